// POSIX back-end: robustness against killed peers, privacy of the objects, and many processes
// creating, attaching and removing one key at once.
#include "exchange/shm/sgsharedmemory.h"
#include "exchange/shm/sgshmplatform.h"
#include "shmpeerprocess.h"
#include "shmtestsupport.h"
#include "tests/support/sgtestprocess.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstring>
#include <fcntl.h>
#include <memory>
#include <sched.h>
#include <sys/mman.h>
#include <sys/mount.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>
#include <vector>

TEST(SgSharedMemoryPosix, ALoneHolderKilledLeavesNamesThatTheNextCreateCleansUp) {
    // Its names stay as leftovers that the next open cleans up, and a fresh create starts from
    // a fresh reference record. (A survivor's remove after a holder was killed while attached
    // leaves nothing: the modeler kill test checks it end to end.)
    const std::string lone = uniqueKey("killlone");
    ShmPeerProcess peer;
    ASSERT_TRUE(peer.ok("open " + lone));
    ASSERT_TRUE(peer.ok("create 16"));
    ASSERT_TRUE(peer.ok("attach 1"));
    ASSERT_TRUE(peer.ok("lock"));
    peer.kill();
    EXPECT_FALSE(sgTestSegmentFiles(lone.c_str()).isEmpty());
    SgTestSegment memory(lone);
    EXPECT_FALSE(memory.exists());
    ASSERT_TRUE(memory.create(16));
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));
    EXPECT_EQ(memory.attachCount(), 1);
    EXPECT_TRUE(memory.tryLock(0));
    memory.unlock();
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveLocked));
    EXPECT_TRUE(sgTestSegmentFiles(lone.c_str()).isEmpty());
}

TEST(SgSharedMemoryPosix, ObjectsArePrivateAndForeignOnesAreNotTrusted) {
    const std::string key = uniqueKey("mode");
    SgTestSegment memory(key);
    EXPECT_FALSE(memory.lock()); // a lock on a missing segment creates nothing
    EXPECT_TRUE(sgTestSegmentFiles(key.c_str()).isEmpty());
    ASSERT_TRUE(memory.create(16));
    ASSERT_TRUE(memory.lock()) << kSgTestStuckLock;
    const QStringList objects = sgTestSegmentFiles(key.c_str());
    EXPECT_EQ(objects.size(), 3);
    for (const QString &name : objects) {
        const std::string path = "/dev/shm/" + name.toStdString();
        struct stat info = {};
        ASSERT_EQ(stat(path.c_str(), &info), 0) << path;
        EXPECT_EQ(info.st_mode & 0777, 0600u) << path;
        EXPECT_EQ(info.st_uid, geteuid()) << path;
    }
    memory.unlock();
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveLocked));

    // An object that others could read is refused, and left as it is.
    const std::string exposed = uniqueKey("exposed");
    const std::string name = SgShmPlatform::nativeName(SgSharedMemory(exposed).dataName());
    const int fd = shm_open(name.c_str(), O_RDWR | O_CREAT | O_EXCL, 0600);
    ASSERT_GE(fd, 0);
    ASSERT_EQ(fchmod(fd, 0644), 0);
    SgTestSegment intruded(exposed);
    EXPECT_FALSE(intruded.exists());
    EXPECT_FALSE(intruded.create(16));
    EXPECT_EQ(intruded.status(), SgSharedMemory::StatusFailed);
    struct stat info = {};
    EXPECT_EQ(fstat(fd, &info), 0);
    EXPECT_EQ(info.st_size, 0);
    close(fd);
    shm_unlink(name.c_str());
    EXPECT_TRUE(sgTestSegmentFiles(exposed.c_str()).isEmpty());

    // A live data object whose reference record has gone is not taken over.
    const std::string orphan = uniqueKey("orphan");
    SgTestSegment holder(orphan);
    ASSERT_TRUE(holder.create(16));
    ASSERT_TRUE(holder.attach(SgSharedMemory::kReadWrite));
    ASSERT_EQ(shm_unlink(SgShmPlatform::nativeName(holder.referenceName()).c_str()), 0);
    SgTestSegment taken(orphan);
    EXPECT_FALSE(taken.create(16));
    EXPECT_EQ(taken.status(), SgSharedMemory::StatusAlreadyExists);

    // A size in the reference record beyond the data object is held to what is mapped.
    const std::string lying = uniqueKey("lying");
    SgTestSegment creator(lying);
    ASSERT_TRUE(creator.create(16));
    const int ref = shm_open(SgShmPlatform::nativeName(creator.referenceName()).c_str(), O_RDWR, 0);
    ASSERT_GE(ref, 0);
    void *record = mmap(nullptr, 8, PROT_READ | PROT_WRITE, MAP_SHARED, ref, 0);
    ASSERT_NE(record, MAP_FAILED);
    const std::uint32_t claimed = 1u << 30;
    std::memcpy(static_cast<char *>(record) + 4, &claimed, 4);
    munmap(record, 8);
    close(ref);
    SgTestSegment reader(lying);
    ASSERT_TRUE(reader.attach(SgSharedMemory::kReadOnly));
    EXPECT_GE(reader.size(), 16);
    EXPECT_LE(reader.size(), 1 << 16);
    reader.detach();
    EXPECT_TRUE(creator.remove(SgSharedMemory::kRemoveUnlocked));
}

