// Versions of the Loomwire graphical environment: reading version text such as "21.0",
// "17.0.1" or "9.0.1f2", comparing two versions, and the fixed threshold tests the product
// calls by name.
//
//   long major, minor, patch;
//   ParseLWVersionString("9.0.1f2", major, minor, patch);        // true: 9, 0, 1
//   bool bothValid;
//   LWVersionCompare("17.0", "17.0.0", bothValid, false);        // 0, bothValid true
//   LWVersionIsMinimumVersionOrGreater("17.0f1");                // true
//   LWVersionIs130_1OrGreater("13.1");                           // false: see below
//
// A version is read as "^(\d+)(\.(\d+)(\.(\d+))?)?" reads it: major, then optionally ".minor"
// and ".minor.patch", from the first character; what follows is ignored and an absent part
// is 0. A part that does not fit in a signed 32-bit integer fails to convert.
//
// The fixed tests (LWVersionIs80OrGreater ...) parse no numbers: they look at single
// characters, the way a two-digit major was once told apart from a one-digit one, and keep
// that behaviour exactly: "13.1" is not 13.0.1 or greater and "14.1" not 14.0.1 or greater
// (only 13.0.x and 14.0.x with x at least 1, or a higher major, pass those two). The character
// rules decide even where a number would not: "100.0" passes the 10.0 test but fails the
// 11.0-and-up ones, as its second character is "0". Characters are compared as unsigned
// bytes, so a byte above 0x7F is "higher" than any digit. A null text is treated as empty
// text everywhere.
#pragma once

#include "tekit/Export.h"

namespace tekit {

/// Reads `text` into major, minor and patch (all set to 0 first; a part that fails to convert
/// stays 0). False when the text does not begin with a digit; otherwise the outcome of the
/// last part converted: "1.99999999999" is false (1, 0, 0), "99999999999.1" true (0, 1, 0).
TEKIT_API bool ParseLWVersionString(char const* text, long& major, long& minor, long& patch);
/// The same, with the patch read and discarded.
TEKIT_API bool ParseLWVersionString(char const* text, long& major, long& minor);

/// -1, 0 or 1 as `a` is lower than, equal to or higher than `b`: majors, then minors, then
/// patches (majors alone with `majorOnly`). `bothValid` tells whether both parsed; when not,
/// the result is 0.
TEKIT_API int LWVersionCompare(char const* a, char const* b, bool& bothValid, bool majorOnly);
/// Whether both parse and `version` is `given` or higher.
TEKIT_API bool LWVersionIsGivenVersionOrGreater(char const* version, char const* given,
                                                bool majorOnly);
/// Whether `version` is 17.0.0 or higher (full comparison).
TEKIT_API bool LWVersionIsMinimumVersionOrGreater(char const* version);

// The fixed threshold tests. Each needs a digit first; c0, c1, ... are the text's characters.
/// c1 a digit; or c0 "9"; or c0 "8", c1 "." and c2 not below "0".
TEKIT_API bool LWVersionIs80OrGreater(char const* version);
/// c1 a digit; or c0 "9", c1 "." and c2 not below "0".
TEKIT_API bool LWVersionIs90OrGreater(char const* version);
/// Exactly a 9.0.x with x from "1" up: "9.0." then a character not below "1".
TEKIT_API bool LWVersionIs90_1(char const* version);
/// c1 a digit; or "9." then a character not below "1"; or LWVersionIs90_1.
TEKIT_API bool LWVersionIs90_1OrGreater(char const* version);
/// c1 a digit: a major of two digits or more.
TEKIT_API bool LWVersionIs100OrGreater(char const* version);
TEKIT_API bool LWVersionIs110OrGreater(char const* version);
TEKIT_API bool LWVersionIs120OrGreater(char const* version);
TEKIT_API bool LWVersionIs130OrGreater(char const* version);
/// 14 or more by its first two characters, or "13.0." then a character not below "1".
TEKIT_API bool LWVersionIs130_1OrGreater(char const* version);
TEKIT_API bool LWVersionIs140OrGreater(char const* version);
/// 15 or more by its first two characters, or "14.0." then a character not below "1".
TEKIT_API bool LWVersionIs140_1OrGreater(char const* version);
TEKIT_API bool LWVersionIs170OrGreater(char const* version);
TEKIT_API bool LWVersionIs180OrGreater(char const* version);
TEKIT_API bool LWVersionIs190OrGreater(char const* version);
/// c1 a digit and c0 "2" or higher.
TEKIT_API bool LWVersionIs200OrGreater(char const* version);

} // namespace tekit
