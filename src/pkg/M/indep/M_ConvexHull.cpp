// Convexity, and convex hulls on an integer lattice.
//
// The hull is that of the points moved to a lattice of 2^29 steps along each axis, on which
// products of differences are exact in 64 bits. Its corners are the same whatever the method; this
// one drops what lies well inside some of the points before anything is moved, sorts the rest by x,
// and walks along those below and those above the line from the first to the last.

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
#include "Mp_Lanes.h"

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

// Two coordinates in the order of the points: by x, and by y where that is the same.
using Key = uint64_t;

M_LongPoint ToPoint(Key key) {
  return {static_cast<int32_t>(key >> 32), static_cast<int32_t>(key)};
}

struct Lattice {
  Axis x, y;

  explicit Lattice(const Box& box) : x(box.left, box.right), y(box.top, box.bottom) {}

  template <class T>
  Key ToKey(const T& p) const {
    const auto high = static_cast<Key>(x.ToLattice(static_cast<double>(p.x)));
    return high << 32 | static_cast<Key>(y.ToLattice(static_cast<double>(p.y)));
  }
};

// ---------------------------------------------------------------------------------------------
// What is well inside
// ---------------------------------------------------------------------------------------------

// The coordinates of as many points as there are lanes, in some order.
template <int kLanes>
struct Coordinates {
  using Doubles = typename Mp::Lanes<kLanes>::Doubles;
  using Bits = typename Mp::Lanes<kLanes>::Bits;
  Doubles x, y;

  template <class T>
  [[gnu::always_inline]] static Coordinates Load(const T* points) {
    if constexpr (sizeof(T) == 2 * sizeof(double)) {
      const auto a = Mp::Load<Doubles>(points);
      const auto b = Mp::Load<Doubles>(points + kLanes / 2);
      if constexpr (kLanes == 2) {
        return {__builtin_shufflevector(a, b, 0, 2), __builtin_shufflevector(a, b, 1, 3)};
      } else {
        return {__builtin_shufflevector(a, b, 0, 4, 2, 6),
                __builtin_shufflevector(a, b, 1, 5, 3, 7)};
      }
    } else {
      Coordinates all;
      for (int i = 0; i < kLanes; ++i) {
        all.x[i] = static_cast<double>(points[Place(i)].x);
        all.y[i] = static_cast<double>(points[Place(i)].y);
      }
      return all;
    }
  }

  // Which of the points is in a lane.
  static constexpr int Place(int lane) { return kLanes == 2 ? lane : lane / 2 + (lane % 2) * 2; }
};

// The least and the greatest of what has been seen; a NaN is neither.
template <int kLanes>
struct Extent {
  using Doubles = typename Mp::Lanes<kLanes>::Doubles;
  Doubles least = Doubles{} + kInfinity;
  Doubles greatest = Doubles{} - kInfinity;

  [[gnu::always_inline]] void Include(const Doubles& v) {
    least = v < least ? v : least;
    greatest = v > greatest ? v : greatest;
  }

  double Least() const {
    double all = least[0];
    for (int i = 1; i < kLanes; ++i) all = std::min(all, least[i]);
    return all;
  }

  double Greatest() const {
    double all = greatest[0];
    for (int i = 1; i < kLanes; ++i) all = std::max(all, greatest[i]);
    return all;
  }
};

