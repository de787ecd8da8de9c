// What the INI store offers IniObj beyond its flat functions: reading text held in memory with
// the file reader's line rules, writing the text into memory, and the atomic replacement of a
// file (temporary file "ini$$......tmp" beside it, 64 KiB blocks, flush, one rename) with any
// content, so the binary forms are saved by the same machinery as INI text.
#pragma once

#include "platform/File.h"
#include "platform/SystemError.h"
#include "tekit/ini/Ini.h"

#include <cstddef>
#include <string>

namespace tekit::ini {

/// The size of the blocks in which files are written.
inline constexpr std::size_t kWriteBlockSize = 64 * 1024;

/// Adds the `size` bytes at `text` to the object as Ini_ReadFromFile adds a file's bytes (the
/// line reader's rules, empty lines skipped, line numbers counted). 0 or a negative status.
int ReadFromMemory(IniHandle ini, char const* text, std::size_t size);

/// Appends the object's text to `out`, each line ending in `lineEnd`. 0 or a negative status.
int WriteToMemory(IniHandle ini, std::string& out, char const* lineEnd);

/// Bytes gathered into 64 KiB blocks and written to an open file; the first failed write is
/// kept and every later call fails at once.
class FileBlockWriter {
public:
    explicit FileBlockWriter(platform::NativeFile file);
    /// Buffers the bytes, writing each block as it fills. False once a write has failed.
    bool Append(void const* data, std::size_t size);
    /// Writes what is buffered. False once a write has failed.
    bool Flush();
    /// The failed write, if any.
    platform::SystemError const& Failure() const { return m_failure; }

private:
    platform::NativeFile m_file;
    std::string m_block;
    platform::SystemError m_failure;
};

/// Writes the whole content of the new file `file`: 0 or a negative status, with the system
/// call that failed in `failure` when one did.
using FileFiller = int (*)(void* context, platform::NativeFile file,
                           platform::SystemError& failure);

/// Replaces `path` by a file that `fill` writes: a temporary file "ini$$" + six characters +
/// ".tmp" created beside it, filled, flushed to the disk, closed and renamed over `path` in
/// one step. Returns 0; INI_ERR_CANT_WRITE_FILE when the target is read-only, a directory, or
/// its directory refuses the temporary file; INI_ERR_WRITE_FAILED when writing, flushing,
/// closing or renaming fails; or the filler's status. On failure the temporary file is
/// removed, the target is unchanged and `failure` names the system call that failed (empty
/// when the refusal came before any).
int ReplaceFileAtomically(char const* path, FileFiller fill, void* context,
                          platform::SystemError& failure);

/// Ini_WriteToFile with the failed system call reported in `failure`.
int WriteTextFile(IniHandle ini, char const* path, platform::SystemError& failure);

} // namespace tekit::ini
