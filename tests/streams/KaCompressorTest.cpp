#include "tekit/streams/KaCompressor.h"
#include "streams/StreamTestSupport.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <gtest/gtest.h>
#include <zlib.h>

#include <algorithm>
#include <random>
#include <string>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using namespace tekit::testing;
using namespace std::string_literals;

unsigned char* U(std::string const& s) {
    return reinterpret_cast<unsigned char*>(const_cast<char*>(s.data()));
}
auto const Size = [](std::string const& s) { return static_cast<unsigned>(s.size()); };

KaCompressor gCompressor;

std::string Frame(std::string const& data) {
    std::string block(gCompressor.CompressBound(Size(data)), '\0');
    unsigned long size = Size(block);
    gCompressor.Compress(U(block), &size, U(data), Size(data));
    return block.substr(0, size);
}

std::string Encode(std::string const& bytes) {
    char* const text = ConvertDataToText(bytes.data(), static_cast<int>(bytes.size()));
    std::string const result = text;
    TBFree(text);
    return result;
}

std::string WithStoredSize(std::string block, std::uint32_t size) {
    for (int i = 0; i < 4; ++i)
        block[4 + i] = static_cast<char>(size >> (8 * i));
    return block;
}

std::string const kData = "[Limits]\r\nLow = 3\r\nHigh = 9\r\n" + std::string(300, '-');

// The header is the file format, and the data after it is exactly zlib's compress output, so
// any zlib reader takes it.
TEST(KaCompressor, FramesZlibOutputBehindMagicAndSizeAndRoundTrips) {
    std::string noise(100000, '\0');
    std::generate(noise.begin(), noise.end(), std::mt19937(1));
    for (std::string const& data : {""s, kData, noise, std::string(1 << 20, '\0')}) {
        std::string const block = Frame(data);
        std::uint32_t const n = Size(data);
        EXPECT_EQ(block.substr(0, 8),
                  "PMCZ"s + char(n) + char(n >> 8) + char(n >> 16) + char(n >> 24));
        std::string zlib(compressBound(n), '\0');
        uLongf zlibSize = Size(zlib);
        compress(U(zlib), &zlibSize, U(data), n);
        EXPECT_EQ(block.substr(8), zlib.substr(0, zlibSize));
        EXPECT_EQ(gCompressor.CompressBound(n), compressBound(n) + 8);
        std::string back(gCompressor.UncompressSize(U(block), Size(block)), '\0');
        unsigned long size = Size(back);
        gCompressor.Uncompress(U(back), &size, U(block), Size(block));
        EXPECT_TRUE(size == n && back == data);
    }
    EXPECT_EQ(Frame(""), "PMCZ\0\0\0\0\x78\x9C\x03\0\0\0\0\x01"s);
}

// Decompression parses untrusted bytes: each malformed block raises its documented error,
// and a claimed size is checked against the data before anything is allocated for it.
TEST(KaCompressor, RefusesMalformedBlocksAndTooLittleRoom) {
    std::string const good = Frame(kData);
    std::string corrupt = good;
    corrupt[20] = static_cast<char>(corrupt[20] ^ 0x55);
    std::string const notFramed = "The data is not a compressed block: a block is at least 8 "
                                  "bytes long and begins with the bytes \"PMCZ\".";
    auto const mismatch = [](std::size_t n) {
        return "The compressed block's data does not uncompress to the " + std::to_string(n) +
               " bytes that its header states.";
    };
    std::string const zlib = "Unable to perform compression or decompression operation (code: ";
    struct {
        std::string block;
        TEError code;
        std::string description;
        std::size_t room = 999;
    } const cases[] = {
        {good.substr(0, 7), TE_INVALID_OR_OUT_OF_RANGE, notFramed},
        {"PMCY" + good.substr(4), TE_INVALID_OR_OUT_OF_RANGE, notFramed},
        {WithStoredSize(good, 0xFFFFFFFFu), TE_INVALID_OR_OUT_OF_RANGE,
         "The compressed block states an uncompressed size of 4294967295 bytes, more than its " +
             std::to_string(good.size() - 8) + " bytes of compressed data can hold."},
        {WithStoredSize(good, Size(kData) + 1), TE_OPERATION_FAILED, mismatch(kData.size() + 1)},
        {WithStoredSize(good, Size(kData) - 1), TE_OPERATION_FAILED, mismatch(kData.size() - 1)},
        {good.substr(0, 14), TE_OPERATION_FAILED, zlib + "-3)."}, // cut short
        {corrupt, TE_OPERATION_FAILED, zlib + "-3)."},
        {good, TE_OPERATION_FAILED, zlib + "-5).", kData.size() - 1}, // too little room
    };
    for (auto const& c : cases) {
        std::vector<unsigned char> dst(c.room);
        unsigned long size = static_cast<unsigned long>(c.room);
        TEException const e =
            Raised([&] { gCompressor.Uncompress(dst.data(), &size, U(c.block), Size(c.block)); });
        EXPECT_EQ(e.GetErrorCode(), c.code);
        EXPECT_EQ(e.GetDescription(), c.description);
        EXPECT_EQ(size, c.room);
    }
    EXPECT_RAISES_IN(gCompressor.UncompressSize(U(good), 7), TE_INVALID_OR_OUT_OF_RANGE,
                     "KaCompressor::UncompressSize", notFramed.c_str());
    unsigned long room = 20;
    EXPECT_RAISES_IN(gCompressor.Compress(U(corrupt), &room, U(kData), Size(kData)),
                     TE_OPERATION_FAILED, "KaCompressor::ThrowExceptionIfError",
                     (zlib + "-5).").c_str());
}

