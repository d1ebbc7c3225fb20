/// \file
/// What counts as zero, and as equal.
#ifndef MP_TOLERANCE_H
#define MP_TOLERANCE_H

#include <algorithm>

namespace Mp {

/// For a length, a divisor or a homogeneous w.
inline constexpr double kTolerance = 1e-12;

/// Strictly within the tolerance of 0. A NaN is not.
constexpr bool IsNearZero(double value) { return -kTolerance < value && value < kTolerance; }

/// Whether a and b differ by less than the tolerance relative to the larger (of two negative
/// values, in magnitude), or by less than about 1e-12. A NaN equals nothing.
constexpr bool IsNearlyEqual(double a, double b) {
  // 1e-12 without its low bits: 1.000088900582341e-12.
  constexpr double kLeast = 0x1.198p-40;
  const double larger = a > b ? a : b;
  const double smaller = a > b ? b : a;
  // Of two negative values -smaller has the larger magnitude. Where only one is negative it may
  // have it, too, but then they differ by more than that.
  const double magnitude = std::max(larger, -smaller);
  return larger - smaller < std::max(kLeast, kTolerance * magnitude);
}

}  // namespace Mp

#endif  // MP_TOLERANCE_H
