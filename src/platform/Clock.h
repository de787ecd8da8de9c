// The system's clocks: a monotonic clock for measuring and waiting, and the local calendar
// time for dates and times shown to people.
#pragma once

#include <cstdint>

namespace tekit::platform {

/// Nanoseconds of the monotonic clock since an arbitrary origin fixed at boot or load; never
/// goes back and does not follow changes of the system time.
std::uint64_t MonotonicNanoseconds();

/// Suspends the calling thread for at least `microseconds`.
void SleepMicroseconds(std::uint64_t microseconds);

/// A moment of the local calendar, in the system's time zone.
struct LocalDateTime {
    int year = 0;   ///< e.g. 2024
    int month = 0;  ///< 1 to 12
    int day = 0;    ///< 1 to 31
    int hour = 0;   ///< 0 to 23
    int minute = 0; ///< 0 to 59
    int second = 0; ///< 0 to 60 (a leap second)
};

/// The current local date and time; false when the system cannot tell it.
bool CurrentLocalDateTime(LocalDateTime& now);

} // namespace tekit::platform
