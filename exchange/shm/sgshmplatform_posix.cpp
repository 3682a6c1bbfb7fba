// POSIX back-end of the segment's kernel calls: one shm object per name (mode 0600, name
// suffixed with the user id), with open-file-description (OFD) locks on single bytes:
// - byte 0, shared: held by every open handle. The kernel drops it when a holder dies, so
//   "no lock on byte 0" means "no live holder" and the name may be cleaned up.
// - byte 8, exclusive and blocking: the gate under which handles are opened and closed, so
//   that create-and-size, existence and unlink-on-last-close are atomic.
// - byte 16, exclusive: the mutex of a semaphore object. A dead holder releases it at once.
// OFD locks belong to an open file description, not to a process: two handles in one process
// contend like two semaphore waiters, and descriptors are close-on-exec so that a started
// program never shares them.
#include "exchange/shm/sgshmplatform.h"

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <new>
#include <system_error>
#include <thread>

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

namespace {

thread_local int t_lastError = 0;

// Views from this size on are mapped and unmapped with a second thread's help, unless
// SG_SHM_ONE_THREAD is set (for measuring the work on one core).
constexpr std::size_t kBigViewBytes = std::size_t(8) << 20;

bool helperThreads() {
    static const bool allowed = std::getenv("SG_SHM_ONE_THREAD") == nullptr;
    return allowed;
}

constexpr off_t kLifetimeByte = 0;
constexpr off_t kGateByte = 8;
constexpr off_t kMutexByte = 16;

// How often an open retries a name that was unlinked under it before giving up.
constexpr int kOpenAttempts = 1000;

struct PosixHandle {
    int fd = -1;
    SgShmPlatform::Access access = SgShmPlatform::Access::ReadWrite;
    std::string nativeName;
};

PosixHandle *toPosix(SgShmPlatform::Handle handle) {
    return static_cast<PosixHandle *>(handle);
}

int fail(int error) {
    t_lastError = error;
    return -1;
}

// Sets (F_RDLCK, F_WRLCK) or clears (F_UNLCK) an OFD lock on one byte of `fd`.
bool lockByte(int fd, short type, off_t byte, bool wait) {
    struct flock request = {};
    request.l_type = type;
    request.l_whence = SEEK_SET;
    request.l_start = byte;
    request.l_len = 1;
    for (;;) {
        if (fcntl(fd, wait ? F_OFD_SETLKW : F_OFD_SETLK, &request) == 0)
            return true;
        if (errno != EINTR)
            return false;
    }
}

void closeKeepingError(int fd) {
    const int saved = errno;
    ::close(fd);
    errno = saved;
}

// Opens the object `name` and takes its shared lifetime lock, all under the gate. With
// `create`, a missing object is created with `createSize` bytes and `*created` is set; a
// leftover of dead holders that already has a size is unlinked and created afresh, so that no
// stale view of it can ever be truncated. Without `create`, a leftover is unlinked and the
// open fails with ENOENT. Objects not owned by this user or open to others are refused.
int openObject(const std::string &name, bool create, off_t createSize, bool *created) {
    *created = false;
    for (int attempt = 0; attempt < kOpenAttempts; ++attempt) {
        const int fd = shm_open(name.c_str(), O_RDWR | O_CLOEXEC | (create ? O_CREAT : 0), 0600);
        if (fd < 0)
            return fail(errno);
        if (!lockByte(fd, F_WRLCK, kGateByte, true)) {
            closeKeepingError(fd);
            return fail(errno);
        }
        struct stat info = {};
        if (fstat(fd, &info) != 0) {
            closeKeepingError(fd);
            return fail(errno);
        }
        if (info.st_nlink == 0) { // unlinked by its last holder while we waited for the gate
            ::close(fd);
            continue;
        }
        if (info.st_uid != geteuid() || (info.st_mode & 077) != 0) {
            ::close(fd);
            return fail(EACCES);
        }
        if (lockByte(fd, F_WRLCK, kLifetimeByte, false)) { // no live holder
            if (!create || info.st_size != 0) {
                shm_unlink(name.c_str());
                ::close(fd);
                if (!create)
                    return fail(ENOENT);
                continue;
            }
            // The pages are allocated now, in one call: a full /dev/shm fails the create
            // here instead of killing the writer with SIGBUS halfway through the record.
            const int error = createSize <= 0                  ? 0
                              : ftruncate(fd, createSize) != 0 ? errno
                                                               : posix_fallocate(fd, 0, createSize);
            if (error != 0) {
                shm_unlink(name.c_str());
                ::close(fd);
                return fail(error);
            }
            *created = true;
        }
        if (!lockByte(fd, F_RDLCK, kLifetimeByte, false)) {
            closeKeepingError(fd);
            return fail(errno);
        }
        lockByte(fd, F_UNLCK, kGateByte, false);
        return fd;
    }
    return fail(EAGAIN);
}

SgShmPlatform::Handle makeHandle(int fd, SgShmPlatform::Access access, const std::string &name) {
    auto *handle = new (std::nothrow) PosixHandle{fd, access, name};
    if (!handle) {
        // Closing without the gate leaves at worst a leftover that the next open cleans up.
        ::close(fd);
        fail(ENOMEM);
    }
    return handle;
}

} // namespace

