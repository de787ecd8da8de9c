#include "tekit/toolbox/Conversions.h"
#include "tekit/toolbox/Constants.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

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
    EXPECT_NE(FeetToMeters(1.0), 0.3048);
}

} // namespace
