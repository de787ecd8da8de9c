// The INI object's sections and items: lookup through the section cache, the sorted indexes or
// binary search, insertion and removal that keep the indexes true, sorting, and the arena.
#include "ini/IniObject.h"

#include "ini/IniIndex.h"
#include "ini/IniText.h"
#include "platform/Heap.h"

#include <algorithm>
#include <cstring>
#include <new>

namespace tekit::ini {

// ---- Arena ----------------------------------------------------------------------------------

struct Arena::Chunk {
    Chunk* next;
};

Arena::~Arena() {
    while (m_chunks) {
        Chunk* const next = m_chunks->next;
        platform::HeapFree(m_chunks);
        m_chunks = next;
    }
}

char* Arena::AllocateSlow(std::size_t size) {
    constexpr std::size_t kMaxChunk = std::size_t(1) << 20;
    if (size > static_cast<std::size_t>(-1) - sizeof(Chunk))
        return nullptr;
    // A block of more than half a chunk gets a chunk of its own; the current one stays in use.
    bool const ownChunk = size > m_nextChunkSize / 2;
    std::size_t const chunkSize = ownChunk ? size : m_nextChunkSize;
    auto* const chunk = static_cast<Chunk*>(platform::HeapAllocate(sizeof(Chunk) + chunkSize));
    if (!chunk)
        return nullptr;
    chunk->next = m_chunks;
    m_chunks = chunk;
    char* const start = reinterpret_cast<char*>(chunk + 1);
    if (ownChunk)
        return start;
    m_nextChunkSize = std::min(m_nextChunkSize * 2, kMaxChunk);
    m_next = start + size;
    m_left = chunkSize - size;
    return start;
}

// ---- Names ----------------------------------------------------------------------------------

int CompareNames(char const* a, char const* b) {
    return std::strcmp(a, b);
}

namespace {

using index_detail::LowerBound;

/// The name of an item-index entry: the tag of the item at its position.
struct ItemName {
    Item const* items;
    char const* operator()(std::intptr_t position) const { return items[position].tag; }
};

/// The name of a section-index entry.
char const* SectionName(std::intptr_t section) {
    return reinterpret_cast<IniSectionRec const*>(section)->name;
}

bool HasIndex(SortedIndex const& index) {
    return index.list != nullptr;
}

void DropItemIndex(IniSectionRec& section) {
    ListDispose(section.index.list);
    section.index = SortedIndex{};
}

/// Records the item just inserted at `position` in the section's index (the entries at or
/// after it move up by one first). A failed insertion drops the index: lookups then search the
/// list.
void IndexInsertItem(IniSectionRec& section, std::int32_t position) {
    if (!HasIndex(section.index))
        return;
    auto* const entries = static_cast<IndexEntry*>(ListGetDataPtr(section.index.list));
    std::int32_t const count = ListNumItems(section.index.list);
    for (std::int32_t i = 0; i < count; ++i)
        if (entries[i].value >= position)
            ++entries[i].value;
    Item const* items = ItemsOf(section);
    if (!IndexInsert(section.index, position, items[position].tag, ItemName{items},
                     [position](std::intptr_t value) { return value < position; }))
        DropItemIndex(section);
}

/// Forgets the item at `position`, which is about to be removed, in the section's index (the
/// entries after it move down by one).
void IndexRemoveItem(IniSectionRec& section, std::int32_t position) {
    if (!HasIndex(section.index))
        return;
    Item const* items = ItemsOf(section);
    IndexRemove(section.index, position, items[position].tag, ItemName{items});
    auto* const entries = static_cast<IndexEntry*>(ListGetDataPtr(section.index.list));
    std::int32_t const count = ListNumItems(section.index.list);
    for (std::int32_t i = 0; i < count; ++i)
        if (entries[i].value > position)
            --entries[i].value;
}

bool BuildItemIndex(IniSectionRec& section) {
    Item const* items = ItemsOf(section);
    return IndexBuild(
        section.index, ItemCount(section), [](std::int32_t i) { return std::intptr_t(i); },
        ItemName{items});
}

void RemoveItemAt(IniSectionRec& section, std::int32_t position) {
    IndexRemoveItem(section, position);
    FreeItemBlock(ItemsOf(section)[position]);
    ListRemoveItem(section.items, nullptr, position + 1);
}

std::int32_t SectionPosition(IniObjectRec const& ini, IniSectionRec const* section) {
    IniSectionRec* const* sections = SectionsOf(ini);
    std::int32_t const count = SectionCount(ini);
    for (std::int32_t i = 0; i < count; ++i)
        if (sections[i] == section)
            return i;
    return -1;
}

void RememberSection(IniObjectRec& ini, IniSectionRec* section) {
    if (ini.cache[0] == section)
        return;
    ini.cache[2] = ini.cache[1] == section ? ini.cache[2] : ini.cache[1];
    ini.cache[1] = ini.cache[0];
    ini.cache[0] = section;
}

/// Adds `section` to the section index in name order, after the sections of the same name.
bool IndexSection(IniObjectRec& ini, IniSectionRec* section) {
    if (!HasIndex(ini.sectionIndex))
        return true;
    return IndexInsert(ini.sectionIndex, reinterpret_cast<std::intptr_t>(section), section->name,
                       SectionName, [](std::intptr_t) { return true; });
}

} // namespace

// ---- Sections -------------------------------------------------------------------------------

void ClearSectionCache(IniObjectRec& ini) {
    ini.cache[0] = ini.cache[1] = ini.cache[2] = nullptr;
}

IniSectionRec* FindSection(IniObjectRec& ini, char const* name) {
    // The cache's names are often alike up to their last bytes: length and last byte first.
    std::size_t const length = std::strlen(name);
    for (IniSectionRec* cached : ini.cache)
        if (cached && cached->nameLength == length &&
            (length == 0 || cached->name[length - 1] == name[length - 1]) &&
            std::memcmp(cached->name, name, length) == 0) {
            RememberSection(ini, cached);
            return cached;
        }
    IniSectionRec* found = nullptr;
    if (HasIndex(ini.sectionIndex)) {
        bool equal = false;
        std::int32_t const at = IndexFind(ini.sectionIndex, name, SectionName, equal);
        if (equal)
            found = reinterpret_cast<IniSectionRec*>(IndexValueAt(ini.sectionIndex, at));
    } else if (ini.keepSorted) {
        IniSectionRec* const* sections = SectionsOf(ini);
        std::int32_t const count = SectionCount(ini);
        std::int32_t const at = LowerBound(
            count, [&](std::int32_t i) { return CompareNames(sections[i]->name, name) < 0; });
        if (at < count && CompareNames(sections[at]->name, name) == 0)
            found = sections[at];
    } else {
        IniSectionRec* const* sections = SectionsOf(ini);
        std::int32_t const count = SectionCount(ini);
        for (std::int32_t i = 0; i < count; ++i)
            if (CompareNames(sections[i]->name, name) == 0) {
                found = sections[i];
                break;
            }
    }
    if (found)
        RememberSection(ini, found);
    return found;
}

IniSectionRec* AddSection(IniObjectRec& ini, char const* name, std::size_t length,
                          std::int32_t line, bool inArena) {
    auto* const section = new (std::nothrow) IniSectionRec;
    if (!section)
        return nullptr;
    section->line = line;
    section->nameOwned = !inArena;
    section->name = inArena ? ini.arena.Allocate(length + 1)
                            : static_cast<char*>(platform::HeapAllocate(length + 1));
    section->items = ListCreate(sizeof(Item));
    if (!section->name || !section->items) {
        FreeSection(section);
        return nullptr;
    }
    std::memcpy(section->name, name, length);
    section->name[length] = '\0';
    section->nameLength = length;
    // A read appends in file order (and sorts at its end); a put keeps the order it finds.
    std::int32_t position = LIST_POS_END;
    if (!inArena && ini.keepSorted) {
        section->keepSorted = true;
        IniSectionRec* const* sections = SectionsOf(ini);
        position = 1 + LowerBound(SectionCount(ini), [&](std::int32_t i) {
                       return CompareNames(sections[i]->name, section->name) <= 0;
                   });
    }
    if (!ListInsertItem(ini.sections, &section, position)) {
        FreeSection(section);
        return nullptr;
    }
    if (HasIndex(ini.sectionIndex) && (!IndexSection(ini, section) || !BuildItemIndex(*section)))
        DropIndexes(ini); // lookups then search the lists
    return section;
}

IniSectionRec* FindOrAddSection(IniObjectRec& ini, char const* name) {
    if (IniSectionRec* const found = FindSection(ini, name))
        return found;
    IniSectionRec* const added = AddSection(ini, name, std::strlen(name), -1, false);
    if (added)
        RememberSection(ini, added);
    return added;
}

void FreeSection(IniSectionRec* section) {
    if (!section)
        return;
    if (section->items) {
        Item const* items = ItemsOf(*section);
        std::int32_t const count = ItemCount(*section);
        for (std::int32_t i = 0; i < count; ++i)
            FreeItemBlock(items[i]);
    }
    ListDispose(section->items);
    ListDispose(section->index.list);
    if (section->nameOwned)
        platform::HeapFree(section->name);
    section->magic = 0;
    delete section;
}

void RemoveSection(IniObjectRec& ini, IniSectionRec* section) {
    std::int32_t const position = SectionPosition(ini, section);
    if (position >= 0)
        ListRemoveItem(ini.sections, nullptr, position + 1);
    if (HasIndex(ini.sectionIndex))
        IndexRemove(ini.sectionIndex, reinterpret_cast<std::intptr_t>(section), section->name,
                    SectionName);
    for (IniSectionRec*& cached : ini.cache)
        if (cached == section)
            cached = nullptr;
    FreeSection(section);
}

// ---- Items ----------------------------------------------------------------------------------

std::int32_t FindItem(IniSectionRec const& section, char const* tag) {
    Item const* items = ItemsOf(section);
    std::int32_t const count = ItemCount(section);
    if (HasIndex(section.index)) {
        bool equal = false;
        std::int32_t const at = IndexFind(section.index, tag, ItemName{items}, equal);
        return equal ? static_cast<std::int32_t>(IndexValueAt(section.index, at)) : -1;
    }
    if (section.keepSorted) {
        std::int32_t const at =
            LowerBound(count, [&](std::int32_t i) { return CompareNames(items[i].tag, tag) < 0; });
        return at < count && CompareNames(items[at].tag, tag) == 0 ? at : -1;
    }
    for (std::int32_t i = 0; i < count; ++i)
        if (items[i].tag[0] == tag[0] && CompareNames(items[i].tag, tag) == 0)
            return i;
    return -1;
}

char* NewItemBlock(char const* tag, std::size_t tagLength, char const* value,
                   std::size_t valueLength) {
    if (tagLength + valueLength < tagLength ||
        tagLength + valueLength > static_cast<std::size_t>(-1) - 2)
        return nullptr;
    auto* const block = static_cast<char*>(platform::HeapAllocate(tagLength + valueLength + 2));
    if (!block)
        return nullptr;
    std::memcpy(block, tag, tagLength);
    block[tagLength] = '\0';
    if (valueLength)
        std::memcpy(block + tagLength + 1, value, valueLength);
    block[tagLength + 1 + valueLength] = '\0';
    return block;
}

void FreeItemBlock(Item const& item) {
    if (item.owned)
        platform::HeapFree(item.tag);
}

int PutItem(IniObjectRec& ini, IniSectionRec& section, char* block, std::size_t tagLength,
            bool quoted) {
    Item const item{block, block + tagLength + 1, -1, static_cast<std::uint8_t>(quoted ? 1 : 0), 1};
    if (ini.duplicateChecking) {
        std::int32_t const first = FindItem(section, block);
        if (first >= 0) {
            // The new item takes the first one's place (same tag: the indexes stay true),
            // and every later item with the tag goes.
            Item* items = ItemsOf(section);
            FreeItemBlock(items[first]);
            items[first] = item;
            bool mayHaveMore = true;
            if (section.keepSorted) {
                std::int32_t const count = ItemCount(section);
                mayHaveMore = first + 1 < count && CompareNames(items[first + 1].tag, block) == 0;
            } else if (HasIndex(section.index)) {
                // Items of one tag are neighbours in the index, the first one foremost.
                bool equal = false;
                ItemName const nameOf{items};
                std::int32_t const at = IndexFind(section.index, block, nameOf, equal);
                auto const* entries = static_cast<IndexEntry*>(ListGetDataPtr(section.index.list));
                mayHaveMore = at + 1 < ListNumItems(section.index.list) &&
                              CompareNames(nameOf(entries[at + 1].value), block) == 0;
            }
            if (mayHaveMore)
                for (std::int32_t i = ItemCount(section) - 1; i > first; --i)
                    if (CompareNames(ItemsOf(section)[i].tag, block) == 0)
                        RemoveItemAt(section, i);
            return 0;
        }
    }
    std::int32_t position = ItemCount(section);
    if (section.keepSorted) {
        Item const* items = ItemsOf(section);
        position = LowerBound(
            position, [&](std::int32_t i) { return CompareNames(items[i].tag, block) <= 0; });
    }
    if (!ListInsertItem(section.items, &item, position + 1)) {
        platform::HeapFree(block);
        return INI_ERR_OUT_OF_MEMORY;
    }
    IndexInsertItem(section, position);
    return 0;
}

int RemoveItems(IniSectionRec& section, char const* tag) {
    int removed = 0;
    std::int32_t const first = FindItem(section, tag);
    if (first < 0)
        return 0;
    for (std::int32_t i = ItemCount(section) - 1; i >= first; --i)
        if (CompareNames(ItemsOf(section)[i].tag, tag) == 0) {
            RemoveItemAt(section, i);
            ++removed;
        }
    return removed;
}

void ClearItems(IniSectionRec& section) {
    Item const* items = ItemsOf(section);
    std::int32_t const count = ItemCount(section);
    for (std::int32_t i = 0; i < count; ++i)
        FreeItemBlock(items[i]);
    ListClear(section.items);
    ListClear(section.index.list);
}

// ---- Order and indexes ----------------------------------------------------------------------

void SortAll(IniObjectRec& ini) {
    IniSectionRec** sections = SectionsOf(ini);
    std::int32_t const count = SectionCount(ini);
    std::stable_sort(sections, sections + count, [](IniSectionRec* a, IniSectionRec* b) {
        return CompareNames(a->name, b->name) < 0;
    });
    for (std::int32_t i = 0; i < count; ++i) {
        IniSectionRec& section = *sections[i];
        Item* items = ItemsOf(section);
        std::stable_sort(items, items + ItemCount(section), [](Item const& a, Item const& b) {
            return CompareNames(a.tag, b.tag) < 0;
        });
        section.keepSorted = true;
        if (HasIndex(section.index) && !BuildItemIndex(section))
            DropItemIndex(section);
    }
    ini.keepSorted = true;
    ClearSectionCache(ini);
}

void DropIndexes(IniObjectRec& ini) {
    ListDispose(ini.sectionIndex.list);
    ini.sectionIndex = SortedIndex{};
    IniSectionRec* const* sections = SectionsOf(ini);
    std::int32_t const count = SectionCount(ini);
    for (std::int32_t i = 0; i < count; ++i)
        DropItemIndex(*sections[i]);
}

bool BuildIndexes(IniObjectRec& ini) {
    DropIndexes(ini);
    IniSectionRec* const* sections = SectionsOf(ini);
    std::int32_t const count = SectionCount(ini);
    bool ok = IndexBuild(
        ini.sectionIndex, count,
        [sections](std::int32_t i) { return reinterpret_cast<std::intptr_t>(sections[i]); },
        SectionName);
    for (std::int32_t i = 0; ok && i < count; ++i)
        ok = BuildItemIndex(*sections[i]);
    if (!ok)
        DropIndexes(ini);
    return ok;
}

// ---- Multi-line items -----------------------------------------------------------------------

bool ParsePieceTag(char const* tag, std::size_t tagLength, std::size_t& baseLength,
                   std::int32_t& number, bool mb) {
    static constexpr char kMarker[] = " Line";
    constexpr std::size_t kMarkerLength = sizeof kMarker - 1;
    std::size_t digits = 0;
    while (digits < tagLength && tag[tagLength - 1 - digits] >= '0' &&
           tag[tagLength - 1 - digits] <= '9')
        ++digits;
    if (digits == 0 || tagLength - digits <= kMarkerLength)
        return false; // no digits, or no room for a base before the marker
    std::size_t const marker = tagLength - digits - kMarkerLength;
    if (std::memcmp(tag + marker, kMarker, kMarkerLength) != 0 ||
        !IsCharStart(tag, tag + tagLength, marker, mb))
        return false;
    std::int64_t value = 0;
    for (std::size_t i = tagLength - digits; i < tagLength && value <= 0x7FFFFFFF; ++i)
        value = value * 10 + (tag[i] - '0');
    baseLength = marker;
    number = value <= 0x7FFFFFFF ? static_cast<std::int32_t>(value) : 0;
    return true;
}

namespace {

struct PieceInfo {
    std::size_t baseLength = 0;
    std::int32_t number = 0;
    bool isPiece = false;
};

PieceInfo PieceOf(Item const& item, bool mb) {
    PieceInfo info;
    info.isPiece = ParsePieceTag(item.tag, std::strlen(item.tag), info.baseLength, info.number, mb);
    return info;
}

} // namespace

bool JoinMultiLineItems(IniObjectRec& ini, IniSectionRec& section, bool mb) {
    Item* const items = ItemsOf(section);
    std::int32_t const count = ItemCount(section);
    std::int32_t out = 0;
    bool ok = true;
    for (std::int32_t i = 0; i < count;) {
        PieceInfo const start = ok ? PieceOf(items[i], mb) : PieceInfo{};
        if (!start.isPiece || start.number != 1) {
            items[out++] = items[i++];
            continue;
        }
        // The run: the same base, numbers 1, 2, 3, ... without a gap.
        std::int32_t end = i + 1;
        std::size_t total = std::strlen(items[i].value);
        while (end < count) {
            PieceInfo const next = PieceOf(items[end], mb);
            if (!next.isPiece || next.baseLength != start.baseLength ||
                next.number != end - i + 1 ||
                std::memcmp(items[end].tag, items[i].tag, start.baseLength) != 0)
                break;
            total += std::strlen(items[end].value);
            ++end;
        }
        std::size_t const blockSize = start.baseLength + total + 2;
        char* const block = blockSize > total ? ini.arena.Allocate(blockSize) : nullptr;
        if (!block) {
            ok = false; // keep this run and the rest as they are
            items[out++] = items[i++];
            continue;
        }
        std::memcpy(block, items[i].tag, start.baseLength);
        block[start.baseLength] = '\0';
        char* value = block + start.baseLength + 1;
        for (std::int32_t k = i; k < end; ++k) {
            std::size_t const length = std::strlen(items[k].value);
            std::memcpy(value, items[k].value, length);
            value += length;
        }
        *value = '\0';
        Item const joined{block, block + start.baseLength + 1, items[i].line, items[i].quoted, 0};
        for (std::int32_t k = i; k < end; ++k)
            FreeItemBlock(items[k]);
        items[out++] = joined;
        i = end;
    }
    if (out < count)
        ListRemoveItems(section.items, nullptr, out + 1, count - out);
    return ok;
}

// ---- The shared buffer ----------------------------------------------------------------------

bool ReserveBuffer(IniObjectRec& ini, std::size_t size) {
    if (size <= ini.bufferSize && ini.buffer)
        return true;
    std::size_t const grown = (size / 1024) * 1024 + 1024;
    if (grown < size)
        return false;
    void* const block = platform::HeapReallocate(ini.buffer, grown);
    if (!block)
        return false;
    ini.buffer = static_cast<char*>(block);
    ini.bufferSize = grown;
    return true;
}

} // namespace tekit::ini
