/// \file
/// Operands drawn from a sequence that is the same on every machine.
#ifndef DIGEST_OPERANDS_H
#define DIGEST_OPERANDS_H

#include <cmath>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <type_traits>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "M_Utils.h"

namespace digest {

/// std::bit_cast(), which not every standard library has yet.
template <class To, class From>
To BitCast(const From& from) {
  return __builtin_bit_cast(To, from);
}

/// Calls visit(number) for each number that a record is made of.
template <class Record, class Visit>
void ForEachNumber(Record& r, const Visit& visit) {
  const auto all = [&](auto&... parts) { (ForEachNumber(parts, visit), ...); };
  if constexpr (std::is_arithmetic_v<Record>) {
    visit(r);
  } else if constexpr (std::is_array_v<Record>) {
    for (auto& element : r) ForEachNumber(element, visit);
  } else if constexpr (requires { r.m; }) {
    all(r.m);
  } else if constexpr (requires { r.values; }) {
    all(r.values);
  } else if constexpr (requires { r.num; }) {
    all(r.num, r.den);
  } else if constexpr (requires { r.h; }) {
    all(r.h, r.v);
  } else if constexpr (requires { r.left; }) {
    all(r.left, r.top, r.right, r.bottom);
  } else if constexpr (requires { r.w; }) {
    all(r.x, r.y, r.z, r.w);
  } else if constexpr (requires { r.z; }) {
    all(r.x, r.y, r.z);
  } else if constexpr (requires { r.x; }) {
    all(r.x, r.y);
  } else if constexpr (requires { r.d; }) {
    all(r.a, r.b, r.c, r.d);
  } else if constexpr (requires { r.origin; }) {
    all(r.origin, r.direction);
  } else if constexpr (requires { r.xy; }) {
    all(r.xy, r.xz, r.yz);
  } else {
    all(r.translate, r.scale, r.shear, r.rotate);
  }
}

/// xorshift64*, and numbers made of it.
class Operands {
 public:
  explicit Operands(uint64_t seed) : state_(seed * 2 + 1) {}

  uint32_t Word() {
    state_ ^= state_ >> 12;
    state_ ^= state_ << 25;
    state_ ^= state_ >> 27;
    return static_cast<uint32_t>(state_ * 0x2545F4914F6CDD1D >> 32);
  }
  uint32_t Below(uint32_t limit) { return Word() % limit; }

  /// Decides what the next numbers are like: mostly such as clients have, at times anything, edges,
  /// infinities and NaNs among them.
  void BeginCall() { isWild_ = Below(4) == 0; }

  template <class Record>
  Record Make() {
    Record record;
    ForEachNumber(record, [&](auto& number) { Draw(&number); });
    return record;
  }

 private:
  void Draw(double* number) { *number = isWild_ ? AnyDouble() : UsualDouble(); }
  void Draw(float* number) { *number = static_cast<float>(UsualDouble()); }
  void Draw(bool* number) { *number = Below(2) != 0; }
  template <class Integer>
  void Draw(Integer* number) {
    *number = static_cast<Integer>(isWild_ ? AnyInteger() : Below(2001) - 1000);
  }

  double UsualDouble() {
    const double fraction = Word() / 4294967296.0;
    switch (Below(4)) {
      case 0:
        return static_cast<double>(Below(9)) - 4;
      case 1:
        return fraction;
      case 2:
        return 2 * fraction - 1;
      default:
        return 2000 * fraction - 1000;
    }
  }

  double AnyDouble() {
    constexpr double kInfinity = std::numeric_limits<double>::infinity();
    constexpr double kNan = std::numeric_limits<double>::quiet_NaN();
    static constexpr double kEdges[] = {0.0,    -0.0,      0.5,          -0.5,          1e-12,
                                        -1e-12, 1e-6,      1e-5,         0.1,           1e-300,
                                        1e300,  32767.0,   2147483647.0, -2147483648.0, 9.3e18,
                                        4e-324, kInfinity, -kInfinity,   kNan};
    const uint32_t kind = Below(8);
    if (kind < 2) return UsualDouble();
    const double edge = kEdges[Below(sizeof kEdges / sizeof kEdges[0])];
    // At an edge, or one step to either side of it.
    if (kind < 6) {
      const int64_t step = int64_t{Below(3)} - 1;
      return std::isfinite(edge) && edge != 0 ? BitCast<double>(BitCast<int64_t>(edge) + step)
                                              : edge;
    }
    // Any exponent that products can bear.
    const auto exponent = static_cast<int>(Below(600)) - 300;
    return std::ldexp(UsualDouble(), exponent);
  }

  // Of any length alike, at times one step from a power of two.
  uint32_t AnyInteger() {
    const uint32_t bits = Below(33);
    const uint32_t top = bits == 0 ? 0 : 1u << (bits - 1);
    const uint32_t magnitude = Below(4) == 0 ? top + Below(3) - 1 : top | (Word() & (top - 1));
    return Below(2) ? magnitude : 0 - magnitude;
  }

  uint64_t state_;
  bool isWild_ = false;
};

}  // namespace digest

#endif  // DIGEST_OPERANDS_H
