// TEError: the library-wide error code. 0 is success; errors are negative, -17000 to -18700.
//
// The error table names every code, gives the HRESULT (or, for a few file errors, the bare
// Win32 number) reported to COM clients, and keys the code's message in the "TE_ERRORS"
// message table. The conversions below turn runtime errno values, Win32 codes and HRESULTs
// into TEError.
//
//   if (code == TE_FILE_NOT_FOUND) ...
//   char const* symbol = TEErrorToStringSymbol(code);   // "TE_FILE_NOT_FOUND"
//   DynamicString text = TEErrorToRString(code).GetString();   // "File not found."
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/StatusDefinitions.h"

#include <cstdint>

namespace tekit {

/// The library's error codes, from "tekit/errors/TEError.def".
enum TEError : std::int32_t {
    TE_NO_ERROR = 0,
#define TE_ERROR(symbol, value, comCode, text) TEKIT_STATUS_ENUMERATOR(symbol, value)
#include "tekit/errors/TEError.def"
};

/// One row of the error table.
struct TEErrorInfo {
    TEError code;
    /// The code's name, also the key of its message in "TE_ERRORS"; null in the closing row.
    char const* symbol;
    /// The HRESULT, or for some file errors the bare Win32 error number, given to COM clients.
    std::uint32_t comCode;
};

/// The error table in its stored order (decreasing value), ended by a row whose symbol is null.
TEKIT_API TEErrorInfo const* GetTEErrorTable();

/// The code's symbol ("TE_OUT_OF_MEMORY"), or "" for 0 and any code not in the table.
TEKIT_API char const* TEErrorToStringSymbol(TEError code);
/// The code named by `symbol` (exact spelling); 0 with `*found` false when there is none.
TEKIT_API TEError TEErrorFromStringSymbol(char const* symbol, bool* found);

/// The code's message: key = its symbol in "TE_ERRORS", or "USER_DEFINED_ERR_CODE" for a code
/// not in the table (then `*found` is false). `defaultText` (null: "Internal Error, error code
/// string not in table") is used when the message table holds no text for the key.
TEKIT_API RString TEErrorToRString(TEError code, char const* defaultText = nullptr,
                                   bool* found = nullptr);

/// The row's COM code; E_FAIL (0x80004005) for a code not in the table. For file errors this
/// is a bare Win32 number (TE_FILE_NOT_FOUND gives 2): wrap it to get an HRESULT.
TEKIT_API std::uint32_t GetWinErrorCode(TEError code);

/// Maps a Win32 error code or HRESULT to a TEError; anything unknown gives `fallback`.
TEKIT_API TEError SystemErrorCodeToTEError(unsigned int systemCode, TEError fallback);
/// SystemErrorCodeToTEError with TE_IO_ERROR as the fallback.
TEKIT_API TEError Win32FileIOErrorToTEError(unsigned int systemCode);
/// Maps a C runtime errno in the Windows runtime's numbering (36 EDEADLOCK, 38 ENAMETOOLONG,
/// 80 STRUNCATE, ...; the library translates a POSIX host's errno first) to a TEError: 0 gives
/// 0, unknown values TE_OPERATION_FAILED.
TEKIT_API TEError ErrnoToTEError(int crtErrno);

/// TE_BAD_EXPRESSION and TE_EMPTY_EXPRESSION: an expression that cannot be parsed.
TEKIT_API bool IsSyntaxError(TEError code);
/// The six failures that make an expression unusable whatever its run-time values.
TEKIT_API bool IsEvaluationError(TEError code);
/// Every other non-zero code: an expression checker reports it as a warning only.
TEKIT_API bool IsEvaluationWarning(TEError code);

} // namespace tekit
