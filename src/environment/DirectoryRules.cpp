// The known directories' rules: the XDG base-directory rules, joining, and their failures.
#include "environment/DirectoryRules.h"

#include "platform/Environment.h"
#include "platform/File.h"
#include "platform/KnownFolders.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"

#include <string_view>

namespace tekit {

namespace {

char const kFunction[] = "GetKnownDirectory";
/// The product's folder under the per-user and shared XDG directories.
char const kProductFolder[] = "orvane";

bool IsAbsolute(std::string_view path) {
    return !path.empty() && path.front() == '/';
}

/// The variable `name` when it is set to an absolute path: the XDG rules ignore an unset,
/// empty or relative value.
bool AbsoluteVariable(DirectorySources const& sources, char const* name, std::string& value) {
    return sources.variable && sources.variable(name, value) && IsAbsolute(value);
}

DynamicString Describe(char const* key, KnownDirectory which, char const* second = nullptr) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    message.Format(KnownDirectoryName(which), 1);
    if (second)
        message.Format(second, 2);
    return message;
}

/// "~": $HOME when absolute, else the account's home directory.
std::string HomeDirectory(KnownDirectory which, DirectorySources const& sources) {
    std::string home;
    if (AbsoluteVariable(sources, "HOME", home))
        return home;
    if (sources.accountHome && !sources.accountHome(home) && IsAbsolute(home))
        return home;
    TE_RAISE(TE_PATH_NOT_FOUND, Describe("KNOWN_DIRECTORY_NO_HOME_1", which), kFunction);
}

/// The per-user base directory of `variable`, or ~/`fallback`.
std::string UserBase(KnownDirectory which, DirectorySources const& sources, char const* variable,
                     char const* fallback) {
    std::string base;
    if (AbsoluteVariable(sources, variable, base))
        return base;
    return JoinDirectory(HomeDirectory(which, sources), fallback, '/');
}

/// The first absolute entry of $XDG_DATA_DIRS, else the first of its default.
std::string SharedDataBase(DirectorySources const& sources) {
    std::string list;
    if (sources.variable && sources.variable("XDG_DATA_DIRS", list)) {
        std::string_view rest = list;
        while (!rest.empty()) {
            std::size_t const colon = rest.find(':');
            std::string_view const entry = rest.substr(0, colon);
            if (IsAbsolute(entry))
                return std::string(entry);
            rest = colon == std::string_view::npos ? std::string_view{} : rest.substr(colon + 1);
        }
    }
    return "/usr/local/share";
}

} // namespace

DirectorySources SystemDirectorySources() {
    DirectorySources sources;
    sources.variable = [](char const* name, std::string& value) {
        return platform::GetEnvironmentVariable(name, value);
    };
#if !defined(_WIN32)
    sources.accountHome = [](std::string& path) { return platform::AccountHomeDirectory(path); };
#endif
    return sources;
}

std::string ResolveXdgDirectory(KnownDirectory which, DirectorySources const& sources) {
    switch (which) {
    case KnownDirectory::kConfiguration:
        return JoinDirectory(UserBase(which, sources, "XDG_CONFIG_HOME", ".config"), kProductFolder,
                             '/');
    case KnownDirectory::kApplicationData:
        return JoinDirectory(UserBase(which, sources, "XDG_DATA_HOME", ".local/share"),
                             kProductFolder, '/');
    case KnownDirectory::kCache:
        return JoinDirectory(UserBase(which, sources, "XDG_CACHE_HOME", ".cache"), kProductFolder,
                             '/');
    case KnownDirectory::kPublic:
        return JoinDirectory(SharedDataBase(sources), kProductFolder, '/');
    case KnownDirectory::kTemporary: {
        std::string directory;
        if (!AbsoluteVariable(sources, "TMPDIR", directory))
            directory = "/tmp";
        return JoinDirectory(directory, nullptr, '/');
    }
    default:
        TE_RAISE_ASSERTION("not a directory of the XDG rules", kFunction);
    }
}

std::string JoinDirectory(std::string directory, char const* name, char separator) {
    while (directory.size() > 1 && directory.back() == separator)
        directory.pop_back();
    if (directory.empty() || directory.back() != separator)
        directory += separator;
    if (name && *name) {
        directory += name;
        directory += separator;
    }
    return directory;
}

std::string ModuleDirectory(std::string const& file) {
    return platform::DirectoryOf(file);
}

Path ToDirectoryPath(KnownDirectory which, std::string const& directory) {
    // A Path holds 259 bytes and its terminator.
    if (directory.size() > 259)
        TE_RAISE(TE_INVALID_PATHNAME,
                 Describe("KNOWN_DIRECTORY_TOO_LONG_1_2", which, directory.c_str()), kFunction);
    return Path(directory.c_str());
}

void RaiseUnknownDirectory(KnownDirectory which, platform::SystemError error) {
    TE_RAISE_API(TE_PATH_NOT_FOUND,
                 Describe("KNOWN_DIRECTORY_SYSTEM_FAILED_1_2", which, error.apiFunction), kFunction,
                 error.apiFunction, error.code);
}

} // namespace tekit
