// The path rules on character lists, shared by the files of the path module.
//
//   PathChars const chars = ToChars(text);
//   PathShape const shape = ShapeOf(chars, "PathBase::GetNumLevels");
//   for (Level const& level : shape.levels) ...
#pragma once

#include "paths/PathChars.h"
#include "tekit/errors/Raise.h"

#include <functional>
#include <vector>

namespace tekit::detail {

bool UsesDriveLetter(PathChars const& chars);
bool UsesUNC(PathChars const& chars);
/// Text ends in a backslash or ':'.
bool IsDirectoryText(PathChars const& chars);

bool FindFileName(PathChars const& chars, int& start, int& length);
bool FindExtension(PathChars const& chars, int& start, int& length);
bool FindBaseName(PathChars const& chars, int& start, int& length);

/// One of < > | : / \ " CR LF.
bool IsForbiddenChar(unsigned short ch);
bool IsValidComponent(PathChars const& chars, int begin, int end, bool allowWildcards);
bool IsValidNetworkName(PathChars const& chars, int begin, int end);

/// Removes one trailing separator except from "", "\" and "X:\".
void StripTrailingSeparator(PathChars& chars);
/// Inserts a separator after a drive letter not followed by one.
void InsertSeparatorAfterDrive(PathChars& chars);

/// [begin, end) of one level; end excludes its separator.
struct Level {
    int begin;
    int end;
};

/// Where the root ends and the levels that follow it.
struct PathShape {
    /// Index at which the first ordinary level starts (GetTopLevel).
    int top = 0;
    /// End of the root's text: "X:\" (3) for a drive path, `top` otherwise.
    int rootEnd = 0;
    std::vector<Level> levels;
};

/// GetTopLevel's index; false for a UNC text with no separator after the machine name.
bool FindTopLevel(PathChars const& chars, int& top);
/// The shape of the text; a UNC text with no separator after the machine name raises
/// TE_PROGRAM_ERROR ("invalid UNC path") naming `function`.
PathShape ShapeOf(PathChars const& chars, char const* function);

/// The first shortened form of `chars` that `fits`, or its last level when none does: the head
/// (root and first level, ending at `headEnd`) kept while middle levels are dropped, then the
/// root alone before the last level, then the last level alone.
PathChars Shorten(PathChars const& chars, int top, int headEnd,
                  std::function<bool(PathChars const&)> const& fits);
/// The root and the first `numLevels` levels, without a trailing separator except a root's.
PathChars PrefixOf(PathChars const& chars, PathShape const& shape, int numLevels);
/// The root without a trailing separator except a root's ("X:\", "\"): for comparing roots.
PathChars RootOf(PathChars const& chars, PathShape const& shape);
/// Level `i` of `a` equals level `j` of `b` ignoring case.
bool LevelsEqual(PathChars const& a, Level const& i, PathChars const& b, Level const& j);

} // namespace tekit::detail
