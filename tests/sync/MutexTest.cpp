// The named mutex: within one process, between threads, and between two processes.
#include "platform/Fault.h"
#include "platform/Process.h"

#include "tekit/sync/Mutex.h"

#include "support/Raises.h"

#include <gtest/gtest.h>

#include <chrono>
#include <cstdlib>
#include <memory>
#include <random>
#include <string>
#include <thread>

namespace tekit {
namespace {

using namespace std::chrono_literals;

/// The child's role is chosen by this variable: "<mutex name>|<go mutex name>".
constexpr char kChildVariable[] = "TEKIT_SYNC_MUTEX_CHILD";
constexpr int kChildDiedHolding = 3;
constexpr unsigned long kInfinite = 0xFFFFFFFF;

/// A name no other run uses at the same time.
std::string UniqueName(char const* what) {
    std::random_device random;
    return std::string("tekit-sync-test-") + what + "-" + std::to_string(random()) +
           std::to_string(random());
}

/// Whether another holder keeps `mutex` from this thread right now.
bool HeldElsewhere(Mutex& mutex) {
    try {
        MutexLock probe(mutex, 0);
        return false;
    } catch (TEException const& e) {
        return e.GetErrorCode() == TE_OPERATION_TIMED_OUT;
    }
}

TEST(Mutex, RefusedCreationRaisesUnableToAllocate) {
    platform::ArmFault(platform::FaultKind::Open, 1, platform::native::kAccessDenied);
    EXPECT_RAISES_IN(Mutex(UniqueName("refused").c_str()), TE_UNABLE_TO_ALLOCATE_SYSTEM_RESOURCE,
                     "Mutex::Mutex");
    platform::DisarmAllFaults();
}

TEST(Mutex, OwnerTakesItAgainAndOthersTimeOutUntilItIsFree) {
    std::string const name = UniqueName("threads");
    Mutex mutex(name.c_str());
    {
        MutexLock outer(mutex, 0);
        MutexLock inner(mutex, 0); // the owner's second hold counts
        std::thread([&] {
            Mutex sameName(name.c_str()); // a second handle on the same mutex
            EXPECT_RAISES_IN(MutexLock(sameName, 0), TE_OPERATION_TIMED_OUT,
                             "MutexLock::MutexLock");
            auto const start = std::chrono::steady_clock::now();
            EXPECT_RAISES(MutexLock(mutex, 100), TE_OPERATION_TIMED_OUT);
            EXPECT_GE(std::chrono::steady_clock::now() - start, 90ms);
        }).join();
    }
    std::thread([&] { EXPECT_FALSE(HeldElsewhere(mutex)); }).join();
}

TEST(Mutex, UnnamedMutexIsPrivateToItsObject) {
    Mutex first(static_cast<char const*>(nullptr)), second(static_cast<char const*>(nullptr));
    MutexLock hold(first, 0);
    std::thread([&] {
        EXPECT_TRUE(HeldElsewhere(first));
        EXPECT_FALSE(HeldElsewhere(second));
    }).join();
}

// The child half of the test below, run in a process of its own: takes the mutex, waits for
// the parent's go, and ends without releasing anything.
TEST(MutexChildProcess, HoldsUntilToldThenDies) {
    char const* const names = std::getenv(kChildVariable);
    ASSERT_NE(names, nullptr) << "runs only as the child of HeldByAnotherProcessThenAbandoned";
    std::string const text(names);
    std::string const name = text.substr(0, text.find('|'));
    std::string const goName = text.substr(text.find('|') + 1);
    auto* const mutex = new Mutex(name.c_str());
    new MutexLock(*mutex, kInfinite);
    auto* const go = new Mutex(goName.c_str());
    try {
        new MutexLock(*go, 60000);
    } catch (TEException const&) {
        std::_Exit(1);
    }
    std::_Exit(kChildDiedHolding);
}

TEST(Mutex, HeldByAnotherProcessThenAbandoned) {
    std::string const name = UniqueName("process"), goName = UniqueName("go");
    Mutex mutex(name.c_str()), go(goName.c_str());
    auto holdGo = std::make_unique<MutexLock>(go, 0);
    platform::ProcessHandle child = nullptr;
    std::string const program = platform::CurrentProgramPath();
    ASSERT_FALSE(platform::StartProcess(
        program.c_str(), {"--gtest_filter=MutexChildProcess.*", "--gtest_brief=1"},
        {std::string(kChildVariable) + "=" + name + "|" + goName}, child));
    std::unique_ptr<void, void (*)(void*)> const closeChild(child, &platform::CloseProcess);

    auto const deadline = std::chrono::steady_clock::now() + 30s;
    while (!HeldElsewhere(mutex) && std::chrono::steady_clock::now() < deadline)
        std::this_thread::sleep_for(10ms);
    ASSERT_TRUE(HeldElsewhere(mutex)) << "the child never took the mutex";
    EXPECT_RAISES_IN(MutexLock(mutex, 50), TE_OPERATION_TIMED_OUT, "MutexLock::MutexLock");

    holdGo.reset(); // the child takes "go" and dies holding both
    int exitCode = -1;
    ASSERT_TRUE(platform::WaitForProcess(child, 30000, exitCode));
    EXPECT_EQ(exitCode, kChildDiedHolding);
    EXPECT_NO_THROW(MutexLock(mutex, 30000)) << "abandoned counts as acquired";
}

} // namespace
} // namespace tekit
