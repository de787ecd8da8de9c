#include "PathTestSupport.h"
#include "support/DebugCapture.h"
#include "support/MultiByteFixture.h"
#include "support/Raises.h"
#include "tekit/errors/RString.h"
#include "tekit/paths/IsValidPath.h"
#include "tekit/paths/Path.h"

#include <string>

using namespace tekit;
using tekit::testing::Raised;
using tekit::testing::RawPath;

namespace {

constexpr char kEmpty[] = "Path is empty.";
constexpr char kSepAfterDrive[] = "Path separator (\\) must follow drive specification.";
constexpr char kMissingNetworkName[] = "Path missing network name.";
constexpr char kMissingDirectory[] = "Path missing directory name after the network name.";
constexpr char kInvalidNetworkName[] = "Path contains invalid network name.";
constexpr char kInvalidShare[] = "Path contains invalid directory name.";
constexpr char kBeginsWithSeparator[] =
    "Path begins with separator (\\).\n"
    "Paths must begin with drive specification (C:) or network name (\\\\machine\\C).";
constexpr char kEmptyComponent[] = "Path contains two adjacent path separators (\\\\).";
constexpr char kInvalidChars[] =
    "One or more path components contain invalid characters: (< > | : / \\ \" * ?).";

/// "" when `path` is valid, otherwise IsValid's message.
std::string Problem(PathBase const& path, bool allowWildcards = false) {
    DynamicString message("unset", true);
    bool const valid = path.IsValid(allowWildcards, &message);
    EXPECT_EQ(valid, message == "unset") << path.CStr();
    return valid ? "" : message.GetBufferReadPtr();
}
std::string Problem(char const* text, bool allowWildcards = false) {
    return Problem(Path(text), allowWildcards);
}

class PathValidity : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
};

} // namespace

TEST_F(PathValidity, EmptyPathComesFirst) {
    EXPECT_EQ(Problem(""), kEmpty);
    EXPECT_FALSE(Path().IsValid(true, nullptr));
}

TEST_F(PathValidity, DrivePathsNeedASeparatorAfterTheDriveAndAreValidUpToTheirRoot) {
    EXPECT_EQ(Problem("C:"), "");
    // Construction turns C:x into C:\x, so only stored text can break the rule; it is checked
    // before the components (the empty one here would fail later).
    EXPECT_EQ(Problem(RawPath("C:x\\\\y")), kSepAfterDrive);
    EXPECT_EQ(Problem("C:\\\\"), kEmptyComponent);
    EXPECT_EQ(Problem("C:\\a\\"), "");
    EXPECT_EQ(Problem("1:\\a"), kInvalidChars); // not a drive: a relative path with a colon
}

TEST_F(PathValidity, UncPathsAreCheckedMachineFirstThenShareThenComponents) {
    EXPECT_EQ(Problem("\\\\"), kMissingNetworkName);
    EXPECT_EQ(Problem("\\\\srv\\"), kMissingDirectory);
    EXPECT_EQ(Problem("\\\\.\\"), kMissingDirectory); // before the machine name is looked at
    EXPECT_EQ(Problem("\\\\.\\share"), kInvalidNetworkName);
    EXPECT_EQ(Problem("\\\\srv\\..\\f"), kInvalidShare);
    EXPECT_EQ(Problem("\\\\srv\\sh?", true), kInvalidShare); // never wildcards in a share
    EXPECT_EQ(Problem("\\\\srv\\\\f"), kEmptyComponent);
    EXPECT_EQ(Problem("\\\\srv\\share\\d\\..\\f.txt"), ""); // dots are fine past the share
    EXPECT_EQ(Problem("\\\\srv\\share\\a|b"), kInvalidChars);
}

TEST_F(PathValidity, RelativePathsMustNotBeginWithASeparator) {
    EXPECT_EQ(Problem("\\dir\\f.txt"), kBeginsWithSeparator);
    EXPECT_EQ(Problem("\\a<b"), kBeginsWithSeparator);
    EXPECT_EQ(Problem(".."), "");
}

TEST_F(PathValidity, ComponentsAreCheckedLeftToRight) {
    EXPECT_EQ(Problem("C:\\a<\\\\b"), kInvalidChars);
    EXPECT_EQ(Problem("C:\\a\\\\b<"), kEmptyComponent);
    for (char const* bad : {"<", ">", "|", ":", "/", "\"", "\r", "\n", "*", "?"}) {
        std::string const text = std::string("C:\\d\\a") + bad + "b\\f.txt";
        EXPECT_EQ(Problem(text.c_str()), kInvalidChars) << text;
    }
    EXPECT_EQ(Problem("C:\\tab\there\\\x01\x7F\xE9"), ""); // other control and 8-bit bytes
}

