// The two UI-aware locks: the reader-writer lock that pumps frames while it spins, and the
// event-guarded recursive counter.
#include "sync/UIThreads.h"

#include "tekit/errors/TEError.h"
#include "tekit/sync/LWAwareCriticalSection.h"
#include "tekit/sync/LockPools.h"
#include "tekit/sync/MessageLoopWaits.h"

#include "platform/Event.h"

#include <atomic>

namespace tekit {

namespace {

std::atomic<std::uint32_t> gWaitEventsCreated{0};
std::atomic<std::uint32_t> gWakeSignals{0};

/// A UI thread pumps its frames at most this often while it waits for the lock.
constexpr double kPumpIntervalSeconds = 0.01;

template <class T> std::atomic_ref<T> Atomic(T& field) {
    return std::atomic_ref<T>(field);
}

} // namespace

namespace detail {
std::uint32_t LockWaitEventsCreated() {
    return gWaitEventsCreated.load(std::memory_order_relaxed);
}
std::uint32_t LockWakeSignals() {
    return gWakeSignals.load(std::memory_order_relaxed);
}
} // namespace detail

// ---- LWAwareCriticalSection -------------------------------------------------------------

LWAwareCriticalSection::~LWAwareCriticalSection() = default;

bool LWAwareCriticalSection::Lock(LockAccessType access, long timeout) {
    TryLockResult result = InternalTryLock(access, timeout);
    bool decided = false;
    bool uiThread = false;
    double lastPump = 0.0;
    bool pumped = false;
    while (result == kTryLockBusy) {
        if (!decided) { // asked once per wait: it takes a lock of its own
            uiThread = LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread();
            decided = true;
        }
        if ((gPerformanceOptions & kPerformanceOptionSpinningLocks) == 0)
            detail::YieldToOtherThreads();
        if (uiThread) {
            double const now = detail::ClockSeconds();
            if (!pumped || now - lastPump > kPumpIntervalSeconds) {
                detail::PumpFrameWindows();
                lastPump = now;
                pumped = true;
            }
        }
        result = InternalTryLock(access, timeout);
    }
    return result == kTryLockAcquired;
}

// ---- LWAwareCriticalSectionImplementation -----------------------------------------------

LWAwareCriticalSectionImplementation::~LWAwareCriticalSectionImplementation() {
    platform::CloseWaitable(m_waitEvent);
}

bool LWAwareCriticalSectionImplementation::Lock(LockAccessType, long) {
    std::uint32_t const self = detail::CurrentLockThreadId();
    if (Atomic(m_owner).load(std::memory_order_relaxed) == self) {
        ++m_recursionCount;
        return true;
    }
    if (Atomic(m_lockCount).fetch_add(1, std::memory_order_acquire) != -1)
        OV_CriticalSection_WaitForLock(this);
    Atomic(m_owner).store(self, std::memory_order_relaxed);
    ++m_recursionCount;
    return true;
}

bool LWAwareCriticalSectionImplementation::TryLock(LockAccessType, long) {
    std::uint32_t const self = detail::CurrentLockThreadId();
    if (Atomic(m_owner).load(std::memory_order_relaxed) != self) {
        std::int32_t expected = -1;
        if (!Atomic(m_lockCount)
                 .compare_exchange_strong(expected, 0, std::memory_order_acquire,
                                          std::memory_order_relaxed))
            return false;
        Atomic(m_owner).store(self, std::memory_order_relaxed);
    }
    ++m_recursionCount;
    return true;
}

void LWAwareCriticalSectionImplementation::Unlock(LockAccessType) {
    if (--m_recursionCount != 0)
        return;
    Atomic(m_owner).store(0, std::memory_order_relaxed);
    // One signal per hand-over: the auto-reset event lets exactly one waiter through.
    if (Atomic(m_lockCount).fetch_sub(1, std::memory_order_release) - 1 >= 0)
        OV_CriticalSection_WakeNextOwner(this);
}

std::uint32_t LWAwareCriticalSectionImplementation::GetThreadId() const {
    return std::atomic_ref<std::uint32_t>(const_cast<std::uint32_t&>(m_owner))
        .load(std::memory_order_relaxed);
}

HANDLE LWAwareCriticalSectionImplementation::GetWaitForLockEvent() {
    HANDLE event = Atomic(m_waitEvent).load(std::memory_order_acquire);
    if (event != nullptr)
        return event;
    NamedCriticalSection& creation = gNamedLocks[kWaitEventNamedLock];
    creation.Lock(kExclusiveAccess, 0);
    event = Atomic(m_waitEvent).load(std::memory_order_acquire);
    if (event == nullptr) {
        platform::WaitableHandle created = nullptr;
        if (platform::SystemError const error =
                platform::CreateEventObject(false, false, created)) {
            creation.Unlock(kExclusiveAccess);
            TE_RAISE_CRITSECT_API(TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE,
                                  "LWAwareCriticalSectionImplementation::GetWaitForLockEvent",
                                  error.apiFunction, error.code);
        }
        event = static_cast<HANDLE>(created);
        Atomic(m_waitEvent).store(event, std::memory_order_release);
        gWaitEventsCreated.fetch_add(1, std::memory_order_relaxed);
    }
    creation.Unlock(kExclusiveAccess);
    return event;
}

void OV_CriticalSection_WaitForLock(LWAwareCriticalSectionImplementation* lock) {
    TEWaitForSingleObject_LWUISafe(lock->GetWaitForLockEvent(), INFINITE);
}

void OV_CriticalSection_WakeNextOwner(LWAwareCriticalSectionImplementation* lock) {
    gWakeSignals.fetch_add(1, std::memory_order_relaxed);
    platform::SetEventObject(lock->GetWaitForLockEvent());
}

} // namespace tekit
