// Convexity, and convex hulls on an integer lattice.
//
// The hull is that of the points moved to a lattice of 2^29 steps along each axis, on which
// products of differences are exact in 64 bits. Its corners are the same whatever the method; this
// one drops what lies well inside some of the points before anything is moved, sorts the rest by x,
// and walks along those below and those above the line from the first to the last.

#include <cmath>
#include <cstdint>
#include <iterator>
#include <limits>
#include <memory>
#include <vector>

#include "M_Matrix.h"
#include "Mp_HullInterior.h"
#include "Mp_HullLattice.h"
#include "Mp_HullSort.h"
#include "Mp_HullWalk.h"

// The host's own type is not hidden, or what is made of it would be.
#pragma GCC visibility push(default)
#include "qelcore/geom/PointT.h"
#pragma GCC visibility pop

namespace {

template <class T>
std::vector<T> ComputeHull(const T* points, size_t count) {
  // First the numbers of the points that are kept, then these on the lattice, in the same place.
  const std::unique_ptr<uint64_t[]> work(new uint64_t[count]);
  Mp::Box box;
  const size_t number = Mp::KeepCandidates(points, count, work.get(), &box);
  const Mp::Lattice lattice(box);
  for (size_t i = 0; i < number; ++i) work[i] = lattice.ToKey(points[work[i]]);
  const std::unique_ptr<Mp::Key[]> scratch(new Mp::Key[number]);
  Mp::Key* const sorted = Mp::Sort(work.get(), number, scratch.get());
  const size_t corners =
      Mp::Hull(sorted, number, sorted == work.get() ? scratch.get() : work.get());

  std::vector<T> result(corners, T{});
  for (size_t i = 0; i < corners; ++i) {
    using Coord = decltype(T::x);
    const M_LongPoint p = Mp::ToPoint(sorted[i]);
    result[i].x = static_cast<Coord>(lattice.x.FromLattice(p.x));
    result[i].y = static_cast<Coord>(lattice.y.FromLattice(p.y));
  }
  return result;
}

template <class Iterator>
bool IsConvex(Iterator first, Iterator last) {
  constexpr double kEpsilon = std::numeric_limits<double>::epsilon();
  constexpr double kStraight = kEpsilon * kEpsilon + 2 * kEpsilon;
  const auto count = last - first;
  if (count < 3) return true;
  int reference = 0;
  auto a = first[count - 2];
  auto b = first[count - 1];
  for (Iterator next = first; next != last; ++next) {
    const auto c = *next;
    const double product1 = (b.x - a.x) * (c.y - b.y);
    const double product2 = (b.y - a.y) * (c.x - b.x);
    const double cross = product1 - product2;
    if (std::abs(cross) > kStraight * (std::abs(product1) + std::abs(product2))) {
      const int turn = cross > 0 ? 1 : -1;
      if (reference == 0) reference = turn;
      if (turn != reference) return false;
    }
    a = b;
    b = c;
  }
  return true;
}

template <class Iterator, class T>
void FindHull(Iterator first, Iterator last, std::vector<T>& out) {
  const auto count = static_cast<size_t>(last - first);
  // The result may replace the points themselves.
  std::vector<T> result = count <= 3 ? std::vector<T>(first, last) : ComputeHull<T>(&*first, count);
  out.swap(result);
}

using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;
using Vector4 = M_Vector4T<double>;
using PointF = qelcore::geom::PointT<float>;

}  // namespace

// A template is exported where it is defined.
#pragma GCC visibility push(default)

template <>
bool M_IsConvex(const Vector2* first, const Vector2* last) {
  return IsConvex(first, last);
}
template <>
bool M_IsConvex(std::vector<Vector2>::const_iterator first,
                std::vector<Vector2>::const_iterator last) {
  return IsConvex(first, last);
}
template <>
bool M_IsConvex(const Vector3* first, const Vector3* last) {
  return IsConvex(first, last);
}
template <>
bool M_IsConvex(std::vector<Vector3>::const_iterator first,
                std::vector<Vector3>::const_iterator last) {
  return IsConvex(first, last);
}
template <>
bool M_IsConvex(const Vector4* first, const Vector4* last) {
  return IsConvex(first, last);
}
template <>
bool M_IsConvex(std::vector<Vector4>::const_iterator first,
                std::vector<Vector4>::const_iterator last) {
  return IsConvex(first, last);
}

template <>
void M_ComputeConvexHull(const Vector2* first, const Vector2* last, std::vector<Vector2>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(std::vector<Vector2>::const_iterator first,
                         std::vector<Vector2>::const_iterator last, std::vector<Vector2>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(const Vector3* first, const Vector3* last, std::vector<Vector3>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(std::vector<Vector3>::const_iterator first,
                         std::vector<Vector3>::const_iterator last, std::vector<Vector3>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(const Vector4* first, const Vector4* last, std::vector<Vector4>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(std::vector<Vector4>::const_iterator first,
                         std::vector<Vector4>::const_iterator last, std::vector<Vector4>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(const PointF* first, const PointF* last, std::vector<PointF>& out) {
  FindHull(first, last, out);
}
template <>
void M_ComputeConvexHull(std::vector<PointF>::const_iterator first,
                         std::vector<PointF>::const_iterator last, std::vector<PointF>& out) {
  FindHull(first, last, out);
}

#pragma GCC visibility pop
