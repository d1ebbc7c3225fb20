#include "Law.h"

namespace {

double Dot(const V3& a, const V3& b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
V3 DrawVector() { return {*operands::Reals(), *operands::Reals(), *operands::Reals()}; }
V2 DrawPoint() { return {*operands::Reals(), *operands::Reals()}; }
bool IsNearZero(double d) { return -1e-12 < d && d < 1e-12; }

TEST(MtrxPlane, OfAPolygon) {
  Holds([] {
    // Of a flat polygon, in any position.
    const V3 a = DrawVector(), u = DrawVector(), v = DrawVector();
    const int32_t count = *rc::gen::inRange(3, 8);
    std::vector<V3> points;
    V3 sum = {0, 0, 0};
    for (int32_t i = 0; i < count; ++i) {
      const double t = i * 6.283185307179586 / count, c = std::cos(t), s = std::sin(t);
      points.push_back({a.x + c * u.x + s * v.x, a.y + c * u.y + s * v.y, a.z + c * u.z + s * v.z});
      sum = {sum.x + points.back().x, sum.y + points.back().y, sum.z + points.back().z};
    }
    const V3 cross = {u.y * v.z - u.z * v.y, u.z * v.x - u.x * v.z, u.x * v.y - u.y * v.x};
    M_PlaneEq plane;
    V3 centroid;
    Equal(M_GetPlaneEquation(points.data(), count, &plane, &centroid), 0);
    Check(IsNear(centroid, V3{sum.x / count, sum.y / count, sum.z / count}));
    RC_PRE(Dot(cross, cross) > 0.01);
    const double length = std::sqrt(Dot(cross, cross));
    Check(IsNear(V3{plane.a, plane.b, plane.c},
                 V3{cross.x / length, cross.y / length, cross.z / length}));
    for (const V3& p : points)
      Check(std::abs(Dot({plane.a, plane.b, plane.c}, p) + plane.d) < 1e-9);
    const V3 normal = DrawVector();
    Equal(M_GetPlaneEquation2(&a, &normal, &plane), 0);
    Check(plane.a == normal.x && plane.b == normal.y && plane.c == normal.z &&
          IsNear(plane.d, -Dot(normal, a)));
  });
  // A normal of up to 1e-12 is left as it is.
  Holds([] {
    const double side = *operands::Near(rc::gen::element(1e-6, 2e-6, 0.5e-6, 0.0));
    const V3 points[] = {{0, 0, 1}, {side, 0, 1}, {side, side, 1}, {0, side, 1}};
    M_PlaneEq plane;
    M_GetPlaneEquation(points, 4, &plane, nullptr);
    const double area = 2 * (side * side);
    Check(std::abs(plane.c - (area > 1e-12 ? 1 : area)) < 1e-26);
  });
  M_PlaneEq plane;
  V3 centroid;
  M_GetPlaneEquation(nullptr, 0, &plane, &centroid);
  EXPECT_TRUE(plane.a == 0 && plane.c == 0 && std::isnan(plane.d) && std::isnan(centroid.y));
}

TEST(MtrxPlane, RaysHitPlanes) {
  Holds([](Digit kind) {
    const V3 n = DrawVector(), o = DrawVector();
    V3 d = DrawVector();
    M_PlaneEq plane = {n.x, n.y, n.z, *operands::Reals()};
    if (kind > 0) {  // Almost along the plane, or starting in it.
      plane = {0, 0, 1, kind > 5 ? -o.z : plane.d};
      d.z = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 1.0, -1.0));
    }
    const double slope = Dot({plane.a, plane.b, plane.c}, d),
                 height = Dot({plane.a, plane.b, plane.c}, o) + plane.d;
    const bool isParallel = IsNearZero(slope);
    const double t = isParallel ? 0 : -height / slope;
    RC_PRE(isParallel || kind > 0 || std::abs(slope) > 1e-6);
    const M_Ray ray = {{o.x, o.y, o.z, kNan}, {d.x, d.y, d.z, kInf}};
    for (const int32_t forwardOnly : {0, 1, 0x100, 0x180}) {
      const bool isHit = !isParallel && (t > 0 || (forwardOnly & 0xFF) == 0);
      V3 hit = {7, 7, 7};
      unsigned char behind = 9, ok = 9;
      Equal(M_RayIntersectPlane(&plane, forwardOnly, &ray, &hit, &behind, &ok), 0);
      Check(ok == isHit && behind == (t < 0) && host.Take().empty());
      const V3 expected = {o.x + t * d.x, o.y + t * d.y, o.z + t * d.z};
      Check(IsNear(hit, expected));
      if (isParallel) Check(hit.x == o.x && hit.y == o.y && hit.z == o.z);
      const int32_t code = isHit ? 0 : M_ERR_NO_PLANE_INTERSECTION;
      Equal(M_RayIntersectPlane(&plane, forwardOnly, &ray, &hit, nullptr, nullptr), code);
      Check(host.Take() == (code ? Calls{"11002f 8 unable to intersect plane."} : Calls()) &&
            IsNear(hit, expected));
    }
  });
}