TEST(SgSharedMemoryPosix, ManyProcessesChurningOneKeyLoseNoUpdate) {
    const std::string anchored = uniqueKey("anchored");
    const std::string loose = uniqueKey("loose");
    SgTestSegment memory(anchored);
    ASSERT_TRUE(memory.create(64));
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));

    std::vector<std::unique_ptr<ShmPeerProcess>> peers;
    for (int i = 0; i < 3; ++i) {
        peers.push_back(std::make_unique<ShmPeerProcess>());
        ASSERT_TRUE(peers.back()->isRunning());
        peers.back()->send("churn " + anchored + " " + loose + " 2000");
    }
    long long total = 0;
    const auto start = Clock::now();
    while (msSince(start) < 2000) {
        ASSERT_TRUE(memory.lock()) << kSgTestStuckLock;
        writeWord(memory, 0, readWord(memory, 0) + 1);
        memory.unlock();
        ++total;
        std::this_thread::sleep_for(std::chrono::microseconds(200));
    }
    for (auto &peer : peers) {
        const std::vector<long long> result = peer->answer("churn");
        ASSERT_EQ(result.size(), 5u);
        EXPECT_GT(result[2], 0); // increments
        EXPECT_EQ(result[3], 0); // failures on the anchored key
        EXPECT_GT(result[4], 0); // cycles on the loose key
        total += result[2];
    }
    EXPECT_EQ(readWord(memory, 0), static_cast<std::uint32_t>(total));
    EXPECT_EQ(memory.attachCount(), 1);
    for (auto &peer : peers)
        peer->quit();
    EXPECT_TRUE(memory.detach());
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveLocked));
    EXPECT_TRUE(sgTestSegmentFiles(anchored.c_str()).isEmpty());
    EXPECT_TRUE(sgTestSegmentFiles(loose.c_str()).isEmpty());
}

TEST(SgSharedMemoryPosix, BigSegmentsFillWholeAndTooLittleRoomFailsTheCreate) {
    // A big segment (mapped and unmapped with a helper thread) holds every byte written, reads
    // the same through a second attachment, and its key is free again at once after removal.
    const std::string key = uniqueKey("big");
    const std::int32_t size = 24 << 20;
    for (int round = 0; round < 2; ++round) {
        {
            SgSharedMemory writer(key);
            ASSERT_TRUE(writer.create(size)) << round;
            ASSERT_TRUE(writer.attach(SgSharedMemory::kReadWrite));
            for (std::int32_t i = 0; i < size; i += 4096)
                writer.data()[i] = static_cast<std::uint8_t>(i / 4096 + round);
            SgSharedMemory reader(key);
            ASSERT_TRUE(reader.attach(SgSharedMemory::kReadOnly));
            for (std::int32_t i = 0; i < size; i += 4096)
                ASSERT_EQ(reader.data()[i], static_cast<std::uint8_t>(i / 4096 + round)) << i;
            EXPECT_TRUE(reader.detach());
            EXPECT_TRUE(writer.detach());
            EXPECT_TRUE(writer.remove(SgSharedMemory::kRemoveUnlocked));
        }
        EXPECT_TRUE(sgTestSegmentFiles(key.c_str()).isEmpty());
    }

    // Where /dev/shm has too little room the create fails and leaves nothing, instead of a
    // writer that dies of SIGBUS halfway through the record (a private mount of a small
    // /dev/shm, in a child that may make one).
    const pid_t child = fork();
    ASSERT_GE(child, 0);
    if (child == 0) {
        if (unshare(CLONE_NEWNS) != 0 ||
            mount(nullptr, "/", nullptr, MS_REC | MS_PRIVATE, nullptr) ||
            mount("sgtest", "/dev/shm", "tmpfs", 0, "size=1m") != 0)
            _exit(77);
        SgSharedMemory tooBig(key);
        const bool refused = !tooBig.create(4 << 20) &&
                             tooBig.status() == SgSharedMemory::StatusFailed &&
                             sgTestSegmentFiles(key.c_str()).isEmpty();
        SgSharedMemory fits(key);
        const bool created = fits.create(256 << 10) && fits.remove(SgSharedMemory::kRemoveUnlocked);
        _exit(refused && created ? 0 : 1);
    }
    int status = 0;
    ASSERT_EQ(waitpid(child, &status, 0), child);
    ASSERT_TRUE(WIFEXITED(status));
    if (WEXITSTATUS(status) == 77)
        GTEST_SKIP() << "no private mount of /dev/shm can be made here";
    EXPECT_EQ(WEXITSTATUS(status), 0);
}
