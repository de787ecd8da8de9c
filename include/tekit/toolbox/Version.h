// A product version such as "4.2.1.77": up to four dot-separated unsigned numbers (major,
// minor, patch, build), compared part by part.
//
//   Version v("4.2");                         // 4.2.0.0, valid
//   v < Version(4, 2, 1);                     // true
//   v == Version("4.2.0.0");                  // true: absent parts are 0
//   v.ToString();                             // "4.2": the parts as written
//   Version("4.x").IsValid();                 // false
//
// Parse rule: the whole text is one to four parts separated by single dots; each part is one
// or more ASCII decimal digits whose value fits in 32 bits unsigned. Anything else is invalid:
// an empty text (or null), a part that is empty ("4..1", ".4", "4."), a sign, white space,
// any other character ("4.2 beta"), a fifth part, a part above 4294967295. Leading zeros are
// allowed and do not count ("04.2" is 4.2).
//
// An invalid version has every part 0 and ToString() "". It compares below every valid version
// and equal to every other invalid one, so sorting puts unreadable versions first and a
// minimum check against it (`v >= minimum`) fails for any invalid `v` unless `minimum` is
// invalid too.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

#include <compare>
#include <cstdint>

namespace tekit {

class TEKIT_API Version {
public:
    /// The number of parts a version has at most.
    static constexpr int kMaxParts = 4;

    /// An invalid version.
    Version() = default;
    /// Reads `text` by the parse rule above; null is invalid.
    explicit Version(char const* text);
    explicit Version(String const& text);
    /// A valid version of four parts.
    Version(std::uint32_t major, std::uint32_t minor, std::uint32_t patch = 0,
            std::uint32_t build = 0);

    /// Reads `text` into this version; returns IsValid().
    bool Parse(char const* text);
    bool IsValid() const { return m_numParts > 0; }

    std::uint32_t GetMajor() const { return m_parts[0]; }
    std::uint32_t GetMinor() const { return m_parts[1]; }
    std::uint32_t GetPatch() const { return m_parts[2]; }
    std::uint32_t GetBuild() const { return m_parts[3]; }
    /// Part `index` (0 .. 3); 0 for any other index.
    std::uint32_t GetPart(int index) const;
    /// How many parts the text had (1 .. 4; four for the numeric constructor); 0 when invalid.
    int GetNumParts() const { return m_numParts; }

    /// The parts as read, joined with dots ("4.2" stays "4.2"); "" when invalid.
    DynamicString ToString() const;

    /// -1, 0 or 1 as this version is lower than, equal to or higher than `other` (invalid
    /// versions lowest, see above). Absent parts are 0, so "4.2" equals "4.2.0.0".
    int Compare(Version const& other) const;
    std::strong_ordering operator<=>(Version const& other) const { return Compare(other) <=> 0; }
    bool operator==(Version const& other) const { return Compare(other) == 0; }

private:
    std::uint32_t m_parts[kMaxParts] = {0, 0, 0, 0};
    int m_numParts = 0;
};

} // namespace tekit
