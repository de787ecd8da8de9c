// ExportTable: the functions and data a DLL offers by name or ordinal, as its export
// directory lists them.
//
//   ExportTable exports = ExecutableFile(Path("zlib1.dll")).ReadExports();
//   exports.GetModuleName();                      // "zlib1.dll"
//   if (ExportedFunction const* f = exports.Find("compress"))
//       f->ordinal;                               // with the ordinal base added
//   exports.Resolve("HeapAlloc");                 // follows forwarders within the module
//
// An export is either code or data inside the module (its RVA) or a forwarder, a text such as
// "NTDLL.RtlAllocateHeap" or "NTDLL.#12" that sends the caller to another module's export.
// The functions are listed by ordinal; an ordinal with several names appears once per name
// (in the name table's order), an ordinal without a name once with an empty name, and an
// unused slot of the address table (RVA 0) not at all.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <cstdint>
#include <vector>

namespace tekit {

struct TEKIT_API ExportedFunction {
    /// The ordinal callers use: the table's index plus the ordinal base.
    std::uint32_t ordinal = 0;
    /// Where the export lies in the module; for a forwarder, where its text lies.
    std::uint32_t rva = 0;
    /// Empty for an export by ordinal only.
    DynamicString name;
    /// "MODULE.Function" or "MODULE.#ordinal" when forwarded; empty otherwise.
    DynamicString forwarder;

    bool IsForwarded() const { return !forwarder.IsEmpty(); }
};

class TEKIT_API ExportTable {
public:
    ExportTable();

    /// The module's own name as its export directory records it ("tekit.dll"); empty when
    /// the module has no export directory.
    DynamicString const& GetModuleName() const { return m_moduleName; }
    std::uint32_t GetOrdinalBase() const { return m_ordinalBase; }
    /// By ordinal, then by the name table's order.
    std::vector<ExportedFunction> const& GetFunctions() const { return m_functions; }
    bool IsEmpty() const { return m_functions.empty(); }

    /// The export named `name` (case matters, as for GetProcAddress); null when there is none.
    ExportedFunction const* Find(char const* name) const;
    /// The export of `ordinal` (its first name, when it has several); null when unused.
    ExportedFunction const* FindOrdinal(std::uint32_t ordinal) const;
    /// The export that `name` ends at: forwarders to this same module (its name with or
    /// without ".dll", any case) are followed; a forwarder to another module is returned as
    /// it is. Raises TE_FUNC_NOT_IN_LIB when a name or ordinal on the way is not exported,
    /// and TE_BAD_FILE_FORMAT when the forwarders return to an export already visited.
    ExportedFunction const& Resolve(char const* name) const;

    // For the reader.
    void SetModule(DynamicString const& moduleName, std::uint32_t ordinalBase,
                   DynamicString const& fileName);
    void Add(ExportedFunction function);
    /// Sorts by ordinal (stable) and indexes the names; after the last Add.
    void Finish();

private:
    DynamicString m_moduleName;
    DynamicString m_fileName;
    std::uint32_t m_ordinalBase = 0;
    std::vector<ExportedFunction> m_functions;
    /// Indexes into m_functions, sorted by name.
    std::vector<std::uint32_t> m_byName;
};

} // namespace tekit
