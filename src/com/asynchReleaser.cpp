// AsynchRefReleaser: the worker thread that performs the final release of interface holders.
// Raise sites here report the file as "asynchReleaser".
#include "tekit/com/AsynchRefReleaser.h"

#include "tekit/com/GlobalInterfacePointer.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEError.h"
#include "tekit/sync/LockPools.h"
#include "tekit/sync/MessageLoopWaits.h"
#include "tekit/sync/PerformanceOptions.h"

#include "platform/Event.h"
#include "platform/InterfaceTable.h"

#include <atomic>
#include <utility>

namespace tekit {

namespace {

/// The releaser's lock: guards the singleton pointer and all of its state.
NamedCriticalSection& ReleaserLock() {
    return gNamedLocks[kReleaserNamedLock];
}

void LockReleaser() {
    ReleaserLock().Lock(kExclusiveAccess, 0);
}

void UnlockReleaser() {
    ReleaserLock().Unlock(kExclusiveAccess);
}

/// Holds the releaser's lock for a scope.
class ReleaserHold {
public:
    ReleaserHold() { LockReleaser(); }
    ~ReleaserHold() { UnlockReleaser(); }
    ReleaserHold(ReleaserHold const&) = delete;
    ReleaserHold& operator=(ReleaserHold const&) = delete;
};

AsynchRefReleaser* gReleaser = nullptr;

/// Releases running outside the lock, on the worker or in a caller's thread: a flush is not
/// done until every one of them has finished.
std::atomic<int> gReleasesInProgress{0};

constexpr unsigned long kCleanupWaitMs = 10000;
constexpr unsigned long kWorkerPollMs = 100;

void ReleaseNow(std::shared_ptr<OVGlobalInterfacePointer>& holder) {
    gReleasesInProgress.fetch_add(1, std::memory_order_acq_rel);
    holder.reset();
    gReleasesInProgress.fetch_sub(1, std::memory_order_acq_rel);
}

[[noreturn]] void RaiseConstructionFailure(platform::SystemError const& error) {
    TE_RAISE_API(TE_UNEXPECTED_SYSTEM_ERROR, static_cast<char const*>(nullptr),
                 "AsynchRefReleaser::AsynchRefReleaser", error.apiFunction, error.code);
}

} // namespace

AsynchRefReleaser::AsynchRefReleaser() {
    platform::WaitableHandle work = nullptr, flushDone = nullptr, thread = nullptr;
    platform::SystemError error = platform::CreateEventObject(true, false, work);
    if (!error)
        error = platform::CreateEventObject(true, true, flushDone);
    m_workEvent = work;
    m_flushDoneEvent = flushDone;
    if (!error)
        error = platform::StartThread(WorkerMain, this, thread);
    if (error) {
        platform::CloseWaitable(m_workEvent);
        platform::CloseWaitable(m_flushDoneEvent);
        RaiseConstructionFailure(error);
    }
    m_thread = thread;
}

AsynchRefReleaser::~AsynchRefReleaser() {
    {
        ReleaserHold hold;
        m_stop = true;
        platform::SetEventObject(m_workEvent);
    }
    platform::CloseWaitable(m_thread);
    platform::CloseWaitable(m_workEvent);
    platform::CloseWaitable(m_flushDoneEvent);
    std::vector<std::shared_ptr<OVGlobalInterfacePointer>>().swap(m_queue);
}

void AsynchRefReleaser::Initialize() {
    ReleaserHold hold;
    if (gReleaser == nullptr)
        gReleaser = new AsynchRefReleaser;
}

void AsynchRefReleaser::Cleanup() {
    AsynchRefReleaser* releaser = nullptr;
    {
        ReleaserHold hold;
        releaser = std::exchange(gReleaser, nullptr);
        if (releaser == nullptr)
            return;
        releaser->m_stop = true;
        platform::SetEventObject(releaser->m_workEvent);
    }
    // A worker that is still busy after the wait keeps using the object: it is left alive
    // rather than freed under it.
    if (TEWaitInLimitedMessageLoop(releaser->m_thread, kCleanupWaitMs) == WAIT_OBJECT_0)
        delete releaser;
}

void AsynchRefReleaser::Release(std::shared_ptr<OVGlobalInterfacePointer>& holder) {
    if (!holder)
        return;
    if ((gPerformanceOptions & kPerformanceOptionAsynchronousRelease) != 0) {
        ReleaserHold hold;
        if (gReleaser != nullptr) {
            gReleaser->m_queue.push_back(std::move(holder));
            platform::ResetEventObject(gReleaser->m_flushDoneEvent);
            platform::SetEventObject(gReleaser->m_workEvent);
            return;
        }
    }
    ReleaseNow(holder);
}

DWORD AsynchRefReleaser::FlushAllReferencesNow(unsigned long timeoutMs) {
    platform::WaitableHandle flushDone = nullptr;
    {
        ReleaserHold hold;
        if (gReleaser == nullptr)
            return 0;
        if (platform::DuplicateWaitable(gReleaser->m_flushDoneEvent, flushDone))
            return WAIT_FAILED;
    }
    DWORD const result = TEWaitInLimitedMessageLoop(flushDone, timeoutMs);
    platform::CloseWaitable(flushDone);
    return result;
}

void AsynchRefReleaser::FlushAllReferencesNowInCallingThread() {
    ReleaserHold hold;
    if (gReleaser != nullptr)
        gReleaser->DoFlushAllReferencesNowInCallingThread();
}

void AsynchRefReleaser::DoFlushAllReferencesNowInCallingThread() {
    while (!m_queue.empty() || gReleasesInProgress.load(std::memory_order_acquire) != 0) {
        if (m_queue.empty()) { // another thread is releasing: let it finish
            UnlockReleaser();
            if ((gPerformanceOptions & kPerformanceOptionSpinningLocks) == 0)
                detail::YieldToOtherThreads();
            LockReleaser();
            continue;
        }
        std::vector<std::shared_ptr<OVGlobalInterfacePointer>> batch;
        batch.swap(m_queue);
        gReleasesInProgress.fetch_add(1, std::memory_order_acq_rel);
        UnlockReleaser();
        for (auto& holder : batch) { // front to back, in arrival order
            try {
                holder.reset();
            } catch (...) {
                TE_WARN("Unexpected exception when AsynchReleaser was releasing objects!",
                        "AsynchRefReleaser::DoFlushAllReferencesNowInCallingThread");
            }
        }
        gReleasesInProgress.fetch_sub(1, std::memory_order_acq_rel);
        LockReleaser();
    }
}

unsigned AsynchRefReleaser::WorkerMain(void* raw) {
    auto* const self = static_cast<AsynchRefReleaser*>(raw);
    platform::NameCurrentThread("OV: Async Ref Releaser");
    long const apartment = platform::EnterMultithreadedApartment();
    for (;;) {
        {
            ReleaserHold hold;
            if (self->m_stop)
                break;
        }
        TEWaitInMessageLoop(self->m_workEvent, INFINITE, kWorkerPollMs);
        ReleaserHold hold;
        self->DoFlushAllReferencesNowInCallingThread();
        // A releaser that is being cleaned up keeps its work event set, so the loop ends.
        if (gReleaser == self) {
            platform::SetEventObject(self->m_flushDoneEvent);
            platform::ResetEventObject(self->m_workEvent);
        }
    }
    {
        ReleaserHold hold;
        self->DoFlushAllReferencesNowInCallingThread();
    }
    if (apartment >= 0)
        platform::LeaveApartment();
    return 0;
}

} // namespace tekit