TEST(MtrxPlane, DistancesFromLines) {
  Holds([](Digit kind) {
    const V2 p = DrawPoint(), a = DrawPoint();
    V2 b = DrawPoint();
    if (kind > 0) b = {a.x, a.y + *operands::Near(rc::gen::element(0.0, 1.0, -2.0))};
    if (kind > 4) b = {0x1p40, kind > 7 ? 1.1e12 : 0};
    V2 from = a;
    if (kind == -9)
      from = {0, 0}, b = {*operands::Near(rc::gen::element(1e-12, 1e12, 1.0000001e12)), 0};
    const double x = b.x - from.x, y = b.y - from.y, length = std::sqrt(x * x + y * y);
    const double vx = p.x - from.x, vy = p.y - from.y, fromA = std::sqrt(vx * vx + vy * vy);
    double distance = -1;
    unsigned char onSegment = 9;
    Equal(M_PerpDistTo2DLine(&p, &from, &b, &onSegment, &distance), 0);
    if (!(length > 1e-12) || 1 / length < 1e-12) {
      Check(IsNear(distance, fromA) && onSegment == 0);
    } else {
      Check(IsNear(distance, std::abs(x * vy - y * vx) / length, 1e-7L));
      const double along = (x * vx + y * vy) / length;
      if (along != 0 && std::abs(fromA - length) > 1e-9)
        Equal(onSegment, (along > 0 && fromA <= length));
      if (fromA == 0) Equal(onSegment, 1);
    }
  });
  // As far from a as b is, and above a itself, still counts.
  const V2 a = {0, 0}, b = {5, 0};
  for (const auto& [x, y, on] :
       {std::tuple(3.0, 4.0, 1), {0.0, 5.0, 1}, {5.0, 0.0, 1}, {-0.5, 1.0, 0}, {4.9, 2.0, 0}}) {
    const V2 p = {x, y};
    unsigned char onSegment = 9;
    double distance;
    M_PerpDistTo2DLine(&p, &a, &b, &onSegment, &distance);
    EXPECT_EQ(onSegment, on) << x;
    EXPECT_EQ(distance, std::abs(y));
  }
}

TEST(MtrxPlane, LinesAreCutAtTheNearPlane) {
  Holds([] {
    V3 p[2] = {DrawVector(), DrawVector()}, crossing = {7, 7, 7};
    for (V3& each : p) {
      if (*rc::gen::arbitrary<bool>()) each.z = *operands::Near(rc::gen::element(0.1, 0.1, 0.0));
    }
    unsigned char flags[2] = {9, 9}, both = 9;
    Equal(M_Clip3DLine(&p[0], &p[1], &flags[0], &flags[1], &crossing), 0);
    Check(flags[0] == (p[0].z < 0.1) && flags[1] == (p[1].z < 0.1));
    if (flags[0] == flags[1]) {
      Check(crossing.x == 0 && crossing.y == 0 && crossing.z == 0);
    } else {
      const double t = (0.1 - p[0].z) / (p[1].z - p[0].z);
      Check(IsNear(crossing,
                   V3{p[0].x + t * (p[1].x - p[0].x), p[0].y + t * (p[1].y - p[0].y), 0.1},
                   1e-12L));
    }
    M_Clip3DLine(&p[0], &p[1], &both, &both, &crossing);
    Equal(both, (flags[0] | flags[1]));
  });
}

