// PathBase: the static text functions and the classification of a path.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"
#include "tekit/errors/Raise.h"

#include <string_view>

namespace tekit {

using namespace detail;

namespace {

constexpr char const* kCmdFileExtensions[] = {"exe", "com", "cmd", "bat"};

/// Stores a found range of `path` in `start` and `length` only when it was found.
template <typename Finder> bool FindIn(String const& path, int& start, int& length, Finder find) {
    int foundStart = 0, foundLength = 0;
    if (!find(ToChars(path), foundStart, foundLength))
        return false;
    start = foundStart;
    length = foundLength;
    return true;
}

} // namespace

bool PathBase::FindFileName(String const& path, int& start, int& length) {
    return FindIn(path, start, length, detail::FindFileName);
}
bool PathBase::FindExtension(String const& path, int& start, int& length) {
    return FindIn(path, start, length, detail::FindExtension);
}
bool PathBase::FindBaseName(String const& path, int& start, int& length) {
    return FindIn(path, start, length, detail::FindBaseName);
}

bool PathBase::sIsDirectory(String const& path) {
    return IsDirectoryText(ToChars(path));
}
bool PathBase::UsesUNC(String const& path) {
    return detail::UsesUNC(ToChars(path));
}

void PathBase::StripTrailingSeparatorIfNeeded(String& path) {
    PathChars chars = ToChars(path);
    size_t const before = chars.size();
    detail::StripTrailingSeparator(chars);
    if (chars.size() != before)
        AssignChars(path, chars);
}

bool PathBase::IsValidPathComponent(String& component, bool allowWildcards) {
    PathChars const chars = ToChars(component);
    return IsValidComponent(chars, 0, Size(chars), allowWildcards);
}
bool PathBase::IsValidNetworkName(String& name) {
    PathChars const chars = ToChars(name);
    return detail::IsValidNetworkName(chars, 0, Size(chars));
}
bool PathBase::IsValidShareDirName(String& name) {
    return IsValidNetworkName(name);
}

bool PathBase::IsCmdFileExtension(String const& extension) {
    for (char const* known : kCmdFileExtensions)
        if (extension.Compare(known, true) == 0)
            return true;
    return false;
}

void PathBase::GetCmdFileExtension(long index, String& extension) {
    if (index < 0 || index >= kNumCmdFileExtensions)
        TE_RAISE_ASSERTION("invalid index to GetCmdFileExtension", "PathBase::GetCmdFileExtension");
    extension.Assign(kCmdFileExtensions[index]);
}

unsigned short PathBase::GetSeparatorChar() {
    return kSeparator;
}
bool PathBase::IsSeparator(unsigned short ch) {
    return ch == kSeparator;
}

// ---- Long-path form -----------------------------------------------------------------------

void PathBase::ConvertForLongPathCalls(String const& path, String& converted) {
    // Built once per process; static initialisation is thread-safe.
    static char const* const kLongPrefix = "\\\\?\\";
    static char const* const kLongUncPrefix = "\\\\?\\UNC\\";
    DynamicString result;
    if (UsesUNC(path)) {
        result.Assign(kLongUncPrefix);
        // The two backslashes are single bytes; a suffix of the text ends with its NUL.
        result += std::string_view(path.GetBufferReadPtr()).substr(2).data();
    } else {
        result.Assign(kLongPrefix);
        result += path;
    }
    converted.Assign(result);
}

// ---- Classification -----------------------------------------------------------------------

bool PathBase::UsesDriveLetter() const {
    return detail::UsesDriveLetter(ToChars(GetPathString()));
}
bool PathBase::UsesUNC() const {
    return detail::UsesUNC(ToChars(GetPathString()));
}
bool PathBase::IsAbsolute() const {
    PathChars const chars = ToChars(GetPathString());
    return detail::UsesDriveLetter(chars) || detail::UsesUNC(chars);
}
bool PathBase::IsRooted() const {
    PathChars const chars = ToChars(GetPathString());
    return detail::UsesDriveLetter(chars) || (!chars.empty() && chars[0] == kSeparator);
}
bool PathBase::IsRootDirectory() const {
    PathChars const chars = ToChars(GetPathString());
    return IsRooted() && ShapeOf(chars, "PathBase::IsRootDirectory").levels.empty();
}

} // namespace tekit
