// tekit range: reads range lists ("1-3, 7-") as the library does and shows their normalised
// text, size and first values in iteration order.
//
//   tekit range '1-3, 7-'
//   tekit range --limit 5 --json '9-0'
#include "Arguments.h"
#include "Commands.h"
#include "Input.h"
#include "Output.h"

#include "tekit/errors/TEException.h"
#include "tekit/toolbox/SimpleIntRangeList.h"

#include <charconv>
#include <iostream>

namespace tekit::tool {

namespace {

char const kRangeDetails[] =
    R"(Reads each TEXT as a range list: comma-separated elements, each a value (3), a range upward
or downward (0-5, 5-0) or, as the last element only, an open-ended range (7-: 7 upward).
White space may stand around values and blank elements are skipped; a text without elements
is everything (0-). Values run from 0 to 2147483645. Shows the list's normalised text (which
reads back to the same list), its number of values, whether a value appears in two elements,
and its first values in iteration order. "-" reads range lists from standard input, one per
line. A text that is not a range list gets the library's message on standard error. JSON
gives an array of {"input", "valid", "text", "size", "openEnded", "duplicates", "values",
"more"} objects, {"input", "valid", "message"} for a text that is not valid; "size" is -1
for an open-ended list.

Options:
  --limit N   Show at most N values (default 20; 0 shows none)
  --json      Print JSON: an array with one object per range list
  -h, --help  Print this help

Examples:
  tekit range '1-3, 7-'
  tekit range --limit 5 '9-0'
  tekit range --json '0-3,2'

Exit status:
  0  every range list is valid
  2  the command line was wrong, or a range list is not valid (why: on standard error)
)";

constexpr int kDefaultLimit = 20;

/// --limit: a whole number of at least 0.
int Limit(Invocation const& call) {
    auto const option = call.options.find("--limit");
    if (option == call.options.end())
        return kDefaultLimit;
    std::string const& text = option->second;
    int value = 0;
    auto const parsed = std::from_chars(text.data(), text.data() + text.size(), value);
    if (parsed.ec != std::errc() || parsed.ptr != text.data() + text.size() || value < 0)
        throw UsageError("--limit needs a whole number of at least 0, not " + Quote(Shown(text)),
                         "range");
    return value;
}

/// The number of values, summed wide: a list may hold more than a 32-bit size counts.
long long SizeOf(SimpleIntRangeList const& list) {
    if (list.IsOpenEnded())
        return -1;
    long long size = 0;
    for (int i = 0; i < list.GetNumRanges(); ++i)
        size += list.GetRange(i).GetSize();
    return size;
}

Record Describe(InputItem const& item, SimpleIntRangeList& list, int limit, bool json) {
    std::string values, valuesJson;
    int shown = 0;
    for (list.Reset(); !list.IsDone() && shown < limit; ++list, ++shown) {
        std::string const value = std::to_string(list.Value());
        values += (shown ? " " : "") + value;
        valuesJson += (shown ? ", " : "") + value;
    }
    bool const more = !list.IsDone();
    long long const size = SizeOf(list);
    Record record;
    record.AddText("input", item.text);
    if (json)
        record.AddBool("valid", true);
    record.AddText("text", list.ToString().GetBufferReadPtr());
    if (json)
        record.AddNumber("size", size).AddBool("openEnded", size < 0);
    else
        record.AddText("size", size < 0 ? "open-ended" : std::to_string(size));
    record.AddBool("duplicates", list.ContainsDuplicates());
    if (json)
        record.AddJson("values", "[" + valuesJson + "]", "").AddBool("more", more);
    else if (limit > 0)
        record.AddText("values", values + (more ? " ..." : ""));
    return record;
}

int RunRange(Invocation const& call) {
    if (call.arguments.empty())
        throw UsageError("no TEXT given (\"-\" reads range lists from standard input)", "range");
    int const limit = Limit(call);
    std::vector<Record> records;
    int invalid = 0;
    for (InputItem const& item : CollectInputs(call.arguments)) {
        SimpleIntRangeList list;
        try {
            list.Parse(DynamicString(item.text.c_str()));
        } catch (TEException const& e) {
            std::cerr << "tekit: " << item.Location() << Shown(e.GetDescription()) << '\n';
            ++invalid;
            if (call.json)
                records.push_back(Record()
                                      .AddText("input", item.text)
                                      .AddBool("valid", false)
                                      .AddText("message", e.GetDescription()));
            continue;
        }
        records.push_back(Describe(item, list, limit, call.json));
    }
    PrintRecords(std::cout, records, call.json);
    return invalid ? kUsageError : kSuccess;
}

} // namespace

std::vector<Command> const& RangeCommands() {
    static std::vector<Command> const commands{
        {"range",
         "Check range lists such as 1-3,7- and show their values",
         "tekit range [--limit N] [--json] TEXT... | -",
         kRangeDetails,
         {{"--limit", "N"}},
         RunRange},
    };
    return commands;
}

} // namespace tekit::tool