TEST(MtrxPlane, LinesAreCutToRectangles) {
  const auto isInside = [](const M_FloatRect& r, const V2& p) {
    return r.left <= p.x && p.x <= r.right && r.top <= p.y && p.y <= r.bottom;
  };
  Holds([&](Digit l, Digit t, Digit w, Digit h) {
    const M_FloatRect r = {l * 1.0, t * 1.0, l + w + 5.0, t + h + 5.0};
    const auto coordinate = [](double low, double high) {
      return *rc::gen::oneOf(operands::Reals(), rc::gen::element(low, high));
    };
    const V2 a = {coordinate(r.left, r.right), coordinate(r.top, r.bottom)},
             b = {coordinate(r.left, r.right), coordinate(r.top, r.bottom)};
    V2 p = a, q = b;
    unsigned char visible = 9;
    Equal(M_ClipLine2Rect(&r, &p, &q, &visible), 0);
    const auto apart = [](double low, double high, double x, double y) {
      return low >= high || x == y ||
             std::min(high, std::max(x, y)) <= std::max(low, std::min(x, y));
    };
    const bool areInside = isInside(r, a) && isInside(r, b);
    if (areInside || apart(r.left, r.right, a.x, b.x) || apart(r.top, r.bottom, a.y, b.y)) {
      Check(visible == areInside && BitsOf(p) == BitsOf(a) && BitsOf(q) == BitsOf(b));
      return;
    }
    // By the parameters at which the line enters and leaves.
    double enter = 0, leave = 1;
    const auto narrow = [&](double from, double to, double low, double high) {
      const double first = (low - from) / (to - from), second = (high - from) / (to - from);
      enter = std::max(enter, std::min(first, second)),
      leave = std::min(leave, std::max(first, second));
    };
    narrow(a.x, b.x, r.left, r.right);
    narrow(a.y, b.y, r.top, r.bottom);
    RC_PRE(std::abs(leave - enter) > 1e-6);
    RC_PRE(std::abs(a.x - b.x) > 1e-3 && std::abs(a.y - b.y) > 1e-3);
    Equal(visible, (enter < leave));
    const auto at = [&](double s) { return V3{a.x + s * (b.x - a.x), a.y + s * (b.y - a.y), 0}; };
    if (visible) {
      Check(IsNear(V3{p.x, p.y, 0}, at(enter), 1e-6L) && IsNear(V3{q.x, q.y, 0}, at(leave), 1e-6L));
      Check((!isInside(r, a) || BitsOf(p) == BitsOf(a)) &&
            (!isInside(r, b) || BitsOf(q) == BitsOf(b)));
    }
  });
  // A corner that is only touched is visible, an edge that is only touched not; what is moved stays
  // moved.
  const M_FloatRect r = {0, 0, 10, 10};
  const std::tuple<V2, V2, int, V2, V2> rows[] = {
      {{-5, 5}, {15, 5}, 0, {-5, 5}, {15, 5}}, {{-5, -5}, {15, 15}, 1, {0, 0}, {10, 10}},
      {{-1, 1}, {1, -1}, 1, {0, 0}, {0, 0}},   {{-2, 1}, {1, -2}, 0, {-1, 0}, {0, -1}},
      {{-5, 0}, {5, -5}, 0, {-5, 0}, {5, -5}}, {{12, 2}, {8, 20}, 0, {10, 11}, {10, 11}}};
  for (const auto& [a, b, isVisible, p, q] : rows) {
    V2 from = a, to = b;
    unsigned char visible = 9;
    M_ClipLine2Rect(&r, &from, &to, &visible);
    EXPECT_EQ(visible, isVisible) << rc::toString(a);
    if (isVisible || BitsOf(p) == BitsOf(a)) {
      EXPECT_TRUE(BitsOf(from) == BitsOf(p) && BitsOf(to) == BitsOf(q)) << rc::toString(from);
    } else {
      EXPECT_NE(BitsOf(from), BitsOf(a));
    }
  }
}

TEST(MtrxPlane, Directions) {
  Holds([](const M_Matrix3& m, Digit x, Digit y, Real u, Real v) {
    V2 images[3] = {{1, 0}, {0, 1}, {0, 0}};
    M_TransformFloatPoints(&m, 3, images);
    const M_DirectionalComponents c = M_ComputeDirectionalComponents(m);
    Equal(BitsOf(c.x), BitsOf(V2{images[0].x - images[2].x, images[0].y - images[2].y}));
    Equal(BitsOf(c.y), BitsOf(V2{images[1].x - images[2].x, images[1].y - images[2].y}));

    const V2 d = x > 6 ? V2{0, y * 1.0} : x < -6 ? V2{x * 1.0, 0} : V2{u, v};
    // Straight up is 360, nowhere 90.
    double bearing = d.x == 0 && d.y == 0 ? 90 : 90 + std::atan2(d.y, d.x) * 180 / std::acos(-1.0);
    if (bearing <= 0) bearing += 360;
    if (d.x == 0 && d.y < 0) bearing = 360;
    Check(IsNear(M_VecToAngle(d), bearing, 1e-12L));
    const M_FloatRect r = {1, -2, 5, 8};
    const V2 p = {3 + d.x, 3 + d.y};
    double angle;
    Equal(M_Pt2Angle(&r, &p, &angle), 0);
    Check(IsNear(angle, M_VecToAngle({p.x - 3, p.y - 3}), 1e-12L));
    if (d.x == 0) Check(M_VecToAngle(d) == bearing && angle == bearing);

    const double degrees = y * 40, s = std::sin(degrees * std::acos(-1.0) / 180),
                 k = std::cos(degrees * std::acos(-1.0) / 180);
    const F2 centre = {static_cast<float>(u), static_cast<float>(x)};
    F2 q = {static_cast<float>(v), static_cast<float>(d.x)};
    const double dx = q.x - centre.x, dy = q.y - centre.y;
    Equal(M_TransformPtF(&centre, degrees, &q), 0);
    Check(IsNear(q.x, centre.x + dx * k - dy * s, 1e-5L) &&
          IsNear(q.y, centre.y + dx * s + dy * k, 1e-5L));
  });
}

}  // namespace
