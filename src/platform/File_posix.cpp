// Files on POSIX: stat, rename, mkdir, opendir and friends. Where Windows and POSIX differ,
// the Windows rules that paths follow win: read-only files are neither deleted nor replaced,
// and wildcards ignore case.
#include "platform/Platform.h"

#include "tekit/errors/TEError.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace tekit::platform {

namespace {

/// 100-nanosecond intervals from 1 January 1601 to 1 January 1970.
constexpr std::int64_t kUnixEpochAsFileTime = 116444736000000000LL;
constexpr std::int64_t kFileTimeUnitsPerSecond = 10000000LL;

bool Fail(FileError& error, char const* apiFunction, int nativeErrno) {
    error.code = ErrnoToTEError(NativeErrnoToCrtErrno(nativeErrno));
    error.apiFunction = apiFunction;
    error.systemCode = nativeErrno;
    return false;
}
bool FailWithErrno(FileError& error, char const* apiFunction) {
    return Fail(error, apiFunction, errno);
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

/// The directory part of `path`: up to and including its last '/', or "" (the current one).
std::string DirectoryOf(std::string const& path) {
    size_t const slash = path.rfind('/');
    return slash == std::string::npos ? std::string() : path.substr(0, slash + 1);
}

char FoldCase(char c) {
    return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c;
}

/// Windows wildcards: '*' any run, '?' any one byte, case ignored; "*.*" is every name.
bool MatchesWildcard(char const* pattern, char const* name) {
    if (std::strcmp(pattern, "*.*") == 0)
        return true;
    char const* star = nullptr;
    char const* resume = nullptr;
    while (*name) {
        if (*pattern == '*') {
            star = pattern++;
            resume = name;
        } else if (*pattern == '?' || FoldCase(*pattern) == FoldCase(*name)) {
            ++pattern;
            ++name;
        } else if (star) {
            pattern = star + 1;
            name = ++resume;
        } else {
            return false;
        }
    }
    while (*pattern == '*')
        ++pattern;
    return *pattern == '\0';
}

/// Closes a descriptor when it goes out of scope.
class FileDescriptor {
public:
    explicit FileDescriptor(int fd) : m_fd(fd) {}
    ~FileDescriptor() {
        if (m_fd >= 0)
            ::close(m_fd);
    }
    FileDescriptor(FileDescriptor const&) = delete;
    FileDescriptor& operator=(FileDescriptor const&) = delete;
    int Get() const { return m_fd; }
    /// Closes now, reporting the error that a delayed write may bring.
    bool Close() {
        int const fd = m_fd;
        m_fd = -1;
        return ::close(fd) == 0;
    }

private:
    int m_fd;
};

bool WriteAll(int fd, char const* data, ssize_t size) {
    while (size > 0) {
        ssize_t const written = ::write(fd, data, static_cast<size_t>(size));
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0)
            return false;
        data += written;
        size -= written;
    }
    return true;
}

/// Copies the open `in` into the new file `out`, then gives it the source's mode and times.
bool CopyContents(int in, struct stat const& source, FileDescriptor& out, char const*& api) {
    char buffer[65536];
    for (;;) {
        ssize_t const count = ::read(in, buffer, sizeof buffer);
        if (count < 0 && errno == EINTR)
            continue;
        if (count < 0)
            return (api = "read"), false;
        if (count == 0)
            break;
        if (!WriteAll(out.Get(), buffer, count))
            return (api = "write"), false;
    }
    timespec const times[2] = {source.st_atim, source.st_mtim};
    if (::fchmod(out.Get(), source.st_mode & 07777) != 0)
        return (api = "fchmod"), false;
    if (::futimens(out.Get(), times) != 0)
        return (api = "futimens"), false;
    if (!out.Close())
        return (api = "close"), false;
    return true;
}

/// Puts the finished temporary file at `to`: replacing, or only when nothing is there.
bool PlaceCopy(std::string const& temporary, char const* to, bool overwrite, FileError& error) {
    if (overwrite) {
        if (::rename(temporary.c_str(), to) == 0)
            return true;
        return FailWithErrno(error, "rename");
    }
    if (::link(temporary.c_str(), to) == 0) {
        ::unlink(temporary.c_str());
        return true;
    }
    if (errno == EEXIST)
        return FailWithErrno(error, "link");
    // A file system without hard links: the destination was checked to be free.
    if (::rename(temporary.c_str(), to) == 0)
        return true;
    return FailWithErrno(error, "rename");
}

/// Refuses what Windows refuses before anything is written: an existing destination when
/// not replacing, and a read-only or directory destination.
bool CheckDestination(char const* to, bool replace, char const* api, FileError& error) {
    struct stat existing {};
    if (::lstat(to, &existing) != 0)
        return true;
    if (!replace)
        return Fail(error, api, EEXIST);
    if (S_ISDIR(existing.st_mode))
        return Fail(error, api, EISDIR);
    if (S_ISREG(existing.st_mode) && IsReadOnlyMode(existing.st_mode))
        return Fail(error, api, EACCES);
    return true;
}

void RemoveMadeDirectories(std::vector<std::string> const& made) {
    for (auto it = made.rbegin(); it != made.rend(); ++it)
        ::rmdir(it->c_str());
}

} // namespace

