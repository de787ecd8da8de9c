// The pattern tokenizer: one left-to-right pass; the first error found is the one reported.
#include "toolbox/pattern/PatternTokenizer.h"

#include "strings/CharScan.h"
#include "strings/MultiByteChars.h"
#include "tekit/toolbox/RegExpr.h"

namespace tekit::toolbox::pattern {

namespace {

/// The value of a hexadecimal digit, or -1 for any other character.
int HexDigit(char c) {
    return detail::IsHexDigit(c) ? detail::HexValue(c) : -1;
}

class Tokenizer {
public:
    Tokenizer(char const* pattern, bool multiByte, std::vector<Token>& tokens)
        : m_p(pattern), m_multiByte(multiByte), m_tokens(tokens) {}

    PatternError Run();

private:
    /// Reads the character at m_p (one or two bytes) and moves past it.
    std::uint16_t Read();
    /// Reads the character after a backslash at m_p, and moves past the escape.
    PatternError ReadEscape(std::uint16_t& value);
    PatternError Outside(char c);
    PatternError InSet(char c);
    PatternError SetCharacter(std::uint16_t value);
    void Push(TokenKind kind, char written, std::uint16_t value = 0) {
        m_tokens.push_back({kind, written, value, value});
    }

    char const* m_p;
    bool m_multiByte;
    std::vector<Token>& m_tokens;
    int m_depth = 0;          ///< open groups
    bool m_inSet = false;     ///< between "[" and "]"
    bool m_setStart = false;  ///< directly after "["
    bool m_haveLow = false;   ///< the last token is a single character that "-" may extend
    bool m_afterDash = false; ///< "-" waits for the high end of a range
};

PatternError Error(std::int32_t code, char character = 0) {
    return {code, character};
}

std::uint16_t Tokenizer::Read() {
    auto const lead = static_cast<unsigned char>(*m_p++);
    if (m_multiByte && mbcs::IsLeadByte(lead) && *m_p != '\0')
        return static_cast<std::uint16_t>(lead << 8 | static_cast<unsigned char>(*m_p++));
    return lead;
}

PatternError Tokenizer::ReadEscape(std::uint16_t& value) {
    ++m_p; // the backslash
    if (*m_p == '\0')
        return Error(REGEXPR_END_WITH_BACKSLASH);
    char const c = *m_p;
    if (c == 't' || c == 'T') {
        ++m_p;
        value = '\t';
    } else if (c == 'x' || c == 'X') {
        int const high = HexDigit(m_p[1]);
        int const low = high < 0 ? -1 : HexDigit(m_p[2]);
        if (low < 0)
            return Error(REGEXPR_INVALID_HEX_VALUE);
        m_p += 3;
        value = static_cast<std::uint16_t>(high << 4 | low);
    } else {
        value = Read();
    }
    return {};
}

PatternError Tokenizer::Run() {
    while (*m_p != '\0') {
        char const c = *m_p;
        if (PatternError const error = m_inSet ? InSet(c) : Outside(c))
            return error;
    }
    if (m_inSet)
        return Error(REGEXPR_UNMATCHED_CHAR, '[');
    if (m_depth > 0)
        return Error(REGEXPR_UNMATCHED_CHAR, '{');
    return {};
}

PatternError Tokenizer::Outside(char c) {
    TokenKind kind = TokenKind::Literal;
    switch (c) {
    case '$':
        kind = TokenKind::LineEnd;
        break;
    case '*':
        kind = TokenKind::Star;
        break;
    case '+':
        kind = TokenKind::Plus;
        break;
    case '.':
        kind = TokenKind::Any;
        break;
    case '?':
        kind = TokenKind::Optional;
        break;
    case '^':
        kind = TokenKind::LineStart;
        break;
    case '|':
        kind = TokenKind::Alternation;
        break;
    case ']':
        return Error(REGEXPR_UNMATCHED_CHAR, ']');
    case '[':
        kind = TokenKind::SetOpen;
        m_inSet = m_setStart = true;
        m_haveLow = m_afterDash = false;
        break;
    case '{':
        kind = TokenKind::GroupOpen;
        ++m_depth;
        break;
    case '}':
        if (m_depth == 0)
            return Error(REGEXPR_UNMATCHED_CHAR, '}');
        kind = TokenKind::GroupClose;
        --m_depth;
        break;
    case '\\': {
        std::uint16_t value = 0;
        if (PatternError const error = ReadEscape(value))
            return error;
        Push(TokenKind::Literal, c, value);
        return {};
    }
    default:
        Push(TokenKind::Literal, c, Read());
        return {};
    }
    ++m_p;
    Push(kind, c);
    return {};
}

PatternError Tokenizer::InSet(char c) {
    bool const setStart = m_setStart;
    m_setStart = false;
    switch (c) {
    case '[':
        return Error(REGEXPR_INVALID_CHAR_IN_RANGE, '[');
    case '-':
        if (!m_haveLow || m_afterDash)
            return Error(REGEXPR_INVALID_CHAR_IN_RANGE, '-');
        ++m_p;
        m_afterDash = true;
        return {};
    case ']':
        if (m_afterDash)
            return Error(REGEXPR_INVALID_CHAR_IN_RANGE, ']');
        ++m_p;
        Push(TokenKind::SetClose, c);
        m_inSet = false;
        return {};
    case '~':
        if (setStart) {
            ++m_p;
            Push(TokenKind::SetNegation, c);
            return {};
        }
        break;
    case '\\': {
        std::uint16_t value = 0;
        if (PatternError const error = ReadEscape(value))
            return error;
        return SetCharacter(value);
    }
    default:
        break;
    }
    return SetCharacter(Read());
}

/// A character in a set: a range of its own, or the high end of the range "-" opened.
PatternError Tokenizer::SetCharacter(std::uint16_t value) {
    if (m_afterDash) {
        m_tokens.back().high = value;
        m_afterDash = m_haveLow = false;
    } else {
        Push(TokenKind::Range, 0, value);
        m_haveLow = true;
    }
    return {};
}

} // namespace

PatternError Tokenize(char const* pattern, bool multiByte, std::vector<Token>& tokens) {
    if (pattern == nullptr)
        return Error(REGEXPR_NULL_INPUT_STRING);
    if (*pattern == '\0')
        return Error(REGEXPR_EMPTY_INPUT_STRING);
    return Tokenizer(pattern, multiByte, tokens).Run();
}

} // namespace tekit::toolbox::pattern
