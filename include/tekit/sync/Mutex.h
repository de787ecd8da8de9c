// A named mutex that processes share, and its scoped holder.
//
//   Mutex mutex("OrvaneStationGlobals");       // created, or opened when it exists
//   {
//       MutexLock hold(mutex, 5000);           // raises TE_OPERATION_TIMED_OUT after 5 s
//       ...
//   }                                          // released
//
// On Windows a mutex object (CreateMutexA); elsewhere a robust process-shared mutex in shared
// memory named after it. Either way the owning thread may take it again, and a holder that
// ends without releasing leaves it "abandoned": the next waiter acquires it.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"

namespace tekit {

class TEKIT_API Mutex {
public:
    /// Raises TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE when the system refuses. A null name
    /// makes a mutex of this process only.
    explicit Mutex(char* name);
    explicit Mutex(char const* name);
    ~Mutex();
    Mutex(Mutex const&) = delete;
    Mutex& operator=(Mutex const&) = delete;

private:
    friend class MutexLock;
    HANDLE m_handle;
};

class TEKIT_API MutexLock {
public:
    /// Waits up to `timeoutMs` (INFINITE: no limit). Raises TE_OPERATION_TIMED_OUT when the
    /// time runs out, and the system's error when the wait fails.
    MutexLock(Mutex& mutex, unsigned long timeoutMs);
    ~MutexLock();
    MutexLock(MutexLock const&) = delete;
    MutexLock& operator=(MutexLock const&) = delete;

private:
    Mutex& m_mutex;
};

} // namespace tekit
