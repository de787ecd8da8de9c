// The INI object's records and the operations the flat functions share: section and item
// lookup, insertion and removal, the sorted indexes, and the object's text arena.
//
// Sections and items live in toolbox lists: the object holds a list of section pointers (a
// section record never moves, so an IniSection stays valid), each section a list of 24-byte
// item records (16 on 32-bit) in file order. An item's tag and value are one block, "tag\0value\0":
// blocks made by a read come from the object's arena (one bump allocation each, freed all at
// once with the object), blocks made by a put are heap blocks of their own.
#pragma once

#include "ini/IniIndex.h"
#include "tekit/ini/Ini.h"
#include "tekit/toolbox/List.h"

#include <cstddef>
#include <cstdint>

namespace tekit::ini {

/// One tag/value item.
struct Item {
    char* tag;   ///< start of the item's block: the tag, then the value
    char* value; ///< in the same block, after the tag's terminator
    std::int32_t line;
    std::uint8_t quoted;
    std::uint8_t owned; ///< 1: the block is a heap block to free; 0: it lies in the arena
};

/// Bump allocation in chunks that grow to 1 MB; everything is freed at once.
class Arena {
public:
    Arena() = default;
    Arena(Arena const&) = delete;
    Arena& operator=(Arena const&) = delete;
    ~Arena();

    /// `size` bytes, or null when memory is exhausted.
    char* Allocate(std::size_t size) {
        if (size <= m_left) {
            char* const p = m_next;
            m_next += size;
            m_left -= size;
            return p;
        }
        return AllocateSlow(size);
    }

private:
    struct Chunk;
    char* AllocateSlow(std::size_t size);

    Chunk* m_chunks = nullptr;
    char* m_next = nullptr;
    std::size_t m_left = 0;
    std::size_t m_nextChunkSize = 4096;
};

inline constexpr std::uint32_t kObjectMagic = 0x494E494F;  // "INIO"
inline constexpr std::uint32_t kSectionMagic = 0x494E4953; // "INIS"
inline constexpr int kMaxTokenLength = 7;
/// The longest value written on one line, and the longest piece of a longer one.
inline constexpr std::size_t kMaxPieceBytes = 120;
/// The longest line the reader takes.
inline constexpr int kMaxLineLength = 640;

} // namespace tekit::ini

struct IniSectionRec {
    std::uint32_t magic = tekit::ini::kSectionMagic;
    char* name = nullptr;
    std::size_t nameLength = 0;
    bool nameOwned = false;
    bool keepSorted = false;    ///< items are kept in tag order
    bool mayHavePieces = false; ///< the reader saw a tag that may be a multi-line piece
    std::int32_t line = -1;
    ListType items = nullptr;      ///< Item, in list order
    tekit::ini::SortedIndex index; ///< item positions (0-based) by tag; no list when none
};

struct IniObjectRec {
    std::uint32_t magic = tekit::ini::kObjectMagic;
    ListType sections = nullptr;          ///< IniSectionRec*, in list order
    tekit::ini::SortedIndex sectionIndex; ///< IniSectionRec*, by name; no list when none
    IniSectionRec* cache[3] = {};         ///< the sections found last, most recent first
    bool keepSorted = false;              ///< sort after reads, insert in order
    bool duplicateChecking = true;
    std::int32_t lineOfLastAccess = -1;
    char sectionStart = '[';
    char sectionEnd = ']';
    char separator[tekit::ini::kMaxTokenLength + 1] = "=";
    char writtenSeparator[tekit::ini::kMaxTokenLength + 3] = " = ";
    char comment[tekit::ini::kMaxTokenLength + 1] = ";";
    IniSectionFilterCallback filter = nullptr;
    void* filterData = nullptr;
    char* buffer = nullptr; ///< the pointer getters' shared buffer
    std::size_t bufferSize = 0;
    IniLocale locale{};
    char decimalPoint = '.'; ///< the locale's, for the doubles written
    tekit::ini::Arena arena;
};

