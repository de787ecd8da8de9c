// Fuzzes framed-block decompression: the input read as a block (header check, then
// uncompression into a buffer of exactly the stored size, so a write past it is caught), and
// the input compressed into a block and uncompressed back.
//
// A block either uncompresses to exactly its stored size or raises one of the documented
// errors; nothing else may happen, and the round trip must give the input back.
#include "tekit/errors/TEException.h"
#include "tekit/streams/KaCompressor.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

namespace {

// Blocks that claim more are checked for their header only: the fuzzer's memory is bounded.
constexpr unsigned int kMaxUncompressed = 64u << 20;

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

bool Documented(tekit::TEError code) {
    return code == tekit::TE_INVALID_OR_OUT_OF_RANGE || code == tekit::TE_OPERATION_FAILED;
}

tekit::KaCompressor& Compressor() {
    static tekit::KaCompressor compressor;
    return compressor;
}

void UncompressInput(unsigned char const* data, unsigned int size) {
    tekit::KaCompressor& compressor = Compressor();
    unsigned int stored = 0;
    try {
        stored = compressor.UncompressSize(data, size);
    } catch (tekit::TEException const& e) {
        Check(e.GetErrorCode() == tekit::TE_INVALID_OR_OUT_OF_RANGE);
        return;
    }
    Check(stored <=
          (size - tekit::KaCompressor::kHeaderSize) * tekit::KaCompressor::kMaxCompressionRatio);
    if (stored > kMaxUncompressed)
        return;
    std::vector<unsigned char> out(stored);
    unsigned long outSize = stored;
    try {
        compressor.Uncompress(out.data(), &outSize, data, size);
        Check(outSize == stored);
    } catch (tekit::TEException const& e) {
        Check(Documented(e.GetErrorCode()));
        Check(outSize == stored);
    }
}

void RoundTrip(unsigned char const* data, unsigned int size) {
    tekit::KaCompressor& compressor = Compressor();
    std::vector<unsigned char> block(compressor.CompressBound(size));
    unsigned long blockSize = static_cast<unsigned long>(block.size());
    compressor.Compress(block.data(), &blockSize, data, size);
    Check(compressor.UncompressSize(block.data(), static_cast<unsigned int>(blockSize)) == size);
    std::vector<unsigned char> back(size);
    unsigned long backSize = size;
    compressor.Uncompress(back.data(), &backSize, block.data(),
                          static_cast<unsigned int>(blockSize));
    Check(backSize == size && (size == 0 || std::memcmp(back.data(), data, size) == 0));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size > kMaxUncompressed)
        return 0;
    // A heap copy of exactly the input, so a read past the block is caught.
    std::vector<unsigned char> const input(data, data + size);
    UncompressInput(input.data(), static_cast<unsigned int>(size));
    RoundTrip(input.data(), static_cast<unsigned int>(size));
    return 0;
}
