// Which threads are Loomwire UI threads, and the pump that serves their frame windows.
#include "sync/UIThreads.h"

#include "tekit/errors/TEError.h"
#include "tekit/sync/CriticalSections.h"
#include "tekit/sync/LWAwareCriticalSection.h"

#include "platform/Clock.h"
#include "platform/MessageLoop.h"
#include "sync/ExclusiveHold.h"

#include <atomic>

namespace tekit {

namespace {

// A thread's slot holds 0 until the thread is examined, then 1 + its frame-window count.
std::atomic<std::uint32_t> gSlot{platform::kNoThreadSlot};
void* gHook = nullptr;
std::atomic<void*> gModule{nullptr};

/// Serialises the slot's allocation and each thread's first examination. It never goes
/// away, as hooks may fire while statics are torn down.
GlobalOSCriticalSection& DetectionLock() {
    static auto* const lock = new GlobalOSCriticalSection;
    return *lock;
}

/// The "C" locale's case folding, which touches only A to Z: the same answer under any
/// locale the host process sets, with no locale object to create.
char FoldCase(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

/// Runs on the thread that creates or destroys the window (the hook is in-context), so only
/// that thread ever changes its own count.
void OnWindowEvent(platform::WindowHandle window, bool created) {
    std::uint32_t const slot = gSlot.load(std::memory_order_acquire);
    if (slot == platform::kNoThreadSlot)
        return;
    std::uintptr_t const value = platform::ThreadSlotValue(slot);
    if (value == 0 ||
        !LWAwareCriticalSectionImplementation::IsLWFrameWindow(static_cast<HWND>(window)))
        return;
    if (created)
        platform::SetThreadSlotValue(slot, value + 1);
    else if (value > 1)
        platform::SetThreadSlotValue(slot, value - 1);
}

void CountFrame(platform::WindowHandle window, void* count) {
    if (LWAwareCriticalSectionImplementation::IsLWFrameWindow(static_cast<HWND>(window)))
        ++*static_cast<std::uintptr_t*>(count);
}

void PumpRange(platform::WindowHandle window, unsigned first, unsigned last,
               platform::PeekFlags flags) {
    for (int i = 0; i < 100 && platform::PeekAndDispatchOne(window, first, last, flags); ++i) {
    }
}

void PumpFrameWindow(platform::WindowHandle window, void*) {
    if (!LWAwareCriticalSectionImplementation::IsLWFrameWindow(static_cast<HWND>(window)))
        return;
    PumpRange(window, 0x305, 0x30E, platform::PeekFlags::kRemovePostedAndSent);  // clipboard
    PumpRange(window, 0x400, 0x7FFF, platform::PeekFlags::kRemovePostedAndSent); // WM_USER..
    PumpRange(window, 0x113, 0x113, platform::PeekFlags::kRemove);               // WM_TIMER
}

} // namespace

namespace detail {

bool EqualIgnoringCase(char const* a, char const* b) {
    for (; *a != '\0' && FoldCase(*a) == FoldCase(*b); ++a, ++b) {
    }
    return FoldCase(*a) == FoldCase(*b);
}

void PumpFrameWindows() {
    platform::EnumerateThreadWindows(PumpFrameWindow, nullptr);
}

void PumpClipboardMessages() {
    PumpRange(nullptr, 0x305, 0x30E, platform::PeekFlags::kRemovePostedAndSent);
}

double ClockSeconds() {
    return static_cast<double>(platform::MonotonicNanoseconds()) / 1e9;
}

bool TimeoutElapsed(double startSeconds, unsigned long timeoutMs) {
    if (timeoutMs == INFINITE)
        return false;
    return (ClockSeconds() - startSeconds) * 1000.0 >
           static_cast<double>(static_cast<std::uint32_t>(timeoutMs));
}

} // namespace detail

void LWAwareCriticalSectionImplementation::InitializeLWUIThreadDetectionHooks() {
    detail::ExclusiveHold const hold(DetectionLock());
    if (gSlot.load(std::memory_order_relaxed) == platform::kNoThreadSlot) {
        std::uint32_t slot = platform::kNoThreadSlot;
        if (platform::SystemError const error = platform::AllocateThreadSlot(slot))
            TE_RAISE_CRITSECT_API(TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE,
                                  "LWAwareCriticalSectionImplementation::"
                                  "InitializeLWUIThreadDetectionHooks",
                                  error.apiFunction, error.code);
        gSlot.store(slot, std::memory_order_release);
    }
    if (gHook != nullptr)
        return; // installed already: a second hook would count every frame twice
    if (platform::SystemError const error = platform::InstallWindowEventHook(
            gModule.load(std::memory_order_relaxed), OnWindowEvent, gHook))
        TE_RAISE_CRITSECT_API(TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE,
                              "LWAwareCriticalSectionImplementation::"
                              "InitializeLWUIThreadDetectionHooks",
                              error.apiFunction, error.code);
}

void LWAwareCriticalSectionImplementation::CleanupLWUIThreadDetectionHooks() {
    detail::ExclusiveHold const hold(DetectionLock());
    platform::RemoveWindowEventHook(gHook);
    gHook = nullptr;
    std::uint32_t const slot = gSlot.exchange(platform::kNoThreadSlot, std::memory_order_acq_rel);
    if (slot != platform::kNoThreadSlot)
        platform::FreeThreadSlot(slot);
}

bool LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread() {
    DetectionLock().Lock(kExclusiveAccess, 0);
    std::uint32_t slot = gSlot.load(std::memory_order_relaxed);
    if (slot == platform::kNoThreadSlot) {
        DetectionLock().Unlock(kExclusiveAccess);
        return false;
    }
    std::uintptr_t value = platform::ThreadSlotValue(slot);
    if (value == 0) {
        // Enumerating windows may send messages: never under the process-wide lock.
        DetectionLock().Unlock(kExclusiveAccess);
        std::uintptr_t frames = 0;
        platform::EnumerateThreadWindows(CountFrame, &frames);
        value = frames + 1;
        DetectionLock().Lock(kExclusiveAccess, 0);
        slot = gSlot.load(std::memory_order_relaxed);
        if (slot == platform::kNoThreadSlot)
            value = 1; // the hooks went away meanwhile
        else
            platform::SetThreadSlotValue(slot, value);
    }
    DetectionLock().Unlock(kExclusiveAccess);
    return value != 1;
}

bool LWAwareCriticalSectionImplementation::IsLWFrameWindow(HWND window) {
    char className[256];
    platform::WindowClassName(window, className);
    return detail::EqualIgnoringCase(className, "LWFrame");
}

void LWAwareCriticalSectionImplementation::DllMainInits(HINSTANCE instance, unsigned long reason,
                                                        void*) {
    if (reason == 1) // DLL_PROCESS_ATTACH
        gModule.store(instance, std::memory_order_relaxed);
}

} // namespace tekit
