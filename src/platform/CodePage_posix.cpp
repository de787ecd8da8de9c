// The POSIX implementation of platform/CodePage.h.
#include "platform/CodePage.h"

namespace tekit::platform {

namespace {

struct LeadRange {
    unsigned char first;
    unsigned char last;
};

/// Lead-byte ranges of the double-byte code pages the library knows without Windows.
struct CodePageLeads {
    unsigned codePage;
    LeadRange ranges[2];
};

constexpr CodePageLeads kCodePages[] = {
    {932, {{0x81, 0x9F}, {0xE0, 0xFC}}}, // Shift-JIS
    {936, {{0x81, 0xFE}, {0, 0}}},       // GBK
    {949, {{0x81, 0xFE}, {0, 0}}},       // Unified Hangul
    {950, {{0x81, 0xFE}, {0, 0}}},       // Big5
};

} // namespace

unsigned GetAnsiCodePage() {
    return 0;
}

bool GetLeadBytes(unsigned codePage, bool (&isLead)[256]) {
    for (auto const& entry : kCodePages) {
        if (entry.codePage != codePage)
            continue;
        for (bool& b : isLead)
            b = false;
        for (auto const& range : entry.ranges)
            for (unsigned c = range.first; range.first != 0 && c <= range.last; ++c)
                isLead[c] = true;
        return true;
    }
    return false;
}

} // namespace tekit::platform
