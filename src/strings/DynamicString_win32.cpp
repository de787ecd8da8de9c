// DynamicString from a COM _bstr_t.
#include "tekit/strings/DynamicString.h"

#include <comdef.h>

namespace tekit {

DynamicString::DynamicString(_bstr_t const& text)
    : DynamicString(static_cast<wchar_t const*>(text)) {}

} // namespace tekit
