// Properties over thousands of random values: what Format writes, CvtTo... reads back, and the
// library's printf writes what the C runtime writes in the "C" locale.
#include "support/MultiByteFixture.h"

#include "tekit/strings/DynamicString.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstring>
#include <limits>
#include <random>
#include <string>

namespace tekit {
namespace {

constexpr int kValuesPerCase = 4000;

using ReadInt32 = std::int32_t (String::*)(int, int&) const;
using ReadUInt32 = std::uint32_t (String::*)(int, int&) const;
using ReadInt64 = std::int64_t (String::*)(int, int&) const;
using ReadUInt64 = std::uint64_t (String::*)(int, int&) const;
/// Fewer for the comparisons with the C runtime, which try many formats per value.
constexpr int kValuesPerFormat = 1500;

/// Random bits with the limits of T mixed in, so the edges are always tried.
template <class T> T RandomValue(std::mt19937_64& random, int i) {
    T const limits[] = {std::numeric_limits<T>::min(), std::numeric_limits<T>::max(), T(0), T(-1)};
    if (i < 4)
        return limits[i];
    std::uint64_t bits = random();
    return static_cast<T>(bits >> (random() % 64)); // small and large magnitudes alike
}

double RandomDouble(std::mt19937_64& random, int i) {
    double const specials[] = {0.0,
                               -0.0,
                               std::numeric_limits<double>::infinity(),
                               std::numeric_limits<double>::denorm_min(),
                               std::numeric_limits<double>::max(),
                               std::numeric_limits<double>::lowest(),
                               0.1,
                               1e23};
    if (i < int(std::size(specials)))
        return specials[i];
    std::uint64_t const bits = random();
    double value;
    std::memcpy(&value, &bits, sizeof value);
    return value;
}

/// Runs every case with multibyte mode off and on (Shift-JIS lead bytes).
class FormatRoundTrip : public tekit::testing::BothByteModes {
protected:
    /// The template: double-byte characters around the placeholder when multibyte mode is on,
    /// so that reading back has to count characters.
    DynamicString Template() const {
        return DynamicString(GetParam() ? "\x82\xA0 %1\x82\xA2" : "= %1;", true);
    }

    /// Reads back the number at character 1 and checks that it ends where the template's tail
    /// starts.
    template <class T, class Read> T ReadBack(DynamicString const& s, Read read) const {
        int end = -1;
        T const value = (s.*read)(1, end);
        EXPECT_EQ(end, s.GetNumChars() - 1) << s.GetBufferReadPtr();
        return value;
    }

    template <class T, class Read> void CheckIntegers(Read read) {
        std::mt19937_64 random(12345);
        for (int i = 0; i < kValuesPerCase; ++i) {
            T const value = RandomValue<T>(random, i);
            DynamicString s = Template();
            s.Format(value, 1);
            ASSERT_EQ(ReadBack<T>(s, read), value) << s.GetBufferReadPtr();
        }
    }
};

TEST_P(FormatRoundTrip, IntegersReadBackAsWritten) {
    CheckIntegers<int>(ReadInt32(&String::CvtToInt32));
    CheckIntegers<long long>(ReadInt64(&String::CvtToInt64));
    CheckIntegers<unsigned int>(ReadUInt32(&String::CvtToUInt32));
    CheckIntegers<unsigned long long>(ReadUInt64(&String::CvtToUInt64));
}

TEST_P(FormatRoundTrip, DoublesReadBackBitForBitInEveryExactFormat) {
    std::mt19937_64 random(4242);
    for (char const* format : {static_cast<char const*>(nullptr), "%.17g", "%a", "%.16e"}) {
        for (auto options : {kDecimalPoint_AlwaysPeriod, kDecimalPoint_UseSystemSeparator}) {
            for (int i = 0; i < kValuesPerCase; ++i) {
                double const value = RandomDouble(random, i);
                DynamicString s = Template();
                s.Format(value, 1, options, format);
                int end = -1;
                double const read = s.CvtToFloat64(1, end, options);
                ASSERT_EQ(end, s.GetNumChars() - 1) << s.GetBufferReadPtr();
                if (std::isnan(value)) {
                    ASSERT_TRUE(std::isnan(read)) << s.GetBufferReadPtr();
                    continue;
                }
                ASSERT_EQ(std::memcmp(&read, &value, sizeof value), 0)
                    << (format ? format : "shortest") << " " << s.GetBufferReadPtr();
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(MultiByteModes, FormatRoundTrip, ::testing::Bool(),
                         [](auto const& info) { return info.param ? "MultiByte" : "SingleByte"; });

#if defined(__GLIBC__)
// ---- The same text as the C runtime ----------------------------------------------------------

std::string Formatted(double value, char const* format) {
    DynamicString s("%1", true);
    s.Format(value, 1, kDecimalPoint_AlwaysPeriod, format);
    return s.GetBufferReadPtr();
}

template <class T> std::string Formatted(T value, char const* format) {
    DynamicString s("%1", true);
    s.Format(value, 1, format);
    return s.GetBufferReadPtr();
}

template <class T> std::string ByCRuntime(char const* format, T value) {
    char buffer[1024];
    std::snprintf(buffer, sizeof buffer, format, value);
    return buffer;
}

TEST(FormatLikeTheCRuntime, FloatingPointFieldsMatchPrintf) {
    std::mt19937_64 random(99);
    char const* const formats[] = {"%f",    "%.3f", "%.0f",     "%#.0f",    "%e",    "%.10E",
                                   "%g",    "%.3g", "%#g",      "%#.3G",    "%.0g",  "%a",
                                   "%.3a",  "%A",   "%+012.4e", "%-14.2f|", "% .5g", "%015.1f",
                                   "%#.0e", "%#a",  "%.25g"};
    for (int i = 0; i < kValuesPerFormat; ++i) {
        double value = RandomDouble(random, i);
        if (i % 2 == 0) // also numbers of everyday size
            value =
                std::ldexp(value == value ? std::fmod(value, 1.0) : 0.5, int(random() % 80) - 40);
        for (char const* format : formats)
            ASSERT_EQ(Formatted(value, format), ByCRuntime(format, value))
                << format << " of " << ByCRuntime("%a", value);
    }
}

TEST(FormatLikeTheCRuntime, IntegerFieldsMatchPrintf) {
    std::mt19937_64 random(7);
    char const* const formats[] = {"%d", "%+5d", "%-6d|", "%06d", "% d",   "%.4d",    "%.0d",
                                   "%x", "%#X",  "%#o",   "%u",   "%8.3x", "%-#10x|", "%c"};
    for (int i = 0; i < kValuesPerFormat; ++i) {
        int const value = RandomValue<int>(random, i);
        for (char const* format : formats)
            ASSERT_EQ(Formatted(value, format), ByCRuntime(format, value)) << format;
    }
}

#endif

} // namespace
} // namespace tekit
