// Planes, lines, angles and clipping.

#include <cmath>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "Mp_Err.h"
#include "Mp_Out.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector3.h"

namespace {

using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;

constexpr double kPi = 3.141592653589793;
constexpr double kDegree = 0.017453292519943295;
constexpr double kDegreesPerRadian = 57.29577951308232;

// The z in eye space from which on a point is seen.
constexpr double kNearPlane = 0.1;

bool IsClipped(const Vector3& p) { return p.z < kNearPlane; }

Vector3 Normal(const M_PlaneEq& plane) { return {plane.a, plane.b, plane.c}; }

Vector3 InSpace(const Vector2& v) { return {v.x, v.y, 0}; }
Vector3 WithoutW(const M_Vector4T<double>& v) { return {v.x, v.y, v.z}; }

Vector3 PointOnLine(const Vector3& start, double t, const Vector3& direction) {
  return Mp::Sum(start, Mp::Scaled(direction, t));
}

bool IsInside(const M_FloatRect& r, const Vector2& p) {
  return r.left <= p.x && p.x <= r.right && r.top <= p.y && p.y <= r.bottom;
}

double Least(double a, double b) { return a < b ? a : b; }
double Greatest(double a, double b) { return a > b ? a : b; }

// Whether the extent from a to b, or that between two edges, is empty, or the two do not overlap.
bool IsApart(double edge, double otherEdge, double a, double b) {
  const double low = Least(a, b);
  const double high = Greatest(a, b);
  return edge >= otherEdge || low >= high || !(Least(otherEdge, high) > Greatest(edge, low));
}

// Moves p along the line to q until one of its coordinates reaches the edge. False where it never
// does.
bool MoveToEdge(Vector2* p, const Vector2& q, double Vector2::*across, double Vector2::*along,
                double edge) {
  const double distance = p->*across - q.*across;
  if (distance == 0) return false;
  const double t = (p->*across - edge) / distance;
  p->*across = edge;
  p->*along += t * (q.*along - p->*along);
  return true;
}

// Brings p into the rectangle, first by x and then by y.
bool Clip(const M_FloatRect& r, Vector2* p, const Vector2& q) {
  if (p->x < r.left) {
    if (!MoveToEdge(p, q, &Vector2::x, &Vector2::y, r.left)) return false;
  } else if (p->x > r.right) {
    if (!MoveToEdge(p, q, &Vector2::x, &Vector2::y, r.right)) return false;
  }
  if (p->y < r.top) return MoveToEdge(p, q, &Vector2::y, &Vector2::x, r.top);
  if (p->y > r.bottom) return MoveToEdge(p, q, &Vector2::y, &Vector2::x, r.bottom);
  return true;
}

}  // namespace

