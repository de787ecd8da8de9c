// The bytes of a PE file: opening, the headers' checks, and checked reads by RVA.
#include "paths/executable/PEImage.h"

#include "errors/NativeError.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"

#include <algorithm>
#include <cstring>

namespace tekit::executable {

namespace {

std::uint16_t Le16(unsigned char const* p) {
    return static_cast<std::uint16_t>(p[0] | p[1] << 8);
}
std::uint32_t Le32(unsigned char const* p) {
    return static_cast<std::uint32_t>(Le16(p)) | static_cast<std::uint32_t>(Le16(p + 2)) << 16;
}
std::uint64_t Le64(unsigned char const* p) {
    return static_cast<std::uint64_t>(Le32(p)) | static_cast<std::uint64_t>(Le32(p + 4)) << 32;
}

// Sizes and offsets of the headers (winnt.h's IMAGE_* structures).
constexpr std::uint32_t kDosHeaderSize = 64;
constexpr std::uint32_t kNewHeaderPointer = 0x3c;
constexpr std::uint32_t kFileHeaderSize = 20;
constexpr std::uint32_t kSectionHeaderSize = 40;
constexpr std::uint16_t kMagicPE32 = 0x10b;
constexpr std::uint16_t kMagicPE32Plus = 0x20b;

/// The bytes a section maps from the file: its raw size, cut to its virtual size when that
/// is smaller (the rest of the raw bytes is padding the loader never maps).
std::uint32_t MappedRawSize(ExecutableSection const& section) {
    return section.virtualSize != 0 ? std::min(section.virtualSize, section.rawSize)
                                    : section.rawSize;
}

} // namespace

DynamicString Detail(char const* key, char const* first, char const* second) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    // From the last placeholder back, so that a '%' in a value is never taken for one.
    if (second)
        message.Format(second, 2);
    if (first)
        message.Format(first, 1);
    return message;
}

std::string Hex(std::uint64_t value) {
    static char const kDigits[] = "0123456789ABCDEF";
    std::string text;
    do {
        text.insert(text.begin(), kDigits[value & 15]);
        value >>= 4;
    } while (value != 0);
    return text;
}

std::unique_ptr<PEImage> PEImage::Open(char const* path, char const* function) {
    std::unique_ptr<PEImage> image(new PEImage);
    image->fileName = path;
    platform::SystemError error = platform::OpenFileForReading(path, image->m_file);
    if (!error)
        error = platform::OpenFileSize(image->m_file, image->fileSize);
    if (error) {
        TEError const code = detail::NativeErrorToTEError(error, TE_IO_ERROR);
        TE_RAISE_API(
            code,
            Detail("EXE_CANT_READ_1_2", path, static_cast<char const*>(TEErrorToRString(code))),
            function, error.apiFunction, error.code);
    }
    image->ReadHeaders(function);
    return image;
}

std::unique_ptr<PEImage> PEImage::FromBytes(void const* bytes, std::size_t size, char const* name,
                                            char const* function) {
    std::unique_ptr<PEImage> image(new PEImage);
    image->fileName = name ? name : "";
    auto const* begin = static_cast<unsigned char const*>(bytes);
    image->m_bytes.assign(begin, begin + (bytes ? size : 0));
    image->fileSize = image->m_bytes.size();
    image->ReadHeaders(function);
    return image;
}

PEImage::~PEImage() {
    if (m_file != platform::kNoFile)
        platform::CloseFile(m_file);
}

void PEImage::Malformed(DynamicString const& detail, char const* function) const {
    TE_RAISE(TE_BAD_FILE_FORMAT,
             Detail("EXE_MALFORMED_1_2", fileName.GetBufferReadPtr(), detail.GetBufferReadPtr()),
             function);
}

bool PEImage::ReadFile(std::uint64_t offset, void* out, std::size_t size,
                       char const* function) const {
    if (offset > fileSize || size > fileSize - offset)
        return false;
    if (m_file == platform::kNoFile) {
        if (size != 0)
            std::memcpy(out, m_bytes.data() + offset, size);
        return true;
    }
    std::size_t count = 0;
    if (platform::SystemError const error =
            platform::ReadFromFileAt(m_file, offset, out, size, count)) {
        TEError const code = detail::NativeErrorToTEError(error, TE_IO_ERROR);
        TE_RAISE_API(code,
                     Detail("EXE_CANT_READ_1_2", fileName.GetBufferReadPtr(),
                            static_cast<char const*>(TEErrorToRString(code))),
                     function, error.apiFunction, error.code);
    }
    // The file shrank since it was opened.
    if (count != size)
        Malformed(Detail("EXE_TRUNCATED_1", "file"), function);
    return true;
}

