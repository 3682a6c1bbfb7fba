#include "facetor/sgfacetormodeler.h"

#include "facetor/sgfacetorcheckpoint.h"
#include "facetor/sgfacetorobjfile.h"
#include "facetor/sgfacetorreturn.h"
#include "facetor/sgfacetorsavesettler.h"

#include <QCoreApplication>
#include <QElapsedTimer>
#include <QFile>
#include <QFileInfo>
#include <QTextStream>
#include <QThread>
#include <QTimer>

#include <atomic>
#include <csignal>

namespace {

std::atomic<bool> s_quitRequested{false};
std::atomic<int> s_quitSignal{0};

QString signalName(int signal) {
    switch (signal) {
    case SIGINT:
        return QStringLiteral("SIGINT (the user asked)");
    case SIGTERM:
        return QStringLiteral("SIGTERM");
    default:
        return QStringLiteral("%1").arg(signal);
    }
}

// How long quitting keeps trying to post its goodbye while the host has not taken the last
// message (the host takes one message per 50 ms poll).
constexpr int kGoodbyeMs = 1000;

// An idle notice means the host has nothing more to send unless a node follows it at once (the
// notice can cross the host's answer to a request).
constexpr int kIdleGraceMs = 250;

} // namespace

SgFacetorModeler::SgFacetorModeler(const SgFacetorOptions &options, QObject *parent)
    : QObject(parent), m_options(options) {
    m_timer = new QTimer(this);
    connect(m_timer, &QTimer::timeout, this, &SgFacetorModeler::poll);
}

SgFacetorModeler::~SgFacetorModeler() = default;

void SgFacetorModeler::requestQuit(int signal) {
    s_quitSignal = signal;
    s_quitRequested = true;
}

void SgFacetorModeler::log(const QString &line) {
    const QString stamped = QStringLiteral("%1 %2\n").arg(
        QDateTime::currentDateTime().toString(Qt::ISODateWithMs), line);
    if (m_logFile) {
        m_logFile->write(stamped.toUtf8());
        m_logFile->flush();
    } else {
        QTextStream(stderr) << stamped;
    }
}

bool SgFacetorModeler::start() {
    if (!m_options.logFile.isEmpty()) {
        m_logFile = std::make_unique<QFile>(m_options.logFile);
        if (!m_logFile->open(QIODevice::WriteOnly | QIODevice::Append | QIODevice::Text)) {
            m_logFile.reset();
            log(QStringLiteral("error cannot open the log file %1").arg(m_options.logFile));
            return false;
        }
    }
    QString error;
    if (!m_edit.parse(m_options.editScript, error)) {
        log(QStringLiteral("error %1").arg(error));
        return false;
    }
    m_workspace = std::make_unique<SgFacetorWorkspace>(m_options.workspace);
    if (!m_workspace->folder().exists()) {
        log(QStringLiteral("error cannot create the workspace %1").arg(m_options.workspace));
        return false;
    }
    for (const QString &path : m_options.returnFiles) {
        SgExchangeNode node;
        if (!SgFacetorObjFile::read(path, QString(), node, error)) {
            log(QStringLiteral("error %1").arg(error));
            return false;
        }
        m_returns.enqueue(node);
    }
    if (m_options.watch) {
        m_settler = new SgFacetorSaveSettler(m_options.settleMs, this);
        connect(m_settler, &SgFacetorSaveSettler::settled, this,
                &SgFacetorModeler::workspaceFileSaved);
    }
    SgFacetorCheckpoint::setReporter([this](const QString &line) { log(line); });
    log(QStringLiteral("workspace %1").arg(m_workspace->folder().absolutePath()));
    m_linkDeadline = QDateTime::currentDateTimeUtc().addMSecs(m_options.linkTimeoutMs);
    m_timer->start(m_options.pollMs);
    return true;
}

