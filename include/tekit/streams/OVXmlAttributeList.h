// OVXmlAttributeList: the attributes of one start tag read by OVXmlMemoryStream, as a stream
// that reads them by name. The routine that wrote the attributes through the typed Write...
// operations in attribute mode reads them back with the same names, in any order:
//
//   OVXmlAttributeList attributes;
//   xml.ReadElementStart("step", attributes);      // <step name='Init' count='3'>
//   int count = attributes.ReadInt("count");         // 3
//   DynamicString name;
//   attributes.ReadString("name", name);             // "Init"
//   bool skip = false;
//   attributes.ReadBoolIfExists("skip", skip);       // false: no such attribute, skip unchanged
//
// A name is looked up as given (case matters); a null or empty name reads the attribute at the
// offset instead, which then moves on by one, so attributes can also be read in order. The
// offset and size count attributes, not bytes. A missing attribute, or a value that does not
// read as the type asked for, raises a file-format error with the location the list was given
// (SetLocationInfoForErrors; context "ThrowFileFormatErrorWithLocationInfo").
//
// The list is read-only as a stream: WriteBytes (and so every typed Write...), WriteString,
// TruncateAtCurrentOffset, WriteStream and ReadBytes raise TE_OPERATION_FAILED (-17500) with
// their qualified name ("OVXmlAttributeList::WriteBytes", ...).
#pragma once

#include "tekit/streams/OVStream.h"
#include "tekit/streams/OVXmlAttribute.h"

#include <cstdint>
#include <vector>

namespace tekit {

class TEKIT_API OVXmlAttributeList : public OVStream {
public:
    OVXmlAttributeList() = default;
    OVXmlAttributeList(OVXmlAttributeList const&) = default;
    OVXmlAttributeList& operator=(OVXmlAttributeList const&) = default;
    ~OVXmlAttributeList() override;

    // ---- The list. ---------------------------------------------------------------------
    /// Appends an attribute; the list's location and error code are given to it.
    void PushBack(OVXmlAttribute const& attribute);
    /// Removes every attribute and puts the offset at 0; the location stays.
    void Clear();
    int GetCount() const { return static_cast<int>(m_count); }
    /// The attribute at `index` (0-based); an index outside the list raises
    /// TE_INDEX_OUT_OF_RANGE.
    OVXmlAttribute const& GetAt(int index) const;
    /// The attribute called `name` (UTF-8 when `nameIsUtf8`, else in the process's code page),
    /// or null.
    OVXmlAttribute const* Find(char const* name, bool nameIsUtf8 = false) const;

    /// Where the start tag was read, for messages: `errorCode` is what a missing or malformed
    /// attribute raises (0: TE_BAD_FILE_FORMAT), `line` and `column` are 1-based (0: unknown),
    /// `sourceName` names the document (may be null). Applies to the attributes already in the
    /// list and to those pushed later.
    void SetLocationInfoForErrors(int errorCode, unsigned int line, unsigned int column,
                                  char const* sourceName);
    /// The element whose attributes these are, named in messages (UTF-8).
    void SetElementName(String const& elementName) { m_elementName = elementName; }
    String const& GetElementName() const { return m_elementName; }

    // ---- Reading by name. --------------------------------------------------------------
    void ReadString(char const* name, DynamicString& value) override;
    int ReadInt(char const* name) override;
    unsigned int ReadUInt(char const* name) override;
    double ReadDouble(char const* name) override;
    bool ReadBool(char const* name) override;
    std::int64_t ReadInt64(char const* name) override;
    std::uint64_t ReadUInt64(char const* name) override;
    /// Reads the attribute into `value` when it exists; otherwise leaves `value` alone and
    /// returns false.
    bool ReadStringIfExists(char const* name, DynamicString& value);
    bool ReadBoolIfExists(char const* name, bool& value);

    // ---- The remaining stream slots. ---------------------------------------------------
    std::uint32_t GetOffset() const override { return m_next; }
    std::uint64_t GetLargeOffset() const override { return m_next; }
    /// The index of the attribute that a read without a name takes next.
    void SetOffset(unsigned int offset) override { m_next = offset; }
    void TruncateAtCurrentOffset() override;
    void WriteBytes(void const* data, unsigned int count) override;
    unsigned int ReadBytes(void* data, unsigned int count, TEError errorIfShort) override;
    void WriteString(char const* name, String const& value, bool escape = true,
                     bool toCRLF = false) override;
    void WriteStream(OVStream const& source, unsigned long offset, unsigned long count) override;
    /// The number of attributes.
    std::uint32_t GetSize() const override { return static_cast<std::uint32_t>(GetCount()); }
    std::uint64_t GetLargeSize() const override { return GetSize(); }

private:
    friend class OVXmlMemoryStream; // refills the list in place when it reads a tag

    /// The attribute a read of `name` takes; a missing one raises.
    OVXmlAttribute const& Lookup(char const* name);
    [[noreturn]] void ThrowMissing(char const* name) const;

    std::vector<OVXmlAttribute> m_attributes; ///< the first m_count are the list's; the
                                              ///< rest keep their buffers for the next tag
    std::size_t m_count = 0;
    DynamicString m_elementName;
    DynamicString m_sourceName;
    unsigned int m_line = 0;
    unsigned int m_column = 0;
    int m_errorCode = 0;
    std::uint32_t m_next = 0;
};

} // namespace tekit
