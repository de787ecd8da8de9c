// The raise, assertion and warning functions behind the TE_RAISE family of macros.
#include "tekit/errors/Raise.h"

#include "errors/Warning.h"
#include "platform/SystemError.h"
#include "tekit/errors/DiagnosticLevel.h"
#include "tekit/errors/TEException.h"

#include <string>

namespace tekit {

void RaiseTEException(char const* description, char const* function, TEError code,
                      bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                      char const* source, char const* file, long line, char const* date,
                      char const* time) {
    throw TEException(description, function, code, debugOnConstruction, apiFunction, apiErrorCode,
                      source, file, line, date, time);
}

void RaiseTEException(String const& description, char const* function, TEError code,
                      bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                      char const* source, char const* file, long line, char const* date,
                      char const* time) {
    throw TEException(description, function, code, debugOnConstruction, apiFunction, apiErrorCode,
                      source, file, line, date, time);
}

void RaiseTEAssertion(char const* description, char const* function, TEError code,
                      bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                      char const* source, char const* file, long line, char const* date,
                      char const* time) {
    // For users the code's own message; the assertion text is for developers.
    char const* const kept = OrvaneMiscUtil::GetDiagnosticLevel() > 0 ? description : "";
    RaiseTEException(kept, function, code, debugOnConstruction, apiFunction, apiErrorCode, source,
                     file, line, date, time);
}

void RaiseTEAssertion(String const& description, char const* function, TEError code,
                      bool debugOnConstruction, char const* apiFunction, long apiErrorCode,
                      char const* source, char const* file, long line, char const* date,
                      char const* time) {
    if (OrvaneMiscUtil::GetDiagnosticLevel() > 0)
        RaiseTEException(description, function, code, debugOnConstruction, apiFunction,
                         apiErrorCode, source, file, line, date, time);
    RaiseTEException("", function, code, debugOnConstruction, apiFunction, apiErrorCode, source,
                     file, line, date, time);
}

/// The function name is this function's own, since the raise site passes only its location.
void RaiseTESystemException(unsigned int systemCode, char const* file, long line, char const* date,
                            char const* time) {
    std::string const message = platform::SystemErrorMessage(systemCode);
    RaiseTEException(message.c_str(), "RaiseTESystemException",
                     SystemErrorCodeToTEError(systemCode, TE_OS_EXCEPTION), false, "",
                     long(std::int32_t(systemCode)), nullptr, file, line, date, time);
}

void ThrowTEError(TEError code) {
    RaiseTEException(nullptr, "ThrowTEError", code, false, nullptr, 0, nullptr, TE_FILE_BASE_NAME,
                     __LINE__, __DATE__, __TIME__);
}

/// The caller gives its function, file and line; the date and time are this library's build.
void Throw32BitOverflowException(char const* function, char const* file, unsigned int line,
                                 bool isSigned) {
    RaiseTEException("32-BIT SIZE LIMITATION.", function,
                     isSigned ? TE_INT32_OVERFLOW : TE_UINT32_OVERFLOW, false, nullptr, 0, nullptr,
                     file, long(line), __DATE__, __TIME__);
}

void ThrowOutOfMemory() {
    RaiseTEException(nullptr, "ThrowOutOfMemory", TE_OUT_OF_MEMORY, false, nullptr, 0, nullptr,
                     TE_FILE_BASE_NAME, __LINE__, __DATE__, __TIME__);
}

void ReportTEWarning(char const* message, char const* function, char const* apiFunction,
                     long apiErrorCode, char const* file, long line, char const* date,
                     char const* time) {
    if (OrvaneMiscUtil::GetDiagnosticLevel() > 0)
        detail::WriteWarning(message, function, apiFunction, apiErrorCode, file, line, date, time);
}

} // namespace tekit
