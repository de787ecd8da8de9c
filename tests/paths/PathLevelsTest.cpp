#include "PathTestSupport.h"
#include "support/Raises.h"
#include "tekit/paths/Path.h"

#include <string>
#include <tuple>
#include <utility>

using namespace tekit;
using tekit::testing::TextOf;

namespace {

std::string Prefix(char const* text, long numLevels) {
    Path out("unchanged");
    bool const found = Path(text).GetPrefix(numLevels, out);
    return (found ? "" : "false:") + std::string(out.CStr());
}
std::string PrefixBefore(char const* text, char const* suffix) {
    Path out("unchanged");
    Path end(suffix);
    bool const found = Path(text).GetPrefix(end, out);
    return (found ? "" : "false:") + std::string(out.CStr());
}
std::string SuffixAfter(char const* text, char const* prefix) {
    Path out("unchanged");
    bool const found = Path(text).GetSuffix(Path(prefix), out);
    return (found ? "" : "false:") + std::string(out.CStr());
}
std::string UpTo(char const* text, long count) {
    return TextOf([&](String& out) { Path(text).GetUpToCntPathNameComponents(count, out); });
}

} // namespace

TEST(PathLevels, LevelsFollowTheRootAndATrailingSeparatorAddsNone) {
    // An empty level between two separators counts.
    std::pair<char const*, int> const levels[] = {
        {"C:\\", 0}, {"C:\\a\\", 1}, {"C:\\a\\\\b", 3}, {"\\\\srv\\share", 0}, {"a\\b", 2},
    };
    for (auto const& [text, count] : levels)
        EXPECT_EQ(Path(text).GetNumLevels(), count) << text;
    std::pair<char const*, int> const components[] = {
        {"C:\\a\\b", 3}, {"a\\b", 2}, {"\\\\srv\\share\\a", 2}, {"", 0}};
    for (auto const& [text, count] : components)
        EXPECT_EQ(Path(text).GetNumPathNameComponents(), count) << text;
}

TEST(PathLevels, LeadingComponentsCountTheRootAsOne) {
    EXPECT_EQ(UpTo("C:\\a\\b", -3), "");
    EXPECT_EQ(UpTo("C:\\a\\b", 1), "C:\\");
    EXPECT_EQ(UpTo("C:\\a\\b\\", 9), "C:\\a\\b");
    EXPECT_EQ(UpTo("a\\b\\c", 2), "a\\b");
    EXPECT_EQ(UpTo("\\\\srv\\sh\\a\\b", 2), "\\\\srv\\sh\\a");
}

TEST(PathLevels, PrefixOfSomeLevels) {
    EXPECT_EQ(Prefix("C:\\a\\b\\c", 0), "C:\\");
    EXPECT_EQ(Prefix("C:\\a\\b\\c", 2), "C:\\a\\b");
    EXPECT_EQ(Prefix("C:\\a\\b\\c", 4), "false:unchanged");
    EXPECT_EQ(Prefix("C:\\a\\b\\c", -1), "false:unchanged");
    EXPECT_EQ(Prefix("a\\b", 0), "");
    EXPECT_EQ(Prefix("\\\\srv\\sh\\a", 0), "\\\\srv\\sh");
}

TEST(PathLevels, PrefixBeforeASuffixAndSuffixAfterAPrefix) {
    EXPECT_EQ(PrefixBefore("C:\\a\\b\\c", "B\\c"), "C:\\a");
    EXPECT_EQ(PrefixBefore("C:\\a\\b\\c", "x\\c"), "false:unchanged");
    EXPECT_EQ(PrefixBefore("C:\\a\\b\\c", "c:\\A\\b\\c"), ""); // rooted: whole path
    EXPECT_EQ(PrefixBefore("C:\\a\\b\\c", "C:\\a"), "false:unchanged");

    EXPECT_EQ(SuffixAfter("C:\\a\\b\\c", "c:\\A"), "b\\c");
    EXPECT_EQ(SuffixAfter("C:\\a\\b\\c\\", "C:\\a\\"), "b\\c\\"); // the rest as written
    EXPECT_EQ(SuffixAfter("C:\\a\\b", "C:\\a\\b"), "");
    EXPECT_EQ(SuffixAfter("C:\\ab\\c", "C:\\a"), "false:unchanged"); // whole levels only
    EXPECT_EQ(SuffixAfter("C:\\a\\b", "a"), "false:unchanged");
    EXPECT_EQ(SuffixAfter("\\\\srv\\sh\\a", "\\\\SRV\\sh"), "a");
}

