// Character scans over byte ranges for the INI reader and writer, in the string family's
// single-byte or multibyte mode.
//
// In multibyte mode a lead byte and the byte after it are one character (the string family's
// model: any byte after a lead byte is its trail byte, a lead byte at the end stands alone), and
// white space, quotes, brackets and tokens count only where a character starts. The reader
// and the writer share these scans, so what the writer puts in a line is what the reader
// takes out of it.
#pragma once

#include "strings/MultiByteChars.h"

#include <cstddef>
#include <cstring>

namespace tekit::ini {

/// The "C" locale's white space.
inline bool IsWhite(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

/// Bytes of the character at `p` (before `end`).
inline std::size_t CharSize(char const* p, char const* end, bool mb) {
    return mb && end - p > 1 && mbcs::IsLeadByte(*p) ? 2 : 1;
}

inline char const* SkipWhite(char const* p, char const* end) {
    // White-space bytes are never lead bytes, so a byte-wise skip stays on characters.
    while (p < end && IsWhite(*p))
        ++p;
    return p;
}

/// The end of [begin, end) without its trailing white-space characters.
inline char const* TrimEnd(char const* begin, char const* end, bool mb) {
    if (!mb) {
        while (end > begin && IsWhite(end[-1]))
            --end;
        return end;
    }
    char const* kept = begin;
    for (char const* p = begin; p < end;) {
        std::size_t const size = CharSize(p, end, true);
        if (size == 2 || !IsWhite(*p))
            kept = p + size;
        p += size;
    }
    return kept;
}

/// The start of the last character of the non-empty range [begin, end).
inline char const* LastChar(char const* begin, char const* end, bool mb) {
    if (!mb)
        return end - 1;
    char const* last = begin;
    for (char const* p = begin; p < end; p += CharSize(p, end, true))
        last = p;
    return last;
}

/// Whether the range ends in the single-byte character `c`.
inline bool EndsWithChar(char const* begin, char const* end, char c, bool mb) {
    if (begin == end)
        return false;
    char const* const last = LastChar(begin, end, mb);
    return end - last == 1 && *last == c;
}

/// The first place where `token` (`length` bytes) starts a match at a character start; null
/// when there is none.
inline char const* FindToken(char const* begin, char const* end, char const* token,
                             std::size_t length, bool mb) {
    if (length == 0 || static_cast<std::size_t>(end - begin) < length)
        return nullptr;
    if (!mb) {
        if (length == 1)
            return static_cast<char const*>(std::memchr(begin, token[0], end - begin));
        for (char const* p = begin; p + length <= end; ++p) {
            p = static_cast<char const*>(std::memchr(p, token[0], end - p));
            if (!p || p + length > end)
                return nullptr;
            if (std::memcmp(p, token, length) == 0)
                return p;
        }
        return nullptr;
    }
    for (char const* p = begin; p + length <= end; p += CharSize(p, end, true))
        if (std::memcmp(p, token, length) == 0)
            return p;
    return nullptr;
}

/// The last character `c` (single-byte) of the range; null when there is none.
inline char const* FindLastChar(char const* begin, char const* end, char c, bool mb) {
    if (!mb) {
        for (char const* p = end; p > begin; --p)
            if (p[-1] == c)
                return p - 1;
        return nullptr;
    }
    char const* found = nullptr;
    for (char const* p = begin; p < end;) {
        std::size_t const size = CharSize(p, end, true);
        if (size == 1 && *p == c)
            found = p;
        p += size;
    }
    return found;
}

/// Whether `offset` bytes from `begin` is where a character starts.
inline bool IsCharStart(char const* begin, char const* end, std::size_t offset, bool mb) {
    if (!mb)
        return true;
    char const* p = begin;
    while (p < begin + offset)
        p += CharSize(p, end, true);
    return p == begin + offset;
}

/// The largest character boundary of [begin, end) that is at most `limit` bytes from `begin`.
inline std::size_t CutAtBoundary(char const* begin, char const* end, std::size_t limit, bool mb) {
    std::size_t const length = static_cast<std::size_t>(end - begin);
    if (length <= limit)
        return length;
    if (!mb)
        return limit;
    std::size_t cut = 0;
    while (cut < limit) {
        std::size_t const size = CharSize(begin + cut, end, true);
        if (cut + size > limit)
            break;
        cut += size;
    }
    return cut;
}

} // namespace tekit::ini
