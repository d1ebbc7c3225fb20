/// \file
/// What is so far inside other points that it is no corner of a hull.
#ifndef MP_HULLINTERIOR_H
#define MP_HULLINTERIOR_H

#include <algorithm>
#include <array>
#include <cmath>

#include "Mp_HullLattice.h"
#include "Mp_Lanes.h"

namespace Mp {

/// The coordinates of as many points as there are lanes, in some order.
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

/// The least and the greatest of what has been seen; a NaN is neither.
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

/// An octagon of points of a sample, the farthest in eight directions, and a rectangle with one of
/// them beyond each of its corners. What lies within the margins of either is so far inside that
/// its place on the lattice is, too.
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

/// Leaves the numbers of the points that may be corners in `kept` and returns how many there are.
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

}  // namespace Mp

#endif  // MP_HULLINTERIOR_H
