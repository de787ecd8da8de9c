// Fuzzes Loomwire version text: parsing agrees with std::regex reading the same expression,
// comparison is a consistent order, and the fixed threshold tests imply each other in their
// natural order without reading past the text (the text lies in a buffer of its exact size).
//
// Input: the first version, optionally a line feed and a second version (each up to a NUL).
#include "tekit/environment/LWVersion.h"

#include <cstddef>
#include <cstdint>
#include <memory>
#include <regex>
#include <string>

using namespace tekit;

namespace {

void Check(bool condition) {
    if (!condition)
        __builtin_trap();
}

/// `text` in a heap block of exactly its size and NUL, so a read past it is caught.
std::unique_ptr<char[]> Exact(std::string const& text) {
    std::unique_ptr<char[]> copy(new char[text.size() + 1]);
    text.copy(copy.get(), text.size());
    copy[text.size()] = '\0';
    return copy;
}

/// The expression's reading, for texts short enough for std::regex's recursion.
void CheckAgainstRegex(char const* text, bool ok, long major, long minor, long patch) {
    static std::regex const expression(R"(^(\d+)(\.(\d+)(\.(\d+))?)?)");
    std::cmatch match;
    if (!std::regex_search(text, match, expression)) {
        Check(!ok && major == 0 && minor == 0 && patch == 0);
        return;
    }
    auto const same = [&](int group, long value) {
        std::string const digits = match[group].str();
        if (digits.empty() || digits.size() > 9)
            return; // absent (0), or possibly beyond 32 bits: checked by the cases below
        Check(std::stol(digits) == value);
    };
    same(1, major);
    same(3, minor);
    same(5, patch);
    int const last = match[5].matched ? 5 : match[3].matched ? 3 : 1;
    if (match[last].str().size() <= 9)
        Check(ok);
}

void CheckThresholds(char const* v) {
    bool const is80 = LWVersionIs80OrGreater(v), is90 = LWVersionIs90OrGreater(v);
    bool const is90_1 = LWVersionIs90_1(v), is90_1Up = LWVersionIs90_1OrGreater(v);
    bool const chain[] = {LWVersionIs200OrGreater(v),
                          LWVersionIs190OrGreater(v),
                          LWVersionIs180OrGreater(v),
                          LWVersionIs170OrGreater(v),
                          LWVersionIs140_1OrGreater(v),
                          LWVersionIs140OrGreater(v),
                          LWVersionIs130_1OrGreater(v),
                          LWVersionIs130OrGreater(v),
                          LWVersionIs120OrGreater(v),
                          LWVersionIs110OrGreater(v),
                          LWVersionIs100OrGreater(v),
                          is90_1Up,
                          is90,
                          is80};
    for (size_t i = 0; i + 1 < std::size(chain); ++i)
        Check(!chain[i] || chain[i + 1]);
    Check(!is90_1 || is90_1Up);
}

void CheckOne(std::string const& text) {
    auto const exact = Exact(text);
    long major = -1, minor = -1, patch = -1;
    bool const ok = ParseLWVersionString(exact.get(), major, minor, patch);
    if (text.size() <= 200)
        CheckAgainstRegex(exact.get(), ok, major, minor, patch);
    CheckThresholds(exact.get());
    bool bothValid = false;
    Check(LWVersionCompare(exact.get(), exact.get(), bothValid, false) == 0 && bothValid == ok);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(uint8_t const* data, size_t size) {
    std::string const input(reinterpret_cast<char const*>(data), size);
    size_t const split = input.find('\n');
    std::string const a = input.substr(0, input.find('\0')).substr(0, split);
    std::string b = split == std::string::npos ? "17.0.0" : input.substr(split + 1);
    b = b.substr(0, b.find('\0'));
    CheckOne(a);
    auto const ea = Exact(a), eb = Exact(b);
    bool validAB = false, validBA = false;
    for (bool majorOnly : {false, true}) {
        int const ab = LWVersionCompare(ea.get(), eb.get(), validAB, majorOnly);
        int const ba = LWVersionCompare(eb.get(), ea.get(), validBA, majorOnly);
        Check(validAB == validBA && ab == -ba && ab >= -1 && ab <= 1);
        Check(LWVersionIsGivenVersionOrGreater(ea.get(), eb.get(), majorOnly) ==
              (validAB && ab >= 0));
    }
    return 0;
}
