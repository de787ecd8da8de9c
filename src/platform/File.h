// Files and directories. Path texts go to the system unchanged.
//
// The first group are single system calls, one implementation per family (File_posix.cpp,
// File_win32.cpp), each passing through the fault seam; the second group is generic code built
// on them (File.cpp). A failed call returns the native error and leaves the file system as it
// was.
#pragma once

#include "platform/SystemError.h"
#include "tekit/platform/WinTypes.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace tekit::platform {

#if defined(_WIN32)
/// The host's file names follow the Windows rules: '\' and '/' separate, "X:" is a drive.
inline constexpr bool kWindowsFileNames = true;
inline constexpr char kSeparators[] = "\\/";
#else
inline constexpr bool kWindowsFileNames = false;
inline constexpr char kSeparators[] = "/";
#endif

/// An open file: a descriptor on POSIX, a HANDLE on Windows.
using NativeFile = std::intptr_t;
inline constexpr NativeFile kNoFile = -1;

/// What the system says about a file or directory.
struct FileInfo {
    bool isDirectory = false;
    bool isReadOnly = false;
    std::uint64_t size = 0;
    /// Creation, last access, last write: 100-nanosecond intervals since 1601 (FILETIME).
    std::uint64_t times[3] = {};
};

struct DirectoryEntry {
    std::string name;
    bool isDirectory = false;
};

// ---- Single calls (one per family) -------------------------------------------------------

SystemError QueryFile(char const* path, FileInfo& info);
/// `which` 0 creation, 1 last access, 2 last write. POSIX cannot set a creation time.
SystemError SetFileTimeValue(char const* path, int which, std::uint64_t fileTime);
SystemError SetFileReadOnly(char const* path, bool readOnly);
/// A file (not a read-only one: the Windows rule, also on POSIX) or an empty directory.
SystemError RemoveFileOrDirectory(char const* path);
/// An empty directory that MakeDirectory created (long paths too, on Windows).
SystemError RemoveEmptyDirectory(char const* path);
/// Renames in one step. Without `replace` an existing `to` is never replaced, not even by a
/// race; with it, a file `to` is. Across volumes it fails with native::kCrossDevice.
SystemError RenameFile(char const* from, char const* to, bool replace);
/// Creates one directory; an existing directory is success with `created` false.
SystemError MakeDirectory(char const* path, bool& created);
/// The entries of `directory` ("" is the current one; otherwise it ends in a separator or, on
/// Windows, a drive's ':'), without "." and "..".
SystemError ListDirectory(std::string const& directory, std::vector<DirectoryEntry>& entries);

SystemError OpenFileForReading(char const* path, NativeFile& file);
/// Creates the new file `path` for writing, failing when anything is there; only the user may
/// read or write it (it is a temporary file).
SystemError CreateTemporaryFile(char const* path, NativeFile& file);
/// Reads up to `size` bytes; `count` 0 is the end of the file.
SystemError ReadFromFile(NativeFile file, void* buffer, std::size_t size, std::size_t& count);
/// Reads up to `size` bytes at `offset` without moving the file's position (pread,
/// ReadFile with an offset); `count` below `size` only at the end of the file.
SystemError ReadFromFileAt(NativeFile file, std::uint64_t offset, void* buffer, std::size_t size,
                           std::size_t& count);
/// The size in bytes of the open file.
SystemError OpenFileSize(NativeFile file, std::uint64_t& size);
/// Writes all `size` bytes.
SystemError WriteToFile(NativeFile file, void const* data, std::size_t size);
/// Makes what was written durable: fsync, FlushFileBuffers.
SystemError FlushFile(NativeFile file);
/// Gives `to` the permissions (the read-only flag) and the access and write times of `from`.
SystemError CopyFileAttributes(NativeFile from, NativeFile to);
SystemError CloseFile(NativeFile file);

/// The current directory, when it fits in 260 bytes.
bool CurrentDirectory(std::string& directory);
/// The file of `module` (null: the program), when it fits in 1023 bytes.
bool ModuleFileName(HINSTANCE module, std::string& path);
/// Both texts name the same existing file.
bool SameExistingFile(char const* a, char const* b);
/// The name of the last component of the existing `path` as the file system stores it.
bool StoredFileName(char const* path, std::string& name);

/// The call that RenameFile makes, named when generic code refuses a rename before making it.
extern char const kRenameFunction[];

// ---- Built on them (generic) -------------------------------------------------------------

/// The directory part of `path`: up to and including its last separator (or drive ':').
std::string DirectoryOf(std::string const& path);
/// Windows wildcards: '*' any run, '?' any one byte, case ignored; "*.*" is every name.
bool MatchesWildcard(char const* pattern, char const* name);

/// Copies through a temporary file beside `to`, renamed over it at the end: no partial copy
/// survives a failure. An existing read-only or directory `to` is never replaced.
SystemError CopyRegularFile(char const* from, char const* to, bool overwrite);
/// Renames; across volumes a file is copied and then removed.
SystemError MoveFileOrDirectory(char const* from, char const* to, bool replace);
/// Creates every missing directory of `path`, removing again those it made when one fails.
SystemError MakeDirectories(char const* path);
/// The paths (directory as written in `pattern`, then the name) of the entries whose names
/// match the wildcard file name of `pattern`. No match is no error.
SystemError ListMatchingFiles(char const* pattern, bool includeDirectories,
                              std::vector<std::string>& paths);
/// Creates a new empty file `prefix` + six characters + ".tmp" in the directory of `target`
/// (`target` itself when it ends in a separator). With `file`, it stays open for writing.
SystemError CreateUniqueFile(char const* target, char const* prefix, std::string& created,
                             NativeFile* file = nullptr);

} // namespace tekit::platform
