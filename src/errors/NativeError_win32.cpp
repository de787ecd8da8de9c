// Win32 error codes as TEErrors, as the error table maps them.
#include "errors/NativeError.h"

namespace tekit::detail {

TEError NativeErrorToTEError(platform::SystemError const& error, TEError win32Fallback) {
    return SystemErrorCodeToTEError(static_cast<unsigned>(error.code), win32Fallback);
}

} // namespace tekit::detail
