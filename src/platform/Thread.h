// The calling thread's identity.
#pragma once

#include <cstdint>

namespace tekit::platform {

/// A small number that identifies the calling thread while it lives.
std::uint32_t CurrentThreadId();

} // namespace tekit::platform
