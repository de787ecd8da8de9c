// The flat functions of the INI object: creation, tokens and flags, order and indexes, and
// access to sections and items by name, pointer and position.
#include "ini/IniObject.h"
#include "ini/IniText.h"

#include "platform/CLocale.h"
#include "platform/Heap.h"
#include "tekit/strings/String.h"
#include "toolbox/FlatGuard.h"

#include <cstring>
#include <new>

namespace tekit::ini {

namespace {

/// Copies `token` into `dest` (room for kMaxTokenLength + 1 bytes), cut at a character
/// boundary; a null or empty token keeps `dest`.
void SetToken(char* dest, char const* token) {
    if (!token || !*token)
        return;
    std::size_t const length = std::strlen(token);
    std::size_t const kept =
        CutAtBoundary(token, token + length, kMaxTokenLength, String::IsMultiByteSupportEnabled());
    std::memcpy(dest, token, kept);
    dest[kept] = '\0';
}

/// The section named `name`, or null (also for invalid arguments, reported through `status`).
IniSectionRec* Lookup(IniHandle ini, char const* name, int& status) {
    status = 0;
    if (!IsValid(ini) || !name) {
        status = INI_ERR_INVALID_ARGUMENT;
        return nullptr;
    }
    return FindSection(*ini, name);
}

bool StartsWith(char const* text, char const* prefix, std::size_t prefixLength) {
    return std::strncmp(text, prefix, prefixLength) == 0;
}

/// The first item of `section` whose tag starts with `prefix`; -1 when none.
std::int32_t FindPrefix(IniSectionRec const& section, char const* prefix) {
    std::size_t const length = std::strlen(prefix);
    Item const* items = ItemsOf(section);
    std::int32_t const count = ItemCount(section);
    for (std::int32_t i = 0; i < count; ++i)
        if (StartsWith(items[i].tag, prefix, length))
            return i;
    return -1;
}

int PartialItem(IniObjectRec& ini, IniSectionRec const& section, char const* prefix,
                char const** fullTag, bool multiLine) {
    std::int32_t const found = FindPrefix(section, prefix);
    if (found < 0)
        return 0;
    char const* tag = ItemsOf(section)[found].tag;
    std::size_t const tagLength = std::strlen(tag);
    std::size_t baseLength = 0;
    std::int32_t number = 0;
    if (multiLine &&
        ParsePieceTag(tag, tagLength, baseLength, number, String::IsMultiByteSupportEnabled())) {
        if (!ReserveBuffer(ini, baseLength + 1))
            return INI_ERR_OUT_OF_MEMORY;
        std::memcpy(ini.buffer, tag, baseLength);
        ini.buffer[baseLength] = '\0';
        tag = ini.buffer;
    }
    if (fullTag)
        *fullTag = tag;
    return 1;
}

bool IsPieceOf(char const* tag, char const* base, std::size_t baseLength, bool mb) {
    std::size_t pieceBase = 0;
    std::int32_t number = 0;
    return std::strncmp(tag, base, baseLength) == 0 &&
           ParsePieceTag(tag, std::strlen(tag), pieceBase, number, mb) && pieceBase == baseLength;
}

int ItemOrPiece(IniSectionRec const& section, char const* tag) {
    if (FindItem(section, tag) >= 0)
        return 1;
    bool const mb = String::IsMultiByteSupportEnabled();
    std::size_t const length = std::strlen(tag);
    Item const* items = ItemsOf(section);
    std::int32_t const count = ItemCount(section);
    for (std::int32_t i = 0; i < count; ++i)
        if (IsPieceOf(items[i].tag, tag, length, mb))
            return 1;
    return 0;
}

int NthItem(IniSectionRec const& section, int index, char const** tag, char const** value,
            int* line, int* quoted) {
    if (index < 1 || index > ItemCount(section))
        return 0;
    Item const& item = ItemsOf(section)[index - 1];
    if (tag)
        *tag = item.tag;
    if (value)
        *value = item.value;
    if (line)
        *line = item.line;
    if (quoted)
        *quoted = item.quoted;
    return 1;
}

/// Copies the items of `from` into `to` of the object `dest`.
int CopyItems(IniObjectRec& dest, IniSectionRec const& from, IniSectionRec& to) {
    Item const* items = ItemsOf(from);
    std::int32_t const count = ItemCount(from);
    for (std::int32_t i = 0; i < count; ++i) {
        std::size_t const tagLength = std::strlen(items[i].tag);
        char* const block =
            NewItemBlock(items[i].tag, tagLength, items[i].value, std::strlen(items[i].value));
        if (!block)
            return INI_ERR_OUT_OF_MEMORY;
        if (int const status = PutItem(dest, to, block, tagLength, items[i].quoted != 0);
            status < 0)
            return status;
    }
    return 1;
}

} // namespace

} // namespace tekit::ini

