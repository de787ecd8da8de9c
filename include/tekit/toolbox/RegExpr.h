// The toolbox's pattern engine: line-wise search of multibyte text for a pattern of its own
// dialect, and the message keys of its status codes.
//
//   int found = 0, position = -1, length = -1;
//   char bad = 0;
//   int rc = RegExpr_FindPatternInText("ERROR {[0-9]+}", 1, text, -1, 0, 1,
//                                      REGEXPR_MATCH_FIRST, &found, &position, &length, &bad);
//   if (rc < 0) {
//       int takesArgument = 0;
//       char const* key = RegExpr_GetOVErrorDescTag(rc, &takesArgument); // "CRX_TOOLERR" section
//   }
//
// The dialect: "{" "}" group, "|" alternation, "*" "+" "?" repetition of the preceding item,
// "." any character, "^" "$" line start and end, "[...]" a set of characters and ranges ("a-z"),
// "[~...]" its complement; "(" and ")" are ordinary characters. "\t" is a tab, "\xHH" the byte
// HH, and a backslash before any other character makes it literal.
//
// Text is searched one line at a time: lines end at CR, LF, CR LF or LF CR, and a match never
// spans a line break. With the string family's multibyte mode on, a lead byte and its trail
// byte are one character everywhere (pattern, text, ".", offsets); sets hold single bytes only.
//
// The match found is the one that starts first in search order. Its length follows the match
// policy: REGEXPR_MATCH_FIRST (0) takes the match a backtracking matcher would (repetitions
// greedy, alternatives tried left to right, the first that lets the rest match; one
// difference: where a repetition's body can match nothing, "{a?|b}*" say, another pass that
// reads characters is preferred to stopping on an empty pass);
// REGEXPR_MATCH_LONGEST (1) takes the longest match at that position. Backward, policy 1
// retries every position of a line downward from the offset (the nearest match before it),
// while policy 0 searches each line once from its start and takes that line's first match
// when it starts at or before the offset (the last line that has a match).
//
// Every search takes time linear in the text and the pattern: the engine simulates an
// automaton and never backtracks. No function throws; errors are status codes.
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/StatusDefinitions.h"

#include <cstdint>

/// The status codes of the pattern engine (also the negative results of its functions).
enum RegExprStatus : std::int32_t {
#define REGEXPR_STATUS(symbol, value, key, text) TEKIT_STATUS_ENUMERATOR(symbol, value)
#include "tekit/errors/RegExprStatus.def"
    /// An allocation inside the engine failed; its key is REGEXPR_UnknownError.
    REGEXPR_ALLOCATION_FAILED = -5261,
};

/// Match policies: the length of the match at the first matching position.
#define REGEXPR_MATCH_FIRST 0
#define REGEXPR_MATCH_LONGEST 1

extern "C" {

/// Compiles `pattern` and searches `text` (`textLength` bytes; negative: up to its NUL) from
/// byte `startOffset`, forward (`forward` 1) or backward (0). `caseSensitive` 0 lets ASCII
/// letters match either case. Returns 0 and sets *found (1 or 0), *matchPosition and
/// *matchLength (bytes; -1 when nothing is found); on a pattern error returns its negative
/// code, the positions -1, and *errorChar the offending character (else NUL). A null text is
/// REGEXPR_NULL_INPUT_STRING. A forward offset below 0 starts at the text's start, a backward
/// offset beyond the text at its end; an offset beyond the text forward, or negative backward,
/// finds nothing. An offset inside a line break belongs to the line the break ends when on its
/// first byte, else to the next line (forward) or that line's end (backward). Any out-pointer
/// may be null.
TEKIT_API int TEKIT_STDCALL RegExpr_FindPatternInText(char const* pattern, int caseSensitive,
                                                      char const* text, int textLength,
                                                      int startOffset, int forward, int matchPolicy,
                                                      int* found, int* matchPosition,
                                                      int* matchLength, char* errorChar);

/// The message key of a status code (REGEXPR_UnknownError for codes outside the table); sets
/// *takesArgument (may be null) to 1 when the message takes the offending character as %1.
TEKIT_API char const* TEKIT_STDCALL RegExpr_GetOVErrorDescTag(int code, int* takesArgument);

/// True when `pattern` compiles, by a search of it in the text "testString". *error (may be
/// null) receives 0, or the negative status code when the pattern is not valid.
TEKIT_API bool TEKIT_STDCALL OVIsValidRegularExpression(char const* pattern, int* error);

} // extern "C"
