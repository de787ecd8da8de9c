#include "errors/MessageCatalogue.h"

namespace tekit::detail {

namespace {

// One table file per section, each a list of {"KEY", "text"} rows.
constexpr MessageRow kErrors[] = {
#include "catalogue/ERRORS.inc"
};
constexpr MessageRow kTEErrors[] = {
#include "catalogue/TE_ERRORS.inc"
};
constexpr MessageRow kErrDescr[] = {
#include "catalogue/ERR_DESCR.inc"
};

template <int N> constexpr MessageSection Section(char const* name, MessageRow const (&rows)[N]) {
    return {name, rows, N};
}

constexpr MessageSection kSections[] = {
    Section("ERRORS", kErrors),
    Section("TE_ERRORS", kTEErrors),
    Section("ERR_DESCR", kErrDescr),
    {nullptr, nullptr, 0},
};

} // namespace

MessageSection const* GetBuiltInMessageSections() {
    return kSections;
}

} // namespace tekit::detail
