// The binary file stream: the memory stream's encoding over a file, through positioned reads
// and writes of the platform layer, with one buffer that gathers writes or holds bytes read
// ahead.
#include "tekit/streams/OVBinaryFileStream.h"

#include "errors/NativeError.h"
#include "platform/Clock.h"
#include "platform/File.h"
#include "platform/Heap.h"
#include "platform/SharedFile.h"
#include "platform/SystemError.h"
#include "streams/LittleEndian.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEException.h"
#include "tekit/paths/PathBase.h"
#include "tekit/streams/OVMemoryStream.h"
#include "tekit/toolbox/Timer.h"

#include <algorithm>
#include <bit>
#include <climits>
#include <cstring>
#include <limits>
#include <string>
#include <vector>

namespace tekit {

using platform::SystemError;
using streams::StoreLittleEndian;

namespace {

constexpr char kConstructor[] = "OVBinaryFileStream::OVBinaryFileStream";
constexpr char kOpen[] = "OVBinaryFileStream::OpenWithNoRetry";
constexpr char kReadBytes[] = "OVBinaryFileStream::ReadBytes";
constexpr char kReadString[] = "OVBinaryFileStream::ReadString";
constexpr char kWriteBytes[] = "OVBinaryFileStream::WriteBytes";
constexpr char kWriteStream[] = "OVBinaryFileStream::WriteStream";

/// Files end before 2^63 bytes on every system the library runs on.
constexpr std::uint64_t kMaxFileSize = std::uint64_t(std::numeric_limits<std::int64_t>::max());

/// Pause between two tries of a busy file: 75 ms and a jitter of 0 to 25 whole milliseconds,
/// so that two programs waiting for each other do not keep colliding. The jitter comes from
/// the monotonic clock, not from the library's random sequence: that sequence repeats for a
/// seed, so programs seeded alike would wait alike, and drawing from it would move a caller's
/// reproducible sequence.
double RetryPause() {
    auto const jitter = static_cast<double>(platform::MonotonicNanoseconds() / 1000 % 26);
    return (75.0 + jitter) / 1000.0;
}

bool IsValidType(OVFileStreamOpenType type) {
    return static_cast<int>(type) >= kOVFileStreamOpenForRead &&
           static_cast<int>(type) <= kOVFileStreamNoFile;
}

bool CanRead(OVFileStreamOpenType type) {
    return type == kOVFileStreamOpenForRead || type == kOVFileStreamOpenForReadWrite ||
           type == kOVFileStreamCreateForReadWrite;
}

/// How the table opens each type; `reopen` keeps the file's contents and needs it to exist.
platform::SharedFileMode ModeOf(OVFileStreamOpenType type, bool shareDelete, bool reopen) {
    using platform::FileAccess;
    using platform::FileCreation;
    platform::SharedFileMode mode;
    mode.shareDelete = shareDelete;
    switch (type) {
    case kOVFileStreamOpenForRead:
    case kOVFileStreamOpenForReadWrite:
        mode.access = type == kOVFileStreamOpenForRead ? FileAccess::Read : FileAccess::ReadWrite;
        mode.creation = FileCreation::OpenExisting;
        mode.shareRead = true;
        mode.sequential = true;
        break;
    case kOVFileStreamOpenForWrite:
        mode.access = FileAccess::Write;
        mode.creation = FileCreation::OpenAlways;
        break;
    default: // the two creating types
        mode.access =
            type == kOVFileStreamCreateForWrite ? FileAccess::Write : FileAccess::ReadWrite;
        mode.creation = FileCreation::CreateAlways;
        break;
    }
    if (reopen)
        mode.creation = FileCreation::OpenExisting;
    return mode;
}

/// Absolute by the host's rules: "X:\" or "\\" on Windows, a leading '/' elsewhere.
bool IsHostAbsolute(char const* path) {
    if constexpr (platform::kWindowsFileNames)
        return (path[0] && path[1] == ':' && (path[2] == '\\' || path[2] == '/')) ||
               ((path[0] == '\\' || path[0] == '/') && (path[1] == '\\' || path[1] == '/'));
    else
        return path[0] == '/';
}

/// The message of "ERR_DESCR" `key` with `path` as %1.
DynamicString DescribePath(char const* key, char const* path) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    message.Format(path, 1);
    return message;
}

[[noreturn]] void RaiseSystemError(SystemError const& error, String const& description,
                                   char const* function) {
    TE_RAISE_API(detail::NativeErrorToTEError(error, TE_IO_ERROR), description, function,
                 error.apiFunction, error.code);
}

[[noreturn]] void RaiseSystemError(SystemError const& error, char const* function) {
    TE_RAISE_API(detail::NativeErrorToTEError(error, TE_IO_ERROR), "", function, error.apiFunction,
                 error.code);
}

} // namespace

