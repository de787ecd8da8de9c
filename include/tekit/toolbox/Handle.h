// Handle: a relocatable heap block, reached through a record that stays put.
//
//   Handle h = NewHandle(16);               // 16 zero bytes
//   if (h && SetHandleSize(h, 64))          // the block may move; h does not
//       static_cast<char*>(h->block)[63] = 1;
//   DisposeHandle(h);
//
// Code keeps the handle, never the block pointer, across a resize. A size of 0 is held as a
// null block. These functions never throw; an allocation failure gives 0 or null and leaves the
// handle as it was. A null handle given to GetHandleSize or SetHandleSize is a programming
// error: the process shows an "Assert" message (a message box on Windows, standard error
// elsewhere) and aborts.
#pragma once

#include "tekit/Export.h"

#include <cstdint>

extern "C" {

/// What a handle points to: the heap block and its size in bytes.
struct HandleRecord {
    void* block;
    std::uint32_t size;
};
typedef HandleRecord* Handle;

/// A new handle with a zero-filled block of `size` bytes; null when an allocation fails.
TEKIT_API Handle TEKIT_STDCALL NewHandle(std::uint32_t size);
/// The block's size in bytes. Aborts on a null handle.
TEKIT_API std::uint32_t TEKIT_STDCALL GetHandleSize(Handle handle);
/// Resizes the block, zero-filling added bytes: 1 on success (at once when the size is
/// unchanged), 0 when the allocation fails and the handle is unchanged. Aborts on a null handle.
TEKIT_API std::int32_t TEKIT_STDCALL SetHandleSize(Handle handle, std::uint32_t newSize);
/// Frees the block and the handle; null is ignored.
TEKIT_API void TEKIT_STDCALL DisposeHandle(Handle handle);

} // extern "C"
