// tekit compress, tekit decompress: framed compressed blocks and compressed strings, as the
// library writes them, from and to files or standard input and output.
//
//   tekit compress station.ini station.pmcz
//   tekit decompress --text - - < value.txt
//   tekit compress --info station.pmcz
#include "Arguments.h"
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/RString.h"
#include "tekit/errors/TEException.h"
#include "tekit/streams/KaCompressor.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <cerrno>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <iterator>
#include <limits>
#include <memory>
#include <random>

#if defined(_WIN32)
#include <fcntl.h>
#include <io.h>
#endif

namespace tekit::tool {

namespace {

char const kCompressDetails[] =
    R"(Compresses the bytes of IN into a framed compressed block, as the library's KaCompressor
and memory streams write it: the 4 bytes "PMCZ" (the magic 0x5A434D50, little-endian), the
uncompressed size as 4 little-endian bytes, then zlib's compress output. With --text OUT gets
the compressed string instead: the whole block in the library's data-to-text encoding (6
characters of .0-9A-Z_a-z for every 4 bytes, beginning "J3p2LV"), and a line end. IN and OUT
may be "-" for standard input and output. OUT is written through a temporary file beside it
that replaces it only when all went well, so a failure leaves OUT as it was.

With --info, reads each FILE, a block or a compressed string, checks that its data
uncompresses to the size it states, and shows its form (binary or text), magic, stored
(uncompressed) size, compressed size (of the block, header included) and ratio (stored size
to compressed size). JSON gives an array of {"file", "form", "magic", "storedSize",
"compressedSize", "ratio"} objects.

Options:
  --text      Write the compressed string instead of the binary block
  --info      Show what each FILE holds instead of compressing
  --json      Print JSON (with --info): an array with one object per FILE
  -h, --help  Print this help

Examples:
  tekit compress station.ini station.pmcz
  tekit compress --text station.ini - > station.txt
  tekit compress --info --json station.pmcz station.txt

Exit status:
  0  success
  1  a file that cannot be read or written, or (with --info) that holds no valid block,
     explained on standard error
  2  the command line was wrong
)";

char const kDecompressDetails[] =
    R"(Uncompresses the framed compressed block in IN (see "tekit help compress") and writes the
bytes it holds to OUT. With --text IN holds a compressed string instead; white space at its
end (a line end) is ignored. IN and OUT may be "-" for standard input and output. A block
whose header or data is damaged gets the library's message; OUT is written through a
temporary file beside it only when the whole block was read, so a failure leaves OUT as it
was.

Options:
  --text      Read a compressed string instead of a binary block
  -h, --help  Print this help

Examples:
  tekit decompress station.pmcz station.ini
  tekit decompress --text station.txt -

Exit status:
  0  success
  1  IN cannot be read or holds no valid block, or OUT cannot be written, explained on
     standard error
  2  the command line was wrong
)";

constexpr std::uint64_t kMaxBlockData = std::numeric_limits<std::uint32_t>::max();

/// How a file is named in messages.
std::string Named(std::string const& file) {
    return file == "-" ? "<stdin>" : Shown(file);
}

std::string Reason(int error) {
    return error ? std::strerror(error) : "input/output error";
}

std::string ReadAll(std::string const& file) {
    if (file == "-") {
#if defined(_WIN32)
        _setmode(_fileno(stdin), _O_BINARY);
#endif
        std::string bytes(std::istreambuf_iterator<char>(std::cin), {});
        if (std::cin.bad())
            throw ToolError("<stdin>: cannot read: input/output error");
        return bytes;
    }
    errno = 0;
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> in(std::fopen(file.c_str(), "rb"),
                                                       &std::fclose);
    if (!in)
        throw ToolError(Named(file) + ": cannot open: " + Reason(errno));
    std::string bytes;
    char buffer[65536];
    std::size_t n = 0;
    while ((n = std::fread(buffer, 1, sizeof buffer, in.get())) > 0)
        bytes.append(buffer, n);
    if (std::ferror(in.get()))
        throw ToolError(Named(file) + ": cannot read: " + Reason(errno));
    return bytes;
}