// ---- Opening and closing. ------------------------------------------------------------------

OVBinaryFileStream::OVBinaryFileStream(char const* path, OVFileStreamOpenType type,
                                       bool shareDelete, double retryTime, bool longPath)
    : m_path(path ? path : "", true), m_shareDelete(shareDelete), m_longPath(longPath),
      m_retryTime(retryTime) {
    if (!IsValidType(type))
        TE_RAISE_ASSERTION(
            "Invalid streamType passed into OVBinaryFileStream::OVBinaryFileStream()",
            kConstructor);
    Open(type);
}

OVBinaryFileStream::~OVBinaryFileStream() {
    try {
        FlushBuffer("OVBinaryFileStream::~OVBinaryFileStream");
    } catch (TEException const&) {
        // Nothing can be reported from here: Flush is the call that shows this failure.
    }
    Close();
    platform::HeapFree(m_buffer);
}

void OVBinaryFileStream::Open(OVFileStreamOpenType type, bool reopen) {
    double const start = Timer();
    for (;;) {
        try {
            OpenWithNoRetry(type, reopen);
            return;
        } catch (TEException const& e) {
            TEError const code = e.GetErrorCode();
            if ((code != TE_ACCESS_DENIED && code != TE_SHARING_VIOLATION) ||
                !(Timer() - start < m_retryTime))
                throw;
        }
        Delay(RetryPause());
    }
}

void OVBinaryFileStream::OpenWithNoRetry(OVFileStreamOpenType type, bool reopen) {
    DynamicString systemPath;
    ConvertPathAsNeeded(m_path, systemPath);
    m_type = type;
    Close();
    if (type == kOVFileStreamNoFile)
        return;
    bool const writing = type == kOVFileStreamOpenForWrite || type == kOVFileStreamCreateForWrite ||
                         type == kOVFileStreamCreateForReadWrite;
    char const* const key = writing ? "TE_CANT_WRITE_FILE_ELAB" : "TE_UNABLE_TO_OPEN_FILE_DESC";
    char const* const path = m_path.GetBufferReadPtr();
    if (writing && !reopen && IsHostAbsolute(path)) {
        // The directories are made through the path as given: the platform takes the
        // long-path route for them itself where it needs one.
        std::string const directory = platform::DirectoryOf(path);
        if (!directory.empty())
            if (SystemError const error = platform::MakeDirectories(directory.c_str()))
                RaiseSystemError(error, DescribePath(key, path), kOpen);
    }
    platform::NativeFile file = platform::kNoFile;
    if (SystemError const error = platform::OpenSharedFile(
            systemPath.GetBufferReadPtr(), ModeOf(type, m_shareDelete, reopen), file))
        RaiseSystemError(error, DescribePath(key, path), kOpen);
    std::uint64_t size = 0;
    if (SystemError const error = platform::OpenFileSize(file, size)) {
        platform::CloseFile(file);
        RaiseSystemError(error, DescribePath(key, path), kOpen);
    }
    m_file = file;
    m_fileSize = size;
    m_offset = 0;
}

