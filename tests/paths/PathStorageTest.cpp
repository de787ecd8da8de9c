#include "PathTestSupport.h"
#include "support/MultiByteFixture.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"
#include "tekit/paths/PathVector.h"
#include "tekit/strings/StringVector.h"

#include <string>
#include <utility>

using namespace tekit;

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
