// OVGlobalInterfacePointer: registration, the kept pointer of an optimized holder, fetching
// from other threads, and the failures it reports.
#include "CountedObject.h"

#include "tekit/com/GlobalInterfacePointer.h"
#include "tekit/errors/RString.h"

#include "support/Raises.h"

#include <gtest/gtest.h>

#include <cstring>
#include <functional>
#include <thread>

namespace tekit {
namespace {

using testing::ApartmentScope;
using testing::CountedObject;
using testing::kTestInterfaceId;

constexpr HRESULT kObjectNotConnected = static_cast<HRESULT>(0x800401FD);
constexpr HRESULT kNoInterface = static_cast<HRESULT>(0x80004002);

/// Runs `body` on a new thread of the multithreaded apartment and waits for it.
void OnOtherThread(std::function<void()> const& body) {
    std::thread([&] {
        ApartmentScope apartment;
        body();
    }).join();
}

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

    struct Case {
        bool addRef;
        bool done;
        long countChange;
    };
    for (Case const c : {Case{false, false, 0}, Case{true, true, 1}}) {
        bool done = !c.done;
        EXPECT_EQ(holder->GetLocalInterface(c.addRef, &done), static_cast<IUnknown*>(&m_object));
        EXPECT_EQ(done, c.done);
        EXPECT_EQ(m_object.Count(), registered + c.countChange);
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

} // namespace
} // namespace tekit
