// List: a growable array of fixed-size items, stored by value in one handle's block.
//
//   ListType list = ListCreate(sizeof(int));
//   int const values[] = {30, 10, 20};
//   for (int v : values)
//       ListInsertInOrder(list, &v, nullptr);     // null: byte order; pass a callback for ints
//   int first = 0;
//   ListGetItem(list, &first, LIST_POS_FRONT);
//   ListDispose(list);
//
// The block is a 24-byte list block header (magic 0x4C495354 "LIST", growth percentage,
// smallest growth step, capacity, item size, item count: six 32-bit fields), the items, and 4
// spare bytes. Positions run from 1 to the item count; LIST_POS_FRONT means the first item
// (for insertion: before it) and LIST_POS_END the last (for insertion: after it); count + 1
// also means the end for insertion. Growth adds (100 + percentage) percent of the capacity, at
// least the smallest step, so single insertions take the capacity 0, 5, 11, 24, 51, 108.
//
// None of these functions throws or prints. A null list (or a handle that is not a list) gives
// 0, null or no action; a position out of range, a bad count or a source or destination that
// overlaps the list's own block gives the failure result and changes nothing.
#pragma once

#include "tekit/Export.h"
#include "tekit/toolbox/CompareFunction.h"
#include "tekit/toolbox/Handle.h"

#include <cstdint>

/// The first item; for insertion, before it.
#define LIST_POS_FRONT (-1)
/// The last item; for insertion, after it.
#define LIST_POS_END 0

