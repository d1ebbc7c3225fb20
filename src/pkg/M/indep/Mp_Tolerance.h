/// \file
/// What counts as zero, and as equal.
#ifndef MP_TOLERANCE_H
#define MP_TOLERANCE_H

#include <algorithm>
#include <cmath>

namespace Mp {

/// For a length, a divisor or a homogeneous w.
inline constexpr double kTolerance = 1e-12;

/// Strictly within the tolerance of 0. A NaN is not.
constexpr bool IsNearZero(double value) { return -kTolerance < value && value < kTolerance; }

/// Whether a and b differ by less than the tolerance relative to the larger magnitude, or by less
/// than about 1e-12. A NaN equals nothing.
inline bool IsNearlyEqual(double a, double b) {
  // 1e-12 without its low bits: 1.000088900582341e-12.
  constexpr double kLeast = 0x1.198p-40;
  const double magnitude = std::max(std::abs(a), std::abs(b));
  return std::abs(a - b) < std::max(kLeast, kTolerance * magnitude);
}

}  // namespace Mp

#endif  // MP_TOLERANCE_H