TEST(KaCompressor, CompressedStringIsTheEncodedBlockAndRoundTrips) {
    for (std::string const& data : {""s, kData, "with\0NUL"s}) {
        DynamicString text, back("old");
        gCompressor.BinaryBytesToCompressedString(U(data), Size(data), text);
        EXPECT_EQ(text.View(), Encode(Frame(data)));
        unsigned char* bytes = nullptr;
        unsigned long count = 0;
        gCompressor.CompressedStringToBinaryBytes(text, bytes, count);
        EXPECT_EQ(std::string(reinterpret_cast<char*>(bytes), count), data);
        TBFree(bytes);
        gCompressor.CompressedStringToString(text, back); // a string ends at a NUL
        EXPECT_EQ(back.View(), data.substr(0, data.find('\0')));
    }
    DynamicString text;
    gCompressor.StringToCompressedString(DynamicString(kData.c_str()), text);
    EXPECT_EQ(text.View(), Encode(Frame(kData)));
}

TEST(KaCompressor, RecognisesTheMagicInTheFirstSixOfMoreThanSixCharacters) {
    for (char const* yes : {"J3p2LV.", "J3p2LV!?"})
        EXPECT_TRUE(KaCompressor::IsCompressedBinaryString(DynamicString(yes))) << yes;
    for (char const* no : {"", "J3p2LV", "J3p2LW..", "J3p2L!..", "hello world"})
        EXPECT_FALSE(KaCompressor::IsCompressedBinaryString(DynamicString(no))) << no;
}

// A bad text raises and leaves the caller's outputs as they were; only the decoded text is
// allocated before the block's header is checked.
TEST(KaCompressor, RefusesTextsThatAreNotCompressedStrings) {
    std::string const g = Encode(Frame(kData));
    struct {
        std::string text;
        TEError code;
    } const cases[] = {
        {g.substr(0, 10) + "!" + g.substr(11), TE_UNRECOGNIZED_VALUE}, // a character outside
        {g.substr(0, g.size() / 6 * 6) + ".", TE_UNRECOGNIZED_VALUE},  // length 6k + 1
        {g.substr(0, 12) + "zz", TE_UNRECOGNIZED_VALUE},               // unused bits set
        {Encode("Hello, world!"), TE_INVALID_OR_OUT_OF_RANGE},         // data, but no block
        {Encode(WithStoredSize(Frame(kData), 0xFFFFFFF0u)), TE_INVALID_OR_OUT_OF_RANGE},
        {g.substr(0, g.size() - 12), TE_OPERATION_FAILED}, // a block cut short
    };
    for (auto const& c : cases) {
        DynamicString const text(c.text.c_str());
        unsigned char* bytes = nullptr;
        unsigned long count = 7;
        ScopedFault const allocations(FaultKind::Allocate, ScopedFault::kCountOnly);
        EXPECT_RAISES(gCompressor.CompressedStringToBinaryBytes(text, bytes, count), c.code);
        EXPECT_LE(allocations.Calls(), c.code == TE_OPERATION_FAILED ? 2u : 1u) << c.text;
        EXPECT_TRUE(bytes == nullptr && count == 7);
        DynamicString out("kept");
        EXPECT_RAISES(gCompressor.CompressedStringToString(text, out), c.code);
        EXPECT_EQ(out.View(), "kept");
    }
    for (std::uint32_t nth : {1u, 2u}) { // allocating the decoded text, then the result
        ScopedFault const fail(FaultKind::Allocate, nth);
        unsigned char* bytes = nullptr;
        unsigned long count = 5;
        EXPECT_RAISES(
            gCompressor.CompressedStringToBinaryBytes(DynamicString(g.c_str()), bytes, count),
            TE_OUT_OF_MEMORY);
        EXPECT_TRUE(fail.Fired() && bytes == nullptr && count == 5);
    }
}

