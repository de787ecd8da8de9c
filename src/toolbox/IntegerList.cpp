// Integer lists: plain int arrays on the library's heap. The block of a list of n values
// always has room for Capacity(n) values, so appending one at a time reallocates only when n
// reaches a power of two.
#include "tekit/toolbox/IntegerList.h"

#include "tekit/errors/TEError.h"
#include "tekit/toolbox/TextHelpers.h"
#include "toolbox/FlatGuard.h"
#include "toolbox/TextScan.h"

#include <algorithm>
#include <bit>
#include <climits>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

namespace {

using namespace tekit;

constexpr long long kMaxValues = 16777216;

std::size_t Capacity(std::size_t numItems) {
    return numItems == 0 ? 0 : std::max<std::size_t>(4, std::bit_ceil(numItems));
}

/// Reads [white] [sign] digits [white] from `p`; false when there is no number or it does not
/// fit in an int.
bool ReadInt(char const*& p, char const* end, long long& value) {
    while (p < end && toolbox::IsWhiteSpace(*p))
        ++p;
    bool const negative = p < end && *p == '-';
    if (p < end && (*p == '-' || *p == '+'))
        ++p;
    if (p >= end || *p < '0' || *p > '9')
        return false;
    long long magnitude = 0;
    for (; p < end && *p >= '0' && *p <= '9'; ++p) {
        magnitude = magnitude * 10 + (*p - '0');
        if (magnitude > 0x80000000LL)
            return false;
    }
    value = negative ? -magnitude : magnitude;
    while (p < end && toolbox::IsWhiteSpace(*p))
        ++p;
    return value >= INT_MIN && value <= INT_MAX;
}

/// Appends the values of one item, "v" or "from-to", to `values`.
int ParseItem(char const* p, char const* end, std::vector<int>& values) {
    long long from = 0, to = 0;
    if (!ReadInt(p, end, from))
        return TE_UNRECOGNIZED_VALUE;
    to = from;
    if (p < end && *p == '-' && !ReadInt(++p, end, to))
        return TE_UNRECOGNIZED_VALUE;
    if (p != end)
        return TE_UNRECOGNIZED_VALUE;
    long long const count = (to >= from ? to - from : from - to) + 1;
    if (static_cast<long long>(values.size()) + count > kMaxValues)
        return TE_INVALID_OR_OUT_OF_RANGE;
    long long const step = to >= from ? 1 : -1;
    for (long long v = from;; v += step) {
        values.push_back(static_cast<int>(v));
        if (v == to)
            break;
    }
    return 0;
}

int Parse(std::string_view text, std::vector<int>& values) {
    std::string const copy(text); // the text helpers scan NUL-terminated text
    if (!HasNonWhiteSpace(copy.c_str()))
        return 0;
    std::size_t begin = 0;
    for (;;) {
        std::size_t const comma = text.find(',', begin);
        std::size_t const end = comma == std::string_view::npos ? text.size() : comma;
        int const status = ParseItem(text.data() + begin, text.data() + end, values);
        if (status < 0)
            return status;
        if (comma == std::string_view::npos)
            return 0;
        begin = comma + 1;
    }
}

/// Moves the parsed values into a new list block.
int Publish(std::vector<int> const& values, int** list) {
    if (values.empty()) {
        *list = nullptr;
        return 0;
    }
    auto* const block = static_cast<int*>(std::malloc(Capacity(values.size()) * sizeof(int)));
    if (!block)
        return TE_OUT_OF_MEMORY;
    std::memcpy(block, values.data(), values.size() * sizeof(int));
    *list = block;
    return static_cast<int>(values.size());
}

int Build(std::string_view text, int** list) {
    return toolbox::Guarded<int>(TE_OUT_OF_MEMORY, TE_PROGRAM_ERROR, [&] {
        std::vector<int> values;
        int const status = Parse(text, values);
        return status < 0 ? status : Publish(values, list);
    });
}

std::string_view Trimmed(std::string_view s) {
    while (!s.empty() && toolbox::IsWhiteSpace(s.front()))
        s.remove_prefix(1);
    while (!s.empty() && toolbox::IsWhiteSpace(s.back()))
        s.remove_suffix(1);
    return s;
}

/// Finds the value of `name` in "name=value; ...": 1, or TE_READ_OBJECT_NOT_FOUND, or
/// TE_UNRECOGNIZED_VALUE for an entry without '='.
int FindParameter(std::string_view info, std::string_view name, std::string_view& value) {
    std::string const wanted(name);
    for (std::size_t begin = 0; begin <= info.size();) {
        std::size_t end = info.find(';', begin);
        if (end == std::string_view::npos)
            end = info.size();
        std::string_view const entry = info.substr(begin, end - begin);
        begin = end + 1;
        if (Trimmed(entry).empty())
            continue;
        std::size_t const equals = entry.find('=');
        if (equals == std::string_view::npos)
            return TE_UNRECOGNIZED_VALUE;
        std::string const key(Trimmed(entry.substr(0, equals)));
        if (StrICmpWithoutSurrWhiteSpace(key.c_str(), wanted.c_str()) == 0) {
            value = entry.substr(equals + 1);
            return 1;
        }
    }
    return TE_READ_OBJECT_NOT_FOUND;
}

} // namespace

extern "C" int TEKIT_STDCALL AppendToIntegerList(int** list, int* numItems, int value) {
    if (!list || !numItems || *numItems < 0 || *numItems == INT_MAX || (!*list && *numItems > 0))
        return 0;
    auto const n = static_cast<std::size_t>(*numItems);
    int* block = *list;
    if (n + 1 > Capacity(n)) {
        block = static_cast<int*>(std::realloc(block, Capacity(n + 1) * sizeof(int)));
        if (!block)
            return 0; // realloc leaves the old block as it was
    }
    block[n] = value;
    *list = block;
    *numItems = static_cast<int>(n + 1);
    return 1;
}

extern "C" int TEKIT_STDCALL BuildIntegerList(char const* text, int** list) {
    if (!text || !list)
        return TE_INVALID_POINTER;
    return Build(text, list);
}

extern "C" int TEKIT_STDCALL GetIntListFromParmInfo(char const* parmInfo, char const* name,
                                                    int** list) {
    if (!parmInfo || !name || !list)
        return TE_INVALID_POINTER;
    return toolbox::Guarded<int>(TE_OUT_OF_MEMORY, TE_PROGRAM_ERROR, [&] {
        std::string_view value;
        int const found = FindParameter(parmInfo, name, value);
        return found < 0 ? found : Build(value, list);
    });
}
