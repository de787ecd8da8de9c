// tekit demo: a short tour of what the library does, each result computed as it is shown.
#include "Arguments.h"
#include "Commands.h"
#include "Output.h"

#include "tekit/errors/Raise.h"
#include "tekit/errors/TEError.h"
#include "tekit/errors/TEException.h"
#include "tekit/paths/Path.h"
#include "tekit/strings/BufferString.h"
#include "tekit/strings/CopyOnWriteMemory.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/MultiByte.h"
#include "tekit/strings/StaticString.h"

#include <algorithm>
#include <iostream>

namespace tekit::tool {

namespace {

struct Step {
    std::string action;
    std::string result;
};

struct Section {
    std::string title;
    std::vector<Step> steps;
};

std::string Quoted(String const& text) {
    return "\"" + std::string(text.GetBufferReadPtr()) + "\"";
}

std::string References(DynamicString const& text) {
    int const count = text.GetCopyOnWriteMemory()->GetRefCount();
    return std::to_string(count) + (count == 1 ? " reference" : " references");
}

std::string YesNo(bool value) {
    return value ? "yes" : "no";
}

/// The bytes of `text` in hex: double-byte text shown without depending on the terminal.
std::string HexBytes(String const& text) {
    std::string out;
    for (char const* p = text.GetBufferReadPtr(); *p; ++p)
        out += (out.empty() ? "" : " ") + HexCode(static_cast<unsigned char>(*p)).substr(8);
    return out;
}

Section CopyOnWrite() {
    Section section{"Strings: copy-on-write sharing", {}};
    DynamicString a("Numeric Limit Test");
    section.steps.push_back({"DynamicString a(\"Numeric Limit Test\")", References(a)});
    DynamicString b = a;
    bool const sameBytes = a.GetBufferReadPtr() == b.GetBufferReadPtr();
    section.steps.push_back({"DynamicString b = a",
                             "one block, " + References(a) + ", same bytes: " + YesNo(sameBytes)});
    b += " #2";
    section.steps.push_back({"b += \" #2\"", "b copied its block before writing: a = " + Quoted(a) +
                                                 " (" + References(a) + "), b = " + Quoted(b) +
                                                 " (" + References(b) + ")"});
    DynamicString empty;
    bool const sharedEmpty = empty.GetCopyOnWriteMemory() == String::EmptyStrCOWM();
    section.steps.push_back(
        {"DynamicString empty", "uses the shared empty block: " + YesNo(sharedEmpty)});
    return section;
}

Section Truncation() {
    Section section{"Strings: fixed-size text is cut, never overflowed", {}};
    DynamicString text("Measure the supply voltage ");
    text.Repeat(4);
    StaticString<64> label = text;
    section.steps.push_back(
        {"StaticString<64> = a " + std::to_string(text.GetNumChars()) + "-character text",
         "keeps " + std::to_string(label.GetNumChars()) + ": " + Quoted(label)});
    char buffer[16];
    BufferString inBuffer(buffer, static_cast<int>(sizeof buffer));
    inBuffer = "0123456789ABCDEFGHIJ";
    section.steps.push_back(
        {"BufferString over char[16] = \"0123456789ABCDEFGHIJ\"",
         "keeps " + std::to_string(inBuffer.GetNumChars()) + ": " + Quoted(inBuffer)});
    return section;
}

Section MultiByte() {
    Section section{"Strings: multibyte mode with code page 932 (Shift-JIS)", {}};
    unsigned const previousPage = GetMultiByteCodePage();
    bool const previousMode = String::IsMultiByteSupportEnabled();
    SetMultiByteCodePage(932);
    String::EnableMultiByteSupport(true);

    DynamicString text("Nihon \x93\xFA\x96\x7B"); // "Nihon " and two double-byte characters
    section.steps.push_back(
        {"\"Nihon \" + 93 FA 96 7B", std::to_string(text.GetNumBytes()) + " bytes, " +
                                         std::to_string(text.GetNumChars()) + " characters"});
    text.Reverse();
    section.steps.push_back({"Reverse()", HexBytes(text) + " (double-byte characters stay whole)"});
    std::string const source = std::string(63, 'a') + "\x93\xFA";
    StaticString<64> cut = source.c_str();
    section.steps.push_back({"StaticString<64> = 63 x 'a' + 93 FA",
                             "keeps " + std::to_string(cut.GetNumBytes()) +
                                 " bytes: the character at byte 63 is dropped, not split"});

    String::EnableMultiByteSupport(previousMode);
    SetMultiByteCodePage(previousPage);
    return section;
}

Section RaiseAndCatch() {
    Section section{"Errors: a raised and caught TEException", {}};
    try {
        TE_RAISE(TE_FILE_NOT_FOUND, "Could not open \"station.ini\".",
                 "DemoCommand::RaiseAndCatch");
    } catch (TEException const& e) {
        section.steps.push_back(
            {"TE_RAISE(TE_FILE_NOT_FOUND, ...)",
             std::to_string(e.GetErrorCode()) + " " + TEErrorToStringSymbol(e.GetErrorCode())});
        section.steps.push_back(
            {"GetDescription()", std::string("\"") + e.GetDescription() + "\""});
        section.steps.push_back({"GetFunctionName()", std::string(e.GetFunctionName())});
        section.steps.push_back(
            {"GetFileName(), GetLine()",
             std::string(e.GetFileName()) + ", line " + std::to_string(e.GetLine())});
    }
    try {
        ThrowTEError(TE_DISK_FULL);
    } catch (TEException const& e) {
        section.steps.push_back(
            {"ThrowTEError(TE_DISK_FULL)",
             "description is the code's message: \"" + std::string(e.GetDescription()) + "\""});
    }
    return section;
}

Section MessageLookup() {
    Section section{"Errors: symbols, messages and COM codes", {}};
    section.steps.push_back(
        {"TEErrorToStringSymbol(-17208)", TEErrorToStringSymbol(TEError(-17208))});
    bool found = false;
    RString const known = TEErrorToRString(TE_OUT_OF_MEMORY, nullptr, &found);
    section.steps.push_back(
        {"TEErrorToRString(TE_OUT_OF_MEMORY)",
         std::string("\"") + static_cast<char const*>(known) + "\", found: " + YesNo(found)});
    RString const unknown = TEErrorToRString(TEError(-1), nullptr, &found);
    section.steps.push_back(
        {"TEErrorToRString(-1)",
         std::string("\"") + static_cast<char const*>(unknown) + "\", found: " + YesNo(found)});
    section.steps.push_back(
        {"GetWinErrorCode(TE_FILE_NOT_FOUND)", HexCode(GetWinErrorCode(TE_FILE_NOT_FOUND))});
    section.steps.push_back(
        {"GetWinErrorCode(TE_ACCESS_DENIED)", HexCode(GetWinErrorCode(TE_ACCESS_DENIED))});
    return section;
}

Section PathChecks() {
    Section section{"Paths: Windows path rules, checked as text on every platform", {}};
    for (char const* text :
         {"C:\\TestStations\\station.ini", "C:settings.ini", "\\\\lab-server\\seq\\*.seq",
          "C:\\data\\\\report.txt", "\\\\lab-server", "\\relative\\file.txt"}) {
        Path const path(text);
        DynamicString message;
        bool const valid = path.IsValid(true, &message);
        std::string result = valid ? "valid" : std::string(message.GetBufferReadPtr());
        std::replace(result.begin(), result.end(), '\n', ' '); // one line per step
        if (std::string(path.CStr()) != text)
            result += " (stored as " + Quoted(path.GetString()) + ")";
        section.steps.push_back({"IsValid(" + std::string(text) + ")", result});
    }
    Path const file("C:\\TestStations\\Bay 3\\Limits\\voltage.final.csv");
    DynamicString extension, shortened;
    file.GetExtension(extension);
    file.GetAbbreviatedName(40, shortened);
    section.steps.push_back({"GetExtension()", Quoted(extension)});
    section.steps.push_back({"GetNumLevels()", std::to_string(file.GetNumLevels())});
    section.steps.push_back({"GetAbbreviatedName(40)", Quoted(shortened)});
    return section;
}

std::string SectionJson(Section const& section) {
    std::vector<std::string> steps;
    for (Step const& step : section.steps)
        steps.push_back(
            Record().AddText("action", step.action).AddText("result", step.result).ToJson());
    std::string stepsJson = "[";
    for (size_t i = 0; i < steps.size(); ++i)
        stepsJson += (i ? ", " : "") + steps[i];
    return Record().AddText("title", section.title).AddJson("steps", stepsJson + "]", "").ToJson();
}

int RunDemo(Invocation const& call) {
    if (!call.arguments.empty())
        throw UsageError("demo takes no arguments, not " + Quote(call.arguments[0]), "demo");
    std::vector<Section> const sections{CopyOnWrite(),   Truncation(),    MultiByte(),
                                        RaiseAndCatch(), MessageLookup(), PathChecks()};
    if (call.json) {
        std::vector<std::string> json;
        for (Section const& section : sections)
            json.push_back(SectionJson(section));
        std::cout << JsonArray(json) << '\n';
        return kSuccess;
    }
    std::cout << "tekit " TEKIT_VERSION_TEXT ": what the library does so far\n";
    for (Section const& section : sections) {
        std::cout << '\n' << section.title << '\n';
        std::vector<std::vector<std::string>> rows;
        for (Step const& step : section.steps)
            rows.push_back({step.action, step.result});
        PrintTable(std::cout, rows, 2);
    }
    return kSuccess;
}

char const kDetails[] =
    R"(Walks through what the library does so far - strings, errors, paths - and computes every
result as it is shown, so a fault in the library shows up here.

Options:
  --json      Print JSON: an array of sections, each with its steps
  -h, --help  Print this help

Examples:
  tekit demo
  tekit demo --json | python3 -m json.tool

Exit status:
  0  the demo ran
  1  it could not finish (why: on standard error)
  2  the command line was wrong
)";

} // namespace

std::vector<Command> const& DemoCommands() {
    static std::vector<Command> const commands{
        {"demo",
         "Show what the library does, step by step",
         "tekit demo [--json]",
         kDetails,
         {},
         RunDemo},
    };
    return commands;
}

} // namespace tekit::tool
