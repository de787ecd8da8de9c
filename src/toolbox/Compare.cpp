// Tolerant comparisons and comparison callbacks. The steps follow the documented contract one
// for one, asymmetries included: the relative test of FP_EQ divides by b only, and the close
// branch of FP_GT/FP_GE is left with "greater than" the tolerance while FP_EQ uses "below".
#include "tekit/toolbox/Compare.h"

#include <cmath>
#include <cstdint>
#include <cstring>

namespace {

constexpr double kTolerance = 1e-8;

bool IsZero(double x) {
    return x == 0.0;
}

int GreaterThan(double a, double b) {
    if (IsZero(b))
        return a > 0.0;
    if (IsZero(a))
        return 0.0 > b;
    double const q = a / b;
    if (!(q > 0.0) || std::fabs(a - b) > kTolerance)
        return a > b;
    return b > 0.0 ? q - 1.0 >= kTolerance : -kTolerance >= q - 1.0;
}

int GreaterOrEqual(double a, double b) {
    if (IsZero(b))
        return a >= 0.0;
    if (IsZero(a))
        return 0.0 >= b;
    double const q = a / b;
    if (!(q > 0.0) || std::fabs(a - b) > kTolerance)
        return a > b;
    return b > 0.0 ? q - 1.0 > -kTolerance : kTolerance > q - 1.0;
}

template <class T> int CompareValues(void const* a, void const* b) {
    T x, y;
    std::memcpy(&x, a, sizeof x); // items of a list need not be aligned
    std::memcpy(&y, b, sizeof y);
    return x < y ? -1 : (x > y ? 1 : 0);
}

} // namespace

extern "C" int TEKIT_STDCALL FP_EQ(double a, double b) {
    double const r = IsZero(b) ? a : a / b - 1.0;
    return r > -kTolerance && r < kTolerance && std::fabs(a - b) < kTolerance;
}

extern "C" int TEKIT_STDCALL FP_GT(double a, double b) {
    return GreaterThan(a, b);
}

extern "C" int TEKIT_STDCALL FP_GE(double a, double b) {
    return GreaterOrEqual(a, b);
}

extern "C" int TEKIT_STDCALL FP_LT(double a, double b) {
    return GreaterThan(b, a);
}

extern "C" int TEKIT_STDCALL FP_LE(double a, double b) {
    return GreaterOrEqual(b, a);
}

extern "C" int TEKIT_STDCALL FP_Compare(double a, double b) {
    if (FP_EQ(a, b))
        return 0;
    return GreaterThan(a, b) ? 1 : -1;
}

extern "C" int TEKIT_STDCALL TEKIT_CompareWithPrecision(double a, double b, int numDigits) {
    if (a == b || std::isnan(a) || std::isnan(b))
        return 0;
    if (numDigits <= 17 && std::isfinite(a) && std::isfinite(b)) {
        double const scale = std::fmax(std::fabs(a), std::fabs(b));
        double const tolerance = std::pow(10.0, -(numDigits < 1 ? 1 : numDigits)) * scale;
        if (std::fabs(a - b) <= tolerance)
            return 0;
    }
    return a < b ? -1 : 1;
}

extern "C" int TEKIT_CDECL DoubleCompare(void const* a, void const* b) {
    return CompareValues<double>(a, b);
}

extern "C" int TEKIT_CDECL FloatCompare(void const* a, void const* b) {
    return CompareValues<float>(a, b);
}

extern "C" int TEKIT_CDECL IntCompare(void const* a, void const* b) {
    return CompareValues<std::int32_t>(a, b);
}

extern "C" int TEKIT_CDECL ShortCompare(void const* a, void const* b) {
    return CompareValues<std::int16_t>(a, b);
}

extern "C" int TEKIT_CDECL CStringCompare(void const* a, void const* b) {
    char const* x;
    char const* y;
    std::memcpy(&x, a, sizeof x);
    std::memcpy(&y, b, sizeof y);
    if (!x || !y)
        return x ? 1 : (y ? -1 : 0);
    int const r = std::strcmp(x, y); // compares as unsigned char, as the C standard requires
    return r < 0 ? -1 : (r > 0 ? 1 : 0);
}
