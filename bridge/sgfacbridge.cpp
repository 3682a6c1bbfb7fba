#include "bridge/sgfacbridge.h"

#include "exchange/sgexchangereader.h"
#include "exchange/sgexchangewriter.h"
#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/app/sghelpmgr.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/geometry/sgpolymesh.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/materials/sgdefaultmaterial.h"
#include "sgcore/properties/sgcolorproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QDialog>
#include <QDir>
#include <QFile>
#include <QMessageBox>
#include <QProcess>
#include <QTimer>

#ifdef Q_OS_WIN
#include <windows.h>
#else
#include <cerrno>
#include <csignal>
#endif

#include <algorithm>
#include <cstring>
#include <exception>

namespace {

constexpr int kPollMs = 50;
constexpr int kControlLockMs = 25;
constexpr int kGoodbyeTries = 50;
constexpr int kIdleNoticePolls = 10;
// An announced return whose data lock the modeler keeps is given up after this long.
constexpr int kReturnLockGiveUpMs = 3000;

SgControlRecord *controlRecord(SgSharedMemory &control) {
    return reinterpret_cast<SgControlRecord *>(control.data());
}

std::unique_ptr<SgSharedMemory> peerSegment(const char *key) {
    auto segment = std::make_unique<SgSharedMemory>(key);
    // No wait on a lock that the modeler can hold stalls the GUI thread for long; on Windows
    // a modeler that died holding one never gives it back.
    segment->setWaitLimit(SgFacBridge::kPeerLockMs);
    return segment;
}

// Whether the process `pid` still runs (a zombie that nobody has reaped counts as ended).
bool processRunning(qint64 pid) {
#ifdef Q_OS_WIN
    HANDLE process = OpenProcess(SYNCHRONIZE, FALSE, DWORD(pid));
    if (!process)
        return false;
    const bool running = WaitForSingleObject(process, 0) == WAIT_TIMEOUT;
    CloseHandle(process);
    return running;
#else
    if (::kill(pid_t(pid), 0) != 0 && errno == ESRCH)
        return false;
    QFile stat(QStringLiteral("/proc/%1/stat").arg(pid));
    if (!stat.open(QIODevice::ReadOnly))
        return true;
    const QByteArray line = stat.read(512);
    const qsizetype close = line.lastIndexOf(')');
    return !(close > 0 && line.size() > close + 2 && line[close + 2] == 'Z');
#endif
}

// Where the sent node can be found: the reference modeler's workspace, which it takes from its
// environment (inherited from the host) or makes in the temporary folder.
QString sentLine(const QString &label) {
#ifdef Q_OS_WIN
    return QStringLiteral("Sent %1 to Facetor.").arg(label);
#else
    QString workspace = qEnvironmentVariable("FACETOR_WORKSPACE");
    if (workspace.isEmpty())
        workspace = QDir::temp().filePath(QStringLiteral("facetor-workspace"));
    return QStringLiteral("Sent %1 to Facetor (workspace %2).")
        .arg(label, QDir::toNativeSeparators(workspace));
#endif
}

} // namespace

SgFacBridge::SgFacBridge() : SgAction(QStringLiteral("Send to Facetor..."), QString()) {
    m_timer = new QTimer(this);
    m_control = peerSegment(kSgControlSegmentKey);
    connect(m_timer, &QTimer::timeout, this, &SgFacBridge::checkSharedMap);
    connect(sgApp, &SgApp::starting, this, &SgFacBridge::starting);
    connect(sgApp, &SgApp::closing, this, &SgFacBridge::closing);
    // Whatever removes a node from the scene, it leaves the send list at once.
    if (SgScene *scene = sgApp->getScene())
        connect(scene, &SgScene::nodeRemoved, this, &SgFacBridge::forgetNode);
    m_process = new QProcess(this);
    for (const QString &argument : sgApp->getCommandArguments()) {
        if (argument != QLatin1String("-facbridge"))
            continue;
        // Started by the modeler: the control record is the modeler's (or all zero when we
        // create it here), so it is not rewritten.
        claimLink();
        if (!m_control->exists())
            m_control->create(int32_t(sizeof(SgControlRecord)));
        m_control->attach(SgSharedMemory::kReadWrite);
        startPolling();
    }
    sgApp->getHelpMgr()->setOnlineHelp(this);
}

