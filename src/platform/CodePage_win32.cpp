// The Windows implementation of platform/CodePage.h.
#include "platform/CodePage.h"
#include "platform/Win32.h"

namespace tekit::platform {

unsigned GetAnsiCodePage() {
    return ::GetACP();
}

bool GetLeadBytes(unsigned codePage, bool (&isLead)[256]) {
    // 0 is the single-byte code page here, as on every platform, not CP_ACP: a caller that
    // wants the ANSI code page passes GetAnsiCodePage().
    if (codePage == 0) {
        for (bool& b : isLead)
            b = false;
        return true;
    }
    CPINFOEXA info{};
    if (!::GetCPInfoExA(codePage, 0, &info))
        return false;
    for (bool& b : isLead)
        b = false;
    // LeadByte holds inclusive ranges as byte pairs, ended by a pair of zeros.
    for (int i = 0; i + 1 < MAX_LEADBYTES && info.LeadByte[i] != 0; i += 2)
        for (unsigned c = info.LeadByte[i]; c <= info.LeadByte[i + 1]; ++c)
            isLead[c] = true;
    return true;
}

} // namespace tekit::platform
