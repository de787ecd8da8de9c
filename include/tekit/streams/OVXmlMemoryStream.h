// OVXmlMemoryStream: a memory stream whose typed operations write and read XML text, so the
// routine that writes an object's binary form writes its XML form when given this stream.
//
//   OVXmlMemoryStream xml;
//   xml.WriteElementStart("Settings");                  // <Settings>
//   xml.WriteElementStartWithAttributes("Limit");       //     <Limit
//   xml.WriteDouble("low", 0.5);                        //      low='0.5'
//   xml.WriteInt("count", 3);                           //      count='3'
//   xml.WriteElementStartWithAttributesEnd(true);       //     />
//   xml.WriteString("Title", title);                    //     <Title>Tom &amp; Jerry</Title>
//   xml.WriteBool("Enabled", true);                     //     <Enabled>true</Enabled>
//   xml.WriteElementEnd("Settings");                    // </Settings>
//
// gives, with a tab per level and CR LF after every line:
//
//   <Settings>
//   	<Limit low='0.5' count='3'/>
//   	<Title>Tom &amp; Jerry</Title>
//   	<Enabled>true</Enabled>
//   </Settings>
//
// and reads back with the same names:
//
//   xml.SetOffset(0);
//   OVXmlAttributeList limit;
//   xml.ReadElementStart("Settings");
//   xml.ReadElementStart("Limit", limit);  double low = limit.ReadDouble("low");
//   xml.ReadElementEnd("Limit");           // nothing to read: <Limit .../> was self-closing
//   xml.ReadString("Title", title);
//   bool enabled = xml.ReadBool("Enabled");
//   xml.ReadElementEnd("Settings");
//
// Writing. Text is UTF-8. Names and values given in the process's code page are converted;
// names are written as given otherwise (they must be XML names: the reader rejects others).
// Values are escaped with String::EscapeXmlChars, the apostrophe too in attribute values,
// which are always in single quotes. Integers are written in decimal, doubles with "%.16g"
// (infinities "inf" and "-inf", NaN "nan"), booleans "true" or "false"; an empty value makes
// a self-closing element (<Name/>). An element started and ended with nothing written between
// is self-closing too, in both the newline and the no-newline form of the start. A comment
// is "<!--", the text, " -->", on a line of its own; a "--" in its text is written "- -",
// which XML does not allow inside a comment. An element end that has no open start, or whose
// start can no longer be found before an empty element's end, raises TE_PROGRAM_ERROR
// (-17001) "Unexpected error in OVXmlMemoryStream::WriteElementEnd".
//
// Reading is a strict tokenizer of the XML this stream writes, with what other writers add to
// it. Between markup it skips white space (blank, tab, CR, LF), comments, and, when reading
// elements, processing instructions; it reads start tags with attributes in single or double
// quotes, self-closing tags, end tags, text with the references &lt; &gt; &amp; &apos; &quot;
// &#NN; &#xHH;, and CDATA sections. A value element holds text only: its content is returned
// exactly (no trimming, no line-end normalisation), so every value reads back as written. A
// document type declaration, an unknown entity, a reference to no character, an unterminated
// tag, comment, CDATA section or attribute value, a "<" in an attribute value, a repeated
// attribute, a bad character in a name, an end tag that does not match, or the end of the text
// inside a token raises TE_BAD_FILE_FORMAT (-17100) with a message giving the source, the
// line and the column (columns count bytes from 1), context
// "ThrowFileFormatErrorWithLocationInfo". A NUL byte counts as the end of the text. Reading
// takes time linear in the text's length; nothing is read recursively.
//
// A failed read leaves the offset where it was. Not locked: one thread uses a stream at a time.
#pragma once

#include "tekit/streams/OVMemoryStream.h"
#include "tekit/strings/DynamicString.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace tekit {

class OVXmlAttributeList;

