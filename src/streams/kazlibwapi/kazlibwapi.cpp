// kazlibwapi: the loadable module that carries zlib's compress, compressBound and uncompress
// for KaCompressor, which loads it at run time and so keeps zlib out of the library itself.
//
// Windows: zlib is linked in statically and kazlibwapi.def exports its three functions under
// their own names, so the DLL needs no zlib1.dll; this file adds nothing.
//
// Elsewhere the module depends on the system's libz.so.1 and exports three functions of its
// own under zlib's names, which therefore cannot call zlib's functions of those names: they
// reach the same work through compress2 and uncompress2 (which zlib documents compress and
// uncompress to be), and zlib's compressBound under its symbol version. kazlibwapi.map gives
// the exports a version of their own, so the versioned reference binds to zlib, not to them.
#include <zlib.h>

#if !defined(_WIN32)

static_assert(ZLIB_VERNUM >= 0x1290, "uncompress2 needs zlib 1.2.9");

#define KAZLIBWAPI_EXPORT __attribute__((visibility("default")))

extern "C" {

uLong ZlibCompressBound(uLong sourceLen);
__asm__(".symver ZlibCompressBound, compressBound@ZLIB_1.2.0");

KAZLIBWAPI_EXPORT int compress(Bytef* dest, uLongf* destLen, Bytef const* source, uLong sourceLen) {
    return compress2(dest, destLen, source, sourceLen, Z_DEFAULT_COMPRESSION);
}

KAZLIBWAPI_EXPORT uLong compressBound(uLong sourceLen) {
    return ZlibCompressBound(sourceLen);
}

KAZLIBWAPI_EXPORT int uncompress(Bytef* dest, uLongf* destLen, Bytef const* source,
                                 uLong sourceLen) {
    return uncompress2(dest, destLen, source, &sourceLen);
}

} // extern "C"

#endif