SgFacBridge::~SgFacBridge() {
    // Each hold is dropped outright rather than by counting the other attachments: a modeler
    // that was killed while attached is never uncounted, and the count would keep this
    // process's handles, and so both segments, alive until it ends. A live modeler keeps a
    // segment alive by its own handles.
    releaseDataSegment();
    if (m_control->exists()) {
        m_control->detach();
        m_control->remove(SgSharedMemory::kRemoveUnlocked);
    }
    m_control.reset();
    m_data.reset();
    m_hostLink.reset();
    delete m_process;
    m_process = nullptr;
    m_retryQueue.clear();
    m_sendList.clear();
    m_pendingImports.clear();
}

QString SgFacBridge::getActionGroup() const {
    return tr("Facetor Bridge");
}

void SgFacBridge::report(const QString &line) {
    sgApp->log(line);
    // The window's status line shows the latest event, never a stale one.
    if (sgApp->getInterface())
        sgApp->statusLine(line);
}

void SgFacBridge::startPolling() {
    m_timer->start(kPollMs);
    m_active = true;
    m_lastSignOfLife.start();
}

void SgFacBridge::starting() {
    if (m_timer && m_active)
        m_timer->start(kPollMs);
}

void SgFacBridge::closing() {
    if (!m_active)
        return;
    for (int attempt = 0; attempt < kGoodbyeTries; ++attempt)
        if (postMessage(SgHostMessage::ShuttingDown, 0))
            return;
}

bool SgFacBridge::claimLink() {
    if (m_hostLink)
        return true;
    auto link = peerSegment(kSgHostLinkKey);
    if (link->create(int32_t(sizeof(qint64)))) {
        m_hostLink = std::move(link);
        return true;
    }
    // Only a segment that exists means another host; any other failure does not stop the user.
    return link->status() != SgSharedMemory::StatusAlreadyExists;
}

bool SgFacBridge::modelerGone() const {
    if (m_modelerPid > 0 && !processRunning(m_modelerPid))
        return true;
    return m_lastSignOfLife.isValid() && m_lastSignOfLife.elapsed() > kSilentLinkMs;
}

void SgFacBridge::endLink(const QString &logLine) {
    // The node the modeler never acknowledged goes first to the next modeler.
    if (m_exchangeBusy && m_inFlight && !m_sendList.contains(m_inFlight)) {
        m_sendList.append(m_inFlight);
        std::rotate(m_sendList.begin(), m_sendList.end() - 1, m_sendList.end());
    }
    m_inFlight = nullptr;
    endExchange();
    m_retryQueue.clear();
    m_returnWaiting = false;
    if (m_control->exists()) {
        m_control->detach();
        m_control->remove(SgSharedMemory::kRemoveUnlocked);
    }
    m_hostLink.reset();
    m_active = false;
    m_timer->stop();
    m_modelerPid = 0;
    report(logLine);
}

void SgFacBridge::executeAction() {
    SgScene *scene = sgApp->getScene();
    if (scene) {
        SgNodeListIterator selected = scene->selectedNodeListIterator();
        while (SgNode *node = selected.next())
            collectNode(node);
    }
    if (m_active && modelerGone())
        endLink(QStringLiteral("Facetor has quit unexpectedly."));
    if (m_active)
        return; // the running exchange sends what was just collected
    if (m_sendList.count() < 1) {
        const auto answer = QMessageBox::question(
            sgApp->getDialogParent(), tr("Launch Facetor"),
            tr("You have nothing selected to send to Facetor.\nDo you still wish to open Facetor?"),
            QMessageBox::Yes | QMessageBox::No, QMessageBox::Yes);
        if (answer != QMessageBox::Yes) {
            m_sendList.clear();
            return;
        }
    }
    // The control record of a link that another host holds is never rewritten.
    if (!claimLink()) {
        report(QStringLiteral("Facetor is linked to another Scenara."));
        return;
    }
    if (!launchModeler()) {
        m_hostLink.reset();
        return;
    }
    if (!m_control->exists())
        m_control->create(int32_t(sizeof(SgControlRecord)));
    if (m_control->attach(SgSharedMemory::kReadWrite) &&
        m_control->size() >= int32_t(sizeof(SgControlRecord))) {
        // A fresh record: both slots free, no message, written before the modeler is told.
        const SgControlRecord fresh = SgControlRecord::fresh();
        std::memcpy(m_control->data(), &fresh, sizeof fresh);
    }
    startPolling();
}

