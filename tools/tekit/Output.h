// Output helpers shared by the tool's commands: every command prints either readable text or
// JSON, from the same values.
//
//   Record r;
//   r.AddNumber("code", -17208).AddText("symbol", "TE_FILE_NOT_FOUND");
//   json ? std::cout << r.ToJson() << '\n' : r.PrintText(std::cout);
#pragma once

#include <cstdint>
#include <iosfwd>
#include <string>
#include <string_view>
#include <vector>

namespace tekit::tool {

/// `text` as a JSON string, quotes included. Valid UTF-8 passes through; a byte that is not
/// part of a valid UTF-8 sequence (library text is in the ANSI code page) is written as
/// \u00XX, its Latin-1 reading, so the output is always valid JSON.
std::string JsonQuote(std::string_view text);

/// A 32-bit code as eight upper-case hex digits: "0x80004005", "0x00000002".
std::string HexCode(std::uint32_t value);

/// `text` for a terminal: each control byte (0x00-0x1F, 0x7F) written as <0x0A>, so a path
/// that holds one stays on its own line and the byte can be seen. '<' is no path character.
std::string Shown(std::string_view text);

/// A byte's name for messages: "line feed (0x0A)", "tab (0x09)", "\"<\" (0x3C)".
std::string CharacterName(unsigned char byte);

/// Named values in a fixed order, printed as aligned "name  value" lines or as a JSON object.
class Record {
public:
    /// Text values are Shown() in text output and JSON-quoted in JSON.
    Record& AddText(std::string name, std::string_view text);
    Record& AddNumber(std::string name, long long value);
    Record& AddBool(std::string name, bool value);
    /// A value that is already JSON (an object or array), shown as `text` in text output.
    Record& AddJson(std::string name, std::string json, std::string text);

    /// One line: {"name": value, ...}.
    std::string ToJson() const;
    void PrintText(std::ostream& out, int indent = 0) const;

private:
    struct Field {
        std::string name;
        std::string text;
        std::string json;
    };
    std::vector<Field> m_fields;
};

/// JSON array of already-formatted elements, one element per line.
std::string JsonArray(std::vector<std::string> const& elements);

/// One record per input: as text, records separated by a blank line; as JSON, one array
/// (also for a single record, so a script sees the same shape whatever the input count).
void PrintRecords(std::ostream& out, std::vector<Record> const& records, bool json);

/// Rows of cells in left-aligned columns separated by two spaces; the last column is not
/// padded, so no line ends in blanks.
void PrintTable(std::ostream& out, std::vector<std::vector<std::string>> const& rows,
                int indent = 0);

} // namespace tekit::tool
