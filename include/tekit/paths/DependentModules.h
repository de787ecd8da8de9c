// FindDependentModules: which DLLs a module needs, directly and through the DLLs it needs,
// and where each is found.
//
//   PathBase::PathVector search;
//   search.push_back(Path("C:\\Orvane\\bin"));
//   for (DependentModule const& dll : FindDependentModules(Path("C:\\tools\\app.exe"), search))
//       if (dll.location.IsEmpty()) ...    // not found: a system DLL, or missing
//
// A DLL is looked for in the module's own directory (the application directory), then in each
// directory of the search list, in order; names compare without regard to ASCII case on every
// platform, as Windows compares them. A found DLL's own imports are followed in turn, so the
// result holds every module reachable from the first one, each once, in the order they were
// first needed (breadth first). Delay-loaded DLLs count, marked as such; so do the modules
// that exports forward to. The operating system's own directories are not searched: a
// system DLL (KERNEL32.dll, api-ms-win-...) is reported as not found unless a search
// directory holds it.
#pragma once

#include "tekit/Export.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/PathVector.h"
#include "tekit/strings/DynamicString.h"

#include <vector>

namespace tekit {

struct TEKIT_API DependentModule {
    /// As the first module to need it spells it.
    DynamicString name;
    /// Where it was found; empty when not found.
    DynamicPath location;
    /// The module that first needed it (its name as found, or the file's own path).
    DynamicString neededBy;
    /// Needed only through delay-loaded imports.
    bool delayLoaded = false;
    /// Needed only because an export of `neededBy` forwards to it.
    bool forwarded = false;
};

/// The modules `file` needs (not `file` itself), searched as above. Raises as ExecutableFile
/// does for `file` and for every DLL found; a directory that cannot be listed is skipped.
TEKIT_API std::vector<DependentModule>
FindDependentModules(PathBase const& file, PathBase::PathVector const& searchDirectories);

} // namespace tekit
