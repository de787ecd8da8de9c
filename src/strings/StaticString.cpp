// The one instantiation of the exported StaticString sizes. Off Windows the header's extern
// declarations already carry the export attribute.
#include "tekit/strings/StaticString.h"

#if defined(_WIN32)
#define TEKIT_INSTANTIATE template class TEKIT_API
#else
#define TEKIT_INSTANTIATE template class
#endif

namespace tekit {

TEKIT_INSTANTIATE StaticString<64>;
TEKIT_INSTANTIATE StaticString<256>;
TEKIT_INSTANTIATE StaticString<260>;
TEKIT_INSTANTIATE StaticString<1024>;

} // namespace tekit
