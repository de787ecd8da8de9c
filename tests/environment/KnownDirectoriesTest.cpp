#include "tekit/environment/KnownDirectories.h"
#include "environment/DirectoryRules.h"
#include "support/Raises.h"
#include "tekit/strings/StringVector.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <map>
#include <string>

using namespace tekit;
namespace fs = std::filesystem;
using K = tekit::KnownDirectory;

namespace {

/// Sources whose environment is `variables` and whose account home is `accountHome` ("":
/// the account has none).
DirectorySources Controlled(std::map<std::string, std::string> variables,
                            std::string accountHome = "/home/account") {
    DirectorySources sources;
    sources.variable = [variables](char const* name, std::string& value) {
        auto const found = variables.find(name);
        return found != variables.end() && (value = found->second, true);
    };
    sources.accountHome = [accountHome](std::string& path) {
        if (accountHome.empty())
            return platform::SystemError{"getpwuid_r", 2};
        path = accountHome;
        return platform::SystemError{};
    };
    return sources;
}

TEST(KnownDirectories, XdgVariablesAndTheirFallbacks) {
    struct Row {
        K which;
        std::map<std::string, std::string> variables;
        char const* expected;
    } const rows[] = {
        {K::kConfiguration, {{"HOME", "/home/ann"}}, "/home/ann/.config/orvane/"},
        {K::kConfiguration, {{"XDG_CONFIG_HOME", "/cfg/"}, {"HOME", "/h"}}, "/cfg/orvane/"},
        {K::kConfiguration, {{"XDG_CONFIG_HOME", ""}, {"HOME", "/h"}}, "/h/.config/orvane/"},
        {K::kConfiguration, {{"XDG_CONFIG_HOME", "rel/cfg"}, {"HOME", "/h"}}, "/h/.config/orvane/"},
        {K::kConfiguration, {{"HOME", "relative"}}, "/home/account/.config/orvane/"},
        {K::kConfiguration, {}, "/home/account/.config/orvane/"},
        {K::kApplicationData, {{"XDG_DATA_HOME", "/d//"}}, "/d/orvane/"},
        {K::kApplicationData, {{"HOME", "/h/"}}, "/h/.local/share/orvane/"},
        {K::kCache, {{"XDG_CACHE_HOME", "/var/cache/u"}}, "/var/cache/u/orvane/"},
        {K::kCache, {{"XDG_CACHE_HOME", "cache"}, {"HOME", "/h"}}, "/h/.cache/orvane/"},
        {K::kPublic, {}, "/usr/local/share/orvane/"},
        {K::kPublic, {{"XDG_DATA_DIRS", ""}}, "/usr/local/share/orvane/"},
        {K::kPublic, {{"XDG_DATA_DIRS", "rel:/opt/share:/usr/share"}}, "/opt/share/orvane/"},
        {K::kPublic, {{"XDG_DATA_DIRS", "::a:b"}}, "/usr/local/share/orvane/"},
        {K::kTemporary, {}, "/tmp/"},
        {K::kTemporary, {{"TMPDIR", "/scratch"}}, "/scratch/"},
        {K::kTemporary, {{"TMPDIR", "scratch"}}, "/tmp/"},
        {K::kTemporary, {{"TMPDIR", "/"}}, "/"},
    };
    for (Row const& row : rows) {
        SCOPED_TRACE(row.expected);
        EXPECT_EQ(ResolveXdgDirectory(row.which, Controlled(row.variables)), row.expected);
    }
}

TEST(KnownDirectories, NoHomeAnywhereRaisesNamingTheDirectory) {
    // The directories that need no home still resolve.
    DirectorySources const homeless = Controlled({{"HOME", "x"}}, "");
    EXPECT_EQ(ResolveXdgDirectory(K::kTemporary, homeless), "/tmp/");
    EXPECT_EQ(ResolveXdgDirectory(K::kPublic, homeless), "/usr/local/share/orvane/");
    EXPECT_EQ(ResolveXdgDirectory(K::kCache, Controlled({{"XDG_CACHE_HOME", "/c"}}, "")),
              "/c/orvane/");
    EXPECT_RAISES_IN(ResolveXdgDirectory(K::kConfiguration, homeless), TE_PATH_NOT_FOUND,
                     "GetKnownDirectory",
                     "Unable to find the configuration directory: neither $HOME nor the user's "
                     "account entry names an absolute home directory.");
    EXPECT_RAISES(ResolveXdgDirectory(K::kBinaries, homeless), TE_PROGRAM_ERROR);
}

TEST(KnownDirectories, JoiningAndLimits) {
    EXPECT_EQ(JoinDirectory("/a", "b", '/'), "/a/b/");
    EXPECT_EQ(JoinDirectory("/a///", nullptr, '/'), "/a/");
    EXPECT_EQ(JoinDirectory("C:\\x\\", "Orvane", '\\'), "C:\\x\\Orvane\\");
    EXPECT_EQ(JoinDirectory("", "b", '/'), "/b/");
    EXPECT_RAISES(ToDirectoryPath(KnownDirectory::kCache, "/" + std::string(300, 'x') + "/"),
                  TE_INVALID_PATHNAME);
    EXPECT_STREQ(KnownDirectoryName(KnownDirectory::kApplicationData), "applicationData");
    EXPECT_STREQ(KnownDirectoryName(static_cast<KnownDirectory>(99)), "");
}

TEST(KnownDirectories, BinariesAreTheDirectoryOfTheModuleHoldingTheLibrary) {
    // The tests link the library statically: its module is this program.
    fs::path const program = fs::canonical(fs::path(::testing::internal::GetArgvs()[0]));
    std::string const binaries = GetBinariesDirectory().CStr();
    EXPECT_EQ(fs::canonical(binaries), program.parent_path());
    EXPECT_EQ(std::string(GetDevelopmentBinariesDirectory().CStr()).substr(0, binaries.size() + 7),
              binaries + "modules");
}

TEST(KnownDirectories, EveryDirectoryResolvesAbsoluteWithItsSeparator) {
    auto const separator = static_cast<char>(fs::path::preferred_separator);
    for (int i = 0; i < kKnownDirectoryCount; ++i) {
        auto const which = static_cast<KnownDirectory>(i);
        std::string const directory = GetKnownDirectory(which).CStr();
        SCOPED_TRACE(KnownDirectoryName(which));
        ASSERT_GT(directory.size(), 1u);
        EXPECT_TRUE(fs::path(directory).is_absolute()) << directory;
        EXPECT_EQ(directory.back(), separator) << directory;
    }
}

TEST(KnownDirectories, LanguageDirectoriesInReadingOrder) {
    KnownDirectoryGetter getter;
    StringVector directories;
    getter.GetLanguageDirectories(DynamicString("German"), directories);
    ASSERT_EQ(directories.size(), 3u);
    std::string const bases[] = {GetBinariesDirectory().CStr(), GetPublicDirectory().CStr(),
                                 GetConfigurationDirectory().CStr()};
    for (std::size_t i = 0; i < 3; ++i) {
        std::string const directory = directories[i].GetBufferReadPtr();
        EXPECT_EQ(directory.substr(0, bases[i].size()), bases[i]);
        EXPECT_EQ(fs::path(directory).parent_path().filename(), "German") << directory;
    }
    DynamicString configuration;
    getter.GetLanguageConfigurationDirectory(configuration);
    EXPECT_EQ(std::string(configuration.GetBufferReadPtr()), bases[2]);
}

} // namespace
