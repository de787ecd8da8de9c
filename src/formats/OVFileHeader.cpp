// The header record: its fields, the binary form and the dispatch between the two forms on
// reading. The XML form is in OVFileHeaderXml.cpp.
#include "tekit/formats/OVFileHeader.h"

#include "formats/HeaderText.h"
#include "tekit/errors/Raise.h"
#include "tekit/ini/IniHeader.h"
#include "tekit/streams/OVStream.h"
#include "tekit/toolbox/Version.h"

#include <bit>
#include <cstddef>
#include <cstring>
#include <limits>

namespace tekit {

namespace {

constexpr char kValidMagic[] = "TOF1";
constexpr char kInvalidMagic[] = "XXXX";

} // namespace

OVFileHeader::OVFileHeader() {
    // The record is its own binary form: no padding, little-endian integers, every field
    // where the format puts it.
    static_assert(std::endian::native == std::endian::little);
    static_assert(sizeof(OVFileHeader) == kSize);
    static_assert(std::is_standard_layout_v<OVFileHeader>);
    static_assert(offsetof(OVFileHeader, m_magic) == 0);
    static_assert(offsetof(OVFileHeader, m_type) == 10);
    static_assert(offsetof(OVFileHeader, m_fileVersion) == 60);
    static_assert(offsetof(OVFileHeader, m_productName) == 64);
    static_assert(offsetof(OVFileHeader, m_productVersion) == 114);
    static_assert(offsetof(OVFileHeader, m_compatibleVersion) == 164);
    static_assert(offsetof(OVFileHeader, m_buildVersion) == 214);
    static_assert(offsetof(OVFileHeader, m_reserved1) == 264);
    static_assert(offsetof(OVFileHeader, m_reserved2) == 268);
    static_assert(offsetof(OVFileHeader, m_origFilePath) == 272);
    Clear();
}

void OVFileHeader::Clear() {
    std::memset(static_cast<void*>(this), 0, kSize);
    MarkAsInvalid();
}

void OVFileHeader::MarkAsInvalid() {
    std::memcpy(m_magic, kInvalidMagic, sizeof kInvalidMagic);
}

bool OVFileHeader::ValidHeader() const {
    return std::memcmp(m_magic, kValidMagic, sizeof kValidMagic) == 0;
}

void OVFileHeader::SetData(char const* type, int fileVersion, char const* productName,
                           char const* productVersion, char const* compatibleVersion,
                           char const* buildVersion, char const* origFilePath) {
    Clear();
    std::memcpy(m_magic, kValidMagic, sizeof kValidMagic);
    header_text::CopyCut(m_type, sizeof m_type, type);
    m_fileVersion = fileVersion;
    header_text::CopyCut(m_productName, sizeof m_productName, productName);
    header_text::CopyCut(m_productVersion, sizeof m_productVersion, productVersion);
    header_text::CopyCut(m_compatibleVersion, sizeof m_compatibleVersion, compatibleVersion);
    header_text::CopyCut(m_buildVersion, sizeof m_buildVersion, buildVersion);
    if (fileVersion < kFirstVersionWithoutPath)
        header_text::CopyCut(m_origFilePath, sizeof m_origFilePath, origFilePath);
}

void OVFileHeader::SetDataFromIniHeader(IniHeader const& iniHeader) {
    DynamicString const productVersion = iniHeader.GetProductVersion();
    DynamicString const displayVersion = iniHeader.GetProductDisplayVersion();
    SetData(iniHeader.GetType().GetBufferReadPtr(), static_cast<int>(iniHeader.GetFormatVersion()),
            iniHeader.GetProductName().GetBufferReadPtr(), productVersion.GetBufferReadPtr(),
            iniHeader.GetCompatibleProductVersion().GetBufferReadPtr(),
            (displayVersion.IsEmpty() ? productVersion : displayVersion).GetBufferReadPtr(),
            iniHeader.GetPath_InternalForUseWithOVFileHeaderOnly().GetBufferReadPtr());
}

bool OVFileHeader::IsCompatibleProductVersion(Version const& productVersion) const {
    Version const oldest(m_compatibleVersion);
    return !oldest.IsValid() || productVersion >= oldest;
}

void OVFileHeader::Write(OVStream* stream, bool asXml) const {
    if (asXml)
        WriteXml(stream);
    else
        stream->WriteBytes(GetBytes(), kSize);
}

void OVFileHeader::Read(OVStream* stream, bool& isXml, int* extra) {
    std::uint64_t const start = stream->GetLargeOffset();
    if (start > std::numeric_limits<unsigned>::max())
        Throw32BitOverflowException("OVFileHeader::Read", __FILE__, __LINE__, false);
    // The first bytes tell the form: an XML header is found within them, a binary one is
    // their first 1296.
    unsigned char window[header_text::kXmlWindow];
    unsigned const count = stream->ReadBytes(window, sizeof window, TEError(0));
    if (extra)
        *extra = 0;
    isXml = false;
    if (header_text::MayBeXml(window, count)) {
        ReadXml(stream, window, count, static_cast<unsigned>(start), isXml, extra);
        if (isXml) {
            if (!ValidHeader())
                stream->SetOffset(static_cast<unsigned>(start));
            return;
        }
    }
    Clear();
    unsigned const taken = count < kSize ? count : kSize;
    std::memcpy(static_cast<void*>(this), window, taken);
    stream->SetOffset(static_cast<unsigned>(start + taken));
    TerminateTextFields();
    if (taken < kSize)
        MarkAsInvalid();
}

void OVFileHeader::TerminateTextFields() {
    for (char* field :
         {m_type, m_productName, m_productVersion, m_compatibleVersion, m_buildVersion})
        field[kTextFieldSize - 1] = '\0';
    m_origFilePath[kPathFieldSize - 1] = '\0';
}

} // namespace tekit
