// KaCompressor: zlib compression with the library's framing, and the compressed string, its
// text form that travels inside INI values, XML attributes and other text.
//
//   KaCompressor compressor;
//   DynamicString text, original;
//   compressor.StringToCompressedString(DynamicString("[Limits]\nLow = 3\n"), text);
//   if (KaCompressor::IsCompressedBinaryString(text))
//       compressor.CompressedStringToString(text, original);
//
// A framed compressed block is
//
//   offset 0  4 bytes  the magic 0x5A434D50, little-endian: the ASCII bytes "PMCZ"
//   offset 4  4 bytes  the uncompressed size, unsigned little-endian
//   offset 8  n bytes  what zlib's compress made of the data
//
// and a compressed string is a whole block in the data-to-text encoding (tekit/toolbox/
// DataText.h): 6 characters for every 4 bytes, so its first 6 characters, "J3p2LV", stand for
// the magic.
//
// zlib itself is not linked into the library: a compressor loads the module "kazlibwapi"
// (kazlibwapi.dll on Windows, libkazlibwapi.so elsewhere) at its first operation, from the
// directory that holds the library's code (GetBinariesDirectory) or, when it is not there, from
// that directory's "modules" sub-directory, where build trees place it. Each object loads once,
// under a lock, so concurrent first uses load it once; the module stays loaded until the
// object goes.
//
// Failures raise TEException (the Obsolete routines return a status instead):
//   TE_DLL_NOT_LOADABLE (-17004)          the module is in neither directory, or cannot load
//   TE_FUNC_NOT_IN_LIB (-17005)           it lacks compress, compressBound or uncompress
//   TE_INVALID_OR_OUT_OF_RANGE (-17300)   data that is not a framed block: shorter than 8
//                                         bytes, a wrong magic, or a stored size that its data
//                                         cannot hold (see kMaxCompressionRatio)
//   TE_UNRECOGNIZED_VALUE (-17304)        a text that is not a compressed string
//   TE_OPERATION_FAILED (-17500)          zlib reported an error ("Unable to perform
//                                         compression or decompression operation (code: %1).",
//                                         %1 zlib's code), or a block's data does not inflate to
//                                         the size its header states
//   TE_OUT_OF_MEMORY (-17000)             a result could not be allocated
//   TE_INVALID_POINTER (-17346)           a null pointer where data is needed
// Nothing a caller passes in is changed by a failed operation; a destination buffer may hold
// partial output.
#pragma once

#include "tekit/Export.h"
#include "tekit/platform/WinTypes.h"

#include <atomic>
#include <cstdint>

namespace tekit {

class String;
class DynamicString;

class TEKIT_API KaCompressor {
public:
    /// The first 4 bytes of every framed block, stored little-endian ("PMCZ").
    static constexpr std::uint32_t kMagic = 0x5A434D50;
    /// Magic and uncompressed size.
    static constexpr unsigned int kHeaderSize = 8;
    /// The most that deflate can shrink data: a block whose stored size exceeds its compressed
    /// bytes (after the header) times this is refused before anything is allocated for it.
    static constexpr std::uint64_t kMaxCompressionRatio = 1032;
#if defined(_WIN32)
    static constexpr char const kModuleFileName[] = "kazlibwapi.dll";
#else
    static constexpr char const kModuleFileName[] = "libkazlibwapi.so";
#endif

    KaCompressor();
    /// Unloads the module if this object loaded it.
    ~KaCompressor();
    KaCompressor(KaCompressor const&) = delete;
    KaCompressor& operator=(KaCompressor const&) = delete;

    // ---- Framed blocks. ----------------------------------------------------------------

    /// Compresses `srcLen` bytes at `src` into a framed block at `dst`. In: `*dstLen` is the
    /// room at `dst`, header included (CompressBound(srcLen) always suffices); out: the
    /// block's size. Too little room raises TE_OPERATION_FAILED with zlib's Z_BUF_ERROR (-5).
    void Compress(unsigned char* dst, unsigned long* dstLen, unsigned char const* src,
                  unsigned int srcLen);
    /// The largest block that compressing `n` bytes can give: zlib's compressBound(n) + 8.
    unsigned long CompressBound(unsigned int n);
    /// Uncompresses the framed block of `srcLen` bytes at `src` into `dst`. In: `*dstLen` is
    /// the room at `dst`; out: the bytes written, always the block's stored size. Room below
    /// the stored size raises TE_OPERATION_FAILED with Z_BUF_ERROR (-5).
    void Uncompress(unsigned char* dst, unsigned long* dstLen, unsigned char const* src,
                    unsigned int srcLen);
    /// The uncompressed size stored in the block's header: what to allocate before Uncompress.
    /// Checks the header only (length, magic and a size its data can hold); needs no module.
    unsigned int UncompressSize(unsigned char const* src, unsigned int srcLen);

