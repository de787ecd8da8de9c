// Searching a string: characters, character sets, sub-strings, prefixes and suffixes, white
// space. Every search walks the text by characters, so in multibyte mode nothing is found
// inside a double-byte character.
#include "strings/CharScan.h"
#include "strings/MultiByteChars.h"
#include "strings/TextSearch.h"
#include "tekit/strings/String.h"

#include <cstring>
#include <string_view>

namespace tekit {

namespace detail {

namespace {

/// True when the `bytes` bytes at `p` are neither preceded nor followed by a word character.
bool IsWholeWordAt(char const* text, char const* p, int bytes, bool mb) {
    if (p > text) {
        char const* before = mb ? mbcs::Dec(text, p) : p - 1;
        if (String::IsCharWholeWordChar(detail::CharAt(before, mb)))
            return false;
    }
    char const* after = p + bytes;
    return *after == '\0' || !String::IsCharWholeWordChar(detail::CharAt(after, mb));
}

/// Single-byte, case respected: the library's fastest path, a plain byte search.
int FindBytes(char const* text, int textBytes, int from, Needle const& needle) {
    std::string_view const hay(text, size_t(textBytes));
    std::string_view const what(needle.text, size_t(needle.bytes));
    for (size_t at = hay.find(what, size_t(from)); at != std::string_view::npos;
         at = hay.find(what, at + 1)) {
        if (!needle.wholeWord || IsWholeWordAt(text, text + at, needle.bytes, false))
            return static_cast<int>(at);
    }
    return -1;
}

} // namespace

bool MatchesAt(char const* p, Needle const& needle, bool mb) {
    if (!mb) {
        if (needle.ignoreCase)
            return mbcs::AsciiNICmp(p, needle.text, needle.bytes) == 0;
        return std::strncmp(p, needle.text, size_t(needle.bytes)) == 0;
    }
    char const* q = needle.text;
    char const* const end = needle.text + needle.bytes;
    while (q < end) {
        unsigned short a = detail::CharAt(p, true);
        unsigned short b = detail::CharAt(q, true);
        if (needle.ignoreCase) {
            a = mbcs::ToLower(a);
            b = mbcs::ToLower(b);
        }
        if (a != b || a == 0)
            return false;
        p += detail::CharBytes(p, true);
        q += detail::CharBytes(q, true);
    }
    return true;
}

int FindNext(char const* text, int textBytes, int from, Needle const& needle, bool mb) {
    if (!needle.text || needle.bytes <= 0 || from < 0 || from > textBytes)
        return -1;
    if (!mb && !needle.ignoreCase)
        return FindBytes(text, textBytes, from, needle);
    // Case folding and character steps never change a character's width, so a match
    // always spans exactly needle.bytes bytes.
    char const* const end = text + textBytes;
    for (char const* p = text + from; end - p >= needle.bytes;) {
        if (MatchesAt(p, needle, mb) &&
            (!needle.wholeWord || IsWholeWordAt(text, p, needle.bytes, mb)))
            return static_cast<int>(p - text);
        int const step = detail::CharBytes(p, mb);
        if (step == 0)
            break;
        p += step;
    }
    return -1;
}

bool IsInSet(unsigned short ch, char const* set, bool mb) {
    if (!set)
        return detail::IsWhiteSpace(ch);
    for (char const* q = set; *q; q += detail::CharBytes(q, mb))
        if (detail::CharAt(q, mb) == ch)
            return true;
    return false;
}

} // namespace detail

namespace {

int Length(char const* text) {
    return text ? static_cast<int>(std::strlen(text)) : 0;
}

/// True when byte offset `p` of `text` starts a character.
bool IsCharBoundary(char const* text, char const* p, bool mb) {
    return !mb || p == text || mbcs::Inc(mbcs::Dec(text, p)) == p;
}

/// False for a character no text holds: NUL, and above 0xFF in single-byte mode.
bool CanOccur(unsigned short ch, bool mb) {
    return ch != 0 && (mb || ch <= 0xFF);
}

} // namespace

int String::FindChar(unsigned short ch, int startIndex) const {
    bool const mb = m_isMultiByteSupportEnabled;
    if (!CanOccur(ch, mb))
        return -1;
    char const* text = detail::ReadPtr(*this);
    if (!mb) {
        int const numBytes = GetNumBytes();
        int const from = std::clamp(startIndex, 0, numBytes);
        void const* hit = std::memchr(text + from, ch, size_t(numBytes - from));
        return hit ? static_cast<int>(static_cast<char const*>(hit) - text) : -1;
    }
    int index = 0;
    for (char const* p = text; *p; p += detail::CharBytes(p, true), ++index)
        if (index >= startIndex && detail::CharAt(p, true) == ch)
            return index;
    return -1;
}

int String::FindCharReverse(unsigned short ch, int startIndex) const {
    bool const mb = m_isMultiByteSupportEnabled;
    if (!CanOccur(ch, mb))
        return -1;
    char const* text = detail::ReadPtr(*this);
    if (!mb) {
        int const numBytes = GetNumBytes();
        int i = (startIndex < 0 || startIndex >= numBytes) ? numBytes - 1 : startIndex;
        for (; i >= 0; --i)
            if (static_cast<unsigned char>(text[i]) == ch)
                return i;
        return -1;
    }
    // Forward: only a walk from the start knows where the characters begin.
    int found = -1;
    int index = 0;
    for (char const* p = text; *p && (startIndex < 0 || index <= startIndex);
         p += detail::CharBytes(p, true), ++index)
        if (detail::CharAt(p, true) == ch)
            found = index;
    return found;
}

int String::FindCharInSet(char const* set, int startIndex) const {
    if (!set || *set == '\0')
        return -1;
    bool const mb = m_isMultiByteSupportEnabled;
    char const* text = detail::ReadPtr(*this);
    int const from = detail::OffsetOfChar(text, GetNumBytes(), startIndex, mb);
    if (!mb) {
        char const* hit = std::strpbrk(text + from, set);
        return hit ? static_cast<int>(hit - text) : -1;
    }
    int index = std::max(startIndex, 0);
    for (char const* p = text + from; *p; p += detail::CharBytes(p, true), ++index)
        if (detail::IsInSet(detail::CharAt(p, true), set, true))
            return index;
    return -1;
}

bool String::ContainsCharInSet(char const* set) const {
    return FindCharInSet(set, 0) >= 0;
}

int String::FindSubstring(char const* text, int startIndex, bool ignoreCase) const {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* own = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    detail::Needle const needle{text, Length(text), ignoreCase, false};
    int const from = detail::OffsetOfChar(own, numBytes, startIndex, mb);
    int const at = detail::FindNext(own, numBytes, from, needle, mb);
    return at < 0 ? -1 : detail::IndexOfOffset(own, at, mb);
}

int String::FindSubstring(String const& text, int startIndex, bool ignoreCase) const {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* own = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    detail::Needle const needle{detail::ReadPtr(text), text.GetNumBytes(), ignoreCase, false};
    int const from = detail::OffsetOfChar(own, numBytes, startIndex, mb);
    int const at = detail::FindNext(own, numBytes, from, needle, mb);
    return at < 0 ? -1 : detail::IndexOfOffset(own, at, mb);
}

bool String::ContainsSubstring(char const* text, bool ignoreCase) const {
    detail::Needle const needle{text, Length(text), ignoreCase, false};
    return detail::FindNext(detail::ReadPtr(*this), GetNumBytes(), 0, needle,
                            m_isMultiByteSupportEnabled) >= 0;
}

int String::GetNumOccurrences(char const* text, bool ignoreCase) const {
    bool const mb = m_isMultiByteSupportEnabled;
    char const* own = detail::ReadPtr(*this);
    int const numBytes = GetNumBytes();
    detail::Needle const needle{text, Length(text), ignoreCase, false};
    int count = 0;
    for (int at = detail::FindNext(own, numBytes, 0, needle, mb); at >= 0;
         at = detail::FindNext(own, numBytes, at + needle.bytes, needle, mb))
        ++count;
    return count;
}

int String::GetNumOccurrences(unsigned short ch) const {
    bool const mb = m_isMultiByteSupportEnabled;
    if (ch == 0)
        return 0;
    int count = 0;
    for (char const* p = detail::ReadPtr(*this); *p; p += detail::CharBytes(p, mb))
        if (detail::CharAt(p, mb) == ch)
            ++count;
    return count;
}

bool String::StartsWith(char const* text, bool ignoreCase) const {
    detail::Needle const needle{text, Length(text), ignoreCase, false};
    if (needle.bytes == 0)
        return true;
    if (needle.bytes > GetNumBytes())
        return false;
    return detail::MatchesAt(detail::ReadPtr(*this), needle, m_isMultiByteSupportEnabled);
}

bool String::EndsWith(char const* text, bool ignoreCase) const {
    bool const mb = m_isMultiByteSupportEnabled;
    detail::Needle const needle{text, Length(text), ignoreCase, false};
    int const numBytes = GetNumBytes();
    if (needle.bytes == 0)
        return true;
    if (needle.bytes > numBytes)
        return false;
    char const* own = detail::ReadPtr(*this);
    char const* start = own + numBytes - needle.bytes;
    return IsCharBoundary(own, start, mb) && detail::MatchesAt(start, needle, mb);
}

bool String::ContainsCntrlChar() const {
    bool const mb = m_isMultiByteSupportEnabled;
    for (char const* p = detail::ReadPtr(*this); *p; p += detail::CharBytes(p, mb))
        if (detail::IsControl(detail::CharAt(p, mb)))
            return true;
    return false;
}

// ---- White space ------------------------------------------------------------------------

namespace {

/// Index of the first character at or after `charIndex` whose white-space-ness is not
/// `skipWhiteSpace`, or the text's length in characters.
int SkipWhile(String const& s, int charIndex, bool skipWhiteSpace) {
    bool const mb = String::IsMultiByteSupportEnabled();
    char const* text = detail::ReadPtr(s);
    int const from = detail::OffsetOfChar(text, s.GetNumBytes(), charIndex, mb);
    int index = mb ? detail::IndexOfOffset(text, from, true) : from;
    for (char const* p = text + from; *p; p += detail::CharBytes(p, mb), ++index)
        if (detail::IsWhiteSpace(detail::CharAt(p, mb)) != skipWhiteSpace)
            break;
    return index;
}

} // namespace

int String::SkipWhiteSpace(int charIndex) const {
    return SkipWhile(*this, charIndex, true);
}

int String::SkipNonWhiteSpace(int charIndex) const {
    return SkipWhile(*this, charIndex, false);
}

} // namespace tekit
