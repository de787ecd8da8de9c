// Loomwire versions: reading version text, comparing versions, and the fixed threshold tests
// with their character rules, quirks included.
#include "tekit/environment/LWVersion.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using namespace tekit;

TEST(LWVersion, ParsingReadsLeadingPartsAndIgnoresTheRest) {
    std::string const tenThousandDigits(10000, '7');
    std::string const zeros = std::string(10000, '0') + "17.2";
    struct {
        char const* text;
        bool ok;
        long major, minor, patch;
    } const cases[] = {
        {"21.0f2", true, 21, 0, 0},
        {"9.0.1f2", true, 9, 0, 1},
        {"17", true, 17, 0, 0},
        {"1.", true, 1, 0, 0}, // a "." needs digits after it to count
        {"1.2.", true, 1, 2, 0},
        {"1..2", true, 1, 0, 0},
        {"1.2.3.4", true, 1, 2, 3},
        {"2147483647.0.1", true, 2147483647, 0, 1},
        {zeros.c_str(), true, 17, 2, 0},
        {"abc", false, 0, 0, 0},
        {"", false, 0, 0, 0},
        {".5", false, 0, 0, 0},
        {"...", false, 0, 0, 0},
        {" 17", false, 0, 0, 0}, // anchored at the first character
        {"-1", false, 0, 0, 0},
        {nullptr, false, 0, 0, 0},
        {"2147483648", false, 0, 0, 0},
        {tenThousandDigits.c_str(), false, 0, 0, 0},
        // The last conversion decides, and a part that fails stays 0.
        {"1.99999999999", false, 1, 0, 0},
        {"99999999999.1", true, 0, 1, 0},
    };
    for (auto const& c : cases) {
        long major = -1, minor = -1, patch = -1;
        std::string const label = c.text ? std::string(c.text).substr(0, 20) : "(null)";
        EXPECT_EQ(ParseLWVersionString(c.text, major, minor, patch), c.ok) << label;
        EXPECT_EQ(major, c.major) << label;
        EXPECT_EQ(minor, c.minor) << label;
        EXPECT_EQ(patch, c.patch) << label;
    }
    long major = -1, minor = -1;
    EXPECT_TRUE(ParseLWVersionString("9.0.1", major, minor));
    EXPECT_EQ(major, 9);
    EXPECT_EQ(minor, 0);
}

TEST(LWVersion, CompareDecidesByTheFirstDifferingPart) {
    struct {
        char const* a;
        char const* b;
        bool majorOnly;
        int result;
        bool bothValid;
    } const cases[] = {
        {"17.0", "17.0.0", false, 0, true},
        {"x", "17", false, 0, false},
        {"17", "", false, 0, false},
        {"18.5", "18.0.3", true, 0, true},
        {"18.5", "18.0.3", false, 1, true},
        {"9.0", "10.0", false, -1, true},
        {"17.0.1", "17.0.2", false, -1, true},
        {"17.9", "17.10", false, -1, true}, // numbers, not text
        {"21.0f2", "21.0.0", false, 0, true},
        {"2147483648", "1", false, 0, false},
    };
    for (auto const& c : cases) {
        bool bothValid = !c.bothValid;
        EXPECT_EQ(LWVersionCompare(c.a, c.b, bothValid, c.majorOnly), c.result)
            << c.a << " vs " << c.b;
        EXPECT_EQ(bothValid, c.bothValid) << c.a << " vs " << c.b;
    }
}

