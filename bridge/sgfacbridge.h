#pragma once

#include "exchange/shm/sgcontrolrecord.h"
#include "sgcore/containers/sgtarray.h"
#include "sgcore/plugin/sgaction.h"

#include <QElapsedTimer>
#include <QList>
#include <QPointer>
#include <QQueue>
#include <QString>

#include <deque>
#include <memory>
#include <utility>

class QDialog;
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
//
// Over a whole sitting: a node removed from the scene leaves the send list (and any import
// waiting for it) at once; a modeler that ends without a goodbye (its process gone, or the
// link silent) ends the link with "Facetor has quit unexpectedly." and the next Send launches
// a new one, with the node it never acknowledged first in line; returned geometry is read and
// acknowledged in the poll step and imported afterwards from a queued call, so the poll and
// its idle notices go on while the import's dialogs are open. No wait on a lock that the
// modeler can hold lasts longer than a few tens of milliseconds.
class SgFacBridge : public SgAction {
    Q_OBJECT
public:
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
    bool postMessage(SgHostMessage code, int value);

    // Takes the waiting modeler-to-host message: its code (any byte) with its parameter in
    // `value`. SendSelection when the control segment is not attached; NoMessage when the lock
    // is not obtained in 25 ms or no message waits (`value` is then untouched).
    // Also notes whether the lock was had and whether the modeler has taken the host's last
    // message (see checkSharedMap).
    SgModelerMessage readMessage(int &value);

    // Writes the first node of the send list into a fresh data segment and posts message 1
    // (queued for retry when the slot is taken). When the modeler still holds the previous
    // segment, sends nothing and posts message 4 instead. A node whose record cannot be
    // written is dropped with "Could not send <label> to Facetor." and the next one is tried.
    void sendNext();

    bool isActive() const { return m_active; }
    bool isExchangeBusy() const { return m_exchangeBusy; }
    int idlePolls() const { return m_idlePolls; }
    const SgTArray<SgNode *> &sendList() const { return m_sendList; }
    const QQueue<std::pair<SgHostMessage, int>> &retryQueue() const { return m_retryQueue; }
    QTimer *pollTimer() const { return m_timer; }
    // The process id of the last modeler launched, 0 when none was.
    qint64 modelerProcessId() const { return m_modelerPid; }
    // Returned shapes read and acknowledged whose import has not finished yet.
    int pendingImports() const { return int(m_pendingImports.size()) + (m_importing ? 1 : 0); }

