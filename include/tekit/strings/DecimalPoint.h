// Which decimal point numbers are written and read with.
//
// Numbers that go into files, expressions or anything a program reads back always use a
// period. Numbers shown to a person may use the decimal separator of the user's locale. A
// kDecimalPointLocalizationOptions value, passed to every operation that writes or reads a
// floating-point number, says which:
//
//   DynamicString text;
//   text.Append(3.5, kDecimalPoint_UseSystemSeparator);              // "3,5" for a German user
//   double v = text.CvtToFloat64(0, kDecimalPoint_UseSystemSeparator);  // 3.5 again
//
// The system separator is the user's, read from the environment (LC_ALL, LC_NUMERIC, LANG) on
// POSIX and from the user's locale settings on Windows. It never depends on the process's C
// locale (setlocale), so library code gives the same text whatever a host application set.
#pragma once

#include "tekit/Export.h"

namespace tekit {

class String;

/// The decimal point used to write and read floating-point numbers.
enum kDecimalPointLocalizationOptions {
    /// Always '.': for files, expressions and anything a program reads back.
    kDecimalPoint_AlwaysPeriod = 0,
    /// The decimal separator of the user's locale, for text shown to a person. A locale whose
    /// separator is not a single byte falls back to '.'.
    kDecimalPoint_UseSystemSeparator = 1,
};
// Any other value is treated as kDecimalPoint_AlwaysPeriod.

/// A replacement for the built-in String::LocalizeExpression, registered with
/// String::RegisterLocalizeExprFunc by a component that parses expressions properly. It writes
/// `expression` into `result` with the decimal points of its numbers changed from '.' to the
/// chosen separator (`localize` true) or back (`localize` false). `result` may be `expression`.
using LocalizeExprFunc = void (*)(String const& expression,
                                  kDecimalPointLocalizationOptions options, bool localize,
                                  String& result);

/// Resolves an option to its decimal point once, so that code converting many numbers asks the
/// system only once, and converts the decimal point of number text.
///
///   DecimalPointLocalizer localizer(kDecimalPoint_UseSystemSeparator);
///   for (auto& cell : cells)
///       localizer.Localize(cell);            // "2.5" -> "2,5" for a German user
class TEKIT_API DecimalPointLocalizer {
public:
    explicit DecimalPointLocalizer(kDecimalPointLocalizationOptions options);

    kDecimalPointLocalizationOptions GetOptions() const { return m_options; }
    /// '.' or the system separator.
    char GetDecimalPoint() const { return m_decimalPoint; }
    /// True when the decimal point is not a period, so number text has to be converted.
    bool IsLocalizing() const { return m_decimalPoint != '.'; }

    /// Number text written with a period is rewritten with this decimal point: every '.' of
    /// the text becomes the separator (the whole text is taken as one number).
    void Localize(String& number) const;
    /// The reverse: every separator of the text becomes '.'.
    void Delocalize(String& number) const;

private:
    kDecimalPointLocalizationOptions m_options;
    char m_decimalPoint;
};

} // namespace tekit
