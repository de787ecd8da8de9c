// Doing something on another thread while the calling thread holds a lock, and many threads
// contending for one lock.
#pragma once

#include "tekit/sync/CriticalSections.h"

#include <gtest/gtest.h>

#include <atomic>
#include <functional>
#include <thread>
#include <vector>

namespace tekit {

/// Runs `body` on another thread and waits for it.
inline void OnOtherThread(std::function<void()> const& body) {
    std::thread(body).join();
}

/// Whether another thread can take `lock` with `access` right now (it lets go at once).
inline bool OtherThreadCanTake(Lockable& lock, LockAccessType access) {
    bool taken = false;
    OnOtherThread([&] {
        taken = lock.TryLock(access, 0);
        if (taken)
            lock.Unlock(access);
    });
    return taken;
}

/// Readers and writers over a pair that a writer changes in two steps, the second under a
/// nested shared request: a reader that ever sees the halves differ, or a final count short of
/// the writes, found a hole in the lock's exclusion.
inline void ExpectExclusion(Lockable& lock, int threads, int operations) {
    long long first = 0, second = 0; // plain: only the lock protects them
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

} // namespace tekit
