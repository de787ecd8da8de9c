// Splitting a text into a StringVector at separator characters or separator texts.
#include "strings/CharScan.h"
#include "tekit/strings/String.h"
#include "tekit/strings/StringVector.h"

#include <cstring>
#include <string>

namespace tekit {

namespace {

/// The bytes [begin, end) without surrounding white space, walked by characters so that a
/// double-byte character is never cut.
std::string Trimmed(char const* begin, char const* end, bool mb) {
    char const* first = begin;
    while (first < end && detail::IsWhiteSpace(detail::CharAt(first, mb)))
        first += detail::CharBytes(first, mb);
    char const* last = first; // one past the last character that is not white space
    for (char const* p = first; p < end; p += detail::CharBytes(p, mb))
        if (!detail::IsWhiteSpace(detail::CharAt(p, mb)))
            last = p + detail::CharBytes(p, mb);
    return std::string(first, static_cast<size_t>(last - first));
}

/// The byte length of the longest separator that occurs at `p`, or 0.
int SeparatorAt(char const* p, StringVector const& separators) {
    size_t best = 0;
    for (DynamicString const& separator : separators) {
        auto const n = static_cast<size_t>(separator.GetNumBytes());
        if (n > best && std::strncmp(p, separator.GetBufferReadPtr(), n) == 0)
            best = n;
    }
    return static_cast<int>(best);
}

} // namespace

void String::Split(StringVector& items, char const* separators, bool skipEmptyItems,
                   bool trimWhiteSpace) const {
    bool const mb = IsMultiByteSupportEnabled();
    char const* const set = (separators && *separators) ? separators : " \t\r\n\v\f";
    char const* text = GetBufferReadPtr();
    StringVector result;
    auto emit = [&](char const* begin, char const* end) {
        std::string item = trimWhiteSpace ? Trimmed(begin, end, mb)
                                          : std::string(begin, static_cast<size_t>(end - begin));
        if (!skipEmptyItems || !item.empty())
            result.emplace_back(item.c_str());
    };
    if (*text) {
        char const* itemStart = text;
        char const* p = text;
        for (; *p; p += detail::CharBytes(p, mb)) {
            if (detail::CharBytes(p, mb) == 1 && std::strchr(set, *p)) {
                emit(itemStart, p);
                itemStart = p + 1;
            }
        }
        emit(itemStart, p);
    }
    items.swap(result);
}

void String::Split(StringVector& items, StringVector const& separators) const {
    bool const mb = IsMultiByteSupportEnabled();
    char const* text = GetBufferReadPtr();
    StringVector result;
    if (*text) {
        char const* itemStart = text;
        char const* p = text;
        while (*p) {
            // Separators are compared byte for byte, but only from character boundaries.
            int const n = SeparatorAt(p, separators);
            if (n > 0) {
                result.emplace_back(
                    std::string(itemStart, static_cast<size_t>(p - itemStart)).c_str());
                p += n;
                itemStart = p;
            } else {
                p += detail::CharBytes(p, mb);
            }
        }
        result.emplace_back(std::string(itemStart, static_cast<size_t>(p - itemStart)).c_str());
    }
    items.swap(result);
}

} // namespace tekit
