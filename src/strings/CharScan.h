// Character steps shared by the escaping, quoting, token, pattern and splitting code.
//
// Every loop of those members walks the text one character at a time through these helpers,
// so that in multibyte mode a double-byte character is never split and its trail byte (which
// may equal '\\', '|' or an ASCII letter) is never taken for a character of its own. With
// multibyte mode off one byte is one character whatever the lead-byte table says.
//
//   bool mb = String::IsMultiByteSupportEnabled();
//   for (char const* p = text; *p; p += detail::CharBytes(p, mb))
//       if (detail::IsSingle(p, mb, '\\')) ...
#pragma once

#include "strings/MultiByteChars.h"
#include "tekit/strings/String.h"

#include <string>

namespace tekit::detail {

/// Bytes of the character at `p`: 0 at the terminator, 2 for a double-byte character.
inline int CharBytes(char const* p, bool mb) {
    if (*p == '\0')
        return 0;
    return mb ? mbcs::CharBytes(p) : 1;
}

/// The character value at `p` (lead byte high, trail byte low for a double-byte one).
inline unsigned short CharAt(char const* p, bool mb) {
    return CharBytes(p, mb) == 2 ? mbcs::GetChar(p) : static_cast<unsigned char>(*p);
}

/// True when the character at `p` is the single-byte character `c`.
inline bool IsSingle(char const* p, bool mb, char c) {
    return *p == c && CharBytes(p, mb) == 1;
}

/// Control characters as the "C" locale's iscntrl sees them, whatever the process locale.
inline bool IsControl(unsigned short ch) {
    return ch < 0x20 || ch == 0x7F;
}

inline bool IsWhiteSpace(unsigned short ch) {
    return ch == ' ' || ch == '\t' || ch == '\n' || ch == '\r' || ch == '\v' || ch == '\f';
}

inline bool IsHexDigit(char c) {
    return (c >= '0' && c <= '9') || (c >= 'a' && c <= 'f') || (c >= 'A' && c <= 'F');
}

inline int HexValue(char c) {
    if (c >= '0' && c <= '9')
        return c - '0';
    return (c | 0x20) - 'a' + 10;
}

/// Byte offset of character `charIndex` (clamped to the text; negative gives 0).
inline int ByteOffsetOfChar(char const* text, int charIndex, bool mb) {
    char const* p = text;
    for (; charIndex > 0 && *p; --charIndex)
        p += CharBytes(p, mb);
    return static_cast<int>(p - text);
}

/// Character index of the character that starts at byte offset `byteOffset`.
inline int CharIndexOfByte(char const* text, int byteOffset, bool mb) {
    int index = 0;
    for (char const* p = text; *p && p - text < byteOffset; p += CharBytes(p, mb))
        ++index;
    return index;
}

/// Appends a character value (one or two bytes).
inline void AppendChar(std::string& out, unsigned short ch) {
    if (ch > 0xFF)
        out += static_cast<char>(ch >> 8);
    out += static_cast<char>(ch & 0xFF);
}

/// Collects a rewritten text only from its first change on, so that a text with nothing to
/// replace costs no copy and its storage is never written.
class Rewriter {
public:
    explicit Rewriter(char const* text) : m_text(text) {}

    /// The `numBytes` bytes at `p` stay as they are.
    void Keep(char const* p, int numBytes) {
        if (m_changed)
            m_out.append(p, static_cast<size_t>(numBytes));
    }
    /// The character at `p` is replaced by `replacement`.
    void Replace(char const* p, char const* replacement) {
        Start(p);
        m_out += replacement;
    }
    void Replace(char const* p, unsigned short ch) {
        Start(p);
        AppendChar(m_out, ch);
    }
    bool Changed() const { return m_changed; }
    /// Stores the result into `target` when anything changed; returns whether it did.
    bool StoreInto(String& target) const;

private:
    void Start(char const* p) {
        if (!m_changed)
            m_out.assign(m_text, static_cast<size_t>(p - m_text));
        m_changed = true;
    }

    char const* m_text;
    std::string m_out;
    bool m_changed = false;
};

/// Stores a result built aside: the source never aliases the target's buffer.
inline void AssignResult(String& target, std::string const& text) {
    target.Assign(text.c_str());
}

inline bool Rewriter::StoreInto(String& target) const {
    if (m_changed)
        AssignResult(target, m_out);
    return m_changed;
}

} // namespace tekit::detail
