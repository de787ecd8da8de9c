// Numbers in text: reading integers and floating-point values, and the decimal point.
#include "NumericTestSupport.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"
#include "tekit/strings/DecimalPoint.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <functional>
#include <limits>
#include <string>
#include <utility>

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

using MultiByteDecimalPoint = testing::MultiByteFixture;

std::string Trimmed(char const* text) {
    DynamicString s(text, true);
    s.TrimTrailingZeros();
    return s.GetBufferReadPtr();
}

TEST(DecimalPoint, ThePeriodOptionNeverChangesText) {
    EXPECT_EQ(String::GetLocalizedDecimalPoint(kDecimalPointLocalizationOptions(7)), '.');
    DecimalPointLocalizer const localizer(kDecimalPoint_AlwaysPeriod);
    EXPECT_FALSE(localizer.IsLocalizing());
    DynamicString s("1.5", true);
    localizer.Localize(s);
    s.Delocalize(kDecimalPoint_AlwaysPeriod);
    EXPECT_STREQ(s.GetBufferReadPtr(), "1.5");
}

TEST(DecimalPoint, TrailingZerosOfTheFractionAreTrimmed) {
    std::pair<char const*, char const*> const cases[] = {
        {"2.000", "2"}, {"1.2500e+03", "1.25e+03"},        {"3.e5", "3e5"}, {"-.0", "-0"},
        {"100", "100"}, {"Total: 7.50 V", "Total: 7.5 V"},
    };
    for (auto const& [text, trimmed] : cases)
        EXPECT_EQ(Trimmed(text), trimmed) << text;

    StaticString<64> fixed("0.10");
    fixed.TrimTrailingZeros(kDecimalPoint_AlwaysPeriod);
    EXPECT_STREQ(fixed.GetBufferReadPtr(), "0.1");
}

TEST_F(MultiByteDecimalPoint, TrimmingAfterDoubleByteCharactersKeepsThemWhole) {
    UseShiftJis();
    DynamicString s("\x82\xA0\x82\xA2 1.500", true);
    s.TrimTrailingZeros();
    EXPECT_STREQ(s.GetBufferReadPtr(), "\x82\xA0\x82\xA2 1.5");
}

TEST(DecimalPoint, SystemSeparatorRoundTripsWhateverItIs) {
    // Whatever the user's separator, what is written with it reads back.
    DynamicString s("%1", true);
    s.Format(-1234.5, 1, kDecimalPoint_UseSystemSeparator, "%.2f");
    EXPECT_EQ(s.CvtToFloat64(0, kDecimalPoint_UseSystemSeparator), -1234.5);
    s.Delocalize(kDecimalPoint_UseSystemSeparator);
    EXPECT_STREQ(s.GetBufferReadPtr(), "-1234.50");
}

std::string gLastExpression;
void RecordingLocalizer(String const& expression, kDecimalPointLocalizationOptions, bool localize,
                        String& result) {
    gLastExpression = expression.GetBufferReadPtr();
    result.Assign(localize ? "localized" : "delocalized");
}

TEST(LocalizeExpression, ARegisteredImplementationReplacesTheBuiltInScan) {
    DynamicString const expression("x + 1.5", true);
    DynamicString result;
    LocalizeExprFunc const builtIn = String::RegisterLocalizeExprFunc(RecordingLocalizer);
    EXPECT_EQ(builtIn, nullptr);
    String::LocalizeExpression(expression, kDecimalPoint_UseSystemSeparator, true, result);
    EXPECT_STREQ(result.GetBufferReadPtr(), "localized");
    EXPECT_EQ(gLastExpression, "x + 1.5");

    EXPECT_EQ(String::RegisterLocalizeExprFunc(nullptr), RecordingLocalizer);
    String::LocalizeExpression(expression, kDecimalPoint_AlwaysPeriod, true, result);
    EXPECT_STREQ(result.GetBufferReadPtr(), "x + 1.5");
}

#if !defined(_WIN32)
class CommaLocale : public ::testing::Test {
protected:
    void SetUp() override {
        m_name = testing::FindCommaLocale();
        if (m_name.empty())
            GTEST_SKIP() << "no locale with a decimal comma is installed";
    }
    std::string m_name;
};

