// The lock interface's defaults, the concrete locks, the pools and globals, and the named
// mutex. Raise sites here report the file as "critsect".
#include "sync/CriticalSectionObjects.h"

#include "tekit/errors/Raise.h"
#include "tekit/errors/TEError.h"
#include "tekit/sync/Interlock.h"
#include "tekit/sync/LockPools.h"
#include "tekit/sync/Mutex.h"

#include "errors/NativeError.h"
#include "platform/Sync.h"
#include "platform/SystemError.h"
#include "platform/Thread.h"

#include <atomic>

namespace tekit {

static_assert(sizeof(detail::CriticalSectionObject) >= platform::kCriticalSectionSize &&
              alignof(detail::CriticalSectionObject) >= platform::kCriticalSectionAlign);
// A reader-writer lock is its three words behind the interface's table pointer.
static_assert(sizeof(UltraFiniteCriticalSection) ==
              (sizeof(void*) + sizeof(detail::RWLockWords) + alignof(void*) - 1) / alignof(void*) *
                  alignof(void*));

// ---- Lockable ---------------------------------------------------------------------------

bool Lockable::AddRef() {
    return false;
}

void Lockable::Release() {}

void Lockable::SetAddRefReleaseCallback(AddRefReleaseCallback, void*, void*) {}

LockOwnership Lockable::CurrentThreadOwnsLock(LockAccessType) {
    return GetThreadId() == detail::CurrentLockThreadId() ? kOwnsLockExclusively : kDoesNotOwnLock;
}

bool Lockable::IsReaderWriterLock() const {
    return false;
}

Lockable::~Lockable() = default;

// ---- The system's critical-section object -------------------------------------------------

namespace detail {

namespace {
std::atomic<std::uint32_t> gDeletedSections{0};
} // namespace

std::uint32_t CurrentLockThreadId() {
    return platform::CurrentThreadId();
}

void YieldToOtherThreads() {
    platform::YieldTimeSlice();
}

void InitializeCriticalSectionObject(CriticalSectionObject& section, std::uint32_t spinCount) {
    platform::InitializeCriticalSectionObject(&section, spinCount);
}

void DeleteCriticalSectionObject(CriticalSectionObject& section) {
    platform::DeleteCriticalSectionObject(&section);
    gDeletedSections.fetch_add(1, std::memory_order_relaxed);
}

void EnterCriticalSectionObject(CriticalSectionObject& section) {
    platform::EnterCriticalSectionObject(&section);
}

bool TryEnterCriticalSectionObject(CriticalSectionObject& section) {
    return platform::TryEnterCriticalSectionObject(&section);
}

void LeaveCriticalSectionObject(CriticalSectionObject& section) {
    platform::LeaveCriticalSectionObject(&section);
}

std::uint32_t DeletedCriticalSectionObjects() {
    return gDeletedSections.load(std::memory_order_relaxed);
}

} // namespace detail

// ---- Concrete locks ---------------------------------------------------------------------
// Destructors are defined here so that each class's table of virtual functions lives in the
// library.

OSCriticalSection::OSCriticalSection() : Win32CriticalSectionBase(0) {}
OSCriticalSection::~OSCriticalSection() = default;

GlobalOSCriticalSection::GlobalOSCriticalSection() {
    SetLeakSection(true);
}
GlobalOSCriticalSection::~GlobalOSCriticalSection() = default;

TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock::
    TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock()
    : OVCriticalSectionBaseWithOnUnlockCallback(0) {}
TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock::
    ~TestObjectArrayCriticalSectionThatAlwaysHasOnUnlock() = default;

OVCriticalSection::~OVCriticalSection() = default;
NamedCriticalSection::~NamedCriticalSection() = default;
SubpropertiesLockCriticalSection::~SubpropertiesLockCriticalSection() = default;
TestObjectMemberCriticalSection::~TestObjectMemberCriticalSection() = default;
UltraFiniteCriticalSection::~UltraFiniteCriticalSection() = default;

// ---- Pools and globals ------------------------------------------------------------------
//
// The named locks are constant-initialised, so they work even for code that runs before this
// file's dynamic initialisation. The two large pools are zero storage (.bss) that the loader
// provides for free; each element only needs its table pointer written, once, at load. (Their
// constant initialisation would put 1.5 MB of data and one relocation per element into the
// library's file for the same effect.)

constinit NamedCriticalSection gNamedLocks[kNamedLockCount];
UltraFiniteCriticalSection gUltraFiniteLocks[kUltraFiniteLockCount];
TestObjectMemberCriticalSection gTestObjectMemberLocks[kTestObjectMemberLockCount];

std::int32_t gPerformanceOptions = 0;
std::int32_t gRWLockContentionCount = 0;
std::int32_t gRWLockShareCount = 0;
std::int32_t gRWLockSleepCount = 0;
std::int32_t gRWLockTotalCount = 0;

// ---- Interlock ----------------------------------------------------------------------------

namespace {
/// Nothing sets it: SetInterlockDisabled is documented to have no effect.
thread_local bool tInterlockDisabled = false;
} // namespace

bool GetInterlockDisabled() {
    return tInterlockDisabled;
}

void SetInterlockDisabled(bool) {}

// ---- Mutex --------------------------------------------------------------------------------

namespace {

/// The TEError of a failed system call; a Win32 code the error table does not know is an
/// operating-system failure.
TEError SystemErrorToTEError(platform::SystemError const& error) {
    return detail::NativeErrorToTEError(error, TE_OS_EXCEPTION);
}

} // namespace

Mutex::Mutex(char* name) : Mutex(static_cast<char const*>(name)) {}

Mutex::Mutex(char const* name) : m_handle(nullptr) {
    platform::NamedMutexHandle handle = nullptr;
    if (platform::SystemError const error = platform::CreateNamedMutex(name, handle))
        TE_RAISE_API(TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE, static_cast<char const*>(nullptr),
                     "Mutex::Mutex", error.apiFunction, error.code);
    m_handle = static_cast<HANDLE>(handle);
}

Mutex::~Mutex() {
    if (m_handle != nullptr)
        platform::CloseNamedMutex(m_handle);
}

MutexLock::MutexLock(Mutex& mutex, unsigned long timeoutMs) : m_mutex(mutex) {
    platform::SystemError error;
    // Acquired and abandoned (the holder ended without releasing) both leave the mutex ours.
    switch (
        platform::WaitForNamedMutex(mutex.m_handle, static_cast<std::uint32_t>(timeoutMs), error)) {
    case platform::kWaitTimeout:
        TE_RAISE(TE_OPERATION_TIMED_OUT, static_cast<char const*>(nullptr), "MutexLock::MutexLock");
    case platform::kWaitFailed:
        TE_RAISE_API(SystemErrorToTEError(error), static_cast<char const*>(nullptr),
                     "MutexLock::MutexLock", error.apiFunction, error.code);
    default:
        break;
    }
}

MutexLock::~MutexLock() {
    platform::ReleaseNamedMutex(m_mutex.m_handle);
}

} // namespace tekit
