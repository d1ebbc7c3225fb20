/// \file
/// The generator of the tests' random operands, the same on every machine.
#ifndef TESTS_GENERATE_H
#define TESTS_GENERATE_H

#include <cstdint>

/// xorshift64*.
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
    const uint32_t top = 1u << (bits - 1);
    switch (Below(5)) {
      case 0:
        return top + Below(3) - 1;
      case 1:
        return (top | (Word() & (top - 1))) & ~((1u << Below(bits)) - 1);
      default:
        return top | (Word() & (top - 1));
    }
  }
  int32_t SignedSpread() { return static_cast<int32_t>(Below(2) ? Spread() : 0 - Spread()); }

 private:
  uint64_t state_;
};

#endif  // TESTS_GENERATE_H
