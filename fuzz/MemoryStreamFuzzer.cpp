// Fuzzes the memory stream's reads over arbitrary contents: the input is a program of
// operations followed by the bytes the stream holds.
//
//   byte 0          n, the number of operation bytes (n % 64)
//   bytes 1..n      operations: the low 4 bits pick the operation, the high 4 an argument
//   the rest        the stream's contents
//
// Every operation either succeeds with the documented effect or raises TEException and leaves
// offset, size and contents exactly as they were.
#include "tekit/errors/TEException.h"
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/streams/OVStringTable.h"
#include "tekit/strings/DynamicString.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>

namespace {

using namespace tekit;

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// Reaches the raw string reads.
class FuzzStream : public OVMemoryStream {
public:
    using OVMemoryStream::OVMemoryStream;
    using OVMemoryStream::ReadStringRaw;
};

std::string Contents(OVMemoryStream const& stream) {
    return std::string(reinterpret_cast<char const*>(stream.GetDataPtr()), stream.GetSize());
}

/// An offset chosen by `argument`: near the start, near the end, or past it.
unsigned OffsetFor(OVMemoryStream const& stream, unsigned argument) {
    unsigned const size = stream.GetSize();
    switch (argument % 4) {
    case 0:
        return argument / 4;
    case 1:
        return size > argument / 4 ? size - argument / 4 : 0;
    case 2:
        return size + argument / 4;
    default:
        return 0xFFFFFFF0u + argument / 4;
    }
}

void Run(FuzzStream& stream, OVStringTable& table, FuzzStream& indexed, unsigned op,
         unsigned argument) {
    DynamicString text;
    unsigned const before = stream.GetOffset();
    switch (op) {
    case 0:
        stream.ReadInt("");
        Check(stream.GetOffset() == before + 4);
        break;
    case 1:
        stream.ReadUInt64("");
        Check(stream.GetOffset() == before + 8);
        break;
    case 2:
        stream.ReadDouble("");
        break;
    case 3:
        stream.ReadBool("");
        Check(stream.GetOffset() == before + 1);
        break;
    case 4:
        stream.ReadString("", text);
        Check(stream.GetOffset() == before + static_cast<unsigned>(text.GetNumBytes()) + 1);
        break;
    case 5: {
        char buffer[16];
        unsigned const n = stream.ReadBytes(buffer, argument, TEError(argument & 1 ? -17100 : 0));
        Check(n <= argument && stream.GetOffset() == before + n);
        break;
    }
    case 6:
        stream.SetOffset(OffsetFor(stream, argument));
        break;
    case 7:
        table.LoadFromMemoryStream(stream, OffsetFor(stream, argument));
        break;
    case 8:
        indexed.SetOffset(OffsetFor(indexed, argument));
        indexed.ReadString("", text);
        break;
    case 9:
        stream.ReadStringRaw(text);
        break;
    case 10: {
        unsigned const size = stream.GetSize();
        stream.DeleteBytesAtCurrentOffset(argument);
        Check(stream.GetSize() == size - argument && stream.GetOffset() == before);
        break;
    }
    case 11:
        stream.TruncateAtCurrentOffset();
        Check(stream.GetSize() == before);
        break;
    case 12: {
        OVMemoryStream copy(stream);
        Check(copy.IsEqualTo(stream));
        // A write far past the end would allocate up to 4 GiB, as asked: not this target's
        // subject.
        if (stream.GetOffset() <= stream.GetSize() + 4096)
            stream.WriteStream(copy, OffsetFor(copy, argument), argument);
        break;
    }
    case 13: {
        DynamicString contents(Contents(stream).c_str());
        stream.SetDataFromStringifiedVersion(contents);
        break;
    }
    case 14: {
        stream.GetStringifiedVersionOfData(text);
        OVMemoryStream back;
        back.SetDataFromStringifiedVersion(text);
        Check(back.IsEqualTo(stream));
        stream.GetData_AssumingDataIsUTF8(text);
        break;
    }
    default:
        stream.ReadInt64("");
        break;
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size == 0)
        return 0;
    std::size_t const ops = std::min<std::size_t>(data[0] % 64, size - 1);
    std::uint8_t const* program = data + 1;
    FuzzStream stream;
    stream.WriteBytes(program + ops, static_cast<unsigned>(size - 1 - ops));
    stream.SetOffset(0);
    OVStringTable table;
    FuzzStream indexed(&table);
    indexed.WriteBytes(program + ops, static_cast<unsigned>(size - 1 - ops));

    for (std::size_t i = 0; i < ops; ++i) {
        unsigned const op = program[i] & 0x0F, argument = program[i] >> 4;
        unsigned const offset = stream.GetOffset();
        std::string const contents = Contents(stream);
        int const strings = table.GetNumStrings();
        try {
            Run(stream, table, indexed, op, argument);
        } catch (TEException const&) {
            Check(stream.GetOffset() == offset && Contents(stream) == contents);
            Check(table.GetNumStrings() == strings);
        }
    }
    return 0;
}
