// The tool's output helpers: JSON must stay valid whatever bytes the library hands over, and
// text columns must line up.
#include "Output.h"

#include <gtest/gtest.h>

#include <sstream>

using namespace tekit::tool;

TEST(JsonQuote, EscapesQuotesBackslashesAndControlCharacters) {
    EXPECT_EQ(JsonQuote(""), "\"\"");
    EXPECT_EQ(JsonQuote("say \"hi\"\\"), "\"say \\\"hi\\\"\\\\\"");
    EXPECT_EQ(JsonQuote("a\nb\rc\td\be\ff"), "\"a\\nb\\rc\\td\\be\\ff\"");
    EXPECT_EQ(JsonQuote(std::string_view("\x01\x1F\x7F", 3)), "\"\\u0001\\u001F\\u007F\"");
    EXPECT_EQ(JsonQuote(std::string_view("a\0b", 3)), "\"a\\u0000b\"");
    EXPECT_EQ(JsonQuote("/ and ' stay"), "\"/ and ' stay\"");
}

TEST(JsonQuote, KeepsValidUtf8AndEscapesEveryOtherHighByte) {
    EXPECT_EQ(JsonQuote("caf\xC3\xA9 \xE6\x97\xA5 \xF0\x9F\x98\x80"),
              "\"caf\xC3\xA9 \xE6\x97\xA5 \xF0\x9F\x98\x80\"");
    // Shift-JIS bytes, a truncated sequence, an overlong form, a surrogate and a value past
    // U+10FFFF are each read byte by byte.
    EXPECT_EQ(JsonQuote("\x93\xFA"), "\"\\u0093\\u00FA\"");
    EXPECT_EQ(JsonQuote("\xE6\x97"), "\"\\u00E6\\u0097\"");
    EXPECT_EQ(JsonQuote("\xC0\xAF"), "\"\\u00C0\\u00AF\"");
    EXPECT_EQ(JsonQuote("\xE0\x80\xAF"), "\"\\u00E0\\u0080\\u00AF\"");
    EXPECT_EQ(JsonQuote("\xED\xA0\x80"), "\"\\u00ED\\u00A0\\u0080\"");
    EXPECT_EQ(JsonQuote("\xF4\x90\x80\x80"), "\"\\u00F4\\u0090\\u0080\\u0080\"");
}

TEST(HexCode, WritesEightUpperCaseDigits) {
    EXPECT_EQ(HexCode(2), "0x00000002");
    EXPECT_EQ(HexCode(0x80004005u), "0x80004005");
    EXPECT_EQ(HexCode(0xFFFFFFFFu), "0xFFFFFFFF");
}

TEST(Record, WritesOneJsonObjectInInsertionOrder) {
    Record record;
    record.AddText("symbol", "TE_X").AddNumber("code", -17000).AddBool("found", false);
    record.AddJson("list", "[1, 2]", "1, 2");
    EXPECT_EQ(record.ToJson(),
              "{\"symbol\": \"TE_X\", \"code\": -17000, \"found\": false, \"list\": [1, 2]}");
    EXPECT_EQ(Record().ToJson(), "{}");
}

TEST(Record, PrintsAlignedNameValueLines) {
    Record record;
    record.AddText("code", "x").AddText("comCode", "y").AddBool("found", true);
    std::ostringstream out;
    record.PrintText(out, 2);
    EXPECT_EQ(out.str(), "  code     x\n  comCode  y\n  found    yes\n");
}

TEST(PrintTable, PadsEveryColumnButTheLastAndEndsNoLineInBlanks) {
    std::ostringstream out;
    PrintTable(out, {{"A", "long cell", "end"}, {"wider", "b"}, {}, {"x", ""}});
    EXPECT_EQ(out.str(), "A      long cell  end\nwider  b\n\nx\n");
    std::ostringstream negativeIndent;
    PrintTable(negativeIndent, {{"x"}}, -3);
    EXPECT_EQ(negativeIndent.str(), "x\n");
}

TEST(JsonArray, PutsOneElementPerLine) {
    EXPECT_EQ(JsonArray({}), "[]");
    EXPECT_EQ(JsonArray({"1", "{}"}), "[\n  1,\n  {}\n]");
}

TEST(Shown, WritesControlBytesAsHexAndKeepsTheRest) {
    struct {
        std::string_view text, shown;
    } const cases[] = {
        {"C:\\a\\b.txt", "C:\\a\\b.txt"},
        {"a\nb", "a<0x0A>b"},
        {"\t\r", "<0x09><0x0D>"},
        {std::string_view("\0x", 2), "<0x00>x"},
        {"\x1F\x7F", "<0x1F><0x7F>"},
        {"caf\xC3\xA9 \x93\xFA", "caf\xC3\xA9 \x93\xFA"}, // high bytes are no control bytes
    };
    for (auto const& c : cases)
        EXPECT_EQ(Shown(c.text), c.shown) << c.shown;
}

TEST(CharacterName, NamesWhitespaceControlAndPrintableBytes) {
    EXPECT_EQ(CharacterName('\n'), "line feed (0x0A)");
    EXPECT_EQ(CharacterName('\r'), "carriage return (0x0D)");
    EXPECT_EQ(CharacterName('\t'), "tab (0x09)");
    EXPECT_EQ(CharacterName(0x01), "control character 0x01");
    EXPECT_EQ(CharacterName(0x7F), "control character 0x7F");
    EXPECT_EQ(CharacterName('<'), "\"<\" (0x3C)");
}

TEST(PrintRecords, SeparatesTextRecordsAndAlwaysWritesOneJsonArray) {
    Record first, second;
    first.AddText("path", "a\tb");
    second.AddNumber("levels", 2);
    std::ostringstream text, json, none;
    PrintRecords(text, {first, second}, false);
    PrintRecords(json, {first}, true);
    PrintRecords(none, {}, true);
    EXPECT_EQ(text.str(), "path  a<0x09>b\n\nlevels  2\n");
    EXPECT_EQ(json.str(), "[\n  {\"path\": \"a\\tb\"}\n]\n");
    EXPECT_EQ(none.str(), "[]\n");
}
