// The typed setters and getters: values as text in their fixed formats, escaped strings, data
// text, and the lookups that record the line of last access.
#include "ini/IniEscape.h"
#include "ini/IniObject.h"
#include "ini/IniText.h"

#include "platform/CLocale.h"
#include "platform/Heap.h"
#include "tekit/strings/String.h"
#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/TextHelpers.h"
#include "toolbox/FlatGuard.h"

#include <bit>
#include <charconv>
#include <climits>
#include <cmath>
#include <cstring>

namespace tekit::ini {

namespace {

/// The negative quiet NaN that x86 arithmetic produces (0.0 / 0.0): "indeterminate".
constexpr std::uint64_t kIndeterminateBits = 0xFFF8000000000000ull;

bool MultiByte() {
    return String::IsMultiByteSupportEnabled();
}

// ---- Setters --------------------------------------------------------------------------------

int PutText(IniObjectRec& ini, IniSectionRec& section, char const* tag, char const* value,
            std::size_t length, bool quoted) {
    std::size_t const tagLength = std::strlen(tag);
    char* const block = NewItemBlock(tag, tagLength, value, length);
    if (!block)
        return INI_ERR_OUT_OF_MEMORY;
    return PutItem(ini, section, block, tagLength, quoted);
}

int PutEscaped(IniObjectRec& ini, IniSectionRec& section, char const* tag, char const* value) {
    bool const mb = MultiByte();
    std::size_t const tagLength = std::strlen(tag);
    std::size_t const length = EscapedLength(value, mb);
    auto* const block = static_cast<char*>(platform::HeapAllocate(tagLength + length + 2));
    if (!block)
        return INI_ERR_OUT_OF_MEMORY;
    std::memcpy(block, tag, tagLength);
    block[tagLength] = '\0';
    Escape(value, block + tagLength + 1, mb);
    return PutItem(ini, section, block, tagLength, true);
}

template <class Integer>
int PutInteger(IniObjectRec& ini, IniSectionRec& section, char const* tag, Integer value) {
    char text[24];
    auto const result = std::to_chars(text, text + sizeof text, value);
    return PutText(ini, section, tag, text, static_cast<std::size_t>(result.ptr - text), false);
}

int PutDoubleValue(IniObjectRec& ini, IniSectionRec& section, char const* tag, double value) {
    char text[40];
    std::size_t length = 0;
    if (std::isnan(value)) {
        char const* const word =
            std::bit_cast<std::uint64_t>(value) == kIndeterminateBits ? "Ind" : "Nan";
        std::memcpy(text, word, length = 3);
    } else if (std::isinf(value)) {
        char const* const word = value > 0 ? "Inf" : "-Inf";
        std::memcpy(text, word, length = std::strlen(word));
    } else {
        // As "%.16g" writes it, with the object's decimal point.
        auto const result =
            std::to_chars(text, text + sizeof text, value, std::chars_format::general, 16);
        length = static_cast<std::size_t>(result.ptr - text);
        if (ini.decimalPoint != '.')
            if (char* const point = static_cast<char*>(std::memchr(text, '.', length)))
                *point = ini.decimalPoint;
    }
    return PutText(ini, section, tag, text, length, false);
}

int PutDataValue(IniObjectRec& ini, IniSectionRec& section, char const* tag, void const* data,
                 int size) {
    if (size < 0 || (!data && size > 0))
        return INI_ERR_INVALID_ARGUMENT;
    int const textLength = GetTextSizeForData(size);
    if (textLength < 0)
        return INI_ERR_DATA_TOO_LARGE;
    std::size_t const tagLength = std::strlen(tag);
    auto* const block = static_cast<char*>(
        platform::HeapAllocate(tagLength + static_cast<std::size_t>(textLength) + 2));
    if (!block)
        return INI_ERR_OUT_OF_MEMORY;
    std::memcpy(block, tag, tagLength);
    block[tagLength] = '\0';
    if (ConvertDataToTextInBuffer(data, size, block + tagLength + 1, textLength + 1) < 0) {
        platform::HeapFree(block);
        return INI_ERR_OUT_OF_MEMORY;
    }
    return PutItem(ini, section, block, tagLength, true);
}

// ---- Getters --------------------------------------------------------------------------------

bool IsBlank(char const* text) {
    while (IsWhite(*text))
        ++text;
    return *text == '\0';
}

/// Looks the item up and records its line: 1 with `value` set, or 0 when it is absent or
/// blank.
int FindValue(IniObjectRec& ini, IniSectionRec const& section, char const* tag,
              char const*& value) {
    std::int32_t const position = FindItem(section, tag);
    if (position < 0)
        return 0;
    Item const& item = ItemsOf(section)[position];
    ini.lineOfLastAccess = item.line;
    if (IsBlank(item.value))
        return 0;
    value = item.value;
    return 1;
}

/// The value without surrounding white space in `out` (room for `size` bytes); false when it
/// does not fit (it then is no word a getter knows).
bool TrimmedCopy(char const* value, char* out, std::size_t size) {
    char const* const end = value + std::strlen(value);
    char const* const begin = SkipWhite(value, end);
    char const* const last = TrimEnd(begin, end, false);
    std::size_t const length = static_cast<std::size_t>(last - begin);
    if (length >= size)
        return false;
    std::memcpy(out, begin, length);
    out[length] = '\0';
    return true;
}

template <class Integer> bool ParseInteger(char const* text, bool allowSign, Integer& result) {
    char const* const end = text + std::strlen(text);
    char const* p = SkipWhite(text, end);
    char const* const last = TrimEnd(p, end, false);
    bool negative = false;
    if (allowSign && p < last && (*p == '+' || *p == '-'))
        negative = *p++ == '-';
    if (p == last)
        return false;
    using Unsigned = std::make_unsigned_t<Integer>;
    Unsigned magnitude = 0;
    constexpr Unsigned kMax = static_cast<Unsigned>(-1);
    for (; p < last; ++p) {
        if (*p < '0' || *p > '9')
            return false;
        unsigned const digit = static_cast<unsigned>(*p - '0');
        if (magnitude > (kMax - digit) / 10)
            return false;
        magnitude = magnitude * 10 + digit;
    }
    if constexpr (std::is_signed_v<Integer>) {
        Unsigned const limit =
            static_cast<Unsigned>(std::numeric_limits<Integer>::max()) + (negative ? 1u : 0u);
        if (magnitude > limit)
            return false;
        result = negative ? static_cast<Integer>(Unsigned(0) - magnitude)
                          : static_cast<Integer>(magnitude);
    } else {
        result = magnitude;
    }
    return true;
}

int GetDoubleValue(IniObjectRec& ini, char const* value, double& result) {
    char word[8];
    if (TrimmedCopy(value, word, sizeof word)) {
        platform::CLocaleHandle const locale = ini.locale;
        if (platform::CompareIgnoringCaseInLocale(word, "Nan", locale) == 0) {
            result = std::numeric_limits<double>::quiet_NaN();
            return 1;
        }
        if (platform::CompareIgnoringCaseInLocale(word, "Ind", locale) == 0) {
            result = std::bit_cast<double>(kIndeterminateBits);
            return 1;
        }
        if (platform::CompareIgnoringCaseInLocale(word, "Inf", locale) == 0) {
            result = std::numeric_limits<double>::infinity();
            return 1;
        }
        if (platform::CompareIgnoringCaseInLocale(word, "-Inf", locale) == 0) {
            result = -std::numeric_limits<double>::infinity();
            return 1;
        }
    }
    char* end = nullptr;
    double const parsed = platform::StringToDoubleInLocale(value, &end, ini.locale);
    if (end == value || !IsBlank(end))
        return INI_ERR_INVALID_DOUBLE;
    result = parsed;
    return 1;
}

int GetBooleanValue(IniObjectRec& ini, char const* value, int& result) {
    char word[8];
    if (TrimmedCopy(value, word, sizeof word)) {
        if (platform::CompareIgnoringCaseInLocale(word, "True", ini.locale) == 0) {
            result = 1;
            return 1;
        }
        if (platform::CompareIgnoringCaseInLocale(word, "False", ini.locale) == 0) {
            result = 0;
            return 1;
        }
    }
    return INI_ERR_INVALID_BOOLEAN;
}

int GetDataValue(char const* value, void*& data, int& size) {
    std::size_t const length = std::strlen(value);
    if (length >= static_cast<std::size_t>(INT_MAX))
        return INI_ERR_DATA_TOO_LARGE;
    int const bytes = GetDataSizeForText(static_cast<int>(length));
    if (bytes < 0)
        return INI_ERR_INVALID_DATA;
    void* const block = platform::HeapAllocate(static_cast<std::size_t>(bytes));
    if (!block)
        return INI_ERR_OUT_OF_MEMORY;
    if (ConvertTextToDataInBuffer(value, static_cast<int>(length), block, bytes) != bytes) {
        platform::HeapFree(block);
        return INI_ERR_INVALID_DATA;
    }
    data = block;
    size = bytes;
    return 1;
}

/// Runs `get(value)` on the item's value when it is present and not blank.
template <class Get>
int WithValue(IniObjectRec& ini, IniSectionRec const& section, char const* tag, Get&& get) {
    char const* value = nullptr;
    int const found = FindValue(ini, section, tag, value);
    return found == 1 ? get(value) : found;
}

// ---- The two ways to name a section ---------------------------------------------------------

/// A getter by section pointer: checks the arguments and runs `body(object, section)`.
template <class Body>
int BySectionPtr(IniHandle ini, IniSection section, char const* tag, bool outputGiven,
                 Body&& body) {
    if (!IsValid(ini) || !IsValid(section) || !tag || !outputGiven)
        return INI_ERR_INVALID_ARGUMENT;
    return toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] { return body(*ini, *section); });
}

