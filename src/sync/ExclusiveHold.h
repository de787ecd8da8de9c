// A lock held exclusively for one scope, for code that keeps a lock of its own (a first load,
// a first examination) and must release it on every way out.
#pragma once

#include "tekit/sync/Lockable.h"

namespace tekit::detail {

/// Locks `lock` for exclusive access, without a timeout, until the hold goes.
template <class Lock> class ExclusiveHold {
public:
    explicit ExclusiveHold(Lock& lock) : m_lock(lock) { m_lock.Lock(kExclusiveAccess, 0); }
    ~ExclusiveHold() { m_lock.Unlock(kExclusiveAccess); }
    ExclusiveHold(ExclusiveHold const&) = delete;
    ExclusiveHold& operator=(ExclusiveHold const&) = delete;

private:
    Lock& m_lock;
};

} // namespace tekit::detail
