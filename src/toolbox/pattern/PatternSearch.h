// The pattern search: cuts a text into lines (at CR, LF, CR LF and LF CR) and looks for the
// first match in search order, forward or backward from a byte offset, skipping lines that
// cannot hold a match.
#pragma once

#include "toolbox/pattern/PatternProgram.h"

#include <cstdint>

namespace tekit::toolbox::pattern {

struct SearchRequest {
    char const* text;
    std::int32_t length;
    std::int32_t start;
    bool forward;
    int policy; ///< 0: first match, 1: longest match (and, backward, every position retried)
};

struct SearchResult {
    std::int32_t position = -1;
    std::int32_t length = -1;
};

/// True and `result` set when the pattern matches; see RegExpr.h for offsets and policies.
bool Search(CompiledPattern const& compiled, SearchRequest const& request, SearchResult& result);

} // namespace tekit::toolbox::pattern
