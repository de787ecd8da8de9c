// The attributes of one start tag as a read-only stream that reads them by name.
#include "tekit/streams/OVXmlAttributeList.h"

#include "streams/XmlSupport.h"
#include "tekit/errors/Raise.h"

#include <string_view>

namespace tekit {

namespace {

std::string_view ViewOf(String const& text) {
    return std::string_view(text.GetBufferReadPtr(), static_cast<std::size_t>(text.GetNumBytes()));
}

[[noreturn]] void NotSupported(char const* function) {
    TE_RAISE(TE_OPERATION_FAILED, streams::XmlMessage("XML_ATTRIBUTE_LIST_READ_ONLY"), function);
}

} // namespace

OVXmlAttributeList::~OVXmlAttributeList() = default;

void OVXmlAttributeList::PushBack(OVXmlAttribute const& attribute) {
    if (m_count < m_attributes.size())
        m_attributes[m_count] = attribute;
    else
        m_attributes.push_back(attribute);
    OVXmlAttribute& added = m_attributes[m_count++];
    // An attribute without a place of its own is reported at the tag's.
    bool const placed = added.GetLine() != 0;
    added.SetLocationInfoForErrors(m_errorCode, placed ? added.GetLine() : m_line,
                                   placed ? added.GetColumn() : m_column,
                                   m_sourceName.GetBufferReadPtr());
}

void OVXmlAttributeList::Clear() {
    m_count = 0; // the attributes stay, so that the next tag reuses their buffers
    m_next = 0;
}

OVXmlAttribute const& OVXmlAttributeList::GetAt(int index) const {
    if (index < 0 || index >= GetCount())
        TE_RAISE(TE_INDEX_OUT_OF_RANGE, "", "OVXmlAttributeList::GetAt");
    return m_attributes[static_cast<std::size_t>(index)];
}

OVXmlAttribute const* OVXmlAttributeList::Find(char const* name, bool nameIsUtf8) const {
    streams::Utf8Name const utf8(name, nameIsUtf8);
    for (std::size_t i = 0; i < m_count; ++i)
        if (ViewOf(m_attributes[i].GetTagName()) == utf8.view)
            return &m_attributes[i];
    return nullptr;
}

void OVXmlAttributeList::SetLocationInfoForErrors(int errorCode, unsigned int line,
                                                  unsigned int column, char const* sourceName) {
    unsigned int const oldLine = m_line, oldColumn = m_column;
    m_errorCode = errorCode;
    m_line = line;
    m_column = column;
    m_sourceName = sourceName ? sourceName : "";
    for (std::size_t i = 0; i < m_count; ++i) {
        OVXmlAttribute& attribute = m_attributes[i];
        bool const own = attribute.GetLine() != 0 &&
                         (attribute.GetLine() != oldLine || attribute.GetColumn() != oldColumn);
        attribute.SetLocationInfoForErrors(errorCode, own ? attribute.GetLine() : line,
                                           own ? attribute.GetColumn() : column, sourceName);
    }
}

// ---- Reading by name. ----------------------------------------------------------------------

void OVXmlAttributeList::ThrowMissing(char const* name) const {
    DynamicString const problem =
        name && *name ? streams::XmlMessage("XML_MISSING_ATTRIBUTE_1_2", ViewOf(m_elementName),
                                            std::string_view(name))
                      : streams::XmlMessage("XML_NO_MORE_ATTRIBUTES_1", ViewOf(m_elementName));
    streams::ThrowXmlFormatError(m_errorCode, problem, m_sourceName.GetBufferReadPtr(), m_line,
                                 m_column);
}

OVXmlAttribute const& OVXmlAttributeList::Lookup(char const* name) {
    if (!name || !*name) {
        if (m_next >= m_count)
            ThrowMissing(name);
        return m_attributes[m_next++];
    }
    OVXmlAttribute const* found = Find(name);
    if (!found)
        ThrowMissing(name);
    return *found;
}

void OVXmlAttributeList::ReadString(char const* name, DynamicString& value) {
    Lookup(name).GetAsString(value);
}

int OVXmlAttributeList::ReadInt(char const* name) {
    return Lookup(name).GetAsInt();
}

unsigned int OVXmlAttributeList::ReadUInt(char const* name) {
    return Lookup(name).GetAsUInt();
}

double OVXmlAttributeList::ReadDouble(char const* name) {
    return Lookup(name).GetAsDouble();
}

bool OVXmlAttributeList::ReadBool(char const* name) {
    return Lookup(name).GetAsBool();
}

std::int64_t OVXmlAttributeList::ReadInt64(char const* name) {
    return Lookup(name).GetAsInt64();
}

std::uint64_t OVXmlAttributeList::ReadUInt64(char const* name) {
    return Lookup(name).GetAsUInt64();
}

bool OVXmlAttributeList::ReadStringIfExists(char const* name, DynamicString& value) {
    OVXmlAttribute const* found = Find(name);
    if (found)
        found->GetAsString(value);
    return found != nullptr;
}

bool OVXmlAttributeList::ReadBoolIfExists(char const* name, bool& value) {
    OVXmlAttribute const* found = Find(name);
    if (found)
        value = found->GetAsBool();
    return found != nullptr;
}

// ---- Not supported. ------------------------------------------------------------------------

void OVXmlAttributeList::TruncateAtCurrentOffset() {
    NotSupported("OVXmlAttributeList::TruncateAtCurrentOffset");
}

void OVXmlAttributeList::WriteBytes(void const*, unsigned int) {
    NotSupported("OVXmlAttributeList::WriteBytes");
}

unsigned int OVXmlAttributeList::ReadBytes(void*, unsigned int, TEError) {
    NotSupported("OVXmlAttributeList::ReadBytes");
}

void OVXmlAttributeList::WriteString(char const*, String const&, bool, bool) {
    NotSupported("OVXmlAttributeList::WriteString");
}

void OVXmlAttributeList::WriteStream(OVStream const&, unsigned long, unsigned long) {
    NotSupported("OVXmlAttributeList::WriteStream");
}

} // namespace tekit
