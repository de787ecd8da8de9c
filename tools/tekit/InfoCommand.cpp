// tekit info: what a product file is, from its first bytes: its form (binary, XML, INI text or
// one of the two binary INI forms), type, format version, the product versions that wrote it
// and can read it, and whether its header is valid.
//
//   tekit info sequence.seq station.ini
//   tekit info --json -r received/
#include "Arguments.h"
#include "Commands.h"
#include "Input.h"
#include "Output.h"

#include "tekit/errors/RString.h"
#include "tekit/errors/TEError.h"
#include "tekit/errors/TEException.h"
#include "tekit/formats/OVFileHeader.h"
#include "tekit/ini/IniHeader.h"
#include "tekit/paths/Path.h"
#include "tekit/streams/OVBinaryFileStream.h"
#include "tekit/strings/DynamicString.h"

#include <algorithm>
#include <cstring>
#include <filesystem>
#include <iostream>
#include <new>
#include <optional>
#include <string>
#include <system_error>

namespace tekit::tool {

namespace {

char const kDetails[] =
    R"(Tells what each FILE is, as a person who receives product files wants to know first: its
form, its type ("SequenceFile", ...), format version, the product that wrote it with its
version, the oldest product version that can read it (compatible version), the build
version, the description and character encoding of an INI file, the path it was saved from
(recorded by format versions below 773), its size in bytes, and whether its header is valid.

The forms: "binary" (the 1296-byte header record "TOF1"), "XML" (a UTF-8 document whose root
is the header element "orvanefileheader"), "INI text" (INI text with a valid "__Header__"
section), "compressed binary INI" and "text binary INI" (the INI forms that begin with
"OrvaneBinary" and "OrvaneBinaryText"), and "unknown" for anything else. A file of a known
form whose header cannot be read (cut short, an attribute missing) shows its form and "valid
no". Fields a form does not carry are left out (null in JSON). Binary and XML files are read
up to their header only (10 KiB at most); any other file is read as INI text, keeping its
header section only.

With -r DIR every file under DIR is shown as well, in path order (links to directories are
not followed). "-" reads file names from standard input, one per line. A file of no known
form is shown as "unknown"; a file that cannot be read (missing, a directory, locked by
another program, a path longer than 259 characters) is named on standard error. JSON gives
an array of {"file", "form", "type", "formatVersion", "productName", "productVersion",
"compatibleVersion", "buildVersion", "description", "characterEncoding", "savedFrom",
"size", "valid"} objects.

Options:
  -r DIR      Also show every file under the directory DIR
  --json      Print JSON: an array with an object per file
  -h, --help  Print this help

Examples:
  tekit info examples/files/*
  tekit info --json -r received/ | python3 -m json.tool

Exit status:
  0  every file is of a known form with a valid header
  1  a file is unknown, has an invalid header, or cannot be read (why: on standard error)
  2  the command line was wrong
)";

/// The longest path text the library's Path holds.
constexpr std::size_t kMaxPathLength = 259;

struct FileFacts {
    std::string form = "unknown";
    bool valid = false;
    OVFileHeader header; ///< valid for every valid file
    std::optional<std::string> description, encoding;
    unsigned long long size = 0;
    std::string problem; ///< why a binary INI file of a known form does not read
};

std::string Text(DynamicString const& text) {
    return text.GetBufferReadPtr();
}

bool StartsWith(unsigned char const* bytes, unsigned count, char const* magic) {
    std::size_t const length = std::strlen(magic);
    return count >= length && std::memcmp(bytes, magic, length) == 0;
}

/// What the file at `name` is. Raises the library's error when it cannot be read.
FileFacts Inspect(std::string const& name) {
    FileFacts facts;
    if (name.size() > kMaxPathLength)
        throw ToolError("the path is longer than 259 characters");
    std::error_code error;
    if (std::filesystem::is_directory(name, error))
        throw ToolError("is a directory (-r DIR shows the files under it)");
    Path const path(name.c_str());
    unsigned char magic[20] = {};
    unsigned magicCount = 0;
    {
        OVBinaryFileStream file(name.c_str(), kOVFileStreamOpenForRead, true);
        facts.size = file.GetLargeSize();
        bool isXml = false;
        facts.header.Read(&file, isXml, nullptr);
        if (facts.header.ValidHeader() || isXml) {
            facts.form = isXml ? "XML" : "binary";
            facts.valid = facts.header.ValidHeader();
            return facts;
        }
        file.SetOffset(0);
        magicCount = file.ReadBytes(magic, sizeof magic, TEError(0));
    }
    if (StartsWith(magic, magicCount, "TOF1")) {
        facts.form = "binary"; // a header record cut short
        return facts;
    }
    bool const textBinary = StartsWith(magic, magicCount, "OrvaneBinaryText");
    bool const compressedBinary = !textBinary && StartsWith(magic, magicCount, "OrvaneBinary");
    IniHeader ini;
    try {
        ini.Read(path);
    } catch (TEException const& e) {
        // Text the INI reader refuses is no INI file, and a damaged binary INI form keeps its
        // form; failures of the file itself and of memory are the file's problem.
        TEError const code = e.GetErrorCode();
        if (code == TE_OUT_OF_MEMORY || (code <= TE_IO_ERROR && code > TE_IO_ERROR - 100))
            throw;
        if (textBinary || compressedBinary) {
            facts.form = textBinary ? "text binary INI" : "compressed binary INI";
            facts.problem = e.GetDescription();
        }
        return facts;
    }
    facts.valid = ini.IsValid();
    facts.form = textBinary         ? "text binary INI"
                 : compressedBinary ? "compressed binary INI"
                 : facts.valid      ? "INI text"
                                    : "unknown";
    if (facts.valid) {
        facts.header.SetDataFromIniHeader(ini);
        facts.description = Text(ini.GetDescription());
        facts.encoding = Text(ini.GetCharacterEncoding());
    }
    return facts;
}

/// A field: its text, or when absent null in JSON and nothing in the text.
void AddOptional(Record& record, bool json, char const* name,
                 std::optional<std::string> const& value) {
    if (value)
        record.AddText(name, *value);
    else if (json)
        record.AddJson(name, "null", "");
}

Record Describe(std::string const& name, FileFacts const& facts, bool json) {
    Record record;
    record.AddText("file", name).AddText("form", facts.form);
    OVFileHeader const& h = facts.header;
    auto field = [&](char const* value) {
        return facts.valid ? std::optional<std::string>(value) : std::nullopt;
    };
    AddOptional(record, json, "type", field(h.GetType()));
    if (facts.valid)
        record.AddNumber("formatVersion", h.GetFileVersion());
    else if (json)
        record.AddJson("formatVersion", "null", "");
    AddOptional(record, json, "productName", field(h.GetProductName()));
    AddOptional(record, json, "productVersion", field(h.GetProductVersion()));
    AddOptional(record, json, "compatibleVersion", field(h.GetCompatibleVersion()));
    AddOptional(record, json, "buildVersion", field(h.GetBuildVersion()));
    AddOptional(record, json, "description", facts.description);
    AddOptional(record, json, "characterEncoding", facts.encoding);
    bool const hasPath = facts.valid && h.GetOrigFilePath()[0] != '\0';
    AddOptional(record, json, "savedFrom",
                hasPath ? std::optional<std::string>(h.GetOrigFilePath()) : std::nullopt);
    record.AddNumber("size", static_cast<long long>(facts.size)).AddBool("valid", facts.valid);
    return record;
}

/// The regular files under `directory`, in path order; a directory that cannot be listed is
/// reported.
std::vector<InputItem> FilesUnder(std::string const& directory, Findings& findings) {
    namespace fs = std::filesystem;
    std::vector<std::string> names;
    std::error_code error;
    fs::recursive_directory_iterator it(directory, error), end;
    for (; !error && it != end; it.increment(error)) {
        std::error_code ignored;
        if (it->is_regular_file(ignored))
            names.push_back(it->path().generic_string());
    }
    if (error)
        findings.Report({directory, 0}, "cannot list the directory: " + error.message());
    std::sort(names.begin(), names.end());
    std::vector<InputItem> items;
    for (std::string& name : names)
        items.push_back({std::move(name), 0});
    return items;
}

int RunInfo(Invocation const& call) {
    bool const walk = call.Has("-r");
    if (call.arguments.empty() && !walk)
        throw UsageError("no FILE given (\"-\" reads file names from standard input)", "info");
    Findings findings;
    std::vector<InputItem> items;
    if (!call.arguments.empty())
        items = CollectInputs(call.arguments);
    if (walk) {
        std::vector<InputItem> const under = FilesUnder(call.options.at("-r"), findings);
        items.insert(items.end(), under.begin(), under.end());
    }
    int invalid = 0;
    std::vector<Record> records;
    for (InputItem const& item : items) {
        try {
            FileFacts const facts = Inspect(item.text);
            invalid += facts.valid ? 0 : 1;
            if (!facts.problem.empty())
                std::cerr << "tekit: " << item.Location() << Shown(item.text) << ": "
                          << facts.problem << '\n';
            records.push_back(Describe(item.text, facts, call.json));
        } catch (TEException const& e) {
            // The description names the file, the code says why ("File not found.").
            findings.Report(item, Shown(item.text) + ": " + e.GetDescription() + " " +
                                      static_cast<char const*>(TEErrorToRString(e.GetErrorCode())));
        } catch (ToolError const& e) {
            findings.Report(item, Shown(item.text) + ": " + e.what());
        } catch (std::bad_alloc const&) {
            findings.Report(item, Shown(item.text) + ": out of memory");
        }
    }
    PrintRecords(std::cout, records, call.json);
    if (invalid) {
        std::cout.flush();
        std::cerr << "tekit: " << invalid << " of " << items.size()
                  << (items.size() == 1 ? " file" : " files")
                  << ": no known form or no valid header\n";
    }
    return invalid ? kFailure : findings.Status();
}

} // namespace

std::vector<Command> const& InfoCommands() {
    static std::vector<Command> const commands{
        {"info",
         "Show what a product file is: form, type, versions, validity",
         "tekit info [-r DIR] [--json] FILE... | -",
         kDetails,
         {{"-r", "DIR"}},
         RunInfo},
    };
    return commands;
}

} // namespace tekit::tool
