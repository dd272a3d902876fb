// The seeded random numbers of placement: splitmix64, the same sequence on every platform for a
// seed, so that a seed gives the same placement everywhere.
#pragma once

#include <cstdint>

namespace kelmartool {

inline std::uint64_t NextRandom(std::uint64_t& state) {
    std::uint64_t z = (state += 0x9E3779B97F4A7C15ull);
    z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ull;
    z = (z ^ (z >> 27)) * 0x94D049BB133111EBull;
    return z ^ (z >> 31);
}

// A number in [0, 1).
inline double NextUnit(std::uint64_t& state) { return static_cast<double>(NextRandom(state) >> 11) * 0x1.0p-53; }

}  // namespace kelmartool
