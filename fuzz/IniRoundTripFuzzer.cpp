// Fuzzes the INI reader and writer: arbitrary bytes are read, written, read and written again;
// the two texts must be identical and the two objects equal (sections, tags, values, quoted
// flags, in order).
//
// Input: byte 0 holds options (bit 0 Shift-JIS multibyte mode, bit 1 an automatically sorting
// object, bit 2 sorted indexes), the rest is the file's bytes, split into lines by the line
// reader as Ini_ReadFromFile does.
//
// A written line longer than the reader's 640 bytes would be cut when read (only a tag of
// several hundred bytes makes one): such inputs are read and written but not compared.
#include "tekit/ini/Ini.h"
#include "tekit/strings/MultiByte.h"
#include "tekit/strings/String.h"
#include "tekit/toolbox/LineFile.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

struct Memory {
    char const* data;
    std::size_t size;
    std::size_t pos = 0;
};

int TEKIT_STDCALL ReadChunk(void* source, int numBytes, int* numBytesRead, void* buffer) {
    auto& memory = *static_cast<Memory*>(source);
    std::size_t const take = std::min(memory.size - memory.pos, static_cast<std::size_t>(numBytes));
    std::memcpy(buffer, memory.data + memory.pos, take);
    memory.pos += take;
    *numBytesRead = static_cast<int>(take);
    return 0;
}

int TEKIT_STDCALL ReadLine(void* data, char* buffer, int bufferSize, int* endOfInput,
                           int* lineNumber) {
    auto const reader = static_cast<LineFile>(data);
    int length = 0;
    int const status = LineFile_ReadNonEmpty(reader, buffer, bufferSize, &length, endOfInput);
    *lineNumber = LineFile_NumLinesRead(reader);
    return status < 0 ? status : length;
}

IniHandle Read(std::string const& text, unsigned options) {
    IniHandle const ini = Ini_New(options & 2 ? 1 : 0, nullptr);
    Check(ini != nullptr);
    if (options & 4)
        Check(Ini_SortInternally(ini) == 0);
    Memory memory{text.data(), text.size()};
    LineFile const reader = LineFile_New(ReadChunk, &memory);
    Check(Ini_ReadGeneric(ini, ReadLine, reader) == 0);
    LineFile_Dispose(reader);
    return ini;
}

int TEKIT_STDCALL AppendLine(void* data, char const* line) {
    *static_cast<std::string*>(data) += line;
    *static_cast<std::string*>(data) += '\n';
    return 0;
}

std::string Write(IniHandle ini) {
    std::string text;
    Check(Ini_WriteGeneric(ini, AppendLine, &text) == 0);
    return text;
}

/// Sections, tags, values and quoted flags, in order, with lengths so no byte is ambiguous.
std::string Contents(IniHandle ini) {
    std::string out;
    auto add = [&](char const* text) { out += std::to_string(std::strlen(text)) + ":" + text; };
    int const sections = Ini_NumberOfSections(ini);
    for (int s = 1; s <= sections; ++s) {
        IniSection section = nullptr;
        Check(Ini_NthSection(ini, s, &section) == 1);
        char const* name = nullptr;
        Check(Ini_SectionInfoSP(ini, section, &name, nullptr) == 1);
        out += "S";
        add(name);
        int const items = Ini_NumberOfItemsSP(ini, section);
        for (int i = 1; i <= items; ++i) {
            char const* tag = nullptr;
            char const* value = nullptr;
            int quoted = 0;
            Check(Ini_NthItemSP(ini, section, i, &tag, &value, nullptr, &quoted) == 1);
            out += quoted ? "Q" : "I";
            add(tag);
            add(value);
        }
    }
    return out;
}

bool HasLongLine(std::string const& text) {
    std::size_t start = 0;
    for (std::size_t end; (end = text.find('\n', start)) != std::string::npos; start = end + 1)
        if (end - start > 640)
            return true;
    return false;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size < 1)
        return 0;
    unsigned const options = data[0];
    tekit::SetMultiByteCodePage(options & 1 ? 932 : 0);
    tekit::String::EnableMultiByteSupport((options & 1) != 0);
    std::string const input(reinterpret_cast<char const*>(data) + 1, size - 1);

    IniHandle const first = Read(input, options);
    std::string const text = Write(first);
    if (!HasLongLine(text)) {
        IniHandle const second = Read(text, options);
        Check(Write(second) == text);
        Check(Contents(second) == Contents(first));
        Ini_Dispose(second);
    }
    Ini_Dispose(first);
    return 0;
}
