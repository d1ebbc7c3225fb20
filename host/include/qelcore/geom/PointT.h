/// \file
/// PointT.h: the host's own point type.
#ifndef QELCORE_GEOM_POINTT_H
#define QELCORE_GEOM_POINTT_H

#pragma GCC visibility push(default)

namespace qelcore::geom {

/// A pair of coordinates.
template <class T>
struct PointT {
  T x;
  T y;
};

}  // namespace qelcore::geom

#pragma GCC visibility pop

#endif  // QELCORE_GEOM_POINTT_H
