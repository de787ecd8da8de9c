// The system's sound output, for audible operator signals: the POSIX implementation.
#include "platform/Sound.h"

namespace tekit::platform {

// A POSIX system offers no sound device that a library may assume (a terminal bell would
// write into the caller's output), so the signals are documented as not played.
bool PlayAlertSound() {
    return false;
}

bool PlayTone(unsigned, unsigned) {
    return false;
}

} // namespace tekit::platform
