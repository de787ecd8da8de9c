// ImportTable: the names of the modules a module needs.
#include "tekit/paths/ImportTable.h"

#include "tekit/strings/StringVector.h"

#include <string>
#include <unordered_set>

namespace tekit {

void ImportTable::GetModuleNames(StringVector& names, bool includeDelayLoaded) const {
    std::unordered_set<std::string> seen;
    for (ImportedModule const& module : m_modules) {
        if (module.delayLoaded && !includeDelayLoaded)
            continue;
        std::string key = module.name.GetBufferReadPtr();
        for (char& c : key)
            if (c >= 'A' && c <= 'Z')
                c = static_cast<char>(c + 32);
        if (seen.insert(std::move(key)).second)
            names.push_back(module.name);
    }
}

} // namespace tekit
