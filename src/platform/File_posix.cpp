// Files on POSIX, one system call's worth each. Where Windows and POSIX differ, the Windows
// rules that paths follow win: read-only files are not deleted, and a rename that must not
// replace never does.
#include "platform/Fault.h"
#include "platform/File.h"

#include <cerrno>
#include <cstdio>
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace tekit::platform {

char const kRenameFunction[] = "rename";

namespace {

/// 100-nanosecond intervals from 1 January 1601 to 1 January 1970.
constexpr std::int64_t kUnixEpochAsFileTime = 116444736000000000LL;
constexpr std::int64_t kFileTimeUnitsPerSecond = 10000000LL;

/// The failure of `apiFunction` that errno describes.
SystemError Errno(char const* apiFunction) {
    return {apiFunction, errno != 0 ? errno : EIO};
}

int Descriptor(NativeFile file) {
    return static_cast<int>(file);
}

std::uint64_t ToFileTime(std::int64_t seconds, long nanoseconds) {
    return static_cast<std::uint64_t>(seconds * kFileTimeUnitsPerSecond + nanoseconds / 100 +
                                      kUnixEpochAsFileTime);
}

timespec FromFileTime(std::uint64_t fileTime) {
    std::int64_t const units = static_cast<std::int64_t>(fileTime) - kUnixEpochAsFileTime;
    std::int64_t seconds = units / kFileTimeUnitsPerSecond;
    std::int64_t remainder = units % kFileTimeUnitsPerSecond;
    if (remainder < 0) { // before 1970: round the seconds down
        --seconds;
        remainder += kFileTimeUnitsPerSecond;
    }
    timespec result{};
    result.tv_sec = static_cast<time_t>(seconds);
    result.tv_nsec = static_cast<long>(remainder * 100);
    return result;
}

bool IsReadOnlyMode(mode_t mode) {
    return (mode & (S_IWUSR | S_IWGRP | S_IWOTH)) == 0;
}

/// Where the system has no rename that refuses to replace: a hard link refuses, and for what
/// cannot be linked the destination is checked to be free first.
SystemError RenameWithoutReplacing(char const* from, char const* to) {
    if (::link(from, to) == 0) {
        ::unlink(from);
        return {};
    }
    if (errno == EEXIST)
        return Errno("link");
    struct stat existing {};
    if (::lstat(to, &existing) == 0)
        return {"rename", EEXIST};
    return ::rename(from, to) == 0 ? SystemError{} : Errno("rename");
}

bool IsDirectoryEntry(DIR* listing, char const* name) {
    struct stat status {};
    return ::fstatat(::dirfd(listing), name, &status, 0) == 0 && S_ISDIR(status.st_mode);
}

} // namespace

SystemError QueryFile(char const* path, FileInfo& info) {
    if (SystemError const injected = InjectedFailure(FaultKind::Stat, "stat"))
        return injected;
    struct stat status {};
    if (::stat(path, &status) != 0)
        return Errno("stat");
    info.isDirectory = S_ISDIR(status.st_mode);
    info.isReadOnly = IsReadOnlyMode(status.st_mode);
    info.size = static_cast<std::uint64_t>(status.st_size);
    // Where no birth time is kept, the last status change stands in for the creation time.
    info.times[0] = ToFileTime(status.st_ctim.tv_sec, status.st_ctim.tv_nsec);
    info.times[1] = ToFileTime(status.st_atim.tv_sec, status.st_atim.tv_nsec);
    info.times[2] = ToFileTime(status.st_mtim.tv_sec, status.st_mtim.tv_nsec);
#if defined(STATX_BTIME)
    struct statx extended {};
    if (::statx(AT_FDCWD, path, 0, STATX_BTIME, &extended) == 0 &&
        (extended.stx_mask & STATX_BTIME))
        info.times[0] = ToFileTime(extended.stx_btime.tv_sec, extended.stx_btime.tv_nsec);
#endif
    return {};
}

SystemError SetFileTimeValue(char const* path, int which, std::uint64_t fileTime) {
    if (SystemError const injected = InjectedFailure(FaultKind::SetTimes, "utimensat"))
        return injected;
    if (which == 0) // no call sets a birth time
        return {"utimensat", ENOTSUP};
    timespec times[2];
    times[0].tv_nsec = UTIME_OMIT;
    times[1].tv_nsec = UTIME_OMIT;
    times[which == 1 ? 0 : 1] = FromFileTime(fileTime);
    return ::utimensat(AT_FDCWD, path, times, 0) == 0 ? SystemError{} : Errno("utimensat");
}

SystemError SetFileReadOnly(char const* path, bool readOnly) {
    if (SystemError const injected = InjectedFailure(FaultKind::Attributes, "chmod"))
        return injected;
    struct stat status {};
    if (::stat(path, &status) != 0)
        return Errno("stat");
    mode_t const mode = readOnly ? (status.st_mode & ~mode_t(S_IWUSR | S_IWGRP | S_IWOTH))
                                 : (status.st_mode | S_IWUSR);
    return ::chmod(path, mode & 07777) == 0 ? SystemError{} : Errno("chmod");
}

SystemError RemoveFileOrDirectory(char const* path) {
    if (SystemError const injected = InjectedFailure(FaultKind::Delete, "unlink"))
        return injected;
    struct stat status {};
    if (::lstat(path, &status) != 0)
        return Errno("lstat");
    if (S_ISDIR(status.st_mode))
        return ::rmdir(path) == 0 ? SystemError{} : Errno("rmdir");
    if (S_ISREG(status.st_mode) && IsReadOnlyMode(status.st_mode))
        return {"unlink", EACCES};
    return ::unlink(path) == 0 ? SystemError{} : Errno("unlink");
}

SystemError RemoveEmptyDirectory(char const* path) {
    if (SystemError const injected = InjectedFailure(FaultKind::Delete, "rmdir"))
        return injected;
    return ::rmdir(path) == 0 ? SystemError{} : Errno("rmdir");
}

SystemError RenameFile(char const* from, char const* to, bool replace) {
    if (SystemError const injected = InjectedFailure(FaultKind::Rename, "rename"))
        return injected;
    if (replace)
        return ::rename(from, to) == 0 ? SystemError{} : Errno("rename");
#if defined(RENAME_NOREPLACE)
    if (::renameat2(AT_FDCWD, from, AT_FDCWD, to, RENAME_NOREPLACE) == 0)
        return {};
    if (errno != EINVAL && errno != ENOSYS)
        return Errno("rename");
#endif
    return RenameWithoutReplacing(from, to);
}

SystemError MakeDirectory(char const* path, bool& created) {
    created = false;
    if (SystemError const injected = InjectedFailure(FaultKind::DirectoryCreate, "mkdir"))
        return injected;
    if (::mkdir(path, 0777) == 0) {
        created = true;
        return {};
    }
    SystemError const error = Errno("mkdir");
    struct stat status {};
    if (error.code == EEXIST && ::stat(path, &status) == 0 && S_ISDIR(status.st_mode))
        return {};
    return error;
}

SystemError ListDirectory(std::string const& directory, std::vector<DirectoryEntry>& entries) {
    if (SystemError const injected = InjectedFailure(FaultKind::DirectoryList, "opendir"))
        return injected;
    DIR* const listing = ::opendir(directory.empty() ? "." : directory.c_str());
    if (!listing)
        return Errno("opendir");
    for (;;) {
        errno = 0; // readdir's end and its failure differ only in errno
        dirent const* const entry = ::readdir(listing);
        if (!entry)
            break;
        std::string name = entry->d_name;
        if (name == "." || name == "..")
            continue;
        bool const isDirectory = IsDirectoryEntry(listing, entry->d_name);
        entries.push_back({std::move(name), isDirectory});
    }
    int const failure = errno;
    ::closedir(listing);
    return failure == 0 ? SystemError{} : SystemError{"readdir", failure};
}

SystemError OpenFileForReading(char const* path, NativeFile& file) {
    if (SystemError const injected = InjectedFailure(FaultKind::Open, "open"))
        return injected;
    int const fd = ::open(path, O_RDONLY | O_CLOEXEC);
    if (fd < 0)
        return Errno("open");
    file = fd;
    return {};
}

SystemError CreateTemporaryFile(char const* path, NativeFile& file) {
    if (SystemError const injected = InjectedFailure(FaultKind::TemporaryFile, "open"))
        return injected;
    int const fd = ::open(path, O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, 0600);
    if (fd < 0)
        return Errno("open");
    file = fd;
    return {};
}

SystemError ReadFromFile(NativeFile file, void* buffer, std::size_t size, std::size_t& count) {
    if (SystemError const injected = InjectedFailure(FaultKind::Read, "read"))
        return injected;
    for (;;) {
        ssize_t const got = ::read(Descriptor(file), buffer, size);
        if (got >= 0) {
            count = static_cast<std::size_t>(got);
            return {};
        }
        if (errno != EINTR)
            return Errno("read");
    }
}

SystemError ReadFromFileAt(NativeFile file, std::uint64_t offset, void* buffer, std::size_t size,
                           std::size_t& count) {
    if (SystemError const injected = InjectedFailure(FaultKind::Read, "pread"))
        return injected;
    count = 0;
    while (count < size) {
        ssize_t const got = ::pread(Descriptor(file), static_cast<char*>(buffer) + count,
                                    size - count, static_cast<off_t>(offset + count));
        if (got == 0)
            break;
        if (got < 0) {
            if (errno == EINTR)
                continue;
            return Errno("pread");
        }
        count += static_cast<std::size_t>(got);
    }
    return {};
}

SystemError OpenFileSize(NativeFile file, std::uint64_t& size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Stat, "fstat"))
        return injected;
    struct stat info {};
    if (::fstat(Descriptor(file), &info) != 0)
        return Errno("fstat");
    size = static_cast<std::uint64_t>(info.st_size);
    return {};
}

