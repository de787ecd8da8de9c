#include "tekit/strings/FormatStringAnalysis.h"

#include <gtest/gtest.h>

#include <cinttypes>
#include <string>

namespace tekit {
namespace {

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

} // namespace
} // namespace tekit
