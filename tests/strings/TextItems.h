// The items of a StringVector as std::strings, for comparing lists in one expectation.
#pragma once

#include "tekit/strings/StringVector.h"

#include <string>
#include <vector>

namespace tekit::testing {

using Texts = std::vector<std::string>;

inline Texts Items(StringVector const& v) {
    Texts out;
    for (DynamicString const& s : v)
        out.emplace_back(s.GetBufferReadPtr());
    return out;
}

} // namespace tekit::testing
