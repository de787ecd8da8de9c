// Shared modules loaded at run time: dlopen/dlsym on POSIX, LoadLibraryA/GetProcAddress on
// Windows. Loads and look-ups pass through the fault seam.
//
//   ModuleHandle module = nullptr;
//   if (SystemError const error = OpenModule("kazlibwapi.dll", module)) ...
//   void* compress = nullptr;
//   FindSymbol(module, "compress", compress);
//   CloseModule(module);
#pragma once

#include "platform/SystemError.h"

#include <string>

namespace tekit::platform {

/// A loaded module; null is none.
using ModuleHandle = void*;

/// Loads the module at `path` (the system's search rules apply to a bare name). On failure
/// `loaderText`, when given, receives the loader's own explanation (dlerror on POSIX).
SystemError OpenModule(char const* path, ModuleHandle& module, std::string* loaderText = nullptr);
/// The address of the exported symbol `name` of `module`.
SystemError FindSymbol(ModuleHandle module, char const* name, void*& address);
/// Releases a module from OpenModule; null is ignored.
void CloseModule(ModuleHandle module);

} // namespace tekit::platform
