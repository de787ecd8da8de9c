#include "tekit/streams/OVMemoryStream.h"

#include "streams/StreamTestSupport.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using namespace tekit;
using namespace tekit::testing;
using namespace std::string_literals;

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