TEST(LWVersion, GivenAndMinimumVersionsNeedBothToParse) {
    EXPECT_TRUE(LWVersionIsGivenVersionOrGreater("17.1", "17.0.5", false));
    EXPECT_FALSE(LWVersionIsGivenVersionOrGreater("16.9", "17", false));
    EXPECT_TRUE(LWVersionIsGivenVersionOrGreater("17.0", "17.9", true));
    EXPECT_FALSE(LWVersionIsGivenVersionOrGreater("abc", "1", false));
    EXPECT_FALSE(LWVersionIsGivenVersionOrGreater("17.0", "x", false)); // not "0 or more"

    EXPECT_FALSE(LWVersionIsMinimumVersionOrGreater("16.0"));
    EXPECT_FALSE(LWVersionIsMinimumVersionOrGreater("16.99.99"));
    EXPECT_TRUE(LWVersionIsMinimumVersionOrGreater("17.0f1"));
    EXPECT_TRUE(LWVersionIsMinimumVersionOrGreater("100"));
    EXPECT_FALSE(LWVersionIsMinimumVersionOrGreater(""));
}

using Threshold = bool (*)(char const*);

Threshold const kThresholds[] = {
    LWVersionIs80OrGreater,   LWVersionIs90OrGreater,    LWVersionIs90_1,
    LWVersionIs90_1OrGreater, LWVersionIs100OrGreater,   LWVersionIs110OrGreater,
    LWVersionIs120OrGreater,  LWVersionIs130OrGreater,   LWVersionIs130_1OrGreater,
    LWVersionIs140OrGreater,  LWVersionIs140_1OrGreater, LWVersionIs170OrGreater,
    LWVersionIs180OrGreater,  LWVersionIs190OrGreater,   LWVersionIs200OrGreater,
};

TEST(LWVersion, FixedTestsFollowTheirCharacterRules) {
    // One letter per test, in the order of kThresholds: 80 90 90_1 90_1+ 100 110 120 130
    // 130_1 140 140_1 170 180 190 200.
    struct {
        char const* version;
        char const* expected;
    } const cases[] = {
        {"7.1", "FFFFFFFFFFFFFFF"},
        {"8", "FFFFFFFFFFFFFFF"},
        {"8.", "FFFFFFFFFFFFFFF"}, // c2 is the end of the text
        {"8.0", "TFFFFFFFFFFFFFF"},
        {"8.\xE9", "TFFFFFFFFFFFFFF"}, // a byte above 0x7F is not below "0"
        {"9", "TFFFFFFFFFFFFFF"},
        {"9.", "TFFFFFFFFFFFFFF"},
        {"9.0", "TTFFFFFFFFFFFFF"}, // too short for 9.0.1
        {"9.0.1", "TTTTFFFFFFFFFFF"},
        {"9.0.a", "TTTTFFFFFFFFFFF"}, // "a" is above "1"
        {"9.1", "TTFTFFFFFFFFFFF"},
        {"10.0", "TTFTTFFFFFFFFFF"},
        {"100.0", "TTFTTFFFFFFFFFF"}, // only the first two characters count
        {"13.0", "TTFTTTTTFFFFFFF"},
        {"13.0.1", "TTFTTTTTTFFFFFF"},
        {"13.1", "TTFTTTTTFFFFFFF"}, // not 13.0.1 or greater
        {"14.0", "TTFTTTTTTTFFFFF"},
        {"14.1", "TTFTTTTTTTFFFFF"}, // not 14.0.1 or greater
        {"14.0.1", "TTFTTTTTTTTFFFF"},
        {"17.0", "TTFTTTTTTTTTFFF"},
        {"19.0", "TTFTTTTTTTTTTTF"},
        {"20.0", "TTFTTTTTTTTTTTT"},
        {"99", "TTFTTTTTTTTTTTT"},
        {"2x", "FFFFFFFFFFFFFFF"},
        {"x9.0", "FFFFFFFFFFFFFFF"},
        {"", "FFFFFFFFFFFFFFF"},
    };
    for (auto const& c : cases)
        for (size_t i = 0; i < std::size(kThresholds); ++i)
            EXPECT_EQ(kThresholds[i](c.version), c.expected[i] == 'T')
                << c.version << ", test " << i;
    for (Threshold test : kThresholds)
        EXPECT_FALSE(test(nullptr));
}

} // namespace