namespace tekit::ini {

inline bool IsValid(IniHandle ini) {
    return ini != nullptr && ini->magic == kObjectMagic;
}
inline bool IsValid(IniSection section) {
    return section != nullptr && section->magic == kSectionMagic;
}

// The lists' items, reached without a call: lookups make many of these.
inline Item* ItemsOf(IniSectionRec const& section) {
    return toolbox::ItemsAs<Item>(section.items);
}
inline std::int32_t ItemCount(IniSectionRec const& section) {
    return toolbox::ItemCountOf(section.items);
}
inline IniSectionRec** SectionsOf(IniObjectRec const& ini) {
    return toolbox::ItemsAs<IniSectionRec*>(ini.sections);
}
inline std::int32_t SectionCount(IniObjectRec const& ini) {
    return toolbox::ItemCountOf(ini.sections);
}

/// Byte order of NUL-terminated names, as unsigned bytes.
int CompareNames(char const* a, char const* b);

// ---- Sections -------------------------------------------------------------------------------

/// The first section named `name` (cache, index, sorted list or list order); null when none.
IniSectionRec* FindSection(IniObjectRec& ini, char const* name);
/// A new empty section with a copy of `name` (`length` bytes), placed in order when the object
/// keeps order and at the end otherwise; its name comes from the arena when `inArena`. Null
/// when memory is exhausted.
IniSectionRec* AddSection(IniObjectRec& ini, char const* name, std::size_t length,
                          std::int32_t line, bool inArena);
/// The section named `name`, created (as a put creates it) when missing; null on exhaustion.
IniSectionRec* FindOrAddSection(IniObjectRec& ini, char const* name);
/// Removes `section` from the object and frees it.
void RemoveSection(IniObjectRec& ini, IniSectionRec* section);
/// Frees a section that no longer belongs to a list.
void FreeSection(IniSectionRec* section);
/// Forgets the cached sections (after anything that may reorder or remove them).
void ClearSectionCache(IniObjectRec& ini);

// ---- Items ----------------------------------------------------------------------------------

/// The 0-based position of the first item tagged `tag`; -1 when none.
std::int32_t FindItem(IniSectionRec const& section, char const* tag);
/// A new heap block "tag\0value\0"; null when memory is exhausted.
char* NewItemBlock(char const* tag, std::size_t tagLength, char const* value,
                   std::size_t valueLength);
/// Frees an item's block when it is a heap block of its own.
void FreeItemBlock(Item const& item);
/// Puts the item whose block `block` was made by NewItemBlock (taken over, freed on failure):
/// with duplicate checking, it replaces every item with its tag, taking the first one's place.
/// 0 or INI_ERR_OUT_OF_MEMORY.
int PutItem(IniObjectRec& ini, IniSectionRec& section, char* block, std::size_t tagLength,
            bool quoted);
/// Removes every item tagged `tag`; the number removed.
int RemoveItems(IniSectionRec& section, char const* tag);
/// Removes every item of the section.
void ClearItems(IniSectionRec& section);

// ---- Order and indexes ----------------------------------------------------------------------

/// Sorts the sections and every section's items (stable) and marks them kept in order.
void SortAll(IniObjectRec& ini);
/// Builds the section index and every section's item index; false on exhaustion (none kept).
bool BuildIndexes(IniObjectRec& ini);
void DropIndexes(IniObjectRec& ini);

// ---- Multi-line items -----------------------------------------------------------------------

/// A tag of the form `base Line<digits>` (base not empty; in multibyte mode the blank starts a
/// character): the base's length and the number (0 when the digits read as 0 or beyond
/// 2147483647). False for any other tag.
bool ParsePieceTag(char const* tag, std::size_t tagLength, std::size_t& baseLength,
                   std::int32_t& number, bool mb);
/// Joins the runs of pieces of `section` (see the header's rules); false on exhaustion, the
/// runs joined until then staying joined.
bool JoinMultiLineItems(IniObjectRec& ini, IniSectionRec& section, bool mb);

// ---- The shared buffer ----------------------------------------------------------------------

/// Makes the shared buffer hold at least `size` bytes, growing in 1024-byte steps to
/// (size rounded down to 1024) + 1024; false on exhaustion.
bool ReserveBuffer(IniObjectRec& ini, std::size_t size);

} // namespace tekit::ini
