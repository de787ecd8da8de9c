// The built-in message catalogue: the sections the global message table starts with.
#include "errors/MessageCatalogue.h"

#include "tekit/errors/StatusDefinitions.h"

namespace tekit::detail {

namespace {

// One table file per section, each a list of {"KEY", "text"} rows; "TE_ERRORS" comes from the
// error definitions.
constexpr MessageRow kErrors[] = {
#include "catalogue/ERRORS.inc"
};
/// "TE_ERRORS": each TEError's message under its symbol, then the text of codes not listed.
constexpr MessageRow kTEErrors[] = {
#define TE_ERROR(symbol, value, comCode, text) TEKIT_STATUS_MESSAGE(#symbol, text)
#include "tekit/errors/TEError.def"
    {"USER_DEFINED_ERR_CODE", "User-defined error code."},
};
/// "ERR_DESCR": the error descriptions, then the pattern engine's messages under their keys
/// and the text of its codes not listed.
constexpr MessageRow kErrDescr[] = {
#include "catalogue/ERR_DESCR.inc"
#define REGEXPR_STATUS(symbol, value, key, text) TEKIT_STATUS_MESSAGE(key, text)
#include "tekit/errors/RegExprStatus.def"
    {"REGEXPR_UnknownError", "Unknown Error"},
};
/// "CRX_TOOLERR": the toolbox's own section holds the pattern engine's rows as well.
constexpr MessageRow kToolErrors[] = {
#define REGEXPR_STATUS(symbol, value, key, text) TEKIT_STATUS_MESSAGE(key, text)
#include "tekit/errors/RegExprStatus.def"
    {"REGEXPR_UnknownError", "Unknown Error"},
};
/// "INI_ERRORS": the INI store's status codes under their keys.
constexpr MessageRow kIniErrors[] = {
#define INI_STATUS(symbol, value, key, text) TEKIT_STATUS_MESSAGE(key, text)
#include "tekit/errors/IniStatus.def"
};

template <int N> constexpr MessageSection Section(char const* name, MessageRow const (&rows)[N]) {
    return {name, rows, N};
}

constexpr MessageSection kSections[] = {
    Section("ERRORS", kErrors),
    Section("TE_ERRORS", kTEErrors),
    Section("ERR_DESCR", kErrDescr),
    Section("CRX_TOOLERR", kToolErrors), // the toolbox's pattern engine
    Section("INI_ERRORS", kIniErrors),   // the INI store
    {nullptr, nullptr, 0},
};

} // namespace

MessageSection const* GetBuiltInMessageSections() {
    return kSections;
}

} // namespace tekit::detail
