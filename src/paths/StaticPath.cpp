// StaticPath and Path: the path in a fixed 260-character buffer.
#include "tekit/paths/StaticPath.h"

#include "tekit/paths/Path.h"

namespace tekit {

StaticPath::StaticPath() = default;
StaticPath::StaticPath(char const* text) {
    SetPathName(text);
}
StaticPath::StaticPath(String const& text) {
    SetPathName(text);
}
StaticPath::StaticPath(PathBase const& other) {
    SetPathName(other);
}
// The text is copied as it is: the other path is already normalised.
StaticPath::StaticPath(StaticPath const& other) : PathBase(other), m_path(other.m_path) {}
StaticPath::~StaticPath() = default;

StaticPath& StaticPath::operator=(StaticPath const& other) {
    m_path = other.m_path;
    return *this;
}

String& StaticPath::GetPathString() {
    return m_path;
}
String const& StaticPath::GetPathString() const {
    return m_path;
}

Path::Path() = default;
Path::Path(char const* text) : StaticPath(text) {}
Path::Path(String const& text) : StaticPath(text) {}
Path::Path(PathBase const& other) : StaticPath(other) {}
Path::Path(Path const& other) = default;
Path::Path(Path&& other) noexcept : StaticPath(other) {}
Path::~Path() = default;

Path& Path::operator=(Path const& other) = default;
Path& Path::operator=(Path&& other) noexcept {
    StaticPath::operator=(other);
    return *this;
}

} // namespace tekit
