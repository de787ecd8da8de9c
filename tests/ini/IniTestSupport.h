// Helpers of the INI tests: an object that disposes itself, and reading and writing text held
// in strings through the generic line callbacks.
#pragma once

#include "tekit/ini/Ini.h"

#include <gtest/gtest.h>

#include <cstring>
#include <sstream>
#include <string>
#include <vector>

namespace tekit::testing {

/// An INI object for one test.
class IniObject {
public:
    explicit IniObject(int sortFlag = 0) : m_ini(Ini_New(sortFlag, nullptr)) {}
    ~IniObject() { Ini_Dispose(m_ini); }
    IniObject(IniObject const&) = delete;
    IniObject& operator=(IniObject const&) = delete;
    operator IniHandle() const { return m_ini; }

private:
    IniHandle m_ini;
};

/// Serves the lines of a text (split at LF) to Ini_ReadGeneric, numbering them from 1.
struct TextLines {
    std::istringstream text;
    int number = 0;

    explicit TextLines(std::string const& all) : text(all) {}

    static int TEKIT_STDCALL Read(void* data, char* buffer, int bufferSize, int* endOfInput,
                                  int* lineNumber) {
        auto& self = *static_cast<TextLines*>(data);
        std::string line;
        if (!std::getline(self.text, line)) {
            *endOfInput = 1;
            return 0;
        }
        line.resize(std::min(line.size(), static_cast<std::size_t>(bufferSize)));
        std::memcpy(buffer, line.c_str(), line.size() + 1);
        *lineNumber = ++self.number;
        return static_cast<int>(line.size());
    }
};

/// Reads `text` (lines separated by LF) into `ini`; the read's status.
inline int ReadText(IniHandle ini, std::string const& text) {
    TextLines lines(text);
    return Ini_ReadGeneric(ini, TextLines::Read, &lines);
}

inline int TEKIT_STDCALL AppendLine(void* data, char const* line) {
    *static_cast<std::string*>(data) += std::string(line) + "\n";
    return 0;
}

/// The object as text, each line ended by LF.
inline std::string WriteText(IniHandle ini) {
    std::string text;
    EXPECT_EQ(Ini_WriteGeneric(ini, AppendLine, &text), 0);
    return text;
}

/// The raw value of (section, tag), or "<absent>".
inline std::string Raw(IniHandle ini, char const* section, char const* tag) {
    char const* value = nullptr;
    int const found = Ini_GetPointerToRawString(ini, section, tag, &value);
    return found == 1 ? std::string(value) : found == 0 ? "<absent>" : "<error>";
}

/// A whole object as one text: each section as "[name]" and its items as tag=value, quoted
/// values marked with a leading '"', with line numbers when `withLines`.
inline std::string Dump(IniHandle ini, bool withLines = false) {
    std::string out;
    int const sections = Ini_NumberOfSections(ini);
    for (int s = 1; s <= sections; ++s) {
        IniSection section = nullptr;
        Ini_NthSection(ini, s, &section);
        char const* name = nullptr;
        int line = 0;
        Ini_SectionInfoSP(ini, section, &name, &line);
        out += "[" + std::string(name) + "]";
        if (withLines)
            out += "@" + std::to_string(line);
        out += "\n";
        int const items = Ini_NumberOfItemsSP(ini, section);
        for (int i = 1; i <= items; ++i) {
            char const* tag = nullptr;
            char const* value = nullptr;
            int quoted = 0;
            Ini_NthItemSP(ini, section, i, &tag, &value, &line, &quoted);
            out += std::string(tag) + "=" + (quoted ? "\"" : "") + value;
            if (withLines)
                out += "@" + std::to_string(line);
            out += "\n";
        }
    }
    return out;
}

} // namespace tekit::testing
