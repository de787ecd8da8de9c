// ExecutableFile: what a Windows executable (PE/COFF: .exe, .dll, 32- or 64-bit) says about
// itself, read from the file's bytes on any platform.
//
//   ExecutableFile dll(Path("C:\\Orvane\\bin\\tekit.dll"));
//   dll.GetBitness();                         // 32 or 64
//   dll.IsLargeAddressAware();                // the /LARGEADDRESSAWARE flag
//   ExportTable exports = dll.ReadExports();  // names, ordinals, forwarders
//   ImportTable imports = dll.ReadImports();  // dependent DLLs, delay-loaded ones too
//
// The file is untrusted. Opening reads and checks the headers (the MS-DOS stub's pointer, the
// "PE\0\0" signature, the file header, the optional header and the section table); the
// export and import tables are read when asked for. Only the bytes that are needed are read,
// through a bounded cache, so a file of any size costs little memory. Whatever is wrong - a
// truncated header, a section whose bytes lie outside the file, an address that wraps or lies
// in no section, a count that the table's bytes cannot hold, a name without its terminating
// NUL, a forwarder chain that returns to itself - raises TEException TE_BAD_FILE_FORMAT with
// the "ERR_DESCR" message EXE_MALFORMED_1_2: the file's name and what is wrong. A file that
// cannot be opened or read raises the TEError of the system's error (TE_FILE_NOT_FOUND ...).
// No read ever leaves the file's bytes, and no allocation grows beyond a small multiple of the
// file's size.
//
// The flat functions at the end answer the questions an installer or loader asks most, with a
// status instead of an exception.
#pragma once

#include "tekit/Export.h"
#include "tekit/paths/ExportTable.h"
#include "tekit/paths/ImportTable.h"
#include "tekit/strings/DynamicString.h"

#include <cstddef>
#include <cstdint>
#include <memory>

namespace tekit {

class PathBase;

/// Machine types of the file header (IMAGE_FILE_MACHINE_*) that have names here; any other
/// value is kept as it is and named "unknown".
enum ExecutableMachine : std::uint16_t {
    kMachineI386 = 0x014c,
    kMachineArm = 0x01c0,
    kMachineArmThumb2 = 0x01c4,
    kMachineIA64 = 0x0200,
    kMachineAmd64 = 0x8664,
    kMachineArm64 = 0xaa64,
};

/// Subsystems of the optional header (IMAGE_SUBSYSTEM_*).
enum ExecutableSubsystem : std::uint16_t {
    kSubsystemUnknown = 0,
    kSubsystemNative = 1,
    kSubsystemWindowsGui = 2,
    kSubsystemWindowsCui = 3,
    kSubsystemWindowsCeGui = 9,
    kSubsystemEfiApplication = 10,
};

/// One section of the section table.
struct ExecutableSection {
    char name[9];                 ///< up to 8 bytes, NUL-terminated here
    std::uint32_t virtualAddress; ///< RVA of the section's first byte
    std::uint32_t virtualSize;    ///< bytes mapped (0: the raw size)
    std::uint32_t rawOffset;      ///< file offset of its bytes
    std::uint32_t rawSize;        ///< bytes in the file (the rest of the mapping is zeros)
};

class TEKIT_API ExecutableFile {
public:
    /// Opens the file at `path` and reads its headers.
    explicit ExecutableFile(PathBase const& path);
    /// The same over `size` bytes at `bytes`, which the object copies; `name` stands for the
    /// file in messages.
    ExecutableFile(void const* bytes, std::size_t size, char const* name);
    ExecutableFile(ExecutableFile&& other) noexcept;
    ExecutableFile& operator=(ExecutableFile&& other) noexcept;
    ~ExecutableFile();

    /// The path or name the file was opened with.
    DynamicString const& GetFileName() const;
    /// IMAGE_FILE_MACHINE_* of the file header (an ExecutableMachine, or another value).
    std::uint16_t GetMachine() const;
    /// "i386", "x86-64", "arm", "arm-thumb2", "ia64", "arm64"; "unknown" for other machines.
    char const* GetMachineName() const;
    /// 32 for a PE32 optional header, 64 for PE32+.
    int GetBitness() const;
    /// The file header's characteristics (IMAGE_FILE_*).
    std::uint16_t GetCharacteristics() const;
    /// IMAGE_FILE_LARGE_ADDRESS_AWARE: a 32-bit program may use addresses above 2 GB.
    bool IsLargeAddressAware() const;
    /// IMAGE_FILE_DLL: a DLL rather than a program.
    bool IsDll() const;
    /// IMAGE_SUBSYSTEM_* of the optional header.
    std::uint16_t GetSubsystem() const;
    /// "native", "windows-gui", "windows-cui", "windows-ce-gui", "efi-application", ...;
    /// "unknown" for other values.
    char const* GetSubsystemName() const;
    /// The optional header's DllCharacteristics (IMAGE_DLLCHARACTERISTICS_*).
    std::uint16_t GetDllCharacteristics() const;
    std::uint64_t GetImageBase() const;
    std::uint32_t GetNumberOfSections() const;
    ExecutableSection const& GetSection(std::uint32_t index) const;

    /// The export table; an empty one (no module name, no functions) when there is none.
    ExportTable ReadExports() const;
    /// The import table: the ordinary imports, then the delay-loaded ones.
    ImportTable ReadImports() const;

private:
    struct Image;
    std::unique_ptr<Image> m_image;
};

} // namespace tekit

// ---- Flat interface ----------------------------------------------------------------------
// Each takes a path in the ANSI code page and never throws: a negative result is the TEError
// that the C++ interface would have raised (TE_BAD_FILE_FORMAT, TE_FILE_NOT_FOUND, ...).

/// 32 or 64.
extern "C" TEKIT_API int TEKIT_STDCALL GetExecutableBitness(char const* path);
/// 1 when the large-address-aware flag is set, 0 when not.
extern "C" TEKIT_API int TEKIT_STDCALL IsExecutableLargeAddressAware(char const* path);
/// IMAGE_FILE_MACHINE_* of the file (a positive number).
extern "C" TEKIT_API int TEKIT_STDCALL GetExecutableMachine(char const* path);
/// 1 when the file exports `name` (forwarded or not), 0 when not.
extern "C" TEKIT_API int TEKIT_STDCALL ExecutableExportsFunction(char const* path,
                                                                 char const* name);