extern "C" {

typedef Handle ListType;

/// Called by ListApplyToEach with the position, the item and the caller's data; a negative
/// result stops the walk.
typedef std::int32_t(TEKIT_CDECL* ListApplyFunction)(std::int32_t position, void* item, void* data);

/// A new empty list of items of `itemSize` bytes (1 to 2^31 - 1); null on failure.
TEKIT_API ListType TEKIT_STDCALL ListCreate(std::int32_t itemSize);
/// Frees the list; null is ignored. The same as DisposeHandle.
TEKIT_API void TEKIT_STDCALL ListDispose(ListType list);
/// Frees (with free) the pointer held in each item, then the list.
TEKIT_API void TEKIT_STDCALL ListDisposePtrList(ListType list);
/// Removes every item; capacity and block stay.
TEKIT_API void TEKIT_STDCALL ListClear(ListType list);
TEKIT_API std::int32_t TEKIT_STDCALL ListNumItems(ListType list);
TEKIT_API std::int32_t TEKIT_STDCALL ListGetItemSize(ListType list);
/// The first item slot; valid until the list next grows or is compacted.
TEKIT_API void* TEKIT_STDCALL ListGetDataPtr(ListType list);
/// The item at `position`; null when it does not exist.
TEKIT_API void* TEKIT_STDCALL ListGetPtrToItem(ListType list, std::int32_t position);

/// Inserts `count` items copied from `items` (zero-filled when null) so that they start at
/// `position`: 1 on success, 0 when count < 1, the position is beyond count + 1 or growth fails.
TEKIT_API std::int32_t TEKIT_STDCALL ListInsertItems(ListType list, void const* items,
                                                     std::int32_t position, std::int32_t count);
TEKIT_API std::int32_t TEKIT_STDCALL ListInsertItem(ListType list, void const* item,
                                                    std::int32_t position);
/// Removes `count` items from `position` on, copying them to `dest` first when it is not
/// null. Nothing happens unless the whole run exists. Capacity is kept.
TEKIT_API void TEKIT_STDCALL ListRemoveItems(ListType list, void* dest, std::int32_t position,
                                             std::int32_t count);
TEKIT_API void TEKIT_STDCALL ListRemoveItem(ListType list, void* dest, std::int32_t position);
/// Copies `count` items from `position` on into `dest`; nothing unless the whole run exists.
TEKIT_API void TEKIT_STDCALL ListGetItems(ListType list, void* dest, std::int32_t position,
                                          std::int32_t count);
TEKIT_API void TEKIT_STDCALL ListGetItem(ListType list, void* dest, std::int32_t position);
/// Overwrites `count` items from `position` on; nothing unless the whole run exists.
TEKIT_API void TEKIT_STDCALL ListReplaceItems(ListType list, void const* items,
                                              std::int32_t position, std::int32_t count);
TEKIT_API void TEKIT_STDCALL ListReplaceItem(ListType list, void const* item,
                                             std::int32_t position);

/// Appends every item of `other` (which may be `list` itself); afterwards the capacity equals
/// the item count. 1 when `other` is null or empty, 0 when `list` is null, the item sizes
/// differ or the resize fails.
TEKIT_API std::int32_t TEKIT_STDCALL ListAppend(ListType list, ListType other);
/// A new list with the same item size, growth policy and items; null on failure.
TEKIT_API ListType TEKIT_STDCALL ListCopy(ListType list);
/// 1 when both are the same list, or hold the same number of items with identical bytes.
TEKIT_API std::int32_t TEKIT_STDCALL ListEqual(ListType list, ListType other);

/// The position of the first item at or after `startPosition` that compares equal to `item`;
/// 0 when there is none.
TEKIT_API std::int32_t TEKIT_STDCALL ListFindItem(ListType list, void const* item,
                                                  std::int32_t startPosition,
                                                  CompareFunction compare);
/// Inserts before the first item equal to `existingItem`, or at the front when none is.
TEKIT_API std::int32_t TEKIT_STDCALL ListInsertBeforeItem(ListType list, void const* newItem,
                                                          void const* existingItem,
                                                          CompareFunction compare);
/// Inserts after the first item equal to `existingItem`, or at the end when none is.
TEKIT_API std::int32_t TEKIT_STDCALL ListInsertAfterItem(ListType list, void const* newItem,
                                                         void const* existingItem,
                                                         CompareFunction compare);
/// On a list sorted by `compare`: the position of an equal item, 0 when there is none.
TEKIT_API std::int32_t TEKIT_STDCALL ListBinSearch(ListType list, void const* item,
                                                   CompareFunction compare);
/// Inserts into a list sorted by `compare`, before an equal item found by the binary search;
/// returns the insertion's result.
TEKIT_API std::int32_t TEKIT_STDCALL ListInsertInOrder(ListType list, void const* item,
                                                       CompareFunction compare);
/// 1 when no neighbouring pair compares greater than 0; 0 for a null list.
TEKIT_API std::int32_t TEKIT_STDCALL ListIsSorted(ListType list, CompareFunction compare);
/// Removes every item equal to an earlier one, keeping the order.
TEKIT_API void TEKIT_STDCALL ListRemoveDuplicates(ListType list, CompareFunction compare);
/// Calls `callback` for each item, from the front when `ascending` is non-zero (items it
/// appends are visited), else from the back (stopping when items it removed end the walk).
/// Returns the last result (a negative one stops at once); 0 when nothing was called.
TEKIT_API std::int32_t TEKIT_STDCALL ListApplyToEach(ListType list, std::int32_t ascending,
                                                     ListApplyFunction callback,
                                                     void* callbackData);

/// Makes room for at least `numItems` further items: 1 when there is room, 0 on failure.
TEKIT_API std::int32_t TEKIT_STDCALL ListPreAllocate(ListType list, std::int32_t numItems);
/// Sets the smallest growth step (items) and the growth percentage.
TEKIT_API void TEKIT_STDCALL ListSetAllocationPolicy(ListType list, std::int32_t minItemsPerAlloc,
                                                     std::int32_t percentIncrease);
/// Shrinks the block to the items held; on failure nothing changes.
TEKIT_API void TEKIT_STDCALL ListCompact(ListType list);

/// Sort the items in place with HeapSort, the quick sort or InsertionSort (tekit/toolbox/Sort.h).
TEKIT_API void TEKIT_STDCALL ListHeapSort(ListType list, CompareFunction compare);
TEKIT_API void TEKIT_STDCALL ListQuickSort(ListType list, CompareFunction compare);
TEKIT_API void TEKIT_STDCALL ListInsertionSort(ListType list, CompareFunction compare);

} // extern "C"
