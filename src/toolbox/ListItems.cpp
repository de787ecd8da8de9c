// Insertion, removal, copying and comparison of list items.
#include "toolbox/ListBlock.h"

#include <cstdint>
#include <cstring>
#include <limits>

using namespace tekit::toolbox;

namespace {

/// The 0-based start of a run of `count` existing items beginning at `position`; -1 when the
/// run does not lie wholly inside the list.
std::int32_t RunStart(ListHeader const& header, std::int32_t position, std::int32_t count) {
    if (count < 1 || count > header.numItems)
        return -1;
    std::int32_t const start = ItemIndex(header, position);
    return start >= 0 && std::int64_t(start) + count <= header.numItems ? start : -1;
}

std::size_t Bytes(ListHeader const& header, std::int64_t count) {
    return std::size_t(count) * std::size_t(header.itemSize);
}

/// Copies `count` items into their slots, or zeroes them. One int or pointer, the common case
/// of appending, is a single store.
void FillSlots(char* slot, void const* items, std::size_t bytes) {
    if (!items)
        std::memset(slot, 0, bytes);
    else if (bytes == 4)
        std::memcpy(slot, items, 4);
    else if (bytes == 8)
        std::memcpy(slot, items, 8);
    else
        std::memcpy(slot, items, bytes);
}

// The capacity check covers the whole run (numItems + count), not only numItems, so that a
// multi-item insertion into a list with a little spare room never writes past the block; it
// grows with k = -count, which for single items is the usual policy step plus one.
//
// A source inside the list's own block is refused: growth may move the block under it.
std::int32_t Insert(ListType list, void const* items, std::int32_t position, std::int32_t count) {
    ListHeader const* header = HeaderOf(list);
    if (!header || count < 1)
        return 0;
    std::int32_t const numItems = header->numItems;
    if (position == numItems + 1)
        position = LIST_POS_END;
    if (position > numItems || position < LIST_POS_FRONT ||
        std::int64_t(numItems) + count > std::numeric_limits<std::int32_t>::max())
        return 0;
    std::uint64_t const length = std::uint64_t(count) * std::uint64_t(header->itemSize);
    if (items && length <= SIZE_MAX && OverlapsBlock(list, items, std::size_t(length)))
        return 0;
    if (std::int64_t(numItems) + count > header->capacity && !GrowList(list, -count))
        return 0;

    ListHeader* grown = HeaderOf(list);
    std::int32_t at = position - 1;
    if (position == LIST_POS_END || (position == LIST_POS_FRONT && numItems == 0))
        at = numItems;
    else if (position == LIST_POS_FRONT)
        at = 0;
    char* const slot = ItemsOf(grown) + Bytes(*grown, at);
    if (at < numItems)
        std::memmove(slot + Bytes(*grown, count), slot, Bytes(*grown, numItems - at));
    FillSlots(slot, items, Bytes(*grown, count));
    grown->numItems += count;
    return 1;
}

} // namespace

extern "C" std::int32_t TEKIT_STDCALL ListInsertItems(ListType list, void const* items,
                                                      std::int32_t position, std::int32_t count) {
    return Insert(list, items, position, count);
}

extern "C" std::int32_t TEKIT_STDCALL ListInsertItem(ListType list, void const* item,
                                                     std::int32_t position) {
    return Insert(list, item, position, 1);
}

// A destination inside the block is refused: the tail's move would overwrite what was copied.
extern "C" void TEKIT_STDCALL ListRemoveItems(ListType list, void* dest, std::int32_t position,
                                              std::int32_t count) {
    ListHeader* header = HeaderOf(list);
    std::int32_t const start = header ? RunStart(*header, position, count) : -1;
    if (start < 0 || (dest && OverlapsBlock(list, dest, Bytes(*header, count))))
        return;
    char* const run = ItemsOf(header) + Bytes(*header, start);
    if (dest)
        std::memcpy(dest, run, Bytes(*header, count));
    std::memmove(run, run + Bytes(*header, count),
                 Bytes(*header, header->numItems - start - count));
    header->numItems -= count;
}

extern "C" void TEKIT_STDCALL ListRemoveItem(ListType list, void* dest, std::int32_t position) {
    ListRemoveItems(list, dest, position, 1);
}

// Getting and replacing never move the block, so an overlapping buffer is copied as if through
// a temporary (memmove) rather than refused.
extern "C" void TEKIT_STDCALL ListGetItems(ListType list, void* dest, std::int32_t position,
                                           std::int32_t count) {
    ListHeader* header = HeaderOf(list);
    std::int32_t const start = header && dest ? RunStart(*header, position, count) : -1;
    if (start >= 0)
        std::memmove(dest, ItemsOf(header) + Bytes(*header, start), Bytes(*header, count));
}

extern "C" void TEKIT_STDCALL ListGetItem(ListType list, void* dest, std::int32_t position) {
    ListGetItems(list, dest, position, 1);
}

extern "C" void TEKIT_STDCALL ListReplaceItems(ListType list, void const* items,
                                               std::int32_t position, std::int32_t count) {
    ListHeader* header = HeaderOf(list);
    std::int32_t const start = header && items ? RunStart(*header, position, count) : -1;
    if (start >= 0)
        std::memmove(ItemsOf(header) + Bytes(*header, start), items, Bytes(*header, count));
}

extern "C" void TEKIT_STDCALL ListReplaceItem(ListType list, void const* item,
                                              std::int32_t position) {
    ListReplaceItems(list, item, position, 1);
}

// Appending a list to itself doubles it: the count is taken before the resize, and the copy
// reads the (possibly moved) block afterwards.
extern "C" std::int32_t TEKIT_STDCALL ListAppend(ListType list, ListType other) {
    ListHeader const* source = HeaderOf(other);
    if (!source || source->numItems == 0)
        return 1;
    ListHeader const* header = HeaderOf(list);
    if (!header || header->itemSize != source->itemSize)
        return 0;
    std::int32_t const numItems = header->numItems, added = source->numItems;
    std::uint32_t const size = ListBlockSize(std::int64_t(numItems) + added, header->itemSize);
    if (size == 0 || !SetHandleSize(list, size))
        return 0;
    ListHeader* target = HeaderOf(list);
    std::memcpy(ItemsOf(target) + Bytes(*target, numItems), ItemsOf(HeaderOf(other)),
                Bytes(*target, added));
    target->numItems = target->capacity = numItems + added;
    return 1;
}

// Two empty lists are equal whatever their item sizes: only the item bytes are compared.
extern "C" std::int32_t TEKIT_STDCALL ListEqual(ListType list, ListType other) {
    if (list == other)
        return 1;
    ListHeader* a = HeaderOf(list);
    ListHeader* b = HeaderOf(other);
    if (!a || !b || a->numItems != b->numItems)
        return 0;
    std::size_t const bytes = Bytes(*a, a->numItems);
    return bytes == Bytes(*b, b->numItems) && std::memcmp(ItemsOf(a), ItemsOf(b), bytes) == 0;
}
