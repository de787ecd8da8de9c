// Locking primitives of the operating system: the critical-section object, the named
// cross-process mutex and yielding the processor.
//
//   alignas(8) unsigned char storage[kCriticalSectionSize];
//   InitializeCriticalSectionObject(storage, 0);
//   EnterCriticalSectionObject(storage);  ...  LeaveCriticalSectionObject(storage);
//   DeleteCriticalSectionObject(storage);
//
// A critical section is CRITICAL_SECTION on Windows and a recursive pthread mutex elsewhere,
// placed in storage that the caller owns. A named mutex is a Windows mutex object on Windows;
// elsewhere a robust, process-shared, recursive pthread mutex in a POSIX shared-memory object
// named after it, so that a holder that dies leaves it "abandoned" as on Windows.
#pragma once

#include "platform/SystemError.h"

#include <cstddef>
#include <cstdint>

namespace tekit::platform {

// ---- Critical sections ------------------------------------------------------------------
/// Bytes a critical-section object needs: CRITICAL_SECTION and pthread_mutex_t are both 40
/// bytes on 64-bit targets and 24 on 32-bit ones (checked where they are used).
inline constexpr std::size_t kCriticalSectionSize = sizeof(void*) == 8 ? 40 : 24;
inline constexpr std::size_t kCriticalSectionAlign = sizeof(void*);

/// `spinCount` 0: InitializeCriticalSection; otherwise InitializeCriticalSectionAndSpinCount
/// (POSIX has no spin count and ignores it).
void InitializeCriticalSectionObject(void* section, std::uint32_t spinCount);
void DeleteCriticalSectionObject(void* section);
void EnterCriticalSectionObject(void* section);
bool TryEnterCriticalSectionObject(void* section);
void LeaveCriticalSectionObject(void* section);

/// Gives the rest of the time slice to another ready thread: Sleep(0), sched_yield().
void YieldTimeSlice();

// ---- Named mutexes ----------------------------------------------------------------------
/// An open named mutex; null is none.
using NamedMutexHandle = void*;

/// The results of WaitForNamedMutex, with the values of the Windows wait results.
inline constexpr std::uint32_t kWaitAcquired = 0;        // WAIT_OBJECT_0
inline constexpr std::uint32_t kWaitAbandoned = 0x80;    // WAIT_ABANDONED
inline constexpr std::uint32_t kWaitTimeout = 258;       // WAIT_TIMEOUT
inline constexpr std::uint32_t kWaitFailed = 0xFFFFFFFF; // WAIT_FAILED
inline constexpr std::uint32_t kWaitForever = 0xFFFFFFFF;

/// Creates the mutex `name`, or opens it when it exists; not owned. A null or empty name
/// makes one that no other process can open. Passes through the fault seam (kind Open).
SystemError CreateNamedMutex(char const* name, NamedMutexHandle& handle);
/// Waits up to `timeoutMs` (kWaitForever: no limit) to own the mutex; the owner may take it
/// again (it counts). Returns one of the kWait* results; on kWaitFailed `error` says why.
std::uint32_t WaitForNamedMutex(NamedMutexHandle handle, std::uint32_t timeoutMs,
                                SystemError& error);
/// Gives up one ownership of the calling thread; a thread that does not own it changes nothing.
void ReleaseNamedMutex(NamedMutexHandle handle);
/// Closes the handle; on POSIX the last close in any process removes the name.
void CloseNamedMutex(NamedMutexHandle handle);

} // namespace tekit::platform
