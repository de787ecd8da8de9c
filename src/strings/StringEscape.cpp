// Escaping and unescaping of special characters, XML, HTML and JSON text.
//
// Each escaper is one forward pass that starts collecting a result only at its first
// replacement, so an ordinary text is never copied or written (a shared block stays shared).
#include "strings/CharScan.h"
#include "tekit/strings/String.h"

#include <cstdio>
#include <cstring>

namespace tekit {

namespace {

/// The special-character escape of the single-byte `c` (written into `hex` when it is the
/// \xHH form), or null when `c` stays as it is.
char const* SpecialCharEscape(unsigned char c, bool keepLayoutChars, char (&hex)[8]) {
    switch (c) {
    case '\t':
        return keepLayoutChars ? nullptr : "\\t";
    case '\n':
        return keepLayoutChars ? nullptr : "\\n";
    case '"':
        return keepLayoutChars ? nullptr : "\\\"";
    case '\r':
        return "\\r";
    case '\\':
        return "\\\\";
    default:
        if (!detail::IsControl(c))
            return nullptr;
        std::snprintf(hex, sizeof hex, "\\x%.2x", c);
        return hex;
    }
}

/// Decodes the escape that starts with the backslash at `p`; returns the bytes it takes, or
/// 0 when the backslash starts no escape (and so stands for itself).
int DecodeEscape(char const* p, bool keepLayoutChars, unsigned short* ch) {
    switch (p[1]) {
    case '\\':
        return *ch = '\\', 2;
    case 'r':
        return *ch = '\r', 2;
    case '\'':
        return *ch = '\'', 2;
    case 't':
    case 'n':
    case '"':
        if (keepLayoutChars)
            return 0;
        *ch = p[1] == 't' ? '\t' : (p[1] == 'n' ? '\n' : '"');
        return 2;
    case 'x':
        // A NUL cannot live inside a text, so "\x00" is no escape either.
        if (detail::IsHexDigit(p[2]) && detail::IsHexDigit(p[3])) {
            int value = detail::HexValue(p[2]) * 16 + detail::HexValue(p[3]);
            if (value != 0)
                return *ch = static_cast<unsigned short>(value), 4;
        }
        return 0;
    default:
        return 0;
    }
}

/// UnescapeNextChar for an offset known to lie within the text.
bool ReadChar(char const* p, bool mb, bool keepLayoutChars, unsigned short* ch, int* bytes) {
    if (*p == '\\') {
        int n = DecodeEscape(p, keepLayoutChars, ch);
        if (n > 0)
            return *bytes = n, true;
    }
    *ch = detail::CharAt(p, mb);
    *bytes = detail::CharBytes(p, mb);
    return false;
}

/// The replacement of the single-byte `c`, or null when `c` is not in `characters`.
char const* FindReplacement(unsigned char c, char const* characters, char const** replacements) {
    char const* hit = c != 0 ? std::strchr(characters, c) : nullptr;
    if (!hit)
        return nullptr;
    char const* replacement = replacements[hit - characters];
    return replacement ? replacement : "";
}

/// Decodes the character reference or named entity at the '&' of `p`; returns its bytes, or
/// 0 when it is none that this reader knows.
int DecodeXmlEntity(char const* p, char* ch) {
    static char const* const kNames[] = {"&lt;", "&gt;", "&amp;", "&apos;", "&quot;"};
    static char const kChars[] = {'<', '>', '&', '\'', '"'};
    for (int i = 0; i < 5; ++i) {
        size_t n = std::strlen(kNames[i]);
        if (std::strncmp(p, kNames[i], n) == 0)
            return *ch = kChars[i], static_cast<int>(n);
    }
    if (p[1] != '#')
        return 0;
    bool hex = p[2] == 'x';
    int i = hex ? 3 : 2, value = 0;
    int const start = i;
    for (; hex ? detail::IsHexDigit(p[i]) : (p[i] >= '0' && p[i] <= '9'); ++i) {
        value = value * (hex ? 16 : 10) + detail::HexValue(p[i]);
        if (value > 127)
            return 0; // not ASCII: left for a reader that knows the code page
    }
    if (i == start || p[i] != ';' || value == 0)
        return 0;
    *ch = static_cast<char>(value);
    return i + 1;
}

/// The attribute table: & < > and the quote, and every control character as a reference.
struct AttributeTable {
    char characters[40] = {};
    char replacements[40][10] = {};
    char const* pointers[40] = {};

