// Fuzzes the executable-file reader: the input read as a Windows executable (headers, export
// table, import tables), and the exports looked up and resolved by name.
//
// A file either reads or raises TE_BAD_FILE_FORMAT; a lookup of a name the table lists finds
// it, and resolving it ends or raises TE_BAD_FILE_FORMAT (a forwarder loop) or
// TE_FUNC_NOT_IN_LIB. Nothing else may happen, and no read may leave the input's bytes.
#include "tekit/errors/TEException.h"
#include "tekit/paths/ExecutableFile.h"
#include "tekit/strings/StringVector.h"

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

// Resolving walks a chain of forwarders; a few names per input keep each run short.
constexpr std::size_t kResolvedNames = 32;

void ReadExports(tekit::ExecutableFile const& file) {
    tekit::ExportTable const exports = file.ReadExports();
    std::size_t resolved = 0;
    for (tekit::ExportedFunction const& f : exports.GetFunctions()) {
        Check(exports.FindOrdinal(f.ordinal) != nullptr);
        if (f.name.IsEmpty())
            continue;
        tekit::ExportedFunction const* found = exports.Find(f.name.GetBufferReadPtr());
        Check(found && std::strcmp(found->name.GetBufferReadPtr(), f.name.GetBufferReadPtr()) == 0);
        if (resolved++ >= kResolvedNames)
            continue;
        try {
            exports.Resolve(f.name.GetBufferReadPtr());
        } catch (tekit::TEException const& e) {
            Check(e.GetErrorCode() == tekit::TE_BAD_FILE_FORMAT ||
                  e.GetErrorCode() == tekit::TE_FUNC_NOT_IN_LIB);
        }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    try {
        tekit::ExecutableFile const file(data, size, "fuzz.dll");
        Check(file.GetBitness() == 32 || file.GetBitness() == 64);
        Check(file.GetMachineName() != nullptr && file.GetSubsystemName() != nullptr);
        for (std::uint32_t i = 0; i < file.GetNumberOfSections(); ++i)
            Check(file.GetSection(i).name[8] == '\0');
        try {
            ReadExports(file);
        } catch (tekit::TEException const& e) {
            Check(e.GetErrorCode() == tekit::TE_BAD_FILE_FORMAT);
        }
        tekit::ImportTable const imports = file.ReadImports();
        tekit::StringVector names;
        imports.GetModuleNames(names, true);
        Check(names.size() <= imports.GetModules().size());
    } catch (tekit::TEException const& e) {
        Check(e.GetErrorCode() == tekit::TE_BAD_FILE_FORMAT);
    }
    return 0;
}
