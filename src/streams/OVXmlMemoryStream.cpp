// The XML memory stream's writing side: elements, attributes, comments and typed values as
// indented UTF-8 text with CR LF line ends.
#include "tekit/streams/OVXmlMemoryStream.h"

#include "streams/XmlSupport.h"
#include "tekit/errors/Raise.h"

#include <charconv>
#include <cstring>
#include <string>

namespace tekit {

using streams::Utf8Name;
using streams::Utf8Text;

namespace {

constexpr std::string_view kCRLF = "\r\n";
constexpr char kTabs[] = "\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t\t";

/// Whether a value needs escaping, line-end conversion or conversion to UTF-8.
bool NeedsPreparation(std::string_view text, bool apostrophe, bool toCRLF) {
    for (char const c : text) {
        auto const u = static_cast<unsigned char>(c);
        if (u >= 0x80 || c == '<' || c == '>' || c == '&' || (apostrophe && c == '\'') ||
            (toCRLF && (c == '\n' || c == '\r')))
            return true;
    }
    return false;
}

/// LF, CR and CR LF all become CR LF.
std::string WithCRLF(std::string_view text) {
    std::string out;
    out.reserve(text.size() + text.size() / 8);
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\r' || text[i] == '\n') {
            out += kCRLF;
            if (text[i] == '\r' && i + 1 < text.size() && text[i + 1] == '\n')
                ++i;
        } else {
            out += text[i];
        }
    }
    return out;
}

} // namespace

OVXmlMemoryStream::OVXmlMemoryStream() = default;
OVXmlMemoryStream::OVXmlMemoryStream(OVXmlMemoryStream const& other) = default;
OVXmlMemoryStream& OVXmlMemoryStream::operator=(OVXmlMemoryStream const& other) = default;
OVXmlMemoryStream::~OVXmlMemoryStream() = default;

void OVXmlMemoryStream::SetOffset(unsigned int offset) {
    m_offset = offset;
    m_pendingEmpty = false;
}

void OVXmlMemoryStream::WriteBytes(void const* data, unsigned int count) {
    OVMemoryStream::WriteBytes(data, count);
    ForgetLines();
}

// ---- Pieces. ---------------------------------------------------------------------------

void OVXmlMemoryStream::WritePieces(int tabs, std::string_view const* pieces, int count) {
    std::uint64_t total = tabs > 0 ? static_cast<std::uint64_t>(tabs) : 0;
    for (int i = 0; i < count; ++i)
        total += pieces[i].size();
    if (total > 0xFFFFFFFFu)
        Throw32BitOverflowException("OVXmlMemoryStream::WriteAsXml", TE_FILE_BASE_NAME, __LINE__,
                                    false);
    // One reservation: nothing below can fail, so a failed write changes nothing.
    PrepareStreamForWrite(static_cast<unsigned int>(total), true);
    unsigned char* out = m_buffer + m_offset;
    for (int left = tabs; left > 0;) {
        int const n = left < int(sizeof kTabs - 1) ? left : int(sizeof kTabs - 1);
        std::memcpy(out, kTabs, std::size_t(n));
        out += n;
        left -= n;
    }
    for (int i = 0; i < count; ++i) {
        if (!pieces[i].empty())
            std::memcpy(out, pieces[i].data(), pieces[i].size());
        out += pieces[i].size();
    }
    m_offset += static_cast<std::uint32_t>(total);
    ForgetLines();
}

void OVXmlMemoryStream::WriteIndentation() {
    WritePieces(m_level, nullptr, 0);
}

void OVXmlMemoryStream::PushElement() {
    m_startOffsets.push_back(m_offset);
    ++m_level;
}

// ---- Elements. -------------------------------------------------------------------------

void OVXmlMemoryStream::WriteElementStart(char const* name, bool noNewLine, bool nameIsUtf8) {
    Utf8Name const utf8(name, nameIsUtf8);
    std::string_view const pieces[] = {"<", utf8.view, noNewLine ? ">" : ">\r\n"};
    m_startOffsets.reserve(m_startOffsets.size() + 1);
    WritePieces(m_level, pieces, 3);
    PushElement();
}

void OVXmlMemoryStream::WriteElementEnd(char const* name, bool indent, bool nameIsUtf8) {
    static constexpr char kUnexpected[] = "Unexpected error in OVXmlMemoryStream::WriteElementEnd";
    if (m_startOffsets.empty())
        TE_RAISE_ASSERTION(kUnexpected, "OVXmlMemoryStream::WriteElementEnd");
    std::uint32_t const start = m_startOffsets.back();
    if (start == m_offset) {
        // Nothing since the start tag: make it self-closing.
        PrepareStreamForWrite(4, false);
        if (!BackupByExpectedBytes(">\r\n") && !BackupByExpectedBytes(">"))
            TE_RAISE_ASSERTION(kUnexpected, "OVXmlMemoryStream::WriteElementEnd");
        std::string_view const closing = "/>\r\n";
        WritePieces(0, &closing, 1);
    } else {
        Utf8Name const utf8(name, nameIsUtf8);
        std::string_view const pieces[] = {"</", utf8.view, ">\r\n"};
        WritePieces(indent ? m_level - 1 : 0, pieces, 3);
    }
    m_startOffsets.pop_back();
    --m_level;
}

