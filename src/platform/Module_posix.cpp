// Shared modules on POSIX: dlopen, dlsym, dlclose.
#include "platform/Fault.h"
#include "platform/Module.h"

#include <cerrno>
#include <dlfcn.h>

namespace tekit::platform {

SystemError OpenModule(char const* path, ModuleHandle& module, std::string* loaderText) {
    if (SystemError const injected = InjectedFailure(FaultKind::ModuleLoad, "dlopen")) {
        if (loaderText)
            *loaderText = SystemErrorMessage(static_cast<unsigned>(injected.code));
        return injected;
    }
    errno = 0;
    void* const handle = ::dlopen(path, RTLD_NOW | RTLD_LOCAL);
    if (!handle) {
        // dlopen promises no errno; the failed open of the file usually leaves one.
        long const code = errno != 0 ? errno : native::kModuleNotFound;
        char const* const text = ::dlerror();
        if (loaderText)
            *loaderText = text ? text : "";
        return {"dlopen", code};
    }
    module = handle;
    return {};
}

SystemError FindSymbol(ModuleHandle module, char const* name, void*& address) {
    if (SystemError const injected = InjectedFailure(FaultKind::SymbolLookup, "dlsym"))
        return injected;
    ::dlerror(); // a null address can be a symbol's value: only dlerror tells a failure
    void* const found = ::dlsym(module, name);
    if (::dlerror() != nullptr)
        return {"dlsym", native::kSymbolNotFound};
    address = found;
    return {};
}

void CloseModule(ModuleHandle module) {
    if (module)
        ::dlclose(module);
}

} // namespace tekit::platform
