// The Windows side of the test object: aggregating the free-threaded marshaler.
#include "CountedObject.h"

#include <objbase.h>

namespace tekit::testing {

IUnknown* CreateFreeThreadedMarshaler(IUnknown* outer) {
    IUnknown* marshaler = nullptr;
    return SUCCEEDED(::CoCreateFreeThreadedMarshaler(outer, &marshaler)) ? marshaler : nullptr;
}

bool QueryMarshaler(IUnknown* marshaler, REFIID iid, void** object) {
    return iid == IID_IMarshal && SUCCEEDED(marshaler->QueryInterface(iid, object));
}

} // namespace tekit::testing
