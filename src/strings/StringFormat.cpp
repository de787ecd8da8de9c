// Numbered-placeholder formatting and the typed Format, Append and SPrintf members of String.
#include "strings/FormatFields.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"
#include "tekit/strings/String.h"

#include <charconv>
#include <climits>
#include <cstring>
#include <functional>
#include <string>

namespace tekit {

namespace {

using detail::Value;
using FSA = FormatStringAnalysis;

/// True when `text` lies in `s`'s buffer, so writing `s` could change it under us.
bool PointsInto(String const& s, char const* text) {
    char const* const begin = s.GetBufferReadPtr();
    std::less_equal<char const*> const lessEqual;
    return lessEqual(begin, text) && std::less<char const*>()(text, begin + s.GetBufferSize() + 1);
}

/// The placeholder text "%<number>" (the format "%%%d").
struct Placeholder {
    char text[24] = "%";
    explicit Placeholder(long number) {
        *std::to_chars(text + 1, text + sizeof text - 1, number).ptr = '\0';
    }
};

/// True when `printfFormat` asks for nothing but the decimal digits of a value of the type
/// whose own format is `defaultFormat` (null asks for that format).
bool IsPlainDecimal(char const* printfFormat, char const* defaultFormat) {
    return printfFormat == nullptr || std::strcmp(printfFormat, defaultFormat) == 0;
}

/// The decimal digits of `value`, terminated.
template <class T> struct Digits {
    char text[24];
    explicit Digits(T value) { *std::to_chars(text, text + sizeof text - 1, value).ptr = '\0'; }
};

/// Writes `value` with `printfFormat` and fills placeholder `number` with it.
void FormatValue(String& s, Value const& value, long number, char const* printfFormat,
                 char const* defaultFormat, char decimalPoint = '.') {
    std::string text;
    detail::FormatOne(text, printfFormat != nullptr ? printfFormat : defaultFormat, value,
                      decimalPoint);
    s.Format(text.c_str(), number);
}

/// Writes `value` with `printfFormat` and appends it.
void AppendValue(String& s, Value const& value, char const* printfFormat,
                 char const* defaultFormat) {
    std::string text;
    detail::FormatOne(text, printfFormat != nullptr ? printfFormat : defaultFormat, value, '.');
    s += text.c_str();
}

/// The integer kind of type T.
template <class T> Value IntegerValue(T value) {
    long const kind = detail::IntegerKind(int(sizeof(T)), T(-1) < T(0));
    if constexpr (T(-1) < T(0))
        return Value::Signed(static_cast<std::int64_t>(value), kind);
    else
        return Value::Unsigned(static_cast<std::uint64_t>(value), kind);
}

/// Fills placeholder `number` with an integer; the plain decimal formats (the defaults) are
/// written with to_chars, without going through the field parser.
template <class T>
void FormatInteger(String& s, T value, long number, char const* printfFormat,
                   char const* defaultFormat) {
    if (IsPlainDecimal(printfFormat, defaultFormat))
        s.Format(Digits<T>(value).text, number);
    else
        FormatValue(s, IntegerValue(value), number, printfFormat, defaultFormat);
}

/// Appends an integer, the plain decimal formats with to_chars.
template <class T>
void AppendInteger(String& s, T value, char const* printfFormat, char const* defaultFormat) {
    if (IsPlainDecimal(printfFormat, defaultFormat))
        s += Digits<T>(value).text;
    else
        AppendValue(s, IntegerValue(value), printfFormat, defaultFormat);
}

/// Writes a double: the shortest round-trip text for a null format.
std::string DoubleText(double value, kDecimalPointLocalizationOptions options,
                       char const* printfFormat) {
    char const decimalPoint = String::GetLocalizedDecimalPoint(options);
    std::string text;
    if (printfFormat == nullptr)
        detail::AppendShortestDouble(text, value, decimalPoint);
    else
        detail::FormatOne(text, printfFormat, Value::Float(value), decimalPoint);
    return text;
}

/// Writes a pointer-sized value: "0x" and hex digits for a null format.
std::string PointerText(Value const& value, char const* printfFormat) {
    std::string text;
    if (printfFormat == nullptr)
        detail::AppendPointer(text, static_cast<std::uintptr_t>(value.bits));
    else
        detail::FormatOne(text, printfFormat, value, '.');
    return text;
}

} // namespace

// ---- Placeholders --------------------------------------------------------------------------

void String::Format(String const& argument, long number) {
    if (PointsInto(*this, argument.GetBufferReadPtr())) {
        Format(DynamicString(argument.GetBufferReadPtr(), true), number);
        return;
    }
    Placeholder const placeholder(number);
    if (!ReplaceSubstring(placeholder.text, argument.GetBufferReadPtr(), false, false))
        HandleMissingFormatArgument(StaticString<64>(placeholder.text), argument);
}

void String::Format(char const* argument, long number) {
    if (argument == nullptr)
        argument = "";
    if (PointsInto(*this, argument)) {
        Format(DynamicString(argument, true), number);
        return;
    }
    Placeholder const placeholder(number);
    if (!ReplaceSubstring(placeholder.text, argument, false, false))
        HandleMissingFormatArgument(StaticString<64>(placeholder.text),
                                    DynamicString(argument, false));
}

// ---- Typed values --------------------------------------------------------------------------

void String::Format(int value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%d");
}

void String::Format(long value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%ld");
}

void String::Format(short value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%hd");
}

void String::Format(char value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(static_cast<signed char>(value)), number, printfFormat, "%c");
}

