// The platform's debug channel; the replaceable sink sits above it, in the errors subsystem.
#pragma once

namespace tekit::platform {

/// Writes text to standard error on POSIX, to the debugger (OutputDebugStringA) on Windows.
void WriteDebugText(char const* text);

} // namespace tekit::platform
