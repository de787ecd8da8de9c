// tekit ini: INI files as the library reads and writes them — list, get and set values, remove
// sections and items, sort, dump everything with its line numbers, check a file for the lines
// the reader ignores, convert between the text and the two binary forms, and show or edit the
// header section.
//
//   tekit ini get station.ini Limits High
//   tekit ini set --int station.ini Limits High 5
//   tekit ini lint station.ini
//   tekit ini convert station.ini station.bin --to binary
//   tekit ini header --set Description='Line 3' station.bin
#include "Arguments.h"
#include "Commands.h"
#include "IniLines.h"
#include "Output.h"

#include "tekit/errors/RString.h"
#include "tekit/errors/TEException.h"
#include "tekit/ini/Ini.h"
#include "tekit/ini/IniHeader.h"
#include "tekit/ini/IniObj.h"
#include "tekit/paths/Path.h"
#include "tekit/toolbox/MemoryHelpers.h"
#include "tekit/toolbox/Version.h"

#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>
#include <memory>

#if defined(_WIN32)
#include <fcntl.h>
#include <io.h>
#endif

namespace tekit::tool {

namespace {

char const kGroupDetails[] =
    R"(The commands read a file as the library's INI reader does: "[name]" starts a section,
"tag = value" is an item, a line starting with ";" is a comment, and a value in double quotes
is a quoted value. Other lines are ignored ("tekit ini lint" shows which, and why). Names of
sections and tags are case-sensitive. Commands that only read take "-" for standard input.
A FILE may also be in one of the library's two binary forms (see "tekit help ini convert"),
told apart by its first bytes; "-" takes the text forms only.

set, remove, sort -o and header --set write the whole file again as the library writes INI
files, through a
temporary file that replaces it in one step, so it is either the old or the new file, never
a mix, and in the form it had. Comments and the lines the reader ignores are not kept (a note
on standard error says how many were dropped); a long value is written as numbered
continuation lines ("Tag Line0001", ...), which the reader joins.

Examples:
  tekit ini sections station.ini
  tekit ini get station.ini Limits High
  tekit ini set --double station.ini Limits High 5.25
  tekit ini lint station.ini
  tekit ini convert station.ini station.bin --to binary
  tekit ini header station.bin

Exit status:
  0  success
  1  a finding (no such section or item, a value of another type, a problem found by lint)
     or a failure (a file that cannot be read or written), explained on standard error
  2  the command line was wrong
)";

char const kSectionsDetails[] =
    R"(Prints the name of each section of FILE ("-": standard input), in file order. A name that
appears twice is listed twice (lookups by name find the first). JSON gives an array of
{"name", "line", "items"}: the name, the line of its header and its number of items.

Options:
  --json      Print JSON: an array with one object per section
  -h, --help  Print this help

Examples:
  tekit ini sections station.ini
  tekit ini sections --json station.ini

Exit status:
  0  success
  1  the file could not be read
  2  the command line was wrong
)";

char const kItemsDetails[] =
    R"(Prints the items of SECTION, one "tag = value" line each, in file order, with the value as
stored: a quoted value in double quotes, and a long value joined from its continuation lines.
JSON gives an array of {"tag", "value", "raw", "line", "quoted"}: "value" is what "tekit ini
get" prints (escapes undone), "raw" the value as stored, "line" the line it was read from.

Options:
  --json      Print JSON: an array with one object per item
  -h, --help  Print this help

Examples:
  tekit ini items station.ini Limits
  tekit ini items --json - Limits < station.ini

Exit status:
  0  success
  1  the file could not be read, or has no such section
  2  the command line was wrong
)";

char const kGetDetails[] =
    R"(Prints the value of TAG in SECTION as the library's string getter gives it: with the escapes
\t, \n, \r, \", \\ and \xHH undone, quoted or not (so an unquoted C:\data reads as C:data;
--raw shows the stored text). A value that is empty or only blanks prints as it is stored.
The typed options read the value as the library's typed getters do and fail, naming the
file and line, when it is not of that type. JSON gives {"section", "tag", "value", "line",
"quoted"}, the value a number or a boolean with --int, --double or --bool.

Options:
  --raw       Print the value as stored, escapes and all
  --int       Read the value as a whole number (64 bits)
  --double    Read the value as a number: digits, or Nan, Ind, Inf, -Inf
  --bool      Read the value as True or False (any case); prints true or false
  --json      Print JSON: one object with the value and where it was found
  -h, --help  Print this help

Examples:
  tekit ini get station.ini Limits High
  tekit ini get --int station.ini Limits Retries
  tekit ini get --raw --json station.ini Paths Report

Exit status:
  0  the value was printed
  1  no such section or item, a blank value with a typed option, a value of another type,
     or a file that could not be read
  2  the command line was wrong
)";

char const kSetDetails[] =
    R"(Sets TAG in SECTION to VALUE and writes FILE again (see "tekit help ini"): an item with that
