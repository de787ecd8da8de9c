// The tolerant comparisons, the comparison callbacks, the constants and the unit conversions.
#include "tekit/toolbox/Compare.h"
#include "tekit/toolbox/CompareFunction.h"
#include "tekit/toolbox/Constants.h"
#include "tekit/toolbox/Conversions.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdint>
#include <limits>
#include <tuple>
#include <type_traits>

namespace {

constexpr double kNaN = std::numeric_limits<double>::quiet_NaN();

struct Case {
    double a, b;
    int eq, gt, ge, lt, le, compare;
};

// Each row pins all six functions on one pair: the asymmetries show as rows that differ only
// in the order of a and b.
TEST(TolerantCompare, KeepsTheDocumentedAsymmetries) {
    Case const cases[] = {
        // clang-format off
        // Near zero: the relative test divides by b only.
        {0.0, 5e-9, 0, 0, 0, 1, 1, -1}, {5e-9, 0.0, 1, 1, 1, 0, 0, 0},
        {1e9, 1e9 + 1e-3, 0, 0, 0, 1, 1, -1}, // relatively equal, absolutely too far apart
        // Differing signs compare plainly.
        {-1.0, 1.0, 0, 0, 0, 1, 1, -1}, {1.0, -1.0, 0, 1, 1, 0, 0, 1},
        // Close values of one sign decide by the relative difference.
        {1.0 + 1e-9, 1.0, 1, 0, 1, 0, 1, 0}, {-1.0 - 1e-9, -1.0, 1, 0, 1, 0, 1, 0},
        {1.0 + 2e-8, 1.0, 0, 1, 1, 0, 0, 1}, {-1.0, -1.0 - 2e-8, 0, 1, 1, 0, 0, 1},
        {1e-12, 2e-12, 0, 0, 0, 1, 1, -1}, // tiny numbers of different size are not equal
        // b is zero: -0.0 counts as zero; a NaN is not zero and orders nothing.
        {-1.0, -0.0, 0, 0, 0, 1, 1, -1}, {kNaN, 1.0, 0, 0, 0, 0, 0, -1},
        // clang-format on
    };
    for (Case const& c : cases) {
        SCOPED_TRACE(testing::Message() << "a=" << c.a << " b=" << c.b);
        EXPECT_EQ(FP_EQ(c.a, c.b), c.eq);
        EXPECT_EQ(FP_GT(c.a, c.b), c.gt);
        EXPECT_EQ(FP_GE(c.a, c.b), c.ge);
        EXPECT_EQ(FP_LT(c.a, c.b), c.lt);
        EXPECT_EQ(FP_LE(c.a, c.b), c.le);
        EXPECT_EQ(FP_Compare(c.a, c.b), c.compare);
    }
}

TEST(CompareCallbacks, OrderValuesAndTreatNaNAsEqual) {
    static_assert(std::is_convertible_v<decltype(&DoubleCompare), CompareFunction>);
    double const d[] = {1.0, 2.0, kNaN};
    EXPECT_EQ(std::tuple(DoubleCompare(&d[0], &d[1]), DoubleCompare(&d[1], &d[0]),
                         DoubleCompare(&d[2], &d[0]), DoubleCompare(&d[0], &d[2])),
              std::tuple(-1, 1, 0, 0));
    float const f[] = {-1.5f, 3.0f, std::numeric_limits<float>::quiet_NaN()};
    EXPECT_EQ(FloatCompare(&f[0], &f[1]), -1);
    EXPECT_EQ(FloatCompare(&f[2], &f[1]), 0);
    std::int32_t const i[] = {INT32_MIN, INT32_MAX};
    EXPECT_EQ(IntCompare(&i[1], &i[0]), 1); // no overflow from subtracting
    std::int16_t const s[] = {-32768, 32767};
    EXPECT_EQ(ShortCompare(&s[0], &s[1]), -1);
    EXPECT_EQ(ShortCompare(&s[1], &s[1]), 0);
}

TEST(CompareCallbacks, CStringsCompareAsUnsignedBytes) {
    char const* const texts[] = {"abc", "abd", "ab", "\xE9", nullptr};
    EXPECT_EQ(std::tuple(CStringCompare(&texts[0], &texts[1]), CStringCompare(&texts[2], &texts[0]),
                         CStringCompare(&texts[3], &texts[0]), CStringCompare(&texts[4], &texts[0]),
                         CStringCompare(&texts[4], &texts[4])),
              std::tuple(-1, -1, 1, -1, 0)); // 0xE9 is above 'a', not negative
}

TEST(CompareWithPrecision, EqualToTheGivenSignificantDigits) {
    struct {
        double a, b;
        int digits, expected;
    } const cases[] = {
        {1.0001, 1.0002, 3, 0},     {1.0001, 1.0002, 5, -1},     {1.0002, 1.0001, 5, 1},
        {123456.0, 123457.0, 5, 0}, {123456.0, 123457.0, 6, -1}, {-2.0, 2.0, 1, -1},
        {0.0, 1e-300, 3, -1},       {1.0, 1.0 + 1e-16, 17, 0},   {1.0, 1.0 + 2.3e-16, 18, -1},
        {kNaN, 1.0, 3, 0},          {1e308, INFINITY, 3, -1},    {INFINITY, INFINITY, 3, 0},
        {1.0, 1.05, 0, 0}, // fewer than 1 digit counts as 1
    };
    for (auto const& c : cases) {
        SCOPED_TRACE(testing::Message() << c.a << " " << c.b << " " << c.digits);
        EXPECT_EQ(TEKIT_CompareWithPrecision(c.a, c.b, c.digits), c.expected);
    }
}

// The values are compared for exact equality: stored results were computed with them, so a
// constant that is merely close (today's Planck constant, a Pi from <numbers>) is wrong.
TEST(Constants, HaveTheirExactValues) {
    struct {
        double(TEKIT_STDCALL* function)();
        double value;
    } const cases[] = {
        // clang-format off
        {Pi, 3.141592653589793}, {HalfPi, 1.5707963267948966}, {ThreeHalvesPi, 4.71238898038469},
        {TwoPi, 6.283185307179586}, {ReciprocalOfPi, 0.3183098861837907},
        {LnOfPi, 1.1447298858494002}, {Log10OfPi, 0.49714987269413385},
        {Euler, 2.718281828459045}, {ReciprocalOfEuler, 0.36787944117144233},
        {Log10OfEuler, 0.4342944819032518}, {Ln2, 0.6931471805599453}, {Ln10, 2.302585092994046},
        {SpeedOfLight, 299792458.0}, {PlanckConstant, 6.626176e-34},
        {ElementaryCharge, 1.6021892e-19}, {GravitationalConstant, 6.672e-11},
        {AvogadroConstant, 6.022045e+23}, {MolarGasConstant, 8.31441},
        {RydbergConstant, 10973731.77},
        // clang-format on
    };
    for (auto const& c : cases)
        EXPECT_EQ(c.function(), c.value);
}

TEST(UnitConversions, UseTheDocumentedFactorsAndOperations) {
    // The reverse directions divide by the shared factor; multiplying by its reciprocal (or by
    // 0.3048 for feet) rounds differently.
    struct {
        double(TEKIT_STDCALL* function)(double);
        double argument, result;
    } const cases[] = {
        // clang-format off
        {DegToRad, 180.0, 180.0 * 0.017453292519943295}, {RadToDeg, 1.0, 57.29577951308232},
        {CelsiusToFahrenheit, 100.0, 212.0}, {CelsiusToFahrenheit, -40.0, -40.0},
        {FahrenheitToCelsius, 212.0, 180.0 * 0.5555555555555556},
        {CelsiusToKelvin, 0.0, 273.15}, {KelvinToCelsius, 273.15, 0.0},
        {MetersToFeet, 1.0, 3.2808399}, {KilometersToMiles, 1.0, 0.62137119},
        {KilogramsToPounds, 1.0, 2.2046226}, {LitersToGallons, 1.0, 0.26417205},
        {FeetToMeters, 3.2808399, 1.0}, {MilesToKilometers, 0.62137119, 1.0},
        {PoundsToKilograms, 2.2046226, 1.0}, {GallonsToLiters, 0.26417205, 1.0},
        {FeetToMeters, 1.0, 1.0 / 3.2808399},
        // clang-format on
    };
    for (auto const& c : cases)
        EXPECT_EQ(c.function(c.argument), c.result) << c.argument;
}

} // namespace
