// tekit error CODE..., tekit error --all: the error table with each code's message.
#include "Arguments.h"
#include "Commands.h"
#include "Input.h"
#include "Output.h"

#include "tekit/errors/TEError.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cstdint>
#include <iostream>
#include <optional>

namespace tekit::tool {

namespace {

char const kDetails[] =
    R"(A CODE is a TEError symbol (TE_FILE_NOT_FOUND), a TEError code (-17208, or 0xFFFFBCC8 as
32 bits), or a system error code that the library converts to a TEError, as it does for
errors from the system: a Win32 error number (5, 0x70) or an HRESULT (0x80070005, also
written -2147024891). Numbers may carry a sign and may be hexadecimal (0x...). A symbol that
is not in the table gets the nearest symbols as suggestions. "-" reads codes from standard
input, one per line.

Options:
  --all       List the whole error table (158 codes)
  --json      Print JSON: an array with one object per code
  -h, --help  Print this help

Examples:
  tekit error -17208 TE_ACCESS_DENIED
  tekit error 0x80070005
  tekit error --all --json

Exit status:
  0  every code was found
  1  a code is neither in the table nor converted by the library (why: on standard error)
  2  the command line was wrong
)";

/// A row of the table that an input names; `systemCode` when it was converted to get there.
struct Lookup {
    TEError code{};
    std::optional<std::uint32_t> systemCode;
    std::string problem; // why there is no row; empty when found
};

std::string Upper(std::string text) {
    for (char& c : text)
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    return text;
}

size_t EditDistance(std::string const& a, std::string const& b) {
    std::vector<size_t> row(b.size() + 1);
    for (size_t j = 0; j <= b.size(); ++j)
        row[j] = j;
    for (size_t i = 1; i <= a.size(); ++i) {
        size_t diagonal = row[0];
        row[0] = i;
        for (size_t j = 1; j <= b.size(); ++j) {
            size_t const substitution = diagonal + (a[i - 1] == b[j - 1] ? 0 : 1);
            diagonal = row[j];
            row[j] = std::min({row[j] + 1, row[j - 1] + 1, substitution});
        }
    }
    return row[b.size()];
}

/// "; did you mean TE_A or TE_B?" for the symbols nearest to `text` (ignoring case, and with
/// "TE_" added when it was left out), or "" when none is near.
std::string Suggestions(std::string const& text) {
    std::string const upper = Upper(text);
    size_t best = std::max<size_t>(2, upper.size() / 6) + 1;
    std::vector<std::string> nearest;
    for (TEErrorInfo const* row = GetTEErrorTable(); row->symbol; ++row) {
        size_t distance = EditDistance(upper, row->symbol);
        if (upper.rfind("TE_", 0) != 0)
            distance = std::min(distance, EditDistance("TE_" + upper, row->symbol));
        if (distance < best)
            best = distance, nearest.clear();
        if (distance == best && nearest.size() < 3)
            nearest.push_back(row->symbol);
    }
    std::string out;
    for (size_t i = 0; i < nearest.size(); ++i)
        out += (i == 0 ? "; did you mean " : i + 1 < nearest.size() ? ", " : " or ") + nearest[i];
    return out.empty() ? out : out + "?";
}

bool IsCode(long long value) {
    return value >= INT32_MIN && value <= INT32_MAX &&
           *TEErrorToStringSymbol(static_cast<TEError>(value)) != '\0';
}

/// A signed decimal or hexadecimal number of up to 32 bits; nothing when `text` is none.
std::optional<long long> ParseNumber(std::string const& text) {
    size_t i = text[0] == '+' || text[0] == '-' ? 1 : 0;
    int base = 10;
    if (text.size() > i + 2 && text[i] == '0' && (text[i + 1] == 'x' || text[i + 1] == 'X'))
        base = 16, i += 2;
    unsigned long long magnitude = 0;
    char const* const end = text.data() + text.size();
    auto const parsed = std::from_chars(text.data() + i, end, magnitude, base);
    bool const negative = text[0] == '-';
    if (i >= text.size() || parsed.ec != std::errc() || parsed.ptr != end ||
        magnitude > (negative ? 0x80000000ull : 0xFFFFFFFFull))
        return std::nullopt;
    return negative ? -static_cast<long long>(magnitude) : static_cast<long long>(magnitude);
}

