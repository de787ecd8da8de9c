// Loads and stores of little-endian values at unaligned addresses: the byte order of every
// stream, whatever the host's.
#pragma once

#include <bit>
#include <cstdint>
#include <cstring>

namespace tekit::streams {

template <class T> inline T ToLittleEndian(T value) {
    if constexpr (std::endian::native == std::endian::big) {
        T swapped = 0;
        for (unsigned i = 0; i < sizeof(T); ++i) {
            swapped = static_cast<T>((swapped << 8) | (value & 0xFF));
            value = static_cast<T>(value >> 8);
        }
        return swapped;
    } else {
        return value;
    }
}

/// Stores the unsigned integer `value` as sizeof(T) little-endian bytes at `p`.
template <class T> inline void StoreLittleEndian(unsigned char* p, T value) {
    value = ToLittleEndian(value);
    std::memcpy(p, &value, sizeof value);
}

/// Loads an unsigned integer of sizeof(T) little-endian bytes from `p`.
template <class T> inline T LoadLittleEndian(unsigned char const* p) {
    T value;
    std::memcpy(&value, p, sizeof value);
    return ToLittleEndian(value);
}

} // namespace tekit::streams