SystemError WriteToFile(NativeFile file, void const* data, std::size_t size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Write, "write"))
        return injected;
    auto const* bytes = static_cast<char const*>(data);
    while (size > 0) {
        ssize_t const written = ::write(Descriptor(file), bytes, size);
        if (written < 0 && errno == EINTR)
            continue;
        if (written < 0)
            return Errno("write");
        if (written == 0) // nothing taken and no reason given: the device is full
            return {"write", ENOSPC};
        bytes += written;
        size -= static_cast<std::size_t>(written);
    }
    return {};
}

SystemError FlushFile(NativeFile file) {
    if (SystemError const injected = InjectedFailure(FaultKind::Flush, "fsync"))
        return injected;
    // EINVAL: a file that cannot be synchronised (a pipe, some special file systems).
    return ::fsync(Descriptor(file)) == 0 || errno == EINVAL ? SystemError{} : Errno("fsync");
}

SystemError CopyFileAttributes(NativeFile from, NativeFile to) {
    if (SystemError const injected = InjectedFailure(FaultKind::Attributes, "fchmod"))
        return injected;
    struct stat source {};
    if (::fstat(Descriptor(from), &source) != 0)
        return Errno("fstat");
    if (::fchmod(Descriptor(to), source.st_mode & 07777) != 0)
        return Errno("fchmod");
    timespec const times[2] = {source.st_atim, source.st_mtim};
    return ::futimens(Descriptor(to), times) == 0 ? SystemError{} : Errno("futimens");
}

