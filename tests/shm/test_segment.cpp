// Segment behaviour that holds on every back-end: one process against a real second one.
#include "exchange/shm/sgcontrolrecord.h"
#include "exchange/shm/sgsharedmemory.h"
#include "shmpeerprocess.h"
#include "shmtestsupport.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstring>
#include <memory>

TEST(SgSharedMemory, NamesFromKeyBytesAndAFreshControlRecord) {
    SgTestSegment abc("abc");
    EXPECT_EQ(abc.dataName(), "sgsharedmemory-616263");
    EXPECT_EQ(abc.lockName(), "sgsharedmemory-616263-lock");
    EXPECT_EQ(abc.referenceName(), "sgsharedmemory-616263-ref");
    EXPECT_EQ(SgTestSegment(std::string("\xff\x01 \x80", 4)).dataName(), "sgsharedmemory-ff012080");
    EXPECT_EQ(SgTestSegment(kSgControlSegmentKey).dataName(),
              "sgsharedmemory-46414345544f525f4252494447455f5354415449435f4d4150");
    EXPECT_STREQ(kSgDataSegmentKey, "FACETOR_BRIDGE_DYNAMIC_MAP");

    // A fresh control record has both slots free.
    const SgControlRecord fresh = SgControlRecord::fresh();
    const unsigned char expected[16] = {1, 0, 0, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0};
    EXPECT_EQ(std::memcmp(&fresh, expected, sizeof expected), 0);
}

TEST(SgSharedMemory, BadSizeEmptyKeyAndMissingSegmentFailLeavingNothingOpen) {
    SgTestSegment memory(uniqueKey("size"));
    EXPECT_FALSE(memory.create(0));
    EXPECT_EQ(memory.status(), SgSharedMemory::StatusBadSize);
    EXPECT_FALSE(memory.create(-5));
    EXPECT_EQ(memory.status(), SgSharedMemory::StatusBadSize);
    EXPECT_FALSE(memory.exists());
    EXPECT_FALSE(memory.lock());

    SgTestSegment empty("");
    EXPECT_FALSE(empty.create(16));
    EXPECT_EQ(empty.status(), SgSharedMemory::StatusEmptyKey);
    EXPECT_FALSE(empty.exists());

    // A missing segment fails lock, attach and detach at once.
    SgTestSegment absent(uniqueKey("missing"));
    long long fastest = 1000;
    for (int attempt = 0; attempt < 3; ++attempt) { // the fastest of three, against load spikes
        const auto start = Clock::now();
        EXPECT_FALSE(absent.lock());
        EXPECT_FALSE(absent.tryLock(25));
        fastest = std::min(fastest, msSince(start));
    }
    EXPECT_LT(fastest, 20);
    EXPECT_EQ(absent.status(), SgSharedMemory::StatusFailed); // no lock-failure status here
    EXPECT_EQ(absent.lockDepth(), 0);

    EXPECT_FALSE(absent.attach(SgSharedMemory::kReadWrite));
    EXPECT_EQ(absent.status(), SgSharedMemory::StatusLockFailed);
    EXPECT_FALSE(absent.isAttached());
    EXPECT_EQ(absent.data(), nullptr);

    EXPECT_FALSE(absent.detach());
    EXPECT_EQ(absent.status(), SgSharedMemory::StatusNotFound);
    EXPECT_FALSE(absent.exists());
}

TEST(SgSharedMemory, TwoProcessesShareDataCountsAndAnExclusiveNestedTimedLock) {
    const std::string key = uniqueKey("share");
    SgTestSegment memory(key);
    ASSERT_TRUE(memory.create(64));
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));
    EXPECT_EQ(memory.size(), 64);
    writeWord(memory, 60, 0xC0FFEEu);

    ShmPeerProcess peer;
    ASSERT_TRUE(peer.ok("open " + key));
    // A second create finds the segment and leaves it as it is.
    EXPECT_EQ(peer.call("create 128"),
              (std::vector<long long>{0, SgSharedMemory::StatusAlreadyExists}));
    ASSERT_TRUE(peer.ok("attach 1"));
    EXPECT_EQ(peer.call("count").at(2), 2);
    EXPECT_EQ(memory.attachCount(), 2);
    EXPECT_EQ(peer.call("read 60").at(2), 0xC0FFEE);
    EXPECT_TRUE(peer.ok("write 0 4242"));
    EXPECT_EQ(readWord(memory, 0), 4242u);

    EXPECT_TRUE(peer.ok("detach"));
    EXPECT_TRUE(memory.detach());
    EXPECT_FALSE(memory.detach());
    EXPECT_EQ(memory.status(), SgSharedMemory::StatusNotFound);
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadOnly));
    EXPECT_EQ(memory.attachCount(), 1); // both earlier attachments were uncounted
    EXPECT_EQ(readWord(memory, 0), 4242u);

    // The lock is exclusive between the processes, nested within one, and timed.
    ASSERT_TRUE(peer.ok("attach 1"));
    ASSERT_TRUE(memory.lock()) << kSgTestStuckLock;
    ASSERT_TRUE(memory.lock()) << kSgTestStuckLock;
    EXPECT_EQ(memory.lockDepth(), 2);
    memory.unlock();
    EXPECT_EQ(memory.lockDepth(), 1);
    EXPECT_EQ(peer.call("trylock 0").at(0), 0);
    memory.unlock();
    EXPECT_EQ(memory.lockDepth(), 0);
    EXPECT_EQ(peer.call("trylock 0").at(0), 1);

    // The peer holds the lock: a timed try gives up after about the time asked for.
    const auto start = Clock::now();
    EXPECT_FALSE(memory.tryLock(25));
    const long long waited = msSince(start);
    EXPECT_GE(waited, 24);
    EXPECT_LT(waited, 400);
    EXPECT_EQ(memory.status(), SgSharedMemory::StatusLockFailed);
    EXPECT_TRUE(peer.ok("unlock"));
    EXPECT_TRUE(memory.tryLock(25));
    const auto peerTry = peer.call("trylock 25");
    EXPECT_EQ(peerTry.at(0), 0);
    EXPECT_GE(peerTry.at(2), 24);
    memory.unlock();
    peer.quit();
}

