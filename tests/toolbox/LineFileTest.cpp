#include "tekit/toolbox/LineFile.h"

#include "tekit/errors/TEError.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cstdio>
#include <stdexcept>
#include <string>
#include <tuple>
#include <vector>

namespace {

using namespace tekit;

/// A byte source in memory that hands out at most `maxRead` bytes per call, so lines and
/// pairs of line ends straddle chunk boundaries; it can fail on a given call.
constexpr int kRealCount = INT_MIN;

struct MemorySource {
    std::string bytes;
    int maxRead = 2048;
    int failOnCall = -1;       ///< the call (from 0) that returns an error
    int badCount = kRealCount; ///< a count to report instead of the real one
    bool throwInstead = false;
    std::size_t position = 0;
    int calls = 0;

    static int TEKIT_STDCALL Read(void* source, int numBytes, int* numRead, void* buffer) {
        auto& s = *static_cast<MemorySource*>(source);
        if (s.calls++ == s.failOnCall) {
            if (s.throwInstead)
                throw std::runtime_error("callback failed");
            return -42;
        }
        std::size_t const n =
            std::min({static_cast<std::size_t>(numBytes), static_cast<std::size_t>(s.maxRead),
                      s.bytes.size() - s.position});
        std::copy_n(s.bytes.data() + s.position, n, static_cast<char*>(buffer));
        s.position += n;
        *numRead = s.badCount != kRealCount ? s.badCount : static_cast<int>(n);
        return 0;
    }
};

/// A line's text, the offset of its first byte and the count of extra line-end bytes before it.
using Line = std::tuple<std::string, long long, int>;

/// Every line up to the end of input, with the reader's position figures for each.
std::vector<Line> ReadAll(std::string const& bytes, int maxLen, int maxRead, bool nonEmpty = false,
                          int* numLines = nullptr) {
    MemorySource source{bytes, maxRead};
    LineFile reader = LineFile_New(MemorySource::Read, &source);
    auto const read = nonEmpty ? LineFile_ReadNonEmpty : LineFile_Read;
    std::vector<Line> lines;
    std::vector<char> buffer(static_cast<std::size_t>(maxLen) + 1);
    int length = -1, end = 0;
    while (read(reader, buffer.data(), maxLen, &length, &end) == 0 && !end)
        lines.push_back({std::string(buffer.data(), static_cast<std::size_t>(length)),
                         LineFile_OffsetOfLastLine(reader),
                         LineFile_NumExtraLineTermChars(reader)});
    EXPECT_EQ(end, 1); // stopped at the end of input, not by a failure
    if (numLines)
        *numLines = LineFile_NumLinesRead(reader);
    LineFile_Dispose(reader);
    return lines;
}

// Each source is read with chunks of every size from 1 byte: a pair of line ends split across
// two chunks, and a cut line whose rest lies in later chunks, must read the same.
TEST(LineFile, SplitsAtEveryKindOfLineEnd) {
    struct {
        std::string bytes;
        int maxLen;
        std::vector<Line> lines;
    } const cases[] = {
        // clang-format off
        {"x\r\ny\r\n", 80, {{"x", 0, 0}, {"y", 3, 1}}}, {"", 80, {}}, {"\r\r", 80, {{"", 1, 1}}},
        {"\nx", 80, {{"x", 1, 1}}},                                   // no leading empty line
        {"x\r\r", 80, {{"x", 0, 0}, {"", 2, 0}}},                     // CR CR: two line ends
        // clang-format on
        {"a\n\rb\r\nc", 80, {{"a", 0, 0}, {"b", 3, 1}, {"c", 6, 1}}}, // LF CR and CR LF
        {std::string("a\0b\0\0c", 6), 80, {{"a", 0, 0}, {"b", 2, 0}, {"", 4, 0}, {"c", 5, 0}}},
        {std::string("a\n\0b", 4), 80, {{"a", 0, 0}, {"b", 3, 1}}}, // LF NUL pairs too
        {"abcdef\nxy\n", 3, {{"abc", 0, 0}, {"xy", 7, 0}}},         // cut, then in sync
        {"abc\n\nd", 0, {{"", 0, 0}, {"", 4, 0}, {"", 5, 0}}},      // nothing kept, lines still
        {std::string(5000, 'q') + "\r\ntail",
         640,
         {{std::string(640, 'q'), 0, 0}, {"tail", 5002, 1}}},
    };
    for (auto const& c : cases) {
        for (int maxRead : {1, 2, 3, 5, 2048}) {
            SCOPED_TRACE(testing::Message()
                         << testing::PrintToString(c.bytes) << " in chunks of " << maxRead);
            int numLines = -1;
            EXPECT_EQ(ReadAll(c.bytes, c.maxLen, maxRead, false, &numLines), c.lines);
            EXPECT_EQ(numLines, static_cast<int>(c.lines.size()));
        }
    }
}

// Empty means no byte other than blanks, counting the bytes cut off a long line.
TEST(LineFile, ReadNonEmptySkipsBlankLinesButCountsThem) {
    int numLines = 0;
    auto const lines = ReadAll("  \n\tx\n \f\v\n\n y\n   z\n", 2, 3, true, &numLines);
    std::vector<Line> const expected = {{"\tx", 3, 0}, {" y", 11, 0}, {"  ", 14, 0}};
    EXPECT_EQ(lines, expected);
    EXPECT_EQ(numLines, 6);
}

TEST(LineFile, ChunkErrorsAndBadCallbacksAreReturned) {
    char buffer[16];
    int length = 0, end = 0;
    struct {
        MemorySource source;
        int expected;
    } cases[] = {
        {{"line one\nline two\n", 4, 1}, -42},                     // error of the callback
        {{"abc", 2048, -1, 4096}, TE_INVALID_OR_OUT_OF_RANGE},     // more than was asked for
        {{"abc", 2048, -1, -3}, TE_INVALID_OR_OUT_OF_RANGE},       // a negative count
        {{"abc", 2048, 0, kRealCount, true}, TE_OPERATION_FAILED}, // an exception
    };
    for (auto& c : cases) {
        LineFile reader = LineFile_New(MemorySource::Read, &c.source);
        EXPECT_EQ(LineFile_Read(reader, buffer, 15, &length, &end), c.expected);
        LineFile_Dispose(reader);
    }
    LineFile reader = LineFile_New(MemorySource::Read, &cases[0].source);
    EXPECT_EQ(LineFile_Read(reader, nullptr, 15, &length, &end), TE_INVALID_POINTER);
    EXPECT_EQ(LineFile_Read(reader, buffer, -1, &length, &end), TE_INVALID_OR_OUT_OF_RANGE);
    EXPECT_EQ(LineFile_Read(reader, buffer, 15, nullptr, nullptr), 0); // outputs are optional
    LineFile_Dispose(reader);
}

TEST(LineFile, ReadsAFileByDefault) {
    std::FILE* file = std::tmpfile();
    ASSERT_NE(file, nullptr);
    std::fputs("ab\r\nc", file);
    std::rewind(file);
    LineFile reader = LineFile_New(nullptr, file);
    char buffer[8];
    int length = 0, end = 0;
    ASSERT_EQ(LineFile_Read(reader, buffer, 7, &length, &end), 0);
    ASSERT_EQ(LineFile_Read(reader, buffer, 7, &length, &end), 0);
    EXPECT_STREQ(buffer, "c");
    LineFile_Dispose(reader);
    std::fclose(file);
    EXPECT_EQ(LineFile_ReadFromFile(nullptr, 10, &length, buffer), TE_INVALID_POINTER);
}

} // namespace