tag is replaced where it stands (every other item with the same tag is removed), a new one is
added at the end of its section, and a missing section is added at the end of the file; a
missing FILE is created. Without an option VALUE is stored as a quoted string with tab, line
ends, double quote, backslash and other control characters escaped, so it reads back as
given. Names must read back as themselves: no blanks around them, no line ends, and a tag
holds no "=" and does not start with ";" or "[". Nothing is written when VALUE does not fit
the option, or when the file cannot be read or written. A VALUE that begins with "-" and is
not a number follows "--": tekit ini set --double f.ini S T -- -inf.

Options:
  --raw       Store VALUE as given, unquoted (no line ends; blanks around it would be lost)
  --int       Store a whole number (64 bits, or an unsigned one up to 18446744073709551615)
  --double    Store a number as "%.16g"; nan, inf and -inf as Nan, Inf and -Inf
  --bool      Store True or False (VALUE: true/false, yes/no, on/off or 1/0, any case)
  -h, --help  Print this help

Examples:
  tekit ini set station.ini Station Name 'Line 3, "north"'
  tekit ini set --int station.ini Limits Retries 3
  tekit ini set --bool station.ini Options Trace yes

Exit status:
  0  the file was written
  1  the file could not be read or written (it is left as it was)
  2  the command line was wrong: a name that would not read back, a VALUE that does not fit
)";

char const kRemoveDetails[] =
    R"(Removes SECTION with its items, or with TAG only the items of SECTION with that tag, and
writes FILE again (see "tekit help ini"). When a section name appears twice, the first
section of that name is the one changed. Nothing is written when there is nothing to remove.

Options:
  -h, --help  Print this help

Examples:
  tekit ini remove station.ini Limits High
  tekit ini remove station.ini Obsolete

Exit status:
  0  the file was written
  1  no such section or item, or the file could not be read or written (it is left as it was)
  2  the command line was wrong
)";

char const kSortDetails[] =
    R"(Sorts the sections of FILE ("-": standard input) by name and the items of each section by
tag, in byte order (upper case before lower case; equal names keep their order), and prints
the result as the library writes INI files, or writes it to OUT (which may be FILE itself).

Options:
  -o OUT      Write the sorted file to OUT, replacing it in one step, instead of printing it
  -h, --help  Print this help

Examples:
  tekit ini sort station.ini
  tekit ini sort station.ini -o station.ini

Exit status:
  0  success
  1  the file could not be read, or OUT could not be written (it is left as it was)
  2  the command line was wrong
)";

char const kDumpDetails[] =
    R"(Shows everything the reader made of FILE ("-": standard input): each section header and
item with the number of the line it was read from, values as stored (a quoted value in
double quotes, a long value joined from its continuation lines). JSON gives an array of
sections {"name", "line", "items"}, each item {"tag", "value", "raw", "line", "quoted"} as
in "tekit ini items".

Options:
  --json      Print JSON: an array with one object per section
  -h, --help  Print this help

Examples:
  tekit ini dump station.ini
  tekit ini dump --json station.ini | python3 -m json.tool

Exit status:
  0  success
  1  the file could not be read
  2  the command line was wrong
)";

char const kLintDetails[] =
    R"(Checks FILE ("-": standard input) for lines the reader ignores or takes otherwise than
meant, and prints one "FILE:LINE: problem" line for each: a line without "=", an empty tag, an
empty value (an empty string is written ""), a section header with text after its closing
"]", without one or with an empty name, an item before any section, a line longer than 640
bytes (the rest is not read), a section or a tag (in one section) that appears twice, and a
continuation line of a long value ("Tag Line0003") that does not follow the piece before it
and so is not joined. Comments and blank lines are not problems.

Options:
  --json      Print JSON: an array of {"file", "line", "problem"}
  -h, --help  Print this help

Examples:
  tekit ini lint station.ini
  tekit ini lint --json - < station.ini

Exit status:
  0  no problem found
  1  a problem was found, or the file could not be read
  2  the command line was wrong
)";

char const kConvertDetails[] =
    R"(Reads IN in whichever of the three forms it has ("-": standard input, a text form) and writes
the same document to OUT in the form FORM asks, replacing OUT in one step through a temporary
file beside it (OUT may be IN itself). The forms:

  text         INI text
  binary       the compressed binary form: a 32-byte header ("OrvaneBinary", NUL-padded to
               20 bytes; the data offset 32; 0; the text's length, each 4 bytes little-endian)
               and the INI text compressed with zlib
  binary-text  the text binary form: "OrvaneBinaryText" and the INI text as a compressed
               string, all printable characters

A file is read as the text binary form when it begins with "OrvaneBinaryText", as the
compressed binary form when it begins with "OrvaneBinary", and as INI text otherwise. The
text inside both binary forms has CR LF line ends. Comments and ignored lines of a text IN
are not carried over.

Options:
  --to FORM   text, binary or binary-text (required)
  -h, --help  Print this help

Examples:
  tekit ini convert station.ini station.bin --to binary
  tekit ini convert station.bin station.ini --to text

Exit status:
  0  OUT was written
  1  IN could not be read (a damaged binary form is named as such) or OUT could not be written
     (it is left as it was)
  2  the command line was wrong
)";

