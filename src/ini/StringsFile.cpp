// Strings files: UTF-8 INI text read by the INI store's reader into message-table rows, with
// the lines the reader would ignore refused; RString::UseStringsFile and
// UseAllStringsFilesInDirectory.
#include "tekit/ini/StringsFile.h"

#include "errors/LoadedStrings.h"
#include "errors/NativeError.h"
#include "ini/IniEscape.h"
#include "ini/IniObject.h"
#include "ini/IniText.h"
#include "ini/StringsFiles.h"
#include "platform/File.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/ini/Ini.h"
#include "tekit/paths/Path.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/sync/CriticalSections.h"

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstring>
#include <initializer_list>
#include <map>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace tekit {

namespace {

using detail::LoadedString;
using platform::SystemError;

constinit OVCriticalSection gLoadingLock;

/// The "ERR_DESCR" message `key` with `arguments` for %1, %2, ...: placeholders are filled
/// from the one that stands last in the text to the first, so no argument text (a file name
/// holding "%1") is ever taken for a placeholder, whatever order a translation puts them in.
DynamicString Message(char const* key, std::initializer_list<char const*> arguments) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    std::string const text = message.GetBufferReadPtr();
    std::vector<std::pair<std::size_t, long>> order; // (where it stands, its number)
    for (long number = 1; number <= static_cast<long>(arguments.size()); ++number) {
        std::string placeholder = "%";
        placeholder += std::to_string(number);
        std::size_t const at = text.find(placeholder);
        // One the text lacks is filled last: Format then appends it, visibly.
        order.emplace_back(at == std::string::npos ? 0 : at + 1, number);
    }
    std::sort(order.rbegin(), order.rend());
    for (auto const& [position, number] : order)
        message.Format(arguments.begin()[number - 1], number);
    return message;
}

[[noreturn]] void RaiseBadLine(char const* name, int line, DynamicString const& problem,
                               char const* function) {
    std::string const number = std::to_string(line);
    TE_RAISE(
        TE_BAD_FILE_FORMAT,
        Message("STRINGS_FILE_BAD_LINE_1_2_3", {name, number.c_str(), problem.GetBufferReadPtr()}),
        function);
}

[[noreturn]] void RaiseFileError(SystemError const& error, char const* path, char const* function) {
    TEError const code = detail::NativeErrorToTEError(error, TE_IO_ERROR);
    RString const reason = TEErrorToRString(code);
    TE_RAISE_API(code,
                 Message("STRINGS_FILE_CANT_READ_1_2", {path, static_cast<char const*>(reason)}),
                 function, error.apiFunction, error.code);
}

/// Closes a file when it goes.
struct OpenFile {
    platform::NativeFile handle = platform::kNoFile;
    ~OpenFile() {
        if (handle != platform::kNoFile)
            platform::CloseFile(handle);
    }
};

/// The whole file, at most StringsFile::kMaxFileBytes.
std::string ReadFileBytes(char const* path, char const* function) {
    OpenFile file;
    if (SystemError const error = platform::OpenFileForReading(path, file.handle))
        RaiseFileError(error, path, function);
    std::uint64_t size = 0;
    if (SystemError const error = platform::OpenFileSize(file.handle, size))
        RaiseFileError(error, path, function);
    std::string bytes;
    std::size_t const limit = StringsFile::kMaxFileBytes;
    std::size_t filled = 0;
    // A file that grows while it is read is caught by the limit on what was read.
    for (;;) {
        if (size > limit || filled > limit) {
            std::string const count = std::to_string(std::max<std::uint64_t>(size, filled));
            TE_RAISE(TE_BAD_FILE_FORMAT,
                     Message("STRINGS_FILE_TOO_LARGE_1_2", {path, count.c_str()}), function);
        }
        bytes.resize(std::max<std::size_t>(filled + 65536, static_cast<std::size_t>(size) + 1));
        std::size_t count = 0;
        if (SystemError const error = platform::ReadFromFile(file.handle, bytes.data() + filled,
                                                             bytes.size() - filled, count))
            RaiseFileError(error, path, function);
        if (count == 0)
            break;
        filled += count;
    }
    bytes.resize(filled);
    return bytes;
}

