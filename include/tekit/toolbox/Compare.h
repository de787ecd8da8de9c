// Tolerant floating-point comparison and the comparison callbacks of lists and sorting.
//
//   if (FP_EQ(measured, limit)) ...            // equal within 1e-8, relatively and absolutely
//   ListQuickSort(list, DoubleCompare);        // a list of doubles, ascending
//   TEKIT_CompareWithPrecision(1.0001, 1.0002, 3);   // 0: equal to 3 significant digits
//
// The tolerance of the FP_ family is one constant, 1e-8, used both as a relative and as an
// absolute bound. The comparisons are deliberately not symmetric near zero and at a difference
// of exactly the tolerance; callers depend on it:
//
//   FP_EQ(0, 5e-9) == 0   but   FP_EQ(5e-9, 0) == 1
//   FP_EQ(1e9, 1e9 + 1e-3) == 0        // relatively close, absolutely too far
//
// "b is zero" below means b == 0.0 (so -0.0 is zero and a NaN is not).
#pragma once

#include "tekit/Export.h"

/// FP_EQ's condition: 0; otherwise 1 when FP_GT(a, b) holds, else -1.
extern "C" TEKIT_API int TEKIT_STDCALL FP_Compare(double a, double b);
/// 1 when r = (b is zero ? a : a / b - 1) lies strictly between -1e-8 and 1e-8 and
/// |a - b| < 1e-8; else 0.
extern "C" TEKIT_API int TEKIT_STDCALL FP_EQ(double a, double b);
/// a greater than b: when b is zero, a > 0; when a is zero, 0 > b; with differing signs or a
/// difference above 1e-8, a > b; for close values of one sign, by the relative difference
/// (a / b - 1 >= 1e-8 for positive b, <= -1e-8 for negative b).
extern "C" TEKIT_API int TEKIT_STDCALL FP_GT(double a, double b);
/// a greater than or equal to b, by FP_GT's steps with these differences: a >= 0 when b is
/// zero, 0 >= b when a is zero, and for close values a / b - 1 > -1e-8 (positive b) or
/// < 1e-8 (negative b). The sign and distance steps stay strict (a > b).
extern "C" TEKIT_API int TEKIT_STDCALL FP_GE(double a, double b);
/// FP_GT(b, a).
extern "C" TEKIT_API int TEKIT_STDCALL FP_LT(double a, double b);
/// FP_GE(b, a).
extern "C" TEKIT_API int TEKIT_STDCALL FP_LE(double a, double b);

/// Compares a and b to `numDigits` significant decimal digits: 0 when
/// |a - b| <= 10^-numDigits x max(|a|, |b|) (so also when a == b, and when either is a NaN,
/// as DoubleCompare), otherwise -1 when a < b and 1 when a > b. `numDigits` below 1 counts
/// as 1; above 17, where doubles hold no more digits, and for infinite values the comparison
/// is exact.
extern "C" TEKIT_API int TEKIT_STDCALL TEKIT_CompareWithPrecision(double a, double b,
                                                                  int numDigits);

// Comparison callbacks for the list and sorting functions: two pointers to items, the key or
// new item first; -1, 0 or 1. They use the caller-cleans convention that the callback type
// of the lists declares.

/// 64-bit doubles: -1 when a < b, 1 when a > b, otherwise 0 (also when either is a NaN).
extern "C" TEKIT_API int TEKIT_CDECL DoubleCompare(void const* a, void const* b);
/// 32-bit floats, as DoubleCompare.
extern "C" TEKIT_API int TEKIT_CDECL FloatCompare(void const* a, void const* b);
/// Signed 32-bit integers.
extern "C" TEKIT_API int TEKIT_CDECL IntCompare(void const* a, void const* b);
/// Signed 16-bit integers.
extern "C" TEKIT_API int TEKIT_CDECL ShortCompare(void const* a, void const* b);
/// Items that are pointers to NUL-terminated strings: the pointed-to strings compared byte
/// by byte as unsigned bytes. A null string sorts before every other and equals a null one.
extern "C" TEKIT_API int TEKIT_CDECL CStringCompare(void const* a, void const* b);
