// Fuzzes compressed strings: the input (up to its first NUL, as a string holds none) read as a
// compressed string into bytes and into text, and recognised by IsCompressedBinaryString.
//
// A text either gives bytes or raises one of the documented errors, leaving the outputs as they
// were; bytes it gives survive a trip through a new compressed string.
#include "tekit/errors/TEException.h"
#include "tekit/streams/KaCompressor.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

bool Documented(tekit::TEError code) {
    return code == tekit::TE_UNRECOGNIZED_VALUE || code == tekit::TE_INVALID_OR_OUT_OF_RANGE ||
           code == tekit::TE_OPERATION_FAILED;
}

tekit::KaCompressor& Compressor() {
    static tekit::KaCompressor compressor;
    return compressor;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    std::string const input(reinterpret_cast<char const*>(data), size);
    tekit::DynamicString const text(input.c_str());
    tekit::KaCompressor& compressor = Compressor();
    bool const looksCompressed = tekit::KaCompressor::IsCompressedBinaryString(text);

    unsigned char* bytes = nullptr;
    unsigned long count = 12345;
    try {
        compressor.CompressedStringToBinaryBytes(text, bytes, count);
    } catch (tekit::TEException const& e) {
        Check(Documented(e.GetErrorCode()));
        Check(bytes == nullptr && count == 12345);
    }
    tekit::DynamicString asText("unchanged");
    try {
        compressor.CompressedStringToString(text, asText);
        Check(bytes != nullptr);
        // The text is the bytes up to their first NUL.
        Check(std::strncmp(asText.GetBufferReadPtr(), reinterpret_cast<char*>(bytes), count) == 0 ||
              std::memchr(bytes, 0, count) != nullptr);
    } catch (tekit::TEException const& e) {
        Check(Documented(e.GetErrorCode()));
        Check(bytes == nullptr && std::strcmp(asText.GetBufferReadPtr(), "unchanged") == 0);
    }
    if (!bytes)
        return 0;
    Check(looksCompressed);
    tekit::DynamicString again;
    compressor.BinaryBytesToCompressedString(bytes, static_cast<unsigned int>(count), again);
    unsigned char* back = nullptr;
    unsigned long backCount = 0;
    compressor.CompressedStringToBinaryBytes(again, back, backCount);
    Check(backCount == count && std::memcmp(back, bytes, count) == 0);
    TBFree(back);
    TBFree(bytes);
    return 0;
}
