// The list block header and the growth policy shared by the list functions.
#pragma once

#include "tekit/toolbox/List.h"

#include <cstddef>
#include <cstdint>

namespace tekit::toolbox {

/// The six 32-bit fields at the front of a list's block; the items follow directly.
struct ListHeader {
    std::uint32_t magic;
    std::int32_t percentIncrease;
    std::int32_t minItemsPerAlloc;
    std::int32_t capacity;
    std::int32_t itemSize;
    std::int32_t numItems;
};
static_assert(sizeof(ListHeader) == 24);

/// "LIST" read as one big-endian 32-bit value.
inline constexpr std::uint32_t kListMagic = 0x4C495354;
/// Bytes kept after the last item slot.
inline constexpr std::uint32_t kListSpareBytes = 4;
inline constexpr std::int32_t kDefaultPercentIncrease = 10;
inline constexpr std::int32_t kDefaultMinItemsPerAlloc = 4;

/// The header of `list`, or null when it is null or its block is not a list block.
inline ListHeader* HeaderOf(ListType list) {
    if (!list || !list->block || list->size < sizeof(ListHeader) + kListSpareBytes)
        return nullptr;
    auto* header = static_cast<ListHeader*>(list->block);
    return header->magic == kListMagic ? header : nullptr;
}

inline char* ItemsOf(ListHeader* header) {
    return reinterpret_cast<char*>(header + 1);
}

/// The items of `list` as an array of `T`, reached without a call; null when `list` is no
/// list block.
template <class T> T* ItemsAs(ListType list) {
    ListHeader* const header = HeaderOf(list);
    return header ? reinterpret_cast<T*>(ItemsOf(header)) : nullptr;
}

/// How many items `list` holds; 0 when it is no list block.
inline std::int32_t ItemCountOf(ListType list) {
    ListHeader* const header = HeaderOf(list);
    return header ? header->numItems : 0;
}

/// The 0-based index of an existing item at `position` (LIST_POS_FRONT, LIST_POS_END or 1 to
/// numItems); -1 when there is no such item.
inline std::int32_t ItemIndex(ListHeader const& header, std::int32_t position) {
    if (header.numItems == 0 || position < LIST_POS_FRONT || position > header.numItems)
        return -1;
    if (position == LIST_POS_FRONT)
        return 0;
    return position == LIST_POS_END ? header.numItems - 1 : position - 1;
}

/// The block size for `capacity` items; 0 when it does not fit a handle's 32-bit size.
std::uint32_t ListBlockSize(std::int64_t capacity, std::int32_t itemSize);

/// The growth step: k == 0 adds the policy's amount, k < 0 that amount plus -k slots, k > 0
/// exactly k slots. Returns 1, or 0 with the list unchanged when the resize fails.
std::int32_t GrowList(ListType list, std::int32_t k);

/// True when [bytes, bytes + length) shares a byte with the list's block.
bool OverlapsBlock(ListType list, void const* bytes, std::size_t length);

/// compare(key, item), or the byte order over `size` bytes when compare is null.
int CompareItems(CompareFunction compare, void const* key, void const* item, std::size_t size);

} // namespace tekit::toolbox
