#include "Law.h"

namespace {

template <class Point>
int Hit(const Point& p, const std::vector<Point>& polygon, double tolerance) {
  unsigned char inside = 9;
  const auto count = static_cast<int32_t>(polygon.size());
  Equal(M_IsFloatPointInConcavePoly(&p, polygon.data(), count, tolerance, &inside), 0);
  return inside;
}

F2 Narrow(const V2& p) { return {static_cast<float>(p.x), static_cast<float>(p.y)}; }

// On a small grid, where edges, corners and repeated points are met often, and floats give what
// doubles do. Its steps have so few digits that squares are exact in doubles, but not in floats. No
// slanting edge has a whole length, so that only upright and level ones are exactly as far away as
// the tolerance.
TEST(Poly, TheOutlineIsDecidedByItsEdges) {
  Holds([] {
    const auto draw = [](int least, int end) {
      return *rc::gen::resize(rc::kNominalSize, rc::gen::inRange(least, end)) * 0x1.99ap-4;
    };
    const double tolerance = std::max(0.0, draw(-6, 7) / 2), near = tolerance * tolerance;
    const V2 p = {draw(-2, 6), draw(-2, 6)};
    std::vector<V2> polygon(*rc::gen::weightedOneOf<size_t>(
        {{9, rc::gen::inRange<size_t>(1, 8)}, {1, rc::gen::inRange<size_t>(63, 140)}}));
    const int places = *rc::gen::element(0, 2, 3, 4, 4);
    for (V2& corner : polygon) corner = {draw(0, places), draw(0, places)};
    bool isPoint = true, isAtCorner = false, isOn = false, isOdd = false;
    for (size_t i = 0; i < polygon.size(); ++i) {
      const V2 &a = polygon[i], &b = polygon[(i + 1) % polygon.size()];
      const V2 edge = {b.x - a.x, b.y - a.y}, v = {p.x - a.x, p.y - a.y};
      const double length = edge.x * edge.x + edge.y * edge.y, distance = v.x * v.x + v.y * v.y,
                   along = v.x * edge.x + v.y * edge.y, across = edge.x * v.y - edge.y * v.x;
      isPoint &= length == 0;
      isAtCorner |= distance <= near;
      // Beside an edge are those that are no farther from its start than its end is.
      isOn |= near > 0 && along >= 0 && distance <= length && across * across <= near * length;
      // Half-open: the end at the smaller x is not part of an edge.
      if ((a.x < p.x) == (b.x < p.x)) continue;
      isOn |= across == 0;
      isOdd ^= across * edge.x < 0;
    }
    const bool isInside = isPoint ? isAtCorner : (near > 0 && isAtCorner) || isOn || isOdd;
    const int news = memory.news;
    Equal(Hit(p, polygon, -tolerance), isInside);
    Equal(memory.news - news, (polygon.size() > 64 ? 1 : 0));
    std::vector<F2> narrow(polygon.size());
    std::transform(polygon.begin(), polygon.end(), narrow.begin(), Narrow);
    if (!isPoint) Equal(Hit(Narrow(p), narrow, tolerance), isInside);
    unsigned char inside = 9;
    if (polygon.size() != 4) return;
    Equal(M_IsFloatPointInQuad(&p, polygon.data(), &inside), 0);
    Equal(inside, Hit(p, polygon, 0));
  });
}

TEST(Poly, FloatsAreApartInFloats) {
  Holds([](Real x, Real y, Real a, Real b) {
    const F2 p = Narrow({x, y}), q = Narrow({a, b});
    const float dx = p.x - q.x, dy = p.y - q.y, apart = dx * dx + dy * dy;
    const double tolerance = *operands::Near(rc::gen::just(std::sqrt(double{apart})));
    Equal(Hit(p, {q}, tolerance), apart == 0 || tolerance * tolerance >= apart);
  });
}

TEST(Poly, LimitsOfTheHitTest) {
  // Of an edge as wide nothing but the ends is near.
  const std::vector<V2> square = {{0, 0}, {10, 0}, {10, 10}, {0, 10}},
                        wide = {{0, 0}, {2e12, 0}, {1e12, -50}}, nan(2, {kNan, 4});
  const std::tuple<std::vector<V2>, V2, double, int> rows[] = {
      {square, {8, -6}, 6.1, 1},
      {square, {9.9, -1.9999}, 2, 0},  // Farther from the start than the end is.
      {square, {5, 10 + 0.9e-11}, 0, 1},
      {square, {5, 10 + 1.1e-11}, 0, 0},
      {square, {5, -1.00005e-12}, 0, 1},
      {square, {5, -1.0001e-12}, 0, 0},
      {square, {kNan, 5}, 0, 0},
      {square, {5, kNan}, 2, 0},
      {{{0, 3}, {-0.0, 3}}, {0, 3}, 0, 0},  // Zeros of either sign are two points.
      {{{3, 0}, {3, -0.0}}, {3, 0}, 0, 0},
      {nan, {kNan, 4}, 0, 0},
      {{{3, 4}}, {0, 0}, std::nextafter(5.0, 4.0), 0},
      {{{0, 0}, {2, 2 / 3.0}, {2, 5}}, {1, 1 / 3.0}, 0, 1},
      {wide, {5e11, 0.5}, 1, 0},
      {wide, {0, 0.5}, 1, 1}};
  for (const auto& [polygon, p, tolerance, inside] : rows)
    EXPECT_EQ(Hit(p, polygon, tolerance), inside) << rc::toString(p);
  EXPECT_EQ(Hit(F2{0, 0}, {{0, 0}, {-0.0f, 0}}, 0), 0);
  for (const int32_t count : {0, -1}) {
    unsigned char inside = 9;
    EXPECT_EQ(M_IsFloatPointInConcavePoly(&square[0], &square[0], count, 9.0, &inside), 0);
    EXPECT_EQ(inside, 0);
  }
}

TEST(Poly, NoMemoryIsTheHostsToReport) {
  const std::vector<V2> many(65, {0, 0});
  for (const int answer : {79, 0, 1234}) {
    unsigned char inside = 9;
    host.answers = answer;
    memory.newToFail = 1;
    EXPECT_EQ(M_IsFloatPointInConcavePoly(&many[0], &many[0], 65, 9.0, &inside), answer);
    EXPECT_EQ(inside, 0);
    EXPECT_EQ(host.Take(), Calls{"exception std::bad_alloc"});
  }
  host = {};
}

TEST(Poly, AreasAreSumsOfTriangles) {
  Holds([](const std::vector<std::pair<Digit, Digit>>& corners) {
    std::vector<V2> polygon;
    for (const auto& [x, y] : corners) polygon.push_back({x * 1.0, y * 1.0});
    double twice = 0;
    for (size_t i = 0; i < polygon.size(); ++i) {
      const V2 &a = polygon[i], &b = polygon[(i + 1) % polygon.size()];
      twice += a.x * b.y - a.y * b.x;
    }
    Equal(M_SignedPolygonArea2D(polygon.data(), static_cast<int32_t>(polygon.size())), twice / 2);
    Equal(M_SignedPolygonArea2D(polygon.data(), -1), 0);
  });
}

int IsEdgeOn(const M_Matrix4& m, const V3* quad, bool useZAxis, double tolerance) {
  unsigned char isEdgeOn = 9;
  Equal(M_IsQuadEdgeOn(&m, quad, useZAxis ? 2 : 0, &isEdgeOn, tolerance), 0);
  return isEdgeOn;
}

TEST(Poly, QuadsAreEdgeOnByTheirPlane) {
  Holds([](bool useZAxis) {
    const M_Matrix4 m = {{{1, 0, 0, 0.1}, {0, 0, 2, 0}, {0, 1, 0, 0}, {1, 2, 3, 2}}};
    V3 quad[4], seen[4], view = {0, 0, 0};
    for (V3& p : quad) p = {*operands::Reals(), *operands::Reals(), *operands::Reals()};
    std::copy(quad, quad + 4, seen);
    M_Transform3DFloatPoints(&m, 4, seen);
    for (const V3& p : seen) view = {view.x + p.x, view.y + p.y, view.z + p.z};
    if (useZAxis) view = {0, 0, 1};
    M_PlaneEq n;
    M_GetPlaneEquation(seen, 4, &n, nullptr);
    const double size = std::hypot(n.a, n.b, n.c) * std::hypot(view.x, view.y, view.z);
    RC_PRE(size > 1e-3);
    const double cosine = std::abs(n.a * view.x + n.b * view.y + n.c * view.z) / size;
    Check(IsEdgeOn(m, quad, useZAxis, cosine + 1e-9) == 1);
    Check(IsEdgeOn(m, quad, useZAxis, cosine - 1e-9) == 0);
  });
  // Exactly at the tolerance is not within it; without an area, or with the eye in its middle, no.
  const M_Matrix4 identity = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};
  const auto isEdgeOn = [&](double side, double z, double tolerance) {
    const V3 quad[] = {{-side, -side, z}, {side, -side, z}, {side, side, z}, {-side, side, z}};
    return IsEdgeOn(identity, quad, false, tolerance) == 1;
  };
  EXPECT_TRUE(!isEdgeOn(1, 1, 1) && !isEdgeOn(1, -1, 1) && !isEdgeOn(1, 1, -1.001));
  EXPECT_TRUE(!isEdgeOn(3e-7, 1, 9) && isEdgeOn(4e-7, 1, 9));
  EXPECT_TRUE(!isEdgeOn(1, 1e-12, 9) && isEdgeOn(1, 1.1e-12, 9));
}

}  // namespace
