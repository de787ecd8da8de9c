// The library's reader-writer lock: one 32-bit state word changed by compare-and-exchange, no
// operating-system object, no queue and no fairness.
//
//   UltraFiniteCriticalSection& lock = gUltraFiniteLocks[slot];   // an RWLock<4>
//   lock.Lock(kSharedAccess, 0);           // many readers at once
//   ... read ...
//   lock.Unlock(kSharedAccess);
//
// The state is 0 when free, n > 0 while n readers hold the lock, and the writer's key (its
// negated thread identifier) while it is held exclusively. The writer may take the lock again,
// shared or exclusive. A thread that asks for shared access while it is the newest reader is
// refused at once (Lock returns false) rather than counted twice. Waiting yields the time slice
// (Sleep(0)), or spins when gPerformanceOptions asks for it. A waiting writer gets no priority.
//
// The three state words are zero when free and need no constructor work, so pools of tens of
// thousands of locks live in static storage.
#pragma once

#include "tekit/sync/CriticalSectionLevelValidation.h"
#include "tekit/sync/PerformanceOptions.h"

#include <atomic>
#include <cstdint>
#include <type_traits>

namespace tekit {

namespace detail {

/// The three fields of a reader-writer lock, in order.
struct RWLockWords {
    /// 0 free; n > 0 held by n readers; negative: held exclusively by the thread whose
    /// identifier is minus this value.
    std::int32_t state;
    /// How often the exclusive holder has taken the lock without releasing it.
    std::int32_t writerRecursion;
    /// The key of the newest reader; 0 again whenever any reader releases.
    std::int32_t lastReader;
};
static_assert(sizeof(RWLockWords) == 12, "a reader-writer lock holds three 32-bit fields");
static_assert(std::is_trivially_default_constructible_v<RWLockWords> &&
                  std::is_trivially_copyable_v<RWLockWords> &&
                  std::is_standard_layout_v<RWLockWords>,
              "the lock is free when zeroed: no constructor work");

} // namespace detail

template <std::int32_t level> class RWLock : public CriticalSectionLevelValidation<level> {
public:
    constexpr RWLock() = default;

    /// Waits until acquired and returns true; returns false at once when refused (the caller
    /// is the newest reader and asks for shared access again). `timeout` is ignored.
    bool Lock(LockAccessType access, long timeout) override {
        for (;;) {
            switch (InternalTryLock(access, timeout)) {
            case kTryLockAcquired:
                return true;
            case kTryLockRefused:
                return false;
            case kTryLockBusy:
                break;
            }
            if ((gPerformanceOptions & kPerformanceOptionSpinningLocks) == 0)
                detail::YieldToOtherThreads();
        }
    }

    /// Does not check that the caller holds the lock.
    void Unlock(LockAccessType access) override {
        std::int32_t const state = State().load(std::memory_order_relaxed);
        // Only a writer's state is negative, so a reader's release needs no thread identifier.
        if (access != kSharedAccess || (state < 0 && state == Key())) {
            if (--m_words.writerRecursion == 0) {
                std::int32_t expected = Key();
                State().compare_exchange_strong(expected, 0, std::memory_order_release,
                                                std::memory_order_relaxed);
            }
            return;
        }
        State().fetch_sub(1, std::memory_order_release);
        LastReader().store(0, std::memory_order_relaxed);
    }

    /// One attempt; true only when acquired.
    bool TryLock(LockAccessType access, long timeout) override {
        return InternalTryLock(access, timeout) == kTryLockAcquired;
    }

    /// Exclusive access asked (1): held by the caller (0) or not (1). Shared or either (0, 2):
    /// 0 when the caller writes, 2 while readers hold it, otherwise 1.
    LockOwnership CurrentThreadOwnsLock(LockAccessType access) override {
        std::int32_t const state = State().load(std::memory_order_relaxed);
        if (state < 0 && state == Key())
            return kOwnsLockExclusively;
        if (access != kExclusiveAccess && state > 0)
            return kLockHeldShared;
        return kDoesNotOwnLock;
    }

    /// The negated state: the writer's identifier, the negated reader count, or 0 when free.
    std::uint32_t GetThreadId() const override {
        return 0u - static_cast<std::uint32_t>(State().load(std::memory_order_relaxed));
    }

    bool IsReaderWriterLock() const override { return true; }

protected:
    /// One attempt: refused, busy or acquired. `timeout` is ignored.
    TryLockResult InternalTryLock(LockAccessType access, long /*timeout*/) {
        std::int32_t const key = Key();
        std::int32_t state = State().load(std::memory_order_relaxed);
        if (access == kSharedAccess && state != key) {
            if (LastReader().load(std::memory_order_relaxed) == key)
                return kTryLockRefused;
            while (state >= 0) {
                if (State().compare_exchange_weak(state, state + 1, std::memory_order_acquire,
                                                  std::memory_order_relaxed)) {
                    LastReader().store(key, std::memory_order_relaxed);
                    return kTryLockAcquired;
                }
            }
            return kTryLockBusy;
        }
        if (state != key) {
            std::int32_t expected = 0;
            if (!State().compare_exchange_strong(expected, key, std::memory_order_acquire,
                                                 std::memory_order_relaxed))
                return kTryLockBusy;
        }
        ++m_words.writerRecursion;
        return kTryLockAcquired;
    }

private:
    /// The calling thread's key: its negated identifier, so never a reader count.
    static std::int32_t Key() {
        return static_cast<std::int32_t>(0u - detail::CurrentLockThreadId());
    }
    std::atomic_ref<std::int32_t> State() const {
        return std::atomic_ref<std::int32_t>(const_cast<std::int32_t&>(m_words.state));
    }
    std::atomic_ref<std::int32_t> LastReader() {
        return std::atomic_ref<std::int32_t>(m_words.lastReader);
    }

    detail::RWLockWords m_words{};
};

} // namespace tekit
