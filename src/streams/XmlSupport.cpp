// Messages, value readers and code-page conversions shared by the XML stream and its
// attributes.
#include "streams/XmlSupport.h"

#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"

#include <charconv>
#include <climits>
#include <cstring>
#include <string>
#include <vector>

namespace tekit::streams {

namespace {

/// Messages quote at most this many bytes of a value or name.
constexpr std::size_t kMaxQuoted = 200;

std::string Quoted(std::string_view text) {
    if (text.size() <= kMaxQuoted)
        return std::string(text);
    return std::string(text.substr(0, kMaxQuoted)) + "...";
}

template <class T> bool ParseInteger(std::string_view text, T& value) {
    char const* first = text.data();
    char const* last = first + text.size();
    // from_chars takes no plus sign; the readers take one before a digit.
    if (first != last && *first == '+' && last - first > 1 && first[1] >= '0' && first[1] <= '9')
        ++first;
    T result{};
    auto const [end, error] = std::from_chars(first, last, result);
    if (error != std::errc() || end != last || first == last)
        return false;
    value = result;
    return true;
}

} // namespace

DynamicString XmlMessage(char const* key, std::string_view first, std::string_view second,
                         std::string_view third) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    std::string_view const arguments[] = {first, second, third};
    for (long number = 3; number >= 1; --number) {
        std::string_view const argument = arguments[number - 1];
        if (argument.data())
            message.Format(DynamicString(Quoted(argument).c_str(), true), number);
    }
    return message;
}

void ThrowXmlFormatError(int code, String const& problem, char const* sourceName, unsigned int line,
                         unsigned int column) {
    // The place's parts, %2 onwards: the source (when named), the line and the column (when
    // known); filled from the last back, as XmlMessage does.
    std::vector<std::string> parts;
    if (sourceName && *sourceName)
        parts.emplace_back(sourceName);
    if (line != 0) {
        parts.push_back(std::to_string(line));
        parts.push_back(std::to_string(column));
    }
    static constexpr char const* kKeys[] = {nullptr, "XML_IN_SOURCE_1_2",
                                            "XML_AT_LINE_COLUMN_1_2_3",
                                            "XML_AT_SOURCE_LINE_COLUMN_1_2_3_4"};
    DynamicString message = problem;
    if (!parts.empty()) {
        message = static_cast<char const*>(RString("ERR_DESCR", kKeys[parts.size()]));
        for (std::size_t n = parts.size(); n >= 1; --n)
            message.Format(parts[n - 1].c_str(), static_cast<long>(n + 1));
        message.Format(problem, 1);
    }
    TE_RAISE(code ? static_cast<TEError>(code) : TE_BAD_FILE_FORMAT, message,
             "ThrowFileFormatErrorWithLocationInfo");
}

bool ParseXmlBool(std::string_view text, bool& value) {
    if (text == "true" || text == "1")
        value = true;
    else if (text == "false" || text == "0")
        value = false;
    else
        return false;
    return true;
}

bool ParseXmlInt(std::string_view text, int& value) {
    return ParseInteger(text, value);
}

bool ParseXmlUInt(std::string_view text, unsigned int& value) {
    return ParseInteger(text, value);
}

bool ParseXmlInt64(std::string_view text, std::int64_t& value) {
    return ParseInteger(text, value);
}

bool ParseXmlUInt64(std::string_view text, std::uint64_t& value) {
    return ParseInteger(text, value);
}

bool ParseXmlDouble(std::string_view text, double& value) {
    char const* first = text.data();
    char const* last = first + text.size();
    if (first != last && *first == '+' && last - first > 1 && first[1] != '-' && first[1] != '+')
        ++first;
    double result = 0;
    auto const [end, error] = std::from_chars(first, last, result);
    if (error != std::errc() || end != last || first == last)
        return false;
    value = result;
    return true;
}

bool IsAscii(char const* text, std::size_t length) {
    unsigned char any = 0;
    for (std::size_t i = 0; i < length; ++i)
        any |= static_cast<unsigned char>(text[i]);
    return any < 0x80;
}

void AssignExact(DynamicString& value, std::string_view bytes) {
    if (bytes.size() > std::size_t(INT_MAX) - 16)
        Throw32BitOverflowException("OVXmlMemoryStream::ReadString", TE_FILE_BASE_NAME, __LINE__,
                                    true);
    if (!String::IsMultiByteSupportEnabled())
        value.AssignUsingNumBytesInsteadOfNumChars(bytes.data(), static_cast<int>(bytes.size()),
                                                   false);
    else
        value = std::string(bytes).c_str();
}

void AssignFromUtf8(DynamicString& value, std::string_view utf8) {
    if (utf8.size() > std::size_t(INT_MAX) - 16)
        Throw32BitOverflowException("OVXmlMemoryStream::ReadString", TE_FILE_BASE_NAME, __LINE__,
                                    true);
    if (IsAscii(utf8.data(), utf8.size()))
        value.AssignUsingNumBytesInsteadOfNumChars(utf8.data(), static_cast<int>(utf8.size()),
                                                   false);
    else
        value.AssignFromUTF8(utf8.data(), static_cast<int>(utf8.size()));
}

Utf8Text::Utf8Text(char const* text, std::size_t length) : m_view(text, length) {
    if (!IsAscii(text, length))
        Convert(DynamicString(std::string(text, length).c_str(), true));
}

Utf8Text::Utf8Text(String const& text)
    : m_view(text.GetBufferReadPtr(), static_cast<std::size_t>(text.GetNumBytes())) {
    if (!IsAscii(m_view.data(), m_view.size()))
        Convert(text);
}

void Utf8Text::Convert(String const& text) {
    long length = 0;
    m_converted = text.AllocUTF8(nullptr, 0, &length);
    m_view = std::string_view(m_converted, static_cast<std::size_t>(length));
}

Utf8Text::~Utf8Text() {
    if (m_converted)
        String::FreeUTF8(m_converted);
}

} // namespace tekit::streams