char const kHeaderDetails[] =
    R"(Shows the header section "[__Header__]" of FILE (any form; "-": standard input, a text
form): its tags Type, Version (the format version), ProductName, ProductVersion,
CompatibleProdVersion (the oldest product version that reads the file),
ProductVersionString, Description, Path and CharEncoding, a missing one shown empty (Version
0, CharEncoding SBCS), then the file's form and whether the header is valid: it has a Type,
and a Version that is a whole number if it has one.

With --set TAG=VALUE (repeatable) it sets those tags instead and writes FILE again in its
form, the header section first (see "tekit help ini"); a missing section is created. Version
takes a whole number, ProductVersion and CompatibleProdVersion a version such as 4.2.1.77 (up
to four numbers), CharEncoding SBCS, DBCS or Unicode.

Options:
  --set TAG=VALUE  Set a tag of the header section (repeatable)
  --json           Print JSON: one object with the tags, "form" and "valid"
  -h, --help       Print this help

Examples:
  tekit ini header station.ini
  tekit ini header --set Type=LimitsFile --set Version=3 station.ini

Exit status:
  0  the header was shown and is valid, or FILE was written
  1  FILE has no header section or an invalid one, or could not be read or written
  2  the command line was wrong: an unknown tag, or a VALUE that does not fit it
)";

// ---- Reading and writing files ---------------------------------------------------------------

/// The three forms of an INI file.
enum class Form { kText, kBinary, kBinaryText };

char const* FormName(Form form) {
    return form == Form::kText ? "text" : form == Form::kBinary ? "binary" : "binary-text";
}

/// The form of a file that begins with `bytes`: the library's magic test, the text binary
/// form's magic first.
Form FormOf(std::string const& bytes) {
    if (bytes.starts_with(IniObj::kBinaryTextMagic))
        return Form::kBinaryText;
    return bytes.starts_with(IniObj::kBinaryMagic) ? Form::kBinary : Form::kText;
}

/// A document of the library (reached by the flat functions through get()) and the form of the
/// file it was read from.
class Ini {
public:
    Ini() : m_object(std::make_unique<IniObj>()) {}
    IniObjectRec* get() const { return m_object->GetHandle(); }
    IniObj& Object() const { return *m_object; }

    Form form = Form::kText;

private:
    std::unique_ptr<IniObj> m_object;
};

/// The library's message for an INI status.
std::string StatusText(int status) {
    struct Row {
        int value;
        char const* key;
        char const* text;
    };
    static Row const kRows[] = {
#define INI_STATUS(symbol, value, key, text) {value, key, text},
#include "tekit/errors/IniStatus.def"
    };
    for (Row const& row : kRows)
        if (row.value == status)
            return static_cast<char const*>(RString("INI_ERRORS", row.key, row.text));
    return "INI status " + std::to_string(status) + ".";
}

/// How a file is named in messages.
std::string Shown(std::string const& file, int line = 0) {
    return (file == "-" ? "<stdin>" : tool::Shown(file)) +
           (line > 0 ? ":" + std::to_string(line) : "");
}

/// The bytes of `file` ("-": standard input).
std::string ReadAll(std::string const& file) {
    if (file == "-") {
#if defined(_WIN32)
        _setmode(_fileno(stdin), _O_BINARY);
#endif
        return std::string(std::istreambuf_iterator<char>(std::cin), {});
    }
    errno = 0;
    std::ifstream in(file, std::ios::binary);
    if (!in)
        throw ToolError(Shown(file) + ": " + StatusText(INI_ERR_CANT_OPEN_FILE) + " " +
                        (errno ? std::strerror(errno) : "") + (errno ? "." : ""));
    std::string text(std::istreambuf_iterator<char>(in), {});
    if (in.bad())
        throw ToolError(Shown(file) + ": " + StatusText(INI_ERR_CANT_READ_FILE));
    return text;
}

/// A library exception about reading a file (its description names the file) as the tool's
/// error.
ToolError FileError(TEException const& e) {
    return ToolError(e.GetDescription());
}

/// `file` read into a new object: through IniObj::ReadFile (any form), or for "-" the text of
/// standard input through Ini_ReadGeneric (the text binary form through IniObj::ReadString).
/// `text` (when given) gets the INI text that was read: none for a binary form.
Ini Load(std::string const& file, std::string* text = nullptr) {
    Ini ini;
    int status = 0;
    if (file == "-") {
        std::string const bytes = ReadAll(file);
        ini.form = FormOf(bytes);
        if (ini.form == Form::kBinary)
            throw ToolError(Shown(file) + ": the compressed binary form is read from a FILE only");
        if (ini.form == Form::kBinaryText) {
            try {
                ini.Object().ReadString(DynamicString(bytes.c_str()));
            } catch (TEException const& e) {
                throw ToolError(Shown(file) + ": " + e.GetDescription());
            }
            return ini;
        }
        TextSource source{bytes};
        LineFile reader = NewTextReader(source);
        if (!reader)
            throw std::bad_alloc();
        status = Ini_ReadGeneric(ini.get(), ReadTextLine, reader);
        LineFile_Dispose(reader);
        if (text)
            *text = bytes;
    } else {
        std::string const bytes = ReadAll(file); // throws with the system's reason
        ini.form = FormOf(bytes);
        try {
            ini.Object().ReadFile(Path(file.c_str()));
        } catch (TEException const& e) {
            throw FileError(e);
        }
        if (text && ini.form == Form::kText)
            *text = bytes;
    }
    if (status < 0)
        throw ToolError(Shown(file) + ": " + StatusText(status));
    return ini;
}

