// errno values as TEErrors, through the Windows runtime's errno numbering.
#include "errors/NativeError.h"

namespace tekit::detail {

TEError NativeErrorToTEError(platform::SystemError const& error, TEError) {
    if (error.code == platform::native::kNotSupported)
        return TE_NOT_SUPPORTED;
    return ErrnoToTEError(platform::NativeErrnoToCrtErrno(static_cast<int>(error.code)));
}

} // namespace tekit::detail
