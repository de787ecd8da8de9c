// A caller outside the tekit tree: only the installed headers and library are visible. It
// prints "consumer: ok" when the exported interface works across the library boundary.
#include <tekit/tekit.h>

#include <cstdio>
#include <cstring>

using namespace tekit;

namespace {

int failures = 0;

void Check(bool ok, char const* what) {
    if (!ok) {
        std::fprintf(stderr, "consumer: %s\n", what);
        ++failures;
    }
}

} // namespace

int main() {
    DynamicString const a("installed");
    DynamicString const b = a;
    Check(a.GetBufferReadPtr() == b.GetBufferReadPtr(), "a copy shares its block");

    // Instances of the template are exported from the library, not compiled here.
    StaticString<64> const label("label");
    Check(label == "label", "StaticString<64> holds its text");

    Check(std::strcmp(TEErrorToStringSymbol(TE_FILE_NOT_FOUND), "TE_FILE_NOT_FOUND") == 0,
          "TEErrorToStringSymbol names TE_FILE_NOT_FOUND");

    // The exception's type information must match on both sides of the library boundary.
    try {
        ThrowTEError(TE_DISK_FULL);
        Check(false, "ThrowTEError returned");
    } catch (TEException const& e) {
        Check(e.GetErrorCode() == TE_DISK_FULL, "the caught exception carries TE_DISK_FULL");
    }

    // Compression loads its zlib module from beside the installed library.
    try {
        KaCompressor compressor;
        DynamicString text, back;
        compressor.StringToCompressedString(DynamicString("installed compression"), text);
        Check(KaCompressor::IsCompressedBinaryString(text), "the compressed string is recognised");
        compressor.CompressedStringToString(text, back);
        Check(back == "installed compression", "a compressed string comes back unchanged");
    } catch (TEException const& e) {
        Check(false, e.GetDescription());
    }

    if (failures == 0)
        std::puts("consumer: ok");
    return failures == 0 ? 0 : 1;
}