void SgFacBridge::forgetNode(SgNode *node) {
    const int index = m_sendList.find(node);
    if (index >= 0)
        m_sendList.removeByIndex(index, 1);
    if (node == m_inFlight)
        m_inFlight = nullptr;
    m_importCandidates.removeAll(node);
    if (node == m_importNode) {
        m_importNode = nullptr;
        if (m_importDialog)
            m_importDialog->reject();
    }
}

void SgFacBridge::collectNode(SgNode *node) {
    if (!node)
        return;
    SgNode *item = nullptr;
    if (dynamic_cast<SgBone *>(node)) {
        item = node->getSkeleton();
    } else if (dynamic_cast<SgSkeleton *>(node)) {
        item = node;
    } else if (node->getObject() && node->getObject()->getCurrentShape()) {
        item = node;
    }
    if (!item || m_sendList.contains(item))
        return;
    m_sendList.append(item);
    if (auto *figure = dynamic_cast<SgSkeleton *>(item)) {
        if (SgScene *scene = sgApp->getScene()) {
            SgSkeletonListIterator figures = scene->skeletonListIterator();
            while (SgSkeleton *follower = figures.next())
                if (follower->getFollowTarget() == figure)
                    collectNode(follower);
        }
    }
    SgNodeList descendants;
    item->getNodeChildren(descendants, true);
    for (SgNode *child : descendants)
        collectNode(child);
}

QString SgFacBridge::modelerInstallPath() const {
#ifdef Q_OS_WIN
    HKEY key = nullptr;
    if (RegOpenKeyExA(HKEY_LOCAL_MACHINE, "SOFTWARE\\Varn\\Facetor", 0, KEY_READ, &key) !=
            ERROR_SUCCESS &&
        RegOpenKeyExA(HKEY_LOCAL_MACHINE, "SOFTWARE\\Varn\\Facetor", 0, KEY_READ | KEY_WOW64_64KEY,
                      &key) != ERROR_SUCCESS)
        return QString();
    char buffer[256] = {};
    DWORD type = 0;
    DWORD size = sizeof buffer;
    const LONG result = RegQueryValueExA(key, "InstallPath", nullptr, &type,
                                         reinterpret_cast<LPBYTE>(buffer), &size);
    RegCloseKey(key);
    // A value that fills the buffer without its terminator is not trusted as a path.
    if (result != ERROR_SUCCESS || type != REG_SZ || size == 0 || buffer[size - 1] != '\0')
        return QString();
    return QString::fromLocal8Bit(buffer);
#else
    const QString fromEnvironment = qEnvironmentVariable("FACETOR_INSTALL_PATH");
    if (!fromEnvironment.isEmpty())
        return fromEnvironment;
    SgAppSettings settings;
    return settings.getString(QStringLiteral("FacetorInstallPath"));
#endif
}

bool SgFacBridge::launchModeler() {
    m_process->setArguments({});
    const QString path = modelerInstallPath();
    m_process->setWorkingDirectory(QDir(path).path());
#ifdef Q_OS_WIN
    m_process->setProgram(path + QLatin1String("/Facetor.exe"));
#else
    m_process->setProgram(path + QLatin1String("/Facetor"));
#endif
    m_process->setArguments({QStringLiteral("-sgl")});
    // The modeler runs on its own; whether it is alive is learnt through the control record
    // and, while this bridge is linked, by looking at its process.
    qint64 pid = 0;
    if (path.isEmpty() || !m_process->startDetached(&pid)) {
        sgApp->log(QStringLiteral("Failed to launch Facetor."));
        return false;
    }
    m_modelerPid = pid;
    return true;
}

