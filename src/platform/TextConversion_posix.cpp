// Narrow <-> wide text on POSIX: code page 0 is Latin-1 (each byte its own code point); the
// Windows code pages go through iconv as "CP<n>" (glibc knows CP932, CP936, CP949, CP950,
// CP1252, ...). wchar_t is UTF-32 here. A code page that iconv does not know is taken as
// Latin-1, so a conversion never fails as a whole.
#include "platform/Platform.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <cwchar>
#include <iconv.h>
#include <string>

namespace tekit::platform {

namespace {

constexpr wchar_t kReplacement = 0xFFFD;

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

std::wstring Latin1ToWide(char const* text, int length) {
    std::wstring out(size_t(length), L'\0');
    for (int i = 0; i < length; ++i)
        out[size_t(i)] = static_cast<wchar_t>(static_cast<unsigned char>(text[i]));
    return out;
}

std::string WideToLatin1(wchar_t const* text, int length) {
    std::string out(size_t(length), '\0');
    for (int i = 0; i < length; ++i) {
        auto const c = static_cast<std::uint32_t>(text[i]);
        out[size_t(i)] = c <= 0xFF ? static_cast<char>(c) : '?';
    }
    return out;
}

/// An iconv descriptor that closes itself.
class Converter {
public:
    Converter(char const* to, char const* from) : m_cd(iconv_open(to, from)) {}
    ~Converter() {
        if (Valid())
            iconv_close(m_cd);
    }
    Converter(Converter const&) = delete;
    Converter& operator=(Converter const&) = delete;
    bool Valid() const { return m_cd != reinterpret_cast<iconv_t>(-1); }

    /// Converts `in` of `inBytes` bytes, appending to `out`; an input unit that cannot be
    /// converted is skipped (`skipBytes` bytes) and `replace` is appended instead.
    template <class Out, class Unit>
    void Run(char const* in, size_t inBytes, Out& out, size_t skipBytes, Unit replace) {
        char buffer[256];
        auto* src = const_cast<char*>(in);
        while (inBytes > 0) {
            char* dst = buffer;
            size_t room = sizeof buffer;
            size_t const rc = iconv(m_cd, &src, &inBytes, &dst, &room);
            Append(out, buffer, size_t(dst - buffer));
            if (rc == size_t(-1) && errno != E2BIG) {
                out.push_back(replace); // EILSEQ or EINVAL (cut sequence): skip one unit
                size_t const skip = std::min(skipBytes, inBytes);
                src += skip;
                inBytes -= skip;
                iconv(m_cd, nullptr, nullptr, nullptr, nullptr);
            }
        }
    }

private:
    static void Append(std::string& out, char const* bytes, size_t n) { out.append(bytes, n); }
    static void Append(std::wstring& out, char const* bytes, size_t n) {
        for (size_t i = 0; i + sizeof(wchar_t) <= n; i += sizeof(wchar_t)) {
            wchar_t c;
            std::memcpy(&c, bytes + i, sizeof c);
            out.push_back(c);
        }
    }

    iconv_t m_cd;
};

std::string CodePageName(unsigned codePage) {
    return "CP" + std::to_string(codePage);
}

} // namespace

std::wstring NarrowToWide(char const* text, int numBytes, unsigned codePage) {
    int const length = ResolveLength(text, numBytes);
    if (length <= 0)
        return {};
    if (codePage != 0) {
        Converter converter("WCHAR_T", CodePageName(codePage).c_str());
        if (converter.Valid()) {
            std::wstring out;
            converter.Run(text, size_t(length), out, 1, kReplacement);
            return out;
        }
    }
    return Latin1ToWide(text, length);
}

std::string WideToNarrow(wchar_t const* text, int numChars, unsigned codePage) {
    int const length = ResolveLength(text, numChars);
    if (length <= 0)
        return {};
    if (codePage != 0) {
        Converter converter(CodePageName(codePage).c_str(), "WCHAR_T");
        if (converter.Valid()) {
            std::string out;
            converter.Run(reinterpret_cast<char const*>(text), size_t(length) * sizeof(wchar_t),
                          out, sizeof(wchar_t), '?');
            return out;
        }
    }
    return WideToLatin1(text, length);
}

} // namespace tekit::platform
