// The second process of the segment tests: reads one command per line on stdin, runs it on its
// own SgSharedMemory object and answers one line on stdout: "<result> <status> [value...]".
#include "exchange/shm/sgsharedmemory.h"
#include "shmtestsupport.h"

#include <chrono>
#include <cstdint>
#include <iostream>
#include <memory>
#include <sstream>
#include <string>
#include <thread>

namespace {

std::unique_ptr<SgSharedMemory> segment;

// Every wait of the peer is bounded: a lock that nobody releases makes a command answer
// "failed" within seconds instead of leaving the test waiting for an answer.
constexpr int kWaitLimitMs = 3000;

// Adds one to the word at `offset` under the lock; false when the lock was not had.
bool incrementLocked(SgSharedMemory &memory, int offset) {
    if (!memory.lock())
        return false;
    writeWord(memory, offset, readWord(memory, offset) + 1);
    memory.unlock();
    return true;
}

// Attaches to, increments and leaves the segment `anchored` (which the test holds) and, in
// turn, creates or attaches, increments and removes the unanchored segment `loose`, for
// `milliseconds`. Answers the increments made on `anchored`, the failures seen on it and
// the cycles run on `loose`.
std::string churn(const std::string &anchored, const std::string &loose, int milliseconds) {
    long increments = 0;
    long failures = 0;
    long cycles = 0;
    const auto start = Clock::now();
    while (msSince(start) < milliseconds) {
        {
            SgSharedMemory memory(anchored);
            memory.setWaitLimit(kWaitLimitMs);
            if (memory.create(64) || memory.status() != SgSharedMemory::StatusAlreadyExists)
                ++failures;
            if (memory.attach(SgSharedMemory::kReadWrite) && incrementLocked(memory, 0))
                ++increments;
            else
                ++failures;
            if (!memory.detach() || !memory.remove(SgSharedMemory::kRemoveUnlocked))
                ++failures;
        }
        {
            SgSharedMemory memory(loose);
            memory.setWaitLimit(kWaitLimitMs);
            if (!memory.exists())
                memory.create(64);
            if (memory.attach(SgSharedMemory::kReadWrite)) {
                incrementLocked(memory, 0);
                memory.detach();
            }
            if (cycles % 2 == 0)
                memory.remove(SgSharedMemory::kRemoveLocked);
            ++cycles;
        }
    }
    std::ostringstream out;
    out << increments << ' ' << failures << ' ' << cycles;
    return out.str();
}

std::string answer(bool result, const std::string &extra = std::string()) {
    std::ostringstream out;
    out << (result ? 1 : 0) << ' ' << (segment ? segment->status() : -1);
    if (!extra.empty())
        out << ' ' << extra;
    return out.str();
}

std::string run(const std::string &line) {
    std::istringstream in(line);
    std::string command;
    in >> command;
    long a = 0;
    long b = 0;
    if (command == "open") {
        std::string key;
        in >> key;
        segment = std::make_unique<SgSharedMemory>(key);
        segment->setWaitLimit(kWaitLimitMs);
        return answer(true);
    }
    if (command == "churn") {
        std::string anchored;
        std::string loose;
        in >> anchored >> loose >> a;
        return "1 0 " + churn(anchored, loose, static_cast<int>(a));
    }
    in >> a >> b; // the numbers a command takes, if any
    if (command == "sleep") {
        std::this_thread::sleep_for(std::chrono::milliseconds(a));
        return "1 0";
    }
    if (!segment)
        return "0 -1 no segment";
    SgSharedMemory &memory = *segment;
    if (command == "create")
        return answer(memory.create(static_cast<std::int32_t>(a)));
    if (command == "attach")
        return answer(memory.attach(static_cast<int>(a)));
    if (command == "detach")
        return answer(memory.detach());
    if (command == "lock")
        return answer(memory.lock());
    if (command == "trylock") {
        const auto start = Clock::now();
        const bool locked = memory.tryLock(static_cast<int>(a));
        return answer(locked, std::to_string(msSince(start)));
    }
    if (command == "unlock") {
        memory.unlock();
        return answer(true);
    }
    if (command == "count")
        return answer(true, std::to_string(memory.attachCount()));
    if (command == "write" || command == "read") {
        if (!memory.data() || a < 0 || a + 4 > memory.size())
            return "0 -1 out of range";
        if (command == "read")
            return answer(true, std::to_string(readWord(memory, static_cast<int>(a))));
        writeWord(memory, static_cast<int>(a), static_cast<std::uint32_t>(b));
        return answer(true);
    }
    if (command == "destroy") {
        segment.reset();
        return "1 0";
    }
    return "0 -1 unknown command";
}

} // namespace

int main() {
    std::string line;
    while (std::getline(std::cin, line)) {
        if (line == "quit")
            break;
        std::cout << run(line) << std::endl;
    }
    segment.reset();
    return 0;
}
