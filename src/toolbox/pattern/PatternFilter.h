// The line filter: a lazily built deterministic automaton that tells, in one table lookup per
// byte, whether a line can hold a match at all, so the exact (and slower) matcher runs only on
// lines that do. Its states are sets of the forward automaton's states, made on first use;
// when there would be too many, it stops filtering and lets every line through, so no input
// costs more than the exact matcher would. Single-byte text only.
//
//   LineFilter filter(compiled);
//   if (filter.MayMatch(line, from)) { /* run the matcher */ }
#pragma once

#include "toolbox/pattern/PatternMatcher.h"

#include <cstdint>
#include <string>
#include <unordered_map>
#include <vector>

namespace tekit::toolbox::pattern {

class LineFilter {
public:
    explicit LineFilter(CompiledPattern const& compiled);

    /// False when no match starts at or after `from` in `line`; true when one may.
    bool MayMatch(Line line, std::int32_t from);

private:
    std::int32_t Start(bool atLineStart);
    std::int32_t Next(std::int32_t state, unsigned char byte);
    bool MatchesAtEnd(std::int32_t state);
    /// Adds `pc` and the states it reaches without reading, to m_work (assertions that do not
    /// hold stay in the set, unfollowed: the end of the line may satisfy "$" later).
    void Close(std::int32_t pc, bool atLineStart, bool atLineEnd);
    /// The state of the set in m_work (sorted here), made if new; -1 when the cache is full.
    std::int32_t Intern();

    Program const& m_program;
    CompiledPattern const& m_compiled;
    std::vector<std::vector<std::int32_t>> m_states;
    std::unordered_map<std::string, std::int32_t> m_index; ///< a set's bytes to its state
    std::vector<std::int32_t> m_next; ///< state * classes + byte class; -1 not made yet
    std::vector<char> m_accepts;      ///< the state holds Match
    std::vector<std::int32_t> m_work;
    std::vector<std::uint32_t> m_mark;
    std::uint32_t m_generation = 0;
    std::vector<std::int32_t> m_stack;
    std::int32_t m_start[2] = {-1, -1};
    bool m_gaveUp = false;
};

} // namespace tekit::toolbox::pattern
