// The one lock interface of the library, and the enumerations it speaks in.
//
//   void Append(Lockable& lock, Record const& record) {
//       lock.Lock(kExclusiveAccess, 0);
//       ...
//       lock.Unlock(kExclusiveAccess);
//   }
//
// Every lock of the library implements Lockable: the critical sections (recursive, the access
// type ignored) and the reader-writer locks (shared or exclusive). The order of the virtual
// functions is part of the binary interface that modules built on the library rely on.
#pragma once

#include "tekit/Export.h"

#include <cstdint>

namespace tekit {

/// How a caller wants to hold a lock. Critical sections ignore it.
enum LockAccessType : std::int32_t {
    kSharedAccess = 0,    ///< reader
    kExclusiveAccess = 1, ///< writer
    kEitherAccess = 2,    ///< only for CurrentThreadOwnsLock, where it counts as shared
};

/// What CurrentThreadOwnsLock tells.
enum LockOwnership : std::int32_t {
    kOwnsLockExclusively = 0, ///< the calling thread holds the lock exclusively
    kDoesNotOwnLock = 1,      ///< the calling thread does not hold it
    kLockHeldShared = 2,      ///< readers hold it; whether the caller is one cannot be told
};

/// The outcome of one attempt to take a reader-writer lock.
enum TryLockResult : std::int32_t {
    kTryLockRefused = 0,  ///< the caller would take a shared lock it took already
    kTryLockBusy = 1,     ///< another thread holds the lock in a way that excludes the caller
    kTryLockAcquired = 2, ///< the caller holds the lock now
};

class Lockable;

/// Told about reference counting on a lock: (lock, context1, context2, is AddRef, count).
using AddRefReleaseCallback = void (*)(Lockable*, void*, void*, bool, unsigned long*);

/// The lock interface. Timeouts are accepted by every lock and honoured by none of the
/// library's own: a Lock waits until it succeeds.
class TEKIT_API Lockable {
public:
    virtual bool Lock(LockAccessType access, long timeout) = 0;
    virtual void Unlock(LockAccessType access) = 0;
    /// One attempt that never waits.
    virtual bool TryLock(LockAccessType access, long timeout) = 0;
    /// Locks that are reference counted return true; the library's own return false.
    virtual bool AddRef();
    virtual void Release();
    virtual void SetAddRefReleaseCallback(AddRefReleaseCallback callback, void* context1,
                                          void* context2);
    /// By default: exclusively held when GetThreadId() is the calling thread.
    virtual LockOwnership CurrentThreadOwnsLock(LockAccessType access);
    /// The owning thread's identifier, 0 when free (reader-writer locks: see RWLock).
    virtual std::uint32_t GetThreadId() const = 0;
    virtual bool IsReaderWriterLock() const;
    virtual ~Lockable();

protected:
    constexpr Lockable() = default;
    Lockable(Lockable const&) = delete;
    Lockable& operator=(Lockable const&) = delete;
};

namespace detail {
/// The calling thread's identifier as locks record it: 32 bits, never 0 for a live thread.
TEKIT_API std::uint32_t CurrentLockThreadId();
/// Gives up the rest of the time slice (Sleep(0) on Windows).
TEKIT_API void YieldToOtherThreads();
} // namespace detail

} // namespace tekit
