// Convexity, and convex hulls on an integer lattice.
//
// The hull is that of the points moved to a lattice of 2^29 steps along each axis, on which
// products of differences are exact in 64 bits. Its corners are the same whatever the method; this
// one drops what lies well inside some of the points before anything is moved, and sorts the rest
// by x.

#include <algorithm>
#include <array>
#include <cmath>
#include <cstdint>
#include <iterator>
#include <limits>
#include <memory>
#include <utility>
#include <vector>

#include "M_Matrix.h"
#include "Mp_Hull.h"

// The host's own type is not hidden, or what is made of it would be.
#pragma GCC visibility push(default)
#include "qelcore/geom/PointT.h"
#pragma GCC visibility pop

namespace {

struct Point {
  double x, y;
};

struct Box {
  double left, top, right, bottom;
};

// A number that is none widens nothing.
void Include(const Point& p, Box* box) {
  box->left = p.x < box->left ? p.x : box->left;
  box->right = p.x > box->right ? p.x : box->right;
  box->top = p.y < box->top ? p.y : box->top;
  box->bottom = p.y > box->bottom ? p.y : box->bottom;
}

constexpr double kInfinity = std::numeric_limits<double>::infinity();
constexpr Box kNothing = {kInfinity, kInfinity, -kInfinity, -kInfinity};

// ---------------------------------------------------------------------------------------------
// The lattice
// ---------------------------------------------------------------------------------------------

constexpr double kStep = 0x1p-29;

// One axis.
class Axis {
 public:
  Axis(double least, double greatest) : least_(least), step_((greatest - least) * kStep) {
    // No extent, or none that a double holds.
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

struct Lattice {
  Axis x, y;

  explicit Lattice(const Box& box) : x(box.left, box.right), y(box.top, box.bottom) {}
};

// ---------------------------------------------------------------------------------------------
// What is well inside
// ---------------------------------------------------------------------------------------------

// An octagon of points of a sample, the farthest in eight directions, and a rectangle with one of
// them beyond each of its corners. What lies within the margins of either is so far inside that its
// place on the lattice is, too.
class Interior {
 public:
  Interior(const Point* sample, size_t count) {
    box_ = kNothing;
    for (size_t i = 0; i < count; ++i) Include(sample[i], &box_);
    const double width = box_.right - box_.left;
    const double height = box_.bottom - box_.top;
    // Where products could overflow or vanish, nothing is inside. A NaN fails, too.
    const auto isModest = [](double number) { return number > 1e-100 && number < 1e100; };
    const bool canTell = isModest(width) && isModest(height) &&
                         isModest(1 + std::abs(box_.left) + std::abs(box_.top));
    std::array<double, 8> farthest;
    farthest.fill(-kInfinity);
    std::array<Point, 8> corners = {};
    for (size_t i = 0; i < count; ++i) {
      const Point& p = sample[i];
      const double x = p.x * height;
      const double y = p.y * width;
      const double distances[8] = {x, x + y, y, y - x, -x, -x - y, -y, x - y};
      for (size_t k = 0; k < 8; ++k) {
        if (!(distances[k] > farthest[k])) continue;
        farthest[k] = distances[k];
        corners[k] = p;
      }
    }
    // Far more than a lattice step is, even if the sample is far smaller than the whole.
    const double marginX = width * kStep * 1024;
    const double marginY = height * kStep * 1024;
    rectangle_ = {std::max(corners[3].x, corners[5].x) + marginX,
                  std::max(corners[5].y, corners[7].y) + marginY,
                  std::min(corners[1].x, corners[7].x) - marginX,
                  std::min(corners[1].y, corners[3].y) - marginY};
    for (size_t k = 0; k < 8; ++k) {
      const Point& p = corners[k];
      const Point& q = corners[(k + 1) % 8];
      const double dx = q.x - p.x;
      const double dy = q.y - p.y;
      // A side without length says nothing; of one that is very short nothing can be said.
      const bool isPoint = dx == 0 && dy == 0;
      const bool isLong = std::abs(dx) > width * 0x1p-20 || std::abs(dy) > height * 0x1p-20;
      sides_[k] = {p, dx, dy,
                   isPoint  ? -1
                   : isLong ? std::abs(dx) * marginY + std::abs(dy) * marginX
                            : kInfinity};
    }
    if (!canTell) {
      rectangle_ = kNothing;
      sides_[0].margin = kInfinity;
    }
  }

  bool IsInRectangle(double x, double y) const {
    return (rectangle_.left < x) & (x < rectangle_.right) & (rectangle_.top < y) &
           (y < rectangle_.bottom);
  }

  // To the left of every side, which the points go round in whatever order they stand.
  bool IsInOctagon(double x, double y) const {
    for (const Side& side : sides_) {
      if (!(side.dx * (y - side.start.y) - side.dy * (x - side.start.x) > side.margin))
        return false;
    }
    return true;
  }

  // Whether the margins were large enough for a lattice of all points.
  bool HoldsFor(const Box& box) const {
    return box.right - box.left <= 256 * (box_.right - box_.left) &&
           box.bottom - box.top <= 256 * (box_.bottom - box_.top);
  }

 private:
  struct Side {
    Point start;
    double dx, dy;
    double margin;
  };

  Box box_;
  Box rectangle_;
  std::array<Side, 8> sides_;
};

// The points that may be corners: their numbers in `kept`, which has room for all, and their box.
// Returns how many there are.
template <class T>
size_t KeepOutside(const Interior& interior, const T* points, size_t count, uint64_t* kept,
                   Box* box) {
  constexpr size_t kBlock = 8;
  size_t number = 0;
  *box = kNothing;
  const auto look = [&](size_t i) {
    const Point p = {static_cast<double>(points[i].x), static_cast<double>(points[i].y)};
    if (interior.IsInRectangle(p.x, p.y) || interior.IsInOctagon(p.x, p.y)) return;
    Include(p, box);
    kept[number++] = i;
  };
  const Interior local = interior;
  size_t i = 0;
  for (; i + kBlock <= count; i += kBlock) {
    int areAll = 1;
    for (size_t j = i; j < i + kBlock; ++j) {
      areAll &=
          local.IsInRectangle(static_cast<double>(points[j].x), static_cast<double>(points[j].y));
    }
    if (areAll) continue;
    for (size_t j = i; j < i + kBlock; ++j) look(j);
  }
  for (; i < count; ++i) look(i);
  return number;
}

// ---------------------------------------------------------------------------------------------
// Sorting
// ---------------------------------------------------------------------------------------------

bool IsLeftOf(const M_LongPoint& a, const M_LongPoint& b) {
  return a.x != b.x ? a.x < b.x : a.y < b.y;
}

// By x, and by y where that is the same. From some number on by the digits of x, into `scratch` and
// back; the few of the same x are put in order afterwards.
void SortByX(M_LongPoint* points, size_t count, M_LongPoint* scratch) {
  constexpr int kBits = 10;
  constexpr size_t kDigits = size_t{1} << kBits;
  // Coordinates are below 2^30: three digits.
  std::array<std::array<size_t, kDigits>, 3> starts = {};
  for (size_t i = 0; i < count; ++i) {
    const auto x = static_cast<uint32_t>(points[i].x);
    ++starts[0][x % kDigits];
    ++starts[1][x >> kBits & (kDigits - 1)];
    ++starts[2][x >> 2 * kBits];
  }
  M_LongPoint* from = points;
  M_LongPoint* to = scratch;
  for (size_t digit = 0; digit < 3; ++digit) {
    size_t sum = 0;
    for (size_t& start : starts[digit]) sum += std::exchange(start, sum);
    for (size_t i = 0; i < count; ++i) {
      const uint32_t value = static_cast<uint32_t>(from[i].x) >> digit * kBits;
      to[starts[digit][value & (kDigits - 1)]++] = from[i];
    }
    std::swap(from, to);
  }
  std::copy(from, from + count, points);
  for (size_t i = 0; i < count;) {
    size_t end = i + 1;
    while (end < count && points[end].x == points[i].x) ++end;
    if (end - i > 1) std::sort(points + i, points + end, IsLeftOf);
    i = end;
  }
}

// ---------------------------------------------------------------------------------------------
// The hull of lattice points
// ---------------------------------------------------------------------------------------------

// Twice the area of a triangle, positive when it turns counter-clockwise.
int64_t Turn(const M_LongPoint& a, const M_LongPoint& b, const M_LongPoint& c) {
  return (int64_t{b.x} - a.x) * (int64_t{c.y} - b.y) - (int64_t{b.y} - a.y) * (int64_t{c.x} - b.x);
}

// Extends a chain that began at `bottom` by a point, and takes back what no longer turns left.
M_LongPoint* Extend(M_LongPoint* bottom, M_LongPoint* top, const M_LongPoint& p) {
  while (top - bottom >= 2 && Turn(top[-2], top[-1], p) <= 0) --top;
  *top = p;
  return top + 1;
}

// The corners of sorted points without repetitions, from the leftmost counter-clockwise. `hull` has
// room for one more than there are points. Returns how many corners there are.
size_t Chain(const M_LongPoint* points, size_t count, M_LongPoint* hull) {
  M_LongPoint* top = hull;
  for (size_t i = 0; i < count; ++i) top = Extend(hull, top, points[i]);
  if (count == 1) return 1;
  M_LongPoint* const bottom = top - 1;
  for (size_t i = count - 1; i-- > 0;) top = Extend(bottom, top, points[i]);
  return static_cast<size_t>(top - hull) - 1;
}

bool IsLower(const M_LongPoint& a, const M_LongPoint& b) {
  return a.y != b.y ? a.y < b.y : a.x < b.x;
}

// Of points on one line: the lowest, the farthest from it and the next farthest, which may lie at
// the same place. Kept on purpose.
size_t HullOfLine(const M_LongPoint* points, size_t count, M_LongPoint* hull) {
  const M_LongPoint pivot = *std::min_element(points, points + count, IsLower);
  const Mp_CompareAngleAndDist isBefore(pivot);
  size_t number = 1;
  hull[0] = pivot;
  for (size_t i = 0; i < count; ++i) {
    const M_LongPoint p = points[i];
    if (p.x == pivot.x && p.y == pivot.y) continue;
    if (number == 1) {
      hull[number++] = p;
    } else if (isBefore(p, hull[1])) {
      hull[2] = std::exchange(hull[1], p);
      number = 3;
    } else if (number == 2 || isBefore(p, hull[2])) {
      hull[2] = p;
      number = 3;
    }
  }
  return number;
}

// ---------------------------------------------------------------------------------------------
// The whole
// ---------------------------------------------------------------------------------------------

// From so many points on it pays to look for what is inside, and to sort by digits.
constexpr size_t kMany = 1024;

template <class T>
Interior InteriorOfSample(const T* points, size_t count) {
  constexpr size_t kLeast = 256;
  constexpr size_t kMost = 2048;
  std::array<Point, kMost> sample;
  const size_t size = std::clamp(count / 256, kLeast, kMost);
  for (size_t i = 0; i < size; ++i) {
    const T& p = points[i * (count / size)];
    sample[i] = {static_cast<double>(p.x), static_cast<double>(p.y)};
  }
  return Interior(sample.data(), size);
}

template <class T>
std::vector<T> ComputeHull(const T* points, size_t count) {
  static_assert(sizeof(M_LongPoint) == sizeof(uint64_t));
  // First the numbers of the points that are kept, then these on the lattice, in the same place.
  const std::unique_ptr<uint64_t[]> kept(new uint64_t[count]);
  Box box = kNothing;
  size_t number = 0;
  if (count >= kMany) {
    const Interior interior = InteriorOfSample(points, count);
    number = KeepOutside(interior, points, count, kept.get(), &box);
    if (!interior.HoldsFor(box)) number = 0;
  }
  if (number == 0) {
    box = kNothing;
    for (number = 0; number < count; ++number) {
      const T& p = points[number];
      Include({static_cast<double>(p.x), static_cast<double>(p.y)}, &box);
      kept[number] = number;
    }
  }
  const Lattice lattice(box);
  const std::unique_ptr<M_LongPoint[]> work(new M_LongPoint[2 * number + 1]);
  M_LongPoint* const onLattice = work.get();
  M_LongPoint* const hull = onLattice + number;
  for (size_t i = 0; i < number; ++i) {
    const T& p = points[kept[i]];
    onLattice[i] = {lattice.x.ToLattice(static_cast<double>(p.x)),
                    lattice.y.ToLattice(static_cast<double>(p.y))};
  }

  if (number >= kMany) {
    SortByX(onLattice, number, hull);
  } else {
    std::sort(onLattice, onLattice + number, IsLeftOf);
  }
  const auto isSame = [](const M_LongPoint& a, const M_LongPoint& b) {
    return a.x == b.x && a.y == b.y;
  };
  // Repetitions count for points on a line only.
  const bool isOnePlace = isSame(onLattice[0], onLattice[number - 1]);
  size_t corners = 1;
  if (isOnePlace) {
    hull[0] = onLattice[0];
  } else {
    const auto isOnLine = [&](const M_LongPoint& p) {
      return Turn(onLattice[0], onLattice[number - 1], p) == 0;
    };
    if (std::all_of(onLattice, onLattice + number, isOnLine)) {
      M_LongPoint line[3];
      corners = HullOfLine(onLattice, number, line);
      std::copy(line, line + corners, hull);
    } else {
      const auto unique =
          static_cast<size_t>(std::unique(onLattice, onLattice + number, isSame) - onLattice);
      corners = Chain(onLattice, unique, hull);
      std::rotate(hull, std::min_element(hull, hull + corners, IsLower), hull + corners);
    }
  }

  std::vector<T> result(corners, T{});
  for (size_t i = 0; i < corners; ++i) {
    using Coord = decltype(T::x);
    result[i].x = static_cast<Coord>(lattice.x.FromLattice(hull[i].x));
    result[i].y = static_cast<Coord>(lattice.y.FromLattice(hull[i].y));
  }
  return result;
}

}  // namespace

// A template is exported where it is defined.
#pragma GCC visibility push(default)

template <class Iterator>
bool M_IsConvex(Iterator first, Iterator last) {
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

template <class Iterator>
void M_ComputeConvexHull(Iterator first, Iterator last,
                         std::vector<typename std::iterator_traits<Iterator>::value_type>& out) {
  using T = typename std::iterator_traits<Iterator>::value_type;
  const auto count = static_cast<size_t>(last - first);
  // The result may replace the points themselves.
  std::vector<T> result = count <= 3 ? std::vector<T>(first, last) : ComputeHull<T>(&*first, count);
  out.swap(result);
}

template <class T>
using VectorIterator = typename std::vector<T>::const_iterator;
using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;
using Vector4 = M_Vector4T<double>;
using PointF = qelcore::geom::PointT<float>;

template bool M_IsConvex(VectorIterator<Vector2>, VectorIterator<Vector2>);
template bool M_IsConvex(VectorIterator<Vector3>, VectorIterator<Vector3>);
template bool M_IsConvex(VectorIterator<Vector4>, VectorIterator<Vector4>);
template bool M_IsConvex(const Vector2*, const Vector2*);
template bool M_IsConvex(const Vector3*, const Vector3*);
template bool M_IsConvex(const Vector4*, const Vector4*);
template void M_ComputeConvexHull(VectorIterator<Vector2>, VectorIterator<Vector2>,
                                  std::vector<Vector2>&);
template void M_ComputeConvexHull(VectorIterator<Vector3>, VectorIterator<Vector3>,
                                  std::vector<Vector3>&);
template void M_ComputeConvexHull(VectorIterator<Vector4>, VectorIterator<Vector4>,
                                  std::vector<Vector4>&);
template void M_ComputeConvexHull(VectorIterator<PointF>, VectorIterator<PointF>,
                                  std::vector<PointF>&);
template void M_ComputeConvexHull(const Vector2*, const Vector2*, std::vector<Vector2>&);
template void M_ComputeConvexHull(const Vector3*, const Vector3*, std::vector<Vector3>&);
template void M_ComputeConvexHull(const Vector4*, const Vector4*, std::vector<Vector4>&);
template void M_ComputeConvexHull(const PointF*, const PointF*, std::vector<PointF>&);

#pragma GCC visibility pop
