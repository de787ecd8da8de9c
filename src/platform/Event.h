// The library's waitable objects: events (manual- or auto-reset) and the handle of a worker
// thread, which becomes signalled when the thread ends.
//
//   HANDLE done = nullptr;
//   if (SystemError const error = CreateEventObject(true, false, done)) ...
//   SetEventObject(done);
//   WaitForObject(done, 100);            // WAIT_OBJECT_0
//   CloseWaitable(done);
//
// On Windows these are the system's event and thread handles. Elsewhere a handle points to a
// small reference-counted object over a mutex and a condition variable; duplicating it adds a
// reference, so every copy must be closed.
#pragma once

#include "platform/SystemError.h"

#include <cstdint>

namespace tekit::platform {

/// An event or thread handle: HANDLE on every platform.
using WaitableHandle = void*;

/// The wait results, with the values of the Windows ones.
inline constexpr std::uint32_t kWaitObject0 = 0;               // WAIT_OBJECT_0
inline constexpr std::uint32_t kWaitTimedOut = 258;            // WAIT_TIMEOUT
inline constexpr std::uint32_t kWaitFailedResult = 0xFFFFFFFF; // WAIT_FAILED
inline constexpr std::uint32_t kWaitInfinite = 0xFFFFFFFF;     // INFINITE

/// CreateEventA(null, manualReset, initiallySignalled, no name).
SystemError CreateEventObject(bool manualReset, bool initiallySignalled, WaitableHandle& handle);
void SetEventObject(WaitableHandle handle);
void ResetEventObject(WaitableHandle handle);
/// Waits up to `timeoutMs` (kWaitInfinite: no limit): kWaitObject0, kWaitTimedOut or
/// kWaitFailedResult. An auto-reset event that ends the wait is reset by it.
std::uint32_t WaitForObject(WaitableHandle handle, std::uint32_t timeoutMs);
/// A second handle to the same object, within the process.
SystemError DuplicateWaitable(WaitableHandle handle, WaitableHandle& copy);
/// Closes one handle (null: nothing). A thread handle closed after its thread ended reclaims
/// the thread; closed before, the thread runs on detached.
void CloseWaitable(WaitableHandle handle);

/// The body of a worker thread; its result is the thread's exit code.
using ThreadFunction = unsigned (*)(void* argument);
/// Starts a thread running `function(argument)`; `handle` is signalled when it returns.
SystemError StartThread(ThreadFunction function, void* argument, WaitableHandle& handle);
/// Names the calling thread for debuggers (best effort; POSIX keeps 15 characters).
void NameCurrentThread(char const* name);

} // namespace tekit::platform
