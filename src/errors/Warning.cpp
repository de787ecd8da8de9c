// The three-line warning form written to the debug output by warnings and by the
// destructor-exception handler.
#include "errors/Warning.h"

#include "tekit/errors/DebugOutput.h"

#include <cstdio>
#include <sstream>

namespace tekit::detail {

namespace {

char const* Text(char const* text) {
    return text ? text : "";
}

/// Numbers in the warning are written with "%d".
char const* FormatInt(char (&buffer)[16], long value) {
    std::snprintf(buffer, sizeof buffer, "%d", int(value));
    return buffer;
}

} // namespace

void WriteWarning(char const* message, char const* function, char const* apiFunction,
                  long apiErrorCode, char const* file, long line, char const* date,
                  char const* time) {
    char lineText[16];
    char codeText[16];
    std::ostringstream out;
    out << "WARNING! '" << Text(message) << "' Line " << FormatInt(lineText, line)
        << " in function " << Text(function) << " in file " << Text(file) << '\n';
    out << "Compilation Date: " << Text(date) << " Compilation Time: " << Text(time) << '\n';
    if (apiFunction)
        out << "API Function: " << apiFunction
            << ", API Error Code: " << FormatInt(codeText, apiErrorCode) << '\n';
    FlushStringStreamToCDebug(out);
}

} // namespace tekit::detail