using namespace tekit::ini;
namespace platform = tekit::platform;

// ---- The object -------------------------------------------------------------------------------

extern "C" IniHandle TEKIT_STDCALL Ini_New(int sortFlag, IniLocale locale) {
    auto* const ini = new (std::nothrow) IniObjectRec;
    if (!ini)
        return nullptr;
    ini->sections = ListCreate(sizeof(IniSectionRec*));
    if (!ini->sections) {
        delete ini;
        return nullptr;
    }
    ini->keepSorted = sortFlag != 0;
    ini->locale = locale;
    ini->decimalPoint = platform::DecimalPointOf(locale);
    return ini;
}

extern "C" void TEKIT_STDCALL Ini_Dispose(IniHandle ini) {
    if (!IsValid(ini))
        return;
    DropIndexes(*ini);
    IniSectionRec* const* sections = SectionsOf(*ini);
    std::int32_t const count = SectionCount(*ini);
    for (std::int32_t i = 0; i < count; ++i)
        FreeSection(sections[i]);
    ListDispose(ini->sections);
    platform::HeapFree(ini->buffer);
    ini->magic = 0;
    delete ini;
}

extern "C" int TEKIT_STDCALL Ini_SetTokens(IniHandle ini, char sectionStart, char sectionEnd,
                                           char const* separator, char const* comment) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    if (sectionStart)
        ini->sectionStart = sectionStart;
    if (sectionEnd)
        ini->sectionEnd = sectionEnd;
    SetToken(ini->separator, separator);
    SetToken(ini->comment, comment);
    std::size_t const length = std::strlen(ini->separator);
    ini->writtenSeparator[0] = ' ';
    std::memcpy(ini->writtenSeparator + 1, ini->separator, length);
    ini->writtenSeparator[length + 1] = ' ';
    ini->writtenSeparator[length + 2] = '\0';
    return 0;
}

extern "C" int TEKIT_STDCALL Ini_SetDuplicateChecking(IniHandle ini, int on) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    int const previous = ini->duplicateChecking ? 1 : 0;
    ini->duplicateChecking = on != 0;
    return previous;
}

extern "C" int TEKIT_STDCALL Ini_SetSectionFilter(IniHandle ini, IniSectionFilterCallback filter,
                                                  void* data) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    ini->filter = filter;
    ini->filterData = data;
    return 0;
}

extern "C" int TEKIT_STDCALL Ini_Sort(IniHandle ini) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    SortAll(*ini);
    return 0;
}

extern "C" int TEKIT_STDCALL Ini_DisableSorting(IniHandle ini) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    ini->keepSorted = false;
    IniSectionRec* const* sections = SectionsOf(*ini);
    std::int32_t const count = SectionCount(*ini);
    for (std::int32_t i = 0; i < count; ++i)
        sections[i]->keepSorted = false;
    return 0;
}

extern "C" int TEKIT_STDCALL Ini_SortInternally(IniHandle ini) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    return BuildIndexes(*ini) ? 0 : INI_ERR_OUT_OF_MEMORY;
}

extern "C" int TEKIT_STDCALL Ini_DisableInternalSorting(IniHandle ini) {
    if (!IsValid(ini))
        return INI_ERR_INVALID_ARGUMENT;
    DropIndexes(*ini);
    return 0;
}

// ---- Sections -------------------------------------------------------------------------------

extern "C" int TEKIT_STDCALL Ini_NumberOfSections(IniHandle ini) {
    return IsValid(ini) ? SectionCount(*ini) : INI_ERR_INVALID_ARGUMENT;
}

extern "C" int TEKIT_STDCALL Ini_NthSection(IniHandle ini, int index, IniSection* section) {
    if (!IsValid(ini) || !section)
        return INI_ERR_INVALID_ARGUMENT;
    if (index < 1 || index > SectionCount(*ini))
        return 0;
    *section = SectionsOf(*ini)[index - 1];
    return 1;
}

