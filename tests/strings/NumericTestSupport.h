// A locale whose decimal separator is a comma, for the tests of number formatting and reading.
#pragma once

#include <cstdlib>
#include <string>

#if !defined(_WIN32)
#include <langinfo.h>
#include <locale.h>
#endif

namespace tekit::testing {

#if !defined(_WIN32)
/// The name of an installed locale whose decimal separator is a comma, or "" when there is
/// none (generate one with `localedef -i de_DE -f UTF-8 de_DE.UTF-8`).
inline std::string FindCommaLocale() {
    for (char const* name : {"de_DE.UTF-8", "de_DE.utf8", "fr_FR.UTF-8", "fr_FR.utf8",
                             "nl_NL.UTF-8", "it_IT.UTF-8", "es_ES.UTF-8", "de_DE", "fr_FR"}) {
        locale_t const locale = newlocale(LC_NUMERIC_MASK, name, locale_t(0));
        if (locale == locale_t(0))
            continue;
        bool const comma = std::string(nl_langinfo_l(RADIXCHAR, locale)) == ",";
        freelocale(locale);
        if (comma)
            return name;
    }
    return "";
}

/// Makes `name` the user's numeric locale, as the environment names it (LC_ALL unset,
/// LC_NUMERIC set), for the life of the object.
class ScopedUserNumericLocale {
public:
    explicit ScopedUserNumericLocale(char const* name) {
        Save("LC_ALL", m_all);
        Save("LC_NUMERIC", m_numeric);
        unsetenv("LC_ALL");
        setenv("LC_NUMERIC", name, 1);
    }
    ~ScopedUserNumericLocale() {
        Restore("LC_ALL", m_all);
        Restore("LC_NUMERIC", m_numeric);
    }
    ScopedUserNumericLocale(ScopedUserNumericLocale const&) = delete;
    ScopedUserNumericLocale& operator=(ScopedUserNumericLocale const&) = delete;

private:
    struct Saved {
        bool set = false;
        std::string value;
    };
    static void Save(char const* name, Saved& saved) {
        char const* value = std::getenv(name);
        saved.set = value != nullptr;
        saved.value = value != nullptr ? value : "";
    }
    static void Restore(char const* name, Saved const& saved) {
        if (saved.set)
            setenv(name, saved.value.c_str(), 1);
        else
            unsetenv(name);
    }
    Saved m_all, m_numeric;
};
#endif

} // namespace tekit::testing
