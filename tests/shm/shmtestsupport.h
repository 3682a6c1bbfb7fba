#pragma once

#include "tests/support/sgtestsegment.h"

#include <chrono>
#include <cstdint>
#include <cstring>
#include <string>

#ifdef _WIN32
#include <process.h>
#define SG_TEST_PID _getpid()
#else
#include <unistd.h>
#define SG_TEST_PID getpid()
#endif

// A key that no other test or test run uses: "shmtest-<what>-<pid>-<n>".
inline std::string uniqueKey(const std::string &what) {
    static int serial = 0;
    return "shmtest-" + what + "-" + std::to_string(SG_TEST_PID) + "-" + std::to_string(++serial);
}

using Clock = std::chrono::steady_clock;

// Milliseconds since `start`.
inline long long msSince(Clock::time_point start) {
    return std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start).count();
}

// The 32-bit word at `offset` of an attached segment, read and written in place.
inline std::uint32_t readWord(const SgSharedMemory &memory, int offset) {
    std::uint32_t value = 0;
    std::memcpy(&value, memory.data() + offset, sizeof value);
    return value;
}
inline void writeWord(SgSharedMemory &memory, int offset, std::uint32_t value) {
    std::memcpy(memory.data() + offset, &value, sizeof value);
}
