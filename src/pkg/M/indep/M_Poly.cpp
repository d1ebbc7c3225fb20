// Point in polygon, the area of a polygon, and quads seen edge-on.

#include <algorithm>
#include <bit>
#include <cmath>
#include <cstdint>
#include <exception>
#include <memory>
#include <type_traits>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "Mp_Arith.h"
#include "Mp_Lanes.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector3.h"
#include "U.h"

namespace {

using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;

// Zeros of either sign differ, NaNs of the same bits do not.
template <class Point>
bool IsSameBitwise(const Point& a, const Point& b) {
  using Word = std::conditional_t<sizeof a.x == sizeof(uint64_t), uint64_t, uint32_t>;
  return Mp::BitCast<Word>(a.x) == Mp::BitCast<Word>(b.x) &&
         Mp::BitCast<Word>(a.y) == Mp::BitCast<Word>(b.y);
}

template <class Point>
Vector2 Widen(const Point& p) {
  return {p.x, p.y};
}

double SquaredDistance(const Vector2& a, const Vector2& b) {
  const double dx = a.x - b.x;
  const double dy = a.y - b.y;
  return dx * dx + dy * dy;
}

// The tolerance's test of an edge: whether the point is near the edge, or near one of its ends.
bool IsNearEdge(const Vector2& p, const Vector2& a, const Vector2& b, double squaredTolerance) {
  const double length = std::sqrt(SquaredDistance(b, a));
  const double r = length > Mp::kTolerance ? 1.0 / length : 0;
  // Unless the edge is too short, or so long that nothing is left of its reciprocal.
  if (!Mp::IsNearZero(r)) {
    const Vector2 u = {(b.x - a.x) / length, (b.y - a.y) / length};
    const Vector2 v = {p.x - a.x, p.y - a.y};
    const double t = v.x * u.x + v.y * u.y;
    const bool isBeside = t >= 0 && std::sqrt(v.x * v.x + v.y * v.y) <= length;
    const Vector2 foot = {t * u.x, t * u.y};
    if (isBeside && squaredTolerance >= SquaredDistance(v, foot)) return true;
  }
  return squaredTolerance >= SquaredDistance(p, a) || squaredTolerance >= SquaredDistance(p, b);
}

// Whether, along one axis, the edge from a to b is so far away that IsNearEdge cannot hold for p,
// whatever is rounded there: that is relative to the distance or to the edge's extent, and far less
// than the margin. Where something is not finite, nothing is known.
bool IsFar(double p, double a, double b, double reach) {
  constexpr double kMargin = 1e-9;
  const double distance = std::max(std::min(a, b) - p, p - std::max(a, b));
  return distance > reach + kMargin * (reach + std::abs(b - a));
}

bool IsNearOutline(const Vector2& p, const auto& corner, int32_t count, double squaredTolerance) {
  // Far below it squares have no digits left.
  const double reach = std::max(std::sqrt(squaredTolerance), 1e-150);
  Vector2 a = corner(0);
  for (int32_t i = 1; i <= count; ++i) {
    const Vector2 b = corner(i < count ? i : 0);
    const bool isFar = IsFar(p.x, a.x, b.x, reach) || IsFar(p.y, a.y, b.y, reach);
    if (!isFar && IsNearEdge(p, a, b, squaredTolerance)) return true;
    a = b;
  }
  return false;
}

// The coordinates x of two points, or of points 0, 2, 1 and 3.
template <int kLanes, class Point>
[[gnu::always_inline]] inline auto LoadX(const Point* points) {
  using Doubles = typename Mp::Lanes<kLanes>::Doubles;
  if constexpr (kLanes == 2) {
    return Doubles{points[0].x, points[1].x};
  } else if constexpr (sizeof(Point) == 2 * sizeof(double)) {
    return __builtin_shufflevector(Mp::Load<Doubles>(points), Mp::Load<Doubles>(points + 2), 0, 4,
                                   2, 6);
  } else {
    return Doubles{points[0].x, points[2].x, points[1].x, points[3].x};
  }
}

// Bit i tells whether point i lies before x, for up to 64 points.
template <int kLanes, class Point>
[[gnu::always_inline]] inline uint64_t FindBefore(const Point* points, int32_t count,
                                                  decltype(Point::x) x) {
  using Bits = typename Mp::Lanes<kLanes>::Bits;
  const auto limit = typename Mp::Lanes<kLanes>::Doubles{} + double{x};
  // Of the first points, in the order in which they are loaded.
  Bits places = {1, 2};
  if constexpr (kLanes == 4) places = Bits{1, 4, 2, 8};
  Bits groups = {};
  uint64_t before = 0;
  const int32_t whole = count - count % kLanes;
  for (int32_t i = whole; i < count; ++i) before |= uint64_t{points[i].x < x} << i;
  for (int32_t i = whole - kLanes; i >= 0; i -= kLanes) {
    groups = groups << kLanes | (static_cast<Bits>(LoadX<kLanes>(points + i) < limit) & places);
  }
  for (int lane = 0; lane < kLanes; ++lane) before |= groups[lane];
  return before;
}

// Bit i tells whether edge i, from point i on to the next, straddles x, for up to 64 edges; `end`
// is behind the last. A point at x lies behind it: so a vertex belongs to one of its edges, and an
// upright edge to nobody.
template <int kLanes, class Point>
[[gnu::always_inline]] inline uint64_t FindStraddling(const Point* points, int32_t count,
                                                      const Point& end, decltype(Point::x) x) {
  const uint64_t before = FindBefore<kLanes>(points, count, x);
  return before ^ (before >> 1 | uint64_t{end.x < x} << (count - 1));
}

constexpr int32_t kBlock = 64;

// The edges of a polygon that straddle x; returns how many.
template <int kLanes, class Point>
[[gnu::always_inline]] inline int32_t ListStraddling(const Point* poly, int32_t count,
                                                     decltype(Point::x) x, int32_t* edges) {
  int32_t found = 0;
  int32_t size;
  for (int32_t i = 0; i < count; i += size) {
    size = std::min(count - i, kBlock);
    const Point& end = poly[i + size < count ? i + size : 0];
    uint64_t straddling = FindStraddling<kLanes>(poly + i, size, end, x);
    for (; straddling != 0; straddling &= straddling - 1) {
      edges[found++] = i + std::countr_zero(straddling);
    }
  }
  return found;
}

template <class Point>
MP_TARGET_AVX2 int32_t ListWithAvx2(const Point* poly, int32_t count, decltype(Point::x) x,
                                    int32_t* edges) {
  return ListStraddling<4>(poly, count, x, edges);
}

// A point that all points of the polygon coincide with.
bool IsAtPoint(const Vector2& p, const Vector2& q, double squaredTolerance) {
  return squaredTolerance > 0 ? squaredTolerance >= SquaredDistance(p, q)
                              : p.x == q.x && p.y == q.y;
}

bool IsAtPoint(const M_Vector2T<float>& p, const M_Vector2T<float>& q, double squaredTolerance) {
  const float dx = p.x - q.x;
  const float dy = p.y - q.y;
  return squaredTolerance > 0 ? squaredTolerance >= dx * dx + dy * dy : p.x == q.x && p.y == q.y;
}

// Points that repeat the one before are no corners, and the edges between them no edges: such an
// edge straddles nothing and has no ends of its own. So the polygon is taken as it is, unless it is
// a single point.
template <class Point>
bool IsInside(const Point& p, const Point* poly, int32_t count, double squaredTolerance) {
  std::unique_ptr<int32_t[]> edges;
  if (count > kBlock) edges.reset(new int32_t[static_cast<size_t>(count)]);

  const auto isFirst = [&](const Point& q) { return IsSameBitwise(q, poly[0]); };
  if (std::all_of(poly + 1, poly + count, isFirst)) {
    return IsAtPoint(p, poly[0], squaredTolerance);
  }
  const Vector2 wide = Widen(p);
  const auto corner = [poly](int32_t i) { return Widen(poly[i]); };
  if (squaredTolerance > 0 && IsNearOutline(wide, corner, count, squaredTolerance)) return true;

  bool isOdd = false;
  // Whether the point is on an edge; else the edge counts if it lies above. One with a NaN does no
  // harm: what is computed for it is a NaN.
  const auto isOn = [&](int32_t edge) {
    const Vector2 a = corner(edge);
    const Vector2 b = corner(edge + 1 < count ? edge + 1 : 0);
    const double y = (wide.x - b.x) / (a.x - b.x) * (a.y - b.y) + b.y;
    isOdd ^= y > wide.y;
    return Mp::IsNearlyEqual(y, wide.y);
  };
  if (count <= kBlock) {
    uint64_t straddling = FindStraddling<2>(poly, count, poly[0], p.x);
    for (; straddling != 0; straddling &= straddling - 1) {
      if (isOn(std::countr_zero(straddling))) return true;
    }
    return isOdd;
  }
  const int32_t found = Mp::HasAvx2() ? ListWithAvx2(poly, count, p.x, edges.get())
                                      : ListStraddling<2>(poly, count, p.x, edges.get());
  return std::any_of(edges.get(), edges.get() + found, isOn) || isOdd;
}

// Twice the signed area of a triangle, or of a quadrilateral by its diagonals.
double Cross(const Vector2& from1, const Vector2& to1, const Vector2& from2, const Vector2& to2) {
  return (to1.x - from1.x) * (to2.y - from2.y) - (to1.y - from1.y) * (to2.x - from2.x);
}

template <class Point>
int32_t HitTest(const Point* point, const Point* poly, int32_t count, double tolerance,
                unsigned char* inside) {
  *inside = 0;
  if (count < 1) return 0;
  try {
    *inside = IsInside(*point, poly, count, tolerance * tolerance);
    return 0;
  } catch (const std::exception& thrown) {
    return U_TranslateAndReportException(thrown);
  } catch (int code) {
    return code;
  }
}

}  // namespace

