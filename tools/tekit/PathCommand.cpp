// tekit path check|split|collapse|abbreviate|longpath: the path rules applied to texts given on
// the command line or read from standard input.
//
//   tekit path check "C:\data\*.ini" --wildcards
//   tekit path split "\\srv\share\dir\report.final.ini"
//   tekit path abbreviate --max 20 "C:\first\a\b\c\file.txt"
#include "Arguments.h"
#include "Commands.h"
#include "Input.h"
#include "Output.h"

#include "tekit/errors/TEException.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cstring>
#include <iostream>
#include <optional>

namespace tekit::tool {

namespace {

// ---- Help texts ---------------------------------------------------------------------------

char const kGroupDetails[] =
    R"(The path rules are the product's Windows path rules, applied as text on every platform: a
path is a drive path (C:\dir\file.txt), a network path (\\server\share\file.txt) or a
relative path (dir\file.txt); C:dir is read as C:\dir. Every command takes several paths;
"-" reads them from standard input, one per line. A command other than check refuses a path
that is not valid, with the reason on standard error.

Examples:
  tekit path check 'C:\data\report.ini' 'C:\a\\b'
  tekit path split '\\lab-server\seq\main.seq'
  printf 'C:\\a\\..\\b.txt\n' | tekit path collapse -

Exit status:
  0  success
  1  a path is not valid, or the command could not do its work on one (why: on standard error)
  2  the command line was wrong
)";

char const kCheckDetails[] =
    R"(Prints "PATH: valid" or "PATH: <why not>" for each path. A path that is not valid because
of a character names the first character the rules forbid (< > | : / \ " carriage return,
line feed; * and ? outside the last level or without --wildcards). Control characters such
as tab are allowed by the rules but not in Windows file names: a note on standard error says
so. Control characters are shown as <0x09>.

Options:
  --wildcards  Allow * and ? in the last level (C:\data\*.ini)
  --json       Print JSON: an array of {"path", "valid", "message"} objects
  -h, --help   Print this help

Examples:
  tekit path check 'C:\data\report.ini' 'C:\a\\b'
  tekit path check --wildcards 'C:\data\*.ini'
  tekit path check - < paths.txt

Exit status:
  0  every path is valid
  1  a path is not valid
  2  the command line was wrong
)";

char const kSplitDetails[] =
    R"(Shows each path's root, number of levels, directory, file name, base name and extension.
Wildcards are allowed in the last level.

Options:
  --json      Print JSON: an array with one object per path
  -h, --help  Print this help

Examples:
  tekit path split 'C:\data\report.final.ini'
  tekit path split --json '\\srv\share\dir\file.txt'

Exit status:
  0  every path was split
  1  a path is not valid (why: on standard error)
  2  the command line was wrong
)";

char const kCollapseDetails[] =
    R"(Drops "." levels and resolves each ".." against the level before it. On an absolute path
a ".." at the root has nothing to remove: it is dropped when something else changes, and
the path is left as it is otherwise (C:\..\x stays). On a relative path a ".." that rises
above its start cannot be resolved: the path rules keep it as a level, which a later ".."
removes, so the result is not the same place; the result is printed and a warning goes to
standard error. A path with wildcards is not valid here.

Options:
  --json      Print JSON: an array of {"path", "collapsed", "resolved"} objects
  -h, --help  Print this help

Examples:
  tekit path collapse 'C:\a\b\..\c\.\d.txt'
  tekit path collapse --json 'a\..\..\b'

Exit status:
  0  every path was collapsed and fully resolved
  1  a path is not valid, or a ".." could not be resolved (why: on standard error)
  2  the command line was wrong
)";

char const kAbbreviateDetails[] =
    R"(Shortens each path for display to at most N characters. A path of N characters or fewer is
shown whole. A longer one keeps its root and file name and replaces middle levels with "...",
keeping as many leading levels as fit: C:\first\...\file.txt. This short form is only used
when the root, "...\" and the file name together take fewer than N characters (one to spare);
otherwise the file name alone is shown. When nothing fits - the file name alone is longer
than N, or the path has no file name - the file name is printed anyway and the command
exits 1.

