// The lock interface's defaults, the recursive critical sections (UI-aware ones included) and
// the reader-writer lock: recursion, the refusal of a repeated shared request, ownership
// queries, and readers and writers at full contention.
#include "OtherThread.h"
#include "sync/CriticalSectionObjects.h"
#include "tekit/sync/CriticalSections.h"
#include "tekit/sync/Interlock.h"
#include "tekit/sync/LWAwareCriticalSection.h"
#include "tekit/sync/LockPools.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cstdint>
#include <memory>
#include <thread>
#include <utility>
#include <vector>

namespace tekit {
namespace {

// Each class has the lock level it is documented with, as a distinct type.
template <std::int32_t level, class Lock>
constexpr bool kHasLevel = std::is_base_of_v<CriticalSectionLevelValidation<level>, Lock>;
static_assert(kHasLevel<INT32_MIN, OSCriticalSection> &&
              kHasLevel<INT32_MIN, GlobalOSCriticalSection> &&
              kHasLevel<INT32_MIN + 2, TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock> &&
              kHasLevel<INT32_MIN, OVCriticalSection> &&
              kHasLevel<INT32_MIN, NamedCriticalSection> &&
              kHasLevel<INT32_MIN + 1, SubpropertiesLockCriticalSection> &&
              kHasLevel<3, TestObjectMemberCriticalSection> &&
              kHasLevel<4, UltraFiniteCriticalSection>);
static_assert(!kHasLevel<3, UltraFiniteCriticalSection>);

struct AnyLock {
    char const* name;
    std::unique_ptr<Lockable> lock;
    bool isReaderWriter;
};

/// One of every concrete lock, fresh.
std::vector<AnyLock> EveryLock() {
    std::vector<AnyLock> locks;
#define TEKIT_ADD_LOCK(Lock, isReaderWriter)                                                       \
    locks.push_back({#Lock, std::make_unique<Lock>(), isReaderWriter})
    TEKIT_ADD_LOCK(OSCriticalSection, false);
    TEKIT_ADD_LOCK(GlobalOSCriticalSection, false);
    TEKIT_ADD_LOCK(TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock, false);
    TEKIT_ADD_LOCK(LWAwareCriticalSectionImplementation, false);
    TEKIT_ADD_LOCK(OVCriticalSection, true);
    TEKIT_ADD_LOCK(NamedCriticalSection, true);
    TEKIT_ADD_LOCK(SubpropertiesLockCriticalSection, true);
    TEKIT_ADD_LOCK(TestObjectMemberCriticalSection, true);
    TEKIT_ADD_LOCK(UltraFiniteCriticalSection, true);
    TEKIT_ADD_LOCK(LWAwareCriticalSection, true);
#undef TEKIT_ADD_LOCK
    return locks;
}

TEST(Lockable, EveryLockIsExclusiveAndRecursiveForItsWriterButNotItsReader) {
    for (auto& [name, lock, isReaderWriter] : EveryLock()) {
        SCOPED_TRACE(name);
        EXPECT_FALSE(lock->AddRef()); // no reference counting
        lock->Release();
        lock->SetAddRefReleaseCallback(nullptr, nullptr, nullptr);
        EXPECT_EQ(lock->IsReaderWriterLock(), isReaderWriter);
        if (isReaderWriter) { // a reader asking again is refused at once, not left waiting
            ASSERT_TRUE(lock->Lock(kSharedAccess, 0));
            EXPECT_FALSE(lock->Lock(kSharedAccess, 0));
            lock->Unlock(kSharedAccess);
        }
        ASSERT_TRUE(lock->Lock(kExclusiveAccess, 0));
        ASSERT_TRUE(lock->TryLock(kExclusiveAccess, 0)) << "the owner deepens its hold";
        EXPECT_EQ(lock->GetThreadId(), detail::CurrentLockThreadId());
        EXPECT_EQ(lock->CurrentThreadOwnsLock(kExclusiveAccess), kOwnsLockExclusively);
        lock->Unlock(kExclusiveAccess);
        EXPECT_FALSE(OtherThreadCanTake(*lock, kExclusiveAccess)) << "still held once";
        lock->Unlock(kExclusiveAccess);
        EXPECT_EQ(lock->GetThreadId(), 0u);
        EXPECT_TRUE(OtherThreadCanTake(*lock, kExclusiveAccess));
    }
}

TEST(CriticalSection, UnlockCallbackRunsTwiceAroundTheOutermostReleaseOnly) {
    using Calls = std::vector<std::pair<bool, std::uint32_t>>; // about to release, owner then
    struct {
        TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock section;
        Calls calls;
    } log;
    log.section.SetOnUnlockCallback(
        [](void* context, bool aboutToRelease) {
            auto* self = static_cast<decltype(&log)>(context);
            self->calls.emplace_back(aboutToRelease, self->section.GetThreadId());
        },
        &log);
    log.section.Lock(kExclusiveAccess, 0);
    log.section.Lock(kSharedAccess, 0);
    ASSERT_TRUE(log.section.TryLock(kExclusiveAccess, 0));
    for (int i = 0; i < 2; ++i)
        log.section.Unlock(kExclusiveAccess);
    EXPECT_TRUE(log.calls.empty());
    log.section.Unlock(kExclusiveAccess);
    EXPECT_EQ(log.calls, (Calls{{true, detail::CurrentLockThreadId()}, {false, 0}}));
}

TEST(CriticalSection, OnlyAGlobalSectionLeavesItsSystemObjectAlive) {
    std::uint32_t const before = detail::DeletedCriticalSectionObjects();
    { GlobalOSCriticalSection global; }
    EXPECT_EQ(detail::DeletedCriticalSectionObjects(), before);
    { OSCriticalSection plain; }
    EXPECT_EQ(detail::DeletedCriticalSectionObjects(), before + 1);
}

TEST(CriticalSection, InterlockSwitchHasNoEffect) {
    EXPECT_FALSE(GetInterlockDisabled());
    SetInterlockDisabled(true);
    EXPECT_FALSE(GetInterlockDisabled());
}

TEST(LockPools, PoolsAndCountersAreReadyAtLoad) {
    std::size_t busy = 0;
    for (UltraFiniteCriticalSection& lock : gUltraFiniteLocks)
        busy += lock.GetThreadId() != 0;
    for (TestObjectMemberCriticalSection& lock : gTestObjectMemberLocks)
        busy += lock.GetThreadId() != 0;
    EXPECT_EQ(busy, 0u);
    EXPECT_EQ(gPerformanceOptions, 0);
    EXPECT_EQ(gRWLockContentionCount + gRWLockShareCount + gRWLockSleepCount + gRWLockTotalCount,
              0);
}

// The reader-writer lock: recursion, the refusal of a repeated shared request, ownership
// queries, and readers and writers at full contention.
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

#if defined(__SANITIZE_THREAD__)
constexpr int kStressOperations = 20000; // the race detector is some twenty times slower
#else
constexpr int kStressOperations = 200000;
#endif

TEST(RWLockStress, ReadersNeverSeeAHalfWrittenPairWhenYieldingOrSpinning) {
    OVCriticalSection lock;
    ExpectExclusion(lock, 4, kStressOperations);
    gPerformanceOptions |= kPerformanceOptionSpinningLocks;
    ExpectExclusion(lock, 4, kStressOperations / 4);
    gPerformanceOptions &= ~kPerformanceOptionSpinningLocks;
}

} // namespace
} // namespace tekit
