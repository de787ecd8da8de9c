// Helpers of the stream tests: a memory stream that shows its capacity and protected
// members, and a snapshot of a stream's state.
#pragma once

#include "tekit/errors/Raise.h"
#include "tekit/streams/OVMemoryStream.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string>
#include <utility>

namespace tekit::testing {

/// A memory stream that exposes what tests must see.
class ProbeStream : public OVMemoryStream {
public:
    using OVMemoryStream::OVMemoryStream;
    using OVMemoryStream::PrepareStreamForWrite;
    using OVMemoryStream::ReadStringRaw;
    using OVMemoryStream::WriteStringRaw;
    std::uint32_t Capacity() const { return m_capacity; }
};

/// A stream of another kind that implements only the raw slots, so its typed values are the
/// base's; ReadBytes raises the error it is given when the bytes run short.
class ByteStream : public OVStream {
public:
    std::string bytes;
    std::uint32_t offset = 0;

    std::uint32_t GetOffset() const override { return offset; }
    std::uint64_t GetLargeOffset() const override { return offset; }
    void SetOffset(unsigned value) override { offset = value; }
    void TruncateAtCurrentOffset() override { bytes.resize(offset); }
    void WriteBytes(void const* data, unsigned count) override {
        bytes.resize(std::max<std::size_t>(bytes.size(), offset + count));
        std::memcpy(bytes.data() + offset, data, count);
        offset += count;
    }
    unsigned ReadBytes(void* data, unsigned count, TEError errorIfShort) override {
        if (offset + count > bytes.size())
            TE_RAISE(errorIfShort, "", "ByteStream::ReadBytes");
        std::memcpy(data, bytes.data() + offset, count);
        offset += count;
        return count;
    }
    void WriteString(char const*, String const&, bool, bool) override {}
    void ReadString(char const*, DynamicString&) override {}
    void WriteStream(OVStream const&, unsigned long, unsigned long) override {}
    std::uint32_t GetSize() const override { return static_cast<std::uint32_t>(bytes.size()); }
    std::uint64_t GetLargeSize() const override { return bytes.size(); }
};

/// The valid bytes of `stream`.
inline std::string Bytes(OVMemoryStream const& stream) {
    return std::string(reinterpret_cast<char const*>(stream.GetDataPtr()), stream.GetSize());
}

/// A stream holding `bytes`, at `offset`.
inline void Fill(OVMemoryStream& stream, std::string const& bytes, unsigned offset = 0) {
    stream.SetOffset(0);
    stream.WriteBytes(bytes.data(), static_cast<unsigned>(bytes.size()));
    stream.TruncateAtCurrentOffset();
    stream.SetOffset(offset);
}

/// What a failed operation must leave as it was: the offset and the valid bytes.
using StreamState = std::pair<std::uint32_t, std::string>;

inline StreamState StateOf(OVMemoryStream const& stream) {
    return {stream.GetOffset(), Bytes(stream)};
}

} // namespace tekit::testing
