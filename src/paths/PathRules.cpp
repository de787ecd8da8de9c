// The path rules on character lists: roots, levels, validation and their messages.
#include "paths/PathRules.h"

#include "tekit/paths/PathBase.h"

#include <algorithm>

namespace tekit::detail {

namespace {

unsigned short At(PathChars const& chars, int i) {
    return chars[static_cast<size_t>(i)];
}

bool IsWildcard(unsigned short ch) {
    return ch == '*' || ch == '?';
}

} // namespace

bool UsesDriveLetter(PathChars const& chars) {
    return Size(chars) >= 2 && IsAsciiLetter(At(chars, 0)) && At(chars, 1) == ':';
}

bool UsesUNC(PathChars const& chars) {
    return Size(chars) >= 2 && At(chars, 0) == kSeparator && At(chars, 1) == kSeparator;
}

bool IsDirectoryText(PathChars const& chars) {
    return !chars.empty() && (chars.back() == kSeparator || chars.back() == ':');
}

bool FindFileName(PathChars const& chars, int& start, int& length) {
    if (chars.empty() || IsDirectoryText(chars))
        return false;
    int i = Size(chars) - 1;
    while (i >= 0 && At(chars, i) != ':' && At(chars, i) != kSeparator)
        --i;
    start = i + 1;
    length = Size(chars) - start;
    return true;
}

bool FindExtension(PathChars const& chars, int& start, int& length) {
    int nameStart = 0, nameLength = 0;
    if (!FindFileName(chars, nameStart, nameLength))
        return false;
    int passed = 0;
    for (int i = Size(chars) - 1; i >= nameStart; --i) {
        if (At(chars, i) == '.') {
            start = i;
            length = Size(chars) - i;
            return true;
        }
        if (++passed > PathBase::kMaxFileExtensionLength)
            return false;
    }
    return false;
}

bool FindBaseName(PathChars const& chars, int& start, int& length) {
    int nameStart = 0, nameLength = 0;
    if (!FindFileName(chars, nameStart, nameLength))
        return false;
    int dot = 0, extensionLength = 0;
    int const baseLength =
        FindExtension(chars, dot, extensionLength) ? dot - nameStart : nameLength;
    if (baseLength < 1)
        return false; // .profile: the dot opens the name, which is all extension
    start = nameStart;
    length = baseLength;
    return true;
}

bool IsForbiddenChar(unsigned short ch) {
    switch (ch) {
    case '<':
    case '>':
    case '|':
    case ':':
    case '/':
    case '\\':
    case '"':
    case '\r':
    case '\n':
        return true;
    default:
        return false;
    }
}

bool IsValidComponent(PathChars const& chars, int begin, int end, bool allowWildcards) {
    for (int i = begin; i < end; ++i)
        if (IsForbiddenChar(At(chars, i)) || (!allowWildcards && IsWildcard(At(chars, i))))
            return false;
    return true;
}

bool IsValidNetworkName(PathChars const& chars, int begin, int end) {
    if (EqualsNoCase(chars, begin, end, ".") || EqualsNoCase(chars, begin, end, ".."))
        return false;
    return IsValidComponent(chars, begin, end, false);
}

void StripTrailingSeparator(PathChars& chars) {
    int const n = Size(chars);
    if (n == 0 || (n == 1 && At(chars, 0) == kSeparator))
        return;
    if (n == 3 && UsesDriveLetter(chars) && At(chars, 2) == kSeparator)
        return;
    if (chars.back() == kSeparator)
        chars.pop_back();
}

void InsertSeparatorAfterDrive(PathChars& chars) {
    if (UsesDriveLetter(chars) && (Size(chars) == 2 || At(chars, 2) != kSeparator))
        chars.insert(chars.begin() + 2, kSeparator);
}

bool FindTopLevel(PathChars const& chars, int& top) {
    int const n = Size(chars);
    if (UsesDriveLetter(chars)) {
        // A drive root alone ("X:\") has its top level at the separator. Shorter text cannot
        // be stored, but a top level never lies past the end.
        top = n == 3 ? 2 : std::min(3, n);
        return true;
    }
    if (UsesUNC(chars)) {
        int const afterMachine = FindFirst(chars, kSeparator, 2, n);
        if (afterMachine < 0)
            return false;
        int const afterShare = FindFirst(chars, kSeparator, afterMachine + 1, n);
        top = afterShare < 0 ? n : afterShare + 1;
        return true;
    }
    // A text rooted on the current drive (\dir) has its levels after the backslash; a
    // relative one from its start.
    top = !chars.empty() && At(chars, 0) == kSeparator ? 1 : 0;
    return true;
}

PathShape ShapeOf(PathChars const& chars, char const* function) {
    PathShape shape;
    if (!FindTopLevel(chars, shape.top))
        TE_RAISE_ASSERTION("invalid UNC path", function);
    int const n = Size(chars);
    shape.rootEnd = UsesDriveLetter(chars) ? std::min(3, n) : shape.top;
    int begin = shape.rootEnd;
    while (begin < n) {
        int const separator = FindFirst(chars, kSeparator, begin, n);
        int const end = separator < 0 ? n : separator;
        shape.levels.push_back({begin, end});
        if (separator < 0)
            break;
        begin = separator + 1; // a trailing separator ends the loop without a level
    }
    return shape;
}

PathChars PrefixOf(PathChars const& chars, PathShape const& shape, int numLevels) {
    if (numLevels <= 0)
        return RootOf(chars, shape);
    int const end = shape.levels[static_cast<size_t>(numLevels - 1)].end;
    PathChars prefix(chars.begin(), chars.begin() + end);
    StripTrailingSeparator(prefix);
    return prefix;
}

PathChars RootOf(PathChars const& chars, PathShape const& shape) {
    PathChars root(chars.begin(), chars.begin() + shape.rootEnd);
    StripTrailingSeparator(root);
    return root;
}

bool LevelsEqual(PathChars const& a, Level const& i, PathChars const& b, Level const& j) {
    return RangesEqualNoCase(a, i.begin, i.end, b, j.begin, j.end);
}

} // namespace tekit::detail
