#include "support/MultiByteFixture.h"
#include "support/Raises.h"

#include "tekit/strings/DynamicString.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <string>

namespace tekit {
namespace {

using testing::Raised;
using MultiByteNumbers = testing::MultiByteFixture;

DynamicString Text(char const* text) {
    return DynamicString(text, true);
}

// ---- Integers ------------------------------------------------------------------------------

TEST(ReadIntegers, SignsAndWhiteSpace) {
    // The limits of each type are read back in FormatPropertyTest.
    EXPECT_EQ(Text(" \t+42 \r\n").CvtToInt32(), 42);
    EXPECT_EQ(Text("0004294967295").CvtToUInt32(), UINT32_MAX);
    EXPECT_EQ(Text("-0").CvtToUInt32(), 0u);
    EXPECT_EQ(Text("-123").CvtToSignedSizeT(), -123);
}

TEST(ReadIntegers, NumbersOutOfRangeRaiseTheirTypesOverflowQuotingTheNumber) {
    bool const wide = sizeof(std::size_t) == 8;
    struct Case {
        std::function<void()> read;
        TEError code;
        char const* function;
        char const* description;
    } const cases[] = {
        {[] { Text(" 2147483648 ").CvtToInt32(); }, TE_INT32_OVERFLOW, "String::CvtToInt32",
         "The number '2147483648' is outside the range of a 32-bit integer (-2147483648 to "
         "2147483647)."},
        {[] { Text("-1").CvtToUInt32(); }, TE_UINT32_OVERFLOW, nullptr,
         "The number '-1' is outside the range of an unsigned 32-bit integer (0 to 4294967295)."},
        {[] { Text("9223372036854775808").CvtToInt64(); }, TE_INT64_OVERFLOW, nullptr, nullptr},
        {[] { Text("99999999999999999999999999").CvtToUInt64(); }, TE_UINT64_OVERFLOW, nullptr,
         "The number '99999999999999999999999999' is outside the range of an unsigned 64-bit "
         "integer (0 to 18446744073709551615)."},
        {[] { Text("-5").CvtToSizeT(); }, wide ? TE_UINT64_OVERFLOW : TE_UINT32_OVERFLOW,
         "String::CvtToSizeT", nullptr},
        {[] { Text("99999999999999999999").CvtToSignedSizeT(); },
         wide ? TE_INT64_OVERFLOW : TE_INT32_OVERFLOW, nullptr, nullptr},
        // The overflow check also holds when reading stops after the number.
        {[] {
             int end;
             Text("4294967296,").CvtToUInt32(0, end);
         },
         TE_UINT32_OVERFLOW, nullptr, nullptr},
    };
    for (Case const& c : cases)
        EXPECT_RAISES_IN(c.read(), c.code, c.function, c.description);
}

TEST(ReadIntegers, TextThatIsNotANumberRaisesAMessageQuotingIt) {
    EXPECT_RAISES_IN(Text("12abc").CvtToInt32(), TE_UNRECOGNIZED_VALUE, nullptr,
                     "'12abc' is not a valid 32-bit integer.");
    for (char const* bad : {"", "   ", "+-5", "- 5", "1 2", "0x10", "5.0"})
        EXPECT_RAISES(Text(bad).CvtToInt64(), TE_UNRECOGNIZED_VALUE) << bad;
    EXPECT_RAISES_IN(Text("x").CvtToUInt32(), TE_UNRECOGNIZED_VALUE, nullptr,
                     "'x' is not a valid unsigned 32-bit integer.");
    EXPECT_RAISES_IN(Text("x").CvtToInt64(), TE_UNRECOGNIZED_VALUE, nullptr,
                     "'x' is not a valid 64-bit integer.");
    EXPECT_RAISES_IN(Text("x").CvtToUInt64(), TE_UNRECOGNIZED_VALUE, nullptr,
                     "'x' is not a valid unsigned 64-bit integer.");

    // A long text is quoted by its first characters only.
    std::string const quoted = "'" + std::string(61, 'q') + "...' is not a valid 32-bit integer.";
    EXPECT_RAISES_IN(DynamicString(std::string(5000, 'q').c_str()).CvtToInt32(),
                     TE_UNRECOGNIZED_VALUE, nullptr, quoted.c_str());
}

TEST(ReadIntegers, StartAndEndIndexesSelectOneNumberOfAText) {
    DynamicString const s("x=42;y= -7 z");
    int end = -1;
    EXPECT_EQ(s.CvtToInt32(2, end), 42);
    EXPECT_EQ(end, 4);
    EXPECT_EQ(s.CvtToInt64(7, end), -7); // white space before the number is skipped
    EXPECT_EQ(end, 10);
    EXPECT_EQ(Text("17").CvtToUInt32(-5), 17u);
    EXPECT_RAISES(s.CvtToInt32(2), TE_UNRECOGNIZED_VALUE);
    EXPECT_RAISES(s.CvtToInt32(100, end), TE_UNRECOGNIZED_VALUE);
}

TEST_F(MultiByteNumbers, IndexesCountDoubleByteCharactersAsOne) {
    UseShiftJis();
    DynamicString const s("\x82\xA0\x82\xA2 123\x82\xA4");
    int end = -1;
    EXPECT_EQ(s.CvtToInt32(2, end), 123);
    EXPECT_EQ(end, 6);
    EXPECT_RAISES(s.CvtToInt32(2), TE_UNRECOGNIZED_VALUE);
}

TEST(ReadIntegersWithRadix, AnyRadixFrom2To36AndCsPrefixes) {
    EXPECT_EQ(Text("0XfF").CvtToUInt32WithRadix(16), 255u);
    EXPECT_EQ(Text(" -0x80000000").CvtToInt32WithRadix(0), INT32_MIN);
    EXPECT_EQ(Text("017").CvtToInt32WithRadix(0), 15);
    EXPECT_EQ(Text("0").CvtToInt32WithRadix(0), 0);
    EXPECT_EQ(Text("Zz").CvtToUInt32WithRadix(36), 36u * 35u + 35u);
    int end = -1;
    EXPECT_EQ(Text("0x").CvtToInt32WithRadix(16, 0, end), 0); // the x is no part of a number
    EXPECT_EQ(end, 1);
    EXPECT_EQ(Text("102").CvtToInt32WithRadix(2, 0, end), 2);
    EXPECT_EQ(end, 2);
    EXPECT_RAISES(Text("100000000").CvtToUInt32WithRadix(16), TE_UINT32_OVERFLOW);
    EXPECT_RAISES_IN(Text("80000000").CvtToInt32WithRadix(16), TE_INT32_OVERFLOW,
                     "String::CvtToInt32WithRadix");
    for (int radix : {1, 37}) {
        std::string const description =
            std::to_string(radix) +
            " is not a valid radix. Use 2 to 36, or 0 to take the radix from the text.";
        EXPECT_RAISES_IN(Text("1").CvtToInt32WithRadix(radix), TE_INVALID_OR_OUT_OF_RANGE, nullptr,
                         description.c_str());
    }
}

// ---- Floating point ------------------------------------------------------------------------

TEST(ReadFloats, EverySyntaxOfCAndAnyCaseAndTheEndIndex) {
    // Shortest, %.17g and %a texts of random doubles are read back in FormatPropertyTest.
    EXPECT_EQ(Text(" +.5 ").CvtToFloat64(), 0.5);
    EXPECT_EQ(Text("1E+2").CvtToFloat64(), 100.0);
    EXPECT_EQ(Text("-0X.8P0").CvtToFloat64(), -0.5);
    EXPECT_EQ(Text("-Infinity").CvtToFloat64(), -std::numeric_limits<double>::infinity());
    EXPECT_TRUE(std::isnan(Text("NaN").CvtToFloat64()));
    int end = -1;
    EXPECT_EQ(Text("3.25kg").CvtToFloat64(0, end), 3.25);
    EXPECT_EQ(end, 4);
    EXPECT_EQ(Text("2.5e").CvtToFloat64(0, end), 2.5);
    EXPECT_EQ(end, 3);
}

TEST(ReadFloats, BadTextRaisesAndHugeNumbersOverflowWhileTinyOnesReadAsZero) {
    for (char const* bad : {"", "e5", "1.5.3", "+-1", ". 5", "0x"})
        EXPECT_RAISES(Text(bad).CvtToFloat64(), TE_UNRECOGNIZED_VALUE) << bad;
    EXPECT_RAISES_IN(Text("one").CvtToFloat64(), TE_UNRECOGNIZED_VALUE, nullptr,
                     "'one' is not a valid number.");
    EXPECT_RAISES_IN(Text("-1e999").CvtToFloat64(), TE_INVALID_OR_OUT_OF_RANGE, nullptr,
                     "The number '-1e999' is too large for a 64-bit floating-point number.");
    EXPECT_RAISES(Text("0x1p99999999999999999999").CvtToFloat64(), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(Text("0.000001e-99999999999999999999").CvtToFloat64(), 0.0);
    EXPECT_TRUE(std::signbit(Text("-1e-999").CvtToFloat64()));
    EXPECT_EQ(Text("4.9e-324").CvtToFloat64(), std::numeric_limits<double>::denorm_min());
}

} // namespace
} // namespace tekit
