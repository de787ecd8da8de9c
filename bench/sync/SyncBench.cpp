// The reader-writer lock and the critical sections against their peers: std::shared_mutex,
// pthread_rwlock_t and POCO's RWLock (when installed) uncontended, shared and exclusive, and
// with two threads contending at 80% reads; OVCriticalSection (an RWLock) and
// OSCriticalSection taken recursively against std::recursive_mutex. The sizes of the locks are
// printed first.
//
//   bench_sync --benchmark_filter=Uncontended --benchmark_repetitions=5
#include "RatioReporter.h"

#include "tekit/sync/CriticalSections.h"

#include <benchmark/benchmark.h>

#include <cstdio>
#include <mutex>
#include <pthread.h>
#include <shared_mutex>
#include <string>

#if defined(TEKIT_BENCH_HAVE_POCO)
#include <Poco/RWLock.h>
#endif

namespace {

using tekit::kExclusiveAccess;
using tekit::kSharedAccess;

// One adapter per implementation: the same four operations.
struct TekitRW {
    tekit::UltraFiniteCriticalSection lock;
    void LockShared() { lock.Lock(kSharedAccess, 0); }
    void UnlockShared() { lock.Unlock(kSharedAccess); }
    void LockExclusive() { lock.Lock(kExclusiveAccess, 0); }
    void UnlockExclusive() { lock.Unlock(kExclusiveAccess); }
};

struct StdRW {
    std::shared_mutex lock;
    void LockShared() { lock.lock_shared(); }
    void UnlockShared() { lock.unlock_shared(); }
    void LockExclusive() { lock.lock(); }
    void UnlockExclusive() { lock.unlock(); }
};

struct PthreadRW {
    pthread_rwlock_t lock = PTHREAD_RWLOCK_INITIALIZER;
    ~PthreadRW() { pthread_rwlock_destroy(&lock); }
    void LockShared() { pthread_rwlock_rdlock(&lock); }
    void UnlockShared() { pthread_rwlock_unlock(&lock); }
    void LockExclusive() { pthread_rwlock_wrlock(&lock); }
    void UnlockExclusive() { pthread_rwlock_unlock(&lock); }
};

#if defined(TEKIT_BENCH_HAVE_POCO)
struct PocoRW {
    Poco::RWLock lock;
    void LockShared() { lock.readLock(); }
    void UnlockShared() { lock.unlock(); }
    void LockExclusive() { lock.writeLock(); }
    void UnlockExclusive() { lock.unlock(); }
};
#endif

template <class RW> void UncontendedShared(benchmark::State& state) {
    RW rw;
    for (auto _ : state) {
        rw.LockShared();
        rw.UnlockShared();
    }
}

template <class RW> void UncontendedExclusive(benchmark::State& state) {
    RW rw;
    for (auto _ : state) {
        rw.LockExclusive();
        rw.UnlockExclusive();
    }
}

/// Two threads on one lock, four reads in five operations, a little work inside.
template <class RW> void Contended(benchmark::State& state) {
    static RW* rw = nullptr;
    static long long shared = 0;
    if (state.thread_index() == 0)
        rw = new RW;
    unsigned i = static_cast<unsigned>(state.thread_index());
    long long seen = 0;
    for (auto _ : state) {
        if (++i % 5 == 0) {
            rw->LockExclusive();
            ++shared;
            rw->UnlockExclusive();
        } else {
            rw->LockShared();
            seen += shared;
            rw->UnlockShared();
        }
    }
    benchmark::DoNotOptimize(seen);
    if (state.thread_index() == 0) {
        delete rw;
        rw = nullptr;
    }
}

/// Three nested holds, as a recursive caller takes its lock.
template <class Lock> void Recursive(benchmark::State& state) {
    Lock lock;
    for (auto _ : state) {
        lock.Lock(kExclusiveAccess, 0);
        lock.Lock(kExclusiveAccess, 0);
        lock.Lock(kExclusiveAccess, 0);
        lock.Unlock(kExclusiveAccess);
        lock.Unlock(kExclusiveAccess);
        lock.Unlock(kExclusiveAccess);
    }
}

struct StdRecursive {
    std::recursive_mutex mutex;
    void Lock(tekit::LockAccessType, long) { mutex.lock(); }
    void Unlock(tekit::LockAccessType) { mutex.unlock(); }
};

template <class RW> void RegisterReaderWriter(char const* implementation) {
    std::string const suffix = std::string("/") + implementation;
    benchmark::RegisterBenchmark(("Uncontended/shared" + suffix).c_str(), UncontendedShared<RW>);
    benchmark::RegisterBenchmark(("Uncontended/exclusive" + suffix).c_str(),
                                 UncontendedExclusive<RW>);
    benchmark::RegisterBenchmark(("Contended/2threads80read" + suffix).c_str(), Contended<RW>)
        ->Threads(2)
        ->UseRealTime();
}

/// Pairs the two-thread runs with their peers by name, and ranks them by wall time: what a
/// waiting thread burns is not throughput.
class SyncReporter : public tekit::bench::RatioReporter {
public:
    using RatioReporter::RatioReporter;
    void ReportRuns(std::vector<Run> const& runs) override {
        std::vector<Run> adjusted = runs;
        for (Run& run : adjusted) {
            if (run.threads <= 1)
                continue;
            run.run_name.threads.clear();
            run.run_name.time_type.clear();
            run.cpu_accumulated_time = run.real_accumulated_time;
        }
        RatioReporter::ReportRuns(adjusted);
    }
};

void PrintSizes() {
    std::printf("Size in bytes: RWLock (UltraFiniteCriticalSection) %zu, of which state %zu; "
                "std::shared_mutex %zu; pthread_rwlock_t %zu",
                sizeof(tekit::UltraFiniteCriticalSection), sizeof(tekit::detail::RWLockWords),
                sizeof(std::shared_mutex), sizeof(pthread_rwlock_t));
#if defined(TEKIT_BENCH_HAVE_POCO)
    std::printf("; Poco::RWLock %zu", sizeof(Poco::RWLock));
#endif
    std::printf("; OSCriticalSection %zu; std::recursive_mutex %zu\n\n",
                sizeof(tekit::OSCriticalSection), sizeof(std::recursive_mutex));
}

} // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    if (benchmark::ReportUnrecognizedArguments(argc, argv))
        return 1;
    PrintSizes();
    RegisterReaderWriter<TekitRW>("tekit");
    RegisterReaderWriter<StdRW>("std");
    RegisterReaderWriter<PthreadRW>("pthread");
#if defined(TEKIT_BENCH_HAVE_POCO)
    RegisterReaderWriter<PocoRW>("poco");
#endif
    benchmark::RegisterBenchmark("Recursive/x3/OVCriticalSection",
                                 Recursive<tekit::OVCriticalSection>);
    benchmark::RegisterBenchmark("Recursive/x3/OSCriticalSection",
                                 Recursive<tekit::OSCriticalSection>);
    benchmark::RegisterBenchmark("Recursive/x3/std", Recursive<StdRecursive>);
#if defined(TEKIT_BENCH_HAVE_POCO)
    SyncReporter reporter({"std", "pthread", "poco"});
#else
    SyncReporter reporter({"std", "pthread"});
#endif
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
