#include "facetor/sgfacetorlink.h"

#include "exchange/sgexchangenodereader.h"
#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"
#include "facetor/sgfacetorcheckpoint.h"

#include <cstring>

namespace {
// Control accesses never hold up the modeler for longer than this.
constexpr int kControlLockMs = 25;

// The checkpoint reached while a message of `code` is being posted under the control lock.
const char *postPoint(SgModelerMessage message) {
    const int code = sgCodeByte(message);
    static constexpr const char *kPoints[] = {"post-idle-locked", "post-data-locked",
                                              "post-quit-locked", "post-ack-locked",
                                              "post-release-locked"};
    return code >= 0 && code < 5 ? kPoints[code] : "post-other-locked";
}
} // namespace

SgFacetorLink::SgFacetorLink()
    : m_control(std::make_unique<SgSharedMemory>(kSgControlSegmentKey)),
      m_data(std::make_unique<SgSharedMemory>(kSgDataSegmentKey)) {}

SgFacetorLink::~SgFacetorLink() = default;

bool SgFacetorLink::tryLink() {
    if (m_linked)
        return true;
    if (!m_control->exists() || !m_control->attach(SgSharedMemory::kReadWrite))
        return false;
    if (m_control->size() < int(sizeof(SgControlRecord)) || !m_control->tryLock(kControlLockMs)) {
        m_control->detach();
        return false;
    }
    // The host writes a fresh record (both flags "free") right after creating the segment; a
    // record of zeros is one the host has not set up yet.
    SgFacetorCheckpoint::reach("link-locked");
    const auto *record = reinterpret_cast<const SgControlRecord *>(m_control->data());
    const bool ready = record->toHostFlag == 1;
    m_control->unlock();
    if (!ready) {
        m_control->detach();
        return false;
    }
    m_linked = true;
    return true;
}

bool SgFacetorLink::post(SgModelerMessage code, int value) {
    if (!m_linked || !m_control->isAttached() || !m_control->tryLock(kControlLockMs))
        return false;
    auto *record = reinterpret_cast<SgControlRecord *>(m_control->data());
    bool posted = false;
    if (record->toHostFlag == 1) {
        SgFacetorCheckpoint::reach(postPoint(code));
        record->toHostCode = sgCodeByte(code);
        record->toHostParameter = value;
        record->toHostFlag = 0;
        posted = true;
    }
    m_control->unlock();
    return posted;
}

bool SgFacetorLink::hostTookLast() {
    if (!m_linked || !m_control->isAttached() || !m_control->tryLock(kControlLockMs))
        return false;
    const bool taken =
        reinterpret_cast<const SgControlRecord *>(m_control->data())->toHostFlag == 1;
    m_control->unlock();
    return taken;
}

std::optional<SgHostMessage> SgFacetorLink::take(int &value) {
    if (!m_linked || !m_control->isAttached() || !m_control->tryLock(kControlLockMs))
        return std::nullopt;
    auto *record = reinterpret_cast<SgControlRecord *>(m_control->data());
    std::optional<SgHostMessage> code;
    if (record->toModelerFlag == 0) {
        SgFacetorCheckpoint::reach("take-locked");
        code = SgHostMessage(record->toModelerCode);
        value = record->toModelerParameter;
        record->toModelerFlag = 1;
    }
    m_control->unlock();
    return code;
}

bool SgFacetorLink::readNode(SgExchangeNode &node, QString &error) {
    node = SgExchangeNode();
    if (!m_data->exists() || !m_data->attach(SgSharedMemory::kReadWrite)) {
        error = QStringLiteral("There is no data segment.");
        return false;
    }
    SgFacetorCheckpoint::reach("node-attached");
    bool ok = false;
    if (m_data->lock()) {
        SgFacetorCheckpoint::reach("node-locked");
        SgExchangeNodeReader reader(m_data->data(), std::size_t(std::max(0, m_data->size())));
        ok = reader.read(node);
        if (!ok)
            error = reader.errorString();
        SgFacetorCheckpoint::reach("node-read-locked");
        m_data->unlock();
    } else {
        error = QStringLiteral("The data segment's lock cannot be had.");
    }
    SgFacetorCheckpoint::reach("node-read");
    m_data->detach();
    SgFacetorCheckpoint::reach("node-detached");
    m_data->remove(SgSharedMemory::kRemoveUnlocked);
    SgFacetorCheckpoint::reach("node-released");
    return ok;
}

bool SgFacetorLink::writeRecord(const QByteArray &record) {
    if (record.isEmpty() || !m_data->create(int32_t(record.size())))
        return false;
    SgFacetorCheckpoint::reach("return-created");
    if (!m_data->attach(SgSharedMemory::kReadWrite)) {
        m_data->remove(SgSharedMemory::kRemoveUnlocked);
        return false;
    }
    SgFacetorCheckpoint::reach("return-attached");
    if (!m_data->lock() || m_data->size() < record.size()) {
        m_data->unlock();
        releaseData();
        return false;
    }
    SgFacetorCheckpoint::reach("return-locked");
    // Written in two halves, so that a test can stop the modeler with half a record written.
    const auto half = size_t(record.size()) / 2;
    std::memcpy(m_data->data(), record.constData(), half);
    SgFacetorCheckpoint::reach("return-half-written");
    std::memcpy(m_data->data() + half, record.constData() + half, size_t(record.size()) - half);
    m_data->unlock();
    SgFacetorCheckpoint::reach("return-written");
    return true;
}

bool SgFacetorLink::dataSegmentExists() {
    return m_data->exists();
}

bool SgFacetorLink::dataSegmentBusy() const {
    return m_data->status() == SgSharedMemory::StatusAlreadyExists;
}

void SgFacetorLink::releaseData() {
    if (m_data->isAttached())
        m_data->detach();
    m_data->remove(SgSharedMemory::kRemoveUnlocked);
}

void SgFacetorLink::unlink() {
    if (m_control->isAttached())
        m_control->detach();
    m_control->remove(SgSharedMemory::kRemoveUnlocked);
    m_linked = false;
}