/// A getter by section name: an absent section is an absent item.
template <class Body>
int BySectionName(IniHandle ini, char const* section, char const* tag, bool outputGiven,
                  Body&& body) {
    if (!IsValid(ini) || !section || !tag || !outputGiven)
        return INI_ERR_INVALID_ARGUMENT;
    IniSectionRec* const found = FindSection(*ini, section);
    if (!found)
        return 0;
    return toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] { return body(*ini, *found); });
}

/// A setter by section pointer; the tag must not be empty.
template <class Body>
int PutBySectionPtr(IniHandle ini, IniSection section, char const* tag, Body&& body) {
    if (!IsValid(ini) || !IsValid(section) || !tag || !*tag)
        return INI_ERR_INVALID_ARGUMENT;
    return toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] { return body(*ini, *section); });
}

/// A setter by section name: a missing section is created.
template <class Body>
int PutBySectionName(IniHandle ini, char const* section, char const* tag, Body&& body) {
    if (!IsValid(ini) || !section || !tag || !*tag)
        return INI_ERR_INVALID_ARGUMENT;
    IniSectionRec* const found = FindOrAddSection(*ini, section);
    if (!found)
        return INI_ERR_OUT_OF_MEMORY;
    return toolbox::Guarded<int>(INI_ERR_OUT_OF_MEMORY, [&] { return body(*ini, *found); });
}

} // namespace

} // namespace tekit::ini

