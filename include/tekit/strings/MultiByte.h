// Which bytes lead a double-byte character in multibyte mode.
//
// Multibyte mode itself is String::EnableMultiByteSupport; the code page only says which bytes
// are lead bytes. On Windows the table comes from the process's ANSI code page when the library
// loads; elsewhere it starts single-byte and is set here:
//
//   SetMultiByteCodePage(932);             // Shift-JIS: lead bytes 0x81-0x9F and 0xE0-0xFC
//   String::EnableMultiByteSupport(true);
//
// Like the multibyte switch, it is meant to be set once at start-up, before strings are shared
// between threads.
#pragma once

#include "tekit/Export.h"

namespace tekit {

/// Fills the lead-byte table for `codePage`: 0 is single-byte (no lead bytes), 932 Shift-JIS;
/// 936, 949 and 950 are known as well. An unknown code page leaves the table as it was.
TEKIT_API void SetMultiByteCodePage(unsigned codePage);
/// The code page whose lead bytes are in use (0: single-byte).
TEKIT_API unsigned GetMultiByteCodePage();

} // namespace tekit
