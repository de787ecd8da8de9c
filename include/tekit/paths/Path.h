// Path: the path value type of the library, 260 characters at most.
//
//   Path file("C:\\data\\report.ini");
//   Path root = file.GetRootDir();            // the drive root, C:\ with its separator
//   PathBase::PathVector recent;
//   recent.push_back(file);
//
// It is what functions return (FindCommonPrefix, GetRootDir) and what PathBase::PathVector
// holds. Moving is copying: the text lives inside the object.
#pragma once

#include "tekit/paths/StaticPath.h"

namespace tekit {

class TEKIT_API Path : public StaticPath {
public:
    Path();
    Path(char const* text);
    Path(String const& text);
    Path(PathBase const& other);
    Path(Path const& other);
    Path(Path&& other) noexcept;
    ~Path() override;

    using PathBase::operator=;
    Path& operator=(Path const& other);
    Path& operator=(Path&& other) noexcept;
};

} // namespace tekit
