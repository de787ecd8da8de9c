#include "NumericTestSupport.h"
#include "support/DebugCapture.h"
#include "support/MultiByteFixture.h"
#include "tekit/errors/RString.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/FormatStringAnalysis.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cinttypes>
#include <climits>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <limits>
#include <random>
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

using FSA = FormatStringAnalysis;

TEST(FormatStringAnalysis, FieldsAreParsedWithTheirParts) {
    FSA const analysis("id %-+ #08.3lld, %%, %*.*Lf and %I64x%hhu");
    ASSERT_EQ(analysis.GetNumFields(), 4);
    EXPECT_TRUE(analysis.IsValid());
    EXPECT_EQ(analysis.GetNumArguments(), 6);

    FSA::Field const& first = *analysis.GetField(0);
    EXPECT_EQ(first.offset, 3);
    EXPECT_EQ(first.numBytes, 12);
    EXPECT_EQ(first.flags, unsigned(FSA::kFlagLeftJustify | FSA::kFlagPlusSign |
                                    FSA::kFlagSpaceSign | FSA::kFlagAlternate | FSA::kFlagZeroPad));
    EXPECT_EQ(first.width, 8);
    EXPECT_EQ(first.precision, 3);
    EXPECT_EQ(first.length, FSA::kLength_ll);
    EXPECT_EQ(first.conversion, 'd');

    EXPECT_EQ(analysis.GetField(1)->width, FSA::kFromArgument);
    EXPECT_EQ(analysis.GetField(1)->length, FSA::kLength_L);
    EXPECT_EQ(analysis.GetField(2)->length, FSA::kLength_I64);
    EXPECT_EQ(analysis.GetField(3)->length, FSA::kLength_hh);
    EXPECT_EQ(analysis.GetField(3)->precision, FSA::kNotGiven);

    EXPECT_EQ(analysis.GetField(4), nullptr);
}

TEST(FormatStringAnalysis, MalformedFieldsAreFoundAndHugeWidthsCut) {
    FSA const analysis("%y %-5 %.d %99999999999d %");
    ASSERT_EQ(analysis.GetNumFields(), 5);
    EXPECT_FALSE(analysis.IsValid());
    EXPECT_EQ(analysis.GetField(0)->numBytes, 1);
    EXPECT_EQ(analysis.GetField(1)->numBytes, 3);
    EXPECT_EQ(analysis.GetField(2)->precision, 0);
    EXPECT_EQ(analysis.GetField(3)->width, FSA::kMaxWidthOrPrecision);
    EXPECT_EQ(analysis.GetField(4)->conversion, 0);
    EXPECT_EQ(analysis.GetNumArguments(), 2);

    EXPECT_STREQ(FSA(static_cast<char const*>(nullptr)).GetFormat(), "");
}

TEST(FormatStringAnalysis, FixupFitsTheFirstFieldAndMakesTheRestLiteral) {
    FSA analysis("%5s items, %n%d left");
    EXPECT_EQ(analysis.FixupFields(FSA::kArgInt32), 3);
    EXPECT_STREQ(analysis.GetFormat(), "%5d items, %%n%%d left");
    EXPECT_EQ(analysis.GetNumArguments(), 1);

    struct Case {
        char const* format;
        long kind;
        std::string fixed;
    } const cases[] = {
        {"%.2f", FSA::kArgFloat64, "%.2f"},    {"%d", FSA::kArgFloat64, "%g"},
        {"%Lf", FSA::kArgFloat64, "%f"},       {"%ld", FSA::kArgInt64, "%" PRId64},
        {"%llx", FSA::kArgUInt64, "%" PRIx64}, {"%hhd", FSA::kArgInt32, "%d"},
        {"%d", FSA::kArgInt8, "%hhd"},         {"%x", FSA::kArgUInt16, "%hx"},
        {"%c", FSA::kArgInt64, "%c"},          {"%p", FSA::kArgUInt32, "%u"},
        {"%0-*.*d", FSA::kArgInt32, "%-0d"},   {"%'d", FSA::kArgInt32, "%d"},
        {"%d", FSA::kArgText, "%s"},           {"100%d %y%", FSA::kArgNone, "100%%d %%y%%"},
        {"%%d", FSA::kArgInt32, "%%d"},
    };
    for (Case const& c : cases) {
        FSA fixed(c.format);
        fixed.FixupFields(c.kind);
        EXPECT_EQ(fixed.GetFormat(), c.fixed) << c.format;
        EXPECT_TRUE(fixed.IsValid()) << c.format;
    }

    FSA unchanged("%+.3e");
    EXPECT_EQ(unchanged.FixupFields(FSA::kArgFloat64), 0);
}

