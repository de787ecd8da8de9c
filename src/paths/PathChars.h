// The path text as a list of character values, so that every path algorithm works by index
// on whole characters: in multibyte mode a double-byte character is one value (lead byte in
// the high 8 bits), and its trail byte can never be mistaken for a backslash or a colon.
//
//   PathChars chars = ToChars(path.GetString());
//   int const sep = FindLast(chars, '\\', 0, Size(chars));
//   AssignChars(out, chars, sep + 1, Size(chars));
#pragma once

#include "tekit/strings/String.h"

#include <string>
#include <vector>

namespace tekit::detail {

using PathChars = std::vector<unsigned short>;

inline constexpr unsigned short kSeparator = '\\';

/// The characters of `text` (of a null text: none).
PathChars ToChars(char const* text);
inline PathChars ToChars(String const& text) {
    return ToChars(text.GetBufferReadPtr());
}
inline int Size(PathChars const& chars) {
    return static_cast<int>(chars.size());
}

/// The bytes of the characters [begin, end), clamped to the list.
std::string ToBytes(PathChars const& chars, int begin, int end);
inline std::string ToBytes(PathChars const& chars) {
    return ToBytes(chars, 0, Size(chars));
}
/// Assigns the characters [begin, end) to `out` (which cuts them where its storage ends).
void AssignChars(String& out, PathChars const& chars, int begin, int end);
inline void AssignChars(String& out, PathChars const& chars) {
    AssignChars(out, chars, 0, Size(chars));
}

/// Index of the first `ch` in [from, end), or -1.
int FindFirst(PathChars const& chars, unsigned short ch, int from, int end);
/// Index of the last `ch` in [begin, end), or -1.
int FindLast(PathChars const& chars, unsigned short ch, int begin, int end);

/// An ASCII letter: a drive letter. A double-byte character never is one.
inline bool IsAsciiLetter(unsigned short ch) {
    return (ch >= 'A' && ch <= 'Z') || (ch >= 'a' && ch <= 'z');
}
inline unsigned short FoldCase(unsigned short ch) {
    return (ch >= 'A' && ch <= 'Z') ? static_cast<unsigned short>(ch - 'A' + 'a') : ch;
}
/// The characters [begin, end) equal `ascii` without regard to ASCII case.
bool EqualsNoCase(PathChars const& chars, int begin, int end, char const* ascii);
/// Two ranges are equal without regard to ASCII case.
bool RangesEqualNoCase(PathChars const& a, int aBegin, int aEnd, PathChars const& b, int bBegin,
                       int bEnd);

} // namespace tekit::detail
