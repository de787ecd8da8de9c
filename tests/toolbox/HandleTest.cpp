#include "tekit/toolbox/Handle.h"

#include "toolbox/HandleAssert.h"

#include <gtest/gtest.h>

#include <cstring>
#include <string>

namespace {

// Blocks start and grow zero-filled; size 0 has no block.
TEST(HandleTest, BlocksAreZeroFilledAndKeepTheirContentWhenResized) {
    Handle h = NewHandle(4), empty = NewHandle(0);
    EXPECT_EQ(empty->block, nullptr);
    EXPECT_EQ(std::memcmp(h->block, "\0\0\0\0", 4), 0);
    std::memcpy(h->block, "abcd", 4);
    ASSERT_EQ(SetHandleSize(h, 4096), 1);
    EXPECT_EQ(GetHandleSize(h), 4096u);
    EXPECT_EQ(std::string(static_cast<char*>(h->block), 4096), "abcd" + std::string(4092, '\0'));

    ASSERT_EQ(SetHandleSize(h, 2), 1); // shrink, then grow again: no stale bytes come back
    ASSERT_EQ(SetHandleSize(h, 4), 1);
    EXPECT_EQ(std::memcmp(h->block, "ab\0\0", 4), 0);

    ASSERT_EQ(SetHandleSize(h, 0), 1);
    EXPECT_EQ(h->block, nullptr);
    DisposeHandle(h);
    DisposeHandle(empty);
    DisposeHandle(nullptr); // ignored
}

TEST(HandleTest, AssertTextNamesMessageLineAndFile) {
    EXPECT_EQ(
        tekit::toolbox::AssertText("Parameter 1 to GetHandleSize was NULL.", 42, "Handle.cpp"),
        "Assert!\n\nParameter 1 to GetHandleSize was NULL.\n\nThe error was detected on "
        "line 42 of file 'Handle.cpp'.\n\nProgram aborting.");
}

// On Windows the text goes to a message box, which would wait for a click.
#if !defined(_WIN32)
TEST(HandleDeathTest, NullHandleAbortsWithTheAssertText) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(GetHandleSize(nullptr),
                 "Assert!\n\nParameter 1 to GetHandleSize was NULL.\n\nThe error was detected on "
                 "line [0-9]+ of file 'Handle.cpp'.\n\nProgram aborting.");
    EXPECT_DEATH(SetHandleSize(nullptr, 4), "Parameter 1 to SetHandleSize was NULL.");
}
#endif

} // namespace
