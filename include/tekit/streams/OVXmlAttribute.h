// OVXmlAttribute: one attribute of a start tag read by OVXmlMemoryStream, with the place it was
// read for error messages.
//
//   OVXmlAttribute const& a = attributes.GetAt(0);    // count='12' at line 3, column 9
//   a.GetTagName();                                    // "count"
//   int n = a.GetAsInt();                              // 12
//   bool b = a.GetAsBool();                            // raises: "12" is no boolean
//
// The value is kept as the reader left it: references resolved ("&lt;" is "<") and still in
// UTF-8. GetAsString converts it to the process's code page; the typed getters read the whole
// text strictly (no blanks, no trailing characters, no overflow):
//
//   GetAsBool                  "true" or "false" (also "1" and "0")
//   GetAsInt, GetAsInt64       optional "-" or "+", then decimal digits
//   GetAsUInt, GetAsUInt64     decimal digits, optional "+"
//   GetAsDouble                what "%.16g" writes, also "inf", "-inf" and "nan" (any case)
//
// A value that does not read raises the error code the attribute carries (TE_BAD_FILE_FORMAT
// unless its list was given another), with a message naming the attribute, its value, the
// source, line and column, and the context "ThrowFileFormatErrorWithLocationInfo".
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <cstdint>

namespace tekit {

class TEKIT_API OVXmlAttribute {
public:
    OVXmlAttribute() = default;
    /// `tagName` and `value` are UTF-8; `value` with its references already resolved.
    /// `sourceName` (may be null) is copied.
    OVXmlAttribute(String const& tagName, String const& value, unsigned int line = 0,
                   unsigned int column = 0, char const* sourceName = nullptr);

    /// The attribute's name as written (UTF-8).
    String const& GetTagName() const { return m_tagName; }
    /// The value as read, UTF-8 with references resolved.
    String const& GetValueUtf8() const { return m_value; }

    bool GetAsBool() const;
    int GetAsInt() const;
    unsigned int GetAsUInt() const;
    std::int64_t GetAsInt64() const;
    std::uint64_t GetAsUInt64() const;
    double GetAsDouble() const;
    /// The value converted from UTF-8 to the process's code page.
    void GetAsString(DynamicString& value) const;
    DynamicString GetAsString() const;

    // ---- Location for messages. --------------------------------------------------------
    /// Where the attribute was read: 1-based line and column of its name (0: unknown), the
    /// source (a file name, may be null), and the error code a bad value raises (0:
    /// TE_BAD_FILE_FORMAT).
    void SetLocationInfoForErrors(int errorCode, unsigned int line, unsigned int column,
                                  char const* sourceName);
    unsigned int GetLine() const { return m_line; }
    unsigned int GetColumn() const { return m_column; }
    String const& GetSourceName() const { return m_sourceName; }

    /// Raises the attribute's error code with `problem` (a message naming what is wrong)
    /// followed by the location, context "ThrowFileFormatErrorWithLocationInfo".
    [[noreturn]] void ThrowFileFormatErrorWithLocationInfo(String const& problem) const;

private:
    friend class OVXmlMemoryStream; // fills attributes in place when it reads a tag

    [[noreturn]] void ThrowBadValue(char const* expected) const;

    DynamicString m_tagName;
    DynamicString m_value;
    DynamicString m_sourceName;
    unsigned int m_line = 0;
    unsigned int m_column = 0;
    int m_errorCode = 0;
};

} // namespace tekit
