// Files opened with an access, a sharing and a creation rule, as a file stream opens them, and
// the positioned reads, writes and size changes that such a stream makes.
//
//   SharedFileMode mode;
//   mode.access = FileAccess::ReadWrite;
//   mode.creation = FileCreation::CreateAlways;
//   NativeFile file = kNoFile;
//   if (SystemError const error = OpenSharedFile(path, mode, file))
//       ...   // native::kSharingViolation when another open excludes this one
//
// Windows applies the sharing rule itself (CreateFileA, or CreateFileW for a \\?\ long-path
// text). POSIX has no sharing modes: there an open-file-description lock stands in for them,
// taken before the file is truncated. Two opens conflict as Windows decides it: each one's
// access must be among the other's shared rights. Among the modes a stream uses, that leaves
// readers that share reading compatible with one another and everything else exclusive, so a
// reader takes a shared lock and every other open an exclusive one (a reader that shares
// nothing cannot lock a file exclusively there, and is treated as one that shares reading). The
// locks bind only programs that take them, that is, programs using this library. Files on
// POSIX can always be renamed or deleted while open, with or without `shareDelete`.
#pragma once

#include "platform/File.h"
#include "platform/SystemError.h"

#include <cstddef>
#include <cstdint>

namespace tekit::platform {

enum class FileAccess : unsigned char { Read, Write, ReadWrite };

enum class FileCreation : unsigned char {
    OpenExisting, ///< fails when the file does not exist
    OpenAlways,   ///< opens the file, creating it empty when missing
    CreateAlways, ///< as OpenAlways, then empties it
};

struct SharedFileMode {
    FileAccess access = FileAccess::Read;
    FileCreation creation = FileCreation::OpenExisting;
    bool shareRead = false;   ///< others may read the file while this open lasts
    bool shareDelete = false; ///< others may delete or rename it
    bool sequential = false;  ///< a hint: the file is read from start to end
};

#if defined(_WIN32)
/// Whether an open file can be renamed by its holder: Windows refuses while any handle lacks
/// delete sharing.
inline constexpr bool kOpenFilesCanBeRenamed = false;
#else
inline constexpr bool kOpenFilesCanBeRenamed = true;
#endif

/// Opens `path` as `mode` says; passes the fault seam as FaultKind::Open. A directory, and
/// writing a read-only file (the Windows rule, also on POSIX), fail with native::kAccessDenied;
/// a conflicting open with native::kSharingViolation.
SystemError OpenSharedFile(char const* path, SharedFileMode const& mode, NativeFile& file);
/// Writes all `size` bytes at `offset`, extending the file (with zero bytes up to `offset`
/// when it lies past the end); the file's own position does not matter. FaultKind::Write.
SystemError WriteToFileAt(NativeFile file, std::uint64_t offset, void const* data,
                          std::size_t size);
/// Makes the file exactly `size` bytes long. FaultKind::Write.
SystemError SetOpenFileSize(NativeFile file, std::uint64_t size);

} // namespace tekit::platform
