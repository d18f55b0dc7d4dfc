// SimRandom: the simulated baseband's only source of randomness, seeded, with the same sequence on every
// machine and standard library (the standard distributions are not specified bit-exactly, so this draws
// uniform and Gaussian numbers itself).
#pragma once

#include <cmath>
#include <cstdint>

namespace velmar::sim {

class SimRandom {
  public:
    explicit SimRandom(std::uint64_t seed) : state_(seed ^ 0x9E3779B97F4A7C15ULL) {}

    // splitmix64: full period, good enough statistics for a simulation, and trivially portable.
    std::uint64_t next() {
        std::uint64_t z = (state_ += 0x9E3779B97F4A7C15ULL);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9ULL;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBULL;
        return z ^ (z >> 31);
    }
    // Uniform in [0, 1).
    double uniform() { return static_cast<double>(next() >> 11) * 0x1.0p-53; }
    double uniform(double low, double high) { return low + (high - low) * uniform(); }
    // Uniform integer in [low, high].
    std::int64_t integer(std::int64_t low, std::int64_t high) {
        return low + static_cast<std::int64_t>(uniform() * static_cast<double>(high - low + 1));
    }
    bool chance(double probability) { return uniform() < probability; }
    // Standard normal (Box-Muller, both values used).
    double gaussian() {
        if (hasSpare_) {
            hasSpare_ = false;
            return spare_;
        }
        double u1 = uniform();
        while (u1 <= 0) {
            u1 = uniform();
        }
        const double u2 = uniform();
        const double radius = std::sqrt(-2.0 * std::log(u1));
        spare_ = radius * std::sin(6.283185307179586 * u2);
        hasSpare_ = true;
        return radius * std::cos(6.283185307179586 * u2);
    }

  private:
    std::uint64_t state_;
    double spare_ = 0;
    bool hasSpare_ = false;
};

}  // namespace velmar::sim
