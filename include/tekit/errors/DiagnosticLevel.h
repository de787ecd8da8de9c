// The process-wide diagnostic level: 0 (the default) for users, above 0 for developers.
//
//   if (OrvaneMiscUtil::GetDiagnosticLevel() > 0)
//       WriteToCDebug("details only a developer wants\n");
//
// Above 0, assertions keep their own text and warnings are written to the debug output. The
// first use reads the environment variable TEKIT_DIAGNOSTIC_LEVEL (a decimal number; unset or
// anything else counts as 0); SetDiagnosticLevel overrides it from then on.
#pragma once

#include "tekit/Export.h"

namespace tekit::OrvaneMiscUtil {

TEKIT_API int GetDiagnosticLevel();
TEKIT_API void SetDiagnosticLevel(int level);

} // namespace tekit::OrvaneMiscUtil