void OVBinaryFileStream::Close() {
    if (m_file != platform::kNoFile)
        platform::CloseFile(m_file); // the handle is gone whatever this reports
    m_file = platform::kNoFile;
    m_fileSize = 0;
    m_bufferCount = 0;
    m_bufferDirty = false;
}

void OVBinaryFileStream::ConvertPathAsNeeded(String const& path, DynamicString& converted) const {
    char const* const text = path.GetBufferReadPtr();
    // Only Windows limits path lengths, and only an absolute path has a long-path form.
    if (!platform::kWindowsFileNames || !m_longPath || !IsHostAbsolute(text) ||
        std::strncmp(text, "\\\\?\\", 4) == 0) {
        converted.Assign(path);
        return;
    }
    PathBase::ConvertForLongPathCalls(path, converted);
    // The system no longer turns '/' into '\' in the long-path form.
    char* p = converted.GetBufferWritePtr();
    for (; *p; ++p)
        if (*p == '/')
            *p = '\\';
}

void OVBinaryFileStream::SetStreamType(OVFileStreamOpenType type) {
    if (!IsValidType(type))
        TE_RAISE_ASSERTION("Invalid streamType passed into OVBinaryFileStream::SetStreamType()",
                           "OVBinaryFileStream::SetStreamType");
    FlushBuffer("OVBinaryFileStream::SetStreamType");
    Open(type);
}

bool OVBinaryFileStream::IsOpen() const {
    return m_file != platform::kNoFile;
}

void OVBinaryFileStream::RequireFile(Need need, char const* function) const {
    if (m_file == platform::kNoFile)
        TE_RAISE(TE_IO_ERROR, "The stream has no open file.", function);
    if (need == Need::Reading && !CanRead(m_type))
        TE_RAISE(TE_ACCESS_DENIED, "The stream's file is open for writing only.", function);
    if (need == Need::Writing && m_type == kOVFileStreamOpenForRead)
        TE_RAISE(TE_ACCESS_DENIED, "The stream's file is open for reading only.", function);
}

// ---- Flushing and moving. ------------------------------------------------------------------

void OVBinaryFileStream::FlushBuffer(char const* function) {
    if (m_bufferCount == 0)
        return;
    if (m_bufferDirty) {
        if (SystemError const error =
                platform::WriteToFileAt(m_file, m_bufferStart, m_buffer, m_bufferCount))
            RaiseSystemError(error, function); // kept: a later flush writes it again
        m_fileSize = std::max(m_fileSize, m_bufferStart + m_bufferCount);
    }
    m_bufferCount = 0;
    m_bufferDirty = false;
}

void OVBinaryFileStream::Flush() {
    static constexpr char kFlush[] = "OVBinaryFileStream::Flush";
    RequireFile(Need::File, kFlush);
    if (m_type == kOVFileStreamOpenForRead)
        return; // nothing of a reader's reaches the disk
    FlushBuffer(kFlush);
    if (SystemError const error = platform::FlushFile(m_file))
        RaiseSystemError(error, kFlush);
}

void OVBinaryFileStream::Move(String const& newPath) {
    MoveTo(newPath, false, "OVBinaryFileStream::Move");
}

void OVBinaryFileStream::ForceMove(String const& newPath) {
    MoveTo(newPath, true, "OVBinaryFileStream::ForceMove");
}

void OVBinaryFileStream::MoveTo(String const& newPath, bool replace, char const* function) {
    if (m_file == platform::kNoFile) {
        m_path.Assign(newPath);
        return;
    }
    FlushBuffer(function);
    DynamicString from, to;
    ConvertPathAsNeeded(m_path, from);
    ConvertPathAsNeeded(newPath, to);
    DynamicString const target(newPath);
    SystemError error;
    if constexpr (platform::kOpenFilesCanBeRenamed) {
        error = platform::RenameFile(from.GetBufferReadPtr(), to.GetBufferReadPtr(), replace);
        if (!error)
            m_path.Assign(target);
    } else {
        // Windows renames only files that nobody holds without delete sharing: this stream
        // lets go of its file for the rename and takes it again, where it is then.
        std::uint64_t const offset = m_offset;
        Close();
        error = platform::RenameFile(from.GetBufferReadPtr(), to.GetBufferReadPtr(), replace);
        if (!error)
            m_path.Assign(target);
        Open(m_type, true);
        m_offset = offset;
    }
    if (error)
        RaiseSystemError(error, DescribePath("TE_CANT_WRITE_FILE_ELAB", target.GetBufferReadPtr()),
                         function);
}

