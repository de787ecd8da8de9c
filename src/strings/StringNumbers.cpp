// Reading numbers from text: the CvtTo... members of String.
//
// Digits are read with std::from_chars, so the result never depends on the process's C locale;
// the decimal point of floating-point numbers is the one the caller's option names.
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/String.h"

#include "strings/MultiByteChars.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <limits>
#include <string>
#include <type_traits>

namespace tekit {

namespace {

/// At most this many characters of an offending text are quoted in a message.
constexpr int kMaxQuotedChars = 64;

/// What a reader is reading: its messages, codes and range.
struct NumberType {
    char const* function;
    char const* notNumberKey;
    char const* overflowKey;
    TEError overflowCode;
    std::uint64_t maxPositive;
    std::uint64_t maxNegativeMagnitude;
};

constexpr NumberType kInt32{"String::CvtToInt32", "NOT_INT32_1", "INT32_OVERFLOW_1",
                            TE_INT32_OVERFLOW,    0x7FFFFFFFull, 0x80000000ull};
constexpr NumberType kUInt32{"String::CvtToUInt32", "NOT_UINT32_1", "UINT32_OVERFLOW_1",
                             TE_UINT32_OVERFLOW,    0xFFFFFFFFull,  0};
constexpr NumberType kInt64{"String::CvtToInt64", "NOT_INT64_1",         "INT64_OVERFLOW_1",
                            TE_INT64_OVERFLOW,    0x7FFFFFFFFFFFFFFFull, 0x8000000000000000ull};
constexpr NumberType kUInt64{"String::CvtToUInt64", "NOT_UINT64_1",        "UINT64_OVERFLOW_1",
                             TE_UINT64_OVERFLOW,    0xFFFFFFFFFFFFFFFFull, 0};

/// The type of the same width under another function name (the size types).
constexpr NumberType Renamed(NumberType type, char const* function) {
    type.function = function;
    return type;
}

[[noreturn]] void RaiseWithText(TEError code, char const* key, char const* text, size_t numBytes,
                                char const* function) {
    DynamicString quoted;
    quoted.AssignUsingNumBytesInsteadOfNumChars(text, int(std::min<size_t>(numBytes, 4096)), false);
    quoted.TruncateToNChars(kMaxQuotedChars, "...");
    DynamicString message(RString("ERR_DESCR", key).GetString());
    message.Format(quoted, 1);
    TE_RAISE(code, message, function);
}

bool IsSpace(char c) {
    return c == ' ' || (c >= '\t' && c <= '\r');
}

/// The text of a string from character `startIndex` on (clamped to the text).
struct Cursor {
    char const* text;  ///< start of the string
    char const* begin; ///< where reading starts
    char const* end;   ///< the terminator
    int startIndex;    ///< character index of `begin`

    Cursor(String const& s, int charIndex) {
        text = s.GetBufferReadPtr();
        end = text + s.GetNumBytes();
        startIndex = std::max(charIndex, 0);
        if (String::IsMultiByteSupportEnabled()) {
            begin = mbcs::NInc(text, startIndex);
            startIndex = mbcs::CharsInBytes(text, int(begin - text));
        } else {
            begin = text + std::min<std::ptrdiff_t>(startIndex, end - text);
            startIndex = int(begin - text);
        }
    }

    char const* SkipSpace(char const* p) const {
        while (p < end && IsSpace(*p))
            ++p;
        return p;
    }

