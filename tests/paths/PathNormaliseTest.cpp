#include "PathTestSupport.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <cstdlib>
#include <string>

using namespace tekit;

namespace {

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

TEST(PathDots, CollapsingRemovesDotsWithoutRisingAboveTheRoot) {
    struct Case {
        char const* text;
        char const* collapsed;
        bool resolved;
    } const cases[] = {
        // Single dots go, double dots take the level before; kept levels keep their separator.
        {"C:\\a\\.\\b\\..\\c", "C:\\a\\c", true},
        {"C:\\a\\b\\..", "C:\\a\\", true},
        {"\\\\srv\\sh\\a\\..\\b\\.", "\\\\srv\\sh\\b\\", true},
        {".\\a", "a", true},
        // An absolute path does not rise above its root: nothing dropped, left as it is.
        {"C:\\..\\a", "C:\\..\\a", true},
        {"C:\\a\\..\\..\\b", "C:\\b", true}, // the second ".." goes once the text is rewritten
        // Unresolved double dots stay on a relative path; a kept ".." is a level to take away.
        {"a\\..\\..\\b", "..\\b", false},
        {"..\\..\\a", "a", false},
        // Invalid paths are left alone.
        {"C:\\a\\\\..\\b", "C:\\a\\\\..\\b", true},
        {"\\\\srv", "\\\\srv", true},
    };
    for (Case const& c : cases) {
        Path path(c.text);
        EXPECT_EQ(path.CollapseDots(), c.resolved) << c.text;
        EXPECT_STREQ(path.CStr(), c.collapsed) << c.text;
    }
}

TEST(PathSeparators, RunsBecomeOneExceptTheUncOpening) {
    Path path("C:\\a\\\\\\b\\\\");
    path.CoalesceDoubleSeparators();
    EXPECT_STREQ(path.CStr(), "C:\\a\\b\\");
    Path unc("\\\\\\\\srv\\\\sh");
    unc.CoalesceDoubleSeparators();
    EXPECT_STREQ(unc.CStr(), "\\\\srv\\sh");
}

TEST(PathVariables, PercentNamesTakeTheEnvironmentsValues) {
    SetVariable("TEKIT_PATHS_ROOT", "C:\\data");
    SetVariable("TEKIT_PATHS_DRIVE", "D:");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_ROOT%\\f.txt", false), "C:\\data\\f.txt");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_DRIVE%x", false), "D:\\x"); // normalised afterwards
    EXPECT_EQ(Expanded("%TEKIT_PATHS_UNDEFINED%\\f", true), "%TEKIT_PATHS_UNDEFINED%\\f");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_UNDEFINED%\\f", false), "\\f");
    EXPECT_EQ(Expanded("50%", false), "50%");
    EXPECT_EQ(Expanded("%TEKIT_PATHS_DRIVE%%TEKIT_PATHS_ROOT%", false), "D:\\C:\\data");
}

TEST(PathCanonical, TextIsCoalescedAndCollapsed) {
    DynamicPath canonical;
    Path("C:\\no-such-dir-of-tekit\\\\a\\.\\b\\..\\c").GetCanonicalPath(canonical);
    EXPECT_STREQ(canonical.CStr(), "C:\\no-such-dir-of-tekit\\a\\c");
}
