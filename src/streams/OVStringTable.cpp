// The string table: a vector by index and, for lookup, 10 009 hash buckets, each an ordered
// map from string to index.
#include "tekit/streams/OVStringTable.h"

#include "streams/LittleEndian.h"
#include "tekit/errors/Raise.h"
#include "tekit/streams/OVMemoryStream.h"

#include <cstdint>
#include <limits>
#include <map>
#include <utility>

namespace tekit {

namespace {

/// Orders by String::Compare; transparent, so a lookup needs no copy of the text.
struct StringLess {
    using is_transparent = void;
    bool operator()(String const& a, String const& b) const { return a.Compare(b) < 0; }
};

} // namespace

struct OVStringTable::Bucket {
    std::map<DynamicString, int, StringLess> indices;
};

OVStringTable::OVStringTable() : m_buckets(kBucketCount) {}

OVStringTable::~OVStringTable() = default;

unsigned long OVStringTable::hash_func(String const& text, unsigned long bucketCount) {
    // Eight bytes at a time, each word mixed in by a multiplication with the golden ratio's
    // bits; the high half folded down at the end, as the modulo sees mostly the low bits.
    constexpr std::uint64_t kMultiplier = 0x9E3779B97F4A7C15ULL;
    auto const* p = reinterpret_cast<unsigned char const*>(text.GetBufferReadPtr());
    auto const n = static_cast<std::size_t>(text.GetNumBytes());
    std::uint64_t hash = n;
    std::size_t i = 0;
    for (; i + 8 <= n; i += 8)
        hash = (hash ^ streams::LoadLittleEndian<std::uint64_t>(p + i)) * kMultiplier;
    if (i < n) {
        std::uint64_t tail = 0;
        for (std::size_t k = 0; i + k < n; ++k)
            tail |= std::uint64_t(p[i + k]) << (8 * k);
        hash = (hash ^ tail) * kMultiplier;
    }
    hash ^= hash >> 32;
    return static_cast<unsigned long>(hash % bucketCount);
}

DynamicString OVStringTable::GetStringForIndex(int index) const {
    if (index < 0)
        return DynamicString();
    if (static_cast<std::size_t>(index) >= m_strings.size())
        TE_RAISE(TE_BAD_FILE_FORMAT, "", "OVStringTable::GetStringForIndex");
    return m_strings[static_cast<std::size_t>(index)];
}

int OVStringTable::GetIndexForString(String const& text) {
    if (text.IsEmpty())
        return -1;
    std::unique_ptr<Bucket>& bucket = m_buckets[hash_func(text, kBucketCount)];
    if (!bucket)
        bucket = std::make_unique<Bucket>();
    auto const found = bucket->indices.find(text);
    if (found != bucket->indices.end())
        return found->second;
    DynamicString key(text);
    if (m_strings.size() >= static_cast<std::size_t>(std::numeric_limits<int>::max()))
        Throw32BitOverflowException("OVStringTable::GetIndexForString", TE_FILE_BASE_NAME, __LINE__,
                                    true);
    int const index = static_cast<int>(m_strings.size());
    m_strings.push_back(key);
    try {
        bucket->indices.emplace(std::move(key), index);
    } catch (...) {
        m_strings.pop_back();
        throw;
    }
    return index;
}

void OVStringTable::Clear() {
    m_strings.clear();
    for (std::unique_ptr<Bucket>& bucket : m_buckets)
        bucket.reset();
}

unsigned long OVStringTable::StoreToMemoryStream(OVMemoryStream& stream) const {
    // Room for the whole table first, so a failure leaves the stream as it was.
    std::uint64_t total = 4;
    for (DynamicString const& text : m_strings)
        total += static_cast<std::uint64_t>(text.GetNumBytes()) + 1;
    if (total > std::numeric_limits<std::uint32_t>::max())
        Throw32BitOverflowException("OVStringTable::StoreToMemoryStream", TE_FILE_BASE_NAME,
                                    __LINE__, false);
    stream.PrepareStreamForWrite(static_cast<std::uint32_t>(total), false);

    // The binary layout, also through streams that write their typed values as text.
    unsigned long const start = stream.m_offset;
    stream.OVMemoryStream::WriteInt("", static_cast<int>(m_strings.size()));
    for (DynamicString const& text : m_strings)
        stream.WriteStringRaw(text, true);
    return start;
}

void OVStringTable::LoadFromMemoryStream(OVMemoryStream& stream, unsigned long offset) {
    std::uint32_t const start = stream.m_offset;
    if (offset > stream.m_size)
        TE_RAISE(TE_BAD_FILE_FORMAT, "", "OVStringTable::LoadFromMemoryStream");
    stream.m_offset = static_cast<std::uint32_t>(offset);
    try {
        int const count = stream.OVMemoryStream::ReadInt("");
        // Every string takes at least its NUL: a count the rest cannot hold is malformed, and
        // is refused before anything is allocated for it.
        if (count < 0 || static_cast<std::uint32_t>(count) > stream.m_size - stream.m_offset)
            TE_RAISE(TE_BAD_FILE_FORMAT, "", "OVStringTable::LoadFromMemoryStream");

        std::vector<DynamicString> strings;
        strings.reserve(static_cast<std::size_t>(count));
        decltype(m_buckets) buckets(kBucketCount);
        for (int index = 0; index < count; ++index) {
            DynamicString text;
            stream.ReadStringRaw(text);
            // An empty entry keeps the later indices in place but is never looked up.
            if (!text.IsEmpty()) {
                std::unique_ptr<Bucket>& bucket = buckets[hash_func(text, kBucketCount)];
                if (!bucket)
                    bucket = std::make_unique<Bucket>();
                bucket->indices.emplace(text, index); // a repeated string keeps its first index
            }
            strings.push_back(std::move(text));
        }
        m_strings.swap(strings);
        m_buckets.swap(buckets);
    } catch (...) {
        stream.m_offset = start;
        throw;
    }
}

} // namespace tekit
