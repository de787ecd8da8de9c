// OVFileHeader: the header every product file begins with, naming the file's type, its format
// version and the product versions that wrote it and can read it.
//
//   OVFileHeader header;
//   header.SetData("SequenceFile", 773, "Orvane", "4.2.1.77", "4.2", "4.2.1f1", "");
//   header.Write(&stream, false);          // the 1296-byte record
//   ...
//   bool isXml = false;
//   header.Read(&stream, isXml, nullptr);  // either form, from the stream's offset
//   if (header.ValidHeader()) ...
//
// The object is a plain record whose memory image is the binary form, little-endian, every
// text field NUL-terminated and NUL-padded:
//
//   offset  size  field                                   XML attribute
//        0    10  magic "TOF1" (valid) or "XXXX"          -
//       10    50  type ("SequenceFile", ...)              type
//       60     4  format version, signed                  fileversion
//       64    50  product name                            productname
//      114    50  product version                         productversion
//      164    50  compatible product version              compatibleversion
//      214    50  build version                           buildversion
//      264     4  reserved, 0                             -
//      268     4  reserved, 0                             -
//      272  1024  saved-from path, only below version 773 origfilepath
//
// The XML form is a UTF-8 byte-order mark, the prolog `<?xml version="1.0" encoding="UTF-8"?>`
// and CR LF, then the root element's start tag with the fields as attributes:
//
//   <orvanefileheader type='SequenceFile' fileversion='773' productname='Orvane'
//    productversion='4.2.1.77' compatibleversion='4.2' buildversion='4.2.1f1'
//    xmlns:xsi='http://www.w3.org/2001/XMLSchema-instance'
//    xmlns='http://www.orvane.example/Orvane/4.2/SequenceFile'>
//
// (one line in the file). The file's content follows and WriteEndOfXmlFile closes the root.
// Files of the INI text form carry the same facts in their "__Header__" section, which
// SetDataFromIniHeader takes over; tekit/formats/FileTypeDetection.h tells the forms apart.
#pragma once

#include "tekit/Export.h"

#include <cstdint>

namespace tekit {

class IniHeader;
class OVStream;
class Version;

/// The three forms of a product file.
enum FileWritingFormats {
    kTextFileFormat = 1,   ///< INI text with a header section
    kBinaryFileFormat = 2, ///< the binary header record, then stream values
    kXmlFileFormat = 3,    ///< the XML header element as the document's root
};

class TEKIT_API OVFileHeader {
public:
    /// Bytes of the record: the binary form's size.
    static constexpr unsigned kSize = 1296;
    /// Bytes of each text field but the path, and of the path field (terminator included).
    static constexpr unsigned kTextFieldSize = 50;
    static constexpr unsigned kPathFieldSize = 1024;
    /// From this format version on, the saved-from path is no longer recorded.
    static constexpr int kFirstVersionWithoutPath = 773;
    /// The root element of the XML form.
    static constexpr char const kXmlRootElement[] = "orvanefileheader";
    /// The host of the XML form's default namespace, an address of ours under the maker's
    /// name (".example": it names, it is not fetched). The path "/Orvane/%1/SequenceFile"
    /// follows for the type "SequenceFile", "/Orvane/%1/PropertyObjectFile" for any other;
    /// %1 is the compatible version up to its second period ("4.2.1.77" gives "4.2"; a text
    /// with fewer periods is taken whole).
    static constexpr char const kNamespaceHost[] = "http://www.orvane.example";

    /// A cleared header: every byte 0, magic "XXXX".
    OVFileHeader();

    /// Zeroes all 1296 bytes and sets the magic to "XXXX".
    void Clear();
    /// Sets the magic to "XXXX", keeping the fields.
    void MarkAsInvalid();
    /// True when the record begins with "TOF1" and a NUL.
    bool ValidHeader() const;

    /// Fills a valid header: each text cut to its field (49 bytes, the path 1023, never in the
    /// middle of a double-byte character in multibyte mode); the path only when `fileVersion`
    /// is below 773. A null text is empty.
    void SetData(char const* type, int fileVersion, char const* productName,
                 char const* productVersion, char const* compatibleVersion,
                 char const* buildVersion, char const* origFilePath);
    /// The same from the tags of an INI header section: type, format version, product name,
    /// product version and compatible version from their tags; the build version is the
    /// section's display version ("ProductVersionString"), or its product version when that
    /// tag is empty; the path from the section's "Path".
    void SetDataFromIniHeader(IniHeader const& iniHeader);

    /// True when a product of version `productVersion` can read the file: it is not older than
    /// the compatible version field. A field that is empty or holds no version restricts
    /// nothing (true).
    bool IsCompatibleProductVersion(Version const& productVersion) const;

    /// Writes the header at the stream's offset: the record as it stands, or with `asXml` the
    /// byte-order mark, the prolog and the root start tag.
    void Write(OVStream* stream, bool asXml) const;
    /// Writes the root element's end tag and CR LF, after an XML file's content.
    static void WriteEndOfXmlFile(OVStream* stream);
    /// Reads a header of either form from the stream's offset: the XML form when the root
    /// element "orvanefileheader" starts within the next 10240 bytes (after an optional
    /// byte-order mark, processing instructions and comments), else the binary record.
    /// `isXml` tells which form was found. The XML form leaves the stream just after the root start
    /// tag and stores in
    /// `*extra` (when not null) the number of line ends read up to there, so that a reader of
    /// the content can continue the line count of its messages; the binary form stores 0 and
    /// leaves the stream after the 1296 bytes (or at its end).
    /// No header is no error: the record is marked invalid (check ValidHeader) when fewer than
    /// 1296 bytes remain, when the root element is malformed, lacks "type" or "fileversion",
    /// repeats an attribute or holds a "fileversion" that is no integer (the stream then
    /// stays at the header's start). Over-long attribute values are cut to their field;
    /// missing optional ones are empty. Errors of the stream itself are raised.
    void Read(OVStream* stream, bool& isXml, int* extra);

    // ---- The fields. A text field read from a file is cut at its last byte, so it always
    // ends within its field. ------------------------------------------------------------
    char const* GetType() const { return m_type; }
    int GetFileVersion() const { return m_fileVersion; }
    char const* GetProductName() const { return m_productName; }
    char const* GetProductVersion() const { return m_productVersion; }
    char const* GetCompatibleVersion() const { return m_compatibleVersion; }
    char const* GetBuildVersion() const { return m_buildVersion; }
    char const* GetOrigFilePath() const { return m_origFilePath; }
    /// The record's 1296 bytes: the binary form.
    unsigned char const* GetBytes() const { return reinterpret_cast<unsigned char const*>(this); }

private:
    void WriteXml(OVStream* stream) const;
    /// Reads the XML form from the first `count` bytes of the stream at `start`, copied into
    /// `window`; `isXml` stays false when the bytes hold no header element.
    void ReadXml(OVStream* stream, unsigned char const* window, unsigned count, unsigned start,
                 bool& isXml, int* extra);
    void TerminateTextFields();

    char m_magic[10];
    char m_type[kTextFieldSize];
    std::int32_t m_fileVersion;
    char m_productName[kTextFieldSize];
    char m_productVersion[kTextFieldSize];
    char m_compatibleVersion[kTextFieldSize];
    char m_buildVersion[kTextFieldSize];
    std::int32_t m_reserved1;
    std::int32_t m_reserved2;
    char m_origFilePath[kPathFieldSize];
};

} // namespace tekit