extern "C" {

int32_t M_GetPlaneEquation(const M_Vector3T<double>* points, int32_t count, M_PlaneEq* plane,
                           M_Vector3T<double>* centroid) {
  Vector3 normal = {0, 0, 0};
  Vector3 sum = {0, 0, 0};
  for (int32_t i = 0; i < count; ++i) {
    const Vector3& p = points[i];
    const Vector3& q = points[i + 1 < count ? i + 1 : 0];
    normal.x += (p.y - q.y) * (p.z + q.z);
    normal.y += (p.z - q.z) * (p.x + q.x);
    normal.z += (p.x - q.x) * (p.y + q.y);
    sum = Mp::Sum(sum, p);
  }
  const double length = Mp::Length(normal);
  if (length > Mp::kTolerance) normal = Mp::Divided(normal, length);
  // Of no points at all the mean is a NaN.
  const Vector3 mean = Mp::Scaled(sum, 1.0 / count);
  Mp::Store(centroid, mean);
  return M_GetPlaneEquation2(&mean, &normal, plane);
}

int32_t M_GetPlaneEquation2(const M_Vector3T<double>* point, const M_Vector3T<double>* normal,
                            M_PlaneEq* plane) {
  *plane = {normal->x, normal->y, normal->z, -Mp::Dot(*normal, *point)};
  return 0;
}

int32_t M_RayIntersectPlane(const M_PlaneEq* plane, int32_t forwardOnly, const M_Ray* ray,
                            M_Vector3T<double>* hit, unsigned char* behind, unsigned char* ok) {
  const Vector3 normal = Normal(*plane);
  const Vector3 origin = WithoutW(ray->origin);
  const Vector3 direction = WithoutW(ray->direction);
  const double slope = Mp::Dot(normal, direction);
  double t = 0;
  bool isHit = false;
  if (!Mp::IsNearZero(slope)) {
    t = -(Mp::Dot(normal, origin) + plane->d) / slope;
    // A flag of which clients set the low byte only.
    isHit = t > 0 || static_cast<unsigned char>(forwardOnly) == 0;
  }
  Mp::Store(behind, t < 0);
  *hit = PointOnLine(origin, t, direction);
  Mp::Store(ok, isHit);
  if (ok || isHit) return 0;
  return Mp_ReportErr(Mp_PLACE_RAY_INTERSECT_PLANE, M_ERR_NO_PLANE_INTERSECTION, 0);
}

int32_t M_PerpDistTo2DLine(const M_Vector2T<double>* point, const M_Vector2T<double>* a,
                           const M_Vector2T<double>* b, unsigned char* onSegment,
                           double* distance) {
  const Vector3 segment = Mp::Difference(InSpace(*b), InSpace(*a));
  const Vector3 v = Mp::Difference(InSpace(*point), InSpace(*a));
  const double length = Mp::Length(segment);
  const double r = length > Mp::kTolerance ? 1.0 / length : 0;
  // Too short, or so long that nothing is left of its reciprocal.
  if (Mp::IsNearZero(r)) {
    Mp::Store(onSegment, 0);
    *distance = Mp::Length(v);
    return 0;
  }
  const Vector3 u = Mp::Divided(segment, length);
  const double t = Mp::Dot(v, u);
  // Kept on purpose: cheaper than to ask whether the foot lies on the segment.
  Mp::Store(onSegment, t >= 0 && Mp::Length(v) <= length);
  *distance = Mp::Length(Mp::Difference(v, Mp::Scaled(u, t)));
  return 0;
}

int32_t M_Clip3DLine(const M_Vector3T<double>* p0, const M_Vector3T<double>* p1,
                     unsigned char* p0Clipped, unsigned char* p1Clipped,
                     M_Vector3T<double>* crossing) {
  const bool isNone = p0->z >= kNearPlane && p1->z >= kNearPlane;
  const bool isAll = IsClipped(*p0) && IsClipped(*p1);
  *p0Clipped = *p1Clipped = isAll;
  if (isNone || isAll) {
    *crossing = {0, 0, 0};
    return 0;
  }
  const bool isP1 = p0->z > p1->z;
  const Vector3 clipped = isP1 ? *p1 : *p0;
  const Vector3 seen = isP1 ? *p0 : *p1;
  // Last, so that both flags may be the same.
  *(isP1 ? p1Clipped : p0Clipped) = 1;
  const double t = (kNearPlane - clipped.z) / std::abs(seen.z - clipped.z);
  *crossing = PointOnLine(clipped, t, Mp::Difference(seen, clipped));
  return 0;
}

int32_t M_ClipLine2Rect(const M_FloatRect* rect, M_Vector2T<double>* p0, M_Vector2T<double>* p1,
                        unsigned char* visible) {
  const bool isInside0 = IsInside(*rect, *p0);
  const bool isInside1 = IsInside(*rect, *p1);
  if (isInside0 && isInside1) {
    *visible = 1;
    return 0;
  }
  // Kept on purpose: a horizontal or vertical line that sticks out counts as not visible.
  if (IsApart(rect->left, rect->right, p0->x, p1->x) ||
      IsApart(rect->top, rect->bottom, p0->y, p1->y)) {
    *visible = 0;
    return 0;
  }
  const bool isClipped = (isInside0 || Clip(*rect, p0, *p1)) && (isInside1 || Clip(*rect, p1, *p0));
  *visible = isClipped && (IsInside(*rect, *p0) || IsInside(*rect, *p1));
  return 0;
}

M_DirectionalComponents M_ComputeDirectionalComponents(const M_Matrix3& m) {
  Vector2 points[3] = {{1, 0}, {0, 1}, {0, 0}};
  M_TransformFloatPoints(&m, 3, points);
  return {{points[0].x - points[2].x, points[0].y - points[2].y},
          {points[1].x - points[2].x, points[1].y - points[2].y}};
}

double M_VecToAngle(const M_Vector2T<double>& v) {
  double a = 0;
  if (v.x != 0) {
    a = std::atan2(-v.y, v.x) * kDegreesPerRadian;
  } else if (v.y < 0) {
    a = 90;
  } else if (v.y > 0) {
    a = -90;
  }
  // From 270 to 630.
  const double bearing = 360 - a + 90;
  return bearing > 360 ? bearing - 360 : bearing;
}

int32_t M_Pt2Angle(const M_FloatRect* rect, const M_Vector2T<double>* point, double* angle) {
  // 90 pi. The division below differs in the last bits from what M_VecToAngle does.
  constexpr double kQuarterTurn = 282.7433388230814;
  const double dx = point->x - (rect->left + rect->right) * 0.5;
  const double dy = point->y - (rect->top + rect->bottom) * 0.5;
  double a = 0;
  if (dx != 0) {
    a = std::atan2(-dy, dx) * 180;
  } else if (dy < 0) {
    a = kQuarterTurn;
  } else if (dy > 0) {
    a = -kQuarterTurn;
  }
  a = a / -kPi + 360 + 90;
  // From 270 to 630.
  if (a > 360) a -= 360;
  *angle = a;
  return 0;
}

int32_t M_TransformPtF(const M_Vector2T<float>* centre, double angle, M_Vector2T<float>* point) {
  const M_Vector2T<float> about = *centre;
  // Kept on purpose: the sine and cosine of an angle that is a quarter turn behind.
  const double x = (angle - 90) * kDegree;
  const double s = std::sin(x);
  const double c = std::cos(x);
  const double dx = point->x - about.x;
  const double dy = point->y - about.y;
  point->x = static_cast<float>(-dy * c - s * dx) + about.x;
  point->y = static_cast<float>(c * dx - s * dy) + about.y;
  return 0;
}

}  // extern "C"
