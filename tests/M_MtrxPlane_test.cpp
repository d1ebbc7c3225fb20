#include "Matrices.h"

namespace {

TEST(MtrxPlane, OfAPolygon) {
  Holds([](Word any) {
    // A flat one around a, in any position.
    const V3 a = Draw<V3>(), u = Draw<V3>(), v = Draw<V3>(), cross = Cross(u, v);
    const int32_t count = 3 + static_cast<int32_t>(any % 8);
    std::vector<V3> points;
    for (int32_t i = 0; i < count; ++i)
      points.push_back(a + std::cos(i * 2 * kPi / count) * u + std::sin(i * 2 * kPi / count) * v);
    M_PlaneEq plane, plane2;
    V3 centroid;
    Equal(M_GetPlaneEquation(points.data(), count, &plane, &centroid), 0);
    Equal(M_GetPlaneEquation2(&a, &u, &plane2), 0);
    Check(IsNear(plane2, M_PlaneEq{u.x, u.y, u.z, -Dot(u, a)}) && IsNear(centroid, a));
    const V3 normal = 1 / Length(cross) * cross;
    if (Length(cross) > 0.1)
      Check(IsNear(plane, M_PlaneEq{normal.x, normal.y, normal.z, -Dot(normal, a)}, 1e-8L));
    // A normal of up to 1e-12 is left as it is.
    const double height = *operands::Near(rc::gen::element(1e-12, 0.0));
    const V3 thin[] = {{0, 0, 0}, {1, 0, 0}, {0, height, 0}};
    M_GetPlaneEquation(thin, 3, &plane, nullptr);
    Equal(plane.c, (height > 1e-12 ? 1 : height));
    M_GetPlaneEquation(nullptr, 0, &plane, &centroid);
    Check(plane.a == 0 && plane.c == 0 && std::isnan(plane.d) && std::isnan(centroid.y));
  });
}

TEST(MtrxPlane, RaysHitPlanes) {
  Holds([](Digit kind) {
    V3 n = Draw<V3>(), o = Draw<V3>(), d = Draw<V3>();
    if (kind > 0) {  // Almost along the plane, or starting in it.
      n = {0, 0, 1};
      d.z = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 1.0, -1.0));
    }
    const M_PlaneEq plane = {n.x, n.y, n.z, kind > 5 ? -o.z : *operands::Reals()};
    const double slope = Dot(n, d), height = Dot(n, o) + plane.d;
    const bool isParallel = std::abs(slope) < 1e-12;
    const double t = isParallel ? 0 : -height / slope;
    RC_PRE(isParallel || kind > 0 || std::abs(slope) > 1e-6);
    const M_Ray ray = {{o.x, o.y, o.z, kNan}, {d.x, d.y, d.z, kInf}};
    for (const int32_t forwardOnly : {0, 1, 0x100, 0x180}) {
      const bool isHit = !isParallel && (t > 0 || (forwardOnly & 0xFF) == 0);
      V3 hit;
      unsigned char behind = 9, ok = 9;
      Equal(M_RayIntersectPlane(&plane, forwardOnly, &ray, &hit, &behind, &ok), 0);
      Check(ok == isHit && behind == (t < 0) && IsNear(hit, o + t * d) && host.Take().empty());
      Equal(M_RayIntersectPlane(&plane, forwardOnly, &ray, &hit, nullptr, nullptr),
            (isHit ? 0 : M_ERR_NO_PLANE_INTERSECTION));
      Equal(host.Take(), Calls(!isHit, "11002f 8 unable to intersect plane."));
    }
  });
}

TEST(MtrxPlane, DistancesFromLines) {
  Holds([](Digit x, Digit y, Digit kind) {
    V2 p = Draw<V2>(), a = Draw<V2>(), b = Draw<V2>();
    if (kind > 0) {  // Exactly.
      p = {x * 1.0, y * 1.0};
      a = {0, 0};
      b = {kind < 6 ? 5 : *operands::Near(rc::gen::element(1e-12, 1e12, 1.0000001e12, 0.0)), 0};
    }
    const V2 line = b - a, v = p - a;
    const double length = Length(line), along = Dot(line, v) / length;
    const bool isNone = !(length > 1e-12) || 1 / length < 1e-12;
    double distance = -1;
    unsigned char onSegment = 9;
    Equal(M_PerpDistTo2DLine(&p, &a, &b, &onSegment, &distance), 0);
    Check(IsNear(distance, isNone ? Length(v) : std::abs(line.x * v.y - line.y * v.x) / length));
    // As far from a as b is still counts, and above a itself.
    if (isNone || kind > 0 || (std::abs(along) > 1e-9 && !IsNear(Length(v), length)))
      Equal(onSegment, (!isNone && along >= 0 && Length(v) <= length));
  });
}

