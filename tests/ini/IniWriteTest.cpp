// Writing INI text: the line formats, multi-line pieces, and text that reads back to the object
// it was written from.
#include "ini/IniTestSupport.h"
#include "support/MultiByteFixture.h"

#include <gtest/gtest.h>

namespace tekit::testing {
namespace {

TEST(IniWrite, SectionsItemsAndEmptyLines) {
    IniObject ini;
    ASSERT_EQ(Ini_PutRawString(ini, "First", "A", "1"), 0);
    ASSERT_EQ(Ini_PutString(ini, "First", "B", "two"), 0);
    ASSERT_EQ(Ini_PutString(ini, "Second", "Empty", ""), 0);
    ASSERT_EQ(ReadText(ini, "[Third]"), 0);
    EXPECT_EQ(WriteText(ini),
              "[First]\nA = 1\nB = \"two\"\n\n[Second]\nEmpty = \"\"\n\n[Third]\n\n");
}

TEST(IniWrite, LongAndAwkwardValuesAreWrittenAsPieces) {
    std::string const x = std::string(119, 'x');
    struct {
        char const* name;
        std::string value;
        bool quoted;
        std::string written; ///< the lines after the header
        bool readsQuoted;    ///< the quoted flag of the item read back
    } const cases[] = {
        {"At120BytesOneLine", x + "x", false, "Tag = " + x + "x\n", false},
        {"At121BytesTwoPieces", x + "xy", false, "Tag Line0001 = " + x + "x\nTag Line0002 = y\n",
         false},
        {"QuotedPiecesAreEachQuoted", x + "xy", true,
         "Tag Line0001 = \"" + x + "x\"\nTag Line0002 = \"y\"\n", true},
        {"CutAvoidsBlankAtPieceEnd", x + " abzzz", false,
         "Tag Line0001 = " + x + "\nTag Line0002 = \" abzzz\"\n", false},
        {"ValueWrappedInQuotesGoesAsPieces", "\"a\"", false,
         "Tag Line0001 = \"a\nTag Line0002 = \"\n", false},
        {"UnquotedEmptyValueIsWrittenQuoted", "", false, "Tag = \"\"\n", true},
        {"LeadingBlankIsWrittenQuoted", " a", false, "Tag = \" a\"\n", true},
    };
    for (auto const& c : cases) {
        SCOPED_TRACE(c.name);
        IniObject ini;
        ASSERT_EQ(c.quoted ? Ini_PutString(ini, "s", "Tag", c.value.c_str())
                           : Ini_PutRawString(ini, "s", "Tag", c.value.c_str()),
                  0);
        std::string const text = WriteText(ini);
        EXPECT_EQ(text, "[s]\n" + c.written + "\n");
        IniObject back;
        ASSERT_EQ(ReadText(back, text), 0);
        EXPECT_EQ(Dump(back),
                  "[s]\nTag=" + std::string(c.readsQuoted ? "\"" : "") + c.value + "\n");
    }
}

TEST(IniWrite, CallbackErrorStopsTheWrite) {
    IniObject ini;
    ASSERT_EQ(Ini_PutInt(ini, "a", "X", 1), 0);
    ASSERT_EQ(Ini_PutInt(ini, "b", "Y", 2), 0);
    struct Sink {
        int lines = 0;
        static int TEKIT_STDCALL Write(void* data, char const*) {
            return ++static_cast<Sink*>(data)->lines == 2 ? -9 : 0;
        }
    } sink;
    EXPECT_EQ(Ini_WriteGeneric(ini, Sink::Write, &sink), -9);
    EXPECT_EQ(sink.lines, 2);
}

// Texts whose objects the plain line form would not give back: each must read, write and read
// again to the same object and the same text.
// clang-format off
char const* const kAwkwardTexts[] = {
    "[s]\nT Line1 = \"a\nT Line2 = b\"",                  // joined value wrapped in quotes
    "[s]\nT = " "0123456789012345678901234567890123456789012345678901234567890123456789"
        "01234567890123456789012345678901234567890123456789\nT Line0002 = y", // a run would take y
    "[s]\nX Line0001 Line1 = a",                          // the joined tag is itself a start
    "[s]\nX  Line1 = a",                                  // the joined tag ends in a blank
    "[s]\nT Line1 = \"\"\nT Line2 = b",                   // quoted empty first piece
    "[s]\nT Line1 = a\nT Line2 = \"  \"\nT Line3 = b",    // blanks inside, at a piece's edge
    "[a]b]\nK = \"\"\"\"\nL = \"",
};
// clang-format on

void ExpectStableRoundTrip(std::string const& text) {
    IniObject first;
    ASSERT_EQ(ReadText(first, text), 0);
    std::string const written = WriteText(first);
    IniObject second;
    ASSERT_EQ(ReadText(second, written), 0);
    EXPECT_EQ(Dump(second), Dump(first)) << written;
    EXPECT_EQ(WriteText(second), written);
}

TEST(IniWrite, AwkwardObjectsReadBackAsWritten) {
    for (char const* text : kAwkwardTexts) {
        SCOPED_TRACE(text);
        ExpectStableRoundTrip(text);
    }
}

class IniWriteBothModes : public BothByteModes {};

TEST_P(IniWriteBothModes, PiecesNeverSplitADoubleByteCharacter) {
    // 119 single bytes, then double-byte characters: in multibyte mode the first cut is at 119.
    std::string value(119, 'a');
    for (int i = 0; i < 70; ++i)
        value += "\x82\xa0";
    IniObject ini;
    ASSERT_EQ(Ini_PutRawString(ini, "s", "T", value.c_str()), 0);
    std::string const text = WriteText(ini);
    std::size_t const first = text.find("T Line0001 = ") + 13;
    std::size_t const firstEnd = text.find('\n', first);
    EXPECT_EQ(firstEnd - first, GetParam() ? 119u : 120u);
    IniObject back;
    ASSERT_EQ(ReadText(back, text), 0);
    EXPECT_EQ(Raw(back, "s", "T"), value);
}

INSTANTIATE_TEST_SUITE_P(ByteModes, IniWriteBothModes, ::testing::Bool());

} // namespace
} // namespace tekit::testing
