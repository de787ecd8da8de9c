// OVMemoryStream's compressed forms: the whole contents as one framed block, and compressed
// byte runs among other values.
#include "platform/Heap.h"
#include "streams/LittleEndian.h"
#include "tekit/errors/Raise.h"
#include "tekit/streams/KaCompressor.h"
#include "tekit/streams/OVMemoryStream.h"

#include <cstdint>
#include <limits>
#include <memory>

namespace tekit {

namespace {

constexpr std::uint64_t kMaxStreamSize = std::numeric_limits<std::uint32_t>::max();
constexpr unsigned int kLengthSize = 4;

/// The compressor of every memory stream. Never destroyed, so streams compress while statics
/// go away too; it keeps the module loaded until the process ends.
KaCompressor& StreamCompressor() {
    static KaCompressor* const compressor = new KaCompressor;
    return *compressor;
}

struct HeapDeleter {
    void operator()(unsigned char* block) const { platform::HeapFree(block); }
};
using HeapBlock = std::unique_ptr<unsigned char, HeapDeleter>;

HeapBlock Allocate(std::uint64_t size, char const* function) {
    HeapBlock block(size <= std::numeric_limits<std::size_t>::max()
                        ? static_cast<unsigned char*>(platform::HeapAllocate(size))
                        : nullptr);
    if (!block)
        TE_RAISE(TE_OUT_OF_MEMORY, "", function);
    return block;
}

/// The framed block's bytes uncompressed into a new block of the heap; `size` receives their
/// number.
HeapBlock UncompressBlock(unsigned char const* block, std::uint32_t blockSize, unsigned long& size,
                          char const* function) {
    KaCompressor& compressor = StreamCompressor();
    size = compressor.UncompressSize(block, blockSize);
    HeapBlock data = Allocate(size, function);
    compressor.Uncompress(data.get(), &size, block, blockSize);
    return data;
}

} // namespace

void OVMemoryStream::Compress() {
    char const* const function = "OVMemoryStream::Compress";
    KaCompressor& compressor = StreamCompressor();
    unsigned long blockSize = compressor.CompressBound(m_size);
    HeapBlock block = Allocate(blockSize, function);
    unsigned long const allocated = blockSize;
    compressor.Compress(block.get(), &blockSize, m_buffer, m_size);
    if (blockSize > kMaxStreamSize)
        Throw32BitOverflowException(function, TE_FILE_BASE_NAME, __LINE__, false);
    platform::HeapFree(m_buffer);
    m_buffer = block.release();
    m_capacity =
        static_cast<std::uint32_t>(allocated < kMaxStreamSize ? allocated : kMaxStreamSize);
    m_size = static_cast<std::uint32_t>(blockSize);
    m_offset = 0;
}

void OVMemoryStream::Uncompress() {
    unsigned long size = 0;
    HeapBlock data = UncompressBlock(m_buffer, m_size, size, "OVMemoryStream::Uncompress");
    platform::HeapFree(m_buffer);
    m_buffer = data.release();
    m_capacity = static_cast<std::uint32_t>(size > 0 ? size : 1);
    m_size = static_cast<std::uint32_t>(size);
    m_offset = 0;
}

void OVMemoryStream::WriteBytesCompressed(void const* data, unsigned int count) {
    char const* const function = "OVMemoryStream::WriteBytesCompressed";
    KaCompressor& compressor = StreamCompressor();
    unsigned long blockSize = compressor.CompressBound(count);
    HeapBlock const run = Allocate(std::uint64_t{kLengthSize} + blockSize, function);
    compressor.Compress(run.get() + kLengthSize, &blockSize,
                        static_cast<unsigned char const*>(data), count);
    if (blockSize > kMaxStreamSize - kLengthSize)
        Throw32BitOverflowException(function, TE_FILE_BASE_NAME, __LINE__, false);
    streams::StoreLittleEndian<std::uint32_t>(run.get(), static_cast<std::uint32_t>(blockSize));
    // One write: it either happens whole or leaves the stream as it was.
    WriteBytes(run.get(), static_cast<unsigned int>(kLengthSize + blockSize));
}

void OVMemoryStream::ReadBytesCompressed(unsigned char*& data, unsigned long& count) {
    char const* const function = "OVMemoryStream::ReadBytesCompressed";
    std::uint64_t const start = std::uint64_t{m_offset} + kLengthSize;
    if (start > m_size)
        TE_RAISE(TE_BAD_FILE_FORMAT, "", function);
    std::uint32_t const blockSize = streams::LoadLittleEndian<std::uint32_t>(m_buffer + m_offset);
    if (start + blockSize > m_size)
        TE_RAISE(TE_BAD_FILE_FORMAT, "", function);
    unsigned long size = 0;
    HeapBlock result = UncompressBlock(m_buffer + start, blockSize, size, function);
    m_offset = static_cast<std::uint32_t>(start + blockSize);
    data = result.release();
    count = size;
}

} // namespace tekit
