#include "tekit/strings/DynamicString.h"

#include "support/MultiByteFixture.h"

#include <gtest/gtest.h>

#include <string>
#include <tuple>

using namespace tekit;

namespace {

using MultiByteEscape = tekit::testing::MultiByteFixture;

template <class Op> std::string Applied(char const* text, Op op) {
    DynamicString s(text);
    op(s);
    return s.GetBufferReadPtr();
}

std::string Escaped(char const* text, bool keepLayout) {
    return Applied(text, [=](String& s) { s.EscapeSpecialChars(keepLayout); });
}

std::string Unescaped(char const* text, bool keepLayout) {
    return Applied(text, [=](String& s) { s.UnescapeSpecialChars(keepLayout); });
}

/// UnescapeNextChar's result, character and index.
std::tuple<bool, int, int> NextChar(char const* text, int index) {
    unsigned short ch = 1;
    bool const escaped = String::UnescapeNextChar(text, &index, &ch, false);
    return {escaped, ch, index};
}

/// FindNextUnescapedQuoteChar's result, index and whether it passed an escape.
std::tuple<bool, int, bool> QuoteAt(char const* text, int index) {
    bool escaped = false;
    bool const found = String::FindNextUnescapedQuoteChar(text, &index, &escaped);
    return {found, index, escaped};
}

std::string Xml(char const* text, bool (*op)(String&)) {
    return Applied(text, [=](String& s) { op(s); });
}

} // namespace

// ---- Special characters. ------------------------------------------------------------------

TEST(SpecialChars, EscapeTableInBothLayoutModes) {
    EXPECT_EQ(Escaped("a\tb\nc\"d\re\\f\x01g\x1fh\x7fi\xE9", false),
              "a\\tb\\nc\\\"d\\re\\\\f\\x01g\\x1fh\\x7fi\xE9");
    EXPECT_EQ(Escaped("\t\r\\\n\"\x01", true), "\t\\r\\\\\n\"\\x01");
}

TEST(SpecialChars, UnescapeReadsTheEscapesOfItsModeAndKeepsMalformedOnesLiteral) {
    EXPECT_EQ(Unescaped("\\t\\n\\\"\\r\\\\\\'\\x41\\x4a\\x4A", false), "\t\n\"\r\\'AJJ");
    // With layout kept, \t \n \" are never written by the escaper and so stand as written.
    EXPECT_EQ(Unescaped("\\t\\n\\\"\\r\\\\\\x41", true), "\\t\\n\\\"\r\\A");
    for (char const* text :
         {"C:\\qdir\\file", "ends with\\", "\\x4", "\\x", "\\xg1", "\\x00", "\\x\\x"})
        EXPECT_EQ(Unescaped(text, false), text) << text;
    EXPECT_EQ(Unescaped("\\\\x41", false), "\\x41");
}

TEST(SpecialChars, UnescapeNextCharReportsEscapesAndNeverReadsPastTheText) {
    EXPECT_EQ(NextChar("\\\"a", 0), std::make_tuple(true, '"', 2));
    EXPECT_EQ(NextChar("\\\"a", 3), std::make_tuple(false, 0, 3));
    EXPECT_EQ(NextChar("ab", 10), std::make_tuple(false, 0, 10)); // beyond the terminator
    EXPECT_EQ(NextChar(nullptr, 0), std::make_tuple(false, 0, 0));
    EXPECT_FALSE(String::UnescapeNextChar("ab", nullptr, nullptr, false));
}

TEST(SpecialChars, FindNextUnescapedQuoteSkipsEscapedQuotes) {
    EXPECT_EQ(QuoteAt("a\\\"b\"c", 0), std::make_tuple(true, 4, true));
    EXPECT_EQ(QuoteAt("abc\\", -5), std::make_tuple(false, 4, false));
    EXPECT_EQ(QuoteAt("ab", 99), std::make_tuple(false, 2, false));
}

TEST_F(MultiByteEscape, DoubleByteCharactersAreNeverEscapedOrTakenForEscapes) {
    // 0x81 0x5C is one Shift-JIS character whose trail byte is a backslash.
    EXPECT_EQ(Escaped("\x81\x5C\\", false), "\x81\\\\\\\\"); // single-byte mode: both
    EXPECT_EQ(QuoteAt("\x81\x5C\"", 0), std::make_tuple(false, 3, true));
    UseShiftJis();
    EXPECT_EQ(Escaped("\x81\x5C\\", false), "\x81\x5C\\\\");
    EXPECT_EQ(Unescaped("\x81\x5C\\\\", false), "\x81\x5C\\");
    EXPECT_EQ(Applied("\x81\x5C\"", [](String& s) { s.EscapeSpecialCharsForJSON(); }),
              "\x81\x5C\\\"");
    EXPECT_EQ(QuoteAt("\x81\x5C\"", 0), std::make_tuple(true, 2, false));
    EXPECT_EQ(NextChar("\x82\xA0x", 0), std::make_tuple(false, 0x82A0, 2));
}

