// The POSIX implementation of platform/DebugOutput.h.
#include "platform/DebugOutput.h"

#include <cstdio>

namespace tekit::platform {

void WriteDebugText(char const* text) {
    if (!text)
        return;
    std::fputs(text, stderr);
    std::fflush(stderr);
}

} // namespace tekit::platform
