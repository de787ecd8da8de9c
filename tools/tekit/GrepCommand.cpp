// tekit grep: the lines of files that the library's pattern engine finds a pattern in, printed
// as grep prints them.
//
//   tekit grep -n 'ERROR {[0-9]+}' station.log      ->  12:ERROR 17 in step 3
//   tekit grep --explain '{ab}+|c'
#include "Arguments.h"
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/RString.h"
#include "tekit/toolbox/RegExpr.h"

#include <algorithm>
#include <charconv>
#include <filesystem>
#include <fstream>
#include <iostream>
#include <iterator>
#include <sstream>

namespace tekit::tool {

namespace {

char const kGrepDetails[] =
    R"(Prints the lines of each FILE (standard input without files, or for "-") in which the
library's pattern engine finds PATTERN, as "file:line:text" like grep: the file name when
there are several files or -r, the line number with -n. Lines end at CR, LF, CR LF or LF CR.
The pattern dialect: {} group, | or, * + ? repetition, . any character, ^ $ line start and
end, [a-z] a set, [~a-z] its complement, \t tab, \xHH a byte, \ before any other character
makes it literal; ( and ) are ordinary characters. A pattern error prints the message with
a caret under the offending character.

Options:
  -i              Let letters match either case
  -n              Show line numbers (from 1)
  -c              Show only the number of matching lines of each file
  -l              Show only the names of files with a match
  -r              Search the files under each directory FILE
  --backward      Search from the end toward the start: matching lines in reverse order
  --from OFFSET   Start searching at byte OFFSET of each file (backward: at most OFFSET)
  --explain       Show how the pattern is read, element by element, and search nothing
  --json          Print JSON: an array of {"file", "line", "text"} ({"file", "count"} with -c)
  -h, --help      Print this help

Examples:
  tekit grep -n 'ERROR {[0-9]+}' station.log
  tekit grep -r -l -i 'todo' src
  tekit grep --explain '^{ab|c}+\x41'

Exit status:
  0  a line matched (with --explain: the pattern is valid)
  1  no line matched
  2  the command line or the pattern was wrong, or a file could not be read
)";

struct Settings {
    std::string pattern;
    bool json = false;
    bool ignoreCase = false, numbers = false, count = false, names = false, recursive = false;
    bool backward = false, showFile = false;
    long long from = -1; // -1: the start (forward) or end (backward)
};

/// A text's lines as [start, end) byte spans; a break is CR, LF, CR LF or LF CR.
std::vector<std::pair<size_t, size_t>> Lines(std::string const& text) {
    std::vector<std::pair<size_t, size_t>> lines;
    size_t start = 0;
    for (size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\r' && text[i] != '\n')
            continue;
        lines.emplace_back(start, i);
        bool const pair = i + 1 < text.size() && (text[i + 1] == '\r' || text[i + 1] == '\n') &&
                          text[i + 1] != text[i];
        i += pair ? 1 : 0;
        start = i + 1;
    }
    if (start < text.size())
        lines.emplace_back(start, text.size());
    return lines;
}

struct Status {
    int code = 0;
    char bad = 0;
};

Status Compile(std::string const& pattern) {
    Status status;
    int found = 0;
    status.code = RegExpr_FindPatternInText(pattern.c_str(), 1, "x", 1, 0, 1, REGEXPR_MATCH_FIRST,
                                            &found, nullptr, nullptr, &status.bad);
    return status;
}

/// Where the error of `pattern` lies: the last character of its shortest prefix that fails in
/// the same way (the engine reports the character, not its place).
size_t ErrorPosition(std::string const& pattern, Status const& error) {
    for (size_t n = 1; n <= pattern.size(); ++n) {
        Status const prefix = Compile(pattern.substr(0, n));
        if (prefix.code == error.code && prefix.bad == error.bad)
            return n - 1;
    }
    return pattern.size();
}

/// The message of a pattern error, the pattern, and a caret under the offending character.
int PatternError(std::string const& pattern, Status const& error) {
    int takesArgument = 0;
    char const* key = RegExpr_GetOVErrorDescTag(error.code, &takesArgument);
    DynamicString message(static_cast<char const*>(RString("CRX_TOOLERR", key)), true);
    if (takesArgument)
        message.Format(std::string(1, error.bad).c_str(), 1);
    std::cerr << "tekit: pattern error: " << Shown(message.GetBufferReadPtr()) << "\n  "
              << Shown(pattern) << "\n  " << std::string(ErrorPosition(pattern, error), ' ')
              << "^\n";
    return kUsageError;
}

/// Prints the matching lines of `text` (with --json, adds them to `records`); the number of
/// them.
int SearchText(Settings const& s, std::string const& name, std::string const& text,
               std::vector<Record>& records) {
    auto const lines = Lines(text);
    if (lines.empty())
        return 0;
    std::string const prefix = s.showFile ? name + ":" : "";
    long long offset = s.from >= 0 ? s.from : s.backward ? (long long)text.size() : 0;
    int matches = 0;
    while (offset >= 0 && offset <= (long long)text.size()) {
        int found = 0, position = -1;
        RegExpr_FindPatternInText(s.pattern.c_str(), s.ignoreCase ? 0 : 1, text.data(),
                                  int(text.size()), int(offset), s.backward ? 0 : 1,
                                  REGEXPR_MATCH_FIRST, &found, &position, nullptr, nullptr);
        if (!found)
            break;
        auto const line = std::upper_bound(lines.begin(), lines.end(),
                                           std::make_pair(size_t(position), ~size_t(0))) -
                          1;
        ++matches;
        long long const number = line - lines.begin() + 1;
        std::string const lineText = text.substr(line->first, line->second - line->first);
        if (s.json && !s.count && !s.names)
            records.push_back(
                Record().AddText("file", name).AddNumber("line", number).AddText("text", lineText));
        else if (!s.count && !s.names)
            std::cout << prefix << (s.numbers ? std::to_string(number) + ":" : "") << lineText
                      << '\n';
        if (s.names)
            break;
        // On to the next line, or back to the break that ends the line before.
        offset = s.backward ? (line == lines.begin() ? -1 : (long long)(line - 1)->second)
                 : line + 1 == lines.end() ? -1
                                           : (long long)(line + 1)->first;
    }
    if (s.json && (s.count || (s.names && matches)))
        records.push_back(s.count ? Record().AddText("file", name).AddNumber("count", matches)
                                  : Record().AddText("file", name));
    else if (s.count)
        std::cout << prefix << matches << '\n';
    else if (s.names && matches)
        std::cout << name << '\n';
    return matches;
}

bool ReadFile(std::string const& name, std::string& text) {
    if (name == "-") {
        text.assign(std::istreambuf_iterator<char>(std::cin), {});
        return true;
    }
    std::ifstream in(name, std::ios::binary);
    if (!in)
        return false;
    text.assign(std::istreambuf_iterator<char>(in), {});
    return !in.bad();
}

/// The files to search: each argument, and with -r the files under a directory (sorted).
std::vector<std::string> Expand(std::vector<std::string> const& arguments, bool recursive) {
    std::vector<std::string> files;
    for (std::string const& argument : arguments) {
        std::error_code error;
        if (!recursive || argument == "-" || !std::filesystem::is_directory(argument, error)) {
            files.push_back(argument);
            continue;
        }
        std::vector<std::string> found;
        for (auto const& entry : std::filesystem::recursive_directory_iterator(argument, error))
            if (entry.is_regular_file(error))
                found.push_back(entry.path().generic_string());
        std::sort(found.begin(), found.end());
        files.insert(files.end(), found.begin(), found.end());
    }
    return files;
}

// ---- --explain -------------------------------------------------------------------------------

/// The byte an escape at `p` (after its backslash) stands for, `p` moved past it.
std::string Escaped(std::string const& pattern, size_t& i) {
    char const c = pattern[i++];
    if (c == 't')
        return "tab";
    if (c == 'x') {
        std::string const hex = pattern.substr(i, 2);
        i += 2;
        return "the byte 0x" + hex;
    }
    return Quote(std::string(1, c));
}

/// One element of the pattern at `i`: its text and what it means.
std::pair<std::string, std::string> Element(std::string const& pattern, size_t& i) {
    size_t const start = i;
    char const c = pattern[i++];
    auto const shown = [&] { return pattern.substr(start, i - start); };
    switch (c) {
    case '{':
        return {"{", "group start"};
    case '}':
        return {"}", "group end"};
    case '|':
        return {"|", "or"};
    case '*':
        return {"*", "the item before, any number of times"};
    case '+':
        return {"+", "the item before, once or more"};
    case '?':
        return {"?", "the item before, or nothing"};
    case '.':
        return {".", "any character"};
    case '^':
        return {"^", "the start of a line"};
    case '$':
        return {"$", "the end of a line"};
    case '\\': {
        std::string const meaning = Escaped(pattern, i);
        return {shown(), meaning};
    }
    case '[': {
        bool const complement = i < pattern.size() && pattern[i] == '~';
        while (i < pattern.size() && pattern[i] != ']')
            i += pattern[i] == '\\' ? 2 : 1;
        ++i;
        std::string const set = shown();
        return {set, std::string(complement ? "one character not in " : "one character in ") +
                         set.substr(complement ? 2 : 1, set.size() - (complement ? 3 : 2))};
    }
    default:
        return {shown(), "the character " + Quote(shown())};
    }
}

int Explain(Settings const& s) {
    std::vector<std::vector<std::string>> rows;
    for (size_t i = 0; i < s.pattern.size();) {
        auto const [text, meaning] = Element(s.pattern, i);
        rows.push_back({Shown(text), meaning});
    }
    std::cout << Shown(s.pattern) << (s.ignoreCase ? "  (letters in either case)" : "") << '\n';
    PrintTable(std::cout, rows, 2);
    return kSuccess;
}

// ---- The command -----------------------------------------------------------------------------

Settings Read(Invocation const& call) {
    if (call.arguments.empty())
        throw UsageError("no PATTERN given", "grep");
    Settings s;
    s.pattern = call.arguments[0];
    s.json = call.json;
    s.ignoreCase = call.Has("-i");
    s.numbers = call.Has("-n");
    s.count = call.Has("-c");
    s.names = call.Has("-l");
    s.recursive = call.Has("-r");
    s.backward = call.Has("--backward");
    if (auto const from = call.options.find("--from"); from != call.options.end()) {
        std::string const& text = from->second;
        auto const parsed = std::from_chars(text.data(), text.data() + text.size(), s.from);
        if (parsed.ec != std::errc() || parsed.ptr != text.data() + text.size() || s.from < 0 ||
            s.from > 0x7FFFFFFF)
            throw UsageError("--from needs a byte offset of at least 0, not " + Quote(Shown(text)),
                             "grep");
    }
    return s;
}

int RunGrep(Invocation const& call) {
    Settings s = Read(call);
    if (Status const status = Compile(s.pattern); status.code < 0)
        return PatternError(s.pattern, status);
    if (call.Has("--explain"))
        return Explain(s);
    std::vector<std::string> arguments(call.arguments.begin() + 1, call.arguments.end());
    if (arguments.empty())
        arguments.push_back("-");
    std::vector<std::string> const files = Expand(arguments, s.recursive);
    s.showFile = files.size() > 1 || s.recursive;
    int matches = 0;
    bool trouble = false;
    std::vector<Record> records;
    for (std::string const& file : files) {
        std::string text;
        if (!ReadFile(file, text)) {
            std::cerr << "tekit: " << Quote(Shown(file)) << ": cannot read it\n";
            trouble = true;
            continue;
        }
        matches += SearchText(s, file == "-" ? "<stdin>" : file, text, records);
    }
    if (s.json)
        PrintRecords(std::cout, records, true);
    return trouble ? kUsageError : matches ? kSuccess : kFailure;
}

} // namespace

std::vector<Command> const& GrepCommands() {
    static std::vector<Command> const commands{
        {"grep",
         "Print the lines that match a pattern of the library's dialect",
         "tekit grep [-i] [-n] [-c] [-l] [-r] [--backward] [--from OFFSET] PATTERN [FILE...]\n"
         "       tekit grep [-i] --explain PATTERN",
         kGrepDetails,
         {{"-i", nullptr},
          {"-n", nullptr},
          {"-c", nullptr},
          {"-l", nullptr},
          {"-r", nullptr},
          {"--backward", nullptr},
          {"--from", "OFFSET"},
          {"--explain", nullptr}},
         RunGrep},
    };
    return commands;
}

} // namespace tekit::tool
