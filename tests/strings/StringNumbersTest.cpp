#include "MultiByteFixture.h"
#include "NumericTestSupport.h"

#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
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
    TEException e = Raised([] { Text(" 2147483648 ").CvtToInt32(); });
    EXPECT_EQ(e.GetErrorCode(), TE_INT32_OVERFLOW);
    EXPECT_STREQ(e.GetDescription(), "The number '2147483648' is outside the range of a 32-bit "
                                     "integer (-2147483648 to 2147483647).");
    EXPECT_STREQ(e.GetFunctionName(), "String::CvtToInt32");

    EXPECT_EQ(Raised([] { Text("-2147483649").CvtToInt32(); }).GetErrorCode(), TE_INT32_OVERFLOW);
    e = Raised([] { Text("-1").CvtToUInt32(); });
    EXPECT_EQ(e.GetErrorCode(), TE_UINT32_OVERFLOW);
    EXPECT_STREQ(e.GetDescription(), "The number '-1' is outside the range of an unsigned 32-bit "
                                     "integer (0 to 4294967295).");
    EXPECT_EQ(Raised([] { Text("9223372036854775808").CvtToInt64(); }).GetErrorCode(),
              TE_INT64_OVERFLOW);
    EXPECT_EQ(Raised([] { Text("-9223372036854775809").CvtToInt64(); }).GetErrorCode(),
              TE_INT64_OVERFLOW);
    e = Raised([] { Text("99999999999999999999999999").CvtToUInt64(); });
    EXPECT_EQ(e.GetErrorCode(), TE_UINT64_OVERFLOW);
    EXPECT_STREQ(e.GetDescription(),
                 "The number '99999999999999999999999999' is outside the range of an unsigned "
                 "64-bit integer (0 to 18446744073709551615).");
    bool const wide = sizeof(std::size_t) == 8;
    e = Raised([] { Text("-5").CvtToSizeT(); });
    EXPECT_EQ(e.GetErrorCode(), wide ? TE_UINT64_OVERFLOW : TE_UINT32_OVERFLOW);
    EXPECT_STREQ(e.GetFunctionName(), "String::CvtToSizeT");
    EXPECT_EQ(Raised([] { Text("99999999999999999999").CvtToSignedSizeT(); }).GetErrorCode(),
              wide ? TE_INT64_OVERFLOW : TE_INT32_OVERFLOW);
}

TEST(ReadIntegers, TextThatIsNotANumberRaisesAMessageQuotingIt) {
    TEException e = Raised([] { Text("12abc").CvtToInt32(); });
    EXPECT_EQ(e.GetErrorCode(), TE_UNRECOGNIZED_VALUE);
    EXPECT_STREQ(e.GetDescription(), "'12abc' is not a valid 32-bit integer.");
    for (char const* bad : {"", "   ", "abc", "+-5", "- 5", "1 2", "0x10", "5.0", "--1"})
        EXPECT_EQ(Raised([&] { Text(bad).CvtToInt64(); }).GetErrorCode(), TE_UNRECOGNIZED_VALUE)
            << bad;
    EXPECT_STREQ(Raised([] { Text("x").CvtToUInt32(); }).GetDescription(),
                 "'x' is not a valid unsigned 32-bit integer.");
    EXPECT_STREQ(Raised([] { Text("x").CvtToInt64(); }).GetDescription(),
                 "'x' is not a valid 64-bit integer.");
    EXPECT_STREQ(Raised([] { Text("x").CvtToUInt64(); }).GetDescription(),
                 "'x' is not a valid unsigned 64-bit integer.");

    // A long text is quoted by its first characters only.
    std::string const longText(5000, 'q');
    e = Raised([&] { DynamicString(longText.c_str()).CvtToInt32(); });
    EXPECT_EQ(std::string(e.GetDescription()),
              "'" + std::string(61, 'q') + "...' is not a valid 32-bit integer.");
}

TEST(ReadIntegers, StartAndEndIndexesSelectOneNumberOfAText) {
    DynamicString const s("x=42;y= -7 z");
    int end = -1;
    EXPECT_EQ(s.CvtToInt32(2, end), 42);
    EXPECT_EQ(end, 4);
    EXPECT_EQ(s.CvtToInt64(7, end), -7); // white space before the number is skipped
    EXPECT_EQ(end, 10);
    EXPECT_EQ(s.CvtToFloat64(8, end), -7.0);
    EXPECT_EQ(end, 10);
    EXPECT_EQ(Text("17").CvtToUInt32(-5), 17u);
    EXPECT_EQ(Raised([&] { s.CvtToInt32(2); }).GetErrorCode(), TE_UNRECOGNIZED_VALUE);
    EXPECT_EQ(Raised([&] { s.CvtToInt32(100, end); }).GetErrorCode(), TE_UNRECOGNIZED_VALUE);
    EXPECT_EQ(Raised([&] { s.CvtToInt32(0, end); }).GetErrorCode(), TE_UNRECOGNIZED_VALUE);
    // The overflow check also holds when reading stops after the number.
    EXPECT_EQ(Raised([] {
                  int e;
                  Text("4294967296,").CvtToUInt32(0, e);
              }).GetErrorCode(),
              TE_UINT32_OVERFLOW);
}