Options:
  --max N     Most characters to show, at least 1 (required)
  --json      Print JSON: an array of {"path", "max", "abbreviated", "fits"} objects
  -h, --help  Print this help

Examples:
  tekit path abbreviate --max 20 'C:\first\a\b\c\file.txt'
  tekit path abbreviate --max 30 - < paths.txt

Exit status:
  0  every path fits in N characters
  1  a path is not valid, or does not fit (why: on standard error)
  2  the command line was wrong, or N is not a whole number of at least 1
)";

char const kLongPathDetails[] =
    R"(Shows the form that the system's long-path calls take: \\?\C:\dir\file.txt for a drive
path, \\?\UNC\server\share\file.txt for a network path. Only a valid absolute path can be
converted: a relative path, an empty one and one that already has the \\?\ prefix are
refused.

Options:
  --json      Print JSON: an array of {"path", "longPath"} objects
  -h, --help  Print this help

Examples:
  tekit path longpath 'C:\data\file.txt'
  tekit path longpath '\\srv\share\f.txt'

Exit status:
  0  every path was converted
  1  a path is not valid, not absolute, or already converted (why: on standard error)
  2  the command line was wrong
)";

// ---- Shared --------------------------------------------------------------------------------

std::string TextOf(String const& text) {
    return text.GetBufferReadPtr();
}

/// The path rules' verdict on `text`, as the path object built from it sees it.
struct Verdict {
    bool valid;
    std::string message;
};

Verdict Check(std::string const& text, bool wildcards) {
    DynamicString message;
    bool const valid = DynamicPath(text.c_str()).IsValid(wildcards, &message);
    std::string joined = TextOf(message);
    std::replace(joined.begin(), joined.end(), '\n', ' '); // one line per path
    return {valid, joined};
}

/// The first byte of `text` that the path rules forbid, with its position (0-based).
std::optional<size_t> FirstForbidden(std::string const& text, bool wildcards) {
    size_t const lastSeparator = text.rfind('\\');
    bool const drive =
        text.size() >= 2 && std::isalpha(static_cast<unsigned char>(text[0])) && text[1] == ':';
    for (size_t i = drive ? 2 : 0; i < text.size(); ++i) {
        char const c = text[i];
        bool const inLastLevel = lastSeparator == std::string::npos || i > lastSeparator;
        if ((c != '\0' && std::strchr("<>|:/\"\r\n", c)) ||
            ((c == '*' || c == '?') && !(wildcards && inLastLevel)))
            return i;
    }
    return std::nullopt;
}

/// The first control byte of `text`: allowed by the path rules, refused by Windows.
std::optional<size_t> FirstControl(std::string const& text) {
    for (size_t i = 0; i < text.size(); ++i)
        if (static_cast<unsigned char>(text[i]) < 0x20 || text[i] == 0x7F)
            return i;
    return std::nullopt;
}

std::string Named(std::string const& text) {
    return Quote(Shown(text));
}

/// Why `text` is refused before the path rules run, or "".
using Refusal = std::string (*)(std::string const& text);

/// Runs `each` on every input that is a valid path; reports the others. Status 1 when any
/// input was refused or `each` reported a finding.
template <typename Each>
int ForEachValidPath(Invocation const& call, char const* command, bool wildcards, Each each,
                     Refusal refusal = nullptr) {
    if (call.arguments.empty())
        throw UsageError("no PATH given (\"-\" reads paths from standard input)", command);
    Findings findings;
    for (InputItem const& item : CollectInputs(call.arguments)) {
        std::string const refused = refusal ? refusal(item.text) : "";
        Verdict const verdict = Check(item.text, wildcards);
        if (!refused.empty())
            findings.Report(item, refused);
        else if (!verdict.valid)
            findings.Report(item, Named(item.text) + " is not a valid path: " + verdict.message);
        if (!refused.empty() || !verdict.valid)
            continue;
        try {
            each(item, findings);
        } catch (TEException const& e) {
            findings.Report(item, Named(item.text) + ": " + e.GetDescription());
        }
    }
    return findings.Status();
}

