// The user's locale, as far as the library reads it.
#pragma once

namespace tekit::platform {

/// The decimal separator of the user's locale (LC_ALL, LC_NUMERIC or LANG on POSIX, the
/// user's regional settings on Windows), never of the process's C locale; '.' when the
/// locale's separator is not a single byte or the locale cannot be read.
char GetSystemDecimalSeparator();

} // namespace tekit::platform
