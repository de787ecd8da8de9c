// Rows read from strings files, entering the global message table: the way the strings-file
// loader (in the INI store's layer, since strings files are INI files) changes the table that
// lives here.
//
//   std::vector<detail::LoadedString> rows = ...;            // read and checked beforehand
//   if (!detail::EnterLoadedStrings(rows, detail::LoadMode::kAdd, nullptr))
//       ... the table was marked complete: raise TE_OBJECT_LOCKED ...
#pragma once

#include <string>
#include <vector>

namespace tekit::detail {

struct LoadedString {
    std::string section;
    std::string key;
    std::string text;
};

enum class LoadMode {
    kAdd,           ///< the rows add to the table or replace its rows of the same names
    kReplaceLoaded, ///< the table goes back to its built-in rows first (a language change)
};

/// Enters `rows` in one step under the table's lock, each replacing the row of its section
/// and key. With kReplaceLoaded the table first holds its built-in rows only and then
/// `language` is the language it holds. Texts replaced stay in memory, so no RString that
/// points at one ever dangles before ResetStrings or RemoveGlobalStringTable. Returns false,
/// changing nothing, when FinishedLoadingStrings has marked the table complete.
bool EnterLoadedStrings(std::vector<LoadedString> const& rows, LoadMode mode, char const* language);
/// Back to the built-in rows, no language, not complete (texts stay in memory, as above).
void UnloadStrings();
/// The language of the last EnterLoadedStrings with kReplaceLoaded; "" when no language was
/// loaded since the table was built, reset or unloaded.
std::string LoadedLanguage();
/// Raises TE_OBJECT_LOCKED: the table is complete, strings can no longer be loaded.
[[noreturn]] void RaiseTableComplete(char const* function);

} // namespace tekit::detail
