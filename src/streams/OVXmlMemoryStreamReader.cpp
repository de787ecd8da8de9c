// The XML memory stream's reading side: a strict, single-pass tokenizer over the stream's
// bytes. Every operation works on a private cursor and moves the stream's offset only when it
// succeeds; every loop moves forward, so reading is linear in the text and never recursive.
#include "streams/XmlSupport.h"
#include "tekit/errors/Raise.h"
#include "tekit/streams/OVXmlAttributeList.h"
#include "tekit/streams/OVXmlMemoryStream.h"

#include <cstring>
#include <optional>
#include <string>
#include <unordered_set>

namespace tekit {

using streams::XmlMessage;

namespace {

enum : unsigned char { kNameStart = 1, kNameChar = 2 };

/// Name characters: letters, '_', ':' and every byte of a multi-byte UTF-8 character may start
/// a name; digits, '-' and '.' may follow.
constexpr struct NameTable {
    unsigned char kind[256] = {};
    constexpr NameTable() {
        for (int c = 0; c < 256; ++c) {
            bool const start = (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z') || c == '_' ||
                               c == ':' || c >= 0x80;
            bool const more = start || (c >= '0' && c <= '9') || c == '-' || c == '.';
            kind[c] = static_cast<unsigned char>((start ? kNameStart : 0) | (more ? kNameChar : 0));
        }
    }
} kNames;

std::string_view ViewOf(String const& text) {
    return std::string_view(text.GetBufferReadPtr(), static_cast<std::size_t>(text.GetNumBytes()));
}

bool IsSpace(char c) {
    return c == ' ' || c == '\t' || c == '\r' || c == '\n';
}

/// A character for a message: itself when printable, else its code.
std::string CharText(char c) {
    auto const u = static_cast<unsigned char>(c);
    if (u > 0x20 && u < 0x7F)
        return std::string(1, c);
    static constexpr char kHex[] = "0123456789ABCDEF";
    return std::string("0x") + kHex[u >> 4] + kHex[u & 15];
}

void AppendUtf8(std::string& out, std::uint32_t code) {
    if (code < 0x80) {
        out += static_cast<char>(code);
    } else if (code < 0x800) {
        out += static_cast<char>(0xC0 | (code >> 6));
        out += static_cast<char>(0x80 | (code & 0x3F));
    } else if (code < 0x10000) {
        out += static_cast<char>(0xE0 | (code >> 12));
        out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (code & 0x3F));
    } else {
        out += static_cast<char>(0xF0 | (code >> 18));
        out += static_cast<char>(0x80 | ((code >> 12) & 0x3F));
        out += static_cast<char>(0x80 | ((code >> 6) & 0x3F));
        out += static_cast<char>(0x80 | (code & 0x3F));
    }
}

} // namespace

class OVXmlMemoryStream::Reader {
public:
    using XmlTagAttribute = TagAttribute;
    enum Kind { kEnd, kStartTag, kEndTag, kText, kInstruction };

    Reader(OVXmlMemoryStream& stream, char const* sourceName = nullptr,
           char const* description = nullptr)
        : m_stream(stream), m_text(reinterpret_cast<char const*>(stream.m_buffer)),
          m_size(stream.m_size),
          m_pos(stream.m_offset < stream.m_size ? stream.m_offset : stream.m_size),
          m_sourceName(sourceName), m_description(description) {}

    /// Makes the cursor the stream's offset.
    void Commit() { m_stream.m_offset = m_pos; }
    std::uint32_t Position() const { return m_pos; }
    void Skip(std::uint32_t count) { m_pos += count; }

    /// The byte at `at`; a NUL (0) also past the end, so a NUL ends the text.
    char At(std::uint32_t at) const { return at < m_size ? m_text[at] : '\0'; }
    bool StartsWith(std::string_view what) const {
        return m_size - m_pos >= what.size() &&
               std::memcmp(m_text + m_pos, what.data(), what.size()) == 0;
    }
    std::string_view View(std::uint32_t at, std::uint32_t length) const {
        return std::string_view(m_text + at, length);
    }

    [[noreturn]] void Fail(std::uint32_t at, char const* key, std::string_view first = {},
                           std::string_view second = {}) const {
        DynamicString problem = XmlMessage(key, first, second);
        if (m_description && *m_description) {
            DynamicString const whole =
                XmlMessage("XML_WHILE_READING_1_2", std::string_view(), m_description);
            DynamicString combined = whole;
            combined.Format(problem, 1);
            problem = combined;
        }
        unsigned int line = 0, column = 0;
        m_stream.Locate(at, line, column);
        char const* source = m_sourceName ? m_sourceName : m_stream.m_sourceName.GetBufferReadPtr();
        streams::ThrowXmlFormatError(0, problem, source, line, column);
    }

