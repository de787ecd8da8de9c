// The pattern search: line geometry and the forward and backward search loops.
#include "toolbox/pattern/PatternSearch.h"

#include "toolbox/pattern/PatternFilter.h"
#include "toolbox/pattern/PatternMatcher.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

namespace tekit::toolbox::pattern {

namespace {

bool IsBreak(char c) {
    return c == '\r' || c == '\n';
}

/// The first occurrence of `needle` in [from, end) of `text`; -1 when there is none.
std::int32_t FindBytes(char const* text, std::int32_t from, std::int32_t end,
                       std::string const& needle) {
    auto const size = static_cast<std::int32_t>(needle.size());
    char const first = needle[0];
    for (std::int32_t at = from; end - at >= size;) {
        auto const* hit = static_cast<char const*>(
            std::memchr(text + at, first, static_cast<std::size_t>(end - at - size + 1)));
        if (hit == nullptr)
            return -1;
        at = static_cast<std::int32_t>(hit - text);
        if (std::memcmp(hit + 1, needle.data() + 1, static_cast<std::size_t>(size - 1)) == 0)
            return at;
        ++at;
    }
    return -1;
}

/// Where lines start and end. A break is CR or LF, or a CR LF or LF CR pair; pairs are taken
/// left to right, so "\n\r\n" is a pair and a single break. Parsing a run of breaks from its
/// start is the only way to tell pairs, so positions inside a run are placed through it.
class Lines {
public:
    Lines(char const* text, std::int32_t length) : m_text(text), m_length(length) {}

    std::int32_t BreakLength(std::int32_t at) const {
        return at + 1 < m_length && IsBreak(m_text[at + 1]) && m_text[at + 1] != m_text[at] ? 2 : 1;
    }
    std::int32_t EndFrom(std::int32_t at) const {
        while (at < m_length && !IsBreak(m_text[at]))
            ++at;
        return at;
    }
    std::int32_t StartBefore(std::int32_t at) const {
        while (at > 0 && !IsBreak(m_text[at - 1]))
            --at;
        return at;
    }
    std::int32_t RunStart(std::int32_t at) const {
        while (at > 0 && IsBreak(m_text[at - 1]))
            --at;
        return at;
    }
    /// The start of the break that holds the break byte at `at`.
    std::int32_t BreakHolding(std::int32_t at) const {
        std::int32_t i = RunStart(at);
        while (i + BreakLength(i) <= at)
            i += BreakLength(i);
        return i;
    }
    bool IsBreakAt(std::int32_t at) const { return at < m_length && IsBreak(m_text[at]); }
    Line Holding(std::int32_t at) const { return {m_text, StartBefore(at), EndFrom(at)}; }
    /// The line that ends at the break starting at `at`.
    Line EndingAt(std::int32_t at) const {
        return {m_text, at == RunStart(at) ? StartBefore(at) : at, at};
    }
    Line After(Line line) const {
        std::int32_t const start = line.end + BreakLength(line.end);
        return {m_text, start, EndFrom(start)};
    }

    /// The line before `line` (which does not start the text). Each run of breaks is parsed
    /// once, so walking back over many empty lines stays linear.
    Line Before(Line line) {
        if (m_runBreaks.empty()) {
            m_runStart = RunStart(line.start - 1);
            for (std::int32_t i = m_runStart; i < line.start; i += BreakLength(i))
                m_runBreaks.push_back(i);
        }
        std::int32_t const at = m_runBreaks.back();
        m_runBreaks.pop_back();
        if (!m_runBreaks.empty())
            return {m_text, at, at}; // an empty line between two breaks
        return {m_text, StartBefore(m_runStart), m_runStart};
    }

private:
    char const* m_text;
    std::int32_t m_length;
    std::vector<std::int32_t> m_runBreaks;
    std::int32_t m_runStart = 0;
};

class Searcher {
public:
    Searcher(CompiledPattern const& compiled, SearchRequest const& request)
        : m_compiled(compiled), m_request(request), m_text(request.text), m_length(request.length),
          m_lines(request.text, request.length), m_matcher(compiled), m_filter(compiled) {}

