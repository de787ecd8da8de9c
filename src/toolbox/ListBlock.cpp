// Creation, growth and the simple accessors of lists.
#include "toolbox/ListBlock.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <limits>

namespace tekit::toolbox {

std::uint32_t ListBlockSize(std::int64_t capacity, std::int32_t itemSize) {
    if (capacity < 0 || capacity > std::numeric_limits<std::int32_t>::max() || itemSize < 1)
        return 0;
    std::uint64_t const size = sizeof(ListHeader) +
                               static_cast<std::uint64_t>(capacity) * std::uint64_t(itemSize) +
                               kListSpareBytes;
    return size <= std::numeric_limits<std::uint32_t>::max() ? std::uint32_t(size) : 0;
}

std::int32_t GrowList(ListType list, std::int32_t k) {
    ListHeader const* header = HeaderOf(list);
    if (!header)
        return 0;
    std::int64_t added = k;
    if (k <= 0) {
        // (100 + percent) percent of the capacity, not percent of it: a little more than
        // doubling. A policy that would give a negative amount gives none, so growth never
        // shrinks the block below what an insertion is about to use.
        std::int64_t const amount = std::max<std::int64_t>(
            (100 + std::int64_t(header->percentIncrease)) * header->capacity / 100,
            header->minItemsPerAlloc);
        added = std::max<std::int64_t>(amount, 0) - std::int64_t(k);
    }
    if (added == 0)
        return 1;
    std::uint32_t const size = ListBlockSize(header->capacity + added, header->itemSize);
    if (size == 0 || !SetHandleSize(list, size))
        return 0;
    static_cast<ListHeader*>(list->block)->capacity += std::int32_t(added);
    return 1;
}

bool OverlapsBlock(ListType list, void const* bytes, std::size_t length) {
    auto const start = reinterpret_cast<std::uintptr_t>(bytes);
    auto const block = reinterpret_cast<std::uintptr_t>(list->block);
    return length > 0 && start < block + list->size && block < start + length;
}

int CompareItems(CompareFunction compare, void const* key, void const* item, std::size_t size) {
    return compare ? compare(key, item) : std::memcmp(key, item, size);
}

} // namespace tekit::toolbox

using namespace tekit::toolbox;

extern "C" ListType TEKIT_STDCALL ListCreate(std::int32_t itemSize) {
    if (itemSize < 1)
        return nullptr;
    ListType const list = NewHandle(ListBlockSize(0, itemSize));
    if (!list)
        return nullptr;
    *static_cast<ListHeader*>(list->block) = {
        kListMagic, kDefaultPercentIncrease, kDefaultMinItemsPerAlloc, 0, itemSize, 0};
    return list;
}

extern "C" void TEKIT_STDCALL ListDispose(ListType list) {
    DisposeHandle(list);
}

// An item smaller than a pointer cannot hold one: such a list is freed without its items.
extern "C" void TEKIT_STDCALL ListDisposePtrList(ListType list) {
    if (ListHeader* header = HeaderOf(list);
        header && std::size_t(header->itemSize) >= sizeof(void*)) {
        for (std::int32_t i = 0; i < header->numItems; ++i) {
            void* pointer;
            std::memcpy(&pointer, ItemsOf(header) + std::size_t(i) * header->itemSize,
                        sizeof pointer);
            std::free(pointer);
        }
    }
    DisposeHandle(list);
}

extern "C" void TEKIT_STDCALL ListClear(ListType list) {
    if (ListHeader* header = HeaderOf(list))
        header->numItems = 0;
}

extern "C" std::int32_t TEKIT_STDCALL ListNumItems(ListType list) {
    ListHeader const* header = HeaderOf(list);
    return header ? header->numItems : 0;
}

extern "C" std::int32_t TEKIT_STDCALL ListGetItemSize(ListType list) {
    ListHeader const* header = HeaderOf(list);
    return header ? header->itemSize : 0;
}

extern "C" void* TEKIT_STDCALL ListGetDataPtr(ListType list) {
    ListHeader* header = HeaderOf(list);
    return header ? ItemsOf(header) : nullptr;
}

extern "C" void* TEKIT_STDCALL ListGetPtrToItem(ListType list, std::int32_t position) {
    ListHeader* header = HeaderOf(list);
    std::int32_t const index = header ? ItemIndex(*header, position) : -1;
    return index < 0 ? nullptr : ItemsOf(header) + std::size_t(index) * header->itemSize;
}

extern "C" std::int32_t TEKIT_STDCALL ListPreAllocate(ListType list, std::int32_t numItems) {
    ListHeader const* header = HeaderOf(list);
    if (!header)
        return 0;
    std::int64_t const room = std::int64_t(header->capacity) - header->numItems;
    if (room >= numItems)
        return 1;
    std::int64_t const missing = numItems - room;
    return missing <= std::numeric_limits<std::int32_t>::max()
               ? GrowList(list, std::int32_t(missing))
               : 0;
}

extern "C" void TEKIT_STDCALL ListSetAllocationPolicy(ListType list, std::int32_t minItemsPerAlloc,
                                                      std::int32_t percentIncrease) {
    if (ListHeader* header = HeaderOf(list)) {
        header->minItemsPerAlloc = minItemsPerAlloc;
        header->percentIncrease = percentIncrease;
    }
}

extern "C" void TEKIT_STDCALL ListCompact(ListType list) {
    ListHeader const* header = HeaderOf(list);
    if (!header || header->capacity == header->numItems)
        return;
    std::int32_t const numItems = header->numItems;
    if (SetHandleSize(list, ListBlockSize(numItems, header->itemSize)))
        static_cast<ListHeader*>(list->block)->capacity = numItems;
}

extern "C" ListType TEKIT_STDCALL ListCopy(ListType list) {
    ListHeader const* header = HeaderOf(list);
    if (!header)
        return nullptr;
    ListType const copy = NewHandle(ListBlockSize(header->numItems, header->itemSize));
    if (!copy)
        return nullptr;
    std::memcpy(copy->block, header,
                sizeof(ListHeader) + std::size_t(header->numItems) * header->itemSize);
    static_cast<ListHeader*>(copy->block)->capacity = header->numItems;
    return copy;
}
