#pragma once

// A test's own view of a shared-memory segment (header only, and free of Qt, so that the
// segment tests of every back-end use it): each of its waits gives up after three seconds, so
// that a lock that is never released fails the test at once instead of hanging it.

#include "exchange/shm/sgsharedmemory.h"

#include <string>

class SgTestSegment : public SgSharedMemory {
public:
    explicit SgTestSegment(const std::string &key) : SgSharedMemory(key) { setWaitLimit(3000); }
};

// What a failed lock of such a segment means.
inline constexpr char kSgTestStuckLock[] =
    "the segment's lock stayed taken for 3 s: its holder never released it";
