// Doing something on another thread while the calling thread holds a lock.
#pragma once

#include "tekit/sync/CriticalSections.h"

#include <functional>
#include <thread>

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

} // namespace tekit
