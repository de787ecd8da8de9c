// Reading INI text: each line is classified (comment, section header, item, or ignored) and
// the object grows by appending; multi-line items are joined, and order and indexes restored,
// when the input ends.
#include "ini/IniObjSupport.h"
#include "ini/IniObject.h"
#include "ini/IniText.h"

#include "platform/File.h"
#include "platform/Heap.h"
#include "tekit/strings/String.h"
#include "tekit/toolbox/LineFile.h"
#include "toolbox/FlatGuard.h"

#include <algorithm>
#include <cstring>

namespace tekit::ini {

namespace {

/// Appends the lines of one read to the object.
class Reader {
public:
    Reader(IniObjectRec& ini, bool mb)
        : m_ini(ini), m_mb(mb), m_separatorLength(std::strlen(ini.separator)),
          m_commentLength(std::strlen(ini.comment)) {}

    /// Takes one line of `length` bytes (`line[length]` may be overwritten). 0 or
    /// INI_ERR_OUT_OF_MEMORY.
    int Line(char* line, std::size_t length, std::int32_t lineNumber) {
        char const* const end = line + length;
        char* const p = const_cast<char*>(SkipWhite(line, end));
        if (p == end)
            return 0;
        if (static_cast<std::size_t>(end - p) >= m_commentLength &&
            std::memcmp(p, m_ini.comment, m_commentLength) == 0)
            return 0;
        if (*p == m_ini.sectionStart)
            return Header(p + 1, end, lineNumber);
        return Entry(p, end, lineNumber);
    }

private:
    int Header(char* begin, char const* end, std::int32_t lineNumber) {
        char const* const name = SkipWhite(begin, end);
        char const* const close = FindLastChar(name, end, m_ini.sectionEnd, m_mb);
        if (!close || SkipWhite(close + 1, end) != end)
            return 0;
        char const* const nameEnd = TrimEnd(name, close, m_mb);
        if (nameEnd == name)
            return 0;
        std::size_t const length = static_cast<std::size_t>(nameEnd - name);
        m_current = nullptr;
        if (m_ini.filter) {
            const_cast<char*>(nameEnd)[0] = '\0';
            if (m_ini.filter(&m_ini, m_ini.filterData, name) == 0)
                return 0;
        }
        m_current = AddSection(m_ini, name, length, lineNumber, true);
        return m_current ? 0 : INI_ERR_OUT_OF_MEMORY;
    }

    int Entry(char const* begin, char const* end, std::int32_t lineNumber) {
        if (!m_current)
            return 0; // before any section, or in a section the filter skipped
        char const* const separator =
            FindToken(begin, end, m_ini.separator, m_separatorLength, m_mb);
        if (!separator)
            return 0;
        char const* const tagEnd = TrimEnd(begin, separator, m_mb);
        char const* value = SkipWhite(separator + m_separatorLength, end);
        char const* valueEnd = TrimEnd(value, end, m_mb);
        if (tagEnd == begin || valueEnd == value)
            return 0;
        bool quoted = false;
        if (valueEnd - value >= 2 && *value == '"' && EndsWithChar(value, valueEnd, '"', m_mb)) {
            ++value;
            --valueEnd;
            quoted = true;
        }
        std::size_t const tagLength = static_cast<std::size_t>(tagEnd - begin);
        std::size_t const valueLength = static_cast<std::size_t>(valueEnd - value);
        char* const block = m_ini.arena.Allocate(tagLength + valueLength + 2);
        if (!block)
            return INI_ERR_OUT_OF_MEMORY;
        std::memcpy(block, begin, tagLength);
        block[tagLength] = '\0';
        std::memcpy(block + tagLength + 1, value, valueLength);
        block[tagLength + 1 + valueLength] = '\0';
        Item const item{block, block + tagLength + 1, lineNumber,
                        static_cast<std::uint8_t>(quoted ? 1 : 0), 0};
        if (!ListInsertItem(m_current->items, &item, LIST_POS_END))
            return INI_ERR_OUT_OF_MEMORY;
        if (tagEnd[-1] >= '0' && tagEnd[-1] <= '9')
            m_current->mayHavePieces = true;
        return 0;
    }