TEST_F(PathValidity, WildcardsOnlyInTheLastComponentAndOnlyWhenAllowed) {
    EXPECT_EQ(Problem("C:\\d\\*.txt", true), "");
    EXPECT_EQ(Problem("C:\\d\\*.txt", false), kInvalidChars);
    EXPECT_EQ(Problem("C:\\d\\f?.txt\\", true), kInvalidChars); // a separator follows it
    EXPECT_EQ(Problem("C:\\d\\a:b", true), kInvalidChars);
}

TEST_F(PathValidity, LastComponentAfterALibraryFileMayHoldAnything) {
    EXPECT_EQ(Problem("C:\\d\\lib.lwb\\Main: <a|b>*?.vi"), "");
    EXPECT_EQ(Problem("C:\\d\\lib.lwb\\sub\\x/y"), kInvalidChars); // one level deeper
    EXPECT_EQ(Problem("C:\\d\\lib.lwb\\x/y\\z"), kInvalidChars);   // not the last component
    EXPECT_EQ(Problem("C:\\d\\lib.lwb\\\\x/y"), kEmptyComponent);
    EXPECT_EQ(Problem(".lwb\\x/y"), ""); // the entry starts at index 5
    EXPECT_EQ(Problem("lwb\\x/y"), kInvalidChars);
}

TEST_F(PathValidity, ComponentAndShareNameChecks) {
    DynamicString text("a*b", true);
    EXPECT_TRUE(PathBase::IsValidPathComponent(text, true));
    text = "..";
    EXPECT_FALSE(PathBase::IsValidShareDirName(text));
}

TEST_F(PathValidity, RaisingValidatorsCarryTheInvalidPathCodeAndTheirTexts) {
    Path const bad("C:\\a\\\\b");
    EXPECT_RAISES_IN(bad.Validate(false), TE_INVALID_PATHNAME, "PathBase::Validate",
                     kEmptyComponent);
    std::string const invalid = std::string("Invalid path: 'C:\\a\\\\b'\n\n") + kEmptyComponent;
    EXPECT_RAISES_IN(bad.ValidateEx(false), TE_INVALID_PATHNAME, nullptr, invalid.c_str());
    // A percent sign in the path is not taken for a placeholder.
    std::string const percent =
        std::string("Invalid path: 'C:\\100%1\\a\\\\b'\n\n") + kEmptyComponent;
    EXPECT_RAISES_IN(Path("C:\\100%1\\a\\\\b").ValidateEx(false), TE_INVALID_PATHNAME, nullptr,
                     percent.c_str());
    EXPECT_RAISES_IN(Path("dir\\f.txt").ValidateAbsolute(false), TE_INVALID_PATHNAME, nullptr,
                     "The path is not absolute: 'dir\\f.txt'");
    std::string const empty = std::string("Invalid path: ''\n\n") + kEmpty;
    EXPECT_RAISES_IN(Path("").ValidateAbsolute(false), TE_INVALID_PATHNAME, nullptr,
                     empty.c_str()); // invalid before not absolute
    EXPECT_NO_THROW(Path("C:\\d\\*.txt").ValidateAbsolute(true));
}

TEST_F(PathValidity, FlatEntryPointRefusesLongTextWithoutParsing) {
    EXPECT_FALSE(IsValidPath("C:\\d\\*.txt", 0));
    EXPECT_TRUE(IsValidPath("C:\\d\\*.txt", 7));
    EXPECT_FALSE(IsValidPath(nullptr, 0));

    std::string text = "C:\\" + std::string(256, 'a');
    ASSERT_EQ(text.size(), 259u);
    EXPECT_TRUE(IsValidPath(text.c_str(), 0));
    text += 'a';
    EXPECT_FALSE(IsValidPath(text.c_str(), 0)); // 260 bytes: a Path could hold it, still no
    EXPECT_TRUE(Path(text.c_str()).IsValid(false, nullptr));
}

class PathValidityMultiByte : public tekit::testing::MultiByteFixture {};

TEST_F(PathValidityMultiByte, TrailByteThatEqualsABackslashIsNoSeparator) {
    // 0x95 0x5C is one Shift-JIS character whose trail byte is the backslash's value.
    char const* const text = "C:\\a\x95\x5C\\b";
    EXPECT_EQ(Problem(text), kEmptyComponent); // single-byte: a\x95, "", b
    UseShiftJis();
    EXPECT_EQ(Problem(text), "");
    EXPECT_EQ(Problem("C:\\\x95\x5C<"), kInvalidChars);
}

TEST(PathAssertions, InternalErrorsRaiseTheProgramErrorWithTheirTextWhenDiagnosing) {
    tekit::testing::DiagnosticLevelScope const diagnosing(1);
    EXPECT_RAISES_IN(Path("\\\\srv").GetNumLevels(), TE_PROGRAM_ERROR, nullptr, "invalid UNC path");
    DynamicString extension;
    for (long index : {4L, -1L})
        EXPECT_RAISES_IN(PathBase::GetCmdFileExtension(index, extension), TE_PROGRAM_ERROR, nullptr,
                         "invalid index to GetCmdFileExtension");
}