TEST(PathLevels, PrefixAndSuffixOfAnAbsolutePath) {
    Path const whole("C:\\a\\b\\c.txt");
    EXPECT_TRUE(Path("c:\\A\\").IsPrefixOfAbsolutePath(whole, false));
    EXPECT_TRUE(Path("C:\\").IsPrefixOfAbsolutePath(whole, false));
    EXPECT_FALSE(whole.IsPrefixOfAbsolutePath(whole, false));
    EXPECT_TRUE(whole.IsPrefixOfAbsolutePath(whole, true));
    EXPECT_FALSE(Path("a").IsPrefixOfAbsolutePath(whole, true));
    EXPECT_FALSE(Path("C:\\a\\b").IsPrefixOfAbsolutePath(Path("a\\b\\c"), true));

    EXPECT_TRUE(Path("b\\C.TXT").IsSuffixOfAbsolutePath(whole));
    EXPECT_FALSE(Path("a\\c.txt").IsSuffixOfAbsolutePath(whole));
    EXPECT_FALSE(Path("x\\a\\b\\c.txt").IsSuffixOfAbsolutePath(whole));
    EXPECT_TRUE(whole.IsSuffixOfAbsolutePath(whole));
    EXPECT_FALSE(Path("C:\\b\\c.txt").IsSuffixOfAbsolutePath(whole));
    EXPECT_FALSE(Path("").IsSuffixOfAbsolutePath(whole));
}

TEST(PathLevels, RootDirectoryIsADirectoryText) {
    std::pair<char const*, char const*> const roots[] = {
        {"C:\\a\\b", "C:\\"}, {"\\\\srv\\sh", "\\\\srv\\sh\\"}, {"\\a", "\\"}, {"a\\b", ""}};
    for (auto const& [text, root] : roots)
        EXPECT_STREQ(Path(text).GetRootDir().CStr(), root) << text;
}

TEST(PathLevels, CommonPrefixIsMadeOfWholeLevels) {
    std::tuple<char const*, char const*, char const*> const cases[] = {
        // clang-format off
        {"C:\\a\\b\\c", "c:\\A\\b\\d", "C:\\a\\b"}, {"C:\\ab", "C:\\abc", "C:\\"},
        {"C:\\a", "D:\\a", ""}, {"a\\b", "C:\\a\\b", ""},
        {"\\\\srv\\sh\\x", "\\\\srv\\sh\\y", "\\\\srv\\sh"},
        {"\\\\srv\\sh\\x", "\\\\srv\\other\\x", ""}, {"\\\\srv\\a\\b", "\\\\srv\\a", "\\\\srv\\a"},
        // clang-format on
    };
    for (auto const& [a, b, common] : cases)
        EXPECT_STREQ(PathBase::FindCommonPrefix(Path(a), Path(b)).CStr(), common) << a << " " << b;
}

TEST(PathLevels, DirectoryHoldsPathsAndLibraryEntries) {
    Path const directory("C:\\d");
    PathBase::VINamespaceInfo info;
    info.isInLibrary = true;
    info.entryName = "stale";
    EXPECT_TRUE(directory.DirectoryContainsPath(Path("C:\\D\\f.txt"), &info));
    EXPECT_FALSE(info.isInLibrary);
    EXPECT_STREQ(info.entryName.GetBufferReadPtr(), "");
    EXPECT_FALSE(directory.DirectoryContainsPath(Path("C:\\d\\s\\f.txt"), nullptr));
    EXPECT_FALSE(directory.DirectoryContainsPath(Path("C:\\dx\\f"), nullptr));

    EXPECT_TRUE(directory.DirectoryContainsPath(Path("C:\\d\\tools.LWB\\Main.vi"), &info));
    EXPECT_TRUE(info.isInLibrary);
    EXPECT_STREQ(info.libraryPath.GetBufferReadPtr(), "C:\\d\\tools.LWB");
    EXPECT_STREQ(info.entryName.GetBufferReadPtr(), "Main.vi");

    EXPECT_TRUE(directory.SubDirectoryContainsPath(Path("C:\\d\\s\\t\\f.txt"), &info));
    EXPECT_FALSE(info.isInLibrary);
    EXPECT_TRUE(directory.SubDirectoryContainsPath(Path("C:\\d\\s\\x.lwb\\e"), &info));
    EXPECT_STREQ(info.libraryPath.GetBufferReadPtr(), "C:\\d\\s\\x.lwb");
    EXPECT_FALSE(directory.SubDirectoryContainsPath(Path("D:\\d\\f"), &info));
    EXPECT_FALSE(Path("").SubDirectoryContainsPath(Path("a"), nullptr));
}

TEST(PathLevels, UncTextWithoutAShareHasNoLevels) {
    Path const machineOnly("\\\\srv");
    EXPECT_RAISES(machineOnly.GetNumLevels(), TE_PROGRAM_ERROR);
    EXPECT_RAISES(machineOnly.GetRootDir(), TE_PROGRAM_ERROR);
    EXPECT_FALSE(machineOnly.IsValid(false, nullptr)); // validation never raises
}
