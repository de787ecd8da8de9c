// What the UI-aware locks and waits share inside the library: the frame pump, the clock they
// measure with, and counters that tests read.
#pragma once

#include "tekit/errors/Raise.h"

#include <cstdint>

/// Raise sites of the UI-aware locks report the lock subsystem's file, "critsect", as the
/// rest of the lock interface does, whatever file holds them.
#define TE_RAISE_CRITSECT_API(code, function, apiFunction, apiErrorCode)                           \
    ::tekit::RaiseTEException(static_cast<char const*>(nullptr), (function), (code), false,        \
                              (apiFunction), (apiErrorCode), nullptr, "critsect", __LINE__,        \
                              __DATE__, __TIME__)

namespace tekit::detail {

/// Removes and dispatches the pending messages of each frame window of the calling thread:
/// clipboard range, application range, then timers, up to 100 of each.
void PumpFrameWindows();
/// The clipboard pass of the frame pump for every window of the calling thread.
void PumpClipboardMessages();

/// Compares without regard to case as the "C" locale does (only A to Z fold).
bool EqualIgnoringCase(char const* a, char const* b);

/// The library's high-resolution clock, in seconds.
double ClockSeconds();
/// Whether more than `timeoutMs` (INFINITE: never) has passed since `startSeconds`.
bool TimeoutElapsed(double startSeconds, unsigned long timeoutMs);

/// Wait events created by LWAwareCriticalSectionImplementation since load.
std::uint32_t LockWaitEventsCreated();
/// Times a waiter of LWAwareCriticalSectionImplementation was woken since load.
std::uint32_t LockWakeSignals();

} // namespace tekit::detail
