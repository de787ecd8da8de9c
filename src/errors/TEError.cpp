// The error table and the conversions from Win32 codes, HRESULTs and errno values to TEError.
#include "tekit/errors/TEError.h"

#include <cstring>

namespace tekit {

namespace {

/// The error table: searched linearly in this order, ended by a row with a null symbol.
constexpr TEErrorInfo kErrorTable[] = {
#define TE_ERROR(symbol, value, comCode, text) {symbol, #symbol, comCode},
#include "tekit/errors/TEError.def"
    {TE_NO_ERROR, nullptr, 0x80004005},
};

constexpr std::uint32_t kEFail = 0x80004005;
char const* const kErrorSection = "TE_ERRORS";
char const* const kUserDefinedKey = "USER_DEFINED_ERR_CODE";
char const* const kMissingTextDefault = "Internal Error, error code string not in table";

TEErrorInfo const* FindRow(TEError code) {
    for (TEErrorInfo const* row = kErrorTable; row->symbol; ++row)
        if (row->code == code)
            return row;
    return nullptr;
}

struct SystemCodeRow {
    unsigned int systemCode;
    TEError code;
};

/// Win32 errors and HRESULTs with a TEError of their own.
constexpr SystemCodeRow kSystemCodes[] = {
    {2, TE_FILE_NOT_FOUND},
    {3, TE_PATH_NOT_FOUND},
    {5, TE_ACCESS_DENIED},
    {65, TE_ACCESS_DENIED},
    {0x80070005, TE_ACCESS_DENIED},
    {8, TE_OUT_OF_MEMORY},
    {14, TE_OUT_OF_MEMORY},
    {0x8007000E, TE_OUT_OF_MEMORY},
    {15, TE_INVALID_DRIVE},
    {19, TE_WRITE_PROTECTED},
    {21, TE_DRIVE_NOT_READY},
    {32, TE_SHARING_VIOLATION},
    {39, TE_DISK_FULL},
    {112, TE_DISK_FULL},
    {53, TE_BAD_NET_PATH},
    {58, TE_BAD_NET_PATH},
    {240, TE_BAD_NET_PATH},
    {80, TE_FILE_ALREADY_EXISTS},
    {183, TE_FILE_ALREADY_EXISTS},
    {110, TE_UNABLE_TO_OPEN_FILE},
    {123, TE_INVALID_PATHNAME},
    {161, TE_INVALID_PATHNAME},
    {1155, TE_NO_FILE_ASSOC},
    {1156, TE_DDE_FAIL},
    {1157, TE_DLL_NOT_LOADABLE},
    {1223, TE_OPERATION_CANCELED},
    {0x80004003, TE_INVALID_POINTER},
    {0x80020005, TE_TYPE_MISMATCH_ERROR},
};

/// TEError by C runtime errno (the Windows runtime's numbering). Some pairings are loose on
/// purpose: 8 (exec format error) is a bad file format, 7 (argument list too long) too many
/// items, 25 and 41 an illegal operation on a value. Values not listed fail the operation.
TEError ErrnoRow(int crtErrno) {
    switch (crtErrno) {
    case 0:
        return TE_NO_ERROR;
    case 1:
    case 13:
        return TE_ACCESS_DENIED;
    case 2:
        return TE_FILE_NOT_FOUND;
    case 3:
    case 6:
    case 9:
    case 14:
    case 19:
    case 20:
    case 21:
    case 22:
    case 29:
    case 33:
    case 34:
    case 38:
    case 42:
    case 80:
        return TE_INVALID_OR_OUT_OF_RANGE;
    case 4:
    case 5:
    case 18:
    case 27:
        return TE_IO_ERROR;
    case 7:
        return TE_TOO_MANY_ITEMS;
    case 8:
        return TE_BAD_FILE_FORMAT;
    case 10:
    case 23:
    case 24:
    case 31:
    case 36:
    case 39:
        return TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE;
    case 11:
    case 12:
        return TE_OUT_OF_MEMORY;
    case 17:
        return TE_FILE_ALREADY_EXISTS;
    case 25:
    case 41:
        return TE_ILLEGAL_OPERATION_ON_VALUE;
    case 28:
        return TE_DISK_FULL;
    case 30:
        return TE_WRITE_PROTECTED;
    default: // 16, 32, 40 and every other value
        return TE_OPERATION_FAILED;
    }
}

} // namespace

TEErrorInfo const* GetTEErrorTable() {
    return kErrorTable;
}

char const* TEErrorToStringSymbol(TEError code) {
    TEErrorInfo const* row = FindRow(code);
    return row ? row->symbol : "";
}

TEError TEErrorFromStringSymbol(char const* symbol, bool* found) {
    if (found)
        *found = false;
    if (!symbol)
        return TE_NO_ERROR;
    for (TEErrorInfo const* row = kErrorTable; row->symbol; ++row)
        if (std::strcmp(row->symbol, symbol) == 0) {
            if (found)
                *found = true;
            return row->code;
        }
    return TE_NO_ERROR;
}

RString TEErrorToRString(TEError code, char const* defaultText, bool* found) {
    if (found)
        *found = true;
    TEErrorInfo const* row = FindRow(code);
    RString text(kErrorSection, row ? row->symbol : kUserDefinedKey,
                 defaultText ? defaultText : kMissingTextDefault, found);
    if (!row && found)
        *found = false;
    return text;
}

std::uint32_t GetWinErrorCode(TEError code) {
    TEErrorInfo const* row = FindRow(code);
    return row ? row->comCode : kEFail;
}

TEError SystemErrorCodeToTEError(unsigned int systemCode, TEError fallback) {
    for (SystemCodeRow const& row : kSystemCodes)
        if (row.systemCode == systemCode)
            return row.code;
    return fallback;
}

TEError Win32FileIOErrorToTEError(unsigned int systemCode) {
    return SystemErrorCodeToTEError(systemCode, TE_IO_ERROR);
}

TEError ErrnoToTEError(int crtErrno) {
    return ErrnoRow(crtErrno);
}

bool IsSyntaxError(TEError code) {
    return code == TE_BAD_EXPRESSION || code == TE_EMPTY_EXPRESSION;
}

bool IsEvaluationError(TEError code) {
    switch (code) {
    case TE_UNKNOWN_TYPE:
    case TE_UNEXPECTED_TYPE:
    case TE_TYPE_MISMATCH_ERROR:
    case TE_WRONG_NUMBER_OF_PARAMETERS:
    case TE_WRONG_NUMBER_OF_ARRAY_INDICES:
    case TE_FUNC_NOT_IN_LIB:
        return true;
    default:
        return false;
    }
}

bool IsEvaluationWarning(TEError code) {
    return code != TE_NO_ERROR && !IsSyntaxError(code) && !IsEvaluationError(code);
}

} // namespace tekit
