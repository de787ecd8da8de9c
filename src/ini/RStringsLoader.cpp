// RStringsLoader: a language's strings files, from the directories a DirectoryGetter names,
// into the message table in one step; the language configuration.
#include "tekit/errors/RStringsLoader.h"

#include "errors/LoadedStrings.h"
#include "ini/StringsFiles.h"
#include "tekit/errors/DirectoryGetter.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEException.h"
#include "tekit/strings/StringVector.h"

#include <cstring>
#include <string>
#include <vector>

namespace tekit {

namespace {

using detail::LoadedString;

/// A language names a folder: not empty, no separator, ':' or control character, no leading
/// '.' (so neither "." nor ".." climbs out of the language directory).
bool IsLanguageName(std::string const& name) {
    if (name.empty() || name[0] == '.')
        return false;
    for (char c : name)
        if (c == '/' || c == '\\' || c == ':' || static_cast<unsigned char>(c) < 0x20 || c == 0x7F)
            return false;
    return true;
}

[[noreturn]] void RaiseBadLanguage(std::string const& name, char const* function) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", "LANGUAGE_NAME_INVALID_1")),
                          true);
    message.Format(name.c_str(), 1);
    TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, message, function);
}

} // namespace

RStringsLoader::RStringsLoader(DirectoryGetter& directories) : m_directories(directories) {}

RStringsLoader::~RStringsLoader() = default;

unsigned int RStringsLoader::Load(String const& language, bool raiseOnBadFile) {
    char const* const kFunction = "RStringsLoader::Load";
    std::string const name(language.GetBufferReadPtr(),
                           static_cast<std::size_t>(language.GetNumBytes()));
    if (!IsLanguageName(name))
        RaiseBadLanguage(name, kFunction);
    ini::StringsLoadingLock const lock;
    ini::EnsureTableOpen(kFunction);
    StringVector directories;
    m_directories.GetLanguageDirectories(language, directories);
    std::vector<LoadedString> rows;
    unsigned int files = 0;
    // A file or directory left out is reported on the debug output (diagnostic level > 0).
    auto const leaveOut = [&](TEException const& e) {
        if (raiseOnBadFile)
            throw;
        TE_WARN(e.GetDescription(), kFunction);
    };
    for (DynamicString const& directory : directories) {
        std::vector<std::string> paths;
        try {
            ini::ListStringsFiles(directory.GetBufferReadPtr(), kFunction, paths);
        } catch (TEException const& e) {
            leaveOut(e);
        }
        for (std::string const& path : paths) {
            std::size_t const before = rows.size();
            try {
                ini::ReadStringsFile(path.c_str(), kFunction, rows);
                ++files;
            } catch (TEException const& e) {
                rows.resize(before);
                leaveOut(e);
            }
        }
    }
    ini::EnterRows(rows, detail::LoadMode::kReplaceLoaded, name.c_str(), kFunction);
    return files;
}

unsigned int RStringsLoader::LoadCurrent() {
    DynamicString language;
    LoadLangConfig(language);
    return Load(language, false);
}

unsigned int RStringsLoader::LoadDefault(bool raiseOnBadFile) {
    return Load(DynamicString(kDefaultLanguage, false), raiseOnBadFile);
}

void RStringsLoader::UnloadAll() {
    ini::StringsLoadingLock const lock;
    detail::UnloadStrings();
}

DynamicString RStringsLoader::CurrentLanguage() const {
    return DynamicString(detail::LoadedLanguage().c_str());
}

void RStringsLoader::LoadLangConfig(String& language) {
    char const* const kFunction = "RStringsLoader::LoadLangConfig";
    DynamicString directory;
    m_directories.GetLanguageConfigurationDirectory(directory);
    std::string path = directory.GetBufferReadPtr();
    path += kConfigurationFile;
    std::vector<LoadedString> rows;
    try {
        ini::ReadStringsFile(path.c_str(), kFunction, rows);
    } catch (TEException const& e) {
        if (e.GetErrorCode() != TE_FILE_NOT_FOUND && e.GetErrorCode() != TE_PATH_NOT_FOUND)
            throw;
    }
    language.Assign(kDefaultLanguage);
    for (LoadedString const& row : rows)
        if (row.section == kConfigurationSection && row.key == kConfigurationKey &&
            !row.text.empty()) {
            language.Assign(row.text.c_str());
            break;
        }
}

} // namespace tekit
