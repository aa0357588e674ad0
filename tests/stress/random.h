#pragma once

#include <cstddef>
#include <cstdint>
#include <iterator>

namespace stress {

// The same numbers for the same seed on every machine.
class Random {
  public:
    explicit Random(std::uint64_t seed) : state_(seed) {}

    std::uint64_t Next() {
        std::uint64_t z = (state_ += 0x9E3779B97F4A7C15u);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9u;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBu;
        return z ^ (z >> 31);
    }
    // Below `limit`, which is not 0.
    std::size_t Below(std::size_t limit) { return static_cast<std::size_t>(Next() % limit); }
    bool Chance(std::size_t percent) { return Below(100) < percent; }
    template <class List>
    auto& Pick(List& list) {
        return *std::next(std::begin(list), static_cast<std::ptrdiff_t>(Below(std::size(list))));
    }

  private:
    std::uint64_t state_;
};

}  // namespace stress
