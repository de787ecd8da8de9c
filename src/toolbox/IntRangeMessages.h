// Messages of range-list parse errors, from the "ERR_DESCR" message table.
//
//   TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, RangeMessage("ERR_RANGE_INVALID_RANGE_STRING_1", text),
//            "SimpleIntRange::ParseString");
#pragma once

#include "tekit/errors/RString.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

/// The message `key` with %1 and (when given) %2 filled. %2 goes in first: the text put in %1
/// is the user's and may itself hold "%2".
inline DynamicString RangeMessage(char const* key, char const* first,
                                  char const* second = nullptr) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    if (second)
        message.Format(second, 2);
    message.Format(first, 1);
    return message;
}

} // namespace tekit
