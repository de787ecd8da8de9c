// tekit strings check: a strings file (a translation of the message tables) read as the library
// loads it and compared with the built-in English catalogue.
//
//   tekit strings check German/tekit.strings.ini
//   tekit strings check --partial --json - < site.strings.ini
#include "Arguments.h"
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/RString.h"
#include "tekit/ini/StringsFile.h"
#include "tekit/paths/Path.h"
#include "tekit/strings/StringVector.h"

#include <cctype>
#include <iostream>
#include <iterator>
#include <set>
#include <string>
#include <utility>
#include <vector>

#if defined(_WIN32)
#include <fcntl.h>
#include <io.h>
#endif

namespace tekit::tool {

namespace {

char const kGroupDetails[] =
    R"(A strings file translates the library's message tables: an INI file in UTF-8 whose
sections are the tables' sections ("TE_ERRORS", "ERR_DESCR", ...), whose tags are the keys
and whose values are the texts, with the INI escapes:

  [ERR_DESCR]
  CANT_FIND_FILE = Die Datei '%1' wurde nicht gefunden.

Examples:
  tekit strings check tekit.strings.ini

Exit status:
  0  the file is clean
  1  a problem was found, or the file could not be read
  2  the command line was wrong
)";

char const kCheckDetails[] =
    R"(Reads FILE ("-": standard input) as the library loads a strings file and compares it with
the built-in English catalogue. A file the library refuses (a line that is not UTF-8, a line
the INI reader would ignore, a key given twice, ...) is reported as "FILE:LINE: problem" and
nothing else is checked. Otherwise one line is printed for each finding:

  FILE:LINE: [SECTION] KEY: not a key of the built-in message table
  FILE:LINE: [SECTION] KEY: the placeholders (%1) differ from the English text's (%1 %2)
  FILE: [SECTION] KEY: missing

Placeholders are the numbered %1, %2, ... that messages are filled in with; a translation
must have each one as often as the English text has it. In JSON, the "line" of a missing key
is null.

Options:
  --partial   The file rewords some texts only: missing keys are no finding
  --json      Print JSON: an array of {"file", "line", "section", "key", "problem"}
  -h, --help  Print this help

Examples:
  tekit strings check /opt/tekit/lib/language/German/tekit.strings.ini
  tekit strings check --partial --json - < site.strings.ini

Exit status:
  0  the file is clean
  1  a finding, or the file could not be read or was refused
  2  the command line was wrong
)";

struct Finding {
    int line = 0; // 0: a missing key
    std::string section;
    std::string key;
    std::string problem;
};

/// The numbered placeholders of `text` ("%12" is 12), sorted, each as often as it appears.
std::multiset<std::string> Placeholders(std::string const& text) {
    std::multiset<std::string> found;
    for (size_t i = 0; i + 1 < text.size(); ++i) {
        if (text[i] != '%' || !std::isdigit(static_cast<unsigned char>(text[i + 1])))
            continue;
        size_t end = i + 1;
        while (end < text.size() && std::isdigit(static_cast<unsigned char>(text[end])))
            ++end;
        found.insert(text.substr(i, end - i));
        i = end - 1;
    }
    return found;
}

std::string Listed(std::multiset<std::string> const& placeholders) {
    std::string text;
    for (std::string const& p : placeholders)
        text += (text.empty() ? "" : " ") + p;
    return text.empty() ? "none" : text;
}

std::vector<Finding> Check(StringsFile const& file, bool partial) {
    std::vector<Finding> findings;
    std::set<std::pair<std::string, std::string>> given;
    for (int i = 0; i < file.GetNumRows(); ++i) {
        Finding f{file.GetLine(i), file.GetSection(i), file.GetKey(i), ""};
        given.insert({f.section, f.key});
        bool found = false;
        RString const english(f.section.c_str(), f.key.c_str(), nullptr, &found);
        if (!found) {
            f.problem = "not a key of the built-in message table";
        } else {
            auto const theirs = Placeholders(file.GetText(i));
            auto const ours = Placeholders(static_cast<char const*>(english));
            if (theirs != ours)
                f.problem = "the placeholders (" + Listed(theirs) +
                            ") differ from the English text's (" + Listed(ours) + ")";
        }
        if (!f.problem.empty())
            findings.push_back(f);
    }
    if (partial)
        return findings;
    StringVector sections;
    RString::GetSectionNames(sections);
    for (DynamicString const& section : sections) {
        StringVector keys;
        RString::GetSectionTags(section.GetBufferReadPtr(), keys);
        for (DynamicString const& key : keys)
            if (!given.count({section.GetBufferReadPtr(), key.GetBufferReadPtr()}))
                findings.push_back(
                    {0, section.GetBufferReadPtr(), key.GetBufferReadPtr(), "missing"});
    }
    return findings;
}

int RunCheck(Invocation const& call) {
    if (call.arguments.size() != 1)
        throw UsageError("strings check takes one FILE (" + std::to_string(call.arguments.size()) +
                             " given)",
                         "strings check");
    std::string const& argument = call.arguments[0];
    std::string const name = argument == "-" ? "<stdin>" : Shown(argument);
    StringsFile file; // a file the library refuses raises: main prints its "FILE:LINE: ..."
    if (argument == "-") {
#if defined(_WIN32)
        _setmode(_fileno(stdin), _O_BINARY);
#endif
        std::string const bytes(std::istreambuf_iterator<char>(std::cin), {});
        file.ReadText(name.c_str(), bytes.data(), bytes.size());
    } else {
        file.Read(Path(argument.c_str()));
    }
    std::vector<Finding> const findings = Check(file, call.Has("--partial"));
    std::vector<Record> records;
    for (Finding const& f : findings) {
        std::string const at = name + (f.line ? ":" + std::to_string(f.line) : "");
        if (!call.json) {
            std::cout << at << ": [" << Shown(f.section) << "] " << Shown(f.key) << ": "
                      << f.problem << '\n';
            continue;
        }
        Record record;
        record.AddText("file", name);
        if (f.line)
            record.AddNumber("line", f.line);
        else
            record.AddJson("line", "null", "");
        records.push_back(record.AddText("section", f.section)
                              .AddText("key", f.key)
                              .AddText("problem", f.problem));
    }
    if (call.json)
        PrintRecords(std::cout, records, true);
    if (findings.empty())
        return kSuccess;
    std::cerr << "tekit: " << name << ": " << findings.size()
              << (findings.size() == 1 ? " problem" : " problems") << '\n';
    return kFailure;
}

} // namespace

CommandGroup const& StringsGroup() {
    static CommandGroup const group{"strings", "Check translations of the message tables",
                                    kGroupDetails};
    return group;
}

std::vector<Command> const& StringsCommands() {
    static std::vector<Command> const commands{
        {"strings check",
         "Compare a strings file with the built-in English messages",
         "tekit strings check [--partial] [--json] FILE",
         kCheckDetails,
         {{"--partial", nullptr}},
         RunCheck},
    };
    return commands;
}

} // namespace tekit::tool