/// Writes `ini` to `file` in `form` in one step.
void Write(Ini const& ini, std::string const& file, Form form) {
    if (form == Form::kText) {
        if (int const status = Ini_WriteToFile(ini.get(), file.c_str()); status < 0)
            throw ToolError(Shown(file) + ": " + StatusText(status) + " It was left as it was.");
        return;
    }
    try {
        ini.Object().WriteFile(Path(file.c_str()), true, form == Form::kBinaryText);
    } catch (TEException const& e) {
        throw ToolError(Shown(file) + ": " + e.GetDescription() + " It was left as it was.");
    }
}

/// Writes `ini` to `file` in one step in the form it was read in, and says on standard error
/// how many lines of the text it was read from (`text`, of `source`) the written file does not
/// have.
void Save(Ini const& ini, std::string const& file, std::string const& text,
          std::string const& source) {
    Write(ini, file, ini.form);
    DroppedLines const dropped = CountDroppedLines(ReadIniLines(text));
    if (!dropped.comments && !dropped.ignored)
        return;
    auto const count = [](int n, char const* what) {
        return std::to_string(n) + " " + what + (n == 1 ? "" : "s");
    };
    std::string what = dropped.comments ? count(dropped.comments, "comment line") : "";
    if (dropped.ignored)
        what += (what.empty() ? "" : " and ") + count(dropped.ignored, "ignored line");
    std::cerr << "tekit: note: " << Shown(file) << ": written without " << what << " of "
              << Shown(source) << '\n';
}

/// The word after "ini " of a command's name: "set" for "ini set".
std::string Subcommand(char const* command) {
    return std::string(command).substr(4);
}

void RequireArguments(Invocation const& call, size_t least, size_t most, char const* command,
                      char const* names) {
    size_t const count = call.arguments.size();
    if (count < least || count > most)
        throw UsageError(Subcommand(command) + " takes " + names + " (" + std::to_string(count) +
                             " given)",
                         command);
}

// ---- Looking things up -----------------------------------------------------------------------

IniSection FindSection(IniObjectRec* ini, std::string const& file, std::string const& name) {
    IniSection section = nullptr;
    if (Ini_GetSectionPtr(ini, name.c_str(), &section) != 1)
        throw ToolError(Shown(file) + ": no section [" + tool::Shown(name) + "]");
    return section;
}

/// One item as stored.
struct Item {
    std::string tag;
    std::string raw;
    int line = -1;
    bool quoted = false;
};

Item NthItem(IniObjectRec* ini, IniSection section, int index) {
    char const *tag = nullptr, *raw = nullptr;
    int line = -1, quoted = 0;
    Ini_NthItemSP(ini, section, index, &tag, &raw, &line, &quoted);
    return {tag, raw, line, quoted != 0};
}

/// The text the library's string getter gives for a stored value (escapes undone), whichever
/// item of a section it belongs to.
std::string Unescaped(std::string const& raw) {
    Ini scratch;
    char* value = nullptr;
    if (Ini_PutRawString(scratch.get(), "s", "t", raw.c_str()) < 0 ||
        Ini_GetStringCopy(scratch.get(), "s", "t", &value) != 1)
        return raw; // a blank value: nothing to undo
    std::string const text = value;
    TBFree(value);
    return text;
}

Record ItemRecord(Item const& item) {
    Record record;
    record.AddText("tag", item.tag)
        .AddText("value", Unescaped(item.raw))
        .AddText("raw", item.raw)
        .AddNumber("line", item.line)
        .AddBool("quoted", item.quoted);
    return record;
}

/// "tag = value" as the file has it.
std::string ItemLine(Item const& item) {
    return tool::Shown(item.tag) + " = " +
           (item.quoted ? "\"" + tool::Shown(item.raw) + "\"" : tool::Shown(item.raw));
}

// ---- The commands ----------------------------------------------------------------------------

int RunSections(Invocation const& call) {
    RequireArguments(call, 1, 1, "ini sections", "one FILE");
    Ini const ini = Load(call.arguments[0]);
    std::vector<Record> records;
    for (int i = 1; i <= Ini_NumberOfSections(ini.get()); ++i) {
        IniSection section = nullptr;
        Ini_NthSection(ini.get(), i, &section);
        char const* name = nullptr;
        int line = -1;
        Ini_SectionInfoSP(ini.get(), section, &name, &line);
        if (!call.json)
            std::cout << tool::Shown(name) << '\n';
        records.push_back(Record()
                              .AddText("name", name)
                              .AddNumber("line", line)
                              .AddNumber("items", Ini_NumberOfItemsSP(ini.get(), section)));
    }
    if (call.json)
        PrintRecords(std::cout, records, true);
    return kSuccess;
}

