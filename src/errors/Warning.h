// The three-line warning form shared by ReportTEWarning and the destructor-exception handler.
#pragma once

namespace tekit::detail {

/// Writes to the debug output, each line ended by a newline:
///   WARNING! '<message>' Line <line> in function <function> in file <file>
///   Compilation Date: <date> Compilation Time: <time>
///   API Function: <apiFunction>, API Error Code: <apiErrorCode>   (only with an apiFunction)
/// Null texts other than `apiFunction` are written as empty.
void WriteWarning(char const* message, char const* function, char const* apiFunction,
                  long apiErrorCode, char const* file, long line, char const* date,
                  char const* time);

} // namespace tekit::detail
