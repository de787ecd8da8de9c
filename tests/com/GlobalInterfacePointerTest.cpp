// OVGlobalInterfacePointer: registration, the kept pointer of an optimized holder, fetching
// from other threads, and the failures it reports.
#include "tekit/com/GlobalInterfacePointer.h"
#include "CountedObject.h"
#include "platform/Thread.h"
#include "support/Raises.h"
#include "tekit/com/AsynchRefReleaser.h"
#include "tekit/errors/RString.h"
#include "tekit/sync/PerformanceOptions.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cstring>
#include <deque>
#include <memory>
#include <thread>
#include <vector>

namespace tekit {
namespace {

using testing::ApartmentScope;
using testing::CountedObject;
using testing::kTestInterfaceId;
using testing::OnOtherThread;

constexpr HRESULT kObjectNotConnected = static_cast<HRESULT>(0x800401FD);
constexpr HRESULT kNoInterface = static_cast<HRESULT>(0x80004002);

class GlobalInterfacePointerTest : public ::testing::Test {
protected:
    ApartmentScope m_apartment;
    CountedObject m_object;
};

std::unique_ptr<OVGlobalInterfacePointer> Hold(IUnknown* object, bool optimized) {
    return std::make_unique<OVGlobalInterfacePointer>(
        object, kTestInterfaceId, DynamicString("ITest"), optimized, true, false);
}

TEST_F(GlobalInterfacePointerTest, KeptPointerIsHandedToTheRegisteringThreadAddingOnlyWhenAsked) {
    auto holder = Hold(&m_object, true);
    ASSERT_TRUE(holder->GetOptimized());
    long const registered = m_object.Count();
    EXPECT_GT(registered, 1); // the table's reference and the kept one

    for (bool const addRef : {false, true}) { // the done flag tells whether it added one
        bool done = !addRef;
        EXPECT_EQ(holder->GetLocalInterface(addRef, &done), static_cast<IUnknown*>(&m_object));
        EXPECT_EQ(done, addRef);
        EXPECT_EQ(m_object.Count(), registered + addRef);
        if (done)
            m_object.Release();
    }
    holder.reset();
    EXPECT_EQ(m_object.Count(), 1);
}

TEST_F(GlobalInterfacePointerTest, OtherThreadsAndPlainHoldersFetchFromATableMadeAfresh) {
    for (bool const optimized : {true, false}) {
        SCOPED_TRACE(optimized ? "optimized" : "plain");
        auto holder = Hold(&m_object, optimized);
        long const registered = m_object.Count();
        OnOtherThread([&] {
            EXPECT_FALSE(holder->InRegisteredThread());
            for (bool const addRef : {false, true}) {
                bool done = false;
                auto* fetched = static_cast<IUnknown*>(holder->GetLocalInterface(addRef, &done));
                ASSERT_NE(fetched, nullptr);
                EXPECT_TRUE(done);
                EXPECT_GT(m_object.Count(), registered);
                fetched->Release();
            }
        });
        if (!optimized) { // the registering thread has no kept pointer either
            bool done = false;
            static_cast<IUnknown*>(holder->GetLocalInterface(false, &done))->Release();
            EXPECT_TRUE(done);
        }
        EXPECT_EQ(m_object.Count(), registered);
        holder.reset();
        EXPECT_EQ(m_object.Count(), 1);
        EXPECT_FALSE(m_object.OverReleased());
        OVGlobalInterfacePointer::ReleaseGlobalRefToGIT(); // the next holder creates it again
    }
}

TEST_F(GlobalInterfacePointerTest, AccessorsReportWhatWasGivenAndAnEmptyHolderHandsOutNothing) {
    OVGlobalInterfacePointer empty(nullptr, kTestInterfaceId, DynamicString("IEmpty"), true, false,
                                   true);
    bool done = true;
    EXPECT_EQ(empty.GetLocalInterface(true, &done), nullptr);
    EXPECT_FALSE(done);
    EXPECT_TRUE(empty.IsDotNetObjectHolder());

    empty.RegisterInterface(&m_object, kTestInterfaceId, DynamicString("ITest"), false);
    EXPECT_STREQ(empty.GetIIDName().GetBufferReadPtr(), "ITest");
    EXPECT_TRUE(empty.InRegisteredThread());
    // Registering again replaces the registration instead of adding a second one.
    long const once = m_object.Count();
    empty.RegisterInterface(&m_object, kTestInterfaceId, DynamicString("ITest2"), false);
    EXPECT_EQ(m_object.Count(), once);
    empty.UnregisterInterface();
    EXPECT_EQ(m_object.Count(), 1);
    EXPECT_EQ(empty.GetLocalInterface(false, nullptr), nullptr);
}

TEST_F(GlobalInterfacePointerTest, KeptPointerMayOnlyBeDroppedByTheRegisteringThread) {
    auto holder = Hold(&m_object, true);
    OnOtherThread([&] {
        EXPECT_RAISES_IN(holder->UnregisterInterface(), TE_UNEXPECTED_SYSTEM_ERROR,
                         "OVGlobalInterfacePointer::ValidateObject");
    });
    holder.reset(); // the registering thread can
    EXPECT_EQ(m_object.Count(), 1);
}

TEST_F(GlobalInterfacePointerTest, FailedFetchExplainsLikelyCause) {
    struct Case {
        HRESULT refusal;
        char const* key;
    };
    for (Case const c : {Case{kObjectNotConnected, "ERR_MIGHT_INVOLVE_LONG_BREAKPOINT_IN_VC"},
                         Case{kNoInterface, "ERR_MIGHT_INVOLVE_MARSHALING"}}) {
        SCOPED_TRACE(c.key);
        auto holder = Hold(&m_object, false);
        m_object.RefuseQueries(c.refusal);
        OnOtherThread([&] {
            TEException const e =
                testing::Raised([&] { holder->GetLocalInterface(true, nullptr); });
            EXPECT_EQ(e.GetErrorCode(), TE_UNEXPECTED_SYSTEM_ERROR);
            EXPECT_STREQ(e.GetFunctionName(), "OVGlobalInterfacePointer::GetLocalInterface");
            RString const expected("ERR_DESCR", c.key);
            EXPECT_NE(std::strstr(e.GetDescription(), expected), nullptr) << e.GetDescription();
        });
        m_object.RefuseQueries(0);
        holder.reset();
        EXPECT_EQ(m_object.Count(), 1);
    }
}

// AsynchRefReleaser: the opt-in, release on the worker thread, flushing, clean-up with work
// still queued, and many threads handing holders over at once.
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
        first.onRelease = [this] { // waits (up to 5 s) for the gate
            entered = true;
            auto const until = std::chrono::steady_clock::now() + std::chrono::seconds(5);
            while (!gate && std::chrono::steady_clock::now() < until)
                std::this_thread::sleep_for(std::chrono::milliseconds(1));
        };
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
    worker.queued.back().onRelease = [&] { worker.gate = true; }; // the calling thread frees it
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
    int wrong = 0; // left with a reference too many (leaked) or released twice
    for (CountedObject const& object : objects)
        wrong += object.Count() != 1 || object.OverReleased();
    EXPECT_EQ(wrong, 0);
}

} // namespace
} // namespace tekit
