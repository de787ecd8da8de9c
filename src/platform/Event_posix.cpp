// The POSIX implementation of platform/Event.h.
#include "platform/Event.h"

#include <atomic>
#include <cerrno>
#include <ctime>
#include <new>
#include <pthread.h>

namespace tekit::platform {

namespace {

/// An event, or a thread's end: a flag under a mutex, with a condition to wait on it.
struct Waitable {
    pthread_mutex_t mutex;
    pthread_cond_t changed;
    bool manualReset = true;
    bool signalled = false;
    std::atomic<int> references{1};
    // Thread handles only.
    bool isThread = false;
    bool reclaimed = false;
    pthread_t thread{};
    ThreadFunction function = nullptr;
    void* argument = nullptr;
};

Waitable* NewWaitable(bool manualReset, bool signalled) {
    auto* w = new (std::nothrow) Waitable;
    if (w == nullptr)
        return nullptr;
    pthread_condattr_t attributes;
    ::pthread_condattr_init(&attributes);
    ::pthread_condattr_setclock(&attributes, CLOCK_MONOTONIC);
    ::pthread_mutex_init(&w->mutex, nullptr);
    ::pthread_cond_init(&w->changed, &attributes);
    ::pthread_condattr_destroy(&attributes);
    w->manualReset = manualReset;
    w->signalled = signalled;
    return w;
}

void DropReference(Waitable* w) {
    if (w->references.fetch_sub(1, std::memory_order_acq_rel) != 1)
        return;
    ::pthread_cond_destroy(&w->changed);
    ::pthread_mutex_destroy(&w->mutex);
    delete w;
}

timespec DeadlineAfter(std::uint32_t timeoutMs) {
    timespec t{};
    ::clock_gettime(CLOCK_MONOTONIC, &t);
    t.tv_sec += static_cast<time_t>(timeoutMs / 1000u);
    t.tv_nsec += static_cast<long>(timeoutMs % 1000u) * 1000000L;
    if (t.tv_nsec >= 1000000000L) {
        ++t.tv_sec;
        t.tv_nsec -= 1000000000L;
    }
    return t;
}

void* ThreadMain(void* raw) {
    auto* w = static_cast<Waitable*>(raw);
    w->function(w->argument);
    SetEventObject(w); // a thread handle is signalled when the thread has finished its work
    DropReference(w);
    return nullptr;
}

} // namespace

SystemError CreateEventObject(bool manualReset, bool initiallySignalled, WaitableHandle& handle) {
    handle = NewWaitable(manualReset, initiallySignalled);
    return handle ? SystemError{} : SystemError{"pthread_cond_init", ENOMEM};
}

void SetEventObject(WaitableHandle handle) {
    auto* w = static_cast<Waitable*>(handle);
    ::pthread_mutex_lock(&w->mutex);
    w->signalled = true;
    // An auto-reset event lets exactly one waiter through.
    if (w->manualReset)
        ::pthread_cond_broadcast(&w->changed);
    else
        ::pthread_cond_signal(&w->changed);
    ::pthread_mutex_unlock(&w->mutex);
}

void ResetEventObject(WaitableHandle handle) {
    auto* w = static_cast<Waitable*>(handle);
    ::pthread_mutex_lock(&w->mutex);
    w->signalled = false;
    ::pthread_mutex_unlock(&w->mutex);
}

std::uint32_t WaitForObject(WaitableHandle handle, std::uint32_t timeoutMs) {
    auto* w = static_cast<Waitable*>(handle);
    if (w == nullptr)
        return kWaitFailedResult;
    timespec const deadline = DeadlineAfter(timeoutMs == kWaitInfinite ? 0 : timeoutMs);
    ::pthread_mutex_lock(&w->mutex);
    int status = 0;
    while (!w->signalled && status != ETIMEDOUT) {
        if (timeoutMs == kWaitInfinite)
            ::pthread_cond_wait(&w->changed, &w->mutex);
        else
            status = ::pthread_cond_timedwait(&w->changed, &w->mutex, &deadline);
    }
    bool const acquired = w->signalled;
    if (acquired && !w->manualReset)
        w->signalled = false;
    ::pthread_mutex_unlock(&w->mutex);
    return acquired ? kWaitObject0 : kWaitTimedOut;
}

SystemError DuplicateWaitable(WaitableHandle handle, WaitableHandle& copy) {
    static_cast<Waitable*>(handle)->references.fetch_add(1, std::memory_order_relaxed);
    copy = handle;
    return {};
}

void CloseWaitable(WaitableHandle handle) {
    auto* w = static_cast<Waitable*>(handle);
    if (w == nullptr)
        return;
    if (w->isThread) {
        ::pthread_mutex_lock(&w->mutex);
        bool const finished = w->signalled;
        bool const reclaim = !w->reclaimed;
        w->reclaimed = true;
        ::pthread_mutex_unlock(&w->mutex);
        if (reclaim && finished)
            ::pthread_join(w->thread, nullptr);
        else if (reclaim)
            ::pthread_detach(w->thread);
    }
    DropReference(w);
}

SystemError StartThread(ThreadFunction function, void* argument, WaitableHandle& handle) {
    handle = nullptr;
    Waitable* w = NewWaitable(true, false);
    if (w == nullptr)
        return {"pthread_create", ENOMEM};
    w->isThread = true;
    w->function = function;
    w->argument = argument;
    w->references.store(2, std::memory_order_relaxed); // the caller's handle and the thread's
    if (int const error = ::pthread_create(&w->thread, nullptr, ThreadMain, w)) {
        w->references.store(1, std::memory_order_relaxed);
        w->isThread = false;
        DropReference(w);
        return {"pthread_create", error};
    }
    handle = w;
    return {};
}

void NameCurrentThread(char const* name) {
    char shortName[16] = {};
    for (int i = 0; i < 15 && name[i] != '\0'; ++i)
        shortName[i] = name[i];
    ::pthread_setname_np(::pthread_self(), shortName);
}

} // namespace tekit::platform
