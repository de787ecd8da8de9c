#include "tekit/toolbox/MemoryHelpers.h"

#include <climits>
#include <cstdint>
#include <cstdlib>
#include <cstring>

extern "C" void TEKIT_STDCALL TBFree(void* block) {
    std::free(block);
}

extern "C" int TEKIT_STDCALL SwapBlock(void* a, void* b, int numBytes) {
    if (!a || !b || numBytes < 1)
        return 0;
    if (a == b)
        return 1;
    auto const x = reinterpret_cast<std::uintptr_t>(a);
    auto const y = reinterpret_cast<std::uintptr_t>(b);
    auto const n = static_cast<std::uintptr_t>(numBytes);
    if (x < y + n && y < x + n)
        return 0; // partly overlapping blocks have no meaningful exchange
    auto* p = static_cast<unsigned char*>(a);
    auto* q = static_cast<unsigned char*>(b);
    unsigned char step[256];
    for (std::size_t left = n; left > 0;) {
        std::size_t const k = left < sizeof step ? left : sizeof step;
        std::memcpy(step, p, k);
        std::memcpy(p, q, k);
        std::memcpy(q, step, k);
        p += k;
        q += k;
        left -= k;
    }
    return 1;
}

extern "C" int TEKIT_STDCALL RoundToNextMultiple(int value, int multiple) {
    if (multiple < 1)
        return value;
    long long const remainder = value % multiple; // truncates toward zero: <= 0 for value <= 0
    if (remainder == 0)
        return value;
    long long const rounded = remainder > 0 ? static_cast<long long>(value) + multiple - remainder
                                            : static_cast<long long>(value) - remainder;
    return rounded > INT_MAX ? value : static_cast<int>(rounded);
}
