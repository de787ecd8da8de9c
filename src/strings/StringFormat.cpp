// Numbered-placeholder formatting and the typed Format, Append and SPrintf members of String.
#include "strings/FormatFields.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/StaticString.h"
#include "tekit/strings/String.h"

#include <charconv>
#include <climits>
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

/// Builds the placeholder text "%<number>" and replaces its first occurrence by `argument`;
/// false when the text holds no such placeholder.
bool ReplacePlaceholder(String& s, StaticString<64>& placeholder, long number,
                        char const* argument) {
    char text[32] = "%";
    *std::to_chars(text + 1, text + sizeof text - 1, number).ptr = '\0';
    placeholder = text;
    return s.ReplaceSubstring(text, argument, false, false);
}

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
    StaticString<64> placeholder;
    if (!ReplacePlaceholder(*this, placeholder, number, argument.GetBufferReadPtr()))
        HandleMissingFormatArgument(placeholder, argument);
}

void String::Format(char const* argument, long number) {
    if (argument == nullptr)
        argument = "";
    if (PointsInto(*this, argument)) {
        Format(DynamicString(argument, true), number);
        return;
    }
    StaticString<64> placeholder;
    if (!ReplacePlaceholder(*this, placeholder, number, argument))
        HandleMissingFormatArgument(placeholder, DynamicString(argument, false));
}

// ---- Typed values --------------------------------------------------------------------------

void String::Format(int value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%d");
}

void String::Format(long value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%ld");
}

void String::Format(short value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%hd");
}

void String::Format(char value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(static_cast<signed char>(value)), number, printfFormat, "%c");
}

void String::Format(unsigned char value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%u");
}

void String::Format(unsigned short value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%hu");
}

void String::Format(unsigned int value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%u");
}

void String::Format(unsigned long value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%lu");
}

void String::Format(long long value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%lld");
}

void String::Format(unsigned long long value, long number, char const* printfFormat) {
    FormatValue(*this, IntegerValue(value), number, printfFormat, "%llu");
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
    AppendValue(*this, IntegerValue(value), printfFormat, "%d");
}

void String::Append(unsigned int value, char const* printfFormat) {
    AppendValue(*this, IntegerValue(value), printfFormat, "%u");
}

void String::Append(long value, char const* printfFormat) {
    AppendValue(*this, IntegerValue(value), printfFormat, "%ld");
}

void String::Append(unsigned long value, char const* printfFormat) {
    AppendValue(*this, IntegerValue(value), printfFormat, "%lu");
}

void String::Append(long long value, char const* printfFormat) {
    AppendValue(*this, IntegerValue(value), printfFormat, "%lld");
}

void String::Append(unsigned long long value, char const* printfFormat) {
    AppendValue(*this, IntegerValue(value), printfFormat, "%llu");
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
