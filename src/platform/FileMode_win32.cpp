// Permissions on Windows: a new file inherits its directory's access rights.
#include "platform/FileMode.h"

namespace tekit::platform {

SystemError CopyFilePermissions(char const*, NativeFile) {
    return {};
}

} // namespace tekit::platform
