// ExportTable: the exports by ordinal and by name, and forwarders followed within the module.
#include "tekit/paths/ExportTable.h"

#include "paths/executable/PEImage.h"
#include "tekit/errors/Raise.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <string>

namespace tekit {

namespace {

bool EqualNoCase(char const* a, std::size_t aLength, char const* b, std::size_t bLength) {
    if (aLength != bLength)
        return false;
    for (std::size_t i = 0; i < aLength; ++i) {
        unsigned char x = static_cast<unsigned char>(a[i]), y = static_cast<unsigned char>(b[i]);
        if (x >= 'A' && x <= 'Z')
            x = static_cast<unsigned char>(x + 32);
        if (y >= 'A' && y <= 'Z')
            y = static_cast<unsigned char>(y + 32);
        if (x != y)
            return false;
    }
    return true;
}

/// Whether the module part of a forwarder ("KERNEL32" of "KERNEL32.HeapAlloc") names the
/// module `self` ("kernel32.dll"): the same name, with or without its ".dll".
bool NamesModule(char const* module, std::size_t length, char const* self) {
    std::size_t selfLength = std::strlen(self);
    if (EqualNoCase(module, length, self, selfLength))
        return true;
    if (selfLength > 4 && EqualNoCase(self + selfLength - 4, 4, ".dll", 4))
        selfLength -= 4;
    return EqualNoCase(module, length, self, selfLength);
}

} // namespace

ExportTable::ExportTable() = default;

void ExportTable::SetModule(DynamicString const& moduleName, std::uint32_t ordinalBase,
                            DynamicString const& fileName) {
    m_moduleName = moduleName;
    m_ordinalBase = ordinalBase;
    m_fileName = fileName;
}

void ExportTable::Add(ExportedFunction function) {
    m_functions.push_back(std::move(function));
}

void ExportTable::Finish() {
    std::stable_sort(
        m_functions.begin(), m_functions.end(),
        [](ExportedFunction const& a, ExportedFunction const& b) { return a.ordinal < b.ordinal; });
    m_byName.clear();
    for (std::uint32_t i = 0; i < m_functions.size(); ++i)
        if (!m_functions[i].name.IsEmpty())
            m_byName.push_back(i);
    std::stable_sort(m_byName.begin(), m_byName.end(), [this](std::uint32_t a, std::uint32_t b) {
        return std::strcmp(m_functions[a].name.GetBufferReadPtr(),
                           m_functions[b].name.GetBufferReadPtr()) < 0;
    });
}

ExportedFunction const* ExportTable::Find(char const* name) const {
    if (!name)
        return nullptr;
    auto const found = std::lower_bound(
        m_byName.begin(), m_byName.end(), name, [this](std::uint32_t index, char const* key) {
            return std::strcmp(m_functions[index].name.GetBufferReadPtr(), key) < 0;
        });
    if (found == m_byName.end() || std::strcmp(m_functions[*found].name.GetBufferReadPtr(), name))
        return nullptr;
    return &m_functions[*found];
}

ExportedFunction const* ExportTable::FindOrdinal(std::uint32_t ordinal) const {
    auto const found = std::lower_bound(
        m_functions.begin(), m_functions.end(), ordinal,
        [](ExportedFunction const& f, std::uint32_t key) { return f.ordinal < key; });
    return found != m_functions.end() && found->ordinal == ordinal ? &*found : nullptr;
}

ExportedFunction const& ExportTable::Resolve(char const* name) const {
    char const kFunction[] = "ExportTable::Resolve";
    std::string wanted = name ? name : "";
    ExportedFunction const* current = Find(wanted.c_str());
    std::vector<bool> visited(m_functions.size());
    for (;;) {
        if (!current)
            TE_RAISE(TE_FUNC_NOT_IN_LIB,
                     executable::Detail("EXE_EXPORT_NOT_FOUND_1_2", m_fileName.GetBufferReadPtr(),
                                        wanted.c_str()),
                     kFunction);
        std::size_t const index = static_cast<std::size_t>(current - m_functions.data());
        if (visited[index])
            TE_RAISE(
                TE_BAD_FILE_FORMAT,
                executable::Detail("EXE_MALFORMED_1_2", m_fileName.GetBufferReadPtr(),
                                   executable::Detail("EXE_CIRCULAR_FORWARDER_1", name ? name : "")
                                       .GetBufferReadPtr()),
                kFunction);
        visited[index] = true;
        if (!current->IsForwarded())
            return *current;
        char const* const text = current->forwarder.GetBufferReadPtr();
        char const* const dot = std::strrchr(text, '.');
        if (!dot || !NamesModule(text, static_cast<std::size_t>(dot - text),
                                 m_moduleName.GetBufferReadPtr()))
            return *current; // into another module
        wanted = dot + 1;
        if (wanted.size() > 1 && wanted[0] == '#') {
            char* end = nullptr;
            unsigned long const ordinal = std::strtoul(wanted.c_str() + 1, &end, 10);
            current = *end == '\0' && ordinal <= 0xffffffffu
                          ? FindOrdinal(static_cast<std::uint32_t>(ordinal))
                          : nullptr;
        } else {
            current = Find(wanted.c_str());
        }
    }
}

} // namespace tekit
