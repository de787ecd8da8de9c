// A message joined with COM _bstr_t text.
#include "tekit/errors/RString.h"
#include "tekit/strings/DynamicString.h"

#include <comdef.h>

namespace tekit {

DynamicString operator+(RString const& a, _bstr_t const& b) {
    DynamicString result(a.GetString());
    result += b;
    return result;
}

} // namespace tekit
