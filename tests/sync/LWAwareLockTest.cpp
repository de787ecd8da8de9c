// The UI-aware locks and waits as every thread that owns no frame window sees them: exclusion,
// recursion, one wake per hand-over, one wait event per lock, and the wait results and times.
#include "OtherThread.h"

#include "sync/UIThreads.h"

#include "tekit/sync/LWAwareCriticalSection.h"
#include "tekit/sync/MessageLoopWaits.h"

#include "platform/Event.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <functional>
#include <memory>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using Clock = std::chrono::steady_clock;

long MillisecondsSince(Clock::time_point start) {
    return static_cast<long>(
        std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start).count());
}

/// An event of the library's own for the tests' waits, closed at the end of its scope.
using TestEvent = std::unique_ptr<void, void (*)(platform::WaitableHandle)>;

TestEvent MakeEvent(bool signalled) {
    platform::WaitableHandle handle = nullptr;
    EXPECT_FALSE(platform::CreateEventObject(true, signalled, handle));
    return TestEvent(handle, &platform::CloseWaitable);
}

TEST(LWAwareCriticalSectionImplementation, RecursiveOwnerNeverTouchesTheEvent) {
    LWAwareCriticalSectionImplementation lock;
    std::uint32_t const wakes = detail::LockWakeSignals();
    std::uint32_t const events = detail::LockWaitEventsCreated();
    for (int i = 0; i < 3; ++i)
        ASSERT_TRUE(i == 1 ? lock.TryLock(kExclusiveAccess, 0) : lock.Lock(kExclusiveAccess, 0));
    for (int i = 0; i < 3; ++i)
        lock.Unlock(kExclusiveAccess);
    EXPECT_EQ(detail::LockWakeSignals(), wakes);
    EXPECT_EQ(detail::LockWaitEventsCreated(), events);
}

TEST(LWAwareCriticalSectionImplementation, EachHandOverToAWaiterSignalsOnce) {
    LWAwareCriticalSectionImplementation lock;
    lock.Lock(kExclusiveAccess, 0);
    std::uint32_t const wakes = detail::LockWakeSignals();
    std::atomic<bool> waiting{false}, acquired{false};
    std::thread waiter([&] {
        waiting = true;
        lock.Lock(kExclusiveAccess, 0);
        acquired = true;
        lock.Unlock(kExclusiveAccess);
    });
    while (!waiting)
        std::this_thread::yield();
    std::this_thread::sleep_for(std::chrono::milliseconds(50));
    EXPECT_FALSE(acquired);
    lock.Unlock(kExclusiveAccess);
    waiter.join();
    EXPECT_TRUE(acquired);
    EXPECT_EQ(detail::LockWakeSignals() - wakes, 1u);
}

TEST(LWAwareCriticalSectionImplementation, ContendingThreadsExcludeEachOtherAndShareOneEvent) {
    LWAwareCriticalSectionImplementation lock;
    std::uint32_t const events = detail::LockWaitEventsCreated();
    ExpectExclusion(lock, 4, 2000);
    EXPECT_LE(detail::LockWaitEventsCreated() - events, 1u);
    HANDLE const event = lock.GetWaitForLockEvent();
    EXPECT_EQ(lock.GetWaitForLockEvent(), event);
    EXPECT_EQ(detail::LockWaitEventsCreated() - events, 1u);
}

TEST(UIThreadDetection, ThreadWithoutFrameWindowsIsNeverAUIThread) {
    LWAwareCriticalSectionImplementation::CleanupLWUIThreadDetectionHooks();
    EXPECT_FALSE(LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread());
    LWAwareCriticalSectionImplementation::InitializeLWUIThreadDetectionHooks();
    LWAwareCriticalSectionImplementation::InitializeLWUIThreadDetectionHooks(); // idempotent
    EXPECT_FALSE(LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread());
    LWAwareCriticalSectionImplementation::CleanupLWUIThreadDetectionHooks();
    EXPECT_FALSE(LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread());
}

TEST(UIThreadDetection, CaseFoldingIsTheCLocalesOnly) {
    EXPECT_TRUE(detail::EqualIgnoringCase("lwFRAME", "LWFrame"));
    EXPECT_FALSE(detail::EqualIgnoringCase("LWFram", "LWFrame"));
    EXPECT_FALSE(detail::EqualIgnoringCase("LWFr\xC4me", "LWFr\xE4me")); // no Latin-1 folding
}

struct WaitCase {
    char const* name;
    std::function<DWORD(HANDLE, unsigned long)> wait;
};

std::vector<WaitCase> const kWaits = {
    {"LWUISafe", [](HANDLE h, unsigned long t) { return TEWaitForSingleObject_LWUISafe(h, t); }},
    {"Limited", [](HANDLE h, unsigned long t) { return TEWaitInLimitedMessageLoop(h, t); }},
    {"MessageLoop", [](HANDLE h, unsigned long t) { return TEWaitInMessageLoop(h, t, 5); }},
};

TEST(MessageLoopWaits, UnsignalledHandleTimesOutNoSoonerThanAsked) {
    TestEvent const event = MakeEvent(false);
    for (WaitCase const& c : kWaits) {
        auto const start = Clock::now();
        EXPECT_EQ(c.wait(event.get(), 30), WAIT_TIMEOUT) << c.name;
        EXPECT_GE(MillisecondsSince(start), 29) << c.name;
    }
    auto const start = Clock::now();
    EXPECT_EQ(TEWaitInMessageLoop(event.get(), 0, 20), WAIT_TIMEOUT); // after one poll
    EXPECT_GE(MillisecondsSince(start), 19);
}

TEST(MessageLoopWaits, SignalledOrSetByAnotherThreadEndsAnUnlimitedWait) {
    for (WaitCase const& c : kWaits) {
        TestEvent const signalled = MakeEvent(true);
        EXPECT_EQ(c.wait(signalled.get(), INFINITE), WAIT_OBJECT_0) << c.name;
        TestEvent const event = MakeEvent(false);
        std::thread setter([&] {
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
            platform::SetEventObject(event.get());
        });
        EXPECT_EQ(c.wait(event.get(), INFINITE), WAIT_OBJECT_0) << c.name;
        setter.join();
    }
}

TEST(MessageLoopWaits, SleepLastsLongerThanItsDuration) {
    auto const start = Clock::now();
    TESleepInMessageLoop(25, 5);
    EXPECT_GE(MillisecondsSince(start), 25);
    TEProcessMessagesForLoomwireIfNeeded(); // no frames, nothing to do
}

} // namespace
} // namespace tekit