void PEImage::ReadHeaders(char const* function) {
    unsigned char dos[kDosHeaderSize];
    if (!ReadFile(0, dos, 2, function) || dos[0] != 'M' || dos[1] != 'Z')
        Malformed(Detail("EXE_NOT_MZ"), function);
    if (!ReadFile(0, dos, sizeof dos, function))
        Malformed(Detail("EXE_TRUNCATED_1", "MS-DOS header"), function);
    std::uint64_t const peOffset = Le32(dos + kNewHeaderPointer);

    unsigned char signature[4];
    if (!ReadFile(peOffset, signature, sizeof signature, function) ||
        std::memcmp(signature, "PE\0\0", 4) != 0)
        Malformed(Detail("EXE_NO_PE_SIGNATURE", Hex(peOffset).c_str()), function);
    unsigned char header[kFileHeaderSize];
    if (!ReadFile(peOffset + 4, header, sizeof header, function))
        Malformed(Detail("EXE_TRUNCATED_1", "file header"), function);
    machine = Le16(header);
    std::uint32_t const sectionCount = Le16(header + 2);
    std::uint32_t const optionalSize = Le16(header + 16);
    characteristics = Le16(header + 18);

    // The optional header: its magic says PE32 or PE32+, and so where its fields lie.
    std::uint64_t const optionalOffset = peOffset + 4 + kFileHeaderSize;
    std::vector<unsigned char> optional(optionalSize);
    if (!ReadFile(optionalOffset, optional.data(), optional.size(), function))
        Malformed(Detail("EXE_TRUNCATED_1", "optional header"), function);
    if (optionalSize < 2)
        Malformed(Detail("EXE_OPTIONAL_HEADER_TOO_SMALL"), function);
    std::uint16_t const magic = Le16(optional.data());
    if (magic != kMagicPE32 && magic != kMagicPE32Plus)
        Malformed(Detail("EXE_BAD_OPTIONAL_HEADER_MAGIC_1", Hex(magic).c_str()), function);
    bool const wide = magic == kMagicPE32Plus;
    std::uint32_t const fixedSize = wide ? 112 : 96;
    if (optionalSize < fixedSize)
        Malformed(Detail("EXE_OPTIONAL_HEADER_TOO_SMALL"), function);
    unsigned char const* const o = optional.data();
    bitness = wide ? 64 : 32;
    imageBase = wide ? Le64(o + 24) : Le32(o + 28);
    sizeOfHeaders = Le32(o + 60);
    subsystem = Le16(o + 68);
    dllCharacteristics = Le16(o + 70);
    std::uint32_t const directoryCount =
        std::min({Le32(o + fixedSize - 4), static_cast<std::uint32_t>(kDataDirectoryCount),
                  (optionalSize - fixedSize) / 8});
    for (std::uint32_t i = 0; i < directoryCount; ++i) {
        directoryRva[i] = Le32(o + fixedSize + 8 * i);
        directorySize[i] = Le32(o + fixedSize + 8 * i + 4);
    }

    std::uint64_t const tableOffset = optionalOffset + optionalSize;
    std::vector<unsigned char> table(std::size_t{sectionCount} * kSectionHeaderSize);
    if (!ReadFile(tableOffset, table.data(), table.size(), function))
        Malformed(Detail("EXE_TRUNCATED_1", "section table"), function);
    sections.resize(sectionCount);
    for (std::uint32_t i = 0; i < sectionCount; ++i) {
        unsigned char const* const s = table.data() + std::size_t{i} * kSectionHeaderSize;
        ExecutableSection& section = sections[i];
        std::memcpy(section.name, s, 8);
        section.name[8] = '\0';
        section.virtualSize = Le32(s + 8);
        section.virtualAddress = Le32(s + 12);
        section.rawSize = Le32(s + 16);
        section.rawOffset = Le32(s + 20);
        if (section.rawSize != 0 && std::uint64_t{section.rawOffset} + section.rawSize > fileSize)
            Malformed(Detail("EXE_SECTION_OUTSIDE_FILE_1", section.name), function);
    }
}

// ---- ImageReader -------------------------------------------------------------------------

ImageReader::ImageReader(PEImage const& image, char const* function)
    : m_image(image), m_function(function), m_textBudget(2 * image.fileSize + 65536),
      m_entryBudget(image.fileSize / 2 + 4096) {}

bool ImageReader::Locate(std::uint32_t rva, std::uint64_t& offset, std::uint64_t& room) const {
    for (ExecutableSection const& section : m_image.sections) {
        std::uint32_t const size = MappedRawSize(section);
        if (rva >= section.virtualAddress && rva - section.virtualAddress < size) {
            std::uint32_t const into = rva - section.virtualAddress;
            offset = std::uint64_t{section.rawOffset} + into;
            room = size - into;
            return true;
        }
    }
    // The headers are mapped at the image's start as they lie in the file.
    std::uint64_t const headers = std::min<std::uint64_t>(m_image.sizeOfHeaders, m_image.fileSize);
    if (rva < headers) {
        offset = rva;
        room = headers - rva;
        return true;
    }
    return false;
}

