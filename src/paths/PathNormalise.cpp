// PathBase: separators, dots, names as stored on disk, and environment variables.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"
#include "platform/Environment.h"
#include "platform/File.h"
#include "tekit/paths/DynamicPath.h"

#include <algorithm>
#include <string>
#include <vector>

namespace tekit {

using namespace detail;

namespace {

/// One level of a walk, with its separator when it has one.
struct Piece {
    int begin;
    int nameEnd;
    int end;
};

std::vector<Piece> PiecesFrom(PathChars const& chars, int start) {
    std::vector<Piece> pieces;
    int const n = Size(chars);
    for (int begin = start; begin < n;) {
        int const separator = FindFirst(chars, kSeparator, begin, n);
        int const nameEnd = separator < 0 ? n : separator;
        int const end = separator < 0 ? n : separator + 1;
        pieces.push_back({begin, nameEnd, end});
        begin = end;
    }
    return pieces;
}

bool HasWildcard(PathChars const& chars, Level const& level) {
    for (int i = level.begin; i < level.end; ++i)
        if (chars[static_cast<size_t>(i)] == '*' || chars[static_cast<size_t>(i)] == '?')
            return true;
    return false;
}

} // namespace

void PathBase::CoalesceDoubleSeparators() {
    PathChars const chars = ToChars(GetPathString());
    PathChars result;
    // The run that opens a UNC path keeps exactly its two separators.
    size_t const opening = detail::UsesUNC(chars) ? 2 : 0;
    for (size_t i = 0; i < chars.size(); ++i) {
        bool const repeated = i > 0 && chars[i] == kSeparator && result.back() == kSeparator;
        if (i < opening || !repeated)
            result.push_back(chars[i]);
    }
    if (result.size() != chars.size())
        AssignChars(GetPathString(), result);
}

bool PathBase::CollapseDots() {
    if (!IsValid(false, nullptr))
        return true;
    PathChars const chars = ToChars(GetPathString());
    PathShape const shape = ShapeOf(chars, "PathBase::CollapseDots");
    bool const absolute = detail::UsesDriveLetter(chars) || detail::UsesUNC(chars);
    std::vector<Piece> kept;
    bool changed = false, unresolved = false;
    for (Piece const& piece : PiecesFrom(chars, shape.rootEnd)) {
        if (EqualsNoCase(chars, piece.begin, piece.nameEnd, ".")) {
            changed = true;
        } else if (!EqualsNoCase(chars, piece.begin, piece.nameEnd, "..")) {
            kept.push_back(piece);
        } else if (!kept.empty()) {
            kept.pop_back(); // a ".." kept before counts too: it is removed like any level
            changed = true;
        } else if (!absolute) {
            kept.push_back(piece);
            unresolved = true;
        } // an absolute path cannot rise above its root: the ".." is skipped
    }
    if (changed) {
        PathChars result(chars.begin(), chars.begin() + shape.rootEnd);
        for (Piece const& piece : kept)
            result.insert(result.end(), chars.begin() + piece.begin, chars.begin() + piece.end);
        InsertSeparatorAfterDrive(result);
        AssignChars(GetPathString(), result);
    }
    return !unresolved;
}

void PathBase::GetCanonicalPath(PathBase& out) const {
    DynamicPath work(*this);
    work.CoalesceDoubleSeparators();
    work.CollapseDots();
    PathChars chars = ToChars(work.GetString());
    int top = 0;
    if (FindTopLevel(chars, top)) {
        PathShape const shape = ShapeOf(chars, "PathBase::GetCanonicalPath");
        for (Level const& level : shape.levels) {
            std::string stored;
            if (level.end == level.begin || HasWildcard(chars, level) ||
                !platform::StoredFileName(ToBytes(chars, 0, level.end).c_str(), stored))
                break;
            PathChars const name = ToChars(stored.c_str());
            // A name from the disk replaces the level only when it is the same name.
            if (RangesEqualNoCase(name, 0, Size(name), chars, level.begin, level.end))
                std::copy(name.begin(), name.end(), chars.begin() + level.begin);
        }
    }
    out.SetPathName(ToBytes(chars).c_str());
}

void PathBase::ParseSysVariables(bool keepUndefined) {
    PathChars const chars = ToChars(GetPathString());
    int const n = Size(chars);
    std::string result;
    for (int i = 0; i < n;) {
        if (chars[size_t(i)] != '%') {
            result += ToBytes(chars, i, i + 1);
            ++i;
            continue;
        }
        int const close = FindFirst(chars, '%', i + 1, n);
        if (close < 0) {
            result += ToBytes(chars, i, n); // a '%' without a partner stays
            break;
        }
        std::string const name = ToBytes(chars, i + 1, close);
        std::string value;
        if (name.empty() || !platform::GetEnvironmentVariable(name.c_str(), value))
            value = (name.empty() || keepUndefined) ? ToBytes(chars, i, close + 1) : "";
        result += value;
        i = close + 1;
    }
    SetPathName(result.c_str());
}

} // namespace tekit
