// OVMemoryStream: the growable in-memory binary stream.
//
//   OVMemoryStream stream;                     // 100 000 bytes allocated at once
//   stream.WriteInt("Count", 2);               // 02 00 00 00
//   stream.WriteString("Name", name);          // the bytes of `name`, then a NUL
//   stream.SetOffset(0);
//   int count = stream.ReadInt("Count");
//
// Values are laid down one after the other as their raw little-endian bytes (on every host),
// with no names, tags, padding or alignment:
//
//   int, uint        4 bytes        int64, uint64   8 bytes
//   double           8 bytes, IEEE 754 binary64
//   bool             1 byte, 0 or 1 (any non-zero byte reads as true)
//   bytes            the bytes themselves, no length prefix
//   string           without a string table: its bytes and one NUL; with a string table: its
//                    4-byte index in the table (the empty string is -1)
//
// Writing in the middle overwrites in place; the size grows only when a write runs past the
// end. The offset may be set past the end: reads then fail and truncation refuses. The buffer
// comes from the C run-time allocator and doubles when it grows.
//
// Failures raise TEException with the operation's qualified name as context:
//   TE_OUT_OF_MEMORY (-17000)             the buffer could not be allocated or grown
//   TE_PROGRAM_ERROR (-17001)             TruncateAtCurrentOffset past the end (assertion)
//   TE_BAD_FILE_FORMAT (-17100)           a read past the end, a string with no terminator
//   TE_INVALID_OR_OUT_OF_RANGE (-17300)   DeleteBytesAtCurrentOffset past the end
// A failed operation leaves offset, size and contents as they were.
//
// Not locked: one thread uses a stream at a time.
#pragma once

#include "tekit/streams/OVStream.h"

#include <cstdint>

namespace tekit {

class OVStringTable;
class KaCompressor;

class TEKIT_API OVMemoryStream : public OVStream {
public:
    /// Bytes allocated by the constructor, so that typical objects never reallocate.
    static constexpr std::uint32_t kInitialCapacity = 100000;

    /// An empty stream. `stringTable` (may be null) is used, not owned: it must outlive the
    /// stream. Strings then travel as table indices.
    explicit OVMemoryStream(OVStringTable* stringTable = nullptr);
    /// Copies the valid bytes, the offset and the string table pointer.
    OVMemoryStream(OVMemoryStream const& other);
    OVMemoryStream& operator=(OVMemoryStream const& other);
    ~OVMemoryStream() override;

    // ---- The stream slots. -------------------------------------------------------------
    std::uint32_t GetOffset() const override { return m_offset; }
    std::uint64_t GetLargeOffset() const override { return m_offset; }
    /// Any offset is accepted, also one past the end.
    void SetOffset(unsigned int offset) override { m_offset = offset; }
    void TruncateAtCurrentOffset() override;
    void WriteBytes(void const* data, unsigned int count) override;
    unsigned int ReadBytes(void* data, unsigned int count, TEError errorIfShort) override;
    /// The flags are ignored: the bytes of `value` are written as they are.
    void WriteString(char const* name, String const& value, bool escape = true,
                     bool toCRLF = false) override;
    void ReadString(char const* name, DynamicString& value) override;
    void WriteInt(char const* name, int value) override;
    int ReadInt(char const* name) override;
    void WriteUInt(char const* name, unsigned int value) override;
    unsigned int ReadUInt(char const* name) override;
    void WriteDouble(char const* name, double value) override;
    double ReadDouble(char const* name) override;
    void WriteBool(char const* name, bool value) override;
    bool ReadBool(char const* name) override;
    void WriteInt64(char const* name, std::int64_t value) override;
    std::int64_t ReadInt64(char const* name) override;
    void WriteUInt64(char const* name, std::uint64_t value) override;
    std::uint64_t ReadUInt64(char const* name) override;
    /// Supports memory-stream sources (this stream included).
    void WriteStream(OVStream const& source, unsigned long offset, unsigned long count) override;
    std::uint32_t GetSize() const override { return m_size; }
    std::uint64_t GetLargeSize() const override { return m_size; }