    /// The first byte at or after `at` that is `quote`, '<', '&' or NUL, or the end.
    std::uint32_t SkipPlain(std::uint32_t at, char quote) const {
        while (at < m_size) {
            char const c = m_text[at];
            if (c == quote || c == '<' || c == '&' || c == '\0')
                break;
            ++at;
        }
        return at;
    }

    void SkipSpace() {
        while (IsSpace(At(m_pos)))
            ++m_pos;
    }

    /// White space, a byte-order mark at the start, comments and, with `instructions`,
    /// processing instructions.
    void SkipMisc(bool instructions) {
        if (m_pos == 0 && StartsWith("\xEF\xBB\xBF"))
            m_pos = 3;
        for (;;) {
            SkipSpace();
            if (StartsWith("<!--"))
                SkipComment();
            else if (instructions && StartsWith("<?"))
                SkipInstruction();
            else
                return;
        }
    }

    void SkipComment() {
        std::uint32_t const start = m_pos;
        for (m_pos += 4;; ++m_pos) {
            char const c = At(m_pos);
            if (c == '\0')
                Fail(start, "XML_END_IN_COMMENT");
            if (c == '-' && At(m_pos + 1) == '-') {
                if (At(m_pos + 2) != '>')
                    Fail(m_pos, "XML_DOUBLE_HYPHEN_IN_COMMENT");
                m_pos += 3;
                return;
            }
        }
    }

    void SkipInstruction() {
        std::uint32_t const start = m_pos;
        m_pos += 2;
        ReadName();
        for (;; ++m_pos) {
            char const c = At(m_pos);
            if (c == '\0')
                Fail(start, "XML_END_IN_INSTRUCTION");
            if (c == '?' && At(m_pos + 1) == '>') {
                m_pos += 2;
                return;
            }
        }
    }

    Kind Peek() const {
        char const c = At(m_pos);
        if (c == '\0')
            return kEnd;
        if (c != '<')
            return kText;
        switch (At(m_pos + 1)) {
        case '/':
            return kEndTag;
        case '?':
            return kInstruction;
        case '!':
            if (StartsWith("<![CDATA["))
                return kText;
            Fail(m_pos, "XML_UNSUPPORTED_MARKUP");
        default:
            return kStartTag;
        }
    }

    std::string_view ReadName() {
        std::uint32_t const start = m_pos;
        if (!(kNames.kind[static_cast<unsigned char>(At(m_pos))] & kNameStart))
            Fail(m_pos, At(m_pos) == '\0' ? "XML_END_IN_TAG" : "XML_BAD_NAME_1",
                 CharText(At(m_pos)));
        while (kNames.kind[static_cast<unsigned char>(At(m_pos))] & kNameChar)
            ++m_pos;
        return View(start, m_pos - start);
    }

    /// Reads the reference at '&' into `out`.
    void ReadReference(std::string& out) {
        std::uint32_t const start = m_pos++;
        if (At(m_pos) == '#') {
            bool const hex = At(++m_pos) == 'x';
            m_pos += hex ? 1 : 0;
            std::uint32_t code = 0, digits = 0;
            for (;; ++m_pos, ++digits) {
                char const c = At(m_pos);
                int digit = c >= '0' && c <= '9' ? c - '0' : -1;
                if (hex && c >= 'a' && c <= 'f')
                    digit = c - 'a' + 10;
                else if (hex && c >= 'A' && c <= 'F')
                    digit = c - 'A' + 10;
                if (digit < 0)
                    break;
                code = code > 0x10FFFF ? code : code * (hex ? 16 : 10) + std::uint32_t(digit);
            }
            if (At(m_pos) != ';' || digits == 0)
                Fail(start, "XML_BAD_REFERENCE");
            ++m_pos;
            if (code == 0 || code > 0x10FFFF || (code >= 0xD800 && code <= 0xDFFF))
                Fail(start, "XML_BAD_CHARACTER_REFERENCE_1", View(start, m_pos - start));
            AppendUtf8(out, code);
            return;
        }
        std::uint32_t const nameStart = m_pos;
        while (kNames.kind[static_cast<unsigned char>(At(m_pos))] & kNameChar)
            ++m_pos;
        std::string_view const name = View(nameStart, m_pos - nameStart);
        if (name.empty() || At(m_pos) != ';')
            Fail(start, "XML_BAD_REFERENCE");
        ++m_pos;
        static constexpr std::string_view kEntities[][2] = {
            {"lt", "<"}, {"gt", ">"}, {"amp", "&"}, {"apos", "'"}, {"quot", "\""}};
        for (auto const& entity : kEntities)
            if (name == entity[0]) {
                out += entity[1];
                return;
            }
        Fail(start, "XML_UNKNOWN_ENTITY_1", name);
    }

