// File operations built on the single calls of the family files: the copy through a temporary
// file, moves across volumes, directories made level by level, wildcard listings and unique
// file names. No system call is made here directly, so every one passes the fault seam.
#include "platform/File.h"

#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstring>
#include <memory>
#include <random>

namespace tekit::platform {

namespace {

constexpr std::size_t kCopyBufferSize = 65536;
constexpr char kCopyPrefix[] = ".tekit-copy-";
/// Six hexadecimal digits of unique names: all of them are tried before giving up.
constexpr std::uint32_t kUniqueNames = 0x1000000;

bool IsSeparator(char c) {
    return c != '\0' && std::strchr(kSeparators, c) != nullptr;
}

char FoldCase(char c) {
    return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c;
}

/// An open file, closed when it goes out of scope. Only files whose close can lose nothing
/// (read, or already failed) are left to the destructor; others call Close().
class ScopedFile {
public:
    ScopedFile() = default;
    ~ScopedFile() {
        if (m_file != kNoFile)
            CloseFile(m_file);
    }
    ScopedFile(ScopedFile const&) = delete;
    ScopedFile& operator=(ScopedFile const&) = delete;
    NativeFile& Get() { return m_file; }
    SystemError Close() {
        NativeFile const file = m_file;
        m_file = kNoFile;
        return CloseFile(file);
    }

private:
    NativeFile m_file = kNoFile;
};

/// Refuses before anything is done what Windows refuses: an existing `to` when not replacing,
/// and a directory or read-only `to`. `exists` tells whether anything was there.
SystemError CheckDestination(char const* to, bool replace, bool& exists) {
    FileInfo existing;
    exists = !QueryFile(to, existing);
    if (!exists)
        return {};
    if (!replace)
        return {kRenameFunction, native::kFileExists};
    if (existing.isDirectory)
        return {kRenameFunction, native::kIsDirectory};
    if (existing.isReadOnly)
        return {kRenameFunction, native::kAccessDenied};
    return {};
}

SystemError CopyContents(NativeFile in, NativeFile out) {
    std::unique_ptr<char[]> const buffer(new char[kCopyBufferSize]);
    for (;;) {
        std::size_t count = 0;
        if (SystemError const error = ReadFromFile(in, buffer.get(), kCopyBufferSize, count))
            return error;
        if (count == 0)
            return {};
        if (SystemError const error = WriteToFile(out, buffer.get(), count))
            return error;
    }
}

/// Fills the new file `out` from `in`, gives it the source's attributes, makes it durable and
/// closes it: after this only a rename is left to do.
SystemError FillCopy(NativeFile in, ScopedFile& out) {
    SystemError error = CopyContents(in, out.Get());
    if (!error)
        error = CopyFileAttributes(in, out.Get());
    if (!error)
        error = FlushFile(out.Get());
    SystemError const closed = out.Close();
    return error ? error : closed;
}

/// Removes a file that may carry the read-only flag, which deletion refuses.
SystemError DiscardFile(char const* path, bool readOnly) {
    if (readOnly)
        SetFileReadOnly(path, false);
    return RemoveFileOrDirectory(path);
}

/// A rename across volumes: copy, then remove the source; the copy goes again when that fails.
SystemError MoveAcrossVolumes(char const* from, char const* to, bool replace,
                              FileInfo const& source, bool destinationExisted) {
    if (SystemError const error = CopyRegularFile(from, to, replace))
        return error;
    SystemError const removed = DiscardFile(from, source.isReadOnly);
    if (!removed)
        return {};
    if (source.isReadOnly)
        SetFileReadOnly(from, true); // as it was
    if (!destinationExisted)
        DiscardFile(to, source.isReadOnly);
    return removed;
}

/// Index where the directories to create start: after "X:\" or "\\srv\share\" on Windows.
std::size_t FirstCreatedLevel(std::string const& text) {
    if constexpr (kWindowsFileNames) {
        if (text.size() >= 3 && text[1] == ':' && IsSeparator(text[2]))
            return 3;
        if (text.size() >= 2 && IsSeparator(text[0]) && IsSeparator(text[1])) {
            std::size_t const machineEnd = text.find_first_of(kSeparators, 2);
            std::size_t const shareEnd = machineEnd == std::string::npos
                                             ? machineEnd
                                             : text.find_first_of(kSeparators, machineEnd + 1);
            return shareEnd == std::string::npos ? text.size() : shareEnd + 1;
        }
    }
    return 0;
}

void RemoveMadeDirectories(std::vector<std::string> const& made) {
    for (auto it = made.rbegin(); it != made.rend(); ++it)
        RemoveEmptyDirectory(it->c_str());
}

/// Where this process starts numbering unique names; each call moves on by one.
std::uint32_t NextUniqueStart() {
    static std::atomic<std::uint32_t> next{static_cast<std::uint32_t>(
        std::random_device{}() ^
        static_cast<std::uint32_t>(std::chrono::steady_clock::now().time_since_epoch().count()))};
    return next.fetch_add(1, std::memory_order_relaxed);
}

std::string UniqueName(std::string const& directory, char const* prefix, std::uint32_t number) {
    char suffix[16];
    std::snprintf(suffix, sizeof suffix, "%06lX.tmp",
                  static_cast<unsigned long>(number % kUniqueNames));
    return directory + prefix + suffix;
}

} // namespace

std::string DirectoryOf(std::string const& path) {
    std::size_t const end = path.find_last_of(kWindowsFileNames ? "\\/:" : "/");
    return end == std::string::npos ? std::string() : path.substr(0, end + 1);
}

bool MatchesWildcard(char const* pattern, char const* name) {
    if (std::strcmp(pattern, "*.*") == 0)
        return true;
    char const* star = nullptr;
    char const* resume = nullptr;
    while (*name) {
        if (*pattern == '*') {
            star = pattern++;
            resume = name;
        } else if (*pattern == '?' || FoldCase(*pattern) == FoldCase(*name)) {
            ++pattern;
            ++name;
        } else if (star) {
            pattern = star + 1;
            name = ++resume;
        } else {
            return false;
        }
    }
    while (*pattern == '*')
        ++pattern;
    return *pattern == '\0';
}

SystemError CopyRegularFile(char const* from, char const* to, bool overwrite) {
    ScopedFile in;
    if (SystemError const error = OpenFileForReading(from, in.Get()))
        return error;
    bool exists = false;
    if (SystemError const error = CheckDestination(to, overwrite, exists))
        return error;
    ScopedFile out;
    std::string temporary;
    if (SystemError const error = CreateUniqueFile(to, kCopyPrefix, temporary, &out.Get()))
        return error;
    SystemError error = FillCopy(in.Get(), out);
    if (!error)
        error = RenameFile(temporary.c_str(), to, overwrite);
    if (error)
        DiscardFile(temporary.c_str(), true); // it may have the source's read-only flag
    return error;
}

SystemError MoveFileOrDirectory(char const* from, char const* to, bool replace) {
    FileInfo source;
    if (SystemError const error = QueryFile(from, source))
        return {kRenameFunction, error.code};
    bool destinationExisted = false;
    if (SystemError const error = CheckDestination(to, replace, destinationExisted))
        return error;
    SystemError const renamed = RenameFile(from, to, replace);
    if (!renamed || renamed.code != native::kCrossDevice || source.isDirectory)
        return renamed;
    return MoveAcrossVolumes(from, to, replace, source, destinationExisted);
}

SystemError MakeDirectories(char const* path) {
    std::string const text = path;
    bool created = false;
    if (text.empty())
        return MakeDirectory(path, created); // the system's own error for an empty path
    std::vector<std::string> made;
    for (std::size_t end = FirstCreatedLevel(text); end < text.size();) {
        std::size_t const separator = text.find_first_of(kSeparators, end);
        end = separator == std::string::npos ? text.size() : separator + 1;
        std::string const prefix = text.substr(0, separator == std::string::npos ? end : separator);
        if (prefix.empty() || IsSeparator(prefix.back()))
            continue;
        if (SystemError const error = MakeDirectory(prefix.c_str(), created)) {
            RemoveMadeDirectories(made);
            return error;
        }
        if (created)
            made.push_back(prefix);
    }
    return {};
}

SystemError ListMatchingFiles(char const* pattern, bool includeDirectories,
                              std::vector<std::string>& paths) {
    std::string const text = pattern;
    std::string const directory = DirectoryOf(text);
    std::string const namePattern = text.substr(directory.size());
    std::vector<DirectoryEntry> entries;
    if (SystemError const error = ListDirectory(directory, entries))
        return error;
    for (DirectoryEntry const& entry : entries) {
        bool const wanted = !entry.isDirectory || includeDirectories;
        if (wanted && !namePattern.empty() &&
            MatchesWildcard(namePattern.c_str(), entry.name.c_str()))
            paths.push_back(directory + entry.name);
    }
    return {};
}

SystemError CreateUniqueFile(char const* target, char const* prefix, std::string& created,
                             NativeFile* file) {
    std::string const text = target;
    std::string const directory =
        !text.empty() && IsSeparator(text.back()) ? text : DirectoryOf(text);
    std::uint32_t const start = NextUniqueStart();
    SystemError error;
    for (std::uint32_t attempt = 0; attempt < kUniqueNames; ++attempt) {
        std::string const name = UniqueName(directory, prefix, start + attempt);
        NativeFile opened = kNoFile;
        error = CreateTemporaryFile(name.c_str(), opened);
        if (!error) {
            created = name;
            if (file)
                *file = opened;
            else
                CloseFile(opened); // an empty file: its close loses nothing
            return {};
        }
        if (error.code != native::kFileExists && error.code != native::kAlreadyExists)
            return error;
    }
    return error;
}

} // namespace tekit::platform
