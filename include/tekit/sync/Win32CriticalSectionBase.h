// The recursive critical section over the operating system's critical-section object, and the
// variant that calls back around its outermost release.
//
//   OSCriticalSection section;                 // a Win32CriticalSectionBase<kGeneralLockLevel>
//   section.Lock(kExclusiveAccess, 0);
//   section.Lock(kExclusiveAccess, 0);         // the owner may take it again
//   section.Unlock(kExclusiveAccess);
//   section.Unlock(kExclusiveAccess);          // released here
//
// The object is CRITICAL_SECTION on Windows and a recursive pthread mutex elsewhere. The owner
// and the recursion count are kept beside it, so that the owner's recursion never reaches the
// system object and OnUnlock sees the outermost release.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"
#include "tekit/sync/CriticalSectionLevelValidation.h"

#include <atomic>
#include <cstdint>

namespace tekit {

namespace detail {

#if defined(_WIN32)
using CriticalSectionObject = CRITICAL_SECTION;
#else
/// Room for a pthread_mutex_t; the platform layer checks that it fits.
struct alignas(sizeof(void*)) CriticalSectionObject {
    unsigned char bytes[sizeof(void*) == 8 ? 40 : 24];
};
#endif

TEKIT_API void InitializeCriticalSectionObject(CriticalSectionObject& section,
                                               std::uint32_t spinCount);
TEKIT_API void DeleteCriticalSectionObject(CriticalSectionObject& section);
TEKIT_API void EnterCriticalSectionObject(CriticalSectionObject& section);
TEKIT_API bool TryEnterCriticalSectionObject(CriticalSectionObject& section);
TEKIT_API void LeaveCriticalSectionObject(CriticalSectionObject& section);

} // namespace detail

/// A recursive critical section of lock level `level`. Lock and TryLock ignore both arguments;
/// Lock waits without limit.
template <std::int32_t level>
class Win32CriticalSectionBase : public CriticalSectionLevelValidation<level> {
public:
    /// `spinCount` 0 initialises the object plainly, any other value with that spin count.
    explicit Win32CriticalSectionBase(std::uint32_t spinCount) {
        detail::InitializeCriticalSectionObject(m_section, spinCount);
    }
    ~Win32CriticalSectionBase() override {
        if (!m_leakSection)
            detail::DeleteCriticalSectionObject(m_section);
    }

    bool Lock(LockAccessType, long) override {
        std::uint32_t const self = detail::CurrentLockThreadId();
        if (Owner() != self)
            detail::EnterCriticalSectionObject(m_section);
        Take(self);
        return true;
    }

    bool TryLock(LockAccessType, long) override {
        std::uint32_t const self = detail::CurrentLockThreadId();
        if (Owner() != self && !detail::TryEnterCriticalSectionObject(m_section))
            return false;
        Take(self);
        return true;
    }

    /// Does not check that the caller owns the section. OnUnlock runs twice around the
    /// outermost release: with true while still held, with false once released.
    void Unlock(LockAccessType) override {
        if (m_recursionCount != 1) {
            --m_recursionCount;
            return;
        }
        OnUnlock(true);
        m_recursionCount = 0;
        SetOwner(0);
        detail::LeaveCriticalSectionObject(m_section);
        OnUnlock(false);
    }

    std::uint32_t GetThreadId() const override { return Owner(); }

    /// When set, destruction leaves the system object alive: for sections with static lifetime
    /// that other static objects may still use while statics are torn down.
    void SetLeakSection(bool leak) { m_leakSection = leak; }

protected:
    virtual void OnUnlock(bool /*aboutToRelease*/) {}

private:
    // Other threads read the owner to see that it is not them: relaxed atomic accesses.
    std::uint32_t Owner() const {
        return std::atomic_ref<std::uint32_t>(const_cast<std::uint32_t&>(m_owner))
            .load(std::memory_order_relaxed);
    }
    void SetOwner(std::uint32_t owner) {
        std::atomic_ref<std::uint32_t>(m_owner).store(owner, std::memory_order_relaxed);
    }
    void Take(std::uint32_t self) {
        SetOwner(self);
        ++m_recursionCount;
    }

    detail::CriticalSectionObject m_section;
    std::uint32_t m_owner = 0;
    bool m_leakSection = false;
    std::int32_t m_recursionCount = 0;
};

/// `Base` (a Win32CriticalSectionBase) that calls a function around its outermost release.
template <class Base> class OVCriticalSectionBaseWithOnUnlockCallback : public Base {
public:
    /// Receives the context and whether the section is about to be released (true, still
    /// held) or has just been released (false).
    using OnUnlockCallback = void (*)(void* context, bool aboutToRelease);

    using Base::Base;

    void SetOnUnlockCallback(OnUnlockCallback callback, void* context) {
        m_callback = callback;
        m_context = context;
    }

protected:
    void OnUnlock(bool aboutToRelease) override {
        if (m_callback)
            m_callback(m_context, aboutToRelease);
    }

private:
    OnUnlockCallback m_callback = nullptr;
    void* m_context = nullptr;
};

} // namespace tekit
