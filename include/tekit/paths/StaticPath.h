// StaticPath: a path in a fixed 260-character buffer (the Windows MAX_PATH).
//
//   StaticPath settings("C:settings.ini");   // stored as C:\settings.ini
//
// Longer text is cut silently, as StaticString<260> cuts it. Path, the value type used
// everywhere, derives from it; use DynamicPath for paths that may be longer.
#pragma once

#include "tekit/paths/PathBase.h"
#include "tekit/strings/StaticString.h"

namespace tekit {

class TEKIT_API StaticPath : public PathBase {
public:
    StaticPath();
    StaticPath(char const* text);
    StaticPath(String const& text);
    StaticPath(PathBase const& other);
    StaticPath(StaticPath const& other);
    ~StaticPath() override;

    using PathBase::operator=;
    StaticPath& operator=(StaticPath const& other);

protected:
    String& GetPathString() override;
    String const& GetPathString() const override;

private:
    StaticString<260> m_path;
};

} // namespace tekit