void String::Format(unsigned char value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%u");
}

void String::Format(unsigned short value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%hu");
}

void String::Format(unsigned int value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%u");
}

void String::Format(unsigned long value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%lu");
}

void String::Format(long long value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%lld");
}

void String::Format(unsigned long long value, long number, char const* printfFormat) {
    FormatInteger(*this, value, number, printfFormat, "%llu");
}

void String::Format(double value, long number, kDecimalPointLocalizationOptions options,
                    char const* printfFormat) {
    Format(DoubleText(value, options, printfFormat).c_str(), number);
}

void String::FormatPtr(std::intptr_t value, long number, char const* printfFormat) {
    Format(PointerText(IntegerValue(value), printfFormat).c_str(), number);
}

void String::FormatPtr(std::uintptr_t value, long number, char const* printfFormat) {
    Format(PointerText(IntegerValue(value), printfFormat).c_str(), number);
}

// ---- Appending -----------------------------------------------------------------------------

void String::Append(int value, char const* printfFormat) {
    AppendInteger(*this, value, printfFormat, "%d");
}

void String::Append(unsigned int value, char const* printfFormat) {
    AppendInteger(*this, value, printfFormat, "%u");
}

void String::Append(long value, char const* printfFormat) {
    AppendInteger(*this, value, printfFormat, "%ld");
}

void String::Append(unsigned long value, char const* printfFormat) {
    AppendInteger(*this, value, printfFormat, "%lu");
}

void String::Append(long long value, char const* printfFormat) {
    AppendInteger(*this, value, printfFormat, "%lld");
}

void String::Append(unsigned long long value, char const* printfFormat) {
    AppendInteger(*this, value, printfFormat, "%llu");
}

void String::Append(double value, kDecimalPointLocalizationOptions options,
                    char const* printfFormat) {
    *this += DoubleText(value, options, printfFormat).c_str();
}

void String::Append(double value, kDecimalPointLocalizationOptions options,
                    String const& printfFormat) {
    Append(value, options, printfFormat.GetBufferReadPtr());
}

void String::AppendSize(std::size_t size) {
    std::string text;
    detail::AppendDecimal(text, static_cast<std::uint64_t>(size));
    *this += text.c_str();
}

void String::AppendPtr(void const* ptr) {
    std::string text;
    detail::AppendPointer(text, reinterpret_cast<std::uintptr_t>(ptr));
    *this += text.c_str();
}

// ---- printf --------------------------------------------------------------------------------

void String::VSPrintf(char const* format, std::va_list args) {
    std::string text;
    detail::FormatArgs(text, format, args);
    if (text.size() >= size_t(INT_MAX))
        Throw32BitOverflowException("String::VSPrintf", TE_FILE_BASE_NAME, __LINE__, true);
    AssignUsingNumBytesInsteadOfNumChars(text.c_str(), int(text.size()), false);
}

void String::SPrintf(char const* format, ...) {
    std::va_list args;
    va_start(args, format);
    VSPrintf(format, args);
    va_end(args);
}

void String::SPrintf(String& target, char const* format, ...) {
    std::va_list args;
    va_start(args, format);
    target.VSPrintf(format, args);
    va_end(args);
}

} // namespace tekit
