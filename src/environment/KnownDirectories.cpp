// The known directories: the binaries from the library's own module, the others from the
// host's rules (KnownDirectories_posix.cpp, KnownDirectories_win32.cpp), and the strings
// loader's directories built on them.
#include "tekit/environment/KnownDirectories.h"

#include "environment/DirectoryRules.h"
#include "platform/File.h"
#include "platform/KnownFolders.h"
#include "tekit/errors/TEException.h"
#include "tekit/strings/StringVector.h"

namespace tekit {

/// The host's rule for every directory but the binaries (one definition per family).
std::string ResolveHostDirectory(KnownDirectory which);

namespace {

char const kSeparator = platform::kSeparators[0];

std::string BinariesDirectory() {
    std::string file;
    if (platform::SystemError const error = platform::LibraryModuleFile(file))
        RaiseUnknownDirectory(KnownDirectory::kBinaries, error);
    return ModuleDirectory(file);
}

std::string Resolve(KnownDirectory which) {
    switch (which) {
    case KnownDirectory::kBinaries:
        return BinariesDirectory();
    case KnownDirectory::kDevelopmentBinaries:
        return JoinDirectory(BinariesDirectory(), "modules", kSeparator);
    default:
        return ResolveHostDirectory(which);
    }
}

} // namespace

Path GetKnownDirectory(KnownDirectory which) {
    return ToDirectoryPath(which, Resolve(which));
}

char const* KnownDirectoryName(KnownDirectory which) {
    switch (which) {
    case KnownDirectory::kBinaries:
        return "binaries";
    case KnownDirectory::kDevelopmentBinaries:
        return "developmentBinaries";
    case KnownDirectory::kConfiguration:
        return "configuration";
    case KnownDirectory::kPublic:
        return "public";
    case KnownDirectory::kApplicationData:
        return "applicationData";
    case KnownDirectory::kCache:
        return "cache";
    case KnownDirectory::kTemporary:
        return "temporary";
    }
    return "";
}

Path GetBinariesDirectory() {
    return GetKnownDirectory(KnownDirectory::kBinaries);
}
Path GetDevelopmentBinariesDirectory() {
    return GetKnownDirectory(KnownDirectory::kDevelopmentBinaries);
}
Path GetConfigurationDirectory() {
    return GetKnownDirectory(KnownDirectory::kConfiguration);
}
Path GetPublicDirectory() {
    return GetKnownDirectory(KnownDirectory::kPublic);
}
Path GetApplicationDataDirectory() {
    return GetKnownDirectory(KnownDirectory::kApplicationData);
}
Path GetCacheDirectory() {
    return GetKnownDirectory(KnownDirectory::kCache);
}
Path GetTemporaryDirectory() {
    return GetKnownDirectory(KnownDirectory::kTemporary);
}

void KnownDirectoryGetter::GetLanguageDirectories(String const& language,
                                                  StringVector& directories) {
    std::string const name(language.GetBufferReadPtr());
    for (KnownDirectory const which :
         {KnownDirectory::kBinaries, KnownDirectory::kPublic, KnownDirectory::kConfiguration}) {
        // A directory the system cannot tell (a user without a home) holds no translations;
        // the others still count.
        std::string base;
        try {
            base = Resolve(which);
        } catch (TEException const&) {
            continue;
        }
        std::string const directory =
            JoinDirectory(JoinDirectory(base, "language", kSeparator), name.c_str(), kSeparator);
        directories.push_back(DynamicString(directory.c_str()));
    }
}

void KnownDirectoryGetter::GetLanguageConfigurationDirectory(String& directory) {
    directory.Assign(GetConfigurationDirectory().CStr());
}

} // namespace tekit
