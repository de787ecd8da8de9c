// Text helpers of the flat interface. Every function checks its pointers and sizes first and
// writes nothing when it fails; none lets an exception out.
#include "tekit/toolbox/TextHelpers.h"

#include "strings/MultiByteChars.h"
#include "tekit/errors/TEError.h"
#include "tekit/strings/String.h"
#include "toolbox/FlatGuard.h"
#include "toolbox/TextScan.h"

#include <algorithm>
#include <climits>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <string>

namespace {

using namespace tekit::toolbox;
using tekit::TE_INCOMPATIBLE_PARAMETERS;
using tekit::TE_INVALID_OR_OUT_OF_RANGE;
using tekit::TE_INVALID_POINTER;
using tekit::TE_OUT_OF_MEMORY;

bool Overlap(void const* a, std::size_t aSize, void const* b, std::size_t bSize) {
    auto const x = reinterpret_cast<std::uintptr_t>(a);
    auto const y = reinterpret_cast<std::uintptr_t>(b);
    return aSize && bSize && x < y + bSize && y < x + aSize;
}

/// Bytes of `text` before its terminator, looking at no more than `limit` bytes; `limit` when
/// there is no terminator among them.
std::size_t BoundedLength(char const* text, std::size_t limit) {
    void const* end = std::memchr(text, '\0', limit);
    return end ? static_cast<std::size_t>(static_cast<char const*>(end) - text) : limit;
}

char* Duplicate(char const* begin, std::size_t length) {
    auto* const copy = static_cast<char*>(std::malloc(length + 1));
    if (copy) {
        std::memcpy(copy, begin, length);
        copy[length] = '\0';
    }
    return copy;
}

/// Reads optional white space, decimal digits and optional white space, up to the end of
/// `text`; the magnitude is capped just above the unsigned 32-bit range.
bool ParseMagnitude(char const* p, std::uint64_t& magnitude) {
    if (*p < '0' || *p > '9')
        return false;
    magnitude = 0;
    for (; *p >= '0' && *p <= '9'; ++p) {
        magnitude = magnitude * 10 + static_cast<unsigned>(*p - '0');
        if (magnitude > 0xFFFFFFFFull)
            magnitude = 0x100000000ull; // stays out of range, never overflows
    }
    return *SkipWhite(p) == '\0';
}

/// Counts the items of a comma-separated text: 0 for an empty or blank text.
int CountItems(char const* text) {
    if (*SkipWhite(text) == '\0')
        return 0;
    long long count = 1;
    for (char const* p = text; *p; p = NextChar(p))
        count += *p == ',';
    return count > INT_MAX ? -1 : static_cast<int>(count);
}

/// Terminates the item that begins at `begin` and ends before `end`, without its white
/// space, and returns its first character.
char* CutItem(char* begin, char* end) {
    char* const first = const_cast<char*>(SkipWhite(begin));
    char* last = first;
    for (char* p = first; p < end; p = NextChar(p)) {
        if (!IsWhiteSpace(*p))
            last = NextChar(p);
    }
    *last = '\0';
    return first;
}

} // namespace

extern "C" char* TEKIT_STDCALL SkipWhiteSpace(char const* text) {
    return text ? const_cast<char*>(SkipWhite(text)) : nullptr;
}

extern "C" char* TEKIT_STDCALL SkipNonWhiteSpace(char const* text) {
    if (!text)
        return nullptr;
    char const* p = text;
    while (*p && !IsWhiteSpace(*p))
        p = NextChar(p);
    return const_cast<char*>(p);
}

extern "C" int TEKIT_STDCALL HasNonWhiteSpace(char const* text) {
    return text && *SkipWhite(text) != '\0';
}

extern "C" int TEKIT_STDCALL StrICmp(char const* a, char const* b) {
    if (!a || !b)
        return a ? 1 : (b ? -1 : 0);
    return CompareIgnoringCase(a, a + std::strlen(a), b, b + std::strlen(b));
}

extern "C" int TEKIT_STDCALL StrICmpWithoutSurrWhiteSpace(char const* a, char const* b) {
    if (!a || !b)
        return a ? 1 : (b ? -1 : 0);
    char const* const ta = SkipWhite(a);
    char const* const tb = SkipWhite(b);
    return CompareIgnoringCase(ta, TrimmedEnd(ta), tb, TrimmedEnd(tb));
}

