// The Windows-only side of the string family: _bstr_t, BSTR and UTF-16 wide text, converted
// through the code page of the lead-byte table.
#ifdef _WIN32

#include "TextItems.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/MultiByte.h"
#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>
#if TEKIT_HAS_OLE
#include <comdef.h> // the _bstr_t, BSTR and SAFEARRAY cases
#endif

#include <string>

namespace tekit {
namespace {

using testing::Text;

/// Each test picks the code page its bytes are written in and gets the process's back after.
class WindowsStringTest : public ::testing::Test {
protected:
    void SetUp() override { m_savedCodePage = GetMultiByteCodePage(); }
    void TearDown() override {
        String::EnableMultiByteSupport(false);
        SetMultiByteCodePage(m_savedCodePage);
    }
    unsigned m_savedCodePage = 0;
};

/// Owns a BSTR the library allocated.
struct SysString {
    BSTR value;
    ~SysString() { SysFreeString(value); }
    std::wstring Wide() const { return std::wstring(value ? value : L"", SysStringLen(value)); }
};

TEST_F(WindowsStringTest, TheCodePageStartsAsTheProcessAnsiCodePage) {
    EXPECT_EQ(m_savedCodePage, GetACP());
}

TEST_F(WindowsStringTest, BstrTextRoundTripsThroughTheCodePage) {
    SetMultiByteCodePage(932);
    _bstr_t const hiragana(L"x\x3042y");
    DynamicString fromBstr(hiragana);
    EXPECT_EQ(Text(fromBstr), "x\x82\xA0y");

    _bstr_t const back = fromBstr;
    EXPECT_EQ(std::wstring(static_cast<wchar_t const*>(back)), L"x\x3042y");

    DynamicString assigned("old", true);
    assigned.Assign(_bstr_t(L"\x3042"));
    assigned += _bstr_t(L"!");
    EXPECT_EQ(Text(assigned), "\x82\xA0!");
}

TEST_F(WindowsStringTest, NarrowAndNullBstrs) {
    // _bstr_t's narrow constructor and conversion rely on helpers the library provides.
    _bstr_t const narrow("text");
    EXPECT_EQ(std::wstring(static_cast<wchar_t const*>(narrow)), L"text");
    EXPECT_STREQ(static_cast<char const*>(_bstr_t(L"wide")), "wide");
    EXPECT_EQ(_bstr_t(static_cast<char const*>(nullptr)).length(), 0u);
    EXPECT_EQ(Text(DynamicString(narrow)), "text");

    DynamicString s{_bstr_t()};
    EXPECT_EQ(s.GetNumBytes(), 0);
    s = "keep";
    s += _bstr_t();
    s += static_cast<wchar_t const*>(nullptr);
    EXPECT_EQ(Text(s), "keep");
    SysString empty{DynamicString().AllocSysString()};
    EXPECT_EQ(SysStringLen(empty.value), 0u);
}

TEST_F(WindowsStringTest, AllocSysStringHoldsTheWholeTextInWideCharacters) {
    SetMultiByteCodePage(932);
    DynamicString const text("a\x82\xA0"
                             "b",
                             true);
    SysString bstr{text.AllocSysString()};
    EXPECT_EQ(bstr.Wide(), L"a\x3042"
                           L"b");

    SetMultiByteCodePage(1252);
    SysString euro{DynamicString("\x80", true).AllocSysString()};
    EXPECT_EQ(euro.Wide(), L"\x20AC");
}

TEST_F(WindowsStringTest, CodePageZeroIsLatin1RatherThanTheAnsiCodePage) {
    SetMultiByteCodePage(0);
    SysString bstr{DynamicString("\x80\xE9", true).AllocSysString()};
    EXPECT_EQ(bstr.Wide(), L"\x0080\x00E9");
    DynamicString const narrow(L"\x20AC\x00E9");
    EXPECT_EQ(Text(narrow), "?\xE9");
}

TEST_F(WindowsStringTest, WideCharactersTheCodePageLacksBecomeOneQuestionMark) {
    SetMultiByteCodePage(1252);
    // A surrogate pair is one character; best fit would have made the Greek alpha an 'a'.
    DynamicString const text(L"<\xD83D\xDE00|\x03B1>");
    EXPECT_EQ(Text(text), "<?|?>");
    StaticString<64> fixed;
    fixed.Assign(L"caf\x00E9");
    EXPECT_EQ(Text(fixed), "caf\xE9");
}

TEST_F(WindowsStringTest, Utf8TextCrossesTheCodePageAndSurrogatePairs) {
    SetMultiByteCodePage(1252);
    DynamicString const euro("\x80", true);
    char buffer[16] = {};
    long length = 0;
    char* utf8 = euro.AllocUTF8(buffer, sizeof buffer, &length);
    EXPECT_EQ(std::string(utf8, size_t(length)), "\xE2\x82\xAC");
    if (utf8 != buffer)
        String::FreeUTF8(utf8);
    DynamicString text;
    text.AssignFromUTF8("\xE2\x82\xAC", -1);
    EXPECT_EQ(Text(text), "\x80");

    // U+1F600 is a surrogate pair in UTF-16 and must stay one character in UTF-8 text.
    SetMultiByteCodePage(65001);
    text.AssignFromUTF8("<\xF0\x9F\x98\x80>", -1);
    EXPECT_EQ(Text(text), "<\xF0\x9F\x98\x80>");
    SysString bstr{text.AllocSysString()};
    EXPECT_EQ(bstr.Wide(), L"<\xD83D\xDE00>");
}

} // namespace
} // namespace tekit

#endif // _WIN32
