// The system's sound output, for audible operator signals: the Windows implementation.
#include "platform/Sound.h"
#include "platform/Win32.h"

namespace tekit::platform {

bool PlayAlertSound() {
    return ::MessageBeep(MB_OK) != FALSE;
}

bool PlayTone(unsigned frequency, unsigned milliseconds) {
    return ::Beep(frequency, milliseconds) != FALSE;
}

} // namespace tekit::platform
