#include "PathTestSupport.h"
#include "support/MultiByteFixture.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"
#include "tekit/paths/PathVector.h"
#include "tekit/strings/StringVector.h"

#include <gtest/gtest.h>
#if TEKIT_HAS_OLE
#include <comdef.h> // the _bstr_t cases
#endif

#include <string>
#include <utility>

namespace tekit {
namespace {

TEST(PathStorage, FixedPathsCutAt260CharactersAndDynamicOnesKeepEverything) {
    std::string const text = "C:\\" + std::string(297, 'a');
    Path const fixed(text.c_str());
    EXPECT_EQ(std::string(fixed.CStr()), text.substr(0, 260));
    DynamicPath const dynamic(text.c_str());
    EXPECT_EQ(std::string(dynamic.CStr()), text);
    EXPECT_EQ(std::string(StaticPath(dynamic).CStr()), text.substr(0, 260));

    // The separator that normalisation inserts pushes the last character out.
    std::string const driveRelative = "C:" + std::string(258, 'b');
    EXPECT_EQ(std::string(Path(driveRelative.c_str()).CStr()), "C:\\" + std::string(257, 'b'));
}

class PathStorageMultiByte : public tekit::testing::MultiByteFixture {};

TEST_F(PathStorageMultiByte, CutNeverSplitsADoubleByteCharacter) {
    UseShiftJis();
    std::string const text = "C:\\" + std::string(256, 'a') + "\x82\xA0" + "z";
    EXPECT_EQ(std::string(Path(text.c_str()).CStr()), text.substr(0, 259));
}

TEST(PathStorage, CopiesAndMovesAreIndependentValues) {
    Path original("C:\\a\\f.txt");
    Path copy(original);
    copy.SetExtension("bak");
    EXPECT_STREQ(original.CStr(), "C:\\a\\f.txt");
    Path moved(std::move(copy));
    EXPECT_STREQ(moved.CStr(), "C:\\a\\f.bak");
    Path assigned;
    assigned = moved;
    assigned = std::move(moved);
    EXPECT_STREQ(assigned.CStr(), "C:\\a\\f.bak");
    assigned = DynamicString("x:y", true);
    EXPECT_STREQ(assigned.CStr(), "x:\\y");
    assigned = DynamicPath("d:\\e");
    assigned.SetPathName(assigned);
    EXPECT_STREQ(assigned.CStr(), "d:\\e");

    DynamicPath dynamic("C:\\x");
    DynamicPath sharing(dynamic);
    sharing.Append("y");
    EXPECT_STREQ(dynamic.CStr(), "C:\\x");
    EXPECT_STREQ(sharing.CStr(), "C:\\x\\y");
    DynamicString name;
    sharing.GetPathName(name);
    EXPECT_EQ(name, "C:\\x\\y");
}

TEST(PathComparison, EqualityAndOrderIgnoreCase) {
    Path const path("C:\\Dir\\File.TXT");
    EXPECT_TRUE(path == Path("c:\\dir\\file.txt"));
    EXPECT_TRUE(path == DynamicString("C:\\DIR\\FILE.txt", true));
    EXPECT_TRUE(path != "c:\\dir\\file.txt ");
    EXPECT_TRUE(path != static_cast<char const*>(nullptr));
    EXPECT_TRUE(Path() == static_cast<char const*>(nullptr));
    EXPECT_TRUE(path.ShortPathNameAwareEquals("C:\\dir\\file.txt", false));
}

TEST(PathComparison, TheOrderedSetHoldsOnePathPerCaseInsensitiveText) {
    PathBase::PathSet set;
    set.insert(Path("C:\\b"));
    set.insert(Path("c:\\A"));
    set.insert(Path("C:\\a"));
    set.insert(Path("C:\\B\\x"));
    ASSERT_EQ(set.size(), 3u);
    auto it = set.begin();
    EXPECT_STREQ((it++)->CStr(), "c:\\A");
    EXPECT_STREQ((it++)->CStr(), "C:\\b");
    EXPECT_STREQ((it++)->CStr(), "C:\\B\\x");
}

TEST(PathVectors, ConvertElementWiseToAndFromStringVectors) {
    StringVector texts;
    texts.emplace_back("C:x", true);
    texts.emplace_back("", true);
    PathBase::PathVector paths;
    paths.emplace_back("stale");
    paths.SetFromStringVector(texts);
    ASSERT_EQ(paths.size(), 2u);
    EXPECT_STREQ(paths[0].CStr(), "C:\\x"); // normalised on the way in

    StringVector back;
    back.emplace_back("stale", true);
    paths.CreateStringVector(back);
    ASSERT_EQ(back.size(), 2u);
    EXPECT_EQ(back[0], "C:\\x");
    EXPECT_EQ(back[1], "");
}

TEST(PathInExceptions, HelpFileTravelsAsAPath) {
    TEException e;
    e.SetWinHelpFile(Path("C:help\\station.chm"));
    EXPECT_STREQ(e.GetWinHelpFile(), "C:\\help\\station.chm");
    Path helpFile("stale");
    e.GetWinHelpFile(helpFile);
    EXPECT_STREQ(helpFile.CStr(), "C:\\help\\station.chm");
}

using tekit::testing::TextOf;

std::string Abbreviated(char const* text, int maxChars) {
    return TextOf([&](String& out) { DynamicPath(text).GetAbbreviatedName(maxChars, out); });
}

std::string LongForm(char const* text) {
    return TextOf(
        [&](String& out) { PathBase::ConvertForLongPathCalls(DynamicString(text, true), out); });
}

TEST(PathAbbreviation, MiddleLevelsGiveWayFromTheFront) {
    char const* const path = "C:\\first\\m1\\m2\\m3\\file.txt"; // 26 characters
    EXPECT_EQ(Abbreviated(path, 26), path);
    EXPECT_EQ(Abbreviated(path, 24), "C:\\first\\...\\m3\\file.txt");
    EXPECT_EQ(Abbreviated(path, 21), "C:\\first\\...\\file.txt");
    EXPECT_EQ(Abbreviated(path, 20), "C:\\...\\file.txt"); // then the first level goes too
    EXPECT_EQ(Abbreviated("\\\\srv\\share\\a\\b\\c\\f.txt", 22), "\\\\srv\\share\\...\\f.txt");
    EXPECT_EQ(Abbreviated("a\\b\\c\\d\\f.txt", 10), "...\\f.txt");
}

TEST(PathAbbreviation, ATooLongFileNameStandsAlone) {
    EXPECT_EQ(Abbreviated("C:\\a\\b\\verylongname.txt", 10), "verylongname.txt");
    EXPECT_EQ(Abbreviated("C:\\aaa\\bbb\\file12.txt", 16), "file12.txt"); // 10 + 4 + 3 >= 16
    EXPECT_EQ(Abbreviated("C:\\a\\b", -1), "b");
    EXPECT_EQ(Abbreviated("\\\\machine-name-only", 5), "machine-name-only");
}

TEST(PathAbbreviation, DirectoryTextsKeepTheirLastLevel) {
    EXPECT_EQ(Abbreviated("C:\\first\\second\\third\\", 18), "C:\\...\\third\\");
    EXPECT_EQ(Abbreviated("C:\\first\\a-very-long-last-level\\", 20), "a-very-long-last-level\\");
}

class PathAbbreviationMultiByte : public tekit::testing::MultiByteFixture {};

TEST_F(PathAbbreviationMultiByte, CountsCharactersNotBytes) {
    UseShiftJis();
    // 14 characters, 19 bytes: fits in 14.
    std::string const path = "C:\\\x82\xA0\x82\xA0\\\x82\xA0\x82\xA0\\\x82\xA0.txt";
    EXPECT_EQ(Abbreviated(path.c_str(), 14), path);
    EXPECT_EQ(Abbreviated(path.c_str(), 13), "C:\\...\\\x82\xA0.txt");
}

TEST(PathForwardSlashes, AbsolutePathsOnly) {
    EXPECT_STREQ(Path("C:\\dir\\f.c").GetCRXStylePathString(), "/C/dir/f.c");
    EXPECT_STREQ(Path("\\\\srv\\sh\\f").GetCRXStylePathString(), "//srv/sh/f");
    EXPECT_STREQ(Path("\\dir").GetCRXStylePathString(), "");
    // One buffer for every call: the next call overwrites the text.
    char const* const first = Path("C:\\a").GetCRXStylePathString();
    char const* const second = Path("D:\\b").GetCRXStylePathString();
    EXPECT_EQ(first, second);
    EXPECT_STREQ(first, "/D/b");
}

TEST(PathLongForm, PrefixesAreAddedWithoutLookingAtTheText) {
    EXPECT_EQ(LongForm("C:\\dir\\f.txt"), "\\\\?\\C:\\dir\\f.txt");
    EXPECT_EQ(LongForm("\\\\srv\\share\\f"), "\\\\?\\UNC\\srv\\share\\f");
    EXPECT_EQ(LongForm("\\\\?\\C:\\f"), "\\\\?\\UNC\\?\\C:\\f"); // converted again
    EXPECT_EQ(LongForm("rel/f"), "\\\\?\\rel/f");
}

TEST(PathLongForm, WideFormForTheSystemCalls) {
    std::string const deep = "C:\\" + std::string(300, 'd') + "\\f";
#if TEKIT_HAS_OLE
    _bstr_t const wide = PathBase::ConvertForLongPathCalls(DynamicString(deep.c_str(), true));
    std::wstring const text(static_cast<wchar_t const*>(wide), wide.length());
#else
    std::wstring const text = PathBase::ConvertForLongPathCalls(DynamicString(deep.c_str(), true));
#endif
    std::wstring const expected = L"\\\\?\\C:\\" + std::wstring(300, L'd') + L"\\f";
    EXPECT_TRUE(text == expected);
}

#if defined(_WIN32)

/// Width of `text` in the memory device context's default font, as the library measures it.
long Width(char const* text) {
    HDC const dc = CreateCompatibleDC(nullptr);
    RECT area{0, 0, 0, 0};
    DrawTextA(dc, text, -1, &area, DT_CALCRECT | DT_SINGLELINE | DT_NOPREFIX);
    DeleteDC(dc);
    return area.right - area.left;
}

std::string Fitted(Path const& path, long width, bool cutFileName) {
    return TextOf(
        [&](String& out) { path.GetAbbreviatedNameToFit(width, out, nullptr, cutFileName); });
}

TEST(PathAbbreviationToFit, ShortensToAPixelWidth) {
    Path const path("C:\\first\\m1\\m2\\m3\\file.txt");
    ASSERT_GT(Width("C:\\first\\...\\file.txt"), Width("C:\\...\\file.txt"));
    EXPECT_EQ(Fitted(path, Width(path.CStr()), false), path.CStr());
    EXPECT_EQ(Fitted(path, Width("C:\\first\\...\\m3\\file.txt"), false),
              "C:\\first\\...\\m3\\file.txt");
    EXPECT_EQ(Fitted(path, Width("C:\\...\\file.txt"), false), "C:\\...\\file.txt");
    EXPECT_EQ(Fitted(path, 1, false), "file.txt");
    std::string const cut = Fitted(path, Width("fil..."), true);
    EXPECT_EQ(cut, "fil...");
    EXPECT_EQ(Fitted(path, 0, true), "...");
}
#endif

} // namespace
} // namespace tekit
