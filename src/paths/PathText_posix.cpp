// PathBase: the long-path form of a path as wide text, where there is no COM _bstr_t.
#include "platform/TextConversion.h"
#include "tekit/errors/Raise.h"
#include "tekit/paths/PathBase.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/strings/MultiByte.h"

#include <new>

namespace tekit {

std::wstring PathBase::ConvertForLongPathCalls(String const& path) {
    DynamicString narrow;
    ConvertForLongPathCalls(path, narrow);
    try {
        return platform::NarrowToWide(narrow.GetBufferReadPtr(), narrow.GetNumBytes(),
                                      String::IsMultiByteSupportEnabled() ? GetMultiByteCodePage()
                                                                          : 0);
    } catch (std::bad_alloc const&) {
        TE_RAISE(TE_OUT_OF_MEMORY, nullptr, "PathBase::ConvertForLongPathCalls");
    }
}

} // namespace tekit