/// The length of the valid UTF-8 sequence at `p` (before `end`), 0 when there is none:
/// overlong forms, surrogates and code points beyond U+10FFFF are not UTF-8.
std::size_t Utf8SequenceLength(unsigned char const* p, unsigned char const* end) {
    unsigned char const c = p[0];
    std::size_t length = 0;
    unsigned char low = 0x80, high = 0xBF; // the range of the second byte
    if (c < 0x80)
        return 1;
    if (c >= 0xC2 && c <= 0xDF)
        length = 2;
    else if (c >= 0xE0 && c <= 0xEF) {
        length = 3;
        low = c == 0xE0 ? 0xA0 : 0x80;
        high = c == 0xED ? 0x9F : 0xBF;
    } else if (c >= 0xF0 && c <= 0xF4) {
        length = 4;
        low = c == 0xF0 ? 0x90 : 0x80;
        high = c == 0xF4 ? 0x8F : 0xBF;
    } else
        return 0;
    if (end - p < static_cast<std::ptrdiff_t>(length) || p[1] < low || p[1] > high)
        return 0;
    for (std::size_t i = 2; i < length; ++i)
        if (p[i] < 0x80 || p[i] > 0xBF)
            return 0;
    return length;
}

/// The file's lines as narrow text, each checked for length, control characters and UTF-8.
std::vector<std::string> SplitLines(char const* name, char const* bytes, std::size_t size,
                                    char const* function) {
    std::vector<std::string> lines;
    std::size_t pos = size >= 3 && std::memcmp(bytes, "\xEF\xBB\xBF", 3) == 0 ? 3 : 0;
    while (pos < size) {
        char const* const begin = bytes + pos;
        auto const* newline = static_cast<char const*>(std::memchr(begin, '\n', size - pos));
        std::size_t length = newline ? static_cast<std::size_t>(newline - begin) : size - pos;
        pos += length + 1;
        if (length > 0 && begin[length - 1] == '\r')
            --length;
        int const number = static_cast<int>(lines.size()) + 1;
        if (length > StringsFile::kMaxLineBytes)
            RaiseBadLine(name, number, Message("STRINGS_FILE_LINE_TOO_LONG", {}), function);
        auto const* p = reinterpret_cast<unsigned char const*>(begin);
        auto const* const end = p + length;
        bool ascii = true;
        for (auto const* q = p; q < end; ++q)
            if ((*q < 0x20 && *q != '\t') || *q == 0x7F) {
                char hex[3];
                std::snprintf(hex, sizeof hex, "%02X", *q);
                RaiseBadLine(name, number, Message("STRINGS_FILE_CONTROL_CHARACTER_1", {hex}),
                             function);
            }
        for (auto const* q = p; q < end;) {
            std::size_t const n = Utf8SequenceLength(q, end);
            if (n == 0)
                RaiseBadLine(name, number, Message("STRINGS_FILE_NOT_UTF8", {}), function);
            ascii = ascii && n == 1;
            q += n;
        }
        if (ascii) {
            lines.emplace_back(begin, length);
            continue;
        }
        DynamicString narrow;
        narrow.AssignFromUTF8(begin, static_cast<int>(length));
        lines.emplace_back(narrow.GetBufferReadPtr(),
                           static_cast<std::size_t>(narrow.GetNumBytes()));
    }
    return lines;
}

/// Hands the lines to the INI reader one by one.
struct LineFeed {
    std::vector<std::string> const& lines;
    std::size_t next = 0;
};

int TEKIT_STDCALL FeedLine(void* data, char* buffer, int bufferSize, int* endOfInput,
                           int* lineNumber) {
    auto& feed = *static_cast<LineFeed*>(data);
    if (feed.next >= feed.lines.size()) {
        *endOfInput = 1;
        buffer[0] = '\0';
        return 0;
    }
    std::string const& line = feed.lines[feed.next];
    // Never longer than the buffer: a UTF-8 line of at most 640 bytes is at most as long in
    // any narrow code page.
    std::size_t const length = std::min(line.size(), static_cast<std::size_t>(bufferSize));
    std::memcpy(buffer, line.data(), length);
    buffer[length] = '\0';
    *lineNumber = static_cast<int>(++feed.next);
    *endOfInput = feed.next == feed.lines.size();
    return static_cast<int>(length);
}

struct IniDeleter {
    void operator()(IniObjectRec* ini) const { Ini_Dispose(ini); }
};

/// Why the INI reader ignored `line`, a line that is neither blank nor a comment; null when
/// it is a piece of a long text that the reader joined to the piece before it.
char const* IgnoredLineReason(std::string const& line, bool beforeFirstSection, bool mb) {
    char const* const end = line.data() + line.size();
    char const* const begin = ini::SkipWhite(line.data(), end);
    if (*begin == '[')
        return "STRINGS_FILE_BAD_SECTION_HEADER";
    if (beforeFirstSection)
        return "STRINGS_FILE_BEFORE_SECTION";
    char const* const separator = ini::FindToken(begin, end, "=", 1, mb);
    if (!separator)
        return "STRINGS_FILE_NOT_AN_ITEM";
    char const* const keyEnd = ini::TrimEnd(begin, separator, mb);
    if (keyEnd == begin)
        return "STRINGS_FILE_EMPTY_KEY";
    char const* const text = ini::SkipWhite(separator + 1, end);
    if (ini::TrimEnd(text, end, mb) == text)
        return "STRINGS_FILE_EMPTY_TEXT";
    std::size_t base = 0;
    std::int32_t number = 0;
    return ini::ParsePieceTag(begin, static_cast<std::size_t>(keyEnd - begin), base, number, mb)
               ? nullptr
               : "STRINGS_FILE_NOT_AN_ITEM";
}