#if defined(__GLIBC__)
TEST(FormatStringAnalysis, AFixedFormatIsSafeForTheCRuntime) {
    // The fitted format reads exactly one argument of the kind, so the C runtime can take it.
    FSA analysis("%s=%lld (%n)");
    analysis.FixupFields(FSA::kArgInt8);
    char buffer[64];
    std::snprintf(buffer, sizeof buffer, analysis.GetFormat(), static_cast<signed char>(-5));
    EXPECT_STREQ(buffer, "-5=%lld (%n)");
}
#endif

// Properties over thousands of random values: what Format writes, CvtTo... reads back, and the
// library's printf writes what the C runtime writes in the "C" locale.
constexpr int kValuesPerCase = 4000;

using ReadInt32 = std::int32_t (String::*)(int, int&) const;
using ReadUInt32 = std::uint32_t (String::*)(int, int&) const;
using ReadInt64 = std::int64_t (String::*)(int, int&) const;
using ReadUInt64 = std::uint64_t (String::*)(int, int&) const;
/// Fewer for the comparisons with the C runtime, which try many formats per value.
constexpr int kValuesPerFormat = 1500;

/// Random bits with the limits of T mixed in, so the edges are always tried.
template <class T> T RandomValue(std::mt19937_64& random, int i) {
    T const limits[] = {std::numeric_limits<T>::min(), std::numeric_limits<T>::max(), T(0), T(-1)};
    if (i < 4)
        return limits[i];
    std::uint64_t bits = random();
    return static_cast<T>(bits >> (random() % 64)); // small and large magnitudes alike
}

