#pragma once

#include "sgcore/containers/sgtarray.h"
#include "sgcore/plugin/sgaction.h"

#include <QQueue>
#include <QString>

#include <memory>
#include <utility>

class QProcess;
class QTimer;
class SgNode;
class SgPolyShape;
class SgSharedMemory;

// The action "Send to Facetor...": gathers the selected nodes into a send list, launches the
// modeler when no link exists, and every 50 ms polls the control record through which the
// modeler asks for nodes, acknowledges them, returns geometry and says goodbye. Nodes go one
// at a time through the data segment; returned geometry becomes a morph, a prop or a copy of
// materials in the scene. Everything runs on the GUI thread.
class SgFacBridge : public SgAction {
    Q_OBJECT
public:
    // The modeler's message codes and the host's own, as they travel in the control record.
    enum Message { Idle = 0, Data = 1, Quit = 2, Acknowledge = 3, Release = 4, NoMessage = 5 };

    // Sets up the poll timer, the modeler process object and the control segment object (no
    // kernel object yet); with the host switch "-facbridge" links to the already running
    // modeler at once and starts polling.
    Q_INVOKABLE SgFacBridge();
    // Drops this process's hold on both segments: each vanishes unless the modeler holds it.
    ~SgFacBridge() override;

    // The category the host lists the action under: "Facetor Bridge".
    QString getActionGroup() const override;

    // Posts a host-to-modeler message when that slot is free. False when the control segment is
    // not attached, its lock is not obtained within 25 ms, or the modeler has not taken the
    // previous message (nothing is written then).
    bool postMessage(int code, int value);

    // Takes the waiting modeler-to-host message: its code (0 to 255) with its parameter in
    // `value`. 0 when the control segment is not attached; 5 when the lock is not obtained in
    // 25 ms or no message waits (`value` is then untouched).
    // Also notes whether the lock was had and whether the modeler has taken the host's last
    // message (see checkSharedMap).
    int readMessage(int &value);

    // Writes the first node of the send list into a fresh data segment and posts message 1
    // (queued for retry when the slot is taken). When the modeler still holds the previous
    // segment, sends nothing and posts message 4 instead.
    void sendNext();

    bool isActive() const { return m_active; }
    bool isExchangeBusy() const { return m_exchangeBusy; }
    int idlePolls() const { return m_idlePolls; }
    const SgTArray<SgNode *> &sendList() const { return m_sendList; }
    const QQueue<std::pair<int, int>> &retryQueue() const { return m_retryQueue; }
    QTimer *pollTimer() const { return m_timer; }
    // The process id of the last modeler launched, 0 when none was.
    qint64 modelerProcessId() const { return m_modelerPid; }

public slots:
    // One poll step: takes at most one modeler message, retries one queued host message or
    // sends the idle notice, and reacts to the message. A step waits at most 25 ms for the
    // control lock: when the modeler holds it, the step posts nothing either. When the last
    // node record was taken and never acknowledged, and a modeler that has linked since asks
    // for the selection (code 0), the modeler that took the record is gone (restarted): the
    // exchange ends and the next node goes out. A new link shows in the control segment's
    // attach count, which a killed modeler never lowers. A modeler that quits (code 2) ends a
    // busy exchange too and drops the queued messages.
    void checkSharedMap();

protected slots:
    // Collects the selection and, when no link exists, launches the modeler and links.
    void executeAction() override;
    // The host has started: restarts the poll of an active bridge.
    void starting();
    // The host is closing: tells an active modeler so (message 2, up to 50 tries).
    void closing();

protected:
    // Lists `node` for sending: a bone stands for its figure; a figure brings the figures that
    // follow it and its descendants; a node without a shape lists nothing. No node twice.
    void collectNode(SgNode *node);
    // Starts the modeler detached with "-sgl" in its install folder. False, with "Failed to
    // launch Facetor." in the host log, when it cannot start.
    bool launchModeler();
    // Where the modeler is installed: the registry on Windows; elsewhere the environment
    // variable FACETOR_INSTALL_PATH, else the application setting "FacetorInstallPath".
    QString modelerInstallPath() const;
    // Reads the returned record, tears the data segment down, acknowledges it and places the
    // shape in the scene.
    void receiveGeometry();
    // Imports `shape` against `node`, whose label equals the shape's name. True when the shape
    // has been dealt with for good, false when it should rather become a prop.
    bool importReturnedShape(SgPolyShape *shape, SgNode *node);
    // The road of "FacetorBridgeTools" not 0: the "Target Importer" dialog in its bridge mode
    // with the shape's geometry as its one source (file mode when the shape has no geometry),
    // run modally on the main window; the dialog makes the morph itself, and this call then
    // makes the prop or copies the materials when the chosen action asks for it.
    void importThroughMorphLoader(SgPolyShape *shape, SgNode *node);
    // Adds `shape` to the scene as a new prop at the centre of its bounding box, with a label
    // made unique by " (1)", " (2)", ...; the scene takes the shape.
    void createPropFromShape(SgPolyShape *shape);
    // Copies the diffuse colour and map of each material of `shape` onto the node's material of
    // the same name (each bone of a figure in turn).
    void copyMaterials(SgPolyShape *shape, SgNode *node);

private:
    void startPolling();
    void queueOrPost(int code, int value);
    // Drops this process's hold on the data segment when it exists.
    void releaseDataSegment();
    // Ends the exchange of the last node sent: drops the hold on its record, no longer busy.
    void endExchange();
    void copyMaterialsToTarget(SgPolyShape *shape, SgNode *target);

    QTimer *m_timer = nullptr;
    QProcess *m_process = nullptr;
    std::unique_ptr<SgSharedMemory> m_control;
    std::unique_ptr<SgSharedMemory> m_data;
    bool m_active = false;
    int m_idlePolls = 0;
    bool m_exchangeBusy = false;
    // The last readMessage missed the control lock; it saw the host-to-modeler slot free.
    bool m_controlLockMissed = false;
    bool m_hostSlotFree = false;
    // The modeler has taken the node record of the busy exchange (seen at a poll when no
    // modeler message was waiting), and how many processes were attached to the control
    // segment then.
    bool m_recordTaken = false;
    int32_t m_attachedAtTake = 0;
    SgTArray<SgNode *> m_sendList{8};
    QQueue<std::pair<int, int>> m_retryQueue;
    qint64 m_modelerPid = 0;
};
