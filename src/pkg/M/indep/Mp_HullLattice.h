/// \file
/// The lattice on which hulls are exact: 2^29 steps along each axis.
#ifndef MP_HULL_LATTICE_H
#define MP_HULL_LATTICE_H

#include <algorithm>
#include <cstdint>
#include <limits>

#include "M_Matrix.h"

namespace Mp {

struct Point {
  double x, y;
};

struct Box {
  double left, top, right, bottom;
};

inline constexpr double kInfinity = std::numeric_limits<double>::infinity();
inline constexpr Box kNothing = {kInfinity, kInfinity, -kInfinity, -kInfinity};

inline constexpr double kStep = 0x1p-29;

/// One axis.
class Axis {
 public:
  Axis(double least, double greatest) : least_(least), step_((greatest - least) * kStep) {
    // No extent, one too small to be divided, or a NaN.
    if (!(step_ > 0)) step_ = 1;
  }

  // A NaN, and what stands beside an infinity, goes to 0. Beyond 2^29 comes what is counted in the
  // smallest steps there are, which may be too short by a third.
  int32_t ToLattice(double coordinate) const {
    constexpr double kMost = 0x1p30 - 1;
    const double steps = (coordinate - least_) / step_ + 0.5;
    if (!(steps >= 0)) return 0;
    return static_cast<int32_t>(std::min(steps, kMost));
  }

  double FromLattice(int32_t coordinate) const { return coordinate * step_ + least_; }

 private:
  double least_;
  double step_;
};

/// Two coordinates in the order of the points: by x, and by y where that is the same.
using Key = uint64_t;

inline M_LongPoint ToPoint(Key key) {
  return {static_cast<int32_t>(key >> 32), static_cast<int32_t>(key)};
}

/// That of the points in a box.
struct Lattice {
  Axis x, y;

  explicit Lattice(const Box& box) : x(box.left, box.right), y(box.top, box.bottom) {}

  template <class T>
  Key ToKey(const T& p) const {
    const auto high = static_cast<Key>(x.ToLattice(static_cast<double>(p.x)));
    return high << 32 | static_cast<Key>(y.ToLattice(static_cast<double>(p.y)));
  }
};

}  // namespace Mp

#endif  // MP_HULL_LATTICE_H
