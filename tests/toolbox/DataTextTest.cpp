#include "tekit/toolbox/DataText.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include "tekit/errors/TEError.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <random>
#include <string>
#include <vector>

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
    for (auto const& c : cases)
        EXPECT_EQ(Encode(c.bytes), c.text);
    char* const text = ConvertDataToText("abc", 3);
    EXPECT_STREQ(text, "NL8Y");
    TBFree(text);
}

TEST(DataText, RoundTripsEveryLengthInSafeCharactersKeepingPrefixesAndOrder) {
    std::mt19937 random(7);
    std::string previousBytes;
    for (int length = 0; length <= 67; ++length) {
        std::string bytes(static_cast<std::size_t>(length), '\0');
        for (char& b : bytes)
            b = static_cast<char>(random());
        std::string const text = Encode(bytes); // as long as GetTextSizeForData says
        EXPECT_EQ(text.size(), std::size_t(length / 4 * 6 + (length % 4 ? length % 4 + 1 : 0)));
        EXPECT_EQ(GetDataSizeForText(static_cast<int>(text.size())), length);
        int size = -1;
        void* const back = ConvertTextToData(text.c_str(), -1, &size);
        EXPECT_EQ(std::string(static_cast<char*>(back), size), bytes);
        TBFree(back);
        EXPECT_EQ(text.find_first_of(" \t\r\n\"',&<>;=[]\\"), std::string::npos); // INI/XML/CSV
        EXPECT_TRUE(
            std::all_of(text.begin(), text.end(), [](char c) { return c > ' ' && c < 127; }));
        // Every 4 bytes decide their own 6 characters.
        EXPECT_EQ(text.substr(0, 6), Encode(bytes.substr(0, 4)));
        // Texts of one length sort as their bytes.
        std::string const other = previousBytes + "x";
        EXPECT_EQ(Encode(other) < text, other < bytes) << length;
        previousBytes = bytes;
    }
}

// Malformed text fails with the one status and leaves the destination as it was.
TEST(DataText, RejectsMalformedTextWithoutWriting) {
    struct {
        std::string text;
        char const* why;
    } const cases[] = {
        // clang-format off
        {"J3p2L", "a 6k + 5 length"}, {"J", "a 6k + 1 length"},
        {"J3p2L=", "a character outside the alphabet"}, {"J3p 2LV", "white space"},
        {std::string("J3p\0LV", 6), "a NUL inside the given length"},
        {"zzzzzz", "unused bits of a full group set"},
        {"HH5KgQ......", "unused bits of a group before the last set"},
        {"zz", "unused bits of a 1-byte tail set"}, {".F8", "unused bits of a 2-byte tail set"},
        {"\xC3\xA9\xC3\xA9..", "bytes above 127"},
        // clang-format on
    };
    for (auto const& c : cases) {
        SCOPED_TRACE(c.why);
        unsigned char buffer[16];
        std::memset(buffer, 0xAB, sizeof buffer);
        EXPECT_EQ(ConvertTextToDataInBuffer(c.text.data(), static_cast<int>(c.text.size()), buffer,
                                            sizeof buffer),
                  TE_UNRECOGNIZED_VALUE);
        EXPECT_TRUE(std::all_of(buffer, buffer + sizeof buffer, [](int b) { return b == 0xAB; }));
    }
}

TEST(DataText, RejectsBadArgumentsAndOverlapWithoutWriting) {
    char text[32] = "J3p2LVJ3p2LV";
    unsigned char data[16] = {1, 2, 3, 4, 5, 6, 7, 8};
    struct {
        int result, expected;
    } const cases[] = {
        // clang-format off
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
        {GetDataSizeForText(11), TE_UNRECOGNIZED_VALUE}, // no text is 6k + 5 long
        // clang-format on
    };
    for (auto const& c : cases)
        EXPECT_EQ(c.result, c.expected);
    EXPECT_STREQ(text, "J3p2LVJ3p2LV");
    EXPECT_EQ(data[0], 1);
    EXPECT_EQ(ConvertDataToText(data, -1), nullptr);
    // Adjacent, not overlapping: decoding into the bytes just after the text is allowed.
    EXPECT_EQ(ConvertTextToDataInBuffer(text, 6, text + 6, 4), 4);
    EXPECT_EQ(std::memcmp(text + 6, "PMCZ", 4), 0);
}

} // namespace
