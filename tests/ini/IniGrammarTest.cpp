// Reading and writing INI text: which lines make sections and items, how multi-line items
// join, the written line formats and pieces, and text that reads back to the object it was
// written from.
#include "ini/IniTestSupport.h"
#include "support/MultiByteFixture.h"

#include <gtest/gtest.h>

namespace tekit::testing {
namespace {

struct ReadCase {
    char const* name;
    char const* text;
    char const* dump; ///< Dump() of the object read
};

// clang-format off
ReadCase const kLines[] = {
    {"EmptyValueIsNoItemButTwoQuotesAreAnEmptyString", "[s]\nT =\nU = \"\"\nV=   ", "[s]\nU=\"\n"},
    {"BlanksInsideAndAfterBracketsAreDropped", "  [  name  ]  \nA=1", "[name]\nA=1\n"},
    {"TextAfterClosingBracketIgnoresTheHeader", "[a]\nX=1\n[b] junk\nY=2", "[a]\nX=1\nY=2\n"},
    {"LastClosingBracketEndsTheName", "[a]b]\nK=v", "[a]b]\nK=v\n"},
    {"HeaderWithoutClosingBracketIsIgnored", "[a\nK=v", ""},
    {"EmptyNameIsIgnored", "[ ]\nK=v\n[]\nL=w", ""},
    {"ItemsBeforeAnySectionAreDropped", "K=v\n[s]\nL=w", "[s]\nL=w\n"},
    {"CommentsAreSkipped", ";c=1\n[s]\n   ; x = 2\nK=v", "[s]\nK=v\n"},
    {"OtherCommentMarksAreText", "[s]\n#x=1\n//y=2", "[s]\n#x=1\n//y=2\n"},
    {"LineWithoutSeparatorIsIgnored", "[s]\nnoseparator\nK=v", "[s]\nK=v\n"},
    {"EmptyTagIsIgnored", "[s]\n = v\nK=v", "[s]\nK=v\n"},
    {"FirstSeparatorSplits", "[s]\nK = a = b", "[s]\nK=a = b\n"},
    {"WhiteSpaceAroundTagAndValueGoes", "[s]\n \t Tag \t = \t v w \t", "[s]\nTag=v w\n"},
    {"QuotesAreStrippedOnce", "[s]\nA = \"a\"\nB = \"\"x\"\"\nC = \"\nD = \"a\" b", "[s]\nA=\"a\nB=\"\"x\"\nC=\"\nD=\"a\" b\n"},
    {"QuotedBlanksSurvive", "[s]\nA = \"  \"", "[s]\nA=\"  \n"},
    {"NamesAreCaseSensitive", "[s]\nKey=1\nkey=2\n[S]\nKey=3", "[s]\nKey=1\nkey=2\n[S]\nKey=3\n"},
    {"RepeatedHeaderStartsAnotherSection", "[a]\nX=1\n[a]\nY=2", "[a]\nX=1\n[a]\nY=2\n"},
    {"DuplicateTagsAreKeptWhenRead", "[s]\nK=1\nK=2", "[s]\nK=1\nK=2\n"},
    {"NoInlineComments", "[s]\nK = v ; not a comment", "[s]\nK=v ; not a comment\n"},
    {"LineNumbersAreTheCallbacks", "; head\n\n[s]\nA=1\n\nB=2", "[s]@3\nA=1@4\nB=2@6\n"},
};

ReadCase const kMultiLine[] = {
    {"RunJoins", "[s]\nT Line0001=ab\nT Line0002=cd\nT Line0003=e", "[s]\nT=abcde\n"},
    {"OnePieceRunJoins", "[s]\nT Line1=ab", "[s]\nT=ab\n"},
    {"NumbersReadAsValues", "[s]\nT Line001=a\nT Line2=b\nT Line00003=c", "[s]\nT=abc\n"},
    {"GapEndsTheRun", "[s]\nT Line0001=a\nT Line0003=c", "[s]\nT=a\nT Line0003=c\n"},
    {"RepeatedNumberEndsTheRun", "[s]\nT Line0001=a\nT Line0002=b\nT Line0002=c", "[s]\nT=ab\nT Line0002=c\n"},
    {"AnotherOneStartsANewRun", "[s]\nT Line1=a\nT Line2=b\nT Line1=c", "[s]\nT=ab\nT=c\n"},
    {"OtherBaseEndsTheRun", "[s]\nA Line1=a\nB Line2=b", "[s]\nA=a\nB Line2=b\n"},
    {"OtherItemEndsTheRun", "[s]\nA Line1=a\nX=x\nA Line2=b", "[s]\nA=a\nX=x\nA Line2=b\n"},
    {"PieceWithoutStartStays", "[s]\nT Line0002=x", "[s]\nT Line0002=x\n"},
    {"ZeroIsNoStart", "[s]\nT Line0000=x\nT Line0001=y", "[s]\nT Line0000=x\nT=y\n"},
    {"NumberBeyondIntIsNoPiece", "[s]\nT Line1=a\nT Line4294967298=b", "[s]\nT=a\nT Line4294967298=b\n"},
    {"MarkerNeedsBaseAndDigitsOnly", "[s]\nLine1=a\nT Line1x=b\nT Line=c\nTLine1=d", "[s]\nLine1=a\nT Line1x=b\nT Line=c\nTLine1=d\n"},
    {"FlagAndLineComeFromTheFirstPiece", "[s]\n\nT Line1 = \"a \"\nT Line2 = b", "[s]@1\nT=\"a b@3\n"},
    {"RunsDoNotCrossSections", "[a]\nT Line1=a\n[b]\nT Line2=b", "[a]\nT=a\n[b]\nT Line2=b\n"},
    {"FileEndingInsideARunKeepsItsPieces", "[s]\nT Line1=a\nT Line2=b\n", "[s]\nT=ab\n"},
};
// clang-format on

class IniReadTest : public ::testing::TestWithParam<ReadCase> {};

TEST_P(IniReadTest, ObjectIsAsExpected) {
    IniObject ini;
    ASSERT_EQ(ReadText(ini, GetParam().text), 0);
    bool const withLines = std::string(GetParam().dump).find('@') != std::string::npos;
    EXPECT_EQ(Dump(ini, withLines), GetParam().dump);
}

std::string CaseName(::testing::TestParamInfo<ReadCase> const& info) {
    return info.param.name;
}

INSTANTIATE_TEST_SUITE_P(Lines, IniReadTest, ::testing::ValuesIn(kLines), CaseName);
INSTANTIATE_TEST_SUITE_P(MultiLine, IniReadTest, ::testing::ValuesIn(kMultiLine), CaseName);

TEST(IniRead, CallbackErrorEndsTheReadAndKeepsWhatWasRead) {
    struct Source : TextLines {
        using TextLines::TextLines;
        static int TEKIT_STDCALL Read(void* data, char* buffer, int size, int* end, int* line) {
            auto& self = *static_cast<Source*>(data);
            return self.number == 3 ? -77 : TextLines::Read(data, buffer, size, end, line);
        }
    } source("[s]\nT Line1=a\nT Line2=b\nU=1");
    IniObject ini;
    EXPECT_EQ(Ini_ReadGeneric(ini, Source::Read, &source), -77);
    EXPECT_EQ(Dump(ini), "[s]\nT=ab\n"); // joined all the same
}

int TEKIT_STDCALL SkipSectionsNamedSkip(IniHandle, void* data, char const* name) {
    ++*static_cast<int*>(data);
    return std::strcmp(name, "skip") == 0 ? 0 : 1;
}

TEST(IniRead, SectionFilterSkipsSectionsAndTheirItems) {
    IniObject ini;
    int calls = 0;
    ASSERT_EQ(Ini_SetSectionFilter(ini, SkipSectionsNamedSkip, &calls), 0);
    ASSERT_EQ(ReadText(ini, "[keep]\nA=1\n[skip]\nB=2\n[ skip ] x\nC=3\n[other]\nD=4"), 0);
    EXPECT_EQ(Dump(ini), "[keep]\nA=1\n[other]\nD=4\n");
    EXPECT_EQ(calls, 3); // the ignored header is never offered
}

TEST(IniRead, TokensChangeTheGrammarAndTheWrittenForm) {
    IniObject ini;
    ASSERT_EQ(Ini_SetTokens(ini, '<', '>', ":=", "#"), 0);
    ASSERT_EQ(ReadText(ini, "<s>\nK := v\nL = w\n#c := 1\n;d := 2"), 0);
    EXPECT_EQ(Dump(ini), "[s]\nK=v\n;d=2\n"); // Dump() shows sections in brackets
    EXPECT_EQ(WriteText(ini), "<s>\nK := v\n;d := 2\n\n");
    // Null and empty tokens keep the current ones; long ones are cut to 7 bytes.
    ASSERT_EQ(Ini_SetTokens(ini, 0, 0, nullptr, ""), 0);
    ASSERT_EQ(Ini_SetTokens(ini, 0, 0, "-=-=-=-=-=", nullptr), 0);
    EXPECT_EQ(WriteText(ini), "<s>\nK -=-=-=- v\n;d -=-=-=- 2\n\n");
}

TEST(IniRead, SortingObjectSortsAfterEveryRead) {
    IniObject ini(1);
    ASSERT_EQ(ReadText(ini, "[b]\nZ=1\nA=2\nZ=0\n[a]\nK=3"), 0);
    EXPECT_EQ(Dump(ini), "[a]\nK=3\n[b]\nA=2\nZ=1\nZ=0\n"); // stable: equal tags keep order
    ASSERT_EQ(ReadText(ini, "[0]\nX=1"), 0);
    EXPECT_EQ(Dump(ini), "[0]\nX=1\n[a]\nK=3\n[b]\nA=2\nZ=1\nZ=0\n");
}

class IniMultiByteRead : public MultiByteFixture {};

// 0x82 leads a double-byte character in Shift-JIS: the byte after it is its trail byte,
// whatever it is. Each case gives the object read with multibyte mode off, then on.
// clang-format off
struct { char const* name; char const* text; char const* singleByte, *shiftJis; } const kByteModes[] = {
    {"TrailByteIsNoClosingBracket", "[a\x82]\nK=v", "[a\x82]\nK=v\n", ""},
    {"TrailByteIsNoWhiteSpace", "[s]\nK = a\x82 ", "[s]\nK=a\x82\n", "[s]\nK=a\x82 \n"},
    {"TrailByteIsNoClosingQuote", "[s]\nK = \"a\x82\"", "[s]\nK=\"a\x82\n", "[s]\nK=\"a\x82\"\n"},
    {"LeadByteAtLineEndStandsAlone", "[s]\nK = a\x82", "[s]\nK=a\x82\n", "[s]\nK=a\x82\n"},
    {"TrailByteIsNoPieceMarkerBlank", "[s]\nT\x82 Line1=a", "[s]\nT\x82=a\n", "[s]\nT\x82 Line1=a\n"},
    {"DoubleByteNamesAndValues", "[\x82\xa0]\n\x82\xa0 = \x82\xa0", "[\x82\xa0]\n\x82\xa0=\x82\xa0\n", "[\x82\xa0]\n\x82\xa0=\x82\xa0\n"},
};
// clang-format on

TEST_F(IniMultiByteRead, TrailBytesAreNeverTokens) {
    for (auto const& c : kByteModes) {
        SCOPED_TRACE(c.name);
        String::EnableMultiByteSupport(false);
        IniObject single;
        ASSERT_EQ(ReadText(single, c.text), 0);
        EXPECT_EQ(Dump(single), c.singleByte);
        UseShiftJis();
        IniObject shiftJis;
        ASSERT_EQ(ReadText(shiftJis, c.text), 0);
        EXPECT_EQ(Dump(shiftJis), c.shiftJis);
    }
}

// Writing INI text: the line formats, multi-line pieces, and text that reads back to the object
// it was written from.
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
