#include "TextItems.h"
#include "support/MultiByteFixture.h"

#include "tekit/strings/BufferString.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace tekit {
namespace {

using MultiByteEdit = testing::MultiByteFixture;

using testing::Text;

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
