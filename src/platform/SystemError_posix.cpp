#include "platform/Platform.h"

#include <cstdio>
#include <cstring>

namespace tekit::platform {

namespace {

/// strerror_r comes in two shapes (XSI returns int and fills the buffer, GNU returns the text);
/// these overloads accept either.
[[maybe_unused]] char const* StrerrorResult(int rc, char const* buffer) {
    return rc == 0 ? buffer : nullptr;
}
[[maybe_unused]] char const* StrerrorResult(char const* text, char const*) {
    return text;
}

/// Codes below this are taken as error numbers the host can describe; larger ones (HRESULTs,
/// Win32 codes of other subsystems) get the generic text.
constexpr unsigned kErrnoRangeLimit = 4096;

} // namespace

std::string SystemErrorMessage(unsigned code) {
    char buffer[256] = {};
    if (code != 0 && code < kErrnoRangeLimit) {
        char const* text = StrerrorResult(strerror_r(int(code), buffer, sizeof buffer), buffer);
        if (text && *text && std::strncmp(text, "Unknown error", 13) != 0)
            return text;
    }
    if (code >= 0x80000000u)
        std::snprintf(buffer, sizeof buffer, "System error 0x%08X", code);
    else
        std::snprintf(buffer, sizeof buffer, "System error %u", code);
    return buffer;
}

} // namespace tekit::platform
