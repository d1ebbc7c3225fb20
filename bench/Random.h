/// \file
/// The same operands for every subject, in every run.
#ifndef BENCH_RANDOM_H
#define BENCH_RANDOM_H

#include <cstdint>

namespace bench {

/// xorshift64*, from the start of the program on.
inline uint32_t Random() {
  static uint64_t state = 0x9E3779B97F4A7C15;
  state ^= state >> 12;
  state ^= state << 25;
  state ^= state >> 27;
  return static_cast<uint32_t>(state * 0x2545F4914F6CDD1D >> 32);
}

inline double Uniform(double lowest, double highest) {
  return lowest + (highest - lowest) * Random() / 4294967296.0;
}

}  // namespace bench

#endif  // BENCH_RANDOM_H
