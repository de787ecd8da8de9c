// Round trips over thousands of random texts of every non-NUL byte, with multibyte mode off
// and on (Shift-JIS lead bytes): whatever an escaper writes, its reader gives back.
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StringVector.h"

#include "support/MultiByteFixture.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

using namespace tekit;

namespace {

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

} // namespace

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
