// FormatMessage texts; errno values are already in the C runtime's numbering here.
#include "platform/SystemError.h"
#include "platform/Win32.h"

#include <cstdio>

namespace tekit::platform {

namespace {

/// The text for a code the system has no message for, the same on every platform.
std::string GenericMessage(unsigned code) {
    char buffer[32] = {};
    if (code >= 0x80000000u)
        std::snprintf(buffer, sizeof buffer, "System error 0x%08X", code);
    else
        std::snprintf(buffer, sizeof buffer, "System error %u", code);
    return buffer;
}

} // namespace

std::string SystemErrorMessage(unsigned code) {
    char buffer[512] = {};
    DWORD const flags = FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS;
    DWORD length = ::FormatMessageA(flags, nullptr, code, 0, buffer, sizeof buffer, nullptr);
    if (length == 0 || length >= sizeof buffer)
        return GenericMessage(code);
    // System messages end with a line break, which a description embeds badly.
    while (length > 0 &&
           (buffer[length - 1] == '\n' || buffer[length - 1] == '\r' || buffer[length - 1] == ' '))
        --length;
    if (length == 0)
        return GenericMessage(code);
    return std::string(buffer, length);
}

int NativeErrnoToCrtErrno(int nativeErrno) {
    // The C runtime's own numbering is the one error conversions are written against.
    return nativeErrno;
}

} // namespace tekit::platform
