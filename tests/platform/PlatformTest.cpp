// The operating-system seam: the same observable behaviour from each platform's implementation,
// and loading shared modules and looking up their symbols, through the fault seam.
#include "platform/CodePage.h"
#include "platform/Environment.h"
#include "platform/Module.h"
#include "platform/SystemError.h"
#include "platform/TextConversion.h"
#include "support/FaultInjection.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cstdlib>
#include <string>
#include <utility>

namespace tekit::platform {
namespace {

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

// Loading shared modules and looking up their symbols, through the fault seam.
using testing::ScopedFault;

#if defined(_WIN32)
constexpr char kSystemModule[] = "kernel32.dll";
constexpr char kSystemSymbol[] = "GetTickCount";
constexpr char kMissingModule[] = "tekit-no-such-module.dll";
#else
constexpr char kSystemModule[] = "libc.so.6";
constexpr char kSystemSymbol[] = "strlen";
constexpr char kMissingModule[] = "libtekit-no-such-module.so";
#endif

TEST(ModuleTest, ASystemModuleLoadsAndFindsItsSymbols) {
    ModuleHandle module = nullptr;
    ASSERT_FALSE(OpenModule(kSystemModule, module));
    ASSERT_NE(module, nullptr);
    void* address = nullptr;
    EXPECT_FALSE(FindSymbol(module, kSystemSymbol, address));
    EXPECT_NE(address, nullptr);
    SystemError const missing = FindSymbol(module, "TekitNoSuchSymbol", address);
    EXPECT_EQ(missing.code, native::kSymbolNotFound);
    CloseModule(module);
}

TEST(ModuleTest, AMissingModuleFailsWithTheLoadersReason) {
    ModuleHandle module = nullptr;
    std::string reason;
    SystemError const error = OpenModule(kMissingModule, module, &reason);
    EXPECT_EQ(error.code, native::kModuleNotFound);
    EXPECT_EQ(module, nullptr);
    EXPECT_FALSE(reason.empty());
}

TEST(ModuleTest, ArmedLoadsAndLookupsFailWithTheInjectedError) {
    ModuleHandle module = nullptr;
    {
        ScopedFault const fault(FaultKind::ModuleLoad, 1, native::kModuleNotFound);
        std::string reason;
        SystemError const error = OpenModule(kSystemModule, module, &reason);
        EXPECT_EQ(error.code, native::kModuleNotFound);
        EXPECT_EQ(module, nullptr);
        EXPECT_FALSE(reason.empty());
        ASSERT_FALSE(OpenModule(kSystemModule, module)); // only the first call fails
    }
    {
        ScopedFault const fault(FaultKind::SymbolLookup, 1, native::kSymbolNotFound);
        void* address = nullptr;
        EXPECT_EQ(FindSymbol(module, kSystemSymbol, address).code, native::kSymbolNotFound);
        EXPECT_EQ(address, nullptr);
    }
    CloseModule(module);
}

} // namespace
} // namespace tekit::platform
