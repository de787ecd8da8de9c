// Tokens, location strings, whole words and the search that skips string constants.
#include "strings/CharScan.h"
#include "strings/ErrDescr.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/String.h"
#include "tekit/strings/StringVector.h"

#include <cstring>
#include <string>

namespace tekit {

namespace {

/// Moves `p` over a token that starts there: to the first white space outside a quoted run.
char const* SkipToken(char const* p, bool mb) {
    bool quoted = false;
    while (*p) {
        if (!quoted && detail::IsWhiteSpace(detail::CharAt(p, mb)))
            break;
        if (detail::IsSingle(p, mb, '"'))
            quoted = !quoted;
        else if (quoted && *p == '\\' && p[1])
            ++p; // the escaped character belongs to the run, whatever it is
        p += detail::CharBytes(p, mb);
    }
    return p;
}

/// Finds the first token at or after byte `offset`: its byte offset and bytes, or false.
bool NextTokenBytes(char const* text, int offset, bool mb, int& start, int& bytes) {
    char const* p = text + offset;
    while (*p && detail::IsWhiteSpace(detail::CharAt(p, mb)))
        p += detail::CharBytes(p, mb);
    if (!*p)
        return false;
    start = static_cast<int>(p - text);
    bytes = static_cast<int>(SkipToken(p, mb) - p);
    return true;
}

/// Reads location strings part by part; raises with the whole location in the message.
class LocationReader {
public:
    LocationReader(char const* location, bool removeQuotes)
        : m_text(location), m_removeQuotes(removeQuotes),
          m_mb(String::IsMultiByteSupportEnabled()) {}

    bool AtEnd() const { return m_text[m_pos] == '\0'; }
    char const* Rest() const { return m_text + m_pos; }

    /// The next part; call only when not AtEnd.
    std::string Next(char const* function) {
        if (m_text[m_pos] == '[')
            return ReadIndex(function);
        if (m_text[m_pos] == '.')
            ++m_pos;
        return ReadName(function);
    }

private:
    [[noreturn]] void Fail(char const* key, char const* function) const {
        TE_RAISE(TE_BAD_PROP_OR_VAR_NAME, DescribeError(key, m_text), function);
    }

    std::string ReadName(char const* function) {
        int const start = m_pos;
        for (char const* p = m_text + m_pos; *p && *p != '.' && *p != '['; p = m_text + m_pos)
            m_pos += detail::CharBytes(p, m_mb);
        if (m_pos == start)
            Fail("LOCATION_EMPTY_PART_1", function);
        return std::string(m_text + start, static_cast<size_t>(m_pos - start));
    }

    std::string ReadIndex(char const* function) {
        int const start = ++m_pos; // past "["
        std::string part = m_text[m_pos] == '"' ? ReadQuoted(function) : ReadPlain(function);
        if (m_pos == start)
            Fail("LOCATION_EMPTY_PART_1", function);
        char const next = m_text[++m_pos]; // past "]"
        if (next != '\0' && next != '.' && next != '[')
            Fail("LOCATION_TEXT_AFTER_BRACKET_1", function);
        return part;
    }

    std::string ReadQuoted(char const* function) {
        int const start = m_pos;
        int closing = m_pos + 1;
        if (!String::FindNextUnescapedQuoteChar(m_text, &closing, nullptr))
            Fail("LOCATION_MISSING_CLOSING_QUOTE_1", function);
        m_pos = closing + 1;
        if (m_text[m_pos] != ']')
            Fail("LOCATION_MISSING_CLOSING_BRACKET_1", function);
        DynamicString quoted;
        quoted.AssignUsingNumBytesInsteadOfNumChars(m_text + start, m_pos - start, false);
        if (m_removeQuotes)
            quoted.RemoveQuotesAndUnescape();
        return quoted.GetBufferReadPtr();
    }

    std::string ReadPlain(char const* function) {
        int const start = m_pos;
        for (char const* p = m_text + m_pos; *p != ']'; p = m_text + m_pos) {
            if (!*p)
                Fail("LOCATION_MISSING_CLOSING_BRACKET_1", function);
            m_pos += detail::CharBytes(p, m_mb);
        }
        return std::string(m_text + start, static_cast<size_t>(m_pos - start));
    }

