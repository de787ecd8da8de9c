// The bytes of a PE file and the checked reads the executable-file classes make of them.
//
//   PEImage image = PEImage::Open(path, "ExecutableFile::ExecutableFile");
//   ImageReader reader(image, "ExecutableFile::ReadExports");
//   std::uint32_t count = reader.U32(rva, "export directory");
//   DynamicString name = reader.Name(nameRva, "export name");
//
// The headers are read and checked once, by Open; ImageReader then reads by RVA. An RVA range
// must lie, whole, inside the bytes a section has in the file (or inside the headers): the
// zero-filled rest of a section's mapping and anything past the end of the file are refused
// as malformed, never read. A reader keeps a bounded cache of file pages and a budget of
// names' bytes and table entries, so a hostile file cannot make it read or allocate much more
// than the file's own size.
#pragma once

#include "platform/File.h"
#include "tekit/paths/ExecutableFile.h"
#include "tekit/strings/DynamicString.h"

#include <cstdint>
#include <memory>
#include <string>
#include <unordered_map>
#include <vector>

namespace tekit::executable {

/// Indexes of the optional header's data directories.
enum DataDirectory : unsigned {
    kExportDirectory = 0,
    kImportDirectory = 1,
    kDelayImportDirectory = 13,
    kDataDirectoryCount = 16,
};

/// The "ERR_DESCR" message `key` with up to two placeholders filled (the last first).
DynamicString Detail(char const* key, char const* first = nullptr, char const* second = nullptr);
/// Hexadecimal text of `value`, without a prefix.
std::string Hex(std::uint64_t value);

/// The file: its bytes (from disk or from memory) and its checked headers.
class PEImage {
public:
    /// Opens `path`, raising as ExecutableFile documents under `function`.
    static std::unique_ptr<PEImage> Open(char const* path, char const* function);
    /// Copies `size` bytes; `name` stands for the file in messages.
    static std::unique_ptr<PEImage> FromBytes(void const* bytes, std::size_t size, char const* name,
                                              char const* function);
    ~PEImage();

    /// Raises TE_BAD_FILE_FORMAT: this file, with `detail` saying what is wrong.
    [[noreturn]] void Malformed(DynamicString const& detail, char const* function) const;
    /// Copies `size` bytes at `offset` of the file; false when they run past its end. A
    /// failing read of the file raises.
    bool ReadFile(std::uint64_t offset, void* out, std::size_t size, char const* function) const;

    DynamicString fileName;
    std::uint64_t fileSize = 0;
    std::uint16_t machine = 0;
    std::uint16_t characteristics = 0;
    int bitness = 0;
    std::uint16_t subsystem = 0;
    std::uint16_t dllCharacteristics = 0;
    std::uint64_t imageBase = 0;
    std::uint32_t sizeOfHeaders = 0;
    std::uint32_t directoryRva[kDataDirectoryCount] = {};
    std::uint32_t directorySize[kDataDirectoryCount] = {};
    std::vector<ExecutableSection> sections;

private:
    PEImage() = default;
    void ReadHeaders(char const* function);

    platform::NativeFile m_file = platform::kNoFile;
    std::vector<unsigned char> m_bytes; // the file, when it came from memory
};

/// Reads by RVA for one operation (one function name in its errors).
class ImageReader {
public:
    ImageReader(PEImage const& image, char const* function);

    PEImage const& Image() const { return m_image; }
    char const* Function() const { return m_function; }
    [[noreturn]] void Malformed(DynamicString const& detail) const {
        m_image.Malformed(detail, m_function);
    }

    /// Copies `size` bytes at `rva`; raises when they do not lie whole in one section's file
    /// bytes. `what` names the structure in the message.
    void Read(std::uint32_t rva, void* out, std::size_t size, char const* what);
    std::uint16_t U16(std::uint32_t rva, char const* what);
    std::uint32_t U32(std::uint32_t rva, char const* what);
    std::uint64_t U64(std::uint32_t rva, char const* what);
    /// The bytes from `rva` to the end of its section's file bytes; raises when `rva` lies in
    /// none. Tables are checked against it before anything is allocated for them.
    std::uint64_t Room(std::uint32_t rva, char const* what);
    /// `count` entries of `entrySize` bytes at `rva` fit in Room; raises otherwise.
    void CheckTable(std::uint32_t rva, std::uint64_t count, std::uint32_t entrySize,
                    char const* what);
    /// The NUL-terminated text at `rva`, which must end inside its section's file bytes.
    /// Charged to the names' budget.
    DynamicString Name(std::uint32_t rva, char const* what);
    /// Counts `count` more table entries against the entries' budget; raises past it.
    void ChargeEntries(std::uint64_t count, char const* what);
    /// The RVA `base` + `offset` (as 32-bit address arithmetic); raises when it wraps.
    std::uint32_t Add(std::uint32_t base, std::uint64_t offset, char const* what);

private:
    /// The file offset of `rva` and the bytes from there to the end of its section's file
    /// bytes; false when it lies in none.
    bool Locate(std::uint32_t rva, std::uint64_t& offset, std::uint64_t& room) const;
    void ReadCached(std::uint64_t offset, void* out, std::size_t size);

    PEImage const& m_image;
    char const* m_function;
    std::uint64_t m_textBudget;
    std::uint64_t m_entryBudget;
    static constexpr std::size_t kPageSize = 16 * 1024;
    static constexpr std::size_t kMaxPages = 256;
    std::unordered_map<std::uint64_t, std::vector<unsigned char>> m_pages;
};

} // namespace tekit::executable
