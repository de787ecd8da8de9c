// The storage kinds that cannot grow (StaticString, BufferString) and the storage-independent
// behaviour of String: measures, the size cache, characters, comparison and obscuring.
#include "MultiByteFixture.h"

#include "tekit/errors/DiagnosticLevel.h"
#include "tekit/errors/TEException.h"
#include "tekit/strings/BufferString.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <iterator>
#include <set>
#include <string>

namespace tekit {
namespace {

using StringTest = testing::MultiByteFixture;

std::string Text(String const& s) {
    return s.GetBufferReadPtr();
}

TEST(StaticStringTruncation, KeepsExactlyNBytesAndCutsTheRest) {
    std::string const exact(64, 'x');
    StaticString<64> full(exact.c_str());
    EXPECT_EQ(Text(full), exact);
    EXPECT_EQ(full.GetNumBytes(), 64);

    StaticString<64> over((exact + "y").c_str());
    EXPECT_EQ(Text(over), exact);

    StaticString<256> big;
    big = std::string(300, 'z').c_str();
    EXPECT_EQ(big.GetNumBytes(), 256);
    big += "more";
    EXPECT_EQ(big.GetNumBytes(), 256);
    EXPECT_EQ(big.GetBufferSize(), 256);

    StaticString<260> path("C:\\dir");
    path += "\\file.txt";
    EXPECT_EQ(Text(path), "C:\\dir\\file.txt");
    StaticString<1024> copy(path);
    EXPECT_EQ(Text(copy), Text(path));
}

TEST_F(StringTest, MultibyteTruncationNeverLeavesHalfACharacter) {
    UseShiftJis();
    std::string const text = std::string(63, 'a') + "\x82\xA0" + "b";
    StaticString<64> fixed(text.c_str());
    EXPECT_EQ(fixed.GetNumBytes(), 63);
    EXPECT_EQ(fixed.GetNumChars(), 63);

    StaticString<64> appended(std::string(62, 'a').c_str());
    appended += "\x82\xA0\x82\xA2";
    EXPECT_EQ(Text(appended), std::string(62, 'a') + "\x82\xA0");

    char buffer[4];
    BufferString inBuffer(buffer, "\x82\xA0\x82\xA2", sizeof buffer);
    EXPECT_EQ(Text(inBuffer), "\x82\xA0");

    DynamicString limited;
    limited.Assign("\x82\xA0"
                   "a\x82\xA2",
                   2, false);
    EXPECT_EQ(Text(limited), "\x82\xA0"
                             "a");
    limited.AssignUsingNumBytesInsteadOfNumChars("\x82\xA0"
                                                 "a\x82\xA2",
                                                 4, false);
    EXPECT_EQ(Text(limited), "\x82\xA0"
                             "a");
}

TEST_F(StringTest, ByteLimitsCountBytesInSingleByteMode) {
    SetMultiByteCodePage(932); // lead bytes known, but the mode is off: one byte, one char
    DynamicString s;
    s.Assign("\x82\xA0"
             "abc",
             3, false);
    EXPECT_EQ(s.GetNumBytes(), 3);
    EXPECT_EQ(s.GetNumChars(), 3);
    s.Assign("abc", 0, false);
    EXPECT_TRUE(s.IsEmpty());
    s.Assign("abcdef", -1, false);
    EXPECT_EQ(Text(s), "abcdef");
}

TEST(BufferStringStorage, WritesStayInsideTheCallersBuffer) {
    char buffer[8 + 1];
    buffer[8] = '#'; // a guard byte just past the declared size
    BufferString s(buffer, "0123456789", 8);
    EXPECT_EQ(Text(s), "0123456");
    s += "abc";
    EXPECT_EQ(s.GetNumBytes(), 7);
    s.InsertChar('X', 0);
    EXPECT_EQ(Text(s), "X012345");
    EXPECT_EQ(buffer[8], '#');
}

TEST(BufferStringStorage, UnknownSizeIsTheTextAndItsTerminator) {
    char buffer[32] = "hello";
    BufferString s(buffer, -1);
    EXPECT_EQ(s.GetBufferSize(), 6);
    EXPECT_EQ(s.RequestBufferSize(100, true, false), 6);
    s = "a much longer text";
    EXPECT_EQ(Text(s), "a muc");
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

TEST(BufferStringStorage, ReadOnlyBufferRaisesOnWrite) {
    static char const kText[] = "constant";
    BufferString view(kText, -1);
    EXPECT_TRUE(view.GetReadOnly());
    EXPECT_EQ(view.GetNumBytes(), 8);
    EXPECT_EQ(view.Compare("constant"), 0);
    try {
        view = "other";
        FAIL() << "no exception";
    } catch (TEException const& e) {
        EXPECT_EQ(e.GetErrorCode(), TE_PROGRAM_ERROR);
        EXPECT_STREQ(e.GetFunctionName(), "BufferString::GetBufferWritePtr");
    }
    EXPECT_STREQ(kText, "constant");
}

TEST(StringSizeCache, StaleAfterGetPtrUntilReleasePtr) {
    DynamicString s("abcdef", true);
    char* p = s.GetPtr(2);
    EXPECT_EQ(*p, 'c');
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
    s.Assign(null);
    EXPECT_TRUE(s.IsEmpty());
    EXPECT_EQ(s.Compare(null), 0);
    EXPECT_GT(DynamicString("a", true).Compare(null), 0);
    StaticString<64> fixed(null);
    EXPECT_TRUE(fixed.IsEmpty());
    BufferString none;
    EXPECT_TRUE(none.IsEmpty());
    none = "nowhere to go";
    EXPECT_TRUE(none.IsEmpty());
}

TEST_F(StringTest, CharactersAndIndicesCountDoubleByteCharacters) {
    UseShiftJis();
    DynamicString s("a\x82\xA0"
                    "b",
                    true);
    EXPECT_EQ(s.GetNumBytes(), 4);
    EXPECT_EQ(s.GetNumChars(), 3);
    EXPECT_EQ(s.GetChar(1), 0x82A0);
    EXPECT_EQ(s.GetChar(3), 0);
    EXPECT_EQ(s.GetChar(-1), 0);
    EXPECT_EQ(s.CharToByteIndex(2), 3);
    EXPECT_EQ(s.ByteToCharIndex(2), 1); // inside the double-byte character
    EXPECT_EQ(s.ByteToCharIndex(3), 2);
    EXPECT_EQ(s.GetLastChar(), 'b');

    s.SetChar(1, 'x'); // two bytes become one
    EXPECT_EQ(Text(s), "axb");
    s.MBSetChar(0, 0x82A2); // one byte becomes two
    EXPECT_EQ(Text(s), "\x82\xA2"
                       "xb");
    s.InsertChar(0x82A0, 3);
    s.AppendChar('!');
    EXPECT_EQ(Text(s), "\x82\xA2"
                       "xb\x82\xA0!");
    EXPECT_EQ(s.GetNumChars(), 5);
    s.SetChar(42, 'z'); // outside the text: nothing
    s.SetChar(1, 0);    // NUL ends the text
    EXPECT_EQ(Text(s), "\x82\xA2");
    EXPECT_EQ(s.GetNumBytes(), 2);
    EXPECT_EQ(s.GetLastChar(), 0x82A2);
    EXPECT_TRUE(s.IsPtrToLastChar(reinterpret_cast<unsigned char const*>(s.GetBufferReadPtr())));
}

TEST(StringCharacters, SingleByteModeCountsBytes) {
    DynamicString s("abc", true);
    s.SetChar(1, 'B');
    s.InsertChar('0', -5);
    s.InsertChar('9', 99);
    EXPECT_EQ(Text(s), "0aBc9");
    EXPECT_EQ(s.GetLastChar(), '9');
    EXPECT_EQ(s.GetFirstChar(), '0');
    EXPECT_EQ(s.CharToByteIndex(99), 5);
    DynamicString empty;
    EXPECT_EQ(empty.GetLastChar(), 0);
    EXPECT_EQ(*empty.GetLastCharPtr(), '\0');
    EXPECT_FALSE(
        empty.IsPtrToLastChar(reinterpret_cast<unsigned char const*>(empty.GetLastCharPtr())));
}

TEST(StringComparison, OwnBufferIsEqualWithoutBeingRead) {
    DynamicString s("abc", true);
    // A start index would otherwise make these differ: the result comes before any reading.
    EXPECT_EQ(s.Compare(s.GetBufferReadPtr(), false, -1, 2), 0);
    EXPECT_EQ(s.Compare(s, true, 1, 1), 0);
}

TEST(StringComparison, BytesCompareUnsignedAndCaseFoldsAsciiOnly) {
    DynamicString s("abc", true);
    EXPECT_LT(s.Compare("abd"), 0);
    EXPECT_GT(s.Compare("ab"), 0);
    EXPECT_LT(s.Compare("ab\xE4"), 0); // 0xE4 is above every ASCII byte
    EXPECT_EQ(s.Compare("ABC", true), 0);
    EXPECT_NE(s.Compare("ABC"), 0);
    EXPECT_EQ(s.Compare("abX", false, 2), 0);
    EXPECT_EQ(s.Compare("BC", true, -1, 1), 0);
    EXPECT_EQ(s.Compare("", false, -1, 10), 0); // the start is clamped to the end
    DynamicString latin("\xC4", true);          // Latin-1 A-umlaut: no case in the "C" locale
    EXPECT_NE(latin.Compare("\xE4", true), 0);
    EXPECT_TRUE(DynamicString("a", true) < DynamicString("b", true));
    EXPECT_TRUE(DynamicString("b", true) >= "a");
    EXPECT_TRUE(DynamicString("[", true).Compare("a", true) < 0); // '[' sorts before letters
}

TEST_F(StringTest, MultibyteComparisonOrdersByCharacterValue) {
    SetMultiByteCodePage(932);
    DynamicString kana("\xA1", true); // a single-byte character above every lead byte 0x81
    EXPECT_GT(kana.Compare("\x81\x40"), 0);
    String::EnableMultiByteSupport(true);
    EXPECT_LT(kana.Compare("\x81\x40"), 0);
    DynamicString s("\x82\x61"
                    "A",
                    true); // trail byte 'a' is not a letter here
    EXPECT_NE(s.Compare("\x82\x41"
                        "a",
                        true),
              0);
    EXPECT_EQ(s.Compare("\x82\x61"
                        "a",
                        true),
              0);
    EXPECT_EQ(s.Compare("\x82\x61"
                        "Z",
                        false, 1),
              0);
    EXPECT_EQ(s.Compare("a", true, -1, 1), 0);
}

TEST(StringComparison, PointerOrderingsSortContainers) {
    DynamicString b("b", true), a("A", true), c("c", true);
    std::set<String const*, StringPtrLessThanNoCase> noCase{&b, &c, &a};
    EXPECT_EQ(*noCase.begin(), &a);
    std::set<String const*, StringPtrLessThan> exact{&b, &c, &a};
    EXPECT_EQ(*exact.begin(), &a); // 'A' < 'b'
    EXPECT_EQ(*std::prev(exact.end()), &c);
    EXPECT_TRUE(StringPtrLessThan()(nullptr, &a));
    EXPECT_FALSE(StringPtrLessThan()(&a, nullptr));
}

TEST(StringScramble, RoundTripsEveryByteAndNeverMakesANul) {
    std::string all;
    for (int round = 0; round < 3; ++round)
        for (int c = 1; c < 256; ++c)
            all.push_back(static_cast<char>(c));
    DynamicString s(all.c_str(), true);
    s.Scramble();
    EXPECT_EQ(s.GetNumBytes(), int(all.size()));
    EXPECT_EQ(std::strlen(s.GetBufferReadPtr()), all.size());
    EXPECT_NE(Text(s), all);
    s.Unscramble();
    EXPECT_EQ(Text(s), all);

    StaticString<64> fixed("password");
    fixed.Scramble();
    EXPECT_NE(Text(fixed), "password");
    fixed.Unscramble();
    EXPECT_EQ(Text(fixed), "password");
}

TEST(StringAssertion, RaisesProgramErrorNamingTheFunction) {
    int const level = OrvaneMiscUtil::GetDiagnosticLevel();
    OrvaneMiscUtil::SetDiagnosticLevel(1);
    try {
        String::ThrowStringAssertion("index >= 0", "String::Something");
        FAIL() << "no exception";
    } catch (TEException const& e) {
        EXPECT_EQ(e.GetErrorCode(), TE_PROGRAM_ERROR);
        EXPECT_STREQ(e.GetFunctionName(), "String::Something");
        EXPECT_NE(std::string(e.GetDescription()).find("index >= 0"), std::string::npos);
    }
    OrvaneMiscUtil::SetDiagnosticLevel(level);
}

} // namespace
} // namespace tekit
