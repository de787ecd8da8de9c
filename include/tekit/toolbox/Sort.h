// Sorting and binary search over plain arrays of fixed-size items.
//
//   int values[] = {3, 1, 2};
//   HeapSort(values, 3, sizeof(int), IntCompare);   // or a CompareFunction of your own
//   std::int32_t at = BinSearch(values, 3, sizeof(int), &key, IntCompare);
//   if (at < 0) insertAt = -at - 1;
//
// A null comparison orders items byte by byte as unsigned bytes over the item size. The sorts
// return 1 when the array is sorted (trivially for fewer than 2 items) and 0, without touching
// the array, for a null array of items, a negative count, an item size below 1 or a failed
// allocation of the one scratch item. A callback that throws leaves the array holding the same
// items in an unspecified order, and the sort returns 0.
#pragma once

#include "tekit/Export.h"
#include "tekit/toolbox/CompareFunction.h"

#include <cstdint>

extern "C" {

/// Heap sort: O(n log n) in every case, in place, not stable.
TEKIT_API std::int32_t TEKIT_STDCALL HeapSort(void* items, std::int32_t numItems,
                                              std::int32_t itemSize, CompareFunction compare);
/// Quick sort (median of three, small runs by insertion, heap sort past a depth limit):
/// O(n log n) in every case, in place, not stable.
TEKIT_API std::int32_t TEKIT_STDCALL QuickSort(void* items, std::int32_t numItems,
                                               std::int32_t itemSize, CompareFunction compare);
/// Insertion sort: stable, O(n^2); for short or nearly sorted arrays.
TEKIT_API std::int32_t TEKIT_STDCALL InsertionSort(void* items, std::int32_t numItems,
                                                   std::int32_t itemSize, CompareFunction compare);
/// Searches `numItems` items sorted by `compare` for `key`: the 0-based index of an equal item,
/// or -(insertion index) - 1 when there is none. Ranges of 7 or more items are halved, shorter
/// ones are walked from their low end. An empty array, a null key or array, or an item size
/// below 1 gives -1.
TEKIT_API std::int32_t TEKIT_STDCALL BinSearch(void const* items, std::int32_t numItems,
                                               std::int32_t itemSize, void const* key,
                                               CompareFunction compare);

} // extern "C"
