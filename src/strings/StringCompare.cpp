// Comparison of strings: by character value in multibyte mode, by unsigned byte otherwise; the
// case-insensitive forms fold ASCII letters only, like the "C" locale, whatever the process's
// locale is.
#include "strings/MultiByteChars.h"
#include "tekit/strings/String.h"

#include <algorithm>
#include <cstring>

namespace tekit {

namespace {

int Sign(int v) {
    return v < 0 ? -1 : (v > 0 ? 1 : 0);
}

/// Unsigned byte comparison of two whole texts: -1, 0 or 1 (strcmp compares bytes as unsigned
/// char, a word at a time).
int CompareBytes(char const* a, char const* b) {
    return Sign(std::strcmp(a, b));
}

long CompareTexts(char const* a, char const* b, bool ignoreCase, int numChars) {
    bool const counted = numChars >= 0;
    if (String::IsMultiByteSupportEnabled()) {
        if (ignoreCase)
            return counted ? mbcs::NICmp(a, b, numChars) : mbcs::ICmp(a, b);
        return counted ? mbcs::NCmp(a, b, numChars) : mbcs::Cmp(a, b);
    }
    if (ignoreCase)
        return mbcs::AsciiNICmp(a, b, numChars);
    if (counted)
        return Sign(std::strncmp(a, b, size_t(numChars)));
    return CompareBytes(a, b);
}

} // namespace

long String::Compare(char const* other, bool ignoreCase, int numChars, int startIndex) const {
    char const* self = GetBufferReadPtr();
    if (other && other == self)
        return 0; // the string's own buffer
    if (!self)
        self = "";
    if (startIndex > 0) {
        if (m_isMultiByteSupportEnabled)
            self = mbcs::NInc(self, startIndex);
        else
            self += std::min(startIndex, GetNumBytes());
    }
    return CompareTexts(self, other ? other : "", ignoreCase, numChars);
}

long String::Compare(String const& other, bool ignoreCase, int numChars, int startIndex) const {
    return Compare(other.GetBufferReadPtr(), ignoreCase, numChars, startIndex);
}

} // namespace tekit
