// Releases interface holders on a thread of the library's own, so that a thread which must
// not block (a Loomwire UI thread) never runs a long COM release.
//
//   AsynchRefReleaser::Initialize();                    // once, at start-up
//   gPerformanceOptions |= kPerformanceOptionAsynchronousRelease;
//   AsynchRefReleaser::Release(holder);                 // holder is empty now
//   AsynchRefReleaser::FlushAllReferencesNow(INFINITE); // everything handed over is released
//   AsynchRefReleaser::Cleanup();                       // at shut-down; waits up to 10 s
//
// Without the option bit, or without a running releaser, Release releases at once on the
// calling thread. The worker thread ("OV: Async Ref Releaser") lives in the multithreaded
// apartment.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"

#include <memory>
#include <vector>

namespace tekit {

class OVGlobalInterfacePointer;

class TEKIT_API AsynchRefReleaser {
public:
    /// Starts the releaser unless one runs. Raises TE_UNEXPECTED_SYSTEM_ERROR when its
    /// events or thread cannot be created.
    static void Initialize();
    /// Takes over `holder` (null: nothing) and releases it, on the worker when asynchronous
    /// release is enabled.
    static void Release(std::shared_ptr<OVGlobalInterfacePointer>& holder);
    /// Waits up to `timeoutMs` until the worker has released everything handed over: the wait
    /// result, or 0 at once when no releaser runs.
    static DWORD FlushAllReferencesNow(unsigned long timeoutMs);
    /// Releases everything queued on the calling thread.
    static void FlushAllReferencesNowInCallingThread();
    /// Stops the worker (it releases what is still queued) and destroys the releaser.
    static void Cleanup();

    AsynchRefReleaser(AsynchRefReleaser const&) = delete;
    AsynchRefReleaser& operator=(AsynchRefReleaser const&) = delete;

private:
    AsynchRefReleaser();
    ~AsynchRefReleaser();

    static unsigned WorkerMain(void* self);
    /// Called and returns with the releaser's lock held; drops it around each release.
    void DoFlushAllReferencesNowInCallingThread();

    HANDLE m_workEvent = nullptr;
    HANDLE m_flushDoneEvent = nullptr;
    HANDLE m_thread = nullptr;
    bool m_stop = false;
    std::vector<std::shared_ptr<OVGlobalInterfacePointer>> m_queue;
};

} // namespace tekit