std::uint64_t ImageReader::Room(std::uint32_t rva, char const* what) {
    std::uint64_t offset = 0, room = 0;
    if (!Locate(rva, offset, room))
        Malformed(Detail("EXE_RVA_OUTSIDE_SECTIONS_1_2", what, Hex(rva).c_str()));
    return room;
}

void ImageReader::CheckTable(std::uint32_t rva, std::uint64_t count, std::uint32_t entrySize,
                             char const* what) {
    if (count * entrySize > Room(rva, what))
        Malformed(Detail("EXE_TOO_MANY_ENTRIES_1_2", what, std::to_string(count).c_str()));
}

std::uint32_t ImageReader::Add(std::uint32_t base, std::uint64_t offset, char const* what) {
    std::uint64_t const sum = std::uint64_t{base} + offset;
    if (sum > 0xffffffffu)
        Malformed(Detail("EXE_RVA_WRAPS_1", what));
    return static_cast<std::uint32_t>(sum);
}

void ImageReader::Read(std::uint32_t rva, void* out, std::size_t size, char const* what) {
    std::uint64_t offset = 0, room = 0;
    if (!Locate(rva, offset, room))
        Malformed(Detail("EXE_RVA_OUTSIDE_SECTIONS_1_2", what, Hex(rva).c_str()));
    if (size > room) {
        if (std::uint64_t{rva} + size > 0x100000000u)
            Malformed(Detail("EXE_RVA_WRAPS_1", what));
        Malformed(Detail("EXE_RVA_OUTSIDE_SECTIONS_1_2", what, Hex(rva).c_str()));
    }
    ReadCached(offset, out, size);
}

void ImageReader::ReadCached(std::uint64_t offset, void* out, std::size_t size) {
    auto* target = static_cast<unsigned char*>(out);
    while (size != 0) {
        std::uint64_t const index = offset / kPageSize;
        std::size_t const into = static_cast<std::size_t>(offset % kPageSize);
        auto page = m_pages.find(index);
        if (page == m_pages.end()) {
            if (m_pages.size() >= kMaxPages)
                m_pages.clear();
            std::uint64_t const start = index * kPageSize;
            std::vector<unsigned char> bytes(static_cast<std::size_t>(
                std::min<std::uint64_t>(kPageSize, m_image.fileSize - start)));
            if (!m_image.ReadFile(start, bytes.data(), bytes.size(), m_function))
                Malformed(Detail("EXE_TRUNCATED_1", "file"));
            page = m_pages.emplace(index, std::move(bytes)).first;
        }
        std::vector<unsigned char> const& bytes = page->second;
        if (into >= bytes.size()) // cannot happen for offsets Locate gave
            Malformed(Detail("EXE_TRUNCATED_1", "file"));
        std::size_t const n = std::min(size, bytes.size() - into);
        std::memcpy(target, bytes.data() + into, n);
        target += n;
        offset += n;
        size -= n;
    }
}

std::uint16_t ImageReader::U16(std::uint32_t rva, char const* what) {
    unsigned char bytes[2];
    Read(rva, bytes, sizeof bytes, what);
    return Le16(bytes);
}

std::uint32_t ImageReader::U32(std::uint32_t rva, char const* what) {
    unsigned char bytes[4];
    Read(rva, bytes, sizeof bytes, what);
    return Le32(bytes);
}

std::uint64_t ImageReader::U64(std::uint32_t rva, char const* what) {
    unsigned char bytes[8];
    Read(rva, bytes, sizeof bytes, what);
    return Le64(bytes);
}

DynamicString ImageReader::Name(std::uint32_t rva, char const* what) {
    std::uint64_t offset = 0, room = 0;
    if (!Locate(rva, offset, room))
        Malformed(Detail("EXE_RVA_OUTSIDE_SECTIONS_1_2", what, Hex(rva).c_str()));
    std::string text;
    unsigned char chunk[256];
    for (;;) {
        if (room == 0)
            Malformed(Detail("EXE_NAME_NOT_TERMINATED_1", what));
        std::size_t const n = static_cast<std::size_t>(std::min<std::uint64_t>(room, sizeof chunk));
        ReadCached(offset, chunk, n);
        auto const* const end = static_cast<unsigned char const*>(std::memchr(chunk, 0, n));
        std::size_t const length = end ? static_cast<std::size_t>(end - chunk) : n;
        if (length > m_textBudget)
            Malformed(Detail("EXE_TOO_MUCH_TEXT"));
        m_textBudget -= length;
        text.append(reinterpret_cast<char const*>(chunk), length);
        if (end)
            return DynamicString(text.c_str());
        offset += n;
        room -= n;
    }
}

void ImageReader::ChargeEntries(std::uint64_t count, char const* what) {
    if (count > m_entryBudget)
        Malformed(Detail("EXE_TOO_MANY_ENTRIES_1_2", what, std::to_string(count).c_str()));
    m_entryBudget -= count;
}

} // namespace tekit::executable
