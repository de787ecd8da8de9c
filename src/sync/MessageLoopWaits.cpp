// The waits that keep serving a thread's windows while they wait for a handle.
#include "sync/UIThreads.h"

#include "tekit/sync/LWAwareCriticalSection.h"
#include "tekit/sync/MessageLoopWaits.h"

#include "platform/Clock.h"
#include "platform/Event.h"
#include "platform/MessageLoop.h"

namespace tekit {

namespace {

constexpr std::uint32_t kStepMs = 10;
constexpr int kMessageLimit = 100;

DWORD Wait(HANDLE handle, std::uint32_t timeoutMs) {
    return platform::WaitForObject(handle, timeoutMs);
}

void PumpAnyMessages() {
    for (int i = 0; i < kMessageLimit &&
                    platform::PeekAndDispatchOne(nullptr, 0, 0, platform::PeekFlags::kRemove);
         ++i) {
    }
}

bool IsOleApartmentWindow(platform::WindowHandle window) {
    char className[256];
    platform::WindowClassName(window, className);
    return detail::EqualIgnoringCase(className, "OleMainThreadWndClass");
}

/// Serves COM's apartment window of the calling thread: calls into the apartment arrive
/// there as messages.
void PumpOleApartmentWindows() {
    for (platform::WindowHandle window = platform::NextMessageOnlyWindow(nullptr);
         window != nullptr; window = platform::NextMessageOnlyWindow(window)) {
        if (!platform::WindowBelongsToCallingThread(window) || !IsOleApartmentWindow(window))
            continue;
        for (int i = 0;
             i < kMessageLimit &&
             platform::PeekAndDispatchOne(window, 0, 0, platform::PeekFlags::kRemovePostedAndSent);
             ++i) {
        }
    }
}

} // namespace

DWORD TEWaitForSingleObject_LWUISafe(HANDLE handle, unsigned long timeoutMs) {
    DWORD result = Wait(handle, 0);
    if (result != WAIT_TIMEOUT)
        return result;
    if (!LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread())
        return Wait(handle, static_cast<std::uint32_t>(timeoutMs));
    double const start = detail::ClockSeconds();
    for (result = Wait(handle, kStepMs); result == WAIT_TIMEOUT; result = Wait(handle, kStepMs)) {
        detail::PumpFrameWindows();
        if (detail::TimeoutElapsed(start, timeoutMs))
            return WAIT_TIMEOUT;
    }
    return result;
}

DWORD TEWaitInLimitedMessageLoop(HANDLE handle, unsigned long timeoutMs) {
    DWORD result = Wait(handle, 0);
    if (result != WAIT_TIMEOUT)
        return result;
    double const start = detail::ClockSeconds();
    for (result = Wait(handle, kStepMs); result == WAIT_TIMEOUT; result = Wait(handle, kStepMs)) {
        detail::PumpClipboardMessages();
        PumpOleApartmentWindows();
        if (LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread())
            detail::PumpFrameWindows();
        if (detail::TimeoutElapsed(start, timeoutMs))
            return WAIT_TIMEOUT;
    }
    return result;
}

DWORD TEWaitInMessageLoop(HANDLE handle, unsigned long timeoutMs, unsigned long pollMs) {
    DWORD result = Wait(handle, 0);
    if (result != WAIT_TIMEOUT)
        return result;
    double const start = detail::ClockSeconds();
    for (;;) {
        result = platform::WaitForObjectOrInput(handle, static_cast<std::uint32_t>(pollMs));
        if (result != WAIT_TIMEOUT && result != WAIT_OBJECT_0 + 1)
            return result;
        PumpAnyMessages();
        if (detail::TimeoutElapsed(start, timeoutMs))
            return WAIT_TIMEOUT;
    }
}

void TESleepInMessageLoop(unsigned long durationMs, unsigned long sleepMs) {
    double const start = detail::ClockSeconds();
    for (;;) {
        PumpAnyMessages();
        if (detail::TimeoutElapsed(start, durationMs))
            return;
        platform::SleepMicroseconds(static_cast<std::uint64_t>(sleepMs) * 1000u);
    }
}

void TEProcessMessagesForLoomwireIfNeeded() {
    if (LWAwareCriticalSectionImplementation::CurrentThreadIsLWUIThread())
        detail::PumpFrameWindows();
}

} // namespace tekit
