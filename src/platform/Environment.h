// The process's environment variables.
#pragma once

#include "tekit/platform/WinTypes.h"

#include <string>

// <windows.h> (included above, so no later include brings the macro back) makes
// GetEnvironmentVariable a macro; the function below keeps its own name in every file.
#undef GetEnvironmentVariable

namespace tekit::platform {

/// The value of an environment variable (the process's own on Windows, not the C runtime's
/// copy); false when it is not set.
bool GetEnvironmentVariable(char const* name, std::string& value);

} // namespace tekit::platform
