// Narrow text in a code page to wide text and back. Code page 0, and any code page the system
// does not know, is Latin-1 (each byte its own code point), so a conversion never fails as a
// whole.
#pragma once

#include <string>

namespace tekit::platform {

/// Narrow text of `numBytes` bytes (negative: up to the terminator; null text: empty) to wide.
std::wstring NarrowToWide(char const* text, int numBytes, unsigned codePage);
/// Wide text to narrow text; a character the code page cannot hold becomes one '?'.
std::string WideToNarrow(wchar_t const* text, int numChars, unsigned codePage);

/// The system's conversion of `length` (> 0) bytes; false when it does not know `codePage`
/// (not 0). One per family: iconv on POSIX, MultiByteToWideChar on Windows.
bool SystemNarrowToWide(char const* text, int length, unsigned codePage, std::wstring& out);
bool SystemWideToNarrow(wchar_t const* text, int length, unsigned codePage, std::string& out);

} // namespace tekit::platform
