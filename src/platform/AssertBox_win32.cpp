// Shows a fatal assertion's text to the user before the process aborts: the Windows implementation.
#include "platform/AssertBox.h"
#include "platform/Win32.h"

namespace tekit::platform {

// Task-modal so the user cannot go on working in the failing program's windows meanwhile.
void ShowAssertBox(char const* caption, char const* text) {
    ::MessageBoxA(nullptr, text ? text : "", caption ? caption : "",
                  MB_OK | MB_ICONSTOP | MB_TASKMODAL | MB_SETFOREGROUND);
}

} // namespace tekit::platform
