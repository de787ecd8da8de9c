// Fuzzes the typed getters and setters of the INI store over a parsed object: random tags and
// types are read, and the getters must agree with each other and with what was put.
//
// Input: bytes 0-1 the length L of the INI text (little-endian), then L bytes of text (lines
// separated by LF), then operations, each an operation byte followed by its operands.
#include "tekit/ini/Ini.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

struct Lines {
    std::vector<std::string> lines;
    std::size_t next = 0;
};

int TEKIT_STDCALL ReadLine(void* data, char* buffer, int bufferSize, int* endOfInput, int*) {
    auto& source = *static_cast<Lines*>(data);
    if (source.next == source.lines.size()) {
        *endOfInput = 1;
        return 0;
    }
    std::string const& line = source.lines[source.next++];
    std::size_t const kept = std::min(line.size(), static_cast<std::size_t>(bufferSize));
    std::memcpy(buffer, line.data(), kept);
    buffer[kept] = '\0';
    return static_cast<int>(kept);
}

class Operations {
public:
    Operations(std::uint8_t const* data, std::size_t size) : m_data(data), m_size(size) {}
    bool More() const { return m_pos < m_size; }
    std::uint8_t Byte() { return m_pos < m_size ? m_data[m_pos++] : 0; }
    std::uint64_t Word() {
        std::uint64_t value = 0;
        for (int i = 0; i < 8; ++i)
            value = value << 8 | Byte();
        return value;
    }
    std::string Text() {
        std::size_t const length = Byte() % 24;
        std::string text;
        for (std::size_t i = 0; i < length && More(); ++i)
            if (char const c = static_cast<char>(Byte()))
                text += c;
        return text;
    }

private:
    std::uint8_t const* m_data;
    std::size_t m_size;
    std::size_t m_pos = 0;
};

bool IsStatus(int status) {
    return status == 0 || status == 1 || status == INI_ERR_INVALID_INTEGER ||
           status == INI_ERR_INVALID_DOUBLE || status == INI_ERR_INVALID_BOOLEAN ||
           status == INI_ERR_INVALID_DATA;
}

/// Every getter on (section, tag): results that must agree.
void GetAll(IniHandle ini, char const* section, char const* tag) {
    char const* pointer = nullptr;
    int const found = Ini_GetPointerToString(ini, section, tag, &pointer);
    Check(found == 0 || found == 1);
    std::string const unescaped = found == 1 ? pointer : "";
    char* copy = nullptr;
    Check(Ini_GetStringCopy(ini, section, tag, &copy) == found);
    if (found == 1)
        Check(unescaped == copy);
    TBFree(copy);
    std::vector<char> buffer(unescaped.size() + 8);
    Check(Ini_GetStringIntoBuffer(ini, section, tag, buffer.data(),
                                  static_cast<int>(buffer.size())) == found);
    if (found == 1)
        Check(unescaped == buffer.data());

    char const* raw = nullptr;
    Check(Ini_GetPointerToRawString(ini, section, tag, &raw) == found);
    int const line = Ini_LineOfLastAccess(ini);
    Check(line >= -1);

    int i = 0;
    std::int64_t i64 = 0;
    int const intStatus = Ini_GetInt(ini, section, tag, &i);
    int const int64Status = Ini_GetInt64(ini, section, tag, &i64);
    Check(IsStatus(intStatus) && IsStatus(int64Status));
    if (intStatus == 1)
        Check(int64Status == 1 && i64 == i);
    unsigned u = 0;
    std::uint64_t u64 = 0;
    int const uintStatus = Ini_GetUInt(ini, section, tag, &u);
    int const uint64Status = Ini_GetUInt64(ini, section, tag, &u64);
    Check(IsStatus(uintStatus) && IsStatus(uint64Status));
    if (uintStatus == 1)
        Check(uint64Status == 1 && u64 == u);
    double d = 0;
    int const doubleStatus = Ini_GetDouble(ini, section, tag, &d);
    Check(IsStatus(doubleStatus));
    if (int64Status == 1 && doubleStatus == 1)
        Check(std::fabs(d - static_cast<double>(i64)) <= std::fabs(d) * 1e-15);
    int b = 0;
    Check(IsStatus(Ini_GetBoolean(ini, section, tag, &b)));
    void* bytes = nullptr;
    int size = 0;
    int const dataStatus = Ini_GetData(ini, section, tag, &bytes, &size);
    Check(IsStatus(dataStatus));
    if (dataStatus == 1)
        Check(bytes != nullptr && size >= 0);
    TBFree(bytes);
}

