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

#include <cstdint>

namespace tekit {

enum TEError : std::int32_t {
    TE_NO_ERROR = 0,
    TE_OUT_OF_MEMORY = -17000,
    TE_PROGRAM_ERROR = -17001,
    TE_REGISTRY_ACCESS_ERROR = -17002,
    TE_REGISTRY_ITEM_NOT_FOUND = -17003,
    TE_DLL_NOT_LOADABLE = -17004,
    TE_FUNC_NOT_IN_LIB = -17005,
    TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE = -17006,
    TE_UNABLE_TO_INITIALIZE_OLE_SYSTEM_DLLS = -17007,
    TE_STACK_OVERFLOW = -17008,
    TE_CONVERTED_ERROR_CODE = -17009,
    TE_INT32_OVERFLOW = -17010,
    TE_UINT32_OVERFLOW = -17011,
    TE_EXTERNAL_SERVER_UNAVAILABLE = -17012,
    TE_INT64_OVERFLOW = -17013,
    TE_UINT64_OVERFLOW = -17014,
    TE_NEWER_FILE_FORMAT = -17098,
    TE_OUT_OF_DATE_FILE_FORMAT = -17099,
    TE_BAD_FILE_FORMAT = -17100,
    TE_IO_ERROR = -17200,
    TE_UNABLE_TO_OPEN_FILE = -17201,
    TE_BAD_NET_PATH = -17202,
    TE_DRIVE_NOT_READY = -17203,
    TE_INVALID_PATHNAME = -17204,
    TE_ACCESS_DENIED = -17205,
    TE_FILE_ALREADY_EXISTS = -17206,
    TE_DISK_FULL = -17207,
    TE_FILE_NOT_FOUND = -17208,
    TE_SHARING_VIOLATION = -17209,
    TE_WRITE_PROTECTED = -17210,
    TE_INVALID_DRIVE = -17211,
    TE_PATH_NOT_FOUND = -17212,
    TE_UNABLE_TO_CLOSE_FILE = -17213,
    TE_MEMORY_CHECKING = -17214,
    TE_UNABLE_TO_OPEN_DIR = -17215,
    TE_UNEXPECTED_END_OF_FILE = -17216,
    TE_INVALID_OR_OUT_OF_RANGE = -17300,
    TE_INDEX_OUT_OF_RANGE = -17301,
    TE_NO_ITEMS_IN_LIST = -17302,
    TE_TOO_MANY_ITEMS = -17303,
    TE_UNRECOGNIZED_VALUE = -17304,
    TE_DUPLICATE_ITEM_OR_VALUE = -17305,
    TE_UNKNOWN_VAR_OR_PROP = -17306,
    TE_UNKNOWN_TYPE = -17307,
    TE_UNEXPECTED_TYPE = -17308,
    TE_ILLEGAL_OPERATION_ON_VALUE = -17309,
    TE_ARRAY_LOCKED = -17310,
    TE_INCOMPATIBLE_PARAMETERS = -17311,
    TE_UNABLE_TO_PASS_BY_REFERENCE = -17312,
    TE_EXPR_TYPE_INCOMPATIBLE_WITH_PARAMETER = -17313,
    TE_EXPR_VALUE_NOT_SUPERSET_OF_PARAMETER = -17314,
    TE_WRONG_NUMBER_OF_PARAMETERS = -17315,
    TE_EVALUATION_CONTEXT_NOT_AVAILABLE = -17316,
    TE_SINGLE_DIM_NUMERIC_ARRAY_EXPECTED = -17317,
    TE_LVALUE_EXPECTED = -17318,
    TE_BAD_PROP_OR_VAR_NAME = -17319,
    TE_UNKNOWN_FUNCTION_OR_SEQUENCE_NAME = -17320,
    TE_TYPE_MISMATCH_ERROR = -17321,
    TE_BAD_EXPRESSION = -17322,
    TE_INVALID_WHEN_NOT_SUSPENDED = -17323,
    TE_ARRAY_INDEX_OUT_OF_BOUNDS = -17324,
    TE_WRONG_NUMBER_OF_ARRAY_INDICES = -17325,
    TE_MISMATCHED_ARRAY_BOUNDS = -17326,
    TE_NAME_ALREADY_IN_USE = -17327,
    TE_MISSING_TYPE = -17328,
    TE_TYPE_CONFLICT = -17329,
    TE_CURRENT_SEQFILE_NOT_AVAILABLE = -17330,
    TE_ITEM_CANNOT_BE_DELETED = -17331,
    TE_OBJECT_TYPE_INCOMPATIBLE_WITH_PARAMETER_SHORT_DESC = -17332,
    TE_TYPE_CANNOT_BE_DELETED = -17333,
    TE_TYPE_WITH_DEPENDING_INSTANCES_CANNOT_BE_DELETED = -17334,
    TE_OBJECT_CANNOT_BE_ADDED = -17335,
    TE_INVALID_ADAPTER_NAME = -17336,
    TE_STEP_TYPE_NOT_FOUND = -17337,
    TE_LWRTDLL_NOT_LOADED = -17338,
    TE_READ_OBJECT_NOT_FOUND = -17339,
    TE_TWO_DIM_NUMERIC_ARRAY_EXPECTED = -17340,
    TE_LOOMWIRE_TYPE_NOT_SUPPORTED_IN_CRX_DESC = -17341,
    TE_INVALID_REG_EXPR = -17342,
    TE_ARRAY_TYPE_EXPECTED = -17343,
    TE_ARRAY_DIMENSION_EXPECTED = -17344,
    TE_ARRAY_DIMENSION_SIZE_EXPECTED = -17345,
    TE_INVALID_POINTER = -17346,
    TE_EMPTY_EXPRESSION = -17347,
    TE_MISMATCHED_ITEMS = -17348,
    TE_OBJECT_LOCKED = -17349,
    TE_UNEXPECTED_CHANGE_COUNT = -17351,
    TE_THREAD_CREATION_FAILED = -17400,
    TE_OPERATION_IN_PROGRESS = -17401,
    TE_OPERATION_TIMED_OUT = -17402,
    TE_OPERATION_FAILED = -17500,
    TE_UNEXPECTED_SYSTEM_ERROR = -17501,
    TE_OS_EXCEPTION = -17502,
    TE_NOT_SUPPORTED = -17503,
    TE_MODULE_LOAD_FAILURE = -17600,
    TE_MODULE_NOT_SPECIFIED = -17601,
    TE_SEQUENCE_ABORTED = -17602,
    TE_SEQUENCE_TERMINATED = -17603,
    TE_OPERATION_CANCELED = -17604,
    TE_UNABLE_TO_LAUNCH_CRX = -17701,
    TE_CRX_OLE_ERROR = -17702,
    TE_CRX_OLE_NOTREG = -17703,
    TE_CRX_AUTO_CMD_FAILED = -17704,
    TE_CRX_REG_VALUE_TYPE_MISMATCH = -17705,
    TE_CRX_REG_VALUE_NOT_FOUND = -17706,
    TE_CRX_REG_KEY_NOT_FOUND = -17707,
    TE_CRX_REG_GENERIC_READ_ERROR = -17708,
    TE_CRX_MODULE_HAS_UNRESOLVED_REFERENCES = -17709,
    TE_CRX_FUNC_NOT_FOUND_IN_MODULE = -17710,
    TE_CRX_CANT_CONNECT_TO_TECRUN = -17711,
    TE_CRX_UNABLE_TO_TERMINATE_USER_PROG = -17712,
    TE_CRX_NON_DLL_MODULE_NOT_SUPPORTED = -17713,
    TE_CRX_VERSION_NOT_SUPPORTED = -17714,
    TE_DISP_UNKNOWN_INTERFACE = -17801,
    TE_DISP_UNKNOWN_MEMBER_NAME = -17802,
    TE_DISP_UNKNOWN_MEMBER_ID = -17803,
    TE_DISP_UNKNOWN_PARAM_NAME = -17804,
    TE_DISP_UNKNOWN_PARAM_ID = -17805,
    TE_DISP_MISSING_PARAM_NAME = -17806,
    TE_DISP_MISSING_PARAM_ID = -17807,
    TE_WRONG_NUM_POSITIONAL_PARAMS = -17808,
    TE_DISP_MISSING_ARG = -17809,
    TE_AUTO_OBJ_NOLONGER_VALID = -17810,
    TE_ACTIVEX_AUTOMATION_SERVER_EXCEPTION = -17811,
    TE_DISP_OBSOLETE_MEMBER_DESC = -17812,
    TE_REMOTE_SEQUENCE_ERROR = -17850,
    TE_REMOTE_SEQUENCE_ERROR_UNABLE_TO_CONNECT = -17851,
    TE_REMOTE_SEQUENCE_REMOTE_EXECUTION_DENIED = -17852,
    TE_REMOTE_HOST_NOT_SPECIFIED = -17853,
    TE_FILE_NOT_CONVERTABLE_TO_SEQFILE = -17901,
    TE_TYPE_PALETTE_FILE_LOAD_ERRORS = -17902,
    TE_LW_AUTO_SERVER_ERR = -18001,
    TE_LW_REPORTED_ERR = -18002,
    TE_LW_MISSING_REQUIRED_ARG = -18003,
    TE_LW_RUN_TIME_ENGINE_ERR = -18004,
    TE_LW_TYPE_CONVERSION_ERR = -18005,
    TE_LW_VI_ABORTED_ERR = -18006,
    TE_RSTRING_NOT_FOUND = -18051,
    TE_DDE_FAIL = -18101,
    TE_NO_FILE_ASSOC = -18151,
    TE_ADAPTER_NO_CONNECT_TO_AUTO_SERVER = -18201,
    TE_ADAPTER_SERVER_CONNECTION_LOST = -18202,
    TE_FAIL_TO_REGISTER_CLIPFORMAT = -18251,
    TE_TYPE_LIBRARY_READ_ERROR = -18351,
    TE_DOES_NOT_HAVE_PRIVILEGE = -18360,
    TE_SOURCE_CODE_CONTROL_ERROR = -18370,
    TE_WATCHEXPRESSION_ERROR = -18380,
    TE_GAUGEKIT_INTERFACE_NOT_FOUND = -18390,
    TE_METHOD_OR_PROP_NOT_AVAILABLE = -18400,
    TE_VISUAL_STUDIO_AUTOMATION_ERROR = -18500,
    TE_LW_KPX_AUTO_SERVER_ERR = -18520,
    TE_LW_KPX_REPORTED_ERR = -18521,
    TE_LW_KPX_MISSING_REQUIRED_ARG = -18522,
    TE_LW_KPX_RUN_TIME_ENGINE_ERR = -18523,
    TE_LW_KPX_TYPE_CONVERSION_ERR = -18524,
    TE_LW_KPX_RTEDLL_NOT_LOADED = -18525,
    TE_LW_KPX_AUTO_BUILD_ERR = -18526,
    TE_XML_ERROR = -18600,
    TE_DNASSEMBLY_MISSING = -18700,
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