TEST(SgSharedMemory, SegmentOutlivesDestroyedCreatorAndVanishesWithTheLastHolder) {
    const std::string key = uniqueKey("lifetime");
    {
        ShmPeerProcess peer;
        ASSERT_TRUE(peer.ok("open " + key));
        ASSERT_TRUE(peer.ok("create 32"));
        ASSERT_TRUE(peer.ok("attach 1"));
        ASSERT_TRUE(peer.ok("write 4 777"));

        SgTestSegment memory(key);
        ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));
        EXPECT_EQ(memory.size(), 32);
        ASSERT_TRUE(peer.ok("destroy")); // the creator's object goes while we are attached
        EXPECT_EQ(readWord(memory, 4), 777u);
        EXPECT_EQ(memory.attachCount(), 1);
        peer.quit(); // and then its process
        EXPECT_TRUE(memory.isAttached());
        EXPECT_TRUE(SgTestSegment(key).exists());
        EXPECT_EQ(readWord(memory, 4), 777u);
    }
    EXPECT_FALSE(SgTestSegment(key).exists());
}

TEST(SgSharedMemory, RemoveUncountsAndWaitsForTheOthers) {
    const std::string key = uniqueKey("remove");
    SgTestSegment memory(key);
    ASSERT_TRUE(memory.create(16));
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));
    ShmPeerProcess peer;
    ASSERT_TRUE(peer.ok("open " + key));
    ASSERT_TRUE(peer.ok("attach 1"));

    // Alone-wait: returns once the peer has detached, 100 ms later.
    const auto start = Clock::now();
    peer.send("sleep 100");
    peer.send("detach");
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveWhenAlone));
    EXPECT_GE(msSince(start), 100);
    peer.answer("sleep");
    EXPECT_EQ(peer.answer("detach").at(0), 1);
    EXPECT_FALSE(memory.isAttached());
    EXPECT_EQ(memory.lockDepth(), 0);

    // A removed object can attach again; remove under the lock uncounts its attachment.
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));
    ASSERT_TRUE(peer.ok("attach 0"));
    EXPECT_EQ(memory.attachCount(), 2);
    ASSERT_TRUE(memory.lock()) << kSgTestStuckLock; // an outer level that remove gives back as well
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveLocked));
    EXPECT_EQ(peer.call("count").at(2), 1);
    EXPECT_EQ(peer.call("trylock 0").at(0), 1);
    EXPECT_TRUE(peer.ok("unlock"));

    // Alone already: returns at once, also while attached itself.
    EXPECT_TRUE(peer.ok("detach"));
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadOnly));
    const auto alone = Clock::now();
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveWhenAlone));
    EXPECT_LT(msSince(alone), 1000);
    peer.quit();
    EXPECT_FALSE(SgTestSegment(key).exists());
}

TEST(SgSharedMemory, APeerKilledHoldingTheLockCostsOnlyBoundedWaits) {
    const std::string key = uniqueKey("killheld");
    SgTestSegment memory(key);
    ASSERT_TRUE(memory.create(16));
    ASSERT_TRUE(memory.attach(SgSharedMemory::kReadWrite));
    memory.setWaitLimit(50);
    auto other = std::make_unique<SgTestSegment>(key);
    other->setWaitLimit(50);
    ASSERT_TRUE(other->attach(SgSharedMemory::kReadWrite));
    {
        ShmPeerProcess peer;
        ASSERT_TRUE(peer.ok("open " + key));
        ASSERT_TRUE(peer.ok("attach 1"));
        ASSERT_TRUE(peer.ok("lock"));
        // While a live peer holds the lock, every call that locks gives up after the limit,
        // destruction included (it lets go of every handle then).
        const auto start = Clock::now();
        EXPECT_FALSE(memory.lock());
        EXPECT_FALSE(memory.detach());
        EXPECT_EQ(memory.status(), SgSharedMemory::StatusLockFailed);
        other.reset();
        EXPECT_LT(msSince(start), 500);
        EXPECT_TRUE(memory.isAttached());
        peer.kill();
    }
    // Killed while holding it: the POSIX back-end gives the lock back, a Windows semaphore
    // stays taken. Either way no call waits past its limit, and letting go without the lock
    // closes every handle.
    const auto start = Clock::now();
    const bool relocked = memory.tryLock(50);
    if (relocked)
        memory.unlock();
#ifdef _WIN32
    EXPECT_FALSE(relocked);
#else
    EXPECT_TRUE(relocked);
#endif
    memory.detach();
    EXPECT_TRUE(memory.remove(SgSharedMemory::kRemoveUnlocked));
    EXPECT_LT(msSince(start), 400);
    EXPECT_FALSE(SgTestSegment(key).exists());
    // With the last handle gone the key starts afresh, its lock free.
    SgTestSegment fresh(key);
    ASSERT_TRUE(fresh.create(16));
    EXPECT_TRUE(fresh.tryLock(0));
    fresh.unlock();
}
