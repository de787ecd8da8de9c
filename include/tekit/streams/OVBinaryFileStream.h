// OVBinaryFileStream: the binary stream over a file on disk. Values are encoded exactly as in
// the memory stream (raw little-endian bytes, strings followed by a NUL; see OVMemoryStream.h),
// so an object saved through one loads through the other, but the file is never held in
// memory as a whole.
//
//   OVBinaryFileStream out("C:\\Data\\run.bin", kOVFileStreamCreateForWrite);
//   out.WriteInt("Count", 2);
//   out.WriteString("Name", name);
//   out.Flush();                                   // optional: the destructor flushes too
//
//   OVBinaryFileStream in("C:\\Data\\run.bin", kOVFileStreamOpenForRead, false, 2.0);
//   int count = in.ReadInt("Count");               // waits up to 2 s for a writer to close
//
// How each type opens the file:
//
//   type                              access      others may       when opening
//   kOVFileStreamOpenForRead          read        read             the file must exist
//   kOVFileStreamOpenForWrite         write       nothing          kept, created if missing
//   kOVFileStreamOpenForReadWrite     read/write  read             the file must exist
//   kOVFileStreamCreateForWrite       write       nothing          emptied, created if missing
//   kOVFileStreamCreateForReadWrite   read/write  nothing          emptied, created if missing
//   kOVFileStreamNoFile               no file is opened; the path is kept
//
// With the share-delete flag, others may also delete or rename the file while it is open.
// Every stream starts at offset 0, also a write stream over a file it keeps.
//
// Sharing. Windows enforces the "others may" column itself: two opens coexist only when each
// one's access is among the other's shared rights, so of these types only readers coexist (a
// reader does not share writing, so even kOVFileStreamOpenForReadWrite, which shares reading,
// refuses a later reader). On other systems the stream emulates this with open-file-description
// locks taken before the file is emptied: a shared lock for kOVFileStreamOpenForRead, an
// exclusive one for the types that write. A second stream that Windows would refuse is refused
// there with the same TE_SHARING_VIOLATION, from this process or another; programs that do not
// use this library are not bound by the locks, and open files can always be renamed or deleted.
//
// Retry. A file that is busy is often busy only for a moment. With a retry time above 0,
// opening that fails with TE_ACCESS_DENIED or TE_SHARING_VIOLATION is tried again every 75 to
// 100 ms until it succeeds or the retry time has passed; any other failure is raised at once.
//
// Writes are gathered in a 64 KiB buffer in the stream and reach the file when it fills, on
// Flush, before a read, a truncation, a move or a change of type, and on destruction; small
// reads are served from the same buffer, read ahead. Offsets, sizes and reads always see the
// buffered writes. The file's size is taken when it opens: changes that other programs make
// to it meanwhile are not seen.
//
// Failures raise TEException with the operation's qualified name as context
// ("OVBinaryFileStream::WriteBytes", ...):
//   TE_PROGRAM_ERROR (-17001)          an open type outside the table; truncation past the end
//                                      (assertions)
//   TE_BAD_FILE_FORMAT (-17100)        a read past the end, a string with no terminator
//   TE_ACCESS_DENIED (-17205)          the system refuses the access (permissions, a read-only
//                                      file, a directory, a file being deleted); reading a
//                                      write-only stream or writing a read-only one
//   TE_SHARING_VIOLATION (-17209)      another stream holds the file in a way that excludes
//                                      this one
//   other file errors (-172xx)         converted from the system's error (not found, disk full,
//                                      ...)
//   TE_IO_ERROR (-17200)               reading, writing, truncating or flushing a stream
//                                      without a file
//   TE_UINT32_OVERFLOW (-17011)        GetOffset or GetSize past 4 GiB: use the Large forms
//   TE_NOT_SUPPORTED, TE_INVALID_OR_OUT_OF_RANGE    WriteStream's source, see there
// A failed operation leaves the offset as it was; a failed write keeps its bytes buffered, so
// that Flush can try them again.
//
// Not locked: one thread uses a stream at a time.
#pragma once

#include "tekit/streams/OVStream.h"
#include "tekit/strings/DynamicString.h"

#include <cstddef>
#include <cstdint>

namespace tekit {

/// How OVBinaryFileStream opens its file (see the table above).
enum OVFileStreamOpenType {
    kOVFileStreamOpenForRead = 0,
    kOVFileStreamOpenForWrite = 1,
    kOVFileStreamOpenForReadWrite = 2,
    kOVFileStreamCreateForWrite = 3,
    kOVFileStreamCreateForReadWrite = 4,
    kOVFileStreamNoFile = 5,
};

class TEKIT_API OVBinaryFileStream : public OVStream {
public:
    /// Bytes gathered before a write reaches the file.
    static constexpr std::uint32_t kWriteBufferSize = 64 * 1024;

    /// Opens `path` as `type` says, retrying busy files for `retryTime` seconds (see above).
    /// `shareDelete` lets others delete or rename the open file. `longPath` passes the path
    /// through the long-path form (\\?\...) before every open so that it may exceed 260
    /// characters; it matters on Windows only, other systems have no such limit. Raises the
    /// open's error (TE_UNABLE_TO_OPEN_FILE_DESC or TE_CANT_WRITE_FILE_ELAB message with the
    /// path, context "OVBinaryFileStream::OpenWithNoRetry") or TE_PROGRAM_ERROR for a bad type.
    OVBinaryFileStream(char const* path, OVFileStreamOpenType type, bool shareDelete = false,
                       double retryTime = 0, bool longPath = false);
    /// Writes what is buffered (a failure is lost: call Flush to see it) and closes the file.
    ~OVBinaryFileStream() override;
    OVBinaryFileStream(OVBinaryFileStream const&) = delete;
    OVBinaryFileStream& operator=(OVBinaryFileStream const&) = delete;

