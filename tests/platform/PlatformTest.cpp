// The operating-system seam: the same observable behaviour from each platform's implementation.
#include "platform/CodePage.h"
#include "platform/Environment.h"
#include "platform/ErrorInfo.h"
#include "platform/SystemError.h"
#include "platform/TextConversion.h"
#include "platform/Thread.h"

#include <gtest/gtest.h>

#include <atomic>
#include <cerrno>
#include <cstdlib>
#include <set>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace tekit::platform {
namespace {

TEST(ThreadIdTest, IsStableWithinAThreadAndDistinctAcrossLiveThreads) {
    std::uint32_t const mine = CurrentThreadId();
    EXPECT_EQ(CurrentThreadId(), mine);

    // All threads stay alive until every id is taken, so no id can be reused.
    constexpr int kThreads = 8;
    std::vector<std::uint32_t> ids(kThreads);
    std::vector<std::thread> threads;
    std::atomic<int> taken{0};
    for (int i = 0; i < kThreads; ++i)
        threads.emplace_back([&, i] {
            ids[i] = CurrentThreadId();
            ++taken;
            while (taken.load() < kThreads)
                std::this_thread::yield();
        });
    for (auto& t : threads)
        t.join();
    std::set<std::uint32_t> distinct(ids.begin(), ids.end());
    distinct.insert(mine);
    EXPECT_EQ(distinct.size(), static_cast<size_t>(kThreads + 1));
}

void SetVariable(char const* name, char const* value) {
#ifdef _WIN32
    ASSERT_EQ(_putenv_s(name, value), 0);
#else
    ASSERT_EQ(setenv(name, value, 1), 0);
#endif
}

void UnsetVariable(char const* name) {
#ifdef _WIN32
    _putenv_s(name, "");
#else
    unsetenv(name);
#endif
}

TEST(EnvironmentTest, ReadsSetVariablesWhateverTheirLengthAndReportsMissingOnes) {
    std::string value = "untouched";
    UnsetVariable("TEKIT_PLATFORM_TEST_VAR");
    EXPECT_FALSE(GetEnvironmentVariable("TEKIT_PLATFORM_TEST_VAR", value));
    EXPECT_FALSE(GetEnvironmentVariable(nullptr, value));

    // Longer than any first guess at a buffer size.
    std::string const longValue(3000, 'x');
    SetVariable("TEKIT_PLATFORM_TEST_VAR", (longValue + "end").c_str());
    EXPECT_TRUE(GetEnvironmentVariable("TEKIT_PLATFORM_TEST_VAR", value));
    EXPECT_EQ(value, longValue + "end");
    UnsetVariable("TEKIT_PLATFORM_TEST_VAR");
}

TEST(LeadBytesTest, ShiftJisLeadsExactlyItsTwoRanges) {
    bool isLead[256] = {};
    ASSERT_TRUE(GetLeadBytes(932, isLead));
    for (int c = 0; c < 256; ++c) {
        bool const expected = (c >= 0x81 && c <= 0x9F) || (c >= 0xE0 && c <= 0xFC);
        EXPECT_EQ(isLead[c], expected) << "byte " << c;
    }
    isLead[0x41] = true; // an unknown code page leaves the table alone
    EXPECT_FALSE(GetLeadBytes(12345, isLead));
    EXPECT_TRUE(isLead[0x41]);
}

TEST(TextConversionTest, CodePageZeroIsLatin1InBothDirections) {
    // Byte 0x80 is U+0080 here, not the euro sign of the Windows ANSI code page 1252.
    std::string bytes;
    for (int c = 1; c < 256; ++c)
        bytes.push_back(static_cast<char>(c));
    std::wstring const wide = NarrowToWide(bytes.c_str(), -1, 0);
    ASSERT_EQ(wide.size(), 255u);
    for (int c = 1; c < 256; ++c)
        EXPECT_EQ(static_cast<unsigned>(wide[c - 1]), static_cast<unsigned>(c));
    EXPECT_EQ(WideToNarrow(wide.c_str(), -1, 0), bytes);
}

TEST(TextConversionTest, CharactersBeyondTheCodePageBecomeOneQuestionMarkEach) {
    // U+3042 is one wide character everywhere; U+1F600 is a surrogate pair in UTF-16 and one
    // character in UTF-32, and either way a single character the text cannot hold.
    EXPECT_EQ(WideToNarrow(L"a\x3042\x0062", -1, 0), "a?b");
    EXPECT_EQ(WideToNarrow(L"<\U0001F600>", -1, 0), "<?>");
    EXPECT_EQ(WideToNarrow(L"\x00FF\x0100", -1, 0), "\xFF?");
}

TEST(TextConversionTest, CountsLimitTheTextAndBadInputGivesEmptyText) {
    EXPECT_EQ(NarrowToWide("abcdef", 3, 0), L"abc");
    EXPECT_EQ(WideToNarrow(L"abcdef", 2, 0), "ab");
    EXPECT_EQ(WideToNarrow(nullptr, 5, 0), "");
    EXPECT_EQ(WideToNarrow(L"abc", 0, 932), "");
}

TEST(TextConversionTest, DoubleByteCodePagesConvertWithoutLookAlikes) {
    // Hiragana A in Shift-JIS, and back.
    EXPECT_EQ(NarrowToWide("x\x82\xA0y", -1, 932), L"x\x3042y");
    EXPECT_EQ(WideToNarrow(L"x\x3042y", -1, 932), "x\x82\xA0y");
    // Code page 932 has no e-acute; a best-fit conversion would write a plain 'e'.
    EXPECT_EQ(WideToNarrow(L"caf\x00E9", -1, 932), "caf?");
}

TEST(TextConversionTest, UnknownCodePagesFallBackToLatin1) {
    EXPECT_EQ(NarrowToWide("\x80\xE9", -1, 12345), L"\x0080\x00E9");
    EXPECT_EQ(WideToNarrow(L"\x00E9\x3042", -1, 12345), "\xE9?");
}

#ifdef _WIN32
TEST(TextConversionTest, Utf8CodePageTakesNeitherDefaultCharacterNorBestFitFlag) {
    EXPECT_EQ(WideToNarrow(L"caf\x00E9", -1, 65001), "caf\xC3\xA9");
    EXPECT_EQ(NarrowToWide("caf\xC3\xA9", -1, 65001), L"caf\x00E9");
}
#endif

TEST(ErrnoTest, HostValuesTakeTheRuntimeNumbering) {
    std::pair<int, int> const cases[] = {{0, 0},       {ENOENT, 2},   {EACCES, 13},
                                         {EAGAIN, 11}, {EDEADLK, 36}, {ENAMETOOLONG, 38},
                                         {ENOLCK, 39}, {ENOSYS, 40},  {ENOTEMPTY, 41},
                                         {EILSEQ, 42}, {ELOOP, 114},  {ETIMEDOUT, 138}};
    for (auto const& [host, runtime] : cases)
        EXPECT_EQ(NativeErrnoToCrtErrno(host), runtime) << host;
}

TEST(SystemErrorMessageTest, KnownCodesReadAsOneLineAndUnknownCodesAsTheirNumber) {
    std::string const text = SystemErrorMessage(2);
    ASSERT_FALSE(text.empty());
    EXPECT_EQ(text.find_first_of("\r\n"), std::string::npos);
    EXPECT_NE(text.back(), ' ');
    EXPECT_EQ(SystemErrorMessage(987654), "System error 987654");
    EXPECT_EQ(SystemErrorMessage(0x8FFF1234u), "System error 0x8FFF1234");
}

constexpr GUID kSomeInterface = {0x12345678, 0x1234, 0x5678, {1, 2, 3, 4, 5, 6, 7, 8}};

TEST(ThreadErrorInfoTest, IsTakenOnceByTheThreadThatPublishedIt) {
    std::string source = "x", description = "y";
    while (GetThreadErrorInfo(source, description)) {
    } // nothing left over from elsewhere

    SetThreadErrorInfo(kSomeInterface, "Orvane.Engine", "The step failed.", 7, "help.chm");
    bool seenElsewhere = true;
    std::thread([&] {
        std::string s, d;
        seenElsewhere = GetThreadErrorInfo(s, d);
    }).join();
    EXPECT_FALSE(seenElsewhere);

    ASSERT_TRUE(GetThreadErrorInfo(source, description));
    EXPECT_EQ(source, "Orvane.Engine");
    EXPECT_EQ(description, "The step failed.");
    EXPECT_FALSE(GetThreadErrorInfo(source, description));

    SetThreadErrorInfo(kSomeInterface, nullptr, nullptr, 0, nullptr); // null texts: empty texts
    ASSERT_TRUE(GetThreadErrorInfo(source, description));
    EXPECT_EQ(source + description, "");
}

} // namespace
} // namespace tekit::platform
