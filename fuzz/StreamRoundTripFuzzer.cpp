// Fuzzes the memory stream's write and read paths with random values: the input chooses a
// sequence of typed values, which are written to a stream (with or without a string table),
// read back in order and compared; the stream also survives its stringified form and a copy.
//
//   byte 0        bit 0: strings through a string table
//   the rest      values: a kind byte (low 3 bits) followed by the value's bytes
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/streams/OVStringTable.h"
#include "tekit/strings/DynamicString.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

namespace {

using namespace tekit;

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

struct Value {
    unsigned kind = 0;
    std::uint64_t bits = 0;
    std::string text;
};

/// Takes `n` bytes of the input (fewer at its end) as a little-endian number.
std::uint64_t Take(std::uint8_t const*& p, std::uint8_t const* end, unsigned n) {
    std::uint64_t value = 0;
    for (unsigned i = 0; i < n && p < end; ++i, ++p)
        value |= std::uint64_t(*p) << (8 * i);
    return value;
}

std::vector<Value> Parse(std::uint8_t const* p, std::uint8_t const* end) {
    std::vector<Value> values;
    while (p < end) {
        Value value;
        value.kind = static_cast<unsigned>(*p++ & 7);
        switch (value.kind) {
        case 0:
        case 1:
            value.bits = Take(p, end, 4);
            break; // int, uint
        case 2:
        case 3:
        case 4:
            value.bits = Take(p, end, 8);
            break; // int64, uint64, double
        case 5:
            value.bits = Take(p, end, 1);
            break; // bool
        default: { // string, bytes
            std::size_t const length = p < end ? *p++ % 40 : 0;
            while (value.text.size() < length && p < end) {
                char const c = static_cast<char>(*p++);
                if (value.kind == 6 && c == 0)
                    break; // strings hold no NUL
                value.text += c;
            }
        }
        }
        values.push_back(value);
    }
    return values;
}

void Write(OVMemoryStream& stream, Value const& v) {
    switch (v.kind) {
    case 0:
        stream.WriteInt("v", static_cast<int>(v.bits));
        break;
    case 1:
        stream.WriteUInt("v", static_cast<unsigned>(v.bits));
        break;
    case 2:
        stream.WriteInt64("v", static_cast<std::int64_t>(v.bits));
        break;
    case 3:
        stream.WriteUInt64("v", v.bits);
        break;
    case 4: {
        double d;
        std::memcpy(&d, &v.bits, 8);
        stream.WriteDouble("v", d);
        break;
    }
    case 5:
        stream.WriteBool("v", (v.bits & 1) != 0);
        break;
    case 6:
        stream.WriteString("v", DynamicString(v.text.c_str()));
        break;
    default:
        stream.WriteBytes(v.text.data(), static_cast<unsigned>(v.text.size()));
        break;
    }
}

void ReadAndCompare(OVMemoryStream& stream, Value const& v) {
    switch (v.kind) {
    case 0:
        Check(stream.ReadInt("v") == static_cast<int>(v.bits));
        break;
    case 1:
        Check(stream.ReadUInt("v") == static_cast<unsigned>(v.bits));
        break;
    case 2:
        Check(stream.ReadInt64("v") == static_cast<std::int64_t>(v.bits));
        break;
    case 3:
        Check(stream.ReadUInt64("v") == v.bits);
        break;
    case 4: {
        double const d = stream.ReadDouble("v");
        Check(std::memcmp(&d, &v.bits, 8) == 0);
        break;
    }
    case 5:
        Check(stream.ReadBool("v") == ((v.bits & 1) != 0));
        break;
    case 6: {
        DynamicString text("stale");
        stream.ReadString("v", text);
        Check(v.text == text.GetBufferReadPtr());
        break;
    }
    default: {
        std::string bytes(v.text.size(), '\0');
        Check(stream.ReadBytes(bytes.data(), static_cast<unsigned>(bytes.size()), TEError(0)) ==
              bytes.size());
        Check(bytes == v.text);
    }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size == 0)
        return 0;
    bool const withTable = (data[0] & 1) != 0;
    std::vector<Value> const values = Parse(data + 1, data + size);

    OVStringTable table;
    OVMemoryStream stream(withTable ? &table : nullptr);
    for (Value const& v : values)
        Write(stream, v);
    Check(stream.GetOffset() == stream.GetSize());

    // The same bytes through a copy and through the stringified form.
    OVMemoryStream copy(stream);
    DynamicString text;
    stream.GetStringifiedVersionOfData(text);
    OVMemoryStream restored(withTable ? &table : nullptr);
    restored.SetDataFromStringifiedVersion(text);
    Check(copy.IsEqualTo(stream) && restored.IsEqualTo(stream));

    for (OVMemoryStream* s : {&stream, &restored}) {
        s->SetOffset(0);
        for (Value const& v : values)
            ReadAndCompare(*s, v);
        Check(s->GetOffset() == s->GetSize());
    }
    return 0;
}
