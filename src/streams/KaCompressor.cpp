// KaCompressor: loading the zlib module, framed blocks and the unframed routines.
#include "tekit/streams/KaCompressor.h"

#include "platform/File.h"
#include "platform/Module.h"
#include "streams/LittleEndian.h"
#include "sync/ExclusiveHold.h"
#include "tekit/environment/KnownDirectories.h"
#include "tekit/errors/RString.h"
#include "tekit/errors/Raise.h"
#include "tekit/errors/TEException.h"
#include "tekit/strings/DynamicString.h"
#include "tekit/sync/CriticalSections.h"

#include <climits>
#include <string>

namespace tekit {

namespace {

// zlib's result codes that the library tells apart.
constexpr int kZOk = 0;
constexpr int kZMemError = -4;
constexpr int kZBufError = -5;

/// The lock of every compressor's first load: a critical section whose system object lives
/// as long as the process, so a compressor may load while statics go away.
GlobalOSCriticalSection& LoadLock() {
    static GlobalOSCriticalSection lock;
    return lock;
}

/// The "ERR_DESCR" message `key` with its placeholders filled from the last back, so a '%'
/// in a path is never taken for a placeholder.
DynamicString Message(char const* key, char const* first, char const* second = nullptr) {
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", key)), true);
    if (second)
        message.Format(second, 2);
    message.Format(first, 1);
    return message;
}

DynamicString InDirectory(Path const& directory) {
    DynamicString file(directory.CStr(), true);
    file += KaCompressor::kModuleFileName;
    return file;
}

bool IsFile(DynamicString const& path) {
    platform::FileInfo info;
    return !platform::QueryFile(path.GetBufferReadPtr(), info) && !info.isDirectory;
}

/// The module's file: beside the library, else in the build tree's sub-directory.
DynamicString FindModule() {
    DynamicString const installed = InDirectory(GetBinariesDirectory());
    if (IsFile(installed))
        return installed;
    DynamicString const development = InDirectory(GetDevelopmentBinariesDirectory());
    if (IsFile(development))
        return development;
    TE_RAISE(TE_DLL_NOT_LOADABLE,
             Message("COMPRESS_MODULE_NOT_FOUND_1_2", installed.GetBufferReadPtr(),
                     development.GetBufferReadPtr()),
             "KaCompressor::Load");
}

/// The status of a failed unframed routine: what its zlib code means to a caller.
int StatusOfZlibCode(int code) {
    return code == kZMemError ? TE_OUT_OF_MEMORY : TE_OPERATION_FAILED;
}

} // namespace

KaCompressor::KaCompressor() = default;

KaCompressor::~KaCompressor() {
    platform::CloseModule(m_module);
}

void KaCompressor::Load() {
    if (m_loaded.load(std::memory_order_acquire))
        return;
    detail::ExclusiveHold const hold(LoadLock());
    if (m_loaded.load(std::memory_order_relaxed))
        return;
    DynamicString const file = FindModule();
    char const* const path = file.GetBufferReadPtr();
    platform::ModuleHandle module = nullptr;
    std::string reason;
    if (platform::SystemError const error = platform::OpenModule(path, module, &reason))
        TE_RAISE_API(TE_DLL_NOT_LOADABLE,
                     Message("COMPRESS_MODULE_NOT_LOADABLE_1_2", path, reason.c_str()),
                     "KaCompressor::Load", error.apiFunction, error.code);
    void* functions[3] = {};
    char const* const names[3] = {"compress", "compressBound", "uncompress"};
    for (int i = 0; i < 3; ++i) {
        if (platform::SystemError const error =
                platform::FindSymbol(module, names[i], functions[i])) {
            platform::CloseModule(module);
            TE_RAISE_API(TE_FUNC_NOT_IN_LIB,
                         Message("COMPRESS_MODULE_FUNCTION_MISSING_1_2", path, names[i]),
                         "KaCompressor::Load", error.apiFunction, error.code);
        }
    }
    m_module = module;
    m_compress = reinterpret_cast<CompressFunction>(functions[0]);
    m_compressBound = reinterpret_cast<CompressBoundFunction>(functions[1]);
    m_uncompress = reinterpret_cast<CompressFunction>(functions[2]);
    m_loaded.store(true, std::memory_order_release);
}

int KaCompressor::LoadForStatus() {
    try {
        Load();
        return 0;
    } catch (TEException const& e) {
        return e.GetErrorCode();
    }
}

void KaCompressor::ThrowExceptionIfError(int code) {
    if (code == kZOk)
        return;
    DynamicString message(static_cast<char const*>(RString("ERR_DESCR", "COMPRESS_OP_FAILED")),
                          true);
    message.Format(code, 1);
    TE_RAISE(TE_OPERATION_FAILED, message, "KaCompressor::ThrowExceptionIfError");
}

unsigned int KaCompressor::CheckHeader(unsigned char const* src, unsigned int srcLen,
                                       char const* function) {
    if (!src && srcLen > 0)
        TE_RAISE(TE_INVALID_POINTER, static_cast<char const*>(nullptr), function);
    if (srcLen < kHeaderSize || streams::LoadLittleEndian<std::uint32_t>(src) != kMagic)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE, RString("ERR_DESCR", "COMPRESS_BLOCK_NOT_FRAMED"),
                 function);
    std::uint32_t const size = streams::LoadLittleEndian<std::uint32_t>(src + 4);
    std::uint64_t const dataSize = srcLen - kHeaderSize;
    // zlib's output for no data is 8 bytes, so no block is exempt from the ratio.
    if (size > dataSize * kMaxCompressionRatio)
        TE_RAISE(TE_INVALID_OR_OUT_OF_RANGE,
                 Message("COMPRESS_BLOCK_SIZE_IMPLAUSIBLE_1_2", std::to_string(size).c_str(),
                         std::to_string(dataSize).c_str()),
                 function);
    return size;
}

