// PathBase: operations on the file or directory a path names, through the platform layer.
#include "tekit/paths/PathBase.h"

#include "errors/NativeError.h"
#include "paths/PathRules.h"
#include "platform/File.h"
#include "platform/SystemError.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/paths/DynamicPath.h"
#include "tekit/paths/Path.h"

#include <string>
#include <vector>

namespace tekit {

using platform::SystemError;

namespace {

/// The TEError of a native error: errno through the C runtime's numbering, Win32 codes as
/// file errors. ENOTSUP has no row in the runtime's errno table and says what it means.
TEError ToTEError(SystemError const& error) {
    return detail::NativeErrorToTEError(error, TE_IO_ERROR);
}

/// The "ERR_DESCR" message `key` with the paths as its first placeholders and the system's
/// reason, the code's own message, as the last. Filled from the last placeholder back, so a
/// '%' in a path is never taken for a placeholder.
DynamicString Describe(char const* key, SystemError const& error, char const* path,
                       char const* other = nullptr) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    RString const reason = TEErrorToRString(ToTEError(error));
    long const reasonNumber = other ? 3 : 2;
    message.Format(static_cast<char const*>(reason), reasonNumber);
    if (other)
        message.Format(other, 2);
    message.Format(path, 1);
    return message;
}

} // namespace

#define TE_RAISE_FILE_ERROR(error, description, function)                                          \
    TE_RAISE_API(ToTEError(error), (description), (function), (error).apiFunction, (error).code)

bool PathBase::Exists() const {
    platform::FileInfo info;
    return !platform::QueryFile(CStr(), info);
}

bool PathBase::IsDirectory() {
    if (sIsDirectory(GetPathString()))
        return true;
    platform::FileInfo info;
    return !platform::QueryFile(CStr(), info) && info.isDirectory;
}

bool PathBase::IsReadOnly() const {
    platform::FileInfo info;
    return !platform::QueryFile(CStr(), info) && info.isReadOnly;
}

std::uint64_t PathBase::GetFileSize() const {
    platform::FileInfo info;
    if (SystemError const error = platform::QueryFile(CStr(), info))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_READ_INFO_1_2", error, CStr()),
                            "PathBase::GetFileSize");
    return info.size;
}

std::uint64_t PathBase::GetFileTime(FileTimeOptions which) const {
    if (which < kCreationTime || which > kLastWriteTime)
        TE_RAISE_ASSERTION("invalid FileTimeOptions", "PathBase::GetFileTime");
    platform::FileInfo info;
    if (SystemError const error = platform::QueryFile(CStr(), info))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_READ_INFO_1_2", error, CStr()),
                            "PathBase::GetFileTime");
    return info.times[which];
}

void PathBase::SetFileTime(FileTimeOptions which, std::uint64_t fileTime) const {
    if (which < kCreationTime || which > kLastWriteTime)
        TE_RAISE_ASSERTION("invalid FileTimeOptions", "PathBase::SetFileTime");
    if (SystemError const error = platform::SetFileTimeValue(CStr(), which, fileTime))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CHANGE_1_2", error, CStr()),
                            "PathBase::SetFileTime");
}

void PathBase::SetReadOnly(bool readOnly) const {
    if (SystemError const error = platform::SetFileReadOnly(CStr(), readOnly))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CHANGE_1_2", error, CStr()),
                            "PathBase::SetReadOnly");
}

void PathBase::Delete() const {
    if (SystemError const error = platform::RemoveFileOrDirectory(CStr()))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_DELETE_1_2", error, CStr()),
                            "PathBase::Delete");
}

void PathBase::CopyTo(PathBase const& destination, bool overwrite) const {
    if (SystemError const error = platform::CopyRegularFile(CStr(), destination.CStr(), overwrite))
        TE_RAISE_FILE_ERROR(error,
                            Describe("PATH_CANT_COPY_1_2_3", error, CStr(), destination.CStr()),
                            "PathBase::CopyTo");
}

void PathBase::MoveTo(PathBase const& destination) const {
    if (SystemError const error = platform::MoveFileOrDirectory(CStr(), destination.CStr(), false))
        TE_RAISE_FILE_ERROR(error,
                            Describe("PATH_CANT_MOVE_1_2_3", error, CStr(), destination.CStr()),
                            "PathBase::MoveTo");
}

void PathBase::MoveToReplacing(PathBase const& destination) const {
    if (SystemError const error = platform::MoveFileOrDirectory(CStr(), destination.CStr(), true))
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
    if (SystemError const error = platform::MakeDirectories(CStr()))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_CREATE_DIRECTORIES_1_2", error, CStr()),
                            "PathBase::MakeAllDirectoriesInPathNameLong");
}

long PathBase::FindFilesEx(PathSet& files, bool includeDirectories) const {
    std::vector<std::string> found;
    if (SystemError const error = platform::ListMatchingFiles(CStr(), includeDirectories, found))
        TE_RAISE_FILE_ERROR(error, Describe("PATH_CANT_LIST_FILES_1_2", error, CStr()),
                            "PathBase::FindFilesEx");
    for (std::string const& name : found)
        files.insert(Path(name.c_str()));
    return static_cast<long>(found.size());
}

void PathBase::CreateUniqueTempFile(char const* prefix, PathBase& created) const {
    std::string name;
    if (SystemError const error = platform::CreateUniqueFile(CStr(), prefix ? prefix : "", name))
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
