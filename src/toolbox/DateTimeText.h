// The text forms of dates and times, apart from the clock so that tests can give any moment.
#pragma once

#include "platform/Clock.h"

namespace tekit::toolbox {

/// "YYYY-MM-DD" and a terminator into `buffer`; 10, or a negative TEError when the buffer is
/// null or smaller than 11 bytes or the date has no such form (a year outside 0 to 9999).
int FormatInternationalDate(platform::LocalDateTime const& when, char* buffer, int bufferSize);
/// "HH:MM:SS" and a terminator; 8, with the failures of FormatInternationalDate.
int FormatInternationalTime(platform::LocalDateTime const& when, char* buffer, int bufferSize);

} // namespace tekit::toolbox
