// Finding texts and characters inside a string's bytes, shared by the search, replacement and
// trimming members.
//
// Positions are byte offsets that always fall on a character boundary: in multibyte mode a
// candidate match starts only where a character starts, so the trail byte of a double-byte
// character (which may equal an ASCII letter) never starts or ends a match.
//
//   detail::Needle needle{find, findBytes, /*ignoreCase*/ true, /*wholeWord*/ false};
//   int at = detail::FindNext(text, textBytes, 0, needle, mb);   // byte offset or -1
#pragma once

#include "strings/CharScan.h"
#include "tekit/strings/String.h"

#include <algorithm>

namespace tekit::detail {

/// The string's text; never null, even for storage without a buffer.
inline char const* ReadPtr(String const& s) {
    char const* p = s.GetBufferReadPtr();
    return (p && s.GetBufferSize() > 0) ? p : "";
}

/// Byte offset of character `charIndex` of `text` (`textBytes` bytes), clamped to the text.
inline int OffsetOfChar(char const* text, int textBytes, int charIndex, bool mb) {
    if (!mb)
        return std::clamp(charIndex, 0, textBytes);
    return detail::ByteOffsetOfChar(text, charIndex, true);
}

/// Character index of byte offset `offset` (a character boundary) of `text`.
inline int IndexOfOffset(char const* text, int offset, bool mb) {
    return mb ? detail::CharIndexOfByte(text, offset, true) : offset;
}

/// What to look for.
struct Needle {
    char const* text;
    int bytes;
    bool ignoreCase;
    /// The match must be neither preceded nor followed by a word character.
    bool wholeWord;
};

/// True when the bytes at `p` start with the characters of `needle`, compared character by
/// character (ASCII letters folded when ignoring case). `p` is NUL-terminated.
bool MatchesAt(char const* p, Needle const& needle, bool mb);

/// Byte offset of the first occurrence of `needle` at or after byte offset `from` (a character
/// boundary) in the `textBytes` bytes of `text`; -1 when there is none or the needle is empty.
int FindNext(char const* text, int textBytes, int from, Needle const& needle, bool mb);

/// True when `ch` is one of the characters of `set` (null: white space).
bool IsInSet(unsigned short ch, char const* set, bool mb);

} // namespace tekit::detail
