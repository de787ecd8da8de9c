// The TEError of a failed platform call: the one place where native errors (errno on POSIX,
// Win32 codes on Windows) become TEErrors.
//
//   if (platform::SystemError const error = platform::RemoveFileOrDirectory(path))
//       TE_RAISE_API(detail::NativeErrorToTEError(error, TE_IO_ERROR), ...);
#pragma once

#include "platform/SystemError.h"
#include "tekit/errors/TEError.h"

namespace tekit::detail {

/// errno values through the C runtime's numbering (ENOTSUP is TE_NOT_SUPPORTED); Win32 codes
/// and HRESULTs as the error table maps them, `win32Fallback` for the others.
TEError NativeErrorToTEError(platform::SystemError const& error, TEError win32Fallback);

} // namespace tekit::detail
