// The list functions that compare items or call back: search, ordered insertion, duplicates,
// the walk over every item, and sorting. A callback that throws ends the call with its
// failure result; the exception does not reach the caller.
#include "toolbox/BinarySearch.h"
#include "toolbox/FlatGuard.h"
#include "toolbox/ListBlock.h"

#include "tekit/toolbox/Sort.h"

#include <cstdint>

using namespace tekit::toolbox;

namespace {

void* ItemAt(ListHeader* header, std::int32_t index) {
    return ItemsOf(header) + std::size_t(index) * std::size_t(header->itemSize);
}

/// The index of the first item from `start` on equal to `item`, -1 when none is; may throw.
std::int32_t FindFrom(ListHeader* header, void const* item, std::int32_t start,
                      CompareFunction compare) {
    for (std::int32_t i = start; i < header->numItems; ++i)
        if (CompareItems(compare, item, ItemAt(header, i), header->itemSize) == 0)
            return i;
    return -1;
}

} // namespace

extern "C" std::int32_t TEKIT_STDCALL ListFindItem(ListType list, void const* item,
                                                   std::int32_t startPosition,
                                                   CompareFunction compare) {
    ListHeader* header = HeaderOf(list);
    std::int32_t const start = header && item ? ItemIndex(*header, startPosition) : -1;
    if (start < 0)
        return 0;
    return Guarded(0, [&] { return FindFrom(header, item, start, compare) + 1; });
}

extern "C" std::int32_t TEKIT_STDCALL ListInsertBeforeItem(ListType list, void const* newItem,
                                                           void const* existingItem,
                                                           CompareFunction compare) {
    std::int32_t const found = ListFindItem(list, existingItem, LIST_POS_FRONT, compare);
    return ListInsertItem(list, newItem, found ? found : LIST_POS_FRONT);
}

extern "C" std::int32_t TEKIT_STDCALL ListInsertAfterItem(ListType list, void const* newItem,
                                                          void const* existingItem,
                                                          CompareFunction compare) {
    std::int32_t const found = ListFindItem(list, existingItem, LIST_POS_FRONT, compare);
    return ListInsertItem(list, newItem, found ? found + 1 : LIST_POS_END);
}

extern "C" std::int32_t TEKIT_STDCALL ListBinSearch(ListType list, void const* item,
                                                    CompareFunction compare) {
    ListHeader* header = HeaderOf(list);
    if (!header)
        return 0;
    std::int32_t const index =
        BinSearch(ItemsOf(header), header->numItems, header->itemSize, item, compare);
    return index >= 0 ? index + 1 : 0;
}

// Before an equal item found, else at the insertion point. A null item cannot be searched for
// and is refused; a callback that throws inserts nothing.
extern "C" std::int32_t TEKIT_STDCALL ListInsertInOrder(ListType list, void const* item,
                                                        CompareFunction compare) {
    ListHeader* header = HeaderOf(list);
    if (!header || !item)
        return 0;
    if (header->numItems == 0)
        return ListInsertItem(list, item, LIST_POS_FRONT);
    return Guarded(0, [&] {
        std::int32_t const index = SearchSorted(ItemsOf(header), header->numItems,
                                                std::size_t(header->itemSize), item, compare);
        std::int32_t const position = index >= 0 ? index + 1 : -index;
        return ListInsertItem(list, item, position > header->numItems ? LIST_POS_END : position);
    });
}

extern "C" std::int32_t TEKIT_STDCALL ListIsSorted(ListType list, CompareFunction compare) {
    ListHeader* header = HeaderOf(list);
    if (!header)
        return 0;
    return Guarded(0, [&] {
        for (std::int32_t i = 1; i < header->numItems; ++i)
            if (CompareItems(compare, ItemAt(header, i - 1), ItemAt(header, i), header->itemSize) >
                0)
                return 0;
        return 1;
    });
}

// Quadratic, as simple as it reads: each item's later equals are found and removed in turn.
extern "C" void TEKIT_STDCALL ListRemoveDuplicates(ListType list, CompareFunction compare) {
    ListHeader* header = HeaderOf(list);
    if (!header)
        return;
    Guarded([&] {
        for (std::int32_t i = 1; i < header->numItems; ++i) {
            void const* item = ItemAt(header, i - 1);
            for (std::int32_t at; (at = FindFrom(header, item, i, compare)) >= 0;)
                ListRemoveItem(list, nullptr, at + 1);
        }
    });
}

// The item pointer is fetched afresh for every call: a callback that inserts may move the
// block. Walking up, the count is read again each time, so appended items are visited.
extern "C" std::int32_t TEKIT_STDCALL ListApplyToEach(ListType list, std::int32_t ascending,
                                                      ListApplyFunction callback,
                                                      void* callbackData) {
    if (!HeaderOf(list) || !callback)
        return 0;
    return Guarded(0, [&] {
        std::int32_t result = 0;
        if (ascending) {
            for (std::int32_t position = 1; position <= ListNumItems(list); ++position)
                if ((result = callback(position, ListGetPtrToItem(list, position), callbackData)) <
                    0)
                    break;
        } else {
            for (std::int32_t position = ListNumItems(list);
                 position >= 1 && position <= ListNumItems(list); --position)
                if ((result = callback(position, ListGetPtrToItem(list, position), callbackData)) <
                    0)
                    break;
        }
        return result;
    });
}

namespace {

void SortList(ListType list, CompareFunction compare,
              std::int32_t(TEKIT_STDCALL* sort)(void*, std::int32_t, std::int32_t,
                                                CompareFunction)) {
    if (ListHeader* header = HeaderOf(list); header && header->numItems > 0)
        sort(ItemsOf(header), header->numItems, header->itemSize, compare);
}

} // namespace

extern "C" void TEKIT_STDCALL ListHeapSort(ListType list, CompareFunction compare) {
    SortList(list, compare, HeapSort);
}

extern "C" void TEKIT_STDCALL ListQuickSort(ListType list, CompareFunction compare) {
    SortList(list, compare, QuickSort);
}

extern "C" void TEKIT_STDCALL ListInsertionSort(ListType list, CompareFunction compare) {
    SortList(list, compare, InsertionSort);
}
