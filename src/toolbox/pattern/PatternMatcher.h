// The pattern matcher: simulates a compiled pattern's automata over one line, keeping every
// live state at once (no backtracking), so each call costs at most the line's length times
// the pattern's size.
//
//   Matcher matcher(compiled);
//   std::int32_t at = matcher.FindStart(line, line.start, line.end, /*lowest=*/true);
//   std::int32_t length = at < 0 ? -1 : matcher.MatchLength(line, at, /*longest=*/false);
#pragma once

#include "toolbox/pattern/PatternProgram.h"

#include <cstdint>
#include <vector>

namespace tekit::toolbox::pattern {

/// One line of a text: bytes [start, end) of `text`, without its line break.
struct Line {
    char const* text;
    std::int32_t start;
    std::int32_t end;
};

/// A set of automaton states in the order they were added (the order is the priority).
class StateList {
public:
    void Reserve(std::size_t states) {
        m_dense.resize(states);
        m_sparse.resize(states);
    }
    bool Contains(std::int32_t pc) const {
        std::uint32_t const i = m_sparse[static_cast<std::size_t>(pc)];
        return i < m_size && m_dense[i] == pc;
    }
    void Insert(std::int32_t pc) {
        m_sparse[static_cast<std::size_t>(pc)] = m_size;
        m_dense[m_size++] = pc;
    }
    void Clear() { m_size = 0; }
    bool Empty() const { return m_size == 0; }
    std::uint32_t Size() const { return m_size; }
    std::int32_t operator[](std::uint32_t i) const { return m_dense[i]; }

private:
    std::vector<std::int32_t> m_dense;
    std::vector<std::uint32_t> m_sparse;
    std::uint32_t m_size = 0;
};

class Matcher {
public:
    explicit Matcher(CompiledPattern const& compiled);

    /// The lowest (`lowest`) or highest position in [lo, hi] of `line` at which a match of the
    /// pattern starts; -1 when there is none. Reads the line backward with the mirror automaton,
    /// which reaches its Match state exactly at the positions where a match starts.
    std::int32_t FindStart(Line line, std::int32_t lo, std::int32_t hi, bool lowest);

    /// The length of the match that starts at `position` (where one starts): the longest, or
    /// the one a backtracking matcher would take (greedy, alternatives left first).
    std::int32_t MatchLength(Line line, std::int32_t position, bool longest);

private:
    /// Adds `pc` and every state reachable from it without reading a character at `pos`.
    void Add(Program const& program, StateList& list, std::int32_t pc, Line line, std::int32_t pos);
    bool Accepts(Inst const& inst, std::uint16_t c) const;
    /// Fills m_bounds with the character starts of the line and its end.
    void CharacterBounds(Line line);

    CompiledPattern const& m_compiled;
    bool const* m_leads;
    StateList m_current;
    StateList m_next;
    std::vector<std::int32_t> m_stack;
    std::vector<std::int32_t> m_bounds;
};

/// States visited and bytes filtered by the matchers and line filters of this thread since it
/// started (for tests of the running time).
std::uint64_t MatcherSteps();
void AddMatcherSteps(std::uint64_t steps);

} // namespace tekit::toolbox::pattern