bool SgFacBridge::postMessage(SgHostMessage code, int value) {
    if (!m_control->isAttached() || !m_control->tryLock(kControlLockMs))
        return false;
    bool posted = false;
    try {
        SgControlRecord *record = controlRecord(*m_control);
        if (record->toModelerFlag == 1) {
            record->toModelerCode = sgCodeByte(code);
            record->toModelerParameter = value;
            record->toModelerFlag = 0;
            posted = true;
        }
    } catch (const std::exception &) {
        posted = false;
    }
    m_control->unlock();
    return posted;
}

SgModelerMessage SgFacBridge::readMessage(int &value) {
    m_controlLockMissed = false;
    m_hostSlotFree = false;
    if (!m_control->isAttached())
        return SgModelerMessage::SendSelection;
    if (!m_control->tryLock(kControlLockMs)) {
        m_controlLockMissed = true;
        return SgModelerMessage::NoMessage;
    }
    auto code = SgModelerMessage::NoMessage;
    try {
        SgControlRecord *record = controlRecord(*m_control);
        m_hostSlotFree = record->toModelerFlag == 1;
        if (record->toHostFlag == 0) {
            value = record->toHostParameter;
            code = SgModelerMessage(record->toHostCode);
            record->toHostFlag = 1;
        }
    } catch (const std::exception &) {
        code = SgModelerMessage::NoMessage;
    }
    m_control->unlock();
    // A message, or the host's last message taken, shows that the modeler is still at work.
    if (code != SgModelerMessage::NoMessage || m_hostSlotFree)
        m_lastSignOfLife.restart();
    return code;
}

void SgFacBridge::queueOrPost(SgHostMessage code, int value) {
    if (!postMessage(code, value))
        m_retryQueue.enqueue({code, value});
}

void SgFacBridge::releaseDataSegment() {
    if (m_data && m_data->exists()) {
        m_data->detach();
        m_data->remove(SgSharedMemory::kRemoveUnlocked);
    }
}

void SgFacBridge::endExchange() {
    releaseDataSegment();
    m_exchangeBusy = false;
    m_recordTaken = false;
    m_inFlight = nullptr;
}

void SgFacBridge::sendNext() {
    while (m_sendList.count() > 0) {
        releaseDataSegment();
        if (!m_data)
            m_data = peerSegment(kSgDataSegmentKey);
        if (m_data->exists()) {
            // The modeler still holds the last record: ask it to let go, send nothing now.
            m_data->attach(SgSharedMemory::kReadWrite);
            m_data->detach();
            m_data->remove(SgSharedMemory::kRemoveUnlocked);
            queueOrPost(SgHostMessage::SegmentBusy, 0);
            return;
        }
        if (writeFirstNode())
            return;
    }
}

bool SgFacBridge::writeFirstNode() {
    SgNode *node = m_sendList[0];
    const QString label = node->getLabel();
    m_sendList.removeByIndex(0, 1);
    bool written = false;
    {
        SgExchangeWriter writer(node, QString());
        const int32_t size = writer.getSize();
        if (size > 0 && m_data->create(size) && m_data->attach(SgSharedMemory::kReadWrite) &&
            m_data->tryLock(kPeerLockMs)) {
            // Never past the segment as it came out, whatever the measure said.
            written = writer.write(m_data->data(), m_data->size()) > 0;
            m_data->unlock();
        }
    }
    if (!written) {
        // Nothing is announced for a record that is not whole; the next node goes on.
        releaseDataSegment();
        report(QStringLiteral("Could not send %1 to Facetor.").arg(label));
        return false;
    }
    queueOrPost(SgHostMessage::NodeWritten, 0);
    m_exchangeBusy = true;
    m_recordTaken = false;
    m_inFlight = node;
    report(sentLine(label));
    return true;
}

