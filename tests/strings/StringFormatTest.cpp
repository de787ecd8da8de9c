#include "NumericTestSupport.h"
#include "support/DebugCapture.h"
#include "support/MultiByteFixture.h"

#include "tekit/errors/RString.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstdint>
#include <limits>
#include <string>

namespace tekit {
namespace {

using MultiByteFormat = testing::MultiByteFixture;

/// "%1" filled by `fill`.
template <class F> std::string Filled(F&& fill) {
    DynamicString s("%1");
    fill(s);
    return s.GetBufferReadPtr();
}

TEST(Placeholders, FillTheFirstOccurrenceOfTheirPlainText) {
    DynamicString message(RString("ERR_DESCR", "CANT_FIND_FILE").GetString());
    message.Format("C:\\data\\a.txt", 1);
    EXPECT_STREQ(message.GetBufferReadPtr(), "Could not find file 'C:\\data\\a.txt'.");

    // %1 is found as text, so it also matches the start of %10.
    DynamicString ten("%10 then %1", true);
    ten.Format("A", 1);
    EXPECT_STREQ(ten.GetBufferReadPtr(), "A0 then %1");

    DynamicString numbered("%2-%1-%-1", true);
    numbered.Format(DynamicString("two"), 2);
    numbered.Format("one", 1);
    numbered.Format("minus", -1);
    EXPECT_STREQ(numbered.GetBufferReadPtr(), "two-one-minus");
    DynamicString none("a%1b", true);
    none.Format(static_cast<char const*>(nullptr), 1); // a null text fills nothing
    EXPECT_STREQ(none.GetBufferReadPtr(), "ab");
}

TEST(Placeholders, AMissingPlaceholderAppendsANoticeAndWarnsOnlyAboveDiagnosticLevelZero) {
    testing::DebugCapture capture;
    {
        testing::DiagnosticLevelScope level(0);
        DynamicString text("No placeholders here.", true);
        text.Format("value", 2);
        EXPECT_STREQ(text.GetBufferReadPtr(),
                     "No placeholders here. COULD NOT FIND %2TO REPLACE WITH value ");
    }
    EXPECT_EQ(capture.Text(), "");
    {
        testing::DiagnosticLevelScope level(1);
        StaticString<64> fixed("Short");
        fixed.Format(DynamicString("arg"), 12);
        EXPECT_STREQ(fixed.GetBufferReadPtr(), "Short COULD NOT FIND %12TO REPLACE WITH arg ");
    }
    std::string const warning = capture.Text();
    EXPECT_EQ(warning.rfind("WARNING! 'Could not find argument to replace in string' Line ", 0), 0u)
        << warning;
    EXPECT_NE(warning.find(" in function String::HandleMissingFormatArgument in file "),
              std::string::npos);
}

TEST(Placeholders, AnArgumentTakenFromTheStringItselfIsCopiedFirst) {
    DynamicString s("<%1>", true);
    s.Format(s, 1);
    EXPECT_STREQ(s.GetBufferReadPtr(), "<<%1>>");
    StaticString<64> fixed("[%1]");
    fixed.Format(fixed.GetBufferReadPtr() + 1, 1);
    EXPECT_STREQ(fixed.GetBufferReadPtr(), "[%1]]");
}

TEST_F(MultiByteFormat, PlaceholdersAfterDoubleByteCharactersAreFilled) {
    UseShiftJis();
    DynamicString s("\x82\xA0\x82\xA2%1\x82\xA4", true);
    s.Format("12", 1);
    EXPECT_STREQ(s.GetBufferReadPtr(), "\x82\xA0\x82\xA2\x31\x32\x82\xA4");
}

TEST(TypedFormat, DefaultFormatsShowEachTypeInDecimal) {
    DynamicString s("%1 %2 %3 %4 %5 %6 %7 %8 %9", true);
    s.Format(INT_MIN, 1, nullptr);
    s.Format(short(-32768), 2);
    s.Format('A', 3);
    s.Format(static_cast<unsigned char>(255), 4);
    s.Format(static_cast<unsigned short>(65535), 5);
    s.Format(4294967295u, 6);
    s.Format(LLONG_MIN, 7);
    s.Format(ULLONG_MAX, 8);
    s.Format(-7L, 9);
    EXPECT_STREQ(s.GetBufferReadPtr(), "-2147483648 -32768 A 255 65535 4294967295 "
                                       "-9223372036854775808 18446744073709551615 -7");
    EXPECT_EQ(Filled([](String& s) { s.Format(ULONG_MAX, 1); }), std::to_string(ULONG_MAX));
}

TEST(TypedFormat, FieldsShowTheValueAtTheWidthOfItsType) {
    // Flags and precisions in general are compared with the C runtime in FormatPropertyTest.
    EXPECT_EQ(Filled([](String& s) { s.Format(-42, 1, "%05d|%-5d"); }), "-0042|%-5d");
    EXPECT_EQ(Filled([](String& s) { s.Format(-1, 1, "%x"); }), "ffffffff");
    EXPECT_EQ(Filled([](String& s) { s.Format(short(-1), 1, "%u"); }), "65535");
    EXPECT_EQ(Filled([](String& s) { s.Format(3000000000u, 1, "%d"); }), "-1294967296");
    EXPECT_EQ(Filled([](String& s) { s.Format('A', 1, "%d=%c"); }), "65=%c");
}

TEST(TypedFormat, AFormatThatDoesNotFitTheValueNeverReadsAMissingArgument) {
    EXPECT_EQ(Filled([](String& s) { s.Format(42, 1, "%s and %d %n%"); }), "42 and %d %n%");
    EXPECT_EQ(Filled([](String& s) { s.Format(42, 1, "%*.*d"); }), "42");
    EXPECT_EQ(Filled([](String& s) { s.Format(42, 1, "100%% %y %"); }), "100% %y %");
    EXPECT_EQ(Filled([](String& s) { s.Format(42, 1, "%99999d"); }).size(), 4096u);
    EXPECT_EQ(Filled([](String& s) { s.Format(2.5, 1, kDecimalPoint_AlwaysPeriod, "%s|%f"); }),
              "2.5|%f");
}

TEST(TypedFormat, DoublesAreExactAndLocaleFree) {
    auto format = [](double value, char const* printfFormat) {
        return Filled(
            [&](String& s) { s.Format(value, 1, kDecimalPoint_AlwaysPeriod, printfFormat); });
    };
    EXPECT_EQ(format(-0.0, nullptr), "-0");
    EXPECT_EQ(format(std::numeric_limits<double>::infinity(), nullptr), "inf");
    EXPECT_EQ(format(std::nan(""), "%F"), "NAN");
    EXPECT_EQ(format(0.125, "%.2f"), "0.12"); // exact halves round to even, as printf does
    EXPECT_EQ(format(-1.5, "%+09.2f"), "-00001.50");
    EXPECT_EQ(format(std::numeric_limits<double>::infinity(), "%08f"), "     inf");
}

TEST(TypedFormat, PointerSizedValuesShowAllTheirHexDigits) {
    std::string const zeros(2 * sizeof(void*) - 4, '0');
    EXPECT_EQ(Filled([](String& s) { s.FormatPtr(std::uintptr_t(0xBEEF), 1); }),
              "0x" + zeros + "BEEF");
    EXPECT_EQ(Filled([](String& s) { s.FormatPtr(std::intptr_t(-1), 1, "%d"); }), "-1");
    DynamicString text;
    text.AppendPtr(reinterpret_cast<void const*>(std::uintptr_t(0xBEEF)));
    EXPECT_EQ(std::string(text.GetBufferReadPtr()), "0x" + zeros + "BEEF");
}

TEST(AppendNumbers, EachTypeIsAppendedWithItsFormat) {
    DynamicString s("n=", true);
    s.Append(5);
    s.Append(-1L, " %lx");
    s.Append(-1LL, " %llx");
    s.Append(ULLONG_MAX, " %llu");
    s.Append(3.25, kDecimalPoint_AlwaysPeriod, " %.1f");
    s.Append(0.5, kDecimalPoint_AlwaysPeriod, DynamicString(" %.3e "));
    s.AppendSize(SIZE_MAX);
    EXPECT_EQ(std::string(s.GetBufferReadPtr()),
              "n=5 " + std::string(2 * sizeof(long), 'f') +
                  " ffffffffffffffff 18446744073709551615 3.2 5.000e-01 " +
                  std::to_string(SIZE_MAX));
}

TEST(SPrintf, WritesEveryConversionWithoutTheCRuntime) {
    DynamicString s;
    s.SPrintf("%s|%5.2s|%-3c|%+d|%lld|%zu|%%|%ls|%5.1f|%x|%hhd", "text", "abc", 'z', 7,
              -9000000000LL, size_t(12), L"wide", 2.25, 255u, 300);
    EXPECT_STREQ(s.GetBufferReadPtr(), "text|   ab|z  |+7|-9000000000|12|%|wide|  2.2|ff|44");

    // The Windows runtime's length modifiers, which compilers do not check.
    std::string const windowsFormat = "%I64d %I32u %Id";
    s.SPrintf(windowsFormat.c_str(), -5000000000LL, 7u, std::ptrdiff_t(-3));
    EXPECT_STREQ(s.GetBufferReadPtr(), "-5000000000 7 -3");
    StaticString<64> target;
    String::SPrintf(target, "[%*d|%-*d|%.*f|%hx]", 4, 1, -3, 2, 1, 0.25, 65537);
    EXPECT_STREQ(target.GetBufferReadPtr(), "[   1|2  |0.2|1]");
}

TEST(SPrintf, NullTextsAndUnsafeFieldsAreDefused) {
    DynamicString s;
    int written = 12345;
    char const* none = nullptr;
    s.SPrintf("a%sb%nc%pd", none, &written, static_cast<void*>(nullptr));
    EXPECT_EQ(written, 12345);
    EXPECT_EQ(std::string(s.GetBufferReadPtr()),
              "abc0x" + std::string(2 * sizeof(void*), '0') + "d");

    DynamicString alias("abc", true);
    alias.SPrintf("%s%s", alias.GetBufferReadPtr(), alias.GetBufferReadPtr());
    EXPECT_STREQ(alias.GetBufferReadPtr(), "abcabc");
}

#if !defined(_WIN32)
TEST(SPrintf, UsesAPeriodWhateverTheProcessLocale) {
    std::string const comma = testing::FindCommaLocale();
    if (comma.empty())
        GTEST_SKIP() << "no locale with a decimal comma is installed";
    ASSERT_NE(setlocale(LC_NUMERIC, comma.c_str()), nullptr);
    DynamicString s;
    s.SPrintf("%.2f", 1.5);
    DynamicString d("%1", true);
    d.Format(1.5, 1, kDecimalPoint_AlwaysPeriod, "%g");
    double const read = DynamicString("2.5").CvtToFloat64();
    setlocale(LC_NUMERIC, "C");
    EXPECT_STREQ(s.GetBufferReadPtr(), "1.50");
    EXPECT_STREQ(d.GetBufferReadPtr(), "1.5");
    EXPECT_EQ(read, 2.5);
}
#endif

} // namespace
} // namespace tekit
