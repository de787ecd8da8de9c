#include "tekit/errors/LookupString.h"

#include "tekit/strings/StaticString.h"

#include <gtest/gtest.h>

using namespace tekit;

TEST(LookupString, JoinsParentAndChildWithADot) {
    StaticString<64> const parent("Locals");
    DynamicString const child("Count", true);
    EXPECT_STREQ(AddLookupStrings("Locals", "Count").GetBufferReadPtr(), "Locals.Count");
    EXPECT_STREQ(AddLookupStrings(parent, "Count").GetBufferReadPtr(), "Locals.Count");
    EXPECT_STREQ(AddLookupStrings("Locals", child).GetBufferReadPtr(), "Locals.Count");
    EXPECT_STREQ(AddLookupStrings(parent, child).GetBufferReadPtr(), "Locals.Count");
}

TEST(LookupString, AnEmptyPartAddsNoSeparator) {
    EXPECT_STREQ(AddLookupStrings("", "Count").GetBufferReadPtr(), "Count");
    EXPECT_STREQ(AddLookupStrings("Locals", "").GetBufferReadPtr(), "Locals");
    EXPECT_STREQ(AddLookupStrings(nullptr, nullptr).GetBufferReadPtr(), "");

    DynamicString name;
    AppendToLookupString(name, "Step");
    AppendToLookupString(name, DynamicString("Result", true));
    AppendToLookupString(name, "");
    AppendToLookupString(name, nullptr);
    EXPECT_STREQ(name.GetBufferReadPtr(), "Step.Result");
}

TEST(LookupString, AppendingIntoFixedStorageTruncatesInsteadOfOverflowing) {
    StaticString<64> name("Parameters");
    AppendToLookupString(name, std::string(100, 'x').c_str());
    EXPECT_EQ(name.GetNumBytes(), 64);
    EXPECT_EQ(std::string(name.GetBufferReadPtr()).substr(0, 11), "Parameters.");
}