/// Writes `bytes` to `file` through a temporary file beside it, which replaces `file` only
/// when every byte reached it; "-" is standard output.
void WriteAll(std::string const& file, std::string const& bytes) {
    if (file == "-") {
#if defined(_WIN32)
        std::cout.flush();
        _setmode(_fileno(stdout), _O_BINARY);
#endif
        std::cout.write(bytes.data(), static_cast<std::streamsize>(bytes.size()));
        return; // main reports a failed write to standard output
    }
    namespace fs = std::filesystem;
    fs::path const target(file);
    std::error_code error;
    if (fs::is_directory(target, error))
        throw ToolError(Named(file) + ": cannot write: it is a directory");
    fs::path temporary;
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> out(nullptr, &std::fclose);
    std::random_device seed;
    for (int attempt = 0; attempt < 100 && !out; ++attempt) {
        temporary = target;
        temporary += ".tekit-" + std::to_string(seed() % 1000000) + ".tmp";
        if (fs::exists(temporary, error))
            continue;
        errno = 0;
        out.reset(std::fopen(temporary.string().c_str(), "wb"));
        if (!out)
            throw ToolError(Named(file) + ": cannot write: " + Reason(errno));
    }
    if (!out)
        throw ToolError(Named(file) + ": cannot write: no free temporary name beside it");
    errno = 0;
    bool written = std::fwrite(bytes.data(), 1, bytes.size(), out.get()) == bytes.size() &&
                   std::fflush(out.get()) == 0;
    int const writeError = errno;
    written = std::fclose(out.release()) == 0 && written;
    if (written)
        fs::rename(temporary, target, error);
    if (!written || error) {
        std::error_code ignored;
        fs::remove(temporary, ignored);
        throw ToolError(Named(file) +
                        ": cannot write: " + (error ? error.message() : Reason(writeError)));
    }
}

unsigned int Size32(std::string const& bytes, std::string const& file) {
    if (bytes.size() > kMaxBlockData)
        throw ToolError(Named(file) + ": too large: a compressed block holds at most " +
                        std::to_string(kMaxBlockData) + " bytes");
    return static_cast<unsigned int>(bytes.size());
}

unsigned char const* Bytes(std::string const& bytes) {
    return reinterpret_cast<unsigned char const*>(bytes.data());
}

std::string Block(KaCompressor& compressor, std::string const& data, std::string const& file) {
    unsigned int const size = Size32(data, file);
    std::string block(compressor.CompressBound(size), '\0');
    unsigned long blockSize = static_cast<unsigned long>(block.size());
    compressor.Compress(reinterpret_cast<unsigned char*>(block.data()), &blockSize, Bytes(data),
                        size);
    block.resize(blockSize);
    return block;
}

std::string Unblock(KaCompressor& compressor, std::string const& block, std::string const& file) {
    unsigned int const blockSize = Size32(block, file);
    std::string data(compressor.UncompressSize(Bytes(block), blockSize), '\0');
    unsigned long size = static_cast<unsigned long>(data.size());
    compressor.Uncompress(reinterpret_cast<unsigned char*>(data.data()), &size, Bytes(block),
                          blockSize);
    return data;
}

/// The text of a compressed string file without the white space at its end.
DynamicString TextOf(std::string bytes, std::string const& file) {
    bytes.erase(bytes.find_last_not_of(" \t\r\n") + 1);
    if (bytes.find('\0') != std::string::npos)
        throw ToolError(Named(file) + ": not a compressed string: it holds a NUL byte");
    return DynamicString(bytes.c_str());
}

/// The block a compressed string stands for.
std::string BlockOfText(DynamicString const& text, std::string const& file) {
    int const size = GetDataSizeForText(text.GetNumBytes());
    std::string block(size > 0 ? static_cast<std::size_t>(size) : 0, '\0');
    if (size < 0 || ConvertTextToDataInBuffer(text.GetBufferReadPtr(), text.GetNumBytes(),
                                              block.data(), size) != size)
        throw ToolError(
            Named(file) + ": " +
            static_cast<char const*>(RString("ERR_DESCR", "COMPRESSED_STRING_MALFORMED")));
    return block;
}

void RequirePaths(Invocation const& call, char const* command) {
    if (call.arguments.size() != 2)
        throw UsageError(std::string(command) + " takes IN and OUT (" +
                             std::to_string(call.arguments.size()) + " given)",
                         command);
}

