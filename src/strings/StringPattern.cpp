// Wildcard patterns (*, ?, [set], \c) and plain sub-string position lists.
//
// A pattern is compiled into tokens and matched over the text's characters by a depth-first
// search with an explicit stack (no recursion, so no text is too long) and a table of the
// (token, position) states already explored. Whether the rest of a pattern matches from a
// state does not depend on how the state was reached, so a state is explored at most once per
// search, across all start positions: a search costs at most tokens x characters steps.
#include "strings/CharScan.h"
#include "tekit/strings/String.h"
#include "tekit/strings/StringVector.h"

#include <algorithm>
#include <string>
#include <vector>

namespace tekit {

namespace {

enum class TokenKind { Literal, Any, Star, Set };

struct CharRange {
    unsigned short low, high;
};

struct PatternToken {
    TokenKind kind = TokenKind::Literal;
    unsigned short ch = 0;         // Literal
    bool negated = false;          // Set
    std::vector<CharRange> ranges; // Set
};

/// One pattern character, a backslash taking the next character literally.
unsigned short ReadPatternChar(char const*& p, bool mb) {
    if (*p == '\\' && p[1])
        ++p;
    unsigned short ch = detail::CharAt(p, mb);
    p += detail::CharBytes(p, mb);
    return ch;
}

/// Parses the set whose "[" is at `p` and moves `p` past its "]"; false (and `p` unmoved)
/// when the set is not closed, so that the "[" stands for itself.
bool ParseSet(char const*& p, bool mb, PatternToken& token) {
    char const* q = p + 1;
    token.kind = TokenKind::Set;
    if (*q == '!' || *q == '^') {
        token.negated = true;
        ++q;
    }
    for (bool first = true; *q && (first || *q != ']'); first = false) {
        unsigned short low = ReadPatternChar(q, mb), high = low;
        if (*q == '-' && q[1] && q[1] != ']') {
            ++q;
            high = ReadPatternChar(q, mb);
        }
        // A reversed range such as z-a is read as a-z: wildcards are forgiving.
        token.ranges.push_back({std::min(low, high), std::max(low, high)});
    }
    if (*q != ']')
        return false;
    p = q + 1;
    return true;
}

struct Pattern {
    std::vector<PatternToken> tokens;
    std::vector<int> wildcards; // token index of each *, ? and [set], in order

    Pattern(char const* pattern, bool mb) {
        for (char const* p = pattern ? pattern : ""; *p;) {
            PatternToken token;
            if (*p == '*' || *p == '?') {
                token.kind = *p == '*' ? TokenKind::Star : TokenKind::Any;
                ++p;
            } else if (*p != '[' || !ParseSet(p, mb, token)) {
                token = PatternToken{};
                token.ch = ReadPatternChar(p, mb);
            }
            if (token.kind != TokenKind::Literal)
                wildcards.push_back(static_cast<int>(tokens.size()));
            tokens.push_back(std::move(token));
        }
    }
};

/// The text as character values, with the byte offset of each character and of the end.
struct Text {
    std::vector<unsigned short> chars;
    std::vector<int> offsets;

    Text(char const* text, bool mb) {
        char const* p = text;
        for (; *p; p += detail::CharBytes(p, mb)) {
            offsets.push_back(static_cast<int>(p - text));
            chars.push_back(detail::CharAt(p, mb));
        }
        offsets.push_back(static_cast<int>(p - text));
    }
    int Size() const { return static_cast<int>(chars.size()); }
};

class Matcher {
public:
    Matcher(Pattern const& pattern, Text const& text, bool ignoreCase, bool shortest,
            bool wholeText)
        : m_pattern(pattern), m_text(text), m_ignoreCase(ignoreCase), m_shortest(shortest),
          m_wholeText(wholeText),
          m_explored(pattern.tokens.size() * static_cast<size_t>(text.Size() + 1), false),
          m_begin(pattern.tokens.size() + 1, 0) {}

    /// The end of the preferred match that starts at `start`, or -1.
    int MatchAt(int start) {
        int const numTokens = static_cast<int>(m_pattern.tokens.size());
        m_stack.assign(1, {0, start, true});
        while (!m_stack.empty()) {
            Step s = m_stack.back();
            m_stack.pop_back();
            if (s.entersToken)
                m_begin[static_cast<size_t>(s.token)] = s.pos;
            if (s.token == numTokens) {
                if (!m_wholeText || s.pos == m_text.Size())
                    return s.pos;
            } else if (Explore(s.token, s.pos)) {
                Expand(s);
            }
        }
        return -1;
    }

