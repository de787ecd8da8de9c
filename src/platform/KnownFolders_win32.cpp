// The module holding this code, the Known Folders and the temporary directory: the Windows
// implementation.
#include "platform/KnownFolders.h"
#include "platform/Win32.h"

#include <knownfolders.h>
#include <shlobj.h>

namespace tekit::platform {

SystemError LibraryModuleFile(std::string& path) {
    HMODULE module = nullptr;
    // Any address inside this library's code names its module; the count of references to it
    // stays as it was.
    if (!::GetModuleHandleExA(GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS |
                                  GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT,
                              reinterpret_cast<LPCSTR>(&LibraryModuleFile), &module))
        return {"GetModuleHandleExA", static_cast<long>(::GetLastError())};
    char buffer[1024];
    DWORD const length = ::GetModuleFileNameA(module, buffer, sizeof buffer);
    if (length == 0 || length >= sizeof buffer)
        return {"GetModuleFileNameA",
                static_cast<long>(length == 0 ? ::GetLastError() : ERROR_INSUFFICIENT_BUFFER)};
    path.assign(buffer, length);
    return {};
}

SystemError KnownFolderPath(KnownFolder folder, std::string& path) {
    KNOWNFOLDERID const& id = folder == KnownFolder::RoamingAppData ? FOLDERID_RoamingAppData
                              : folder == KnownFolder::LocalAppData ? FOLDERID_LocalAppData
                                                                    : FOLDERID_PublicDocuments;
    PWSTR wide = nullptr;
    HRESULT const result = ::SHGetKnownFolderPath(id, KF_FLAG_DONT_VERIFY, nullptr, &wide);
    if (FAILED(result)) {
        ::CoTaskMemFree(wide);
        return {"SHGetKnownFolderPath", static_cast<long>(result)};
    }
    // The ANSI code page, as every narrow path of the library.
    int const size = ::WideCharToMultiByte(CP_ACP, 0, wide, -1, nullptr, 0, nullptr, nullptr);
    std::string narrow(size > 0 ? static_cast<std::size_t>(size) : 0, '\0');
    bool const converted = size > 0 && ::WideCharToMultiByte(CP_ACP, 0, wide, -1, narrow.data(),
                                                             size, nullptr, nullptr) == size;
    DWORD const error = ::GetLastError();
    ::CoTaskMemFree(wide);
    if (!converted)
        return {"WideCharToMultiByte", static_cast<long>(error)};
    narrow.resize(static_cast<std::size_t>(size - 1));
    path = std::move(narrow);
    return {};
}

SystemError TemporaryDirectory(std::string& path) {
    char buffer[MAX_PATH + 1];
    DWORD const length = ::GetTempPathA(sizeof buffer, buffer);
    if (length == 0 || length >= sizeof buffer)
        return {"GetTempPathA",
                static_cast<long>(length == 0 ? ::GetLastError() : ERROR_INSUFFICIENT_BUFFER)};
    path.assign(buffer, length);
    return {};
}

} // namespace tekit::platform
