#include "TextItems.h"
#include "support/MultiByteFixture.h"

#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace tekit {
namespace {

using MultiByteLines = testing::MultiByteFixture;

using testing::Text;

std::string Line(String const& s, int index) {
    DynamicString out("stale");
    s.GetNthLine(index, out);
    return Text(out);
}

TEST(StringLines, EveryKindOfEndingClosesALineAndAFinalOneOpensNone) {
    DynamicString s("one\ntwo\r\nthree\rfour\n");
    EXPECT_EQ(s.GetNumLines(), 4);
    EXPECT_EQ(Line(s, 3), "four");
    EXPECT_EQ(Line(s, 4), "");
    EXPECT_EQ(s.CharOffsetOfLine(2), 9);
    EXPECT_EQ(s.CharOffsetOfLine(4), -1);
    EXPECT_EQ(DynamicString("a\n\n").GetNumLines(), 2);
    s.GetNthLine(2, s);
    EXPECT_EQ(Text(s), "three");
}

TEST(StringLines, RemovingAndTruncatingLines) {
    DynamicString s("a\r\nb\nc\rd");
    s.RemoveNthLine(1);
    s.RemoveNthLine(2);
    s.RemoveNthLine(5);
    EXPECT_EQ(Text(s), "a\r\nc\r");
    s.TruncateToNLines(2);
    EXPECT_EQ(Text(s), "a\r\nc\r"); // nothing follows the kept lines
    s.TruncateToNLines(1);
    EXPECT_EQ(Text(s), "a");
    s.Assign("\nx");
    s.TruncateToNLines(1);
    EXPECT_EQ(Text(s), "");
}

TEST(StringLineEndings, ConversionBothWaysAndNoCopyWhenAlreadyDone) {
    DynamicString s("a\nb\r\nc\rd\r\r\n");
    s.ConvertToCRLF();
    EXPECT_EQ(Text(s), "a\r\nb\r\nc\r\nd\r\n\r\n");
    s.Assign("a\r\nb\rc\n\r\n");
    s.ConvertFromCRLF();
    EXPECT_EQ(Text(s), "a\nb\rc\n\n");

    DynamicString a("a\r\nb\r\n");
    DynamicString b(a);
    b.ConvertToCRLF();
    EXPECT_EQ(b.GetCopyOnWriteMemory(), a.GetCopyOnWriteMemory());
}

// Every character outside a line ending must be found at its mapped index in the converted
// text, and the end of the text must map to the end of the converted text.
TEST(StringLineEndings, IndexMappingFollowsTheConversion) {
    char const* const original = "x\ny\r\nz\rw\r\r\n\nv";
    DynamicString toCRLF(original);
    DynamicString fromCRLF(original);
    toCRLF.ConvertToCRLF();
    fromCRLF.ConvertFromCRLF();
    DynamicString const s(original);
    int const length = s.GetNumChars();
    for (int i = 0; i < length; ++i) {
        if (original[i] == '\r' || original[i] == '\n')
            continue;
        EXPECT_EQ(toCRLF.GetChar(s.GetIndexIfConvertToCRLF(i)), original[i]) << i;
        EXPECT_EQ(fromCRLF.GetChar(s.GetIndexIfConvertFromCRLF(i)), original[i]) << i;
    }
    EXPECT_EQ(s.GetIndexIfConvertToCRLF(length + 10), toCRLF.GetNumChars());
    EXPECT_EQ(s.GetIndexIfConvertFromCRLF(length), fromCRLF.GetNumChars());
    EXPECT_EQ(s.GetIndexIfConvertToCRLF(1), 1);   // a lone "\n" maps to its new "\r"
    EXPECT_EQ(s.GetIndexIfConvertFromCRLF(4), 3); // the "\n" of "\r\n" keeps its place
}

TEST(StringLineEndings, StorageThatCannotGrowKeepsTheStart) {
    std::string text;
    for (int i = 0; i < 32; ++i)
        text += "a\n";
    StaticString<64> s(text.c_str());
    s.ConvertToCRLF();
    EXPECT_EQ(Text(s).size(), 64u);
    EXPECT_EQ(Text(s).substr(57), "a\r\na\r\na");
}

TEST_F(MultiByteLines, LinePositionsCountCharacters) {
    UseShiftJis();
    DynamicString s("\x82\xA0\x82\xA2\n\x82\xA4");
    EXPECT_EQ(s.CharOffsetOfLine(1), 3);
    EXPECT_EQ(Line(s, 1), "\x82\xA4");
    EXPECT_EQ(s.GetIndexIfConvertToCRLF(3), 4);
    s.ConvertToCRLF();
    EXPECT_EQ(s.GetIndexIfConvertFromCRLF(4), 3);
}

} // namespace
} // namespace tekit
