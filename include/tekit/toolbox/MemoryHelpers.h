// Memory helpers of the flat interface: releasing what the toolbox allocates, swapping blocks
// and rounding sizes.
//
//   char* copy = TBStrDup("Limit");
//   TBFree(copy);
//   int padded = RoundToNextMultiple(13, 8);        // 16
//   SwapBlock(&a, &b, sizeof a);
#pragma once

#include "tekit/Export.h"

/// Frees a block returned by a toolbox function that documents it (TBStrDup,
/// StrDupWithoutSurrWhiteSpace, ConvertDataToText, ConvertTextToData, the integer-list
/// builders). It is the library's own heap, so callers with another C runtime free safely.
/// Null is ignored.
extern "C" TEKIT_API void TEKIT_STDCALL TBFree(void* block);

/// Exchanges the contents of two blocks of `numBytes` bytes. 1 on success (also when `a` and
/// `b` are the same block); 0, and nothing changed, for a null block, a count below 1 or
/// blocks that partly overlap.
extern "C" TEKIT_API int TEKIT_STDCALL SwapBlock(void* a, void* b, int numBytes);

/// The smallest multiple of `multiple` that is not below `value` (13, 8 -> 16; -13, 8 -> -8).
/// `value` itself when `multiple` is below 1 or the result would not fit in an int.
extern "C" TEKIT_API int TEKIT_STDCALL RoundToNextMultiple(int value, int multiple);
