// Ready-made locks shared by the library and the modules built on it.
//
//   NamedCriticalSection& lock = gNamedLocks[kReleaserNamedLock];
//   lock.Lock(kExclusiveAccess, 0);  ...  lock.Unlock(kExclusiveAccess);
//
// The pools are plain arrays indexed by the caller: nothing hashes names or objects onto them.
// A named lock is a fixed slot that one shared resource owns by convention; the library owns
// the three slots below and leaves the others to the modules built on it. The pools exist from
// the moment the library is loaded until it is unloaded.
#pragma once

#include "tekit/Export.h"
#include "tekit/sync/CriticalSections.h"

#include <cstddef>

namespace tekit {

inline constexpr std::size_t kNamedLockCount = 18;
inline constexpr std::size_t kUltraFiniteLockCount = 65536;
inline constexpr std::size_t kTestObjectMemberLockCount = 65536;

/// The slots of gNamedLocks that the library itself uses.
enum NamedLockSlot : std::size_t {
    kDebugOutputNamedLock = 2, ///< the debug-output writer
    kReleaserNamedLock = 7,    ///< the asynchronous reference releaser's shared state
    kWaitEventNamedLock = 8,   ///< lazy creation of the wait events of the event-based lock
};

extern TEKIT_API NamedCriticalSection gNamedLocks[kNamedLockCount];
extern TEKIT_API UltraFiniteCriticalSection gUltraFiniteLocks[kUltraFiniteLockCount];
/// Kept for the per-object locks of a later owner; the library never indexes it.
extern TEKIT_API TestObjectMemberCriticalSection gTestObjectMemberLocks[kTestObjectMemberLockCount];

} // namespace tekit
