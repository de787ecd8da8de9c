// The fatal assertion of the handle functions: a null handle is a programming error.
#pragma once

#include <string>

namespace tekit::toolbox {

/// The assertion's text for `message` detected at `line` of `file`.
std::string AssertText(char const* message, int line, char const* file);

/// Shows the assertion's text in a box captioned "Assert", then aborts the process.
[[noreturn]] void AssertFailed(char const* message, int line, char const* file);

} // namespace tekit::toolbox