void PutAndGet(IniHandle ini, Operations& ops, char const* section, std::string const& tag) {
    if (tag.empty())
        return;
    switch (ops.Byte() % 5) {
    case 0: {
        int const value = static_cast<int>(ops.Word());
        Check(Ini_PutInt(ini, section, tag.c_str(), value) == 0);
        int back = 0;
        Check(Ini_GetInt(ini, section, tag.c_str(), &back) == 1 && back == value);
        break;
    }
    case 1: {
        std::uint64_t const value = ops.Word();
        Check(Ini_PutUInt64(ini, section, tag.c_str(), value) == 0);
        std::uint64_t back = 0;
        Check(Ini_GetUInt64(ini, section, tag.c_str(), &back) == 1 && back == value);
        break;
    }
    case 2: {
        std::uint64_t const bits = ops.Word();
        double value = 0;
        std::memcpy(&value, &bits, sizeof value);
        Check(Ini_PutDouble(ini, section, tag.c_str(), value) == 0);
        double back = 0;
        Check(Ini_GetDouble(ini, section, tag.c_str(), &back) == 1);
        if (std::isnan(value)) {
            Check(std::isnan(back));
        } else {
            char text[40];
            std::snprintf(text, sizeof text, "%.16g", value);
            Check(back == std::strtod(text, nullptr));
        }
        break;
    }
    case 3: {
        std::string const value = ops.Text();
        Check(Ini_PutString(ini, section, tag.c_str(), value.c_str()) == 0);
        char* back = nullptr;
        int const found = Ini_GetStringCopy(ini, section, tag.c_str(), &back);
        bool const blank = value.find_first_not_of(' ') == std::string::npos;
        Check(found == (blank ? 0 : 1));
        if (found == 1)
            Check(value == back);
        TBFree(back);
        break;
    }
    default: {
        std::string const value = ops.Text();
        Check(Ini_PutData(ini, section, tag.c_str(), value.data(),
                          static_cast<int>(value.size())) == 0);
        void* back = nullptr;
        int size = -1;
        int const found = Ini_GetData(ini, section, tag.c_str(), &back, &size);
        Check(found == (value.empty() ? 0 : 1));
        if (found == 1)
            Check(size == static_cast<int>(value.size()) &&
                  std::memcmp(back, value.data(), value.size()) == 0);
        TBFree(back);
        break;
    }
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size) {
    if (size < 2)
        return 0;
    std::size_t const textLength = std::min<std::size_t>(data[0] | data[1] << 8, size - 2);
    std::string const text(reinterpret_cast<char const*>(data) + 2, textLength);
    Lines lines;
    for (std::size_t start = 0; start <= text.size();) {
        std::size_t const end = std::min(text.find('\n', start), text.size());
        lines.lines.push_back(text.substr(start, end - start));
        start = end + 1;
    }
    IniHandle const ini = Ini_New(0, nullptr);
    Check(Ini_ReadGeneric(ini, ReadLine, &lines) == 0);
    Operations ops(data + 2 + textLength, size - 2 - textLength);
    while (ops.More()) {
        std::uint8_t const op = ops.Byte();
        // A section and tag from the object, or made up.
        std::string section = "s", tag;
        int const sections = Ini_NumberOfSections(ini);
        if (sections > 0 && op & 1) {
            char const* name = nullptr;
            Check(Ini_NthSectionName(ini, 1 + ops.Byte() % sections, &name) == 1);
            section = name;
            int const items = Ini_NumberOfItems(ini, name);
            char const* itemTag = nullptr;
            if (items > 0 && Ini_NthItemName(ini, name, 1 + ops.Byte() % items, &itemTag) == 1)
                tag = itemTag;
        } else {
            tag = ops.Text();
        }
        if (op & 2) {
            if (op & 4)
                Ini_SortInternally(ini);
            PutAndGet(ini, ops, section.c_str(), tag);
        } else {
            GetAll(ini, section.c_str(), tag.c_str());
        }
    }
    Ini_Dispose(ini);
    return 0;
}
