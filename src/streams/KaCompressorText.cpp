// KaCompressor: compressed strings, the text form of framed blocks.
#include "tekit/streams/KaCompressor.h"

#include "platform/Heap.h"
#include "streams/LittleEndian.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/DataText.h"

#include <climits>
#include <memory>

namespace tekit {

namespace {

struct HeapDeleter {
    void operator()(unsigned char* block) const { platform::HeapFree(block); }
};
using HeapBlock = std::unique_ptr<unsigned char, HeapDeleter>;

HeapBlock Allocate(std::size_t size, char const* function) {
    HeapBlock block(static_cast<unsigned char*>(platform::HeapAllocate(size)));
    if (!block)
        TE_RAISE(TE_OUT_OF_MEMORY, static_cast<char const*>(nullptr), function);
    return block;
}

[[noreturn]] void RaiseMalformed(char const* function) {
    TE_RAISE(TE_UNRECOGNIZED_VALUE, RString("ERR_DESCR", "COMPRESSED_STRING_MALFORMED"), function);
}

/// Reserves room for `numBytes` bytes and a terminator in `text` and returns it for writing.
char* PrepareText(DynamicString& text, std::uint64_t numBytes, char const* function) {
    if (numBytes >= INT_MAX)
        Throw32BitOverflowException(function, TE_FILE_BASE_NAME, __LINE__, true);
    int const size = static_cast<int>(numBytes) + 1;
    if (text.RequestBufferSize(size, false, true) < size)
        TE_RAISE(TE_OUT_OF_MEMORY, static_cast<char const*>(nullptr), function);
    return text.GetBufferWritePtr();
}

} // namespace

unsigned char* KaCompressor::DecodeText(String const& text, unsigned int& blockSize,
                                        char const* function) {
    int const length = text.GetNumBytes();
    int const size = GetDataSizeForText(length);
    if (size < 0)
        RaiseMalformed(function);
    HeapBlock block = Allocate(static_cast<std::size_t>(size), function);
    if (ConvertTextToDataInBuffer(text.GetBufferReadPtr(), length, block.get(), size) != size)
        RaiseMalformed(function);
    blockSize = static_cast<unsigned int>(size);
    return block.release();
}

void KaCompressor::BinaryBytesToCompressedString(unsigned char const* bytes, unsigned int n,
                                                 DynamicString& out) {
    char const* const function = "KaCompressor::BinaryBytesToCompressedString";
    if (!bytes && n > 0)
        TE_RAISE(TE_INVALID_POINTER, static_cast<char const*>(nullptr), function);
    unsigned long blockSize = CompressBound(n);
    HeapBlock const block = Allocate(blockSize, function);
    Compress(block.get(), &blockSize, bytes, n);
    // 6 characters for every 4 bytes: the text outgrows an int well before the data does.
    int const textSize = blockSize < INT_MAX ? GetTextSizeForData(static_cast<int>(blockSize)) : -1;
    if (textSize < 0)
        Throw32BitOverflowException(function, TE_FILE_BASE_NAME, __LINE__, true);
    DynamicString text;
    char* const buffer = PrepareText(text, static_cast<unsigned>(textSize), function);
    ConvertDataToTextInBuffer(block.get(), static_cast<int>(blockSize), buffer, textSize + 1);
    out = text;
}

void KaCompressor::CompressedStringToBinaryBytes(String const& text, unsigned char*& bytes,
                                                 unsigned long& numBytes) {
    char const* const function = "KaCompressor::CompressedStringToBinaryBytes";
    unsigned int blockSize = 0;
    HeapBlock const block(DecodeText(text, blockSize, function));
    unsigned long size = CheckHeader(block.get(), blockSize, function);
    HeapBlock result = Allocate(size, function);
    Uncompress(result.get(), &size, block.get(), blockSize);
    bytes = result.release();
    numBytes = size;
}

void KaCompressor::StringToCompressedString(String const& text, DynamicString& out) {
    BinaryBytesToCompressedString(reinterpret_cast<unsigned char const*>(text.GetBufferReadPtr()),
                                  static_cast<unsigned int>(text.GetNumBytes()), out);
}

void KaCompressor::CompressedStringToString(String const& text, DynamicString& out) {
    char const* const function = "KaCompressor::CompressedStringToString";
    unsigned int blockSize = 0;
    HeapBlock const block(DecodeText(text, blockSize, function));
    unsigned long size = CheckHeader(block.get(), blockSize, function);
    DynamicString result;
    char* const buffer = PrepareText(result, size, function);
    Uncompress(reinterpret_cast<unsigned char*>(buffer), &size, block.get(), blockSize);
    buffer[size] = '\0';
    out = result;
}

bool KaCompressor::IsCompressedBinaryString(String const& text) {
    if (text.GetNumBytes() <= 6)
        return false;
    if (GetDataSizeForText(6) != 4)
        TE_RAISE_ASSERTION(
            "KaCompressor::IsBinarySafeArrayString got unexpected value for dataSize.",
            "KaCompressor::IsCompressedBinaryString");
    unsigned char magic[4];
    return ConvertTextToDataInBuffer(text.GetBufferReadPtr(), 6, magic, sizeof magic) == 4 &&
           streams::LoadLittleEndian<std::uint32_t>(magic) == kMagic;
}

} // namespace tekit