void SgFacetorModeler::quit(int exitCode, const QString &reason) {
    if (m_quitting)
        return;
    m_quitting = true;
    m_timer->stop();
    if (m_link.isLinked()) {
        SgFacetorCheckpoint::reach("goodbye");
        QElapsedTimer waited;
        waited.start();
        bool posted = false;
        while (!(posted = m_link.post(SgModelerMessage::Quit)) && waited.elapsed() < kGoodbyeMs)
            QThread::msleep(2);
        log(posted ? QStringLiteral("goodbye posted") : QStringLiteral("goodbye not taken"));
        SgFacetorCheckpoint::reach("goodbye-posted");
    }
    m_link.releaseData();
    m_link.unlink();
    log(QStringLiteral("quit: %1 (exit code %2)").arg(reason).arg(exitCode));
    QCoreApplication::exit(exitCode);
}

void SgFacetorModeler::poll() {
    if (s_quitRequested) {
        quit(0, QStringLiteral("signal %1").arg(signalName(s_quitSignal)));
        return;
    }
    if (m_link.isLinked()) {
        pollLinked();
        return;
    }
    SgFacetorCheckpoint::reach("unlinked");
    if (m_link.tryLink()) {
        log(QStringLiteral("linked"));
        m_heardFromHost.start();
        SgFacetorCheckpoint::reach("linked");
        postOrQueue(SgModelerMessage::SendSelection); // ask for the pending selection
        SgFacetorCheckpoint::reach("requested");
    } else if (QDateTime::currentDateTimeUtc() > m_linkDeadline) {
        log(QStringLiteral("error the host never set the control segment up"));
        quit(1, QStringLiteral("the host never set the link up"));
    }
}

void SgFacetorModeler::pollLinked() {
    if (!m_outbox.isEmpty() && m_link.post(m_outbox.head()))
        m_outbox.dequeue();
    int value = 0;
    if (const std::optional<SgHostMessage> code = m_link.take(value)) {
        m_heardFromHost.restart();
        react(*code);
    } else if (m_options.hostTimeoutMs > 0 && m_heardFromHost.elapsed() > m_options.hostTimeoutMs) {
        // A host that died cannot say goodbye: a modeler left linked to it would hold the
        // segments for good.
        log(QStringLiteral("error the host has sent nothing for %1 ms")
                .arg(m_options.hostTimeoutMs));
        quit(1, QStringLiteral("the host has gone silent"));
        return;
    }
    if (!m_selectionArrived && m_options.expect <= 0 && m_idleSince.isValid() &&
        m_idleSince.elapsed() >= kIdleGraceMs)
        selectionComplete();
    startNextReturn();
    maybeFinish();
}

void SgFacetorModeler::react(SgHostMessage code) {
    switch (code) {
    case SgHostMessage::NodeWritten:
        receiveNode();
        break;
    case SgHostMessage::Idle:
        if (!m_selectionArrived && m_options.expect <= 0 && !m_idleSince.isValid())
            m_idleSince.start();
        askAgainWhenIdle();
        break;
    case SgHostMessage::ShuttingDown:
        log(QStringLiteral("host closing"));
        quit(0, QStringLiteral("the host closed the link"));
        break;
    case SgHostMessage::GeometryRead:
        log(QStringLiteral("host read the returned geometry"));
        SgFacetorCheckpoint::reach("return-acknowledged");
        m_link.releaseData();
        SgFacetorCheckpoint::reach("return-released");
        m_returnInFlight = false;
        m_inFlight = SgExchangeNode();
        ++m_returned;
        startNextReturn();
        break;
    case SgHostMessage::SegmentBusy:
        log(QStringLiteral("host asks to release the data segment"));
        m_link.releaseData();
        if (m_returnInFlight) {
            // The host never read it: it goes out again first, once the host is free.
            log(QStringLiteral("return of %1 put back").arg(m_inFlight.name));
            m_returns.prepend(std::move(m_inFlight));
            m_inFlight = SgExchangeNode();
        }
        m_returnInFlight = false;
        postOrQueue(SgModelerMessage::SendSelection);
        break;
    default:
        log(QStringLiteral("unknown host message %1").arg(sgCodeByte(code)));
        break;
    }
}