    // How long the link may stay silent (no message, the host's last message never taken, or
    // the control lock never had) before the modeler counts as gone.
    static constexpr int kSilentLinkMs = 10000;
    // The longest wait for a lock that the modeler holds, per attempt.
    static constexpr int kPeerLockMs = 30;

signals:
    // One returned shape has been dealt with: "imported" (a morph, a prop or materials were
    // made), "declined" (the user chose to keep the scene as it was) or "refused" (the return
    // was unusable, or its node left the scene). Emitted after the scene has been updated.
    void returnHandled(const QString &outcome);

public slots:
    // One poll step: takes at most one modeler message, retries one queued host message or
    // sends the idle notice, and reacts to the message. A step waits at most 25 ms for the
    // control lock: when the modeler holds it, the step posts nothing either. When the last
    // node record was taken and never acknowledged, and a modeler that has linked since asks
    // for the selection (code 0), the modeler that took the record is gone (restarted): the
    // exchange ends and the next node goes out. A new link shows in the control segment's
    // attach count, which a killed modeler never lowers. A modeler that quits (code 2) ends a
    // busy exchange too and drops the queued messages; one that is gone without a goodbye
    // ends the link the same way, with "Facetor has quit unexpectedly." in the log.
    void checkSharedMap();

protected slots:
    // Collects the selection and, when no link exists, launches the modeler and links. A link
    // whose modeler is gone is ended first; a control segment that another host holds is left
    // alone ("Facetor is linked to another Scenara." in the log).
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
    // Reads the returned record, tears the data segment down, acknowledges it and queues the
    // shape for import. A data lock the modeler holds is tried again at the next polls for a
    // few seconds before the return is given up.
    void receiveGeometry();
    // Imports `shape` against `node`, whose label equals the shape's name. True when the shape
    // has been dealt with for good, false when it should rather become a prop.
    bool importReturnedShape(SgPolyShape *shape, SgNode *node);
    // The road of "FacetorBridgeTools" not 0: the "Target Importer" dialog in its bridge mode
    // with the shape's geometry as its one source, run modally on the main window; the dialog
    // makes the morph itself, and this call then makes the prop or copies the materials when
    // the chosen action asks for it.
    void importThroughMorphLoader(SgPolyShape *shape, SgNode *node);
    // Adds `shape` to the scene as a new prop at the centre of its bounding box, with a label
    // made unique by " (1)", " (2)", ...; the scene takes the shape.
    void createPropFromShape(SgPolyShape *shape);
    // Copies the diffuse colour and map of each material of `shape` onto the node's material of
    // the same name (each bone of a figure in turn).
    void copyMaterials(SgPolyShape *shape, SgNode *node);

private slots:
    // `node` is leaving the scene: it leaves the send list and any import that waits for it.
    void forgetNode(SgNode *node);
    // Imports the shapes read so far, one at a time; a call made while an import's dialog is
    // open leaves the rest to the import already running.
    void importPending();

private:
    void startPolling();
    void queueOrPost(SgHostMessage code, int value);
    // Drops this process's hold on the data segment when it exists.
    void releaseDataSegment();
    // Ends the exchange of the last node sent: drops the hold on its record, no longer busy.
    void endExchange();
    // Ends the link: the node of an unacknowledged exchange goes back to the front of the send
    // list, queued messages are dropped, both segments are let go and the poll stops.
    void endLink(const QString &logLine);
    // Whether the linked modeler is gone without a goodbye: its process has ended, or the link
    // has been silent for kSilentLinkMs.
    bool modelerGone() const;
    // Claims the link for this host; false when another host holds it.
    bool claimLink();
    // Tries to read the announced return; false while the data lock is held by the modeler.
    bool readReturn(std::unique_ptr<SgPolyShape> &shape);
    // Writes the first node of the send list; false (node dropped, logged) when it cannot.
    bool writeFirstNode();
    // Places one returned shape: a morph, prop or materials on the first node whose label
    // matches, else a prop; an empty return is refused.
    void placeShape(std::unique_ptr<SgPolyShape> shape);
    // The nodes whose label equals `name` exactly, or else whose label as it travelled to the
    // modeler (8-bit) does.
    QList<SgNode *> nodesLabelled(const QString &name) const;
    // Runs `dialog` modally for the import of the current node; false when the node left the
    // scene meanwhile (the dialog is closed then).
    bool runImportDialog(QDialog &dialog, int &result);
    void report(const QString &line);
    void finishReturn(const QString &outcome);
    void copyMaterialsToTarget(SgPolyShape *shape, SgNode *target);

    QTimer *m_timer = nullptr;
    QProcess *m_process = nullptr;
    std::unique_ptr<SgSharedMemory> m_control;
    std::unique_ptr<SgSharedMemory> m_data;
    // Held while this host is linked, so that a second host leaves the control record alone.
    std::unique_ptr<SgSharedMemory> m_hostLink;
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
    // The node of the busy exchange (null once it has left the scene).
    SgNode *m_inFlight = nullptr;
    // Since the modeler last showed it lives (a message, or the host's last message taken).
    QElapsedTimer m_lastSignOfLife;
    // An announced return whose data lock was not had yet, and since when it waits.
    bool m_returnWaiting = false;
    QElapsedTimer m_returnWaitingSince;
    SgTArray<SgNode *> m_sendList{8};
    QQueue<std::pair<SgHostMessage, int>> m_retryQueue;
    qint64 m_modelerPid = 0;
    // Returned shapes waiting for their import, the import under way, its candidate nodes and
    // the node it works on (null once that node has left the scene), and its open dialog.
    std::deque<std::unique_ptr<SgPolyShape>> m_pendingImports;
    bool m_importing = false;
    QList<SgNode *> m_importCandidates;
    SgNode *m_importNode = nullptr;
    QPointer<QDialog> m_importDialog;
    // What the import under way has done, for returnHandled ("imported" when empty).
    QString m_importOutcome;
};
