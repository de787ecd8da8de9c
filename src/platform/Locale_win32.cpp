// The user's decimal separator, from the regional settings rather than the C runtime's locale.
#include "platform/Locale.h"
#include "platform/Win32.h"

namespace tekit::platform {

char GetSystemDecimalSeparator() {
    // Read each time: the user may change the settings while the process runs, and the call
    // costs no file access.
    char separator[8] = {};
    int const written =
        ::GetLocaleInfoA(LOCALE_USER_DEFAULT, LOCALE_SDECIMAL, separator, sizeof separator);
    // `written` counts the terminator: 2 is a single-byte separator.
    return written == 2 ? separator[0] : '.';
}

} // namespace tekit::platform
