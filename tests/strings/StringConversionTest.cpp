// Wide and UTF-8 text in and out of the family. Narrow text is in the lead-byte table's code
// page: Latin-1 for code page 0 off Windows, Shift-JIS for 932.
#include "TextItems.h"
#include "support/MultiByteFixture.h"

#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <string>

namespace tekit {
namespace {

using testing::Text;

class StringConversionTest : public testing::MultiByteFixture {
protected:
    static std::string Utf8(String const& s) {
        char small[4];
        long length = -1;
        char* utf8 = s.AllocUTF8(small, sizeof small, &length);
        std::string out(utf8, size_t(length));
        if (utf8 != small)
            String::FreeUTF8(utf8);
        return out;
    }
};

#if !defined(_WIN32) // code page 0 is Latin-1 here; on Windows it is the process's ANSI page
TEST_F(StringConversionTest, Latin1TextRoundTripsThroughUtf8) {
    SetMultiByteCodePage(0);
    DynamicString s("caf\xE9 \xFF", true);
    EXPECT_EQ(Utf8(s), "caf\xC3\xA9 \xC3\xBF");
    DynamicString back;
    back.AssignFromUTF8("caf\xC3\xA9 \xC3\xBF", -1);
    EXPECT_EQ(Text(back), Text(s));
    back.AssignFromUTF8("\xE2\x82\xAC", -1); // the euro sign has no Latin-1 byte
    EXPECT_EQ(Text(back), "?");
}

TEST_F(StringConversionTest, WideTextIsNarrowedInTheCodePage) {
    SetMultiByteCodePage(0);
    DynamicString s(L"na\u00EFve \u4E00");
    s += L"!";
    EXPECT_EQ(Text(s), "na\xEFve ?!");
    s.Assign(static_cast<wchar_t const*>(nullptr));
    EXPECT_TRUE(s.IsEmpty());
}
#endif

TEST_F(StringConversionTest, InvalidUtf8BecomesReplacementCharacters) {
    SetMultiByteCodePage(932);
    DynamicString s;
    s.AssignFromUTF8("a\xC3(b", -1); // a lead byte without its continuation
    EXPECT_EQ(Text(s), "a?(b");
    s.AssignFromUTF8("\xC0\xAF"
                     "x",
                     -1); // an overlong form: two stray bytes
    EXPECT_EQ(Text(s), "??x");
    s.AssignFromUTF8("\xED\xA0\x80", -1); // an encoded surrogate
    EXPECT_EQ(Text(s), "???");
    s.AssignFromUTF8("ok\xE3\x81", -1); // cut at the end
    EXPECT_EQ(Text(s), "ok?");
    s.AssignFromUTF8("abcdef", 3);
    EXPECT_EQ(Text(s), "abc");
    s.AssignFromUTF8(nullptr, 5);
    EXPECT_TRUE(s.IsEmpty());
}

TEST_F(StringConversionTest, ShiftJisRoundTripsThroughUtf8AndWideText) {
    UseShiftJis();
    DynamicString s;
    s.AssignFromUTF8("\xE3\x81\x82"
                     "A\xF0\x9F\x98\x80",
                     -1); // hiragana A, 'A', an emoji
    EXPECT_EQ(Text(s), "\x82\xA0"
                       "A?");
    EXPECT_EQ(Utf8(s), "\xE3\x81\x82"
                       "A?");

    wchar_t wide[8];
    EXPECT_EQ(s.ConvertToUnicodeInBufferTruncateIfNeeded(wide, 8), 3);
    EXPECT_EQ(std::wstring(wide), L"\u3042A?");
    DynamicString back(wide);
    EXPECT_EQ(Text(back), Text(s));
}

TEST_F(StringConversionTest, WideBufferIsCutAndAlwaysTerminated) {
    DynamicString s("abcdef", true);
    wchar_t wide[4] = {L'#', L'#', L'#', L'#'};
    EXPECT_EQ(s.ConvertToUnicodeInBufferTruncateIfNeeded(wide, 4), 3);
    EXPECT_EQ(std::wstring(wide), L"abc");
    EXPECT_EQ(s.ConvertToUnicodeInBufferTruncateIfNeeded(nullptr, 10), 0);
}

TEST_F(StringConversionTest, Utf8GoesToTheCallersBufferOnlyWhenItFits) {
    DynamicString s("hello", true);
    char fits[6];
    long length = 0;
    EXPECT_EQ(s.AllocUTF8(fits, sizeof fits, &length), fits);
    EXPECT_EQ(length, 5);
    char tooSmall[5];
    char* allocated = s.AllocUTF8(tooSmall, sizeof tooSmall, &length);
    EXPECT_NE(allocated, tooSmall);
    EXPECT_STREQ(allocated, "hello");
    String::FreeUTF8(allocated);
    char* noBuffer = s.AllocUTF8(nullptr, 0, nullptr);
    EXPECT_STREQ(noBuffer, "hello");
    String::FreeUTF8(noBuffer);
}

TEST_F(StringConversionTest, StorageThatCannotGrowCutsConvertedText) {
    UseShiftJis();
    StaticString<64> fixed;
    std::string utf8;
    for (int i = 0; i < 40; ++i)
        utf8 += "\xE3\x81\x82"; // 40 double-byte characters: 80 bytes narrow
    fixed.AssignFromUTF8(utf8.c_str(), -1);
    EXPECT_EQ(fixed.GetNumChars(), 32);
}

} // namespace
} // namespace tekit
