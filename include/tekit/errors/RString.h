// RString: a user-visible message, looked up by section and key in the process-wide message
// table so that loaded language files can translate it.
//
//   RString text("ERR_DESCR", "CANT_FIND_FILE", "Could not find file '%1'.", nullptr);
//   DynamicString message = text.GetString();
//   message.Format(path, 1);
//
// The table is created on first use with the library's built-in English rows; strings files
// add rows or replace them (UseStringsFile, RStringsLoader, SetString), until
// FinishedLoadingStrings marks it complete. A found message points into the table and is not
// owned: it stays valid until ResetStrings or RemoveGlobalStringTable, so an RString must not
// outlive the table. A default text given by the caller is copied and owned by the RString.
// Lookups are safe from any number of threads.
//
// Strings files are INI files (see tekit/ini/StringsFile.h): the two functions that read them
// are defined with the INI store, which sits above this layer; declaring them needs nothing
// from it.
#pragma once

#include "tekit/Export.h"
#include "tekit/errors/LookupString.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

class Path;
class StringVector;

class TEKIT_API RString {
public:
    /// Looks up (section, key). Not found: the RString owns a copy of `defaultText`; without
    /// one it shows the table's ("ERRORS", "STRING_NOT_IN_TABLE") text, or "String Not Found In
    /// Table" when there is no table. `*found` (when given) tells whether the key was found.
    RString(char const* section, char const* key, char const* defaultText = nullptr,
            bool* found = nullptr);
    RString(RString const& other);
    RString(RString&& other) noexcept;
    RString& operator=(RString const& other);
    RString& operator=(RString&& other) noexcept;
    ~RString();

    operator char const*() const { return m_string->GetBufferReadPtr(); }
    String const& GetString() const { return *m_string; }

    // ---- The global table. ----------------------------------------------------------------
    /// Creates the table with the built-in rows, if it does not exist.
    static void InitGlobalStringTable();
    /// True once FinishedLoadingStrings has marked the table complete.
    static bool GlobalStringTableIsReady();
    /// Marks the end of loading strings files.
    static void FinishedLoadingStrings();
    /// Drops every loaded row: the table holds the built-in rows only and is no longer ready.
    static void ResetStrings();
    /// Destroys the table; later lookups find nothing until InitGlobalStringTable.
    static void RemoveGlobalStringTable();
    /// Replaces `keys` by the keys of `section`, in ascending byte order.
    static void GetSectionTags(char const* section, StringVector& keys);
    /// Replaces `sections` by the names of the table's sections, in ascending byte order.
    static void GetSectionNames(StringVector& sections);
    /// Adds the row (section, key) or replaces its text: how a strings file enters the table.
    /// Sections and keys match exactly, case included. RStrings that refer to a replaced text
    /// keep seeing it until the next ResetStrings or RemoveGlobalStringTable. Once
    /// FinishedLoadingStrings has marked the table complete it is read-only: this raises
    /// TE_OBJECT_LOCKED (-17349) until ResetStrings or RStringsLoader::UnloadAll.
    static void SetString(char const* section, char const* key, char const* text);

    // ---- Strings files. ---------------------------------------------------------------------
    /// Reads the strings file `file` (UTF-8 INI text: "[SECTION]" headers and "KEY = text"
    /// lines) and enters all of its rows in one step; a bad file changes nothing. Raises the
    /// file's system error (TE_FILE_NOT_FOUND, TE_ACCESS_DENIED, ...), TE_BAD_FILE_FORMAT
    /// naming the file and line of the first problem, or TE_OBJECT_LOCKED when the table is
    /// complete.
    static void UseStringsFile(Path const& file);
    /// Reads every strings file ("*.strings.ini", in byte order of the names, so a later file's
    /// row replaces an earlier one's) of `directory` and enters their rows in one step: when one
    /// file is bad none is entered. A directory that does not exist holds no files. `*count`
    /// (when `count` is not null) receives the number of files entered.
    static void UseAllStringsFilesInDirectory(Path const& directory, unsigned int* count);

private:
    void CopyFrom(RString const& other);
    void Free();

    String const* m_string;
    bool m_ownsString;
};

/// Concatenations of a message with other text.
TEKIT_API DynamicString operator+(RString const& a, RString const& b);
TEKIT_API DynamicString operator+(RString const& a, String const& b);
TEKIT_API DynamicString operator+(String const& a, RString const& b);
TEKIT_API DynamicString operator+(RString const& a, char const* b);
TEKIT_API DynamicString operator+(char const* a, RString const& b);
TEKIT_API DynamicString operator+(RString const& a, wchar_t const* b);
#if TEKIT_HAS_OLE
TEKIT_API DynamicString operator+(RString const& a, _bstr_t const& b);
#endif

} // namespace tekit