TEST_F(CommaLocale, TheSystemSeparatorIsTheUsersNotTheProcesss) {
    {
        testing::ScopedUserNumericLocale const user(m_name.c_str());
        EXPECT_EQ(String::GetLocalizedDecimalPoint(kDecimalPoint_UseSystemSeparator), ',');
        EXPECT_EQ(String::GetLocalizedDecimalPoint(kDecimalPoint_AlwaysPeriod), '.');
        EXPECT_STREQ(setlocale(LC_NUMERIC, nullptr), "C"); // the process locale is untouched
    }
    for (char const* period : {"C", "no_SUCH.locale"}) {
        testing::ScopedUserNumericLocale const user(period);
        EXPECT_EQ(String::GetLocalizedDecimalPoint(kDecimalPoint_UseSystemSeparator), '.');
    }
    ASSERT_NE(setlocale(LC_NUMERIC, m_name.c_str()), nullptr);
    testing::ScopedUserNumericLocale const user("C");
    char const separator = String::GetLocalizedDecimalPoint(kDecimalPoint_UseSystemSeparator);
    setlocale(LC_NUMERIC, "C");
    EXPECT_EQ(separator, '.');
}

TEST_F(CommaLocale, NumbersAreWrittenAndReadWithTheComma) {
    testing::ScopedUserNumericLocale const user(m_name.c_str());
    DynamicString s("%1 | %2", true);
    s.Format(2.5, 1, kDecimalPoint_UseSystemSeparator);
    s.Format(1e-7, 2, kDecimalPoint_UseSystemSeparator, "%.3e");
    EXPECT_STREQ(s.GetBufferReadPtr(), "2,5 | 1,000e-07");
    int end = 0;
    EXPECT_EQ(s.CvtToFloat64(0, end, kDecimalPoint_UseSystemSeparator), 2.5);
    EXPECT_EQ(end, 3);
    EXPECT_EQ(s.CvtToFloat64(6, kDecimalPoint_UseSystemSeparator), 1e-7);
    // A period is no decimal point here, and a comma none with the period option.
    EXPECT_RAISES(DynamicString("1.5").CvtToFloat64(0, kDecimalPoint_UseSystemSeparator),
                  TE_UNRECOGNIZED_VALUE);
    EXPECT_RAISES(DynamicString("1,5").CvtToFloat64(), TE_UNRECOGNIZED_VALUE);

    DynamicString appended;
    appended.Append(0.25, kDecimalPoint_UseSystemSeparator, "%.1f");
    EXPECT_STREQ(appended.GetBufferReadPtr(), "0,2");

    DynamicString number("3.75", true);
    DecimalPointLocalizer const localizer(kDecimalPoint_UseSystemSeparator);
    EXPECT_TRUE(localizer.IsLocalizing());
    localizer.Localize(number);
    EXPECT_STREQ(number.GetBufferReadPtr(), "3,75");
    number.TrimTrailingZeros(kDecimalPoint_UseSystemSeparator);
    number.Delocalize(kDecimalPoint_UseSystemSeparator);
    EXPECT_STREQ(number.GetBufferReadPtr(), "3.75");
}

TEST_F(CommaLocale, ExpressionsChangeOnlyTheDecimalPointsOfTheirNumbers) {
    testing::ScopedUserNumericLocale const user(m_name.c_str());
    DynamicString const expression(
        "Locals.x + 3.14 * f(1.5, \"2.5\") - Step2.5 + a[1].b + .5 + 5. + 0x1F + 1.5e-3", true);
    DynamicString localized;
    String::LocalizeExpression(expression, kDecimalPoint_UseSystemSeparator, true, localized);
    EXPECT_STREQ(localized.GetBufferReadPtr(),
                 "Locals.x + 3,14 * f(1,5, \"2.5\") - Step2.5 + a[1].b + ,5 + 5, + 0x1F + 1,5e-3");
    DynamicString back(localized);
    String::LocalizeExpression(back, kDecimalPoint_UseSystemSeparator, false, back);
    EXPECT_STREQ(back.GetBufferReadPtr(),
                 "Locals.x + 3.14 * f(1.5, \"2.5\") - Step2.5 + a[1].b + .5 + 5, + 0x1F + 1.5e-3");
}
#endif

} // namespace
} // namespace tekit