// ---- Commands ------------------------------------------------------------------------------

/// The verdict as "valid" or the rules' message, naming the character at fault when there is
/// one; `found` gets that character's name.
std::string CheckMessage(std::string const& text, Verdict const& verdict, bool wildcards,
                         std::string& found) {
    if (verdict.valid)
        return "valid";
    std::optional<size_t> const at = FirstForbidden(text, wildcards);
    if (!at)
        return verdict.message;
    found = CharacterName(static_cast<unsigned char>(text[*at]));
    return verdict.message + " Found " + found + " at character " + std::to_string(*at + 1) + ".";
}

/// A control byte is no finding of the rules, but it will trouble the file system.
void NoteControlCharacter(InputItem const& item) {
    if (std::optional<size_t> const at = FirstControl(item.text))
        std::cerr << "tekit: " << item.Location() << "note: " << Named(item.text) << " holds "
                  << CharacterName(static_cast<unsigned char>(item.text[*at]))
                  << ": the path rules allow it, Windows file names do not\n";
}

int RunCheck(Invocation const& call) {
    if (call.arguments.empty())
        throw UsageError("no PATH given (\"-\" reads paths from standard input)", "path check");
    bool const wildcards = call.Has("--wildcards");
    std::vector<InputItem> const items = CollectInputs(call.arguments);
    std::vector<Record> records;
    size_t invalid = 0;
    for (InputItem const& item : items) {
        Verdict const verdict = Check(item.text, wildcards);
        std::string found;
        std::string const message = CheckMessage(item.text, verdict, wildcards, found);
        invalid += verdict.valid ? 0 : 1;
        if (verdict.valid)
            NoteControlCharacter(item);
        if (!call.json)
            std::cout << (item.text.empty() ? "\"\"" : Shown(item.text)) << ": " << message << '\n';
        Record record;
        record.AddText("path", item.text).AddBool("valid", verdict.valid);
        record.AddText("message", verdict.message);
        if (!found.empty())
            record.AddText("found", found);
        records.push_back(record);
    }
    if (call.json)
        PrintRecords(std::cout, records, true);
    if (invalid)
        throw ToolError(std::to_string(invalid) + " of " + std::to_string(items.size()) +
                        (items.size() == 1 ? " path" : " paths") + (invalid == 1 ? " is" : " are") +
                        " not valid");
    return kSuccess;
}

int RunSplit(Invocation const& call) {
    std::vector<Record> records;
    int const status =
        ForEachValidPath(call, "path split", true, [&](InputItem const& item, Findings&) {
            DynamicPath const path(item.text.c_str());
            DynamicString directory, fileName, baseName, extension;
            path.GetDirectoryPathName(directory);
            path.GetFileName(fileName);
            path.GetBaseName(baseName);
            path.GetExtension(extension);
            Record record;
            record.AddText("path", path.CStr())
                .AddText("root", path.GetRootDir().CStr())
                .AddNumber("levels", path.GetNumLevels())
                .AddText("directory", TextOf(directory))
                .AddText("fileName", TextOf(fileName))
                .AddText("baseName", TextOf(baseName))
                .AddText("extension", TextOf(extension));
            records.push_back(record);
        });
    PrintRecords(std::cout, records, call.json);
    return status;
}

int RunCollapse(Invocation const& call) {
    std::vector<Record> records;
    int const status =
        ForEachValidPath(call, "path collapse", false, [&](InputItem const& item, Findings& found) {
            DynamicPath path(item.text.c_str());
            bool const resolved = path.CollapseDots();
            if (!call.json)
                std::cout << Shown(path.CStr()) << '\n';
            records.push_back(Record()
                                  .AddText("path", item.text)
                                  .AddText("collapsed", path.CStr())
                                  .AddBool("resolved", resolved));
            if (!resolved)
                found.Report(item,
                             Named(item.text) +
                                 ": a \"..\" rises above the start of this relative path, so " +
                                 Named(path.CStr()) + " is not a resolved form of it");
        });
    if (call.json)
        PrintRecords(std::cout, records, true);
    return status;
}