Record Describe(KaCompressor& compressor, std::string const& file) {
    std::string const bytes = ReadAll(file);
    bool const isText = bytes.compare(0, 4, "PMCZ") != 0 &&
                        KaCompressor::IsCompressedBinaryString(
                            DynamicString(bytes.substr(0, 8).c_str())); // a NUL ends the text
    std::string const block = isText ? BlockOfText(TextOf(bytes, file), file) : bytes;
    std::string const data = Unblock(compressor, block, file); // the data must be whole
    double const ratio = block.empty() ? 0.0 : double(data.size()) / double(block.size());
    char ratioText[32];
    std::snprintf(ratioText, sizeof ratioText, "%.2f", ratio);
    return Record()
        .AddText("file", file)
        .AddText("form", isText ? "text" : "binary")
        .AddText("magic", HexCode(KaCompressor::kMagic) + " (PMCZ)")
        .AddNumber("storedSize", static_cast<long long>(data.size()))
        .AddNumber("compressedSize", static_cast<long long>(block.size()))
        .AddJson("ratio", ratioText, ratioText);
}

int RunCompress(Invocation const& call) {
    KaCompressor compressor;
    if (call.Has("--info")) {
        if (call.Has("--text"))
            throw UsageError("--info and --text cannot be combined", "compress");
        if (call.arguments.empty())
            throw UsageError("--info needs a FILE", "compress");
        std::vector<Record> records;
        int failures = 0;
        for (std::string const& file : call.arguments) {
            try {
                records.push_back(Describe(compressor, file));
            } catch (TEException const& e) {
                std::cerr << "tekit: " << Named(file) << ": " << Shown(e.GetDescription()) << '\n';
                ++failures;
            } catch (ToolError const& e) {
                std::cerr << "tekit: " << e.what() << '\n';
                ++failures;
            }
        }
        PrintRecords(std::cout, records, call.json);
        return failures ? kFailure : kSuccess;
    }
    RequirePaths(call, "compress");
    std::string const &in = call.arguments[0], &out = call.arguments[1];
    std::string const data = ReadAll(in);
    std::string result;
    try {
        if (call.Has("--text")) {
            DynamicString text;
            compressor.BinaryBytesToCompressedString(Bytes(data), Size32(data, in), text);
            result = std::string(text.View()) + "\n";
        } else {
            result = Block(compressor, data, in);
        }
    } catch (TEException const& e) {
        throw ToolError(Named(in) + ": " + Shown(e.GetDescription()));
    }
    WriteAll(out, result);
    return kSuccess;
}

int RunDecompress(Invocation const& call) {
    RequirePaths(call, "decompress");
    std::string const &in = call.arguments[0], &out = call.arguments[1];
    std::string const bytes = ReadAll(in);
    KaCompressor compressor;
    std::string data;
    try {
        if (call.Has("--text")) {
            unsigned char* raw = nullptr;
            unsigned long size = 0;
            compressor.CompressedStringToBinaryBytes(TextOf(bytes, in), raw, size);
            std::unique_ptr<unsigned char, void (*)(void*)> const owned(raw,
                                                                        [](void* p) { TBFree(p); });
            data.assign(reinterpret_cast<char const*>(raw), size);
        } else {
            data = Unblock(compressor, bytes, in);
        }
    } catch (TEException const& e) {
        std::string hint;
        if (!call.Has("--text") &&
            KaCompressor::IsCompressedBinaryString(DynamicString(bytes.substr(0, 7).c_str())))
            hint = " (it holds a compressed string: use --text)";
        throw ToolError(Named(in) + ": " + Shown(e.GetDescription()) + hint);
    }
    WriteAll(out, data);
    return kSuccess;
}

} // namespace

std::vector<Command> const& CompressCommands() {
    static std::vector<Command> const commands{
        {"compress",
         "Compress a file into a framed block or a compressed string",
         "tekit compress [--text] IN OUT\n       tekit compress --info [--json] FILE...",
         kCompressDetails,
         {{"--text", nullptr}, {"--info", nullptr}},
         RunCompress},
        {"decompress",
         "Uncompress a framed block or a compressed string",
         "tekit decompress [--text] IN OUT",
         kDecompressDetails,
         {{"--text", nullptr}},
         RunDecompress},
    };
    return commands;
}

} // namespace tekit::tool
