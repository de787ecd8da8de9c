// Waits that keep serving a thread's windows.
//
//   DWORD const result = TEWaitInMessageLoop(done, 5000, 100);  // dispatches every 100 ms
//   if (result == WAIT_TIMEOUT) ...
//
// Each wait returns the system's wait result (WAIT_OBJECT_0, WAIT_TIMEOUT, WAIT_FAILED, ...)
// unchanged; INFINITE means no limit. They differ in which messages they serve:
//
//   TEWaitForSingleObject_LWUISafe   the frame windows of a Loomwire UI thread, nothing else
//   TEWaitInLimitedMessageLoop       clipboard messages, COM's apartment window, and frames
//   TEWaitInMessageLoop              every message of the thread
//
// On Linux no thread has windows or messages, so each is a timed wait on the handle (one of
// the library's events or thread handles).
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"

namespace tekit {

/// Waits for `handle`; a UI thread pumps its frame windows every 10 ms meanwhile.
TEKIT_API DWORD TEWaitForSingleObject_LWUISafe(HANDLE handle, unsigned long timeoutMs);
/// Waits for `handle` in 10 ms steps, serving only clipboard traffic, COM's apartment window
/// and, on a UI thread, the frame windows.
TEKIT_API DWORD TEWaitInLimitedMessageLoop(HANDLE handle, unsigned long timeoutMs);
/// Waits for `handle`, dispatching up to 100 messages of any kind whenever input arrives or
/// `pollMs` passes.
TEKIT_API DWORD TEWaitInMessageLoop(HANDLE handle, unsigned long timeoutMs, unsigned long pollMs);
/// Sleeps for more than `durationMs`, dispatching up to 100 messages every `sleepMs`.
TEKIT_API void TESleepInMessageLoop(unsigned long durationMs, unsigned long sleepMs);
/// Pumps the calling thread's frame windows if it is a Loomwire UI thread.
TEKIT_API void TEProcessMessagesForLoomwireIfNeeded();

} // namespace tekit
