// DynamicPath: a path whose text lives on the heap and is never cut.
//
//   DynamicPath deep(longText);               // keeps all of it, beyond 260 characters
//   DynamicString forSystem;
//   PathBase::ConvertForLongPathCalls(deep.GetString(), forSystem);   // \\?\C:\...
//
// For paths that may exceed 260 characters, such as those handed to the long-path calls.
#pragma once

#include "tekit/paths/PathBase.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

class TEKIT_API DynamicPath : public PathBase {
public:
    DynamicPath();
    DynamicPath(char const* text);
    DynamicPath(String const& text);
    DynamicPath(PathBase const& other);
    DynamicPath(DynamicPath const& other);
    ~DynamicPath() override;

    using PathBase::operator=;
    DynamicPath& operator=(DynamicPath const& other);

protected:
    String& GetPathString() override;
    String const& GetPathString() const override;

private:
    DynamicString m_path;
};

} // namespace tekit
