// The TEError codes: the table, the messages, the mapping of system codes, and the one
// definition file the enum, the table and the "TE_ERRORS" messages are generated from.
#include "tekit/errors/TEError.h"
#include "platform/SystemError.h"
#include "tekit/errors/RString.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <tuple>
#include <utility>
#include <vector>

namespace tekit {
namespace {

TEST(ErrorTable, SymbolsAndComCodes) {
    int rows = 0, eFail = 0;
    for (TEErrorInfo const* row = GetTEErrorTable(); row->symbol; ++row, ++rows) {
        EXPECT_TRUE(row->code >= -18700 && row->code <= -17000) << row->symbol;
        bool found = false;
        EXPECT_EQ(TEErrorFromStringSymbol(row->symbol, &found), row->code);
        EXPECT_TRUE(found) << row->symbol;
        eFail += row->comCode == 0x80004005u;
    }
    EXPECT_EQ(eFail, 69);
    EXPECT_STREQ(GetTEErrorTable()[0].symbol, "TE_OUT_OF_MEMORY");
    EXPECT_STREQ(GetTEErrorTable()[rows - 1].symbol, "TE_DNASSEMBLY_MISSING");

    std::map<TEError, std::uint32_t> const documented = {
        // clang-format off
        {TE_OUT_OF_MEMORY, 0x8007000E}, {TE_REGISTRY_ACCESS_ERROR, 0x80040150},
        {TE_FUNC_NOT_IN_LIB, 0x1F},
        {TE_FILE_NOT_FOUND, 0x2}, // a bare Win32 number, no HRESULT
        {TE_DOES_NOT_HAVE_PRIVILEGE, 0x80070005}, {TE_INDEX_OUT_OF_RANGE, 0x8002000B},
        {TE_RSTRING_NOT_FOUND, 0x80070057}, {TE_UNEXPECTED_CHANGE_COUNT, 0x80004005},
        // clang-format on
    };
    for (auto const& [code, comCode] : documented)
        EXPECT_EQ(GetWinErrorCode(code), comCode) << TEErrorToStringSymbol(code);
}

TEST(ErrorTable, CodesOutsideTheTableHaveNoSymbolAndReportEFail) {
    for (TEError code : {TEError(0), TEError(-1), TEError(-17015), TEError(-17350)}) {
        EXPECT_STREQ(TEErrorToStringSymbol(code), "");
        EXPECT_EQ(GetWinErrorCode(code), 0x80004005u);
    }
    for (char const* symbol : {"te_file_not_found", static_cast<char const*>(nullptr)}) {
        bool found = true;
        EXPECT_EQ(TEErrorFromStringSymbol(symbol, &found), 0);
        EXPECT_FALSE(found);
    }
    EXPECT_EQ(TEErrorFromStringSymbol("TE_DISK_FULL", nullptr), TE_DISK_FULL);
}

TEST(ErrorMessages, UnknownCodeGivesTheUserDefinedCodeTextAndNotFound) {
    RString::ResetStrings();
    bool found = true;
    RString const unknown = TEErrorToRString(TEError(-1), nullptr, &found);
    EXPECT_FALSE(found);
    EXPECT_STREQ(unknown, RString("TE_ERRORS", "USER_DEFINED_ERR_CODE"));

    // Without a message table the default text shows: the caller's, else the built-in one.
    RString::RemoveGlobalStringTable();
    EXPECT_STREQ(TEErrorToRString(TEError(-1)), "Internal Error, error code string not in table");
    EXPECT_STREQ(TEErrorToRString(TE_DISK_FULL, "Disk full (default)"), "Disk full (default)");
    RString::ResetStrings();
}

/// Each TEError with the codes that map to it.
template <typename Code> using CodeGroups = std::vector<std::pair<TEError, std::vector<Code>>>;

template <typename Code> std::map<Code, TEError> Expand(CodeGroups<Code> const& groups) {
    std::map<Code, TEError> expanded;
    for (auto const& [error, codes] : groups)
        for (Code code : codes)
            expanded[code] = error;
    return expanded;
}

TEST(SystemCodes, MapWin32CodesAndHResultsOrFallBack) {
    auto const expected = Expand<unsigned>({
        // clang-format off
        {TE_FILE_NOT_FOUND, {2}}, {TE_PATH_NOT_FOUND, {3}}, {TE_ACCESS_DENIED, {5, 65, 0x80070005}},
        {TE_OUT_OF_MEMORY, {8, 14, 0x8007000E}}, {TE_INVALID_DRIVE, {15}},
        {TE_WRITE_PROTECTED, {19}}, {TE_DRIVE_NOT_READY, {21}}, {TE_SHARING_VIOLATION, {32}},
        {TE_DISK_FULL, {39, 112}}, {TE_BAD_NET_PATH, {53, 58, 240}},
        {TE_FILE_ALREADY_EXISTS, {80, 183}}, {TE_UNABLE_TO_OPEN_FILE, {110}},
        {TE_INVALID_PATHNAME, {123, 161}}, {TE_NO_FILE_ASSOC, {1155}}, {TE_DDE_FAIL, {1156}},
        {TE_DLL_NOT_LOADABLE, {1157}}, {TE_OPERATION_CANCELED, {1223}},
        {TE_INVALID_POINTER, {0x80004003}}, {TE_TYPE_MISMATCH_ERROR, {0x80020005}},
        // clang-format on
    });
    std::vector<unsigned> codes = {0x80070002, 0x80004005, 0xFFFFFFFF};
    for (unsigned code = 0; code < 1300; ++code)
        codes.push_back(code);
    for (auto const& [code, error] : expected)
        codes.push_back(code);
    for (unsigned code : codes) {
        auto const it = expected.find(code);
        TEError const want = it == expected.end() ? TE_XML_ERROR : it->second;
        EXPECT_EQ(SystemErrorCodeToTEError(code, TE_XML_ERROR), want) << code;
    }
    EXPECT_EQ(Win32FileIOErrorToTEError(999), TE_IO_ERROR);
    EXPECT_EQ(Win32FileIOErrorToTEError(32), TE_SHARING_VIOLATION);
}

TEST(SystemCodes, MapRuntimeErrnoValuesInTheRuntimesNumbering) {
    auto const expected = Expand<int>({
        // clang-format off
        {TE_NO_ERROR, {0}}, {TE_ACCESS_DENIED, {1, 13}}, {TE_FILE_NOT_FOUND, {2}},
        {TE_INVALID_OR_OUT_OF_RANGE, {3, 6, 9, 14, 19, 20, 21, 22, 29, 33, 34, 38, 42, 80}},
        {TE_IO_ERROR, {4, 5, 18, 27}}, {TE_TOO_MANY_ITEMS, {7}}, {TE_BAD_FILE_FORMAT, {8}},
        {TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE, {10, 23, 24, 31, 36, 39}},
        {TE_OUT_OF_MEMORY, {11, 12}}, {TE_FILE_ALREADY_EXISTS, {17}},
        {TE_ILLEGAL_OPERATION_ON_VALUE, {25, 41}}, {TE_DISK_FULL, {28}}, {TE_WRITE_PROTECTED, {30}},
        // clang-format on
    });
    for (int value = -5; value < 200; ++value) {
        auto const it = expected.find(value);
        TEError const want = it == expected.end() ? TE_OPERATION_FAILED : it->second;
        EXPECT_EQ(ErrnoToTEError(value), want) << value;
    }
}

#if !defined(_WIN32)
TEST(SystemCodes, HostErrnoIsTranslatedByNameBeforeMapping) {
    // Host values without a runtime counterpart, or with a number the runtime uses for another
    // error (ELOOP is 40 on Linux), must not be read as that other error.
    std::pair<int, TEError> const mapped[] = {
        {ENOSPC, TE_DISK_FULL},       {EROFS, TE_WRITE_PROTECTED},
        {ELOOP, TE_OPERATION_FAILED}, {ECONNRESET, TE_OPERATION_FAILED},
        {9999, TE_OPERATION_FAILED},  {EMFILE, TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE}};
    for (auto const& [host, error] : mapped)
        EXPECT_EQ(ErrnoToTEError(platform::NativeErrnoToCrtErrno(host)), error) << host;
}
#endif

TEST(ExpressionErrors, SyntaxAndEvaluationErrorsAreHardAndEveryOtherFailureAWarning) {
    int syntax = 0, evaluation = 0, warnings = 0;
    for (TEErrorInfo const* row = GetTEErrorTable(); row->symbol; ++row) {
        int const kinds = IsSyntaxError(row->code) + IsEvaluationError(row->code) +
                          IsEvaluationWarning(row->code);
        EXPECT_EQ(kinds, 1) << row->symbol;
        syntax += IsSyntaxError(row->code);
        evaluation += IsEvaluationError(row->code);
        warnings += IsEvaluationWarning(row->code);
    }
    EXPECT_EQ(std::tuple(syntax, evaluation, warnings), std::tuple(2, 6, 150));
    EXPECT_TRUE(IsSyntaxError(TE_EMPTY_EXPRESSION));
    EXPECT_TRUE(IsEvaluationWarning(TEError(-1)));
    EXPECT_FALSE(IsEvaluationWarning(TE_NO_ERROR));
}

// The enum, the error table and the "TE_ERRORS" message section are generated from one
// definition file; this checks that every row of it arrives in all three, in order.
struct Definition {
    TEError enumerator;
    std::int32_t value;
    char const* symbol;
    std::uint32_t comCode;
    char const* text;
};

constexpr Definition kDefinitions[] = {
#define TE_ERROR(symbol, value, comCode, text) {symbol, value, #symbol, comCode, text},
#include "tekit/errors/TEError.def"
};

TEST(ErrorDefinitions, EnumTableAndMessagesAgreeOnEveryRow) {
    TEErrorInfo const* table = GetTEErrorTable();
    std::set<std::string> symbols;
    std::size_t row = 0;
    for (Definition const& definition : kDefinitions) {
        SCOPED_TRACE(definition.symbol);
        EXPECT_EQ(definition.enumerator, definition.value);
        ASSERT_NE(table[row].symbol, nullptr) << "the table ends before the definitions";
        EXPECT_EQ(table[row].code, definition.value);
        EXPECT_STREQ(table[row].symbol, definition.symbol);
        EXPECT_EQ(table[row].comCode, definition.comCode);
        EXPECT_STREQ(TEErrorToStringSymbol(definition.enumerator), definition.symbol);
        bool found = false;
        RString message("TE_ERRORS", definition.symbol, "", &found);
        EXPECT_TRUE(found);
        EXPECT_STREQ(message.GetString().GetBufferReadPtr(), definition.text);
        if (row > 0) {
            EXPECT_LT(definition.value, kDefinitions[row - 1].value) << "rows out of order";
        }
        EXPECT_TRUE(symbols.insert(definition.symbol).second) << "symbol defined twice";
        ++row;
    }
    EXPECT_EQ(table[row].symbol, nullptr) << "the table has rows the definitions do not";
    EXPECT_EQ(row, 158u);
}

} // namespace
} // namespace tekit
