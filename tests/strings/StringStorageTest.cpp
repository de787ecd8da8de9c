// The storage kinds that cannot grow (StaticString, BufferString), the storage-independent
// behaviour of String (measures, the size cache, characters, comparison and obscuring), and
// editing: substrings, insertion, replacement and removal.
#include "TextItems.h"
#include "support/DebugCapture.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"
#include "tekit/strings/BufferString.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <set>
#include <string>

namespace tekit {
namespace {

using StringTest = testing::MultiByteFixture;

using testing::Text;

TEST(StaticStringTruncation, KeepsExactlyNBytesAndCutsTheRest) {
    std::string const exact(64, 'x');
    StaticString<64> over((exact + "y").c_str());
    EXPECT_EQ(Text(over), exact);
    StaticString<256> big;
    big = std::string(300, 'z').c_str();
    big += "more";
    EXPECT_EQ(big.GetNumBytes(), 256);
}

TEST_F(StringTest, MultibyteTruncationNeverLeavesHalfACharacter) {
    UseShiftJis();
    StaticString<64> fixed((std::string(63, 'a') + "\x82\xA0" + "b").c_str());
    EXPECT_EQ(fixed.GetNumBytes(), 63);
    StaticString<64> appended(std::string(62, 'a').c_str());
    appended += "\x82\xA0\x82\xA2";
    EXPECT_EQ(Text(appended), std::string(62, 'a') + "\x82\xA0");
    char buffer[4];
    BufferString inBuffer(buffer, "\x82\xA0\x82\xA2", sizeof buffer);
    EXPECT_EQ(Text(inBuffer), "\x82\xA0");

    DynamicString limited; // a count of characters, then of bytes: never half a character
    limited.Assign("\x82\xA0\x61\x82\xA2", 2, false);
    EXPECT_EQ(Text(limited), "\x82\xA0\x61");
    limited.AssignUsingNumBytesInsteadOfNumChars("\x82\xA0\x61\x82\xA2", 4, false);
    EXPECT_EQ(Text(limited), "\x82\xA0\x61");
}

TEST(BufferStringStorage, WritesStayInsideTheCallersBuffer) {
    char buffer[8 + 1];
    buffer[8] = '#'; // a guard byte just past the declared size
    BufferString s(buffer, "0123456789", 8);
    EXPECT_EQ(Text(s), "0123456");
    s += "abc";
    s.InsertChar('X', 0);
    EXPECT_EQ(Text(s), "X012345");
    EXPECT_EQ(buffer[8], '#');

    char known[32] = "hello"; // size unknown: the text and its terminator
    BufferString unknown(known, -1);
    EXPECT_EQ(unknown.RequestBufferSize(100, true, false), 6);
    unknown = "a much longer text";
    EXPECT_EQ(Text(unknown), "a muc");

    static char const kText[] = "constant";
    BufferString view(kText, -1);
    EXPECT_RAISES_IN(view = "other", TE_PROGRAM_ERROR, "BufferString::GetBufferWritePtr");
    EXPECT_STREQ(kText, "constant");
}

TEST(BufferStringStorage, AdvanceBufferWritesASequenceAndStopsAtTheTerminator) {
    char buffer[16] = {};
    BufferString s(buffer, sizeof buffer);
    s = "one";
    s.AdvanceBuffer(3);
    s = "two";
    s.AdvanceBuffer(100); // only as far as the text goes
    EXPECT_EQ(s.GetBufferReadPtr(), buffer + 6);
    EXPECT_EQ(s.GetBufferSize(), 10);
    s = "three";
    EXPECT_STREQ(buffer, "onetwothree");
}

TEST(StringSizeCache, StaleAfterGetPtrUntilReleasePtr) {
    DynamicString s("abcdef", true);
    char* p = s.GetPtr(2);
    EXPECT_EQ(s.GetNumBytes(), 6); // measured now, then cached
    p[0] = '\0';
    EXPECT_EQ(s.GetNumBytes(), 6); // stale: the write is not finished
    s.ReleasePtr();
    EXPECT_EQ(s.GetNumBytes(), 2);
    EXPECT_EQ(s.GetPtr(100), s.GetBufferReadPtr() + 2); // clamped to the terminator
}

TEST(StringNullText, NullTextIsTheEmptyText) {
    char const* const null = nullptr;
    DynamicString s(null);
    EXPECT_TRUE(s.IsEmpty());
    s = "x";
    s += null;
    EXPECT_EQ(Text(s), "x");
    EXPECT_GT(s.Compare(null), 0);
}

TEST_F(StringTest, CharactersAndIndicesCountDoubleByteCharacters) {
    UseShiftJis();
    DynamicString s("a\x82\xA0\x62", true); // a<あ>b
    EXPECT_EQ(s.GetNumChars(), 3);
    EXPECT_EQ(s.GetChar(1), 0x82A0);
    EXPECT_EQ(s.GetChar(-1), 0);
    EXPECT_EQ(s.CharToByteIndex(2), 3);
    EXPECT_EQ(s.ByteToCharIndex(2), 1); // inside the double-byte character

    s.SetChar(1, 'x'); // two bytes become one
    EXPECT_EQ(Text(s), "axb");
    s.MBSetChar(0, 0x82A2); // one byte becomes two
    s.InsertChar(0x82A0, 3);
    s.AppendChar('!');
    EXPECT_EQ(Text(s), "\x82\xA2xb\x82\xA0!");
    s.SetChar(42, 'z'); // outside the text: nothing
    s.SetChar(1, 0);    // NUL ends the text
    EXPECT_EQ(Text(s), "\x82\xA2");
    EXPECT_EQ(s.GetLastChar(), 0x82A2);
    EXPECT_TRUE(s.IsPtrToLastChar(reinterpret_cast<unsigned char const*>(s.GetBufferReadPtr())));
}

TEST(StringCharacters, SingleByteModeCountsBytesAndClampsIndices) {
    DynamicString s("abc", true);
    s.SetChar(1, 'B');
    s.SetChar(9, 'x');
    s.InsertChar('0', -5);
    s.InsertChar('9', 99);
    EXPECT_EQ(Text(s), "0aBc9");
    EXPECT_EQ(s.CharToByteIndex(99), 5);
    EXPECT_EQ(DynamicString().GetLastChar(), 0);
}

TEST(StringComparison, BytesCompareUnsignedAndCaseFoldsAsciiOnly) {
    DynamicString s("abc", true);
    // Its own buffer is equal before any reading, whatever the start index says.
    EXPECT_EQ(s.Compare(s.GetBufferReadPtr(), false, -1, 2), 0);
    EXPECT_GT(s.Compare("ab"), 0);
    EXPECT_LT(s.Compare("ab\xE4"), 0); // 0xE4 is above every ASCII byte
    EXPECT_EQ(s.Compare("abX", false, 2), 0);
    EXPECT_EQ(s.Compare("", false, -1, 10), 0); // the start is clamped to the end
    EXPECT_NE(DynamicString("\xC4", true).Compare("\xE4", true), 0); // no case above 127
    EXPECT_TRUE(DynamicString("[", true).Compare("a", true) < 0);    // '[' sorts before letters

    DynamicString b("b", true), a("A", true), c("c", true);
    using NoCaseSet = std::set<String const*, StringPtrLessThanNoCase>;
    using ExactSet = std::set<String const*, StringPtrLessThan>;
    EXPECT_EQ(*NoCaseSet({&b, &c, &a}).begin(), &a);
    EXPECT_EQ(*ExactSet({&b, &c, &a}).begin(), &a); // 'A' < 'b'
}

TEST_F(StringTest, MultibyteComparisonOrdersByCharacterValue) {
    SetMultiByteCodePage(932);
    DynamicString kana("\xA1", true); // a single-byte character above every lead byte 0x81
    EXPECT_GT(kana.Compare("\x81\x40"), 0);
    String::EnableMultiByteSupport(true);
    EXPECT_LT(kana.Compare("\x81\x40"), 0);
    DynamicString s("\x82\x61\x41", true); // trail byte 'a' is not a letter here
    EXPECT_NE(s.Compare("\x82\x41\x61", true), 0);
    EXPECT_EQ(s.Compare("a", true, -1, 1), 0);
}

TEST(StringScramble, RoundTripsEveryByteAndNeverMakesANul) {
    std::string all;
    for (int round = 0; round < 3; ++round)
        for (int c = 1; c < 256; ++c)
            all.push_back(static_cast<char>(c));
    DynamicString s(all.c_str(), true);
    s.Scramble();
    EXPECT_EQ(std::strlen(s.GetBufferReadPtr()), all.size());
    EXPECT_NE(Text(s), all);
    s.Unscramble();
    EXPECT_EQ(Text(s), all);
}

TEST(StringAssertion, RaisesProgramErrorNamingTheFunction) {
    testing::DiagnosticLevelScope const diagnosing(1);
    TEException const e =
        testing::Raised([] { String::ThrowStringAssertion("index >= 0", "String::Something"); });
    EXPECT_EQ(e.GetErrorCode(), TE_PROGRAM_ERROR);
    EXPECT_STREQ(e.GetFunctionName(), "String::Something");
    EXPECT_NE(std::string(e.GetDescription()).find("index >= 0"), std::string::npos);
}

using MultiByteEdit = testing::MultiByteFixture;

TEST(StringSubstrings, IndicesAndCountsAreClampedToTheText) {
    DynamicString s("Hello World");
    DynamicString out;
    s.GetSubstring(6, 100, out);
    EXPECT_EQ(Text(out), "World");
    s.GetSubstring(4, -1, s);
    EXPECT_EQ(Text(s), "o World");
    s.InsertSubstring("<", -5);
    s.InsertSubstring(">", 99);
    EXPECT_EQ(Text(s), "<o World>");
    s.RemoveSubstring(2, 1);
    s.RemoveSubstring(7, -1);
    EXPECT_EQ(Text(s), "<oWorld");
    s.RemoveSubstring(0, -4);
    EXPECT_EQ(Text(s), "");
}

TEST(StringSubstrings, TextMayPointIntoTheStringItself) {
    DynamicString s("abc");
    s.InsertSubstring(s.GetBufferReadPtr(), 2);
    EXPECT_EQ(Text(s), "ababcc");
    s.Assign("abcdef");
    s.ReplaceSubstring(0, 2, s.GetBufferReadPtr() + 4);
    EXPECT_EQ(Text(s), "efcdef");
    s.ReplaceAllSubstrings("ef", s.GetBufferReadPtr() + 2);
    EXPECT_EQ(Text(s), "cdefcdcdef");
    s.TruncateToNChars(6, s.GetBufferReadPtr() + 8);
    EXPECT_EQ(Text(s), "cdefef");
}

TEST(StringReplace, FirstOccurrenceWholeWordsAndCase) {
    DynamicString s("concat cat Cat");
    EXPECT_TRUE(s.ReplaceSubstring("cat", "dog", false, true));
    EXPECT_EQ(Text(s), "concat dog Cat");
    EXPECT_TRUE(s.ReplaceSubstring(DynamicString("CAT"), DynamicString("cow"), true));
    EXPECT_EQ(Text(s), "concow dog Cat");
    EXPECT_FALSE(s.ReplaceSubstring("", "x"));
    EXPECT_FALSE(DynamicString("my_dog dog2").ReplaceSubstring("dog", "x", false, true));
}

TEST(StringReplace, ReplaceAllMakesOnePassAndCounts) {
    DynamicString s("aXa");
    EXPECT_EQ(s.ReplaceAllSubstrings("a", "aa"), 2); // a replacement is not searched again
    EXPECT_EQ(Text(s), "aaXaa");
    EXPECT_EQ(s.ReplaceAllSubstrings("AA", nullptr, true), 2);
    EXPECT_EQ(Text(s), "X");
    DynamicString words("id idx id_1 (id)");
    EXPECT_EQ(words.ReplaceAllSubstrings("id", "key", false, true), 2);
    EXPECT_EQ(Text(words), "key idx id_1 (key)");
    EXPECT_TRUE(words.ReplaceIfEqual("KEY IDX ID_1 (KEY)", "same", true));
    EXPECT_FALSE(words.ReplaceIfEqual("SAME", "other"));
}

TEST(StringTruncate, SuffixReplacesTheLastCharactersOnlyWhenItFits) {
    DynamicString s("abcdef");
    s.TruncateToNChars(6, "...");
    EXPECT_EQ(Text(s), "abcdef");
    s.TruncateToNChars(5, "...");
    EXPECT_EQ(Text(s), "ab...");
    s.TruncateToNChars(2, "...");
    EXPECT_EQ(Text(s), "ab");
    s.TruncateToNChars(-1);
    EXPECT_EQ(Text(s), "");
}

TEST(StringTrim, SetsAndWhiteSpace) {
    DynamicString s(" \t\r\n\v\fvalue \f\v\n\r\t ");
    s.RemoveSurroundingWhiteSpace(kTrimRight);
    EXPECT_EQ(Text(s), " \t\r\n\v\fvalue");
    s.RemoveSurroundingWhiteSpace();
    EXPECT_EQ(Text(s), "value");
    s.Assign("--x-y--");
    s.TrimLeft("-");
    s.TrimRight("-y");
    EXPECT_EQ(Text(s), "x");
}

TEST(StringEditSharing, AnEditThatChangesNothingLeavesASharedBlockShared) {
    DynamicString a("shared text");
    DynamicString b(a);
    b.RemoveSubstring(40, 2);
    b.InsertSubstring("", 3);
    b.ReplaceSubstring(2, 0, "");
    b.ReplaceAllSubstrings("zz", "y");
    b.TruncateToNChars(11, "...");
    b.RemoveSurroundingWhiteSpace();
    EXPECT_EQ(b.GetCopyOnWriteMemory(), a.GetCopyOnWriteMemory());
}

TEST(StringEditTruncation, StorageThatCannotGrowKeepsTheStartOfTheResult) {
    StaticString<8> s("abcdef");
    s.InsertSubstring("123", 2);
    EXPECT_EQ(Text(s), "ab123cde");

    char buffer[10];
    std::memset(buffer, '#', sizeof buffer);
    BufferString b(buffer, "xyx", 6);
    EXPECT_EQ(b.ReplaceAllSubstrings("x", "<x>"), 2);
    b.Append(DynamicString("tail"), ",");
    EXPECT_EQ(Text(b), "<x>y<");
    EXPECT_EQ(buffer[6], '#'); // nothing written past the caller's buffer
}

TEST_F(MultiByteEdit, IndicesCountCharactersAndCutsKeepDoubleByteCharactersWhole) {
    UseShiftJis();
    DynamicString s("\x82\xA0\x82\xA2\x82\xA4");
    s.InsertSubstring("-", 1);
    s.RemoveSubstring(2, 1);
    EXPECT_EQ(Text(s), "\x82\xA0-\x82\xA4");
    s.TruncateToNChars(2, "~");
    EXPECT_EQ(Text(s), "\x82\xA0~");

    StaticString<8> fixed("abcdef");
    fixed.InsertSubstring("\x82\xA0\x82\xA2", 5); // 10 bytes: the second character does not fit
    EXPECT_EQ(Text(fixed), "abcde\x82\xA0");
    fixed.ReplaceAllSubstrings("a", "xxx"); // 9 bytes: the cut would split the last one
    EXPECT_EQ(Text(fixed), "xxxbcde");
}

TEST_F(MultiByteEdit, TrimmingAndWholeWordsSeeCharactersNotBytes) {
    UseShiftJis();
    DynamicString s("x\x83\x40"); // the trail byte is '@'
    s.TrimRight("@");
    EXPECT_EQ(Text(s), "x\x83\x40");
    s.TrimLeft("\x83\x40x");
    EXPECT_EQ(Text(s), "");
    DynamicString words("\x82\xA0id id");
    EXPECT_EQ(words.ReplaceAllSubstrings("id", "k", false, true), 1);
    EXPECT_EQ(Text(words), "\x82\xA0id k");
}

TEST(StringAppendSeparator, ListsAndJoins) {
    DynamicString list;
    list.Append(DynamicString("a"), ", ");
    list.Append(DynamicString(), ", ");
    list.Append(list, "+");
    EXPECT_EQ(Text(list), "a, +a, ");

    DynamicString path("C:\\dir");
    path.AppendUsingSeparator(DynamicString("sub\\"), "\\");
    path.AppendUsingSeparator(DynamicString("\\file"), "\\");
    EXPECT_EQ(Text(path), "C:\\dir\\sub\\file");
}

} // namespace
} // namespace tekit
