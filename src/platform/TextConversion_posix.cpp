// The system's conversion on POSIX: the Windows code pages go through iconv as "CP<n>" (glibc
// knows CP932, CP936, CP949, CP950, CP1252, ...). wchar_t is UTF-32 here.
#include "platform/TextConversion.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <iconv.h>
#include <string>

namespace tekit::platform {

namespace {

constexpr wchar_t kReplacement = 0xFFFD;

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

bool SystemNarrowToWide(char const* text, int length, unsigned codePage, std::wstring& out) {
    Converter converter("WCHAR_T", CodePageName(codePage).c_str());
    if (!converter.Valid())
        return false;
    converter.Run(text, size_t(length), out, 1, kReplacement);
    return true;
}

bool SystemWideToNarrow(wchar_t const* text, int length, unsigned codePage, std::string& out) {
    Converter converter(CodePageName(codePage).c_str(), "WCHAR_T");
    if (!converter.Valid())
        return false;
    converter.Run(reinterpret_cast<char const*>(text), size_t(length) * sizeof(wchar_t), out,
                  sizeof(wchar_t), '?');
    return true;
}

} // namespace tekit::platform
