// Timer, delays, sound signals and the international date and time: the toolbox's faces of
// the platform's clock and sound.
#include "tekit/toolbox/DateTime.h"
#include "tekit/toolbox/Sound.h"
#include "tekit/toolbox/Timer.h"

#include "platform/Clock.h"
#include "platform/Sound.h"
#include "tekit/errors/TEError.h"
#include "toolbox/DateTimeText.h"

#include <cmath>
#include <cstdio>
#include <cstring>

namespace tekit::toolbox {

namespace {

bool InRange(int value, int low, int high) {
    return value >= low && value <= high;
}

/// Writes three numbers in `format`, a text of exactly `length` characters, to `buffer`.
int WriteFixed(char const* format, int length, int a, int b, int c, char* buffer, int bufferSize) {
    if (!buffer)
        return TE_INVALID_POINTER;
    if (bufferSize <= length)
        return TE_INVALID_OR_OUT_OF_RANGE;
    char text[16];
    std::snprintf(text, sizeof text, format, a, b, c);
    std::memcpy(buffer, text, static_cast<std::size_t>(length) + 1);
    return length;
}

} // namespace

int FormatInternationalDate(platform::LocalDateTime const& when, char* buffer, int bufferSize) {
    if (!InRange(when.year, 0, 9999) || !InRange(when.month, 1, 12) || !InRange(when.day, 1, 31))
        return TE_INVALID_OR_OUT_OF_RANGE;
    return WriteFixed("%04d-%02d-%02d", 10, when.year, when.month, when.day, buffer, bufferSize);
}

int FormatInternationalTime(platform::LocalDateTime const& when, char* buffer, int bufferSize) {
    if (!InRange(when.hour, 0, 23) || !InRange(when.minute, 0, 59) || !InRange(when.second, 0, 60))
        return TE_INVALID_OR_OUT_OF_RANGE;
    return WriteFixed("%02d:%02d:%02d", 8, when.hour, when.minute, when.second, buffer, bufferSize);
}

} // namespace tekit::toolbox

namespace {

using namespace tekit;

/// The clock's origin, taken at its first use.
std::uint64_t TimerOrigin() {
    static std::uint64_t const origin = platform::MonotonicNanoseconds();
    return origin;
}

/// Calls `format` with the current local date and time.
template <class Format> int FormatNow(Format format, char* buffer, int bufferSize) {
    if (!buffer)
        return TE_INVALID_POINTER;
    platform::LocalDateTime now;
    if (!platform::CurrentLocalDateTime(now))
        return TE_UNEXPECTED_SYSTEM_ERROR;
    return format(now, buffer, bufferSize);
}

} // namespace

extern "C" double TEKIT_STDCALL Timer(void) {
    std::uint64_t const origin = TimerOrigin();
    return static_cast<double>(platform::MonotonicNanoseconds() - origin) * 1e-9;
}

extern "C" void TEKIT_STDCALL Delay(double seconds) {
    constexpr double kLongestDelay = 86400.0;
    if (!(seconds > 0.0)) // also a NaN
        return;
    double const microseconds = std::ceil(std::fmin(seconds, kLongestDelay) * 1e6);
    platform::SleepMicroseconds(static_cast<std::uint64_t>(microseconds));
}

extern "C" int TEKIT_STDCALL TBBeep(void) {
    return platform::PlayAlertSound() ? 1 : 0;
}

extern "C" int TEKIT_STDCALL TBTone(int frequency, int milliseconds) {
    if (frequency < 37 || frequency > 32767 || milliseconds < 0 || milliseconds > 10000)
        return 0;
    return platform::PlayTone(static_cast<unsigned>(frequency), static_cast<unsigned>(milliseconds))
               ? 1
               : 0;
}

extern "C" int TEKIT_STDCALL InternationalDate(char* buffer, int bufferSize) {
    return FormatNow(toolbox::FormatInternationalDate, buffer, bufferSize);
}

extern "C" int TEKIT_STDCALL InternationalTime(char* buffer, int bufferSize) {
    return FormatNow(toolbox::FormatInternationalTime, buffer, bufferSize);
}
