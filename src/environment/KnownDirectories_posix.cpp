// The known directories on POSIX systems: the XDG base-directory rules over this process's
// environment and the user's account entry.
#include "environment/DirectoryRules.h"

namespace tekit {

std::string ResolveHostDirectory(KnownDirectory which) {
    return ResolveXdgDirectory(which, SystemDirectorySources());
}

} // namespace tekit
