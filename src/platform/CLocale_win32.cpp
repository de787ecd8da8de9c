// C run-time locale handles on Windows: _create_locale and the _*_l functions of the run-time.
#include "platform/CLocale.h"

#include <stdlib.h>
#include <string.h>

namespace tekit::platform {

namespace {

CLocaleHandle OrStandard(CLocaleHandle locale) {
    return locale != nullptr ? locale : StandardCLocale();
}

} // namespace

CLocaleHandle StandardCLocale() {
    static CLocaleHandle const locale = ::_create_locale(LC_ALL, "C");
    return locale;
}

CLocaleHandle CreateNamedCLocale(char const* name) {
    return ::_create_locale(LC_ALL, name);
}

void FreeCLocale(CLocaleHandle locale) {
    if (locale != nullptr)
        ::_free_locale(locale);
}

double StringToDoubleInLocale(char const* text, char** end, CLocaleHandle locale) {
    locale = OrStandard(locale);
    return locale != nullptr ? ::_strtod_l(text, end, locale) : ::strtod(text, end);
}

int CompareIgnoringCaseInLocale(char const* a, char const* b, CLocaleHandle locale) {
    locale = OrStandard(locale);
    return locale != nullptr ? ::_stricmp_l(a, b, locale) : ::_stricmp(a, b);
}

char DecimalPointOf(CLocaleHandle locale) {
    // The run-time has no per-locale localeconv: read the locale's answer back from strtod,
    // which knows its decimal point. Only '.' and ',' are single-byte decimal points in use.
    locale = OrStandard(locale);
    if (locale == nullptr)
        return '.';
    char* end = nullptr;
    char const comma[] = "0,5";
    double const value = ::_strtod_l(comma, &end, locale);
    return (value == 0.5 && end == comma + 3) ? ',' : '.';
}

} // namespace tekit::platform
