#include "exchange/shm/sgsharedmemory.h"

#include "exchange/shm/sgshmplatform.h"

#include <algorithm>
#include <atomic>
#include <bit>
#include <chrono>
#include <limits>
#include <new>
#include <thread>
#include <vector>

static_assert(std::endian::native == std::endian::little,
              "the reference record is little-endian and read in place");

namespace {

using Platform = SgShmPlatform;

// The whole reference mapping: how many attachments exist in all processes, and the data
// size given to create. Both fields are read and written in place.
constexpr std::uint32_t kReferenceRecordSize = 8;
constexpr std::size_t kAttachCountOffset = 0;
constexpr std::size_t kSizeOffset = 4;

// remove(kRemoveWhenAlone) rechecks the other attachments every millisecond and gives up after
// this long: a peer that died while attached never uncounts itself.
constexpr auto kRemoveWaitLimit = std::chrono::seconds(5);

std::atomic_ref<std::uint32_t> referenceField(const Platform::View &view, std::size_t offset) {
    return std::atomic_ref<std::uint32_t>(
        *reinterpret_cast<std::uint32_t *>(static_cast<std::uint8_t *>(view.address) + offset));
}

std::string hexName(std::string_view key) {
    static constexpr char kDigits[] = "0123456789abcdef";
    std::string name = "sgsharedmemory-";
    name.reserve(name.size() + 2 * key.size());
    for (const char c : key) {
        const auto byte = static_cast<unsigned char>(c);
        name += kDigits[byte >> 4];
        name += kDigits[byte & 0x0F];
    }
    return name;
}

// Handles of objects destroyed while other processes were still attached: they stay open
// until this process ends, so that the segment outlives the object. At a normal exit they are
// closed as any handle is, so that a last holder leaves no name behind.
class KeptHandles {
public:
    ~KeptHandles() {
        for (Platform::Handle handle : m_handles)
            Platform::closeHandle(handle);
    }
    void keep(Platform::Handle handle) { m_handles.push_back(handle); }

private:
    std::vector<Platform::Handle> m_handles;
};

KeptHandles &keptHandles() {
    static KeptHandles handles;
    return handles;
}

} // namespace

struct SgSharedMemory::State {
    Platform::Handle dataMapping = nullptr;
    Platform::Handle lockHandle = nullptr;
    Platform::View dataView;
    std::int32_t status = StatusFailed;
    std::string key;
    std::string dataName;
    std::string lockName;
    int lockDepth = 0;
    Platform::Handle referenceMapping = nullptr;
    std::string referenceName;
    Platform::View referenceView;
    std::int32_t size = 0;
    // The access that the open data mapping handle allows.
    Platform::Access mappingAccess = Platform::Access::Read;
    // The wait of lock() and of the calls that lock on their own.
    std::uint32_t waitLimit = Platform::kInfinite;
    // Created by this object and not attached for writing since: its creator fills it next.
    bool freshlyCreated = false;
};

SgSharedMemory::SgSharedMemory(std::string_view key) {
    try {
        d = std::make_unique<State>();
        d->key = std::string(key);
        d->dataName = hexName(key);
        d->lockName = d->dataName + "-lock";
        d->referenceName = d->dataName + "-ref";
    } catch (const std::bad_alloc &) {
        throw "Out of Memory";
    }
}

SgSharedMemory::~SgSharedMemory() {
    // A peer that keeps the lock past the wait limit cannot be counted on: every handle goes
    // without counting, and the segment lives on through the peer's own handles.
    if ((d->dataView.address || d->referenceView.address) && !detach() &&
        d->status == StatusLockFailed) {
        remove(kRemoveUnlocked);
        return;
    }
    // A destroyed object never keeps the semaphore taken.
    releaseAllLockLevels();
    // An object that holds no mapping (never created or attached, or removed) has no part in
    // the segment's lifetime: counting through attach(0) would only reopen handles to keep.
    if (!d->dataMapping && !d->referenceMapping) {
        Platform::closeHandle(d->lockHandle);
        return;
    }
    if (otherAttachments() <= 0) {
        remove(kRemoveUnlocked);
        return;
    }
    try {
        for (Platform::Handle handle : {d->dataMapping, d->referenceMapping, d->lockHandle}) {
            if (handle)
                keptHandles().keep(handle);
        }
    } catch (const std::bad_alloc &) {
        // Dropping the handles unrecorded keeps them open just the same.
    }
}

const std::string &SgSharedMemory::key() const {
    return d->key;
}
const std::string &SgSharedMemory::dataName() const {
    return d->dataName;
}
const std::string &SgSharedMemory::lockName() const {
    return d->lockName;
}
const std::string &SgSharedMemory::referenceName() const {
    return d->referenceName;
}

bool SgSharedMemory::segmentExists() const {
    // A mapping handle that this object holds keeps the segment in existence.
    if (d->dataMapping)
        return true;
    Platform::Handle test = Platform::openMapping(d->dataName, Platform::Access::Read);
    if (!test)
        return false;
    Platform::closeHandle(test);
    return true;
}