    IniObjectRec& m_ini;
    bool const m_mb;
    std::size_t const m_separatorLength;
    std::size_t const m_commentLength;
    IniSectionRec* m_current = nullptr;
};

/// Reads every line of `source` (a callable filling a 641-byte buffer: returns a status and
/// sets the length, end of input and line number) into the object, then finishes the read.
template <class Source> int ReadLines(IniObjectRec& ini, Source&& source) {
    bool const mb = String::IsMultiByteSupportEnabled();
    std::int32_t const firstNew = SectionCount(ini);
    bool const hadIndexes = ini.sectionIndex.list != nullptr;
    DropIndexes(ini); // rebuilt at the end: appending keeps no index up to date cheaply
    ClearSectionCache(ini);

    Reader reader(ini, mb);
    char line[kMaxLineLength + 1 + 16];
    int status = 0;
    for (;;) {
        std::size_t length = 0;
        bool endOfInput = false;
        std::int32_t lineNumber = 0;
        status = source(line, length, endOfInput, lineNumber);
        if (status < 0)
            break;
        if (length > 0 && (status = reader.Line(line, length, lineNumber)) < 0)
            break;
        if (endOfInput)
            break;
    }

    // The sections read so far stay, whole: joined, in order, indexed as before.
    IniSectionRec* const* sections = SectionsOf(ini);
    std::int32_t const count = SectionCount(ini);
    for (std::int32_t i = firstNew; i < count; ++i)
        if (sections[i]->mayHavePieces && !JoinMultiLineItems(ini, *sections[i], mb) && status >= 0)
            status = INI_ERR_OUT_OF_MEMORY;
    if (ini.keepSorted)
        SortAll(ini);
    if (hadIndexes && !BuildIndexes(ini) && status >= 0)
        status = INI_ERR_OUT_OF_MEMORY;
    return status < 0 ? status : 0;
}

/// The line reader's chunk callback over an open file, reading ahead in large blocks so that a
/// big file costs few system calls.
struct FileSource {
    platform::NativeFile file = platform::kNoFile;
    char* block = nullptr;
    std::size_t size = 0;
    std::size_t used = 0;
    std::size_t filled = 0;
};

constexpr std::size_t kFileBlockSize = 64 * 1024;

int TEKIT_STDCALL ReadFileChunk(void* data, int numBytes, int* numBytesRead, void* buffer) {
    auto& source = *static_cast<FileSource*>(data);
    if (source.used == source.filled) {
        std::size_t count = 0;
        if (platform::ReadFromFile(source.file, source.block, source.size, count))
            return INI_ERR_CANT_READ_FILE;
        source.used = 0;
        source.filled = count;
    }
    std::size_t const take = std::min(source.filled - source.used,
                                      static_cast<std::size_t>(numBytes > 0 ? numBytes : 0));
    std::memcpy(buffer, source.block + source.used, take);
    source.used += take;
    *numBytesRead = static_cast<int>(take);
    return 0;
}

/// The line reader's chunk callback over bytes in memory.
struct MemorySource {
    char const* next = nullptr;
    std::size_t left = 0;
};

int TEKIT_STDCALL ReadMemoryChunk(void* data, int numBytes, int* numBytesRead, void* buffer) {
    auto& source = *static_cast<MemorySource*>(data);
    std::size_t const take =
        std::min(source.left, static_cast<std::size_t>(numBytes > 0 ? numBytes : 0));
    std::memcpy(buffer, source.next, take);
    source.next += take;
    source.left -= take;
    *numBytesRead = static_cast<int>(take);
    return 0;
}

/// Reads what `reader` delivers into the object: 0 or a status.
int ReadThroughLineReader(IniObjectRec& ini, LineFile reader) {
    return toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] {
        return ReadLines(
            ini, [&](char* line, std::size_t& length, bool& endOfInput, std::int32_t& lineNumber) {
                int kept = 0, end = 0;
                int const result = LineFile_ReadNonEmpty(reader, line, kMaxLineLength, &kept, &end);
                if (result < 0)
                    return static_cast<int>(INI_ERR_CANT_READ_FILE);
                length = static_cast<std::size_t>(kept);
                endOfInput = end != 0;
                lineNumber = LineFile_NumLinesRead(reader);
                return 0;
            });
    });
}

} // namespace

int ReadFromMemory(IniHandle ini, char const* text, std::size_t size) {
    if (!IsValid(ini) || (!text && size > 0))
        return INI_ERR_INVALID_ARGUMENT;
    MemorySource source{text, size};
    LineFile const reader = LineFile_New(ReadMemoryChunk, &source);
    int const status = reader ? ReadThroughLineReader(*ini, reader) : INI_ERR_OUT_OF_MEMORY;
    LineFile_Dispose(reader);
    return status;
}

} // namespace tekit::ini

using namespace tekit::ini;
using tekit::toolbox::Guarded;

extern "C" int TEKIT_STDCALL Ini_ReadGeneric(IniHandle ini, IniReadLineCallback readLine,
                                             void* data) {
    if (!IsValid(ini) || !readLine)
        return INI_ERR_INVALID_ARGUMENT;
    return Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] {
        std::int32_t previousLine = 0;
        return ReadLines(
            *ini, [&](char* line, std::size_t& length, bool& endOfInput, std::int32_t& lineNumber) {
                int end = 0;
                int number = previousLine + 1;
                line[0] = '\0';
                int const status = readLine(data, line, kMaxLineLength, &end, &number);
                if (status < 0)
                    return status;
                line[kMaxLineLength] = '\0';
                length = std::strlen(line);
                endOfInput = end != 0;
                lineNumber = previousLine = number;
                return 0;
            });
    });
}

extern "C" int TEKIT_STDCALL Ini_ReadFromFile(IniHandle ini, char const* path) {
    if (!IsValid(ini) || !path)
        return INI_ERR_INVALID_ARGUMENT;
    FileSource source;
    if (tekit::platform::OpenFileForReading(path, source.file))
        return INI_ERR_CANT_OPEN_FILE;
    source.block = static_cast<char*>(tekit::platform::HeapAllocate(kFileBlockSize));
    source.size = kFileBlockSize;
    LineFile const reader = source.block ? LineFile_New(ReadFileChunk, &source) : nullptr;
    int const status = reader ? ReadThroughLineReader(*ini, reader) : INI_ERR_OUT_OF_MEMORY;
    LineFile_Dispose(reader);
    tekit::platform::HeapFree(source.block);
    tekit::platform::CloseFile(source.file);
    return status;
}