// The unframed routines are plain zlib streams and report by status.
TEST(KaCompressor, ObsoleteRoutinesArePlainZlibWithStatuses) {
    int const bound = gCompressor.ObsoleteCompressBound(Size(kData));
    EXPECT_EQ(bound, static_cast<int>(compressBound(Size(kData))));
    std::string packed(static_cast<std::size_t>(bound), '\0'), back(kData.size(), '\0');
    unsigned long size = Size(packed), room = Size(back);
    EXPECT_EQ(gCompressor.ObsoleteCompress(U(packed), &size, U(kData), Size(kData)), 0);
    packed.resize(size);
    EXPECT_EQ(packed, Frame(kData).substr(8));
    EXPECT_EQ(gCompressor.ObsoleteUncompress(U(back), &room, U(packed), Size(packed)), 0);
    EXPECT_EQ(back, kData);
    room = Size(back) - 1;
    EXPECT_EQ(gCompressor.ObsoleteUncompress(U(back), &room, U(packed), Size(packed)),
              TE_OPERATION_FAILED);
    EXPECT_EQ(gCompressor.ObsoleteUncompress(nullptr, &room, U(packed), 1), TE_INVALID_POINTER);
}

// A module that cannot be loaded, or lacks a function, raises naming the file; the object
// stays unloaded, so it loads once the cause is gone.
TEST(KaCompressor, LoadFailuresNameTheModuleAndAreRetried) {
    struct {
        FaultKind kind;
        std::uint32_t nth;
        TEError code;
        char const* named;
    } const cases[] = {
        {FaultKind::ModuleLoad, 1, TE_DLL_NOT_LOADABLE, "Unable to load the compression module"},
        {FaultKind::SymbolLookup, 1, TE_FUNC_NOT_IN_LIB, "has no function 'compress'."},
        {FaultKind::SymbolLookup, 2, TE_FUNC_NOT_IN_LIB, "has no function 'compressBound'."},
        {FaultKind::SymbolLookup, 3, TE_FUNC_NOT_IN_LIB, "has no function 'uncompress'."},
    };
    for (auto const& c : cases) {
        KaCompressor compressor;
        {
            ScopedFault const fail(c.kind, c.nth, native::kModuleNotFound, true);
            TEException const e = Raised([&] { compressor.CompressBound(1); });
            std::string const description = e.GetDescription();
            EXPECT_EQ(e.GetErrorCode(), c.code);
            EXPECT_NE(description.find(c.named), std::string::npos) << description;
            EXPECT_NE(description.find(KaCompressor::kModuleFileName), std::string::npos);
            EXPECT_EQ(compressor.ObsoleteCompressBound(1), c.code);
            // Reading a header needs no module.
            EXPECT_EQ(compressor.UncompressSize(U("PMCZ\0\0\0\0\x78\x9C"s), 10), 0u);
        }
        EXPECT_EQ(compressor.CompressBound(0), compressBound(0) + 8);
    }
}

TEST(KaCompressor, ConcurrentFirstUsesLoadOnce) {
    KaCompressor compressor;
    ScopedFault const loads(FaultKind::ModuleLoad, ScopedFault::kCountOnly);
    std::vector<std::thread> threads;
    for (int i = 0; i < 8; ++i)
        threads.emplace_back([&] { EXPECT_EQ(compressor.CompressBound(9), compressBound(9) + 8); });
    for (std::thread& t : threads)
        t.join();
    EXPECT_EQ(loads.Calls(), 1u);
}

