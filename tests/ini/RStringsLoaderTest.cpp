// RStringsLoader: languages from the directories of a DirectoryGetter, the language
// configuration, all-or-nothing loads, and the shipped German strings file.
#include "tekit/errors/RStringsLoader.h"

#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/errors/DirectoryGetter.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/TEError.h"
#include "tekit/paths/Path.h"
#include "tekit/strings/StringVector.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

namespace tekit {
namespace {

using testing::Raised;
using testing::ScratchDirectory;
namespace fs = std::filesystem;

std::string Text(char const* section, char const* key) {
    return RString(section, key).GetString().GetBufferReadPtr();
}

std::string const kNotFound = "String not found in the language resource files";

/// A directory text as the library takes it: ending in a separator, and on Windows (under
/// Wine) a Linux path reached through drive Z:.
std::string HostDirectory(std::string path) {
#if defined(_WIN32)
    if (!path.empty() && path[0] == '/')
        path = "Z:" + path;
#endif
    return path + static_cast<char>(fs::path::preferred_separator);
}

/// Languages under `roots` (each root/<language>/, in order), configuration in `config`.
class TestDirectories : public DirectoryGetter {
public:
    std::vector<std::string> roots;
    std::string config;

    void GetLanguageDirectories(String const& language, StringVector& directories) override {
        for (std::string const& root : roots)
            directories.emplace_back(
                HostDirectory(root + "/" + language.GetBufferReadPtr()).c_str());
    }
    void GetLanguageConfigurationDirectory(String& directory) override {
        directory.Assign(HostDirectory(config).c_str());
    }
};

class LanguageLoader : public ::testing::Test {
protected:
    void SetUp() override {
        RString::ResetStrings();
        m_directories.roots = {Dir("installed"), Dir("user")};
        m_directories.config = Dir("config");
    }
    void TearDown() override { RString::ResetStrings(); }

    std::string Dir(std::string const& name) {
        fs::create_directories(m_scratch.Root() / name);
        return (m_scratch.Root() / name).string();
    }
    void Write(std::string const& relative, std::string const& bytes) {
        fs::path const path = m_scratch.Root() / relative;
        fs::create_directories(path.parent_path());
        std::ofstream(path, std::ios::binary) << bytes;
    }

