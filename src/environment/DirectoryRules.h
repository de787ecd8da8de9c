// The rules that turn what the system says into the known directories, kept apart from the
// system calls so that tests can give them any environment.
//
//   DirectorySources sources;
//   sources.variable = [](char const* name, std::string& value) { ... };   // a test's own
//   std::string config = ResolveXdgDirectory(KnownDirectory::kConfiguration, sources);
#pragma once

#include "platform/SystemError.h"
#include "tekit/environment/KnownDirectories.h"

#include <functional>
#include <string>

namespace tekit {

/// What the rules ask the system.
struct DirectorySources {
    /// An environment variable; false when it is not set.
    std::function<bool(char const* name, std::string& value)> variable;
    /// The home directory of the user's account entry.
    std::function<platform::SystemError(std::string& path)> accountHome;
};

/// The sources of this process: its environment and the user's account.
DirectorySources SystemDirectorySources();

/// `which` by the XDG base-directory rules (the POSIX systems' directories), ending in '/'.
/// kBinaries and kDevelopmentBinaries are not among them: they raise TE_PROGRAM_ERROR.
/// Raises TE_PATH_NOT_FOUND, naming the directory, when a home directory is needed and
/// neither $HOME nor the account entry gives an absolute one.
std::string ResolveXdgDirectory(KnownDirectory which, DirectorySources const& sources);

/// `directory` (absolute; a trailing separator or not) with `name` and a separator appended:
/// ("/home/a/", "orvane", '/') gives "/home/a/orvane/"; ("/", "x", '/') gives "/x/".
std::string JoinDirectory(std::string directory, char const* name, char separator);

/// The directory of the module file `file`, ending in its separator ("/opt/lib/libtekit.so"
/// gives "/opt/lib/").
std::string ModuleDirectory(std::string const& file);

/// `directory` as a Path; raises TE_INVALID_PATHNAME, naming the directory `which`, when it
/// is longer than a Path holds (a cut directory would name another place).
Path ToDirectoryPath(KnownDirectory which, std::string const& directory);

/// Raises TE_PATH_NOT_FOUND for `which`: the system call `apiFunction` failed with `code`.
[[noreturn]] void RaiseUnknownDirectory(KnownDirectory which, platform::SystemError error);

} // namespace tekit
