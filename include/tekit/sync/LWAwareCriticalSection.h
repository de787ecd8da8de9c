// Locks that keep a Loomwire UI thread's windows alive while it waits, and the detection of
// such a thread.
//
//   static LWAwareCriticalSection gTableLock;       // a reader-writer lock
//   gTableLock.Lock(kExclusiveAccess, 0);           // a UI thread pumps its frames meanwhile
//   ...
//   gTableLock.Unlock(kExclusiveAccess);
//
//   LWAwareCriticalSectionImplementation section;   // recursive, waits on an event
//   section.Lock(kExclusiveAccess, 0);  ...  section.Unlock(kExclusiveAccess);
//
// A thread is a Loomwire UI thread while it owns at least one top-level window of class
// "LWFrame" (any case). Each thread is examined once, by enumerating its windows; from then on
// a window-event hook keeps its count as frames come and go. Before the hooks are installed no
// thread is a UI thread. On Linux no thread owns windows, so none ever is.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"
#include "tekit/sync/Lockable.h"
#include "tekit/sync/RWLock.h"

#include <cstdint>

namespace tekit {

#if !defined(_WIN32)
using HWND = void*;
#endif

/// A reader-writer lock whose waiting thread, when it is a UI thread, pumps its frame windows
/// at most every 10 ms. Other threads wait as RWLock does.
class TEKIT_API LWAwareCriticalSection : public RWLock<kGeneralLockLevel> {
public:
    constexpr LWAwareCriticalSection() = default;
    ~LWAwareCriticalSection() override;

    /// As RWLock::Lock; `timeout` is ignored.
    bool Lock(LockAccessType access, long timeout) override;
};

/// A recursive lock over a counter, whose waiters sleep on an auto-reset event created on
/// first contention. The access type and timeouts are ignored.
class TEKIT_API LWAwareCriticalSectionImplementation : public Lockable {
public:
    LWAwareCriticalSectionImplementation() = default;
    ~LWAwareCriticalSectionImplementation() override;

    bool Lock(LockAccessType access, long timeout) override;
    void Unlock(LockAccessType access) override;
    bool TryLock(LockAccessType access, long timeout) override;
    std::uint32_t GetThreadId() const override;

    /// The wait event, created on first call. Raises TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE
    /// when the system refuses one.
    HANDLE GetWaitForLockEvent();

    // ---- UI-thread detection (process-wide) ---------------------------------------------
    /// Allocates the per-thread slot (once) and installs the window-event hook. Raises
    /// TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE when either is refused.
    static void InitializeLWUIThreadDetectionHooks();
    /// Removes the hook and frees the slot: no thread is a UI thread any more.
    static void CleanupLWUIThreadDetectionHooks();
    /// Whether the calling thread owns a frame window.
    static bool CurrentThreadIsLWUIThread();
    /// Whether the window's class is "LWFrame", without regard to case.
    static bool IsLWFrameWindow(HWND window);
    /// The library's load-time entry: keeps the module that holds the hook's handler.
    static void DllMainInits(HINSTANCE instance, unsigned long reason, void* reserved);

private:
    // The field order is part of the interface.
    std::int32_t m_lockCount = -1; ///< -1 free; 0 held; each waiter adds 1
    std::int32_t m_spare = 0;
    std::int32_t m_recursionCount = 0;
    std::uint32_t m_owner = 0;
    HANDLE m_waitEvent = nullptr;
};

/// Waits for the lock's event without limit, pumping frames on a UI thread.
TEKIT_API void OV_CriticalSection_WaitForLock(LWAwareCriticalSectionImplementation* lock);
/// Lets one waiter of the lock go.
TEKIT_API void OV_CriticalSection_WakeNextOwner(LWAwareCriticalSectionImplementation* lock);

} // namespace tekit
