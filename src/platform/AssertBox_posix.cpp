// Shows a fatal assertion's text to the user before the process aborts: the POSIX implementation.
#include "platform/AssertBox.h"

#include <cstdio>

namespace tekit::platform {

// No desktop to ask: the text goes where a terminal or a log collects it.
void ShowAssertBox(char const* /*caption*/, char const* text) {
    std::fputs(text ? text : "", stderr);
    std::fputc('\n', stderr);
    std::fflush(stderr);
}

} // namespace tekit::platform