void SgFacBridge::checkSharedMap() {
    if (m_returnWaiting)
        receiveGeometry();
    int value = 0;
    const SgModelerMessage code = readMessage(value);
    // The record has been taken when the slot is free with no modeler message waiting (a
    // message 1 still queued is not in the slot yet). The number of processes attached to the
    // control segment then is remembered: a modeler that is killed never uncounts itself, so
    // a higher number later means that another modeler has linked since.
    if (m_exchangeBusy && !m_recordTaken && code == SgModelerMessage::NoMessage && m_hostSlotFree &&
        !m_retryQueue.contains(std::pair(SgHostMessage::NodeWritten, 0))) {
        m_recordTaken = true;
        m_attachedAtTake = m_control->attachCount();
    }
    if (m_controlLockMissed) {
        // The modeler holds the control lock: a second wait for it in this step would only
        // double the time the host stands still. The queued message or the idle notice goes
        // out at a later step.
        ++m_idlePolls;
    } else if (!m_retryQueue.isEmpty()) {
        const std::pair<SgHostMessage, int> retry = m_retryQueue.head();
        if (postMessage(retry.first, retry.second))
            m_retryQueue.dequeue();
    } else {
        if (m_idlePolls >= kIdleNoticePolls) {
            postMessage(SgHostMessage::Idle, 0);
            m_idlePolls = 0;
        }
        if (code == SgModelerMessage::NoMessage || code == SgModelerMessage::SendSelection)
            ++m_idlePolls;
        else
            m_idlePolls = 0;
    }
    switch (code) {
    case SgModelerMessage::SendSelection:
        // A modeler that has linked since the record was taken asks for the selection: the
        // modeler that took the record without acknowledging it is gone, and the record too.
        if (m_exchangeBusy && m_recordTaken && m_control->attachCount() > m_attachedAtTake)
            endExchange();
        if (!m_exchangeBusy)
            sendNext();
        break;
    case SgModelerMessage::GeometryWritten:
        m_returnWaiting = true;
        m_returnWaitingSince.start();
        receiveGeometry();
        break;
    case SgModelerMessage::Quit:
        // No modeler is left to acknowledge a record or take a queued message.
        endLink(QStringLiteral("Facetor has quit."));
        break;
    case SgModelerMessage::NodeRead:
        endExchange();
        sendNext();
        break;
    case SgModelerMessage::ReleaseSegment:
        releaseDataSegment();
        break;
    default:
        break;
    }
    // A message the modeler left before it ended has been taken above; the link ends after.
    if (m_active && modelerGone())
        endLink(QStringLiteral("Facetor has quit unexpectedly."));
}

bool SgFacBridge::readReturn(std::unique_ptr<SgPolyShape> &shape) {
    if (!m_data)
        m_data = peerSegment(kSgDataSegmentKey);
    if (!m_data->exists())
        return true; // nothing to read: acknowledged all the same
    if (!m_data->isAttached() && !m_data->attach(SgSharedMemory::kReadWrite))
        return m_data->status() != SgSharedMemory::StatusLockFailed;
    if (!m_data->tryLock(kPeerLockMs))
        return false;
    SgExchangeReader reader(m_data->data(), m_data->size());
    QString trailer;
    shape.reset(reader.readShape(trailer));
    m_data->unlock();
    return true;
}

void SgFacBridge::receiveGeometry() {
    std::unique_ptr<SgPolyShape> shape;
    if (!readReturn(shape)) {
        // The modeler holds the record's lock: tried again at the next polls, for a while.
        if (m_returnWaitingSince.elapsed() < kReturnLockGiveUpMs)
            return;
        report(QStringLiteral("Could not read the geometry returned by Facetor."));
    }
    m_returnWaiting = false;
    if (QWidget *window = sgApp->getInterface())
        window->activateWindow();
    m_data->detach();
    m_data->remove(SgSharedMemory::kRemoveUnlocked);
    queueOrPost(SgHostMessage::GeometryRead, 0);
    if (!shape)
        return;
    // The import and its dialogs run outside the poll step, so that the poll goes on; from a
    // timer, so that the window's own events (input, painting) are handled between the two.
    m_pendingImports.push_back(std::move(shape));
    QTimer::singleShot(0, this, &SgFacBridge::importPending);
}

void SgFacBridge::importPending() {
    if (m_importing)
        return;
    m_importing = true;
    while (!m_pendingImports.empty()) {
        std::unique_ptr<SgPolyShape> shape = std::move(m_pendingImports.front());
        m_pendingImports.pop_front();
        placeShape(std::move(shape));
    }
    m_importing = false;
}

