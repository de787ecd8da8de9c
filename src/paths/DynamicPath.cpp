// DynamicPath: the path on the heap, never cut.
#include "tekit/paths/DynamicPath.h"

namespace tekit {

DynamicPath::DynamicPath() = default;
DynamicPath::DynamicPath(char const* text) {
    SetPathName(text);
}
DynamicPath::DynamicPath(String const& text) {
    SetPathName(text);
}
DynamicPath::DynamicPath(PathBase const& other) {
    SetPathName(other);
}
// Shares the other's block: the text is already normalised.
DynamicPath::DynamicPath(DynamicPath const& other) : PathBase(other), m_path(other.m_path) {}
DynamicPath::~DynamicPath() = default;

DynamicPath& DynamicPath::operator=(DynamicPath const& other) {
    m_path = other.m_path;
    return *this;
}

String& DynamicPath::GetPathString() {
    return m_path;
}
String const& DynamicPath::GetPathString() const {
    return m_path;
}

} // namespace tekit
