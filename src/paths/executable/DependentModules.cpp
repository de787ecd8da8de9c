// FindDependentModules: a breadth-first walk over the imports (and forwarders) of a module and
// of every DLL found for it.
#include "tekit/paths/DependentModules.h"

#include "platform/File.h"
#include "tekit/paths/ExecutableFile.h"
#include "tekit/strings/StringVector.h"

#include <cstring>
#include <deque>
#include <map>
#include <string>
#include <unordered_map>

namespace tekit {

namespace {

std::string Lower(char const* text) {
    std::string lower = text ? text : "";
    for (char& c : lower)
        if (c >= 'A' && c <= 'Z')
            c = static_cast<char>(c + 32);
    return lower;
}

std::string AsDirectory(std::string directory) {
    if (!directory.empty() && !std::strchr(platform::kSeparators, directory.back()) &&
        !(platform::kWindowsFileNames && directory.back() == ':'))
        directory += platform::kSeparators[0];
    return directory;
}

/// Finds DLLs by name in the search directories, listing each directory once.
class Finder {
public:
    explicit Finder(std::vector<std::string> directories) : m_directories(std::move(directories)) {}

    /// The path of the file `name` (any case), or empty.
    std::string Find(char const* name) {
        std::string const wanted = Lower(name);
        for (std::string const& directory : m_directories) {
            auto const& files = Listing(directory);
            auto const found = files.find(wanted);
            if (found != files.end())
                return directory + found->second;
        }
        return {};
    }

private:
    std::unordered_map<std::string, std::string> const& Listing(std::string const& directory) {
        auto cached = m_listings.find(directory);
        if (cached != m_listings.end())
            return cached->second;
        std::unordered_map<std::string, std::string> files;
        std::vector<platform::DirectoryEntry> entries;
        // A directory that cannot be listed holds nothing for us.
        if (!platform::ListDirectory(directory, entries))
            for (platform::DirectoryEntry const& entry : entries)
                if (!entry.isDirectory)
                    files.emplace(Lower(entry.name.c_str()), entry.name);
        return m_listings.emplace(directory, std::move(files)).first->second;
    }

    std::vector<std::string> m_directories;
    std::map<std::string, std::unordered_map<std::string, std::string>> m_listings;
};

} // namespace

std::vector<DependentModule> FindDependentModules(PathBase const& file,
                                                  PathBase::PathVector const& searchDirectories) {
    std::vector<std::string> directories{AsDirectory(platform::DirectoryOf(file.CStr()))};
    for (Path const& directory : searchDirectories)
        directories.push_back(AsDirectory(directory.CStr()));
    Finder finder(std::move(directories));

    std::vector<DependentModule> modules;
    std::unordered_map<std::string, std::size_t> known; // lower-case name -> index
    // The file itself, by the name after its directory (in the host's separators).
    std::string const own = file.CStr();
    known.emplace(Lower(own.substr(platform::DirectoryOf(own).size()).c_str()), SIZE_MAX);

    // A module needed again in a stronger way (ordinarily rather than delay-loaded, directly
    // rather than through a forwarder) loses the weaker mark.
    auto const need = [&](DynamicString const& name, DynamicString const& neededBy, bool delay,
                          bool forwarded, std::deque<std::size_t>& queue) {
        auto const [at, added] = known.emplace(Lower(name.GetBufferReadPtr()), modules.size());
        if (!added) {
            if (at->second != SIZE_MAX) {
                DependentModule& module = modules[at->second];
                module.delayLoaded = module.delayLoaded && delay;
                module.forwarded = module.forwarded && forwarded;
            }
            return;
        }
        DependentModule module;
        module.name = name;
        module.neededBy = neededBy;
        module.delayLoaded = delay;
        module.forwarded = forwarded;
        std::string const location = finder.Find(name.GetBufferReadPtr());
        module.location = DynamicPath(location.c_str());
        modules.push_back(std::move(module));
        if (!location.empty())
            queue.push_back(modules.size() - 1);
    };

    std::deque<std::size_t> queue;
    auto const visit = [&](char const* path, DynamicString const& label) {
        ExecutableFile const executable{DynamicPath(path)};
        ImportTable const imports = executable.ReadImports();
        for (ImportedModule const& imported : imports.GetModules())
            need(imported.name, label, imported.delayLoaded, false, queue);
        ExportTable const exports = executable.ReadExports();
        for (ExportedFunction const& function : exports.GetFunctions()) {
            if (!function.IsForwarded())
                continue;
            char const* const text = function.forwarder.GetBufferReadPtr();
            char const* const dot = std::strrchr(text, '.');
            if (!dot || dot == text)
                continue;
            DynamicString target(std::string(text, dot).append(".dll").c_str());
            if (Lower(target.GetBufferReadPtr()) ==
                Lower(exports.GetModuleName().GetBufferReadPtr()))
                continue;
            need(target, label, false, true, queue);
        }
    };
    visit(file.CStr(), DynamicString(file.CStr()));
    while (!queue.empty()) {
        std::size_t const index = queue.front();
        queue.pop_front();
        DynamicPath const location = modules[index].location;
        DynamicString const label = modules[index].name;
        visit(location.CStr(), label);
    }
    return modules;
}

} // namespace tekit
