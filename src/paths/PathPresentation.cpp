// PathBase: shortened and forward-slash forms of a path for display and for other tools.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"

#include <functional>
#include <string>
#include <vector>

namespace tekit {

using namespace detail;

namespace {

PathChars Join(PathChars const& chars, int headEnd, int tailBegin) {
    static PathChars const kEllipsis{'.', '.', '.', kSeparator};
    PathChars result(chars.begin(), chars.begin() + headEnd);
    result.insert(result.end(), kEllipsis.begin(), kEllipsis.end());
    result.insert(result.end(), chars.begin() + tailBegin, chars.end());
    return result;
}

/// The shortened forms, most complete first: the head (root and first level, ending at
/// `headEnd`) kept while middle levels are dropped from the front one at a time
/// ("C:\first\...\c\file"), then the root alone before the last level ("C:\...\file"), then
/// the last level alone.
std::vector<PathChars> Shortenings(PathChars const& chars, PathShape const& shape, int top,
                                   int headEnd) {
    std::vector<PathChars> forms;
    int const numLevels = static_cast<int>(shape.levels.size());
    if (numLevels >= 3 && headEnd > top) {
        for (int tail = 2; tail < numLevels; ++tail)
            forms.push_back(Join(chars, headEnd, shape.levels[size_t(tail)].begin));
    }
    int const lastBegin = shape.levels.back().begin;
    forms.push_back(Join(chars, top, lastBegin));
    forms.emplace_back(chars.begin() + lastBegin, chars.end());
    return forms;
}

PathChars FileNameOf(PathChars const& chars) {
    int start = 0, length = 0;
    if (!FindFileName(chars, start, length))
        return {};
    return PathChars(chars.begin() + start, chars.end());
}

} // namespace

/// The first shortening that `fits`, or the last level when none does.
PathChars detail::Shorten(PathChars const& chars, int top, int headEnd,
                          std::function<bool(PathChars const&)> const& fits) {
    PathShape const shape = ShapeOf(chars, "PathBase::GetAbbreviatedName");
    if (shape.levels.empty())
        TE_RAISE_ASSERTION("Missing path components??", "PathBase::GetAbbreviatedName");
    std::vector<PathChars> const forms = Shortenings(chars, shape, top, headEnd);
    for (PathChars const& form : forms)
        if (fits(form))
            return form;
    return forms.back();
}

void PathBase::GetAbbreviatedName(int maxChars, String& out) const {
    PathChars const chars = ToChars(GetPathString());
    if (Size(chars) <= maxChars) {
        out.Assign(GetPathString());
        return;
    }
    int const fileLength = Size(FileNameOf(chars));
    // "..." and a separator take 4 characters: root, "...\" and the file name always fit. The
    // top level is only looked for when the file name leaves room.
    int const top = fileLength < maxChars ? GetTopLevel() : 0;
    if (fileLength < maxChars && fileLength + 4 + top < maxChars)
        AssignChars(out, Shorten(chars, top, HeadEnd(top), [maxChars](PathChars const& form) {
                        return Size(form) <= maxChars;
                    }));
    else
        AssignChars(out, FileNameOf(chars));
}

int PathBase::HeadEnd(int top) const {
    int firstLevel = 0;
    return GetNextLevels(top, 1, firstLevel) ? top + firstLevel + 1 : -1;
}

char const* PathBase::GetCRXStylePathString() const {
    // One process-wide buffer, overwritten by the next call: callers copy the text.
    static std::string buffer;
    PathChars chars = ToChars(GetPathString());
    bool const drive = detail::UsesDriveLetter(chars);
    buffer.clear();
    if (!drive && !detail::UsesUNC(chars))
        return buffer.c_str();
    for (unsigned short& ch : chars)
        if (ch == kSeparator)
            ch = '/';
    if (drive) {
        chars.erase(chars.begin() + 1); // the colon: X:/rest becomes /X/rest
        chars.insert(chars.begin(), '/');
    }
    buffer = ToBytes(chars);
    return buffer.c_str();
}

} // namespace tekit
