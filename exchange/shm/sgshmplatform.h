#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

// The kernel calls beneath SgSharedMemory: named memory mappings, views of them, and a named
// semaphore with a maximum count of 1 used as a cross-process mutex. Each call mirrors one
// Windows call; the Win32 back-end makes exactly that call, the POSIX back-end gives the same
// observable behaviour with shm objects and open-file-description locks, except where a
// holder dies:
// - a named object exists while any handle to it is open in any process; it vanishes when the
//   last handle closes (a process that dies closes its handles);
// - a lock held by a process that dies: the POSIX back-end releases it; a Windows semaphore
//   stays taken until every handle to it is closed, so that waits on it must be bounded
//   (SgSharedMemory::setWaitLimit);
// - objects are private to the user (mode 0600, names carry the user id).
// Handles are opaque and null when invalid. None of the calls throws.
class SgShmPlatform {
public:
    using Handle = void *;

    // Access of a mapping handle or a view.
    enum class Access { Read, ReadWrite };

    // Result of waiting on a semaphore.
    enum class WaitResult { Acquired, TimedOut, Failed };

    // The wait time that never ends.
    static constexpr std::uint32_t kInfinite = 0xFFFFFFFFu;
    // The error code of a create that found an object of the name (Windows' own value).
    static constexpr int kErrorAlreadyExists = 183;

    // A mapped view: its address and the number of bytes that may be accessed from it.
    struct View {
        void *address = nullptr;
        std::size_t length = 0;
    };

    // Creates the mapping `name` of `size` bytes (zero-filled), or opens the one that exists;
    // sets `*alreadyExisted` accordingly. Returns null on failure (see lastError()).
    static Handle createMapping(const std::string &name, std::uint32_t size, bool *alreadyExisted);

    // Opens the existing mapping `name` with `access`; null when none exists or on failure.
    static Handle openMapping(const std::string &name, Access access);

    // Maps the whole mapping behind `mapping` with `access`; an empty View on failure. A view
    // must be unmapped before its mapping handle is closed.
    static View mapView(Handle mapping, Access access);

    // Unmaps a view returned by mapView; false on failure.
    static bool unmapView(const View &view);

    // Makes every page of a writable view present before the writer fills it, in one call
    // instead of one fault per page; a hint that may do nothing.
    static void prepareForWriting(const View &view);

    // Creates the semaphore `name` (initial count 1, maximum 1) or opens the one that exists.
    static Handle createSemaphore(const std::string &name);

    // Waits up to `milliseconds` (kInfinite: no limit) to take the semaphore.
    static WaitResult waitSemaphore(Handle semaphore, std::uint32_t milliseconds);

    // Gives the semaphore back; false on failure.
    static bool releaseSemaphore(Handle semaphore);

    // Closes any handle returned above; false on failure. Closing a null handle does nothing.
    static bool closeHandle(Handle handle);

    // The error code of the calling thread's last failed call (kErrorAlreadyExists after a
    // create that found an existing object).
    static int lastError();

    // The name under which the kernel keeps the object `name` ("/name-u<uid>" on POSIX, where
    // /dev/shm shows it without the slash, with "-<space>" appended when the environment
    // variable SG_SHM_TEST_NAMESPACE is set to a space for tests; `name` itself on Windows).
    static std::string nativeName(const std::string &name);
};
