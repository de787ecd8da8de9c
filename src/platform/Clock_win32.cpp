// The Windows implementation of platform/Clock.h.
#include "platform/Clock.h"
#include "platform/Win32.h"

namespace tekit::platform {

namespace {

std::uint64_t CounterFrequency() {
    static std::uint64_t const frequency = [] {
        LARGE_INTEGER f{};
        ::QueryPerformanceFrequency(&f); // never fails on Windows XP and later
        return static_cast<std::uint64_t>(f.QuadPart);
    }();
    return frequency;
}

} // namespace

std::uint64_t MonotonicNanoseconds() {
    LARGE_INTEGER counter{};
    ::QueryPerformanceCounter(&counter);
    std::uint64_t const ticks = static_cast<std::uint64_t>(counter.QuadPart);
    std::uint64_t const f = CounterFrequency();
    // Split so that ticks * 1e9 cannot overflow 64 bits.
    return ticks / f * 1000000000u + ticks % f * 1000000000u / f;
}

void SleepMicroseconds(std::uint64_t microseconds) {
    // Sleep counts whole milliseconds: round up so the wait is never shorter than asked.
    std::uint64_t milliseconds = (microseconds + 999u) / 1000u;
    while (milliseconds > 0) {
        DWORD const step =
            milliseconds > 0x7FFFFFFFu ? 0x7FFFFFFFu : static_cast<DWORD>(milliseconds);
        ::Sleep(step);
        milliseconds -= step;
    }
}

bool CurrentLocalDateTime(LocalDateTime& now) {
    SYSTEMTIME local{};
    ::GetLocalTime(&local);
    now = {local.wYear, local.wMonth, local.wDay, local.wHour, local.wMinute, local.wSecond};
    return true;
}

} // namespace tekit::platform
