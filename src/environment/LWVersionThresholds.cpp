// The fixed Loomwire version tests: character rules, kept as the product has always applied
// them (quirks included), not numeric comparisons.
//
// Every rule reads a character only after the ones before it matched a non-NUL character, so
// no test looks past the end of its text, nor past the characters it names.
#include "tekit/environment/LWVersion.h"

namespace tekit {

namespace {

/// The text as unsigned bytes (a byte above 0x7F ranks above every digit); "" for null.
unsigned char const* Bytes(char const* text) {
    return reinterpret_cast<unsigned char const*>(text ? text : "");
}

bool IsDigit(unsigned char c) {
    return c >= '0' && c <= '9';
}

/// The common shape "c1 is a digit and (c0 is '2' or higher, or c1 is `c1Min` or higher)".
bool TwoDigitMajorAtLeast(unsigned char const* v, unsigned char c1Min) {
    return IsDigit(v[1]) && (v[0] >= '2' || v[1] >= c1Min);
}

/// The text begins with `prefix` and then a character "1" or higher.
bool PrefixThenOneOrHigher(unsigned char const* v, char const* prefix) {
    for (; *prefix; ++prefix, ++v)
        if (*v != static_cast<unsigned char>(*prefix))
            return false;
    return *v >= '1';
}

bool Is90_1(unsigned char const* v) {
    // "9.0." then "1" or higher: at least 5 characters, c1 no digit.
    return PrefixThenOneOrHigher(v, "9.0.");
}

} // namespace

bool LWVersionIs80OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) &&
           (IsDigit(v[1]) || v[0] == '9' || (v[0] == '8' && v[1] == '.' && v[2] >= '0'));
}

bool LWVersionIs90OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && (IsDigit(v[1]) || (v[0] == '9' && v[1] == '.' && v[2] >= '0'));
}

bool LWVersionIs90_1(char const* version) {
    return Is90_1(Bytes(version));
}

bool LWVersionIs90_1OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && (IsDigit(v[1]) || PrefixThenOneOrHigher(v, "9.") || Is90_1(v));
}

bool LWVersionIs100OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && IsDigit(v[1]);
}

bool LWVersionIs110OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '1');
}

bool LWVersionIs120OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '2');
}

bool LWVersionIs130OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '3');
}

bool LWVersionIs130_1OrGreater(char const* version) {
    // 13.1 reads as neither 14 or more nor "13.0.x": false, as it always was.
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && (TwoDigitMajorAtLeast(v, '4') || PrefixThenOneOrHigher(v, "13.0."));
}

bool LWVersionIs140OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '4');
}

bool LWVersionIs140_1OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && (TwoDigitMajorAtLeast(v, '5') || PrefixThenOneOrHigher(v, "14.0."));
}

bool LWVersionIs170OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '7');
}

bool LWVersionIs180OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '8');
}

bool LWVersionIs190OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && TwoDigitMajorAtLeast(v, '9');
}

bool LWVersionIs200OrGreater(char const* version) {
    unsigned char const* v = Bytes(version);
    return IsDigit(v[0]) && IsDigit(v[1]) && v[0] >= '2';
}

} // namespace tekit