TEST(MtrxPlane, LinesAreCutAtTheNearPlane) {
  Holds([](bool isEdge0, bool isEdge1) {
    V3 p = Draw<V3>(), q = Draw<V3>(), crossing;
    const auto edge = operands::Near(rc::gen::element(0.1, 0.1, 0.0));
    if (isEdge0) p.z = *edge;
    if (isEdge1) q.z = *edge;
    unsigned char flags[2] = {9, 9}, both = 9;
    Equal(M_Clip3DLine(&p, &q, &flags[0], &flags[1], &crossing), 0);
    Check(flags[0] == (p.z < 0.1) && flags[1] == (q.z < 0.1));
    const double t = (0.1 - p.z) / (q.z - p.z);
    Check(IsNear(crossing, flags[0] == flags[1] ? V3{0, 0, 0} : p + t * (q - p), 1e-12L));
    M_Clip3DLine(&p, &q, &both, &both, &crossing);
    Equal(both, (flags[0] | flags[1]));
  });
  // A NaN is neither before the plane nor behind it: the first point is the one that is cut.
  const V3 seen = {0, 0, 1}, none = {0, 0, kNan};
  V3 crossing;
  for (const auto& [p, q] : {std::pair(seen, none), {none, seen}}) {
    unsigned char flags[2] = {9, 9};
    M_Clip3DLine(&p, &q, &flags[0], &flags[1], &crossing);
    EXPECT_TRUE(flags[0] == 1 && flags[1] == 0);
  }
}

TEST(MtrxPlane, LinesAreCutToRectangles) {
  Holds([](Digit l, Digit t, Digit w, Digit h) {
    const M_FloatRect r = {l * 1.0, t * 1.0, l + w + 5.0, t + h + 5.0};
    const auto x = rc::gen::oneOf(operands::Reals(), rc::gen::element(r.left, r.right)),
               y = rc::gen::oneOf(operands::Reals(), rc::gen::element(r.top, r.bottom));
    const V2 a = {*x, *y}, b = {*x, *y};
    V2 p = a, q = b;
    unsigned char visible = 9;
    Equal(M_ClipLine2Rect(&r, &p, &q, &visible), 0);
    // By the parameters at which it enters and leaves; what has no extent is not seen.
    double enter = 0, leave = 1;
    bool isApart = false;
    const auto narrow = [&](double from, double to, double low, double high) {
      isApart |=
          low >= high || from == to || std::max(from, to) <= low || high <= std::min(from, to);
      const double first = (low - from) / (to - from), second = (high - from) / (to - from);
      enter = std::max(enter, std::min(first, second));
      leave = std::min(leave, std::max(first, second));
    };
    narrow(a.x, b.x, r.left, r.right);
    narrow(a.y, b.y, r.top, r.bottom);
    const auto isInside = [&](const V2& v) {
      return r.left <= v.x && v.x <= r.right && r.top <= v.y && v.y <= r.bottom;
    };
    const bool isWhole = isInside(a) && isInside(b), isCut = !isWhole && !isApart;
    RC_PRE(!isCut || std::abs(leave - enter) > 1e-6);
    Equal(visible, (isWhole || (isCut && enter < leave)));
    if (isCut && visible)
      Check(IsNear(p, a + enter * (b - a), 1e-6L) && IsNear(q, a + leave * (b - a), 1e-6L));
    if (!isCut || isInside(a)) Equal(BitsOf(p), BitsOf(a));
    if (!isCut || isInside(b)) Equal(BitsOf(q), BitsOf(b));
  });
  // A corner that is only touched is visible; what is moved stays moved.
  for (const auto& [a, b, isVisible, end] :
       {std::tuple(V2{-1, 1}, V2{1, -1}, 1, V2{0, 0}), {{-2, 1}, {2, -3}, 0, {-1, 0}}}) {
    const M_FloatRect r = {0, 0, 10, 10};
    V2 p = a, q = b;
    unsigned char visible = 9;
    M_ClipLine2Rect(&r, &p, &q, &visible);
    EXPECT_TRUE(visible == isVisible && BitsOf(p) == BitsOf(end) && BitsOf(q) == BitsOf(end));
  }
}

TEST(MtrxPlane, Directions) {
  Holds([](const M_Matrix3& m, Digit x, Digit y) {
    V2 images[3] = {{1, 0}, {0, 1}, {0, 0}};
    M_TransformFloatPoints(&m, 3, images);
    const std::array expected = {images[0] - images[2], images[1] - images[2]};
    Equal(BitsOf(M_ComputeDirectionalComponents(m)), BitsOf(expected));

    const V2 d = x > 6 ? V2{0, y * 1.0} : x < -6 ? V2{x * 1.0, 0} : Draw<V2>();
    // From straight up, which is 360; nowhere is 90.
    const double turn = std::atan2(d.x, -d.y) / kPi * 180,
                 bearing = Length(d) == 0 ? 90 : turn + (turn <= 0 ? 360 : 0);
    const M_FloatRect r = {1, -2, 5, 8};
    const V2 p = d + V2{3, 3};
    double angle;
    Equal(M_Pt2Angle(&r, &p, &angle), 0);
    Check(IsNear(M_VecToAngle(d), bearing, 1e-12L));
    Check(IsNear(angle, M_VecToAngle(p - V2{3, 3}), 1e-12L));
    if (d.x == 0) Check(M_VecToAngle(d) == bearing && angle == bearing);

    const double radians = y * 40 / 180.0 * kPi, s = std::sin(radians), c = std::cos(radians);
    const F2 centre = {x * 1.5f, y / 2.0f};
    F2 q = {static_cast<float>(d.x), static_cast<float>(d.y)};
    const double h = q.x - centre.x, v = q.y - centre.y;
    Equal(M_TransformPtF(&centre, y * 40, &q), 0);
    Check(IsNear(q.x, centre.x + h * c - v * s, 1e-5L));
    Check(IsNear(q.y, centre.y + h * s + v * c, 1e-5L));
  });
  // Narrowed before the centre is added.
  const F2 centre = {1, 1};
  F2 q = {0x1p-30f, 1};
  M_TransformPtF(&centre, 0, &q);
  EXPECT_EQ(q.x, 0);
}

}  // namespace
