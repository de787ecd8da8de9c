// Strings files: reading and checking (StringsFile), and RString::UseStringsFile and
// UseAllStringsFilesInDirectory entering their rows into the message table.
#include "tekit/ini/StringsFile.h"
#include "tekit/errors/RString.h"
#include "tekit/paths/Path.h"
#include "tekit/strings/MultiByte.h"

#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/errors/TEError.h"

#include <gtest/gtest.h>

#include <fstream>
#include <string>

namespace tekit {
namespace {

using testing::FaultKind;
using testing::Raised;
using testing::ScopedFault;
using testing::ScratchDirectory;

std::string Text(char const* section, char const* key) {
    return RString(section, key).GetString().GetBufferReadPtr();
}

class StringsFiles : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
    void TearDown() override { RString::ResetStrings(); }

    std::string Write(std::string const& name, std::string const& bytes) {
        std::string const path = (m_scratch.Root() / name).string();
        std::ofstream(path, std::ios::binary) << bytes;
        return path;
    }

    ScratchDirectory m_scratch{"strings"};
};

TEST_F(StringsFiles, RowsReplaceBuiltInOnesAndAddNewOnesWithTheIniEscapes) {
    std::string const path = Write("a.strings.ini", "\xEF\xBB\xBF; a comment\r\n"
                                                    "[ERR_DESCR]\r\n"
                                                    "\r\n"
                                                    "CANT_FIND_FILE = Datei '%1' fehlt.\r\n"
                                                    "[MINE]\n"
                                                    "Tab = \"a\\tb \\\"q\\\" c:\\\\x\"\n"
                                                    "Empty = \"\"\n"
                                                    "Umlaut = Gr\xC3\xB6\xC3\x9F"
                                                    "e\n"
                                                    "Long Line0001 = \"first \"\n"
                                                    "; pieces may have comments between them\n"
                                                    "Long Line0002 = \"half, second half\"\n"
                                                    "[ERR_DESCR]\n"
                                                    "PATH_IS_EMPTY = Leer.");
    StringsFile file;
    file.Read(Path(path.c_str()));
    ASSERT_EQ(file.GetNumRows(), 6);
    EXPECT_STREQ(file.GetText(1), "a\tb \"q\" c:\\x");
    EXPECT_EQ(file.GetLine(1), 6);
    EXPECT_STREQ(file.GetText(3), "Gr\xF6\xDF"
                                  "e"); // UTF-8 to Latin-1, the narrow code page 0
    EXPECT_STREQ(file.GetKey(4), "Long");
    EXPECT_STREQ(file.GetText(4), "first half, second half");
    EXPECT_STREQ(file.GetSection(5), "ERR_DESCR");
    EXPECT_RAISES(file.GetKey(6), TE_INDEX_OUT_OF_RANGE);

    RString::UseStringsFile(Path(path.c_str()));
    EXPECT_EQ(Text("ERR_DESCR", "CANT_FIND_FILE"), "Datei '%1' fehlt.");
    EXPECT_EQ(Text("ERR_DESCR", "PATH_IS_EMPTY"), "Leer.");
    EXPECT_EQ(Text("MINE", "Empty"), "");
    EXPECT_EQ(Text("ERR_DESCR", "PATH_NOT_ABSOLUTE_1"), "The path is not absolute: '%1'");
}

TEST_F(StringsFiles, BadFilesRaiseWithTheirLineAndChangeNothing) {
    struct Case {
        char const* bytes;
        char const* description; // after "<path>:"
    } const cases[] = {
        {"[S]\nA = 1\nB = \xC3(\n", "3: the line is not UTF-8 text."},
        {"[S]\nA = \xED\xA0\x80\n", "2: the line is not UTF-8 text."}, // a surrogate
        {"[S]\nA = a\x01z\n", "2: the line holds the control character 0x01; write a tab, line "
                              "feed or carriage return in a text as \\t, \\n or \\r."},
        {"[S]\rA = 1\n", "1: the line holds the control character 0x0D; write a tab, line "
                         "feed or carriage return in a text as \\t, \\n or \\r."},
        {"A = 1\n[S]\n", "1: the line comes before the first section header \"[SECTION]\"."},
        {"[S]\n[T] x\n", "2: a section header is a name between \"[\" and \"]\", with nothing "
                         "after the \"]\"."},
        {"[S]\nA Datei\n", "2: the line is neither a section header, a comment (\";\") nor "
                           "\"KEY = text\"."},
        {"[S]\n = x\n", "2: the key before \"=\" is empty."},
        {"[S]\nA =\n", "2: the text after \"=\" is empty; write an empty text as \"\"."},
        {"[S]\nA = 1\n[T]\n[S]\nB = 2\nA = 3\n",
         "6: the key 'A' appears twice in its section (first at line 2)."},
        {"[S]\nA Line0001 = x\nA Line0002 = y\nA = z\n",
         "4: the key 'A' appears twice in its section (first at line 2)."},
    };
    RString::SetString("S", "KEEP", "kept");
    for (Case const& c : cases) {
        std::string const path = Write("bad.strings.ini", c.bytes);
        EXPECT_RAISES_IN(RString::UseStringsFile(Path(path.c_str())), TE_BAD_FILE_FORMAT,
                         "RString::UseStringsFile", (path + ":" + c.description).c_str())
            << c.bytes;
        EXPECT_EQ(Text("S", "KEEP"), "kept");
        EXPECT_EQ(Text("S", "A"), "String not found in the language resource files");
    }

    std::string const longest = "[S]\nA = " + std::string(636, 'x'); // a line of 640 bytes
    StringsFile file;
    file.ReadText("long", longest.data(), longest.size());
    EXPECT_EQ(file.GetNumRows(), 1);
    std::string const tooLong = longest + "\nB = " + std::string(637, 'y');
    EXPECT_RAISES_IN(file.ReadText("long", tooLong.data(), tooLong.size()), TE_BAD_FILE_FORMAT,
                     "StringsFile::ReadText",
                     "long:3: the line is longer than 640 bytes; write a long "
                     "text in pieces \"KEY Line0001 = ...\", \"KEY Line0002 = ...\".");
    std::string const huge(StringsFile::kMaxFileBytes + 1, ' ');
    EXPECT_RAISES_IN(file.ReadText("huge", huge.data(), huge.size()), TE_BAD_FILE_FORMAT,
                     "StringsFile::ReadText",
                     "The file 'huge' holds 16777217 bytes, more than the 16 MB that a strings "
                     "file or language configuration may hold.");
    EXPECT_EQ(file.GetNumRows(), 1); // a failed read keeps the rows held
}

TEST_F(StringsFiles, ReadFailuresRaiseTheSystemsErrorAndChangeNothing) {
    std::string const path = Write("s.strings.ini", "[S]\nA = 1\n");
    EXPECT_RAISES(RString::UseStringsFile(Path((path + ".none").c_str())), TE_FILE_NOT_FOUND);
    {
        ScopedFault const denied(FaultKind::Open, 1, testing::native::kAccessDenied);
        EXPECT_RAISES(RString::UseStringsFile(Path(path.c_str())), TE_ACCESS_DENIED);
    }
    {
        ScopedFault const failing(FaultKind::Read, 1, testing::native::kSharingViolation);
        TEException const e = Raised([&] { RString::UseStringsFile(Path(path.c_str())); });
        EXPECT_EQ(e.GetErrorCode(), TE_SHARING_VIOLATION);
        EXPECT_TRUE(failing.Fired());
    }
    EXPECT_EQ(Text("S", "A"), "String not found in the language resource files");
}

TEST_F(StringsFiles, ADirectoryEntersAllItsStringsFilesInNameOrderOrNone) {
    Write("b.strings.ini", "[S]\nA = from b\nB = b\n");
    Write("a.STRINGS.INI", "[S]\nA = from a\nC = a\n");
    Write("other.ini", "[S]\nD = not a strings file\n");
    Path const directory(m_scratch.Root().string().c_str());
    unsigned int count = 99;
    RString::UseAllStringsFilesInDirectory(directory, &count);
    EXPECT_EQ(count, 2u);
    EXPECT_EQ(Text("S", "A"), "from b");
    EXPECT_EQ(Text("S", "C"), "a");
    EXPECT_EQ(Text("S", "D"), "String not found in the language resource files");

    RString::ResetStrings();
    Write("c.strings.ini", "[S]\nbroken\n");
    EXPECT_RAISES(RString::UseAllStringsFilesInDirectory(directory, &count), TE_BAD_FILE_FORMAT);
    EXPECT_EQ(Text("S", "B"), "String not found in the language resource files");

    RString::UseAllStringsFilesInDirectory(Path((m_scratch.Root() / "none").string().c_str()),
                                           &count);
    EXPECT_EQ(count, 0u);
    ScopedFault const denied(FaultKind::DirectoryList, 1, testing::native::kAccessDenied);
    EXPECT_RAISES_IN(RString::UseAllStringsFilesInDirectory(directory, nullptr), TE_ACCESS_DENIED,
                     "RString::UseAllStringsFilesInDirectory");
}

TEST_F(StringsFiles, TheCompleteTableIsReadOnlyUntilReset) {
    std::string const path = Write("s.strings.ini", "[S]\nA = 1\n");
    RString::FinishedLoadingStrings();
    EXPECT_RAISES_IN(RString::UseStringsFile(Path(path.c_str())), TE_OBJECT_LOCKED,
                     "RString::UseStringsFile",
                     "The message table is complete and read-only: no more strings can be loaded "
                     "until it is reset.");
    EXPECT_RAISES(RString::SetString("S", "A", "x"), TE_OBJECT_LOCKED);
    StringsFile file;
    file.Read(Path(path.c_str()));
    EXPECT_RAISES_IN(file.Use(), TE_OBJECT_LOCKED, "StringsFile::Use");
    EXPECT_TRUE(RString::GlobalStringTableIsReady());

    RString::ResetStrings();
    file.Use();
    EXPECT_EQ(Text("S", "A"), "1");
}

TEST_F(StringsFiles, LinesAreConvertedToTheCodePageBeforeTheIniReaderSeesThem) {
    // U+8868 is 0x95 0x5C in Shift-JIS: its trail byte is a backslash, which must not escape
    // the quote after it.
    SetMultiByteCodePage(932);
    String::EnableMultiByteSupport(true);
    std::string const text = "[S]\nA = \"\xE8\xA1\xA8\"\n";
    StringsFile file;
    file.ReadText("sjis", text.data(), text.size());
    String::EnableMultiByteSupport(false);
    SetMultiByteCodePage(0);
    ASSERT_EQ(file.GetNumRows(), 1);
    EXPECT_STREQ(file.GetText(0), "\x95\x5C");
}

} // namespace
} // namespace tekit
