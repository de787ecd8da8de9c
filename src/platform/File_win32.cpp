// Files on Windows, one system call's worth each: the ANSI file calls, and the wide long-path
// calls for the directories that MakeDirectories creates and removes again.
#include "platform/Fault.h"
#include "platform/File.h"
#include "platform/Win32.h"

#include <climits>

namespace tekit::platform {

char const kRenameFunction[] = "MoveFileExA";

namespace {

/// Attributes a copy takes over from its source, as CopyFile does.
constexpr DWORD kCopiedAttributes = FILE_ATTRIBUTE_READONLY | FILE_ATTRIBUTE_HIDDEN |
                                    FILE_ATTRIBUTE_SYSTEM | FILE_ATTRIBUTE_ARCHIVE |
                                    FILE_ATTRIBUTE_NOT_CONTENT_INDEXED;

/// The failure of `apiFunction` that GetLastError describes.
SystemError LastError(char const* apiFunction) {
    DWORD const code = ::GetLastError();
    return {apiFunction, static_cast<long>(code != 0 ? code : ERROR_GEN_FAILURE)};
}

HANDLE Handle(NativeFile file) {
    return reinterpret_cast<HANDLE>(file);
}

NativeFile FromHandle(HANDLE handle) {
    return reinterpret_cast<NativeFile>(handle);
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

} // namespace

SystemError QueryFile(char const* path, FileInfo& info) {
    if (SystemError const injected = InjectedFailure(FaultKind::Stat, "GetFileAttributesExA"))
        return injected;
    WIN32_FILE_ATTRIBUTE_DATA data{};
    if (!::GetFileAttributesExA(path, GetFileExInfoStandard, &data))
        return LastError("GetFileAttributesExA");
    info.isDirectory = (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0;
    info.isReadOnly = (data.dwFileAttributes & FILE_ATTRIBUTE_READONLY) != 0;
    info.size = (std::uint64_t(data.nFileSizeHigh) << 32) | data.nFileSizeLow;
    info.times[0] = ToFileTime(data.ftCreationTime);
    info.times[1] = ToFileTime(data.ftLastAccessTime);
    info.times[2] = ToFileTime(data.ftLastWriteTime);
    return {};
}

SystemError SetFileTimeValue(char const* path, int which, std::uint64_t fileTime) {
    if (SystemError const injected = InjectedFailure(FaultKind::SetTimes, "SetFileTime"))
        return injected;
    HANDLE const file = ::CreateFileA(path, FILE_WRITE_ATTRIBUTES,
                                      FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                      nullptr, OPEN_EXISTING, FILE_FLAG_BACKUP_SEMANTICS, nullptr);
    if (file == INVALID_HANDLE_VALUE)
        return LastError("CreateFileA");
    FILETIME const time = FromFileTime(fileTime);
    BOOL const done = ::SetFileTime(file, which == 0 ? &time : nullptr,
                                    which == 1 ? &time : nullptr, which == 2 ? &time : nullptr);
    SystemError const error = done ? SystemError{} : LastError("SetFileTime");
    ::CloseHandle(file);
    return error;
}

SystemError SetFileReadOnly(char const* path, bool readOnly) {
    if (SystemError const injected = InjectedFailure(FaultKind::Attributes, "SetFileAttributesA"))
        return injected;
    DWORD const attributes = ::GetFileAttributesA(path);
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return LastError("GetFileAttributesA");
    DWORD changed = readOnly ? (attributes | FILE_ATTRIBUTE_READONLY)
                             : (attributes & ~DWORD(FILE_ATTRIBUTE_READONLY));
    if (changed == 0)
        changed = FILE_ATTRIBUTE_NORMAL;
    return ::SetFileAttributesA(path, changed) ? SystemError{} : LastError("SetFileAttributesA");
}

SystemError RemoveFileOrDirectory(char const* path) {
    if (SystemError const injected = InjectedFailure(FaultKind::Delete, "DeleteFileA"))
        return injected;
    DWORD const attributes = ::GetFileAttributesA(path);
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return LastError("GetFileAttributesA");
    if (attributes & FILE_ATTRIBUTE_DIRECTORY)
        return ::RemoveDirectoryA(path) ? SystemError{} : LastError("RemoveDirectoryA");
    return ::DeleteFileA(path) ? SystemError{} : LastError("DeleteFileA");
}

SystemError RemoveEmptyDirectory(char const* path) {
    if (SystemError const injected = InjectedFailure(FaultKind::Delete, "RemoveDirectoryW"))
        return injected;
    return ::RemoveDirectoryW(LongForm(path).c_str()) ? SystemError{}
                                                      : LastError("RemoveDirectoryW");
}

SystemError RenameFile(char const* from, char const* to, bool replace) {
    if (SystemError const injected = InjectedFailure(FaultKind::Rename, "MoveFileExA"))
        return injected;
    // No MOVEFILE_COPY_ALLOWED: a move across volumes is generic code's to do.
    DWORD const flags = replace ? MOVEFILE_REPLACE_EXISTING : 0;
    return ::MoveFileExA(from, to, flags) ? SystemError{} : LastError("MoveFileExA");
}

SystemError MakeDirectory(char const* path, bool& created) {
    created = false;
    if (SystemError const injected =
            InjectedFailure(FaultKind::DirectoryCreate, "CreateDirectoryW"))
        return injected;
    std::wstring const wide = LongForm(path);
    if (::CreateDirectoryW(wide.c_str(), nullptr)) {
        created = true;
        return {};
    }
    SystemError const error = LastError("CreateDirectoryW");
    DWORD const attributes = ::GetFileAttributesW(wide.c_str());
    if (error.code == ERROR_ALREADY_EXISTS && attributes != INVALID_FILE_ATTRIBUTES &&
        (attributes & FILE_ATTRIBUTE_DIRECTORY))
        return {};
    return error;
}

SystemError ListDirectory(std::string const& directory, std::vector<DirectoryEntry>& entries) {
    if (SystemError const injected = InjectedFailure(FaultKind::DirectoryList, "FindFirstFileA"))
        return injected;
    WIN32_FIND_DATAA data{};
    HANDLE const search = ::FindFirstFileA((directory + "*").c_str(), &data);
    if (search == INVALID_HANDLE_VALUE) {
        SystemError const error = LastError("FindFirstFileA");
        bool const empty = error.code == ERROR_FILE_NOT_FOUND || error.code == ERROR_NO_MORE_FILES;
        return empty ? SystemError{} : error;
    }
    do {
        std::string name = data.cFileName;
        if (name != "." && name != "..")
            entries.push_back(
                {std::move(name), (data.dwFileAttributes & FILE_ATTRIBUTE_DIRECTORY) != 0});
    } while (::FindNextFileA(search, &data));
    SystemError const error = LastError("FindNextFileA");
    ::FindClose(search);
    return error.code == ERROR_NO_MORE_FILES ? SystemError{} : error;
}

SystemError OpenFileForReading(char const* path, NativeFile& file) {
    if (SystemError const injected = InjectedFailure(FaultKind::Open, "CreateFileA"))
        return injected;
    HANDLE const handle = ::CreateFileA(path, GENERIC_READ, FILE_SHARE_READ, nullptr, OPEN_EXISTING,
                                        FILE_ATTRIBUTE_NORMAL | FILE_FLAG_SEQUENTIAL_SCAN, nullptr);
    if (handle == INVALID_HANDLE_VALUE)
        return LastError("CreateFileA");
    file = FromHandle(handle);
    return {};
}

SystemError CreateTemporaryFile(char const* path, NativeFile& file) {
    if (SystemError const injected = InjectedFailure(FaultKind::TemporaryFile, "CreateFileA"))
        return injected;
    HANDLE const handle =
        ::CreateFileA(path, GENERIC_WRITE, 0, nullptr, CREATE_NEW, FILE_ATTRIBUTE_NORMAL, nullptr);
    if (handle == INVALID_HANDLE_VALUE)
        return LastError("CreateFileA");
    file = FromHandle(handle);
    return {};
}

SystemError ReadFromFile(NativeFile file, void* buffer, std::size_t size, std::size_t& count) {
    if (SystemError const injected = InjectedFailure(FaultKind::Read, "ReadFile"))
        return injected;
    DWORD got = 0;
    DWORD const wanted = size > MAXDWORD ? MAXDWORD : static_cast<DWORD>(size);
    if (!::ReadFile(Handle(file), buffer, wanted, &got, nullptr))
        return LastError("ReadFile");
    count = got;
    return {};
}

SystemError ReadFromFileAt(NativeFile file, std::uint64_t offset, void* buffer, std::size_t size,
                           std::size_t& count) {
    if (SystemError const injected = InjectedFailure(FaultKind::Read, "ReadFile"))
        return injected;
    count = 0;
    while (count < size) {
        OVERLAPPED at{};
        std::uint64_t const position = offset + count;
        at.Offset = static_cast<DWORD>(position);
        at.OffsetHigh = static_cast<DWORD>(position >> 32);
        std::size_t const left = size - count;
        DWORD const wanted = left > MAXDWORD ? MAXDWORD : static_cast<DWORD>(left);
        DWORD got = 0;
        if (!::ReadFile(Handle(file), static_cast<char*>(buffer) + count, wanted, &got, &at)) {
            if (::GetLastError() == ERROR_HANDLE_EOF)
                break;
            return LastError("ReadFile");
        }
        if (got == 0)
            break;
        count += got;
    }
    return {};
}

SystemError OpenFileSize(NativeFile file, std::uint64_t& size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Stat, "GetFileSizeEx"))
        return injected;
    LARGE_INTEGER value{};
    if (!::GetFileSizeEx(Handle(file), &value))
        return LastError("GetFileSizeEx");
    size = static_cast<std::uint64_t>(value.QuadPart);
    return {};
}

SystemError WriteToFile(NativeFile file, void const* data, std::size_t size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Write, "WriteFile"))
        return injected;
    auto const* bytes = static_cast<char const*>(data);
    while (size > 0) {
        DWORD const chunk = size > MAXDWORD ? MAXDWORD : static_cast<DWORD>(size);
        DWORD written = 0;
        if (!::WriteFile(Handle(file), bytes, chunk, &written, nullptr))
            return LastError("WriteFile");
        if (written == 0)
            return {"WriteFile", ERROR_DISK_FULL};
        bytes += written;
        size -= written;
    }
    return {};
}

