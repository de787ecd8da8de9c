// The pattern matcher: Thompson/Pike simulation of the automata over one line.
#include "toolbox/pattern/PatternMatcher.h"

#include "strings/MultiByteChars.h"

#include <algorithm>
#include <utility>

namespace tekit::toolbox::pattern {

namespace {
thread_local std::uint64_t tSteps = 0;
} // namespace

std::uint64_t MatcherSteps() {
    return tSteps;
}

void AddMatcherSteps(std::uint64_t steps) {
    tSteps += steps;
}

Matcher::Matcher(CompiledPattern const& compiled)
    : m_compiled(compiled), m_leads(mbcs::gLeadBytes) {
    std::size_t const states =
        std::max(compiled.forward.insts.size(), compiled.reverse.insts.size());
    m_current.Reserve(states);
    m_next.Reserve(states);
    m_stack.reserve(states);
}

void Matcher::Add(Program const& program, StateList& list, std::int32_t pc, Line line,
                  std::int32_t pos) {
    m_stack.push_back(pc);
    while (!m_stack.empty()) {
        pc = m_stack.back();
        m_stack.pop_back();
        if (list.Contains(pc))
            continue;
        ++tSteps;
        list.Insert(pc);
        Inst const& inst = program.insts[static_cast<std::size_t>(pc)];
        switch (inst.op) {
        case Op::Split:
            m_stack.push_back(inst.out1); // after out: out has the priority
            m_stack.push_back(inst.out);
            break;
        case Op::Jump:
            m_stack.push_back(inst.out);
            break;
        case Op::LineStart:
            if (pos == line.start)
                m_stack.push_back(inst.out);
            break;
        case Op::LineEnd:
            if (pos == line.end)
                m_stack.push_back(inst.out);
            break;
        default:
            break; // a state that reads a character, or Match
        }
    }
}

bool Matcher::Accepts(Inst const& inst, std::uint16_t c) const {
    switch (inst.op) {
    case Op::Char:
        return c == inst.c1 || c == inst.c2;
    case Op::Any:
        return true;
    case Op::Set: {
        CharSet const& set = m_compiled.sets[static_cast<std::size_t>(inst.set)];
        return c > 0xFF ? set.negated : set.bytes[c];
    }
    default:
        return false;
    }
}

void Matcher::CharacterBounds(Line line) {
    m_bounds.clear();
    char const* const end = line.text + line.end;
    for (std::int32_t pos = line.start; pos < line.end;) {
        m_bounds.push_back(pos);
        int bytes = 1;
        CharAt(line.text + pos, end, true, m_leads, bytes);
        pos += bytes;
    }
    m_bounds.push_back(line.end);
}

std::int32_t Matcher::FindStart(Line line, std::int32_t lo, std::int32_t hi, bool lowest) {
    Program const& program = m_compiled.reverse;
    bool const multiByte = m_compiled.multiByte;
    if (multiByte)
        CharacterBounds(line);
    std::size_t bound = multiByte ? m_bounds.size() - 1 : 0;
    std::int32_t found = -1;
    m_current.Clear();
    for (std::int32_t pos = line.end;;) {
        Add(program, m_current, program.start, line, pos); // a match may end here
        if (pos <= hi && pos >= lo && m_current.Contains(program.match)) {
            found = pos;
            if (!lowest)
                return found;
        }
        if (pos <= lo || pos <= line.start)
            return found;
        std::int32_t const previous = multiByte ? m_bounds[--bound] : pos - 1;
        int bytes = 1;
        std::uint16_t const c =
            multiByte ? CharAt(line.text + previous, line.text + pos, true, m_leads, bytes)
                      : static_cast<unsigned char>(line.text[previous]);
        m_next.Clear();
        for (std::uint32_t i = 0; i < m_current.Size(); ++i) {
            Inst const& inst = program.insts[static_cast<std::size_t>(m_current[i])];
            if (Accepts(inst, c))
                Add(program, m_next, inst.out, line, previous);
        }
        std::swap(m_current, m_next);
        pos = previous;
    }
}

std::int32_t Matcher::MatchLength(Line line, std::int32_t position, bool longest) {
    Program const& program = m_compiled.forward;
    char const* const end = line.text + line.end;
    std::int32_t matchEnd = -1;
    m_current.Clear();
    Add(program, m_current, program.start, line, position);
    for (std::int32_t pos = position; !m_current.Empty();) {
        int bytes = 1;
        std::uint16_t const c =
            pos < line.end ? CharAt(line.text + pos, end, m_compiled.multiByte, m_leads, bytes) : 0;
        m_next.Clear();
        for (std::uint32_t i = 0; i < m_current.Size(); ++i) {
            Inst const& inst = program.insts[static_cast<std::size_t>(m_current[i])];
            if (inst.op == Op::Match) {
                matchEnd = pos;
                if (longest)
                    continue;
                break; // the states after this one have a lower priority
            }
            if (pos < line.end && Accepts(inst, c))
                Add(program, m_next, inst.out, line, pos + bytes);
        }
        std::swap(m_current, m_next);
        pos += bytes;
    }
    return matchEnd < 0 ? -1 : matchEnd - position;
}

} // namespace tekit::toolbox::pattern
