// The user's decimal separator, read from the locale that the environment names, without
// touching the process's own locale.
#include "platform/Environment.h"
#include "platform/Locale.h"

#include <langinfo.h>
#include <locale.h>
#include <mutex>

namespace tekit::platform {

namespace {

/// The environment that decides LC_NUMERIC, in the order the C library consults it, with
/// LOCPATH (where locales are looked for).
std::string NumericLocaleKey() {
    std::string key, value;
    for (char const* name : {"LC_ALL", "LC_NUMERIC", "LANG"})
        if (GetEnvironmentVariable(name, value) && !value.empty()) {
            key = value;
            break;
        }
    if (GetEnvironmentVariable("LOCPATH", value))
        key += '\n' + value;
    return key;
}

char ReadDecimalSeparator() {
    locale_t const locale = newlocale(LC_NUMERIC_MASK, "", locale_t(0));
    if (locale == locale_t(0))
        return '.';
    char const* radix = nl_langinfo_l(RADIXCHAR, locale);
    char const separator =
        (radix != nullptr && radix[0] != '\0' && radix[1] == '\0') ? radix[0] : '.';
    freelocale(locale);
    return separator;
}

} // namespace

char GetSystemDecimalSeparator() {
    // Creating a locale reads files: keep the answer while the environment stays the same.
    static std::mutex mutex;
    static std::string cachedKey;
    static char cachedSeparator = 0;
    std::string key = NumericLocaleKey();
    std::lock_guard<std::mutex> const lock(mutex);
    if (cachedSeparator == 0 || key != cachedKey) {
        cachedSeparator = ReadDecimalSeparator();
        cachedKey = std::move(key);
    }
    return cachedSeparator;
}

} // namespace tekit::platform
