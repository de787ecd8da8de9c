// One attribute read from an XML start tag, with its typed getters.
#include "tekit/streams/OVXmlAttribute.h"

#include "streams/XmlSupport.h"

#include <string_view>

namespace tekit {

namespace {

std::string_view ViewOf(String const& text) {
    return std::string_view(text.GetBufferReadPtr(), static_cast<std::size_t>(text.GetNumBytes()));
}

} // namespace

OVXmlAttribute::OVXmlAttribute(String const& tagName, String const& value, unsigned int line,
                               unsigned int column, char const* sourceName)
    : m_tagName(tagName), m_value(value), m_line(line), m_column(column) {
    if (sourceName)
        m_sourceName = sourceName;
}

void OVXmlAttribute::SetLocationInfoForErrors(int errorCode, unsigned int line, unsigned int column,
                                              char const* sourceName) {
    m_errorCode = errorCode;
    m_line = line;
    m_column = column;
    m_sourceName = sourceName ? sourceName : "";
}

void OVXmlAttribute::ThrowFileFormatErrorWithLocationInfo(String const& problem) const {
    streams::ThrowXmlFormatError(m_errorCode, problem, m_sourceName.GetBufferReadPtr(), m_line,
                                 m_column);
}

void OVXmlAttribute::ThrowBadValue(char const* key) const {
    ThrowFileFormatErrorWithLocationInfo(
        streams::XmlMessage(key, ViewOf(m_value), ViewOf(m_tagName)));
}

bool OVXmlAttribute::GetAsBool() const {
    bool value = false;
    if (!streams::ParseXmlBool(ViewOf(m_value), value))
        ThrowBadValue(streams::kNotBool);
    return value;
}

int OVXmlAttribute::GetAsInt() const {
    int value = 0;
    if (!streams::ParseXmlInt(ViewOf(m_value), value))
        ThrowBadValue(streams::kNotInteger);
    return value;
}

unsigned int OVXmlAttribute::GetAsUInt() const {
    unsigned int value = 0;
    if (!streams::ParseXmlUInt(ViewOf(m_value), value))
        ThrowBadValue(streams::kNotInteger);
    return value;
}

std::int64_t OVXmlAttribute::GetAsInt64() const {
    std::int64_t value = 0;
    if (!streams::ParseXmlInt64(ViewOf(m_value), value))
        ThrowBadValue(streams::kNotInteger);
    return value;
}

std::uint64_t OVXmlAttribute::GetAsUInt64() const {
    std::uint64_t value = 0;
    if (!streams::ParseXmlUInt64(ViewOf(m_value), value))
        ThrowBadValue(streams::kNotInteger);
    return value;
}

double OVXmlAttribute::GetAsDouble() const {
    double value = 0;
    if (!streams::ParseXmlDouble(ViewOf(m_value), value))
        ThrowBadValue(streams::kNotNumber);
    return value;
}

void OVXmlAttribute::GetAsString(DynamicString& value) const {
    streams::AssignFromUtf8(value, ViewOf(m_value));
}

DynamicString OVXmlAttribute::GetAsString() const {
    DynamicString value;
    GetAsString(value);
    return value;
}

} // namespace tekit
