// Narrow <-> wide text: the rules every platform shares (lengths, Latin-1 for code page 0 and
// for code pages the system does not know) around the system's own conversion.
#include "platform/TextConversion.h"

#include <cstdint>
#include <cstring>
#include <cwchar>

namespace tekit::platform {

namespace {

/// A negative count means "up to the terminator"; a null text is the empty text.
int ResolveLength(char const* text, int numBytes) {
    if (!text)
        return 0;
    return numBytes < 0 ? static_cast<int>(std::strlen(text)) : numBytes;
}

int ResolveLength(wchar_t const* text, int numChars) {
    if (!text)
        return 0;
    return numChars < 0 ? static_cast<int>(std::wcslen(text)) : numChars;
}

bool IsHighSurrogate(wchar_t c) {
    return c >= 0xD800 && c <= 0xDBFF;
}

bool IsLowSurrogate(wchar_t c) {
    return c >= 0xDC00 && c <= 0xDFFF;
}

/// Each byte is the code point of the same value.
std::wstring Latin1ToWide(char const* text, int length) {
    std::wstring out(static_cast<size_t>(length), L'\0');
    for (int i = 0; i < length; ++i)
        out[size_t(i)] = static_cast<wchar_t>(static_cast<unsigned char>(text[i]));
    return out;
}

/// One '?' per character above 0xFF; a UTF-16 surrogate pair is one character, as where wide
/// characters are 32 bits wide.
std::string WideToLatin1(wchar_t const* text, int length) {
    std::string out;
    out.reserve(static_cast<size_t>(length));
    for (int i = 0; i < length; ++i) {
        wchar_t const c = text[i];
        if (IsHighSurrogate(c) && i + 1 < length && IsLowSurrogate(text[i + 1]))
            ++i;
        out.push_back(static_cast<std::uint32_t>(c) <= 0xFF ? static_cast<char>(c) : '?');
    }
    return out;
}

} // namespace

std::wstring NarrowToWide(char const* text, int numBytes, unsigned codePage) {
    int const length = ResolveLength(text, numBytes);
    if (length <= 0)
        return {};
    std::wstring out;
    if (codePage != 0 && SystemNarrowToWide(text, length, codePage, out))
        return out;
    return Latin1ToWide(text, length);
}

std::string WideToNarrow(wchar_t const* text, int numChars, unsigned codePage) {
    int const length = ResolveLength(text, numChars);
    if (length <= 0)
        return {};
    std::string out;
    if (codePage != 0 && SystemWideToNarrow(text, length, codePage, out))
        return out;
    return WideToLatin1(text, length);
}

} // namespace tekit::platform
