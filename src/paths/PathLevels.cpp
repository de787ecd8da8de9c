// PathBase: levels, prefixes and suffixes, built on the split into root and levels.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"
#include "tekit/paths/Path.h"

#include <algorithm>

namespace tekit {

using namespace detail;

namespace {

/// A path's characters with their shape.
struct Split {
    PathChars chars;
    PathShape shape;
    Split(String const& text, char const* function)
        : chars(ToChars(text)), shape(ShapeOf(chars, function)) {}
    int NumLevels() const { return static_cast<int>(shape.levels.size()); }
    Level const& At(int i) const { return shape.levels[static_cast<size_t>(i)]; }
};

bool SameRoot(Split const& a, Split const& b) {
    PathChars const ra = RootOf(a.chars, a.shape), rb = RootOf(b.chars, b.shape);
    return RangesEqualNoCase(ra, 0, Size(ra), rb, 0, Size(rb));
}

/// `path` has the root of `prefix` and starts with all of its levels.
bool StartsWithLevels(Split const& path, Split const& prefix) {
    if (!SameRoot(path, prefix) || prefix.NumLevels() > path.NumLevels())
        return false;
    for (int i = 0; i < prefix.NumLevels(); ++i)
        if (!LevelsEqual(path.chars, path.At(i), prefix.chars, prefix.At(i)))
            return false;
    return true;
}

/// The relative `suffix`'s levels are the last levels of `path`.
bool EndsWithLevels(Split const& path, Split const& suffix) {
    int const offset = path.NumLevels() - suffix.NumLevels();
    if (offset < 0)
        return false;
    for (int i = 0; i < suffix.NumLevels(); ++i)
        if (!LevelsEqual(path.chars, path.At(offset + i), suffix.chars, suffix.At(i)))
            return false;
    return true;
}

bool SamePath(Split const& a, Split const& b) {
    return a.NumLevels() == b.NumLevels() && StartsWithLevels(a, b);
}

bool HasRoot(PathChars const& chars) {
    return detail::UsesDriveLetter(chars) || (!chars.empty() && chars[0] == kSeparator);
}

/// The second-to-last level, at or after `firstLevel`, ends in ".lwb": the last level is an
/// entry of that library file.
bool NamesLibraryEntry(Split const& path, int firstLevel) {
    int const library = path.NumLevels() - 2;
    if (library < firstLevel || library < 0)
        return false;
    Level const& level = path.At(library);
    return level.end - level.begin >= 4 &&
           EqualsNoCase(path.chars, level.end - 4, level.end, ".lwb");
}

void Reset(PathBase::VINamespaceInfo* info) {
    if (!info)
        return;
    info->isInLibrary = false;
    info->libraryPath.Clear();
    info->entryName.Clear();
}

/// Fills `info` for a path held as an entry of a library file.
void DescribeLibraryEntry(PathBase::VINamespaceInfo* info, Split const& path) {
    if (!info)
        return;
    info->isInLibrary = true;
    int const last = path.NumLevels() - 1;
    AssignChars(info->libraryPath, PrefixOf(path.chars, path.shape, last));
    AssignChars(info->entryName, path.chars, path.At(last).begin, path.At(last).end);
}

/// `directory` holds `path` at a depth of 1 (or any depth with `anyDepth`).
bool Contains(String const& directory, PathBase const& path, bool anyDepth,
              PathBase::VINamespaceInfo* info) {
    Reset(info);
    if (directory.IsEmpty())
        return false;
    Split const dir(directory, "PathBase::DirectoryContainsPath");
    Split const held(path.GetString(), "PathBase::DirectoryContainsPath");
    if (!StartsWithLevels(held, dir))
        return false;
    int const depth = held.NumLevels() - dir.NumLevels();
    bool const library = NamesLibraryEntry(held, dir.NumLevels());
    bool const contained = anyDepth ? depth >= 1 : (depth == 1 || (depth == 2 && library));
    if (contained && library)
        DescribeLibraryEntry(info, held);
    return contained;
}

} // namespace

int PathBase::GetTopLevel() const {
    int top = 0;
    if (!FindTopLevel(ToChars(GetPathString()), top))
        TE_RAISE_ASSERTION("invalid UNC path", "PathBase::GetTopLevel");
    return top;
}

bool PathBase::GetNextLevels(int start, long count, int& length) const {
    PathChars const chars = ToChars(GetPathString());
    int const n = Size(chars);
    if (start < 0 || start > n)
        return false;
    if (count <= 0) {
        length = 0;
        return true;
    }
    int position = start;
    for (long level = 0; level < count; ++level) {
        if (position >= n)
            return false; // nothing, or only a trailing separator, is left
        int const separator = FindFirst(chars, kSeparator, position, n);
        int const end = separator < 0 ? n : separator;
        if (level == count - 1) {
            length = end - start;
            return true;
        }
        if (separator < 0)
            return false;
        position = separator + 1;
    }
    return false;
}

long PathBase::GetNumLevels() const {
    return Split(GetPathString(), "PathBase::GetNumLevels").NumLevels();
}

long PathBase::GetNumPathNameComponents() const {
    Split const path(GetPathString(), "PathBase::GetNumPathNameComponents");
    return path.NumLevels() + (HasRoot(path.chars) ? 1 : 0);
}

void PathBase::GetUpToCntPathNameComponents(long count, String& out) const {
    Split const path(GetPathString(), "PathBase::GetUpToCntPathNameComponents");
    if (count <= 0) {
        out.Clear();
        return;
    }
    long const levels = HasRoot(path.chars) ? count - 1 : count;
    int const kept = static_cast<int>(std::min<long>(levels, path.NumLevels()));
    AssignChars(out, PrefixOf(path.chars, path.shape, kept));
}

bool PathBase::GetPrefix(long numLevels, PathBase& out) const {
    Split const path(GetPathString(), "PathBase::GetPrefix");
    if (numLevels < 0 || numLevels > path.NumLevels())
        return false;
    out.SetPathName(ToBytes(PrefixOf(path.chars, path.shape, static_cast<int>(numLevels))).c_str());
    return true;
}

bool PathBase::GetPrefix(PathBase& suffix, PathBase& prefix) const {
    Split const path(GetPathString(), "PathBase::GetPrefix");
    Split const end(suffix.GetString(), "PathBase::GetPrefix");
    if (HasRoot(end.chars)) {
        if (!SamePath(path, end))
            return false;
        prefix.Clear();
        return true;
    }
    if (!EndsWithLevels(path, end))
        return false;
    int const kept = path.NumLevels() - end.NumLevels();
    prefix.SetPathName(ToBytes(PrefixOf(path.chars, path.shape, kept)).c_str());
    return true;
}

bool PathBase::GetSuffix(PathBase const& prefix, PathBase& suffix) const {
    Split const path(GetPathString(), "PathBase::GetSuffix");
    Split const start(prefix.GetString(), "PathBase::GetSuffix");
    if (!StartsWithLevels(path, start))
        return false;
    if (start.NumLevels() == path.NumLevels())
        suffix.Clear();
    else
        suffix.SetPathName(
            ToBytes(path.chars, path.At(start.NumLevels()).begin, Size(path.chars)).c_str());
    return true;
}

bool PathBase::IsPrefixOfAbsolutePath(PathBase const& path, bool allowEqual) const {
    if (IsEmpty() || !path.IsAbsolute())
        return false;
    Split const whole(path.GetString(), "PathBase::IsPrefixOfAbsolutePath");
    Split const start(GetPathString(), "PathBase::IsPrefixOfAbsolutePath");
    if (!StartsWithLevels(whole, start))
        return false;
    return allowEqual || start.NumLevels() < whole.NumLevels();
}

bool PathBase::IsSuffixOfAbsolutePath(PathBase const& path) const {
    if (IsEmpty() || !path.IsAbsolute())
        return false;
    Split const whole(path.GetString(), "PathBase::IsSuffixOfAbsolutePath");
    Split const end(GetPathString(), "PathBase::IsSuffixOfAbsolutePath");
    return HasRoot(end.chars) ? SamePath(whole, end) : EndsWithLevels(whole, end);
}

Path PathBase::GetRootDir() const {
    Split const path(GetPathString(), "PathBase::GetRootDir");
    PathChars root = RootOf(path.chars, path.shape);
    if (!root.empty() && !IsDirectoryText(root))
        root.push_back(kSeparator); // \\srv\share\ (a UNC root)
    return Path(ToBytes(root).c_str());
}

Path PathBase::FindCommonPrefix(PathBase const& a, PathBase const& b) {
    Split const first(a.GetString(), "PathBase::FindCommonPrefix");
    Split const second(b.GetString(), "PathBase::FindCommonPrefix");
    if (!SameRoot(first, second))
        return Path();
    int common = 0;
    while (common < first.NumLevels() && common < second.NumLevels() &&
           LevelsEqual(first.chars, first.At(common), second.chars, second.At(common)))
        ++common;
    return Path(ToBytes(PrefixOf(first.chars, first.shape, common)).c_str());
}

bool PathBase::DirectoryContainsPath(PathBase const& path, VINamespaceInfo* info) const {
    return Contains(GetPathString(), path, false, info);
}

bool PathBase::SubDirectoryContainsPath(PathBase const& path, VINamespaceInfo* info) const {
    return Contains(GetPathString(), path, true, info);
}

} // namespace tekit
