// The INI reader's view of a text, rebuilt from the line reader for `tekit ini lint`.
#include "IniLines.h"

#include "Output.h"

#include <algorithm>
#include <cstring>
#include <map>
#include <new>
#include <optional>

namespace tekit::tool {

namespace {

std::string Quoted(std::string const& text) {
    return "\"" + text + "\"";
}

bool IsWhiteSpace(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

std::string TrimEnd(std::string text) {
    while (!text.empty() && IsWhiteSpace(text.back()))
        text.pop_back();
    return text;
}

std::string TrimStart(std::string const& text) {
    size_t start = 0;
    while (start < text.size() && IsWhiteSpace(text[start]))
        ++start;
    return text.substr(start);
}

/// Sorts out one line (of at most kIniLineLimit bytes) as the reader does.
void Classify(IniLine& line) {
    std::string const text = TrimStart(line.text);
    if (text[0] == ';') {
        line.kind = IniLine::kComment;
        return;
    }
    if (text[0] == '[') {
        size_t const close = text.rfind(']');
        if (close == 0 || close == std::string::npos) {
            line.reason = "a section header without its closing \"]\"";
        } else if (!TrimStart(text.substr(close + 1)).empty()) {
            line.reason = "text after the closing \"]\" of a section header";
        } else {
            line.name = TrimEnd(TrimStart(text.substr(1, close - 1)));
            line.kind = line.name.empty() ? IniLine::kIgnored : IniLine::kHeader;
            line.reason = line.name.empty() ? "a section header with an empty name" : "";
        }
        return;
    }
    size_t const separator = text.find('=');
    if (separator == std::string::npos) {
        line.reason = "no \"=\" between a tag and a value";
        return;
    }
    line.name = TrimEnd(text.substr(0, separator));
    line.value = TrimEnd(TrimStart(text.substr(separator + 1)));
    if (line.name.empty()) {
        line.reason = "an empty tag";
    } else if (line.value.empty()) {
        line.reason = "an empty value (an empty string is written \"\")";
    } else {
        line.kind = IniLine::kItem;
        if (line.value.size() >= 2 && line.value.front() == '"' && line.value.back() == '"') {
            line.value = line.value.substr(1, line.value.size() - 2);
            line.quoted = true;
        }
    }
}

/// A tag ending in " Line" and digits, with a base tag before them: the base tag and the
/// number (0 when the digits do not fit in an int, which no run ever reaches).
struct Piece {
    std::string base;
    long long number = 0;
};

std::optional<Piece> AsPiece(std::string const& tag) {
    size_t const digits = tag.size() - 1 - tag.find_last_not_of("0123456789");
    size_t const marker = tag.size() - digits - 5;
    if (digits == 0 || tag.size() - digits <= 5 || tag.compare(marker, 5, " Line") != 0)
        return std::nullopt;
    Piece piece{tag.substr(0, marker), 0};
    for (size_t i = marker + 5; i < tag.size() && piece.number <= 0x7FFFFFFF; ++i)
        piece.number = piece.number * 10 + (tag[i] - '0');
    piece.number = piece.number <= 0x7FFFFFFF ? piece.number : 0;
    return piece;
}

/// Adds `item` to `section`: joined to the run of continuation lines in progress (`run`, the
/// last piece taken) when it continues it, else as an item of its own.
void AddItem(IniSectionView& section, IniLine const& item, std::optional<Piece>& run,
             std::vector<IniProblem>* problems) {
    std::optional<Piece> const piece = AsPiece(item.name);
    if (piece && run && piece->base == run->base && piece->number == run->number + 1) {
        section.items.back().value += item.value;
        run = piece;
        return;
    }
    if (piece && piece->number == 1) {
        section.items.push_back({piece->base, item.value, item.number, item.quoted});
        run = piece;
        return;
    }
    if (piece && problems)
        problems->push_back(
            {item.number, Quoted(Shown(item.name)) + " is not joined to a long value: " +
                              (piece->number == 0 ? std::string("pieces are numbered from 1 up")
                                                  : "it does not follow piece " +
                                                        std::to_string(piece->number - 1) + " of " +
                                                        Quoted(Shown(piece->base))) +
                              ", so it stays an item of its own"});
    section.items.push_back({item.name, item.value, item.number, item.quoted});
    run.reset();
}

int TEKIT_STDCALL ReadChunk(void* source, int numBytes, int* numBytesRead, void* buffer) {
    auto& memory = *static_cast<TextSource*>(source);
    size_t const count =
        std::min(static_cast<size_t>(numBytes), memory.text.size() - memory.position);
    std::memcpy(buffer, memory.text.data() + memory.position, count);
    memory.position += count;
    *numBytesRead = static_cast<int>(count);
    return 0;
}

} // namespace

LineFile NewTextReader(TextSource& source) {
    return LineFile_New(ReadChunk, &source);
}

int TEKIT_STDCALL ReadTextLine(void* data, char* buffer, int bufferSize, int* endOfInput,
                               int* lineNumber) {
    auto* reader = static_cast<LineFile>(data);
    int length = 0;
    int const status = LineFile_ReadNonEmpty(reader, buffer, bufferSize, &length, endOfInput);
    *lineNumber = LineFile_NumLinesRead(reader);
    return status < 0 ? status : length;
}

std::vector<IniLine> ReadIniLines(std::string const& text) {
    std::vector<IniLine> lines;
    TextSource source{text};
    LineFile reader = NewTextReader(source);
    if (!reader)
        throw std::bad_alloc();
    // Lines up to 4 KiB are read whole, so a line over the limit is seen as one.
    std::vector<char> buffer(4097);
    int length = 0, end = 0;
    while (LineFile_ReadNonEmpty(reader, buffer.data(), 4096, &length, &end) >= 0 && !end) {
        IniLine line;
        line.number = LineFile_NumLinesRead(reader);
        line.cut = length > kIniLineLimit;
        line.text.assign(buffer.data(), static_cast<size_t>(std::min(length, kIniLineLimit)));
        Classify(line);
        lines.push_back(std::move(line));
    }
    LineFile_Dispose(reader);
    return lines;
}

std::vector<IniSectionView> BuildSections(std::vector<IniLine> const& lines,
                                          std::vector<IniProblem>* problems) {
    std::vector<IniSectionView> sections;
    std::optional<Piece> run;
    for (IniLine const& line : lines) {
        if (line.kind == IniLine::kHeader) {
            sections.push_back({line.name, line.number, {}});
            run.reset();
        } else if (line.kind == IniLine::kItem && !sections.empty()) {
            AddItem(sections.back(), line, run, problems);
        }
    }
    return sections;
}

std::vector<IniProblem> FindIniProblems(std::vector<IniLine> const& lines) {
    std::vector<IniProblem> problems;
    bool inSection = false;
    for (IniLine const& line : lines) {
        if (line.cut)
            problems.push_back({line.number, "longer than " + std::to_string(kIniLineLimit) +
                                                 " bytes: the rest of the line is not read"});
        inSection = inSection || line.kind == IniLine::kHeader;
        if (line.kind == IniLine::kIgnored)
            problems.push_back({line.number, "ignored: " + line.reason});
        else if (line.kind == IniLine::kItem && !inSection)
            problems.push_back({line.number, "ignored: an item before any section"});
    }
    std::map<std::string, int> sectionLines; // name -> line of its first header
    for (IniSectionView const& section : BuildSections(lines, &problems)) {
        auto const [first, added] = sectionLines.emplace(section.name, section.line);
        if (!added)
            problems.push_back(
                {section.line, "section [" + Shown(section.name) + "] again (first at line " +
                                   std::to_string(first->second) + "): lookups find the first"});
        std::map<std::string, int> itemLines;
        for (IniItemView const& item : section.items) {
            auto const [firstItem, addedItem] = itemLines.emplace(item.tag, item.line);
            if (!addedItem)
                problems.push_back({item.line, "tag " + Quoted(Shown(item.tag)) + " again in [" +
                                                   Shown(section.name) + "] (first at line " +
                                                   std::to_string(firstItem->second) +
                                                   "): lookups find only one of them"});
        }
    }
    std::stable_sort(problems.begin(), problems.end(),
                     [](IniProblem const& a, IniProblem const& b) { return a.line < b.line; });
    return problems;
}

DroppedLines CountDroppedLines(std::vector<IniLine> const& lines) {
    DroppedLines dropped;
    bool inSection = false;
    for (IniLine const& line : lines) {
        inSection = inSection || line.kind == IniLine::kHeader;
        dropped.comments += line.kind == IniLine::kComment;
        dropped.ignored +=
            line.kind == IniLine::kIgnored || (line.kind == IniLine::kItem && !inSection);
    }
    return dropped;
}

} // namespace tekit::tool