    // ---- Compressed strings. -----------------------------------------------------------

    /// `out` receives the compressed string of the `n` bytes at `bytes`.
    void BinaryBytesToCompressedString(unsigned char const* bytes, unsigned int n,
                                       DynamicString& out);
    /// Uncompresses the compressed string `text` into a new block (free it with TBFree; never
    /// null, even for 0 bytes) and stores it and its size in `bytes` and `numBytes`.
    void CompressedStringToBinaryBytes(String const& text, unsigned char*& bytes,
                                       unsigned long& numBytes);
    /// `out` receives the compressed string of the bytes of `text`, without its terminator.
    void StringToCompressedString(String const& text, DynamicString& out);
    /// `out` receives the text that the compressed string `text` holds. A string holds no NUL,
    /// so uncompressed data with one ends at its first NUL.
    void CompressedStringToString(String const& text, DynamicString& out);
    /// True when `text` is longer than 6 characters and its first 6 encode the magic. Needs no
    /// module, and says false (never raises) for any text that is not encoded data.
    static bool IsCompressedBinaryString(String const& text);

#if TEKIT_HAS_OLE
    /// `out` receives the compressed string of the bytes of a one-dimensional SAFEARRAY of
    /// VT_UI1 (any lower bound). Another array raises TE_INVALID_OR_OUT_OF_RANGE.
    void BinarySafeArrayToString(SAFEARRAY* array, DynamicString& out);
    /// `*array` receives a new one-dimensional SAFEARRAY of VT_UI1 (lower bound 0) holding the
    /// bytes of the compressed string `text`; destroy it with SafeArrayDestroy.
    void StringToBinarySafeArray(DynamicString& text, SAFEARRAY** array);
#endif

    // ---- The unframed routines. --------------------------------------------------------
    //
    // The earlier format that the compressed binary INI form keeps: zlib's compress output as
    // it is (a zlib stream, RFC 1950), with no magic and no size; the caller stores the
    // uncompressed size itself. Each returns a status and never raises: 0 on success, or a
    // negative TEError -
    //   TE_INVALID_POINTER (-17346)    a null pointer where one is needed
    //   TE_OPERATION_FAILED (-17500)   zlib failed: the room at `dst` is too small, or the data
    //                                  is not a whole zlib stream
    //   TE_OUT_OF_MEMORY (-17000)      zlib ran out of memory
    //   TE_DLL_NOT_LOADABLE, TE_FUNC_NOT_IN_LIB   the module could not be loaded

    /// Compresses `srcLen` bytes at `src` into `dst`; `*dstLen`: room in, size out.
    int ObsoleteCompress(unsigned char* dst, unsigned long* dstLen, unsigned char const* src,
                         unsigned long srcLen);
    /// zlib's compressBound(`srcLen`): the room ObsoleteCompress may need. A bound beyond
    /// INT_MAX is TE_INVALID_OR_OUT_OF_RANGE.
    int ObsoleteCompressBound(unsigned long srcLen);
    /// Uncompresses the zlib stream of `srcLen` bytes at `src` into `dst`; `*dstLen`: room in,
    /// bytes written out.
    int ObsoleteUncompress(unsigned char* dst, unsigned long* dstLen, unsigned char const* src,
                           unsigned long srcLen);

private:
    /// zlib's signatures (the Windows module's functions use the C calling convention).
    using CompressFunction = int(TEKIT_CDECL*)(unsigned char*, unsigned long*, unsigned char const*,
                                               unsigned long);
    using CompressBoundFunction = unsigned long(TEKIT_CDECL*)(unsigned long);

    /// Loads the module and its functions once; raises and stays unloaded on failure.
    void Load();
    /// Load for the unframed routines: 0, or the code of the error it raised.
    int LoadForStatus();
    /// Raises TE_OPERATION_FAILED with "COMPRESS_OP_FAILED" when `code` is not zlib's Z_OK.
    static void ThrowExceptionIfError(int code);
    /// The framed block's stored size after checking its header; raises in `function`'s name.
    static unsigned int CheckHeader(unsigned char const* src, unsigned int srcLen,
                                    char const* function);
    /// Decodes a compressed string's text into a new block of the library's heap.
    static unsigned char* DecodeText(String const& text, unsigned int& blockSize,
                                     char const* function);

    void* m_module = nullptr;
    CompressFunction m_compress = nullptr;
    CompressBoundFunction m_compressBound = nullptr;
    CompressFunction m_uncompress = nullptr;
    std::atomic<bool> m_loaded{false};
};

} // namespace tekit
