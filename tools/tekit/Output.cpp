#include "Output.h"

#include <algorithm>
#include <cstdio>
#include <ostream>

namespace tekit::tool {

namespace {

/// Length of the valid UTF-8 sequence starting at `text[i]`, or 0 when it is not one
/// (overlong forms, surrogates and values above U+10FFFF are not valid).
size_t Utf8SequenceLength(std::string_view text, size_t i) {
    auto const byte = [&](size_t k) { return static_cast<unsigned char>(text[k]); };
    unsigned char const lead = byte(i);
    size_t length = 0;
    unsigned minimum = 0, value = 0;
    if (lead >= 0xC2 && lead <= 0xDF)
        length = 2, minimum = 0x80, value = lead & 0x1F;
    else if (lead >= 0xE0 && lead <= 0xEF)
        length = 3, minimum = 0x800, value = lead & 0x0F;
    else if (lead >= 0xF0 && lead <= 0xF4)
        length = 4, minimum = 0x10000, value = lead & 0x07;
    else
        return 0;
    if (i + length > text.size())
        return 0;
    for (size_t k = 1; k < length; ++k) {
        if ((byte(i + k) & 0xC0) != 0x80)
            return 0;
        value = (value << 6) | (byte(i + k) & 0x3F);
    }
    bool const surrogate = value >= 0xD800 && value <= 0xDFFF;
    return value < minimum || value > 0x10FFFF || surrogate ? 0 : length;
}

std::string EscapedByte(unsigned char byte) {
    char escape[8];
    std::snprintf(escape, sizeof escape, "\\u%04X", byte);
    return escape;
}

/// The escape for an ASCII byte, or nothing when it stands for itself.
char const* ShortEscape(char c) {
    switch (c) {
    case '"':
        return "\\\"";
    case '\\':
        return "\\\\";
    case '\b':
        return "\\b";
    case '\f':
        return "\\f";
    case '\n':
        return "\\n";
    case '\r':
        return "\\r";
    case '\t':
        return "\\t";
    default:
        return nullptr;
    }
}

} // namespace

std::string JsonQuote(std::string_view text) {
    std::string out = "\"";
    for (size_t i = 0; i < text.size();) {
        auto const byte = static_cast<unsigned char>(text[i]);
        if (byte >= 0x80) {
            size_t const length = Utf8SequenceLength(text, i);
            out += length ? std::string(text.substr(i, length)) : EscapedByte(byte);
            i += length ? length : 1;
            continue;
        }
        if (char const* escape = ShortEscape(text[i]))
            out += escape;
        else if (byte < 0x20 || byte == 0x7F)
            out += EscapedByte(byte);
        else
            out += text[i];
        ++i;
    }
    return out + "\"";
}

std::string HexCode(std::uint32_t value) {
    char text[16];
    std::snprintf(text, sizeof text, "0x%08X", static_cast<unsigned>(value));
    return text;
}

std::string Shown(std::string_view text) {
    std::string out;
    for (char const c : text) {
        auto const byte = static_cast<unsigned char>(c);
        out += byte < 0x20 || byte == 0x7F ? "<" + HexCode(byte).replace(2, 6, "") + ">"
                                           : std::string(1, c);
    }
    return out;
}

std::string CharacterName(unsigned char byte) {
    static char const* const kNames[] = {"tab", "line feed", "vertical tab", "form feed",
                                         "carriage return"};
    std::string const code = HexCode(byte).replace(2, 6, "");
    if (byte >= 0x09 && byte <= 0x0D)
        return std::string(kNames[byte - 0x09]) + " (" + code + ")";
    if (byte < 0x20 || byte == 0x7F)
        return "control character " + code;
    return "\"" + std::string(1, static_cast<char>(byte)) + "\" (" + code + ")";
}

Record& Record::AddText(std::string name, std::string_view text) {
    m_fields.push_back({std::move(name), Shown(text), JsonQuote(text)});
    return *this;
}

Record& Record::AddNumber(std::string name, long long value) {
    std::string const text = std::to_string(value);
    m_fields.push_back({std::move(name), text, text});
    return *this;
}

Record& Record::AddBool(std::string name, bool value) {
    m_fields.push_back({std::move(name), value ? "yes" : "no", value ? "true" : "false"});
    return *this;
}

Record& Record::AddJson(std::string name, std::string json, std::string text) {
    m_fields.push_back({std::move(name), std::move(text), std::move(json)});
    return *this;
}

std::string Record::ToJson() const {
    std::string out = "{";
    for (size_t i = 0; i < m_fields.size(); ++i)
        out += (i ? ", " : "") + JsonQuote(m_fields[i].name) + ": " + m_fields[i].json;
    return out + "}";
}

void Record::PrintText(std::ostream& out, int indent) const {
    std::vector<std::vector<std::string>> rows;
    for (Field const& field : m_fields)
        rows.push_back({field.name, field.text});
    PrintTable(out, rows, indent);
}

std::string JsonArray(std::vector<std::string> const& elements) {
    if (elements.empty())
        return "[]";
    std::string out = "[\n";
    for (size_t i = 0; i < elements.size(); ++i)
        out += "  " + elements[i] + (i + 1 < elements.size() ? ",\n" : "\n");
    return out + "]";
}

void PrintRecords(std::ostream& out, std::vector<Record> const& records, bool json) {
    if (json) {
        std::vector<std::string> elements;
        for (Record const& record : records)
            elements.push_back(record.ToJson());
        out << JsonArray(elements) << '\n';
        return;
    }
    for (size_t i = 0; i < records.size(); ++i) {
        out << (i ? "\n" : "");
        records[i].PrintText(out);
    }
}

void PrintTable(std::ostream& out, std::vector<std::vector<std::string>> const& rows, int indent) {
    std::vector<size_t> widths;
    for (auto const& row : rows)
        for (size_t column = 0; column < row.size(); ++column) {
            widths.resize(std::max(widths.size(), column + 1));
            widths[column] = std::max(widths[column], row[column].size());
        }
    std::string const margin(static_cast<size_t>(std::max(indent, 0)), ' ');
    for (auto const& row : rows) {
        std::string line = margin;
        for (size_t column = 0; column < row.size(); ++column) {
            line += row[column];
            if (column + 1 < row.size())
                line += std::string(widths[column] - row[column].size() + 2, ' ');
        }
        line.erase(line.find_last_not_of(' ') + 1); // an empty last cell leaves no blanks
        out << line << '\n';
    }
}

} // namespace tekit::tool
