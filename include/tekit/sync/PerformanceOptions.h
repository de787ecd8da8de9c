// Process-wide tuning of the locks, and the reader-writer lock counters of the interface.
//
//   gPerformanceOptions |= kPerformanceOptionSpinningLocks;  // once, before threads start
#pragma once

#include "tekit/Export.h"

#include <cstdint>

namespace tekit {

/// A bit set, 0 at load.
extern TEKIT_API std::int32_t gPerformanceOptions;

/// A lock that must wait retries at once instead of yielding with Sleep(0) between attempts.
inline constexpr std::int32_t kPerformanceOptionSpinningLocks = 2;
/// The asynchronous reference releaser releases COM references on its own thread.
inline constexpr std::int32_t kPerformanceOptionAsynchronousRelease = 32;

/// Part of the exported interface; the library's locks never change them, so they stay 0.
extern TEKIT_API std::int32_t gRWLockContentionCount;
extern TEKIT_API std::int32_t gRWLockShareCount;
extern TEKIT_API std::int32_t gRWLockSleepCount;
extern TEKIT_API std::int32_t gRWLockTotalCount;

} // namespace tekit
