// The memory stream: a malloc'ed buffer that doubles when it grows, with values laid down as
// raw little-endian bytes.
#include "tekit/streams/OVMemoryStream.h"

#include "platform/Heap.h"
#include "streams/LittleEndian.h"
#include "tekit/errors/Raise.h"
#include "tekit/streams/OVStringTable.h"
#include "tekit/strings/DynamicString.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <cstring>
#include <limits>

namespace tekit {

using streams::LoadLittleEndian;
using streams::StoreLittleEndian;

namespace {

constexpr std::uint64_t kMaxSize = std::numeric_limits<std::uint32_t>::max();

/// A new block of `capacity` bytes holding a copy of the `size` bytes at `data`.
unsigned char* NewBlock(std::uint32_t capacity, void const* data, std::uint32_t size,
                        char const* function) {
    auto* block = static_cast<unsigned char*>(platform::HeapAllocate(capacity));
    if (!block)
        TE_RAISE(TE_OUT_OF_MEMORY, "", function);
    if (size)
        std::memcpy(block, data, size);
    return block;
}

} // namespace

OVMemoryStream::OVMemoryStream(OVStringTable* stringTable) : m_stringTable(stringTable) {
    m_buffer = NewBlock(kInitialCapacity, nullptr, 0, "OVMemoryStream::OVMemoryStream");
    m_capacity = kInitialCapacity;
}

OVMemoryStream::OVMemoryStream(OVMemoryStream const& other)
    : OVStream(other), m_offset(other.m_offset), m_size(other.m_size),
      m_stringTable(other.m_stringTable) {
    std::uint32_t const capacity = std::max(other.m_size, kInitialCapacity);
    m_buffer = NewBlock(capacity, other.m_buffer, other.m_size, "OVMemoryStream::OVMemoryStream");
    m_capacity = capacity;
}

OVMemoryStream& OVMemoryStream::operator=(OVMemoryStream const& other) {
    if (this == &other)
        return *this;
    if (other.m_size > m_capacity) {
        // A new block first, so a failed allocation leaves this stream as it was.
        unsigned char* block =
            NewBlock(other.m_size, other.m_buffer, other.m_size, "OVMemoryStream::operator=");
        platform::HeapFree(m_buffer);
        m_buffer = block;
        m_capacity = other.m_size;
    } else if (other.m_size) {
        std::memcpy(m_buffer, other.m_buffer, other.m_size);
    }
    m_size = other.m_size;
    m_offset = other.m_offset;
    m_stringTable = other.m_stringTable;
    return *this;
}

OVMemoryStream::~OVMemoryStream() {
    platform::HeapFree(m_buffer);
}

// ---- Growth. -----------------------------------------------------------------------------

void OVMemoryStream::GrowBuffer(std::uint64_t needed) {
    std::uint64_t const doubled = std::min<std::uint64_t>(2 * std::uint64_t(m_capacity), kMaxSize);
    std::uint64_t capacity = std::max(doubled, needed);
    void* block = platform::HeapReallocate(m_buffer, static_cast<std::size_t>(capacity));
    if (!block && capacity > needed) {
        // Doubling asked for more than the write needs; the exact size may still be there.
        capacity = needed;
        block = platform::HeapReallocate(m_buffer, static_cast<std::size_t>(capacity));
    }
    if (!block)
        TE_RAISE(TE_OUT_OF_MEMORY, "", "OVMemoryStream::PrepareStreamForWrite");
    m_buffer = static_cast<unsigned char*>(block);
    m_capacity = static_cast<std::uint32_t>(capacity);
}

void OVMemoryStream::PrepareStreamForWrite(unsigned int count, bool extendSize) {
    std::uint64_t const needed = std::uint64_t(m_offset) + count;
    if (needed > kMaxSize)
        Throw32BitOverflowException("OVMemoryStream::PrepareStreamForWrite", TE_FILE_BASE_NAME,
                                    __LINE__, false);
    if (needed > m_capacity)
        GrowBuffer(needed);
    if (extendSize && needed > m_size) {
        if (m_offset > m_size) // never expose what the buffer held before
            std::memset(m_buffer + m_size, 0, m_offset - m_size);
        m_size = static_cast<std::uint32_t>(needed);
    }
}

// ---- Fixed-size values: one bounds check on the common path. -----------------------------

template <class U> void OVMemoryStream::WriteFixed(U value) {
    std::uint32_t const offset = m_offset;
    if (offset <= m_size && m_capacity - offset >= sizeof(U)) [[likely]] {
        StoreLittleEndian(m_buffer + offset, value);
        m_offset = offset + sizeof(U);
        if (m_offset > m_size)
            m_size = m_offset;
        return;
    }
    PrepareStreamForWrite(sizeof(U), true);
    StoreLittleEndian(m_buffer + offset, value);
    m_offset = offset + sizeof(U);
}

template <class U> U OVMemoryStream::ReadFixed(char const* function) {
    if (std::uint64_t(m_offset) + sizeof(U) > m_size) [[unlikely]]
        TE_RAISE(TE_BAD_FILE_FORMAT, "", function);
    U const value = LoadLittleEndian<U>(m_buffer + m_offset);
    m_offset += sizeof(U);
    return value;
}

void OVMemoryStream::WriteInt(char const*, int value) {
    WriteFixed(static_cast<std::uint32_t>(value));
}

int OVMemoryStream::ReadInt(char const*) {
    return static_cast<int>(ReadFixed<std::uint32_t>("OVMemoryStream::ReadInt"));
}

void OVMemoryStream::WriteUInt(char const*, unsigned int value) {
    WriteFixed(static_cast<std::uint32_t>(value));
}

unsigned int OVMemoryStream::ReadUInt(char const*) {
    return ReadFixed<std::uint32_t>("OVMemoryStream::ReadUInt");
}

void OVMemoryStream::WriteDouble(char const*, double value) {
    WriteFixed(std::bit_cast<std::uint64_t>(value));
}

double OVMemoryStream::ReadDouble(char const*) {
    return std::bit_cast<double>(ReadFixed<std::uint64_t>("OVMemoryStream::ReadDouble"));
}

void OVMemoryStream::WriteBool(char const*, bool value) {
    WriteFixed(static_cast<std::uint8_t>(value ? 1 : 0));
}

bool OVMemoryStream::ReadBool(char const*) {
    return ReadFixed<std::uint8_t>("OVMemoryStream::ReadBool") != 0;
}

void OVMemoryStream::WriteInt64(char const*, std::int64_t value) {
    WriteFixed(static_cast<std::uint64_t>(value));
}

std::int64_t OVMemoryStream::ReadInt64(char const*) {
    return static_cast<std::int64_t>(ReadFixed<std::uint64_t>("OVMemoryStream::ReadInt64"));
}

void OVMemoryStream::WriteUInt64(char const*, std::uint64_t value) {
    WriteFixed(value);
}

std::uint64_t OVMemoryStream::ReadUInt64(char const*) {
    return ReadFixed<std::uint64_t>("OVMemoryStream::ReadUInt64");
}

// ---- Bytes. --------------------------------------------------------------------------------

void OVMemoryStream::WriteBytes(void const* data, unsigned int count) {
    if (!count) {
        PrepareStreamForWrite(0, true);
        return;
    }
    auto const* bytes = static_cast<unsigned char const*>(data);
    std::uintptr_t const from =
        reinterpret_cast<std::uintptr_t>(bytes) - reinterpret_cast<std::uintptr_t>(m_buffer);
    if (from < m_size) [[unlikely]] {
        // Bytes of this stream's own buffer (GetDataPtr), which growing may move.
        PrepareStreamForWrite(count, true);
        std::memmove(m_buffer + m_offset, m_buffer + from, count);
    } else {
        PrepareStreamForWrite(count, true);
        std::memcpy(m_buffer + m_offset, bytes, count);
    }
    m_offset += count;
}

unsigned int OVMemoryStream::ReadBytes(void* data, unsigned int count, TEError errorIfShort) {
    std::uint32_t const left = m_offset < m_size ? m_size - m_offset : 0;
    if (count > left) {
        if (errorIfShort != 0)
            TE_RAISE(errorIfShort, "", "OVMemoryStream::ReadBytes");
        count = left;
    }
    if (count)
        std::memcpy(data, m_buffer + m_offset, count);
    m_offset += count;
    return count;
}

void OVMemoryStream::WriteStream(OVStream const& source, unsigned long offset,
                                 unsigned long count) {
    auto const* memory = dynamic_cast<OVMemoryStream const*>(&source);
    if (!memory)
        TE_RAISE(TE_NOT_SUPPORTED, "Stream type not support by OVMemoryStream::WriteStream.",
                 "OVMemoryStream::WriteStream");
    if (offset > memory->m_size)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 "invalid starting offset in OVMemoryStream::WriteStream",
                 "OVMemoryStream::WriteStream");
    auto const n =
        static_cast<std::uint32_t>(std::min<unsigned long>(count, memory->m_size - offset));
    PrepareStreamForWrite(n, true);
    // After the growth: the source may be this stream, whose buffer may have moved.
    if (n)
        std::memmove(m_buffer + m_offset, memory->m_buffer + offset, n);
    m_offset += n;
}

