// The raise functions and the macros that raise sites use.
//
// Every raise passes eleven arguments in a fixed order: description, qualified function name,
// code, debug-on-construction, API function name and its error code, source, file base name,
// line, compilation date and time. Raise sites use the macros, which add the file's base name,
// line, date and time:
//
//   TE_RAISE(TE_INDEX_OUT_OF_RANGE, description, "OVMemoryStream::ReadInt");
//   TE_RAISE_API(TE_IO_ERROR, description, "OVBinaryFileStream::Read", "ReadFile", error);
//   TE_ASSERT(index >= 0, "OVMemoryStream::Seek");
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/TEError.h"

namespace tekit {

class String;

[[noreturn]] TEKIT_API void RaiseTEException(char const* description, char const* function,
                                             TEError code, bool debugOnConstruction,
                                             char const* apiFunction, long apiErrorCode,
                                             char const* source, char const* file, long line,
                                             char const* date, char const* time);
[[noreturn]] TEKIT_API void RaiseTEException(String const& description, char const* function,
                                             TEError code, bool debugOnConstruction,
                                             char const* apiFunction, long apiErrorCode,
                                             char const* source, char const* file, long line,
                                             char const* date, char const* time);
/// As RaiseTEException, but the description is kept only when the diagnostic level is above
/// 0; otherwise the exception shows the code's own message.
[[noreturn]] TEKIT_API void RaiseTEAssertion(char const* description, char const* function,
                                             TEError code, bool debugOnConstruction,
                                             char const* apiFunction, long apiErrorCode,
                                             char const* source, char const* file, long line,
                                             char const* date, char const* time);
[[noreturn]] TEKIT_API void RaiseTEAssertion(String const& description, char const* function,
                                             TEError code, bool debugOnConstruction,
                                             char const* apiFunction, long apiErrorCode,
                                             char const* source, char const* file, long line,
                                             char const* date, char const* time);
/// Raises the TEError that a system code maps to (fallback TE_OS_EXCEPTION), with the
/// system's message for it as the description.
[[noreturn]] TEKIT_API void RaiseTESystemException(unsigned int systemCode, char const* file,
                                                   long line, char const* date, char const* time);
/// Raises `code` with its own message, function name "ThrowTEError".
[[noreturn]] TEKIT_API void ThrowTEError(TEError code);
/// Raises "32-BIT SIZE LIMITATION." as TE_INT32_OVERFLOW (signed) or TE_UINT32_OVERFLOW.
[[noreturn]] TEKIT_API void Throw32BitOverflowException(char const* function, char const* file,
                                                        unsigned int line, bool isSigned);
/// Raises TE_OUT_OF_MEMORY with its own message, function name "ThrowOutOfMemory".
[[noreturn]] TEKIT_API void ThrowOutOfMemory();

/// Writes a three-line warning ("WARNING! '...") to the debug output, only when the diagnostic
/// level is above 0. `apiFunction` may be null (then the third line is left out).
TEKIT_API void ReportTEWarning(char const* message, char const* function, char const* apiFunction,
                               long apiErrorCode, char const* file, long line, char const* date,
                               char const* time);

namespace detail {
/// The base name of a source path without directories or extension: "src/a/CopyOnWrite.cpp"
/// gives "CopyOnWrite". Evaluated at compile time into a static buffer.
template <unsigned N> struct SourceBaseName {
    char text[N] = {};
    constexpr SourceBaseName(char const (&path)[N]) {
        unsigned start = 0, end = N - 1;
        for (unsigned i = 0; i + 1 < N; ++i)
            if (path[i] == '/' || path[i] == '\\')
                start = i + 1;
        for (unsigned i = N - 1; i > start; --i)
            if (path[i - 1] == '.') {
                end = i - 1;
                break;
            }
        for (unsigned i = start; i < end; ++i)
            text[i - start] = path[i];
    }
};
} // namespace detail

} // namespace tekit

/// The calling file's base name as a `char const*` with static storage.
#define TE_FILE_BASE_NAME                                                                          \
    ([]() -> char const* {                                                                         \
        static constexpr ::tekit::detail::SourceBaseName kName(__FILE__);                          \
        return kName.text;                                                                         \
    }())

#define TE_RAISE(code, description, function)                                                      \
    ::tekit::RaiseTEException((description), (function), (code), false, nullptr, 0, nullptr,       \
                              TE_FILE_BASE_NAME, __LINE__, __DATE__, __TIME__)
#define TE_RAISE_API(code, description, function, apiFunction, apiErrorCode)                       \
    ::tekit::RaiseTEException((description), (function), (code), false, (apiFunction),             \
                              (apiErrorCode), nullptr, TE_FILE_BASE_NAME, __LINE__, __DATE__,      \
                              __TIME__)
/// Raises with an error source (a COM component's name) and the place the caller names: a
/// `file` of null is the calling file and `line` then the calling line.
#define TE_RAISE_FROM(code, description, function, apiErrorCode, errorSource, file, line)          \
    ::tekit::RaiseTEException((description), (function), (code), false, nullptr, (apiErrorCode),   \
                              (errorSource), (file) ? (file) : TE_FILE_BASE_NAME,                  \
                              (file) ? (line) : __LINE__, __DATE__, __TIME__)
/// Raises TE_PROGRAM_ERROR with `text` as the assertion text.
#define TE_RAISE_ASSERTION(text, function)                                                         \
    ::tekit::RaiseTEAssertion((text), (function), ::tekit::TE_PROGRAM_ERROR, false, nullptr, 0,    \
                              nullptr, TE_FILE_BASE_NAME, __LINE__, __DATE__, __TIME__)
/// Raises TE_PROGRAM_ERROR with the failed condition as the assertion text.
#define TE_ASSERT(condition, function)                                                             \
    do {                                                                                           \
        if (!(condition))                                                                          \
            ::tekit::RaiseTEAssertion("Assertion failed: " #condition, (function),                 \
                                      ::tekit::TE_PROGRAM_ERROR, false, nullptr, 0, nullptr,       \
                                      TE_FILE_BASE_NAME, __LINE__, __DATE__, __TIME__);            \
    } while (0)
#define TE_WARN(message, function)                                                                 \
    ::tekit::ReportTEWarning((message), (function), nullptr, 0, TE_FILE_BASE_NAME, __LINE__,       \
                             __DATE__, __TIME__)
