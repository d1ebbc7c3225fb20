/// \file
/// The arithmetic that C++ leaves undefined or to the machine, written out once: wrapping sums and
/// products, magnitudes, the bits of a value, and the conversion of doubles that do not fit.
#ifndef MP_ARITH_H
#define MP_ARITH_H

#include <cstdint>
#include <limits>
#include <type_traits>

namespace Mp {

template <class Int>
constexpr Int WrapAdd(Int a, Int b) {
  using Unsigned = std::make_unsigned_t<Int>;
  return static_cast<Int>(static_cast<Unsigned>(a) + static_cast<Unsigned>(b));
}

template <class Int>
constexpr Int WrapSub(Int a, Int b) {
  using Unsigned = std::make_unsigned_t<Int>;
  return static_cast<Int>(static_cast<Unsigned>(a) - static_cast<Unsigned>(b));
}

constexpr int32_t WrapMul(int32_t a, int32_t b) {
  return static_cast<int32_t>(static_cast<uint32_t>(a) * static_cast<uint32_t>(b));
}

/// -2^31 is its own negative.
constexpr int32_t WrapNegate(int32_t a) { return WrapSub(0, a); }

/// |a|, with 2^31 for -2^31.
constexpr uint32_t Magnitude(int32_t a) { return static_cast<uint32_t>(a < 0 ? WrapNegate(a) : a); }

/// std::bit_cast(), which not every standard library has yet.
template <class To, class From>
constexpr To BitCast(const From& from) {
  return __builtin_bit_cast(To, from);
}

/// d truncated towards zero. The most negative value stands for all that does not fit; a NaN fails
/// both comparisons and goes the same way.
template <class Int>
constexpr Int TruncTo(double d) {
  constexpr Int kLowest = std::numeric_limits<Int>::min();
  constexpr double kLimit = -static_cast<double>(kLowest);
  return d >= -kLimit && d < kLimit ? static_cast<Int>(d) : kLowest;
}

}  // namespace Mp

#endif  // MP_ARITH_H