bool SgSharedMemory::exists() const {
    return segmentExists();
}

bool SgSharedMemory::isAttached() const {
    return d->dataView.address && segmentExists();
}

std::uint8_t *SgSharedMemory::data() const {
    return static_cast<std::uint8_t *>(d->dataView.address);
}

std::int32_t SgSharedMemory::size() const {
    return d->size;
}

std::int32_t SgSharedMemory::status() const {
    return d->status;
}

int SgSharedMemory::lockDepth() const {
    return d->lockDepth;
}

std::int32_t SgSharedMemory::attachCount() const {
    if (!d->referenceView.address)
        return -1;
    const std::uint32_t count = referenceField(d->referenceView, kAttachCountOffset).load();
    return static_cast<std::int32_t>(
        std::min<std::uint32_t>(count, std::numeric_limits<std::int32_t>::max()));
}

void SgSharedMemory::closeMappings() {
    // The reference record goes first: while the data object can still be seen the segment
    // counts as existing, so a peer that finds it gone can create the whole segment afresh.
    Platform::closeHandle(d->referenceMapping);
    Platform::closeHandle(d->dataMapping);
    d->dataMapping = nullptr;
    d->referenceMapping = nullptr;
}

bool SgSharedMemory::unmapViews() {
    bool unmapped = true;
    for (Platform::View *view : {&d->dataView, &d->referenceView}) {
        if (!view->address)
            continue;
        if (Platform::unmapView(*view))
            *view = {};
        else
            unmapped = false;
    }
    return unmapped;
}

bool SgSharedMemory::create(std::int32_t size) {
    // A segment is never left mapped behind closed handles: an attachment is undone first.
    if (d->dataView.address || d->referenceView.address)
        detach();
    unmapViews();
    closeMappings();
    d->dataView = {};
    d->referenceView = {};
    d->freshlyCreated = false;

    if (size <= 0) {
        d->status = StatusBadSize;
        return false;
    }
    if (d->key.empty()) {
        d->status = StatusEmptyKey;
        return false;
    }

    bool dataExisted = false;
    bool referenceExisted = false;
    d->dataMapping =
        Platform::createMapping(d->dataName, static_cast<std::uint32_t>(size), &dataExisted);
    const int dataError = Platform::lastError();
    d->referenceMapping =
        Platform::createMapping(d->referenceName, kReferenceRecordSize, &referenceExisted);
    const int referenceError = Platform::lastError();

    // An existing segment is refused rather than taken over: resetting its reference record
    // would lose the attachments of its other holders, and its data mapping keeps its old size.
    if (d->dataMapping && d->referenceMapping && !dataExisted && !referenceExisted) {
        const Platform::View reference =
            Platform::mapView(d->referenceMapping, Platform::Access::ReadWrite);
        if (reference.address && reference.length >= kReferenceRecordSize) {
            // A fresh mapping is zero-filled, so the attach count already reads 0; it is not
            // written, so that an attach racing with this create is not lost.
            referenceField(reference, kSizeOffset).store(static_cast<std::uint32_t>(size));
            Platform::unmapView(reference);
            d->size = size;
            d->mappingAccess = Platform::Access::ReadWrite;
            d->freshlyCreated = true;
            return true;
        }
        if (reference.address)
            Platform::unmapView(reference);
        d->status = StatusFailed;
        closeMappings();
        return false;
    }
    const bool existed = dataExisted || referenceExisted ||
                         (!d->dataMapping && dataError == Platform::kErrorAlreadyExists) ||
                         (!d->referenceMapping && referenceError == Platform::kErrorAlreadyExists);
    d->status = existed ? StatusAlreadyExists : StatusFailed;
    closeMappings();
    return false;
}

bool SgSharedMemory::openMappings(int mode) {
    const Platform::Access access =
        mode == kReadWrite ? Platform::Access::ReadWrite : Platform::Access::Read;
    const bool accessSuffices =
        access == Platform::Access::Read || d->mappingAccess == Platform::Access::ReadWrite;
    if (d->dataMapping && d->referenceMapping && accessSuffices)
        return true;
    closeMappings();
    d->dataMapping = Platform::openMapping(d->dataName, access);
    d->referenceMapping = Platform::openMapping(d->referenceName, Platform::Access::ReadWrite);
    if (d->dataMapping && d->referenceMapping) {
        d->mappingAccess = access;
        return true;
    }
    closeMappings();
    return false;
}

