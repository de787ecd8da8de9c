// What RString's strings-file functions, StringsFile and RStringsLoader share: the loading
// lock, reading one file into rows, finding the strings files of a directory, and entering
// rows into the message table.
#pragma once

#include "errors/LoadedStrings.h"

#include <string>
#include <vector>

namespace tekit::ini {

/// Holds the lock of every load of strings files (exclusively) while it lives: loads from
/// several threads follow one another. Lookups never wait for it.
class StringsLoadingLock {
public:
    StringsLoadingLock();
    ~StringsLoadingLock();
    StringsLoadingLock(StringsLoadingLock const&) = delete;
    StringsLoadingLock& operator=(StringsLoadingLock const&) = delete;
};

/// Reads and checks the strings file `path`, appending its rows (and, when `lines` is given,
/// their line numbers). Raises as StringsFile::Read does, in the name of `function`.
void ReadStringsFile(char const* path, char const* function,
                     std::vector<detail::LoadedString>& rows, std::vector<int>* lines = nullptr);
/// The same for `size` bytes in memory, named `name` in messages.
void ReadStringsText(char const* name, char const* bytes, std::size_t size, char const* function,
                     std::vector<detail::LoadedString>& rows, std::vector<int>* lines = nullptr);

/// The strings files ("*.strings.ini") of `directory`, in byte order of their names, appended
/// to `files`. A directory that does not exist has none; another failure to list it raises
/// its system error.
void ListStringsFiles(std::string directory, char const* function, std::vector<std::string>& files);

/// Raises TE_OBJECT_LOCKED when the message table is complete.
void EnsureTableOpen(char const* function);
/// Enters `rows` (see detail::EnterLoadedStrings); raises TE_OBJECT_LOCKED when the table is
/// complete.
void EnterRows(std::vector<detail::LoadedString> const& rows, detail::LoadMode mode,
               char const* language, char const* function);

} // namespace tekit::ini