    /// Ends a read at `numberEnd`: stores the index after the number, or checks that only
    /// white space follows. Numbers are single-byte text, so bytes count as characters.
    void Finish(char const* numberEnd, int* endIndex, NumberType const& type) const {
        if (endIndex != nullptr) {
            *endIndex = startIndex + int(numberEnd - begin);
            return;
        }
        if (SkipSpace(numberEnd) != end)
            RaiseWithText(TE_UNRECOGNIZED_VALUE, type.notNumberKey, begin, size_t(end - begin),
                          type.function);
    }
};

/// A number after its leading white space: where it begins, whether its sign is '-', and where
/// its digits begin (past a '-' or '+').
struct SignedNumber {
    char const* begin;
    bool negative;
    char const* digits;
};

SignedNumber ReadSign(Cursor const& cursor) {
    char const* const begin = cursor.SkipSpace(cursor.begin);
    bool const sign = begin < cursor.end && (*begin == '-' || *begin == '+');
    return {begin, sign && *begin == '-', begin + (sign ? 1 : 0)};
}

bool IsDigitOf(char c, int radix) {
    int const digit = (c >= '0' && c <= '9')   ? c - '0'
                      : (c >= 'a' && c <= 'z') ? c - 'a' + 10
                      : (c >= 'A' && c <= 'Z') ? c - 'A' + 10
                                               : 99;
    return digit < radix;
}

/// Skips a "0x" prefix for radix 16 and picks the radix for 0, as C's strtol does.
char const* ResolveRadix(char const* p, char const* end, int& radix) {
    bool const hexPrefix =
        end - p > 2 && p[0] == '0' && (p[1] | 0x20) == 'x' && IsDigitOf(p[2], 16);
    if ((radix == 16 || radix == 0) && hexPrefix) {
        radix = 16;
        return p + 2;
    }
    if (radix == 0)
        radix = (end - p > 1 && p[0] == '0' && IsDigitOf(p[1], 8)) ? 8 : 10;
    return p;
}

template <class T>
T ReadInteger(String const& s, int startIndex, int* endIndex, int radix, NumberType const& type) {
    if (radix < 0 || radix == 1 || radix > 36) {
        DynamicString text;
        text.Append(radix);
        RaiseWithText(TE_INVALID_OR_OUT_OF_RANGE, "INVALID_RADIX_1", text.GetBufferReadPtr(),
                      size_t(text.GetNumBytes()), type.function);
    }
    Cursor const cursor(s, startIndex);
    auto const [numberBegin, negative, digits] = ReadSign(cursor);
    char const* const p = ResolveRadix(digits, cursor.end, radix);
    std::uint64_t magnitude = 0;
    auto const [digitsEnd, error] = std::from_chars(p, cursor.end, magnitude, radix);
    if (digitsEnd == p)
        RaiseWithText(TE_UNRECOGNIZED_VALUE, type.notNumberKey, cursor.begin,
                      size_t(cursor.end - cursor.begin), type.function);
    cursor.Finish(digitsEnd, endIndex, type);
    std::uint64_t const limit = negative ? type.maxNegativeMagnitude : type.maxPositive;
    if (error == std::errc::result_out_of_range || magnitude > limit)
        RaiseWithText(type.overflowCode, type.overflowKey, numberBegin,
                      size_t(digitsEnd - numberBegin), type.function);
    return static_cast<T>(negative ? 0 - magnitude : magnitude);
}

template <class T> constexpr NumberType TypeOf() {
    if constexpr (sizeof(T) == 8)
        return std::is_signed_v<T> ? kInt64 : kUInt64;
    else
        return std::is_signed_v<T> ? kInt32 : kUInt32;
}

// ---- Floating point ------------------------------------------------------------------------

constexpr NumberType kFloat64{"String::CvtToFloat64",
                              "NOT_FLOAT64_1",
                              "FLOAT64_OVERFLOW_1",
                              TE_INVALID_OR_OUT_OF_RANGE,
                              0,
                              0};

/// True for the bytes that can belong to a number's text.
bool IsNumberByte(char c, char decimalPoint) {
    return (c >= '0' && c <= '9') || ((c | 0x20) >= 'a' && (c | 0x20) <= 'z') || c == '+' ||
           c == '-' || c == '(' || c == ')' || c == '_' || c == decimalPoint;
}

/// The number text at `p` with the decimal point made a period (and a period made invalid),
/// byte for byte, so lengths read from it hold for the original text.
std::string WithPeriod(char const* p, char const* end, char decimalPoint) {
    std::string text;
    for (; p < end && IsNumberByte(*p, decimalPoint); ++p)
        text += *p == decimalPoint ? '.' : *p == '.' ? '\x01' : *p;
    return text;
}

/// Whether a number that from_chars found out of range was too large rather than too small:
/// the exponent of its first significant digit (decimal, or binary for hex) is not negative.
bool IsTooLarge(char const* p, char const* end, bool hex) {
    int const digitWeight = hex ? 4 : 1;
    long long exponent = -digitWeight;
    bool point = false, significant = false;
    for (; p < end && (IsDigitOf(*p, hex ? 16 : 10) || *p == '.'); ++p) {
        if (*p == '.') {
            point = true;
        } else if (!significant && *p == '0') {
            exponent -= point ? digitWeight : 0;
        } else {
            significant = true;
            exponent += point ? 0 : digitWeight;
        }
    }
    if (p < end && (*p | 0x20) == (hex ? 'p' : 'e')) {
        ++p;
        bool const negative = p < end && *p == '-';
        p += (p < end && (*p == '-' || *p == '+')) ? 1 : 0;
        long long value = 0;
        if (std::from_chars(p, end, value).ec == std::errc::result_out_of_range)
            return !negative;
        exponent += negative ? -value : value;
    }
    return exponent >= 0;
}

double ReadFloat(String const& s, int startIndex, int* endIndex,
                 kDecimalPointLocalizationOptions options) {
    Cursor const cursor(s, startIndex);
    auto const [numberBegin, negative, p] = ReadSign(cursor);
    std::string const text = WithPeriod(p, cursor.end, String::GetLocalizedDecimalPoint(options));
    char const* const first = text.c_str();
    char const* const last = first + text.size();
    bool const hex = text.size() > 2 && text[0] == '0' && (text[1] | 0x20) == 'x' &&
                     (IsDigitOf(text[2], 16) || text[2] == '.');
    double magnitude = 0;
    auto result = std::from_chars(first + (hex ? 2 : 0), last, magnitude,
                                  hex ? std::chars_format::hex : std::chars_format::general);
    if (hex && result.ec == std::errc::invalid_argument)
        result = std::from_chars(first, last, magnitude);
    bool const secondSign = !text.empty() && (text[0] == '-' || text[0] == '+');
    if (result.ec == std::errc::invalid_argument || secondSign)
        RaiseWithText(TE_UNRECOGNIZED_VALUE, kFloat64.notNumberKey, cursor.begin,
                      size_t(cursor.end - cursor.begin), kFloat64.function);
    char const* const numberEnd = p + (result.ptr - first);
    cursor.Finish(numberEnd, endIndex, kFloat64);
    if (result.ec == std::errc::result_out_of_range) {
        if (IsTooLarge(first + (hex ? 2 : 0), result.ptr, hex))
            RaiseWithText(TE_INVALID_OR_OUT_OF_RANGE, kFloat64.overflowKey, numberBegin,
                          size_t(numberEnd - numberBegin), kFloat64.function);
        magnitude = 0;
    }
    return negative ? -magnitude : magnitude;
}

/// The readers whose errors name them rather than the reader of their width.
constexpr NumberType kSizeT = Renamed(TypeOf<std::size_t>(), "String::CvtToSizeT");
constexpr NumberType kSignedSizeT = Renamed(TypeOf<std::ptrdiff_t>(), "String::CvtToSignedSizeT");
constexpr NumberType kInt32WithRadix = Renamed(kInt32, "String::CvtToInt32WithRadix");
constexpr NumberType kUInt32WithRadix = Renamed(kUInt32, "String::CvtToUInt32WithRadix");

} // namespace

// ---- Integers ------------------------------------------------------------------------------

// Each reader comes in a form without and one with the end index, both reading through
// ReadInteger with the limits and the function name of `type`; the decimal ones fix the radix.
#define TEKIT_INTEGER_READERS(T, name, type)                                                       \
    T String::name(int startIndex) const {                                                         \
        return ReadInteger<T>(*this, startIndex, nullptr, 10, type);                               \
    }                                                                                              \
    T String::name(int startIndex, int& endIndex) const {                                          \
        return ReadInteger<T>(*this, startIndex, &endIndex, 10, type);                             \
    }
#define TEKIT_RADIX_READERS(T, name, type)                                                         \
    T String::name(int radix, int startIndex) const {                                              \
        return ReadInteger<T>(*this, startIndex, nullptr, radix, type);                            \
    }                                                                                              \
    T String::name(int radix, int startIndex, int& endIndex) const {                               \
        return ReadInteger<T>(*this, startIndex, &endIndex, radix, type);                          \
    }

TEKIT_INTEGER_READERS(std::int32_t, CvtToInt32, kInt32)
TEKIT_INTEGER_READERS(std::uint32_t, CvtToUInt32, kUInt32)
TEKIT_INTEGER_READERS(std::int64_t, CvtToInt64, kInt64)
TEKIT_INTEGER_READERS(std::uint64_t, CvtToUInt64, kUInt64)
TEKIT_INTEGER_READERS(std::size_t, CvtToSizeT, kSizeT)
TEKIT_INTEGER_READERS(std::ptrdiff_t, CvtToSignedSizeT, kSignedSizeT)
TEKIT_RADIX_READERS(std::int32_t, CvtToInt32WithRadix, kInt32WithRadix)
TEKIT_RADIX_READERS(std::uint32_t, CvtToUInt32WithRadix, kUInt32WithRadix)

#undef TEKIT_INTEGER_READERS
#undef TEKIT_RADIX_READERS

// ---- Floating point ------------------------------------------------------------------------

double String::CvtToFloat64(int startIndex, kDecimalPointLocalizationOptions options) const {
    return ReadFloat(*this, startIndex, nullptr, options);
}

double String::CvtToFloat64(int startIndex, int& endIndex,
                            kDecimalPointLocalizationOptions options) const {
    return ReadFloat(*this, startIndex, &endIndex, options);
}

} // namespace tekit
