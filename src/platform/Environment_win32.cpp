// The process's environment variables: the Windows implementation.
#include "platform/Environment.h"
#include "platform/Win32.h"

namespace tekit::platform {

bool GetEnvironmentVariable(char const* name, std::string& value) {
    if (!name || !*name)
        return false;
    // The process environment itself, not the C runtime's copy, which misses changes made
    // through SetEnvironmentVariableA.
    std::string buffer(64, '\0');
    for (;;) {
        ::SetLastError(ERROR_SUCCESS);
        DWORD const needed =
            ::GetEnvironmentVariableA(name, buffer.data(), static_cast<DWORD>(buffer.size()));
        if (needed == 0) {
            // 0 is both "not set" and "set to the empty text".
            if (::GetLastError() == ERROR_ENVVAR_NOT_FOUND)
                return false;
            value.clear();
            return true;
        }
        if (needed < buffer.size()) {
            buffer.resize(needed);
            value = std::move(buffer);
            return true;
        }
        buffer.assign(needed, '\0'); // `needed` counts the terminator here
    }
}

} // namespace tekit::platform
