// Win32 back-end of the segment's kernel calls: each call is the Windows call of the same
// meaning, with the access flags, sizes and names that the modeler uses on its side.
#include "exchange/shm/sgshmplatform.h"

#include <windows.h>

namespace {

DWORD mapAccess(SgShmPlatform::Access access) {
    return access == SgShmPlatform::Access::ReadWrite ? FILE_MAP_ALL_ACCESS : FILE_MAP_READ;
}

} // namespace

static_assert(FILE_MAP_ALL_ACCESS == 0xF001F && FILE_MAP_READ == 4);
static_assert(ERROR_ALREADY_EXISTS == SgShmPlatform::kErrorAlreadyExists);
static_assert(INFINITE == SgShmPlatform::kInfinite);

SgShmPlatform::Handle SgShmPlatform::createMapping(const std::string &name, std::uint32_t size,
                                                   bool *alreadyExisted) {
    HANDLE mapping =
        CreateFileMappingA(INVALID_HANDLE_VALUE, nullptr, PAGE_READWRITE, 0, size, name.c_str());
    const DWORD error = GetLastError();
    if (alreadyExisted)
        *alreadyExisted = mapping && error == ERROR_ALREADY_EXISTS;
    return mapping;
}

SgShmPlatform::Handle SgShmPlatform::openMapping(const std::string &name, Access access) {
    return OpenFileMappingA(mapAccess(access), FALSE, name.c_str());
}

SgShmPlatform::View SgShmPlatform::mapView(Handle mapping, Access access) {
    void *address = MapViewOfFile(mapping, mapAccess(access), 0, 0, 0);
    if (!address)
        return {};
    // The view's extent bounds every access through it (a peer's size field is not trusted).
    MEMORY_BASIC_INFORMATION region = {};
    if (VirtualQuery(address, &region, sizeof region) == 0) {
        UnmapViewOfFile(address);
        return {};
    }
    return {address, region.RegionSize};
}

bool SgShmPlatform::unmapView(const View &view) {
    return UnmapViewOfFile(view.address) != 0;
}

void SgShmPlatform::prepareForWriting(const View &) {}

SgShmPlatform::Handle SgShmPlatform::createSemaphore(const std::string &name) {
    return CreateSemaphoreA(nullptr, 1, 1, name.c_str());
}

SgShmPlatform::WaitResult SgShmPlatform::waitSemaphore(Handle semaphore,
                                                       std::uint32_t milliseconds) {
    switch (WaitForSingleObject(semaphore, milliseconds)) {
    case WAIT_OBJECT_0:
        return WaitResult::Acquired;
    case WAIT_TIMEOUT:
        return WaitResult::TimedOut;
    default:
        return WaitResult::Failed;
    }
}

bool SgShmPlatform::releaseSemaphore(Handle semaphore) {
    return ReleaseSemaphore(semaphore, 1, nullptr) != 0;
}

bool SgShmPlatform::closeHandle(Handle handle) {
    return !handle || CloseHandle(handle) != 0;
}

int SgShmPlatform::lastError() {
    return static_cast<int>(GetLastError());
}

std::string SgShmPlatform::nativeName(const std::string &name) {
    return name;
}