    bool Forward(SearchResult& result);
    bool Backward(SearchResult& result);

private:
    /// The next position in [from, end) where a match may begin; -1 when none can.
    std::int32_t NextCandidate(std::int32_t from, std::int32_t end) const;
    /// False when no match can start at or after `from` in the line.
    bool LineMayMatch(Line line, std::int32_t from);
    bool Found(Line line, std::int32_t at, SearchResult& result);

    CompiledPattern const& m_compiled;
    SearchRequest const& m_request;
    char const* m_text;
    std::int32_t m_length;
    Lines m_lines;
    Matcher m_matcher;
    LineFilter m_filter;
};

std::int32_t Searcher::NextCandidate(std::int32_t from, std::int32_t end) const {
    if (!m_compiled.requiredLiteral.empty())
        return FindBytes(m_text, from, end, m_compiled.requiredLiteral);
    auto const& first = m_compiled.firstBytes;
    while (from < end && !first[static_cast<unsigned char>(m_text[from])])
        ++from;
    return from < end ? from : -1;
}

bool Searcher::LineMayMatch(Line line, std::int32_t from) {
    if (m_compiled.neverMatches)
        return false;
    if (!m_compiled.canBeEmpty && NextCandidate(from, line.end) < 0)
        return false;
    return m_compiled.multiByte || m_filter.MayMatch(line, from);
}

bool Searcher::Found(Line line, std::int32_t at, SearchResult& result) {
    if (at < 0)
        return false;
    result.position = at;
    result.length = m_matcher.MatchLength(line, at, m_request.policy == 1);
    return true;
}

bool Searcher::Forward(SearchResult& result) {
    std::int32_t from = m_request.start < 0 ? 0 : m_request.start;
    if (from > m_length || m_compiled.neverMatches)
        return false;
    Line line = m_lines.Holding(from);
    if (m_lines.IsBreakAt(from)) {
        std::int32_t const brk = m_lines.BreakHolding(from);
        line = from == brk ? m_lines.EndingAt(brk) : m_lines.After(m_lines.EndingAt(brk));
        from = std::max(from, line.start);
    }
    for (;;) {
        if (!m_compiled.canBeEmpty) {
            std::int32_t const candidate = NextCandidate(from, m_length);
            if (candidate < 0)
                return false;
            if (candidate > line.end) {
                line = m_lines.Holding(candidate);
                from = line.start;
            }
            if (m_compiled.pureLiteral) {
                result = {candidate, static_cast<std::int32_t>(m_compiled.requiredLiteral.size())};
                return true;
            }
            // Matches begin at the literal: try the first one; the rest of the line, if that
            // fails, goes to the whole-line search (so each line costs at most two passes).
            if (m_compiled.literalLeads) {
                result = {candidate, m_matcher.MatchLength(line, candidate, m_request.policy == 1)};
                if (result.length >= 0)
                    return true;
                from = candidate + 1;
            }
        }
        if ((m_compiled.multiByte || m_filter.MayMatch(line, from)) &&
            Found(line, m_matcher.FindStart(line, from, line.end, true), result))
            return true;
        if (line.end >= m_length)
            return false;
        line = m_lines.After(line);
        from = line.start;
    }
}

bool Searcher::Backward(SearchResult& result) {
    if (m_request.start < 0)
        return false;
    std::int32_t limit = std::min(m_request.start, m_length);
    Line line = m_lines.Holding(limit);
    if (m_lines.IsBreakAt(limit)) {
        line = m_lines.EndingAt(m_lines.BreakHolding(limit));
        limit = line.end;
    }
    for (;;) {
        if (LineMayMatch(line, line.start)) {
            std::int32_t at = m_request.policy == 1
                                  ? m_matcher.FindStart(line, line.start, limit, false)
                                  : m_matcher.FindStart(line, line.start, line.end, true);
            if (Found(line, at <= limit ? at : -1, result))
                return true;
        }
        if (line.start == 0)
            return false;
        line = m_lines.Before(line);
        limit = line.end;
    }
}

} // namespace

bool Search(CompiledPattern const& compiled, SearchRequest const& request, SearchResult& result) {
    Searcher searcher(compiled, request);
    return request.forward ? searcher.Forward(result) : searcher.Backward(result);
}

} // namespace tekit::toolbox::pattern
