// Text helpers of the flat interface over plain NUL-terminated text: white space, comparison
// ignoring case, bounded copy and insertion, trimming, splitting at commas, integers.
//
//   char name[32];
//   StringCopyMax(name, "  Supply Voltage ", sizeof name);
//   RemoveSurroundingWhiteSpace(name);                      // "Supply Voltage"
//   if (StrICmp(name, "supply voltage") == 0) ...          // equal
//   int channel;
//   if (TBStrToInt(" 12 ", &channel)) ...                  // channel == 12
//
// White space is the "C" locale's: space, tab, line feed, vertical tab, form feed, carriage
// return. Case is ASCII case only. In the string family's multibyte mode (with the lead-byte
// table of the code page, see tekit/strings/MultiByte.h) the helpers that scan text step over
// a double-byte character as one: its trail byte is never case-folded, taken for a separator
// or split by a cut.
//
// Failures follow the toolbox's style: 0 or null, or a negative TEError (TE_INVALID_POINTER for
// a null pointer that is needed, TE_INVALID_OR_OUT_OF_RANGE for a bad size or position,
// TE_INCOMPATIBLE_PARAMETERS for overlapping source and destination), with nothing changed.
// Copies returned by the helpers are freed with TBFree.
#pragma once

#include "tekit/Export.h"

/// The first character of `text` that is not white space (its terminator when there is none);
/// null for a null text.
extern "C" TEKIT_API char* TEKIT_STDCALL SkipWhiteSpace(char const* text);
/// The first white-space character of `text`, or its terminator; null for a null text.
extern "C" TEKIT_API char* TEKIT_STDCALL SkipNonWhiteSpace(char const* text);
/// 1 when `text` holds a character other than white space, else 0 (also for null).
extern "C" TEKIT_API int TEKIT_STDCALL HasNonWhiteSpace(char const* text);

/// Compares ignoring ASCII case, by character value: -1, 0 or 1. A null text sorts before
/// every text, "" included, and equals another null text.
extern "C" TEKIT_API int TEKIT_STDCALL StrICmp(char const* a, char const* b);
/// StrICmp of the two texts without their leading and trailing white space.
extern "C" TEKIT_API int TEKIT_STDCALL StrICmpWithoutSurrWhiteSpace(char const* a, char const* b);

/// Copies `source` (null: "") into `dest` of `destSize` bytes, cut to destSize - 1 bytes at a
/// character boundary, and terminates it. Returns the bytes copied.
extern "C" TEKIT_API int TEKIT_STDCALL StringCopyMax(char* dest, char const* source, int destSize);
/// Inserts `text` (null: "") into `dest`, a buffer of `destSize` bytes, before its character
/// at `position` (0 to its number of characters). The result is cut at the end, at a
/// character boundary, to fit. Returns the new length in bytes. `text` must not lie in `dest`.
extern "C" TEKIT_API int TEKIT_STDCALL StringInsert(char* dest, char const* text, int position,
                                                    int destSize);
/// Removes leading and trailing white space in place; returns the new length in bytes.
extern "C" TEKIT_API int TEKIT_STDCALL RemoveSurroundingWhiteSpace(char* text);
/// A new copy of `text` without its leading and trailing white space; null for a null text or
/// when the allocation fails.
extern "C" TEKIT_API char* TEKIT_STDCALL StrDupWithoutSurrWhiteSpace(char const* text);
/// Splits `text` in place at its commas: each comma becomes a terminator, the white space
/// around each item is cut off, and `items[i]` points to item i. A text that is empty or only
/// white space holds no items; otherwise n commas make n + 1 items, empty ones included.
/// Returns the number of items. With `items` null the text is only counted, not changed; when
/// it holds more than `maxItems` items the result is TE_INVALID_OR_OUT_OF_RANGE and nothing
/// changes.
extern "C" TEKIT_API int TEKIT_STDCALL SpliceCommaSeparatedList(char* text, char** items,
                                                                int maxItems);
/// A new copy of `text`; null for a null text or when the allocation fails.
extern "C" TEKIT_API char* TEKIT_STDCALL TBStrDup(char const* text);

/// Converts a whole text to a signed 32-bit integer: optional white space, an optional sign,
/// decimal digits, optional white space, nothing else. 1 and `*value` set on success; 0 and
/// `*value` unchanged for any other text, a value out of range or a null pointer.
extern "C" TEKIT_API int TEKIT_STDCALL TBStrToInt(char const* text, int* value);
/// The same for an unsigned 32-bit integer; a sign is not accepted ("+1" and "-1" fail).
extern "C" TEKIT_API int TEKIT_STDCALL StrToUInt(char const* text, unsigned int* value);