// An octagon of points of a sample, the farthest in eight directions, and a rectangle with one of
// them beyond each of its corners. What lies within the margins of either is so far inside that its
// place on the lattice is, too.
class Interior {
 public:
  // Even samples only. What is not in `sample` is not looked at.
  Interior(const Point* sample, size_t count) {
    using Two = Coordinates<2>;
    using Doubles = Two::Doubles;
    Extent<2> xs, ys;
    for (size_t i = 0; i < count; i += 2) {
      const Two p = Two::Load(sample + i);
      xs.Include(p.x);
      ys.Include(p.y);
    }
    box_ = {xs.Least(), ys.Least(), xs.Greatest(), ys.Greatest()};
    const double width = box_.right - box_.left;
    const double height = box_.bottom - box_.top;
    // Where products could overflow or vanish, nothing is inside. A NaN fails, too.
    const auto isModest = [](double number) { return number > 1e-100 && number < 1e100; };
    if (!isModest(width) || !isModest(height) ||
        !isModest(1 + std::abs(box_.left) + std::abs(box_.top))) {
      return;
    }

    // Four directions; the others are opposite.
    const auto distances = [&](size_t i) {
      const Two p = Two::Load(sample + i);
      const Doubles x = p.x * height;
      const Doubles y = p.y * width;
      return std::array<Doubles, 4>{x, x + y, y, y - x};
    };
    std::array<Extent<2>, 4> extents;
    for (size_t i = 0; i < count; i += 2) {
      const auto d = distances(i);
      for (size_t k = 0; k < 4; ++k) extents[k].Include(d[k]);
    }
    std::array<double, 4> least, greatest;
    for (size_t k = 0; k < 4; ++k) {
      least[k] = extents[k].Least();
      greatest[k] = extents[k].Greatest();
    }
    std::array<Point, 8> corners = {};
    for (size_t i = 0; i < count; i += 2) {
      const auto d = distances(i);
      Two::Bits isFarthest = {};
      for (size_t k = 0; k < 4; ++k) {
        isFarthest |= static_cast<Two::Bits>(d[k] == least[k]);
        isFarthest |= static_cast<Two::Bits>(d[k] == greatest[k]);
      }
      if ((isFarthest[0] | isFarthest[1]) == 0) continue;
      for (size_t j = 0; j < 2; ++j) {
        for (size_t k = 0; k < 4; ++k) {
          if (d[k][j] == greatest[k]) corners[k] = sample[i + j];
          if (d[k][j] == least[k]) corners[k + 4] = sample[i + j];
        }
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
      const double margin = isPoint  ? -1
                            : isLong ? std::abs(dx) * marginY + std::abs(dy) * marginX
                                     : kInfinity;
      sides_[k] = {dx, dy, margin + (dx * (p.y - box_.top) - dy * (p.x - box_.left))};
    }
  }

  // Copies the numbers of the points that may be corners to `kept`, which has room for all, and
  // returns how many there are. *box becomes that of all points.
  template <int kLanes, class T>
  [[gnu::always_inline]] size_t KeepOutside(const T* points, size_t count, uint64_t* kept,
                                            Box* box) const {
    using Some = Coordinates<kLanes>;
    using Bits = typename Some::Bits;
    constexpr size_t kBlock = 2 * size_t{kLanes};
    Extent<kLanes> xs, ys;
    const std::array<Side, 8> sides = sides_;
    const Box rectangle = rectangle_;
    const Point origin = {box_.left, box_.top};
    size_t number = 0;
    size_t i = 0;
    for (; i + kBlock <= count; i += kBlock) {
      const Some halves[2] = {Some::Load(points + i), Some::Load(points + i + kLanes)};
      Bits areAll = ~Bits{};
      for (const Some& p : halves) {
        areAll &= static_cast<Bits>((rectangle.left < p.x) & (p.x < rectangle.right) &
                                    (rectangle.top < p.y) & (p.y < rectangle.bottom));
      }
      if (Mp::HoldsInAll<kLanes>(areAll)) continue;
      for (size_t half = 0; half < 2; ++half) {
        const Some& p = halves[half];
        xs.Include(p.x);
        ys.Include(p.y);
        const auto x = p.x - origin.x;
        const auto y = p.y - origin.y;
        // To the left of every side, which the points go round in whatever order they stand.
        Bits isInside = ~Bits{};
        for (const Side& side : sides) {
          isInside &= static_cast<Bits>(side.dx * y - side.dy * x > side.least);
        }
        for (int lane = 0; lane < kLanes; ++lane) {
          kept[number] = i + half * size_t{kLanes} + static_cast<size_t>(Some::Place(lane));
          number += isInside[lane] + 1;
        }
      }
    }
    *box = {xs.Least(), ys.Least(), xs.Greatest(), ys.Greatest()};
    for (; i < count; ++i) {
      const Point p = {static_cast<double>(points[i].x), static_cast<double>(points[i].y)};
      *box = {p.x < box->left ? p.x : box->left, p.y < box->top ? p.y : box->top,
              p.x > box->right ? p.x : box->right, p.y > box->bottom ? p.y : box->bottom};
      kept[number++] = i;
    }
    return number;
  }

  // Whether the margins were large enough for a lattice of all points.
  bool HoldsFor(const Box& box) const {
    return box.right - box.left <= 256 * (box_.right - box_.left) &&
           box.bottom - box.top <= 256 * (box_.bottom - box_.top);
  }

 private:
  // Inside, as seen from the origin: dx * y - dy * x > least.
  struct Side {
    double dx = 0;
    double dy = 0;
    double least = kInfinity;
  };

  Box box_;
  Box rectangle_ = kNothing;
  std::array<Side, 8> sides_;
};

template <class T>
MP_TARGET_AVX2 size_t KeepOutsideWithAvx2(const Interior& interior, const T* points, size_t count,
                                          uint64_t* kept, Box* box) {
  return interior.KeepOutside<4>(points, count, kept, box);
}

template <class T>
size_t KeepOutside(const Interior& interior, const T* points, size_t count, uint64_t* kept,
                   Box* box) {
  if (Mp::HasAvx2()) return KeepOutsideWithAvx2(interior, points, count, kept, box);
  return interior.KeepOutside<2>(points, count, kept, box);
}

template <class T>
Interior InteriorOfSample(const T* points, size_t count) {
  constexpr size_t kLeast = 512;
  constexpr size_t kMost = 2048;
  std::array<Point, kMost> sample;
  const size_t size = std::min(count, std::clamp(count / 256, kLeast, kMost)) & ~size_t{1};
  for (size_t i = 0; i < size; ++i) {
    const T& p = points[i * (count / size)];
    sample[i] = {static_cast<double>(p.x), static_cast<double>(p.y)};
  }
  return Interior(sample.data(), size);
}

// Leaves the numbers of the points that may be corners in `kept` and returns how many there are.
template <class T>
size_t KeepCandidates(const T* points, size_t count, uint64_t* kept, Box* box) {
  // Of so few, most are corners.
  constexpr size_t kFew = 32;
  if (count >= kFew) {
    const Interior interior = InteriorOfSample(points, count);
    const size_t number = KeepOutside(interior, points, count, kept, box);
    if (interior.HoldsFor(*box)) return number;
  }
  return KeepOutside(Interior(nullptr, 0), points, count, kept, box);
}

// ---------------------------------------------------------------------------------------------
// Sorting
// ---------------------------------------------------------------------------------------------

// From some number on by the digits of x, and the few of the same x afterwards. Returns where the
// keys are then, in `keys` or in `scratch`.
Key* Sort(Key* keys, size_t count, Key* scratch) {
  constexpr size_t kMany = 1024;
  if (count < kMany) {
    std::sort(keys, keys + count);
    return keys;
  }
  constexpr int kBits = 10;
  constexpr size_t kDigits = size_t{1} << kBits;
  // Coordinates are below 2^30: three digits.
  const auto digitOf = [](Key key, size_t place) {
    return key >> (32 + place * kBits) & (kDigits - 1);
  };
  std::array<std::array<size_t, kDigits>, 3> starts = {};
  for (size_t i = 0; i < count; ++i) {
    for (size_t place = 0; place < 3; ++place) ++starts[place][digitOf(keys[i], place)];
  }
  Key* from = keys;
  Key* to = scratch;
  for (size_t place = 0; place < 3; ++place) {
    size_t sum = 0;
    for (size_t& start : starts[place]) sum += std::exchange(start, sum);
    for (size_t i = 0; i < count; ++i) to[starts[place][digitOf(from[i], place)]++] = from[i];
    std::swap(from, to);
  }
  for (size_t i = 0; i < count;) {
    size_t end = i + 1;
    while (end < count && from[end] >> 32 == from[i] >> 32) ++end;
    if (end - i > 1) std::sort(from + i, from + end);
    i = end;
  }
  return from;
}

// ---------------------------------------------------------------------------------------------
// The hull of lattice points
// ---------------------------------------------------------------------------------------------

// Twice the area of a triangle, positive when it turns counter-clockwise.
int64_t Turn(Key a, Key b, Key c) {
  const M_LongPoint p = ToPoint(a), q = ToPoint(b), r = ToPoint(c);
  return (int64_t{q.x} - p.x) * (int64_t{r.y} - q.y) - (int64_t{q.y} - p.y) * (int64_t{r.x} - q.x);
}

// Leaves of a chain of points, in place, those at which it turns left. Returns how many there are.
size_t KeepLeftTurns(Key* points, size_t count) {
  size_t top = 1;
  for (size_t i = 1; i < count; ++i) {
    while (top >= 2 && Turn(points[top - 2], points[top - 1], points[i]) <= 0) --top;
    points[top++] = points[i];
  }
  return top;
}

bool IsLower(Key a, Key b) {
  const M_LongPoint p = ToPoint(a), q = ToPoint(b);
  return p.y != q.y ? p.y < q.y : p.x < q.x;
}

// Of points on one line, by the two at either end of it: the lowest, the farthest from it and the
// next farthest, which may lie at the same place. Kept on purpose.
size_t HullOfLine(const std::array<Key, 4>& ends, Key* hull) {
  const Key pivot = *std::min_element(ends.begin(), ends.end(), IsLower);
  hull[0] = pivot;
  Key* const end = std::remove_copy(ends.begin(), ends.end(), hull + 1, pivot);
  const Mp_CompareAngleAndDist isBefore(ToPoint(pivot));
  std::sort(hull + 1, end, [&](Key a, Key b) { return isBefore(ToPoint(a), ToPoint(b)); });
  return std::min<size_t>(static_cast<size_t>(end - hull), 3);
}

// The corners of four or more sorted points, or of three that are no line, from the lowest
// counter-clockwise, in place. Returns how many there are. Both arrays have room for all points.
size_t Hull(Key* sorted, size_t count, Key* scratch) {
  const Key first = sorted[0];
  const Key last = sorted[count - 1];
  if (first == last) return 1;
  const std::array<Key, 4> ends = {first, sorted[1], sorted[count - 2], last};
  // Those below the line from the first to the last stay, those above go to the end of the scratch,
  // from right to left.
  Key* below = sorted + 1;
  Key* const aboveEnd = scratch + count;
  Key* above = aboveEnd - 1;
  *above = first;  // There are points: NOLINT(clang-analyzer-cplusplus.NewDelete)
  for (size_t i = 1; i + 1 < count; ++i) {
    const Key key = sorted[i];
    const int64_t turn = Turn(first, last, key);
    *below = key;
    below += turn < 0;
    above[-1] = key;
    above -= turn > 0;
  }
  if (below == sorted + 1 && above == aboveEnd - 1) return HullOfLine(ends, sorted);
  *below++ = last;
  *--above = last;
  const size_t corners = KeepLeftTurns(sorted, static_cast<size_t>(below - sorted));
  const size_t others = KeepLeftTurns(above, static_cast<size_t>(aboveEnd - above));
  Key* const end = std::copy(above + 1, above + others - 1, sorted + corners);
  std::rotate(sorted, std::min_element(sorted, end, IsLower), end);
  return static_cast<size_t>(end - sorted);
}

// ---------------------------------------------------------------------------------------------
// The whole
// ---------------------------------------------------------------------------------------------

template <class T>
std::vector<T> ComputeHull(const T* points, size_t count) {
  // First the numbers of the points that are kept, then these on the lattice, in the same place.
  const std::unique_ptr<uint64_t[]> work(new uint64_t[count]);
  Box box;
  const size_t number = KeepCandidates(points, count, work.get(), &box);
  const Lattice lattice(box);
  for (size_t i = 0; i < number; ++i) work[i] = lattice.ToKey(points[work[i]]);
  const std::unique_ptr<Key[]> scratch(new Key[number]);
  Key* const sorted = Sort(work.get(), number, scratch.get());
  const size_t corners = Hull(sorted, number, sorted == work.get() ? scratch.get() : work.get());

  std::vector<T> result(corners, T{});
  for (size_t i = 0; i < corners; ++i) {
    using Coord = decltype(T::x);
    const M_LongPoint p = ToPoint(sorted[i]);
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