    /// Character range of wildcard `k` (0-based) in the last match.
    void WildcardRange(int k, int& begin, int& end) const {
        auto const token = static_cast<size_t>(m_pattern.wildcards[static_cast<size_t>(k)]);
        begin = m_begin[token];
        end = m_begin[token + 1];
    }

private:
    struct Step {
        int token, pos;
        bool entersToken; // true: the token starts at pos (records where its match begins)
    };

    /// Marks the state explored; false when it already was (and so cannot lead to a match).
    bool Explore(int token, int pos) {
        size_t const index = static_cast<size_t>(token) * static_cast<size_t>(m_text.Size() + 1) +
                             static_cast<size_t>(pos);
        if (m_explored[index])
            return false;
        m_explored[index] = true;
        return true;
    }

    /// Pushes the ways on from a state, the preferred one last (it is taken first).
    void Expand(Step s) {
        PatternToken const& token = m_pattern.tokens[static_cast<size_t>(s.token)];
        if (token.kind != TokenKind::Star) {
            if (s.pos < m_text.Size() && Matches(token, m_text.chars[static_cast<size_t>(s.pos)]))
                m_stack.push_back({s.token + 1, s.pos + 1, true});
            return;
        }
        Step const stop{s.token + 1, s.pos, true};
        Step const more{s.token, s.pos + 1, false};
        bool const canGrow = s.pos < m_text.Size();
        if (m_shortest && canGrow)
            m_stack.push_back(more);
        m_stack.push_back(stop);
        if (!m_shortest && canGrow)
            m_stack.push_back(more);
    }

    bool Matches(PatternToken const& token, unsigned short ch) const {
        switch (token.kind) {
        case TokenKind::Any:
            return true;
        case TokenKind::Literal:
            return ch == token.ch || (m_ignoreCase && mbcs::ToLower(ch) == mbcs::ToLower(token.ch));
        case TokenKind::Set: {
            bool in = InSet(token, ch) || (m_ignoreCase && (InSet(token, mbcs::ToLower(ch)) ||
                                                            InSet(token, mbcs::ToUpper(ch))));
            return in != token.negated;
        }
        default:
            return false;
        }
    }

    static bool InSet(PatternToken const& token, unsigned short ch) {
        for (CharRange const& r : token.ranges)
            if (ch >= r.low && ch <= r.high)
                return true;
        return false;
    }

