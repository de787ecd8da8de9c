// The lead-byte table and the byte-level helpers that every string operation is built on.
#include "TextItems.h"
#include "support/MultiByteFixture.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace tekit {
namespace {

using MultiByteTest = testing::MultiByteFixture;

TEST_F(MultiByteTest, CodePageFillsTheLeadByteTable) {
    SetMultiByteCodePage(932);
    EXPECT_EQ(GetMultiByteCodePage(), 932u);
    String::EnableMultiByteSupport(true);
    // 0x81-0x9F and 0xE0-0xFC lead; 0xA0-0xDF (half-width katakana) do not.
    EXPECT_EQ(DynamicString("\x81\x40\x9F\x40\xE0\x40\xFC\x40", true).GetNumChars(), 4);
    EXPECT_EQ(DynamicString("\x80\x40\xA0\xDF\xFD", true).GetNumChars(), 5);

    SetMultiByteCodePage(12345); // unknown: the table stays as it was
    EXPECT_EQ(GetMultiByteCodePage(), 932u);
    SetMultiByteCodePage(0);
    EXPECT_EQ(DynamicString("\x81\x40", true).GetNumChars(), 2);
}

TEST_F(MultiByteTest, LeadByteBeforeTheTerminatorCountsAsOneByte) {
    UseShiftJis();
    DynamicString cut("ab\x82", true);
    EXPECT_EQ(cut.GetNumChars(), 3);
    EXPECT_EQ(cut.GetLastChar(), 0x82);
    EXPECT_EQ(String::SizeOfMBCSSubString("ab\x82", 10, 10), 3);
    EXPECT_EQ(cut.CharToByteIndex(10), 3);
    EXPECT_EQ(cut.Compare("ab\x82", false, 5), 0);
}

TEST_F(MultiByteTest, LastCharacterIsFoundByLeadBytePairing) {
    UseShiftJis();
    // 0x82 is both a lead byte and a valid trail byte: only pairing from the start tells.
    DynamicString pairs("\x82\x82\x82\xA0", true); // two characters: 82 82 | 82 A0
    EXPECT_EQ(pairs.GetLastCharPtr(), pairs.GetBufferReadPtr() + 2);
    EXPECT_EQ(pairs.GetLastChar(), 0x82A0);
    DynamicString single("x\x82\x82"
                         "a",
                         true); // x | 82 82 | a
    EXPECT_EQ(single.GetLastCharPtr(), single.GetBufferReadPtr() + 3);
    DynamicString trail("\x82\x41", true); // 'A' here is a trail byte, not a character
    EXPECT_EQ(trail.GetLastCharPtr(), trail.GetBufferReadPtr());
}

TEST_F(MultiByteTest, SubStringSizeStopsAtCharacterAndByteLimits) {
    SetMultiByteCodePage(932);
    char const* text = "a\x82\xA0"
                       "bc";
    EXPECT_EQ(String::SizeOfMBCSSubString(text, 2, 100), 3);
    EXPECT_EQ(String::SizeOfMBCSSubString(text, -1, 2), 1); // never half a character
    EXPECT_EQ(String::SizeOfMBCSSubString(text, -1, -4), 0);
    EXPECT_EQ(String::SizeOfMBCSSubString(nullptr, -1, 10), 0);
    EXPECT_EQ(String::MBCSPtrCharacterIndex(text, text + 2), 1); // inside the character
    EXPECT_EQ(String::MBCSPtrCharacterIndex(text, text - 1), 0);
}

TEST(StringCopyRoutines, CopyIsBoundedTerminatedAndReportsTheSize) {
    char dest[8];
    int cached = -1;
    String::StringCopyMaxN(dest, "abcdefghij", 20, sizeof dest, &cached);
    EXPECT_STREQ(dest, "abcdefg");
    EXPECT_EQ(cached, 8);
    String::StringCopyMax(dest, "xy", sizeof dest, &cached);
    EXPECT_STREQ(dest, "xy");
    EXPECT_EQ(cached, 3);

    dest[0] = '#';
    String::StringCopyMax(dest, "xy", 0, &cached);
    EXPECT_EQ(dest[0], '#');
    EXPECT_EQ(cached, 0);

    char overlap[] = "0123456789";
    String::StringCopyMaxN(overlap + 2, overlap, 5, 8, nullptr);
    EXPECT_STREQ(overlap, "0101234");
}

TEST_F(MultiByteTest, MultibyteCopyFollowsTheModeOnlyInTheSafeForm) {
    SetMultiByteCodePage(932);
    char dest[4];
    int cached = 0;
    String::MBCSStringCopyMax(dest, "ab\x82\xA0", sizeof dest, &cached);
    EXPECT_STREQ(dest, "ab");
    EXPECT_EQ(cached, 3);
    String::MBCSStringCopyMaxN(dest, "\x82\xA0\x82\xA2", 3, sizeof dest, &cached);
    EXPECT_STREQ(dest, "\x82\xA0");
    String::MBSafeStringCopyMax(dest, "ab\x82\xA0", sizeof dest, &cached);
    EXPECT_STREQ(dest, "ab\x82"); // mode off: bytes
    String::EnableMultiByteSupport(true);
    String::MBSafeStringCopyMax(dest, "ab\x82\xA0", sizeof dest, &cached);
    EXPECT_STREQ(dest, "ab");
}

TEST_F(MultiByteTest, InsertionCutsWhatDoesNotFit) {
    char dest[8] = "abcd";
    String::StringInsert(dest, "XYZ", 2, sizeof dest);
    EXPECT_STREQ(dest, "abXYZcd");
    String::StringInsert(dest, "12", 1, sizeof dest);
    EXPECT_STREQ(dest, "a12bXYZ");
    String::StringInsert(dest, dest + 4, 0, sizeof dest); // text from the buffer itself
    EXPECT_STREQ(dest, "XYZa12b");

    SetMultiByteCodePage(932);
    char mb[6] = "abc";
    String::MBCSStringInsert(mb, "\x82\xA0\x82\xA2", 1, sizeof mb);
    EXPECT_STREQ(mb, "a\x82\xA0\x82\xA2"); // the tail "bc" no longer fits
    char tail[6] = "a\x82\xA0"
                   "b";
    String::MBCSStringInsert(tail, "xy", 2, sizeof tail); // inside a character: before it
    EXPECT_STREQ(tail, "axy\x82\xA0");
    char cut[8] = "abcdef";
    String::MBCSStringInsert(cut, "\x82\xA0\x82\xA2", 5, sizeof cut); // the text itself is cut
    EXPECT_STREQ(cut, "abcde\x82\xA0"); // a prefix of the uncut result, no old tail after it
}

TEST_F(MultiByteTest, ShrinkingACharacterOfASharedStringKeepsTheTail) {
    SetMultiByteCodePage(932);
    String::EnableMultiByteSupport(true);
    DynamicString a("\x82\xA0tail", true);
    DynamicString b(a);
    b.MBSetChar(0, 'x');
    EXPECT_STREQ(b.GetBufferReadPtr(), "xtail");
    EXPECT_STREQ(a.GetBufferReadPtr(), "\x82\xA0tail");
}

TEST_F(MultiByteTest, RemovalClampsToTheText) {
    char text[] = "abcdef";
    String::StringRemove(text, 1, 2);
    EXPECT_STREQ(text, "adef");
    String::StringRemove(text, 2, 100);
    EXPECT_STREQ(text, "ad");
    String::StringRemove(text, 5, 1);
    EXPECT_STREQ(text, "ad");

    SetMultiByteCodePage(932);
    char mb[] = "a\x82\xA0"
                "b\x82\xA2"
                "c";
    String::MBCSStringRemove(mb, 1, 2);
    EXPECT_STREQ(mb, "a\x82\xA2"
                     "c");
    String::MBCSStringRemove(mb, 1, 99);
    EXPECT_STREQ(mb, "a");
}

TEST_F(MultiByteTest, CaseChangesLeaveDoubleByteCharactersAlone) {
    SetMultiByteCodePage(932);
    char text[] = "ab\x82\x61"
                  "cd\xE4";
    String::MBCSUpperN(text, -1);
    EXPECT_STREQ(text, "AB\x82\x61"
                       "CD\xE4"); // trail byte 'a' and Latin-1 0xE4 untouched
    String::MBCSLowerN(text, 2);
    EXPECT_STREQ(text, "ab\x82\x61"
                       "CD\xE4");
}

// Wide and UTF-8 text in and out of the family. Narrow text is in the lead-byte table's code
// page: Latin-1 for code page 0 off Windows, Shift-JIS for 932.
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
