// IniObj: whole documents to and from files and strings, and the two binary file forms.
//
// Inside both binary forms the INI text has CR LF line ends, as files of the product's own
// platform have, whatever the platform writing them.
#include "tekit/ini/IniObj.h"

#include "ini/IniObjErrors.h"
#include "ini/IniObjSupport.h"
#include "platform/File.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEException.h"
#include "tekit/paths/Path.h"
#include "tekit/streams/KaCompressor.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <climits>
#include <cstdint>
#include <cstring>
#include <memory>
#include <new>
#include <string>

namespace tekit {

using platform::SystemError;

namespace {

constexpr std::size_t kMagicTestSize = 20;
constexpr std::size_t kBinaryMagicLength = sizeof IniObj::kBinaryMagic - 1;
constexpr std::size_t kTextMagicLength = sizeof IniObj::kBinaryTextMagic - 1;
constexpr std::size_t kDataOffsetField = 20;
constexpr std::size_t kTextLengthField = 28;
constexpr char kBinaryLineEnd[] = "\r\n";
/// The most bytes of text (and of a file's data) the binary forms take: what a string holds.
constexpr std::uint64_t kMaxBinaryBytes = INT_MAX - 1;
constexpr std::size_t kTextReserve = 100000;

/// One compressor for every IniObj: it loads its module once and keeps no other state.
KaCompressor& Compressor() {
    static KaCompressor compressor;
    return compressor;
}

std::uint32_t ReadLittleEndian32(unsigned char const* p) {
    return std::uint32_t(p[0]) | std::uint32_t(p[1]) << 8 | std::uint32_t(p[2]) << 16 |
           std::uint32_t(p[3]) << 24;
}

void WriteLittleEndian32(unsigned char* p, std::uint32_t value) {
    for (int i = 0; i < 4; ++i)
        p[i] = static_cast<unsigned char>(value >> (8 * i));
}

bool StartsWith(unsigned char const* bytes, std::size_t size, char const* magic,
                std::size_t length) {
    return size >= length && std::memcmp(bytes, magic, length) == 0;
}

/// Raises a failed status of the compressor's unframed routines.
[[noreturn]] void RaiseCompressorStatus(int status, char const* function) {
    TEError const code = static_cast<TEError>(status);
    TE_RAISE(code, TEErrorToRString(code), function);
}

/// A file open for reading, closed when it goes.
class InputFile {
public:
    InputFile(char const* path, char const* function) : m_path(path), m_function(function) {
        if (SystemError const error = platform::OpenFileForReading(path, m_file))
            ini::RaiseReadFailure(INI_ERR_CANT_OPEN_FILE, error, path, "IniObj::ReadFile");
        if (SystemError const error = platform::OpenFileSize(m_file, m_size))
            Fail(error);
    }
    ~InputFile() { platform::CloseFile(m_file); }
    InputFile(InputFile const&) = delete;
    InputFile& operator=(InputFile const&) = delete;

    std::uint64_t Size() const { return m_size; }
    /// Reads `size` bytes at `offset`; a failure or a file that got shorter raises.
    void Read(std::uint64_t offset, void* buffer, std::size_t size) {
        std::size_t count = 0;
        if (SystemError const error = platform::ReadFromFileAt(m_file, offset, buffer, size, count))
            Fail(error);
        if (count != size)
            Fail({});
    }

private:
    [[noreturn]] void Fail(SystemError const& error) {
        ini::RaiseReadFailure(INI_ERR_CANT_READ_FILE, error, m_path, m_function,
                              TE_UNABLE_TO_OPEN_FILE);
    }

    char const* m_path;
    char const* m_function;
    platform::NativeFile m_file = platform::kNoFile;
    std::uint64_t m_size = 0;
};

/// A file's content in two parts (a header, the data), as FileFiller's context.
struct FileContent {
    void const* head;
    std::size_t headSize;
    void const* body;
    std::size_t bodySize;
};

int FillWithContent(void* context, platform::NativeFile file, SystemError& failure) {
    auto const& content = *static_cast<FileContent const*>(context);
    ini::FileBlockWriter writer(file);
    bool const written = writer.Append(content.head, content.headSize) &&
                         writer.Append(content.body, content.bodySize) && writer.Flush();
    failure = writer.Failure();
    return written ? 0 : INI_ERR_WRITE_FAILED;
}

/// The object's text with `lineEnd` line ends; raises in `function`.
std::string TextOf(IniHandle ini, char const* lineEnd, char const* function) {
    std::string text;
    text.reserve(kTextReserve);
    if (int const status = ini::WriteToMemory(ini, text, lineEnd); status < 0)
        ini::RaiseStatus(status, function);
    if (text.size() > kMaxBinaryBytes)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 ini::Message("INI_TEXT_TOO_LARGE_1", {std::to_string(text.size()).c_str()}),
                 function);
    return text;
}

/// The compressed string of `text`.
DynamicString CompressedStringOf(std::string const& text) {
    DynamicString compressed;
    Compressor().BinaryBytesToCompressedString(reinterpret_cast<unsigned char const*>(text.data()),
                                               static_cast<unsigned>(text.size()), compressed);
    return compressed;
}

struct TBFreeDeleter {
    void operator()(unsigned char* block) const { TBFree(block); }
};

/// The text that the compressed string `text` holds (up to its first NUL, as a string
/// holds it); a malformed one raises TE_BAD_FILE_FORMAT with `describe` giving the message.
template <class Describe>
std::unique_ptr<unsigned char, TBFreeDeleter> Uncompressed(String const& text, std::size_t& size,
                                                           Describe&& describe) {
    unsigned char* bytes = nullptr;
    unsigned long count = 0;
    try {
        Compressor().CompressedStringToBinaryBytes(text, bytes, count);
    } catch (TEException const& e) {
        TEError const code = e.GetErrorCode();
        if (code == TE_DLL_NOT_LOADABLE || code == TE_FUNC_NOT_IN_LIB || code == TE_OUT_OF_MEMORY)
            throw;
        describe(e.GetDescription());
    }
    size = strnlen(reinterpret_cast<char const*>(bytes), count);
    return std::unique_ptr<unsigned char, TBFreeDeleter>(bytes);
}

} // namespace