/// --max: a whole number of at least 1.
int MaxChars(Invocation const& call) {
    auto const option = call.options.find("--max");
    if (option == call.options.end())
        throw UsageError("--max N is required", "path abbreviate");
    std::string const& text = option->second;
    int value = 0;
    auto const parsed = std::from_chars(text.data(), text.data() + text.size(), value);
    if (parsed.ec != std::errc() || parsed.ptr != text.data() + text.size() || value < 1)
        throw UsageError("--max needs a whole number of at least 1, not " + Named(text),
                         "path abbreviate");
    return value;
}

int RunAbbreviate(Invocation const& call) {
    int const maxChars = MaxChars(call);
    std::vector<Record> records;
    int const status = ForEachValidPath(
        call, "path abbreviate", true, [&](InputItem const& item, Findings& found) {
            DynamicString shortened;
            DynamicPath(item.text.c_str()).GetAbbreviatedName(maxChars, shortened);
            std::string const result = TextOf(shortened);
            bool const fits = !result.empty() && result.size() <= size_t(maxChars);
            if (!call.json)
                std::cout << Shown(result) << '\n';
            records.push_back(Record()
                                  .AddText("path", item.text)
                                  .AddNumber("max", maxChars)
                                  .AddText("abbreviated", result)
                                  .AddBool("fits", fits));
            if (!fits)
                found.Report(item, Named(item.text) + " does not fit in " +
                                       std::to_string(maxChars) + " characters: " +
                                       (result.empty() ? "it has no file name to show"
                                                       : "its file name alone has " +
                                                             std::to_string(result.size())));
        });
    if (call.json)
        PrintRecords(std::cout, records, true);
    return status;
}

/// The rules would call the "?" of a converted path a bad server name: say what it is.
std::string LongPathRefusal(std::string const& text) {
    return text.rfind("\\\\?\\", 0) == 0 ? Named(text) + " already has the long-path prefix \\\\?\\"
                                         : "";
}

int RunLongPath(Invocation const& call) {
    std::vector<Record> records;
    auto const convert = [&](InputItem const& item, Findings& found) {
        DynamicPath const path(item.text.c_str());
        if (!path.IsAbsolute()) {
            found.Report(item, Named(item.text) +
                                   " is not absolute: long-path calls take a drive path "
                                   "(C:\\...) or a network path (\\\\server\\share\\...)");
            return;
        }
        DynamicString converted;
        PathBase::ConvertForLongPathCalls(path.GetString(), converted);
        if (!call.json)
            std::cout << Shown(TextOf(converted)) << '\n';
        records.push_back(
            Record().AddText("path", item.text).AddText("longPath", TextOf(converted)));
    };
    int const status = ForEachValidPath(call, "path longpath", true, convert, LongPathRefusal);
    if (call.json)
        PrintRecords(std::cout, records, true);
    return status;
}

} // namespace

CommandGroup const& PathGroup() {
    static CommandGroup const group{"path", "Check, split, collapse and shorten Windows paths",
                                    kGroupDetails};
    return group;
}

std::vector<Command> const& PathCommands() {
    static std::vector<Command> const commands{
        {"path check",
         "Tell whether each path is valid, or why it is not",
         "tekit path check [--wildcards] [--json] PATH... | -",
         kCheckDetails,
         {{"--wildcards", nullptr}},
         RunCheck},
        {"path split",
         "Show each path's root, levels, directory and file name",
         "tekit path split [--json] PATH... | -",
         kSplitDetails,
         {},
         RunSplit},
        {"path collapse",
         "Remove . levels and resolve .. levels",
         "tekit path collapse [--json] PATH... | -",
         kCollapseDetails,
         {},
         RunCollapse},
        {"path abbreviate",
         "Shorten each path with ... for display",
         "tekit path abbreviate --max N [--json] PATH... | -",
         kAbbreviateDetails,
         {{"--max", "N"}},
         RunAbbreviate},
        {"path longpath",
         "Show the form for the system's long-path calls",
         "tekit path longpath [--json] PATH... | -",
         kLongPathDetails,
         {},
         RunLongPath},
    };
    return commands;
}

} // namespace tekit::tool
