// Text scanning for the toolbox's text helpers: "C" locale white space and case, multibyte-aware.
#include "toolbox/TextScan.h"

#include "strings/MultiByteChars.h"
#include "tekit/strings/String.h"

namespace tekit::toolbox {

namespace {

bool MultiByte() {
    return String::IsMultiByteSupportEnabled();
}

/// The character at `p` of a range ending at `end` (0 past it), and how many bytes it takes.
unsigned short CharAt(char const* p, char const* end, int& size) {
    if (p >= end) {
        size = 0;
        return 0;
    }
    if (MultiByte() && mbcs::IsLeadByte(*p) && p + 1 < end && p[1] != '\0') {
        size = 2;
        return static_cast<unsigned short>(static_cast<unsigned char>(p[0]) << 8 |
                                           static_cast<unsigned char>(p[1]));
    }
    size = 1;
    return static_cast<unsigned char>(*p);
}

} // namespace

char const* NextChar(char const* p) {
    return MultiByte() ? mbcs::Inc(p) : p + 1;
}

char const* SkipWhite(char const* p) {
    // A white-space byte is never part of a double-byte character: lead bytes are above 0x80
    // and trail bytes above 0x3F in every code page the library knows.
    while (IsWhiteSpace(*p))
        ++p;
    return p;
}

char const* TrimmedEnd(char const* text) {
    char const* end = text;
    for (char const* p = text; *p; p = NextChar(p)) {
        if (!IsWhiteSpace(*p))
            end = NextChar(p);
    }
    return end;
}

int CutAtCharBoundary(char const* text, int length, int limit) {
    if (length <= limit)
        return length;
    if (!MultiByte())
        return limit;
    int kept = 0;
    for (char const* p = text; *p;) {
        char const* next = mbcs::Inc(p);
        if (next - text > limit)
            break;
        kept = static_cast<int>(next - text);
        p = next;
    }
    return kept;
}

int CompareIgnoringCase(char const* a, char const* aEnd, char const* b, char const* bEnd) {
    for (;;) {
        int sizeA = 0, sizeB = 0;
        unsigned short const ca = mbcs::ToLower(CharAt(a, aEnd, sizeA));
        unsigned short const cb = mbcs::ToLower(CharAt(b, bEnd, sizeB));
        if (ca != cb)
            return ca < cb ? -1 : 1;
        if (ca == 0)
            return 0;
        a += sizeA;
        b += sizeB;
    }
}

} // namespace tekit::toolbox
