// Path text: classification, splitting into components and changing them, and normalisation
// (dots, separators, variables).
#include "PathTestSupport.h"
#include "support/MultiByteFixture.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <string>
#include <tuple>
#include <utility>

namespace tekit {
namespace {
using tekit::testing::TextOf;

using Finder = bool (*)(String const&, int&, int&);

/// "start+length" of what `find` finds in `text`, or "none" (the outputs then untouched).
std::string Found(Finder find, std::string const& text) {
    int start = -1, length = -1;
    if (find(DynamicString(text.c_str(), true), start, length))
        return std::to_string(start) + "+" + std::to_string(length);
    return start == -1 && length == -1 ? "none" : "none, outputs written";
}

std::string Component(Path const& path, void (PathBase::*get)(String&) const) {
    return TextOf([&](String& out) { (path.*get)(out); });
}

TEST(PathClassification, DriveUncRootedAndRelativeForms) {
    struct Case {
        char const* text;
        bool drive, unc, absolute, rooted, root;
    } const cases[] = {
        // clang-format off
        {"c:\\x", true, false, true, true, false}, {"1:\\x", false, false, false, false, false},
        {"\\\\srv\\share\\", false, true, true, true, true},
        {"\\a", false, false, false, true, false}, {"", false, false, false, false, false},
        {"C:\\", true, false, true, true, true}, {"\\", false, false, false, true, true},
        // clang-format on
    };
    for (Case const& c : cases) {
        Path const p(c.text);
        EXPECT_EQ(std::tuple(p.UsesDriveLetter(), p.UsesUNC(), p.IsAbsolute(), p.IsRooted(),
                             p.IsRootDirectory()),
                  std::tuple(c.drive, c.unc, c.absolute, c.rooted, c.root))
            << c.text;
    }
    EXPECT_FALSE(PathBase::sIsDirectory(DynamicString()));
    EXPECT_TRUE(PathBase::sIsDirectory(DynamicString("C:", true)));
    EXPECT_FALSE(PathBase::IsSeparator('/'));
}

TEST(PathNormalisation, DriveRelativeFormsBecomeAbsoluteOnEveryWayIn) {
    EXPECT_STREQ(Path("C:").CStr(), "C:\\");
    EXPECT_STREQ(DynamicPath("x:f").CStr(), "x:\\f");
    Path path;
    path.SetPathName(DynamicString("E:", true));
    EXPECT_STREQ(path.CStr(), "E:\\");
    path.Clear();
    path.Append("F:g");
    EXPECT_STREQ(path.CStr(), "F:\\g");
    EXPECT_STREQ(Path("dir\\C:x").CStr(), "dir\\C:x"); // only at the start
    EXPECT_STREQ(Path(static_cast<char const*>(nullptr)).CStr(), "");
}

TEST(PathSplitting, FileNameExtensionAndBaseName) {
    std::string const longest = "a." + std::string(254, 'x');
    std::string const tooLong = "C:\\a." + std::string(255, 'x');
    struct Case {
        std::string text;
        char const *fileName, *extension, *baseName;
    } const cases[] = {
        // clang-format off
        // The file name starts after the last separator or colon; the extension includes its
        // dot, is found within 254 characters and never before the file name.
        {"C:\\dir\\f.txt", "7+5", "8+4", "7+1"}, {"C:\\dir\\a:b", "9+1", "none", "9+1"},
        {"\\\\srv\\share", "6+5", "none", "6+5"}, {"C:\\dir\\", "none", "none", "none"},
        {"C:", "none", "none", "none"}, {"C:\\d\\a.tar.gz", "5+8", "10+3", "5+5"},
        {"C:\\d.x\\file", "7+4", "none", "7+4"}, {"C:\\d\\.profile", "5+8", "5+8", "none"},
        {"a.", "0+2", "1+1", "0+1"}, {longest, "0+256", "1+255", "0+1"},
        {"a." + std::string(255, 'x'), "0+257", "none", "0+257"},
        {tooLong, "3+257", "none", "3+257"}, // no extension: all of it
        // clang-format on
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(c.text.substr(0, 20));
        EXPECT_EQ(Found(PathBase::FindFileName, c.text), c.fileName);
        EXPECT_EQ(Found(PathBase::FindExtension, c.text), c.extension);
        EXPECT_EQ(Found(PathBase::FindBaseName, c.text), c.baseName);
    }
}

TEST(PathComponents, GettersGiveTheSplitTexts) {
    Path const path("C:\\dir\\sub\\report.final.ini");
    EXPECT_EQ(Component(path, &PathBase::GetDirectoryPathName), "C:\\dir\\sub");
    EXPECT_EQ(Component(path, &PathBase::GetFileName), "report.final.ini");
    EXPECT_EQ(Component(path, &PathBase::GetBaseName), "report.final");
    EXPECT_EQ(Component(path, &PathBase::GetExtension), "ini");
    EXPECT_TRUE(path.HasExtension(".INI"));
    EXPECT_EQ(Component(Path("C:\\f"), &PathBase::GetDirectoryPathName), "C:\\");
    EXPECT_EQ(Component(Path("C:\\a\\"), &PathBase::GetDirectoryPathName), "C:\\a");
    EXPECT_EQ(Component(Path("C:\\.profile"), &PathBase::GetBaseName), "");
    EXPECT_FALSE(Path("C:\\d.x\\f").HasExtension(nullptr));
    EXPECT_TRUE(Path("a.").HasExtension());
    EXPECT_EQ(Component(Path("C:\\a\\"), &PathBase::GetFileName), "");
}

TEST(PathComponents, SettersReplaceOnePartAndKeepTheRest) {
    Path path("C:\\dir\\report.ini");
    path.SetExtension(".old");
    EXPECT_STREQ(path.CStr(), "C:\\dir\\report.old");
    path.SetExtension("");
    EXPECT_STREQ(path.CStr(), "C:\\dir\\report");
    path.SetBaseName("summary");
    EXPECT_STREQ(path.CStr(), "C:\\dir\\summary");
    path.SetFileName(DynamicString("log.csv", true));
    EXPECT_STREQ(path.CStr(), "C:\\dir\\log.csv");
    path.SetDirectoryPathName("D:\\archive\\");
    EXPECT_STREQ(path.CStr(), "D:\\archive\\log.csv");

    Path profile("C:\\.profile");
    profile.SetBaseName("a");
    EXPECT_STREQ(profile.CStr(), "C:\\a.profile");

    Path directory("C:\\dir\\");
    directory.SetExtension("txt"); // no file name: nothing to give an extension to
    EXPECT_STREQ(directory.CStr(), "C:\\dir\\");
}

TEST(PathComponents, AppendAddsOneSeparatorUnlessTheEndHasOne) {
    Path path;
    path.Append("a");
    path.Append("b");
    EXPECT_STREQ(path.CStr(), "a\\b");
    path = "C:\\";
    path.Append("x");
    path.Append(DynamicString("\\y", true)); // the component goes in unchanged
    EXPECT_STREQ(path.CStr(), "C:\\x\\\\y");
    path = "C:\\x";
    path.Append("");
    EXPECT_STREQ(path.CStr(), "C:\\x\\");
}

TEST(PathComponents, RemovingComponentsNeverCutsIntoTheRoot) {
    // Each step removes the file component ('f') or the last component ('l').
    auto removed = [](char const* text, std::string const& steps) {
        Path path(text);
        for (char step : steps)
            step == 'f' ? path.RemoveFileComponent() : path.RemoveLastComponent();
        return std::string(path.CStr());
    };
    EXPECT_EQ(removed("C:\\a\\b.txt", "fff"), "C:\\");
    EXPECT_EQ(removed("C:\\a\\b\\", "f"), "C:\\a\\b\\");
    EXPECT_EQ(removed("C:\\a\\b\\", "fl"), "C:\\a");
    EXPECT_EQ(removed("C:\\a\\b\\", "flll"), "C:\\");
    EXPECT_EQ(removed("\\\\srv\\share\\d", "l"), "\\\\srv\\share");
}

TEST(PathComponents, TrailingSeparatorsAreStrippedExceptFromRoots) {
    auto stripped = [](char const* text) {
        DynamicString s(text, true);
        PathBase::StripTrailingSeparatorIfNeeded(s);
        return std::string(s.GetBufferReadPtr());
    };
    std::pair<char const*, char const*> const cases[] = {
        {"\\", "\\"}, {"C:\\", "C:\\"}, {"1:\\", "1:"}, {"a\\\\", "a\\"}};
    for (auto const& [text, result] : cases)
        EXPECT_EQ(stripped(text), result) << text;

    Path path("\\\\srv\\share\\");
    path.StripTrailingSeparator();
    EXPECT_STREQ(path.CStr(), "\\\\srv\\share");
}

TEST(PathComponents, ConvertToDirectoryAddsTheSeparatorOnce) {
    Path path("C:\\a");
    EXPECT_TRUE(path.ConvertToDirectory(false));
    EXPECT_TRUE(path.ConvertToDirectory(false));
    EXPECT_STREQ(path.CStr(), "C:\\a\\");
    EXPECT_FALSE(Path().ConvertToDirectory(false));
    EXPECT_FALSE(Path("no such directory of the tests").ConvertToDirectory(true));
}

TEST(PathComponents, CommandFileExtensions) {
    DynamicString extension;
    char const* const expected[] = {"exe", "com", "cmd", "bat"};
    ASSERT_EQ(PathBase::kNumCmdFileExtensions, 4);
    for (long i = 0; i < PathBase::kNumCmdFileExtensions; ++i) {
        PathBase::GetCmdFileExtension(i, extension);
        EXPECT_EQ(extension, expected[i]);
        EXPECT_TRUE(PathBase::IsCmdFileExtension(extension));
    }
    EXPECT_TRUE(PathBase::IsCmdFileExtension(DynamicString("BaT", true)));
    EXPECT_FALSE(PathBase::IsCmdFileExtension(DynamicString(".exe", true)));
}

class PathSplittingMultiByte : public tekit::testing::MultiByteFixture {};

TEST_F(PathSplittingMultiByte, IndicesCountCharactersAndTrailBytesStayInTheirCharacter) {
    DynamicString const text("C:\\\x95\x5C\\\x82\xA0.txt", true); // C:\<表>\<あ>.txt
    int start = -1, length = -1;
    ASSERT_TRUE(PathBase::FindFileName(text, start, length)); // single-byte: 0x5C splits
    EXPECT_EQ(std::pair(start, length), std::pair(6, 6));
    UseShiftJis();
    ASSERT_TRUE(PathBase::FindFileName(text, start, length));
    EXPECT_EQ(std::pair(start, length), std::pair(5, 5));
    Path const path(text);
    EXPECT_EQ(path.GetNumLevels(), 2);
    EXPECT_EQ(Component(path, &PathBase::GetDirectoryPathName), "C:\\\x95\x5C");

    Path directory("C:\\d\\\x95\x5C"); // ends in a character, not in a separator
    EXPECT_FALSE(directory.IsDirectory());
    EXPECT_EQ(Component(directory, &PathBase::GetFileName), "\x95\x5C");
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

} // namespace
} // namespace tekit
