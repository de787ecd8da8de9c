// RString and the global message table: texts by section and key, built-in or set at run time.
#include "tekit/errors/RString.h"

#include "errors/LoadedStrings.h"
#include "errors/MessageCatalogue.h"
#include "tekit/errors/Raise.h"
#include "tekit/strings/StringVector.h"

#include <deque>
#include <map>
#include <memory>
#include <mutex>
#include <shared_mutex>
#include <string>
#include <string_view>

namespace tekit {

namespace {

/// The process-wide message table. Texts live in a deque, so their addresses stay put while
/// rows are added; a replaced text stays alive (unreferenced) until the table is rebuilt or
/// destroyed, so RStrings that point at it never dangle before then.
class MessageTable {
public:
    MessageTable() { AddBuiltInRows(); }

    String const* Find(std::string_view section, std::string_view key) const {
        auto s = m_sections.find(section);
        if (s == m_sections.end())
            return nullptr;
        auto k = s->second.find(key);
        return k == s->second.end() ? nullptr : k->second;
    }

    /// `copy` false keeps a reference to `text`, which must then be static.
    void Set(std::string_view section, std::string_view key, char const* text, bool copy) {
        DynamicString& stored = m_texts.emplace_back(text, copy);
        stored.GetNumBytes(); // measure now: readers on other threads never write the cache
        auto s = m_sections.find(section);
        if (s == m_sections.end())
            s = m_sections.emplace(std::string(section), Keys()).first;
        s->second.insert_or_assign(std::string(key), &stored);
    }

    void GetSections(StringVector& sections) const {
        for (auto const& [section, keys] : m_sections)
            sections.emplace_back(section.c_str());
    }

    /// Back to the built-in rows. The texts stay in m_texts, so RStrings keep valid pointers.
    void RestoreBuiltInRows() {
        m_sections.clear();
        AddBuiltInRows();
    }

    void GetKeys(std::string_view section, StringVector& keys) const {
        auto s = m_sections.find(section);
        if (s == m_sections.end())
            return;
        for (auto const& [key, text] : s->second)
            keys.emplace_back(key.c_str());
    }

private:
    using Keys = std::map<std::string, DynamicString const*, std::less<>>;

    void AddBuiltInRows() {
        for (auto const* section = detail::GetBuiltInMessageSections(); section->name; ++section)
            for (int i = 0; i < section->numRows; ++i)
                Set(section->name, section->rows[i].key, section->rows[i].text, false);
    }

