// Shared opens on POSIX: open(2), then an open-file-description lock that stands in for the
// Windows sharing rule (see SharedFile.h), then the truncation that creating asks for.
#include "platform/Fault.h"
#include "platform/SharedFile.h"

#include <cerrno>
#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

namespace tekit::platform {

namespace {

int Descriptor(NativeFile file) {
    return static_cast<int>(file);
}

/// The failure of `apiFunction` that `code` describes.
SystemError Failure(char const* apiFunction, int code) {
    return {apiFunction, code != 0 ? code : EIO};
}

/// Takes the lock that stands for the open's sharing. Another description's conflicting lock
/// is a sharing violation. A reader can only take a shared lock: one that shares nothing is
/// treated as one that shares reading.
SystemError LockForSharing(int fd, SharedFileMode const& mode) {
    bool const shared = mode.access == FileAccess::Read;
#if defined(F_OFD_SETLK)
    struct flock lock {};
    lock.l_type = shared ? F_RDLCK : F_WRLCK;
    lock.l_whence = SEEK_SET; // l_start 0, l_len 0: the whole file, however long it grows
    if (::fcntl(fd, F_OFD_SETLK, &lock) == 0)
        return {};
    int const code = errno;
    char const* const function = "fcntl";
#else
    // Without description locks, flock's locks also belong to the open description.
    if (::flock(fd, (shared ? LOCK_SH : LOCK_EX) | LOCK_NB) == 0)
        return {};
    int const code = errno;
    char const* const function = "flock";
#endif
    if (code == EAGAIN || code == EACCES || code == EWOULDBLOCK)
        return {function, native::kSharingViolation};
    return Failure(function, code);
}

bool IsReadOnlyMode(mode_t mode) {
    return (mode & (S_IWUSR | S_IWGRP | S_IWOTH)) == 0;
}

} // namespace

SystemError OpenSharedFile(char const* path, SharedFileMode const& mode, NativeFile& file) {
    if (SystemError const injected = InjectedFailure(FaultKind::Open, "open"))
        return injected;
    int flags = O_CLOEXEC;
    switch (mode.access) {
    case FileAccess::Read:
        flags |= O_RDONLY;
        break;
    case FileAccess::Write:
        flags |= O_WRONLY;
        break;
    case FileAccess::ReadWrite:
        flags |= O_RDWR;
        break;
    }
    if (mode.creation != FileCreation::OpenExisting)
        flags |= O_CREAT; // never O_TRUNC: the lock decides first whether we may touch it
    int const fd = ::open(path, flags, 0666);
    if (fd < 0)
        return errno == EISDIR ? SystemError{"open", native::kAccessDenied}
                               : Failure("open", errno);
    struct stat status {};
    SystemError error;
    if (::fstat(fd, &status) != 0)
        error = Failure("fstat", errno);
    else if (S_ISDIR(status.st_mode))
        error = {"open", native::kAccessDenied}; // as CreateFile refuses a directory
    else if (mode.access != FileAccess::Read && S_ISREG(status.st_mode) &&
             IsReadOnlyMode(status.st_mode))
        error = {"open", native::kAccessDenied}; // the Windows rule, also for root
    else
        error = LockForSharing(fd, mode);
    if (!error && mode.creation == FileCreation::CreateAlways && status.st_size != 0 &&
        ::ftruncate(fd, 0) != 0)
        error = Failure("ftruncate", errno);
    if (error) {
        ::close(fd);
        return error;
    }
#if defined(POSIX_FADV_SEQUENTIAL)
    if (mode.sequential)
        ::posix_fadvise(fd, 0, 0, POSIX_FADV_SEQUENTIAL); // only a hint: its result is no matter
#endif
    file = fd;
    return {};
}

SystemError WriteToFileAt(NativeFile file, std::uint64_t offset, void const* data,
                          std::size_t size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Write, "pwrite"))
        return injected;
    auto const* bytes = static_cast<char const*>(data);
    while (size > 0) {
        ssize_t const written = ::pwrite(Descriptor(file), bytes, size, static_cast<off_t>(offset));
        if (written < 0) {
            if (errno == EINTR)
                continue;
            return Failure("pwrite", errno);
        }
        if (written == 0)
            return {"pwrite", native::kDiskFull};
        bytes += written;
        offset += static_cast<std::uint64_t>(written);
        size -= static_cast<std::size_t>(written);
    }
    return {};
}

SystemError SetOpenFileSize(NativeFile file, std::uint64_t size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Write, "ftruncate"))
        return injected;
    return ::ftruncate(Descriptor(file), static_cast<off_t>(size)) == 0
               ? SystemError{}
               : Failure("ftruncate", errno);
}

} // namespace tekit::platform
