// errno values as TEErrors, through the Windows runtime's errno numbering.
#include "errors/NativeError.h"

#include <cerrno>

namespace tekit::detail {

TEError NativeErrorToTEError(platform::SystemError const& error, TEError) {
    if (error.code == platform::native::kNotSupported)
        return TE_NOT_SUPPORTED;
    // A file held by someone else, as Windows's sharing violation says it: a lock of the
    // library's file streams (reported as EBUSY), a busy device or a program being run.
    if (error.code == EBUSY || error.code == ETXTBSY)
        return TE_SHARING_VIOLATION;
    return ErrnoToTEError(platform::NativeErrnoToCrtErrno(static_cast<int>(error.code)));
}

} // namespace tekit::detail