int RunItems(Invocation const& call) {
    RequireArguments(call, 2, 2, "ini items", "FILE and SECTION");
    std::string const& file = call.arguments[0];
    Ini const ini = Load(file);
    IniSection section = FindSection(ini.get(), file, call.arguments[1]);
    std::vector<Record> records;
    for (int i = 1; i <= Ini_NumberOfItemsSP(ini.get(), section); ++i) {
        Item const item = NthItem(ini.get(), section, i);
        if (call.json)
            records.push_back(ItemRecord(item));
        else
            std::cout << ItemLine(item) << '\n';
    }
    if (call.json)
        PrintRecords(std::cout, records, true);
    return kSuccess;
}

/// The option that picks a value's type: "", "--raw", "--int", "--double" or "--bool".
std::string TypeOption(Invocation const& call, char const* command) {
    std::string type;
    for (char const* option : {"--raw", "--int", "--double", "--bool"}) {
        if (!call.Has(option))
            continue;
        if (!type.empty())
            throw UsageError(type + " and " + option + " cannot be given together", command);
        type = option;
    }
    return type;
}

std::string DoubleText(double value) {
    if (std::isnan(value))
        return "Nan";
    if (std::isinf(value))
        return value < 0 ? "-Inf" : "Inf";
    char text[32];
    auto const end = std::to_chars(text, text + sizeof text, value).ptr;
    return std::string(text, end);
}

int RunGet(Invocation const& call) {
    RequireArguments(call, 3, 3, "ini get", "FILE, SECTION and TAG");
    std::string const type = TypeOption(call, "ini get");
    std::string const &file = call.arguments[0], &tag = call.arguments[2];
    Ini const ini = Load(file);
    IniObjectRec* const object = ini.get();
    IniSection section = FindSection(object, file, call.arguments[1]);
    std::string const where = "[" + tool::Shown(call.arguments[1]) + "] " + tool::Shown(tag);
    if (Ini_ItemExistsSP(object, section, tag.c_str()) != 1)
        throw ToolError(Shown(file) + ": no item " + Quote(tool::Shown(tag)) + " in section [" +
                        tool::Shown(call.arguments[1]) + "]");
    std::string text, json;
    int status = 0;
    if (type == "--int") {
        std::int64_t value = 0;
        status = Ini_GetInt64SP(object, section, tag.c_str(), &value);
        text = json = std::to_string(value);
    } else if (type == "--double") {
        double value = 0;
        status = Ini_GetDoubleSP(object, section, tag.c_str(), &value);
        text = DoubleText(value);
        json = std::isfinite(value) ? text : JsonQuote(text);
    } else if (type == "--bool") {
        int value = 0;
        status = Ini_GetBooleanSP(object, section, tag.c_str(), &value);
        text = json = value ? "true" : "false";
    } else {
        char* value = nullptr;
        status = type == "--raw" ? Ini_GetRawStringCopySP(object, section, tag.c_str(), &value)
                                 : Ini_GetStringCopySP(object, section, tag.c_str(), &value);
        if (status == 1) {
            text = value;
            TBFree(value);
        }
    }
    Item first; // the item the getters found: the first with the tag

    for (int i = 1; i <= Ini_NumberOfItemsSP(object, section) && first.tag != tag; ++i)
        first = NthItem(object, section, i);
    if (status < 0)
        throw ToolError(Shown(file, first.line) + ": " + where + ": " +
                        Quote(tool::Shown(first.raw)) + ": " + StatusText(status));
    if (status == 0 && !type.empty() && type != "--raw")
        throw ToolError(Shown(file, first.line) + ": " + where + " has no value");
    if (status == 0) // blank: no escapes to undo
        text = first.raw;
    if (json.empty())
        json = JsonQuote(text);
    if (call.json)
        std::cout << Record()
                         .AddText("section", call.arguments[1])
                         .AddText("tag", tag)
                         .AddJson("value", json, text)
                         .AddNumber("line", first.line)
                         .AddBool("quoted", first.quoted)
                         .ToJson()
                  << '\n';
    else
        std::cout << text << '\n';
    return kSuccess;
}