    // ---- Memory-stream operations. -----------------------------------------------------
    /// True when both hold the same valid bytes; offsets, capacities and tables do not count.
    bool IsEqualTo(OVMemoryStream& other);
    /// Removes `count` bytes at the offset, moving the rest down; the offset stays.
    void DeleteBytesAtCurrentOffset(unsigned long count);
    /// The valid bytes (null only for a stream whose buffer was never allocated).
    unsigned char const* GetDataPtr() const { return m_buffer; }
    OVStringTable* GetStringTable() const { return m_stringTable; }

    // ---- Text forms of the whole contents. ---------------------------------------------
    //
    // The stringified form is the valid bytes in the data-to-text encoding (6 printable
    // characters for every 4 bytes, see tekit/toolbox/DataText.h): any contents survive a
    // trip through an INI value or an XML attribute. The UTF-8 form treats the contents as
    // UTF-8 text without terminator, as the XML streams write it. Setting replaces the
    // contents and puts the offset at 0; the string table is kept.

    /// `text` receives the stringified form of the valid bytes ("" for an empty stream).
    void GetStringifiedVersionOfData(DynamicString& text) const;
    /// Replaces the contents by the bytes that `text` encodes. Text that is not encoded data
    /// raises TE_UNRECOGNIZED_VALUE, leaving the stream as it was.
    void SetDataFromStringifiedVersion(String const& text);
    /// `text` receives the valid bytes read as UTF-8 text, converted to the process's code
    /// page; a NUL among the bytes ends the text.
    void GetData_AssumingDataIsUTF8(DynamicString& text) const;
    /// Replaces the contents by the UTF-8 form of `text`, without terminator.
    void SetData_AsUTF8(String const& text);

    // Compression members (defined in MemoryStreamCompression.cpp).
    //
    // They use KaCompressor's framed block (tekit/streams/KaCompressor.h), load the zlib
    // module at their first use, and raise its errors: a stream or block that is not what
    // they expect, or a module that cannot be loaded, leaves the stream as it was.

    /// Replaces the valid bytes by their framed compressed block; the offset goes to 0.
    void Compress();
    /// Replaces the valid bytes, which must be one framed compressed block, by the bytes it
    /// holds; the offset goes to 0.
    void Uncompress();
    /// Writes `count` bytes at `data` compressed, at the offset: the framed block's length as
    /// a 4-byte uint, then the block.
    void WriteBytesCompressed(void const* data, unsigned int count);
    /// Reads what WriteBytesCompressed wrote at the offset into a new block (free it with
    /// TBFree; never null, even for 0 bytes), stores it and its size in `data` and `count`,
    /// and moves the offset past it. A length or block that runs past the end raises
    /// TE_BAD_FILE_FORMAT, with `data`, `count` and the offset unchanged.
    void ReadBytesCompressed(unsigned char*& data, unsigned long& count);

protected:
    /// Makes room for `count` bytes at the offset: grows the buffer to the larger of twice
    /// its capacity and offset + count, and with `extendSize` moves the size to offset + count
    /// when that is further (bytes between the old size and an offset past it become 0).
    /// Raises TE_OUT_OF_MEMORY when the buffer cannot grow, TE_UINT32_OVERFLOW when
    /// offset + count does not fit 32 bits; the state is then unchanged.
    void PrepareStreamForWrite(unsigned int count, bool extendSize);
    /// Writes the string's bytes, and its terminating NUL when `includeTerminator`.
    void WriteStringRaw(String const& value, bool includeTerminator);
    void WriteStringRaw(char const* value, bool includeTerminator);
    /// Reads the bytes up to the next NUL, which it consumes.
    void ReadStringRaw(DynamicString& value);

    /// Grows the buffer to at least `needed` bytes (see PrepareStreamForWrite).
    void GrowBuffer(std::uint64_t needed);
    /// Replaces buffer and size by `count` bytes at `data`, offset 0; state unchanged on
    /// failure.
    void ReplaceContents(void const* data, std::uint32_t count, char const* function);

    unsigned char* m_buffer = nullptr; ///< malloc'ed; `m_capacity` bytes
    std::uint32_t m_offset = 0;        ///< position of the next read or write
    std::uint32_t m_size = 0;          ///< valid bytes; never above m_capacity
    std::uint32_t m_capacity = 0;      ///< bytes allocated
    OVStringTable* m_stringTable = nullptr;

private:
    friend class OVStringTable;

    template <class U> void WriteFixed(U value);
    template <class U> U ReadFixed(char const* function);
};

} // namespace tekit