extern "C" int TEKIT_STDCALL Ini_NthSectionName(IniHandle ini, int index, char const** name) {
    if (!name)
        return INI_ERR_INVALID_ARGUMENT;
    IniSection section = nullptr;
    int const found = Ini_NthSection(ini, index, &section);
    if (found == 1)
        *name = section->name;
    return found;
}

extern "C" int TEKIT_STDCALL Ini_SectionExists(IniHandle ini, char const* section) {
    int status = 0;
    IniSectionRec* const found = Lookup(ini, section, status);
    return status < 0 ? status : found ? 1 : 0;
}

extern "C" int TEKIT_STDCALL Ini_PartialSectionNameExists(IniHandle ini, char const* prefix,
                                                          char const** fullName) {
    if (!IsValid(ini) || !prefix)
        return INI_ERR_INVALID_ARGUMENT;
    std::size_t const length = std::strlen(prefix);
    IniSectionRec* const* sections = SectionsOf(*ini);
    std::int32_t const count = SectionCount(*ini);
    for (std::int32_t i = 0; i < count; ++i)
        if (StartsWith(sections[i]->name, prefix, length)) {
            if (fullName)
                *fullName = sections[i]->name;
            return 1;
        }
    return 0;
}

extern "C" int TEKIT_STDCALL Ini_RemoveSection(IniHandle ini, char const* section) {
    int status = 0;
    IniSectionRec* const found = Lookup(ini, section, status);
    if (!found)
        return status;
    RemoveSection(*ini, found);
    return 1;
}

extern "C" int TEKIT_STDCALL Ini_CopySection(IniHandle source, IniHandle dest, char const* section,
                                             int replace) {
    if (!IsValid(dest))
        return INI_ERR_INVALID_ARGUMENT;
    int status = 0;
    IniSectionRec* const from = Lookup(source, section, status);
    if (!from)
        return status;
    if (source == dest)
        return 1;
    if (replace)
        if (IniSectionRec* const existing = FindSection(*dest, section))
            ClearItems(*existing);
    IniSectionRec* const to = FindOrAddSection(*dest, section);
    if (!to)
        return INI_ERR_OUT_OF_MEMORY;
    return CopyItems(*dest, *from, *to);
}

extern "C" int TEKIT_STDCALL Ini_GetSectionPtr(IniHandle ini, char const* section,
                                               IniSection* sectionPtr) {
    if (!sectionPtr)
        return INI_ERR_INVALID_ARGUMENT;
    int status = 0;
    IniSectionRec* const found = Lookup(ini, section, status);
    if (found)
        *sectionPtr = found;
    return status < 0 ? status : found ? 1 : 0;
}

extern "C" int TEKIT_STDCALL Ini_SectionInfoSP(IniHandle ini, IniSection section, char const** name,
                                               int* line) {
    if (!IsValid(ini) || !IsValid(section))
        return INI_ERR_INVALID_ARGUMENT;
    if (name)
        *name = section->name;
    if (line)
        *line = section->line;
    return 1;
}

// ---- Items ----------------------------------------------------------------------------------
//
// Each function by name looks the section up and goes on as its section-pointer twin; an
// absent section is an absent item.

#define TEKIT_INI_BY_NAME(call)                                                                    \
    int status = 0;                                                                                \
    IniSectionRec* const found = Lookup(ini, section, status);                                     \
    if (!found)                                                                                    \
        return status;                                                                             \
    return call

extern "C" int TEKIT_STDCALL Ini_NumberOfItemsSP(IniHandle ini, IniSection section) {
    if (!IsValid(ini) || !IsValid(section))
        return INI_ERR_INVALID_ARGUMENT;
    return ItemCount(*section);
}
extern "C" int TEKIT_STDCALL Ini_NumberOfItems(IniHandle ini, char const* section) {
    TEKIT_INI_BY_NAME(Ini_NumberOfItemsSP(ini, found));
}

extern "C" int TEKIT_STDCALL Ini_NthItemNameSP(IniHandle ini, IniSection section, int index,
                                               char const** tag) {
    if (!IsValid(ini) || !IsValid(section) || !tag)
        return INI_ERR_INVALID_ARGUMENT;
    return NthItem(*section, index, tag, nullptr, nullptr, nullptr);
}
extern "C" int TEKIT_STDCALL Ini_NthItemName(IniHandle ini, char const* section, int index,
                                             char const** tag) {
    TEKIT_INI_BY_NAME(Ini_NthItemNameSP(ini, found, index, tag));
}

