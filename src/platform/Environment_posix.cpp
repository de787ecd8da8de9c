// The process's environment variables: the POSIX implementation.
#include "platform/Environment.h"

#include <cstdlib>

namespace tekit::platform {

bool GetEnvironmentVariable(char const* name, std::string& value) {
    char const* v = name ? std::getenv(name) : nullptr;
    if (!v)
        return false;
    value = v;
    return true;
}

} // namespace tekit::platform
