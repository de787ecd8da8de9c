// A compiled pattern: two automata (the pattern forward, and its mirror image, which reads a
// line backward to find where matches start), the compiled sets, and what the search uses to
// skip text: the bytes that can begin a match and a literal that every match contains.
#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace tekit::toolbox::pattern {

enum class Op : std::uint8_t {
    Char,      ///< the character c1 or c2 (c2: the other case of a letter, or c1 again)
    Set,       ///< a single-byte character in sets[set]; a double-byte one if it is negated
    Any,       ///< any character
    LineStart, ///< no character: the line's start
    LineEnd,   ///< no character: the line's end
    Split,     ///< no character: out, else out1 (out has the higher priority)
    Jump,      ///< no character: out
    Match,
};

struct Inst {
    Op op;
    std::uint16_t c1 = 0;
    std::uint16_t c2 = 0;
    std::int32_t set = -1;
    std::int32_t out = -1;
    std::int32_t out1 = -1;
};

/// A set compiled to a table over the 256 byte values (complemented if negated).
struct CharSet {
    std::array<bool, 256> bytes{};
    bool negated = false;
};

/// A nondeterministic automaton: instructions, the first one, and the one Match.
struct Program {
    std::vector<Inst> insts;
    std::int32_t start = -1;
    std::int32_t match = -1;
};

struct CompiledPattern {
    Program forward;
    Program reverse;
    std::vector<CharSet> sets;
    bool multiByte = false;
    /// The pattern matches the empty text somewhere (no byte is needed to begin a match).
    bool canBeEmpty = false;
    /// The pattern needs a CR or LF in a line, so it never matches.
    bool neverMatches = false;
    /// Bytes that can begin a non-empty match.
    std::array<bool, 256> firstBytes{};
    /// Bytes that every match contains, in this order (empty: none known).
    std::string requiredLiteral;
    /// The pattern is requiredLiteral and nothing else, in single-byte text.
    bool pureLiteral = false;
    /// Every match begins with requiredLiteral (single-byte text).
    bool literalLeads = false;
    /// Bytes that no instruction tells apart share a class (the line filter's alphabet).
    std::array<std::uint8_t, 256> byteClass{};
    int classCount = 1;
};

/// The character at `p` of a line that ends at `end`, and its length in `bytes`.
inline std::uint16_t CharAt(char const* p, char const* end, bool multiByte, bool const* leads,
                            int& bytes) {
    auto const lead = static_cast<unsigned char>(*p);
    if (multiByte && leads[lead] && p + 1 < end && p[1] != '\0') {
        bytes = 2;
        return static_cast<std::uint16_t>(lead << 8 | static_cast<unsigned char>(p[1]));
    }
    bytes = 1;
    return lead;
}

} // namespace tekit::toolbox::pattern
