// Narrow text to wide and UTF-8 text and back; UTF-8 by portable code.
#include "strings/WideText.h"

#include "platform/TextConversion.h"
#include "strings/MultiByteChars.h"

#include <cstring>
#include <cwchar>

namespace tekit::detail {

namespace {

constexpr char32_t kReplacement = 0xFFFD;

int NarrowLength(char const* text, int numBytes) {
    if (!text)
        return 0;
    return numBytes < 0 ? static_cast<int>(std::strlen(text))
                        : static_cast<int>(strnlen(text, size_t(numBytes)));
}

int WideLength(wchar_t const* text, int numChars) {
    if (!text)
        return 0;
    int n = 0;
    while ((numChars < 0 || n < numChars) && text[n] != 0)
        ++n;
    return n;
}

bool IsSurrogate(char32_t c) {
    return c >= 0xD800 && c <= 0xDFFF;
}

/// Appends one code point to wide text, as a surrogate pair where wchar_t has 16 bits.
void PutWide(std::wstring& out, char32_t c) {
    if constexpr (sizeof(wchar_t) == 2) {
        if (c > 0xFFFF) {
            c -= 0x10000;
            out.push_back(static_cast<wchar_t>(0xD800 + (c >> 10)));
            out.push_back(static_cast<wchar_t>(0xDC00 + (c & 0x3FF)));
            return;
        }
    }
    out.push_back(static_cast<wchar_t>(c));
}

/// Reads one code point of wide text at `i` and advances `i`; unpaired surrogates give U+FFFD.
char32_t GetWide(wchar_t const* text, int length, int& i) {
    auto c = static_cast<char32_t>(text[i++]);
    if constexpr (sizeof(wchar_t) == 2) {
        if (c >= 0xD800 && c <= 0xDBFF && i < length) {
            auto const low = static_cast<char32_t>(text[i]);
            if (low >= 0xDC00 && low <= 0xDFFF) {
                ++i;
                return 0x10000 + ((c - 0xD800) << 10) + (low - 0xDC00);
            }
        }
    }
    return (IsSurrogate(c) || c > 0x10FFFF) ? kReplacement : c;
}

void PutUtf8(std::string& out, char32_t c) {
    if (c < 0x80) {
        out.push_back(static_cast<char>(c));
    } else if (c < 0x800) {
        out.push_back(static_cast<char>(0xC0 | (c >> 6)));
        out.push_back(static_cast<char>(0x80 | (c & 0x3F)));
    } else if (c < 0x10000) {
        out.push_back(static_cast<char>(0xE0 | (c >> 12)));
        out.push_back(static_cast<char>(0x80 | ((c >> 6) & 0x3F)));
        out.push_back(static_cast<char>(0x80 | (c & 0x3F)));
    } else {
        out.push_back(static_cast<char>(0xF0 | (c >> 18)));
        out.push_back(static_cast<char>(0x80 | ((c >> 12) & 0x3F)));
        out.push_back(static_cast<char>(0x80 | ((c >> 6) & 0x3F)));
        out.push_back(static_cast<char>(0x80 | (c & 0x3F)));
    }
}

/// The continuation bytes that follow a UTF-8 lead byte (0: not a lead byte) and its payload.
int Utf8LeadForm(unsigned char lead, char32_t& payload) {
    if (lead >= 0xC2 && lead <= 0xDF) {
        payload = lead & 0x1F;
        return 1;
    }
    if (lead >= 0xE0 && lead <= 0xEF) {
        payload = lead & 0x0F;
        return 2;
    }
    if (lead >= 0xF0 && lead <= 0xF4) {
        payload = lead & 0x07;
        return 3;
    }
    return 0;
}

/// True when the first continuation byte makes an overlong form, a surrogate or a value above
/// U+10FFFF: the sequence is rejected there, so its remaining bytes are read again as strays.
bool BadSecondByte(unsigned char lead, unsigned char second) {
    return (lead == 0xE0 && second < 0xA0) || (lead == 0xED && second >= 0xA0) ||
           (lead == 0xF0 && second < 0x90) || (lead == 0xF4 && second >= 0x90);
}

/// Reads one UTF-8 sequence at `i` and advances `i`. An invalid or cut sequence gives U+FFFD
/// and advances past its longest valid start (at least one byte), so decoding resumes at the
/// next possible lead byte.
char32_t GetUtf8(unsigned char const* s, int length, int& i) {
    unsigned char const lead = s[i++];
    if (lead < 0x80)
        return lead;
    char32_t c = 0;
    int const extra = Utf8LeadForm(lead, c);
    if (extra == 0)
        return kReplacement;
    for (int k = 0; k < extra; ++k) {
        if (i >= length || (s[i] & 0xC0) != 0x80)
            return kReplacement;
        if (k == 0 && BadSecondByte(lead, s[i]))
            return kReplacement;
        c = (c << 6) | (s[i] & 0x3F);
        ++i;
    }
    return c;
}

} // namespace

std::wstring ToWide(char const* text, int numBytes) {
    int const n = NarrowLength(text, numBytes);
    if (n == 0)
        return {};
    return platform::NarrowToWide(text, n, mbcs::CurrentCodePage());
}

std::string ToNarrow(wchar_t const* text, int numChars) {
    int const n = WideLength(text, numChars);
    if (n == 0)
        return {};
    return platform::WideToNarrow(text, n, mbcs::CurrentCodePage());
}

std::wstring Utf8ToWide(char const* utf8, int numBytes) {
    int const n = NarrowLength(utf8, numBytes);
    std::wstring out;
    out.reserve(size_t(n));
    auto const* s = reinterpret_cast<unsigned char const*>(utf8);
    for (int i = 0; i < n;)
        PutWide(out, GetUtf8(s, n, i));
    return out;
}

std::string WideToUtf8(wchar_t const* text, int numChars) {
    int const n = WideLength(text, numChars);
    std::string out;
    out.reserve(size_t(n));
    for (int i = 0; i < n;)
        PutUtf8(out, GetWide(text, n, i));
    return out;
}

} // namespace tekit::detail