bool QueryFile(char const* path, FileInfo& info, FileError& error) {
    struct stat status {};
    if (::stat(path, &status) != 0)
        return FailWithErrno(error, "stat");
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
    return true;
}

bool SetFileTimeValue(char const* path, int which, std::uint64_t fileTime, FileError& error) {
    if (which == 0) { // POSIX has no call that sets a birth time
        error.code = TE_NOT_SUPPORTED;
        error.apiFunction = "utimensat";
        error.systemCode = ENOTSUP;
        return false;
    }
    timespec times[2];
    times[0].tv_nsec = UTIME_OMIT;
    times[1].tv_nsec = UTIME_OMIT;
    times[which == 1 ? 0 : 1] = FromFileTime(fileTime);
    if (::utimensat(AT_FDCWD, path, times, 0) != 0)
        return FailWithErrno(error, "utimensat");
    return true;
}

bool SetFileReadOnly(char const* path, bool readOnly, FileError& error) {
    struct stat status {};
    if (::stat(path, &status) != 0)
        return FailWithErrno(error, "stat");
    mode_t const mode = readOnly ? (status.st_mode & ~mode_t(S_IWUSR | S_IWGRP | S_IWOTH))
                                 : (status.st_mode | S_IWUSR);
    if (::chmod(path, mode & 07777) != 0)
        return FailWithErrno(error, "chmod");
    return true;
}

bool RemoveFileOrDirectory(char const* path, FileError& error) {
    struct stat status {};
    if (::lstat(path, &status) != 0)
        return FailWithErrno(error, "lstat");
    if (S_ISDIR(status.st_mode))
        return ::rmdir(path) == 0 || FailWithErrno(error, "rmdir");
    if (S_ISREG(status.st_mode) && IsReadOnlyMode(status.st_mode))
        return Fail(error, "unlink", EACCES);
    return ::unlink(path) == 0 || FailWithErrno(error, "unlink");
}

bool CopyRegularFile(char const* from, char const* to, bool overwrite, FileError& error) {
    FileDescriptor in(::open(from, O_RDONLY | O_CLOEXEC));
    if (in.Get() < 0)
        return FailWithErrno(error, "open");
    struct stat source {};
    if (::fstat(in.Get(), &source) != 0)
        return FailWithErrno(error, "fstat");
    if (S_ISDIR(source.st_mode))
        return Fail(error, "read", EISDIR);
    if (!CheckDestination(to, overwrite, "open", error))
        return false;
    std::string temporary = DirectoryOf(to) + ".tekit-copy-XXXXXX";
    FileDescriptor out(::mkstemp(temporary.data()));
    if (out.Get() < 0)
        return FailWithErrno(error, "mkstemp");
    char const* api = "";
    if (!CopyContents(in.Get(), source, out, api)) {
        int const failure = errno;
        ::unlink(temporary.c_str());
        return Fail(error, api, failure);
    }
    if (PlaceCopy(temporary, to, overwrite, error))
        return true;
    ::unlink(temporary.c_str());
    return false;
}