/// Why a section name or tag given to set would not read back as itself, or "".
bool IsBlank(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

std::string NameProblem(std::string const& name, bool tag) {
    if (name.empty())
        return "is empty";
    if (IsBlank(name.front()) || IsBlank(name.back()))
        return "begins or ends with white space, which the reader drops";
    if (name.find_first_of("\r\n") != std::string::npos)
        return "holds a line end";
    if (tag && name.find('=') != std::string::npos)
        return "holds \"=\", which the reader takes for the end of the tag";
    if (tag && (name[0] == ';' || name[0] == '['))
        return std::string("begins with \"") + name[0] + "\", which makes the line a " +
               (name[0] == ';' ? "comment" : "section header");
    return "";
}

/// Puts VALUE as `type` asks; a VALUE that does not fit the type is a usage error.
int Put(IniObjectRec* ini, std::string const& type, char const* section, char const* tag,
        std::string const& value) {
    auto const wrong = [&](char const* what) {
        return UsageError(type + " needs " + what + ", not " + Quote(tool::Shown(value)),
                          "ini set");
    };
    char const* const begin = value.data();
    char const* const end = begin + value.size();
    if (type == "--int") {
        std::int64_t number = 0;
        if (auto const r = std::from_chars(begin, end, number); r.ec == std::errc() && r.ptr == end)
            return Ini_PutInt64(ini, section, tag, number);
        std::uint64_t unsignedNumber = 0;
        if (auto const r = std::from_chars(begin, end, unsignedNumber);
            r.ec == std::errc() && r.ptr == end)
            return Ini_PutUInt64(ini, section, tag, unsignedNumber);
        throw wrong("a whole number that fits in 64 bits");
    }
    if (type == "--double") {
        double number = 0;
        auto const r = std::from_chars(begin, end, number);
        if (r.ec != std::errc() || r.ptr != end)
            throw wrong("a number (such as 5, -0.25, 1e-9, nan, inf)");
        return Ini_PutDouble(ini, section, tag, number);
    }
    if (type == "--bool") {
        std::string lower;
        for (char c : value)
            lower += static_cast<char>(c >= 'A' && c <= 'Z' ? c - 'A' + 'a' : c);
        for (char const* yes : {"true", "yes", "on", "1"})
            if (lower == yes)
                return Ini_PutBoolean(ini, section, tag, 1);
        for (char const* no : {"false", "no", "off", "0"})
            if (lower == no)
                return Ini_PutBoolean(ini, section, tag, 0);
        throw wrong("true or false (or yes/no, on/off, 1/0)");
    }
    if (type == "--raw") {
        if (value.find_first_of("\r\n") != std::string::npos)
            throw wrong("a value without line ends");
        if (!value.empty() && (IsBlank(value.front()) || IsBlank(value.back())))
            throw wrong("a value without white space around it, which the reader drops");
        return Ini_PutRawString(ini, section, tag, value.c_str());
    }
    return Ini_PutString(ini, section, tag, value.c_str());
}

void RejectStandardInput(std::string const& file, char const* command) {
    if (file == "-")
        throw UsageError(Subcommand(command) +
                             " changes FILE in place: standard input (\"-\") cannot be changed",
                         command);
}

int RunSet(Invocation const& call) {
    RequireArguments(call, 4, 4, "ini set", "FILE, SECTION, TAG and VALUE");
    std::string const type = TypeOption(call, "ini set");
    std::string const &file = call.arguments[0], &section = call.arguments[1],
                      &tag = call.arguments[2];
    RejectStandardInput(file, "ini set");
    if (std::string const problem = NameProblem(section, false); !problem.empty())
        throw UsageError("section name " + Quote(tool::Shown(section)) + " " + problem, "ini set");
    if (std::string const problem = NameProblem(tag, true); !problem.empty())
        throw UsageError("tag " + Quote(tool::Shown(tag)) + " " + problem, "ini set");
    errno = 0;
    std::FILE* const probe = std::fopen(file.c_str(), "rb");
    bool const exists = probe || errno != ENOENT; // any other failure: Load explains it
    if (probe)
        std::fclose(probe);
    std::string text;
    Ini ini = exists ? Load(file, &text) : Ini();
    if (int const status = Put(ini.get(), type, section.c_str(), tag.c_str(), call.arguments[3]);
        status < 0)
        throw ToolError(Shown(file) + ": " + StatusText(status) + " It was left as it was.");
    Save(ini, file, text, file);
    return kSuccess;
}

int RunRemove(Invocation const& call) {
    RequireArguments(call, 2, 3, "ini remove", "FILE, SECTION and optionally TAG");
    std::string const& file = call.arguments[0];
    RejectStandardInput(file, "ini remove");
    std::string text;
    Ini const ini = Load(file, &text);
    std::string const& section = call.arguments[1];
    IniSection sectionPtr = FindSection(ini.get(), file, section);
    if (call.arguments.size() == 3) {
        std::string const& tag = call.arguments[2];
        if (Ini_RemoveItemSP(ini.get(), sectionPtr, tag.c_str()) != 1)
            throw ToolError(Shown(file) + ": no item " + Quote(tool::Shown(tag)) + " in section [" +
                            tool::Shown(section) + "]");
    } else {
        Ini_RemoveSection(ini.get(), section.c_str());
    }
    Save(ini, file, text, file);
    return kSuccess;
}

int TEKIT_STDCALL PrintLine(void*, char const* line) {
    std::cout << line << '\n';
    return 0;
}

int RunSort(Invocation const& call) {
    RequireArguments(call, 1, 1, "ini sort", "one FILE");
    std::string const& file = call.arguments[0];
    std::string text;
    Ini const ini = Load(file, &text);
    Ini_Sort(ini.get());
    auto const out = call.options.find("-o");
    if (out != call.options.end()) {
        if (out->second.empty() || out->second == "-")
            throw UsageError("-o needs a file to write (without -o the result is printed)",
                             "ini sort");
        Save(ini, out->second, text, file);
    } else if (int const status = Ini_WriteGeneric(ini.get(), PrintLine, nullptr); status < 0) {
        throw ToolError(Shown(file) + ": " + StatusText(status));
    }
    return kSuccess;
}

int RunDump(Invocation const& call) {
    RequireArguments(call, 1, 1, "ini dump", "one FILE");
    Ini const ini = Load(call.arguments[0]);
    IniObjectRec* const object = ini.get();
    std::vector<std::string> sections;
    std::vector<std::pair<int, std::string>> rows; // line, text
    for (int s = 1; s <= Ini_NumberOfSections(object); ++s) {
        IniSection section = nullptr;
        Ini_NthSection(object, s, &section);
        char const* name = nullptr;
        int line = -1;
        Ini_SectionInfoSP(object, section, &name, &line);
        rows.emplace_back(line, "[" + tool::Shown(name) + "]");
        std::vector<std::string> items;
        for (int i = 1; i <= Ini_NumberOfItemsSP(object, section); ++i) {
            Item const item = NthItem(object, section, i);
            rows.emplace_back(item.line, "  " + ItemLine(item));
            items.push_back(ItemRecord(item).ToJson());
        }
        std::string itemsJson = "[";
        for (size_t i = 0; i < items.size(); ++i)
            itemsJson += (i ? ", " : "") + items[i];
        sections.push_back(Record()
                               .AddText("name", name)
                               .AddNumber("line", line)
                               .AddJson("items", itemsJson + "]", "")
                               .ToJson());
    }
    if (call.json) {
        std::cout << JsonArray(sections) << '\n';
        return kSuccess;
    }
    size_t width = 1;
    for (auto const& row : rows)
        width = std::max(width, std::to_string(row.first).size());
    for (auto const& [line, text] : rows) {
        std::string const number = std::to_string(line);
        std::cout << std::string(width - number.size(), ' ') << number << ": " << text << '\n';
    }
    return kSuccess;
}

int RunLint(Invocation const& call) {
    RequireArguments(call, 1, 1, "ini lint", "one FILE");
    std::string const& file = call.arguments[0];
    std::vector<IniProblem> const problems = FindIniProblems(ReadIniLines(ReadAll(file)));
    std::vector<Record> records;
    for (IniProblem const& problem : problems) {
        if (call.json)
            records.push_back(Record()
                                  .AddText("file", Shown(file))
                                  .AddNumber("line", problem.line)
                                  .AddText("problem", problem.message));
        else
            std::cout << Shown(file, problem.line) << ": " << problem.message << '\n';
    }
    if (call.json)
        PrintRecords(std::cout, records, true);
    if (problems.empty())
        return kSuccess;
    std::cerr << "tekit: " << Shown(file) << ": " << problems.size()
              << (problems.size() == 1 ? " problem" : " problems") << '\n';
    return kFailure;
}

int RunConvert(Invocation const& call) {
    RequireArguments(call, 2, 2, "ini convert", "IN and OUT");
    auto const to = call.options.find("--to");
    if (to == call.options.end())
        throw UsageError("--to FORM is required: text, binary or binary-text", "ini convert");
    Form form = Form::kText;
    if (to->second == "binary")
        form = Form::kBinary;
    else if (to->second == "binary-text")
        form = Form::kBinaryText;
    else if (to->second != "text")
        throw UsageError("--to takes text, binary or binary-text, not " +
                             Quote(tool::Shown(to->second)),
                         "ini convert");
    std::string const& out = call.arguments[1];
    if (out == "-")
        throw UsageError("OUT must be a file: the binary forms are not printed", "ini convert");
    Ini const ini = Load(call.arguments[0]);
    Write(ini, out, form);
    return kSuccess;
}

/// The tags of the header section, in the order they are shown.
char const* const kHeaderTags[] = {
    IniHeader::kTypeTag,
    IniHeader::kFormatVersionTag,
    IniHeader::kProductNameTag,
    IniHeader::kProductVersionTag,
    IniHeader::kCompatibleProductVersionTag,
    IniHeader::kProductDisplayVersionTag,
    IniHeader::kDescriptionTag,
    IniHeader::kPathTag,
    IniHeader::kCharEncodingTag,
};

/// Sets one tag of `header` from "TAG=VALUE"; a VALUE that does not fit the tag is a usage
/// error.
void SetHeaderTag(IniObj& header, std::string const& assignment) {
    char const* const command = "ini header";
    size_t const equals = assignment.find('=');
    std::string const tag = assignment.substr(0, equals);
    std::string const value = equals == std::string::npos ? "" : assignment.substr(equals + 1);
    bool known = false;
    for (char const* name : kHeaderTags)
        known = known || tag == name;
    if (equals == std::string::npos || !known)
        throw UsageError("--set takes TAG=VALUE with TAG one of Type, Version, ProductName, "
                         "ProductVersion, CompatibleProdVersion, ProductVersionString, "
                         "Description, Path, CharEncoding; not " +
                             Quote(tool::Shown(assignment)),
                         command);
    auto const wrong = [&](char const* what) {
        return UsageError(tag + " takes " + what + ", not " + Quote(tool::Shown(value)), command);
    };
    char const* const section = IniHeader::kHeaderSectionName;
    if (tag == IniHeader::kFormatVersionTag) {
        long number = 0;
        auto const r = std::from_chars(value.data(), value.data() + value.size(), number);
        if (r.ec != std::errc() || r.ptr != value.data() + value.size())
            throw wrong("a whole number");
        header.Set(section, tag.c_str(), number);
        return;
    }
    if ((tag == IniHeader::kProductVersionTag || tag == IniHeader::kCompatibleProductVersionTag) &&
        !Version(value.c_str()).IsValid())
        throw wrong("a version of up to four numbers such as 4.2.1.77");
    if (tag == IniHeader::kCharEncodingTag && value != IniHeader::kSBCS.GetBufferReadPtr() &&
        value != IniHeader::kDBCS.GetBufferReadPtr() &&
        value != IniHeader::kUnicode.GetBufferReadPtr())
        throw wrong("SBCS, DBCS or Unicode");
    header.Set(section, tag.c_str(), value.c_str());
}

int RunHeader(Invocation const& call) {
    RequireArguments(call, 1, 1, "ini header", "one FILE");
    std::string const& file = call.arguments[0];
    bool const editing = call.Has("--set");
    if (editing)
        RejectStandardInput(file, "ini header");
    std::string text;
    Ini const ini = Load(file, editing ? &text : nullptr);
    IniHeader header(ini.Object());
    if (editing) {
        for (auto const& [option, assignment] : call.values)
            if (option == "--set")
                SetHeaderTag(header.GetIniObj(), assignment);
        header.Write(ini.Object());
        Save(ini, file, text, file);
        return kSuccess;
    }
    if (!header.Exists())
        throw ToolError(Shown(file) + ": no header section [" + IniHeader::kHeaderSectionName +
                        "]");
    Record record;
    for (char const* tag : kHeaderTags) {
        std::string_view const name = tag;
        if (name == IniHeader::kFormatVersionTag)
            record.AddNumber(tag, header.GetFormatVersion());
        else if (name == IniHeader::kCharEncodingTag)
            record.AddText(tag, header.GetCharacterEncoding().GetBufferReadPtr());
        else {
            DynamicString value;
            header.GetIniObj().Get(IniHeader::kHeaderSectionName, tag, value);
            record.AddText(tag, value.GetBufferReadPtr());
        }
    }
    record.AddText("form", FormName(ini.form)).AddBool("valid", header.IsValid());
    if (call.json)
        std::cout << record.ToJson() << '\n';
    else
        record.PrintText(std::cout);
    if (header.IsValid())
        return kSuccess;
    std::cerr << "tekit: " << Shown(file) << ": the header section is not valid\n";
    return kFailure;
}

} // namespace