    Pattern const& m_pattern;
    Text const& m_text;
    bool m_ignoreCase, m_shortest, m_wholeText;
    std::vector<bool> m_explored;
    std::vector<int> m_begin; // where each token's match begins; the last entry is the end
    std::vector<Step> m_stack;
};

/// The first match at or after `from`: its start and end, or false.
bool FindFrom(Matcher& matcher, int from, int size, int& start, int& end) {
    for (start = from; start <= size; ++start)
        if ((end = matcher.MatchAt(start)) >= 0)
            return true;
    return false;
}

std::string Slice(char const* text, Text const& t, int begin, int end) {
    int const from = t.offsets[static_cast<size_t>(begin)];
    return std::string(text + from,
                       static_cast<size_t>(t.offsets[static_cast<size_t>(end)] - from));
}

void CollectWildcards(Matcher const& matcher, Pattern const& pattern, char const* text,
                      Text const& t, StringVector& out) {
    out.clear();
    for (int k = 0; k < static_cast<int>(pattern.wildcards.size()); ++k) {
        int begin = 0, end = 0;
        matcher.WildcardRange(k, begin, end);
        out.emplace_back(Slice(text, t, begin, end).c_str());
    }
}

/// Expands \0 to \9 and \\ of a replacement text.
void AppendReplacement(std::string& out, char const* replacement, StringVector const& wildcards,
                       std::string const& whole, bool mb) {
    for (char const* p = replacement; *p;) {
        if (*p == '\\' && p[1] >= '0' && p[1] <= '9') {
            auto k = static_cast<size_t>(p[1] - '0');
            if (k == 0)
                out += whole;
            else if (k <= wildcards.size())
                out += wildcards[k - 1].GetBufferReadPtr();
            p += 2;
        } else if (*p == '\\' && p[1] == '\\') {
            out += '\\';
            p += 2;
        } else {
            int const n = detail::CharBytes(p, mb);
            out.append(p, static_cast<size_t>(n));
            p += n;
        }
    }
}

/// True when `find` occurs at `p`, compared character by character; `bytes` receives the
/// bytes it covers in the text.
bool OccursAt(char const* p, char const* find, bool mb, bool ignoreCase, int& bytes) {
    char const* start = p;
    while (*find) {
        unsigned short a = detail::CharAt(p, mb), b = detail::CharAt(find, mb);
        if (a != b && !(ignoreCase && mbcs::ToLower(a) == mbcs::ToLower(b)))
            return false;
        p += detail::CharBytes(p, mb);
        find += detail::CharBytes(find, mb);
    }
    bytes = static_cast<int>(p - start);
    return true;
}

int FindPositions(char const* text, char const* find, bool ignoreCase,
                  std::vector<int>& positions) {
    positions.clear();
    if (!find || !*find)
        return 0;
    bool const mb = String::IsMultiByteSupportEnabled();
    int index = 0;
    for (char const* p = text; *p;) {
        int bytes = 0;
        if (OccursAt(p, find, mb, ignoreCase, bytes)) {
            positions.push_back(index);
            index += detail::CharIndexOfByte(p, bytes, mb);
            p += bytes;
        } else {
            ++index;
            p += detail::CharBytes(p, mb);
        }
    }
    return static_cast<int>(positions.size());
}

} // namespace

int String::FindPattern(char const* pattern, int startIndex, bool ignoreCase,
                        int* matchLength) const {
    return FindPatternEx(pattern, startIndex, ignoreCase, false, matchLength, nullptr);
}

int String::FindPatternEx(char const* pattern, int startIndex, bool ignoreCase, bool shortestMatch,
                          int* matchLength, StringVector* wildcardMatches) const {
    if (matchLength)
        *matchLength = 0;
    if (wildcardMatches)
        wildcardMatches->clear();
    if (!pattern || !*pattern)
        return -1;
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    Text const t(text, mb);
    Pattern const compiled(pattern, mb);
    Matcher matcher(compiled, t, ignoreCase, shortestMatch, false);
    int start = 0, end = 0;
    if (startIndex > t.Size() || !FindFrom(matcher, std::max(startIndex, 0), t.Size(), start, end))
        return -1;
    if (matchLength)
        *matchLength = end - start;
    if (wildcardMatches)
        CollectWildcards(matcher, compiled, text, t, *wildcardMatches);
    return start;
}

bool String::MatchPattern(String const& pattern, StringVector& wildcardMatches,
                          bool ignoreCase) const {
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    Text const t(text, mb);
    Pattern const compiled(pattern.GetBufferReadPtr(), mb);
    Matcher matcher(compiled, t, ignoreCase, false, true);
    wildcardMatches.clear();
    if (matcher.MatchAt(0) < 0)
        return false;
    CollectWildcards(matcher, compiled, text, t, wildcardMatches);
    return true;
}

int String::ReplaceAllPatterns(char const* pattern, char const* replacement, bool ignoreCase,
                               bool shortestMatch) {
    if (!pattern || !*pattern)
        return 0;
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    Text const t(text, mb);
    Pattern const compiled(pattern, mb);
    Matcher matcher(compiled, t, ignoreCase, shortestMatch, false);
    std::string out;
    StringVector wildcards;
    int count = 0, copied = 0, start = 0, end = 0;
    for (int from = 0; FindFrom(matcher, from, t.Size(), start, end);) {
        if (end == start) { // an empty match replaces nothing; look one character further
            from = start + 1;
            continue;
        }
        std::string const whole = Slice(text, t, start, end);
        CollectWildcards(matcher, compiled, text, t, wildcards);
        out += Slice(text, t, copied, start);
        AppendReplacement(out, replacement ? replacement : "", wildcards, whole, mb);
        copied = from = end;
        ++count;
    }
    if (count > 0) {
        out += Slice(text, t, copied, t.Size());
        detail::AssignResult(*this, out);
    }
    return count;
}

int String::FindSubStringPositions(char const* text, std::vector<int>& positions) const {
    return FindPositions(GetBufferReadPtr(), text, false, positions);
}

int String::FindSubStringPositionsNoCase(char const* text, std::vector<int>& positions) const {
    return FindPositions(GetBufferReadPtr(), text, true, positions);
}

} // namespace tekit