SystemError FlushFile(NativeFile file) {
    if (SystemError const injected = InjectedFailure(FaultKind::Flush, "FlushFileBuffers"))
        return injected;
    return ::FlushFileBuffers(Handle(file)) ? SystemError{} : LastError("FlushFileBuffers");
}

SystemError CopyFileAttributes(NativeFile from, NativeFile to) {
    if (SystemError const injected =
            InjectedFailure(FaultKind::Attributes, "SetFileInformationByHandle"))
        return injected;
    FILE_BASIC_INFO info{};
    if (!::GetFileInformationByHandleEx(Handle(from), FileBasicInfo, &info, sizeof info))
        return LastError("GetFileInformationByHandleEx");
    info.CreationTime.QuadPart = 0; // 0: left as it is
    info.ChangeTime.QuadPart = 0;
    info.FileAttributes &= kCopiedAttributes;
    return ::SetFileInformationByHandle(Handle(to), FileBasicInfo, &info, sizeof info)
               ? SystemError{}
               : LastError("SetFileInformationByHandle");
}

SystemError CloseFile(NativeFile file) {
    // The handle is gone after CloseHandle whatever it reports, an injected failure included.
    SystemError const injected = InjectedFailure(FaultKind::Close, "CloseHandle");
    if (!::CloseHandle(Handle(file)) && !injected)
        return LastError("CloseHandle");
    return injected;
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
    if (InjectedFailure(FaultKind::Stat, "GetLongPathNameA"))
        return false;
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
    if (InjectedFailure(FaultKind::Stat, "FindFirstFileA"))
        return false;
    WIN32_FIND_DATAA data{};
    HANDLE const search = ::FindFirstFileA(path, &data);
    if (search == INVALID_HANDLE_VALUE)
        return false;
    name = data.cFileName;
    ::FindClose(search);
    return true;
}

} // namespace tekit::platform
