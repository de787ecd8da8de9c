#include "tekit/errors/ComErrorInfo.h"

#include "support/Raises.h"

#include <gtest/gtest.h>

#include <thread>

using namespace tekit;
using tekit::testing::Raised;

namespace {

GUID const kInterface = {0x12345678, 0x1234, 0x5678, {1, 2, 3, 4, 5, 6, 7, 8}};

TEException Thrown(TEError code, char const* description, char const* source) {
    return TEException(description, "Engine::Run", code, false, nullptr, 0, source, "Engine", 3,
                       "Aug 12 2021", "18:30:26");
}

class ComErrors : public ::testing::Test {
protected:
    void SetUp() override { RString::ResetStrings(); }
};

} // namespace

TEST_F(ComErrors, AnExceptionCrossesAComBoundaryWithItsCodeDescriptionAndSource) {
    TEException const original = Thrown(TE_ACCESS_DENIED, "Cannot open the station", "Engine");
    HRESULT const hr = SetErrorInfoForTEException(kInterface, &original, nullptr);
    EXPECT_EQ(std::uint32_t(hr), 0x80070005u);

    TEException const back = Raised([hr] { CheckHrIErrorInfo(hr, "Client::Start", "Client"); });
    EXPECT_EQ(back.GetErrorCode(), TE_ACCESS_DENIED);
    EXPECT_STREQ(back.GetDescription(), "Cannot open the station");
    EXPECT_STREQ(back.GetSource(), "Engine");
    EXPECT_STREQ(back.GetFunctionName(), "Client::Start");
}

TEST_F(ComErrors, BareWin32NumbersAreWrappedAsHResults) {
    TEException const missing = Thrown(TE_FILE_NOT_FOUND, "No such file", nullptr);
    HRESULT const hr = SetErrorInfoForTEException(kInterface, &missing, nullptr);
    EXPECT_EQ(std::uint32_t(hr), 0x80070002u);
    EXPECT_RAISES(CheckHrIErrorInfo(hr), TE_FILE_NOT_FOUND);

    TEException const program = Thrown(TE_PROGRAM_ERROR, "Broken", nullptr);
    HRESULT const fail = SetErrorInfoForTEException(kInterface, &program, nullptr);
    EXPECT_EQ(std::uint32_t(fail), 0x80004005u);
    EXPECT_RAISES_IN(CheckHrIErrorInfo(fail), TE_OPERATION_FAILED, "CheckHrIErrorInfo", "Broken")
        << "E_FAIL names no code";

    EXPECT_EQ(std::uint32_t(SetErrorInfoForTEException(kInterface, nullptr, nullptr)), 0x80004005u);
}

TEST_F(ComErrors, ErrorInformationIsConsumedAndBelongsToItsThread) {
    TEException const original = Thrown(TE_DISK_FULL, "Station disk full", "Engine");
    HRESULT const hr = SetErrorInfoForTEException(kInterface, &original, nullptr);

    TEException fromOtherThread;
    std::thread([&] { fromOtherThread = Raised([hr] { CheckHrIErrorInfo(hr); }); }).join();
    EXPECT_STREQ(fromOtherThread.GetDescription(), "The disk is full.");

    EXPECT_RAISES_IN(CheckHrIErrorInfo(hr), TE_DISK_FULL, "CheckHrIErrorInfo", "Station disk full");
    // Taken once: a second failure without new information shows the code's own message.
    EXPECT_RAISES_IN(CheckHrIErrorInfo(long(std::int32_t(0x8007000Eu))), TE_OUT_OF_MEMORY,
                     "CheckHrIErrorInfo", "Out of memory.");
}

TEST_F(ComErrors, SuccessCodesRaiseNothing) {
    EXPECT_NO_THROW(CheckHrIErrorInfo(0));
    EXPECT_NO_THROW(CheckHrIErrorInfo(1, "f", "file")); // S_FALSE
}
