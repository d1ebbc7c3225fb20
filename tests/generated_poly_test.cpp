// Hulls against the plain scan, hit tests against the winding of the outline, clipped areas, and
// what is allocated.

#include <cmath>
#include <functional>
#include <numbers>

#include "Generator.h"
#include "M_Matrix.h"
#include "Mp_Hull.h"
#include "TestHost.h"

namespace {

using V2 = M_Vector2T<double>;
using V4 = M_Vector4T<double>;

class Polygons : public HostTest {
 protected:
  double Uniform(double limit) { return generator_.Small(1 << 30) * limit / (1 << 30); }

  // Points at ascending angles about (0, 0).
  std::vector<V2> Star(int count) {
    std::vector<V2> star;
    for (int i = 0; i < count; ++i) {
      const double angle = (i + 0.4 + Uniform(0.3)) * 2 * std::numbers::pi / count,
                   r = 2 + Uniform(1);
      star.push_back({r * std::cos(angle), r * std::sin(angle)});
    }
    return star;
  }

  Generator generator_{13};
};

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
  std::sort(sorted.begin(), sorted.end(), Mp_CompareAngleAndDist(pivot));
  const auto turn = [](auto& a, auto& b, auto& c) {
    return (int64_t{b.x} - a.x) * (int64_t{c.y} - b.y) -
           (int64_t{b.y} - a.y) * (int64_t{c.x} - b.x);
  };
  std::vector<M_LongPoint> reduced, hull = {pivot};
  for (const M_LongPoint& p : sorted) {
    if (reduced.empty() || turn(pivot, reduced.back(), p) != 0) reduced.push_back(p);
  }
  if (reduced.size() == 1 && sorted.size() > 1) reduced.push_back(sorted[1]);
  for (const M_LongPoint& p : reduced) {
    while (hull.size() > 2 && turn(hull[hull.size() - 2], hull.back(), p) <= 0) hull.pop_back();
    hull.push_back(p);
  }
  std::vector<V2> result;
  for (const M_LongPoint& p : hull) result.push_back({p.x * sx + left->x, p.y * sy + low->y});
  return result;
}

TEST_F(Polygons, HullsAreThoseOfThePlainScan) {
  for (int round = 0; round < 3000; ++round) {
    // Small sets on few places, and others of several shapes, some with a point far away.
    const bool isSmall = round % 3 != 0;
    const int32_t shape = round / 3 % 7, grid = 1 + round % 5;
    std::vector<V2> points(static_cast<size_t>(isSmall           ? 4 + generator_.Below(20)
                                               : round % 60 == 0 ? 1000 + generator_.Below(5000)
                                                                 : 32 + generator_.Below(300)));
    const V2 middle = {Uniform(generator_.OneOf({0.0, 4.0, 1e6})),
                       Uniform(generator_.OneOf({1e-4, 4.0}))};
    const double slope = shape < 4 && generator_.Below(2) ? Uniform(2) : 0,
                 flat = generator_.OneOf({1.0, 1e-4}), tilt = generator_.OneOf({0.0, 1e-8, 1e-7});
    const bool isUpright = generator_.Below(2);
    uint32_t side = 0;
    for (V2& p : points) {
      // At times exactly at an end.
      const double u = std::clamp(Uniform(1.2), -1.0, 1.0), v = Uniform(1),
                   angle = v * std::numbers::pi, r = shape == 1 ? 1 : std::sqrt(std::abs(u));
      if (generator_.Below(20) == 0) side = generator_.Below(4);
      if (isSmall) {
        p = {static_cast<double>(generator_.Small(grid)),
             static_cast<double>(generator_.Small(grid))};
        continue;
      }
      if (shape < 2) {
        p = {r * std::cos(angle) * 3, r * std::sin(angle)};
      } else if (shape == 2) {
        p = {u + v, Uniform(1)};
      } else if (shape == 3) {  // The outline of a triangle, and of a rectangle.
        p = side == 0   ? V2{u, -0.55 - 0.25 * u}
            : side == 1 ? V2{0.65 - 0.35 * u, 0.1 + 0.9 * u}
                        : V2{-0.35 + 0.65 * u, 0.35 + 0.65 * u};
      } else if (shape == 4) {
        const double far = (side < 2 ? 1 : -1) * (1 - 2e-9 * std::abs(v)) + tilt * u;
        p = side % 2 == 0 ? V2{u, far} : V2{far, u};
      } else {
        p = isUpright ? V2{0.25, shape == 5 ? u : 0.5} : V2{u, shape == 5 ? 0.25 : v};
      }
      p = {p.x + middle.x, p.y * flat + p.x * slope + middle.y};
    }
    if (!isSmall && shape == 6 && !isUpright) points.resize(2048, {0, 0});
    if (!isSmall && generator_.Below(2)) {
      points.back() = {generator_.OneOf({0.0, 2e9, -1e9}), generator_.OneOf({0.0, 1e9, -2e9})};
    }
    // Where products overflow, vanish, or steps are the smallest numbers.
    const double scale = generator_.OneOf({1.0, 1.0, 1.0, 1e154, 1e-160, 1e-308});
    for (V2& p : points) p = {p.x * scale, p.y * scale};
    std::vector<V2> hull;
    M_ComputeConvexHull(points.cbegin(), points.cend(), hull);
    std::vector<V4> fours;
    for (const V2& p : points) fours.push_back({p.x, p.y, 1, 1});
    M_ComputeConvexHull(fours.cbegin(), fours.cend(), fours);
    const std::vector<V2> plain = PlainHull(points);
    ASSERT_EQ(hull.size(), plain.size()) << round;
    ASSERT_EQ(fours.size(), plain.size()) << round;
    for (size_t i = 0; i < hull.size(); ++i) {
      ASSERT_TRUE(hull[i].x == plain[i].x && hull[i].y == plain[i].y) << round << ' ' << i;
      ASSERT_TRUE(fours[i].x == plain[i].x && fours[i].y == plain[i].y) << round << ' ' << i;
    }
  }
}

