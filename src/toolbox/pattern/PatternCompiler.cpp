// The pattern compiler: an iterative parser over the tokens that builds both automata at once
// by Thompson's construction (the mirror automaton concatenates in the opposite order).
#include "toolbox/pattern/PatternCompiler.h"

#include "strings/MultiByteChars.h"
#include "tekit/toolbox/RegExpr.h"

#include <utility>

namespace tekit::toolbox::pattern {

namespace {

/// A piece of automaton under construction: its first instruction and the list of its
/// unconnected exits, threaded through the exit fields themselves (index * 2 + field).
struct Frag {
    std::int32_t start = -1;
    std::int32_t head = -1;
    std::int32_t tail = -1;
};

class Builder {
public:
    explicit Builder(Program& program) : m_program(program) {}

    Frag Single(Inst inst) {
        std::int32_t const at = Add(inst);
        return {at, at * 2, at * 2};
    }
    Frag Concat(Frag a, Frag b) {
        Patch(a, b.start);
        return {a.start, b.head, b.tail};
    }
    Frag Alternate(Frag a, Frag b) {
        std::int32_t const split = Add({Op::Split, 0, 0, -1, a.start, b.start});
        return {split, a.head, Append(a, b).tail};
    }
    Frag Star(Frag a) {
        std::int32_t const split = Add({Op::Split, 0, 0, -1, a.start, -1});
        Patch(a, split);
        return {split, split * 2 + 1, split * 2 + 1};
    }
    Frag Plus(Frag a) {
        std::int32_t const split = Add({Op::Split, 0, 0, -1, a.start, -1});
        Patch(a, split);
        return {a.start, split * 2 + 1, split * 2 + 1};
    }
    Frag Optional(Frag a) {
        std::int32_t const split = Add({Op::Split, 0, 0, -1, a.start, -1});
        Frag const exit{split, split * 2 + 1, split * 2 + 1};
        return {split, a.head, Append(a, exit).tail};
    }
    void Finish(Frag whole) {
        m_program.match = Add({Op::Match});
        Patch(whole, m_program.match);
        m_program.start = whole.start;
    }

private:
    std::int32_t Add(Inst inst) {
        m_program.insts.push_back(inst);
        return static_cast<std::int32_t>(m_program.insts.size() - 1);
    }
    std::int32_t& Exit(std::int32_t hole) {
        Inst& inst = m_program.insts[static_cast<std::size_t>(hole / 2)];
        return hole % 2 == 0 ? inst.out : inst.out1;
    }
    /// Joins b's exits after a's; returns the joined list (in a).
    Frag Append(Frag a, Frag b) {
        Exit(a.tail) = b.head;
        return {a.start, a.head, b.tail};
    }
    void Patch(Frag a, std::int32_t target) {
        for (std::int32_t hole = a.head; hole != -1;) {
            std::int32_t const next = hole == a.tail ? -1 : Exit(hole);
            Exit(hole) = target;
            hole = next;
        }
    }

    Program& m_program;
};

/// The same piece in the forward and in the mirror automaton.
struct Piece {
    Frag forward;
    Frag reverse;
};

/// One nesting level (the whole pattern, or an open group).
struct Level {
    Piece alternatives; ///< the alternatives before the last "|"
    Piece sequence;     ///< the items of the current alternative before the last one
    Piece last;         ///< the last item, which a repetition applies to
    bool hasAlternatives = false;
    bool hasSequence = false;
    bool hasLast = false;
    bool afterBar = false; ///< the current alternative is the right side of a "|"
};

class Parser {
public:
    Parser(std::vector<Token> const& tokens, bool caseSensitive, CompiledPattern& compiled)
        : m_tokens(tokens), m_caseSensitive(caseSensitive), m_compiled(compiled),
          m_forward(compiled.forward), m_reverse(compiled.reverse) {}

