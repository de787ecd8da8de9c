// ImportTable: the DLLs a module needs and what it takes from each, as its import directory
// and delay-load import directory list them.
//
//   ImportTable imports = ExecutableFile(Path("tekit.dll")).ReadImports();
//   for (ImportedModule const& module : imports.GetModules())
//       module.name;                  // "KERNEL32.dll", "libstdc++-6.dll", ...
//   StringVector needed;
//   imports.GetModuleNames(needed, false);   // only those loaded with the module
//
// Ordinary imports come first, in the directory's order, then the delay-loaded ones, which
// the module loads on its first call. A DLL named twice in a directory (linkers do that)
// keeps both entries, as the file has them.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <cstdint>
#include <utility>
#include <vector>

namespace tekit {

class StringVector;

struct TEKIT_API ImportedFunction {
    /// Empty for an import by ordinal.
    DynamicString name;
    /// The exporting module's name-table index the linker suggests (imports by name).
    std::uint16_t hint = 0;
    /// The ordinal (imports by ordinal).
    std::uint16_t ordinal = 0;
    bool byOrdinal = false;
};

struct TEKIT_API ImportedModule {
    /// The DLL's name as the import directory spells it.
    DynamicString name;
    /// Loaded on first use (delay-load import directory) rather than with the module.
    bool delayLoaded = false;
    std::vector<ImportedFunction> functions;
};

class TEKIT_API ImportTable {
public:
    std::vector<ImportedModule> const& GetModules() const { return m_modules; }
    bool IsEmpty() const { return m_modules.empty(); }
    /// The modules' names, each once (the first spelling, compared without regard to ASCII
    /// case), delay-loaded ones only with `includeDelayLoaded`; appended to `names`.
    void GetModuleNames(StringVector& names, bool includeDelayLoaded) const;

    // For the reader.
    void Add(ImportedModule module) { m_modules.push_back(std::move(module)); }

private:
    std::vector<ImportedModule> m_modules;
};

} // namespace tekit
