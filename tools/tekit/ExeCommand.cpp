// tekit exe: what a Windows executable (.exe, .dll; 32- or 64-bit) says about itself, read from
// its bytes on any platform: machine, bitness, flags, exports, imports, dependent DLLs.
//
//   tekit exe tekit.dll
//   tekit exe --exports --json tekit.dll
//   tekit exe --deps 'C:\Orvane\bin' app.exe
#include "Arguments.h"
#include "Commands.h"
#include "Input.h"
#include "Output.h"

#include "tekit/errors/TEException.h"
#include "tekit/paths/DependentModules.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/ExecutableFile.h"
#include "tekit/paths/PathVector.h"

#include <iostream>
#include <new>
#include <string_view>

namespace tekit::tool {

namespace {

#if defined(_WIN32)
char const kListSeparator = ';';
#else
char const kListSeparator = ':';
#endif

char const kDetails[] =
    R"(Reads each FILE as a Windows executable (PE/COFF: a program or DLL, 32- or 64-bit) from
its bytes, on any platform, and prints its machine (i386, x86-64, arm64, ...), bitness, kind
(dll or program), subsystem and whether it is large-address aware. A file that is not a valid
executable, or that is cut short or points outside itself, is named on standard error with
what is wrong. "-" reads file names from standard input, one per line.

Exports are listed by ordinal with their names, or (by ordinal) for one without a name; a
forwarder is followed by "-> MODULE.Function". Imports list each DLL and its functions, the
delay-loaded DLLs last and marked. Dependencies are the DLLs the file needs, directly and
through the DLLs it needs, looked for in the file's own directory, then in DIRS (a list
separated by ":", or ";" on Windows; "" searches the file's directory only). A DLL that is
not found (a system DLL, or a missing one) is listed as "not found"; that is no failure.
JSON gives an array of {"file", "machine", "machineCode", "bitness", "dll", "subsystem",
"largeAddressAware"} objects, with "exports", "imports" and "dependencies" when asked for.

Options:
  --exports    Also list the exports: ordinal, name, forwarder
  --imports    Also list the imported DLLs and their functions
  --deps DIRS  Also find the DLLs the file needs, beside it and in DIRS
  --json       Print JSON: an array with an object per file
  -h, --help   Print this help

Examples:
  tekit exe tekit.dll
  tekit exe --exports --json tekit.dll
  tekit exe --imports --deps /usr/x86_64-w64-mingw32/lib app.exe

Exit status:
  0  every file was read
  1  a file could not be read or is not a valid executable (why: on standard error)
  2  the command line was wrong
)";

std::vector<std::string> SplitList(std::string const& list) {
    std::vector<std::string> parts;
    std::size_t start = 0;
    while (start <= list.size()) {
        std::size_t const end = std::min(list.find(kListSeparator, start), list.size());
        if (end > start)
            parts.push_back(list.substr(start, end - start));
        start = end + 1;
    }
    return parts;
}

std::string Text(DynamicString const& text) {
    return text.GetBufferReadPtr();
}

/// `text` for a terminal, as Shown() makes it; most names hold no control byte and pass as
/// they are.
std::string Plain(std::string_view text) {
    for (char const c : text)
        if (static_cast<unsigned char>(c) < 0x20 || c == 0x7F)
            return Shown(text);
    return std::string(text);
}

/// The exports: as JSON, or as a summary and text rows (a DLL exports thousands of names, so
/// only the form asked for is built).
void AddExports(Record& record, std::vector<std::vector<std::string>>& rows,
                ExportTable const& exports, bool json) {
    std::size_t const count = exports.GetFunctions().size();
    if (!json) {
        rows.reserve(count);
        for (ExportedFunction const& f : exports.GetFunctions()) {
            std::string text = f.name.IsEmpty() ? "(by ordinal)" : Plain(Text(f.name));
            if (f.IsForwarded())
                text += " -> " + Plain(Text(f.forwarder));
            rows.push_back({std::to_string(f.ordinal), std::move(text)});
        }
        std::string const summary =
            exports.GetModuleName().IsEmpty() && exports.IsEmpty()
                ? "none"
                : Plain(Text(exports.GetModuleName())) + ", " + std::to_string(count) + " entries";
        record.AddJson("exports", "", summary);
        return;
    }
    std::string out = "{\"module\": " + JsonQuote(Text(exports.GetModuleName())) +
                      ", \"ordinalBase\": " + std::to_string(exports.GetOrdinalBase()) +
                      ", \"functions\": [";
    bool first = true;
    for (ExportedFunction const& f : exports.GetFunctions()) {
        out += first ? "{\"ordinal\": " : ", {\"ordinal\": ";
        first = false;
        out += std::to_string(f.ordinal);
        out += ", \"name\": ";
        out += f.name.IsEmpty() ? "null" : JsonQuote(Text(f.name));
        out += ", \"rva\": ";
        out += std::to_string(f.rva);
        out += ", \"forwarder\": ";
        out += f.IsForwarded() ? JsonQuote(Text(f.forwarder)) : "null";
        out += "}";
    }
    out += "]}";
    record.AddJson("exports", std::move(out), "");
}

void AddImports(Record& record, std::vector<std::vector<std::string>>& rows,
                ImportTable const& imports) {
    std::string json = "[";
    for (ImportedModule const& module : imports.GetModules()) {
        json += json.size() > 1 ? ", " : "";
        json += "{\"module\": " + JsonQuote(Text(module.name)) +
                ", \"delayLoaded\": " + (module.delayLoaded ? "true" : "false") +
                ", \"functions\": [";
        rows.push_back({Plain(Text(module.name)) + (module.delayLoaded ? " (delay-loaded)" : "")});
        bool first = true;
        for (ImportedFunction const& f : module.functions) {
            json += first ? "" : ", ";
            first = false;
            if (f.byOrdinal) {
                json += "{\"ordinal\": " + std::to_string(f.ordinal) + "}";
                rows.push_back({"  #" + std::to_string(f.ordinal)});
            } else {
                json += "{\"name\": " + JsonQuote(Text(f.name)) +
                        ", \"hint\": " + std::to_string(f.hint) + "}";
                rows.push_back({"  " + Plain(Text(f.name))});
            }
        }
        json += "]}";
    }
    json += "]";
    record.AddJson("imports", json, std::to_string(imports.GetModules().size()) + " DLLs");
}

void AddDependencies(Record& record, std::vector<std::vector<std::string>>& rows,
                     std::vector<DependentModule> const& modules) {
    std::string json = "[";
    std::size_t found = 0;
    for (DependentModule const& module : modules) {
        std::string const location = module.location.CStr();
        found += location.empty() ? 0 : 1;
        json += json.size() > 1 ? ", " : "";
        json += "{\"name\": " + JsonQuote(Text(module.name)) +
                ", \"path\": " + (location.empty() ? "null" : JsonQuote(location)) +
                ", \"neededBy\": " + JsonQuote(Text(module.neededBy)) +
                ", \"delayLoaded\": " + (module.delayLoaded ? "true" : "false") +
                ", \"forwarded\": " + (module.forwarded ? "true" : "false") + "}";
        std::string how = module.delayLoaded ? " (delay-loaded)"
                          : module.forwarded ? " (forwarded)"
                                             : "";
        rows.push_back({Plain(Text(module.name)),
                        (location.empty() ? std::string("not found") : Plain(location)) + how});
    }
    json += "]";
    record.AddJson("dependencies", json,
                   std::to_string(modules.size()) + " DLLs, " + std::to_string(found) + " found");
}

int RunExe(Invocation const& call) {
    if (call.arguments.empty())
        throw UsageError("no FILE given (\"-\" reads file names from standard input)", "exe");
    bool const exports = call.Has("--exports"), imports = call.Has("--imports");
    bool const deps = call.Has("--deps");
    PathBase::PathVector search;
    if (deps)
        for (std::string const& directory : SplitList(call.options.at("--deps")))
            search.push_back(Path(directory.c_str()));

    Findings findings;
    std::vector<std::string> elements;
    bool firstText = true;
    for (InputItem const& item : CollectInputs(call.arguments)) {
        Record record;
        std::vector<std::vector<std::string>> exportRows, importRows, dependencyRows;
        try {
            ExecutableFile const file{DynamicPath(item.text.c_str())};
            record.AddText("file", item.text)
                .AddText("machine", file.GetMachineName())
                .AddNumber("machineCode", file.GetMachine())
                .AddNumber("bitness", file.GetBitness())
                .AddBool("dll", file.IsDll())
                .AddText("subsystem", file.GetSubsystemName())
                .AddBool("largeAddressAware", file.IsLargeAddressAware());
            if (exports)
                AddExports(record, exportRows, file.ReadExports(), call.json);
            if (imports)
                AddImports(record, importRows, file.ReadImports());
            if (deps)
                AddDependencies(record, dependencyRows,
                                FindDependentModules(DynamicPath(item.text.c_str()), search));
        } catch (TEException const& e) {
            findings.Report(item, e.GetDescription());
            continue;
        } catch (std::bad_alloc const&) {
            findings.Report(item, "out of memory");
            continue;
        }
        if (call.json) {
            elements.push_back(record.ToJson());
            continue;
        }
        std::cout << (firstText ? "" : "\n");
        firstText = false;
        record.PrintText(std::cout);
        for (auto const* rows : {&exportRows, &importRows, &dependencyRows})
            if (!rows->empty()) {
                std::cout << (rows == &exportRows   ? "exports:\n"
                              : rows == &importRows ? "imports:\n"
                                                    : "dependencies:\n");
                PrintTable(std::cout, *rows, 2);
            }
    }
    if (call.json)
        std::cout << JsonArray(elements) << '\n';
    return findings.Status();
}

} // namespace

std::vector<Command> const& ExeCommands() {
    static std::vector<Command> const commands{
        {"exe",
         "Show what a Windows executable says: machine, bitness, exports, imports, DLLs",
         "tekit exe [--exports] [--imports] [--deps DIRS] [--json] FILE... | -",
         kDetails,
         {{"--exports", nullptr}, {"--imports", nullptr}, {"--deps", "DIRS"}},
         RunExe},
    };
    return commands;
}

} // namespace tekit::tool