// ---- Offsets and sizes. --------------------------------------------------------------------

std::uint32_t OVBinaryFileStream::GetOffset() const {
    if (m_offset > std::numeric_limits<std::uint32_t>::max())
        Throw32BitOverflowException("OVBinaryFileStream::GetOffset", TE_FILE_BASE_NAME, __LINE__,
                                    false);
    return static_cast<std::uint32_t>(m_offset);
}

void OVBinaryFileStream::SetLargeOffset(std::uint64_t offset) {
    m_offset = offset;
}

std::uint64_t OVBinaryFileStream::GetLargeSize() const {
    if (m_bufferDirty)
        return std::max(m_fileSize, m_bufferStart + m_bufferCount);
    return m_fileSize;
}

std::uint32_t OVBinaryFileStream::GetSize() const {
    std::uint64_t const size = GetLargeSize();
    if (size > std::numeric_limits<std::uint32_t>::max())
        Throw32BitOverflowException("OVBinaryFileStream::GetSize", TE_FILE_BASE_NAME, __LINE__,
                                    false);
    return static_cast<std::uint32_t>(size);
}

void OVBinaryFileStream::TruncateAtCurrentOffset() {
    static constexpr char kTruncate[] = "OVBinaryFileStream::TruncateAtCurrentOffset";
    RequireFile(Need::Writing, kTruncate);
    if (m_offset > GetLargeSize())
        TE_RAISE_ASSERTION(
            "Current offset past end of stream in OVBinaryFileStream::TruncateAtCurrentOffset",
            kTruncate);
    FlushBuffer(kTruncate);
    if (SystemError const error = platform::SetOpenFileSize(m_file, m_offset))
        RaiseSystemError(error, kTruncate);
    m_fileSize = m_offset;
}

// ---- Writing. ------------------------------------------------------------------------------

void OVBinaryFileStream::WriteRaw(void const* data, std::uint64_t count, char const* function) {
    if (count == 0)
        return;
    if (m_bufferDirty && m_offset == m_bufferStart + m_bufferCount &&
        count <= kWriteBufferSize - m_bufferCount) {
        std::memcpy(m_buffer + m_bufferCount, data, static_cast<std::size_t>(count));
        m_bufferCount += static_cast<std::uint32_t>(count);
        m_offset += count;
        return;
    }
    RequireFile(Need::Writing, function);
    if (m_offset > kMaxFileSize || count > kMaxFileSize - m_offset)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, "The write would end past the largest file size.",
                 function);
    FlushBuffer(function);
    if (count >= kWriteBufferSize) {
        // Large writes go to the file directly: copying them would only cost time.
        if (SystemError const error =
                platform::WriteToFileAt(m_file, m_offset, data, static_cast<std::size_t>(count)))
            RaiseSystemError(error, function);
        m_offset += count;
        m_fileSize = std::max(m_fileSize, m_offset);
        return;
    }
    if (!m_buffer) {
        m_buffer = static_cast<unsigned char*>(platform::HeapAllocate(kWriteBufferSize));
        if (!m_buffer)
            TE_RAISE(TE_OUT_OF_MEMORY, "", function);
    }
    std::memcpy(m_buffer, data, static_cast<std::size_t>(count));
    m_bufferStart = m_offset;
    m_bufferCount = static_cast<std::uint32_t>(count);
    m_bufferDirty = true;
    m_offset += count;
}

