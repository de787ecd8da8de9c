// Escaping and quoting: the escape tables, XML, HTML and JSON, and round trips over thousands
// of random texts of every non-NUL byte with multibyte mode off and on.
#include "support/MultiByteFixture.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StringVector.h"

#include <gtest/gtest.h>

#include <random>
#include <string>
#include <tuple>

namespace tekit {
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

constexpr int kRounds = 3000;

class EscapeRoundTrip : public tekit::testing::BothByteModes {
protected:
    /// Bytes 1 to 255, one in three from the characters that the escapers care about.
    std::string AnyText() {
        static char const kSpecial[] = "\\\"'<>&\t\n\r\x01\x1f\x7f;#x0aA,|";
        std::string text(static_cast<size_t>(Below(41)), '\0');
        for (char& c : text)
            c = Below(3) == 0 ? kSpecial[Below(sizeof kSpecial - 1)]
                              : static_cast<char>(1 + Below(255));
        return text;
    }

    /// As AnyText, but every Shift-JIS lead byte has a valid trail byte: only such text can
    /// carry a delimiter or a closing quote right after any character.
    std::string WellFormedText() {
        std::string out;
        for (char c : AnyText()) {
            auto const b = static_cast<unsigned char>(c);
            out += c;
            if ((b >= 0x81 && b <= 0x9F) || (b >= 0xE0 && b <= 0xFC))
                out += static_cast<char>(Below(2) ? 0x40 + Below(0x3F) : 0x80 + Below(0x7D));
        }
        return out;
    }

    int Below(size_t n) {
        return std::uniform_int_distribution<int>(0, static_cast<int>(n) - 1)(m_random);
    }

    std::mt19937 m_random{20240611u};
};

std::string Str(String const& s) {
    return s.GetBufferReadPtr();
}

TEST_P(EscapeRoundTrip, SpecialCharsAndQuotedLiteralsComeBack) {
    for (int i = 0; i < kRounds; ++i) {
        std::string const original = AnyText();
        for (bool keepLayout : {false, true}) {
            DynamicString s(original.c_str());
            s.EscapeSpecialChars(keepLayout);
            if (!GetParam() && !keepLayout) {
                for (char c : Str(s))
                    ASSERT_GE(static_cast<unsigned char>(c), 0x20) << original;
            }
            s.UnescapeSpecialChars(keepLayout);
            ASSERT_EQ(Str(s), original) << "keepLayout " << keepLayout;
        }
        // A quoted literal needs text well formed in its code page: after a dangling lead
        // byte the closing quote would be taken for a trail byte.
        std::string const literal = WellFormedText();
        DynamicString escaped(literal.c_str()), quoted(literal.c_str());
        escaped.EscapeAndQuote();
        quoted.EscapeQuotesAndQuote();
        ASSERT_TRUE(escaped.RemoveQuotesAndUnescape() && quoted.RemoveQuotesAndUnescape());
        ASSERT_EQ(Str(escaped), literal);
        ASSERT_EQ(Str(quoted), literal);
    }
}

TEST_P(EscapeRoundTrip, XmlHtmlValuesAndAttributesComeBack) {
    for (int i = 0; i < kRounds; ++i) {
        std::string const original = AnyText();
        for (int family = 0; family < 5; ++family) {
            DynamicString s(original.c_str());
            bool escaped = false;
            switch (family) {
            case 0:
            case 1:
                String::EscapeXmlChars(s, family == 1);
                break;
            case 2:
                String::EscapeHtmlChars(s);
                break;
            case 3:
                String::MakeValidXMLValue(s, escaped, true);
                ASSERT_FALSE(s.ContainsIllegalXMLChar(false));
                break;
            default:
                String::MakeValidXMLAttribute(s, i % 2 == 0);
                ASSERT_FALSE(s.ContainsIllegalXMLChar(true));
            }
            if (!GetParam()) {
                ASSERT_EQ(Str(s).find_first_of("<>"), std::string::npos);
            }
            String::UnEscapeXmlChars(s);
            if (escaped)
                s.UnescapeSpecialChars(true);
            ASSERT_EQ(Str(s), original) << "family " << family;
        }
    }
}

TEST_P(EscapeRoundTrip, CommaSeparatedTextComesBack) {
    for (int i = 0; i < kRounds; ++i) {
        StringVector items, back;
        for (int n = Below(6); n > 0; --n)
            items.emplace_back(WellFormedText().c_str());
        char const delimiter = ",;\t|"[Below(4)];
        DynamicString csv;
        items.CreateCSVString(csv, delimiter);
        back.SetFromCSVString(csv, delimiter);
        ASSERT_EQ(back.size(), items.size()) << Str(csv);
        for (size_t k = 0; k < items.size(); ++k)
            ASSERT_EQ(Str(back[k]), Str(items[k])) << Str(csv);
    }
}

INSTANTIATE_TEST_SUITE_P(MultiByteMode, EscapeRoundTrip, ::testing::Bool(),
                         [](auto const& info) { return info.param ? "ShiftJis" : "SingleByte"; });

} // namespace
} // namespace tekit
