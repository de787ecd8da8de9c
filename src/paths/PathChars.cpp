// Path texts as character lists: double-byte characters kept whole, so the path rules work
// on characters, never on half a character.
#include "paths/PathChars.h"

#include "strings/MultiByteChars.h"

#include <algorithm>

namespace tekit::detail {

PathChars ToChars(char const* text) {
    PathChars chars;
    if (!text)
        return chars;
    if (!String::IsMultiByteSupportEnabled()) {
        for (char const* p = text; *p; ++p)
            chars.push_back(static_cast<unsigned char>(*p));
        return chars;
    }
    for (char const* p = text; *p; p = mbcs::Inc(p))
        chars.push_back(mbcs::GetChar(p));
    return chars;
}

std::string ToBytes(PathChars const& chars, int begin, int end) {
    begin = std::clamp(begin, 0, Size(chars));
    end = std::clamp(end, begin, Size(chars));
    std::string bytes;
    bytes.reserve(static_cast<size_t>(end - begin));
    for (int i = begin; i < end; ++i) {
        unsigned short const ch = chars[static_cast<size_t>(i)];
        if (ch > 0xFF)
            bytes += static_cast<char>(ch >> 8);
        bytes += static_cast<char>(ch & 0xFF);
    }
    return bytes;
}

void AssignChars(String& out, PathChars const& chars, int begin, int end) {
    out.Assign(ToBytes(chars, begin, end).c_str());
}

int FindFirst(PathChars const& chars, unsigned short ch, int from, int end) {
    end = std::min(end, Size(chars));
    for (int i = std::max(from, 0); i < end; ++i)
        if (chars[static_cast<size_t>(i)] == ch)
            return i;
    return -1;
}

int FindLast(PathChars const& chars, unsigned short ch, int begin, int end) {
    begin = std::max(begin, 0);
    for (int i = std::min(end, Size(chars)) - 1; i >= begin; --i)
        if (chars[static_cast<size_t>(i)] == ch)
            return i;
    return -1;
}

bool EqualsNoCase(PathChars const& chars, int begin, int end, char const* ascii) {
    int i = begin;
    for (; *ascii; ++ascii, ++i) {
        if (i >= end || i >= Size(chars))
            return false;
        if (FoldCase(chars[static_cast<size_t>(i)]) != FoldCase(static_cast<unsigned char>(*ascii)))
            return false;
    }
    return i == end;
}

bool RangesEqualNoCase(PathChars const& a, int aBegin, int aEnd, PathChars const& b, int bBegin,
                       int bEnd) {
    if (aEnd - aBegin != bEnd - bBegin)
        return false;
    for (int i = 0; i < aEnd - aBegin; ++i)
        if (FoldCase(a[static_cast<size_t>(aBegin + i)]) !=
            FoldCase(b[static_cast<size_t>(bBegin + i)]))
            return false;
    return true;
}

} // namespace tekit::detail
