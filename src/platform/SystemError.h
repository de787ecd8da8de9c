// The native error of a failed system call (errno on POSIX, GetLastError() on Windows), the
// translation of errno into the C runtime's numbering, and the system's message texts.
#pragma once

#include <cerrno>
#include <string>

namespace tekit::platform {

/// A failed call: the system function and the native error it reported. A default-constructed
/// value is success; converting to bool asks "did it fail?".
///
///   if (SystemError const error = RemoveFileOrDirectory(path))
///       return error;
struct SystemError {
    /// The system call that failed; null on success.
    char const* apiFunction = nullptr;
    /// errno on POSIX, a Win32 error code on Windows; never 0 on failure.
    long code = 0;

    explicit operator bool() const { return apiFunction != nullptr; }
};

/// Portable names of the native errors that generic code and tests speak of.
namespace native {
#if defined(_WIN32)
inline constexpr long kFileNotFound = 2;      // ERROR_FILE_NOT_FOUND
inline constexpr long kPathNotFound = 3;      // ERROR_PATH_NOT_FOUND
inline constexpr long kAccessDenied = 5;      // ERROR_ACCESS_DENIED
inline constexpr long kCrossDevice = 17;      // ERROR_NOT_SAME_DEVICE
inline constexpr long kSharingViolation = 32; // ERROR_SHARING_VIOLATION
inline constexpr long kNotSupported = 50;     // ERROR_NOT_SUPPORTED
inline constexpr long kFileExists = 80;       // ERROR_FILE_EXISTS
inline constexpr long kDiskFull = 112;        // ERROR_DISK_FULL
inline constexpr long kModuleNotFound = 126;  // ERROR_MOD_NOT_FOUND
inline constexpr long kSymbolNotFound = 127;  // ERROR_PROC_NOT_FOUND
inline constexpr long kAlreadyExists = 183;   // ERROR_ALREADY_EXISTS
/// What writing over a directory reports.
inline constexpr long kIsDirectory = kAccessDenied;
#else
inline constexpr long kFileNotFound = ENOENT;
inline constexpr long kPathNotFound = ENOENT;
inline constexpr long kAccessDenied = EACCES;
inline constexpr long kCrossDevice = EXDEV;
inline constexpr long kSharingViolation = EBUSY;
inline constexpr long kNotSupported = ENOTSUP;
inline constexpr long kFileExists = EEXIST;
inline constexpr long kDiskFull = ENOSPC;
inline constexpr long kModuleNotFound = ENOENT;
inline constexpr long kSymbolNotFound = ENOENT;
inline constexpr long kAlreadyExists = EEXIST;
inline constexpr long kIsDirectory = EISDIR;
#endif
} // namespace native

/// Translates the host's errno value into the C runtime numbering that ErrnoToTEError takes
/// (the Windows runtime's: 36 EDEADLOCK, 38 ENAMETOOLONG, 80 STRUNCATE, ...). Identity on
/// Windows; on POSIX by symbolic name, so it holds on any POSIX system.
int NativeErrnoToCrtErrno(int nativeErrno);

/// The system's message text for a system error code or HRESULT (no trailing line break).
std::string SystemErrorMessage(unsigned code);

} // namespace tekit::platform