// ---- XML, HTML and JSON. --------------------------------------------------------------------

TEST(XmlEscaping, XmlAndHtmlTablesDifferInTheirQuotes) {
    EXPECT_EQ(
        Xml("<a href=\"x\">'&'</a>", [](String& s) { return String::EscapeXmlChars(s, false); }),
        "&lt;a href=\"x\"&gt;'&amp;'&lt;/a&gt;");
    EXPECT_EQ(Xml("it's", [](String& s) { return String::EscapeXmlChars(s, true); }), "it&apos;s");
    EXPECT_EQ(Xml("<\"'&>", String::EscapeHtmlChars), "&lt;&quot;'&amp;&gt;");
}

TEST(XmlEscaping, UnescapeReadsNamedEntitiesAndAsciiReferencesInOnePass) {
    EXPECT_EQ(Xml("&lt;&gt;&amp;&apos;&quot;&#65;&#x42;&#x7f;&amp;lt;", String::UnEscapeXmlChars),
              "<>&'\"AB\x7f&lt;");
    char const* unknown = "&nbsp; &#233; &#x100; & &#; &#x; &#65 &LT; &#0; &#X41;";
    DynamicString s(unknown);
    EXPECT_FALSE(String::UnEscapeXmlChars(s));
    EXPECT_STREQ(s.GetBufferReadPtr(), unknown);
}

TEST(XmlEscaping, ValidValueEscapesSpecialCharsOnlyWhenIllegalOnesArePresent) {
    EXPECT_FALSE(DynamicString("a\tb\nc\r\x7f\xff").ContainsIllegalXMLChar(false));
    EXPECT_TRUE(DynamicString("a\tb").ContainsIllegalXMLChar(true));
    EXPECT_TRUE(DynamicString("a\x01").ContainsIllegalXMLChar(false));

    DynamicString legal("a<b\r\n");
    bool escaped = true;
    EXPECT_TRUE(String::MakeValidXMLValue(legal, escaped, false));
    EXPECT_FALSE(escaped);
    EXPECT_STREQ(legal.GetBufferReadPtr(), "a&lt;b&#13;\n");

    DynamicString illegal("x\x01\\<'\r");
    EXPECT_TRUE(String::MakeValidXMLValue(illegal, escaped, true));
    EXPECT_TRUE(escaped);
    EXPECT_STREQ(illegal.GetBufferReadPtr(), "x\\x01\\\\&lt;&apos;\\r");
}

TEST(XmlEscaping, ValidAttributeWritesReferencesForLayoutAndControlCharacters) {
    EXPECT_EQ(
        Xml("a'b\"c\t\n\r\x01&<", [](String& s) { return String::MakeValidXMLAttribute(s, true); }),
        "a&apos;b\"c&#9;&#10;&#13;&#x01;&amp;&lt;");
}

TEST(JsonEscaping, UsesFourUpperCaseHexDigitsForControlCharacters) {
    EXPECT_EQ(
        Applied("a\"b\\c\n\x01\x1f\x7f/\xE9", [](String& s) { s.EscapeSpecialCharsForJSON(); }),
        "a\\\"b\\\\c\\u000A\\u0001\\u001F\x7f/\xE9");
}

// ---- Quoting. -------------------------------------------------------------------------------

TEST(Quoting, QuoteFamilyBuildsLiterals) {
    EXPECT_EQ(Applied("a", [](String& s) { s.Quote(); }), "\"a\"");
    EXPECT_EQ(Applied("a\"\t", [](String& s) { s.EscapeQuotesAndQuote(); }), "\"a\\\"\t\"");
    EXPECT_EQ(Applied("a\"\t", [](String& s) { s.EscapeAndQuote(); }), "\"a\\\"\\t\"");
}

TEST(Quoting, OnlyTextsWhoseOpeningQuoteClosesAtTheEndAreUnquoted) {
    for (char const* yes : {"\"a\"", "\"\"", "\"a\\\\\"", "\"a\\\"b\""})
        EXPECT_TRUE(DynamicString(yes).IsSurroundedByQuotes()) << yes;
    for (char const* no : {"\"", "\"a\" + \"b\"", "\"a\\\"", "a\"", "\"a", ""}) {
        DynamicString s(no);
        EXPECT_FALSE(s.IsSurroundedByQuotes()) << no;
        EXPECT_FALSE(s.RemoveQuotesAndUnescape()) << no;
        EXPECT_STREQ(s.GetBufferReadPtr(), no);
    }
    EXPECT_EQ(Applied("\"a\\tb\\\"c\"", [](String& s) { s.RemoveQuotesAndUnescape(); }), "a\tb\"c");
    EXPECT_EQ(Applied("\"a\\tb\"", [](String& s) { s.RemoveSurroundingQuotes(); }), "a\\tb");
}
