/// \file
/// Generated operands.
#ifndef TESTS_GENERATOR_H
#define TESTS_GENERATOR_H

#include <algorithm>
#include <cstdint>

#include "M_Utils.h"

/// xorshift64*: the same operands on every machine.
class Generator {
 public:
  explicit Generator(uint64_t seed) : state_(seed) {}

  uint32_t Word() {
    state_ ^= state_ >> 12;
    state_ ^= state_ << 25;
    state_ ^= state_ >> 27;
    return static_cast<uint32_t>(state_ * 0x2545F4914F6CDD1D >> 32);
  }
  uint32_t Below(uint32_t limit) { return Word() % limit; }

  /// A word of any bit length alike, at times one step from a power of two, at times with zeros at
  /// its end: what limits and overflow predictions turn on.
  uint32_t Spread() {
    const uint32_t bits = Below(33);
    if (bits == 0) return 0;
    const uint32_t top = 1u << (bits - 1), random = top | (Word() & (top - 1));
    const uint32_t kind = Below(5);
    return kind == 0   ? top + Below(3) - 1
           : kind == 1 ? random & ~((1u << Below(bits)) - 1)
                       : random;
  }
  int32_t Signed() { return static_cast<int32_t>(Below(2) ? Spread() : 0 - Spread()); }
  /// An integer of -limit to limit.
  int32_t Small(int32_t limit) {
    return static_cast<int32_t>(Below(2 * static_cast<uint32_t>(limit) + 1)) - limit;
  }
  template <class T, size_t kSize>
  T OneOf(const T (&all)[kSize]) {
    return all[Below(kSize)];
  }
  M_Ratio Ratio() { return {Signed(), std::max(Spread(), 1u)}; }

 private:
  uint64_t state_;
};

#endif  // TESTS_GENERATOR_H
