// The sorted indexes behind Ini_SortInternally: the names of a section's items (or of the
// object's sections) in byte order, for binary search, while the lists keep file order.
//
// Names in a configuration file share long beginnings ("Measurement001", "Measurement002"),
// which make every comparison of a plain search walk the same bytes again. So an index keeps
// the length of a beginning that all its names share, and with each entry the next 8 bytes of
// the name as one big-endian integer (its head): two names compare as their heads do, and only
// names whose heads are equal are compared further, from the byte after the head. A search
// thus compares integers held in the index itself and touches a name's text about once.
#pragma once

#include "tekit/toolbox/List.h"
#include "toolbox/ListBlock.h"

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <string.h> // strnlen

namespace tekit::ini {

/// One entry: the name's head and what it names (an item position or a section pointer).
struct IndexEntry {
    std::uint64_t head;
    std::intptr_t value;
};

/// A list of IndexEntry in name order (names that are equal in list order), and the length of
/// a beginning that every indexed name has.
struct SortedIndex {
    ListType list = nullptr;
    std::uint32_t prefix = 0;
};

namespace index_detail {

/// The name as the index compares it: the head, whether the name ends within the head, and
/// the rest after the head.
struct Key {
    std::uint64_t head = 0;
    bool complete = false;
    char const* rest = nullptr;
};

/// The key of `name`, which is at least `prefix` bytes long.
inline Key KeyOf(char const* name, std::uint32_t prefix) {
    Key key;
    char const* p = name + prefix;
    int i = 0;
    for (; i < 8 && p[i]; ++i)
        key.head |= std::uint64_t(static_cast<unsigned char>(p[i])) << (56 - 8 * i);
    key.complete = i < 8;
    key.rest = key.complete ? nullptr : p + 8;
    return key;
}

/// The order of the entry's name against `key`: <0, 0 or >0. The name's text is read only when
/// the heads are equal.
template <class NameOf>
int Compare(IndexEntry const& entry, NameOf const& nameOf, std::uint32_t prefix, Key const& key) {
    if (entry.head != key.head)
        return entry.head < key.head ? -1 : 1;
    return key.complete ? 0 : std::strcmp(nameOf(entry.value) + prefix + 8, key.rest);
}

inline IndexEntry* Entries(SortedIndex const& index) {
    return toolbox::ItemsAs<IndexEntry>(index.list);
}

inline std::int32_t Count(SortedIndex const& index) {
    return toolbox::ItemCountOf(index.list);
}

inline std::uint32_t CommonLength(char const* a, char const* b, std::uint32_t limit) {
    std::uint32_t n = 0;
    while (n < limit && a[n] && a[n] == b[n])
        ++n;
    return n;
}

/// The first position in `count` elements at which `less(position)` is false.
template <class Less> std::int32_t LowerBound(std::int32_t count, Less less) {
    std::int32_t low = 0, high = count;
    while (low < high) {
        std::int32_t const middle = low + (high - low) / 2;
        if (less(middle))
            low = middle + 1;
        else
            high = middle;
    }
    return low;
}

/// Makes `prefix` a beginning that `name` has too, recomputing every head when it shrinks.
template <class NameOf> void FitPrefix(SortedIndex& index, char const* name, NameOf const& nameOf) {
    IndexEntry* const entries = Entries(index);
    std::int32_t const count = Count(index);
    if (count == 0) {
        index.prefix = static_cast<std::uint32_t>(std::strlen(name));
        return;
    }
    std::uint32_t const common = CommonLength(name, nameOf(entries[0].value), index.prefix);
    if (common == index.prefix)
        return;
    index.prefix = common;
    for (std::int32_t i = 0; i < count; ++i)
        entries[i].head = KeyOf(nameOf(entries[i].value), common).head;
}

} // namespace index_detail

/// What entry `at` names.
inline std::intptr_t IndexValueAt(SortedIndex const& index, std::int32_t at) {
    return index_detail::Entries(index)[at].value;
}

/// Looks `name` up: the first entry whose name is not below it, and whether that entry's name
/// is `name`. When `name` does not begin as every indexed name does, it is not found and the
/// position returned means nothing.
template <class NameOf>
std::int32_t IndexFind(SortedIndex const& index, char const* name, NameOf const& nameOf,
                       bool& found) {
    using namespace index_detail;
    found = false;
    IndexEntry const* const entries = Entries(index);
    std::int32_t const count = Count(index);
    if (count == 0 || ::strnlen(name, index.prefix) < index.prefix)
        return count;
    // The shared beginning is not compared here: a name without it finds a wrong place, and
    // the last comparison, of the whole names, then fails. That keeps a search to the index's
    // own memory and the text of the one name it finds.
    Key const key = KeyOf(name, index.prefix);
    // The first head not below the key's, without branches the processor could mispredict.
    IndexEntry const* base = entries;
    for (std::int32_t n = count; n > 1;) {
        std::int32_t const half = n / 2;
        base = base[half].head < key.head ? base + half : base;
        n -= half;
    }
    std::int32_t at = static_cast<std::int32_t>(base - entries) + (base->head < key.head ? 1 : 0);
    if (!key.complete && at < count && entries[at].head == key.head) {
        // Names with this head follow in order of the rest of their text.
        std::int32_t end = at;
        while (end < count && entries[end].head == key.head)
            ++end;
        at += LowerBound(end - at, [&](std::int32_t i) {
            return std::strcmp(nameOf(entries[at + i].value) + index.prefix + 8, key.rest) < 0;
        });
    }
    found = at < count && entries[at].head == key.head &&
            std::strcmp(nameOf(entries[at].value), name) == 0;
    return at;
}

/// Builds the index of `count` values, `valueAt(i)` in list order, stable by name. False,
/// with no index, when memory is exhausted.
template <class ValueAt, class NameOf>
bool IndexBuild(SortedIndex& index, std::int32_t count, ValueAt const& valueAt,
                NameOf const& nameOf) {
    using namespace index_detail;
    ListDispose(index.list);
    index = SortedIndex{};
    ListType const list = ListCreate(sizeof(IndexEntry));
    if (!list || (count > 0 && !ListInsertItems(list, nullptr, LIST_POS_END, count))) {
        ListDispose(list);
        return false;
    }
    auto* const entries = static_cast<IndexEntry*>(ListGetDataPtr(list));
    std::uint32_t prefix = 0;
    if (count > 0) {
        char const* const first = nameOf(valueAt(0));
        prefix = static_cast<std::uint32_t>(std::strlen(first));
        for (std::int32_t i = 1; i < count && prefix > 0; ++i)
            prefix = CommonLength(first, nameOf(valueAt(i)), prefix);
    }
    for (std::int32_t i = 0; i < count; ++i)
        entries[i] = {KeyOf(nameOf(valueAt(i)), prefix).head, valueAt(i)};
    std::stable_sort(entries, entries + count, [&](IndexEntry const& a, IndexEntry const& b) {
        return a.head != b.head ? a.head < b.head
                                : Compare(a, nameOf, prefix, KeyOf(nameOf(b.value), prefix)) < 0;
    });
    index.list = list;
    index.prefix = prefix;
    return true;
}

/// Inserts `value` named `name`: after the entries of an equal name for which
/// `comesBefore(entryValue)` holds, before the others. False on exhaustion.
template <class NameOf, class ComesBefore>
bool IndexInsert(SortedIndex& index, std::intptr_t value, char const* name, NameOf const& nameOf,
                 ComesBefore const& comesBefore) {
    using namespace index_detail;
    FitPrefix(index, name, nameOf);
    IndexEntry* const entries = Entries(index);
    Key const key = KeyOf(name, index.prefix);
    std::int32_t const at = LowerBound(Count(index), [&](std::int32_t i) {
        int const order = Compare(entries[i], nameOf, index.prefix, key);
        return order < 0 || (order == 0 && comesBefore(entries[i].value));
    });
    IndexEntry const entry{key.head, value};
    return ListInsertItem(index.list, &entry, at + 1) != 0;
}

/// Removes the entry of `value`, named `name`.
template <class NameOf>
void IndexRemove(SortedIndex& index, std::intptr_t value, char const* name, NameOf const& nameOf) {
    bool found = false;
    IndexEntry const* const entries = index_detail::Entries(index);
    std::int32_t const count = index_detail::Count(index);
    for (std::int32_t i = IndexFind(index, name, nameOf, found); i < count; ++i)
        if (entries[i].value == value) {
            ListRemoveItem(index.list, nullptr, i + 1);
            return;
        }
}

} // namespace tekit::ini