using namespace tekit::ini;
namespace platform = tekit::platform;

// Each setter and getter comes twice: by section name and, with "SP", by section pointer. The
// macros write both from one body over (IniObjectRec& o, IniSectionRec& s).
#define TEKIT_INI_PUT(Name, ValueType, valid, ...)                                                 \
    extern "C" int TEKIT_STDCALL Name(IniHandle ini, char const* section, char const* tag,         \
                                      ValueType value) {                                           \
        if (!(valid))                                                                              \
            return INI_ERR_INVALID_ARGUMENT;                                                       \
        return PutBySectionName(ini, section, tag,                                                 \
                                [&](IniObjectRec& o, IniSectionRec& s) { return __VA_ARGS__; });   \
    }                                                                                              \
    extern "C" int TEKIT_STDCALL Name##SP(IniHandle ini, IniSection section, char const* tag,      \
                                          ValueType value) {                                       \
        if (!(valid))                                                                              \
            return INI_ERR_INVALID_ARGUMENT;                                                       \
        return PutBySectionPtr(ini, section, tag,                                                  \
                               [&](IniObjectRec& o, IniSectionRec& s) { return __VA_ARGS__; });    \
    }

#define TEKIT_INI_UNPAREN(...) __VA_ARGS__
// A getter pair whose output parameters are `Params` (parenthesized) and present when `given`.
#define TEKIT_INI_GETTER(Name, Params, given, ...)                                                 \
    extern "C" int TEKIT_STDCALL Name(IniHandle ini, char const* section, char const* tag,         \
                                      TEKIT_INI_UNPAREN Params) {                                  \
        return BySectionName(ini, section, tag, given,                                             \
                             [&](IniObjectRec& o, IniSectionRec& s) { return __VA_ARGS__; });      \
    }                                                                                              \
    extern "C" int TEKIT_STDCALL Name##SP(IniHandle ini, IniSection section, char const* tag,      \
                                          TEKIT_INI_UNPAREN Params) {                              \
        return BySectionPtr(ini, section, tag, given,                                              \
                            [&](IniObjectRec& o, IniSectionRec& s) { return __VA_ARGS__; });       \
    }
