// The access rights a replaced file keeps: a file written beside its target and renamed over
// it takes the target's permissions first.
//
//   CopyFilePermissions("station.ini", temporaryFile);
#pragma once

#include "platform/File.h"
#include "platform/SystemError.h"

namespace tekit::platform {

/// Gives the open file `to` the permission bits of the file `from` (chmod bits on POSIX); with
/// `from` null, those a new file gets from the process's file mode creation mask (0666 without
/// the umask), as if it had been created by a plain open. On Windows a new file already takes
/// the access rights its directory hands down, so there is nothing to do and the call succeeds.
SystemError CopyFilePermissions(char const* from, NativeFile to);

} // namespace tekit::platform
