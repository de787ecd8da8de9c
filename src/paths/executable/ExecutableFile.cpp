// ExecutableFile: the headers' facts, and the export and import tables read on request.
#include "tekit/paths/ExecutableFile.h"

#include "paths/executable/PEImage.h"
#include "tekit/errors/Raise.h"
#include "tekit/paths/PathBase.h"

#include <cstring>
#include <string>

namespace tekit {

using executable::Detail;
using executable::ImageReader;
using executable::PEImage;

struct ExecutableFile::Image {
    std::unique_ptr<PEImage> pe;
};

namespace {

constexpr std::uint16_t kLargeAddressAware = 0x0020;
constexpr std::uint16_t kDllFile = 0x2000;
constexpr std::uint32_t kImportDescriptorSize = 20;
constexpr std::uint32_t kDelayDescriptorSize = 32;
constexpr std::uint32_t kExportDirectorySize = 40;

std::uint32_t Le32(unsigned char const* p) {
    return static_cast<std::uint32_t>(p[0] | p[1] << 8 | p[2] << 16) |
           static_cast<std::uint32_t>(p[3]) << 24;
}

bool AllZero(unsigned char const* p, std::size_t size) {
    for (std::size_t i = 0; i < size; ++i)
        if (p[i])
            return false;
    return true;
}

/// The functions of one import lookup table (a list of thunks ending in 0) at `list`.
void ReadThunks(ImageReader& reader, std::uint32_t list, ImportedModule& module) {
    int const bitness = reader.Image().bitness;
    std::uint32_t const entrySize = bitness == 64 ? 8 : 4;
    std::uint64_t const ordinalFlag = bitness == 64 ? std::uint64_t{1} << 63 : 0x80000000u;
    for (std::uint64_t i = 0;; ++i) {
        std::uint32_t const at = reader.Add(list, i * entrySize, "import lookup table");
        std::uint64_t const thunk = bitness == 64 ? reader.U64(at, "import lookup table")
                                                  : reader.U32(at, "import lookup table");
        if (thunk == 0)
            return;
        reader.ChargeEntries(1, "import lookup table");
        ImportedFunction function;
        if (thunk & ordinalFlag) {
            function.byOrdinal = true;
            function.ordinal = static_cast<std::uint16_t>(thunk & 0xffff);
        } else {
            auto const hintName = static_cast<std::uint32_t>(thunk & 0x7fffffff);
            function.hint = reader.U16(hintName, "import hint/name entry");
            function.name = reader.Name(reader.Add(hintName, 2, "import hint/name entry"),
                                        "imported function's name");
        }
        module.functions.push_back(std::move(function));
    }
}

/// Reads the `Size`-byte descriptors of data directory `index` in turn until `take` returns
/// false (the list's end); `what` names the directory in errors.
template <std::uint32_t Size, class Take>
void ForEachDescriptor(ImageReader& reader, executable::DataDirectory index, char const* what,
                       Take&& take) {
    std::uint32_t const directory = reader.Image().directoryRva[index];
    if (directory == 0)
        return;
    for (std::uint64_t i = 0;; ++i) {
        unsigned char d[Size];
        reader.Read(reader.Add(directory, i * Size, what), d, sizeof d, what);
        if (!take(static_cast<unsigned char const*>(d)))
            return;
    }
}

void ReadOrdinaryImports(ImageReader& reader, ImportTable& table) {
    ForEachDescriptor<kImportDescriptorSize>(
        reader, executable::kImportDirectory, "import directory", [&](unsigned char const* d) {
            std::uint32_t const lookup = Le32(d), nameRva = Le32(d + 12), addresses = Le32(d + 16);
            // The list ends with a descriptor that points to no table.
            if (lookup == 0 && addresses == 0)
                return false;
            reader.ChargeEntries(1, "import directory");
            ImportedModule module;
            module.name = reader.Name(nameRva, "imported DLL's name");
            ReadThunks(reader, lookup != 0 ? lookup : addresses, module);
            table.Add(std::move(module));
            return true;
        });
}

void ReadDelayImports(ImageReader& reader, ImportTable& table) {
    PEImage const& image = reader.Image();
    ForEachDescriptor<kDelayDescriptorSize>(
        reader, executable::kDelayImportDirectory, "delay-load directory",
        [&](unsigned char const* d) {
            if (AllZero(d, kDelayDescriptorSize))
                return false;
            std::uint32_t const attributes = Le32(d);
            std::uint32_t nameRva = Le32(d + 4), names = Le32(d + 16);
            if (nameRva == 0)
                return false;
            // Descriptors of the oldest linkers (attribute bit 0 clear) hold addresses, not
            // RVAs.
            if ((attributes & 1) == 0) {
                std::uint64_t const base = image.imageBase;
                if (nameRva < base || nameRva - base > 0xffffffffu || (names && names < base))
                    reader.Malformed(Detail("EXE_RVA_WRAPS_1", "delay-load directory"));
                nameRva = static_cast<std::uint32_t>(nameRva - base);
                if (names)
                    names = static_cast<std::uint32_t>(names - base);
            }
            reader.ChargeEntries(1, "delay-load directory");
            ImportedModule module;
            module.delayLoaded = true;
            module.name = reader.Name(nameRva, "delay-loaded DLL's name");
            if (names != 0)
                ReadThunks(reader, names, module);
            table.Add(std::move(module));
            return true;
        });
}

} // namespace

ExecutableFile::ExecutableFile(PathBase const& path) : m_image(new Image) {
    m_image->pe = PEImage::Open(path.CStr(), "ExecutableFile::ExecutableFile");
}

ExecutableFile::ExecutableFile(void const* bytes, std::size_t size, char const* name)
    : m_image(new Image) {
    m_image->pe = PEImage::FromBytes(bytes, size, name, "ExecutableFile::ExecutableFile");
}

ExecutableFile::ExecutableFile(ExecutableFile&& other) noexcept = default;
ExecutableFile& ExecutableFile::operator=(ExecutableFile&& other) noexcept = default;
ExecutableFile::~ExecutableFile() = default;

DynamicString const& ExecutableFile::GetFileName() const {
    return m_image->pe->fileName;
}
std::uint16_t ExecutableFile::GetMachine() const {
    return m_image->pe->machine;
}
int ExecutableFile::GetBitness() const {
    return m_image->pe->bitness;
}
std::uint16_t ExecutableFile::GetCharacteristics() const {
    return m_image->pe->characteristics;
}
bool ExecutableFile::IsLargeAddressAware() const {
    return (m_image->pe->characteristics & kLargeAddressAware) != 0;
}
bool ExecutableFile::IsDll() const {
    return (m_image->pe->characteristics & kDllFile) != 0;
}
std::uint16_t ExecutableFile::GetSubsystem() const {
    return m_image->pe->subsystem;
}
std::uint16_t ExecutableFile::GetDllCharacteristics() const {
    return m_image->pe->dllCharacteristics;
}
std::uint64_t ExecutableFile::GetImageBase() const {
    return m_image->pe->imageBase;
}
std::uint32_t ExecutableFile::GetNumberOfSections() const {
    return static_cast<std::uint32_t>(m_image->pe->sections.size());
}

ExecutableSection const& ExecutableFile::GetSection(std::uint32_t index) const {
    if (index >= m_image->pe->sections.size())
        TE_RAISE(TE_INDEX_OUT_OF_RANGE, nullptr, "ExecutableFile::GetSection");
    return m_image->pe->sections[index];
}

char const* ExecutableFile::GetMachineName() const {
    switch (GetMachine()) {
    case kMachineI386:
        return "i386";
    case kMachineAmd64:
        return "x86-64";
    case kMachineArm:
        return "arm";
    case kMachineArmThumb2:
        return "arm-thumb2";
    case kMachineIA64:
        return "ia64";
    case kMachineArm64:
        return "arm64";
    default:
        return "unknown";
    }
}

char const* ExecutableFile::GetSubsystemName() const {
    switch (GetSubsystem()) {
    case kSubsystemNative:
        return "native";
    case kSubsystemWindowsGui:
        return "windows-gui";
    case kSubsystemWindowsCui:
        return "windows-cui";
    case kSubsystemWindowsCeGui:
        return "windows-ce-gui";
    case kSubsystemEfiApplication:
        return "efi-application";
    default:
        return "unknown";
    }
}

ExportTable ExecutableFile::ReadExports() const {
    PEImage const& image = *m_image->pe;
    ImageReader reader(image, "ExecutableFile::ReadExports");
    ExportTable table;
    std::uint32_t const directory = image.directoryRva[executable::kExportDirectory];
    if (directory == 0)
        return table;
    unsigned char d[kExportDirectorySize];
    reader.Read(directory, d, sizeof d, "export directory");
    std::uint32_t const nameRva = Le32(d + 12), base = Le32(d + 16);
    std::uint32_t const functionCount = Le32(d + 20), nameCount = Le32(d + 24);
    std::uint32_t const addresses = Le32(d + 28), names = Le32(d + 32), ordinals = Le32(d + 36);
    table.SetModule(nameRva ? reader.Name(nameRva, "exporting module's name") : DynamicString(),
                    base, image.fileName);

    // Every count is checked against the bytes its table has before anything is allocated.
    std::vector<unsigned char> addressBytes, nameBytes, ordinalBytes;
    if (functionCount != 0) {
        reader.CheckTable(addresses, functionCount, 4, "export address table");
        reader.ChargeEntries(functionCount, "export address table");
        addressBytes.resize(std::size_t{functionCount} * 4);
        reader.Read(addresses, addressBytes.data(), addressBytes.size(), "export address table");
    }
    if (nameCount != 0) {
        reader.CheckTable(names, nameCount, 4, "export name table");
        reader.CheckTable(ordinals, nameCount, 2, "export ordinal table");
        reader.ChargeEntries(nameCount, "export name table");
        nameBytes.resize(std::size_t{nameCount} * 4);
        ordinalBytes.resize(std::size_t{nameCount} * 2);
        reader.Read(names, nameBytes.data(), nameBytes.size(), "export name table");
        reader.Read(ordinals, ordinalBytes.data(), ordinalBytes.size(), "export ordinal table");
    }
    if (std::uint64_t{base} + functionCount > 0x100000000u)
        reader.Malformed(Detail("EXE_RVA_WRAPS_1", "export ordinal base"));

    // An RVA inside the export directory's own range is a forwarder's text.
    std::uint64_t const directoryEnd =
        std::uint64_t{directory} + image.directorySize[executable::kExportDirectory];
    auto const entry = [&](std::uint32_t index, DynamicString name) {
        ExportedFunction function;
        function.ordinal = base + index;
        function.rva = Le32(addressBytes.data() + std::size_t{index} * 4);
        function.name = std::move(name);
        if (function.rva >= directory && function.rva < directoryEnd)
            function.forwarder = reader.Name(function.rva, "export forwarder");
        table.Add(std::move(function));
    };
    std::vector<bool> named(functionCount);
    for (std::uint32_t i = 0; i < nameCount; ++i) {
        DynamicString name =
            reader.Name(Le32(nameBytes.data() + std::size_t{i} * 4), "exported name");
        std::uint32_t const index = static_cast<std::uint32_t>(
            ordinalBytes[2 * std::size_t{i}] | ordinalBytes[2 * std::size_t{i} + 1] << 8);
        if (index >= functionCount)
            reader.Malformed(Detail("EXE_ORDINAL_OUT_OF_RANGE_1", name.GetBufferReadPtr()));
        named[index] = true;
        entry(index, std::move(name));
    }
    for (std::uint32_t index = 0; index < functionCount; ++index)
        if (!named[index] && Le32(addressBytes.data() + std::size_t{index} * 4) != 0)
            entry(index, DynamicString());
    table.Finish();
    return table;
}

ImportTable ExecutableFile::ReadImports() const {
    ImageReader reader(*m_image->pe, "ExecutableFile::ReadImports");
    ImportTable table;
    ReadOrdinaryImports(reader, table);
    ReadDelayImports(reader, table);
    return table;
}

} // namespace tekit
