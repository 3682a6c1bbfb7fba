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

#include <QDir>
#include <QMessageBox>
#include <QProcess>
#include <QTimer>

#ifdef Q_OS_WIN
#include <windows.h>
#endif

#include <cstring>
#include <exception>

namespace {

constexpr int kPollMs = 50;
constexpr int kControlLockMs = 25;
constexpr int kGoodbyeTries = 50;
constexpr int kIdleNoticePolls = 10;

SgControlRecord *controlRecord(SgSharedMemory &control) {
    return reinterpret_cast<SgControlRecord *>(control.data());
}

} // namespace

SgFacBridge::SgFacBridge() : SgAction(QStringLiteral("Send to Facetor..."), QString()) {
    m_timer = new QTimer(this);
    m_control = std::make_unique<SgSharedMemory>(kSgControlSegmentKey);
    connect(m_timer, &QTimer::timeout, this, &SgFacBridge::checkSharedMap);
    connect(sgApp, &SgApp::starting, this, &SgFacBridge::starting);
    connect(sgApp, &SgApp::closing, this, &SgFacBridge::closing);
    m_process = new QProcess(this);
    for (const QString &argument : sgApp->getCommandArguments()) {
        if (argument != QLatin1String("-facbridge"))
            continue;
        // Started by the modeler: the control record is the modeler's (or all zero when we
        // create it here), so it is not rewritten.
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
    delete m_process;
    m_process = nullptr;
    m_retryQueue.clear();
    m_sendList.clear();
}

QString SgFacBridge::getActionGroup() const {
    return tr("Facetor Bridge");
}

void SgFacBridge::startPolling() {
    m_timer->start(kPollMs);
    m_active = true;
}

void SgFacBridge::starting() {
    if (m_timer && m_active)
        m_timer->start(kPollMs);
}

void SgFacBridge::closing() {
    if (!m_active)
        return;
    for (int attempt = 0; attempt < kGoodbyeTries; ++attempt)
        if (postMessage(Quit, 0))
            return;
}

void SgFacBridge::executeAction() {
    SgScene *scene = sgApp->getScene();
    if (scene) {
        SgNodeListIterator selected = scene->selectedNodeListIterator();
        while (SgNode *node = selected.next())
            collectNode(node);
    }
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
    if (!launchModeler())
        return;
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
    // The modeler runs on its own; whether it is alive is learnt through the control record.
    qint64 pid = 0;
    if (path.isEmpty() || !m_process->startDetached(&pid)) {
        sgApp->log(QStringLiteral("Failed to launch Facetor."));
        return false;
    }
    m_modelerPid = pid;
    return true;
}

bool SgFacBridge::postMessage(int code, int value) {
    if (!m_control->isAttached() || !m_control->tryLock(kControlLockMs))
        return false;
    bool posted = false;
    try {
        SgControlRecord *record = controlRecord(*m_control);
        if (record->toModelerFlag == 1) {
            record->toModelerCode = uint8_t(code);
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

int SgFacBridge::readMessage(int &value) {
    m_controlLockMissed = false;
    m_hostSlotFree = false;
    if (!m_control->isAttached())
        return Idle;
    if (!m_control->tryLock(kControlLockMs)) {
        m_controlLockMissed = true;
        return NoMessage;
    }
    int code = NoMessage;
    try {
        SgControlRecord *record = controlRecord(*m_control);
        m_hostSlotFree = record->toModelerFlag == 1;
        if (record->toHostFlag == 0) {
            value = record->toHostParameter;
            code = record->toHostCode;
            record->toHostFlag = 1;
        }
    } catch (const std::exception &) {
        code = NoMessage;
    }
    m_control->unlock();
    return code;
}

void SgFacBridge::queueOrPost(int code, int value) {
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
}

void SgFacBridge::sendNext() {
    if (m_sendList.count() < 1)
        return;
    releaseDataSegment();
    if (!m_data)
        m_data = std::make_unique<SgSharedMemory>(kSgDataSegmentKey);
    if (m_data->exists()) {
        // The modeler still holds the last record: ask it to let go, send nothing now.
        m_data->attach(SgSharedMemory::kReadWrite);
        m_data->detach();
        m_data->remove(SgSharedMemory::kRemoveUnlocked);
        queueOrPost(Release, 0);
        return;
    }
    {
        SgExchangeWriter writer(m_sendList[0], QString());
        const int32_t size = writer.getSize();
        if (m_data->create(size) && m_data->attach(SgSharedMemory::kReadWrite) && m_data->lock()) {
            // Never past the segment as it came out, whatever the measure said.
            writer.write(m_data->data(), m_data->size());
            m_data->unlock();
        }
    }
    queueOrPost(Data, 0);
    m_exchangeBusy = true;
    m_recordTaken = false;
    m_sendList.removeByIndex(0, 1);
}

void SgFacBridge::checkSharedMap() {
    int value = 0;
    const int code = readMessage(value);
    // The record has been taken when the slot is free with no modeler message waiting (a
    // message 1 still queued is not in the slot yet). The number of processes attached to the
    // control segment then is remembered: a modeler that is killed never uncounts itself, so
    // a higher number later means that another modeler has linked since.
    if (m_exchangeBusy && !m_recordTaken && code == NoMessage && m_hostSlotFree &&
        !m_retryQueue.contains(std::pair<int, int>(Data, 0))) {
        m_recordTaken = true;
        m_attachedAtTake = m_control->attachCount();
    }
    if (m_controlLockMissed) {
        // The modeler holds the control lock: a second wait for it in this step would only
        // double the time the host stands still. The queued message or the idle notice goes
        // out at a later step.
        ++m_idlePolls;
    } else if (!m_retryQueue.isEmpty()) {
        const std::pair<int, int> retry = m_retryQueue.head();
        if (postMessage(retry.first, retry.second))
            m_retryQueue.dequeue();
    } else {
        if (m_idlePolls >= kIdleNoticePolls) {
            postMessage(Idle, 0);
            m_idlePolls = 0;
        }
        if (code == NoMessage || code == Idle)
            ++m_idlePolls;
        else
            m_idlePolls = 0;
    }
    switch (code) {
    case Idle:
        // A modeler that has linked since the record was taken asks for the selection: the
        // modeler that took the record without acknowledging it is gone, and the record too.
        if (m_exchangeBusy && m_recordTaken && m_control->attachCount() > m_attachedAtTake)
            endExchange();
        if (!m_exchangeBusy)
            sendNext();
        break;
    case Data:
        receiveGeometry();
        break;
    case Quit:
        m_active = false;
        m_timer->stop();
        // No modeler is left to acknowledge a record or take a queued message.
        endExchange();
        m_retryQueue.clear();
        if (m_control->exists()) {
            m_control->detach();
            m_control->remove(SgSharedMemory::kRemoveUnlocked);
        }
        break;
    case Acknowledge:
        endExchange();
        sendNext();
        break;
    case Release:
        releaseDataSegment();
        break;
    default:
        break;
    }
}

void SgFacBridge::receiveGeometry() {
    if (!m_data)
        m_data = std::make_unique<SgSharedMemory>(kSgDataSegmentKey);
    std::unique_ptr<SgPolyShape> shape;
    if (m_data->exists() && m_data->attach(SgSharedMemory::kReadWrite)) {
        if (m_data->lock()) {
            SgExchangeReader reader(m_data->data(), m_data->size());
            QString trailer;
            shape.reset(reader.readShape(trailer));
            m_data->unlock();
        }
    }
    if (QWidget *window = sgApp->getInterface())
        window->activateWindow();
    m_data->detach();
    m_data->remove(SgSharedMemory::kRemoveUnlocked);
    queueOrPost(Acknowledge, 0);
    if (!shape)
        return;
    // The shape goes to the first node, in scene order, whose label equals its name and that
    // keeps it; failing that, it becomes a prop.
    bool dealtWith = false;
    if (SgScene *scene = sgApp->getScene()) {
        SgNodeListIterator nodes = scene->nodeListIterator();
        while (SgNode *node = nodes.next()) {
            if (node->getLabel() == shape->getName() && importReturnedShape(shape.get(), node)) {
                dealtWith = true;
                break;
            }
        }
    }
    if (!dealtWith)
        createPropFromShape(shape.get());
    // A shape that became a prop belongs to its object now; any other is not needed any more.
    if (shape->getElementParent())
        (void)shape.release();
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
