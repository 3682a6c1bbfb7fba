#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

// One named shared-memory segment shared with another process: a data mapping of a chosen
// size, an 8-byte reference record (attach count, size) and a named semaphore with a maximum
// count of 1 that serialises access across processes. Both processes derive the same three
// kernel object names from the same key, so either side may create, attach, lock and tear
// down. An object is used from one thread only; it is not copyable.
//
// Every operation reports failure by returning false and leaves a status code (status()); a
// successful operation leaves the status as it was. The status serves diagnosis only.
class SgSharedMemory {
public:
    // Status codes.
    enum Status : std::int32_t {
        StatusBadSize = 0,       // create was asked for a size of 0 or less
        StatusEmptyKey = 1,      // create was called with an empty key
        StatusAlreadyExists = 2, // create found the segment existing (ERROR_ALREADY_EXISTS)
        StatusNotFound = 5,      // attach could not open a mapping; detach while detached
        StatusLockFailed = 7,    // the lock was not obtained
        StatusFailed = 8,        // the initial value; any other kernel failure
    };

    // Attach modes.
    static constexpr int kReadOnly = 0;
    static constexpr int kReadWrite = 1;

    // Remove modes.
    static constexpr int kRemoveLocked = 0;    // lock, then tear down
    static constexpr int kRemoveUnlocked = 1;  // tear down without locking
    static constexpr int kRemoveWhenAlone = 2; // wait until no other process is attached

    // Remembers `key` (8-bit bytes) and derives the three names; creates and opens nothing.
    // Status starts at StatusFailed. Throws the text "Out of Memory" when the state cannot be
    // allocated.
    explicit SgSharedMemory(std::string_view key);

    // Detaches; then, when no other attachment remains (or their number cannot be learnt),
    // closes every handle so that the segment vanishes unless another process holds it. When
    // other processes are still attached, this process keeps its handles open until it ends,
    // so the segment outlives the object. An object that holds no mapping closes what it has
    // and counts nothing. When detaching fails because a peer keeps the lock past the wait
    // limit, every handle is closed without counting.
    ~SgSharedMemory();

    SgSharedMemory(const SgSharedMemory &) = delete;
    SgSharedMemory &operator=(const SgSharedMemory &) = delete;

    // The key and the names derived from it: "sgsharedmemory-" followed by two lower-case
    // hexadecimal digits per key byte; the lock name adds "-lock", the reference name "-ref".
    const std::string &key() const;
    const std::string &dataName() const;
    const std::string &lockName() const;
    const std::string &referenceName() const;

    // Whether the data mapping exists in any process. Opens and closes a test handle unless
    // this object holds the mapping open. A few system calls.
    bool exists() const;

    // Whether the segment exists and this object has it mapped.
    bool isAttached() const;

    // The mapped data segment; null when detached. Read-only unless attached with kReadWrite.
    std::uint8_t *data() const;

    // Number of bytes that may be accessed through data(): the size in the reference record,
    // bounded by the extent of the mapped view. Valid after create or attach; 0 before.
    std::int32_t size() const;

    // The last status code (see Status).
    std::int32_t status() const;

    // Creates the segment with `size` data bytes and a fresh reference record (attach count
    // 0, size). Does not attach. Fails with StatusBadSize, StatusEmptyKey, StatusAlreadyExists
    // when a segment of the name exists (it is left untouched), or StatusFailed. Detaches and
    // closes this object's mappings first.
    bool create(std::int32_t size);

    // Locks, opens the mappings if needed, maps them (read-write for kReadWrite, read-only
    // otherwise), counts the attachment in the reference record and unlocks. Fails with
    // StatusLockFailed (also when the segment does not exist), StatusNotFound or StatusFailed.
    // Attaching an attached object detaches it first. Waits for the lock without a limit.
    bool attach(int mode);

    // Locks, uncounts the attachment, unmaps both views and unlocks; the mappings stay open.
    // Fails with StatusNotFound when not attached, StatusLockFailed or StatusFailed.
    bool detach();

    // Bounds every wait for the lock that this object makes without a time of its own (lock,
    // and so attach, detach, remove and destruction) to `milliseconds`; negative restores the
    // wait without a limit (the default). A peer that holds the lock for longer makes these
    // calls fail with StatusLockFailed; remove(kRemoveUnlocked) then still lets go of every
    // handle. On Windows a semaphore held by a process that died stays taken for good, so a
    // caller that must never hang sets a bound.
    void setWaitLimit(int milliseconds);

    // Takes the segment's lock, waiting without a limit (or the wait limit). Nested calls on one
    // object only deepen the lock. Fails (without StatusLockFailed, and giving up one held level)
    // when the segment does not exist; fails with StatusLockFailed when the semaphore cannot be
    // had. Cost: one system call when uncontended and this object holds the mapping open (created
    // or attached); a handful more otherwise, for the existence test.
    bool lock();

    // As lock(), waiting at most `milliseconds` (negative counts as 0).
    bool tryLock(int milliseconds);

    // Gives up one lock level; the semaphore is released when the last level goes.
    void unlock();

    // The number of lock levels this object holds.
    int lockDepth() const;

    // Tears the segment down in this object: unmaps the views and closes every handle, after
    // which the object may create or attach again. kRemoveLocked locks first (StatusLockFailed
    // when it cannot); kRemoveUnlocked does not lock; kRemoveWhenAlone waits until no other
    // process is attached (bounded, see the implementation). An attachment of this object
    // still counted is uncounted when the lock is held. Releases any lock level still held.
    bool remove(int mode);

    // The attach count in the reference record as seen through this object's view; -1 when
    // detached. Read without the lock.
    std::int32_t attachCount() const;

private:
    struct State;

    bool lockFor(std::uint32_t milliseconds);
    bool segmentExists() const;
    bool openMappings(int mode);
    void closeMappings();
    bool unmapViews();
    int otherAttachments();
    void releaseAllLockLevels();

    std::unique_ptr<State> d;
};