SystemError CloseFile(NativeFile file) {
    // The descriptor is gone after close whatever it reports, an injected failure included.
    SystemError const injected = InjectedFailure(FaultKind::Close, "close");
    if (::close(Descriptor(file)) != 0 && !injected)
        return Errno("close");
    return injected;
}

bool CurrentDirectory(std::string& directory) {
    char buffer[260];
    if (!::getcwd(buffer, sizeof buffer))
        return false;
    directory = buffer;
    return true;
}

bool ModuleFileName(HINSTANCE module, std::string& path) {
    char buffer[1024];
    if (!module) {
        ssize_t const length = ::readlink("/proc/self/exe", buffer, 1023);
        if (length <= 0)
            return false;
        buffer[length] = '\0';
        path = buffer;
        return true;
    }
    Dl_info info{};
    if (!::dladdr(module, &info) || !info.dli_fname)
        return false;
    std::snprintf(buffer, sizeof buffer, "%s", info.dli_fname);
    path = buffer;
    return true;
}

bool SameExistingFile(char const* a, char const* b) {
    if (InjectedFailure(FaultKind::Stat, "stat"))
        return false;
    struct stat first {
    }, second{};
    return ::stat(a, &first) == 0 && ::stat(b, &second) == 0 && first.st_dev == second.st_dev &&
           first.st_ino == second.st_ino;
}

bool StoredFileName(char const* path, std::string& name) {
    if (InjectedFailure(FaultKind::Stat, "lstat"))
        return false;
    struct stat status {};
    if (::lstat(path, &status) != 0)
        return false;
    std::string const text = path;
    name = text.substr(DirectoryOf(text).size()); // POSIX names are stored as given
    return true;
}

} // namespace tekit::platform