QList<SgNode *> SgFacBridge::nodesLabelled(const QString &name) const {
    QList<SgNode *> exact;
    QList<SgNode *> travelled;
    if (SgScene *scene = sgApp->getScene()) {
        for (SgNode *node : scene->getNodes()) {
            const QString label = node->getLabel();
            if (label == name)
                exact.append(node);
            else if (QString::fromLatin1(label.toLatin1()) == name)
                travelled.append(node);
        }
    }
    // A label that does not fit in 8 bits travels changed: it is matched as it travelled.
    return exact.isEmpty() ? travelled : exact;
}

void SgFacBridge::placeShape(std::unique_ptr<SgPolyShape> shape) {
    const QString name = shape->getName();
    const SgVertexMesh *geometry = shape->getGeometry();
    if (geometry == nullptr || geometry->getVertexCount() == 0) {
        report(QStringLiteral("Facetor returned %1 without geometry; nothing was imported.")
                   .arg(name));
        finishReturn(QStringLiteral("refused"));
        return;
    }
    // The shape goes to the first node, in scene order, whose label matches its name and that
    // keeps it; failing that, it becomes a prop.
    m_importOutcome.clear();
    m_importCandidates = nodesLabelled(name);
    bool dealtWith = false;
    while (!dealtWith && !m_importCandidates.isEmpty()) {
        m_importNode = m_importCandidates.takeFirst();
        dealtWith = importReturnedShape(shape.get(), m_importNode);
    }
    m_importNode = nullptr;
    m_importCandidates.clear();
    if (!dealtWith)
        createPropFromShape(shape.get());
    // A shape that became a prop belongs to its object now; any other is not needed any more.
    if (shape->getElementParent())
        (void)shape.release();
    finishReturn(m_importOutcome.isEmpty() ? QStringLiteral("imported") : m_importOutcome);
}

void SgFacBridge::finishReturn(const QString &outcome) {
    if (SgScene *scene = sgApp->getScene())
        scene->update();
    emit returnHandled(outcome);
}

bool SgFacBridge::runImportDialog(QDialog &dialog, int &result) {
    m_importDialog = &dialog;
    result = dialog.exec();
    m_importDialog = nullptr;
    return m_importNode != nullptr;
}

void SgFacBridge::createPropFromShape(SgPolyShape *shape) {
    SgScene *scene = sgApp->getScene();
    if (!shape || !scene || shape->getElementParent())
        return;
    auto *object = new SgObject();
    object->setName(shape->getName());
    object->addShape(shape, -1);
    auto *node = new SgNode();
    SgVertexMesh *geometry = shape->getGeometry();
    node->setOrigin(geometry ? geometry->getBoundingBox().getCenter() : SgVec3(), false);
    node->setName(shape->getName());
    node->setLabel(shape->getName());
    const QString base = node->getName();
    for (int n = 1; scene->findNodeByLabel(node->getLabel()); ++n) {
        const QString unique = base + QStringLiteral(" (%1)").arg(n);
        node->setName(unique);
        node->setLabel(unique);
    }
    node->setObject(object);
    scene->addNode(node);
    scene->update();
    report(QStringLiteral("Imported %1 from Facetor as the prop %2.")
               .arg(shape->getName(), node->getLabel()));
}

void SgFacBridge::copyMaterials(SgPolyShape *shape, SgNode *node) {
    if (!shape || !node)
        return;
    if (auto *figure = dynamic_cast<SgSkeleton *>(node)) {
        for (SgBone *bone : figure->getAllBones())
            copyMaterialsToTarget(shape, bone);
    } else {
        copyMaterialsToTarget(shape, node);
    }
}

void SgFacBridge::copyMaterialsToTarget(SgPolyShape *shape, SgNode *target) {
    SgObject *object = target->getObject();
    SgShape *targetShape = object ? object->getCurrentShape() : nullptr;
    if (!targetShape)
        return;
    for (SgMaterial *returned : shape->getAllMaterials()) {
        auto *namesake =
            dynamic_cast<SgDefaultMaterial *>(targetShape->findMaterial(returned->getName()));
        auto *diffuse = dynamic_cast<SgColorProperty *>(
            returned->findProperty(QStringLiteral("Diffuse Color")));
        if (!namesake || !diffuse)
            continue;
        namesake->setDiffuseColor(diffuse->getColorValue());
        if (diffuse->isMapped() && diffuse->getMapValue())
            namesake->setColorMap(diffuse->getMapValue());
    }
}