void OVXmlMemoryStream::WriteElementStartWithAttributes(char const* name, bool nameIsUtf8) {
    Utf8Name const utf8(name, nameIsUtf8);
    std::string_view const pieces[] = {"<", utf8.view};
    WritePieces(m_level, pieces, 2);
    m_attributeMode = true;
}

void OVXmlMemoryStream::WriteElementStartWithAttributesEnd(bool selfClosing) {
    if (!m_attributeMode)
        TE_RAISE_ASSERTION("No start tag with attributes is open",
                           "OVXmlMemoryStream::WriteElementStartWithAttributesEnd");
    std::string_view const closing = selfClosing ? "/>\r\n" : ">\r\n";
    if (!selfClosing)
        m_startOffsets.reserve(m_startOffsets.size() + 1);
    WritePieces(0, &closing, 1);
    m_attributeMode = false;
    if (!selfClosing)
        PushElement();
}

void OVXmlMemoryStream::WriteComment(char const* text, bool indent) {
    Utf8Text const utf8(text ? text : "", text ? std::strlen(text) : 0);
    std::string body;
    body.reserve(utf8.View().size());
    for (char const c : utf8.View()) {
        if (c == '-' && !body.empty() && body.back() == '-')
            body += ' '; // "--" may not appear inside a comment
        body += c;
    }
    std::string_view const pieces[] = {"<!--", body, " -->\r\n"};
    WritePieces(indent ? m_level : 0, pieces, 3);
}

// ---- Values. ---------------------------------------------------------------------------

void OVXmlMemoryStream::WriteValue(char const* name, std::string_view text) {
    Utf8Name const utf8(name, false);
    if (m_attributeMode) {
        if (utf8.view.empty())
            TE_RAISE_ASSERTION("An attribute needs a name", "OVXmlMemoryStream::WriteAsXml");
        std::string_view const pieces[] = {" ", utf8.view, "='", text, "'"};
        WritePieces(0, pieces, 5);
    } else if (utf8.view.empty()) {
        WritePieces(0, &text, 1);
    } else if (text.empty()) {
        std::string_view const pieces[] = {"<", utf8.view, "/>\r\n"};
        WritePieces(m_level, pieces, 3);
    } else {
        std::string_view const pieces[] = {"<", utf8.view, ">", text, "</", utf8.view, ">\r\n"};
        WritePieces(m_level, pieces, 7);
    }
}

void OVXmlMemoryStream::WriteAsXml(char const* name, String const& value, bool escape,
                                   bool toCRLF) {
    std::string_view const text(value.GetBufferReadPtr(),
                                static_cast<std::size_t>(value.GetNumBytes()));
    if (!escape || !NeedsPreparation(text, m_attributeMode, toCRLF)) {
        WriteValue(name, text);
        return;
    }
    DynamicString escaped(value);
    String::EscapeXmlChars(escaped, m_attributeMode);
    std::string const lines =
        toCRLF ? WithCRLF(std::string_view(escaped.GetBufferReadPtr(),
                                           static_cast<std::size_t>(escaped.GetNumBytes())))
               : std::string(escaped.GetBufferReadPtr(),
                             static_cast<std::size_t>(escaped.GetNumBytes()));
    Utf8Text const utf8(lines.data(), lines.size());
    WriteValue(name, utf8.View());
}

void OVXmlMemoryStream::WriteString(char const* name, String const& value, bool escape,
                                    bool toCRLF) {
    WriteAsXml(name, value, escape, toCRLF);
}

namespace {

template <class T> std::string_view Decimal(char (&buffer)[32], T value) {
    auto const result = std::to_chars(buffer, buffer + sizeof buffer, value);
    return std::string_view(buffer, static_cast<std::size_t>(result.ptr - buffer));
}

} // namespace

void OVXmlMemoryStream::WriteInt(char const* name, int value) {
    char buffer[32];
    WriteValue(name, Decimal(buffer, value));
}

void OVXmlMemoryStream::WriteUInt(char const* name, unsigned int value) {
    char buffer[32];
    WriteValue(name, Decimal(buffer, value));
}

void OVXmlMemoryStream::WriteInt64(char const* name, std::int64_t value) {
    char buffer[32];
    WriteValue(name, Decimal(buffer, value));
}

void OVXmlMemoryStream::WriteUInt64(char const* name, std::uint64_t value) {
    char buffer[32];
    WriteValue(name, Decimal(buffer, value));
}

void OVXmlMemoryStream::WriteDouble(char const* name, double value) {
    // The shortest form of "%.16g", independent of the C locale's decimal point.
    char buffer[32];
    auto const result =
        std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general, 16);
    WriteValue(name, std::string_view(buffer, static_cast<std::size_t>(result.ptr - buffer)));
}

void OVXmlMemoryStream::WriteBool(char const* name, bool value) {
    WriteValue(name, value ? "true" : "false");
}

bool OVXmlMemoryStream::BackupByExpectedBytes(char const* expected) {
    std::size_t const n = std::strlen(expected);
    if (m_offset < n || m_offset > m_size || std::memcmp(m_buffer + m_offset - n, expected, n) != 0)
        return false;
    m_offset -= static_cast<std::uint32_t>(n);
    return true;
}

} // namespace tekit