#define TEKIT_INI_GET(Name, OutType, ...)                                                          \
    TEKIT_INI_GETTER(Name, (OutType out), out != nullptr, __VA_ARGS__)

// ---- Setters --------------------------------------------------------------------------------

TEKIT_INI_PUT(Ini_PutString, char const*, value, PutEscaped(o, s, tag, value))
TEKIT_INI_PUT(Ini_PutRawString, char const*, value,
              PutText(o, s, tag, value, std::strlen(value), false))
TEKIT_INI_PUT(Ini_PutInt, int, true, PutInteger(o, s, tag, value))
TEKIT_INI_PUT(Ini_PutUInt, unsigned int, true, PutInteger(o, s, tag, value))
TEKIT_INI_PUT(Ini_PutInt64, std::int64_t, true, PutInteger(o, s, tag, value))
TEKIT_INI_PUT(Ini_PutUInt64, std::uint64_t, true, PutInteger(o, s, tag, value))
TEKIT_INI_PUT(Ini_PutDouble, double, true, PutDoubleValue(o, s, tag, value))
TEKIT_INI_PUT(Ini_PutBoolean, int, true,
              PutText(o, s, tag, value ? "True" : "False", value ? 4 : 5, false))

extern "C" int TEKIT_STDCALL Ini_PutData(IniHandle ini, char const* section, char const* tag,
                                         void const* data, int size) {
    if (size < 0 || (!data && size > 0))
        return INI_ERR_INVALID_ARGUMENT;
    return PutBySectionName(ini, section, tag, [&](IniObjectRec& o, IniSectionRec& s) {
        return PutDataValue(o, s, tag, data, size);
    });
}
extern "C" int TEKIT_STDCALL Ini_PutDataSP(IniHandle ini, IniSection section, char const* tag,
                                           void const* data, int size) {
    if (size < 0 || (!data && size > 0))
        return INI_ERR_INVALID_ARGUMENT;
    return PutBySectionPtr(ini, section, tag, [&](IniObjectRec& o, IniSectionRec& s) {
        return PutDataValue(o, s, tag, data, size);
    });
}

// ---- String getters -------------------------------------------------------------------------

