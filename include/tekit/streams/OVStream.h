// OVStream: the abstract sequential stream through which persistent objects are written and
// read, with one named, typed operation per kind of value.
//
//   void Settings::Save(OVStream& stream) const {
//       stream.WriteInt("Version", 3);
//       stream.WriteString("Title", m_title);
//       stream.WriteDouble("Limit", m_limit);
//   }
//   void Settings::Load(OVStream& stream) {
//       int version = stream.ReadInt("Version");
//       stream.ReadString("Title", m_title);
//       m_limit = stream.ReadDouble("Limit");
//   }
//
// Binary streams ignore the names; XML streams use them as element or attribute names, so one
// routine writes either form. Reader and writer must agree on the order of the calls: binary
// streams carry no tags.
//
// The virtual operations keep a fixed slot order (destructor, offsets, raw bytes, strings, the
// typed values, WriteStream, sizes); derived streams in other modules depend on it. The base
// writes the typed values as their raw little-endian bytes through WriteBytes and reads them
// through ReadBytes (error TE_BAD_FILE_FORMAT when the stream is short); a stream that knows
// its buffer overrides them with inlined copies.
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/TEError.h"

#include <cstdint>

namespace tekit {

class String;
class DynamicString;

class TEKIT_API OVStream {
public:
    /// WriteStream's count that copies everything from the source offset to its end.
    static constexpr unsigned long kToEnd = ~0UL;

    // ---- Slot order matters: do not reorder, insert or remove virtual members. ----------
    virtual ~OVStream();
    /// Position of the next read or write.
    virtual std::uint32_t GetOffset() const = 0;
    virtual std::uint64_t GetLargeOffset() const = 0;
    virtual void SetOffset(unsigned int offset) = 0;
    /// Makes the current offset the end of the stream.
    virtual void TruncateAtCurrentOffset() = 0;
    virtual void WriteBytes(void const* data, unsigned int count) = 0;
    /// Reads `count` bytes into `data`. When fewer are left: a non-zero `errorIfShort` is
    /// raised and nothing moves; 0 reads what is left. Returns the bytes read.
    virtual unsigned int ReadBytes(void* data, unsigned int count, TEError errorIfShort) = 0;
    /// Writes a string value. The flags matter to text streams only (binary streams ignore
    /// them):
    ///   `escape`  the value is plain text: escape the format's special characters (XML:
    ///             attribute rules while writing attributes) and convert it to UTF-8. Pass false
    ///             for text that is already escaped and UTF-8; it is written as it is.
    ///   `toCRLF`  with `escape`, line ends of the value become CR LF.
    virtual void WriteString(char const* name, String const& value, bool escape = true,
                             bool toCRLF = false) = 0;
    virtual void ReadString(char const* name, DynamicString& value) = 0;
    virtual void WriteInt(char const* name, int value);
    virtual int ReadInt(char const* name);
    virtual void WriteUInt(char const* name, unsigned int value);
    virtual unsigned int ReadUInt(char const* name);
    virtual void WriteDouble(char const* name, double value);
    virtual double ReadDouble(char const* name);
    virtual void WriteBool(char const* name, bool value);
    /// Any non-zero byte reads as true.
    virtual bool ReadBool(char const* name);
    virtual void WriteInt64(char const* name, std::int64_t value);
    virtual std::int64_t ReadInt64(char const* name);
    virtual void WriteUInt64(char const* name, std::uint64_t value);
    virtual std::uint64_t ReadUInt64(char const* name);
    /// Appends bytes of `source` at this stream's offset: `count` bytes starting at source
    /// offset `offset`, fewer when the source ends first (kToEnd: all the rest). The source's
    /// own offset does not move. An `offset` past the source's size raises
    /// TE_INVALID_OR_OUT_OF_RANGE; a source kind the stream cannot read raises TE_NOT_SUPPORTED.
    virtual void WriteStream(OVStream const& source, unsigned long offset, unsigned long count) = 0;
    /// Number of valid bytes.
    virtual std::uint32_t GetSize() const = 0;
    virtual std::uint64_t GetLargeSize() const = 0;

protected:
    OVStream() = default;
    OVStream(OVStream const&) = default;
    OVStream& operator=(OVStream const&) = default;
};

} // namespace tekit
