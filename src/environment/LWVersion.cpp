// Loomwire version text: parsing and comparison.
#include "tekit/environment/LWVersion.h"

#include <charconv>
#include <cstdint>
#include <string_view>

namespace tekit {

namespace {

/// Groups 1, 3 and 5 of "^(\d+)(\.(\d+)(\.(\d+))?)?" searched in a text (empty when absent).
struct VersionGroups {
    std::string_view major, minor, patch;
};

bool IsDigit(char c) {
    return c >= '0' && c <= '9';
}

/// The digits at `p`, advancing `p` past them.
std::string_view TakeDigits(char const*& p) {
    char const* const begin = p;
    while (IsDigit(*p))
        ++p;
    return {begin, size_t(p - begin)};
}

/// "." and digits at `p`: their digits, `p` advanced past both; nothing taken otherwise.
std::string_view TakeDotDigits(char const*& p) {
    if (*p != '.' || !IsDigit(p[1]))
        return {};
    ++p;
    return TakeDigits(p);
}

/// The expression's match at the text's start. Greedy digits followed by optional groups, each
/// of which needs a digit after its ".", match without backtracking: one scan, in time linear
/// in the digits read, whatever the text's length (there is no expression object to build).
bool MatchVersion(char const* text, VersionGroups& groups) {
    char const* p = text;
    groups.major = TakeDigits(p);
    if (groups.major.empty())
        return false;
    groups.minor = TakeDotDigits(p);
    if (!groups.minor.empty())
        groups.patch = TakeDotDigits(p);
    return true;
}

/// The digits as a signed 32-bit number into `value`, over the range String::CvtToInt32
/// reads; false, and `value` left alone, when they do not fit.
bool Convert(std::string_view digits, long& value) {
    std::int32_t number = 0;
    auto const result = std::from_chars(digits.data(), digits.data() + digits.size(), number);
    if (result.ec != std::errc())
        return false;
    value = number;
    return true;
}

int Sign(long a, long b) {
    return a < b ? -1 : a > b ? 1 : 0;
}

} // namespace

bool ParseLWVersionString(char const* text, long& major, long& minor, long& patch) {
    major = minor = patch = 0;
    VersionGroups groups;
    if (text == nullptr || !MatchVersion(text, groups))
        return false;
    // Each present group is converted; the last conversion decides the result.
    bool converted = Convert(groups.major, major);
    if (!groups.minor.empty())
        converted = Convert(groups.minor, minor);
    if (!groups.patch.empty())
        converted = Convert(groups.patch, patch);
    return converted;
}

bool ParseLWVersionString(char const* text, long& major, long& minor) {
    long patch = 0;
    return ParseLWVersionString(text, major, minor, patch);
}

int LWVersionCompare(char const* a, char const* b, bool& bothValid, bool majorOnly) {
    long aMajor, aMinor, aPatch, bMajor, bMinor, bPatch;
    bool const aValid = ParseLWVersionString(a, aMajor, aMinor, aPatch);
    bool const bValid = ParseLWVersionString(b, bMajor, bMinor, bPatch);
    bothValid = aValid && bValid;
    if (!bothValid)
        return 0;
    if (majorOnly || aMajor != bMajor)
        return Sign(aMajor, bMajor);
    if (aMinor != bMinor)
        return Sign(aMinor, bMinor);
    return Sign(aPatch, bPatch);
}

bool LWVersionIsGivenVersionOrGreater(char const* version, char const* given, bool majorOnly) {
    bool bothValid = false;
    int const order = LWVersionCompare(version, given, bothValid, majorOnly);
    return bothValid && order >= 0;
}

bool LWVersionIsMinimumVersionOrGreater(char const* version) {
    return LWVersionIsGivenVersionOrGreater(version, "17.0.0", false);
}

} // namespace tekit