class TEKIT_API OVXmlMemoryStream : public OVMemoryStream {
public:
    OVXmlMemoryStream();
    OVXmlMemoryStream(OVXmlMemoryStream const& other);
    OVXmlMemoryStream& operator=(OVXmlMemoryStream const& other);
    ~OVXmlMemoryStream() override;

    // ---- Writing elements. -------------------------------------------------------------
    /// Indentation, "<", the name, ">", then CR LF unless `noNewLine`; one level deeper.
    void WriteElementStart(char const* name, bool noNewLine = false, bool nameIsUtf8 = false);
    /// Closes the innermost open element: "</name>" and CR LF, after the indentation when
    /// `indent` (pass false after a no-newline start); an element with nothing written since
    /// its start becomes self-closing instead.
    void WriteElementEnd(char const* name, bool indent = true, bool nameIsUtf8 = false);
    /// Indentation, "<" and the name; the typed writes that follow are attributes until
    /// WriteElementStartWithAttributesEnd.
    void WriteElementStartWithAttributes(char const* name, bool nameIsUtf8 = false);
    /// Leaves attribute mode and closes the start tag. `selfClosing`: "/>" and CR LF, the
    /// element is complete. Otherwise ">" and CR LF, and the element stays open one level
    /// deeper until WriteElementEnd (which makes it self-closing when nothing is written).
    void WriteElementStartWithAttributesEnd(bool selfClosing = false);
    /// A comment on a line of its own, indented when `indent`: "<!--", the text (converted to
    /// UTF-8), " -->", CR LF.
    void WriteComment(char const* text, bool indent = true);

    /// The nesting level: one tab of indentation per level.
    int GetLevel() const { return m_level; }
    bool IsInAttributeMode() const { return m_attributeMode; }

    // ---- Reading elements. -------------------------------------------------------------
    /// Reads the start tag of element `name` (its attributes are checked and dropped); a null
    /// or empty name reads whichever start tag comes next.
    void ReadElementStart(char const* name, bool nameIsUtf8 = false);
    /// Reads the start tag of element `name` and replaces `attributes` by its attributes, with
    /// their locations, the list's location set to the tag's, and `sourceName` (null: the
    /// stream's, see SetSourceNameForErrors) for messages. `description` (may be null) says
    /// what the element stands for and is added to messages ("while reading <description>").
    /// When the tag does not read, the list is left as it was.
    void ReadElementStart(char const* name, OVXmlAttributeList& attributes, bool nameIsUtf8 = false,
                          char const* sourceName = nullptr, char const* description = nullptr);
    /// Reads the end tag of `name`; after a self-closing start tag of `name` it reads nothing.
    void ReadElementEnd(char const* name, bool nameIsUtf8 = false);
    /// True when the next markup is the start tag of `name` (in the process's code page);
    /// moves nothing.
    bool IsNextElement(char const* name);
    /// When the next markup is a start tag, puts its name in `name` (as UTF-8 when
    /// `nameAsUtf8`, else converted to the process's code page) and returns true; at an end
    /// tag, at text, inside a self-closing element or at the end of the text returns false.
    /// Moves nothing.
    bool GetNextElementName(DynamicString& name, bool nameAsUtf8 = false);
    /// When the next markup is a processing instruction (<?target a='1' b="2"?>), reads it,
    /// puts its target in `target` and its pseudo-attributes in `attributes`, and returns
    /// true; otherwise moves nothing and returns false.
    bool ReadProcessingInstructionIfAny(DynamicString& target, OVXmlAttributeList& attributes);

    /// Lines ended (by LF, CR LF or a lone CR) before the offset.
    unsigned int GetNumLinesSoFar() const;
    /// Names the document in format errors (a file name, say); null for none.
    void SetSourceNameForErrors(char const* sourceName);