extern "C" int TEKIT_STDCALL StringCopyMax(char* dest, char const* source, int destSize) {
    if (!dest)
        return TE_INVALID_POINTER;
    if (destSize < 1)
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (!source)
        source = "";
    // Only the bytes that can be kept are looked at: the source may be longer than the buffer.
    std::size_t const length = BoundedLength(source, static_cast<std::size_t>(destSize));
    int const kept = CutAtCharBoundary(source, static_cast<int>(length), destSize - 1);
    if (Overlap(source, length + (length < static_cast<std::size_t>(destSize)), dest,
                static_cast<std::size_t>(kept) + 1))
        return TE_INCOMPATIBLE_PARAMETERS;
    std::memcpy(dest, source, static_cast<std::size_t>(kept));
    dest[kept] = '\0';
    return kept;
}

extern "C" int TEKIT_STDCALL StringInsert(char* dest, char const* text, int position,
                                          int destSize) {
    if (!dest)
        return TE_INVALID_POINTER;
    if (destSize < 1 || std::memchr(dest, '\0', static_cast<std::size_t>(destSize)) == nullptr)
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (!text)
        text = "";
    std::size_t const textLength = std::strlen(text);
    if (Overlap(text, textLength + 1, dest, static_cast<std::size_t>(destSize)))
        return TE_INCOMPATIBLE_PARAMETERS;
    bool const multiByte = tekit::String::IsMultiByteSupportEnabled();
    int const numChars = multiByte ? tekit::mbcs::Len(dest) : static_cast<int>(std::strlen(dest));
    if (position < 0 || position > numChars)
        return TE_INVALID_OR_OUT_OF_RANGE;
    return tekit::toolbox::Guarded<int>(TE_OUT_OF_MEMORY, [&] {
        std::size_t const offset =
            multiByte ? static_cast<std::size_t>(tekit::mbcs::NBCnt(dest, position))
                      : static_cast<std::size_t>(position);
        std::string result(dest, offset);
        result.append(text, textLength).append(dest + offset);
        int const kept = CutAtCharBoundary(
            result.c_str(), static_cast<int>(std::min<std::size_t>(result.size(), INT_MAX)),
            destSize - 1);
        std::memcpy(dest, result.data(), static_cast<std::size_t>(kept));
        dest[kept] = '\0';
        return kept;
    });
}

extern "C" int TEKIT_STDCALL RemoveSurroundingWhiteSpace(char* text) {
    if (!text)
        return TE_INVALID_POINTER;
    char const* const first = SkipWhite(text);
    std::size_t const length = static_cast<std::size_t>(TrimmedEnd(first) - first);
    std::memmove(text, first, length);
    text[length] = '\0';
    return length > INT_MAX ? INT_MAX : static_cast<int>(length);
}

extern "C" char* TEKIT_STDCALL StrDupWithoutSurrWhiteSpace(char const* text) {
    if (!text)
        return nullptr;
    char const* const first = SkipWhite(text);
    return Duplicate(first, static_cast<std::size_t>(TrimmedEnd(first) - first));
}

extern "C" int TEKIT_STDCALL SpliceCommaSeparatedList(char* text, char** items, int maxItems) {
    if (!text)
        return TE_INVALID_POINTER;
    int const count = CountItems(text);
    if (count < 0 || (items && count > maxItems))
        return TE_INVALID_OR_OUT_OF_RANGE;
    if (!items || count == 0)
        return count;
    char* begin = text;
    for (int i = 0; i < count; ++i) {
        char* end = begin;
        while (*end && *end != ',')
            end = NextChar(end);
        char* const next = *end ? end + 1 : end;
        items[i] = CutItem(begin, end);
        begin = next;
    }
    return count;
}

extern "C" char* TEKIT_STDCALL TBStrDup(char const* text) {
    return text ? Duplicate(text, std::strlen(text)) : nullptr;
}

extern "C" int TEKIT_STDCALL TBStrToInt(char const* text, int* value) {
    if (!text || !value)
        return 0;
    char const* p = SkipWhite(text);
    bool const negative = *p == '-';
    if (*p == '-' || *p == '+')
        ++p;
    std::uint64_t magnitude = 0;
    if (!ParseMagnitude(p, magnitude) || magnitude > (negative ? 0x80000000ull : 0x7FFFFFFFull))
        return 0;
    long long const signedValue =
        negative ? -static_cast<long long>(magnitude) : static_cast<long long>(magnitude);
    *value = static_cast<int>(signedValue);
    return 1;
}

extern "C" int TEKIT_STDCALL StrToUInt(char const* text, unsigned int* value) {
    if (!text || !value)
        return 0;
    std::uint64_t magnitude = 0;
    if (!ParseMagnitude(SkipWhite(text), magnitude) || magnitude > 0xFFFFFFFFull)
        return 0;
    *value = static_cast<unsigned int>(magnitude);
    return 1;
}
