#include <functional>
#include <numbers>

#include "Law.h"
#include "Mp_Hull.h"

namespace {

using PointF = qelcore::geom::PointT<float>;

int64_t Turn(const M_LongPoint& a, const M_LongPoint& b, const M_LongPoint& c) {
  return (int64_t{b.x} - a.x) * (int64_t{c.y} - b.y) - (int64_t{b.y} - a.y) * (int64_t{c.x} - b.x);
}

// Pivot, angles, scan: no short cuts.
std::vector<V2> PlainHull(const std::vector<V2>& points) {
  const auto [left, right] =
      std::minmax_element(points.begin(), points.end(), [](auto& a, auto& b) { return a.x < b.x; });
  const auto [low, high] =
      std::minmax_element(points.begin(), points.end(), [](auto& a, auto& b) { return a.y < b.y; });
  const double sx = right->x > left->x ? (right->x - left->x) * 0x1p-29 : 1;
  const double sy = high->y > low->y ? (high->y - low->y) * 0x1p-29 : 1;
  std::vector<M_LongPoint> sorted;
  for (const V2& p : points) {
    sorted.push_back({static_cast<int32_t>((p.x - left->x) / sx + 0.5),
                      static_cast<int32_t>((p.y - low->y) / sy + 0.5)});
  }
  const M_LongPoint pivot = *std::min_element(sorted.begin(), sorted.end(), [](auto& a, auto& b) {
    return a.y != b.y ? a.y < b.y : a.x < b.x;
  });
  std::erase_if(sorted, [&](auto& p) { return p.x == pivot.x && p.y == pivot.y; });
  std::sort(sorted.begin(), sorted.end(), [&](auto& a, auto& b) {
    const int64_t turn = Turn(pivot, a, b), ax = a.x - int64_t{pivot.x},
                  ay = a.y - int64_t{pivot.y}, bx = b.x - int64_t{pivot.x},
                  by = b.y - int64_t{pivot.y};
    const bool isBefore = turn != 0 ? turn > 0 : ax * ax + ay * ay > bx * bx + by * by;
    Equal(Mp_CompareAngleAndDist(pivot)(a, b), isBefore);
    return isBefore;
  });
  std::vector<M_LongPoint> reduced, hull = {pivot};
  for (const M_LongPoint& p : sorted) {
    if (reduced.empty() || Turn(pivot, reduced.back(), p) != 0) reduced.push_back(p);
  }
  if (reduced.size() == 1 && sorted.size() > 1) reduced.push_back(sorted[1]);
  for (const M_LongPoint& p : reduced) {
    while (hull.size() > 2 && Turn(hull[hull.size() - 2], hull.back(), p) <= 0) hull.pop_back();
    hull.push_back(p);
  }
  std::vector<V2> result;
  for (const M_LongPoint& p : hull) result.push_back({p.x * sx + left->x, p.y * sy + low->y});
  return result;
}

template <class Point>
std::vector<V2> HullOf(const std::vector<V2>& points) {
  std::vector<Point> own, hull(1);
  for (const V2& p : points) {
    own.push_back({});
    own.back().x = static_cast<decltype(Point::x)>(p.x),
    own.back().y = static_cast<decltype(Point::y)>(p.y);
    if constexpr (requires(Point q) { q.z; }) own.back().z = 5;
  }
  M_ComputeConvexHull(own.cbegin(), own.cend(), hull);
  std::vector<Point> byPointers;
  M_ComputeConvexHull(own.data(), own.data() + own.size(), byPointers);
  M_ComputeConvexHull(own.cbegin(), own.cend(), own);
  std::vector<V2> result;
  Check(byPointers.size() == hull.size() && own.size() == hull.size());
  for (size_t i = 0; i < hull.size(); ++i) {
    Check(BitsOf(byPointers[i]) == BitsOf(hull[i]) && BitsOf(own[i]) == BitsOf(hull[i]));
    if constexpr (requires(Point q) { q.z; }) Equal(hull[i].z, (points.size() > 3 ? 0 : 5));
    result.push_back({hull[i].x, hull[i].y});
  }
  return result;
}

// Small sets on few places, and large ones of several shapes, some with a point far away.
std::vector<V2> DrawSet() {
  const auto real = [](double limit) { return (*operands::Bits() * 0x1p-31 - 1) * limit; };
  std::vector<V2> points;
  if (*rc::gen::inRange(0, 10) > 0) {
    const int grid = *rc::gen::inRange(0, 5);
    for (int i = *rc::gen::inRange(1, 20); i > 0; --i)
      points.push_back(
          {*rc::gen::inRange(-grid, grid + 1) * 1.0, *rc::gen::inRange(-grid, grid + 1) * 1.0});
  } else {
    // Drawing each number apart would take too long.
    uint64_t state = *operands::Bits() | 1;
    const auto next = [&] {
      state ^= state << 13, state ^= state >> 7, state ^= state << 17;
      return static_cast<double>(state >> 11) * 0x1p-52 - 1;
    };
    const int shape = *rc::gen::inRange(0, 7);
    const int count = *rc::gen::weightedOneOf<int>(
        {{8, rc::gen::inRange(32, 300)}, {1, rc::gen::inRange(1000, 5000)}});
    const double flat = *rc::gen::element(1.0, 1e-4), tilt = *rc::gen::element(0.0, 1e-8, 1e-7),
                 slope = shape < 4 ? *rc::gen::element(0.0, 1.5) : 0;
    for (int i = 0; i < count; ++i) {
      const double u = std::clamp(next() * 1.2, -1.0, 1.0), v = next(),
                   angle = v * std::numbers::pi;
      const int side = static_cast<int>((next() + 1) * 2);
      V2 p = {3 * std::cos(angle), std::sin(angle)};  // 0: a circle
      if (shape == 1) p = {p.x * std::sqrt(std::abs(u)), p.y * std::sqrt(std::abs(u))};
      if (shape == 2) p = {u + v, next()};
      if (shape == 3)
        p = side == 0   ? V2{u, -0.55 - 0.25 * u}
            : side == 1 ? V2{0.65 - 0.35 * u, 0.1 + 0.9 * u}
                        : V2{-0.35 + 0.65 * u, 0.35 + 0.65 * u};
      const double far = (side < 2 ? 1 : -1) * (1 - 2e-9 * std::abs(v)) + tilt * u;
      if (shape == 4) p = side % 2 ? V2{far, u} : V2{u, far};
      if (shape == 5) p = flat == 1 ? V2{0.25, u} : V2{u, 0.25};
      if (shape == 6) p = i < 100 ? V2{u, v} : V2{0, 0};
      points.push_back({p.x, p.y * flat + p.x * slope});
    }
    const V2 middle = {*rc::gen::element(0.0, 4.0, 1e6), real(4)};
    for (V2& p : points) p = {p.x + middle.x, p.y + middle.y};
    if (*rc::gen::arbitrary<bool>())
      points.back() = {*rc::gen::element(0.0, 2e9, -1e9), *rc::gen::element(0.0, 1e9, -2e9)};
  }
  // Where products overflow, vanish, or steps are the smallest numbers.
  const double scale = *rc::gen::element(1.0, 1.0, 1.0, 1e154, 1e-160, 1e-308);
  for (V2& p : points) p = {p.x * scale, p.y * scale};
  return points;
}

TEST(ConvexHull, IsThatOfThePlainScan) {
  Holds(
      [] {
        const std::vector<V2> points = DrawSet(),
                              plain = points.size() <= 3 ? points : PlainHull(points);
        for (const auto& hull : {HullOf<V2>(points), HullOf<V3>(points), HullOf<V4>(points)}) {
          Equal(hull.size(), plain.size());
          for (size_t i = 0; i < hull.size(); ++i)
            Check(hull[i].x == plain[i].x && hull[i].y == plain[i].y);
        }
        // Floats are widened, and their corners rounded.
        std::vector<V2> narrow = points;
        for (V2& p : narrow) p = {static_cast<float>(p.x), static_cast<float>(p.y)};
        if (std::any_of(narrow.begin(), narrow.end(),
                        [](auto& p) { return !std::isfinite(p.x) || !std::isfinite(p.y); }))
          return;
        const std::vector<V2> floats = HullOf<PointF>(narrow),
                              plainFloats = narrow.size() <= 3 ? narrow : PlainHull(narrow);
        Equal(floats.size(), plainFloats.size());
        for (size_t i = 0; i < floats.size(); ++i) {
          Equal(floats[i].x, static_cast<float>(plainFloats[i].x));
          Equal(floats[i].y, static_cast<float>(plainFloats[i].y));
        }
      },
      0.5);
  EXPECT_TRUE(HullOf<V2>({}).empty());
}

TEST(ConvexHull, OfWhatIsNoNumberEnds) {
  const auto odd = rc::gen::element(kNan, kInf, -kInf, 1e308, -1e308, 5e-324, 0.0);
  Holds(
      [&](Real a, Real b) {
        std::vector<V2> points(*rc::gen::element<size_t>(4, 8, 8, 40), V2{a, b});
        for (V2& p : points)
          p = {*rc::gen::oneOf(odd, operands::Reals()), *rc::gen::oneOf(odd, operands::Reals())};
        const size_t corners = HullOf<V2>(points).size();
        Check(corners > 0 && corners <= points.size());
      },
      0.2);
}

TEST(ConvexHull, FailedAllocationsChangeNothing) {
  std::vector<V2> many(3000), out;
  for (double angle = 0; V2 & p : many) p = {std::cos(++angle), std::sin(angle)};
  for (const int count : {3, 50, 3000}) {
    bool fails = true;
    for (int allocation = 1; fails; ++allocation) {
      out.assign(1, {9, 9});
      const int blocks = memory.blocks;
      memory.newToFail = allocation;
      try {
        M_ComputeConvexHull(many.cbegin(), many.cbegin() + count, out);
        fails = false;
        EXPECT_GT(allocation, 1);
      } catch (const std::bad_alloc&) {
        EXPECT_TRUE(memory.blocks == blocks && out.size() == 1 && out[0].x == 9);
      }
      memory.newToFail = 0;
    }
  }
}

TEST(ConvexHull, TurnsOfAPolygon) {
  Holds([](std::vector<Digit> numbers) {
    std::vector<V2> points;
    for (size_t i = 0; i + 1 < numbers.size(); i += 2)
      points.push_back({numbers[i] % 4 * 1.0, numbers[i + 1] % 4 * 1.0});
    bool hasLeft = false, hasRight = false;
    for (size_t i = 0; i < points.size(); ++i) {
      const V2 &a = points[i], &b = points[(i + 1) % points.size()],
               &c = points[(i + 2) % points.size()];
      const double cross = (b.x - a.x) * (c.y - b.y) - (b.y - a.y) * (c.x - b.x);
      hasLeft |= cross > 0, hasRight |= cross < 0;
    }
    const bool isConvex = points.size() < 3 || !(hasLeft && hasRight);
    std::vector<V3> threes;
    std::vector<V4> fours;
    for (const V2& p : points)
      threes.push_back({p.x, p.y, kNan}), fours.push_back({p.x, p.y, kNan, kNan});
    Equal(M_IsConvex(points.cbegin(), points.cend()), isConvex);
    Equal(M_IsConvex(points.data(), points.data() + points.size()), isConvex);
    Equal(M_IsConvex(threes.cbegin(), threes.cend()), isConvex);
    Equal(M_IsConvex(fours.data(), fours.data() + fours.size()), isConvex);
  });
  // Turns within the rounding of products do not count; a star turns the same way everywhere.
  const auto dented = [](double y) {
    const V2 points[] = {{0, 0}, {1, 1 - y}, {2, 2}, {0, 3}};
    return M_IsConvex(points, points + 4);
  };
  EXPECT_TRUE(dented(0) && dented(-0x1p-52) && dented(0.25) && !dented(-0.25) && !dented(-0x1p-50));
  const V2 star[] = {{0, 3}, {2, -3}, {-3, 1}, {3, 1}, {-2, -3}},
           nan[] = {{0, 0}, {1, kNan}, {2, 0}, {1, 1}};
  EXPECT_TRUE(M_IsConvex(star, star + 5) && M_IsConvex(nan, nan + 4));
}

}  // namespace
