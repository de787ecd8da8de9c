// Typed values: the text each setter stores, what each getter accepts, escaping, and the shared
// buffer of the pointer getters.
#include "ini/IniObject.h"
#include "ini/IniTestSupport.h"
#include "support/MultiByteFixture.h"
#include "tekit/toolbox/MemoryHelpers.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>

namespace tekit::testing {
namespace {

double const kNaN = std::numeric_limits<double>::quiet_NaN();
double const kInf = std::numeric_limits<double>::infinity();
double const kIndeterminate = std::bit_cast<double>(std::uint64_t{0xFFF8000000000000});

TEST(IniValues, SettersStoreTheirFormats) {
    IniObject ini;
    // clang-format off
    struct { char const* tag; int (*put)(IniHandle); char const* stored; } const cases[] = {
        {"Int", [](IniHandle h) { return Ini_PutInt(h, "s", "Int", INT32_MIN); }, "-2147483648"},
        {"UInt", [](IniHandle h) { return Ini_PutUInt(h, "s", "UInt", UINT32_MAX); }, "4294967295"},
        {"Int64", [](IniHandle h) { return Ini_PutInt64(h, "s", "Int64", INT64_MIN); }, "-9223372036854775808"},
        {"UInt64", [](IniHandle h) { return Ini_PutUInt64(h, "s", "UInt64", UINT64_MAX); }, "18446744073709551615"},
        {"Third", [](IniHandle h) { return Ini_PutDouble(h, "s", "Third", 1.0 / 3); }, "0.3333333333333333"},
        {"Tenth", [](IniHandle h) { return Ini_PutDouble(h, "s", "Tenth", 0.1); }, "0.1"},
        {"Big", [](IniHandle h) { return Ini_PutDouble(h, "s", "Big", 1e300); }, "1e+300"},
        {"Seventeen", [](IniHandle h) { return Ini_PutDouble(h, "s", "Seventeen", 0.30000000000000004); }, "0.3"},
        {"NegZero", [](IniHandle h) { return Ini_PutDouble(h, "s", "NegZero", -0.0); }, "-0"},
        {"NaN", [](IniHandle h) { return Ini_PutDouble(h, "s", "NaN", kNaN); }, "Nan"},
        {"Ind", [](IniHandle h) { return Ini_PutDouble(h, "s", "Ind", kIndeterminate); }, "Ind"},
        {"Inf", [](IniHandle h) { return Ini_PutDouble(h, "s", "Inf", kInf); }, "Inf"},
        {"NegInf", [](IniHandle h) { return Ini_PutDouble(h, "s", "NegInf", -kInf); }, "-Inf"},
        {"True", [](IniHandle h) { return Ini_PutBoolean(h, "s", "True", 7); }, "True"},
        {"False", [](IniHandle h) { return Ini_PutBoolean(h, "s", "False", 0); }, "False"},
        {"Data", [](IniHandle h) { return Ini_PutData(h, "s", "Data", "PMCZ", 4); }, "J3p2LV"},
        {"Escaped", [](IniHandle h) { return Ini_PutString(h, "s", "Escaped", "a\tb\n\r\"\\\x01\x7f\xe9"); },
         "a\\tb\\n\\r\\\"\\\\\\x01\\x7f\xe9"},
    };
    // clang-format on
    for (auto const& c : cases) {
        SCOPED_TRACE(c.tag);
        ASSERT_EQ(c.put(ini), 0);
        EXPECT_EQ(Raw(ini, "s", c.tag), c.stored);
    }
    // Numbers, booleans and raw strings are unquoted; strings and data are quoted.
    std::string const text = WriteText(ini);
    EXPECT_NE(text.find("Int = -2147483648\n"), std::string::npos);
    EXPECT_NE(text.find("Data = \"J3p2LV\"\n"), std::string::npos);
}

TEST(IniValues, IntegerGettersTakeWholeNumbersInTheirRanges) {
    constexpr int E = INI_ERR_INVALID_INTEGER;
    struct Case {
        char const* value;
        int asInt, asUInt, asInt64, asUInt64; ///< each getter's result
    };
    // clang-format off
    Case const cases[] = {
        {"42", 1, 1, 1, 1}, {" -7 ", 1, E, 1, E}, {"+3", 1, E, 1, E},
        {"-2147483648", 1, E, 1, E}, {"2147483648", E, 1, 1, 1}, {"4294967296", E, E, 1, 1},
        {"-9223372036854775808", E, E, 1, E}, {"9223372036854775808", E, E, E, 1},
        {"18446744073709551615", E, E, E, 1}, {"18446744073709551616", E, E, E, E},
        {"1.5", E, E, E, E}, {"0x10", E, E, E, E}, {"12abc", E, E, E, E}, {"-", E, E, E, E},
        {"   ", 0, 0, 0, 0},
    };
    // clang-format on
    for (Case const& c : cases) {
        SCOPED_TRACE(c.value);
        IniObject ini;
        ASSERT_EQ(Ini_PutRawString(ini, "s", "K", c.value), 0);
        int i = 99;
        unsigned u = 99;
        std::int64_t i64 = 99;
        std::uint64_t u64 = 99;
        EXPECT_EQ(Ini_GetInt(ini, "s", "K", &i), c.asInt);
        EXPECT_EQ(Ini_GetUInt(ini, "s", "K", &u), c.asUInt);
        EXPECT_EQ(Ini_GetInt64(ini, "s", "K", &i64), c.asInt64);
        EXPECT_EQ(Ini_GetUInt64(ini, "s", "K", &u64), c.asUInt64);
        // A value is written only on success.
        EXPECT_EQ(i64, c.asInt64 == 1 ? std::strtoll(c.value, nullptr, 10) : 99);
        EXPECT_EQ(u64, c.asUInt64 == 1 ? std::strtoull(c.value, nullptr, 10) : 99u);
        EXPECT_EQ(i, c.asInt == 1 ? static_cast<int>(i64) : 99);
        EXPECT_EQ(u, c.asUInt == 1 ? static_cast<unsigned>(u64) : 99u);
    }
}

TEST(IniValues, DoubleGetterReadsNumbersAndTheSpecialWords) {
    // clang-format off
    struct { char const* value; int status; double number; } const cases[] = {
        {"2.5", 1, 2.5}, {" -1e-3 ", 1, -1e-3}, {"0.3333333333333333", 1, 0.3333333333333333},
        {"inf", 1, kInf}, {"INF", 1, kInf}, {"-Inf", 1, -kInf}, {"1,5", INI_ERR_INVALID_DOUBLE, 0},
        {"abc", INI_ERR_INVALID_DOUBLE, 0}, {"1.5x", INI_ERR_INVALID_DOUBLE, 0}, {"\t", 0, 0},
    };
    // clang-format on
    for (auto const& c : cases) {
        SCOPED_TRACE(c.value);
        IniObject ini;
        ASSERT_EQ(Ini_PutRawString(ini, "s", "K", c.value), 0);
        double value = 99;
        EXPECT_EQ(Ini_GetDouble(ini, "s", "K", &value), c.status);
        EXPECT_EQ(value, c.status == 1 ? c.number : 99);
    }
    // The NaNs come back as the ones they were written from.
    IniObject ini;
    double value = 0;
    for (double const nan : {kNaN, kIndeterminate}) {
        ASSERT_EQ(Ini_PutDouble(ini, "s", "N", nan), 0);
        ASSERT_EQ(Ini_GetDouble(ini, "s", "N", &value), 1);
        EXPECT_EQ(std::bit_cast<std::uint64_t>(value), std::bit_cast<std::uint64_t>(nan));
    }
    ASSERT_EQ(Ini_PutRawString(ini, "s", "N", "nAN"), 0);
    EXPECT_EQ(Ini_GetDouble(ini, "s", "N", &value), 1);
    EXPECT_TRUE(std::isnan(value));
}

TEST(IniValues, LocaleDecidesTheDecimalPoint) {
#if defined(_WIN32)
    IniLocale german = nullptr;
    for (char const* name : {"de-DE", "German_Germany.1252", "German"})
        if (!german)
            german = _create_locale(LC_ALL, name);
#else
    IniLocale const german = newlocale(LC_ALL_MASK, "de_DE.UTF-8", locale_t(0));
#endif
    if (!german)
        GTEST_SKIP() << "no German locale on this machine";
    IniHandle const ini = Ini_New(0, german);
    double value = 0;
    ASSERT_EQ(Ini_PutDouble(ini, "s", "D", 2.5), 0);
    EXPECT_EQ(Raw(ini, "s", "D"), "2,5");
    EXPECT_EQ(Ini_GetDouble(ini, "s", "D", &value), 1);
    EXPECT_EQ(value, 2.5);
    ASSERT_EQ(Ini_PutRawString(ini, "s", "D", "2.5"), 0);
    EXPECT_EQ(Ini_GetDouble(ini, "s", "D", &value), INI_ERR_INVALID_DOUBLE);
    Ini_Dispose(ini);
#if defined(_WIN32)
    _free_locale(german);
#else
    freelocale(german);
#endif
}

TEST(IniValues, BooleanGetterTakesTrueAndFalseInAnyCase) {
    constexpr int E = INI_ERR_INVALID_BOOLEAN;
    // clang-format off
    struct { char const* value; int status, result; } const cases[] = {
        {"True", 1, 1}, {"tRUE", 1, 1}, {"FALSE", 1, 0}, {" false ", 1, 0}, {"1", E, -1},
        {"yes", E, -1}, {"Truee", E, -1},
    };
    // clang-format on
    for (auto const& c : cases) {
        SCOPED_TRACE(c.value);
        IniObject ini;
        ASSERT_EQ(Ini_PutRawString(ini, "s", "B", c.value), 0);
        int value = -1;
        EXPECT_EQ(Ini_GetBoolean(ini, "s", "B", &value), c.status);
        EXPECT_EQ(value, c.result);
    }
}

TEST(IniValues, DataRoundTripsAndBadDataTextFails) {
    IniObject ini;
    unsigned char bytes[300];
    for (int i = 0; i < 300; ++i)
        bytes[i] = static_cast<unsigned char>(i * 7);
    for (int size : {0, 1, 2, 3, 4, 5, 300}) {
        SCOPED_TRACE(size);
        ASSERT_EQ(Ini_PutData(ini, "s", "D", bytes, size), 0);
        void* data = nullptr;
        int got = -1;
        // Zero bytes are stored as an empty text, which getters report as absent.
        ASSERT_EQ(Ini_GetData(ini, "s", "D", &data, &got), size == 0 ? 0 : 1);
        if (size > 0) {
            ASSERT_EQ(got, size);
            EXPECT_EQ(std::memcmp(data, bytes, static_cast<std::size_t>(size)), 0);
        }
        TBFree(data);
    }
    for (char const* bad : {"J3p2L", "J3p2L!", "a b"}) {
        ASSERT_EQ(Ini_PutRawString(ini, "s", "D", bad), 0);
        void* data = nullptr;
        int size = -1;
        EXPECT_EQ(Ini_GetData(ini, "s", "D", &data, &size), INI_ERR_INVALID_DATA) << bad;
        EXPECT_EQ(data, nullptr);
    }
    EXPECT_EQ(Ini_PutData(ini, "s", "D", nullptr, 3), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_PutData(ini, "s", "D", bytes, -1), INI_ERR_INVALID_ARGUMENT);
}

TEST(IniValues, UnescapingFollowsTheTable) {
    // clang-format off
    struct { char const* raw; char const* text; } const cases[] = {
        {"\\n\\r\\t", "\n\r\t"}, {"\\x41\\x6a\\x6A", "Ajj"}, {"\\q\\\\\\\"", "q\\\""},
        {"\\x4", "x4"}, {"\\xg1", "xg1"}, {"\\X41", "X41"}, {"end\\", "end\\"},
        {"a\\x00b", "a"},
    };
    // clang-format on
    for (auto const& c : cases) {
        SCOPED_TRACE(c.raw);
        IniObject ini;
        ASSERT_EQ(Ini_PutRawString(ini, "s", "K", c.raw), 0);
        char const* text = nullptr;
        ASSERT_EQ(Ini_GetPointerToString(ini, "s", "K", &text), 1);
        EXPECT_STREQ(text, c.text);
    }
}

class IniEscapeProperty : public BothByteModes {};

TEST_P(IniEscapeProperty, AnyBytesSurviveEscapingWritingAndReading) {
    std::mt19937 random(GetParam() ? 3 : 4);
    for (int round = 0; round < 500; ++round) {
        std::string value(random() % 300, ' ');
        for (char& c : value)
            c = static_cast<char>(1 + random() % 255);
        IniObject ini;
        ASSERT_EQ(Ini_PutString(ini, "s", "K", value.c_str()), 0);
        char* copy = nullptr;
        int const found = Ini_GetStringCopy(ini, "s", "K", &copy);
        bool const blank = value.find_first_not_of(" \t\n\v\f\r") == std::string::npos;
        ASSERT_EQ(found, blank && value.find_first_of("\t\n\v\f\r") == std::string::npos ? 0 : 1);
        if (found == 1) {
            EXPECT_EQ(std::string(copy), value);
        }
        TBFree(copy);
        // The escaped text holds no control character, so its lines carry it whole.
        std::string const raw = Raw(ini, "s", "K");
        for (char c : raw)
            ASSERT_FALSE(static_cast<unsigned char>(c) < 0x20 || c == 0x7f);
        IniObject back;
        ASSERT_EQ(ReadText(back, WriteText(ini)), 0);
        EXPECT_EQ(Raw(back, "s", "K"), raw);
    }
}

INSTANTIATE_TEST_SUITE_P(ByteModes, IniEscapeProperty, ::testing::Bool());

class IniStringGetters : public MultiByteFixture {};

TEST_F(IniStringGetters, BufferCutsKeepWholeCharactersAndPointersShareOneBuffer) {
    IniObject ini;
    ASSERT_EQ(Ini_PutString(ini, "s", "K", "tab\there"), 0);
    ASSERT_EQ(Ini_PutString(ini, "s", "L", "other"), 0);
    char buffer[6];
    EXPECT_EQ(Ini_GetStringIntoBuffer(ini, "s", "K", buffer, sizeof buffer), 1);
    EXPECT_STREQ(buffer, "tab\th");
    EXPECT_EQ(Ini_GetRawStringIntoBuffer(ini, "s", "K", buffer, sizeof buffer), 1);
    EXPECT_STREQ(buffer, "tab\\t");
    // The pointer getters share one buffer: the second call overwrites the first's text.
    char const* first = nullptr;
    char const* second = nullptr;
    ASSERT_EQ(Ini_GetPointerToString(ini, "s", "K", &first), 1);
    ASSERT_EQ(Ini_GetPointerToString(ini, "s", "L", &second), 1);
    EXPECT_EQ(first, second);
    EXPECT_STREQ(first, "other");
    // Cuts never split a double-byte character.
    UseShiftJis();
    ASSERT_EQ(Ini_PutString(ini, "s", "K", "abc\x82\xa0"), 0);
    EXPECT_EQ(Ini_GetStringIntoBuffer(ini, "s", "K", buffer, 5), 1);
    EXPECT_STREQ(buffer, "abc");
    EXPECT_EQ(Ini_GetRawStringIntoBuffer(ini, "s", "K", buffer, 5), 1);
    EXPECT_STREQ(buffer, "abc");
    // A lead byte before a control character is no character: both bytes are escaped.
    ASSERT_EQ(Ini_PutString(ini, "s", "K", "\x82\n"), 0);
    EXPECT_EQ(Raw(ini, "s", "K"), "\\x82\\n");
}

TEST(IniValues, SharedBufferGrowsIn1024ByteSteps) {
    IniObject ini;
    IniObjectRec const& object = *static_cast<IniHandle>(ini);
    struct Step {
        std::size_t length, bufferSize;
    };
    // Grown when length + 1 does not fit, to (length + 1) rounded down to 1024, plus 1024.
    Step const steps[] = {{1, 1024},    {1023, 1024}, {1024, 2048}, {10, 2048},
                          {2047, 2048}, {2048, 3072}, {5000, 5120}};
    for (Step const& step : steps) {
        SCOPED_TRACE(step.length);
        ASSERT_EQ(Ini_PutRawString(ini, "s", "K", std::string(step.length, 'v').c_str()), 0);
        char const* value = nullptr;
        ASSERT_EQ(Ini_GetPointerToString(ini, "s", "K", &value), 1);
        EXPECT_EQ(object.bufferSize, step.bufferSize);
        EXPECT_EQ(std::strlen(value), step.length);
    }
}

TEST(IniValues, GettersRecordTheLineOfLastAccess) {
    IniObject ini;
    EXPECT_EQ(Ini_LineOfLastAccess(ini), -1);
    ASSERT_EQ(ReadText(ini, "[s]\nA=1\nB=\"\"\nC=3"), 0);
    int value = 0;
    ASSERT_EQ(Ini_GetInt(ini, "s", "C", &value), 1);
    EXPECT_EQ(Ini_LineOfLastAccess(ini), 4);
    EXPECT_EQ(Ini_GetInt(ini, "s", "B", &value), 0); // found but blank: recorded
    EXPECT_EQ(Ini_LineOfLastAccess(ini), 3);
    EXPECT_EQ(Ini_GetInt(ini, "s", "Z", &value), 0); // absent: kept
    EXPECT_EQ(Ini_LineOfLastAccess(ini), 3);
    EXPECT_EQ(Ini_ItemExists(ini, "s", "A"), 1); // not a getter
    EXPECT_EQ(Ini_LineOfLastAccess(ini), 3);
    ASSERT_EQ(Ini_PutInt(ini, "s", "A", 5), 0);
    ASSERT_EQ(Ini_GetInt(ini, "s", "A", &value), 1);
    EXPECT_EQ(Ini_LineOfLastAccess(ini), -1); // put, not read
}

TEST(IniValues, BadArgumentsAreRefused) {
    IniObject ini;
    int value = 0;
    EXPECT_EQ(Ini_GetInt(nullptr, "s", "K", &value), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_GetInt(ini, nullptr, "K", &value), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_GetInt(ini, "s", "K", nullptr), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_GetIntSP(ini, nullptr, "K", &value), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_PutInt(ini, "s", "", 1), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_PutString(ini, "s", "K", nullptr), INI_ERR_INVALID_ARGUMENT);
    EXPECT_EQ(Ini_NumberOfSections(ini), 0); // no section made by a refused put
    EXPECT_STREQ(Ini_GetErrorKey(INI_ERR_CANT_WRITE_FILE), "INI_ERR_CANT_WRITE_FILE");
    EXPECT_EQ(Ini_GetErrorKey(-17000), nullptr);
}

} // namespace
} // namespace tekit::testing