    /// Reads the attributes of a tag whose name has been read, up to its end: ">" or "/>"
    /// (returns whether it was "/>"), or "?>" for a processing instruction.
    bool ReadAttributes(std::uint32_t tagStart, bool instruction,
                        std::vector<XmlTagAttribute>& attributes, std::string& scratch) {
        attributes.clear();
        scratch.clear();
        std::optional<std::unordered_set<std::string_view>> seen; // for tags of many attributes
        for (;;) {
            std::uint32_t const before = m_pos;
            SkipSpace();
            char const c = At(m_pos);
            if (c == '\0')
                Fail(tagStart, instruction ? "XML_END_IN_INSTRUCTION" : "XML_END_IN_TAG");
            if (instruction && c == '?' && At(m_pos + 1) == '>') {
                m_pos += 2;
                return false;
            }
            if (!instruction && c == '>') {
                ++m_pos;
                return false;
            }
            if (!instruction && c == '/' && At(m_pos + 1) == '>') {
                m_pos += 2;
                return true;
            }
            if (m_pos == before || !(kNames.kind[static_cast<unsigned char>(c)] & kNameStart))
                Fail(m_pos, "XML_UNEXPECTED_IN_TAG_1", CharText(c));
            XmlTagAttribute attribute{};
            attribute.nameAt = m_pos;
            std::string_view const name = ReadName();
            attribute.nameLength = static_cast<std::uint32_t>(name.size());
            ReadAttributeValue(tagStart, name, attribute, scratch);
            if (attributes.size() < 16) {
                for (XmlTagAttribute const& other : attributes)
                    if (View(other.nameAt, other.nameLength) == name)
                        Fail(attribute.nameAt, "XML_DUPLICATE_ATTRIBUTE_1", name);
            } else {
                if (!seen) {
                    seen.emplace();
                    for (XmlTagAttribute const& other : attributes)
                        seen->insert(View(other.nameAt, other.nameLength));
                }
                if (!seen->insert(name).second)
                    Fail(attribute.nameAt, "XML_DUPLICATE_ATTRIBUTE_1", name);
            }
            attributes.push_back(attribute);
        }
    }

    void ReadAttributeValue(std::uint32_t tagStart, std::string_view name,
                            XmlTagAttribute& attribute, std::string& scratch) {
        SkipSpace();
        if (At(m_pos) == '=') {
            ++m_pos;
            SkipSpace();
        }
        char const quote = At(m_pos);
        if (quote == '\0')
            Fail(tagStart, "XML_END_IN_TAG");
        if (At(m_pos - 1) != '=' && !IsSpace(At(m_pos - 1)))
            Fail(m_pos, "XML_ATTRIBUTE_WITHOUT_VALUE_1", name);
        if (quote != '\'' && quote != '"')
            Fail(m_pos, "XML_ATTRIBUTE_WITHOUT_VALUE_1", name);
        std::uint32_t const open = m_pos++;
        // Plain values stay in the text; the first reference moves the value to the scratch.
        std::uint32_t segment = m_pos;
        attribute.valueAt = m_pos;
        attribute.decoded = false;
        for (;;) {
            m_pos = SkipPlain(m_pos, quote);
            char const c = At(m_pos);
            if (c == quote)
                break;
            if (c == '\0')
                Fail(open, "XML_END_IN_ATTRIBUTE_VALUE_1", name);
            if (c == '<')
                Fail(m_pos, "XML_LT_IN_ATTRIBUTE_VALUE_1", name);
            if (!attribute.decoded) {
                attribute.decoded = true;
                attribute.valueAt = static_cast<std::uint32_t>(scratch.size());
            }
            scratch.append(m_text + segment, m_pos - segment);
            ReadReference(scratch);
            segment = m_pos;
        }
        if (attribute.decoded) {
            scratch.append(m_text + segment, m_pos - segment);
            attribute.valueLength = static_cast<std::uint32_t>(scratch.size()) - attribute.valueAt;
        } else {
            attribute.valueLength = m_pos - attribute.valueAt;
        }
        ++m_pos;
    }

