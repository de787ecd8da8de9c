// errno in the C runtime's numbering, and strerror_r texts.
#include "platform/SystemError.h"

#include <cerrno>
#include <cstdio>
#include <cstring>

namespace tekit::platform {

namespace {

/// strerror_r comes in two shapes (XSI returns int and fills the buffer, GNU returns the text);
/// these overloads accept either.
[[maybe_unused]] char const* StrerrorResult(int rc, char const* buffer) {
    return rc == 0 ? buffer : nullptr;
}
[[maybe_unused]] char const* StrerrorResult(char const* text, char const*) {
    return text;
}

/// Codes below this are taken as error numbers the host can describe; larger ones (HRESULTs,
/// Win32 codes of other subsystems) get the generic text.
constexpr unsigned kErrnoRangeLimit = 4096;

} // namespace

std::string SystemErrorMessage(unsigned code) {
    char buffer[256] = {};
    if (code != 0 && code < kErrnoRangeLimit) {
        char const* text = StrerrorResult(strerror_r(int(code), buffer, sizeof buffer), buffer);
        if (text && *text && std::strncmp(text, "Unknown error", 13) != 0)
            return text;
    }
    if (code >= 0x80000000u)
        std::snprintf(buffer, sizeof buffer, "System error 0x%08X", code);
    else
        std::snprintf(buffer, sizeof buffer, "System error %u", code);
    return buffer;
}

namespace {

struct ErrnoPair {
    int native;
    int crt;
};

/// Host errno names with their number in the C runtime numbering. Matched by name, never by
/// value: on Linux ELOOP is 40, which the runtime numbering uses for ENOSYS. Where two names
/// share one host value (EAGAIN and EWOULDBLOCK, EDEADLK and EDEADLOCK) the first row wins.
constexpr ErrnoPair kErrnoPairs[] = {
    {EPERM, 1},
    {ENOENT, 2},
    {ESRCH, 3},
    {EINTR, 4},
    {EIO, 5},
    {ENXIO, 6},
    {E2BIG, 7},
    {ENOEXEC, 8},
    {EBADF, 9},
    {ECHILD, 10},
    {EAGAIN, 11},
    {ENOMEM, 12},
    {EACCES, 13},
    {EFAULT, 14},
    {EBUSY, 16},
    {EEXIST, 17},
    {EXDEV, 18},
    {ENODEV, 19},
    {ENOTDIR, 20},
    {EISDIR, 21},
    {EINVAL, 22},
    {ENFILE, 23},
    {EMFILE, 24},
    {ENOTTY, 25},
    {EFBIG, 27},
    {ENOSPC, 28},
    {ESPIPE, 29},
    {EROFS, 30},
    {EMLINK, 31},
    {EPIPE, 32},
    {EDOM, 33},
    {ERANGE, 34},
    {EDEADLK, 36},
    {ENAMETOOLONG, 38},
    {ENOLCK, 39},
    {ENOSYS, 40},
    {ENOTEMPTY, 41},
    {EILSEQ, 42},
    // The runtime's POSIX supplement (100 and up).
    {EADDRINUSE, 100},
    {EADDRNOTAVAIL, 101},
    {EAFNOSUPPORT, 102},
    {EALREADY, 103},
    {EBADMSG, 104},
    {ECANCELED, 105},
    {ECONNABORTED, 106},
    {ECONNREFUSED, 107},
    {ECONNRESET, 108},
    {EDESTADDRREQ, 109},
    {EHOSTUNREACH, 110},
    {EIDRM, 111},
    {EINPROGRESS, 112},
    {EISCONN, 113},
    {ELOOP, 114},
    {EMSGSIZE, 115},
    {ENETDOWN, 116},
    {ENETRESET, 117},
    {ENETUNREACH, 118},
    {ENOBUFS, 119},
#ifdef ENODATA
    {ENODATA, 120},
#endif
    {ENOLINK, 121},
    {ENOMSG, 122},
    {ENOPROTOOPT, 123},
#ifdef ENOSR
    {ENOSR, 124},
#endif
#ifdef ENOSTR
    {ENOSTR, 125},
#endif
    {ENOTCONN, 126},
    {ENOTRECOVERABLE, 127},
    {ENOTSOCK, 128},
    {ENOTSUP, 129},
    {EOPNOTSUPP, 130},
    {EOVERFLOW, 132},
    {EOWNERDEAD, 133},
    {EPROTO, 134},
    {EPROTONOSUPPORT, 135},
    {EPROTOTYPE, 136},
#ifdef ETIME
    {ETIME, 137},
#endif
    {ETIMEDOUT, 138},
    {ETXTBSY, 139},
    {EWOULDBLOCK, 140},
};

/// The runtime's "other error" number: what a host value without a counterpart becomes, so it
/// can never be read as an unrelated runtime error that happens to share its number.
constexpr int kCrtOtherError = 131;

} // namespace

int NativeErrnoToCrtErrno(int nativeErrno) {
    if (nativeErrno == 0)
        return 0;
    for (ErrnoPair const& pair : kErrnoPairs)
        if (pair.native == nativeErrno)
            return pair.crt;
    return kCrtOtherError;
}

} // namespace tekit::platform