// ---- Files --------------------------------------------------------------------------------

void IniObj::ReadFile(Path const& path) {
    if (ReadAsBinary(path))
        return;
    IniHandle const fresh = NewHandle();
    int const status = Ini_ReadFromFile(fresh, path.CStr());
    if (status < 0) {
        Ini_Dispose(fresh);
        ini::RaiseReadFailure(status, {}, path.CStr(), "IniObj::ReadFile");
    }
    Adopt(fresh, status, "IniObj::ReadFile");
}

void IniObj::WriteFile(Path const& path) {
    WriteFile(path, false, false);
}

void IniObj::WriteFile(Path const& path, bool binary, bool asText) {
    if (binary) {
        WriteAsBinary(path, asText);
        return;
    }
    SystemError failure;
    if (int const status = ini::WriteTextFile(m_ini, path.CStr(), failure); status < 0)
        ini::RaiseWriteFailure(status, failure, path.CStr(), "IniObj::WriteFile");
}

bool IniObj::ReadAsBinary(Path const& path) {
    char const* const name = path.CStr();
    char const* const function = "IniObj::ReadAsBinary";
    InputFile file(name, function);
    std::uint64_t const size = file.Size();
    unsigned char head[kBinaryHeaderSize] = {};
    file.Read(0, head, size < kMagicTestSize ? std::size_t(size) : kMagicTestSize);
    auto const bad = [&](DynamicString const& reason) {
        ini::RaiseBadBinaryFile(name, reason, function);
    };

    if (StartsWith(head, size, kBinaryTextMagic, kTextMagicLength)) {
        if (size - kTextMagicLength > kMaxBinaryBytes)
            bad(ini::Message("INI_BINARY_TOO_LARGE_1", {std::to_string(size).c_str()}));
        std::size_t const length = std::size_t(size - kTextMagicLength);
        std::string bytes(length, '\0');
        file.Read(kTextMagicLength, bytes.data(), length);
        DynamicString text;
        if (std::memchr(bytes.data(), '\0', length) == nullptr)
            text.AssignUsingNumBytesInsteadOfNumChars(bytes.data(), int(length), false);
        else // a string ends at a NUL, which no compressed string holds
            bad(ini::Message(
                "INI_BINARY_BAD_TEXT_1",
                {static_cast<char const*>(RString("ERR_DESCR", "COMPRESSED_STRING_MALFORMED"))}));
        bytes = std::string();
        std::size_t textSize = 0;
        auto const decoded = Uncompressed(text, textSize, [&](char const* reason) {
            bad(ini::Message("INI_BINARY_BAD_TEXT_1", {reason}));
        });
        ReadText(reinterpret_cast<char const*>(decoded.get()), textSize, "IniObj::ReadFile");
        return true;
    }
    if (!StartsWith(head, size, kBinaryMagic, kBinaryMagicLength))
        return false;

    if (size < kBinaryHeaderSize)
        bad(ini::Message("INI_BINARY_TRUNCATED", {}));
    file.Read(0, head, kBinaryHeaderSize);
    std::uint32_t const offset = ReadLittleEndian32(head + kDataOffsetField);
    std::uint32_t const textLength = ReadLittleEndian32(head + kTextLengthField);
    std::uint64_t const dataSize = size - kBinaryHeaderSize;
    if (offset != kBinaryHeaderSize)
        bad(ini::Message("INI_BINARY_BAD_OFFSET_1", {std::to_string(offset).c_str()}));
    if (dataSize > kMaxBinaryBytes)
        bad(ini::Message("INI_BINARY_TOO_LARGE_1", {std::to_string(size).c_str()}));
    // Refused before anything is allocated: no deflate stream inflates beyond this ratio.
    if (textLength > kMaxBinaryBytes || textLength > dataSize * KaCompressor::kMaxCompressionRatio)
        bad(ini::Message("INI_BINARY_BAD_LENGTH_1_2",
                         {std::to_string(textLength).c_str(), std::to_string(dataSize).c_str()}));
    std::string data(std::size_t(dataSize), '\0');
    file.Read(kBinaryHeaderSize, data.data(), data.size());
    std::unique_ptr<char[]> const text(new (std::nothrow) char[std::size_t(textLength) + 1]);
    if (!text)
        ThrowOutOfMemory();
    unsigned long inflated = textLength;
    int const status = Compressor().ObsoleteUncompress(
        reinterpret_cast<unsigned char*>(text.get()), &inflated,
        reinterpret_cast<unsigned char const*>(data.data()), static_cast<unsigned long>(dataSize));
    if (status == TE_DLL_NOT_LOADABLE || status == TE_FUNC_NOT_IN_LIB || status == TE_OUT_OF_MEMORY)
        RaiseCompressorStatus(status, function);
    if (status < 0 || inflated != textLength)
        bad(ini::Message("INI_BINARY_BAD_DATA_1", {std::to_string(textLength).c_str()}));
    ReadText(text.get(), textLength, "IniObj::ReadFile");
    return true;
}