namespace {

int PointerToString(IniObjectRec& o, IniSectionRec& s, char const* tag, char const** out) {
    return WithValue(o, s, tag, [&](char const* value) {
        std::size_t const length = std::strlen(value);
        if (!ReserveBuffer(o, length + 1))
            return static_cast<int>(INI_ERR_OUT_OF_MEMORY);
        Unescape(value, o.buffer, o.bufferSize, MultiByte());
        *out = o.buffer;
        return 1;
    });
}

int StringCopy(IniObjectRec& o, IniSectionRec& s, char const* tag, char** out, bool raw) {
    return WithValue(o, s, tag, [&](char const* value) {
        std::size_t const length = std::strlen(value);
        auto* const copy = static_cast<char*>(platform::HeapAllocate(length + 1));
        if (!copy)
            return static_cast<int>(INI_ERR_OUT_OF_MEMORY);
        if (raw)
            std::memcpy(copy, value, length + 1);
        else
            Unescape(value, copy, length + 1, MultiByte());
        *out = copy;
        return 1;
    });
}

int StringIntoBuffer(IniObjectRec& o, IniSectionRec& s, char const* tag, char* buffer,
                     int bufferSize, bool raw) {
    if (bufferSize < 1)
        return INI_ERR_INVALID_ARGUMENT;
    return WithValue(o, s, tag, [&](char const* value) {
        std::size_t const size = static_cast<std::size_t>(bufferSize);
        if (raw) {
            char const* const end = value + std::strlen(value);
            std::size_t const kept = CutAtBoundary(value, end, size - 1, MultiByte());
            std::memcpy(buffer, value, kept);
            buffer[kept] = '\0';
        } else {
            Unescape(value, buffer, size, MultiByte());
        }
        return 1;
    });
}

} // namespace

TEKIT_INI_GET(Ini_GetPointerToString, char const**, PointerToString(o, s, tag, out))
TEKIT_INI_GET(Ini_GetStringCopy, char**, StringCopy(o, s, tag, out, false))
TEKIT_INI_GET(Ini_GetPointerToRawString, char const**, WithValue(o, s, tag, [&](char const* value) {
                  *out = value;
                  return 1;
              }))
TEKIT_INI_GET(Ini_GetRawStringCopy, char**, StringCopy(o, s, tag, out, true))

TEKIT_INI_GETTER(Ini_GetStringIntoBuffer, (char* buffer, int bufferSize), buffer != nullptr,
                 StringIntoBuffer(o, s, tag, buffer, bufferSize, false))
TEKIT_INI_GETTER(Ini_GetRawStringIntoBuffer, (char* buffer, int bufferSize), buffer != nullptr,
                 StringIntoBuffer(o, s, tag, buffer, bufferSize, true))

// ---- Typed getters --------------------------------------------------------------------------

TEKIT_INI_GET(Ini_GetInt, int*, WithValue(o, s, tag, [&](char const* value) {
                  return TBStrToInt(value, out) ? 1 : static_cast<int>(INI_ERR_INVALID_INTEGER);
              }))
TEKIT_INI_GET(Ini_GetUInt, unsigned int*, WithValue(o, s, tag, [&](char const* value) {
                  return StrToUInt(value, out) ? 1 : static_cast<int>(INI_ERR_INVALID_INTEGER);
              }))
TEKIT_INI_GET(Ini_GetInt64, std::int64_t*, WithValue(o, s, tag, [&](char const* value) {
                  return ParseInteger(value, true, *out)
                             ? 1
                             : static_cast<int>(INI_ERR_INVALID_INTEGER);
              }))
TEKIT_INI_GET(Ini_GetUInt64, std::uint64_t*, WithValue(o, s, tag, [&](char const* value) {
                  return ParseInteger(value, false, *out)
                             ? 1
                             : static_cast<int>(INI_ERR_INVALID_INTEGER);
              }))
TEKIT_INI_GET(Ini_GetDouble, double*, WithValue(o, s, tag, [&](char const* value) {
                  return GetDoubleValue(o, value, *out);
              }))
TEKIT_INI_GET(Ini_GetBoolean, int*, WithValue(o, s, tag, [&](char const* value) {
                  return GetBooleanValue(o, value, *out);
              }))

TEKIT_INI_GETTER(Ini_GetData, (void** data, int* size), data != nullptr && size != nullptr,
                 WithValue(o, s, tag,
                           [&](char const* value) { return GetDataValue(value, *data, *size); }))
