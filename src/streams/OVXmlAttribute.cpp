// One attribute read from an XML start tag, with its typed getters.
#include "tekit/streams/OVXmlAttribute.h"

#include "streams/XmlSupport.h"

#include <string_view>

namespace tekit {

namespace {

std::string_view ViewOf(String const& text) {
    return std::string_view(text.GetBufferReadPtr(), static_cast<std::size_t>(text.GetNumBytes()));
}

/// What `parse` reads from `text`; `fail` raises when it reads nothing valid.
template <class T, class Fail>
T ParsedValue(std::string_view text, bool (*parse)(std::string_view, T&), Fail&& fail) {
    T value{};
    if (!parse(text, value))
        fail();
    return value;
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
    return ParsedValue(ViewOf(m_value), streams::ParseXmlBool,
                       [this] { ThrowBadValue(streams::kNotBool); });
}

int OVXmlAttribute::GetAsInt() const {
    return ParsedValue(ViewOf(m_value), streams::ParseXmlInt,
                       [this] { ThrowBadValue(streams::kNotInteger); });
}

unsigned int OVXmlAttribute::GetAsUInt() const {
    return ParsedValue(ViewOf(m_value), streams::ParseXmlUInt,
                       [this] { ThrowBadValue(streams::kNotInteger); });
}

std::int64_t OVXmlAttribute::GetAsInt64() const {
    return ParsedValue(ViewOf(m_value), streams::ParseXmlInt64,
                       [this] { ThrowBadValue(streams::kNotInteger); });
}

std::uint64_t OVXmlAttribute::GetAsUInt64() const {
    return ParsedValue(ViewOf(m_value), streams::ParseXmlUInt64,
                       [this] { ThrowBadValue(streams::kNotInteger); });
}

double OVXmlAttribute::GetAsDouble() const {
    return ParsedValue(ViewOf(m_value), streams::ParseXmlDouble,
                       [this] { ThrowBadValue(streams::kNotNumber); });
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