// A template is exported where it is defined.
#pragma GCC visibility push(default)

template <>
int32_t M_IsFloatPointInConcavePoly(const M_Vector2T<double>* point, const M_Vector2T<double>* poly,
                                    int32_t count, double tolerance, unsigned char* inside) {
  return HitTest(point, poly, count, tolerance, inside);
}
template <>
int32_t M_IsFloatPointInConcavePoly(const M_Vector2T<float>* point, const M_Vector2T<float>* poly,
                                    int32_t count, double tolerance, unsigned char* inside) {
  return HitTest(point, poly, count, tolerance, inside);
}

#pragma GCC visibility pop

extern "C" {

int32_t M_IsFloatPointInQuad(const M_Vector2T<double>* point, const M_Vector2T<double>* quad,
                             unsigned char* inside) {
  return M_IsFloatPointInConcavePoly(point, quad, 4, 0.0, inside);
}

double M_SignedPolygonArea2D(const M_Vector2T<double>* poly, int32_t count) {
  if (count < 3) return 0.0;
  if (count == 3) return 0.5 * Cross(poly[0], poly[1], poly[1], poly[2]);
  if (count == 4) return 0.5 * Cross(poly[0], poly[2], poly[1], poly[3]);
  // Quadrilaterals with a corner in point 0, and a triangle for an odd one.
  double sum = 0;
  for (int32_t i = 2; i + 1 < count; i += 2) {
    sum += Cross(poly[0], poly[i], poly[i - 1], poly[i + 1]);
  }
  if (count % 2 != 0) sum += Cross(poly[0], poly[count - 2], poly[count - 2], poly[count - 1]);
  return sum * 0.5;
}

int32_t M_IsQuadEdgeOn(const M_Matrix4* matrix, const M_Vector3T<double>* corners,
                       unsigned char useZAxis, unsigned char* isEdgeOn, double tolerance) {
  *isEdgeOn = 0;
  M_Vector4T<double> points[4];
  Vector3 flat[4];
  for (int i = 0; i < 4; ++i) points[i] = {corners[i].x, corners[i].y, corners[i].z, 1};
  if (const int32_t code = M_TransformVector4(matrix, 4, points)) return code;
  for (int i = 0; i < 4; ++i) flat[i] = {points[i].x, points[i].y, points[i].z};

  M_PlaneEq plane;
  M_GetPlaneEquation(flat, 4, &plane, nullptr);
  const Vector3 normal = {plane.a, plane.b, plane.c};
  const double length = Mp::Length(normal);
  // From the eye at the origin to the middle of the quad.
  Vector3 view = {0, 0, 1};
  if (useZAxis == 0) {
    const Vector3 sum = Mp::Sum(Mp::Sum(Mp::Sum(flat[0], flat[1]), flat[2]), flat[3]);
    view = Mp::Divided(sum, 4);
  }
  const double distance = Mp::Length(view);
  if (!(length > Mp::kTolerance) || !(distance > Mp::kTolerance)) return 0;
  const double cosine = Mp::Dot(Mp::Divided(normal, length), Mp::Divided(view, distance));
  *isEdgeOn = -tolerance < cosine && cosine < tolerance;
  return 0;
}

}  // extern "C"