std::string const kText = "Station 3, limits 0.5 to 2.5; " + std::string(5000, '~');

TEST(MemoryStreamCompression, CompressAndUncompressReplaceTheContentsOrNothing) {
    std::string block; // kText's, compressed
    for (std::string const& contents : {""s, kText}) {
        OVMemoryStream stream;
        Fill(stream, contents);
        stream.SetOffset(3);
        stream.Compress();
        EXPECT_EQ(Bytes(stream).substr(0, 6),
                  "PMCZ"s + char(contents.size()) + char(contents.size() >> 8));
        EXPECT_EQ(stream.GetOffset(), 0u);
        block = Bytes(stream);
        stream.Uncompress();
        EXPECT_EQ(StateOf(stream), (StreamState{0, contents}));
    }
    struct {
        std::string contents;
        bool compress;
        std::uint32_t failedAllocation; // 0: none
        TEError code;
    } const failures[] = {
        {"PMCY" + block.substr(4), false, 0, TE_INVALID_OR_OUT_OF_RANGE},
        {block.substr(0, 14), false, 0, TE_OPERATION_FAILED},
        {block, false, 1, TE_OUT_OF_MEMORY},
        {kText, true, 1, TE_OUT_OF_MEMORY},
    };
    for (auto const& c : failures) {
        OVMemoryStream stream;
        Fill(stream, c.contents);
        stream.SetOffset(2);
        StreamState const before = StateOf(stream);
        ScopedFault const fail(FaultKind::Allocate, c.failedAllocation);
        EXPECT_RAISES(c.compress ? stream.Compress() : stream.Uncompress(), c.code);
        EXPECT_EQ(StateOf(stream), before);
    }
}

// A compressed run sits among other values: its length as 4 bytes, then the framed block. A
// run that is cut or damaged raises and moves nothing.
TEST(MemoryStreamCompression, CompressedRunsTravelAmongOtherValues) {
    OVMemoryStream stream;
    stream.WriteInt("before", 7);
    stream.WriteBytesCompressed(kText.data(), static_cast<unsigned>(kText.size()));
    stream.WriteBytesCompressed(nullptr, 0);
    EXPECT_EQ(Bytes(stream).substr(8, 4), "PMCZ");
    stream.SetOffset(0);
    EXPECT_EQ(stream.ReadInt("before"), 7);
    for (std::string const& expected : {kText, ""s}) {
        unsigned char* data = nullptr;
        unsigned long count = 0;
        stream.ReadBytesCompressed(data, count);
        EXPECT_EQ(std::string(reinterpret_cast<char*>(data), count), expected);
        TBFree(data);
    }
    StreamState const written = StateOf(stream);
    {
        ScopedFault const fail(FaultKind::Allocate, 1);
        EXPECT_RAISES(stream.WriteBytesCompressed(kText.data(), 10), TE_OUT_OF_MEMORY);
    }
    EXPECT_EQ(StateOf(stream), written);

    std::string const run = Bytes(stream).substr(4, Bytes(stream).size() - 4 - 20);
    struct {
        std::string contents;
        std::uint32_t offset;
        TEError code;
    } const cases[] = {
        {run, static_cast<std::uint32_t>(run.size() + 1), TE_BAD_FILE_FORMAT},   // past the end
        {run.substr(0, 3), 0, TE_BAD_FILE_FORMAT},                               // length cut
        {run.substr(0, run.size() - 1), 0, TE_BAD_FILE_FORMAT},                  // block cut
        {run.substr(0, 4) + "Q" + run.substr(5), 0, TE_INVALID_OR_OUT_OF_RANGE}, // magic
        {run.substr(0, 8) + "\xFF\xFF\xFF\xFF" + run.substr(12), 0, TE_INVALID_OR_OUT_OF_RANGE},
    };
    for (auto const& c : cases) {
        Fill(stream, c.contents);
        stream.SetOffset(c.offset);
        StreamState const before = StateOf(stream);
        unsigned char* data = nullptr;
        unsigned long count = 3;
        EXPECT_RAISES(stream.ReadBytesCompressed(data, count), c.code);
        EXPECT_EQ(StateOf(stream), before);
        EXPECT_TRUE(data == nullptr && count == 3);
    }
}

} // namespace
} // namespace tekit
