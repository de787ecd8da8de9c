// The multibyte character operations over the process-wide lead-byte table.
#include "strings/MultiByteChars.h"

#include "platform/CodePage.h"
#include "tekit/strings/MultiByte.h"

#include <atomic>
#include <cstring>

namespace tekit::mbcs {

bool gLeadBytes[256] = {};

namespace {

std::atomic<unsigned> gCodePage{0};

/// At load the table follows the process's ANSI code page (always 0, single-byte, off Windows).
struct LoadAnsiCodePage {
    LoadAnsiCodePage() { LoadCodePage(platform::GetAnsiCodePage()); }
} const gLoadAnsiCodePage;

int Sign(int v) {
    return v < 0 ? -1 : (v > 0 ? 1 : 0);
}

/// Compares characters one by one until `n` characters (negative: all) or a difference.
template <class Fold> int CompareChars(char const* a, char const* b, int n, Fold fold) {
    a = a ? a : "";
    b = b ? b : "";
    for (int i = 0; n < 0 || i < n; ++i) {
        unsigned short ca = fold(GetChar(a));
        unsigned short cb = fold(GetChar(b));
        if (ca != cb)
            return ca < cb ? -1 : 1;
        if (ca == 0)
            return 0;
        a = Inc(a);
        b = Inc(b);
    }
    return 0;
}

unsigned short NoFold(unsigned short ch) {
    return ch;
}

} // namespace

bool LoadCodePage(unsigned codePage) {
    bool table[256] = {};
    if (codePage != 0 && !platform::GetLeadBytes(codePage, table))
        return false;
    table[0] = false; // the terminator never leads a character
    std::memcpy(gLeadBytes, table, sizeof gLeadBytes);
    gCodePage.store(codePage, std::memory_order_relaxed);
    return true;
}

unsigned CurrentCodePage() {
    return gCodePage.load(std::memory_order_relaxed);
}

int CharBytes(char const* p) {
    if (!p || *p == '\0')
        return 0;
    return (IsLeadByte(*p) && p[1] != '\0') ? 2 : 1;
}

char const* Inc(char const* p) {
    if (!p)
        return p;
    return p + CharBytes(p);
}

char const* NInc(char const* p, int n) {
    if (!p)
        return p;
    for (; n > 0 && *p != '\0'; --n)
        p = Inc(p);
    return p;
}

char const* Dec(char const* start, char const* p) {
    if (!start || !p || p <= start)
        return start;
    // The bytes of lead-byte range right before p - 1 pair up from the last byte that cannot
    // lead (a character always ends there); an odd run means p - 1 is a trail byte.
    char const* q = p - 1;
    int run = 0;
    for (char const* r = q; r > start && IsLeadByte(r[-1]); --r)
        ++run;
    return (run % 2 == 1) ? q - 1 : q;
}

int Len(char const* s) {
    int n = 0;
    for (; s && *s != '\0'; s = Inc(s))
        ++n;
    return n;
}

int NBCnt(char const* s, int n) {
    if (!s)
        return 0;
    if (n < 0)
        return static_cast<int>(std::strlen(s));
    return static_cast<int>(NInc(s, n) - s);
}

int CharsInBytes(char const* s, int numBytes) {
    int chars = 0;
    for (int used = 0; s && *s != '\0';) {
        used += CharBytes(s);
        if (used > numBytes)
            break;
        ++chars;
        s = Inc(s);
    }
    return chars;
}

unsigned short GetChar(char const* p) {
    if (!p)
        return 0;
    auto lead = static_cast<unsigned char>(p[0]);
    if (CharBytes(p) == 2)
        return static_cast<unsigned short>((lead << 8) | static_cast<unsigned char>(p[1]));
    return lead;
}

int PutChar(char* p, unsigned short ch) {
    if (!p)
        return 0;
    if (CharValueBytes(ch) == 2) {
        p[0] = static_cast<char>(ch >> 8);
        p[1] = static_cast<char>(ch & 0xFF);
        return 2;
    }
    p[0] = static_cast<char>(ch);
    return 1;
}

int Cmp(char const* a, char const* b) {
    return CompareChars(a, b, -1, NoFold);
}
int NCmp(char const* a, char const* b, int n) {
    return CompareChars(a, b, n, NoFold);
}
int ICmp(char const* a, char const* b) {
    return CompareChars(a, b, -1, ToLower);
}
int NICmp(char const* a, char const* b, int n) {
    return CompareChars(a, b, n, ToLower);
}

int AsciiNICmp(char const* a, char const* b, int n) {
    auto const* pa = reinterpret_cast<unsigned char const*>(a ? a : "");
    auto const* pb = reinterpret_cast<unsigned char const*>(b ? b : "");
    for (int i = 0; n < 0 || i < n; ++i) {
        int ca = ToLower(pa[i]);
        int cb = ToLower(pb[i]);
        if (ca != cb || ca == 0)
            return Sign(ca - cb);
    }
    return 0;
}

} // namespace tekit::mbcs

namespace tekit {

void SetMultiByteCodePage(unsigned codePage) {
    mbcs::LoadCodePage(codePage);
}
unsigned GetMultiByteCodePage() {
    return mbcs::CurrentCodePage();
}

} // namespace tekit