    char const* m_text;
    int m_pos = 0;
    bool m_removeQuotes;
    bool m_mb;
};

} // namespace

int String::GetNextToken(int startIndex, int& tokenLength) const {
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    int start = 0, bytes = 0;
    tokenLength = 0;
    if (!NextTokenBytes(text, detail::ByteOffsetOfChar(text, startIndex, mb), mb, start, bytes))
        return -1;
    int const index = detail::CharIndexOfByte(text, start, mb);
    tokenLength = detail::CharIndexOfByte(text, start + bytes, mb) - index;
    return index;
}

bool String::GetNthToken(int tokenIndex, String& token) const {
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    int start = 0, bytes = 0;
    bool found = tokenIndex >= 0;
    for (int i = 0, offset = 0; found && i <= tokenIndex; ++i, offset = start + bytes)
        found = NextTokenBytes(text, offset, mb, start, bytes);
    std::string const result = found ? std::string(text + start, static_cast<size_t>(bytes)) : "";
    detail::AssignResult(token, result);
    return found;
}

bool String::GetNextLocationStringToken(String& location, String& token, bool removeQuotes) {
    std::string const text = location.GetBufferReadPtr();
    LocationReader reader(text.c_str(), removeQuotes);
    if (reader.AtEnd()) {
        token.Clear();
        return false;
    }
    std::string const part = reader.Next("String::GetNextLocationStringToken");
    detail::AssignResult(location, reader.Rest());
    detail::AssignResult(token, part);
    return true;
}

int String::ParseLocationString(String const& location, StringVector& parts, bool removeQuotes) {
    std::string const text = location.GetBufferReadPtr();
    LocationReader reader(text.c_str(), removeQuotes);
    StringVector result;
    while (!reader.AtEnd())
        result.emplace_back(reader.Next("String::ParseLocationString").c_str());
    parts.swap(result);
    return static_cast<int>(parts.size());
}

bool String::IsCharWholeWordChar(unsigned short ch) {
    return ch > 127 || ch == '_' || (ch >= '0' && ch <= '9') || (ch >= 'a' && ch <= 'z') ||
           (ch >= 'A' && ch <= 'Z');
}

bool String::IsPtrToWholeWord(char const* text, char const* ptr, int numBytes) {
    if (!text || !ptr || ptr < text || numBytes <= 0)
        return false;
    // The span must lie within the text: no terminator inside it, none before it.
    if (std::memchr(text, '\0', static_cast<size_t>(ptr - text)) ||
        std::memchr(ptr, '\0', static_cast<size_t>(numBytes)))
        return false;
    bool const mb = IsMultiByteSupportEnabled();
    if (ptr > text) {
        char const* before = mb ? mbcs::Dec(text, ptr) : ptr - 1;
        if (IsCharWholeWordChar(detail::CharAt(before, mb)))
            return false;
    }
    char const* after = ptr + numBytes;
    return *after == '\0' || !IsCharWholeWordChar(detail::CharAt(after, mb));
}

int String::FindCharReverseIgnoringEmbeddedStringConstants(unsigned short ch,
                                                           int startIndex) const {
    // Forward, because only a walk from the start knows which quotes open a constant.
    bool const mb = IsMultiByteSupportEnabled();
    int found = -1;
    bool quoted = false;
    char const* p = GetBufferReadPtr();
    for (int index = 0; *p && (startIndex < 0 || index <= startIndex); ++index) {
        bool const isQuote = detail::IsSingle(p, mb, '"');
        if (!quoted && !isQuote && detail::CharAt(p, mb) == ch)
            found = index;
        if (isQuote)
            quoted = !quoted;
        else if (quoted && *p == '\\' && p[1]) {
            ++p; // an escaped character is part of the constant
            ++index;
        }
        p += detail::CharBytes(p, mb);
    }
    return found;
}

} // namespace tekit