extern "C" int TEKIT_STDCALL Ini_NthItemSP(IniHandle ini, IniSection section, int index,
                                           char const** tag, char const** rawValue, int* line,
                                           int* quoted) {
    if (!IsValid(ini) || !IsValid(section))
        return INI_ERR_INVALID_ARGUMENT;
    return NthItem(*section, index, tag, rawValue, line, quoted);
}

extern "C" int TEKIT_STDCALL Ini_ItemExistsSP(IniHandle ini, IniSection section, char const* tag) {
    if (!IsValid(ini) || !IsValid(section) || !tag)
        return INI_ERR_INVALID_ARGUMENT;
    return FindItem(*section, tag) >= 0 ? 1 : 0;
}
extern "C" int TEKIT_STDCALL Ini_ItemExists(IniHandle ini, char const* section, char const* tag) {
    TEKIT_INI_BY_NAME(Ini_ItemExistsSP(ini, found, tag));
}

extern "C" int TEKIT_STDCALL Ini_ItemOrMultiLineItemExistsSP(IniHandle ini, IniSection section,
                                                             char const* tag) {
    if (!IsValid(ini) || !IsValid(section) || !tag)
        return INI_ERR_INVALID_ARGUMENT;
    return ItemOrPiece(*section, tag);
}
extern "C" int TEKIT_STDCALL Ini_ItemOrMultiLineItemExists(IniHandle ini, char const* section,
                                                           char const* tag) {
    TEKIT_INI_BY_NAME(Ini_ItemOrMultiLineItemExistsSP(ini, found, tag));
}

extern "C" int TEKIT_STDCALL Ini_PartialItemNameExistsSP(IniHandle ini, IniSection section,
                                                         char const* prefix, char const** fullTag) {
    if (!IsValid(ini) || !IsValid(section) || !prefix)
        return INI_ERR_INVALID_ARGUMENT;
    return PartialItem(*ini, *section, prefix, fullTag, false);
}
extern "C" int TEKIT_STDCALL Ini_PartialItemNameExists(IniHandle ini, char const* section,
                                                       char const* prefix, char const** fullTag) {
    TEKIT_INI_BY_NAME(Ini_PartialItemNameExistsSP(ini, found, prefix, fullTag));
}

extern "C" int TEKIT_STDCALL Ini_PartialItemNameOrMultiLineItemExistsSP(IniHandle ini,
                                                                        IniSection section,
                                                                        char const* prefix,
                                                                        char const** fullTag) {
    if (!IsValid(ini) || !IsValid(section) || !prefix)
        return INI_ERR_INVALID_ARGUMENT;
    return PartialItem(*ini, *section, prefix, fullTag, true);
}
extern "C" int TEKIT_STDCALL Ini_PartialItemNameOrMultiLineItemExists(IniHandle ini,
                                                                      char const* section,
                                                                      char const* prefix,
                                                                      char const** fullTag) {
    TEKIT_INI_BY_NAME(Ini_PartialItemNameOrMultiLineItemExistsSP(ini, found, prefix, fullTag));
}

extern "C" int TEKIT_STDCALL Ini_RemoveItemSP(IniHandle ini, IniSection section, char const* tag) {
    if (!IsValid(ini) || !IsValid(section) || !tag)
        return INI_ERR_INVALID_ARGUMENT;
    return RemoveItems(*section, tag) > 0 ? 1 : 0;
}
extern "C" int TEKIT_STDCALL Ini_RemoveItem(IniHandle ini, char const* section, char const* tag) {
    TEKIT_INI_BY_NAME(Ini_RemoveItemSP(ini, found, tag));
}

extern "C" int TEKIT_STDCALL Ini_LineOfLastAccess(IniHandle ini) {
    return IsValid(ini) ? ini->lineOfLastAccess : INI_ERR_INVALID_ARGUMENT;
}

extern "C" char const* TEKIT_STDCALL Ini_GetErrorKey(int status) {
    switch (status) {
#define INI_STATUS(symbol, value, key, text)                                                       \
    case value:                                                                                    \
        return key;
#include "tekit/errors/IniStatus.def"
    default:
        return nullptr;
    }
}
