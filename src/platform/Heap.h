// Blocks of the C run-time heap, through the fault seam: a test can make the Nth allocation
// fail as if memory had run out.
//
//   void* block = HeapReallocate(old, newSize);   // null on failure; `old` is then kept
//   if (!block) ...
//   HeapFree(block);
//
// Blocks are plain malloc/realloc/free blocks, so they may be freed with free() as well.
#pragma once

#include "platform/Fault.h"

#include <cstddef>
#include <cstdlib>

namespace tekit::platform {

/// A new block of `size` bytes (at least 1 is allocated), or null.
inline void* HeapAllocate(std::size_t size) {
    if (InjectedFailure(FaultKind::Allocate, "malloc"))
        return nullptr;
    return std::malloc(size ? size : 1);
}

/// `block` (may be null) grown or shrunk to `size` bytes, or null with `block` unchanged.
inline void* HeapReallocate(void* block, std::size_t size) {
    if (InjectedFailure(FaultKind::Allocate, "realloc"))
        return nullptr;
    return std::realloc(block, size ? size : 1);
}

inline void HeapFree(void* block) {
    std::free(block);
}

} // namespace tekit::platform
