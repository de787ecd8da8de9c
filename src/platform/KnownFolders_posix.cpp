// The module holding this code and the account's home directory: the POSIX implementation.
#include "platform/KnownFolders.h"

#include <cerrno>
#include <climits>
#include <cstdlib>
#include <dlfcn.h>
#include <link.h>
#include <pwd.h>
#include <unistd.h>
#include <vector>

namespace tekit::platform {

SystemError LibraryModuleFile(std::string& path) {
    Dl_info info{};
    link_map* module = nullptr;
    // Any address inside this library's code names its module.
    if (!::dladdr1(reinterpret_cast<void*>(&LibraryModuleFile), &info,
                   reinterpret_cast<void**>(&module), RTLD_DL_LINKMAP) ||
        !module)
        return {"dladdr1", ENOENT};
    char buffer[PATH_MAX];
    if (!module->l_name || !*module->l_name) {
        // The main program (the library linked in statically): the kernel knows its file.
        ssize_t const length = ::readlink("/proc/self/exe", buffer, sizeof buffer - 1);
        if (length <= 0)
            return {"readlink", errno != 0 ? errno : ENOENT};
        path.assign(buffer, static_cast<std::size_t>(length));
        return {};
    }
    // A shared object loaded by a relative name: relative to the directory it was loaded from.
    if (!::realpath(module->l_name, buffer))
        return {"realpath", errno};
    path = buffer;
    return {};
}

SystemError AccountHomeDirectory(std::string& path) {
    long const suggested = ::sysconf(_SC_GETPW_R_SIZE_MAX);
    std::vector<char> buffer(suggested > 0 ? static_cast<std::size_t>(suggested) : 4096);
    for (;;) {
        passwd entry{};
        passwd* found = nullptr;
        int const error = ::getpwuid_r(::getuid(), &entry, buffer.data(), buffer.size(), &found);
        if (error == ERANGE && buffer.size() < 1024 * 1024) {
            buffer.resize(buffer.size() * 2);
            continue;
        }
        if (error != 0)
            return {"getpwuid_r", error};
        if (!found || !found->pw_dir || !*found->pw_dir)
            return {"getpwuid_r", ENOENT};
        path = found->pw_dir;
        return {};
    }
}

} // namespace tekit::platform
