// OVStringTable: the strings of a stream, each stored once and referred to by its index.
//
// A memory stream bound to a table writes every string as its 4-byte index, so repeated
// strings cost 4 bytes each. The table itself is stored into a stream and loaded back before
// the data that refers to it is read. One layout that needs a single stream: reserve a 4-byte
// slot for the table's offset, write the data, store the table at the end and fill the slot.
//
//   OVStringTable table;
//   OVMemoryStream stream(&table);
//   stream.WriteUInt("", 0);                          // slot for the table's offset
//   stream.WriteString("Name", name);                 // 4 bytes: the index of `name`
//   unsigned long tableOffset = table.StoreToMemoryStream(stream);
//   stream.SetOffset(0);
//   stream.WriteUInt("", static_cast<unsigned>(tableOffset));
//
//   OVStringTable loaded;                             // reading back
//   OVMemoryStream in(&loaded);                       // ... holding the same bytes
//   unsigned tableAt = in.ReadUInt("");
//   loaded.LoadFromMemoryStream(in, tableAt);
//   in.SetOffset(4);
//   in.ReadString("Name", name);
//
// Stored layout: a 4-byte int count, then every string in index order with its NUL.
//
// The empty string is never stored: its index is -1, and every negative index reads back as
// the empty string. Identical strings (compared byte for byte, as String::Compare does) share
// one index. Not locked: one thread uses a table at a time.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <memory>
#include <vector>

namespace tekit {

class OVMemoryStream;

class TEKIT_API OVStringTable {
public:
    /// Buckets of the lookup hash; a prime.
    static constexpr unsigned long kBucketCount = 10009;

    OVStringTable();
    ~OVStringTable();
    OVStringTable(OVStringTable const&) = delete;
    OVStringTable& operator=(OVStringTable const&) = delete;

    /// The string of `index`: "" for a negative index; TE_BAD_FILE_FORMAT (context
    /// "OVStringTable::GetStringForIndex") for an index at or past the count.
    DynamicString GetStringForIndex(int index) const;
    /// The index of `text`, adding it when it is new; -1 for the empty string.
    int GetIndexForString(String const& text);
    /// Strings in the table.
    int GetNumStrings() const { return static_cast<int>(m_strings.size()); }
    /// Removes every string.
    void Clear();

    /// Writes the table at the stream's offset; returns that offset. On failure the stream is
    /// unchanged.
    unsigned long StoreToMemoryStream(OVMemoryStream& stream) const;
    /// Replaces this table's strings by the table stored at `offset` of `stream`, leaving the
    /// stream's offset after it. Malformed data (a count that the stream cannot hold, a string
    /// with no terminator, an offset past the end) raises TE_BAD_FILE_FORMAT and changes
    /// neither the table nor the stream's offset.
    void LoadFromMemoryStream(OVMemoryStream& stream, unsigned long offset);

private:
    struct Bucket;

    /// A multiplicative hash of the string's bytes, reduced modulo `bucketCount`.
    static unsigned long hash_func(String const& text, unsigned long bucketCount);

    std::vector<DynamicString> m_strings;           ///< by index
    std::vector<std::unique_ptr<Bucket>> m_buckets; ///< kBucketCount; each made on first use
};

} // namespace tekit
