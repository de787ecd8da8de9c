// RStringsLoader: puts the message table into one language, from the strings files of the
// directories a DirectoryGetter names.
//
//   KnownDirectoryGetter directories;      // tekit/environment/KnownDirectories.h
//   RStringsLoader loader(directories);
//   loader.LoadCurrent();                  // the language the configuration names
//   RString::FinishedLoadingStrings();     // from now on the table is read-only
//
// The strings files of a language are the files "*.strings.ini" (tekit/ini/StringsFile.h) of
// each of the language's directories, read directory by directory in the getter's order and
// within a directory in byte order of the names; a later row replaces an earlier one of the
// same section and key, and every row replaces the built-in row it names. A language's rows
// always stand on the built-in English rows: loading a language first drops the rows of the
// language loaded before. A directory that does not exist holds no files.
//
// The language configuration is the INI file "Language.ini" in the getter's configuration
// directory, read as a strings file (UTF-8):
//
//   [Language]
//   Current = German
//
// Without the file, the section or the key, the current language is kDefaultLanguage.
//
// A load is all or nothing: the files are read and checked first, then their rows enter the
// table in one step, under a lock of the library held for the whole load, so loads from
// several threads follow one another and lookups never see half a language. Replaced texts
// stay in memory, so RStrings taken before a load keep valid (old) texts. After
// RString::FinishedLoadingStrings a load raises TE_OBJECT_LOCKED; UnloadAll opens the table
// again.
//
// This class and RString::UseStringsFile are declared with the message table and defined with
// the INI store, whose reader they use: the layer of the message table stays free of INI code.
#pragma once

#include "tekit/Export.h"
#include "tekit/strings/DynamicString.h"

namespace tekit {

class DirectoryGetter;
class String;

class TEKIT_API RStringsLoader {
public:
    /// The language of the built-in rows, and the one without configuration.
    static constexpr char const kDefaultLanguage[] = "English";
    /// The language configuration's file, section and key.
    static constexpr char const kConfigurationFile[] = "Language.ini";
    static constexpr char const kConfigurationSection[] = "Language";
    static constexpr char const kConfigurationKey[] = "Current";

    /// `directories` must outlive the loader.
    explicit RStringsLoader(DirectoryGetter& directories);
    virtual ~RStringsLoader();
    RStringsLoader(RStringsLoader const&) = delete;
    RStringsLoader& operator=(RStringsLoader const&) = delete;

    /// Puts the table into `language`: the built-in rows, then the rows of every strings file
    /// of the language. Returns the number of files entered. With `raiseOnBadFile` a file or
    /// directory that cannot be read, or a bad file, raises its TEException and the table
    /// stays as it was; without it such a file is left out (and reported as a warning on the
    /// debug output) and the others are entered. A language name is a folder name: an empty
    /// name, one with a separator, ':' or a control character, or one starting with '.'
    /// raises TE_INVALID_OR_OUT_OF_RANGE.
    unsigned int Load(String const& language, bool raiseOnBadFile);
    /// Loads the language that the configuration names (LoadLangConfig), leaving bad files
    /// out: a broken translation must not keep a program from starting.
    unsigned int LoadCurrent();
    /// Loads kDefaultLanguage: the built-in rows and the strings files of "English", which may
    /// reword them.
    unsigned int LoadDefault(bool raiseOnBadFile);
    /// Drops every loaded row (those of RString::UseStringsFile and SetString too): the table
    /// holds the built-in rows, no language, and is open for loading again.
    void UnloadAll();
    /// The language the table holds: the name of the last load, "" before any load and after
    /// UnloadAll or RString::ResetStrings.
    DynamicString CurrentLanguage() const;

protected:
    /// Sets `language` to the language the configuration names, kDefaultLanguage when there is
    /// none. A configuration that exists but cannot be read, or is a bad file, raises as
    /// StringsFile::Read does. A derived loader may keep its configuration elsewhere.
    virtual void LoadLangConfig(String& language);

    DirectoryGetter& m_directories;
};

} // namespace tekit
