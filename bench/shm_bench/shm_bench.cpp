// Measures the segment's uncontended lock and a 16-byte control message round trip between two
// processes (both spinning on tryLock), with a std::mutex and a pipe round trip between the
// same two processes as baselines in the same run. Prints the ratios at the end.
//
// Run: build/bench/shm_bench/shm_bench
#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"

#include "bench/support/sgbenchreport.h"

#include <benchmark/benchmark.h>

#include <climits>
#include <cstdio>
#include <cstring>
#include <mutex>
#include <string>
#include <thread>

#include <csignal>
#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

extern char **environ;

namespace {

std::string selfPath() {
    char path[PATH_MAX] = {};
    const ssize_t length = readlink("/proc/self/exe", path, sizeof path - 1);
    return std::string(path, length > 0 ? static_cast<size_t>(length) : 0);
}

// Starts this program again with `mode` and `argument`; with `pipes`, the child's stdin and
// stdout are connected to *toChild and *fromChild.
pid_t startPeer(const char *mode, const std::string &argument, int *toChild, int *fromChild) {
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    int in[2] = {-1, -1};
    int out[2] = {-1, -1};
    if (toChild && fromChild) {
        if (pipe2(in, O_CLOEXEC) != 0 || pipe2(out, O_CLOEXEC) != 0)
            return -1;
        posix_spawn_file_actions_adddup2(&actions, in[0], STDIN_FILENO);
        posix_spawn_file_actions_adddup2(&actions, out[1], STDOUT_FILENO);
    }
    const std::string program = selfPath();
    char *argv[] = {const_cast<char *>(program.c_str()), const_cast<char *>(mode),
                    const_cast<char *>(argument.c_str()), nullptr};
    pid_t pid = -1;
    if (posix_spawn(&pid, program.c_str(), &actions, nullptr, argv, environ) != 0)
        pid = -1;
    posix_spawn_file_actions_destroy(&actions);
    if (toChild && fromChild) {
        close(in[0]);
        close(out[1]);
        *toChild = in[1];
        *fromChild = out[0];
    }
    return pid;
}

void stopPeer(pid_t pid) {
    if (pid <= 0)
        return;
    kill(pid, SIGKILL);
    waitpid(pid, nullptr, 0);
}

SgControlRecord *controlRecord(SgSharedMemory &memory) {
    return reinterpret_cast<SgControlRecord *>(memory.data());
}

// Host side: waits for the host-to-modeler slot to be free and posts `code` there.
void postToModeler(SgSharedMemory &memory, SgHostMessage code, std::int32_t parameter) {
    for (;;) {
        if (memory.tryLock(0)) {
            SgControlRecord *record = controlRecord(memory);
            if (record->toModelerFlag == 1) {
                record->toModelerCode = sgCodeByte(code);
                record->toModelerParameter = parameter;
                record->toModelerFlag = 0;
                memory.unlock();
                return;
            }
            memory.unlock();
        }
        std::this_thread::yield();
    }
}

// Host side: waits for a modeler-to-host message and takes it.
std::int32_t takeFromModeler(SgSharedMemory &memory) {
    for (;;) {
        if (memory.tryLock(0)) {
            SgControlRecord *record = controlRecord(memory);
            if (record->toHostFlag == 0) {
                const std::int32_t parameter = record->toHostParameter;
                record->toHostFlag = 1;
                memory.unlock();
                return parameter;
            }
            memory.unlock();
        }
        std::this_thread::yield();
    }
}

// Modeler side of the round trip: answers each host message with a message carrying the same
// parameter, until the host posts "shutting down" or goes away.
int echoThroughSegment(const std::string &key) {
    SgSharedMemory memory(key);
    if (!memory.attach(SgSharedMemory::kReadWrite))
        return 1;
    const pid_t parent = getppid();
    long idle = 0;
    for (;;) {
        if (memory.tryLock(0)) {
            SgControlRecord *record = controlRecord(memory);
            if (record->toModelerFlag == 0 && record->toHostFlag == 1) {
                const std::uint8_t code = record->toModelerCode;
                record->toHostParameter = record->toModelerParameter;
                record->toHostCode = sgCodeByte(SgModelerMessage::NodeRead);
                record->toModelerFlag = 1;
                record->toHostFlag = 0;
                memory.unlock();
                if (code == sgCodeByte(SgHostMessage::ShuttingDown))
                    return 0;
                idle = 0;
                continue;
            }
            memory.unlock();
        }
        if (++idle % 100000 == 0 && getppid() != parent)
            return 0;
        std::this_thread::yield();
    }
}

int echoThroughPipe() {
    char message[16];
    for (;;) {
        size_t got = 0;
        while (got < sizeof message) {
            const ssize_t n = read(STDIN_FILENO, message + got, sizeof message - got);
            if (n <= 0)
                return 0;
            got += static_cast<size_t>(n);
        }
        if (write(STDOUT_FILENO, message, sizeof message) != static_cast<ssize_t>(sizeof message))
            return 1;
    }
}

std::string benchKey(const char *what) {
    return std::string("shmbench-") + what + "-" + std::to_string(getpid());
}

void BM_SegmentLockUnlock(benchmark::State &state) {
    SgSharedMemory memory(benchKey("lock"));
    if (!memory.create(16) || !memory.attach(SgSharedMemory::kReadWrite)) {
        state.SkipWithError("cannot create the segment");
        return;
    }
    for (auto _ : state) {
        memory.lock();
        memory.unlock();
    }
}
BENCHMARK(BM_SegmentLockUnlock)->Repetitions(5);

void BM_StdMutexLockUnlock(benchmark::State &state) {
    std::mutex mutex;
    for (auto _ : state) {
        mutex.lock();
        benchmark::DoNotOptimize(&mutex);
        mutex.unlock();
    }
}
BENCHMARK(BM_StdMutexLockUnlock)->Repetitions(5);

void BM_ControlRoundTripSegment(benchmark::State &state) {
    SgSharedMemory memory(benchKey("control"));
    if (!memory.create(static_cast<std::int32_t>(sizeof(SgControlRecord))) ||
        !memory.attach(SgSharedMemory::kReadWrite)) {
        state.SkipWithError("cannot create the control segment");
        return;
    }
    const SgControlRecord fresh = SgControlRecord::fresh();
    std::memcpy(memory.data(), &fresh, sizeof fresh);
    const pid_t peer = startPeer("--echo-segment", memory.key(), nullptr, nullptr);
    std::int32_t sequence = 0;
    for (auto _ : state) {
        postToModeler(memory, SgHostMessage::NodeWritten, ++sequence);
        if (takeFromModeler(memory) != sequence) {
            state.SkipWithError("wrong answer");
            break;
        }
    }
    postToModeler(memory, SgHostMessage::ShuttingDown, 0);
    takeFromModeler(memory);
    waitpid(peer, nullptr, 0);
}
BENCHMARK(BM_ControlRoundTripSegment)->UseRealTime()->Repetitions(5);

void BM_ControlRoundTripPipe(benchmark::State &state) {
    int toPeer = -1;
    int fromPeer = -1;
    const pid_t peer = startPeer("--echo-pipe", "", &toPeer, &fromPeer);
    char message[16] = {};
    for (auto _ : state) {
        if (write(toPeer, message, sizeof message) != static_cast<ssize_t>(sizeof message)) {
            state.SkipWithError("pipe write failed");
            break;
        }
        size_t got = 0;
        while (got < sizeof message) {
            const ssize_t n = read(fromPeer, message + got, sizeof message - got);
            if (n <= 0)
                break;
            got += static_cast<size_t>(n);
        }
        ++message[0];
    }
    close(toPeer);
    close(fromPeer);
    stopPeer(peer);
}
BENCHMARK(BM_ControlRoundTripPipe)->UseRealTime()->Repetitions(5);

} // namespace

int main(int argc, char **argv) {
    if (argc == 3 && std::strcmp(argv[1], "--echo-segment") == 0)
        return echoThroughSegment(argv[2]);
    if (argc >= 2 && std::strcmp(argv[1], "--echo-pipe") == 0)
        return echoThroughPipe();
    sgBenchInitialize(argc, argv);
    SgBenchReporter reporter(SgBenchReporter::RealTime);
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    std::printf("\nRatios of the medians of real time (same run):\n");
    sgPrintRatio("segment lock+unlock / std::mutex", reporter.median("BM_SegmentLockUnlock"),
                 reporter.median("BM_StdMutexLockUnlock"));
    sgPrintRatio("control round trip, segment / pipe",
                 reporter.median("BM_ControlRoundTripSegment"),
                 reporter.median("BM_ControlRoundTripPipe"));
    return 0;
}
