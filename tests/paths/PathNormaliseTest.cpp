#include "PathTestSupport.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <cstdlib>
#include <string>

using namespace tekit;

namespace {

struct Collapsed {
    std::string text;
    bool resolved;
};

Collapsed Collapse(char const* text) {
    Path path(text);
    bool const resolved = path.CollapseDots();
    return {path.CStr(), resolved};
}

void SetVariable(char const* name, char const* value) {
#if defined(_WIN32)
    _putenv_s(name, value);
#else
    setenv(name, value, 1);
#endif
}

std::string Expanded(char const* text, bool keepUndefined) {
    Path path(text);
    path.ParseSysVariables(keepUndefined);
    return path.CStr();
}

} // namespace

TEST(PathDots, SingleDotsGoAndDoubleDotsTakeTheLevelBefore) {
    Collapsed c = Collapse("C:\\a\\.\\b\\..\\c");
    EXPECT_EQ(c.text, "C:\\a\\c");
    EXPECT_TRUE(c.resolved);
    c = Collapse("C:\\a\\b\\..");
    EXPECT_EQ(c.text, "C:\\a\\"); // each kept level keeps its own separator
    c = Collapse("\\\\srv\\sh\\a\\..\\b\\.");
    EXPECT_EQ(c.text, "\\\\srv\\sh\\b\\");
    c = Collapse(".\\a");
    EXPECT_EQ(c.text, "a");
    c = Collapse("C:\\a\\b");
    EXPECT_EQ(c.text, "C:\\a\\b");
    EXPECT_TRUE(c.resolved);
}

TEST(PathDots, AnAbsolutePathDoesNotRiseAboveItsRoot) {
    Collapsed c = Collapse("C:\\..");
    EXPECT_EQ(c.text, "C:\\.."); // nothing dropped or resolved: left as it is
    EXPECT_TRUE(c.resolved);
    c = Collapse("C:\\..\\a");
    EXPECT_EQ(c.text, "C:\\..\\a");
    c = Collapse("C:\\a\\..\\..\\b");
    EXPECT_EQ(c.text, "C:\\b"); // the second ".." is skipped once the text is rewritten
    EXPECT_TRUE(c.resolved);
}

TEST(PathDots, UnresolvedDoubleDotsStayOnARelativePath) {
    Collapsed c = Collapse("a\\..\\..\\b");
    EXPECT_EQ(c.text, "..\\b");
    EXPECT_FALSE(c.resolved);
    c = Collapse("..\\x");
    EXPECT_EQ(c.text, "..\\x");
    EXPECT_FALSE(c.resolved);
    // A kept ".." counts as a kept level: the next ".." takes it away.
    c = Collapse("..\\..\\a");
    EXPECT_EQ(c.text, "a");
    EXPECT_FALSE(c.resolved);
}

TEST(PathDots, InvalidPathsAreLeftAlone) {
    Collapsed c = Collapse("C:\\a\\\\..\\b");
    EXPECT_EQ(c.text, "C:\\a\\\\..\\b");
    EXPECT_TRUE(c.resolved);
    c = Collapse("C:\\*\\..");
    EXPECT_EQ(c.text, "C:\\*\\..");
    c = Collapse("\\\\srv");
    EXPECT_EQ(c.text, "\\\\srv");
}

TEST(PathSeparators, RunsBecomeOneExceptTheUncOpening) {
    Path path("C:\\a\\\\\\b\\\\");
    path.CoalesceDoubleSeparators();
    EXPECT_STREQ(path.CStr(), "C:\\a\\b\\");
    Path unc("\\\\\\\\srv\\\\sh");
    unc.CoalesceDoubleSeparators();
    EXPECT_STREQ(unc.CStr(), "\\\\srv\\sh");
    Path rooted("\\\\");
    rooted.CoalesceDoubleSeparators();
    EXPECT_STREQ(rooted.CStr(), "\\\\");
}

TEST(PathVariables, PercentNamesTakeTheEnvironmentsValues) {
    SetVariable("TEKIT_PATHS_ROOT", "C:\\data");
    SetVariable("TEKIT_PATHS_DRIVE", "D:");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_ROOT%\\f.txt", false), "C:\\data\\f.txt");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_DRIVE%x", false), "D:\\x"); // normalised afterwards
    EXPECT_EQ(Expanded("%TEKIT_PATHS_UNDEFINED%\\f", true), "%TEKIT_PATHS_UNDEFINED%\\f");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_UNDEFINED%\\f", false), "\\f");
    EXPECT_EQ(Expanded("a%%b", false), "a%%b");
    EXPECT_EQ(Expanded("50%", false), "50%");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_DRIVE%%TEKIT_PATHS_ROOT%", false), "D:\\C:\\data");
}

TEST(PathCanonical, TextIsCoalescedAndCollapsed) {
    DynamicPath canonical;
    Path("C:\\no-such-dir-of-tekit\\\\a\\.\\b\\..\\c").GetCanonicalPath(canonical);
    EXPECT_STREQ(canonical.CStr(), "C:\\no-such-dir-of-tekit\\a\\c");
    Path("rel\\.\\x").GetCanonicalPath(canonical);
    EXPECT_STREQ(canonical.CStr(), "rel\\x");
}