void IniObj::WriteAsBinary(Path const& path, bool asText) {
    char const* const function = "IniObj::WriteAsBinary";
    std::string const text = TextOf(m_ini, kBinaryLineEnd, function);
    SystemError failure;
    int status = 0;
    if (asText) {
        DynamicString const compressed = CompressedStringOf(text);
        FileContent const content{kBinaryTextMagic, kTextMagicLength, compressed.GetBufferReadPtr(),
                                  std::size_t(compressed.GetNumBytes())};
        status = ini::ReplaceFileAtomically(path.CStr(), FillWithContent,
                                            const_cast<FileContent*>(&content), failure);
    } else {
        int const bound = Compressor().ObsoleteCompressBound(text.size());
        if (bound < 0)
            RaiseCompressorStatus(bound, function);
        std::string data(std::size_t(bound), '\0');
        unsigned long compressedSize = static_cast<unsigned long>(bound);
        if (int const compressed = Compressor().ObsoleteCompress(
                reinterpret_cast<unsigned char*>(data.data()), &compressedSize,
                reinterpret_cast<unsigned char const*>(text.data()), text.size());
            compressed < 0)
            RaiseCompressorStatus(compressed, function);
        unsigned char header[kBinaryHeaderSize] = {};
        std::memcpy(header, kBinaryMagic, kBinaryMagicLength);
        WriteLittleEndian32(header + kDataOffsetField, kBinaryHeaderSize);
        WriteLittleEndian32(header + kTextLengthField, static_cast<std::uint32_t>(text.size()));
        FileContent const content{header, sizeof header, data.data(), compressedSize};
        status = ini::ReplaceFileAtomically(path.CStr(), FillWithContent,
                                            const_cast<FileContent*>(&content), failure);
    }
    if (status < 0)
        ini::RaiseWriteFailure(status, failure, path.CStr(), function);
}

// ---- Strings ------------------------------------------------------------------------------

void IniObj::ReadString(String const& text) {
    char const* const bytes = text.GetBufferReadPtr();
    std::size_t const size = std::size_t(text.GetNumBytes());
    if (!StartsWith(reinterpret_cast<unsigned char const*>(bytes), size, kBinaryTextMagic,
                    kTextMagicLength)) {
        ReadText(bytes, size, "IniObj::ReadString");
        return;
    }
    DynamicString compressed;
    compressed.AssignUsingNumBytesInsteadOfNumChars(bytes + kTextMagicLength,
                                                    int(size - kTextMagicLength), false);
    std::size_t textSize = 0;
    auto const decoded = Uncompressed(compressed, textSize, [](char const* reason) {
        TE_RAISE(TE_BAD_FILE_FORMAT, ini::Message("INI_STRING_MALFORMED_1", {reason}),
                 "IniObj::ReadString");
    });
    ReadText(reinterpret_cast<char const*>(decoded.get()), textSize, "IniObj::ReadString");
}

void IniObj::WriteString(DynamicString& out, bool compressed, bool crlf) {
    std::string const text = TextOf(m_ini, crlf ? "\r\n" : "\n", "IniObj::WriteString");
    if (!compressed) {
        out.AssignUsingNumBytesInsteadOfNumChars(text.data(), int(text.size()), false);
        return;
    }
    DynamicString result(kBinaryTextMagic);
    result += CompressedStringOf(text);
    out = result;
}

void IniObj::ReadText(char const* text, std::size_t size, char const* function) {
    IniHandle const fresh = NewHandle();
    Adopt(fresh, ini::ReadFromMemory(fresh, text, size), function);
}

} // namespace tekit
