// Product versions: reading "4.2.1.77", writing it back and comparing.
#include "tekit/toolbox/Version.h"

#include <cstdio>

namespace tekit {

Version::Version(char const* text) {
    Parse(text);
}

Version::Version(String const& text) {
    Parse(text.GetBufferReadPtr());
}

Version::Version(std::uint32_t major, std::uint32_t minor, std::uint32_t patch, std::uint32_t build)
    : m_parts{major, minor, patch, build}, m_numParts(kMaxParts) {}

bool Version::Parse(char const* text) {
    *this = Version();
    if (!text)
        return false;
    std::uint32_t parts[kMaxParts] = {0, 0, 0, 0};
    int numParts = 0;
    char const* p = text;
    for (;;) {
        if (numParts == kMaxParts || *p < '0' || *p > '9')
            return false;
        std::uint64_t value = 0;
        for (; *p >= '0' && *p <= '9'; ++p) {
            value = value * 10 + std::uint64_t(*p - '0');
            if (value > 0xFFFFFFFFu)
                return false;
        }
        parts[numParts++] = std::uint32_t(value);
        if (*p == '\0')
            break;
        if (*p++ != '.')
            return false;
    }
    for (int i = 0; i < kMaxParts; ++i)
        m_parts[i] = parts[i];
    m_numParts = numParts;
    return true;
}

std::uint32_t Version::GetPart(int index) const {
    return index >= 0 && index < kMaxParts ? m_parts[index] : 0;
}

DynamicString Version::ToString() const {
    char text[4 * 11 + 1] = "";
    int length = 0;
    for (int i = 0; i < m_numParts; ++i)
        length += std::snprintf(text + length, sizeof text - size_t(length), i ? ".%u" : "%u",
                                unsigned(m_parts[i]));
    return DynamicString(text);
}

int Version::Compare(Version const& other) const {
    if (IsValid() != other.IsValid())
        return IsValid() ? 1 : -1;
    for (int i = 0; i < kMaxParts; ++i)
        if (m_parts[i] != other.m_parts[i])
            return m_parts[i] < other.m_parts[i] ? -1 : 1;
    return 0;
}

} // namespace tekit
