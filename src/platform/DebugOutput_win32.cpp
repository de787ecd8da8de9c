// The Windows implementation of platform/DebugOutput.h.
#include "platform/DebugOutput.h"
#include "platform/Win32.h"

namespace tekit::platform {

void WriteDebugText(char const* text) {
    if (!text)
        return;
    ::OutputDebugStringA(text);
}

} // namespace tekit::platform