TEST_F(Polygons, HullsOfWhatIsNoNumberEnd) {
  const double kOdd[] = {NAN, INFINITY, -INFINITY, 1e308, -1e308, 5e-324, 0};
  for (int round = 0; round < 300; ++round) {
    std::vector<V2> points(round < 250 ? 8 : 2000), hull;
    for (V2& p : points) {
      p = {generator_.Below(3) ? Uniform(1) : generator_.OneOf(kOdd),
           generator_.Below(3) ? Uniform(1) : generator_.OneOf(kOdd)};
    }
    M_ComputeConvexHull(points.cbegin(), points.cend(), hull);
    ASSERT_TRUE(!hull.empty() && hull.size() <= points.size());
  }
}

TEST_F(Polygons, PointsAreInsideWhereTheOutlineGoesRound) {
  for (int round = 0; round < 3000; ++round) {
    const std::vector<V2> star = Star(3 + round % 150);
    const auto count = static_cast<int32_t>(star.size());
    const V2 p = {Uniform(3.5), Uniform(3.5)};
    double turns = 0, nearest = 99;
    for (size_t i = 0; i < star.size(); ++i) {
      const V2 &a = star[i], &b = star[(i + 1) % star.size()];
      turns += std::remainder(std::atan2(b.y - p.y, b.x - p.x) - std::atan2(a.y - p.y, a.x - p.x),
                              2 * std::numbers::pi);
      double distance;
      unsigned char onSegment;
      M_PerpDistTo2DLine(&p, &a, &b, &onSegment, &distance);
      const double ends =
          std::min(std::hypot(a.x - p.x, a.y - p.y), std::hypot(b.x - p.x, b.y - p.y));
      nearest = std::min({nearest, ends, onSegment ? distance : 99});
    }
    const bool isInside = std::abs(turns) > 1;
    for (const double tolerance : {0.0, 0.25}) {
      unsigned char inside = 9;
      host.news = 0;
      ASSERT_EQ(M_IsFloatPointInConcavePoly(&p, star.data(), count, tolerance, &inside), 0);
      ASSERT_EQ(host.news, count > 64 ? 1 : 0);
      if (std::abs(nearest - tolerance) > 1e-6) {
        ASSERT_EQ(inside, isInside || nearest < tolerance);
      }
    }
  }
}

TEST_F(Polygons, NoMemoryIsTheHostsToReport) {
  const std::vector<V2> star = Star(65);
  const V2 p = {0, 0};
  unsigned char inside = 9;
  ASSERT_EQ(M_IsFloatPointInConcavePoly(&p, star.data(), 64, 9.0, &inside), 0);
  ASSERT_EQ(inside, 1);
  host.newToFail = 1;
  EXPECT_EQ(M_IsFloatPointInConcavePoly(&p, star.data(), 65, 9.0, &inside), 79);
  EXPECT_EQ(inside, 0);
  EXPECT_EQ(host.Take(), Calls{"exception std::bad_alloc"});

  // The outline is the host's memory: one block for eight points.
  {
    M_TransformPoly3D poly;
    for (auto& corner : poly.points) corner = {Uniform(1), Uniform(1), 1};
    EXPECT_EQ(host.trackedBlocks, 0);
    for (int i = 0; i < 3; ++i) {
      poly.InitPolyPoints();
      EXPECT_EQ(host.trackedBlocks, 1);
      EXPECT_EQ(host.trackedBytes, 128u);
      poly.InvalidatePolyPoints();
    }
  }
  EXPECT_EQ(host.trackedBlocks, 0);
}

