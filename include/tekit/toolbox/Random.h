// Pseudo-random numbers that repeat for a seed: the same seed gives the same sequence on every
// platform and build, so a test that draws values can be run again exactly.
//
//   SetRandomSeed(42);
//   double noise = Random(-0.5, 0.5);
//
// The generator is xoshiro256** (Blackman and Vigna), its state filled from the 32-bit seed by
// SplitMix64; the library starts as if SetRandomSeed(0) had been called. Each value uses the
// top 53 bits of one output. One generator serves the process, under a lock. It is not meant
// for cryptography.
#pragma once

#include "tekit/Export.h"

/// Restarts the sequence.
extern "C" TEKIT_API void TEKIT_STDCALL SetRandomSeed(unsigned int seed);
/// The next value, uniform over [minimum, maximum): minimum + (maximum - minimum) * u with u in
/// [0, 1). With minimum > maximum the range is (maximum, minimum].
extern "C" TEKIT_API double TEKIT_STDCALL Random(double minimum, double maximum);
