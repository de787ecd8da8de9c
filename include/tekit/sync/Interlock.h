// The per-thread interlock switch of the lock interface.
//
//   SetInterlockDisabled(true);     // accepted, and changes nothing
//   GetInterlockDisabled();         // false
#pragma once

#include "tekit/Export.h"

namespace tekit {

/// The calling thread's flag: false, as nothing in the library sets it.
TEKIT_API bool GetInterlockDisabled();
/// Accepted and without effect.
TEKIT_API void SetInterlockDisabled(bool disabled);

} // namespace tekit