    std::string_view ValueOf(XmlTagAttribute const& a, std::string const& scratch) const {
        return a.decoded ? std::string_view(scratch).substr(a.valueAt, a.valueLength)
                         : View(a.valueAt, a.valueLength);
    }

    /// Reads the start tag of `name` (empty: any) at the cursor, after markup was skipped.
    /// Returns whether it was self-closing.
    bool ReadStartTag(std::string_view name, std::vector<XmlTagAttribute>& attributes,
                      std::string& scratch, std::uint32_t& tagStart,
                      std::string_view* foundName = nullptr) {
        tagStart = m_pos;
        switch (Peek()) {
        case kEnd:
            Fail(m_pos, "XML_EXPECTED_ELEMENT_AT_END_1", name);
        case kText:
            Fail(m_pos, "XML_EXPECTED_ELEMENT_FOUND_TEXT_1", name);
        case kEndTag:
            m_pos += 2;
            Fail(tagStart, "XML_EXPECTED_ELEMENT_FOUND_END_1_2", name, ReadName());
        default:
            break;
        }
        ++m_pos;
        std::string_view const found = ReadName();
        if (!name.empty() && found != name)
            Fail(tagStart, "XML_EXPECTED_ELEMENT_FOUND_1_2", name, found);
        if (foundName)
            *foundName = found;
        return ReadAttributes(tagStart, false, attributes, scratch);
    }

    /// ReadElementStart: the start tag of `name` (empty: any), its attributes into `list`
    /// when given; then the offset moves and a self-closing element is remembered.
    void ReadElement(std::string_view name, OVXmlAttributeList* list) {
        CheckNotInsideEmpty(name);
        SkipMisc(true);
        std::uint32_t tagStart = 0;
        std::string_view found;
        bool const empty =
            ReadStartTag(name, m_stream.m_tagAttributes, m_stream.m_tagValues, tagStart, &found);
        if (list)
            m_stream.FillAttributeList(*this, *list, found, m_sourceName, tagStart);
        Commit();
        m_stream.m_pendingEmpty = empty;
        if (empty)
            streams::AssignExact(m_stream.m_pendingName, found);
    }

    /// Reads "</name>" at the cursor, after markup was skipped.
    void ReadEndTag(std::string_view name) {
        std::uint32_t const start = m_pos;
        switch (Peek()) {
        case kEnd:
            Fail(m_pos, "XML_EXPECTED_END_AT_END_1", name);
        case kText:
            Fail(m_pos, "XML_EXPECTED_END_FOUND_TEXT_1", name);
        case kStartTag:
            ++m_pos;
            Fail(start, "XML_EXPECTED_END_FOUND_ELEMENT_1_2", name, ReadName());
        default:
            break;
        }
        m_pos += 2;
        std::string_view const found = ReadName();
        if (found != name)
            Fail(start, "XML_MISMATCHED_END_1_2", name, found);
        SkipSpace();
        if (At(m_pos) == '\0')
            Fail(start, "XML_END_IN_TAG");
        if (At(m_pos) != '>')
            Fail(m_pos, "XML_UNEXPECTED_IN_TAG_1", CharText(At(m_pos)));
        ++m_pos;
    }

    /// Reads text, references, CDATA sections and comments up to the next other markup or the
    /// end. `out` is a view of the text when it needed no decoding, else of `scratch`.
    void ReadContent(std::string& scratch, std::string_view& out) {
        std::uint32_t const start = m_pos;
        std::uint32_t segment = m_pos;
        bool decoded = false;
        auto flush = [&] {
            if (!decoded) {
                decoded = true;
                scratch.clear();
            }
            scratch.append(m_text + segment, m_pos - segment);
        };
        for (;;) {
            char const c = At(m_pos);
            if (c == '\0')
                break;
            if (c == '&') {
                flush();
                ReadReference(scratch);
                segment = m_pos;
            } else if (c != '<') {
                ++m_pos;
            } else if (StartsWith("<![CDATA[")) {
                flush();
                std::uint32_t const open = m_pos;
                m_pos += 9;
                segment = m_pos;
                while (!(At(m_pos) == ']' && StartsWith("]]>"))) {
                    if (At(m_pos) == '\0')
                        Fail(open, "XML_END_IN_CDATA");
                    ++m_pos;
                }
                flush();
                m_pos += 3;
                segment = m_pos;
            } else if (StartsWith("<!--") || StartsWith("<?")) {
                flush();
                if (At(m_pos + 1) == '!')
                    SkipComment();
                else
                    SkipInstruction();
                segment = m_pos;
            } else {
                break;
            }
        }
        if (decoded) {
            flush();
            out = scratch;
        } else {
            out = View(start, m_pos - start);
        }
    }

