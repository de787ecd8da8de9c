// The pattern engine's flat functions: compile, search, and the message keys of the codes.
#include "tekit/toolbox/RegExpr.h"

#include "tekit/strings/String.h"
#include "toolbox/pattern/PatternCompiler.h"
#include "toolbox/pattern/PatternSearch.h"

#include <cstring>
#include <new>

namespace tekit::toolbox {

namespace {

struct StatusRow {
    std::int32_t code;
    char const* key;
    char const* text;
};

constexpr StatusRow kStatusRows[] = {
#define REGEXPR_STATUS(symbol, value, key, text) {value, key, text},
#include "tekit/errors/RegExprStatus.def"
};

char const* const kUnknownErrorKey = "REGEXPR_UnknownError";

template <class T> void Set(T* out, T value) {
    if (out != nullptr)
        *out = value;
}

std::int32_t TextLength(char const* text, int length) {
    return length >= 0 ? length : static_cast<std::int32_t>(std::strlen(text));
}

int FindPattern(char const* pattern, int caseSensitive, char const* text, int textLength,
                int startOffset, int forward, int matchPolicy, int* found, int* matchPosition,
                int* matchLength, char* errorChar) {
    pattern::CompiledPattern compiled;
    pattern::PatternError const error = pattern::Compile(
        pattern, caseSensitive != 0, String::IsMultiByteSupportEnabled(), compiled);
    if (error) {
        Set(errorChar, error.character);
        return error.code;
    }
    if (text == nullptr)
        return REGEXPR_NULL_INPUT_STRING;
    pattern::SearchRequest const request{text, TextLength(text, textLength), startOffset,
                                         forward != 0, matchPolicy == 1 ? 1 : 0};
    pattern::SearchResult result;
    if (pattern::Search(compiled, request, result)) {
        Set(found, 1);
        Set(matchPosition, result.position);
        Set(matchLength, result.length);
    }
    return 0;
}

} // namespace

} // namespace tekit::toolbox

using namespace tekit::toolbox;

extern "C" int TEKIT_STDCALL RegExpr_FindPatternInText(char const* pattern, int caseSensitive,
                                                       char const* text, int textLength,
                                                       int startOffset, int forward,
                                                       int matchPolicy, int* found,
                                                       int* matchPosition, int* matchLength,
                                                       char* errorChar) {
    Set(found, 0);
    Set(matchPosition, -1);
    Set(matchLength, -1);
    Set(errorChar, '\0');
    try {
        return FindPattern(pattern, caseSensitive, text, textLength, startOffset, forward,
                           matchPolicy, found, matchPosition, matchLength, errorChar);
    } catch (...) { // allocation failure: nothing else in the engine throws
        return REGEXPR_ALLOCATION_FAILED;
    }
}

extern "C" char const* TEKIT_STDCALL RegExpr_GetOVErrorDescTag(int code, int* takesArgument) {
    for (StatusRow const& row : kStatusRows) {
        if (row.code == code) {
            Set(takesArgument, std::strstr(row.text, "%1") != nullptr ? 1 : 0);
            return row.key;
        }
    }
    Set(takesArgument, 0);
    return kUnknownErrorKey;
}

/// Valid means the search of the pattern in "testString" ran (found or not).
extern "C" bool TEKIT_STDCALL OVIsValidRegularExpression(char const* pattern, int* error) {
    int const status =
        RegExpr_FindPatternInText(pattern, 1, "testString", -1, 0, 1, REGEXPR_MATCH_FIRST, nullptr,
                                  nullptr, nullptr, nullptr);
    Set(error, status < 0 ? status : 0);
    return status >= 0;
}