    // ---- The stream slots. -------------------------------------------------------------
    /// The value as XML (see WriteAsXml); `escape` and `toCRLF` as there.
    void WriteString(char const* name, String const& value, bool escape = true,
                     bool toCRLF = false) override;
    /// Reads the element `name` and returns its text converted to the process's code page;
    /// an empty name reads the text up to the next markup.
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
    /// Also leaves a self-closing element just read (its end then reads as any other).
    void SetOffset(unsigned int offset) override;
    /// Bytes written directly are taken as they are (they must be UTF-8 XML text).
    void WriteBytes(void const* data, unsigned int count) override;

protected:
    /// Writes one value: in attribute mode " name='text'"; otherwise with a name
    /// "<name>text</name>" (or "<name/>" for an empty text) on an indented line; with an empty
    /// name the text alone. `escape`: the text is plain text in the process's code page, to be
    /// escaped and converted to UTF-8 (line ends to CR LF first when `toCRLF`); otherwise it
    /// is written as it is.
    void WriteAsXml(char const* name, String const& value, bool escape, bool toCRLF);
    /// As many tabs as the level.
    void WriteIndentation();

    /// Moves the offset past white space, comments and (when `skipProcessingInstructions`)
    /// processing instructions, to the next markup or text, or the end.
    void
    MoveOffsetToNextNonWhitespaceCharacterAndNonComment(bool skipProcessingInstructions = true);
    /// Moves past `expected` at the offset; raises a format error when it is not there.
    void MovePastExpectedString(char const* expected);
    /// Reads text with references up to `terminator` (not consumed), resolving references,
    /// into `value` (UTF-8). Markup in the way raises a format error, as does the end of the
    /// text.
    void ReadStringToChar(char terminator, DynamicString& value);
    /// Reads the value element `name` (or, with an empty name, the text up to the next
    /// markup) into `value` as UTF-8 with references resolved.
    void ReadXml(char const* name, DynamicString& value);
    /// When the bytes just before the offset are `expected`, moves the offset back over them
    /// and returns true; otherwise returns false.
    bool BackupByExpectedBytes(char const* expected);

    /// Raises TE_BAD_FILE_FORMAT for the given byte offset with `problem`, its place and the
    /// source name; context "ThrowFileFormatErrorWithLocationInfo".
    [[noreturn]] void ThrowFileFormatErrorWithLocationInfo(std::uint32_t offset,
                                                           String const& problem) const;

private:
    class Reader;
    friend class Reader;

    /// Writes `tabs` tab characters and then the pieces, with one reservation.
    void WritePieces(int tabs, std::string_view const* pieces, int count);
    /// One value whose text is ready (escaped, UTF-8): see WriteAsXml.
    void WriteValue(char const* name, std::string_view text);
    void PushElement();
    /// Replaces `list` by the attributes of the tag just read, with their places.
    void FillAttributeList(Reader const& reader, OVXmlAttributeList& list, std::string_view element,
                           char const* sourceName, std::uint32_t tagStart) const;
    /// 1-based line and column of a byte offset (columns count bytes).
    void Locate(std::uint32_t offset, unsigned int& line, unsigned int& column) const;
    /// Forgets the line count, after a write.
    void ForgetLines() const { m_linesAt = m_lines = m_lineStart = 0; }

    int m_level = 0;
    bool m_attributeMode = false;
    std::vector<std::uint32_t> m_startOffsets; ///< after each open element's start tag
    // Reading.
    bool m_pendingEmpty = false;           ///< the last start tag read was self-closing
    DynamicString m_pendingName;           ///< its name (UTF-8)
    DynamicString m_sourceName;            ///< for messages
    mutable std::uint32_t m_linesAt = 0;   ///< offset up to which m_lines is counted
    mutable std::uint32_t m_lines = 0;     ///< line ends before m_linesAt
    mutable std::uint32_t m_lineStart = 0; ///< offset of the line m_linesAt is on
    /// An attribute of the tag being read: where its name and value are (a value that held
    /// references is in m_tagValues).
    struct TagAttribute {
        std::uint32_t nameAt, nameLength, valueAt, valueLength;
        bool decoded;
    };
    std::vector<TagAttribute> m_tagAttributes; ///< kept between reads, so reading allocates
    std::string m_tagValues;                   ///< little
};

} // namespace tekit