void KaCompressor::Compress(unsigned char* dst, unsigned long* dstLen, unsigned char const* src,
                            unsigned int srcLen) {
    if (!dst || !dstLen || (!src && srcLen > 0))
        TE_RAISE(TE_INVALID_POINTER, static_cast<char const*>(nullptr), "KaCompressor::Compress");
    Load();
    if (*dstLen < kHeaderSize)
        ThrowExceptionIfError(kZBufError);
    unsigned long room = *dstLen - kHeaderSize;
    static unsigned char const kNothing = 0; // zlib wants a pointer even for no data
    ThrowExceptionIfError(m_compress(dst + kHeaderSize, &room, src ? src : &kNothing, srcLen));
    streams::StoreLittleEndian<std::uint32_t>(dst, kMagic);
    streams::StoreLittleEndian<std::uint32_t>(dst + 4, srcLen);
    *dstLen = room + kHeaderSize;
}

unsigned long KaCompressor::CompressBound(unsigned int n) {
    Load();
    unsigned long const bound = m_compressBound(n);
    // Where unsigned long has 32 bits, the bound of the largest sizes wraps.
    if (bound < n || bound > ULONG_MAX - kHeaderSize)
        Throw32BitOverflowException("KaCompressor::CompressBound", TE_FILE_BASE_NAME, __LINE__,
                                    false);
    return bound + kHeaderSize;
}

unsigned int KaCompressor::UncompressSize(unsigned char const* src, unsigned int srcLen) {
    return CheckHeader(src, srcLen, "KaCompressor::UncompressSize");
}

void KaCompressor::Uncompress(unsigned char* dst, unsigned long* dstLen, unsigned char const* src,
                              unsigned int srcLen) {
    unsigned int const size = CheckHeader(src, srcLen, "KaCompressor::Uncompress");
    if ((!dst && size > 0) || !dstLen)
        TE_RAISE(TE_INVALID_POINTER, static_cast<char const*>(nullptr), "KaCompressor::Uncompress");
    Load();
    // Never more room than the stored size: data that inflates further is refused by zlib
    // before it writes past what the header promised.
    unsigned long room = *dstLen < size ? *dstLen : size;
    unsigned long const given = room;
    unsigned char spare = 0; // zlib wants a pointer even for no room
    int const code =
        m_uncompress(room ? dst : &spare, &room, src + kHeaderSize, srcLen - kHeaderSize);
    bool const wrongSize = (code == kZOk && room != size) || (code == kZBufError && given == size);
    if (wrongSize)
        TE_RAISE(TE_OPERATION_FAILED,
                 Message("COMPRESS_BLOCK_SIZE_MISMATCH_1", std::to_string(size).c_str()),
                 "KaCompressor::Uncompress");
    ThrowExceptionIfError(code);
    *dstLen = room;
}

int KaCompressor::ObsoleteCompress(unsigned char* dst, unsigned long* dstLen,
                                   unsigned char const* src, unsigned long srcLen) {
    if (!dst || !dstLen || (!src && srcLen > 0))
        return TE_INVALID_POINTER;
    if (int const status = LoadForStatus())
        return status;
    static unsigned char const kNothing = 0;
    int const code = m_compress(dst, dstLen, src ? src : &kNothing, srcLen);
    return code == kZOk ? 0 : StatusOfZlibCode(code);
}

int KaCompressor::ObsoleteCompressBound(unsigned long srcLen) {
    if (int const status = LoadForStatus())
        return status;
    unsigned long const bound = m_compressBound(srcLen);
    return bound < srcLen || bound > INT_MAX ? static_cast<int>(TE_INVALID_OR_OUT_OF_RANGE)
                                             : static_cast<int>(bound);
}

int KaCompressor::ObsoleteUncompress(unsigned char* dst, unsigned long* dstLen,
                                     unsigned char const* src, unsigned long srcLen) {
    if (!dst || !dstLen || !src)
        return TE_INVALID_POINTER;
    if (int const status = LoadForStatus())
        return status;
    int const code = m_uncompress(dst, dstLen, src, srcLen);
    return code == kZOk ? 0 : StatusOfZlibCode(code);
}

} // namespace tekit