    explicit AttributeTable(char quote) {
        int n = 0;
        auto add = [&](char c, char const* text) {
            characters[n] = c;
            std::snprintf(replacements[n], sizeof replacements[n], "%s", text);
            pointers[n] = replacements[n];
            ++n;
        };
        add('&', "&amp;");
        add('<', "&lt;");
        add('>', "&gt;");
        add(quote, quote == '\'' ? "&apos;" : "&quot;");
        for (int c = 1; c < 0x20; ++c) {
            char ref[10];
            if (c == '\t' || c == '\n' || c == '\r')
                std::snprintf(ref, sizeof ref, "&#%d;", c);
            else
                std::snprintf(ref, sizeof ref, "&#x%.2X;", c);
            add(static_cast<char>(c), ref);
        }
    }
};

/// Replaces each single-byte character of `s` for which `replacementOf(c)` gives a text (not
/// null) by that text; returns whether anything changed.
template <class ReplacementOf>
bool ReplaceSingleByteChars(String& s, bool mb, ReplacementOf&& replacementOf) {
    char const* text = s.GetBufferReadPtr();
    detail::Rewriter out(text);
    for (char const* p = text; *p;) {
        int const n = detail::CharBytes(p, mb);
        char const* replacement = n == 1 ? replacementOf(static_cast<unsigned char>(*p)) : nullptr;
        if (replacement)
            out.Replace(p, replacement);
        else
            out.Keep(p, n);
        p += n;
    }
    return out.StoreInto(s);
}

} // namespace

void String::EscapeSpecialChars(bool keepLayoutChars) {
    char hex[8];
    ReplaceSingleByteChars(*this, IsMultiByteSupportEnabled(), [&](unsigned char c) {
        return SpecialCharEscape(c, keepLayoutChars, hex);
    });
}

void String::UnescapeSpecialChars(bool keepLayoutChars) {
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    detail::Rewriter out(text);
    for (char const* p = text; *p;) {
        unsigned short ch = 0;
        int n = 0;
        if (ReadChar(p, mb, keepLayoutChars, &ch, &n))
            out.Replace(p, ch);
        else
            out.Keep(p, n);
        p += n;
    }
    out.StoreInto(*this);
}

bool String::UnescapeNextChar(char const* text, int* index, unsigned short* character,
                              bool keepLayoutChars) {
    unsigned short ignored = 0;
    unsigned short* ch = character ? character : &ignored;
    *ch = 0;
    if (!text || !index || *index < 0)
        return false;
    // An offset beyond the terminator reads nothing (and nothing past the text).
    if (std::memchr(text, '\0', static_cast<size_t>(*index)))
        return false;
    int bytes = 0;
    bool escaped =
        ReadChar(text + *index, IsMultiByteSupportEnabled(), keepLayoutChars, ch, &bytes);
    *index += bytes;
    return escaped;
}

bool String::FindNextUnescapedQuoteChar(char const* text, int* index, bool* passedEscape) {
    if (passedEscape)
        *passedEscape = false;
    if (!text || !index)
        return false;
    bool const mb = IsMultiByteSupportEnabled();
    int const length = static_cast<int>(std::strlen(text));
    char const* p = text + (*index < 0 ? 0 : (*index > length ? length : *index));
    while (*p && *p != '"') {
        if (*p == '\\' && p[1]) {
            if (passedEscape)
                *passedEscape = true;
            ++p; // the escaped character, whatever it is, is skipped whole
        }
        p += detail::CharBytes(p, mb);
    }
    *index = static_cast<int>(p - text);
    return *p == '"';
}

bool String::EscapeCharsHelper(String& text, char const* characters, char const** replacements) {
    if (!characters || !replacements || !*characters)
        return false;
    return ReplaceSingleByteChars(text, IsMultiByteSupportEnabled(), [&](unsigned char c) {
        return FindReplacement(c, characters, replacements);
    });
}

bool String::EscapeXmlChars(String& text, bool escapeApostrophe) {
    static char const* kReplacements[] = {"&lt;", "&gt;", "&amp;", "&apos;"};
    return EscapeCharsHelper(text, escapeApostrophe ? "<>&'" : "<>&", kReplacements);
}

bool String::EscapeHtmlChars(String& text) {
    static char const* kReplacements[] = {"&lt;", "&gt;", "&amp;", "&quot;"};
    return EscapeCharsHelper(text, "<>&\"", kReplacements);
}

bool String::UnEscapeXmlChars(String& text) {
    bool const mb = IsMultiByteSupportEnabled();
    char const* p = text.GetBufferReadPtr();
    detail::Rewriter out(p);
    while (*p) {
        char ch = 0;
        int n = *p == '&' ? DecodeXmlEntity(p, &ch) : 0;
        if (n > 0) {
            out.Replace(p, static_cast<unsigned char>(ch));
        } else {
            n = detail::CharBytes(p, mb);
            out.Keep(p, n);
        }
        p += n;
    }
    return out.StoreInto(text);
}

bool String::ContainsIllegalXMLChar(bool forAttribute) const {
    bool const mb = IsMultiByteSupportEnabled();
    for (char const* p = GetBufferReadPtr(); *p; p += detail::CharBytes(p, mb)) {
        unsigned short ch = detail::CharAt(p, mb);
        bool layout = ch == '\t' || ch == '\n' || ch == '\r';
        if (ch < 0x20 && (forAttribute || !layout))
            return true;
    }
    return false;
}

bool String::MakeValidXMLValue(String& text, bool& escapedSpecialChars, bool escapeApostrophe) {
    static char const* kReplacements[] = {"&lt;", "&gt;", "&amp;", "&#13;", "&apos;"};
    escapedSpecialChars = text.ContainsIllegalXMLChar(false);
    if (escapedSpecialChars)
        text.EscapeSpecialChars(true);
    bool escaped = EscapeCharsHelper(text, escapeApostrophe ? "<>&\r'" : "<>&\r", kReplacements);
    return escapedSpecialChars || escaped;
}

bool String::MakeValidXMLAttribute(String& text, bool singleQuoted) {
    static AttributeTable const kSingle('\''), kDouble('"');
    AttributeTable const& table = singleQuoted ? kSingle : kDouble;
    return EscapeCharsHelper(text, table.characters, const_cast<char const**>(table.pointers));
}

void String::EscapeSpecialCharsForJSON() {
    bool const mb = IsMultiByteSupportEnabled();
    char const* p = GetBufferReadPtr();
    detail::Rewriter out(p);
    char escape[8];
    while (*p) {
        int const n = detail::CharBytes(p, mb);
        auto const c = static_cast<unsigned char>(*p);
        if (n == 1 && (c == '"' || c == '\\' || c < 0x20)) {
            std::snprintf(escape, sizeof escape, c < 0x20 ? "\\u%.4X" : "\\%c", c);
            out.Replace(p, escape);
        } else {
            out.Keep(p, n);
        }
        p += n;
    }
    out.StoreInto(*this);
}

} // namespace tekit
