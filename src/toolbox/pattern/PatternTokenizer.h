// The pattern tokenizer: turns a pattern of the toolbox dialect into tokens, reporting the
// first lexical error (unmatched brackets and braces, bad ranges, bad escapes) with the
// character that caused it.
//
//   std::vector<Token> tokens;
//   PatternError error = Tokenize("{ab}+[~0-9]", /*multiByte=*/false, tokens);
#pragma once

#include <cstdint>
#include <vector>

namespace tekit::toolbox::pattern {

enum class TokenKind : std::uint8_t {
    Alternation,
    Star,
    Plus,
    Optional,
    Any,
    LineStart,
    LineEnd,
    GroupOpen,
    GroupClose,
    SetOpen,
    SetClose,
    SetNegation,
    Range,   ///< inside a set: `low`..`high`
    Literal, ///< outside a set: the character `low`
};

/// A character is a byte, or a lead byte (high 8 bits) and its trail byte in multibyte mode.
struct Token {
    TokenKind kind;
    char written; ///< the pattern character of an operator, for messages
    std::uint16_t low = 0;
    std::uint16_t high = 0;
};

/// A status code (0: none) and, for the messages that name one, the offending character.
struct PatternError {
    std::int32_t code = 0;
    char character = 0;
    explicit operator bool() const { return code != 0; }
};

/// Tokenizes `pattern` (NUL-terminated; null and empty are errors too). `multiByte` makes a
/// lead byte and the byte after it one character.
PatternError Tokenize(char const* pattern, bool multiByte, std::vector<Token>& tokens);

} // namespace tekit::toolbox::pattern