    std::map<std::string, Keys, std::less<>> m_sections;
    std::deque<DynamicString> m_texts;
};

/// Only the first lookup of the process builds the table: once it was created or removed, a
/// removed table stays removed until InitGlobalStringTable.
enum class TableState { Untouched, Managed };

/// The table and its guard. Allocated once and never freed, so lookups made while the
/// process shuts down (from other statics' destructors) still find a valid lock.
struct GlobalTable {
    std::shared_mutex mutex;
    std::unique_ptr<MessageTable> table;
    TableState state = TableState::Untouched;
    bool ready = false;
    /// The language whose strings files the table holds ("" none).
    std::string language;
};

GlobalTable& Global() {
    static GlobalTable* global = new GlobalTable;
    return *global;
}

std::string_view Text(char const* text) {
    return text ? std::string_view(text) : "";
}

/// The exclusive part of a table operation: creates the table when it does not exist.
MessageTable& CreateTableLocked(GlobalTable& global) {
    if (!global.table)
        global.table = std::make_unique<MessageTable>();
    global.state = TableState::Managed;
    return *global.table;
}

/// Builds the table on the first lookup of the process.
void CreateOnFirstUse() {
    GlobalTable& global = Global();
    {
        std::shared_lock lock(global.mutex);
        if (global.state == TableState::Managed)
            return;
    }
    std::unique_lock lock(global.mutex);
    if (global.state == TableState::Untouched)
        CreateTableLocked(global);
}

String const* Find(char const* section, char const* key) {
    GlobalTable& global = Global();
    std::shared_lock lock(global.mutex);
    return global.table ? global.table->Find(Text(section), Text(key)) : nullptr;
}

/// What a lookup without a default shows when there is no table or no text for the miss.
String const& NotFoundConstant() {
    static DynamicString const* constant = [] {
        auto* text = new DynamicString("String Not Found In Table", false);
        text->GetNumBytes();
        return text;
    }();
    return *constant;
}

} // namespace

// ---- RString ------------------------------------------------------------------------------

RString::RString(char const* section, char const* key, char const* defaultText, bool* found)
    : m_string(nullptr), m_ownsString(false) {
    CreateOnFirstUse();
    if (String const* text = Find(section, key)) {
        m_string = text;
        if (found)
            *found = true;
        return;
    }
    if (found)
        *found = false;
    if (defaultText) {
        m_string = new DynamicString(defaultText);
        m_ownsString = true;
        return;
    }
    String const* missing = Find("ERRORS", "STRING_NOT_IN_TABLE");
    m_string = missing ? missing : &NotFoundConstant();
}

RString::RString(RString const& other) : m_string(nullptr), m_ownsString(false) {
    CopyFrom(other);
}

RString::RString(RString&& other) noexcept
    : m_string(other.m_string), m_ownsString(other.m_ownsString) {
    other.m_string = &NotFoundConstant();
    other.m_ownsString = false;
}

RString& RString::operator=(RString const& other) {
    if (this != &other) {
        Free();
        CopyFrom(other);
    }
    return *this;
}

RString& RString::operator=(RString&& other) noexcept {
    if (this != &other) {
        Free();
        m_string = other.m_string;
        m_ownsString = other.m_ownsString;
        other.m_string = &NotFoundConstant();
        other.m_ownsString = false;
    }
    return *this;
}

RString::~RString() {
    Free();
}

/// An owned text is copied (the copy shares its block); a table text is shared as it is.
void RString::CopyFrom(RString const& other) {
    m_ownsString = other.m_ownsString;
    m_string = other.m_ownsString ? new DynamicString(*other.m_string) : other.m_string;
}

void RString::Free() {
    if (m_ownsString)
        delete m_string;
    m_string = nullptr;
    m_ownsString = false;
}

// ---- The global table ---------------------------------------------------------------------

void RString::InitGlobalStringTable() {
    std::unique_lock lock(Global().mutex);
    CreateTableLocked(Global());
}

bool RString::GlobalStringTableIsReady() {
    std::shared_lock lock(Global().mutex);
    return Global().table && Global().ready;
}

void RString::FinishedLoadingStrings() {
    std::unique_lock lock(Global().mutex);
    CreateTableLocked(Global());
    Global().ready = true;
}

void RString::ResetStrings() {
    std::unique_lock lock(Global().mutex);
    Global().table = std::make_unique<MessageTable>();
    Global().state = TableState::Managed;
    Global().ready = false;
    Global().language.clear();
}

void RString::RemoveGlobalStringTable() {
    std::unique_lock lock(Global().mutex);
    Global().table.reset();
    Global().state = TableState::Managed;
    Global().ready = false;
    Global().language.clear();
}

void RString::GetSectionTags(char const* section, StringVector& keys) {
    keys.clear();
    CreateOnFirstUse();
    std::shared_lock lock(Global().mutex);
    if (Global().table)
        Global().table->GetKeys(Text(section), keys);
}

void RString::GetSectionNames(StringVector& sections) {
    sections.clear();
    CreateOnFirstUse();
    std::shared_lock lock(Global().mutex);
    if (Global().table)
        Global().table->GetSections(sections);
}

void RString::SetString(char const* section, char const* key, char const* text) {
    if (!detail::EnterLoadedStrings(
            {{std::string(Text(section)), std::string(Text(key)), std::string(Text(text))}},
            detail::LoadMode::kAdd, nullptr))
        detail::RaiseTableComplete("RString::SetString");
}

// ---- Strings files entering the table -----------------------------------------------------

namespace detail {

void RaiseTableComplete(char const* function) {
    // Raised with no lock held: building the exception looks messages up in the table.
    RString const text("ERR_DESCR", "STRINGS_TABLE_COMPLETE");
    TE_RAISE(TE_OBJECT_LOCKED, static_cast<char const*>(text), function);
}

bool EnterLoadedStrings(std::vector<LoadedString> const& rows, LoadMode mode,
                        char const* language) {
    GlobalTable& global = Global();
    std::unique_lock lock(global.mutex);
    if (global.table && global.ready)
        return false;
    MessageTable& table = CreateTableLocked(global);
    if (mode == LoadMode::kReplaceLoaded) {
        table.RestoreBuiltInRows();
        global.language = language ? language : "";
    }
    for (LoadedString const& row : rows)
        table.Set(row.section, row.key, row.text.c_str(), true);
    return true;
}

void UnloadStrings() {
    GlobalTable& global = Global();
    std::unique_lock lock(global.mutex);
    CreateTableLocked(global).RestoreBuiltInRows();
    global.ready = false;
    global.language.clear();
}

std::string LoadedLanguage() {
    std::shared_lock lock(Global().mutex);
    return Global().language;
}

} // namespace detail

// ---- Concatenation ------------------------------------------------------------------------

DynamicString operator+(RString const& a, RString const& b) {
    return a.GetString() + b.GetString();
}
DynamicString operator+(RString const& a, String const& b) {
    return a.GetString() + b;
}
DynamicString operator+(String const& a, RString const& b) {
    return a + b.GetString();
}
DynamicString operator+(RString const& a, char const* b) {
    return a.GetString() + b;
}
DynamicString operator+(char const* a, RString const& b) {
    return a + b.GetString();
}

DynamicString operator+(RString const& a, wchar_t const* b) {
    DynamicString result(a.GetString());
    result += b;
    return result;
}

} // namespace tekit
