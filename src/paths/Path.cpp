// PathBase: validation against the Windows path rules, and the raising validators.
#include "tekit/paths/Path.h"

#include "paths/PathRules.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/paths/IsValidPath.h"

#include <cstring>

namespace tekit {

using namespace detail;

namespace {

/// The message key of the first rule that `chars` breaks, or null when it keeps them all.
class Validator {
public:
    Validator(PathChars const& chars, bool allowWildcards)
        : m_chars(chars), m_n(Size(chars)), m_allowWildcards(allowWildcards) {}

    char const* Check() const {
        if (m_n == 0)
            return "PATH_IS_EMPTY";
        if (detail::UsesDriveLetter(m_chars))
            return CheckDrivePath();
        if (detail::UsesUNC(m_chars))
            return CheckUncPath();
        if (m_chars[0] == kSeparator)
            return "PATH_BEGINS_WITH_SEPARATOR";
        return CheckComponents(0, false);
    }

private:
    char const* CheckDrivePath() const {
        if (m_n > 2 && m_chars[2] != kSeparator)
            return "PATH_SEP_MUST_FOLLOW_DRIVE_SPEC";
        if (m_n <= 3)
            return nullptr; // a bare drive or a drive root
        return CheckComponents(3, false);
    }

    char const* CheckUncPath() const {
        if (m_n == 2)
            return "UNC_PATH_MISSING_NETWORK_NAME";
        int const separator = FindFirst(m_chars, kSeparator, 2, m_n);
        if (separator < 0 || separator == m_n - 1)
            return "UNC_PATH_MISSING_DIRECTORY";
        if (!detail::IsValidNetworkName(m_chars, 2, separator))
            return "UNC_PATH_INVALID_NETWORK_NAME";
        return CheckComponents(separator + 1, true);
    }

    /// The components from `start`; the first is a share when `firstIsShare`.
    char const* CheckComponents(int start, bool firstIsShare) const {
        bool isShare = firstIsShare;
        for (int begin = start;;) {
            int const separator = FindFirst(m_chars, kSeparator, begin, m_n);
            bool const isLast = separator < 0;
            int const end = isLast ? m_n : separator;
            if (end == begin)
                return "PATH_HAS_EMPTY_COMPONENT";
            if (char const* failure = CheckComponent(begin, end, isLast, isShare))
                return failure;
            if (isLast || separator == m_n - 1)
                return nullptr; // one trailing separator ends the path
            begin = separator + 1;
            isShare = false;
        }
    }

    char const* CheckComponent(int begin, int end, bool isLast, bool isShare) const {
        if (isShare)
            return detail::IsValidNetworkName(m_chars, begin, end) ? nullptr
                                                                   : "UNC_PATH_INVALID_SHAREDIR";
        if (IsValidComponent(m_chars, begin, end, isLast && m_allowWildcards))
            return nullptr;
        if (isLast && IsLibraryEntry(begin))
            return nullptr;
        return "PATH_HAS_INVALID_CHARS";
    }

    /// The component at `begin` follows one that ends in ".lwb": it names an entry inside a
    /// library file of the graphical environment, not a file, and may hold any character.
    bool IsLibraryEntry(int begin) const {
        return begin >= 5 && EqualsNoCase(m_chars, begin - 5, begin - 1, ".lwb");
    }

    PathChars const& m_chars;
    int m_n;
    bool m_allowWildcards;
};

/// The message of "ERR_DESCR" `key` with %1 filled by `path`.
DynamicString PathMessage(char const* key, char const* path) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    message.Format(path, 1);
    return message;
}

} // namespace

bool PathBase::IsValid(bool allowWildcards, String* errorText) const {
    PathChars const chars = ToChars(GetPathString());
    char const* const failure = Validator(chars, allowWildcards).Check();
    if (!failure)
        return true;
    if (errorText)
        errorText->Assign(static_cast<char const*>(RString("ERR_DESCR", failure)));
    return false;
}

void PathBase::Validate(bool allowWildcards) const {
    DynamicString message;
    if (!IsValid(allowWildcards, &message))
        TE_RAISE(TE_INVALID_PATHNAME, message, "PathBase::Validate");
}

void PathBase::ValidateEx(bool allowWildcards) const {
    DynamicString message;
    if (IsValid(allowWildcards, &message))
        return;
    DynamicString description = PathMessage("INVALID_PATHNAME_1", CStr());
    description += "\n\n";
    description += message;
    TE_RAISE(TE_INVALID_PATHNAME, description, "PathBase::ValidateEx");
}

void PathBase::ValidateAbsolute(bool allowWildcards) const {
    ValidateEx(allowWildcards);
    if (!IsAbsolute())
        TE_RAISE(TE_INVALID_PATHNAME, PathMessage("PATH_NOT_ABSOLUTE_1", CStr()),
                 "PathBase::ValidateAbsolute");
}

} // namespace tekit

extern "C" bool TEKIT_STDCALL IsValidPath(char const* path, int allowWildcards) {
    if (path && std::strlen(path) > 259)
        return false;
    try {
        return tekit::Path(path).IsValid(allowWildcards != 0, nullptr);
    } catch (...) {
        return false; // nothing may leave a flat function
    }
}
