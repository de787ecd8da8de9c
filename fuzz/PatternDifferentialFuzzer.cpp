// Compares the pattern engine with RE2 on generated patterns and lines: whether a match is
// found, where it starts and how long it is, under both match policies (leftmost-first is
// RE2's default, leftmost-longest its longest_match option).
//
// Input: the pattern is generated from the input bytes (a small grammar over a, b, c, any
// character, sets, groups, alternation, repetition and anchors) and written in both dialects;
// the bytes left over become one line of text over a small alphabet.
#include "tekit/toolbox/RegExpr.h"

#include <re2/re2.h>

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <string>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

class Input {
public:
    Input(std::uint8_t const* data, std::size_t size) : m_data(data), m_size(size) {}
    unsigned Next() { return m_at < m_size ? m_data[m_at++] : 0; }
    bool Empty() const { return m_at >= m_size; }

private:
    std::uint8_t const* m_data;
    std::size_t m_size;
    std::size_t m_at = 0;
};

/// A pattern in the engine's dialect and in RE2's, and whether it can match nothing.
struct Both {
    std::string own;
    std::string re2;
    bool nullable = false;
};

Both Generate(Input& in, int depth);

Both Atom(Input& in, int depth) {
    static char const* const kSets[][2] = {
        {"[ab]", "[ab]"}, {"[~a]", "[^a]"}, {"[a-c]", "[a-c]"}, {"[~b-c]", "[^b-c]"}};
    switch (in.Next() % 9) {
    case 0:
        return {"a", "a"};
    case 1:
        return {"b", "b"};
    case 2:
        return {"c", "c"};
    case 3:
        return {".", "."};
    case 4: {
        auto const& set = kSets[in.Next() % 4];
        return {set[0], set[1]};
    }
    case 5:
        return {"^", "^", true};
    case 6:
        return {"$", "$", true};
    case 7:
        return {"(", "\\("};
    default: {
        if (depth <= 0)
            return {"a", "a"};
        Both const inner = Generate(in, depth - 1);
        return {"{" + inner.own + "}", "(?:" + inner.re2 + ")", inner.nullable};
    }
    }
}

/// Repeats only what cannot match nothing: where a repetition's body matches nothing, the
/// engine prefers another pass that reads characters, and RE2 (like Perl) stops.
Both Piece(Input& in, int depth) {
    Both atom = Atom(in, depth);
    unsigned const op = in.Next() % 6;
    if (op < 3 && !atom.nullable) {
        char const c = "*+?"[op];
        atom.own += c;
        atom.re2 = "(?:" + atom.re2 + ")" + c;
        atom.nullable = c != '+';
    }
    return atom;
}

Both Generate(Input& in, int depth) {
    Both out = Piece(in, depth);
    bool done = false; // an alternative before the current one can match nothing
    for (unsigned n = in.Next() % 4; n > 0; --n) {
        Both const next = Piece(in, depth);
        bool const bar = in.Next() % 4 == 0;
        out.own += (bar ? "|" : "") + next.own;
        out.re2 += (bar ? "|" : "") + next.re2;
        done = done || (bar && out.nullable);
        out.nullable = bar ? next.nullable : out.nullable && next.nullable;
    }
    out.nullable = out.nullable || done;
    return out;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    Input in(data, size);
    Both const pattern = Generate(in, 3);
    std::string text;
    while (!in.Empty() && text.size() < 64)
        text += "abc(x"[in.Next() % 5];

    for (int policy : {REGEXPR_MATCH_FIRST, REGEXPR_MATCH_LONGEST}) {
        RE2::Options options;
        options.set_encoding(RE2::Options::EncodingLatin1);
        options.set_longest_match(policy == REGEXPR_MATCH_LONGEST);
        options.set_log_errors(false);
        RE2 const re(pattern.re2, options);
        Check(re.ok());
        re2::StringPiece whole;
        bool const theirs = re.Match(text, 0, text.size(), RE2::UNANCHORED, &whole, 1);

        int found = 0, position = -1, length = -1;
        int const rc = RegExpr_FindPatternInText(pattern.own.c_str(), 1, text.c_str(),
                                                 static_cast<int>(text.size()), 0, 1, policy,
                                                 &found, &position, &length, nullptr);
        bool const same = rc == 0 && (found == 1) == theirs &&
                          (!theirs || (position == static_cast<int>(whole.data() - text.data()) &&
                                       length == static_cast<int>(whole.size())));
        if (!same) {
            std::fprintf(
                stderr, "policy %d: '%s' (RE2 '%s') in '%s': %d at %d+%d, RE2 %d at %d+%d\n",
                policy, pattern.own.c_str(), pattern.re2.c_str(), text.c_str(), found, position,
                length, theirs ? 1 : 0, theirs ? static_cast<int>(whole.data() - text.data()) : -1,
                theirs ? static_cast<int>(whole.size()) : -1);
            Check(false);
        }
    }
    return 0;
}