void SgFacetorModeler::selectionComplete() {
    m_selectionArrived = true;
    log(QStringLiteral("selection arrived"));
    startNextReturn();
}

void SgFacetorModeler::receiveNode() {
    m_idleSince.invalidate();
    SgExchangeNode node;
    QString error;
    if (m_link.readNode(node, error)) {
        SgFacetorCheckpoint::reach("node-received");
        const QString path = m_workspace->writeNode(node);
        ++m_received;
        log(QStringLiteral("received %1 vertices=%2 facets=%3 materials=%4 file=%5")
                .arg(node.name)
                .arg(node.vertexCount())
                .arg(node.facets.size())
                .arg(node.materials.size())
                .arg(path));
        if (!path.isEmpty() && m_settler)
            m_settler->watch(path);
        if (!m_edit.isEmpty()) {
            m_edit.apply(node);
            queueReturn(node);
        }
    } else {
        log(QStringLiteral("error the node record cannot be read: %1").arg(error));
    }
    postOrQueue(SgModelerMessage::NodeRead);
    SgFacetorCheckpoint::reach("node-acknowledged");
    if (!m_selectionArrived && m_options.expect > 0 && m_received >= m_options.expect)
        selectionComplete();
}

void SgFacetorModeler::workspaceFileSaved(const QString &path) {
    SgExchangeNode node;
    QString error;
    if (!SgFacetorObjFile::read(path, m_workspace->nodeNameOf(path), node, error)) {
        log(QStringLiteral("error %1; %2 not returned").arg(error, path));
        return;
    }
    log(QStringLiteral("saved %1").arg(path));
    queueReturn(node);
}

void SgFacetorModeler::queueReturn(const SgExchangeNode &node) {
    m_returns.enqueue(node);
    startNextReturn();
}

void SgFacetorModeler::startNextReturn() {
    // Returns wait until the host has nothing more to send, so the data segment is free.
    if (!m_selectionArrived || m_returnInFlight || m_returns.isEmpty() || !m_link.isLinked())
        return;
    // The host still holds the segment of the last node it sent until it has read our
    // acknowledgement; a return waits for it to go, and for the host to have answered our last
    // message (a request for the selection may bring a node into the segment).
    if (!m_outbox.isEmpty() || !m_link.hostTookLast() || m_link.dataSegmentExists())
        return;
    SgExchangeNode &node = m_returns.head();
    if (!m_link.writeRecord(SgFacetorReturn::encode(node))) {
        // A segment that is still being torn down by the host is tried again at the next poll;
        // any other failure drops this return so that the rest can go.
        if (m_link.dataSegmentBusy())
            return;
        log(QStringLiteral("error cannot write the returned geometry of %1").arg(node.name));
        m_returns.dequeue();
        return;
    }
    m_inFlight = m_returns.dequeue();
    m_returnInFlight = true;
    log(QStringLiteral("returned %1 vertices=%2")
            .arg(m_inFlight.name)
            .arg(m_inFlight.vertexCount()));
    postOrQueue(SgModelerMessage::GeometryWritten);
    SgFacetorCheckpoint::reach("return-announced");
}

void SgFacetorModeler::askAgainWhenIdle() {
    if (m_returnInFlight || !m_returns.isEmpty() || !m_outbox.isEmpty())
        return;
    postOrQueue(SgModelerMessage::SendSelection);
}

void SgFacetorModeler::postOrQueue(SgModelerMessage code) {
    if (m_outbox.isEmpty() && m_link.post(code))
        return;
    m_outbox.enqueue(code);
}

void SgFacetorModeler::maybeFinish() {
    if (m_options.quitWhenDone && !m_quitting && m_selectionArrived && !m_returnInFlight &&
        m_returns.isEmpty() && m_outbox.isEmpty())
        quit(0, QStringLiteral("done, every return read"));
}
