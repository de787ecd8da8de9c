// Time measurement and waiting over the system's monotonic clock, which system time changes
// do not move.
//
//   double start = Timer();
//   RunStep();
//   double elapsed = Timer() - start;        // seconds
//   Delay(0.25);                              // wait a quarter of a second
#pragma once

#include "tekit/Export.h"

/// Seconds since the library's clock started (its first use), with the resolution of the
/// system's monotonic clock (a microsecond or better).
extern "C" TEKIT_API double TEKIT_STDCALL Timer(void);
/// Suspends the calling thread for at least `seconds`; at once for 0, a negative value or a
/// NaN. A wait is cut at one day.
extern "C" TEKIT_API void TEKIT_STDCALL Delay(double seconds);
