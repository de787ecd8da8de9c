// Streams: the typed values as bytes, the memory stream's buffer, and string tables.
#include "tekit/streams/OVMemoryStream.h"

#include "streams/StreamTestSupport.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "tekit/streams/OVStringTable.h"
#include "tekit/strings/DynamicString.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <functional>
#include <random>
#include <string>
#include <vector>

namespace {

using namespace tekit;
using namespace tekit::testing;
using namespace std::string_literals;
using Op = std::function<void(ProbeStream&)>;

DynamicString Text(std::string const& text) {
    return DynamicString(text.c_str());
}

// The bytes are the file format, the same for the base's typed values (over WriteBytes and
// ReadBytes) and the memory stream's own: pinned for every kind, and read back.
TEST(StreamEncoding, WritesEveryKindAsPinnedLittleEndianBytesAndReadsItBack) {
    ByteStream base;
    OVMemoryStream memory;
    OVStream* const streams[] = {&base, &memory};
    for (OVStream* s : streams) {
        s->WriteInt("", -2);
        s->WriteUInt("", 0x01020304u);
        s->WriteInt64("", -0x0102030405060708LL);
        s->WriteUInt64("", 0xF1F2F3F4F5F6F7F8ULL);
        s->WriteDouble("", -1.5);
        s->WriteBool("", true);
        s->WriteBool("", false);
        s->WriteBytes("\x02", 1);
    }
    std::string const expected = "\xFE\xFF\xFF\xFF\x04\x03\x02\x01\xF8\xF8\xF9\xFA\xFB\xFC\xFD\xFE"
                                 "\xF8\xF7\xF6\xF5\xF4\xF3\xF2\xF1\0\0\0\0\0\0\xF8\xBF\x01\0\x02"s;
    EXPECT_EQ(base.bytes, expected);
    EXPECT_EQ(Bytes(memory), expected);
    for (OVStream* s : streams) {
        s->SetOffset(0);
        EXPECT_EQ(s->ReadInt(""), -2);
        EXPECT_EQ(s->ReadUInt(""), 0x01020304u);
        EXPECT_EQ(s->ReadInt64(""), -0x0102030405060708LL);
        EXPECT_EQ(s->ReadUInt64(""), 0xF1F2F3F4F5F6F7F8ULL);
        EXPECT_EQ(s->ReadDouble(""), -1.5);
        EXPECT_TRUE(s->ReadBool(""));
        EXPECT_FALSE(s->ReadBool(""));
        EXPECT_TRUE(s->ReadBool("")); // any non-zero byte is true
        EXPECT_RAISES(s->ReadBool(""), TE_BAD_FILE_FORMAT);
        EXPECT_EQ(s->GetOffset(), s->GetSize());
    }
}

TEST(StreamEncoding, WritesStringsWithTheirTerminatorWhateverTheFlags) {
    OVMemoryStream s;
    s.WriteString("", DynamicString("ab"), false, true); // the flags mean nothing to it
    s.WriteString("", DynamicString());
    EXPECT_EQ(Bytes(s), "ab\0\0"s);
    s.SetOffset(0);
    DynamicString text("stale");
    s.ReadString("", text);
    EXPECT_EQ(text, "ab");
    s.ReadString("", text);
    EXPECT_TRUE(text.IsEmpty());
}

TEST(MemoryStreamLayout, OverwritesInPlaceAndGrowsOnlyPastTheEnd) {
    // clang-format off
    struct { unsigned offset; std::string expected; } const cases[] = {
        {2, "01\x04\x03\x02\x01" "6789"},          // inside: size stays 10
        {8, "01234567\x04\x03\x02\x01"},           // runs past the end by 2: size 12
        {13, "0123456789\0\0\0\x04\x03\x02\x01"s}, // past the end: the gap reads as zeros
    };
    // clang-format on
    for (auto const& c : cases) {
        OVMemoryStream stream;
        Fill(stream, "0123456789", c.offset);
        stream.WriteUInt("", 0x01020304u);
        EXPECT_EQ(StateOf(stream), (StreamState{c.offset + 4, c.expected}));
    }
}

TEST(MemoryStreamLayout, StartsWithTheInitialCapacityAndGrowsByDoublingOrToTheNeed) {
    ProbeStream stream;
    EXPECT_EQ(stream.Capacity(), 100000u);
    // clang-format off
    struct { unsigned offset, count, capacity; } const steps[] = {
        {0, 100000, 100000}, {100000, 1, 200000}, {0, 450000, 450000}, {450000, 10, 900000},
    };
    // clang-format on
    std::vector<unsigned char> const block(450000, 0xAB);
    for (auto const& step : steps) {
        stream.SetOffset(step.offset);
        stream.WriteBytes(block.data(), step.count);
        EXPECT_EQ(stream.Capacity(), step.capacity) << step.offset << "+" << step.count;
    }
    EXPECT_EQ(stream.GetLargeSize(), 450010u);
}

// Every read checks the bounds with its own context, and a failure moves nothing.
TEST(MemoryStreamReads, ReadPastTheEndRaisesWithTheOperationsContextAndMovesNothing) {
    char buffer[4];
    DynamicString text;
    struct {
        char const* context;
        Op read;
        std::string contents; // read from offset 1
    } const cases[] = {
        {"OVMemoryStream::ReadInt", [](ProbeStream& s) { s.ReadInt(""); }, "x123"},
        {"OVMemoryStream::ReadUInt", [](ProbeStream& s) { s.ReadUInt(""); }, "x123"},
        {"OVMemoryStream::ReadInt64", [](ProbeStream& s) { s.ReadInt64(""); }, "x1234567"},
        {"OVMemoryStream::ReadUInt64", [](ProbeStream& s) { s.ReadUInt64(""); }, "x1234567"},
        {"OVMemoryStream::ReadDouble", [](ProbeStream& s) { s.ReadDouble(""); }, "x1234567"},
        {"OVMemoryStream::ReadBool", [](ProbeStream& s) { s.ReadBool(""); }, "x"},
        {"OVMemoryStream::ReadStringRaw", [&](ProbeStream& s) { s.ReadString("", text); }, "x12"},
        {"OVMemoryStream::ReadBytes",
         [&](ProbeStream& s) { s.ReadBytes(buffer, 4, TE_BAD_FILE_FORMAT); }, "x123"},
    };
    for (auto const& c : cases) {
        SCOPED_TRACE(c.context);
        ProbeStream stream;
        Fill(stream, c.contents);
        for (unsigned offset : {1u, 1000u}) { // far past the end too, without overflowing
            stream.SetOffset(offset);
            EXPECT_RAISES_IN(c.read(stream), TE_BAD_FILE_FORMAT, c.context);
            EXPECT_EQ(StateOf(stream), (StreamState{offset, c.contents}));
        }
    }
}

TEST(MemoryStreamReads, ReadBytesReturnsWhatIsLeftOnlyWhenNoErrorIsGiven) {
    // clang-format off
    struct { unsigned offset; TEError errorIfShort; unsigned count, offsetAfter; } const cases[] = {
        {6, TEError(0), 4, 10},  {6, TE_OUT_OF_MEMORY, ~0u, 6}, // count ~0u: raises
        {0, TE_BAD_FILE_FORMAT, 10, 10}, {12, TEError(0), 0, 12}, {10, TEError(0), 0, 10},
    };
    // clang-format on
    for (auto const& c : cases) {
        OVMemoryStream stream;
        Fill(stream, "0123456789", c.offset);
        char buffer[10] = {};
        if (c.count == ~0u)
            EXPECT_RAISES_IN(stream.ReadBytes(buffer, 10, c.errorIfShort), c.errorIfShort,
                             "OVMemoryStream::ReadBytes");
        else
            EXPECT_EQ(stream.ReadBytes(buffer, 10, c.errorIfShort), c.count);
        EXPECT_EQ(stream.GetOffset(), c.offsetAfter) << c.offset;
    }
}

// The terminator search goes eight bytes at a time: every position of the NUL in a word, after
// bytes that look like zeros to a careless test (0x01, 0x80, 0xFF), and no NUL at all.
TEST(MemoryStreamReads, FindsTheTerminatorAtEveryPositionOfAWord) {
    for (char filler : {'a', '\x01', '\x80', '\xFF'}) {
        for (std::size_t length = 0; length <= 40; ++length) {
            std::string const text(length, filler);
            OVMemoryStream stream;
            Fill(stream, "<" + text + '\0' + text + "\x01\x01", 1);
            DynamicString read;
            stream.ReadString("", read);
            EXPECT_EQ(std::string(read.GetBufferReadPtr()), text) << length;
            EXPECT_EQ(stream.GetOffset(), length + 2);
            EXPECT_RAISES(stream.ReadString("", read), TE_BAD_FILE_FORMAT);
            EXPECT_EQ(stream.GetOffset(), length + 2);
        }
    }
}

TEST(MemoryStreamEditing, TruncatesAtTheOffsetAndRefusesPastTheEnd) {
    OVMemoryStream stream;
    Fill(stream, "0123456789", 4);
    stream.TruncateAtCurrentOffset();
    stream.SetOffset(5);
    EXPECT_RAISES_IN(stream.TruncateAtCurrentOffset(), TE_PROGRAM_ERROR,
                     "OVMemoryStream::TruncateAtCurrentOffset");
    EXPECT_EQ(StateOf(stream), (StreamState{5, "0123"}));
    // The buffer keeps the cut bytes: writing past the new end must show zeros, not them.
    stream.SetOffset(6);
    stream.WriteBool("", true);
    EXPECT_EQ(Bytes(stream), "0123\0\0\x01"s);
}

TEST(MemoryStreamEditing, DeletesBytesAtTheOffsetWithoutMovingIt) {
    // clang-format off
    struct { unsigned offset; unsigned long count; char const* expected; } const cases[] = {
        {2, 3, "0156789"}, {0, 10, ""}, {9, 1, "012345678"}, {10, 0, "0123456789"},
        {8, 3, nullptr}, {11, 0, nullptr}, {2, ~0UL, nullptr}, // null: raises
    };
    // clang-format on
    for (auto const& c : cases) {
        OVMemoryStream stream;
        Fill(stream, "0123456789", c.offset);
        if (c.expected)
            stream.DeleteBytesAtCurrentOffset(c.count);
        else
            EXPECT_RAISES_IN(stream.DeleteBytesAtCurrentOffset(c.count), TE_INVALID_OR_OUT_OF_RANGE,
                             "OVMemoryStream::DeleteBytesAtCurrentOffset");
        EXPECT_EQ(StateOf(stream), (StreamState{c.offset, c.expected ? c.expected : "0123456789"}));
    }
}

TEST(MemoryStreamComparison, ComparesOnlyTheValidBytes) {
    OVStringTable table;
    // clang-format off
    struct { std::string a, b; bool equal; } const cases[] = {
        {"", "", true}, {"abc", "abc", true}, {"abc", "abd", false}, {"abc", "ab", false},
        {"ab\0c"s, "ab\0d"s, false}, {"", "\0"s, false},
    };
    // clang-format on
    for (auto const& c : cases) {
        OVMemoryStream a, b(&table);
        Fill(a, c.a + "tail", static_cast<unsigned>(c.a.size()));
        a.TruncateAtCurrentOffset(); // the bytes beyond the size do not count
        Fill(b, c.b);                // nor do offsets and tables
        EXPECT_EQ(a.IsEqualTo(b), c.equal);
        EXPECT_EQ(b.IsEqualTo(a), c.equal);
        EXPECT_TRUE(a.IsEqualTo(a));
    }
}

TEST(MemoryStreamCopies, CopiesAreIndependentAndKeepOffsetAndTable) {
    OVStringTable table;
    OVMemoryStream original(&table);
    for (std::string const& contents : {"abc"s, std::string(300000, 'x')}) {
        Fill(original, contents, 2);
        OVMemoryStream copy(original), small, large;
        Fill(large, std::string(200000, 'y'));
        small = original;
        large = original;
        for (OVMemoryStream* s : {&copy, &small, &large}) {
            EXPECT_EQ(StateOf(*s), StateOf(original));
            EXPECT_EQ(s->GetStringTable(), &table);
            s->WriteBool("", true);
        }
        EXPECT_EQ(Bytes(original), contents);
    }
}

TEST(MemoryStreamCopies, WriteStreamCopiesARangeOfTheSourceAtTheOffset) {
    // clang-format off
    struct { unsigned long offset, count; std::string expected; } const cases[] = {
        {0, OVStream::kToEnd, "AB0123456789"}, {2, 3, "AB234"}, {8, 100, "AB89"}, {10, 5, "AB"},
    };
    // clang-format on
    for (auto const& c : cases) {
        OVMemoryStream source, target;
        Fill(source, "0123456789", 7);
        Fill(target, "AB", 2);
        target.WriteStream(source, c.offset, c.count);
        EXPECT_EQ(StateOf(target), (StreamState{c.expected.size(), c.expected}));
        EXPECT_EQ(source.GetOffset(), 7u);
    }
    OVMemoryStream target;
    ByteStream other;
    EXPECT_RAISES_IN(target.WriteStream(other, 0, 1), TE_NOT_SUPPORTED,
                     "OVMemoryStream::WriteStream",
                     "Stream type not support by OVMemoryStream::WriteStream.");
    EXPECT_RAISES_IN(target.WriteStream(target, 1, 1), TE_INVALID_OR_OUT_OF_RANGE,
                     "OVMemoryStream::WriteStream",
                     "invalid starting offset in OVMemoryStream::WriteStream");
    // Copying from itself while the buffer moves: through WriteStream and from GetDataPtr.
    std::string const full(OVMemoryStream::kInitialCapacity, 'h');
    Fill(target, full, OVMemoryStream::kInitialCapacity);
    target.WriteStream(target, 0, OVStream::kToEnd);
    target.WriteBytes(target.GetDataPtr(), target.GetSize());
    EXPECT_EQ(Bytes(target), full + full + full + full);
}

// Growth is the one write step that can fail: every write, whatever its path to the buffer,
// leaves offset, size and contents unchanged when the allocator refuses.
TEST(MemoryStreamFailures, AFailedAllocationLeavesEveryWriteWithoutEffect) {
    OVStringTable table;
    table.GetIndexForString(Text("stored"));
    OVMemoryStream large;
    Fill(large, std::string(300000, 'l'));
    DynamicString stringified;
    large.GetStringifiedVersionOfData(stringified);
    char const* const kGrow = "OVMemoryStream::PrepareStreamForWrite";
    struct {
        char const* context;
        Op write;
    } const cases[] = {
        {kGrow, [](ProbeStream& s) { s.WriteInt("", 1); }},
        {kGrow, [](ProbeStream& s) { s.WriteDouble("", 1); }},
        {kGrow, [](ProbeStream& s) { s.WriteBool("", true); }},
        {kGrow, [](ProbeStream& s) { s.WriteBytes("abc", 3); }},
        {kGrow, [](ProbeStream& s) { s.WriteString("", Text("abc")); }},
        {kGrow, [](ProbeStream& s) { s.WriteStringRaw("abc", false); }},
        {kGrow, [&](ProbeStream& s) { s.WriteStream(large, 0, 10); }},
        {kGrow, [&](ProbeStream& s) { table.StoreToMemoryStream(s); }},
        {"OVMemoryStream::operator=",
         [&](ProbeStream& s) { static_cast<OVMemoryStream&>(s) = large; }},
        {"OVMemoryStream::SetData_AsUTF8",
         [](ProbeStream& s) { s.SetData_AsUTF8(Text(std::string(200000, 'u'))); }},
        {"OVMemoryStream::SetDataFromStringifiedVersion",
         [&](ProbeStream& s) { s.SetDataFromStringifiedVersion(stringified); }},
    };
    std::string const full(OVMemoryStream::kInitialCapacity, 's');
    for (auto const& c : cases) {
        ProbeStream stream;
        Fill(stream, full, OVMemoryStream::kInitialCapacity);
        {
            ScopedFault const noMemory(FaultKind::Allocate, 1, ENOMEM, true);
            EXPECT_RAISES_IN(c.write(stream), TE_OUT_OF_MEMORY, c.context);
        }
        EXPECT_EQ(StateOf(stream), (StreamState{full.size(), full}));
        c.write(stream); // and with memory, it works
    }
    // Through a string table, the failed write adds no string to the table either.
    OVMemoryStream indexed(&table);
    Fill(indexed, full.substr(2), OVMemoryStream::kInitialCapacity - 2);
    ScopedFault const noMemory(FaultKind::Allocate, 1, ENOMEM, true);
    EXPECT_RAISES(indexed.WriteString("", Text("new")), TE_OUT_OF_MEMORY);
    EXPECT_EQ(table.GetNumStrings(), 1);
    EXPECT_RAISES_IN(OVMemoryStream(), TE_OUT_OF_MEMORY, "OVMemoryStream::OVMemoryStream");
}

TEST(MemoryStreamFailures, ASizeBeyondThirtyTwoBitsRaisesAndChangesNothing) {
    std::vector<char> const block(64);
    struct {
        unsigned offset;
        Op write;
    } const cases[] = {
        {0xFFFFFFF0u, [&](ProbeStream& s) { s.WriteBytes(block.data(), 64); }},
        {0xFFFFFFFEu, [](ProbeStream& s) { s.WriteInt64("", 1); }},
    };
    for (auto const& c : cases) {
        ProbeStream stream;
        Fill(stream, "abc", c.offset);
        EXPECT_RAISES_IN(c.write(stream), TE_UINT32_OVERFLOW,
                         "OVMemoryStream::PrepareStreamForWrite", "32-BIT SIZE LIMITATION.");
        EXPECT_EQ(StateOf(stream), (StreamState{c.offset, "abc"}));
        EXPECT_EQ(stream.Capacity(), OVMemoryStream::kInitialCapacity);
    }
}

TEST(MemoryStreamText, StringifiedFormRoundTripsAnyContents) {
    std::mt19937 random(14);
    for (std::size_t size : {0u, 1u, 3u, 4u, 5u, 100001u}) {
        std::string bytes(size, '\0');
        for (char& b : bytes)
            b = static_cast<char>(random());
        OVMemoryStream source, target;
        Fill(source, bytes);
        DynamicString text("stale");
        source.GetStringifiedVersionOfData(text);
        EXPECT_EQ(text.GetNumBytes(), (size / 4) * 6 + (size % 4 ? size % 4 + 1 : 0));
        Fill(target, "previous contents", 5);
        target.SetDataFromStringifiedVersion(text);
        EXPECT_EQ(StateOf(target), (StreamState{0, bytes})) << size;
    }
    OVMemoryStream known;
    Fill(known, "abc");
    DynamicString text;
    known.GetStringifiedVersionOfData(text);
    EXPECT_EQ(text, "NL8Y");
    for (char const* bad : {"NL8Y#", "NL8Y.", "zz", "J3p2LV!"}) {
        EXPECT_RAISES_IN(known.SetDataFromStringifiedVersion(Text(bad)), TE_UNRECOGNIZED_VALUE,
                         "OVMemoryStream::SetDataFromStringifiedVersion");
        EXPECT_EQ(StateOf(known), (StreamState{0, "abc"})) << bad;
    }
}

TEST(MemoryStreamText, Utf8FormConvertsTheCodePageAndBack) {
    OVMemoryStream stream;
    Fill(stream, "old contents", 3);
    DynamicString const text("caf\xE9 ok");
    stream.SetData_AsUTF8(text);
    EXPECT_EQ(StateOf(stream), (StreamState{0, "caf\xC3\xA9 ok"}));
    DynamicString back;
    stream.GetData_AssumingDataIsUTF8(back);
    EXPECT_EQ(back, text);
    Fill(stream, "ab\0cd"s); // a NUL ends the text
    stream.GetData_AssumingDataIsUTF8(back);
    EXPECT_EQ(back, "ab");
}

// A stream with a table writes each text as its index: identical texts share one, the empty
// text has none (-1).
TEST(StringTable, GivesIdenticalTextsOneIndexAndTheEmptyTextNone) {
    OVStringTable table;
    OVMemoryStream stream(&table);
    char const* const texts[] = {"alpha", "beta", "alpha", "", "Alpha", "beta", "alpha "};
    for (char const* text : texts)
        stream.WriteString("", DynamicString(text));
    EXPECT_EQ(Bytes(stream), "\0\0\0\0\x01\0\0\0\0\0\0\0\xFF\xFF\xFF\xFF"
                             "\x02\0\0\0\x01\0\0\0\x03\0\0\0"s);
    EXPECT_EQ(table.GetNumStrings(), 4);
    EXPECT_EQ(table.GetIndexForString(DynamicString("")), -1);
    EXPECT_EQ(table.GetStringForIndex(2), "Alpha");
    EXPECT_TRUE(table.GetStringForIndex(-1).IsEmpty());
    stream.SetOffset(0);
    for (char const* text : texts) {
        DynamicString read("stale");
        stream.ReadString("", read);
        EXPECT_EQ(read, text);
    }
    stream.WriteInt("", 4); // no such index
    stream.SetOffset(28);
    DynamicString read("kept");
    EXPECT_RAISES_IN(stream.ReadString("", read), TE_BAD_FILE_FORMAT,
                     "OVStringTable::GetStringForIndex");
    EXPECT_EQ(stream.GetOffset(), 28u);
    EXPECT_EQ(read, "kept");
}

// More strings than buckets: every bucket holds several, and each keeps its own index.
TEST(StringTable, KeepsIndicesApartWhenBucketsFillUp) {
    OVStringTable table;
    int const count = 3 * static_cast<int>(OVStringTable::kBucketCount);
    for (int i = 0; i < count; ++i)
        ASSERT_EQ(table.GetIndexForString(DynamicString(std::to_string(i * 7919).c_str())), i);
    for (int i = count - 1; i >= 0; i -= 97) {
        std::string const text = std::to_string(i * 7919);
        EXPECT_EQ(table.GetIndexForString(DynamicString(text.c_str())), i);
        EXPECT_EQ(table.GetStringForIndex(i), text.c_str());
    }
    EXPECT_EQ(table.GetNumStrings(), count);
}

TEST(StringTable, StoresACountAndTerminatedStringsAtTheOffsetAndLoadsThemBack) {
    OVStringTable table;
    for (char const* text : {"a", "bc", "a", "def"})
        table.GetIndexForString(DynamicString(text));
    OVMemoryStream stream;
    Fill(stream, "head", 4);
    EXPECT_EQ(table.StoreToMemoryStream(stream), 4u);
    EXPECT_EQ(Bytes(stream), "head\x03\0\0\0a\0bc\0def\0"s);
    stream.WriteBool("", true); // what follows the table

    OVStringTable loaded;
    loaded.GetIndexForString(DynamicString("replaced"));
    stream.SetOffset(0);
    loaded.LoadFromMemoryStream(stream, 4);
    EXPECT_EQ(stream.GetOffset(), stream.GetSize() - 1);
    EXPECT_EQ(loaded.GetNumStrings(), 3);
    for (char const* text : {"a", "bc", "def"})
        EXPECT_EQ(loaded.GetIndexForString(DynamicString(text)),
                  table.GetIndexForString(DynamicString(text)));
    EXPECT_EQ(loaded.GetIndexForString(DynamicString("replaced")), 3);
}

// Stored tables come from files: malformed ones raise and change neither table nor stream.
TEST(StringTable, RefusesMalformedStoredTablesWithoutEffect) {
    char const* const kLoad = "OVStringTable::LoadFromMemoryStream";
    // clang-format off
    struct { char const* what; std::string bytes; unsigned long offset; char const* context; }
    const cases[] = {
        {"count beyond the data", "\xFF\xFF\xFF\x7F" "a\0"s, 0, kLoad},
        {"count just beyond the bytes", "\x03\0\0\0a\0"s, 0, kLoad},
        {"negative count", "\xFE\xFF\xFF\xFF"s, 0, kLoad},
        {"unterminated string", "\x01\0\0\0abc"s, 0, "OVMemoryStream::ReadStringRaw"},
        {"offset past the end", "\0\0\0\0"s, 5, kLoad},
    };
    // clang-format on
    for (auto const& c : cases) {
        SCOPED_TRACE(c.what);
        OVStringTable table;
        table.GetIndexForString(DynamicString("kept"));
        OVMemoryStream stream;
        Fill(stream, c.bytes, 1);
        EXPECT_RAISES_IN(table.LoadFromMemoryStream(stream, c.offset), TE_BAD_FILE_FORMAT,
                         c.context);
        EXPECT_EQ(StateOf(stream), (StreamState{1, c.bytes}));
        EXPECT_EQ(table.GetNumStrings(), 1);
        EXPECT_EQ(table.GetIndexForString(DynamicString("kept")), 0);
    }
}

} // namespace
