// xoshiro256** (Blackman and Vigna, 2018) seeded through SplitMix64: small, fast, the same on
// every platform, and with no weak low bits, so a value can use the top 53 bits of one output.
#include "tekit/toolbox/Random.h"

#include <cstdint>
#include <mutex>

namespace {

struct Generator {
    std::uint64_t s[4];

    explicit Generator(std::uint32_t seed) { Seed(seed); }

    void Seed(std::uint32_t seed) {
        std::uint64_t x = seed;
        for (auto& word : s) {
            x += 0x9E3779B97F4A7C15ull;
            std::uint64_t z = x;
            z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
            z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
            word = z ^ (z >> 31);
        }
    }

    static std::uint64_t Rotl(std::uint64_t x, int k) { return (x << k) | (x >> (64 - k)); }

    std::uint64_t Next() {
        std::uint64_t const result = Rotl(s[1] * 5, 7) * 9;
        std::uint64_t const t = s[1] << 17;
        s[2] ^= s[0];
        s[3] ^= s[1];
        s[1] ^= s[2];
        s[0] ^= s[3];
        s[2] ^= t;
        s[3] = Rotl(s[3], 45);
        return result;
    }
};

std::mutex gRandomLock;
Generator gGenerator(0);

} // namespace

extern "C" void TEKIT_STDCALL SetRandomSeed(unsigned int seed) {
    std::lock_guard<std::mutex> hold(gRandomLock);
    gGenerator.Seed(seed);
}

extern "C" double TEKIT_STDCALL Random(double minimum, double maximum) {
    std::uint64_t bits;
    {
        std::lock_guard<std::mutex> hold(gRandomLock);
        bits = gGenerator.Next();
    }
    double const unit = static_cast<double>(bits >> 11) * 0x1.0p-53;
    return minimum + (maximum - minimum) * unit;
}
