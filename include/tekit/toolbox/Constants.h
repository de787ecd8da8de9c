// Mathematical and physical constants as functions, for callers that reach the library
// through its flat interface (GetProcAddress, dlsym) rather than its headers.
//
//   double circumference = TwoPi() * radius;
//   double energy = PlanckConstant() * frequency;
//
// The values are fixed: the physical ones are the older published values that stored results
// were computed with (PlanckConstant 6.626176e-34, not today's 6.62607015e-34), kept so that
// those results stay reproducible.
#pragma once

#include "tekit/Export.h"

extern "C" {
TEKIT_API double TEKIT_STDCALL Pi(void);                    ///< 3.141592653589793
TEKIT_API double TEKIT_STDCALL HalfPi(void);                ///< 1.5707963267948966
TEKIT_API double TEKIT_STDCALL ThreeHalvesPi(void);         ///< 4.71238898038469
TEKIT_API double TEKIT_STDCALL TwoPi(void);                 ///< 6.283185307179586
TEKIT_API double TEKIT_STDCALL ReciprocalOfPi(void);        ///< 0.3183098861837907
TEKIT_API double TEKIT_STDCALL LnOfPi(void);                ///< 1.1447298858494002
TEKIT_API double TEKIT_STDCALL Log10OfPi(void);             ///< 0.49714987269413385
TEKIT_API double TEKIT_STDCALL Euler(void);                 ///< 2.718281828459045
TEKIT_API double TEKIT_STDCALL ReciprocalOfEuler(void);     ///< 0.36787944117144233
TEKIT_API double TEKIT_STDCALL Log10OfEuler(void);          ///< 0.4342944819032518
TEKIT_API double TEKIT_STDCALL Ln2(void);                   ///< 0.6931471805599453
TEKIT_API double TEKIT_STDCALL Ln10(void);                  ///< 2.302585092994046
TEKIT_API double TEKIT_STDCALL SpeedOfLight(void);          ///< 299792458.0 m/s
TEKIT_API double TEKIT_STDCALL PlanckConstant(void);        ///< 6.626176e-34
TEKIT_API double TEKIT_STDCALL ElementaryCharge(void);      ///< 1.6021892e-19
TEKIT_API double TEKIT_STDCALL GravitationalConstant(void); ///< 6.672e-11
TEKIT_API double TEKIT_STDCALL AvogadroConstant(void);      ///< 6.022045e+23
TEKIT_API double TEKIT_STDCALL MolarGasConstant(void);      ///< 8.31441
TEKIT_API double TEKIT_STDCALL RydbergConstant(void);       ///< 10973731.77
}