    OVFileStreamOpenType GetStreamType() const { return m_type; }
    /// Closes the file (writing what is buffered) and opens it again as `type` says, with the
    /// retries of the constructor; the offset goes to 0. kOVFileStreamNoFile only closes it.
    /// On failure the stream has no file (its type is `type`).
    void SetStreamType(OVFileStreamOpenType type);
    /// Writes what is buffered and makes the file's contents durable (fsync, FlushFileBuffers).
    void Flush();
    /// Moves the open file to `newPath` and goes on using it there, at the same offset and
    /// type; `newPath` must not exist. Raises the rename's converted error (message key
    /// TE_CANT_WRITE_FILE_ELAB with the new path), leaving the file where it was and open.
    /// A stream without a file only changes its path. Where open files cannot be renamed
    /// (Windows), the stream closes the file for the rename and opens it again; when that
    /// fails, the open's error is raised and the stream has no file.
    void Move(String const& newPath);
    /// As Move, but an existing file `newPath` is replaced.
    void ForceMove(String const& newPath);
    /// The path as given (not in its long-path form).
    String const& GetFilePath() const { return m_path; }
    /// Whether the stream has a file open.
    bool IsOpen() const;
    /// Moves the offset anywhere in 64 bits, also past the end (see SetOffset).
    void SetLargeOffset(std::uint64_t offset);

    // ---- The stream slots. -------------------------------------------------------------
    /// Raises TE_UINT32_OVERFLOW past 4 GiB.
    std::uint32_t GetOffset() const override;
    std::uint64_t GetLargeOffset() const override { return m_offset; }
    /// Any offset is accepted, also one past the end: reads there fail, a write there fills
    /// the gap with zero bytes.
    void SetOffset(unsigned int offset) override { SetLargeOffset(offset); }
    void TruncateAtCurrentOffset() override;
    void WriteBytes(void const* data, unsigned int count) override;
    unsigned int ReadBytes(void* data, unsigned int count, TEError errorIfShort) override;
    /// The flags are ignored: the bytes of `value` and a NUL are written.
    void WriteString(char const* name, String const& value, bool escape = true,
                     bool toCRLF = false) override;
    /// Reads up to the next NUL, which it consumes.
    void ReadString(char const* name, DynamicString& value) override;
    void WriteInt(char const* name, int value) override;
    void WriteUInt(char const* name, unsigned int value) override;
    void WriteDouble(char const* name, double value) override;
    void WriteBool(char const* name, bool value) override;
    void WriteInt64(char const* name, std::int64_t value) override;
    void WriteUInt64(char const* name, std::uint64_t value) override;
    /// Supports memory-stream and binary-file-stream sources (not this stream itself); any
    /// other raises TE_NOT_SUPPORTED "Stream type not support by
    /// OVBinaryFileStream::WriteStream.". An `offset` past the source's size raises
    /// TE_INVALID_OR_OUT_OF_RANGE "invalid starting offset in OVBinaryFileStream::WriteStream".
    void WriteStream(OVStream const& source, unsigned long offset, unsigned long count) override;
    /// Raises TE_UINT32_OVERFLOW past 4 GiB.
    std::uint32_t GetSize() const override;
    std::uint64_t GetLargeSize() const override;

private:
    enum class Need : unsigned char { File, Reading, Writing };

    /// Opens with the retries; `reopen` opens the existing file again without emptying it.
    void Open(OVFileStreamOpenType type, bool reopen = false);
    void OpenWithNoRetry(OVFileStreamOpenType type, bool reopen = false);
    /// Closes the file; buffered bytes are dropped (callers write them first).
    void Close();
    /// The text handed to the system: the long-path form when the flag asks for it.
    void ConvertPathAsNeeded(String const& path, DynamicString& converted) const;
    void MoveTo(String const& newPath, bool replace, char const* function);
    void RequireFile(Need need, char const* function) const;
    /// Writes the buffered bytes to the file, or drops bytes read ahead; raises with
    /// `function` as context, keeping them.
    void FlushBuffer(char const* function);
    void WriteRaw(void const* data, std::uint64_t count, char const* function);
    /// Reads the file's bytes at `position` into the buffer (read ahead); false at the end.
    bool FillBuffer(std::uint64_t position, char const* function);
    /// `count` bytes at `position`, with the buffered writes over the file's bytes and zero
    /// bytes where neither reaches; the offset does not move.
    void CopyOut(std::uint64_t position, unsigned char* out, std::size_t count,
                 char const* function) const;
    template <class U> void WriteFixed(U value, char const* function);

    DynamicString m_path;
    std::intptr_t m_file = -1; ///< descriptor or HANDLE; -1 without a file
    OVFileStreamOpenType m_type = kOVFileStreamNoFile;
    bool m_shareDelete = false;
    bool m_longPath = false;
    /// The buffer holds bytes to write (true) or bytes read ahead (false).
    bool m_bufferDirty = false;
    double m_retryTime = 0;
    std::uint64_t m_offset = 0;   ///< the stream's offset
    std::uint64_t m_fileSize = 0; ///< the file's size on disk, without the buffered writes
    /// kWriteBufferSize bytes once used; its valid bytes belong at [m_bufferStart, + count).
    unsigned char* m_buffer = nullptr;
    std::uint64_t m_bufferStart = 0;
    std::uint32_t m_bufferCount = 0;
};

} // namespace tekit