void OVMemoryStream::TruncateAtCurrentOffset() {
    if (m_offset > m_size)
        TE_RAISE_ASSERTION(
            "Current offset past end of stream in OVMemoryStream::TruncateAtCurrentOffset",
            "OVMemoryStream::TruncateAtCurrentOffset");
    m_size = m_offset;
}

void OVMemoryStream::DeleteBytesAtCurrentOffset(unsigned long count) {
    if (m_offset > m_size || count > m_size - m_offset)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, "", "OVMemoryStream::DeleteBytesAtCurrentOffset");
    auto const n = static_cast<std::uint32_t>(count);
    std::memmove(m_buffer + m_offset, m_buffer + m_offset + n, m_size - m_offset - n);
    m_size -= n;
}

bool OVMemoryStream::IsEqualTo(OVMemoryStream& other) {
    if (this == &other)
        return true;
    if (m_size != other.m_size)
        return false;
    return m_size == 0 || std::memcmp(m_buffer, other.m_buffer, m_size) == 0;
}

// ---- Strings. ------------------------------------------------------------------------------

void OVMemoryStream::WriteStringRaw(char const* value, bool includeTerminator) {
    if (!value)
        value = "";
    std::size_t const length = std::strlen(value);
    std::uint64_t const count = std::uint64_t(length) + (includeTerminator ? 1 : 0);
    if (count > kMaxSize)
        Throw32BitOverflowException("OVMemoryStream::WriteStringRaw", TE_FILE_BASE_NAME, __LINE__,
                                    false);
    PrepareStreamForWrite(static_cast<std::uint32_t>(count), true);
    std::memcpy(m_buffer + m_offset, value, length);
    if (includeTerminator)
        m_buffer[m_offset + length] = 0;
    m_offset += static_cast<std::uint32_t>(count);
}

