// The toolbox's memory helpers: freeing its blocks, exchanging two blocks, rounding sizes.
#include "tekit/toolbox/MemoryHelpers.h"

#include "toolbox/SwapBytes.h"

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
    tekit::toolbox::SwapBytes(a, b, n);
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