// Whichever allocation fails, what there was is still there, and nothing is lost.
TEST_F(Polygons, FailedAllocationsChangeNothing) {
  const std::vector<V2> few = Star(50), many = Star(5000);
  const std::vector<V4> none, clipper = {{-2, -2, 0, 0}, {2, -2, 0, 0}, {0, 2, 0, 0}};
  std::vector<V4> subject;
  for (const V2& p : few) subject.push_back({p.x, p.y, 0, 0});
  std::vector<V2> hull;
  std::vector<V4> clipped;
  const std::function<void()> works[] = {
      [&] { M_ComputeConvexHull(few.cbegin(), few.cbegin() + 3, hull); },
      [&] { M_ComputeConvexHull(few.cbegin(), few.cend(), hull); },
      [&] { M_ComputeConvexHull(many.data(), many.data() + many.size(), hull); },
      [&] { M_PolyPolyClip2D(&clipper, &subject, &clipped); },
      [&] { M_PolyPolyClip2D(&none, &subject, &clipped); },
  };
  for (const auto& work : works) {
    bool fails = true;
    int allocation = 0;
    while (fails) {
      ASSERT_LT(++allocation, 60);
      hull.assign(1, {9, 9});
      clipped.assign(1, {9, 9, 9, 9});
      const int blocks = host.blocks;
      host.newToFail = allocation;
      try {
        work();
        fails = false;
      } catch (const std::bad_alloc&) {
        EXPECT_EQ(host.blocks, blocks);
        EXPECT_TRUE(hull.size() == 1 && hull[0].x == 9 && clipped.size() == 1);
      }
    }
    EXPECT_GT(allocation, 1);
    host.newToFail = 0;
  }
}

double Area(const std::vector<V4>& polygon) {
  std::vector<V2> flat;
  for (const V4& p : polygon) flat.push_back({p.x, p.y});
  return std::abs(M_SignedPolygonArea2D(flat.data(), static_cast<int32_t>(flat.size())));
}

TEST_F(Polygons, ClippedPartsAddUp) {
  for (int round = 0; round < 2000; ++round) {
    std::vector<V4> subject, result;
    for (const V2& p : Star(3 + round % 9)) subject.push_back({p.x, p.y, p.x, p.y});
    // Two halves of a large square, cut anywhere.
    const double a = Uniform(3), b = Uniform(3);
    double sum = 0;
    for (const double side : {-50.0, 50.0}) {
      const std::vector<V4> half = {
          {a, -50, 0, 0}, {b, 50, 0, 0}, {side, 50, 0, 0}, {side, -50, 0, 0}};
      M_PolyPolyClip2D(&half, &subject, &result);
      sum += Area(result);
      for (const V4& p : result) {
        // What was carried along lies where the point does.
        ASSERT_NEAR(p.z, p.x, 1e-9);
        ASSERT_NEAR(p.w, p.y, 1e-9);
        const double edge = a + (b - a) * (p.y + 50) / 100;
        ASSERT_TRUE(side < 0 ? p.x <= edge + 1e-6 : p.x >= edge - 1e-6);
      }
    }
    ASSERT_NEAR(sum, Area(subject), 1e-6);
  }
}

// Also where both neighbours are on one side of the line, one of them too close to it to be inside.
TEST_F(Polygons, NewPointsCarryWhatLiesBetween) {
  std::vector<V4> result;
  const std::vector<V4> clipper = {{0, 0, 0, 0}, {1, 0, 0, 0}, {1, 1, 0, 0}, {0, 1, 0, 0}};
  for (int round = 0; round < 300; ++round) {
    std::vector<V4> subject;
    for (int i = 0; i < 5; ++i) {
      const double inwards = 1e-6 * (1 + Uniform(1e-3));
      subject.push_back({0.5 + Uniform(1), 0.5 + Uniform(1), Uniform(1), 0.5});
      (round % 2 ? subject.back().x : subject.back().y) = round % 4 < 2 ? inwards : 1 - inwards;
    }
    M_PolyPolyClip2D(&clipper, &subject, &result);
    for (const V4& p : result) ASSERT_TRUE(std::abs(p.z) <= 1 && p.w == 0.5) << round;
  }
}

}  // namespace
