// How the INI reader sees a text, rebuilt line by line for `tekit ini lint`: the lines it
// ignores and why, and the sections and items it makes of the rest (continuation lines of
// long values joined), without an INI object.
//
//   std::vector<IniLine> lines = ReadIniLines(text);           // the bytes of a file
//   for (IniProblem const& p : FindIniProblems(lines))
//       std::printf("%d: %s\n", p.line, p.message.c_str());
//
// The rules follow the library's reader with its default tokens ("[", "]", "=", ";"): lines
// come from the line reader, empty ones skipped and each cut at 640 bytes; leading white space
// is skipped; a comment starts with ";"; a header starts with "[" and ends at the last "]",
// with nothing but white space after it; an item has a tag, "=" and a value, either side
// trimmed; a value in double quotes loses them. A tests checks the rules against the reader.
#pragma once

#include "tekit/toolbox/LineFile.h"

#include <string>
#include <vector>

namespace tekit::tool {

/// Text in memory as the source of a line reader; the text must outlive the reader.
struct TextSource {
    std::string const& text;
    size_t position = 0;
};
/// A line reader over `source` (LineFile_Dispose frees it); null when memory is exhausted.
LineFile NewTextReader(TextSource& source);
/// The line callback of Ini_ReadGeneric over a reader from NewTextReader (`data`): empty lines
/// skipped, each line's number reported as the reader counts it.
int TEKIT_STDCALL ReadTextLine(void* data, char* buffer, int bufferSize, int* endOfInput,
                               int* lineNumber);

/// The longest line the INI reader takes; the rest of a longer line is dropped.
constexpr int kIniLineLimit = 640;

struct IniLine {
    enum Kind { kComment, kHeader, kItem, kIgnored };

    int number = 0; // the line reader's line number, from 1
    Kind kind = kIgnored;
    std::string text;    // the line as the reader keeps it (at most kIniLineLimit bytes)
    bool cut = false;    // the line was longer than kIniLineLimit bytes
    std::string name;    // kHeader: the section name; kItem: the tag
    std::string value;   // kItem: the value, without its double quotes
    bool quoted = false; // kItem: the value was in double quotes
    std::string reason;  // kIgnored: why the reader ignores the line
};

/// The non-empty lines of `text`, classified.
std::vector<IniLine> ReadIniLines(std::string const& text);

/// A line the reader ignores or takes otherwise than its writer probably meant.
struct IniProblem {
    int line = 0;
    std::string message;
};

/// An item or a section as the reader makes it.
struct IniItemView {
    std::string tag;
    std::string value;
    int line = 0;
    bool quoted = false;
};
struct IniSectionView {
    std::string name;
    int line = 0;
    std::vector<IniItemView> items;
};

/// The sections of `lines` with their items, continuation lines joined. The pieces that are
/// not joined, because they do not follow the piece before them, go to `problems` (when
/// given).
std::vector<IniSectionView> BuildSections(std::vector<IniLine> const& lines,
                                          std::vector<IniProblem>* problems = nullptr);

/// Every problem of `lines`, in line order: ignored lines with their reason, items before any
/// section, lines cut at the limit, continuation lines that are not joined, and sections and
/// tags (in one section) that appear twice.
std::vector<IniProblem> FindIniProblems(std::vector<IniLine> const& lines);

/// The lines that the reader drops and the writer therefore does not give back.
struct DroppedLines {
    int comments = 0;
    int ignored = 0; // ignored lines and items before any section
};
DroppedLines CountDroppedLines(std::vector<IniLine> const& lines);

} // namespace tekit::tool
