// The reader-writer lock: recursion, the refusal of a repeated shared request, ownership
// queries, and readers and writers at full contention.
#include "OtherThread.h"

#include "tekit/sync/CriticalSections.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstdint>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using Clock = std::chrono::steady_clock;

/// Exposes the single attempt that Lock and TryLock are built on.
class ProbedLock : public RWLock<kUltraFiniteLockLevel> {
public:
    using RWLock::InternalTryLock;
};

TEST(RWLock, WriterTakesItAgainSharedOrExclusiveAndFreesItAfterAsManyReleases) {
    ProbedLock lock;
    ASSERT_TRUE(lock.Lock(kExclusiveAccess, 0));
    ASSERT_TRUE(lock.Lock(kSharedAccess, 0));
    ASSERT_EQ(lock.InternalTryLock(kSharedAccess, 0), kTryLockAcquired);
    ASSERT_TRUE(lock.TryLock(kExclusiveAccess, 0));
    LockAccessType const releases[] = {kSharedAccess, kExclusiveAccess, kSharedAccess};
    for (LockAccessType const access : releases) {
        lock.Unlock(access);
        EXPECT_FALSE(OtherThreadCanTake(lock, kSharedAccess));
        EXPECT_EQ(lock.CurrentThreadOwnsLock(kExclusiveAccess), kOwnsLockExclusively);
    }
    lock.Unlock(kExclusiveAccess);
    EXPECT_TRUE(OtherThreadCanTake(lock, kExclusiveAccess));
}

TEST(RWLock, NewestReaderAskingAgainIsRefusedAtOnceUntilAnotherReaderReleases) {
    ProbedLock lock;
    ASSERT_TRUE(lock.Lock(kSharedAccess, 0));
    EXPECT_EQ(lock.InternalTryLock(kSharedAccess, 0), kTryLockRefused);
    EXPECT_FALSE(lock.Lock(kSharedAccess, 0)) << "refused, not waiting";

    // Another reader's release forgets the newest reader: the repeat is then counted.
    OnOtherThread([&] {
        ASSERT_TRUE(lock.Lock(kSharedAccess, 0));
        lock.Unlock(kSharedAccess);
    });
    ASSERT_TRUE(lock.Lock(kSharedAccess, 0));
    EXPECT_EQ(lock.GetThreadId(), std::uint32_t(-2));
    lock.Unlock(kSharedAccess);
    lock.Unlock(kSharedAccess);
}

TEST(RWLock, OwnershipAsSeenByReadersWritersAndOthers) {
    ProbedLock lock;
    std::atomic<int> phase{0};
    EXPECT_EQ(lock.CurrentThreadOwnsLock(kEitherAccess), kDoesNotOwnLock);

    // Two other threads read at once: the count is 2, and nobody can tell who reads.
    std::vector<std::thread> readers;
    for (int i = 0; i < 2; ++i)
        readers.emplace_back([&] {
            lock.Lock(kSharedAccess, 0);
            phase.fetch_add(1);
            while (phase.load() < 3)
                std::this_thread::yield();
            lock.Unlock(kSharedAccess);
        });
    while (phase.load() < 2)
        std::this_thread::yield();
    EXPECT_EQ(lock.GetThreadId(), 0xFFFFFFFEu);
    EXPECT_EQ(lock.CurrentThreadOwnsLock(kEitherAccess), kLockHeldShared);
    EXPECT_EQ(lock.CurrentThreadOwnsLock(kExclusiveAccess), kDoesNotOwnLock);
    EXPECT_EQ(lock.InternalTryLock(kExclusiveAccess, 0), kTryLockBusy);
    phase = 3;
    for (std::thread& reader : readers)
        reader.join();

    lock.Lock(kExclusiveAccess, 0);
    for (LockAccessType const access : {kSharedAccess, kExclusiveAccess, kEitherAccess})
        EXPECT_EQ(lock.CurrentThreadOwnsLock(access), kOwnsLockExclusively);
    OnOtherThread([&] { EXPECT_EQ(lock.InternalTryLock(kSharedAccess, 0), kTryLockBusy); });
    lock.Unlock(kExclusiveAccess);
}

/// Mixed readers and writers over a pair that a writer changes in two steps: a reader that
/// ever sees the halves differ, or a final count short of the writes, found a hole in the lock.
void RunReadersAndWriters(int threads, int operations) {
    OVCriticalSection lock;
    long long first = 0, second = 0;
    std::atomic<long long> torn{0}, writes{0};
    std::vector<std::thread> workers;
    for (int t = 0; t < threads; ++t)
        workers.emplace_back([&, t] {
            for (int i = 0; i < operations; ++i) {
                if ((i + t) % 5 == 0) { // one operation in five writes
                    ASSERT_TRUE(lock.Lock(kExclusiveAccess, 0));
                    ++first;
                    ASSERT_TRUE(lock.Lock(kSharedAccess, 0)); // the writer's shared request
                    ++second;
                    lock.Unlock(kSharedAccess);
                    lock.Unlock(kExclusiveAccess);
                    writes.fetch_add(1, std::memory_order_relaxed);
                } else {
                    ASSERT_TRUE(lock.Lock(kSharedAccess, 0));
                    if (first != second)
                        torn.fetch_add(1, std::memory_order_relaxed);
                    lock.Unlock(kSharedAccess);
                }
            }
        });
    for (std::thread& worker : workers)
        worker.join();
    EXPECT_EQ(torn.load(), 0);
    EXPECT_EQ(second, writes.load());
}

#if defined(__SANITIZE_THREAD__)
constexpr int kStressOperations = 20000; // the race detector is some twenty times slower
#else
constexpr int kStressOperations = 200000;
#endif

TEST(RWLockStress, ReadersNeverSeeAHalfWrittenPairWhenYieldingOrSpinning) {
    RunReadersAndWriters(4, kStressOperations);
    gPerformanceOptions |= kPerformanceOptionSpinningLocks;
    RunReadersAndWriters(4, kStressOperations / 4);
    gPerformanceOptions &= ~kPerformanceOptionSpinningLocks;
}

TEST(RWLockStress, TryLockNeverBlocksWhileOthersHammerTheLock) {
    UltraFiniteCriticalSection lock;
    std::atomic<bool> stop{false};
    std::vector<std::thread> hammers;
    for (int t = 0; t < 2; ++t)
        hammers.emplace_back([&, t] {
            LockAccessType const access = t == 0 ? kExclusiveAccess : kSharedAccess;
            while (!stop.load(std::memory_order_relaxed)) {
                lock.Lock(access, 0);
                lock.Unlock(access);
            }
        });
    auto slowest = Clock::duration::zero();
    int acquired = 0;
    for (int i = 0; i < kStressOperations / 10; ++i) {
        LockAccessType const access = i % 2 ? kExclusiveAccess : kSharedAccess;
        auto const start = Clock::now();
        bool const taken = lock.TryLock(access, 0);
        slowest = std::max(slowest, Clock::now() - start);
        if (taken) {
            ++acquired;
            lock.Unlock(access);
        }
    }
    stop = true;
    for (std::thread& hammer : hammers)
        hammer.join();
    EXPECT_LT(slowest, std::chrono::milliseconds(500)) << "a try waited for the holder";
    EXPECT_EQ(lock.GetThreadId(), 0u) << acquired << " tries succeeded";
}

} // namespace
} // namespace tekit
