// The system's conversion on Windows: MultiByteToWideChar and WideCharToMultiByte, without
// best-fit look-alikes.
#include "platform/TextConversion.h"
#include "platform/Win32.h"

namespace tekit::platform {

namespace {

bool IsHighSurrogate(wchar_t c) {
    return c >= 0xD800 && c <= 0xDBFF;
}

bool IsLowSurrogate(wchar_t c) {
    return c >= 0xDC00 && c <= 0xDFFF;
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
std::string CallWideCharToMultiByte(unsigned codePage, DWORD flags, wchar_t const* text, int length,
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

bool SystemNarrowToWide(char const* text, int length, unsigned codePage, std::wstring& out) {
    if (!::IsValidCodePage(codePage))
        return false;
    int const needed = ::MultiByteToWideChar(codePage, 0, text, length, nullptr, 0);
    if (needed <= 0)
        return true; // the system refuses the text: empty, not Latin-1
    out.assign(static_cast<size_t>(needed), L'\0');
    int const written = ::MultiByteToWideChar(codePage, 0, text, length, out.data(), needed);
    out.resize(written > 0 ? static_cast<size_t>(written) : 0);
    return true;
}

bool SystemWideToNarrow(wchar_t const* text, int length, unsigned codePage, std::string& out) {
    if (!::IsValidCodePage(codePage))
        return false;
    if (IsUnicodeCodePage(codePage)) {
        out = CallWideCharToMultiByte(codePage, 0, text, length, nullptr);
        return true;
    }
    // No best fit: a character the code page cannot hold becomes '?' rather than a look-alike,
    // so the same text converts the same way on every platform.
    DWORD const flags = TakesNoFlags(codePage) ? 0 : WC_NO_BEST_FIT_CHARS;
    std::wstring const joined = JoinSurrogatePairs(text, length);
    out = CallWideCharToMultiByte(codePage, flags, joined.data(), static_cast<int>(joined.size()),
                                  "?");
    return true;
}

} // namespace tekit::platform
