// The concrete locks, each of one lock level.
//
//   static GlobalOSCriticalSection gCacheLock;       // stays usable while statics go away
//   OVCriticalSection lock;                          // the product's general lock (RWLock)
//   lock.Lock(kExclusiveAccess, 0);  ...  lock.Unlock(kExclusiveAccess);
//
// Critical sections (recursive, over the system object): OSCriticalSection,
// GlobalOSCriticalSection, TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock. Reader-writer
// locks (no system object, free when zeroed): OVCriticalSection, NamedCriticalSection,
// SubpropertiesLockCriticalSection, TestObjectMemberCriticalSection, UltraFiniteCriticalSection.
#pragma once

#include "tekit/Export.h"
#include "tekit/sync/RWLock.h"
#include "tekit/sync/Win32CriticalSectionBase.h"

namespace tekit {

/// A plain critical section.
class TEKIT_API OSCriticalSection : public Win32CriticalSectionBase<kGeneralLockLevel> {
public:
    OSCriticalSection();
    ~OSCriticalSection() override;
};

/// A critical section for objects with static lifetime: its system object is never deleted.
class TEKIT_API GlobalOSCriticalSection : public OSCriticalSection {
public:
    GlobalOSCriticalSection();
    ~GlobalOSCriticalSection() override;
};

/// A critical section whose unlock callback (null at first) can be set at any time.
class TEKIT_API TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock
    : public OVCriticalSectionBaseWithOnUnlockCallback<
          Win32CriticalSectionBase<kTestObjectArrayLockLevel>> {
public:
    TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock();
    ~TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock() override;
};

/// The product's general-purpose lock.
class TEKIT_API OVCriticalSection : public RWLock<kGeneralLockLevel> {
public:
    constexpr OVCriticalSection() = default;
    ~OVCriticalSection() override;
};

/// An element of gNamedLocks.
class TEKIT_API NamedCriticalSection : public RWLock<kGeneralLockLevel> {
public:
    constexpr NamedCriticalSection() = default;
    ~NamedCriticalSection() override;
};

/// The lock over sub-properties.
class TEKIT_API SubpropertiesLockCriticalSection : public RWLock<kSubpropertiesLockLevel> {
public:
    constexpr SubpropertiesLockCriticalSection() = default;
    ~SubpropertiesLockCriticalSection() override;
};

/// An element of gTestObjectMemberLocks.
class TEKIT_API TestObjectMemberCriticalSection : public RWLock<kTestObjectMemberLockLevel> {
public:
    constexpr TestObjectMemberCriticalSection() = default;
    ~TestObjectMemberCriticalSection() override;
};

/// An element of gUltraFiniteLocks.
class TEKIT_API UltraFiniteCriticalSection : public RWLock<kUltraFiniteLockLevel> {
public:
    constexpr UltraFiniteCriticalSection() = default;
    ~UltraFiniteCriticalSection() override;
};

} // namespace tekit
