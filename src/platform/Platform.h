// The library's one seam to the operating system.
//
// Every call that touches the OS goes through these functions; each has one implementation per
// platform family (*_posix.cpp, *_win32.cpp), chosen by CMake. No other folder includes
// <windows.h>, <unistd.h> or <pthread.h>.
#pragma once

#include "tekit/platform/WinTypes.h"

#include <cstdint>
#include <string>
#include <vector>

// <windows.h> (included above through WinTypes.h, so no later include brings it back) makes
// GetEnvironmentVariable a macro; the seam's function keeps its own name in every file.
#undef GetEnvironmentVariable

namespace tekit::platform {

// ---- Threads ----------------------------------------------------------------------------
/// A small number that identifies the calling thread while it lives.
std::uint32_t CurrentThreadId();

// ---- Debug output -----------------------------------------------------------------------
/// Writes text to the platform's debug channel: standard error on POSIX, the debugger
/// (OutputDebugStringA) on Windows. The replaceable sink sits above this, in the errors module.
void WriteDebugText(char const* text);

// ---- Environment ------------------------------------------------------------------------
/// The value of an environment variable; false when it is not set.
bool GetEnvironmentVariable(char const* name, std::string& value);

// ---- Code pages -------------------------------------------------------------------------
/// The process's ANSI code page: GetACP() on Windows; 0 (single-byte) elsewhere.
unsigned GetAnsiCodePage();
/// Fills `isLead` with the lead bytes of `codePage`; false when the code page is unknown.
bool GetLeadBytes(unsigned codePage, bool (&isLead)[256]);

// ---- Text conversion --------------------------------------------------------------------
/// Narrow text of `numBytes` bytes in `codePage` (0: single-byte Latin-1) to wide text.
std::wstring NarrowToWide(char const* text, int numBytes, unsigned codePage);
/// Wide text to narrow text in `codePage`; characters it cannot hold become '?'.
std::string WideToNarrow(wchar_t const* text, int numChars, unsigned codePage);

// ---- Errors -----------------------------------------------------------------------------
/// Translates the host's errno value into the C runtime numbering that ErrnoToTEError takes
/// (the Windows runtime's: 36 EDEADLOCK, 38 ENAMETOOLONG, 80 STRUNCATE, ...). Identity on
/// Windows; on POSIX by symbolic name, so it holds on any POSIX system.
int NativeErrnoToCrtErrno(int nativeErrno);
/// The system's message text for a system error code or HRESULT (no trailing line break).
std::string SystemErrorMessage(unsigned code);

// ---- COM error information ------------------------------------------------------------
/// Publishes error information for the calling thread (SetErrorInfo on Windows; a
/// thread-local record elsewhere). Null texts are taken as empty.
void SetThreadErrorInfo(GUID const& iid, char const* source, char const* description,
                        unsigned long helpContext, char const* helpFile);
/// Takes the calling thread's error information (it is consumed); false when there is none.
bool GetThreadErrorInfo(std::string& source, std::string& description);

// ---- Locale -------------------------------------------------------------------------------
/// The decimal separator of the user's locale (LC_ALL, LC_NUMERIC or LANG on POSIX, the
/// user's regional settings on Windows), never of the process's C locale; '.' when the
/// locale's separator is not a single byte or the locale cannot be read.
char GetSystemDecimalSeparator();

// ---- Files ------------------------------------------------------------------------------
//
// Path texts go to the system unchanged. Each call that can fail returns false and fills a
// FileError; a failed call leaves the file system as it was.

/// Why a file call failed: the TEError converted from the system's error (errno through
/// ErrnoToTEError(NativeErrnoToCrtErrno(errno)), Win32 codes through
/// Win32FileIOErrorToTEError), the system call, and the system's own code.
struct FileError {
    std::int32_t code = 0;
    char const* apiFunction = "";
    long systemCode = 0;
};

/// What the system says about a file or directory.
struct FileInfo {
    bool isDirectory = false;
    bool isReadOnly = false;
    std::uint64_t size = 0;
    /// Creation, last access, last write: 100-nanosecond intervals since 1601 (FILETIME).
    std::uint64_t times[3] = {};
};

/// False when nothing is there (or the system cannot tell).
bool QueryFile(char const* path, FileInfo& info, FileError& error);
/// `which` 0 creation, 1 last access, 2 last write.
bool SetFileTimeValue(char const* path, int which, std::uint64_t fileTime, FileError& error);
bool SetFileReadOnly(char const* path, bool readOnly, FileError& error);
/// A file (not a read-only one) or an empty directory.
bool RemoveFileOrDirectory(char const* path, FileError& error);
/// Through a temporary file beside `to`: no partial copy survives a failure. An existing
/// read-only `to` is never replaced.
bool CopyRegularFile(char const* from, char const* to, bool overwrite, FileError& error);
/// Renames; across volumes a file is copied and then removed.
bool MoveFileOrDirectory(char const* from, char const* to, bool replace, FileError& error);
/// Creates every missing directory of `path`, removing again those it made when one fails.
bool MakeDirectories(char const* path, FileError& error);
/// The paths (directory as written in `pattern`, then the name) of the entries whose names
/// match the wildcard file name of `pattern` (* and ?, case ignored). No match is no error.
bool ListMatchingFiles(char const* pattern, bool includeDirectories,
                       std::vector<std::string>& paths, FileError& error);
/// Creates a new empty file `prefix` + six characters + ".tmp" in the directory of
/// `target` (`target` itself when it ends in a separator).
bool CreateUniqueFile(char const* target, char const* prefix, std::string& created,
                      FileError& error);
/// The current directory, when it fits in 260 bytes.
bool CurrentDirectory(std::string& directory);
/// The file of `module` (null: the program), when it fits in 1023 bytes.
bool ModuleFileName(HINSTANCE module, std::string& path);
/// Both texts name the same existing file.
bool SameExistingFile(char const* a, char const* b);
/// The name of the last component of the existing `path` as the file system stores it.
bool StoredFileName(char const* path, std::string& name);
#if defined(_WIN32)
/// Width in pixels of `text` drawn on one line with `font` (null: the system font); -1 when
/// it cannot be measured.
long MeasureTextWidth(char const* text, HFONT font);
#endif

} // namespace tekit::platform