bool SgSharedMemory::attach(int mode) {
    if (d->dataView.address || d->referenceView.address)
        detach();
    if (!lock()) {
        d->status = StatusLockFailed;
        return false;
    }
    if (!openMappings(mode)) {
        d->status = StatusNotFound;
        unlock();
        return false;
    }
    const Platform::Access access =
        mode == kReadWrite ? Platform::Access::ReadWrite : Platform::Access::Read;
    d->dataView = Platform::mapView(d->dataMapping, access);
    d->referenceView = Platform::mapView(d->referenceMapping, Platform::Access::ReadWrite);
    if (!d->dataView.address || !d->referenceView.address ||
        d->referenceView.length < kReferenceRecordSize) {
        unmapViews();
        d->dataView = {};
        d->referenceView = {};
        d->status = StatusFailed;
        unlock();
        return false;
    }
    referenceField(d->referenceView, kAttachCountOffset).fetch_add(1);
    // The size comes from the other process: it never exceeds what the view maps.
    const std::uint64_t recorded = referenceField(d->referenceView, kSizeOffset).load();
    d->size = static_cast<std::int32_t>(std::min<std::uint64_t>(
        {recorded, d->dataView.length,
         static_cast<std::uint64_t>(std::numeric_limits<std::int32_t>::max())}));
    unlock();
    if (d->freshlyCreated && access == Platform::Access::ReadWrite)
        Platform::prepareForWriting(d->dataView);
    d->freshlyCreated = false;
    return true;
}

bool SgSharedMemory::detach() {
    if (!d->dataView.address || !d->referenceView.address) {
        d->status = StatusNotFound;
        return false;
    }
    if (!lock()) {
        d->status = StatusLockFailed;
        return false;
    }
    auto count = referenceField(d->referenceView, kAttachCountOffset);
    if (count.load() > 0)
        count.fetch_sub(1);
    if (!unmapViews()) {
        d->status = StatusFailed;
        unlock();
        return false;
    }
    unlock();
    return true;
}

bool SgSharedMemory::lockFor(std::uint32_t milliseconds) {
    if (!segmentExists()) {
        if (d->lockDepth > 0)
            unlock();
        return false;
    }
    if (d->lockDepth > 0) {
        ++d->lockDepth;
        return true;
    }
    if (!d->lockHandle) {
        d->lockHandle = Platform::createSemaphore(d->lockName);
        if (!d->lockHandle) {
            d->status = StatusLockFailed;
            return false;
        }
    }
    if (Platform::waitSemaphore(d->lockHandle, milliseconds) == Platform::WaitResult::Acquired) {
        d->lockDepth = 1;
        return true;
    }
    d->status = StatusLockFailed;
    return false;
}

void SgSharedMemory::setWaitLimit(int milliseconds) {
    d->waitLimit =
        milliseconds < 0 ? Platform::kInfinite : static_cast<std::uint32_t>(milliseconds);
}

bool SgSharedMemory::lock() {
    return lockFor(d->waitLimit);
}

bool SgSharedMemory::tryLock(int milliseconds) {
    return lockFor(static_cast<std::uint32_t>(std::max(0, milliseconds)));
}

void SgSharedMemory::unlock() {
    if (d->lockDepth > 1) {
        --d->lockDepth;
    } else if (d->lockDepth == 1) {
        Platform::releaseSemaphore(d->lockHandle);
        d->lockDepth = 0;
    }
}

void SgSharedMemory::releaseAllLockLevels() {
    if (d->lockDepth > 0) {
        d->lockDepth = 1;
        unlock();
    }
}

int SgSharedMemory::otherAttachments() {
    if (d->dataView.address && d->referenceView.address)
        return attachCount() - 1;
    if (!attach(kReadOnly))
        return -1;
    const int others = attachCount() - 1;
    detach();
    return others;
}

bool SgSharedMemory::remove(int mode) {
    if (mode == kRemoveWhenAlone) {
        if (!lock()) {
            d->status = StatusLockFailed;
            return false;
        }
        const auto deadline = std::chrono::steady_clock::now() + kRemoveWaitLimit;
        while (otherAttachments() > 0) {
            unlock();
            if (std::chrono::steady_clock::now() >= deadline) {
                d->status = StatusLockFailed;
                return false;
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(1));
            if (!lock()) {
                d->status = StatusLockFailed;
                return false;
            }
        }
    } else if (mode == kRemoveLocked) {
        if (!lock()) {
            d->status = StatusLockFailed;
            return false;
        }
    }
    const bool tookLock = mode == kRemoveWhenAlone || mode == kRemoveLocked;

    // An attachment still counted is uncounted while the lock is held.
    if (d->lockDepth > 0 && d->referenceView.address) {
        auto count = referenceField(d->referenceView, kAttachCountOffset);
        if (count.load() > 0)
            count.fetch_sub(1);
    }
    if (!unmapViews()) {
        d->status = StatusFailed;
        if (tookLock)
            unlock();
        return false;
    }
    // Every level still held is given back before the semaphore handle closes, so that a
    // waiting peer is not left waiting for a release that can no longer come.
    releaseAllLockLevels();
    Platform::closeHandle(d->lockHandle);
    d->lockHandle = nullptr;
    closeMappings();
    d->dataView = {};
    d->referenceView = {};
    d->lockDepth = 0;
    return true;
}
