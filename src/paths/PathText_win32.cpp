// PathBase: the long-path form of a path as a COM _bstr_t, for wide Win32 file calls.
#include "tekit/errors/Raise.h"
#include "tekit/paths/PathBase.h"
#include "tekit/strings/DynamicString.h"

#include <comdef.h>

namespace tekit {

_bstr_t PathBase::ConvertForLongPathCalls(String const& path) {
    DynamicString narrow;
    ConvertForLongPathCalls(path, narrow);
    BSTR const text = narrow.AllocSysString();
    if (!text)
        TE_RAISE(TE_OUT_OF_MEMORY, nullptr, "PathBase::ConvertForLongPathCalls");
    return _bstr_t(text, false);
}

} // namespace tekit