TEST_F(MultiByteNumbers, IndexesCountDoubleByteCharactersAsOne) {
    UseShiftJis();
    DynamicString const s("\x82\xA0\x82\xA2 123\x82\xA4");
    int end = -1;
    EXPECT_EQ(s.CvtToInt32(2, end), 123);
    EXPECT_EQ(end, 6);
    EXPECT_EQ(s.CvtToUInt64(3, end), 123u);
    EXPECT_EQ(end, 6);
    EXPECT_EQ(Raised([&] { s.CvtToInt32(2); }).GetErrorCode(), TE_UNRECOGNIZED_VALUE);
}

TEST(ReadIntegersWithRadix, AnyRadixFrom2To36AndCsPrefixes) {
    EXPECT_EQ(Text("ff").CvtToInt32WithRadix(16), 255);
    EXPECT_EQ(Text("0XfF").CvtToUInt32WithRadix(16), 255u);
    EXPECT_EQ(Text(" -0x80000000").CvtToInt32WithRadix(0), INT32_MIN);
    EXPECT_EQ(Text("017").CvtToInt32WithRadix(0), 15);
    EXPECT_EQ(Text("0").CvtToInt32WithRadix(0), 0);
    EXPECT_EQ(Text("19").CvtToInt32WithRadix(0), 19);
    EXPECT_EQ(Text("Zz").CvtToUInt32WithRadix(36), 36u * 35u + 35u);
    EXPECT_EQ(Text("1011").CvtToInt32WithRadix(2), 11);
    int end = -1;
    EXPECT_EQ(Text("0x").CvtToInt32WithRadix(16, 0, end), 0); // the x is no part of a number
    EXPECT_EQ(end, 1);
    EXPECT_EQ(Text("102").CvtToInt32WithRadix(2, 0, end), 2);
    EXPECT_EQ(end, 2);
    EXPECT_EQ(Raised([] { Text("102").CvtToInt32WithRadix(2); }).GetErrorCode(),
              TE_UNRECOGNIZED_VALUE);
    EXPECT_EQ(Raised([] { Text("100000000").CvtToUInt32WithRadix(16); }).GetErrorCode(),
              TE_UINT32_OVERFLOW);
    EXPECT_STREQ(Raised([] { Text("80000000").CvtToInt32WithRadix(16); }).GetFunctionName(),
                 "String::CvtToInt32WithRadix");
    for (int radix : {-1, 1, 37}) {
        TEException const e = Raised([&] { Text("1").CvtToInt32WithRadix(radix); });
        EXPECT_EQ(e.GetErrorCode(), TE_INVALID_OR_OUT_OF_RANGE);
        EXPECT_EQ(std::string(e.GetDescription()),
                  std::to_string(radix) +
                      " is not a valid radix. Use 2 to 36, or 0 to take the radix from the text.");
    }
}

// ---- Floating point ------------------------------------------------------------------------

TEST(ReadFloats, EverySyntaxOfCAndAnyCase) {
    // Shortest, %.17g and %a texts of random doubles are read back in FormatPropertyTest.
    EXPECT_EQ(Text(" +.5 ").CvtToFloat64(), 0.5);
    EXPECT_EQ(Text("5.").CvtToFloat64(), 5.0);
    EXPECT_EQ(Text("1E+2").CvtToFloat64(), 100.0);
    EXPECT_EQ(Text("-0X.8P0").CvtToFloat64(), -0.5);
    EXPECT_EQ(Text("-Infinity").CvtToFloat64(), -std::numeric_limits<double>::infinity());
    EXPECT_TRUE(std::isnan(Text("NaN").CvtToFloat64()));
}

TEST(ReadFloats, BadTextRaisesAndHugeNumbersOverflowWhileTinyOnesReadAsZero) {
    for (char const* bad : {"", "e5", "1.5.3", "--1", "+-1", "1,5", ". 5", "0x"})
        EXPECT_EQ(Raised([&] { Text(bad).CvtToFloat64(); }).GetErrorCode(), TE_UNRECOGNIZED_VALUE)
            << bad;
    EXPECT_STREQ(Raised([] { Text("one").CvtToFloat64(); }).GetDescription(),
                 "'one' is not a valid number.");
    TEException const e = Raised([] { Text("-1e999").CvtToFloat64(); });
    EXPECT_EQ(e.GetErrorCode(), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_STREQ(e.GetDescription(),
                 "The number '-1e999' is too large for a 64-bit floating-point number.");
    EXPECT_EQ(Raised([] { Text("123456789e305").CvtToFloat64(); }).GetErrorCode(),
              TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(Raised([] { Text("0x1p99999999999999999999").CvtToFloat64(); }).GetErrorCode(),
              TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(Text("1e-999").CvtToFloat64(), 0.0);
    EXPECT_EQ(Text("0.000001e-99999999999999999999").CvtToFloat64(), 0.0);
    EXPECT_TRUE(std::signbit(Text("-1e-999").CvtToFloat64()));
    EXPECT_EQ(Text("4.9e-324").CvtToFloat64(), std::numeric_limits<double>::denorm_min());
}

TEST(ReadFloats, EndIndexStopsAfterTheNumber) {
    int end = -1;
    EXPECT_EQ(Text("3.25kg").CvtToFloat64(0, end), 3.25);
    EXPECT_EQ(end, 4);
    EXPECT_EQ(Text("a: 1e3, b").CvtToFloat64(2, end), 1000.0);
    EXPECT_EQ(end, 6);
    EXPECT_EQ(Text("2.5e").CvtToFloat64(0, end), 2.5);
    EXPECT_EQ(end, 3);
}

} // namespace
} // namespace tekit