SgShmPlatform::Handle SgShmPlatform::createMapping(const std::string &name, std::uint32_t size,
                                                   bool *alreadyExisted) {
    const std::string native = nativeName(name);
    bool created = false;
    const int fd = openObject(native, true, static_cast<off_t>(size), &created);
    if (alreadyExisted)
        *alreadyExisted = fd >= 0 && !created;
    if (fd < 0)
        return nullptr;
    if (!created)
        t_lastError = kErrorAlreadyExists;
    return makeHandle(fd, Access::ReadWrite, native);
}

SgShmPlatform::Handle SgShmPlatform::openMapping(const std::string &name, Access access) {
    const std::string native = nativeName(name);
    bool created = false;
    const int fd = openObject(native, false, 0, &created);
    if (fd < 0)
        return nullptr;
    return makeHandle(fd, access, native);
}

SgShmPlatform::View SgShmPlatform::mapView(Handle mapping, Access access) {
    PosixHandle *handle = toPosix(mapping);
    if (!handle || (access == Access::ReadWrite && handle->access != Access::ReadWrite)) {
        t_lastError = EACCES;
        return {};
    }
    struct stat info = {};
    if (fstat(handle->fd, &info) != 0) {
        t_lastError = errno;
        return {};
    }
    if (info.st_size <= 0) {
        t_lastError = EINVAL;
        return {};
    }
    const int protection = access == Access::ReadWrite ? PROT_READ | PROT_WRITE : PROT_READ;
    const auto length = static_cast<std::size_t>(info.st_size);
    void *address = mmap(nullptr, length, protection, MAP_SHARED, handle->fd, 0);
    if (address == MAP_FAILED) {
        t_lastError = errno;
        return {};
    }
    // Unmapping a view marks each page it touched as recently used, moving the segment's pages
    // between the kernel's page lists one by one, unless the view says its reads follow no
    // order: a segment is read once and let go, so that bookkeeping is pure cost (about a
    // third of the unmapping). A hint; a kernel without it unmaps as before.
    madvise(address, length, MADV_RANDOM);
    return {address, length};
}

void SgShmPlatform::prepareForWriting(const View &view) {
#if defined(MADV_POPULATE_WRITE)
    // Maps the pages writable in one pass; a fault per page costs several times more. A big
    // view is mapped in two halves at once, the second on a thread of its own, so that a
    // second core halves the wait; without one it takes as long as one pass.
    if (!view.address)
        return;
    auto *first = static_cast<unsigned char *>(view.address);
    const std::size_t page = std::size_t(sysconf(_SC_PAGESIZE));
    const std::size_t half = view.length / 2 / page * page;
    std::thread second;
    if (view.length >= kBigViewBytes && helperThreads()) {
        try {
            second = std::thread(
                [=] { madvise(first + half, view.length - half, MADV_POPULATE_WRITE); });
        } catch (const std::system_error &) {
            // No thread to be had: the first pass maps it all.
        }
    }
    madvise(first, second.joinable() ? half : view.length, MADV_POPULATE_WRITE);
    if (second.joinable())
        second.join();
#else
    (void)view;
#endif
}

