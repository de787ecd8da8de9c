// PathBase: text access, comparison and the components of a path.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"
#include "strings/MultiByteChars.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

namespace tekit {

using namespace detail;

std::int32_t const PathBase::kMaxFileExtensionLength = 254;
std::int32_t const PathBase::kNumCmdFileExtensions = 4;

namespace {

/// Stores `chars` as the path's text, normalised as on construction.
void StoreNormalised(String& text, PathChars chars) {
    InsertSeparatorAfterDrive(chars);
    AssignChars(text, chars);
}

int CompareNoCase(char const* a, char const* b) {
    return String::IsMultiByteSupportEnabled() ? mbcs::ICmp(a, b) : mbcs::AsciiICmp(a, b);
}

/// `name` without one leading dot.
char const* SkipDot(char const* name) {
    return name && *name == '.' ? name + 1 : name;
}

/// Assigns to `out` the part of `path` that `find` locates, less its first `skip` characters;
/// clears `out` when there is no such part.
void AssignPart(String const& path, bool (*find)(PathChars const&, int&, int&), int skip,
                String& out) {
    PathChars const chars = ToChars(path);
    int start = 0, length = 0;
    if (find(chars, start, length))
        AssignChars(out, chars, start + skip, start + length);
    else
        out.Clear();
}

} // namespace

PathBase::~PathBase() = default;

// ---- Text access and assignment -----------------------------------------------------------

char const* PathBase::CStr() const {
    return GetPathString().GetBufferReadPtr();
}
String const& PathBase::GetString() const {
    return GetPathString();
}
void PathBase::GetPathName(String& out) const {
    out.Assign(GetPathString());
}
void PathBase::SetPathName(char const* text) {
    GetPathString().Assign(text ? text : "");
    DisallowRelativePathsWithDriveSpec();
}
void PathBase::SetPathName(String const& text) {
    SetPathName(text.GetBufferReadPtr());
}
void PathBase::SetPathName(PathBase const& other) {
    if (&other != this)
        SetPathName(other.CStr());
}
PathBase& PathBase::operator=(char const* text) {
    SetPathName(text);
    return *this;
}
PathBase& PathBase::operator=(String const& text) {
    SetPathName(text);
    return *this;
}
PathBase& PathBase::operator=(PathBase const& other) {
    SetPathName(other);
    return *this;
}
void PathBase::Clear() {
    GetPathString().Clear();
}
bool PathBase::IsEmpty() const {
    return GetPathString().IsEmpty();
}

void PathBase::DisallowRelativePathsWithDriveSpec() {
    PathChars chars = ToChars(GetPathString());
    if (detail::UsesDriveLetter(chars) && (Size(chars) == 2 || chars[2] != kSeparator))
        StoreNormalised(GetPathString(), chars);
}

// ---- Comparison ---------------------------------------------------------------------------

bool PathBase::EqualsText(char const* other) const {
    return CompareNoCase(CStr(), other ? other : "") == 0;
}
bool PathBase::operator==(PathBase const& other) const {
    return EqualsText(other.CStr());
}
bool PathBase::operator==(String const& other) const {
    return EqualsText(other.GetBufferReadPtr());
}
bool PathBase::operator==(char const* other) const {
    return EqualsText(other);
}
bool PathBase::operator<(PathBase const& other) const {
    return CompareNoCase(CStr(), other.CStr()) < 0;
}
bool PathBase::PathCompareObj::operator()(Path const& a, Path const& b) const {
    return a < b;
}

// ---- Components ---------------------------------------------------------------------------

void PathBase::GetDirectoryPathName(String& out) const {
    PathChars chars = ToChars(GetPathString());
    int start = 0, length = 0;
    if (detail::FindFileName(chars, start, length))
        chars.resize(static_cast<size_t>(start));
    detail::StripTrailingSeparator(chars);
    AssignChars(out, chars);
}

void PathBase::GetFileName(String& out) const {
    AssignPart(GetPathString(), detail::FindFileName, 0, out);
}

void PathBase::GetBaseName(String& out) const {
    AssignPart(GetPathString(), detail::FindBaseName, 0, out);
}

void PathBase::GetExtension(String& out) const {
    AssignPart(GetPathString(), detail::FindExtension, 1, out); // without the dot
}

void PathBase::SetDirectoryPathName(char const* directory) {
    DynamicString name;
    GetFileName(name);
    DynamicPath result(directory ? directory : "");
    if (!name.IsEmpty())
        result.Append(name);
    SetPathName(result);
}
void PathBase::SetDirectoryPathName(String const& directory) {
    SetDirectoryPathName(directory.GetBufferReadPtr());
}

void PathBase::SetFileName(char const* name) {
    PathChars chars = ToChars(GetPathString());
    int start = 0, length = 0;
    if (!detail::FindFileName(chars, start, length)) {
        Append(name);
        return;
    }
    chars.resize(static_cast<size_t>(start));
    PathChars const added = ToChars(name);
    chars.insert(chars.end(), added.begin(), added.end());
    StoreNormalised(GetPathString(), chars);
}
void PathBase::SetFileName(String const& name) {
    SetFileName(name.GetBufferReadPtr());
}

void PathBase::SetBaseName(char const* name) {
    PathChars const chars = ToChars(GetPathString());
    int dot = 0, length = 0;
    DynamicString fileName(name ? name : "");
    if (detail::FindExtension(chars, dot, length))
        fileName += ToBytes(chars, dot, dot + length).c_str();
    SetFileName(fileName);
}
void PathBase::SetBaseName(String const& name) {
    SetBaseName(name.GetBufferReadPtr());
}

void PathBase::SetExtension(char const* extension) {
    PathChars chars = ToChars(GetPathString());
    int start = 0, length = 0;
    if (!detail::FindFileName(chars, start, length))
        return;
    int dot = 0;
    if (detail::FindExtension(chars, dot, length))
        chars.resize(static_cast<size_t>(dot));
    PathChars const added = ToChars(SkipDot(extension));
    if (!added.empty()) {
        chars.push_back('.');
        chars.insert(chars.end(), added.begin(), added.end());
    }
    StoreNormalised(GetPathString(), chars);
}
void PathBase::SetExtension(String const& extension) {
    SetExtension(extension.GetBufferReadPtr());
}

bool PathBase::HasExtension() const {
    int dot = 0, length = 0;
    return detail::FindExtension(ToChars(GetPathString()), dot, length);
}

bool PathBase::HasExtension(char const* extension) const {
    PathChars const chars = ToChars(GetPathString());
    int dot = 0, length = 0;
    if (!detail::FindExtension(chars, dot, length))
        return false;
    return CompareNoCase(ToBytes(chars, dot + 1, dot + length).c_str(),
                         SkipDot(extension ? extension : "")) == 0;
}

void PathBase::Append(char const* component) {
    PathChars chars = ToChars(GetPathString());
    if (!chars.empty() && !IsDirectoryText(chars))
        chars.push_back(kSeparator);
    PathChars const added = ToChars(component);
    chars.insert(chars.end(), added.begin(), added.end());
    StoreNormalised(GetPathString(), chars);
}
void PathBase::Append(String const& component) {
    Append(component.GetBufferReadPtr());
}

void PathBase::RemoveFileComponent() {
    PathChars chars = ToChars(GetPathString());
    int start = 0, length = 0;
    if (!detail::FindFileName(chars, start, length))
        return;
    if (start < ShapeOf(chars, "PathBase::RemoveFileComponent").rootEnd)
        return; // the share of \\srv\share is part of the root
    chars.resize(static_cast<size_t>(start));
    detail::StripTrailingSeparator(chars);
    StoreNormalised(GetPathString(), chars);
}

void PathBase::RemoveLastComponent() {
    PathChars chars = ToChars(GetPathString());
    PathShape const shape = ShapeOf(chars, "PathBase::RemoveLastComponent");
    if (shape.levels.empty())
        return;
    StoreNormalised(GetPathString(), PrefixOf(chars, shape, int(shape.levels.size()) - 1));
}

void PathBase::ExtractFileComponent(PathBase& out) {
    DynamicString name;
    GetFileName(name);
    out.SetPathName(name);
    RemoveFileComponent();
}

void PathBase::StripTrailingSeparator() {
    PathChars chars = ToChars(GetPathString());
    detail::StripTrailingSeparator(chars);
    AssignChars(GetPathString(), chars);
}

bool PathBase::ConvertToDirectory(bool mustExist) {
    if (IsEmpty() || (mustExist && !IsDirectory()))
        return false;
    PathChars chars = ToChars(GetPathString());
    if (!IsDirectoryText(chars)) {
        chars.push_back(kSeparator);
        AssignChars(GetPathString(), chars);
    }
    return true;
}

} // namespace tekit