    /// The name of the start tag that comes next, markup skipped, into `name`; false inside
    /// a self-closing element or when something else comes next. Nothing is committed.
    bool PeekStartTagName(std::string_view& name) {
        if (m_stream.m_pendingEmpty)
            return false;
        SkipMisc(true);
        if (Peek() != kStartTag)
            return false;
        Skip(1);
        name = ReadName();
        return true;
    }

    /// Inside an element read as self-closing nothing but its end may be read.
    void CheckNotInsideEmpty(std::string_view name) const {
        if (m_stream.m_pendingEmpty)
            Fail(m_pos, "XML_INSIDE_EMPTY_ELEMENT_1_2", m_stream.m_pendingName.GetBufferReadPtr(),
                 name);
    }

    /// Reads the value element `name` (empty: the text up to the next markup) into `out`,
    /// a view of the text or of `storage`; `at` receives where the value's text begins.
    void ReadValue(std::string_view name, std::string_view& out, std::string& storage,
                   std::uint32_t& at) {
        if (name.empty()) {
            at = m_pos;
            if (!m_stream.m_pendingEmpty)
                ReadContent(storage, out);
            return;
        }
        CheckNotInsideEmpty(name);
        SkipMisc(true);
        std::uint32_t tagStart = 0;
        bool const empty =
            ReadStartTag(name, m_stream.m_tagAttributes, m_stream.m_tagValues, tagStart);
        at = m_pos;
        if (empty)
            return;
        ReadContent(storage, out);
        if (At(m_pos) == '\0')
            Fail(tagStart, "XML_END_IN_ELEMENT_1", name);
        if (Peek() == kStartTag) {
            std::uint32_t const childStart = m_pos++;
            Fail(childStart, "XML_ELEMENT_IN_VALUE_1_2", name, ReadName());
        }
        ReadEndTag(name);
    }

    /// Reads the value element `name` and hands its text, with where it starts and the name as
    /// UTF-8, to `use`; the offset moves past the element only when `use` returns.
    template <class Use> void ReadValueText(char const* name, Use use) {
        streams::Utf8Name const utf8(name, false);
        std::string storage;
        std::string_view text;
        std::uint32_t at = 0;
        ReadValue(utf8.view, text, storage, at);
        use(text, at, utf8.view);
        Commit();
    }

