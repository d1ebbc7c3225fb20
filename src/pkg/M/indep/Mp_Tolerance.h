/// \file
/// What counts as a zero length, determinant or homogeneous w.
#ifndef MP_TOLERANCE_H
#define MP_TOLERANCE_H

namespace Mp {

inline constexpr double kTolerance = 1e-12;

/// Strictly within the tolerance of 0. A NaN is not.
constexpr bool IsNearZero(double value) { return -kTolerance < value && value < kTolerance; }

}  // namespace Mp

#endif  // MP_TOLERANCE_H
