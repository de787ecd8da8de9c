#include "platform/Platform.h"
#include "platform/Win32.h"

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

/// Code page 0 is Latin-1: each byte is the code point of the same value.
std::wstring Latin1ToWide(char const* text, int length) {
    std::wstring out(static_cast<size_t>(length), L'\0');
    for (int i = 0; i < length; ++i)
        out[i] = static_cast<wchar_t>(static_cast<unsigned char>(text[i]));
    return out;
}

/// One '?' per character above 0xFF; a surrogate pair is one character, as on systems whose
/// wide characters are 32 bits wide.
std::string WideToLatin1(wchar_t const* text, int length) {
    std::string out;
    out.reserve(static_cast<size_t>(length));
    for (int i = 0; i < length; ++i) {
        wchar_t const c = text[i];
        if (IsHighSurrogate(c) && i + 1 < length && IsLowSurrogate(text[i + 1]))
            ++i;
        out.push_back(static_cast<unsigned>(c) <= 0xFF ? static_cast<char>(c) : '?');
    }
    return out;
}

/// Code page 0, and any the system does not know, is taken as Latin-1, so a conversion never
/// fails as a whole (the same rule as on other platforms).
bool IsSystemCodePage(unsigned codePage) {
    return codePage != 0 && ::IsValidCodePage(codePage);
}

/// Code pages that hold every character: they take neither a default character nor flags.
bool IsUnicodeCodePage(unsigned codePage) {
    return codePage == CP_UTF7 || codePage == CP_UTF8 || codePage == 54936; // GB 18030
}

/// Code pages that reject every flag (the ISO-2022 and ISCII families among them).
bool TakesNoFlags(unsigned codePage) {
    return IsUnicodeCodePage(codePage) || codePage == 42 ||
           (codePage >= 50220 && codePage <= 50229) || (codePage >= 57002 && codePage <= 57011);
}

/// A code page of single and double bytes holds no character beyond U+FFFF, and the system
/// would write a '?' for each half of a surrogate pair: make the pair one '?' beforehand.
std::wstring JoinSurrogatePairs(wchar_t const* text, int length) {
    std::wstring out;
    out.reserve(static_cast<size_t>(length));
    for (int i = 0; i < length; ++i) {
        if (IsHighSurrogate(text[i]) && i + 1 < length && IsLowSurrogate(text[i + 1])) {
            out.push_back(L'?');
            ++i;
        } else {
            out.push_back(text[i]);
        }
    }
    return out;
}

/// WideCharToMultiByte into a string of the right size; empty when the system refuses.
std::string SystemWideToNarrow(unsigned codePage, DWORD flags, wchar_t const* text, int length,
                               char const* fallback) {
    int const needed =
        ::WideCharToMultiByte(codePage, flags, text, length, nullptr, 0, fallback, nullptr);
    if (needed <= 0)
        return {};
    std::string out(static_cast<size_t>(needed), '\0');
    int const written =
        ::WideCharToMultiByte(codePage, flags, text, length, out.data(), needed, fallback, nullptr);
    out.resize(written > 0 ? static_cast<size_t>(written) : 0);
    return out;
}

} // namespace

std::wstring NarrowToWide(char const* text, int numBytes, unsigned codePage) {
    int const length = ResolveLength(text, numBytes);
    if (length == 0)
        return {};
    if (!IsSystemCodePage(codePage))
        return Latin1ToWide(text, length);
    int const needed = ::MultiByteToWideChar(codePage, 0, text, length, nullptr, 0);
    if (needed <= 0)
        return {};
    std::wstring out(static_cast<size_t>(needed), L'\0');
    int const written = ::MultiByteToWideChar(codePage, 0, text, length, out.data(), needed);
    out.resize(written > 0 ? static_cast<size_t>(written) : 0);
    return out;
}

std::string WideToNarrow(wchar_t const* text, int numChars, unsigned codePage) {
    int const length = ResolveLength(text, numChars);
    if (length == 0)
        return {};
    if (!IsSystemCodePage(codePage))
        return WideToLatin1(text, length);
    if (IsUnicodeCodePage(codePage))
        return SystemWideToNarrow(codePage, 0, text, length, nullptr);
    // No best fit: a character the code page cannot hold becomes '?' rather than a look-alike,
    // so the same text converts the same way on every platform.
    DWORD const flags = TakesNoFlags(codePage) ? 0 : WC_NO_BEST_FIT_CHARS;
    std::wstring const joined = JoinSurrogatePairs(text, length);
    return SystemWideToNarrow(codePage, flags, joined.data(), static_cast<int>(joined.size()), "?");
}

} // namespace tekit::platform
