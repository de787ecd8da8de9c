// The header's XML form: the byte-order mark, the prolog and the root element's start tag with
// the fields as attributes.
#include "tekit/formats/OVFileHeader.h"

#include "formats/HeaderText.h"
#include "tekit/errors/TEException.h"
#include "tekit/streams/OVXmlAttributeList.h"
#include "tekit/streams/OVXmlMemoryStream.h"
#include "tekit/strings/DynamicString.h"

#include <cstring>

namespace tekit {

namespace {

constexpr unsigned char kByteOrderMark[] = {0xEF, 0xBB, 0xBF};
constexpr char kProlog[] = "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\r\n";
constexpr char kEndTag[] = "</orvanefileheader>\r\n";
constexpr char kSchemaInstance[] = "http://www.w3.org/2001/XMLSchema-instance";
constexpr char kSequenceFileType[] = "SequenceFile";

/// The default namespace: host, "/Orvane/", the compatible version up to its second period,
/// then "/SequenceFile" for sequence files and "/PropertyObjectFile" for every other type.
DynamicString NamespaceFor(char const* type, char const* compatibleVersion) {
    char const* end = std::strchr(compatibleVersion, '.');
    end = end ? std::strchr(end + 1, '.') : nullptr;
    DynamicString uri(OVFileHeader::kNamespaceHost);
    uri += "/Orvane/";
    DynamicString cut;
    cut.AssignUsingNumBytesInsteadOfNumChars(
        compatibleVersion, end ? static_cast<int>(end - compatibleVersion) : -1, false);
    uri += cut;
    uri += std::strcmp(type, kSequenceFileType) == 0 ? "/SequenceFile" : "/PropertyObjectFile";
    return uri;
}

/// The attribute's value, converted to the process's code page and cut to the field.
void CopyAttribute(char* field, std::size_t size, OVXmlAttribute const* attribute) {
    if (!attribute)
        return;
    DynamicString value;
    attribute->GetAsString(value);
    header_text::CopyCut(field, size, value.GetBufferReadPtr());
}

} // namespace

void OVFileHeader::WriteXml(OVStream* stream) const {
    OVXmlMemoryStream tag;
    tag.WriteElementStartWithAttributes(kXmlRootElement, true);
    tag.WriteString("type", DynamicString(m_type));
    tag.WriteInt("fileversion", m_fileVersion);
    tag.WriteString("productname", DynamicString(m_productName));
    tag.WriteString("productversion", DynamicString(m_productVersion));
    tag.WriteString("compatibleversion", DynamicString(m_compatibleVersion));
    tag.WriteString("buildversion", DynamicString(m_buildVersion));
    if (m_fileVersion < kFirstVersionWithoutPath)
        tag.WriteString("origfilepath", DynamicString(m_origFilePath));
    tag.WriteString("xmlns:xsi", DynamicString(kSchemaInstance));
    tag.WriteString("xmlns", NamespaceFor(m_type, m_compatibleVersion));
    tag.WriteElementStartWithAttributesEnd(false);

    stream->WriteBytes(kByteOrderMark, sizeof kByteOrderMark);
    stream->WriteBytes(kProlog, sizeof kProlog - 1);
    stream->WriteBytes(tag.GetDataPtr(), tag.GetSize());
}

void OVFileHeader::WriteEndOfXmlFile(OVStream* stream) {
    stream->WriteBytes(kEndTag, sizeof kEndTag - 1);
}

void OVFileHeader::ReadXml(OVStream* stream, unsigned char const* window, unsigned count,
                           unsigned start, bool& isXml, int* extra) {
    unsigned const skipped =
        count > 2 && std::memcmp(window, kByteOrderMark, sizeof kByteOrderMark) == 0 ? 3 : 0;
    OVXmlMemoryStream xml;
    xml.WriteBytes(window + skipped, count - skipped);
    xml.SetOffset(0);
    try {
        DynamicString target;
        OVXmlAttributeList pseudoAttributes;
        while (xml.ReadProcessingInstructionIfAny(target, pseudoAttributes)) {
        }
        if (!xml.IsNextElement(kXmlRootElement))
            return;
        isXml = true;
        Clear();
        OVXmlAttributeList attributes;
        xml.ReadElementStart(kXmlRootElement, attributes, true);
        OVXmlAttribute const* type = attributes.Find("type", true);
        OVXmlAttribute const* version = attributes.Find("fileversion", true);
        if (!type || !version)
            return; // no header without its type and format version: left invalid
        m_fileVersion = version->GetAsInt();
        CopyAttribute(m_type, sizeof m_type, type);
        CopyAttribute(m_productName, sizeof m_productName, attributes.Find("productname", true));
        CopyAttribute(m_productVersion, sizeof m_productVersion,
                      attributes.Find("productversion", true));
        CopyAttribute(m_compatibleVersion, sizeof m_compatibleVersion,
                      attributes.Find("compatibleversion", true));
        CopyAttribute(m_buildVersion, sizeof m_buildVersion, attributes.Find("buildversion", true));
        CopyAttribute(m_origFilePath, sizeof m_origFilePath, attributes.Find("origfilepath", true));
    } catch (TEException const& e) {
        // Malformed markup or a "fileversion" that is no integer: an invalid header, which
        // the caller sees in ValidHeader(), as it does a binary header cut short.
        if (e.GetErrorCode() != TE_BAD_FILE_FORMAT)
            throw;
        if (isXml)
            Clear();
        return;
    }
    std::memcpy(m_magic, "TOF1", 5);
    m_reserved1 = 0;
    m_reserved2 = 0;
    stream->SetOffset(start + skipped + xml.GetOffset());
    if (extra)
        *extra = static_cast<int>(xml.GetNumLinesSoFar());
}

} // namespace tekit