double RandomDouble(std::mt19937_64& random, int i) {
    double const specials[] = {0.0,
                               -0.0,
                               std::numeric_limits<double>::infinity(),
                               std::numeric_limits<double>::denorm_min(),
                               std::numeric_limits<double>::max(),
                               std::numeric_limits<double>::lowest(),
                               0.1,
                               1e23};
    if (i < int(std::size(specials)))
        return specials[i];
    std::uint64_t const bits = random();
    double value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

/// Runs every case with multibyte mode off and on (Shift-JIS lead bytes).
class FormatRoundTrip : public tekit::testing::BothByteModes {
protected:
    /// The template: double-byte characters around the placeholder when multibyte mode is on,
    /// so that reading back has to count characters.
    DynamicString Template() const {
        return DynamicString(GetParam() ? "\x82\xA0 %1\x82\xA2" : "= %1;", true);
    }

    /// Reads back the number at character 1 and checks that it ends where the template's tail
    /// starts.
    template <class T, class Read> T ReadBack(DynamicString const& s, Read read) const {
        int end = -1;
        T const value = (s.*read)(1, end);
        EXPECT_EQ(end, s.GetNumChars() - 1) << s.GetBufferReadPtr();
        return value;
    }

    template <class T, class Read> void CheckIntegers(Read read) {
        std::mt19937_64 random(12345);
        for (int i = 0; i < kValuesPerCase; ++i) {
            T const value = RandomValue<T>(random, i);
            DynamicString s = Template();
            s.Format(value, 1);
            ASSERT_EQ(ReadBack<T>(s, read), value) << s.GetBufferReadPtr();
        }
    }
};

TEST_P(FormatRoundTrip, IntegersReadBackAsWritten) {
    CheckIntegers<int>(ReadInt32(&String::CvtToInt32));
    CheckIntegers<long long>(ReadInt64(&String::CvtToInt64));
    CheckIntegers<unsigned int>(ReadUInt32(&String::CvtToUInt32));
    CheckIntegers<unsigned long long>(ReadUInt64(&String::CvtToUInt64));
}

TEST_P(FormatRoundTrip, DoublesReadBackBitForBitInEveryExactFormat) {
    std::mt19937_64 random(4242);
    for (char const* format : {static_cast<char const*>(nullptr), "%.17g", "%a", "%.16e"}) {
        for (auto options : {kDecimalPoint_AlwaysPeriod, kDecimalPoint_UseSystemSeparator}) {
            for (int i = 0; i < kValuesPerCase; ++i) {
                double const value = RandomDouble(random, i);
                DynamicString s = Template();
                s.Format(value, 1, options, format);
                int end = -1;
                double const read = s.CvtToFloat64(1, end, options);
                ASSERT_EQ(end, s.GetNumChars() - 1) << s.GetBufferReadPtr();
                if (std::isnan(value)) {
                    ASSERT_TRUE(std::isnan(read)) << s.GetBufferReadPtr();
                    continue;
                }
                ASSERT_EQ(std::memcmp(&read, &value, sizeof value), 0)
                    << (format ? format : "shortest") << " " << s.GetBufferReadPtr();
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(MultiByteModes, FormatRoundTrip, ::testing::Bool(),
                         [](auto const& info) { return info.param ? "MultiByte" : "SingleByte"; });

#if defined(__GLIBC__)
// ---- The same text as the C runtime ----------------------------------------------------------

std::string Formatted(double value, char const* format) {
    DynamicString s("%1", true);
    s.Format(value, 1, kDecimalPoint_AlwaysPeriod, format);
    return s.GetBufferReadPtr();
}

template <class T> std::string Formatted(T value, char const* format) {
    DynamicString s("%1", true);
    s.Format(value, 1, format);
    return s.GetBufferReadPtr();
}

template <class T> std::string ByCRuntime(char const* format, T value) {
    char buffer[1024];
    std::snprintf(buffer, sizeof buffer, format, value);
    return buffer;
}

TEST(FormatLikeTheCRuntime, FloatingPointFieldsMatchPrintf) {
    std::mt19937_64 random(99);
    char const* const formats[] = {"%f",    "%.3f", "%.0f",     "%#.0f",    "%e",    "%.10E",
                                   "%g",    "%.3g", "%#g",      "%#.3G",    "%.0g",  "%a",
                                   "%.3a",  "%A",   "%+012.4e", "%-14.2f|", "% .5g", "%015.1f",
                                   "%#.0e", "%#a",  "%.25g"};
    for (int i = 0; i < kValuesPerFormat; ++i) {
        double value = RandomDouble(random, i);
        if (i % 2 == 0) // also numbers of everyday size
            value =
                std::ldexp(value == value ? std::fmod(value, 1.0) : 0.5, int(random() % 80) - 40);
        for (char const* format : formats)
            ASSERT_EQ(Formatted(value, format), ByCRuntime(format, value))
                << format << " of " << ByCRuntime("%a", value);
    }
}

TEST(FormatLikeTheCRuntime, IntegerFieldsMatchPrintf) {
    std::mt19937_64 random(7);
    char const* const formats[] = {"%d", "%+5d", "%-6d|", "%06d", "% d",   "%.4d",    "%.0d",
                                   "%x", "%#X",  "%#o",   "%u",   "%8.3x", "%-#10x|", "%c"};
    for (int i = 0; i < kValuesPerFormat; ++i) {
        int const value = RandomValue<int>(random, i);
        for (char const* format : formats)
            ASSERT_EQ(Formatted(value, format), ByCRuntime(format, value)) << format;
    }
}

#endif

} // namespace
} // namespace tekit