Lookup LookUpNumber(std::string const& text) {
    std::optional<long long> const value = ParseNumber(text);
    if (!value)
        return {{}, {}, Quote(text) + " is no 32-bit number, decimal or hexadecimal (0x...)"};
    if (*value == 0)
        return {{}, {}, "0 means success: it is no error code"};
    auto const bits = static_cast<std::uint32_t>(*value);
    if (IsCode(static_cast<std::int32_t>(bits)))
        return {static_cast<TEError>(static_cast<std::int32_t>(bits)), {}, {}};
    TEError const converted = SystemErrorCodeToTEError(bits, TEError{});
    if (converted != TEError{})
        return {converted, bits, {}};
    std::string problem =
        text + " is neither a TEError code nor a system error code that the library converts";
    if (*value > 0 && IsCode(-*value))
        problem += "; did you mean -" + std::to_string(*value) + " (" +
                   TEErrorToStringSymbol(static_cast<TEError>(-*value)) + ")?";
    return {{}, {}, problem};
}

Lookup LookUp(std::string const& text) {
    if (text.empty())
        return {{}, {}, "an empty line names no code"};
    if (std::string("+-0123456789").find(text[0]) != std::string::npos)
        return LookUpNumber(text);
    bool found = false;
    TEError const code = TEErrorFromStringSymbol(text.c_str(), &found);
    if (found)
        return {code, {}, {}};
    return {{}, {}, "unknown error symbol " + Quote(Shown(text)) + Suggestions(text)};
}

Record DescribeCode(Lookup const& lookup) {
    RString const message = TEErrorToRString(lookup.code, nullptr, nullptr);
    Record record;
    if (lookup.systemCode)
        record.AddText("systemCode", HexCode(*lookup.systemCode));
    record.AddNumber("code", lookup.code)
        .AddText("symbol", TEErrorToStringSymbol(lookup.code))
        .AddText("comCode", HexCode(GetWinErrorCode(lookup.code)))
        .AddText("message", static_cast<char const*>(message));
    return record;
}

void PrintAll(bool json) {
    std::vector<Record> records;
    std::vector<std::vector<std::string>> rows{{"CODE", "COM CODE", "SYMBOL", "MESSAGE"}};
    for (TEErrorInfo const* row = GetTEErrorTable(); row->symbol; ++row) {
        Record const record = DescribeCode({row->code, {}, {}});
        json ? records.push_back(record) : void();
        RString const message = TEErrorToRString(row->code, nullptr, nullptr);
        rows.push_back({std::to_string(row->code), HexCode(row->comCode), row->symbol,
                        static_cast<char const*>(message)});
    }
    if (json)
        PrintRecords(std::cout, records, true);
    else
        PrintTable(std::cout, rows);
}

/// Trims the blanks around a code read from a line.
std::string Trimmed(std::string const& text) {
    size_t const first = text.find_first_not_of(" \t");
    return first == std::string::npos
               ? ""
               : text.substr(first, text.find_last_not_of(" \t") + 1 - first);
}

int RunError(Invocation const& call) {
    bool const all = call.Has("--all");
    if (all && !call.arguments.empty())
        throw UsageError("--all lists every code: give no CODE with it", "error");
    if (all) {
        PrintAll(call.json);
        return kSuccess;
    }
    if (call.arguments.empty())
        throw UsageError("no CODE given (or --all)", "error");
    Findings findings;
    std::vector<Record> records;
    for (InputItem const& item : CollectInputs(call.arguments)) {
        Lookup const lookup = LookUp(item.line ? Trimmed(item.text) : item.text);
        if (lookup.problem.empty())
            records.push_back(DescribeCode(lookup));
        else
            findings.Report(item, lookup.problem);
    }
    PrintRecords(std::cout, records, call.json);
    return findings.Status();
}

} // namespace

std::vector<Command> const& ErrorCommands() {
    static std::vector<Command> const commands{
        {"error",
         "Show error codes: symbol, COM code and message",
         "tekit error [--json] CODE... | -\n       tekit error [--json] --all",
         kDetails,
         {{"--all", nullptr}},
         RunError},
    };
    return commands;
}

} // namespace tekit::tool
