// Permission bits on POSIX: stat the source (or read the umask), fchmod the open file.
#include "platform/Fault.h"
#include "platform/FileMode.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <sys/stat.h>

namespace tekit::platform {

namespace {

/// The process's umask, read without changing it (umask() would, for every thread): from
/// /proc/self/status on Linux, else the usual 022.
mode_t CurrentUmask() {
    mode_t mask = 022;
    if (std::FILE* const status = std::fopen("/proc/self/status", "r")) {
        char line[256];
        unsigned value = 0;
        while (std::fgets(line, sizeof line, status))
            if (std::sscanf(line, "Umask: %o", &value) == 1) {
                mask = static_cast<mode_t>(value);
                break;
            }
        std::fclose(status);
    }
    return mask;
}

} // namespace

SystemError CopyFilePermissions(char const* from, NativeFile to) {
    if (SystemError const injected = InjectedFailure(FaultKind::Attributes, "fchmod"))
        return injected;
    mode_t mode = 0666 & ~CurrentUmask();
    if (from) {
        struct stat status {};
        if (::stat(from, &status) != 0)
            return {"stat", static_cast<long>(errno)};
        mode = status.st_mode & 07777;
    }
    if (::fchmod(static_cast<int>(to), mode) != 0)
        return {"fchmod", static_cast<long>(errno)};
    return {};
}

} // namespace tekit::platform
