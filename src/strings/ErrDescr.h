// Descriptions of the string family's parse errors, from the "ERR_DESCR" message table.
//
//   TE_RAISE(TE_UNRECOGNIZED_VALUE, DescribeError("CSV_UNTERMINATED_QUOTE_1", text),
//            "StringVector::SetFromCSVString");
#pragma once

#include "tekit/errors/RString.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

/// The message `key` of section "ERR_DESCR" with its placeholder %1 (if any) filled.
inline DynamicString DescribeError(char const* key, char const* argument = nullptr) {
    DynamicString description(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    if (argument)
        description.Format(argument, 1);
    return description;
}

} // namespace tekit
