#include "NumericTestSupport.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"

#include "tekit/strings/DecimalPoint.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <string>
#include <utility>

namespace tekit {
namespace {

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
