// The line filter: subset construction on demand over the forward automaton.
#include "toolbox/pattern/PatternFilter.h"

#include <algorithm>
#include <utility>

namespace tekit::toolbox::pattern {

namespace {
/// Beyond this many states the filter stops: its table would outgrow its use.
constexpr std::size_t kMaxStates = 4096;
} // namespace

LineFilter::LineFilter(CompiledPattern const& compiled)
    : m_program(compiled.forward), m_compiled(compiled), m_mark(compiled.forward.insts.size()) {}

void LineFilter::Close(std::int32_t pc, bool atLineStart, bool atLineEnd) {
    m_stack.push_back(pc);
    while (!m_stack.empty()) {
        pc = m_stack.back();
        m_stack.pop_back();
        auto& mark = m_mark[static_cast<std::size_t>(pc)];
        if (mark == m_generation)
            continue;
        mark = m_generation;
        m_work.push_back(pc);
        AddMatcherSteps(1);
        Inst const& inst = m_program.insts[static_cast<std::size_t>(pc)];
        bool const follow = inst.op == Op::Split || inst.op == Op::Jump ||
                            (inst.op == Op::LineStart && atLineStart) ||
                            (inst.op == Op::LineEnd && atLineEnd);
        if (follow)
            m_stack.push_back(inst.out);
        if (inst.op == Op::Split)
            m_stack.push_back(inst.out1);
    }
}

std::int32_t LineFilter::Intern() {
    std::sort(m_work.begin(), m_work.end());
    std::string key(reinterpret_cast<char const*>(m_work.data()),
                    m_work.size() * sizeof(std::int32_t));
    auto const found = m_index.find(key);
    if (found != m_index.end())
        return found->second;
    if (m_states.size() >= kMaxStates) {
        m_gaveUp = true;
        return -1;
    }
    auto const state = static_cast<std::int32_t>(m_states.size());
    m_states.push_back(m_work);
    m_index.emplace(std::move(key), state);
    m_next.resize(m_next.size() + static_cast<std::size_t>(m_compiled.classCount), -1);
    m_accepts.push_back(std::binary_search(m_work.begin(), m_work.end(), m_program.match));
    return state;
}

std::int32_t LineFilter::Start(bool atLineStart) {
    std::int32_t& start = m_start[atLineStart ? 1 : 0];
    if (start < 0) {
        m_work.clear();
        ++m_generation;
        Close(m_program.start, atLineStart, false);
        start = Intern();
    }
    return start;
}

std::int32_t LineFilter::Next(std::int32_t state, unsigned char byte) {
    auto const slot =
        static_cast<std::size_t>(state) * static_cast<std::size_t>(m_compiled.classCount) +
        m_compiled.byteClass[byte];
    if (m_next[slot] >= 0)
        return m_next[slot];
    m_work.clear();
    ++m_generation;
    // Copied: interning may grow m_states and move the set.
    std::vector<std::int32_t> const set = m_states[static_cast<std::size_t>(state)];
    for (std::int32_t pc : set) {
        Inst const& inst = m_program.insts[static_cast<std::size_t>(pc)];
        bool const reads = inst.op == Op::Char || inst.op == Op::Set || inst.op == Op::Any;
        bool accepts =
            inst.op == Op::Any || (inst.op == Op::Char && (byte == inst.c1 || byte == inst.c2));
        if (inst.op == Op::Set)
            accepts = m_compiled.sets[static_cast<std::size_t>(inst.set)].bytes[byte];
        if (reads && accepts)
            Close(inst.out, false, false);
    }
    Close(m_program.start, false, false); // a match may also start at the next position
    std::int32_t const next = Intern();
    if (next >= 0)
        m_next[slot] = next;
    return next;
}

bool LineFilter::MatchesAtEnd(std::int32_t state) {
    m_work.clear();
    ++m_generation;
    for (std::int32_t pc : m_states[static_cast<std::size_t>(state)]) {
        Inst const& inst = m_program.insts[static_cast<std::size_t>(pc)];
        if (inst.op == Op::LineEnd)
            Close(inst.out, false, true);
    }
    return std::find(m_work.begin(), m_work.end(), m_program.match) != m_work.end();
}

bool LineFilter::MayMatch(Line line, std::int32_t from) {
    if (m_gaveUp || from >= line.end)
        return true; // an empty rest of line is left to the matcher
    std::int32_t state = Start(from == line.start);
    AddMatcherSteps(static_cast<std::uint64_t>(line.end - from));
    auto const classes = static_cast<std::size_t>(m_compiled.classCount);
    for (std::int32_t at = from; state >= 0; ++at) {
        if (m_accepts[static_cast<std::size_t>(state)])
            return true;
        if (at == line.end)
            return MatchesAtEnd(state);
        auto const byte = static_cast<unsigned char>(line.text[at]);
        std::int32_t const next =
            m_next[static_cast<std::size_t>(state) * classes + m_compiled.byteClass[byte]];
        state = next >= 0 ? next : Next(state, byte);
    }
    return true; // the table is full
}

} // namespace tekit::toolbox::pattern
