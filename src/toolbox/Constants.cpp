// Constants and unit conversions. The literals are the documented values digit for digit;
// a pair of conversions shares one factor, multiplied one way and divided the other.
#include "tekit/toolbox/Constants.h"
#include "tekit/toolbox/Conversions.h"

#define TEKIT_CONSTANT(name, value)                                                                \
    extern "C" double TEKIT_STDCALL name(void) {                                                   \
        return value;                                                                              \
    }

TEKIT_CONSTANT(Pi, 3.141592653589793)
TEKIT_CONSTANT(HalfPi, 1.5707963267948966)
TEKIT_CONSTANT(ThreeHalvesPi, 4.71238898038469)
TEKIT_CONSTANT(TwoPi, 6.283185307179586)
TEKIT_CONSTANT(ReciprocalOfPi, 0.3183098861837907)
TEKIT_CONSTANT(LnOfPi, 1.1447298858494002)
TEKIT_CONSTANT(Log10OfPi, 0.49714987269413385)
TEKIT_CONSTANT(Euler, 2.718281828459045)
TEKIT_CONSTANT(ReciprocalOfEuler, 0.36787944117144233)
TEKIT_CONSTANT(Log10OfEuler, 0.4342944819032518)
TEKIT_CONSTANT(Ln2, 0.6931471805599453)
TEKIT_CONSTANT(Ln10, 2.302585092994046)
TEKIT_CONSTANT(SpeedOfLight, 299792458.0)
TEKIT_CONSTANT(PlanckConstant, 6.626176e-34)
TEKIT_CONSTANT(ElementaryCharge, 1.6021892e-19)
TEKIT_CONSTANT(GravitationalConstant, 6.672e-11)
TEKIT_CONSTANT(AvogadroConstant, 6.022045e+23)
TEKIT_CONSTANT(MolarGasConstant, 8.31441)
TEKIT_CONSTANT(RydbergConstant, 10973731.77)

#undef TEKIT_CONSTANT

namespace {

constexpr double kRadiansPerDegree = 0.017453292519943295;
constexpr double kDegreesPerRadian = 57.29577951308232;
constexpr double kKelvinOffset = 273.15;

} // namespace

extern "C" double TEKIT_STDCALL DegToRad(double x) {
    return x * kRadiansPerDegree;
}
extern "C" double TEKIT_STDCALL RadToDeg(double x) {
    return x * kDegreesPerRadian;
}
extern "C" double TEKIT_STDCALL CelsiusToFahrenheit(double x) {
    return x * 1.8 + 32.0;
}
extern "C" double TEKIT_STDCALL FahrenheitToCelsius(double x) {
    return (x - 32.0) * 0.5555555555555556;
}
extern "C" double TEKIT_STDCALL CelsiusToKelvin(double x) {
    return x + kKelvinOffset;
}
extern "C" double TEKIT_STDCALL KelvinToCelsius(double x) {
    return x - kKelvinOffset;
}

/// A pair of conversions over one factor: `toUnit` multiplies by it, `fromUnit` divides.
#define TEKIT_CONVERSION_PAIR(toUnit, fromUnit, factor)                                            \
    extern "C" double TEKIT_STDCALL toUnit(double x) {                                             \
        return x * (factor);                                                                       \
    }                                                                                              \
    extern "C" double TEKIT_STDCALL fromUnit(double x) {                                           \
        return x / (factor);                                                                       \
    }

TEKIT_CONVERSION_PAIR(MetersToFeet, FeetToMeters, 3.2808399)
TEKIT_CONVERSION_PAIR(KilometersToMiles, MilesToKilometers, 0.62137119)
TEKIT_CONVERSION_PAIR(KilogramsToPounds, PoundsToKilograms, 2.2046226)
TEKIT_CONVERSION_PAIR(LitersToGallons, GallonsToLiters, 0.26417205)

#undef TEKIT_CONVERSION_PAIR
