// What the library keeps about the system critical-section objects it manages.
#pragma once

#include <cstdint>

namespace tekit::detail {

/// How many critical-section objects have been deleted since the library was loaded.
std::uint32_t DeletedCriticalSectionObjects();

} // namespace tekit::detail
