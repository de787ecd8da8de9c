// DirectoryGetter: where the strings loader looks for translations of the message tables.
//
//   class TestDirectories : public DirectoryGetter {
//       void GetLanguageDirectories(String const& language, StringVector& dirs) override {
//           dirs.push_back(DynamicString("/srv/strings/"));
//       }
//       void GetLanguageConfigurationDirectory(String& dir) override { dir = "/srv/cfg/"; }
//   };
//
// The loader asks, and the installation answers: KnownDirectoryGetter (environment) names the
// installation's, the machine's and the user's directories; a test or an embedding program
// names its own. Directories are texts that end in the host's separator.
#pragma once

#include "tekit/Export.h"

namespace tekit {

class String;
class StringVector;

class TEKIT_API DirectoryGetter {
public:
    virtual ~DirectoryGetter();
    /// The directories that hold the strings files of `language`, in the order they are read:
    /// a row read later replaces one of the same section and key read earlier. Appends to
    /// `directories`; a directory that does not exist is simply skipped by the reader.
    virtual void GetLanguageDirectories(String const& language, StringVector& directories) = 0;
    /// The directory of the language configuration, which names the current language.
    virtual void GetLanguageConfigurationDirectory(String& directory) = 0;
};

} // namespace tekit
