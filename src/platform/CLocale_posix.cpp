// C run-time locale handles on POSIX: newlocale and the *_l functions.
#include "platform/CLocale.h"

#include <langinfo.h>
#include <stdlib.h>
#include <strings.h>

namespace tekit::platform {

namespace {

CLocaleHandle OrStandard(CLocaleHandle locale) {
    return locale != CLocaleHandle(0) ? locale : StandardCLocale();
}

} // namespace

CLocaleHandle StandardCLocale() {
    static CLocaleHandle const locale = ::newlocale(LC_ALL_MASK, "C", locale_t(0));
    return locale;
}

CLocaleHandle CreateNamedCLocale(char const* name) {
    return ::newlocale(LC_ALL_MASK, name, locale_t(0));
}

void FreeCLocale(CLocaleHandle locale) {
    if (locale != locale_t(0))
        ::freelocale(locale);
}

double StringToDoubleInLocale(char const* text, char** end, CLocaleHandle locale) {
    locale = OrStandard(locale);
    return locale != locale_t(0) ? ::strtod_l(text, end, locale) : ::strtod(text, end);
}

int CompareIgnoringCaseInLocale(char const* a, char const* b, CLocaleHandle locale) {
    locale = OrStandard(locale);
    return locale != locale_t(0) ? ::strcasecmp_l(a, b, locale) : ::strcasecmp(a, b);
}

char DecimalPointOf(CLocaleHandle locale) {
    locale = OrStandard(locale);
    if (locale == locale_t(0))
        return '.';
    char const* radix = ::nl_langinfo_l(RADIXCHAR, locale);
    return (radix != nullptr && radix[0] != '\0' && radix[1] == '\0') ? radix[0] : '.';
}

} // namespace tekit::platform
