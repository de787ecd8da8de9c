// C run-time locale handles: the library's own "C" locale and the few conversions that take a
// locale explicitly, whatever locale the process has set.
//
//   CLocaleHandle c = StandardCLocale();                   // created once, never freed
//   double v = StringToDoubleInLocale("2.5", &end, c);
//   char point = DecimalPointOf(c);                         // '.'
#pragma once

#include <locale.h>

namespace tekit::platform {

/// A locale of the C run-time: `locale_t` on POSIX, `_locale_t` on Windows.
#if defined(_WIN32)
using CLocaleHandle = _locale_t;
#else
using CLocaleHandle = locale_t;
#endif

/// The library's "C" locale, created on first use and kept for the life of the process; null
/// only when the run-time cannot create it (the conversions then use the process's locale).
CLocaleHandle StandardCLocale();

/// A new locale of the run-time named `name` ("de_DE.UTF-8", "German_Germany.1252", ...),
/// freed with FreeCLocale; null when the run-time knows no such locale.
CLocaleHandle CreateNamedCLocale(char const* name);
void FreeCLocale(CLocaleHandle locale);

/// strtod in `locale` (null: the library's "C" locale).
double StringToDoubleInLocale(char const* text, char** end, CLocaleHandle locale);
/// Compares ignoring case as `locale` folds it (null: the "C" locale): <0, 0 or >0.
int CompareIgnoringCaseInLocale(char const* a, char const* b, CLocaleHandle locale);
/// The decimal point of `locale` (null: the "C" locale) when it is one byte, else '.'.
char DecimalPointOf(CLocaleHandle locale);

} // namespace tekit::platform
