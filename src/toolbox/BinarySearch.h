// The binary search shared by BinSearch, ListBinSearch and ListInsertInOrder.
#pragma once

#include "tekit/toolbox/CompareFunction.h"

#include <cstddef>
#include <cstdint>

namespace tekit::toolbox {

/// The index of an item equal to `key` among `numItems` sorted items, or -(insertion index) - 1.
/// Ranges of 7 or more entries are halved at their middle, shorter ones probed at their low
/// end. An exception of `compare` passes through.
std::int32_t SearchSorted(void const* items, std::int32_t numItems, std::size_t itemSize,
                          void const* key, CompareFunction compare);

} // namespace tekit::toolbox
