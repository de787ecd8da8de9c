// What the XML stream, its attributes and attribute lists share: the messages of format
// errors with their location, the strict readers of typed values, and the conversions between
// the process's code page and UTF-8 with their ASCII fast path.
#pragma once

#include "tekit/strings/DynamicString.h"

#include <cstdint>
#include <cstring>
#include <string_view>

namespace tekit::streams {

/// The "ERR_DESCR" message `key` with up to three arguments filled in, from the last back so
/// that a "%" in an argument is never taken for a placeholder.
DynamicString XmlMessage(char const* key, std::string_view first = {}, std::string_view second = {},
                         std::string_view third = {});

/// Raises `code` (0: TE_BAD_FILE_FORMAT) with `problem` followed by the place: the source
/// (may be null or empty), the line and the column (0: unknown, then left out). Context
/// "ThrowFileFormatErrorWithLocationInfo".
[[noreturn]] void ThrowXmlFormatError(int code, String const& problem, char const* sourceName,
                                      unsigned int line, unsigned int column);

// Strict readers of a whole value as written by the stream; false when the text is not one.
bool ParseXmlBool(std::string_view text, bool& value);
bool ParseXmlInt(std::string_view text, int& value);
bool ParseXmlUInt(std::string_view text, unsigned int& value);
bool ParseXmlInt64(std::string_view text, std::int64_t& value);
bool ParseXmlUInt64(std::string_view text, std::uint64_t& value);
bool ParseXmlDouble(std::string_view text, double& value);

/// The message key for a value that does not read as the type of the parser.
inline constexpr char const* kNotBool = "XML_NOT_BOOL_1_2";
inline constexpr char const* kNotInteger = "XML_NOT_INTEGER_1_2";
inline constexpr char const* kNotNumber = "XML_NOT_NUMBER_1_2";

/// Whether every byte is below 0x80: such text is the same in UTF-8 and every code page.
bool IsAscii(char const* text, std::size_t length);

/// `bytes` exactly, whatever the multibyte mode (which would not cut UTF-8 where it ends).
void AssignExact(DynamicString& value, std::string_view bytes);

/// `utf8` converted to the process's code page.
void AssignFromUtf8(DynamicString& value, std::string_view utf8);

/// Text in the process's code page as UTF-8; the view stays valid while the holder lives.
class Utf8Text {
public:
    Utf8Text(char const* text, std::size_t length);
    explicit Utf8Text(String const& text);
    Utf8Text(Utf8Text const&) = delete;
    Utf8Text& operator=(Utf8Text const&) = delete;
    ~Utf8Text();
    std::string_view View() const { return m_view; }

private:
    void Convert(String const& text);

    char* m_converted = nullptr; ///< from AllocUTF8, when the text was not ASCII
    std::string_view m_view;
};

/// A name given by a caller, as UTF-8: converted unless `isUtf8` (null is empty).
struct Utf8Name {
    Utf8Name(char const* name, bool isUtf8)
        : text(name && !isUtf8 ? name : "", name && !isUtf8 ? std::strlen(name) : 0),
          view(isUtf8 ? std::string_view(name ? name : "") : text.View()) {}
    Utf8Text text;
    std::string_view view;
};

} // namespace tekit::streams
