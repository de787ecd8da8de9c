// The known directories on Windows: the Known Folders and the temporary directory, with the
// product's folder under them.
#include "environment/DirectoryRules.h"
#include "platform/KnownFolders.h"

namespace tekit {

namespace {

/// The product's folder under the Known Folders.
char const kProductFolder[] = "Orvane";

std::string UnderKnownFolder(KnownDirectory which, platform::KnownFolder folder,
                             char const* subFolder = nullptr) {
    std::string base;
    if (platform::SystemError const error = platform::KnownFolderPath(folder, base))
        RaiseUnknownDirectory(which, error);
    std::string directory = JoinDirectory(base, kProductFolder, '\\');
    return subFolder ? JoinDirectory(directory, subFolder, '\\') : directory;
}

} // namespace

std::string ResolveHostDirectory(KnownDirectory which) {
    using platform::KnownFolder;
    switch (which) {
    case KnownDirectory::kConfiguration:
        return UnderKnownFolder(which, KnownFolder::RoamingAppData);
    case KnownDirectory::kPublic:
        return UnderKnownFolder(which, KnownFolder::PublicDocuments);
    case KnownDirectory::kApplicationData:
        return UnderKnownFolder(which, KnownFolder::LocalAppData);
    case KnownDirectory::kCache:
        return UnderKnownFolder(which, KnownFolder::LocalAppData, "Cache");
    default: {
        std::string directory;
        if (platform::SystemError const error = platform::TemporaryDirectory(directory))
            RaiseUnknownDirectory(which, error);
        return JoinDirectory(directory, nullptr, '\\');
    }
    }
}

} // namespace tekit
