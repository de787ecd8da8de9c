#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include "tekit/errors/TEError.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <string>

namespace {

using namespace tekit;

std::string Encode(std::string const& bytes) {
    std::string text(
        static_cast<std::size_t>(GetTextSizeForData(static_cast<int>(bytes.size()))) + 1, '#');
    int const n = ConvertDataToTextInBuffer(bytes.data(), static_cast<int>(bytes.size()),
                                            text.data(), static_cast<int>(text.size()));
    EXPECT_EQ(n, static_cast<int>(text.size()) - 1);
    text.resize(static_cast<std::size_t>(std::max(n, 0)));
    return text;
}

// Fixed texts: a change of alphabet, bit order or tail form would silently break every stored
// INI data value and compressed string, so the exact characters are pinned.
TEST(DataText, EncodesKnownBytesAsPinnedText) {
    struct {
        std::string bytes, text;
    } const cases[] = {
        // clang-format off
        {"", ""}, {std::string(4, '\0'), "......"}, {"\xFF\xFF\xFF\xFF", "zzzzzk"},
        {"PMCZ", "J3p2LV"}, // a compressed block's magic
        {"\xFF", "zk"}, {"\x01\x02", ".F7"}, {"abc", "NL8Y"},
        {"Hello, world!", "H5KgQ.QmkVSkQr8gO.7F"},
        // clang-format on
    };
    for (auto const& c : cases) {
        EXPECT_EQ(Encode(c.bytes), c.text);
        int size = -1;
        void* const back = ConvertTextToData(c.text.c_str(), -1, &size);
        EXPECT_EQ(std::string(static_cast<char*>(back), size), c.bytes);
        EXPECT_EQ(GetDataSizeForText(static_cast<int>(c.text.size())), size);
        TBFree(back);
    }
    char* const text = ConvertDataToText("abc", 3);
    EXPECT_STREQ(text, "NL8Y");
    TBFree(text);
}

// Every 4 bytes decide their own 6 characters, and texts of one length sort as their bytes.
TEST(DataText, GroupsEncodeAloneAndTextsSortAsTheirBytes) {
    char const* const ascending[] = {"PMCZ\x01\xFF\xFE", "PMCZ\x01\xFF\xFF", "PMCZ\x02\x01\x01",
                                     "PMCZ\x7F\x01\x01", "PMCZ\x80\x01\x01", "PMCZ\xFF\x01\x01"};
    std::string previous;
    for (char const* bytes : ascending) {
        std::string const text = Encode(bytes);
        EXPECT_EQ(text.substr(0, 6), "J3p2LV");
        EXPECT_LT(previous, text);
        previous = text;
    }
}

// Bad arguments, overlap and malformed text fail with their status and write nothing.
TEST(DataText, RejectsBadArgumentsOverlapAndMalformedTextWithoutWriting) {
    char text[32] = "J3p2LVJ3p2LV";
    unsigned char const before[16] = {1, 2, 3, 4, 5, 6, 7, 8};
    unsigned char data[16];
    std::memcpy(data, before, sizeof data);
    auto const decode = [&](std::string const& t) {
        return ConvertTextToDataInBuffer(t.data(), static_cast<int>(t.size()), data, sizeof data);
    };
    constexpr int kBad = TE_UNRECOGNIZED_VALUE;
    struct {
        int result, expected;
    } const cases[] = {
        // clang-format off
        // Malformed: a 6k + 5 or 6k + 1 length, a character outside the alphabet, white space,
        // a NUL inside the given length, unused bits set (of a full group, of a group before
        // the last, of a 1- and a 2-byte tail), bytes above 127.
        {decode("J3p2L"), kBad}, {decode("J"), kBad}, {decode("J3p2L="), kBad},
        {decode("J3p 2LV"), kBad}, {decode(std::string("J3p\0LV", 6)), kBad},
        {decode("zzzzzz"), kBad}, {decode("HH5KgQ......"), kBad}, {decode("zz"), kBad},
        {decode(".F8"), kBad}, {decode("\xC3\xA9\xC3\xA9.."), kBad},
        {GetDataSizeForText(11), kBad}, // no text is 6k + 5 long
        {ConvertDataToTextInBuffer(data, 4, text, 6), TE_INVALID_OR_OUT_OF_RANGE}, // no terminator
        {ConvertDataToTextInBuffer(nullptr, 4, text, 16), TE_INVALID_POINTER},
        {ConvertDataToTextInBuffer(data, -4, text, 16), TE_INVALID_OR_OUT_OF_RANGE},
        {ConvertTextToDataInBuffer("J3p2LV", -1, data, 3), TE_INVALID_OR_OUT_OF_RANGE},
        {ConvertTextToDataInBuffer("J3p2LV", -2, data, 16), TE_INVALID_OR_OUT_OF_RANGE},
        {ConvertTextToDataInBuffer(nullptr, 6, data, 16), TE_INVALID_POINTER},
        {ConvertTextToDataInBuffer(text, 12, text + 4, 8), TE_INCOMPATIBLE_PARAMETERS},
        {ConvertDataToTextInBuffer(text + 8, 8, text, 32), TE_INCOMPATIBLE_PARAMETERS},
        {ConvertTextToDataInBuffer(nullptr, 0, nullptr, 0), 0}, // nothing needs no pointers
        {GetTextSizeForData(1431655764), 2147483646}, // the largest text with its terminator
        {GetTextSizeForData(1431655765), TE_INVALID_OR_OUT_OF_RANGE},
        {GetTextSizeForData(-1), TE_INVALID_OR_OUT_OF_RANGE},
        {GetDataSizeForText(-6), TE_INVALID_OR_OUT_OF_RANGE},
        // clang-format on
    };
    for (auto const& c : cases)
        EXPECT_EQ(c.result, c.expected) << "row " << &c - cases;
    EXPECT_STREQ(text, "J3p2LVJ3p2LV");
    EXPECT_EQ(std::memcmp(data, before, sizeof data), 0);
    EXPECT_EQ(ConvertDataToText(data, -1), nullptr);
    // Adjacent, not overlapping: decoding into the bytes just after the text is allowed.
    EXPECT_EQ(ConvertTextToDataInBuffer(text, 6, text + 6, 4), 4);
    EXPECT_EQ(std::memcmp(text + 6, "PMCZ", 4), 0);
}

} // namespace
