// Well-known directories of an installation: where the library's own modules lie, where the
// product keeps its configuration, shared files, per-user data and temporary files, and where
// the strings loader finds translations.
//
//   Path modules = GetDevelopmentBinariesDirectory();   // e.g. /opt/tekit/lib/modules/
//   Path settings = GetConfigurationDirectory();        // e.g. /home/ann/.config/orvane/
//   DynamicString file(settings.CStr());
//   file += "station.ini";
//
// Every directory is absolute and ends in the host's separator ('\' on Windows, '/'
// elsewhere), so a file name appends to it directly. The directories are named, not made:
// none of these functions creates anything on disk.
//
// Where they come from (Windows; Linux and other POSIX systems):
//
//   binaries          the DLL that holds the library (or the program it is linked into);
//                     the shared object that holds it (or the program), through dladdr
//   configuration     Known Folder RoamingAppData + Orvane\;
//                     $XDG_CONFIG_HOME, else ~/.config; + orvane/
//   public            Known Folder PublicDocuments + Orvane\;
//                     the first absolute entry of $XDG_DATA_DIRS, else /usr/local/share;
//                     + orvane/
//   application data  Known Folder LocalAppData + Orvane\;
//                     $XDG_DATA_HOME, else ~/.local/share; + orvane/
//   cache             Known Folder LocalAppData + Orvane\Cache\;
//                     $XDG_CACHE_HOME, else ~/.cache; + orvane/
//   temporary         GetTempPath (TMP, TEMP, USERPROFILE, the Windows directory);
//                     $TMPDIR, else /tmp
//
// As the XDG base-directory rules say, a variable that is unset, empty or not an absolute path
// is ignored and its default used; so is a relative $TMPDIR. "~" is $HOME when that is an
// absolute path, else the home directory of the user's account entry. The product's own
// folders ("Orvane", "orvane") keep each platform's habit of case.
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/DirectoryGetter.h"
#include "tekit/paths/Path.h"

namespace tekit {

/// The directories the resolver knows.
enum class KnownDirectory {
    kBinaries,            ///< the directory of the module that holds the library's code
    kDevelopmentBinaries, ///< kBinaries + "modules": loadable modules of a build tree
    kConfiguration,       ///< the user's product settings
    kPublic,              ///< files the product shares between all users of the machine
    kApplicationData,     ///< the user's product data
    kCache,               ///< the user's product data that may be rebuilt at any time
    kTemporary,           ///< the system's directory for temporary files
};
inline constexpr int kKnownDirectoryCount = static_cast<int>(KnownDirectory::kTemporary) + 1;

/// The directory `which`, resolved anew on each call (so a changed environment variable
/// counts). Raises TE_PATH_NOT_FOUND when the system cannot tell it (no home directory, or a
/// failing Known Folder call), naming the directory and the reason.
TEKIT_API Path GetKnownDirectory(KnownDirectory which);
/// The name of `which` as the `tekit env` command prints it ("binaries", "configuration",
/// "developmentBinaries", ...); "" for a value outside the enumeration.
TEKIT_API char const* KnownDirectoryName(KnownDirectory which);

/// The directory of the module that holds the library's code: libtekit.so / tekit.dll, or the
/// program the library is linked into statically (as the unit tests are).
TEKIT_API Path GetBinariesDirectory();
/// GetBinariesDirectory() plus the development sub-directory "modules", where build trees
/// place loadable modules such as kazlibwapi.
TEKIT_API Path GetDevelopmentBinariesDirectory();
TEKIT_API Path GetConfigurationDirectory();
TEKIT_API Path GetPublicDirectory();
TEKIT_API Path GetApplicationDataDirectory();
TEKIT_API Path GetCacheDirectory();
TEKIT_API Path GetTemporaryDirectory();

/// The directories the strings loader searches, from the known directories:
///
///   language configuration:  the configuration directory
///   strings files of "German":  <binaries>language/German/   (the installation's own)
///                               <public>language/German/     (added on this machine)
///                               <configuration>language/German/  (the user's own)
///
/// A later directory's rows replace those of an earlier one, so a machine's or a user's
/// translation wins over the installed one. Language names are used as given.
class TEKIT_API KnownDirectoryGetter : public DirectoryGetter {
public:
    void GetLanguageDirectories(String const& language, StringVector& directories) override;
    void GetLanguageConfigurationDirectory(String& directory) override;
};

} // namespace tekit
