// The base stream's typed values: raw little-endian bytes through WriteBytes and ReadBytes.
#include "tekit/streams/OVStream.h"

#include "streams/LittleEndian.h"

#include <bit>

namespace tekit {

using streams::LoadLittleEndian;
using streams::StoreLittleEndian;

namespace {

template <class U> void WriteValue(OVStream& stream, U value) {
    unsigned char bytes[sizeof(U)];
    StoreLittleEndian(bytes, value);
    stream.WriteBytes(bytes, sizeof bytes);
}

template <class U> U ReadValue(OVStream& stream) {
    unsigned char bytes[sizeof(U)];
    stream.ReadBytes(bytes, sizeof bytes, TE_BAD_FILE_FORMAT);
    return LoadLittleEndian<U>(bytes);
}

} // namespace

OVStream::~OVStream() = default;

void OVStream::WriteInt(char const*, int value) {
    WriteValue(*this, static_cast<std::uint32_t>(value));
}

int OVStream::ReadInt(char const*) {
    return static_cast<int>(ReadValue<std::uint32_t>(*this));
}

void OVStream::WriteUInt(char const*, unsigned int value) {
    WriteValue(*this, static_cast<std::uint32_t>(value));
}

unsigned int OVStream::ReadUInt(char const*) {
    return ReadValue<std::uint32_t>(*this);
}

void OVStream::WriteDouble(char const*, double value) {
    WriteValue(*this, std::bit_cast<std::uint64_t>(value));
}

double OVStream::ReadDouble(char const*) {
    return std::bit_cast<double>(ReadValue<std::uint64_t>(*this));
}

void OVStream::WriteBool(char const*, bool value) {
    WriteValue(*this, static_cast<std::uint8_t>(value ? 1 : 0));
}

bool OVStream::ReadBool(char const*) {
    return ReadValue<std::uint8_t>(*this) != 0;
}

void OVStream::WriteInt64(char const*, std::int64_t value) {
    WriteValue(*this, static_cast<std::uint64_t>(value));
}

std::int64_t OVStream::ReadInt64(char const*) {
    return static_cast<std::int64_t>(ReadValue<std::uint64_t>(*this));
}

void OVStream::WriteUInt64(char const*, std::uint64_t value) {
    WriteValue(*this, value);
}

std::uint64_t OVStream::ReadUInt64(char const*) {
    return ReadValue<std::uint64_t>(*this);
}

} // namespace tekit
