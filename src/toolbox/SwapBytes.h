// Exchanging two non-overlapping byte runs through a small stack buffer, piece by piece: the
// one swap behind SwapBlock and the sorting routines' items of any size.
#pragma once

#include <cstddef>
#include <cstring>

namespace tekit::toolbox {

inline void SwapBytes(void* a, void* b, std::size_t numBytes) {
    auto* p = static_cast<unsigned char*>(a);
    auto* q = static_cast<unsigned char*>(b);
    unsigned char step[64];
    for (std::size_t left = numBytes; left > 0;) {
        std::size_t const n = left < sizeof step ? left : sizeof step;
        std::memcpy(step, p, n);
        std::memcpy(p, q, n);
        std::memcpy(q, step, n);
        p += n, q += n, left -= n;
    }
}

} // namespace tekit::toolbox
