// The pattern engine's running time: the states it visits grow linearly with the text, even
// for patterns that make a backtracking matcher take exponential or quadratic time.
#include "toolbox/pattern/PatternMatcher.h"

#include "support/MultiByteFixture.h"
#include "tekit/toolbox/RegExpr.h"

#include <gtest/gtest.h>

#include <string>

namespace tekit::toolbox::pattern {
namespace {

/// States visited by one search of `pattern` in `size` copies of 'a'.
std::uint64_t Steps(char const* pattern, int size, bool forward, int policy) {
    std::string const text(static_cast<std::size_t>(size), 'a');
    std::uint64_t const before = MatcherSteps();
    int found = -1;
    int const rc =
        RegExpr_FindPatternInText(pattern, 1, text.c_str(), size, forward ? 0 : size,
                                  forward ? 1 : 0, policy, &found, nullptr, nullptr, nullptr);
    EXPECT_EQ(rc, 0) << pattern;
    return MatcherSteps() - before;
}

using RegExprMatcherTest = testing::MultiByteFixture;

// Single-byte text goes through the line filter (a lazy deterministic automaton) first, and
// multibyte text straight to the simulation of the nondeterministic one: both are checked.
TEST_F(RegExprMatcherTest, StepsGrowLinearlyWithTheText) {
    struct Case {
        char const* pattern;
        int size; ///< the smaller of the two sizes
    } const cases[] = {
        {"{{a*}*}*{b|c}", 50000},     // nested stars, no match: exponential for backtracking
        {"{a|aa}*{a|aa}*c|x", 10000}, // overlapping alternatives
        {"a*a*a*a*a*[bc]", 10000},    {"{a?}{a?}{a?}{a?}{a?}aaaaa", 10000},
        {"{{a*}*}*", 10000}, // matches the whole line
    };
    UseShiftJis();
    for (bool multiByte : {false, true}) {
        String::EnableMultiByteSupport(multiByte);
        // Without a match every character is read; the count shows it was.
        EXPECT_GT(Steps(cases[0].pattern, 50000, true, REGEXPR_MATCH_FIRST), 50000u);
        for (auto const& [pattern, size] : cases) {
            for (int policy : {REGEXPR_MATCH_FIRST, REGEXPR_MATCH_LONGEST}) {
                for (bool forward : {true, false}) {
                    std::uint64_t const small = Steps(pattern, size, forward, policy);
                    std::uint64_t const large = Steps(pattern, size * 2, forward, policy);
                    EXPECT_LT(large, small * 21 / 10 + 1000) << pattern << " " << forward;
                    EXPECT_LT(large, std::uint64_t(size) * 2 * 64) << pattern; // states x text
                }
            }
        }
    }
}

} // namespace
} // namespace tekit::toolbox::pattern
