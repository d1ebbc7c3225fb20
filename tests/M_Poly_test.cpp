#include <numbers>

#include "Law.h"

namespace {

// Points at ascending angles about (0, 0): a polygon that does not cross itself.
std::vector<V2> DrawStar() {
  const int count =
      *rc::gen::weightedOneOf<int>({{6, rc::gen::inRange(3, 12)}, {1, rc::gen::inRange(60, 200)}});
  std::vector<V2> star;
  for (int i = 0; i < count; ++i) {
    const double angle = (i + 0.4 + *rc::gen::inRange(-3, 4) / 10.0) * 2 * std::numbers::pi / count;
    const double r = 2 + *rc::gen::inRange(-16, 17) / 16.0;
    star.push_back({r * std::cos(angle), r * std::sin(angle)});
  }
  return star;
}

double SegmentDistance(const V2& p, const V2& a, const V2& b) {
  const double x = b.x - a.x, y = b.y - a.y, square = x * x + y * y;
  const double t =
      square > 0 ? std::clamp(((p.x - a.x) * x + (p.y - a.y) * y) / square, 0.0, 1.0) : 0;
  return std::hypot(p.x - a.x - t * x, p.y - a.y - t * y);
}

int news;  // Of the last hit test.

unsigned char Hit(const V2& p, const std::vector<V2>& polygon, double tolerance) {
  unsigned char inside = 9;
  const int before = memory.news;
  const int32_t code = M_IsFloatPointInConcavePoly(
      &p, polygon.data(), static_cast<int32_t>(polygon.size()), tolerance, &inside);
  news = memory.news - before;
  Equal(code, 0);
  return inside;
}

// By how often the outline goes round the point, and how far it is.
TEST(Poly, PointsAreInsideWhereTheOutlineGoesRound) {
  Holds([](Real x, Real y, bool isRepeated) {
    std::vector<V2> star = DrawStar();
    const V2 p = {x * 0.4, y * 0.4};
    double turns = 0, nearest = 99;
    for (size_t i = 0; i < star.size(); ++i) {
      const V2 &a = star[i], &b = star[(i + 1) % star.size()];
      turns += std::remainder(std::atan2(b.y - p.y, b.x - p.x) - std::atan2(a.y - p.y, a.x - p.x),
                              2 * std::numbers::pi);
      nearest = std::min(nearest, SegmentDistance(p, a, b));
    }
    const bool isInside = std::abs(turns) > 1;
    if (isRepeated)
      star.insert(star.begin() + 1, star[1]), star.push_back(star.back()), star.push_back(star[0]);
    RC_PRE(nearest > 1e-9);
    Equal(Hit(p, star, 0), isInside);
    Equal(news, (star.size() > 64 ? 1 : 0));
    // A tolerance asks for points that are no farther from an edge's start than its end is; all
    // others are close to an end.
    for (const double tolerance : {0.25, -0.25, 3.0}) {
      const bool isNear = nearest < std::abs(tolerance);
      bool isFound = false;
      for (size_t i = 0; i < star.size(); ++i) {
        const V2 &a = star[i], &b = star[(i + 1) % star.size()];
        double distance;
        unsigned char on;
        M_PerpDistTo2DLine(&p, &a, &b, &on, &distance);
        isFound |= on && distance < std::abs(tolerance);
        isFound |= std::hypot(p.x - a.x, p.y - a.y) < std::abs(tolerance);
      }
      if (std::abs(nearest - std::abs(tolerance)) > 1e-6)
        Equal(Hit(p, star, tolerance), (isInside || isFound));
      if (!isInside && !isNear) Check(Hit(p, star, tolerance) == 0 || isFound);
    }
    if (star.size() == 4) {
      unsigned char inside = 9;
      Check(M_IsFloatPointInQuad(&p, star.data(), &inside) == 0 && inside == isInside);
    }
  });
}

// On a grid of quarters, edges and corners are met often. Floats give what doubles do.
TEST(Poly, TheOutlineIsDecidedByItsEdges) {
  Holds([] {
    const auto quarter = [] { return *rc::gen::inRange(-8, 9) / 4.0; };
    std::vector<V2> polygon;
    for (int i = *rc::gen::inRange(1, 8); i > 0; --i) polygon.push_back({quarter(), quarter()});
    if (*rc::gen::inRange(0, 4) == 0) polygon.assign(polygon.size(), polygon[0]);
    const V2 p = {quarter(), quarter()};
    bool isOn = false, isOdd = false, isPoint = true;
    for (size_t i = 0; i < polygon.size(); ++i) {
      const V2 &a = polygon[i], &b = polygon[(i + 1) % polygon.size()];
      isPoint &= a.x == b.x && a.y == b.y;
      // Half-open: the end at the smaller x is not part of an edge.
      if (!(std::min(a.x, b.x) < p.x && p.x <= std::max(a.x, b.x))) continue;
      const double above =
          ((p.x - b.x) * (a.y - b.y) - (p.y - b.y) * (a.x - b.x)) * (a.x > b.x ? 1 : -1);
      isOn |= above == 0;
      isOdd ^= above > 0;
    }
    const bool isSame = isPoint && polygon[0].x == p.x && polygon[0].y == p.y;
    const bool expected = isPoint ? isSame : isOn || isOdd;
    Equal(Hit(p, polygon, 0), expected);
    std::vector<F2> narrow;
    for (const V2& v : polygon)
      narrow.push_back({static_cast<float>(v.x), static_cast<float>(v.y)});
    const F2 q = {static_cast<float>(p.x), static_cast<float>(p.y)};
    for (const double tolerance : {0.0, 0.25, 1.0}) {
      unsigned char inside = 9;
      Equal(M_IsFloatPointInConcavePoly(&q, narrow.data(), static_cast<int32_t>(narrow.size()),
                                        tolerance, &inside),
            0);
      Equal(inside, Hit(p, polygon, tolerance));
      const double distance = std::hypot(p.x - polygon[0].x, p.y - polygon[0].y);
      if (isPoint && tolerance > 0) Equal(inside, (distance <= tolerance));
    }
  });
}

TEST(Poly, LimitsOfTheHitTest) {
  const std::vector<V2> square = {{0, 0}, {10, 0}, {10, 10}, {0, 10}};
  const std::tuple<V2, double, int> rows[] = {{{0, 5}, 0, 0},
                                              {{10, 5}, 0, 1},
                                              {{5, 0}, 0, 1},
                                              {{5, 10}, 0, 1},
                                              {{5, -1.5}, 2, 1},
                                              {{5, -2.5}, 2, 0},
                                              {{-1, -1}, 2, 1},
                                              {{5, -2}, 2, 1},
                                              {{5, std::nextafter(-2.0, -3.0)}, 2, 0},
                                              {{-2, 0}, 2, 1},
                                              {{12, 10}, 2, 1},
                                              {{5, 10 + 0.9e-11}, 0, 1},
                                              {{5, 10 + 1.1e-11}, 0, 0},
                                              {{5, -0.9e-12}, 0, 1},
                                              {{5, -1.1e-12}, 0, 0},
                                              {{10, 12}, 2, 1},
                                              {{kNan, 5}, 0, 0},
                                              {{5, kNan}, 2, 0}};
  for (const auto& [p, tolerance, inside] : rows)
    EXPECT_EQ(Hit(p, square, tolerance), inside) << rc::toString(p);
  // Zeros of either sign are two points, NaNs of the same bits one.
  EXPECT_EQ(Hit({0, 0}, {{0, 0}, {-0.0, 0}}, 0), 0);
  EXPECT_EQ(Hit({0, 0}, {{0, 0}, {0, 0}}, 0), 1);
  EXPECT_EQ(Hit({3, 4}, {{0, 0}}, 5), 1);
  EXPECT_EQ(Hit({3, 4}, {{0, 0}}, std::nextafter(5.0, 4.0)), 0);
  EXPECT_EQ(Hit({kNan, 4}, {{kNan, 4}}, 0), 0);
  // The distance of single floats is measured in floats.
  Holds([](Real x, Real y, Real a, Real b) {
    const F2 p = {static_cast<float>(x), static_cast<float>(y)};
    const F2 q = {static_cast<float>(a), static_cast<float>(b)};
    const float dx = p.x - q.x, dy = p.y - q.y, apart = dx * dx + dy * dy;
    const double tolerance = *operands::Near(rc::gen::just(std::sqrt(double{apart})));
    unsigned char inside = 9;
    M_IsFloatPointInConcavePoly(&p, &q, 1, tolerance, &inside);
    Equal(inside, apart == 0 || tolerance * tolerance >= apart);
  });
  unsigned char inside;
  for (const int32_t count : {0, -1}) {
    inside = 9;
    EXPECT_EQ(M_IsFloatPointInConcavePoly(&square[0], &square[0], count, 9.0, &inside), 0);
    EXPECT_EQ(inside, 0);
  }
  // An edge of more than 1e12 has no inside beside it, but its ends.
  EXPECT_EQ(Hit({5e11, 0.5}, {{0, 0}, {2e12, 0}, {1e12, -50}}, 1), 0);
  EXPECT_EQ(Hit({0, 0.5}, {{0, 0}, {2e12, 0}, {1e12, -50}}, 1), 1);
}

TEST(Poly, NoMemoryIsTheHostsToReport) {
  const std::vector<V2> many(65, {0, 0});
  const V2 p = {0, 0};
  unsigned char inside = 9;
  memory.newToFail = 1;
  EXPECT_EQ(M_IsFloatPointInConcavePoly(&p, many.data(), 64, 0.0, &inside), 0);
  EXPECT_EQ(inside, 1);
  for (const int answer : {79, 0, 1234}) {
    host.answers = answer;
    memory.newToFail = 1;
    EXPECT_EQ(M_IsFloatPointInConcavePoly(&p, many.data(), 65, 9.0, &inside), answer);
    EXPECT_EQ(inside, 0);
  }
  memory.newToFail = 0;
  EXPECT_EQ(host.Take(), Calls(3, "exception std::bad_alloc"));
  host = {};
}

TEST(Poly, AreasAreSumsOfTriangles) {
  Holds([](std::vector<Digit> numbers) {
    std::vector<V2> polygon;
    for (size_t i = 0; i + 1 < numbers.size(); i += 2)
      polygon.push_back({numbers[i] * 1.0, numbers[i + 1] * 1.0});
    double twice = 0;
    for (size_t i = 0; i < polygon.size(); ++i) {
      const V2 &a = polygon[i], &b = polygon[(i + 1) % polygon.size()];
      twice += a.x * b.y - a.y * b.x;
    }
    Equal(M_SignedPolygonArea2D(polygon.data(), static_cast<int32_t>(polygon.size())), twice / 2);
    Equal(M_SignedPolygonArea2D(polygon.data(), -1), 0);
  });
}

TEST(Poly, QuadsEdgeOn) {
  Holds([](bool useZAxis, bool isDivided) {
    const auto vector = [] {
      return V3{*operands::Reals(), *operands::Reals(), *operands::Reals()};
    };
    const V3 o = vector(), u = vector(), v = vector();
    const V3 quad[] = {o,
                       {o.x + u.x, o.y + u.y, o.z + u.z},
                       {o.x + u.x + v.x, o.y + u.y + v.y, o.z + u.z + v.z},
                       {o.x + v.x, o.y + v.y, o.z + v.z}};
    M_Matrix4 m = {{{1, 0, 0, 0}, {0, 0, 2, 0}, {0, 1, 0, 0}, {1, 2, 3, isDivided ? 2.0 : 1.0}}};
    V3 t[4];
    std::copy(quad, quad + 4, t);
    M_Transform3DFloatPoints(&m, 4, t);
    const V3 a = {t[1].x - t[0].x, t[1].y - t[0].y, t[1].z - t[0].z},
             b = {t[3].x - t[0].x, t[3].y - t[0].y, t[3].z - t[0].z};
    const V3 n = {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
    const V3 view = useZAxis
                        ? V3{0, 0, 1}
                        : V3{(t[0].x + t[2].x) / 2, (t[0].y + t[2].y) / 2, (t[0].z + t[2].z) / 2};
    const double size = std::sqrt((n.x * n.x + n.y * n.y + n.z * n.z) *
                                  (view.x * view.x + view.y * view.y + view.z * view.z));
    RC_PRE(size > 1e-3);
    const double cosine = std::abs(n.x * view.x + n.y * view.y + n.z * view.z) / size;
    for (const double tolerance : {cosine + 1e-9, cosine - 1e-9}) {
      unsigned char isEdgeOn = 9;
      Equal(M_IsQuadEdgeOn(&m, quad, useZAxis ? 2 : 0, &isEdgeOn, tolerance), 0);
      Equal(isEdgeOn, (tolerance > cosine));
    }
  });
  // Exactly at the tolerance is not within it; without an area, or with the eye in its middle, no.
  const M_Matrix4 identity = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};
  const auto isEdgeOn = [&](double side, double z, double tolerance, unsigned char useZAxis) {
    const V3 quad[] = {{-side, -side, z}, {side, -side, z}, {side, side, z}, {-side, side, z}};
    unsigned char result = 9;
    EXPECT_EQ(M_IsQuadEdgeOn(&identity, quad, useZAxis, &result, tolerance), 0);
    return result;
  };
  EXPECT_TRUE(!isEdgeOn(1, 1, 1, 1) && isEdgeOn(1, 1, 1.001, 1) && !isEdgeOn(1, 1, 0, 1) &&
              !isEdgeOn(1, 1, -1.001, 1));
  EXPECT_TRUE(!isEdgeOn(0, 1, 9, 1) && !isEdgeOn(3e-7, 1, 9, 1) && isEdgeOn(4e-7, 1, 9, 1));
  EXPECT_TRUE(!isEdgeOn(1, 0, 9, 0) && !isEdgeOn(1, 1e-12, 9, 0) && isEdgeOn(1, 1.1e-12, 9, 0));
}

}  // namespace