    PatternError Run();

private:
    PatternError Step(std::size_t& i);
    PatternError Item(Piece piece);
    PatternError Repeat(Token const& token);
    PatternError Bar();
    PatternError Close(Piece& whole);
    PatternError Set(std::size_t& i, Piece& piece);
    void FlushLast(Level& level);
    Piece Single(Inst inst) { return {m_forward.Single(inst), m_reverse.Single(inst)}; }
    Piece Literal(std::uint16_t c);

    std::vector<Token> const& m_tokens;
    bool m_caseSensitive;
    CompiledPattern& m_compiled;
    Builder m_forward;
    Builder m_reverse;
    std::vector<Level> m_levels;
};

bool IsLetter(std::uint16_t c) {
    return (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z');
}

std::uint16_t OtherCase(std::uint16_t c) {
    return c >= 'a' && c <= 'z' ? mbcs::ToUpper(c) : mbcs::ToLower(c);
}

Piece Parser::Literal(std::uint16_t c) {
    std::uint16_t const other = !m_caseSensitive && IsLetter(c) ? OtherCase(c) : c;
    return Single({Op::Char, c, other});
}

void Parser::FlushLast(Level& level) {
    if (!level.hasLast)
        return;
    if (level.hasSequence) {
        level.sequence = {m_forward.Concat(level.sequence.forward, level.last.forward),
                          m_reverse.Concat(level.last.reverse, level.sequence.reverse)};
    } else {
        level.sequence = level.last;
    }
    level.hasSequence = true;
    level.hasLast = false;
}

PatternError Parser::Item(Piece piece) {
    Level& level = m_levels.back();
    FlushLast(level);
    level.last = piece;
    level.hasLast = true;
    return {};
}

PatternError Parser::Repeat(Token const& token) {
    Level& level = m_levels.back();
    if (!level.hasLast)
        return {REGEXPR_OPERATOR_ON_EMPTY_PATTERN, token.written};
    Piece& last = level.last;
    switch (token.kind) {
    case TokenKind::Star:
        last = {m_forward.Star(last.forward), m_reverse.Star(last.reverse)};
        break;
    case TokenKind::Plus:
        last = {m_forward.Plus(last.forward), m_reverse.Plus(last.reverse)};
        break;
    default:
        last = {m_forward.Optional(last.forward), m_reverse.Optional(last.reverse)};
        break;
    }
    return {};
}

PatternError Parser::Bar() {
    Level& level = m_levels.back();
    FlushLast(level);
    if (!level.hasSequence)
        return {level.afterBar ? REGEXPR_EMPTY_RIGHT_SIDE : REGEXPR_EMPTY_LEFT_SIDE, 0};
    if (level.hasAlternatives) {
        level.alternatives = {
            m_forward.Alternate(level.alternatives.forward, level.sequence.forward),
            m_reverse.Alternate(level.alternatives.reverse, level.sequence.reverse)};
    } else {
        level.alternatives = level.sequence;
    }
    level.hasAlternatives = true;
    level.hasSequence = false;
    level.afterBar = true;
    return {};
}

/// Ends the innermost level: its alternatives joined, or an error for an empty part.
PatternError Parser::Close(Piece& whole) {
    Level& level = m_levels.back();
    FlushLast(level);
    if (!level.hasSequence)
        return {level.afterBar ? REGEXPR_EMPTY_RIGHT_SIDE : REGEXPR_EMPTY_GROUP, 0};
    whole = level.sequence;
    if (level.hasAlternatives) {
        whole = {m_forward.Alternate(level.alternatives.forward, whole.forward),
                 m_reverse.Alternate(level.alternatives.reverse, whole.reverse)};
    }
    m_levels.pop_back();
    return {};
}

/// Compiles the set that opens at tokens[i]; leaves i at its closing token.
PatternError Parser::Set(std::size_t& i, Piece& piece) {
    CharSet set;
    bool any = false;
    for (++i; m_tokens[i].kind != TokenKind::SetClose; ++i) {
        Token const& token = m_tokens[i];
        if (token.kind == TokenKind::SetNegation) {
            set.negated = true;
            continue;
        }
        if (token.high > 0xFF)
            return {REGEXPR_MULTIBYTE_CHARS_NOT_ALLOWED_IN_RANGE, 0};
        if (token.low > token.high)
            return {REGEXPR_INVALID_RANGE, 0};
        for (unsigned c = token.low; c <= token.high; ++c)
            set.bytes[c] = true;
        any = true;
    }
    if (!any)
        return {REGEXPR_EMPTY_SET, 0};
    if (!m_caseSensitive) {
        for (unsigned c = 'A'; c <= 'Z'; ++c)
            set.bytes[c] = set.bytes[c + 32] = set.bytes[c] || set.bytes[c + 32];
    }
    if (set.negated) {
        for (bool& b : set.bytes)
            b = !b;
    }
    m_compiled.sets.push_back(set);
    auto const index = static_cast<std::int32_t>(m_compiled.sets.size() - 1);
    piece = Single({Op::Set, 0, 0, index});
    return {};
}

PatternError Parser::Step(std::size_t& i) {
    Token const& token = m_tokens[i];
    switch (token.kind) {
    case TokenKind::Literal:
        return Item(Literal(token.low));
    case TokenKind::Any:
        return Item(Single({Op::Any}));
    case TokenKind::LineStart:
        return Item(Single({Op::LineStart}));
    case TokenKind::LineEnd:
        return Item(Single({Op::LineEnd}));
    case TokenKind::Star:
    case TokenKind::Plus:
    case TokenKind::Optional:
        return Repeat(token);
    case TokenKind::Alternation:
        return Bar();
    case TokenKind::GroupOpen:
        m_levels.emplace_back();
        return {};
    case TokenKind::GroupClose: {
        Piece group;
        if (PatternError const error = Close(group))
            return error;
        return Item(group);
    }
    case TokenKind::SetOpen: {
        Piece set;
        if (PatternError const error = Set(i, set))
            return error;
        return Item(set);
    }
    default:
        return {}; // set tokens are read by Set
    }
}

PatternError Parser::Run() {
    m_levels.emplace_back();
    for (std::size_t i = 0; i < m_tokens.size(); ++i) {
        if (PatternError const error = Step(i))
            return error;
    }
    Piece whole;
    if (PatternError const error = Close(whole))
        return error;
    m_forward.Finish(whole.forward);
    m_reverse.Finish(whole.reverse);
    return {};
}

/// The longest run of literal characters outside groups that every match contains; letters
/// end a run when case is ignored, and an alternation outside groups leaves none.
/// `leads` tells whether the literal is where every match begins.
std::string RequiredLiteral(std::vector<Token> const& tokens, bool caseSensitive, bool& leads) {
    std::string best, run;
    int depth = 0;
    bool runLeads = true;
    leads = false;
    auto endRun = [&] {
        if (run.size() > best.size()) {
            best = run;
            leads = runLeads;
        }
        run.clear();
        runLeads = false;
    };
    for (std::size_t i = 0; i < tokens.size(); ++i) {
        TokenKind const kind = tokens[i].kind;
        depth += kind == TokenKind::GroupOpen ? 1 : kind == TokenKind::GroupClose ? -1 : 0;
        if (kind == TokenKind::Alternation && depth == 0)
            return {};
        if (kind != TokenKind::Literal || depth > 0) { // set members are Range tokens
            endRun();
            continue;
        }
        TokenKind const next = i + 1 < tokens.size() ? tokens[i + 1].kind : TokenKind::Any;
        std::uint16_t const c = tokens[i].low;
        if (next == TokenKind::Star || next == TokenKind::Optional ||
            (!caseSensitive && IsLetter(c))) {
            endRun();
            continue;
        }
        if (c > 0xFF)
            run += static_cast<char>(c >> 8);
        run += static_cast<char>(c & 0xFF);
        if (next == TokenKind::Plus)
            endRun();
    }
    endRun();
    return best;
}

/// Walks the forward automaton's instructions reachable without reading a character.
void ComputeFirstBytes(CompiledPattern& compiled) {
    Program const& program = compiled.forward;
    std::vector<bool> seen(program.insts.size());
    std::vector<std::int32_t> stack{program.start};
    auto& first = compiled.firstBytes;
    while (!stack.empty()) {
        std::int32_t const pc = stack.back();
        stack.pop_back();
        if (pc < 0 || seen[static_cast<std::size_t>(pc)])
            continue;
        seen[static_cast<std::size_t>(pc)] = true;
        Inst const& inst = program.insts[static_cast<std::size_t>(pc)];
        switch (inst.op) {
        case Op::Char:
            first[inst.c1 > 0xFF ? inst.c1 >> 8 : inst.c1] = true;
            first[inst.c2 > 0xFF ? inst.c2 >> 8 : inst.c2] = true;
            break;
        case Op::Set: {
            CharSet const& set = compiled.sets[static_cast<std::size_t>(inst.set)];
            for (unsigned b = 0; b < 256; ++b)
                first[b] = first[b] || set.bytes[b] ||
                           (set.negated && compiled.multiByte &&
                            mbcs::IsLeadByte(static_cast<unsigned char>(b)));
            break;
        }
        case Op::Any:
            first.fill(true);
            break;
        case Op::Match:
            compiled.canBeEmpty = true;
            break;
        case Op::Split:
            stack.push_back(inst.out1);
            [[fallthrough]];
        default:
            stack.push_back(inst.out);
            break;
        }
    }
    first['\r'] = first['\n'] = false; // a line holds neither
}

/// Splits every class of `classes` by membership in `members`.
void Refine(std::array<std::uint8_t, 256>& classes, int& count,
            std::array<bool, 256> const& members) {
    std::array<int, 512> renumber;
    renumber.fill(-1);
    int next = 0;
    for (unsigned b = 0; b < 256; ++b) {
        int& id = renumber[classes[b] * 2 + (members[b] ? 1 : 0)];
        if (id < 0)
            id = next++;
        classes[b] = static_cast<std::uint8_t>(id);
    }
    count = next;
}

/// Byte classes: each character of the pattern (with its other case) is a class of its own,
/// the other bytes one class, then the sets split these; past a few hundred distinct sets,
/// every byte is its own class.
void ComputeByteClasses(CompiledPattern& compiled) {
    auto& classes = compiled.byteClass;
    int& count = compiled.classCount;
    for (Inst const& inst : compiled.forward.insts) {
        if (inst.op == Op::Char && inst.c1 <= 0xFF && classes[inst.c1] == 0)
            classes[inst.c1] = classes[inst.c2 & 0xFF] = static_cast<std::uint8_t>(count++);
    }
    int sets = 0;
    for (Inst const& inst : compiled.forward.insts) {
        if (inst.op != Op::Set)
            continue;
        if (++sets > 256) {
            for (unsigned b = 0; b < 256; ++b)
                classes[b] = static_cast<std::uint8_t>(b);
            count = 256;
            return;
        }
        Refine(classes, count, compiled.sets[static_cast<std::size_t>(inst.set)].bytes);
    }
}

} // namespace

PatternError Compile(char const* pattern, bool caseSensitive, bool multiByte,
                     CompiledPattern& compiled) {
    std::vector<Token> tokens;
    if (PatternError const error = Tokenize(pattern, multiByte, tokens))
        return error;
    compiled.multiByte = multiByte;
    if (PatternError const error = Parser(tokens, caseSensitive, compiled).Run())
        return error;
    bool literalLeads = false;
    compiled.requiredLiteral = RequiredLiteral(tokens, caseSensitive, literalLeads);
    compiled.literalLeads = literalLeads && !multiByte;
    compiled.neverMatches = compiled.requiredLiteral.find_first_of("\r\n") != std::string::npos;
    compiled.pureLiteral = !multiByte && compiled.requiredLiteral.size() == tokens.size();
    ComputeFirstBytes(compiled);
    ComputeByteClasses(compiled);
    return {};
}

} // namespace tekit::toolbox::pattern