bool MoveFileOrDirectory(char const* from, char const* to, bool replace, FileError& error) {
    struct stat source {};
    if (::lstat(from, &source) != 0)
        return FailWithErrno(error, "rename");
    struct stat existing {};
    bool const destinationExisted = ::lstat(to, &existing) == 0;
    if (destinationExisted && !CheckDestination(to, replace, "rename", error))
        return false;
#if defined(RENAME_NOREPLACE)
    if (!replace && ::renameat2(AT_FDCWD, from, AT_FDCWD, to, RENAME_NOREPLACE) == 0)
        return true;
    bool const tryPlainRename = replace || errno == EINVAL || errno == ENOSYS;
#else
    bool const tryPlainRename = true;
#endif
    if (tryPlainRename && ::rename(from, to) == 0)
        return true;
    if (errno != EXDEV || !S_ISREG(source.st_mode))
        return FailWithErrno(error, "rename");
    // Another volume: copy, then remove the source; the copy goes again if that fails.
    if (!CopyRegularFile(from, to, replace, error))
        return false;
    if (::unlink(from) == 0)
        return true;
    int const failure = errno;
    if (!destinationExisted)
        ::unlink(to);
    return Fail(error, "unlink", failure);
}

bool MakeDirectories(char const* path, FileError& error) {
    std::string const text = path;
    if (text.empty())
        return Fail(error, "mkdir", ENOENT);
    std::vector<std::string> made;
    for (size_t end = 0; end != std::string::npos;) {
        end = text.find('/', end + 1);
        std::string const prefix = text.substr(0, end);
        if (prefix.empty() || prefix.back() == '/')
            continue;
        if (::mkdir(prefix.c_str(), 0777) == 0) {
            made.push_back(prefix);
            continue;
        }
        int failure = errno;
        struct stat status {};
        if (failure == EEXIST && ::stat(prefix.c_str(), &status) == 0 && S_ISDIR(status.st_mode))
            continue;
        RemoveMadeDirectories(made);
        return Fail(error, "mkdir", failure);
    }
    return true;
}

bool ListMatchingFiles(char const* pattern, bool includeDirectories,
                       std::vector<std::string>& paths, FileError& error) {
    std::string const text = pattern;
    std::string const directory = DirectoryOf(text);
    std::string const namePattern = text.substr(directory.size());
    DIR* listing = ::opendir(directory.empty() ? "." : directory.c_str());
    if (!listing)
        return FailWithErrno(error, "opendir");
    errno = 0;
    while (dirent const* entry = namePattern.empty() ? nullptr : ::readdir(listing)) {
        std::string const name = entry->d_name;
        if (name == "." || name == ".." || !MatchesWildcard(namePattern.c_str(), name.c_str()))
            continue;
        std::string const full = directory + name;
        struct stat status {};
        bool const isDirectory = ::stat(full.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
        if (!isDirectory || includeDirectories)
            paths.push_back(full);
    }
    int const failure = errno;
    ::closedir(listing);
    return failure == 0 || Fail(error, "readdir", failure);
}

bool CreateUniqueFile(char const* target, char const* prefix, std::string& created,
                      FileError& error) {
    std::string const text = target;
    std::string name =
        (!text.empty() && text.back() == '/' ? text : DirectoryOf(text)) + prefix + "XXXXXX.tmp";
    int const fd = ::mkstemps(name.data(), 4);
    if (fd < 0)
        return FailWithErrno(error, "mkstemps");
    ::close(fd);
    created = name;
    return true;
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
    struct stat first {
    }, second{};
    return ::stat(a, &first) == 0 && ::stat(b, &second) == 0 && first.st_dev == second.st_dev &&
           first.st_ino == second.st_ino;
}

bool StoredFileName(char const* path, std::string& name) {
    struct stat status {};
    if (::lstat(path, &status) != 0)
        return false;
    std::string const text = path;
    name = text.substr(DirectoryOf(text).size()); // POSIX names are stored as given
    return true;
}

} // namespace tekit::platform
