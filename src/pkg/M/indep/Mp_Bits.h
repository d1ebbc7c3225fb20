/// \file
/// Bit counting through the nibble tables, the overflow predictions, and the greatest common
/// divisor.
#ifndef MP_BITS_H
#define MP_BITS_H

#include <bit>
#include <cstdint>
#include <utility>

#include "Mp_Arith.h"

#pragma GCC visibility push(default)
extern "C" {
extern const unsigned char Mp_G_lead_zeros[16];   ///< Leading zero bits of a nibble, 4 for 0.
extern const unsigned char Mp_G_trail_zeros[16];  ///< Trailing zero bits of a nibble, 4 for 0.
}
#pragma GCC visibility pop

namespace Mp {

/// Leading zero bits, 32 for 0.
inline int LeadingZeros(uint32_t x) {
  int n = 0;
  if (x < 0x10000) {
    x <<= 16;
    n += 16;
  }
  if (x < 0x1000000) {
    x <<= 8;
    n += 8;
  }
  if (x < 0x10000000) {
    x <<= 4;
    n += 4;
  }
  return n + Mp_G_lead_zeros[x >> 28];
}

/// Trailing zero bits, 32 for 0.
inline int TrailingZeros(uint32_t x) {
  int n = 0;
  if ((x & 0xFFFF) == 0) {
    x >>= 16;
    n += 16;
  }
  if ((x & 0xFF) == 0) {
    x >>= 8;
    n += 8;
  }
  if ((x & 0xF) == 0) {
    x >>= 4;
    n += 4;
  }
  return n + Mp_G_trail_zeros[x & 0xF];
}

inline bool AddWouldOverflow(int32_t a, int32_t b) {
  const int32_t sum = WrapAdd(a, b);
  return ((sum ^ a) & (sum ^ b)) < 0;
}

/// By bit lengths only, which have to be at most 31 together: at times true for a product that
/// fits, never false for one that does not. A product tells the sum of its factors' lengths but for
/// one octave, where they are counted. A zero has no length, and a one in its place tells the same.
inline bool MulWouldOverflow(int32_t a, int32_t b) {
  const uint32_t x = Magnitude(a);
  const uint32_t y = Magnitude(b);
  const uint64_t product = uint64_t{x + (x == 0)} * (y + (y == 0));
  constexpr uint64_t kOctave = uint64_t{1} << 30;
  if (product - kOctave >= kOctave) return product >= kOctave;
  return LeadingZeros(x) + LeadingZeros(y) < 33;
}

/// As MulWouldOverflow, for 32 unsigned bits.
inline bool UMulWouldOverflow(uint32_t a, uint32_t b) {
  const uint64_t product = uint64_t{a} * b;
  constexpr uint64_t kOctave = uint64_t{1} << 31;
  if (product - kOctave >= kOctave) return product >= kOctave;
  return LeadingZeros(a) + LeadingZeros(b) < 32;
}

/// gcd(a, b), but 1 when b is 0. One remainder brings both operands to the same size; subtraction
/// and shifts, which need no division, find the rest. A limited one ends early, with anything else
/// that is not above the limit, where it would not be above it.
template <bool kIsLimited = false>
uint32_t Gcd(uint32_t a, uint32_t b, uint32_t limit = 0) {
  if (b == 0) return 1;
  if (a < b) {
    if (a == 0) return b;
    std::swap(a, b);
  }
  a %= b;
  if (a == 0) return b;
  const int twos = std::countr_zero(a | b);
  b >>= std::countr_zero(b);
  int shift = std::countr_zero(a);
  do {
    a >>= shift;
    // b becomes the smaller of the two and a their distance. The signs are too random for a branch,
    // so they are written as masks.
    const int64_t difference = int64_t{b} - int64_t{a};
    const int64_t mask = difference >> 63;
    shift = std::countr_zero(static_cast<uint64_t>(difference));
    b = static_cast<uint32_t>(a + (difference & mask));
    a = static_cast<uint32_t>((difference ^ mask) - mask);
  } while (a != 0 && (!kIsLimited || b > limit >> twos));
  return b << twos;
}

}  // namespace Mp

#endif  // MP_BITS_H