bool SgShmPlatform::unmapView(const View &view) {
    // A big view's page tables take milliseconds to tear down, and its pages to free when the
    // view is their last hold: that goes to a thread of its own, so that the caller's thread
    // goes on. Nothing uses the range after this call, and the kernel hands it out again only
    // once it is unmapped.
    if (view.address && view.length >= kBigViewBytes && helperThreads()) {
        try {
            std::thread([view] { munmap(view.address, view.length); }).detach();
            return true;
        } catch (const std::system_error &) {
            // No thread to be had: unmapped here.
        }
    }
    if (!view.address || munmap(view.address, view.length) != 0) {
        t_lastError = view.address ? errno : EINVAL;
        return false;
    }
    return true;
}

SgShmPlatform::Handle SgShmPlatform::createSemaphore(const std::string &name) {
    const std::string native = nativeName(name);
    bool created = false;
    const int fd = openObject(native, true, 0, &created);
    if (fd < 0)
        return nullptr;
    return makeHandle(fd, Access::ReadWrite, native);
}

SgShmPlatform::WaitResult SgShmPlatform::waitSemaphore(Handle semaphore,
                                                       std::uint32_t milliseconds) {
    PosixHandle *handle = toPosix(semaphore);
    if (!handle) {
        t_lastError = EINVAL;
        return WaitResult::Failed;
    }
    if (milliseconds == kInfinite) {
        if (lockByte(handle->fd, F_WRLCK, kMutexByte, true))
            return WaitResult::Acquired;
        t_lastError = errno;
        return WaitResult::Failed;
    }
    // A timed wait polls, sleeping 1 ms between tries: an OFD lock has no timed wait.
    using Clock = std::chrono::steady_clock;
    const auto deadline = Clock::now() + std::chrono::milliseconds(milliseconds);
    for (;;) {
        if (lockByte(handle->fd, F_WRLCK, kMutexByte, false))
            return WaitResult::Acquired;
        if (errno != EAGAIN && errno != EACCES) {
            t_lastError = errno;
            return WaitResult::Failed;
        }
        const auto now = Clock::now();
        if (now >= deadline)
            return WaitResult::TimedOut;
        std::this_thread::sleep_for(
            std::min<Clock::duration>(deadline - now, std::chrono::milliseconds(1)));
    }
}

bool SgShmPlatform::releaseSemaphore(Handle semaphore) {
    PosixHandle *handle = toPosix(semaphore);
    if (!handle || !lockByte(handle->fd, F_UNLCK, kMutexByte, false)) {
        t_lastError = handle ? errno : EINVAL;
        return false;
    }
    return true;
}

bool SgShmPlatform::closeHandle(Handle handle) {
    PosixHandle *posix = toPosix(handle);
    if (!posix)
        return true;
    // The last holder unlinks the name: it alone can turn its shared lifetime lock exclusive.
    if (lockByte(posix->fd, F_WRLCK, kGateByte, true) &&
        lockByte(posix->fd, F_WRLCK, kLifetimeByte, false))
        shm_unlink(posix->nativeName.c_str());
    const bool closed = ::close(posix->fd) == 0;
    if (!closed)
        t_lastError = errno;
    delete posix;
    return closed;
}

int SgShmPlatform::lastError() {
    return t_lastError;
}

std::string SgShmPlatform::nativeName(const std::string &name) {
    // Tests that run from several build folders at once keep apart through a namespace of
    // their own (the product never sets it); a child process inherits it.
    static const std::string space = [] {
        const char *value = std::getenv("SG_SHM_TEST_NAMESPACE");
        return value && *value ? std::string("-") + value : std::string();
    }();
    return "/" + name + "-u" + std::to_string(geteuid()) + space;
}