template <class U> void OVBinaryFileStream::WriteFixed(U value, char const* function) {
    if (m_bufferDirty && m_offset == m_bufferStart + m_bufferCount &&
        m_bufferCount <= kWriteBufferSize - sizeof(U)) [[likely]] {
        StoreLittleEndian(m_buffer + m_bufferCount, value);
        m_bufferCount += sizeof(U);
        m_offset += sizeof(U);
        return;
    }
    unsigned char bytes[sizeof(U)];
    StoreLittleEndian(bytes, value);
    WriteRaw(bytes, sizeof(U), function);
}

void OVBinaryFileStream::WriteBytes(void const* data, unsigned int count) {
    WriteRaw(data, count, kWriteBytes);
}

void OVBinaryFileStream::WriteInt(char const*, int value) {
    WriteFixed(static_cast<std::uint32_t>(value), "OVBinaryFileStream::WriteInt");
}

void OVBinaryFileStream::WriteUInt(char const*, unsigned int value) {
    WriteFixed(static_cast<std::uint32_t>(value), "OVBinaryFileStream::WriteUInt");
}

void OVBinaryFileStream::WriteDouble(char const*, double value) {
    WriteFixed(std::bit_cast<std::uint64_t>(value), "OVBinaryFileStream::WriteDouble");
}

void OVBinaryFileStream::WriteBool(char const*, bool value) {
    WriteFixed(static_cast<std::uint8_t>(value ? 1 : 0), "OVBinaryFileStream::WriteBool");
}

void OVBinaryFileStream::WriteInt64(char const*, std::int64_t value) {
    WriteFixed(static_cast<std::uint64_t>(value), "OVBinaryFileStream::WriteInt64");
}

void OVBinaryFileStream::WriteUInt64(char const*, std::uint64_t value) {
    WriteFixed(value, "OVBinaryFileStream::WriteUInt64");
}

void OVBinaryFileStream::WriteString(char const*, String const& value, bool, bool) {
    // The text and its terminator in one write: the string's buffer ends in its NUL.
    WriteRaw(value.GetBufferReadPtr(), std::uint64_t(value.GetNumBytes()) + 1,
             "OVBinaryFileStream::WriteString");
}

void OVBinaryFileStream::CopyOut(std::uint64_t position, unsigned char* out, std::size_t count,
                                 char const* function) const {
    std::size_t got = 0;
    if (position < m_fileSize)
        if (SystemError const error = platform::ReadFromFileAt(m_file, position, out, count, got))
            RaiseSystemError(error, function);
    std::memset(out + got, 0, count - got); // a gap before buffered writes past the end
    if (!m_bufferDirty)
        return;
    std::uint64_t const from = std::max(position, m_bufferStart);
    std::uint64_t const to = std::min(position + count, m_bufferStart + m_bufferCount);
    if (from < to)
        std::memcpy(out + (from - position), m_buffer + (from - m_bufferStart),
                    static_cast<std::size_t>(to - from));
}

void OVBinaryFileStream::WriteStream(OVStream const& source, unsigned long offset,
                                     unsigned long count) {
    auto const* memory = dynamic_cast<OVMemoryStream const*>(&source);
    auto const* file = dynamic_cast<OVBinaryFileStream const*>(&source);
    // This stream as its own source would read what the copy itself overwrites.
    if ((!memory && !file) || file == this)
        TE_RAISE(TE_NOT_SUPPORTED, "Stream type not support by OVBinaryFileStream::WriteStream.",
                 kWriteStream);
    std::uint64_t const size = source.GetLargeSize();
    if (offset > size)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 "invalid starting offset in OVBinaryFileStream::WriteStream", kWriteStream);
    std::uint64_t const n = std::min<std::uint64_t>(count, size - offset);
    if (memory) {
        WriteRaw(memory->GetDataPtr() + offset, n, kWriteStream);
        return;
    }
    file->RequireFile(Need::Reading, kWriteStream);
    RequireFile(Need::Writing, kWriteStream);
    std::uint64_t const start = m_offset;
    std::vector<unsigned char> chunk(
        static_cast<std::size_t>(std::min<std::uint64_t>(n, std::uint64_t(kWriteBufferSize))));
    try {
        for (std::uint64_t done = 0; done < n;) {
            auto const part =
                static_cast<std::size_t>(std::min<std::uint64_t>(n - done, chunk.size()));
            file->CopyOut(offset + done, chunk.data(), part, kWriteStream);
            WriteRaw(chunk.data(), part, kWriteStream);
            done += part;
        }
    } catch (TEException const&) {
        m_offset = start;
        throw;
    }
}

