// The lock interface's defaults and the recursive critical sections, UI-aware ones included.
#include "OtherThread.h"

#include "sync/CriticalSectionObjects.h"

#include "tekit/sync/CriticalSections.h"
#include "tekit/sync/Interlock.h"
#include "tekit/sync/LWAwareCriticalSection.h"
#include "tekit/sync/LockPools.h"

#include <gtest/gtest.h>

#include <memory>
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

struct UnlockCall {
    bool aboutToRelease;
    std::uint32_t ownerDuringCall;
};

struct CallbackLog {
    TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock* section = nullptr;
    std::vector<UnlockCall> calls;
};

void RecordUnlock(void* context, bool aboutToRelease) {
    auto* log = static_cast<CallbackLog*>(context);
    log->calls.push_back({aboutToRelease, log->section->GetThreadId()});
}

TEST(CriticalSection, UnlockCallbackRunsTwiceAroundTheOutermostReleaseOnly) {
    TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock section;
    CallbackLog log{&section, {}};
    section.SetOnUnlockCallback(&RecordUnlock, &log);
    section.Lock(kExclusiveAccess, 0);
    section.Lock(kSharedAccess, 0);
    ASSERT_TRUE(section.TryLock(kExclusiveAccess, 0));
    section.Unlock(kExclusiveAccess);
    section.Unlock(kExclusiveAccess);
    EXPECT_TRUE(log.calls.empty());
    section.Unlock(kExclusiveAccess);
    std::uint32_t const self = detail::CurrentLockThreadId();
    ASSERT_EQ(log.calls.size(), 2u);
    EXPECT_TRUE(log.calls[0].aboutToRelease);
    EXPECT_EQ(log.calls[0].ownerDuringCall, self) << "still held during the first call";
    EXPECT_EQ(log.calls[1].ownerDuringCall, 0u) << "already released during the second";
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

} // namespace
} // namespace tekit