/// The earliest problem found after reading.
struct Problem {
    int line = INT_MAX;
    DynamicString text;

    void Note(int at, DynamicString const& what) {
        if (at < line) {
            line = at;
            text = what;
        }
    }
};

} // namespace

namespace ini {

StringsLoadingLock::StringsLoadingLock() {
    gLoadingLock.Lock(kExclusiveAccess, 0);
}

StringsLoadingLock::~StringsLoadingLock() {
    gLoadingLock.Unlock(kExclusiveAccess);
}

void ReadStringsText(char const* name, char const* bytes, std::size_t size, char const* function,
                     std::vector<LoadedString>& rows, std::vector<int>* lines) {
    if (size > StringsFile::kMaxFileBytes) {
        std::string const count = std::to_string(size);
        TE_RAISE(TE_BAD_FILE_FORMAT, Message("STRINGS_FILE_TOO_LARGE_1_2", {name, count.c_str()}),
                 function);
    }
    std::vector<std::string> const text = SplitLines(name, bytes, size, function);
    std::unique_ptr<IniObjectRec, IniDeleter> const ini(Ini_New(0, nullptr));
    LineFeed feed{text};
    if (!ini || Ini_ReadGeneric(ini.get(), FeedLine, &feed) < 0)
        ThrowOutOfMemory();

    bool const mb = String::IsMultiByteSupportEnabled();
    std::vector<char> recognized(text.size() + 2, 0);
    int firstSection = INT_MAX;
    std::map<std::pair<std::string, std::string>, int> seen;
    std::vector<LoadedString> found;
    std::vector<int> foundLines;
    Problem problem;
    for (int s = 1; s <= Ini_NumberOfSections(ini.get()); ++s) {
        IniSection section = nullptr;
        char const* sectionName = nullptr;
        int line = 0;
        Ini_NthSection(ini.get(), s, &section);
        Ini_SectionInfoSP(ini.get(), section, &sectionName, &line);
        recognized[static_cast<std::size_t>(line)] = 1;
        firstSection = std::min(firstSection, line);
        for (int i = 1; i <= Ini_NumberOfItemsSP(ini.get(), section); ++i) {
            char const *key = nullptr, *raw = nullptr;
            Ini_NthItemSP(ini.get(), section, i, &key, &raw, &line, nullptr);
            recognized[static_cast<std::size_t>(line)] = 1;
            auto const [first, added] = seen.try_emplace({sectionName, key}, line);
            if (!added) {
                std::string const firstLine = std::to_string(first->second);
                problem.Note(line,
                             Message("STRINGS_FILE_DUPLICATE_KEY_1_2", {key, firstLine.c_str()}));
                continue;
            }
            std::string value(std::strlen(raw) + 1, '\0');
            value.resize(ini::Unescape(raw, value.data(), value.size(), mb));
            found.push_back({sectionName, key, std::move(value)});
            foundLines.push_back(line);
        }
    }
    for (std::size_t i = 0; i < text.size() && static_cast<int>(i) + 1 < problem.line; ++i) {
        std::string const& line = text[i];
        char const* const begin = ini::SkipWhite(line.data(), line.data() + line.size());
        if (recognized[i + 1] || begin == line.data() + line.size() || *begin == ';')
            continue;
        int const number = static_cast<int>(i) + 1;
        if (char const* reason = IgnoredLineReason(line, number < firstSection, mb))
            problem.Note(number, Message(reason, {}));
    }
    if (problem.line != INT_MAX)
        RaiseBadLine(name, problem.line, problem.text, function);
    rows.insert(rows.end(), std::make_move_iterator(found.begin()),
                std::make_move_iterator(found.end()));
    if (lines)
        lines->insert(lines->end(), foundLines.begin(), foundLines.end());
}

void ReadStringsFile(char const* path, char const* function, std::vector<LoadedString>& rows,
                     std::vector<int>* lines) {
    std::string const bytes = ReadFileBytes(path, function);
    ReadStringsText(path, bytes.data(), bytes.size(), function, rows, lines);
}

void ListStringsFiles(std::string directory, char const* function,
                      std::vector<std::string>& files) {
    if (!directory.empty() && !std::strchr(platform::kSeparators, directory.back()))
        directory += platform::kSeparators[0];
    std::vector<std::string> found;
    SystemError const error =
        platform::ListMatchingFiles((directory + "*.strings.ini").c_str(), false, found);
    if (error && (error.code == platform::native::kPathNotFound ||
                  error.code == platform::native::kFileNotFound))
        return;
    if (error) {
        TEError const code = detail::NativeErrorToTEError(error, TE_IO_ERROR);
        RString const reason = TEErrorToRString(code);
        TE_RAISE_API(code,
                     Message("STRINGS_DIRECTORY_CANT_LIST_1_2",
                             {directory.c_str(), static_cast<char const*>(reason)}),
                     function, error.apiFunction, error.code);
    }
    std::sort(found.begin(), found.end());
    files.insert(files.end(), found.begin(), found.end());
}

void EnsureTableOpen(char const* function) {
    if (RString::GlobalStringTableIsReady())
        detail::RaiseTableComplete(function);
}

void EnterRows(std::vector<LoadedString> const& rows, detail::LoadMode mode, char const* language,
               char const* function) {
    if (!detail::EnterLoadedStrings(rows, mode, language))
        detail::RaiseTableComplete(function);
}

} // namespace ini

