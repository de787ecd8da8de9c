// Shared opens on Windows: CreateFileA with the mode's access, sharing and creation, or
// CreateFileW for a path in the long-path form, which only the wide call accepts.
#include "platform/Fault.h"
#include "platform/SharedFile.h"
#include "platform/Win32.h"

#include <cstring>
#include <string>

namespace tekit::platform {

namespace {

SystemError LastError(char const* apiFunction) {
    DWORD const code = ::GetLastError();
    return {apiFunction, static_cast<long>(code != 0 ? code : ERROR_GEN_FAILURE)};
}

HANDLE Handle(NativeFile file) {
    return reinterpret_cast<HANDLE>(file);
}

std::wstring Widen(char const* text) {
    int const length = ::MultiByteToWideChar(CP_ACP, 0, text, -1, nullptr, 0);
    std::wstring wide(length > 0 ? std::size_t(length) : 1, L'\0');
    if (length > 0)
        ::MultiByteToWideChar(CP_ACP, 0, text, -1, wide.data(), length);
    wide.resize(wide.size() - 1);
    return wide;
}

DWORD DesiredAccess(FileAccess access) {
    switch (access) {
    case FileAccess::Read:
        return GENERIC_READ;
    case FileAccess::Write:
        return GENERIC_WRITE;
    case FileAccess::ReadWrite:
        break;
    }
    return GENERIC_READ | GENERIC_WRITE;
}

DWORD CreationDisposition(FileCreation creation) {
    switch (creation) {
    case FileCreation::OpenExisting:
        return OPEN_EXISTING;
    case FileCreation::OpenAlways:
        return OPEN_ALWAYS;
    case FileCreation::CreateAlways:
        break;
    }
    return CREATE_ALWAYS;
}

} // namespace

SystemError OpenSharedFile(char const* path, SharedFileMode const& mode, NativeFile& file) {
    bool const longForm = std::strncmp(path, "\\\\?\\", 4) == 0;
    char const* const function = longForm ? "CreateFileW" : "CreateFileA";
    if (SystemError const injected = InjectedFailure(FaultKind::Open, function))
        return injected;
    DWORD const share =
        (mode.shareRead ? FILE_SHARE_READ : 0) | (mode.shareDelete ? FILE_SHARE_DELETE : 0);
    DWORD const flags =
        FILE_ATTRIBUTE_NORMAL | (mode.sequential ? FILE_FLAG_SEQUENTIAL_SCAN : DWORD(0));
    HANDLE const handle =
        longForm ? ::CreateFileW(Widen(path).c_str(), DesiredAccess(mode.access), share, nullptr,
                                 CreationDisposition(mode.creation), flags, nullptr)
                 : ::CreateFileA(path, DesiredAccess(mode.access), share, nullptr,
                                 CreationDisposition(mode.creation), flags, nullptr);
    if (handle == INVALID_HANDLE_VALUE)
        return LastError(function);
    file = reinterpret_cast<NativeFile>(handle);
    return {};
}

SystemError WriteToFileAt(NativeFile file, std::uint64_t offset, void const* data,
                          std::size_t size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Write, "WriteFile"))
        return injected;
    auto const* bytes = static_cast<char const*>(data);
    while (size > 0) {
        OVERLAPPED at{};
        at.Offset = static_cast<DWORD>(offset);
        at.OffsetHigh = static_cast<DWORD>(offset >> 32);
        DWORD const chunk = size > MAXDWORD ? MAXDWORD : static_cast<DWORD>(size);
        DWORD written = 0;
        if (!::WriteFile(Handle(file), bytes, chunk, &written, &at))
            return LastError("WriteFile");
        if (written == 0)
            return {"WriteFile", ERROR_DISK_FULL};
        bytes += written;
        offset += written;
        size -= written;
    }
    return {};
}

SystemError SetOpenFileSize(NativeFile file, std::uint64_t size) {
    if (SystemError const injected = InjectedFailure(FaultKind::Write, "SetEndOfFile"))
        return injected;
    LARGE_INTEGER end{};
    end.QuadPart = static_cast<LONGLONG>(size);
    if (!::SetFilePointerEx(Handle(file), end, nullptr, FILE_BEGIN))
        return LastError("SetFilePointerEx");
    return ::SetEndOfFile(Handle(file)) ? SystemError{} : LastError("SetEndOfFile");
}

} // namespace tekit::platform
