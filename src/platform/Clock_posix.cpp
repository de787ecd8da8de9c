// The POSIX implementation of platform/Clock.h.
#include "platform/Clock.h"

#include <cerrno>
#include <ctime>

namespace tekit::platform {

std::uint64_t MonotonicNanoseconds() {
    timespec now{};
    ::clock_gettime(CLOCK_MONOTONIC, &now);
    return static_cast<std::uint64_t>(now.tv_sec) * 1000000000u +
           static_cast<std::uint64_t>(now.tv_nsec);
}

void SleepMicroseconds(std::uint64_t microseconds) {
    timespec wait{static_cast<time_t>(microseconds / 1000000u),
                  static_cast<long>(microseconds % 1000000u) * 1000L};
    // A signal cuts the sleep short; sleep on for what is left.
    while (::nanosleep(&wait, &wait) != 0 && errno == EINTR) {
    }
}

bool CurrentLocalDateTime(LocalDateTime& now) {
    time_t const seconds = ::time(nullptr);
    tm local{};
    if (seconds == static_cast<time_t>(-1) || !::localtime_r(&seconds, &local))
        return false;
    now = {local.tm_year + 1900, local.tm_mon + 1, local.tm_mday,
           local.tm_hour,        local.tm_min,     local.tm_sec};
    return true;
}

} // namespace tekit::platform
