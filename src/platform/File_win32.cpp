// Files on Windows: the ANSI file calls, and the wide long-path calls to create directories.
#include "platform/Platform.h"
#include "platform/Win32.h"

#include "tekit/errors/TEError.h"

#include <cstdio>

namespace tekit::platform {

namespace {

bool Fail(FileError& error, char const* apiFunction, DWORD code) {
    error.code = Win32FileIOErrorToTEError(code);
    error.apiFunction = apiFunction;
    error.systemCode = static_cast<long>(code);
    return false;
}
bool FailWithLastError(FileError& error, char const* apiFunction) {
    return Fail(error, apiFunction, ::GetLastError());
}

std::uint64_t ToFileTime(FILETIME const& time) {
    return (std::uint64_t(time.dwHighDateTime) << 32) | time.dwLowDateTime;
}
FILETIME FromFileTime(std::uint64_t value) {
    FILETIME time;
    time.dwLowDateTime = DWORD(value & 0xFFFFFFFFu);
    time.dwHighDateTime = DWORD(value >> 32);
    return time;
}

bool IsSeparator(char c) {
    return c == '\\' || c == '/';
}

/// The directory part of `path`: up to and including its last separator or ':', or "".
std::string DirectoryOf(std::string const& path) {
    size_t const end = path.find_last_of("\\/:");
    return end == std::string::npos ? std::string() : path.substr(0, end + 1);
}

/// Attributes of `path`, or INVALID_FILE_ATTRIBUTES.
DWORD AttributesOf(char const* path) {
    return ::GetFileAttributesA(path);
}

/// Refuses what the file calls would half do: an existing destination when not replacing, and
/// a read-only or directory destination.
bool CheckDestination(char const* to, bool replace, char const* api, FileError& error) {
    DWORD const attributes = AttributesOf(to);
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return true;
    if (!replace)
        return Fail(error, api, ERROR_FILE_EXISTS);
    if (attributes & (FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_READONLY))
        return Fail(error, api, ERROR_ACCESS_DENIED);
    return true;
}

void DeleteTemporary(std::string const& path) {
    ::SetFileAttributesA(path.c_str(), FILE_ATTRIBUTE_NORMAL);
    ::DeleteFileA(path.c_str());
}

std::wstring Widen(std::string const& text) {
    int const length = ::MultiByteToWideChar(CP_ACP, 0, text.c_str(), -1, nullptr, 0);
    std::wstring wide(length > 0 ? size_t(length) : 1, L'\0');
    if (length > 0)
        ::MultiByteToWideChar(CP_ACP, 0, text.c_str(), -1, wide.data(), length);
    wide.resize(wide.size() - 1);
    return wide;
}

/// The wide form for the long-path calls of an absolute path (\\?\C:\... or
/// \\?\UNC\srv\share\...), where the system no longer turns '/' into '\'.
std::wstring LongForm(std::string text) {
    for (char& c : text)
        if (c == '/')
            c = '\\';
    bool const drive = text.size() >= 2 && text[1] == ':';
    bool const unc = text.size() >= 2 && text[0] == '\\' && text[1] == '\\';
    if (unc && text.compare(0, 4, "\\\\?\\") != 0)
        return Widen("\\\\?\\UNC\\" + text.substr(2));
    if (drive)
        return Widen("\\\\?\\" + text);
    return Widen(text);
}

/// Index where the directories to create start: after "X:\" or "\\srv\share\".
size_t FirstCreatedLevel(std::string const& text) {
    if (text.size() >= 3 && text[1] == ':' && IsSeparator(text[2]))
        return 3;
    if (text.size() >= 2 && IsSeparator(text[0]) && IsSeparator(text[1])) {
        size_t const machineEnd = text.find_first_of("\\/", 2);
        size_t const shareEnd = machineEnd == std::string::npos
                                    ? machineEnd
                                    : text.find_first_of("\\/", machineEnd + 1);
        return shareEnd == std::string::npos ? text.size() : shareEnd + 1;
    }
    return IsSeparator(text[0]) ? 1 : 0;
}

void RemoveMadeDirectories(std::vector<std::wstring> const& made) {
    for (auto it = made.rbegin(); it != made.rend(); ++it)
        ::RemoveDirectoryW(it->c_str());
}

} // namespace

bool QueryFile(char const* path, FileInfo& info, FileError& error) {
    WIN32_FILE_ATTRIBUTE_DATA data{};
    if (!::GetFileAttributesExA(path, GetFileExInfoStandard, &data))
        return FailWithLastError(error, "GetFileAttributesExA");
    info.isDirectory = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
    info.isReadOnly = (data.dwFileAttributes & FILE_ATTRIBUTE_READONLY) != 0;
    info.size = (std::uint64_t(data.nFileSizeHigh) << 32) | data.nFileSizeLow;
    info.times[0] = ToFileTime(data.ftCreationTime);
    info.times[1] = ToFileTime(data.ftLastAccessTime);
    info.times[2] = ToFileTime(data.ftLastWriteTime);
    return true;
}

bool SetFileTimeValue(char const* path, int which, std::uint64_t fileTime, FileError& error) {
    HANDLE const file = ::CreateFileA(path, FILE_WRITE_ATTRIBUTES,
                                      FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                      nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (file == INVALID_HANDLE_VALUE)
        return FailWithLastError(error, "CreateFileA");
    FILETIME const time = FromFileTime(fileTime);
    BOOL const done = ::SetFileTime(file, which == 0 ? &time : nullptr,
                                    which == 1 ? &time : nullptr, which == 2 ? &time : nullptr);
    DWORD const failure = ::GetLastError();
    ::CloseHandle(file);
    return done || Fail(error, "SetFileTime", failure);
}

bool SetFileReadOnly(char const* path, bool readOnly, FileError& error) {
    DWORD const attributes = AttributesOf(path);
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return FailWithLastError(error, "GetFileAttributesA");
    DWORD changed = readOnly ? (attributes | FILE_ATTRIBUTE_READONLY)
                             : (attributes & ~DWORD(FILE_ATTRIBUTE_READONLY));
    if (changed == 0)
        changed = FILE_ATTRIBUTE_NORMAL;
    return ::SetFileAttributesA(path, changed) || FailWithLastError(error, "SetFileAttributesA");
}

bool RemoveFileOrDirectory(char const* path, FileError& error) {
    DWORD const attributes = AttributesOf(path);
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return FailWithLastError(error, "GetFileAttributesA");
    if (attributes & FILE_ATTRIBUTE_DIRECTORY)
        return ::RemoveDirectoryA(path) || FailWithLastError(error, "RemoveDirectoryA");
    return ::DeleteFileA(path) || FailWithLastError(error, "DeleteFileA");
}

bool CopyRegularFile(char const* from, char const* to, bool overwrite, FileError& error) {
    if (AttributesOf(from) == INVALID_FILE_ATTRIBUTES)
        return FailWithLastError(error, "CopyFileA");
    if (!CheckDestination(to, overwrite, "CopyFileA", error))
        return false;
    std::string directory = DirectoryOf(to);
    char temporary[MAX_PATH + 1] = {};
    if (!::GetTempFileNameA(directory.empty() ? "." : directory.c_str(), "tkc", 0, temporary))
        return FailWithLastError(error, "GetTempFileNameA");
    if (!::CopyFileA(from, temporary, FALSE)) {
        DWORD const failure = ::GetLastError();
        DeleteTemporary(temporary);
        return Fail(error, "CopyFileA", failure);
    }
    if (::MoveFileExA(temporary, to, overwrite ? MOVEFILE_REPLACE_EXISTING : 0))
        return true;
    DWORD const failure = ::GetLastError();
    DeleteTemporary(temporary);
    return Fail(error, "MoveFileExA", failure);
}

bool MoveFileOrDirectory(char const* from, char const* to, bool replace, FileError& error) {
    if (AttributesOf(from) == INVALID_FILE_ATTRIBUTES)
        return FailWithLastError(error, "MoveFileExA");
    if (!CheckDestination(to, replace, "MoveFileExA", error))
        return false;
    DWORD const flags = MOVEFILE_COPY_ALLOWED | (replace ? MOVEFILE_REPLACE_EXISTING : 0);
    return ::MoveFileExA(from, to, flags) || FailWithLastError(error, "MoveFileExA");
}

bool MakeDirectories(char const* path, FileError& error) {
    std::string const text = path;
    if (text.empty())
        return Fail(error, "CreateDirectoryW", ERROR_PATH_NOT_FOUND);
    std::vector<std::wstring> made;
    for (size_t end = FirstCreatedLevel(text); end < text.size();) {
        size_t const separator = text.find_first_of("\\/", end);
        end = separator == std::string::npos ? text.size() : separator + 1;
        std::string const prefix = text.substr(0, separator == std::string::npos ? end : separator);
        if (prefix.empty() || IsSeparator(prefix.back()))
            continue;
        std::wstring const wide = LongForm(prefix);
        if (::CreateDirectoryW(wide.c_str(), nullptr)) {
            made.push_back(wide);
            continue;
        }
        DWORD const failure = ::GetLastError();
        DWORD const attributes = ::GetFileAttributesW(wide.c_str());
        if (failure == ERROR_ALREADY_EXISTS && attributes != INVALID_FILE_ATTRIBUTES &&
            (attributes & FILE_ATTRIBUTE_DIRECTORY))
            continue;
        RemoveMadeDirectories(made);
        return Fail(error, "CreateDirectoryW", failure);
    }
    return true;
}

bool ListMatchingFiles(char const* pattern, bool includeDirectories,
                       std::vector<std::string>& paths, FileError& error) {
    std::string const directory = DirectoryOf(pattern);
    WIN32_FIND_DATAA data{};
    HANDLE const search = ::FindFirstFileA(pattern, &data);
    if (search == INVALID_HANDLE_VALUE) {
        DWORD const failure = ::GetLastError();
        if (failure == ERROR_FILE_NOT_FOUND || failure == ERROR_NO_MORE_FILES)
            return true;
        return Fail(error, "FindFirstFileA", failure);
    }
    do {
        std::string const name = data.cFileName;
        bool const isDirectory = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
        if (name != "." && name != ".." && (!isDirectory || includeDirectories))
            paths.push_back(directory + name);
    } while (::FindNextFileA(search, &data));
    DWORD const failure = ::GetLastError();
    ::FindClose(search);
    return failure == ERROR_NO_MORE_FILES || Fail(error, "FindNextFileA", failure);
}

bool CreateUniqueFile(char const* target, char const* prefix, std::string& created,
                      FileError& error) {
    std::string const text = target;
    std::string const directory =
        !text.empty() && IsSeparator(text.back()) ? text : DirectoryOf(text);
    // Six hex digits from a per-process start, tried in turn as GetTempFileNameA does.
    DWORD const start = (::GetTickCount() ^ (::GetCurrentProcessId() << 8)) & 0xFFFFFF;
    for (DWORD attempt = 0; attempt < 0x1000000; ++attempt) {
        char suffix[16];
        std::snprintf(suffix, sizeof suffix, "%06lX.tmp",
                      static_cast<unsigned long>((start + attempt) & 0xFFFFFF));
        std::string const name = directory + prefix + suffix;
        HANDLE const file = ::CreateFileA(name.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                          FILE_ATTRIBUTE_NORMAL, nullptr);
        if (file != INVALID_HANDLE_VALUE) {
            ::CloseHandle(file);
            created = name;
            return true;
        }
        DWORD const failure = ::GetLastError();
        if (failure != ERROR_FILE_EXISTS && failure != ERROR_ALREADY_EXISTS)
            return Fail(error, "CreateFileA", failure);
    }
    return Fail(error, "CreateFileA", ERROR_FILE_EXISTS);
}

bool CurrentDirectory(std::string& directory) {
    char buffer[260];
    DWORD const length = ::GetCurrentDirectoryA(sizeof buffer, buffer);
    if (length == 0 || length >= sizeof buffer)
        return false;
    directory.assign(buffer, length);
    return true;
}

bool ModuleFileName(HINSTANCE module, std::string& path) {
    char buffer[1024];
    DWORD const length = ::GetModuleFileNameA(module, buffer, 1023);
    buffer[1023] = '\0';
    if (length == 0)
        return false;
    path = buffer;
    return true;
}

bool SameExistingFile(char const* a, char const* b) {
    char fullA[1024], fullB[1024], longA[1024], longB[1024];
    if (!::GetFullPathNameA(a, sizeof fullA, fullA, nullptr) ||
        !::GetFullPathNameA(b, sizeof fullB, fullB, nullptr))
        return false;
    DWORD const lengthA = ::GetLongPathNameA(fullA, longA, sizeof longA);
    DWORD const lengthB = ::GetLongPathNameA(fullB, longB, sizeof longB);
    if (lengthA == 0 || lengthA >= sizeof longA || lengthB == 0 || lengthB >= sizeof longB)
        return false;
    return ::lstrcmpiA(longA, longB) == 0;
}

bool StoredFileName(char const* path, std::string& name) {
    WIN32_FIND_DATAA data{};
    HANDLE const search = ::FindFirstFileA(path, &data);
    if (search == INVALID_HANDLE_VALUE)
        return false;
    name = data.cFileName;
    ::FindClose(search);
    return true;
}

} // namespace tekit::platform
