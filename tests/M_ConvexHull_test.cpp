#include <random>

#include "Law.h"
#include "Mp_Hull.h"

namespace {

using PointF = qelcore::geom::PointT<float>;

// Points of another type; what there is beside x and y is set to `rest`.
template <class To, class From>
std::vector<To> As(const std::vector<From>& points, double rest = 0) {
  std::vector<To> result(points.size(), To());
  for (size_t i = 0; i < points.size(); ++i) {
    result[i].x = static_cast<decltype(To::x)>(points[i].x);
    result[i].y = static_cast<decltype(To::y)>(points[i].y);
    if constexpr (requires(To p) { p.z; }) result[i].z = rest;
  }
  return result;
}

int64_t Turn(const M_LongPoint& a, const M_LongPoint& b, const M_LongPoint& c) {
  return (int64_t{b.x} - a.x) * (int64_t{c.y} - b.y) - (int64_t{b.y} - a.y) * (int64_t{c.x} - b.x);
}

// On the lattice of 2^29 steps: pivot, angles, scan; no short cuts.
std::vector<V2> PlainHull(const std::vector<V2>& points) {
  const auto axis = [&](double V2::*coordinate) {
    double least = kInf, greatest = -kInf;
    for (const V2& p : points) {
      least = std::min(least, p.*coordinate);
      greatest = std::max(greatest, p.*coordinate);
    }
    const double step = (greatest - least) * 0x1p-29;
    return std::pair(least, step > 0 ? step : 1);
  };
  const auto [left, stepX] = axis(&V2::x);
  const auto [low, stepY] = axis(&V2::y);
  const auto round = [](double d) { return static_cast<int32_t>(d >= 0 ? d + 0.5 : 0); };
  std::vector<M_LongPoint> sorted, hull;
  for (const V2& p : points)
    sorted.push_back({round((p.x - left) / stepX), round((p.y - low) / stepY)});
  const auto isLower = [](auto& a, auto& b) { return a.y != b.y ? a.y < b.y : a.x < b.x; };
  const M_LongPoint pivot = *std::min_element(sorted.begin(), sorted.end(), isLower);
  std::erase_if(sorted, [&](auto& p) { return p.x == pivot.x && p.y == pivot.y; });
  std::sort(sorted.begin(), sorted.end(), Mp_CompareAngleAndDist(pivot));
  // Of points at one angle the farthest; of those on one line the two farthest.
  const bool isLine = !sorted.empty() && Turn(pivot, sorted.front(), sorted.back()) == 0;
  hull = {pivot};
  for (const M_LongPoint& p : sorted) {
    if (isLine ? hull.size() > 2 : hull.size() > 1 && Turn(pivot, hull.back(), p) == 0) continue;
    while (hull.size() > 2 && Turn(hull[hull.size() - 2], hull.back(), p) <= 0) hull.pop_back();
    hull.push_back(p);
  }
  std::vector<V2> result;
  for (const M_LongPoint& p : hull) result.push_back({p.x * stepX + left, p.y * stepY + low});
  return result;
}

// By iterators, by pointers and in place; floats are widened, and their corners rounded.
template <class Point>
void TestHull(const std::vector<V2>& points) {
  std::vector<Point> own = As<Point>(points, 5), hull(1), byPointers, expected = own;
  if (points.size() > 3) expected = As<Point>(PlainHull(As<V2>(own)));
  M_ComputeConvexHull(own.cbegin(), own.cend(), hull);
  M_ComputeConvexHull(own.data(), own.data() + own.size(), byPointers);
  M_ComputeConvexHull(own.cbegin(), own.cend(), own);
  for (const auto& each : {hull, byPointers, own}) {
    Equal(each.size(), expected.size());
    for (size_t i = 0; i < each.size(); ++i) {
      const Point &p = each[i], &q = expected[i];
      Equal(BitsOf(V2{p.x, p.y}), BitsOf(V2{q.x, q.y}));
      if constexpr (requires { p.z; }) Equal(p.z, q.z);
    }
  }
}

// Sets of several shapes, some with points far away, or nowhere.
std::vector<V2> DrawSet() {
  std::vector<V2> points(
      *rc::gen::weightedOneOf<size_t>({{70, rc::gen::inRange<size_t>(0, 20)},
                                       {27, rc::gen::inRange<size_t>(32, 300)},
                                       {3, rc::gen::inRange<size_t>(1000, 5000)}}));
  // Drawing each number apart would take too long.
  std::minstd_rand random(*operands::Bits());
  const auto next = [&] { return std::uniform_real_distribution(-1.0, 1.0)(random); };
  const int shape = points.size() < 32 ? 0 : *rc::gen::inRange(0, 7),
            grid = *rc::gen::inRange(0, 5);
  const double flat = *rc::gen::element(1.0, 1e-4), tilt = *rc::gen::element(0.0, 1e-8, 1e-7),
               slope = shape < 4 ? *rc::gen::element(0.0, 1.5) : 0;
  const V2 middle = {*rc::gen::element(0.0, 4.0, 1e6), next() * 4};
  for (size_t i = 0; i < points.size(); ++i) {
    const double u = std::clamp(next() * 1.2, -1.0, 1.0), v = next(), root = std::sqrt(std::abs(u));
    const size_t side = random() % 4;
    // Beside a line by no more than a few steps of the lattice.
    const double far = (side < 2 ? 1 : -1) * (1 - 2e-9 * std::abs(v)) + tilt * u;
    const V2 circle = {3 * std::cos(v * 4), std::sin(v * 4)},
             shapes[] = {{std::round(u * grid), std::round(v * grid)},
                         circle,
                         {circle.x * root, circle.y * root},
                         {u + v, next()},
                         side % 2 == 0 ? V2{u, far} : V2{far, u},
                         flat == 1 ? V2{0.25, u} : V2{u, 0.25},
                         i < 100 ? V2{u, v} : V2{0, 0}};
    const V2& p = shapes[shape];
    points[i] = {p.x + middle.x, p.y * flat + p.x * slope + middle.y};
  }
  // Neighbours together, so that whole blocks lie inside.
  if (*rc::gen::arbitrary<bool>())
    std::sort(points.begin(), points.end(), [](const V2& p, const V2& q) { return p.y < q.y; });
  const auto far = *rc::gen::inRange(0, 4) > 0
                       ? rc::gen::element(0.0, 0.0, 2e9, -1e9)
                       : rc::gen::element(0.0, kNan, kInf, -kInf, 1e308, -1e308);
  for (int i = *rc::gen::element(0, 0, 1, 1, 3); i > 0 && !points.empty(); --i)
    points[*rc::gen::inRange<size_t>(0, points.size())] = {*far, *far};
  // Where products overflow, vanish, or steps are the smallest numbers.
  const double scale = *rc::gen::element(1.0, 1.0, 1.0, 1e154, 1e-160, 1e-308);
  for (V2& p : points) p = {p.x * scale, p.y * scale};
  return points;
}

TEST(ConvexHull, IsThatOfThePlainScan) {
  Holds([] {
    const std::vector<V2> points = DrawSet();
    TestHull<V2>(points);
    TestHull<V3>(points);
    TestHull<V4>(points);
    TestHull<PointF>(points);
  });
  // So many that they are sorted in shares.
  std::vector<V2> circle(150000);
  for (size_t i = 0; V2 & p : circle) p = {std::cos(++i), std::sin(i)};
  TestHull<V2>(circle);
}

TEST(ConvexHull, FailedAllocationsChangeNothing) {
  for (const size_t count : {3u, 50u, 3000u}) {
    std::vector<V2> points(count), out;
    for (size_t i = 0; V2 & p : points) p = {std::cos(++i), std::sin(i)};
    const int news = memory.news;
    M_ComputeConvexHull(points.cbegin(), points.cend(), out);
    out.assign(1, {9, 9});
    const int blocks = memory.blocks;
    for (int allocations = memory.news - news; allocations > 0; --allocations) {
      memory.newToFail = allocations;
      EXPECT_THROW(M_ComputeConvexHull(points.cbegin(), points.cend(), out), std::bad_alloc);
      EXPECT_TRUE(memory.blocks == blocks && out.size() == 1 && out[0].x == 9);
    }
  }
}

TEST(ConvexHull, ConvexPolygonsTurnOneWay) {
  Holds([](const std::vector<std::pair<Digit, Digit>>& corners) {
    std::vector<V2> points;
    for (const auto& [x, y] : corners) points.push_back({x % 4 * 1.0, y % 4 * 1.0});
    bool hasLeft = false, hasRight = false;
    for (size_t i = 0; i < points.size(); ++i) {
      const V2 &a = points[i], &b = points[(i + 1) % points.size()],
               &c = points[(i + 2) % points.size()];
      const double cross = (b.x - a.x) * (c.y - b.y) - (b.y - a.y) * (c.x - b.x);
      hasLeft |= cross > 0;
      hasRight |= cross < 0;
    }
    const auto test = [&](const auto& own) {
      Equal(M_IsConvex(own.cbegin(), own.cend()), !(hasLeft && hasRight));
      Equal(M_IsConvex(own.data(), own.data() + own.size()), !(hasLeft && hasRight));
    };
    test(points);
    test(As<V3>(points, kNan));
    test(As<V4>(points, kNan));
  });
  // Turns within the rounding of products do not count; a star turns the same way everywhere.
  const auto isConvex = [](const std::vector<V2>& p) { return M_IsConvex(p.cbegin(), p.cend()); };
  const auto dented = [&](double y) { return isConvex({{0, 0}, {1, 1 - y}, {2, 2}, {0, 3}}); };
  EXPECT_TRUE(dented(0) && dented(-0x1p-51) && dented(0.25) && !dented(-0.25) &&
              !dented(-0x1.8p-51));
  EXPECT_TRUE(isConvex({{0, 3}, {2, -3}, {-3, 1}, {3, 1}, {-2, -3}}));
  EXPECT_TRUE(isConvex({{0, 0}, {1, kNan}, {2, 0}, {1, 1}}));
}

}  // namespace
