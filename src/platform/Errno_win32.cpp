#include "platform/Platform.h"

namespace tekit::platform {

int NativeErrnoToCrtErrno(int nativeErrno) {
    // The C runtime's own numbering is the one error conversions are written against.
    return nativeErrno;
}

} // namespace tekit::platform
