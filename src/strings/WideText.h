// Conversions between the family's narrow text and wide or UTF-8 text.
//
// Narrow text is in the code page of the lead-byte table (the process's ANSI code page on
// Windows; Latin-1 when it is 0 elsewhere). Wide text is UTF-16 where wchar_t has 16 bits
// (Windows) and UTF-32 where it has 32. UTF-8 is converted by portable code: invalid input
// becomes U+FFFD and never stops the conversion.
#pragma once

#include <string>

namespace tekit::detail {

/// `numBytes` of narrow text (negative: to the terminator) as wide text.
std::wstring ToWide(char const* text, int numBytes);
/// `numChars` wide characters (negative: to the terminator) as narrow text; characters the
/// code page cannot hold become '?'.
std::string ToNarrow(wchar_t const* text, int numChars);

/// `numBytes` of UTF-8 (negative: to the terminator) as wide text.
std::wstring Utf8ToWide(char const* utf8, int numBytes);
/// Wide text as UTF-8; unpaired surrogates become U+FFFD.
std::string WideToUtf8(wchar_t const* text, int numChars);

} // namespace tekit::detail
