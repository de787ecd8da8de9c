// The library's own printf: fields written without the C runtime, so the text is the same on
// every platform and in every locale, and no field reads an argument that is not there.
//
//   std::string out;
//   detail::FormatOne(out, "%08.3f", detail::Value::Float(3.14159), ',');  // 0003,142
//
// Integers are written with std::to_chars, floating-point numbers with std::to_chars and the
// printf precision rules, so "%.2f" gives exactly what the C runtime gives in the "C" locale.
#pragma once

#include "tekit/strings/FormatStringAnalysis.h"

#include <cstdarg>
#include <cstdint>
#include <string>

namespace tekit::detail {

using Field = FormatStringAnalysis::Field;
using Kind = FormatStringAnalysis::ArgumentKind;

/// Parses the field whose '%' is at `format[0]` and returns the bytes it spans (at least 1).
/// The conversion is '%' for a literal percent ("%%") and 0 for a malformed field, which then
/// spans the '%' and the flags, width, precision and length that parsed.
int ParseField(char const* format, Field& field);

/// The conversion that shows a value of `kind`: `conversion` when it can, else the kind's own
/// ('d' signed, 'u' unsigned, 'g' floating, 's' text). %n is never a fit.
char FitConversion(char conversion, long kind);
/// The length modifier text that the platform's printf needs for `kind` and `conversion`.
char const* LengthTextFor(long kind, char conversion);

/// One value for FormatOne.
struct Value {
    long kind = FormatStringAnalysis::kArgNone;
    std::uint64_t bits = 0; ///< integers, two's complement
    double number = 0;
    char const* text = nullptr;

    static Value Signed(std::int64_t v, long kind);
    static Value Unsigned(std::uint64_t v, long kind);
    static Value Float(double v);
    static Value Text(char const* v);
};

/// Bytes of an integer kind (0 for the others).
int KindBytes(long kind);
bool KindIsSigned(long kind);
/// The integer kind of `numBytes` bytes.
long IntegerKind(int numBytes, bool isSigned);

/// Appends `format` with `value` in its first field; the fields FixupFields would make literal
/// (%n, later fields, malformed fields) are written as they stand, '*' is ignored.
void FormatOne(std::string& out, char const* format, Value const& value, char decimalPoint);
/// Appends `format` with its arguments read from `args` (period as the decimal point).
void FormatArgs(std::string& out, char const* format, std::va_list args);

/// The shortest text that reads back as `value`, with `decimalPoint`.
void AppendShortestDouble(std::string& out, double value, char decimalPoint);
/// "0x" and upper-case hex digits, 2 per byte of a pointer.
void AppendPointer(std::string& out, std::uintptr_t value);
/// Appends the decimal digits of `value` (a fast path for the common formats).
void AppendDecimal(std::string& out, std::int64_t value);
void AppendDecimal(std::string& out, std::uint64_t value);

} // namespace tekit::detail
