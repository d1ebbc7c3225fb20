/// \file
/// The order of points around the lowest of them.
#ifndef MP_HULL_H
#define MP_HULL_H

#include <cstdint>

#include "M_Matrix.h"

/// Puts lattice points in the order of their angles about a pivot, counter-clockwise where y grows
/// upwards, and of points at the same angle the farther first. Exact on the lattice of hulls.
class Mp_CompareAngleAndDist {
 public:
  explicit Mp_CompareAngleAndDist(const M_LongPoint& pivot) : pivot_(pivot) {}

  bool operator()(const M_LongPoint& a, const M_LongPoint& b) const {
    const int64_t ax = int64_t{a.x} - pivot_.x;
    const int64_t ay = int64_t{a.y} - pivot_.y;
    const int64_t bx = int64_t{b.x} - pivot_.x;
    const int64_t by = int64_t{b.y} - pivot_.y;
    const int64_t turn = ax * by - ay * bx;
    return turn != 0 ? turn > 0 : ax * ax + ay * ay > bx * bx + by * by;
  }

 private:
  M_LongPoint pivot_;
};

#endif  // MP_HULL_H