void OVMemoryStream::WriteStringRaw(String const& value, bool includeTerminator) {
    // GetNumBytes measures and caches the length when it is not known yet.
    auto const length = static_cast<std::uint32_t>(value.GetNumBytes());
    std::uint32_t const count = length + (includeTerminator ? 1 : 0);
    PrepareStreamForWrite(count, true);
    std::memcpy(m_buffer + m_offset, value.GetBufferReadPtr(), length);
    if (includeTerminator)
        m_buffer[m_offset + length] = 0;
    m_offset += count;
}

/// The first NUL of the `count` bytes at `p`, or null. Strings are mostly short: eight bytes
/// at a time in a register beat a call to memchr for them.
inline unsigned char const* FindTerminator(unsigned char const* p, std::uint32_t count) {
    constexpr std::uint64_t kOnes = 0x0101010101010101ULL, kHighs = 0x8080808080808080ULL;
    std::uint32_t i = 0;
    for (; count - i >= 8; i += 8) {
        // Loaded little-endian, so the first byte is the lowest: the lowest set high bit marks
        // the first zero byte (a borrow may set false ones above it, never below).
        std::uint64_t const word = LoadLittleEndian<std::uint64_t>(p + i);
        std::uint64_t const zeros = (word - kOnes) & ~word & kHighs;
        if (zeros)
            return p + i + std::countr_zero(zeros) / 8;
    }
    for (; i < count; ++i)
        if (p[i] == 0)
            return p + i;
    return nullptr;
}

void OVMemoryStream::ReadStringRaw(DynamicString& value) {
    unsigned char const* nul =
        m_offset < m_size ? FindTerminator(m_buffer + m_offset, m_size - m_offset) : nullptr;
    if (!nul)
        TE_RAISE(TE_BAD_FILE_FORMAT, "", "OVMemoryStream::ReadStringRaw");
    char const* text = reinterpret_cast<char const*>(m_buffer + m_offset);
    auto const length = static_cast<std::uint32_t>(nul - m_buffer - m_offset);
    if (length > static_cast<std::uint32_t>(std::numeric_limits<int>::max()) - 16)
        Throw32BitOverflowException("OVMemoryStream::ReadStringRaw", TE_FILE_BASE_NAME, __LINE__,
                                    true);
    value = text; // the dynamic string's own fast path: one copy into its own block
    m_offset += length + 1;
}

void OVMemoryStream::WriteString(char const* name, String const& value, bool, bool) {
    if (!m_stringTable) {
        WriteStringRaw(value, true);
        return;
    }
    // Room first: a failed write must not leave a new string in the table for nothing.
    PrepareStreamForWrite(4, false);
    WriteInt(name, m_stringTable->GetIndexForString(value));
}

void OVMemoryStream::ReadString(char const* name, DynamicString& value) {
    if (!m_stringTable) {
        ReadStringRaw(value);
        return;
    }
    std::uint32_t const start = m_offset;
    int const index = ReadInt(name);
    try {
        value = m_stringTable->GetStringForIndex(index);
    } catch (...) {
        m_offset = start;
        throw;
    }
}

} // namespace tekit
