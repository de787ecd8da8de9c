// Integer lists of the flat interface: growable arrays of int built one value at a time or
// from text such as "1, 3, 5-8".
//
//   int* channels = nullptr;
//   int n = BuildIntegerList("1, 3, 5-8", &channels);     // n == 6: 1 3 5 6 7 8
//   AppendToIntegerList(&channels, &n, 12);               // n == 7
//   TBFree(channels);
//
//   int* gains = nullptr;
//   GetIntListFromParmInfo("channels=1-4; gain=2", "gain", &gains);   // 1 value: 2
//
// Text syntax: items separated by commas; an item is an integer (optional sign, decimal
// digits) or a range "from-to" that runs upward or downward ("5-8", "8-5", "-3--1"), with
// white space allowed around numbers. A text that is empty or only white space is the empty
// list. At most 16777216 values are built, so a range cannot exhaust memory.
//
// Failures are negative TEError values (TE_INVALID_POINTER, TE_UNRECOGNIZED_VALUE for text
// that is not a list, TE_INVALID_OR_OUT_OF_RANGE for too many values, TE_READ_OBJECT_NOT_FOUND
// for a missing parameter, TE_OUT_OF_MEMORY); the list is then unchanged.
#pragma once

#include "tekit/Export.h"

/// Appends `value` to the array `*list` of `*numItems` values (a null `*list` with
/// `*numItems` 0 is the empty list), moving it to a larger block as needed. 1 on success; 0,
/// and both unchanged, for null pointers, a negative count or exhaustion. `*list` must come
/// from these functions: their blocks keep room for growth (a power of two of values, at
/// least 4), so appending one value at a time reallocates rarely.
extern "C" TEKIT_API int TEKIT_STDCALL AppendToIntegerList(int** list, int* numItems, int value);

/// Parses `text` into a new array stored in `*list` (null for the empty list; free with
/// TBFree) and returns the number of values.
extern "C" TEKIT_API int TEKIT_STDCALL BuildIntegerList(char const* text, int** list);

/// From parameter information "name=value; name=value ..." (names compared ignoring case and
/// surrounding white space), builds the list of the value of `name` as BuildIntegerList does.
extern "C" TEKIT_API int TEKIT_STDCALL GetIntListFromParmInfo(char const* parmInfo,
                                                              char const* name, int** list);
