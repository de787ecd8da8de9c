// The binary file stream: the open types, the encoding through the buffer, 64-bit offsets,
// sharing and its retries, failures of the system calls, moves and stream copies.
#include "tekit/streams/OVBinaryFileStream.h"

#include "streams/StreamTestSupport.h"
#include "support/FaultInjection.h"
#include "support/Raises.h"
#include "support/ScratchDirectory.h"
#include "tekit/errors/TEException.h"
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/toolbox/Timer.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <functional>
#include <memory>
#include <string>
#include <thread>

namespace {

using namespace tekit;
using namespace tekit::testing;
using namespace std::string_literals;
namespace fs = std::filesystem;

std::string ReadAll(OVBinaryFileStream& s) {
    std::string bytes(static_cast<std::size_t>(s.GetLargeSize()), '\0');
    s.SetOffset(0);
    s.ReadBytes(bytes.data(), static_cast<unsigned>(bytes.size()), TE_BAD_FILE_FORMAT);
    return bytes;
}

class BinaryFileStream : public ::testing::Test {
protected:
    ScratchDirectory scratch{"filestream"};
    std::string const file = (scratch.Root() / "data.bin").string();
    std::string Path(char const* name) const { return (scratch.Root() / name).string(); }
};

TEST_F(BinaryFileStream, OpensEachTypeAsTheTableSays) {
    struct Case {
        OVFileStreamOpenType type;
        std::uint64_t sizeAtOpen;
        std::string afterWritingXY; ///< "" when writing is refused
    } const cases[] = {
        {kOVFileStreamOpenForRead, 6, ""},
        {kOVFileStreamOpenForWrite, 6, "XYcdef"}, // kept, written from offset 0
        {kOVFileStreamOpenForReadWrite, 6, "XYcdef"},
        {kOVFileStreamCreateForWrite, 0, "XY"}, // emptied
        {kOVFileStreamCreateForReadWrite, 0, "XY"},
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(c.type);
        WriteFileBytes(file, "abcdef");
        {
            OVBinaryFileStream s(file.c_str(), c.type);
            EXPECT_EQ(s.GetLargeSize(), c.sizeAtOpen);
            EXPECT_EQ(s.GetOffset(), 0u);
            if (c.afterWritingXY.empty())
                EXPECT_RAISES_IN(s.WriteBytes("XY", 2), TE_ACCESS_DENIED,
                                 "OVBinaryFileStream::WriteBytes");
            else
                s.WriteBytes("XY", 2);
            char byte = 0;
            if (c.type == kOVFileStreamOpenForWrite || c.type == kOVFileStreamCreateForWrite) {
                EXPECT_RAISES(s.ReadBytes(&byte, 1, TE_NO_ERROR), TE_ACCESS_DENIED);
            }
        }
        EXPECT_EQ(ReadFileBytes(file), c.afterWritingXY.empty() ? "abcdef" : c.afterWritingXY);
    }
}

TEST_F(BinaryFileStream, ReopensAsANewTypeAndKeepsThePathWithoutAFile) {
    OVBinaryFileStream s(file.c_str(), kOVFileStreamCreateForWrite);
    s.WriteString("", DynamicString("saved"));
    s.SetStreamType(kOVFileStreamOpenForRead);
    DynamicString text;
    s.ReadString("", text);
    EXPECT_EQ(text, "saved");
    EXPECT_RAISES(s.SetStreamType(OVFileStreamOpenType(9)), TE_PROGRAM_ERROR);
    s.SetStreamType(kOVFileStreamNoFile);
    EXPECT_FALSE(s.IsOpen());
    EXPECT_EQ(s.GetFilePath(), file.c_str());
    EXPECT_RAISES(s.WriteBytes("x", 1), TE_IO_ERROR);
    EXPECT_RAISES(s.Flush(), TE_IO_ERROR);
    s.Move(DynamicString("elsewhere.bin")); // only the path changes
    EXPECT_EQ(s.GetFilePath(), "elsewhere.bin");
    EXPECT_EQ(ReadFileBytes(file), "saved"s + '\0');
}

TEST_F(BinaryFileStream, RefusesBadTypesAndReportsOpenFailuresWithThePath) {
    for (int bad : {-1, 6}) {
        EXPECT_RAISES_IN(OVBinaryFileStream(file.c_str(), OVFileStreamOpenType(bad)),
                         TE_PROGRAM_ERROR, "OVBinaryFileStream::OVBinaryFileStream");
        EXPECT_FALSE(fs::exists(file));
    }
    std::string const missing = Path("missing.bin");
    EXPECT_RAISES_IN(OVBinaryFileStream(missing.c_str(), kOVFileStreamOpenForReadWrite),
                     TE_FILE_NOT_FOUND, "OVBinaryFileStream::OpenWithNoRetry",
                     ("Unable to open file '" + missing + "'.").c_str());
    EXPECT_RAISES(OVBinaryFileStream(scratch.Root().string().c_str(), kOVFileStreamOpenForRead),
                  TE_ACCESS_DENIED); // a directory
    // Writing types make the missing directories of an absolute path.
    std::string const deep = (scratch.Root() / "a" / "b" / "new.bin").string();
    OVBinaryFileStream(deep.c_str(), kOVFileStreamCreateForWrite).WriteBytes("z", 1);
    EXPECT_EQ(ReadFileBytes(deep), "z");
}

TEST_F(BinaryFileStream, EncodesAsTheMemoryStreamAndReadsBackAcrossTheBuffer) {
    OVMemoryStream memory;
    OVBinaryFileStream s(file.c_str(), kOVFileStreamCreateForReadWrite);
    for (OVStream* out : {static_cast<OVStream*>(&memory), static_cast<OVStream*>(&s)}) {
        out->WriteInt("", -2);
        out->WriteUInt("", 0x01020304u);
        out->WriteInt64("", -0x0102030405060708LL);
        out->WriteUInt64("", 0xF1F2F3F4F5F6F7F8ULL);
        out->WriteDouble("", -1.5);
        out->WriteBool("", true);
        out->WriteString("", DynamicString("text"));
        out->WriteString("", DynamicString());
        for (int i = 0; i < 40000; ++i) // past the 64 KiB buffer more than once
            out->WriteInt("", i);
    }
    EXPECT_EQ(s.GetLargeSize(), memory.GetSize());
    EXPECT_TRUE(ReadAll(s) == Bytes(memory));
    s.SetOffset(24);
    EXPECT_EQ(s.ReadDouble(""), -1.5);
    EXPECT_TRUE(s.ReadBool(""));
    DynamicString text;
    s.ReadString("", text);
    EXPECT_EQ(text, "text");
    s.ReadString("", text);
    EXPECT_TRUE(text.IsEmpty());
    for (int i = 0; i < 40000; ++i)
        ASSERT_EQ(s.ReadInt(""), i);
    EXPECT_RAISES(s.ReadBool(""), TE_BAD_FILE_FORMAT);
    s.SetStreamType(kOVFileStreamNoFile); // others may read it now (Windows)
    EXPECT_TRUE(ReadFileBytes(file) == Bytes(memory));
}

TEST_F(BinaryFileStream, KeepsReadsWritesAndSizesCoherentWithTheBuffer) {
    OVBinaryFileStream s(file.c_str(), kOVFileStreamCreateForReadWrite);
    s.WriteBytes("0123456789", 10);
    s.SetOffset(2);
    s.WriteInt("", 0x41424344); // overwrites 2 to 5, size stays
    EXPECT_EQ(s.GetSize(), 10u);
    s.SetOffset(12);
    s.WriteBytes("!", 1); // the gap reads as zero bytes
    EXPECT_EQ(ReadAll(s), "01DCBA6789\0\0!"s);
    s.SetOffset(20);
    EXPECT_RAISES_IN(s.TruncateAtCurrentOffset(), TE_PROGRAM_ERROR,
                     "OVBinaryFileStream::TruncateAtCurrentOffset");
    s.SetOffset(4);
    s.TruncateAtCurrentOffset();
    EXPECT_EQ(s.GetSize(), 4u);
    s.SetOffset(1);
    DynamicString text;
    EXPECT_RAISES(s.ReadString("", text), TE_BAD_FILE_FORMAT); // no terminator
    EXPECT_EQ(s.GetOffset(), 1u);
    char bytes[8] = {};
    EXPECT_EQ(s.ReadBytes(bytes, 8, TE_NO_ERROR), 3u); // what is left
    s.SetStreamType(kOVFileStreamNoFile);
    EXPECT_EQ(ReadFileBytes(file), "01DC");
}

TEST_F(BinaryFileStream, AddressesOffsetsPastFourGigabytes) {
    std::uint64_t const distant = (5ULL << 30) + 3;
    OVBinaryFileStream s(file.c_str(), kOVFileStreamCreateForReadWrite);
    s.SetLargeOffset(distant);
    try {
        s.WriteUInt64("", 0x1122334455667788ULL);
        s.Flush();
    } catch (TEException const& e) {
        GTEST_SKIP() << "the file system holds no sparse 5 GiB file: " << e.GetDescription();
    }
    EXPECT_EQ(s.GetLargeSize(), distant + 8);
    EXPECT_RAISES(s.GetSize(), TE_UINT32_OVERFLOW);
    s.SetLargeOffset(distant);
    EXPECT_EQ(s.ReadUInt64(""), 0x1122334455667788ULL);
    EXPECT_EQ(s.GetLargeOffset(), distant + 8);
    s.SetOffset(16);
    s.TruncateAtCurrentOffset();
    EXPECT_EQ(fs::file_size(file), 16u);
}

// What Windows allows between two opens of these types; elsewhere the locks say the same.
TEST_F(BinaryFileStream, RefusesASecondOpenThatTheFirstDoesNotShare) {
    struct Case {
        OVFileStreamOpenType first, second;
        bool shared;
    } const cases[] = {
        {kOVFileStreamOpenForRead, kOVFileStreamOpenForRead, true},
        {kOVFileStreamOpenForRead, kOVFileStreamOpenForReadWrite, false},
        {kOVFileStreamOpenForReadWrite, kOVFileStreamOpenForRead, false},
        {kOVFileStreamOpenForRead, kOVFileStreamCreateForWrite, false},
        {kOVFileStreamOpenForWrite, kOVFileStreamOpenForRead, false},
        {kOVFileStreamCreateForReadWrite, kOVFileStreamCreateForWrite, false},
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(std::to_string(c.first) + " then " + std::to_string(c.second));
        WriteFileBytes(file, "held");
        OVBinaryFileStream first(file.c_str(), c.first);
        std::string const held = ReadFileBytes(file);
        if (c.shared)
            OVBinaryFileStream second(file.c_str(), c.second);
        else
            EXPECT_RAISES_IN(OVBinaryFileStream(file.c_str(), c.second), TE_SHARING_VIOLATION,
                             "OVBinaryFileStream::OpenWithNoRetry");
        EXPECT_EQ(ReadFileBytes(file), held); // a refused creation empties nothing
    }
}

TEST_F(BinaryFileStream, RetriesBusyFilesWithinTheRetryTimeOnly) {
    auto holder = std::make_unique<OVBinaryFileStream>(file.c_str(), kOVFileStreamCreateForWrite);
    holder->WriteBytes("first", 5);
    std::thread closer([&] {
        Delay(0.2);
        holder.reset();
    });
    double const start = Timer();
    OVBinaryFileStream second(file.c_str(), kOVFileStreamOpenForRead, false, 2.0);
    double const waited = Timer() - start;
    closer.join();
    EXPECT_GE(waited, 0.15);
    EXPECT_LT(waited, 1.5);
    EXPECT_EQ(ReadAll(second), "first");

    double const busyStart = Timer(); // held for longer than the retry time
    EXPECT_RAISES(OVBinaryFileStream(file.c_str(), kOVFileStreamOpenForWrite, false, 0.3),
                  TE_SHARING_VIOLATION);
    EXPECT_GE(Timer() - busyStart, 0.3);
    double const missingStart = Timer(); // not a sharing or access failure: no retry
    EXPECT_RAISES(OVBinaryFileStream(Path("none.bin").c_str(), kOVFileStreamOpenForRead, false, 5),
                  TE_FILE_NOT_FOUND);
    EXPECT_LT(Timer() - missingStart, 0.5);
}

TEST_F(BinaryFileStream, RaisesFailedSystemCallsAndLeavesTheStreamUsable) {
    using Op = std::function<void(OVBinaryFileStream&)>;
    std::string const big(OVBinaryFileStream::kWriteBufferSize, 'b');
    struct Case {
        FaultKind kind;
        Op op;
        char const* function;
        std::uint32_t size;     ///< the stream's size after the failure
        std::string afterRetry; ///< the file once the same call succeeds
    } const cases[] = {
        // clang-format off
        {FaultKind::Write, [&](auto& s) { s.WriteBytes(big.data(), unsigned(big.size())); },
         "OVBinaryFileStream::WriteBytes", 4, "abcd" + big},
        {FaultKind::Write, [](auto& s) { s.WriteInt("", 0x31313131); s.Flush(); },
         "OVBinaryFileStream::Flush", 8, "abcd1111"}, // still buffered
        {FaultKind::Flush, [](auto& s) { s.Flush(); }, "OVBinaryFileStream::Flush", 4, "abcd"},
        {FaultKind::Write, [](auto& s) { s.SetOffset(1); s.TruncateAtCurrentOffset(); },
         "OVBinaryFileStream::TruncateAtCurrentOffset", 4, "a"},
        {FaultKind::Read, [](auto& s) { s.SetOffset(0); s.ReadInt(""); },
         "OVBinaryFileStream::ReadBytes", 4, "abcd"},
        {FaultKind::Rename, [&](auto& s) { s.Move(DynamicString(Path("moved.bin").c_str())); },
         "OVBinaryFileStream::Move", 4, "abcd"},
        // clang-format on
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(c.function);
        WriteFileBytes(file, "abcd");
        fs::remove(Path("moved.bin"));
        OVBinaryFileStream s(file.c_str(), kOVFileStreamOpenForReadWrite);
        s.SetOffset(4);
        {
            ScopedFault const fault(c.kind, 1, native::kDiskFull);
            EXPECT_RAISES_IN(c.op(s), TE_DISK_FULL, c.function);
        }
        EXPECT_EQ(ReadFileBytes(file), "abcd");
        EXPECT_EQ(s.GetSize(), c.size);
        s.SetOffset(4);
        c.op(s); // works now; bytes kept buffered are written once
        s.Flush();
        EXPECT_EQ(ReadFileBytes(fs::exists(Path("moved.bin")) ? Path("moved.bin") : file),
                  c.afterRetry);
    }
    ScopedFault const open(FaultKind::Open, 1, native::kAccessDenied);
    EXPECT_RAISES_IN(OVBinaryFileStream(file.c_str(), kOVFileStreamCreateForWrite),
                     TE_ACCESS_DENIED, "OVBinaryFileStream::OpenWithNoRetry");
    ScopedFault const directory(FaultKind::DirectoryCreate, 1, native::kAccessDenied);
    std::string const deep = (scratch.Root() / "sub" / "x.bin").string();
    EXPECT_RAISES(OVBinaryFileStream(deep.c_str(), kOVFileStreamCreateForWrite), TE_ACCESS_DENIED);
    EXPECT_FALSE(fs::exists(scratch.Root() / "sub"));
    auto s = std::make_unique<OVBinaryFileStream>(file.c_str(), kOVFileStreamCreateForWrite);
    s->WriteInt("", 1);
    ScopedFault const full(FaultKind::Write, 1, native::kDiskFull, true);
    EXPECT_NO_THROW(s.reset()); // the destructor's failed write is lost, never thrown
}

TEST_F(BinaryFileStream, MovesTheOpenFileAndReplacesOnlyWhenForced) {
    std::string const target = Path("target.bin"), other = Path("other.bin");
    WriteFileBytes(other, "other");
    OVBinaryFileStream s(file.c_str(), kOVFileStreamCreateForReadWrite);
    s.WriteBytes("abc", 3);
    s.Move(DynamicString(target.c_str()));
    EXPECT_FALSE(fs::exists(file));
    EXPECT_EQ(s.GetFilePath(), target.c_str());
    EXPECT_EQ(s.GetOffset(), 3u);
    s.WriteBytes("d", 1);
    EXPECT_RAISES_IN(s.Move(DynamicString(other.c_str())), TE_FILE_ALREADY_EXISTS,
                     "OVBinaryFileStream::Move");
    EXPECT_EQ(ReadFileBytes(other), "other");
    EXPECT_EQ(s.GetFilePath(), target.c_str());
    s.ForceMove(DynamicString(other.c_str()));
    s.WriteBytes("e", 1);
    EXPECT_EQ(ReadAll(s), "abcde");
    s.SetStreamType(kOVFileStreamNoFile);
    EXPECT_FALSE(fs::exists(target));
    EXPECT_EQ(ReadFileBytes(other), "abcde");
}

TEST_F(BinaryFileStream, CopiesFromMemoryAndFileStreamsOnly) {
    OVMemoryStream memory;
    memory.WriteBytes("0123456789", 10);
    OVBinaryFileStream source(Path("source.bin").c_str(), kOVFileStreamCreateForReadWrite);
    source.WriteBytes("ABCDEF", 6); // still buffered: the copy sees it
    source.SetOffset(1);
    OVBinaryFileStream s(file.c_str(), kOVFileStreamCreateForReadWrite);
    s.WriteStream(memory, 7, OVStream::kToEnd);
    s.WriteStream(source, 2, 3);
    EXPECT_EQ(source.GetOffset(), 1u);
    ByteStream foreign;
    EXPECT_RAISES_IN(s.WriteStream(foreign, 0, 1), TE_NOT_SUPPORTED,
                     "OVBinaryFileStream::WriteStream",
                     "Stream type not support by OVBinaryFileStream::WriteStream.");
    EXPECT_RAISES(s.WriteStream(s, 0, 1), TE_NOT_SUPPORTED);
    EXPECT_RAISES_IN(s.WriteStream(memory, 11, 1), TE_INVALID_OR_OUT_OF_RANGE,
                     "OVBinaryFileStream::WriteStream",
                     "invalid starting offset in OVBinaryFileStream::WriteStream");
    EXPECT_EQ(ReadAll(s), "789CDE");
}

} // namespace
