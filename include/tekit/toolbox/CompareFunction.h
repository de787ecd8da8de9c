// CompareFunction: the comparison callback that the toolbox's lists, sorts and searches take.
//
//   static int TEKIT_CDECL ByValue(void const* key, void const* item) {
//       int const a = *static_cast<int const*>(key), b = *static_cast<int const*>(item);
//       return a < b ? -1 : a > b;
//   }
//   ListInsertInOrder(list, &value, ByValue);
//
// The first argument is the key (or the new item), the second an item already held; the result
// is negative, 0 or positive. Callbacks use the caller-cleans convention on 32-bit Windows.
// Wherever a callback is null, items are compared byte by byte as unsigned bytes over the item
// size (the order of memcmp).
#pragma once

#include "tekit/Export.h"

extern "C" {
typedef int(TEKIT_CDECL* CompareFunction)(void const* key, void const* item);
}