// ---- Reading. ------------------------------------------------------------------------------

bool OVBinaryFileStream::FillBuffer(std::uint64_t position, char const* function) {
    FlushBuffer(function);
    if (!m_buffer) {
        m_buffer = static_cast<unsigned char*>(platform::HeapAllocate(kWriteBufferSize));
        if (!m_buffer)
            TE_RAISE(TE_OUT_OF_MEMORY, "", function);
    }
    std::size_t got = 0;
    if (position < m_fileSize)
        if (SystemError const error =
                platform::ReadFromFileAt(m_file, position, m_buffer, kWriteBufferSize, got))
            RaiseSystemError(error, function);
    m_bufferStart = position;
    m_bufferCount = static_cast<std::uint32_t>(got);
    return got != 0;
}

unsigned int OVBinaryFileStream::ReadBytes(void* data, unsigned int count, TEError errorIfShort) {
    RequireFile(Need::Reading, kReadBytes);
    std::uint64_t const size = GetLargeSize();
    std::uint64_t const left = m_offset < size ? size - m_offset : 0;
    if (count > left) {
        if (errorIfShort != 0)
            TE_RAISE(errorIfShort, "", kReadBytes);
        count = static_cast<unsigned int>(left);
    }
    if (count == 0)
        return 0;
    // Bytes read ahead.
    if (!m_bufferDirty && m_offset >= m_bufferStart &&
        m_offset + count <= m_bufferStart + m_bufferCount) {
        std::memcpy(data, m_buffer + (m_offset - m_bufferStart), count);
        m_offset += count;
        return count;
    }
    FlushBuffer(kReadBytes);
    std::size_t got = 0;
    if (count >= kWriteBufferSize) {
        if (SystemError const error = platform::ReadFromFileAt(m_file, m_offset, data, count, got))
            RaiseSystemError(error, kReadBytes);
    } else {
        FillBuffer(m_offset, kReadBytes);
        got = std::min<std::size_t>(count, m_bufferCount);
        std::memcpy(data, m_buffer, got);
    }
    // Shorter than the size said only when another program cut the file.
    if (got < count && errorIfShort != 0)
        TE_RAISE(errorIfShort, "", kReadBytes);
    m_offset += got;
    return static_cast<unsigned int>(got);
}

void OVBinaryFileStream::ReadString(char const*, DynamicString& value) {
    RequireFile(Need::Reading, kReadString);
    std::string text;
    std::uint64_t position = m_offset;
    for (;;) {
        bool const buffered =
            !m_bufferDirty && position >= m_bufferStart && position < m_bufferStart + m_bufferCount;
        if (!buffered && (position >= GetLargeSize() || !FillBuffer(position, kReadString)))
            TE_RAISE(TE_BAD_FILE_FORMAT, "", kReadString); // no terminator before the end
        auto const* const start = m_buffer + (position - m_bufferStart);
        auto const available = static_cast<std::size_t>(m_bufferStart + m_bufferCount - position);
        auto const* const nul = static_cast<unsigned char const*>(std::memchr(start, 0, available));
        std::size_t const length = nul ? std::size_t(nul - start) : available;
        if (text.size() + length > std::size_t(INT_MAX) - 16)
            Throw32BitOverflowException(kReadString, TE_FILE_BASE_NAME, __LINE__, true);
        text.append(reinterpret_cast<char const*>(start), length);
        position += length;
        if (nul) {
            value = text.c_str();
            m_offset = position + 1;
            return;
        }
    }
}

} // namespace tekit
