// Strings and the items of a StringVector as std::strings, for comparing in one expectation.
#pragma once

#include "tekit/strings/StringVector.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

namespace tekit::testing {

using Texts = std::vector<std::string>;

/// The text, after checking that the cached size matches the bytes in the buffer.
inline std::string Text(String const& s) {
    EXPECT_EQ(s.GetNumBytes(), int(std::strlen(s.GetBufferReadPtr())));
    return s.GetBufferReadPtr();
}

inline Texts Items(StringVector const& v) {
    Texts out;
    for (DynamicString const& s : v)
        out.emplace_back(s.GetBufferReadPtr());
    return out;
}

} // namespace tekit::testing
