// Escaping and unescaping of INI string values.
//
// In multibyte mode a lead byte followed by a character that is not a control character is a
// double-byte character and is copied whole; a lead byte followed by a control character (or
// ending the text) is broken, and is escaped as "\xHH" itself. So the escaped text never holds
// a control character, and unescaping, which pairs every lead byte with the byte after it,
// meets the same characters that escaping wrote.
#include "ini/IniEscape.h"

#include "strings/CharScan.h"
#include "strings/MultiByteChars.h"

namespace tekit::ini {

namespace {

bool IsControl(unsigned char c) {
    return c < 0x20 || c == 0x7F;
}

/// The escape letter of `c`, or 0 when it has none ("\xHH" or itself).
char EscapeLetter(unsigned char c) {
    switch (c) {
    case '\t':
        return 't';
    case '\n':
        return 'n';
    case '\r':
        return 'r';
    case '"':
        return '"';
    case '\\':
        return '\\';
    default:
        return 0;
    }
}

/// Bytes that the character at `text` takes when copied whole: 2 for an intact double-byte
/// character in multibyte mode, else 1.
int WholeChar(unsigned char const* text, bool mb) {
    return mb && mbcs::IsLeadByte(static_cast<char>(text[0])) && text[1] != 0 && !IsControl(text[1])
               ? 2
               : 1;
}

} // namespace

std::size_t EscapedLength(char const* text, bool mb) {
    auto const* p = reinterpret_cast<unsigned char const*>(text);
    std::size_t length = 0;
    while (*p) {
        int const whole = WholeChar(p, mb);
        if (whole == 2) {
            length += 2;
            p += 2;
            continue;
        }
        bool const broken = mb && mbcs::IsLeadByte(static_cast<char>(*p));
        length += EscapeLetter(*p) ? 2 : (IsControl(*p) || broken) ? 4 : 1;
        ++p;
    }
    return length;
}

void Escape(char const* text, char* out, bool mb) {
    static constexpr char kHex[] = "0123456789abcdef";
    auto const* p = reinterpret_cast<unsigned char const*>(text);
    while (*p) {
        if (WholeChar(p, mb) == 2) {
            *out++ = static_cast<char>(*p++);
            *out++ = static_cast<char>(*p++);
            continue;
        }
        unsigned char const c = *p++;
        if (char const letter = EscapeLetter(c)) {
            *out++ = '\\';
            *out++ = letter;
        } else if (IsControl(c) || (mb && mbcs::IsLeadByte(static_cast<char>(c)))) {
            *out++ = '\\';
            *out++ = 'x';
            *out++ = kHex[c >> 4];
            *out++ = kHex[c & 15];
        } else {
            *out++ = static_cast<char>(c);
        }
    }
    *out = '\0';
}

std::size_t Unescape(char const* text, char* out, std::size_t capacity, bool mb) {
    std::size_t written = 0;
    auto put = [&](char const* bytes, std::size_t count) {
        if (written + count >= capacity)
            return false;
        for (std::size_t i = 0; i < count; ++i)
            out[written++] = bytes[i];
        return true;
    };
    char const* p = text;
    while (*p) {
        std::size_t const size = mb ? static_cast<std::size_t>(mbcs::CharBytes(p)) : 1;
        if (size == 2 || *p != '\\' || p[1] == '\0') {
            // A character, a double-byte one whole, or a backslash that ends the text.
            if (!put(p, size))
                break;
            p += size;
            continue;
        }
        char const c = p[1];
        char byte = c;
        std::size_t consumed = 2;
        if (c == 'n') {
            byte = '\n';
        } else if (c == 'r') {
            byte = '\r';
        } else if (c == 't') {
            byte = '\t';
        } else if (c == 'x' && detail::IsHexDigit(p[2]) && detail::IsHexDigit(p[3])) {
            byte = static_cast<char>(detail::HexValue(p[2]) * 16 + detail::HexValue(p[3]));
            consumed = 4;
        } else if (mb && mbcs::CharBytes(p + 1) == 2) {
            // A backslash before a double-byte character gives that character.
            if (!put(p + 1, 2))
                break;
            p += 3;
            continue;
        }
        if (byte == '\0' || !put(&byte, 1))
            break; // "\x00" ends the text
        p += consumed;
    }
    out[written] = '\0';
    return written;
}

} // namespace tekit::ini
