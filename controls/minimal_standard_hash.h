// The hash of the maps that are keyed by a page or a column.
#pragma once

#include <cstddef>
#include <cstdint>
#include <random>

namespace orvane {

// One step of the minimal standard generator (Park and Miller): key * 16807 mod 2^31 - 1. Small
// neighbouring keys come out far apart.
struct MinimalStandardHash {
    std::size_t operator()(int key) const {
        const std::uint64_t seed = static_cast<std::uint32_t>(key);
        return static_cast<std::size_t>(seed * std::minstd_rand0::multiplier % std::minstd_rand0::modulus);
    }
};

// Buckets of such a map: more than there will ever be pages or columns.
inline constexpr std::size_t kHashBuckets = 17;

}  // namespace orvane
