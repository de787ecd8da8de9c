// The escaping of string values: control characters, quotes and backslashes as backslash
// sequences, so that any text survives one line of an INI file.
//
//   std::size_t n = EscapedLength("a\tb", mb);     // 4
//   Escape("a\tb", out, mb);                       // a\tb (backslash, 't')
//   Unescape(out, back, sizeof back, mb);          // "a\tb" again
#pragma once

#include <cstddef>

namespace tekit::ini {

/// Bytes (without the terminator) of the escaped form of `text`.
std::size_t EscapedLength(char const* text, bool mb);
/// Writes the escaped form of `text` and a terminator to `out` (EscapedLength + 1 bytes).
void Escape(char const* text, char* out, bool mb);
/// Writes the unescaped form of `text` to `out`, at most `capacity` - 1 bytes and never part
/// of a double-byte character, and a terminator (`capacity` >= 1). Returns the bytes written.
std::size_t Unescape(char const* text, char* out, std::size_t capacity, bool mb);

} // namespace tekit::ini
