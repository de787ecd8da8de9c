#include "tekit/errors/ComErrorInfo.h"

#include <gtest/gtest.h>

#include <functional>
#include <thread>

using namespace tekit;

namespace {

GUID const kInterface = {0x12345678, 0x1234, 0x5678, {1, 2, 3, 4, 5, 6, 7, 8}};

TEException Raised(TEError code, char const* description, char const* source) {
    return TEException(description, "Engine::Run", code, false, nullptr, 0, source, "Engine", 3,
                       "Aug 12 2021", "18:30:26");
}

TEException Caught(std::function<void()> const& call) {
    try {
        call();
    } catch (TEException const& e) {
        return e;
    }
    ADD_FAILURE() << "nothing was raised";
    return TEException();
}

class ComErrors : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
};

} // namespace

TEST_F(ComErrors, AnExceptionCrossesAComBoundaryWithItsCodeDescriptionAndSource) {
    TEException const original = Raised(TE_ACCESS_DENIED, "Cannot open the station", "Engine");
    HRESULT const hr = SetErrorInfoForTEException(kInterface, &original, nullptr);
    EXPECT_EQ(std::uint32_t(hr), 0x80070005u);

    TEException const back = Caught([hr] { CheckHrIErrorInfo(hr, "Client::Start", "Client"); });
    EXPECT_EQ(back.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_STREQ(back.GetDescription(), "Cannot open the station");
    EXPECT_STREQ(back.GetSource(), "Engine");
    EXPECT_STREQ(back.GetFunctionName(), "Client::Start");
    EXPECT_STREQ(back.GetFileName(), "Client");
    EXPECT_EQ(back.GetAPIErrorCode(), std::int32_t(0x80070005u));
}

TEST_F(ComErrors, BareWin32NumbersAreWrappedAsHResults) {
    TEException const missing = Raised(TE_FILE_NOT_FOUND, "No such file", nullptr);
    HRESULT const hr = SetErrorInfoForTEException(kInterface, &missing, nullptr);
    EXPECT_EQ(std::uint32_t(hr), 0x80070002u);
    EXPECT_EQ(Caught([hr] { CheckHrIErrorInfo(hr); }).GetErrorCode(), TE_FILE_NOT_FOUND);

    TEException const program = Raised(TE_PROGRAM_ERROR, "Broken", nullptr);
    HRESULT const fail = SetErrorInfoForTEException(kInterface, &program, nullptr);
    EXPECT_EQ(std::uint32_t(fail), 0x80004005u);
    TEException const back = Caught([fail] { CheckHrIErrorInfo(fail); });
    EXPECT_EQ(back.GetErrorCode(), TE_OPERATION_FAILED); // E_FAIL names no code
    EXPECT_STREQ(back.GetDescription(), "Broken");
    EXPECT_STREQ(back.GetFunctionName(), "CheckHrIErrorInfo");

    EXPECT_EQ(std::uint32_t(SetErrorInfoForTEException(kInterface, nullptr, nullptr)), 0x80004005u);
}

TEST_F(ComErrors, ErrorInformationIsConsumedAndBelongsToItsThread) {
    TEException const original = Raised(TE_DISK_FULL, "Station disk full", "Engine");
    HRESULT const hr = SetErrorInfoForTEException(kInterface, &original, nullptr);

    TEException fromOtherThread;
    std::thread([&] { fromOtherThread = Caught([hr] { CheckHrIErrorInfo(hr); }); }).join();
    EXPECT_STREQ(fromOtherThread.GetDescription(), "The disk is full.");

    EXPECT_STREQ(Caught([hr] { CheckHrIErrorInfo(hr); }).GetDescription(), "Station disk full");
    // Taken once: a second failure without new information shows the code's own message.
    EXPECT_STREQ(
        Caught([] { CheckHrIErrorInfo(long(std::int32_t(0x8007000Eu))); }).GetDescription(),
        "Out of memory.");
}

TEST_F(ComErrors, SuccessCodesRaiseNothing) {
    EXPECT_NO_THROW(CheckHrIErrorInfo(0));
    EXPECT_NO_THROW(CheckHrIErrorInfo(1, "f", "file")); // S_FALSE
}