// ---- StringsFile ------------------------------------------------------------------------------

struct StringsFile::Rows {
    std::vector<LoadedString> rows;
    std::vector<int> lines;
};

StringsFile::StringsFile() : m_rows(new Rows) {}

StringsFile::~StringsFile() {
    delete m_rows;
}

void StringsFile::Read(Path const& file) {
    Rows read;
    ini::ReadStringsFile(file.CStr(), "StringsFile::Read", read.rows, &read.lines);
    std::swap(*m_rows, read);
}

void StringsFile::ReadText(char const* name, void const* bytes, std::size_t size) {
    Rows read;
    ini::ReadStringsText(name ? name : "", static_cast<char const*>(bytes), size,
                         "StringsFile::ReadText", read.rows, &read.lines);
    std::swap(*m_rows, read);
}

int StringsFile::GetNumRows() const {
    return static_cast<int>(m_rows->rows.size());
}

namespace {
LoadedString const& RowAt(std::vector<LoadedString> const& rows, int index, char const* function) {
    if (index < 0 || static_cast<std::size_t>(index) >= rows.size())
        TE_RAISE(TE_INDEX_OUT_OF_RANGE, "", function);
    return rows[static_cast<std::size_t>(index)];
}
} // namespace

char const* StringsFile::GetSection(int index) const {
    return RowAt(m_rows->rows, index, "StringsFile::GetSection").section.c_str();
}

char const* StringsFile::GetKey(int index) const {
    return RowAt(m_rows->rows, index, "StringsFile::GetKey").key.c_str();
}

char const* StringsFile::GetText(int index) const {
    return RowAt(m_rows->rows, index, "StringsFile::GetText").text.c_str();
}

int StringsFile::GetLine(int index) const {
    RowAt(m_rows->rows, index, "StringsFile::GetLine");
    return m_rows->lines[static_cast<std::size_t>(index)];
}

void StringsFile::Use() const {
    ini::StringsLoadingLock const lock;
    ini::EnterRows(m_rows->rows, detail::LoadMode::kAdd, nullptr, "StringsFile::Use");
}

// ---- RString's strings-file functions ----------------------------------------------------------

void RString::UseStringsFile(Path const& file) {
    char const* const kFunction = "RString::UseStringsFile";
    ini::StringsLoadingLock const lock;
    ini::EnsureTableOpen(kFunction);
    std::vector<LoadedString> rows;
    ini::ReadStringsFile(file.CStr(), kFunction, rows);
    ini::EnterRows(rows, detail::LoadMode::kAdd, nullptr, kFunction);
}

void RString::UseAllStringsFilesInDirectory(Path const& directory, unsigned int* count) {
    char const* const kFunction = "RString::UseAllStringsFilesInDirectory";
    ini::StringsLoadingLock const lock;
    ini::EnsureTableOpen(kFunction);
    std::vector<std::string> files;
    ini::ListStringsFiles(directory.CStr(), kFunction, files);
    std::vector<LoadedString> rows;
    for (std::string const& file : files)
        ini::ReadStringsFile(file.c_str(), kFunction, rows);
    ini::EnterRows(rows, detail::LoadMode::kAdd, nullptr, kFunction);
    if (count)
        *count = static_cast<unsigned int>(files.size());
}

} // namespace tekit
