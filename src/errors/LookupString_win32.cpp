// Lookup strings joined as COM _bstr_t text.
#include "tekit/errors/LookupString.h"

#include <comdef.h>

namespace tekit {

_bstr_t AddLookupStrings(_bstr_t const& parent, _bstr_t const& child) {
    if (parent.length() == 0)
        return child;
    if (child.length() == 0)
        return parent;
    return parent + _bstr_t(L".") + child;
}

} // namespace tekit
