// AsynchRefReleaser: the opt-in, release on the worker thread, flushing, clean-up with work
// still queued, and many threads handing holders over at once.
#include "CountedObject.h"

#include "tekit/com/AsynchRefReleaser.h"
#include "tekit/com/GlobalInterfacePointer.h"
#include "tekit/sync/PerformanceOptions.h"

#include "platform/Thread.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <deque>
#include <memory>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using testing::ApartmentScope;
using testing::CountedObject;
using testing::kTestInterfaceId;
using Holder = std::shared_ptr<OVGlobalInterfacePointer>;

Holder Hold(CountedObject& object) {
    return std::make_shared<OVGlobalInterfacePointer>(&object, kTestInterfaceId,
                                                      DynamicString("ITest"), false, false, false);
}

/// Each test starts without a releaser and with asynchronous release as it asks. The options
/// are set only while the releaser's thread is not running, as the library requires.
class AsynchRefReleaserTest : public ::testing::Test {
protected:
    void SetUp() override { AsynchRefReleaser::Cleanup(); }
    void TearDown() override {
        AsynchRefReleaser::Cleanup();
        gPerformanceOptions = m_savedOptions;
    }
    static void EnableAsynchronousRelease(bool on) {
        gPerformanceOptions = on ? gPerformanceOptions | kPerformanceOptionAsynchronousRelease
                                 : gPerformanceOptions & ~kPerformanceOptionAsynchronousRelease;
    }

    ApartmentScope m_apartment;
    std::int32_t const m_savedOptions = gPerformanceOptions;
    std::uint32_t const m_self = platform::CurrentThreadId();
};

TEST_F(AsynchRefReleaserTest, ReleaseHappensOnTheWorkerOnlyWhenOneRunsAndIsOptedIn) {
    struct Case {
        bool optIn, running;
        DWORD flushed; // without a releaser a flush returns at once
    };
    for (Case const c : {Case{true, false, 0}, Case{false, true, WAIT_OBJECT_0},
                         Case{true, true, WAIT_OBJECT_0}}) {
        SCOPED_TRACE(::testing::Message() << "opted in " << c.optIn << ", running " << c.running);
        AsynchRefReleaser::Cleanup(); // the options change only while no thread reads them
        EnableAsynchronousRelease(c.optIn);
        for (int i = 0; i < 2 * c.running; ++i)
            AsynchRefReleaser::Initialize(); // a second call keeps the running releaser
        AsynchRefReleaser::FlushAllReferencesNowInCallingThread(); // nothing queued, no failure
        CountedObject object;
        Holder holder = Hold(object);
        AsynchRefReleaser::Release(holder);
        EXPECT_EQ(holder, nullptr);
        EXPECT_EQ(AsynchRefReleaser::FlushAllReferencesNow(INFINITE), c.flushed);
        EXPECT_EQ(object.Count(), 1);
        EXPECT_EQ(object.LastReleasingThread() == m_self, !(c.optIn && c.running));
    }
}

/// Opts in, starts the releaser and holds its worker inside the first object's release while
/// more holders queue behind it.
struct StuckWorker {
    std::atomic<bool> gate{false}, entered{false};
    CountedObject first;
    std::deque<CountedObject> queued{8};

    void Start() {
        gPerformanceOptions |= kPerformanceOptionAsynchronousRelease;
        AsynchRefReleaser::Initialize();
        Holder holder = Hold(first);
        first.BlockReleasesOn(&gate, &entered);
        AsynchRefReleaser::Release(holder);
        while (!entered)
            std::this_thread::yield();
        for (CountedObject& object : queued) {
            Holder more = Hold(object);
            AsynchRefReleaser::Release(more);
        }
    }
    std::thread OpenGateLater() {
        return std::thread([this] {
            std::this_thread::sleep_for(std::chrono::milliseconds(50));
            gate = true;
        });
    }
};

TEST_F(AsynchRefReleaserTest, FlushWaitsForTheWorkerAndTimesOutWhileItIsStuck) {
    StuckWorker worker;
    worker.Start();
    EXPECT_EQ(AsynchRefReleaser::FlushAllReferencesNow(30), WAIT_TIMEOUT);
    std::thread opener = worker.OpenGateLater();
    EXPECT_EQ(AsynchRefReleaser::FlushAllReferencesNow(INFINITE), WAIT_OBJECT_0);
    opener.join();
    for (CountedObject const& object : worker.queued)
        EXPECT_EQ(object.Count(), 1);
}

TEST_F(AsynchRefReleaserTest, CleanupReleasesWhatIsStillQueued) {
    StuckWorker worker;
    worker.Start();
    std::thread opener = worker.OpenGateLater();
    AsynchRefReleaser::Cleanup();
    opener.join();
    EXPECT_EQ(worker.first.Count(), 1);
    for (CountedObject const& object : worker.queued) {
        EXPECT_EQ(object.Count(), 1);
        EXPECT_NE(object.LastReleasingThread(), m_self);
    }
    EXPECT_EQ(AsynchRefReleaser::FlushAllReferencesNow(INFINITE), 0u); // gone
}

TEST_F(AsynchRefReleaserTest, FlushInCallingThreadReleasesTheQueueThereAndAwaitsTheWorker) {
    StuckWorker worker;
    worker.Start();
    worker.queued.back().OpenOnRelease(&worker.gate); // the calling thread frees the worker
    AsynchRefReleaser::FlushAllReferencesNowInCallingThread();
    EXPECT_EQ(worker.first.Count(), 1); // the worker's own release has finished as well
    for (CountedObject const& object : worker.queued) {
        EXPECT_EQ(object.Count(), 1);
        EXPECT_EQ(object.LastReleasingThread(), m_self);
    }
}

TEST_F(AsynchRefReleaserTest,
       ManyThreadsHandOverThousandsOfHoldersAndNothingLeaksOrIsReleasedTwice) {
    constexpr int kThreads = 4;
    constexpr int kPerThread = 2500;
    EnableAsynchronousRelease(true);
    AsynchRefReleaser::Initialize();
    std::deque<CountedObject> objects(kThreads * kPerThread);
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t)
        threads.emplace_back([&objects, t] {
            ApartmentScope apartment;
            for (int i = t * kPerThread; i < (t + 1) * kPerThread; ++i) {
                Holder holder = Hold(objects[static_cast<std::size_t>(i)]);
                AsynchRefReleaser::Release(holder);
            }
        });
    for (std::thread& thread : threads)
        thread.join();
    ASSERT_EQ(AsynchRefReleaser::FlushAllReferencesNow(INFINITE), WAIT_OBJECT_0);
    int leaked = 0, overReleased = 0;
    for (CountedObject& object : objects) {
        leaked += object.Count() != 1;
        overReleased += object.OverReleased();
        object.Release(); // the creator's reference: now every count is 0
        leaked += object.Count() != 0;
    }
    EXPECT_EQ(leaked, 0);
    EXPECT_EQ(overReleased, 0);
}

} // namespace
} // namespace tekit
