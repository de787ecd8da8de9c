// PathBase: operations on the file or directory a path names, through the platform layer.
#include "tekit/paths/PathBase.h"

#include "paths/PathRules.h"
#include "platform/Platform.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <string>
#include <vector>

namespace tekit {

using platform::FileError;

namespace {

/// The "ERR_DESCR" message `key` with the paths as its first placeholders and the system's
/// reason, the code's own message, as the last. Filled from the last placeholder back, so a
/// '%' in a path is never taken for a placeholder.
DynamicString Describe(char const* key, FileError const& error, char const* path,
                       char const* other = nullptr) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    RString const reason = TEErrorToRString(TEError(error.code));
    long const reasonNumber = other ? 3 : 2;
    message.Format(static_cast<char const*>(reason), reasonNumber);
    if (other)
        message.Format(other, 2);
    message.Format(path, 1);
    return message;
}

} // namespace

#define TE_RAISE_FILE_ERROR(error, description, function)                                          \
    TE_RAISE_API(TEError((error).code), (description), (function), (error).apiFunction,            \
                 (error).systemCode)

bool PathBase::Exists() const {
    platform::FileInfo info;
    FileError error;
    return platform::QueryFile(CStr(), info, error);
}

bool PathBase::IsDirectory() {
    if (sIsDirectory(GetPathString()))
        return true;
    platform::FileInfo info;
    FileError error;
    return platform::QueryFile(CStr(), info, error) && info.isDirectory;
}

bool PathBase::IsReadOnly() const {
    platform::FileInfo info;
    FileError error;
    return platform::QueryFile(CStr(), info, error) && info.isReadOnly;
}

std::uint64_t PathBase::GetFileSize() const {
    platform::FileInfo info;
    FileError error;
    if (!platform::QueryFile(CStr(), info, error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_READ_INFO_1_2", error, CStr()),
                            "PathBase::GetFileSize");
    return info.size;
}

std::uint64_t PathBase::GetFileTime(FileTimeOptions which) const {
    if (which < kCreationTime || which > kLastWriteTime)
        TE_RAISE_ASSERTION("invalid FileTimeOptions", "PathBase::GetFileTime");
    platform::FileInfo info;
    FileError error;
    if (!platform::QueryFile(CStr(), info, error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_READ_INFO_1_2", error, CStr()),
                            "PathBase::GetFileTime");
    return info.times[which];
}

void PathBase::SetFileTime(FileTimeOptions which, std::uint64_t fileTime) const {
    if (which < kCreationTime || which > kLastWriteTime)
        TE_RAISE_ASSERTION("invalid FileTimeOptions", "PathBase::SetFileTime");
    FileError error;
    if (!platform::SetFileTimeValue(CStr(), which, fileTime, error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CHANGE_1_2", error, CStr()),
                            "PathBase::SetFileTime");
}

void PathBase::SetReadOnly(bool readOnly) const {
    FileError error;
    if (!platform::SetFileReadOnly(CStr(), readOnly, error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CHANGE_1_2", error, CStr()),
                            "PathBase::SetReadOnly");
}

void PathBase::Delete() const {
    FileError error;
    if (!platform::RemoveFileOrDirectory(CStr(), error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_DELETE_1_2", error, CStr()),
                            "PathBase::Delete");
}

void PathBase::CopyTo(PathBase const& destination, bool overwrite) const {
    FileError error;
    if (!platform::CopyRegularFile(CStr(), destination.CStr(), overwrite, error))
        TE_RAISE_FILE_ERROR(error,
                            Describe("PATH_CANT_COPY_1_2_3", error, CStr(), destination.CStr()),
                            "PathBase::CopyTo");
}

void PathBase::MoveTo(PathBase const& destination) const {
    FileError error;
    if (!platform::MoveFileOrDirectory(CStr(), destination.CStr(), false, error))
        TE_RAISE_FILE_ERROR(error,
                            Describe("PATH_CANT_MOVE_1_2_3", error, CStr(), destination.CStr()),
                            "PathBase::MoveTo");
}

void PathBase::MoveToReplacing(PathBase const& destination) const {
    FileError error;
    if (!platform::MoveFileOrDirectory(CStr(), destination.CStr(), true, error))
        TE_RAISE_FILE_ERROR(error,
                            Describe("PATH_CANT_MOVE_1_2_3", error, CStr(), destination.CStr()),
                            "PathBase::MoveToReplacing");
}

void PathBase::MakeBackupCopy(PathBase& backup) const {
    DynamicString name(CStr(), true);
    name += ".bak";
    CopyTo(DynamicPath(name), true);
    backup.SetPathName(name);
}

void PathBase::MakeAllDirectoriesInPathNameLong() const {
    FileError error;
    if (!platform::MakeDirectories(CStr(), error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CREATE_DIRECTORIES_1_2", error, CStr()),
                            "PathBase::MakeAllDirectoriesInPathNameLong");
}

long PathBase::FindFilesEx(PathSet& files, bool includeDirectories) const {
    std::vector<std::string> found;
    FileError error;
    if (!platform::ListMatchingFiles(CStr(), includeDirectories, found, error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_LIST_FILES_1_2", error, CStr()),
                            "PathBase::FindFilesEx");
    for (std::string const& name : found)
        files.insert(Path(name.c_str()));
    return static_cast<long>(found.size());
}

void PathBase::CreateUniqueTempFile(char const* prefix, PathBase& created) const {
    std::string name;
    FileError error;
    if (!platform::CreateUniqueFile(CStr(), prefix ? prefix : "", name, error))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CREATE_TEMP_FILE_1_2", error, CStr()),
                            "PathBase::CreateUniqueTempFile");
    created.SetPathName(name.c_str());
}

bool PathBase::ShortPathNameAwareEquals(char const* other, bool askFileSystem) const {
    return EqualsText(other) ||
           (askFileSystem && other && platform::SameExistingFile(CStr(), other));
}
bool PathBase::ShortPathNameAwareEquals(String const& other, bool askFileSystem) const {
    return ShortPathNameAwareEquals(other.GetBufferReadPtr(), askFileSystem);
}
bool PathBase::ShortPathNameAwareEquals(PathBase const& other, bool askFileSystem) const {
    return ShortPathNameAwareEquals(other.CStr(), askFileSystem);
}

bool PathBase::GetCurrentDir(PathBase& out) {
    std::string directory;
    if (!platform::CurrentDirectory(directory))
        return false;
    out.SetPathName(directory.c_str());
    return true;
}

void PathBase::SetUsingGetModuleFileName(HINSTANCE module) {
    std::string file;
    if (!platform::ModuleFileName(module, file))
        file.clear();
    SetPathName(file.c_str());
}

} // namespace tekit
