#pragma once

#include "exchange/sgexchangenode.h"
#include "facetor/sgfacetoredit.h"
#include "facetor/sgfacetorlink.h"
#include "facetor/sgfacetorworkspace.h"

#include <QDateTime>
#include <QElapsedTimer>
#include <QHash>
#include <QObject>
#include <QQueue>
#include <QString>

#include <memory>

class QFile;
class QTimer;
class SgFacetorSaveSettler;

// What the modeler is asked to do, from its command line, environment and settings file.
struct SgFacetorOptions {
    QString workspace;         // where received nodes are written
    QString editScript;        // a scripted edit: every received node is returned with it
    QStringList returnFiles;   // OBJ files returned once the selection has arrived
    bool watch = false;        // return a workspace OBJ file whenever it is saved
    int settleMs = 300;        // a saved file is returned once it has not changed for this long
    bool quitWhenDone = false; // quit once the selection has arrived and every return is read
    int expect = 0;            // the selection is complete after this many nodes (0: when the
                               // host's idle notice is not followed by a node within 250 ms)
    QString logFile;           // one line per event ("" for standard error)
    int linkTimeoutMs = 30000; // give up when the host never sets the control segment up
    int hostTimeoutMs = 10000; // quit when a linked host has sent nothing for this long (it
                               // sends an idle notice every 500 ms while it lives)
    int pollMs = 2;            // how often the control record is polled
};

// The reference modeler's side of the protocol: links to the host's control segment, asks for
// the pending selection, writes each received node into the workspace and acknowledges it,
// answers the host's codes, returns geometry, and says goodbye (message 2) when it quits.
class SgFacetorModeler : public QObject {
    Q_OBJECT
public:
    explicit SgFacetorModeler(const SgFacetorOptions &options, QObject *parent = nullptr);
    ~SgFacetorModeler() override;

    // Checks the options and starts waiting for the control segment. False, with the reason
    // logged, when an option is unusable.
    bool start();

    // Posts message 2 (trying for up to 100 ms), lets go of both segments and ends the event
    // loop with `exitCode`; the log says "quit: <reason>".
    void quit(int exitCode, const QString &reason);

    // Set from a signal handler: the next poll quits, naming the signal.
    static void requestQuit(int signal = 0);

private slots:
    void poll();
    // A watched workspace file has settled after a save: it is returned if it reads whole.
    void workspaceFileSaved(const QString &path);

private:
    void pollLinked();
    void react(SgHostMessage code);
    void receiveNode();
    void queueReturn(const SgExchangeNode &node);
    void startNextReturn();
    void postOrQueue(SgModelerMessage code);
    // Asks the host again for its pending selection (code 0) when nothing is in flight, so that
    // nodes the user sends later reach this modeler.
    void askAgainWhenIdle();
    void maybeFinish();
    void selectionComplete();
    void log(const QString &line);

    SgFacetorOptions m_options;
    SgFacetorEdit m_edit;
    std::unique_ptr<SgFacetorWorkspace> m_workspace;
    SgFacetorLink m_link;
    QTimer *m_timer = nullptr;
    std::unique_ptr<QFile> m_logFile;
    QDateTime m_linkDeadline;
    QQueue<SgModelerMessage> m_outbox;
    QQueue<SgExchangeNode> m_returns;
    SgExchangeNode m_inFlight; // the return the host has been told about and not yet read
    SgFacetorSaveSettler *m_settler = nullptr;
    QElapsedTimer m_idleSince;
    QElapsedTimer m_heardFromHost;
    bool m_quitting = false;
    bool m_selectionArrived = false;
    bool m_returnInFlight = false;
    int m_received = 0;
    int m_returned = 0;
};
