// tekit version compare|check: Loomwire version text as the library reads and compares it,
// and its fixed threshold tests.
//
//   tekit version compare 17.0 17.0.0
//   tekit version check 13.0.1
#include "Arguments.h"
#include "Commands.h"
#include "Input.h"
#include "Output.h"

#include "tekit/environment/LWVersion.h"

#include <iostream>

namespace tekit::tool {

namespace {

char const kGroupDetails[] =
    R"(A version is text such as 21.0, 17.0.1 or 9.0.1f2: digits for the major, then optionally
".minor" and ".minor.patch"; anything after them is ignored and a missing part is 0. A version
that does not begin with a digit, or whose numbers do not fit in 32 bits, cannot be read.

Examples:
  tekit version compare 17.0 17.0.0
  tekit version check 13.0.1 14.1

Exit status:
  0  success
  1  a version could not be read (why: on standard error)
  2  the command line was wrong
)";

char const kCompareDetails[] =
    R"(Prints -1, 0 or 1 as A is lower than, equal to or higher than B: majors are compared,
then minors, then patches, as numbers (17.0 equals 17.0.0; 17.9 is lower than 17.10). When a
version cannot be read there is no result: nothing is printed and the reason goes to
standard error. "-" reads a version from standard input, one per line. JSON gives one object
{"a", "b", "majorOnly", "bothValid", "result"}, whose result is 0 when not both versions
could be read.

Options:
  --major     Compare the majors alone (18.5 equals 18.0.3)
  --json      Print JSON: one object with both versions and the result
  -h, --help  Print this help

Examples:
  tekit version compare 17.0 17.0.0
  tekit version compare --major 18.5 18.0.3

Exit status:
  0  both versions were read and compared
  1  a version could not be read (why: on standard error)
  2  the command line was wrong
)";

char const kCheckDetails[] =
    R"(Shows how each VERSION reads (major, minor, patch) and the answer of every fixed threshold
test for it. The tests look at single characters, not numbers, and keep their old rules:
only the first two characters tell the major (so 100.0 is not 11.0 or greater), and 13.1 is
not 13.0.1 or greater (nor 14.1 14.0.1 or greater). "-" reads versions from standard input,
one per line.

Options:
  --json      Print JSON: an array of {"version", "valid", "major", "minor", "patch", "tests"}
  -h, --help  Print this help

Examples:
  tekit version check 13.0.1
  tekit version check --json 9.0.1f2

Exit status:
  0  every version could be read
  1  a version could not be read (the tests are still shown; why: on standard error)
  2  the command line was wrong
)";

struct Threshold {
    char const* name;
    bool (*test)(char const*);
};

Threshold const kThresholds[] = {
    {"LWVersionIs80OrGreater", LWVersionIs80OrGreater},
    {"LWVersionIs90OrGreater", LWVersionIs90OrGreater},
    {"LWVersionIs90_1", LWVersionIs90_1},
    {"LWVersionIs90_1OrGreater", LWVersionIs90_1OrGreater},
    {"LWVersionIs100OrGreater", LWVersionIs100OrGreater},
    {"LWVersionIs110OrGreater", LWVersionIs110OrGreater},
    {"LWVersionIs120OrGreater", LWVersionIs120OrGreater},
    {"LWVersionIs130OrGreater", LWVersionIs130OrGreater},
    {"LWVersionIs130_1OrGreater", LWVersionIs130_1OrGreater},
    {"LWVersionIs140OrGreater", LWVersionIs140OrGreater},
    {"LWVersionIs140_1OrGreater", LWVersionIs140_1OrGreater},
    {"LWVersionIs170OrGreater", LWVersionIs170OrGreater},
    {"LWVersionIs180OrGreater", LWVersionIs180OrGreater},
    {"LWVersionIs190OrGreater", LWVersionIs190OrGreater},
    {"LWVersionIs200OrGreater", LWVersionIs200OrGreater},
    {"LWVersionIsMinimumVersionOrGreater", LWVersionIsMinimumVersionOrGreater},
};

/// Why `text` cannot be read as a version.
std::string Unreadable(std::string const& text) {
    bool const digitFirst = !text.empty() && text[0] >= '0' && text[0] <= '9';
    return Quote(Shown(text)) + " is not a version: " +
           (digitFirst ? "a number in it does not fit in 32 bits"
                       : "it does not begin with a digit (21.0, 17.0.1, 9.0.1f2)");
}

int RunCompare(Invocation const& call) {
    std::vector<InputItem> const items = CollectInputs(call.arguments);
    if (items.size() != 2)
        throw UsageError("compare takes two versions, A and B (" + std::to_string(items.size()) +
                             " given)",
                         "version compare");
    bool const majorOnly = call.Has("--major");
    bool bothValid = false;
    int const result =
        LWVersionCompare(items[0].text.c_str(), items[1].text.c_str(), bothValid, majorOnly);
    Findings findings;
    long major, minor, patch;
    for (InputItem const& item : items)
        if (!ParseLWVersionString(item.text.c_str(), major, minor, patch))
            findings.Report(item, Unreadable(item.text));
    if (call.json)
        std::cout << Record()
                         .AddText("a", items[0].text)
                         .AddText("b", items[1].text)
                         .AddBool("majorOnly", majorOnly)
                         .AddBool("bothValid", bothValid)
                         .AddNumber("result", result)
                         .ToJson()
                  << '\n';
    else if (bothValid)
        std::cout << result << '\n';
    return findings.Status();
}

int RunCheck(Invocation const& call) {
    if (call.arguments.empty())
        throw UsageError("no VERSION given (\"-\" reads versions from standard input)",
                         "version check");
    std::vector<Record> records;
    Findings findings;
    for (InputItem const& item : CollectInputs(call.arguments)) {
        char const* const text = item.text.c_str();
        long major, minor, patch;
        bool const valid = ParseLWVersionString(text, major, minor, patch);
        if (!valid)
            findings.Report(item, Unreadable(item.text));
        Record record, tests;
        record.AddText("version", item.text);
        if (call.json)
            record.AddBool("valid", valid);
        if (valid || call.json)
            record.AddNumber("major", major).AddNumber("minor", minor).AddNumber("patch", patch);
        else
            record.AddText("reads as", "not a version");
        for (Threshold const& threshold : kThresholds)
            (call.json ? tests : record).AddBool(threshold.name, threshold.test(text));
        if (call.json)
            record.AddJson("tests", tests.ToJson(), "");
        records.push_back(record);
    }
    PrintRecords(std::cout, records, call.json);
    return findings.Status();
}

} // namespace

CommandGroup const& VersionGroup() {
    static CommandGroup const group{"version", "Read, compare and test Loomwire versions",
                                    kGroupDetails};
    return group;
}

std::vector<Command> const& VersionCommands() {
    static std::vector<Command> const commands{
        {"version compare",
         "Compare two versions: -1, 0 or 1",
         "tekit version compare [--major] [--json] A B",
         kCompareDetails,
         {{"--major", nullptr}},
         RunCompare},
        {"version check",
         "Show how each version reads and every fixed threshold test",
         "tekit version check [--json] VERSION... | -",
         kCheckDetails,
         {},
         RunCheck},
    };
    return commands;
}

} // namespace tekit::tool