CommandGroup const& IniGroup() {
    static CommandGroup const group{"ini", "Read, change, sort and check INI files", kGroupDetails};
    return group;
}

std::vector<Command> const& IniCommands() {
    static std::vector<Command> const commands{
        {"ini sections",
         "List the sections of an INI file",
         "tekit ini sections [--json] FILE",
         kSectionsDetails,
         {},
         RunSections},
        {"ini items",
         "List the items of a section",
         "tekit ini items [--json] FILE SECTION",
         kItemsDetails,
         {},
         RunItems},
        {"ini get",
         "Print the value of an item",
         "tekit ini get [--raw | --int | --double | --bool] [--json] FILE SECTION TAG",
         kGetDetails,
         {{"--raw", nullptr}, {"--int", nullptr}, {"--double", nullptr}, {"--bool", nullptr}},
         RunGet},
        {"ini set",
         "Set the value of an item and write the file",
         "tekit ini set [--raw | --int | --double | --bool] FILE SECTION TAG VALUE",
         kSetDetails,
         {{"--raw", nullptr}, {"--int", nullptr}, {"--double", nullptr}, {"--bool", nullptr}},
         RunSet},
        {"ini remove",
         "Remove a section or an item and write the file",
         "tekit ini remove FILE SECTION [TAG]",
         kRemoveDetails,
         {},
         RunRemove},
        {"ini sort",
         "Sort sections and items by name",
         "tekit ini sort [-o OUT] FILE",
         kSortDetails,
         {{"-o", "OUT"}},
         RunSort},
        {"ini dump",
         "Show every section and item with its line number",
         "tekit ini dump [--json] FILE",
         kDumpDetails,
         {},
         RunDump},
        {"ini lint",
         "Find the lines the reader ignores, repeated names and broken long values",
         "tekit ini lint [--json] FILE",
         kLintDetails,
         {},
         RunLint},
        {"ini convert",
         "Write an INI file in the text or one of the binary forms",
         "tekit ini convert --to FORM IN OUT",
         kConvertDetails,
         {{"--to", "FORM"}},
         RunConvert},
        {"ini header",
         "Show or set the header section of an INI file",
         "tekit ini header [--json] [--set TAG=VALUE]... FILE",
         kHeaderDetails,
         {{"--set", "TAG=VALUE"}},
         RunHeader},
    };
    return commands;
}

} // namespace tekit::tool
