// Shared modules on Windows: LoadLibraryA, GetProcAddress, FreeLibrary.
#include "platform/Fault.h"
#include "platform/Module.h"
#include "platform/Win32.h"

#include <cstring>

namespace tekit::platform {

SystemError OpenModule(char const* path, ModuleHandle& module, std::string* loaderText) {
    SystemError error = InjectedFailure(FaultKind::ModuleLoad, "LoadLibraryA");
    if (!error) {
        if (HMODULE const handle = ::LoadLibraryA(path)) {
            module = handle;
            return {};
        }
        DWORD const code = ::GetLastError();
        error = {"LoadLibraryA", static_cast<long>(code != 0 ? code : ERROR_MOD_NOT_FOUND)};
    }
    if (loaderText)
        *loaderText = SystemErrorMessage(static_cast<unsigned>(error.code));
    return error;
}

SystemError FindSymbol(ModuleHandle module, char const* name, void*& address) {
    if (SystemError const injected = InjectedFailure(FaultKind::SymbolLookup, "GetProcAddress"))
        return injected;
    FARPROC const found = ::GetProcAddress(static_cast<HMODULE>(module), name);
    if (!found) {
        DWORD const code = ::GetLastError();
        return {"GetProcAddress", static_cast<long>(code != 0 ? code : ERROR_PROC_NOT_FOUND)};
    }
    static_assert(sizeof found == sizeof address);
    std::memcpy(&address, &found, sizeof address); // a function's address as data
    return {};
}

void CloseModule(ModuleHandle module) {
    if (module)
        ::FreeLibrary(static_cast<HMODULE>(module));
}

} // namespace tekit::platform