    ScratchDirectory m_scratch{"language"};
    TestDirectories m_directories;
    RStringsLoader m_loader{m_directories};
};

TEST_F(LanguageLoader, TheGermanFileTranslatesRaisedMessagesUntilUnloadedOrReset) {
    m_directories.roots = {TEKIT_LANGUAGE_DIR};
    std::string const missing = (m_scratch.Root() / "fehlt.ini").string();
    auto const raised = [&] { return Raised([&] { Path(missing.c_str()).GetFileSize(); }); };
    std::string const english = raised().GetDescription();
    ASSERT_EQ(english, "Could not read the information of '" + missing + "'. File not found.");
    DynamicString german;
    german.AssignFromUTF8(("Die Informationen zu '" + missing +
                           "' können nicht gelesen werden. Die Datei wurde nicht gefunden.")
                              .c_str(),
                          -1);

    EXPECT_EQ(m_loader.Load(DynamicString("German"), true), 1u);
    EXPECT_STREQ(raised().GetDescription(), german.GetBufferReadPtr());
    m_loader.UnloadAll();
    EXPECT_EQ(raised().GetDescription(), english);

    m_loader.Load(DynamicString("German"), true);
    RString::ResetStrings();
    EXPECT_EQ(raised().GetDescription(), english);
}

TEST_F(LanguageLoader, TheConfiguredLanguageStandsOnTheBuiltInRowsLaterDirectoriesWinning) {
    Write("installed/German/tekit.strings.ini", "[S]\nA = installed\nB = installed\n");
    Write("installed/German/more.strings.ini", "[S]\nC = more\n");
    Write("user/German/mine.strings.ini", "[S]\nB = user\n[ERR_DESCR]\nPATH_IS_EMPTY = Leer.\n");
    Write("installed/French/tekit.strings.ini", "[S]\nA = installe\n");
    EXPECT_STREQ(m_loader.CurrentLanguage().GetBufferReadPtr(), "");
    EXPECT_EQ(m_loader.LoadCurrent(), 0u); // no configuration: English, which has no files
    EXPECT_STREQ(m_loader.CurrentLanguage().GetBufferReadPtr(), "English");

    Write("config/Language.ini", "[Language]\nCurrent = German\n");
    RString const before("S", "A", "default");
    EXPECT_EQ(m_loader.LoadCurrent(), 3u);
    EXPECT_STREQ(m_loader.CurrentLanguage().GetBufferReadPtr(), "German");
    EXPECT_EQ(Text("S", "A"), "installed");
    EXPECT_EQ(Text("S", "B"), "user");
    EXPECT_EQ(Text("S", "C"), "more");
    EXPECT_EQ(Text("ERR_DESCR", "PATH_IS_EMPTY"), "Leer.");

    RString const german("S", "A");
    EXPECT_EQ(m_loader.Load(DynamicString("French"), true), 1u);
    EXPECT_EQ(Text("S", "A"), "installe");
    EXPECT_EQ(Text("S", "B"), kNotFound); // German's rows went with it
    EXPECT_EQ(Text("ERR_DESCR", "PATH_IS_EMPTY"), "Path is empty.");
    EXPECT_STREQ(german, "installed"); // a replaced text stays in memory
    EXPECT_STREQ(before, "default");

    m_loader.UnloadAll();
    EXPECT_EQ(Text("S", "A"), kNotFound);
    EXPECT_STREQ(m_loader.CurrentLanguage().GetBufferReadPtr(), "");
}

TEST_F(LanguageLoader, ABadFileRaisesAndChangesNothingOrIsLeftOut) {
    Write("installed/German/a.strings.ini", "[S]\nA = a\n");
    Write("user/German/b.strings.ini", "[S]\nB = b\nbroken line\n");
    Write("user/German/c.strings.ini", "[S]\nC = c\n");
    m_loader.LoadDefault(true);
    TEException const e = Raised([&] { m_loader.Load(DynamicString("German"), true); });
    EXPECT_EQ(e.GetErrorCode(), TE_BAD_FILE_FORMAT);
    EXPECT_STREQ(e.GetFunctionName(), "RStringsLoader::Load");
    EXPECT_EQ(Text("S", "A"), kNotFound);
    EXPECT_STREQ(m_loader.CurrentLanguage().GetBufferReadPtr(), "English");

    EXPECT_EQ(m_loader.Load(DynamicString("German"), false), 2u);
    EXPECT_EQ(Text("S", "A"), "a");
    EXPECT_EQ(Text("S", "B"), kNotFound);
    EXPECT_EQ(Text("S", "C"), "c");

    testing::ScopedFault const denied(testing::FaultKind::DirectoryList, 1,
                                      testing::native::kAccessDenied);
    EXPECT_RAISES(m_loader.Load(DynamicString("German"), true), TE_ACCESS_DENIED);
    EXPECT_EQ(Text("S", "C"), "c");
}

TEST_F(LanguageLoader, LanguageNamesAreFolderNames) {
    for (char const* name : {"", ".", "..", ".hidden", "a/b", "a\\b", "C:", "tab\tname"})
        EXPECT_RAISES_IN(m_loader.Load(DynamicString(name), true), TE_INVALID_OR_OUT_OF_RANGE,
                         "RStringsLoader::Load")
            << name;
    Write("config/Language.ini", "[Language]\nCurrent = ../../etc\n");
    EXPECT_RAISES(m_loader.LoadCurrent(), TE_INVALID_OR_OUT_OF_RANGE);
}

TEST_F(LanguageLoader, AConfigurationThatCannotBeReadRaises) {
    Write("config/Language.ini", "Current = German\n");
    EXPECT_RAISES_IN(m_loader.LoadCurrent(), TE_BAD_FILE_FORMAT, "RStringsLoader::LoadLangConfig");
    fs::remove(m_scratch.Root() / "config/Language.ini");
    fs::create_directories(m_scratch.Root() / "config/Language.ini"); // a folder, not a file
    EXPECT_NE(Raised([&] { m_loader.LoadCurrent(); }).GetErrorCode(), TEError{});
}

TEST_F(LanguageLoader, AfterFinishedLoadingOnlyUnloadAllOpensTheTable) {
    Write("installed/German/a.strings.ini", "[S]\nA = a\n");
    RString::FinishedLoadingStrings();
    EXPECT_RAISES_IN(m_loader.Load(DynamicString("German"), false), TE_OBJECT_LOCKED,
                     "RStringsLoader::Load");
    m_loader.UnloadAll();
    EXPECT_FALSE(RString::GlobalStringTableIsReady());
    EXPECT_EQ(m_loader.Load(DynamicString("German"), true), 1u);
    EXPECT_EQ(Text("S", "A"), "a");
}

} // namespace
} // namespace tekit