    template <class T, class Parse> T ReadTyped(char const* name, Parse parse, char const* key) {
        T value{};
        ReadValueText(name, [&](std::string_view text, std::uint32_t at, std::string_view utf8) {
            if (!parse(text, value))
                Fail(at, key, text, utf8);
        });
        return value;
    }

private:
    OVXmlMemoryStream& m_stream;
    char const* m_text;
    std::uint32_t m_size;
    std::uint32_t m_pos;
    char const* m_sourceName;
    char const* m_description;
};

// ---- Locations. --------------------------------------------------------------------------

void OVXmlMemoryStream::Locate(std::uint32_t offset, unsigned int& line,
                               unsigned int& column) const {
    if (offset > m_size)
        offset = m_size;
    if (offset < m_linesAt && offset >= m_lineStart) {
        // Back on the line already counted to (a tag's start after its attributes).
        line = m_lines + 1;
        column = offset - m_lineStart + 1;
        return;
    }
    if (offset < m_linesAt)
        ForgetLines();
    // Forward from where the last count stopped, so reading a document counts each byte once:
    // the line feeds, then the carriage returns that no line feed follows.
    auto const* const text = reinterpret_cast<char const*>(m_buffer);
    for (char const* p = text + m_linesAt;;) {
        auto const* lf =
            static_cast<char const*>(std::memchr(p, '\n', std::size_t(text + offset - p)));
        if (!lf)
            break;
        ++m_lines;
        m_lineStart = static_cast<std::uint32_t>(lf + 1 - text);
        p = lf + 1;
    }
    for (char const* p = text + m_linesAt;;) {
        auto const* cr =
            static_cast<char const*>(std::memchr(p, '\r', std::size_t(text + offset - p)));
        if (!cr)
            break;
        auto const next = static_cast<std::uint32_t>(cr + 1 - text);
        if (next >= m_size || text[next] != '\n') {
            ++m_lines;
            m_lineStart = next > m_lineStart ? next : m_lineStart;
        }
        p = cr + 1;
    }
    m_linesAt = offset;
    line = m_lines + 1;
    column = offset - m_lineStart + 1;
}

unsigned int OVXmlMemoryStream::GetNumLinesSoFar() const {
    unsigned int line = 0, column = 0;
    Locate(m_offset, line, column);
    return line - 1;
}

void OVXmlMemoryStream::SetSourceNameForErrors(char const* sourceName) {
    m_sourceName = sourceName ? sourceName : "";
}

void OVXmlMemoryStream::ThrowFileFormatErrorWithLocationInfo(std::uint32_t offset,
                                                             String const& problem) const {
    unsigned int line = 0, column = 0;
    Locate(offset, line, column);
    streams::ThrowXmlFormatError(0, problem, m_sourceName.GetBufferReadPtr(), line, column);
}

// ---- The protected scanners. -------------------------------------------------------------

void OVXmlMemoryStream::MoveOffsetToNextNonWhitespaceCharacterAndNonComment(
    bool skipProcessingInstructions) {
    Reader reader(*this);
    reader.SkipMisc(skipProcessingInstructions);
    reader.Commit();
}

void OVXmlMemoryStream::MovePastExpectedString(char const* expected) {
    Reader reader(*this);
    std::string_view const text(expected ? expected : "");
    if (!reader.StartsWith(text))
        reader.Fail(reader.Position(), "XML_EXPECTED_TEXT_1", text);
    SetOffset(reader.Position() + static_cast<std::uint32_t>(text.size()));
}

void OVXmlMemoryStream::ReadStringToChar(char terminator, DynamicString& value) {
    Reader reader(*this);
    std::string scratch;
    std::uint32_t const start = reader.Position();
    std::uint32_t segment = start;
    for (char c; (c = reader.At(reader.Position())) != terminator || c == '\0';) {
        if (c == '\0')
            reader.Fail(start, "XML_EXPECTED_TEXT_1", std::string_view(&terminator, 1));
        if (c == '<')
            reader.Fail(reader.Position(), "XML_UNEXPECTED_MARKUP");
        if (c == '&') {
            scratch.append(reader.View(segment, reader.Position() - segment));
            reader.ReadReference(scratch);
            segment = reader.Position();
        } else {
            reader.Skip(1);
        }
    }
    scratch.append(reader.View(segment, reader.Position() - segment));
    streams::AssignExact(value, scratch);
    reader.Commit();
}

// ---- Elements. ---------------------------------------------------------------------------

/// Refills `list` in place with the attributes just read, with their places, reusing the
/// buffers of the attributes it held.
void OVXmlMemoryStream::FillAttributeList(Reader const& reader, OVXmlAttributeList& list,
                                          std::string_view element, char const* sourceName,
                                          std::uint32_t tagStart) const {
    if (!sourceName)
        sourceName = m_sourceName.GetBufferReadPtr();
    std::string_view const source(sourceName);
    auto const setSource = [source](DynamicString& name) {
        if (ViewOf(name) != source)
            name = source.data();
    };
    list.m_count = 0;
    list.m_next = 0;
    list.m_errorCode = 0;
    Locate(tagStart, list.m_line, list.m_column); // in the text's order: bytes counted once
    streams::AssignExact(list.m_elementName, element);
    setSource(list.m_sourceName);
    for (TagAttribute const& read : m_tagAttributes) {
        if (list.m_count == list.m_attributes.size())
            list.m_attributes.emplace_back();
        OVXmlAttribute& attribute = list.m_attributes[list.m_count++];
        std::string_view const name = reader.View(read.nameAt, read.nameLength);
        if (ViewOf(attribute.m_tagName) != name) // mostly the name of the last tag's
            streams::AssignExact(attribute.m_tagName, name);
        streams::AssignExact(attribute.m_value, reader.ValueOf(read, m_tagValues));
        Locate(read.nameAt, attribute.m_line, attribute.m_column);
        attribute.m_errorCode = 0;
        setSource(attribute.m_sourceName);
    }
}

void OVXmlMemoryStream::ReadElementStart(char const* name, bool nameIsUtf8) {
    streams::Utf8Name const utf8(name, nameIsUtf8);
    Reader(*this).ReadElement(utf8.view, nullptr);
}

void OVXmlMemoryStream::ReadElementStart(char const* name, OVXmlAttributeList& attributes,
                                         bool nameIsUtf8, char const* sourceName,
                                         char const* description) {
    streams::Utf8Name const utf8(name, nameIsUtf8);
    Reader(*this, sourceName, description).ReadElement(utf8.view, &attributes);
}

void OVXmlMemoryStream::ReadElementEnd(char const* name, bool nameIsUtf8) {
    streams::Utf8Name const utf8(name, nameIsUtf8);
    Reader reader(*this);
    if (m_pendingEmpty) {
        std::string_view const pending(m_pendingName.GetBufferReadPtr(),
                                       static_cast<std::size_t>(m_pendingName.GetNumBytes()));
        if (pending != utf8.view)
            reader.Fail(reader.Position(), "XML_MISMATCHED_END_1_2", utf8.view, pending);
        m_pendingEmpty = false;
        return;
    }
    reader.SkipMisc(true);
    reader.ReadEndTag(utf8.view);
    reader.Commit();
}

bool OVXmlMemoryStream::IsNextElement(char const* name) {
    streams::Utf8Name const utf8(name, false);
    std::string_view found;
    return Reader(*this).PeekStartTagName(found) && found == utf8.view;
}

bool OVXmlMemoryStream::GetNextElementName(DynamicString& name, bool nameAsUtf8) {
    std::string_view found;
    if (!Reader(*this).PeekStartTagName(found))
        return false;
    if (nameAsUtf8)
        streams::AssignExact(name, found);
    else
        streams::AssignFromUtf8(name, found);
    return true;
}

bool OVXmlMemoryStream::ReadProcessingInstructionIfAny(DynamicString& target,
                                                       OVXmlAttributeList& attributes) {
    if (m_pendingEmpty)
        return false;
    Reader reader(*this);
    reader.SkipMisc(false);
    if (reader.Peek() != Reader::kInstruction)
        return false;
    std::uint32_t const start = reader.Position();
    reader.Skip(2);
    std::string_view const found = reader.ReadName();
    reader.ReadAttributes(start, true, m_tagAttributes, m_tagValues);
    FillAttributeList(reader, attributes, found, nullptr, start);
    streams::AssignFromUtf8(target, found);
    reader.Commit();
    return true;
}

// ---- Values. -----------------------------------------------------------------------------

void OVXmlMemoryStream::ReadXml(char const* name, DynamicString& value) {
    Reader(*this).ReadValueText(name, [&](std::string_view text, std::uint32_t, std::string_view) {
        streams::AssignExact(value, text);
    });
}

void OVXmlMemoryStream::ReadString(char const* name, DynamicString& value) {
    Reader(*this).ReadValueText(name, [&](std::string_view text, std::uint32_t, std::string_view) {
        streams::AssignFromUtf8(value, text);
    });
}

int OVXmlMemoryStream::ReadInt(char const* name) {
    return Reader(*this).ReadTyped<int>(name, streams::ParseXmlInt, streams::kNotInteger);
}

unsigned int OVXmlMemoryStream::ReadUInt(char const* name) {
    return Reader(*this).ReadTyped<unsigned int>(name, streams::ParseXmlUInt, streams::kNotInteger);
}

std::int64_t OVXmlMemoryStream::ReadInt64(char const* name) {
    return Reader(*this).ReadTyped<std::int64_t>(name, streams::ParseXmlInt64,
                                                 streams::kNotInteger);
}

std::uint64_t OVXmlMemoryStream::ReadUInt64(char const* name) {
    return Reader(*this).ReadTyped<std::uint64_t>(name, streams::ParseXmlUInt64,
                                                  streams::kNotInteger);
}

double OVXmlMemoryStream::ReadDouble(char const* name) {
    return Reader(*this).ReadTyped<double>(name, streams::ParseXmlDouble, streams::kNotNumber);
}

bool OVXmlMemoryStream::ReadBool(char const* name) {
    return Reader(*this).ReadTyped<bool>(name, streams::ParseXmlBool, streams::kNotBool);
}

} // namespace tekit
