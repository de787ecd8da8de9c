// The system's own answers to "where is ...": the module that holds this code, the user's home
// or the Known Folders, and the temporary directory. Generic rules built on them (the XDG
// base-directory rules, the product's sub-folders) live in the environment subsystem.
#pragma once

#include "platform/SystemError.h"

#include <string>

namespace tekit::platform {

/// The file of the module that holds the library's code: the shared library, or the program
/// it is linked into. dladdr on POSIX; GetModuleHandleExA(FROM_ADDRESS) and GetModuleFileNameA
/// on Windows.
SystemError LibraryModuleFile(std::string& path);

#if defined(_WIN32)
/// The Known Folders the library names.
enum class KnownFolder { RoamingAppData, LocalAppData, PublicDocuments };
/// SHGetKnownFolderPath, as narrow text in the ANSI code page, without a trailing separator.
SystemError KnownFolderPath(KnownFolder folder, std::string& path);
/// GetTempPathA: the directory for temporary files, with its trailing separator.
SystemError TemporaryDirectory(std::string& path);
#else
/// The home directory of the user's account entry (getpwuid_r), not $HOME.
SystemError AccountHomeDirectory(std::string& path);
#endif

} // namespace tekit::platform
