// Unit conversions: one double in, one double out.
//
//   double rad = DegToRad(90.0);                 // 1.5707963267948966
//   double m = FeetToMeters(MetersToFeet(2.0));  // 2.0, up to two roundings
//
// Each pair shares one factor, multiplied one way and divided the other (FeetToMeters is
// x / 3.2808399, not x * 0.3048): the rounding of that quotient is part of the results that
// stored data were computed with, so the factors and operations are exactly these.
#pragma once

#include "tekit/Export.h"

extern "C" {
TEKIT_API double TEKIT_STDCALL DegToRad(double x);            ///< x * 0.017453292519943295
TEKIT_API double TEKIT_STDCALL RadToDeg(double x);            ///< x * 57.29577951308232
TEKIT_API double TEKIT_STDCALL CelsiusToFahrenheit(double x); ///< x * 1.8 + 32.0
TEKIT_API double TEKIT_STDCALL FahrenheitToCelsius(double x); ///< (x - 32.0) * 0.5555555555555556
TEKIT_API double TEKIT_STDCALL CelsiusToKelvin(double x);     ///< x + 273.15
TEKIT_API double TEKIT_STDCALL KelvinToCelsius(double x);     ///< x - 273.15
TEKIT_API double TEKIT_STDCALL MetersToFeet(double x);        ///< x * 3.2808399
TEKIT_API double TEKIT_STDCALL FeetToMeters(double x);        ///< x / 3.2808399
TEKIT_API double TEKIT_STDCALL KilometersToMiles(double x);   ///< x * 0.62137119
TEKIT_API double TEKIT_STDCALL MilesToKilometers(double x);   ///< x / 0.62137119
TEKIT_API double TEKIT_STDCALL KilogramsToPounds(double x);   ///< x * 2.2046226
TEKIT_API double TEKIT_STDCALL PoundsToKilograms(double x);   ///< x / 2.2046226
TEKIT_API double TEKIT_STDCALL LitersToGallons(double x);     ///< x * 0.26417205
TEKIT_API double TEKIT_STDCALL GallonsToLiters(double x);     ///< x / 0.26417205
}
