// Quads on their way to the screen, and points.

#include <algorithm>
#include <cmath>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "Mp_Tolerance.h"

namespace {

using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;
using Vector4 = M_Vector4T<double>;

constexpr int kCorners = 4;
constexpr size_t kMostPolyPoints = 8;
constexpr double kNearPlane = 0.1;

void ThrowOnError(int32_t code) {
  if (code != 0) throw int{code};
}

int Next(int corner) { return (corner + 1) % kCorners; }

Vector2 OnScreen(const Vector3& p) { return {p.x, p.y}; }

// A matrix with a first or second row of zeros makes nothing that can be seen.
bool IsDegenerate(const M_Matrix4& m) {
  for (int i = 0; i < 2; ++i) {
    const double* const row = m.m[i];
    const double sum = row[0] * row[0] + row[1] * row[1] + row[2] * row[2] + row[3] * row[3];
    if (Mp::IsNearZero(sum)) return true;
  }
  return false;
}

bool IsInsideOutline(const Vector2* point, const Vector2* outline, int32_t count,
                     double tolerance) {
  unsigned char inside;
  ThrowOnError(M_IsFloatPointInConcavePoly(point, outline, count, tolerance, &inside));
  return inside != 0;
}

// The visible part of an edge, from its start to its end.
bool VisibleEdge(const M_TransformPoly2D& poly, int edge, Vector2* start, Vector2* end) {
  *start = poly.points[edge];
  *end = poly.points[Next(edge)];
  return true;
}

bool VisibleEdge(const M_TransformPoly3D& poly, int edge, Vector2* start, Vector2* end) {
  const int next = Next(edge);
  const bool isClipped = poly.clipped[edge] != 0;
  const bool isNextClipped = poly.clipped[next] != 0;
  if (isClipped && isNextClipped) return false;
  *start = OnScreen(isClipped ? poly.clipPoints[edge] : poly.points[edge]);
  *end = OnScreen(isNextClipped ? poly.clipPoints[edge] : poly.points[next]);
  return true;
}

double Distance(const Vector2& a, const Vector2& b) {
  const double dx = a.x - b.x;
  const double dy = a.y - b.y;
  return std::sqrt(dx * dx + dy * dy);
}

void ClearFlags(M_TransformPoly3D* poly) {
  for (unsigned char& flag : poly->clipped) flag = 0;
}

template <class Poly>
double MinimumEdgeDistance(const M_Vector2T<double>* point, const Poly& poly) {
  double least = -1.0;
  for (int edge = 0; edge < kCorners; ++edge) {
    Vector2 start, end;
    if (!VisibleEdge(poly, edge, &start, &end)) continue;
    unsigned char onSegment;
    double distance;
    ThrowOnError(M_PerpDistTo2DLine(point, &start, &end, &onSegment, &distance));
    if (onSegment == 0) {
      const double toStart = Distance(*point, start);
      const double toEnd = Distance(*point, end);
      distance = toEnd < toStart ? toEnd : toStart;
    }
    if (least < 0 || distance < least) least = distance;
  }
  return least;
}

}  // namespace

// A template is exported where it is defined.
#pragma GCC visibility push(default)

template <>
double M_GetMinimumEdgeDistance(const M_Vector2T<double>* point, const M_TransformPoly2D& poly) {
  return MinimumEdgeDistance(point, poly);
}
template <>
double M_GetMinimumEdgeDistance(const M_Vector2T<double>* point, const M_TransformPoly3D& poly) {
  return MinimumEdgeDistance(point, poly);
}

#pragma GCC visibility pop

// ---------------------------------------------------------------------------------------------
// 2D
// ---------------------------------------------------------------------------------------------

M_TransformPoly2D::M_TransformPoly2D() : visible(true) {}

M_TransformPoly2D::~M_TransformPoly2D() = default;

bool M_TransformPoly2D::IsPointInside(const M_Vector2T<double>* point, double tolerance) const {
  return visible && IsInsideOutline(point, points, kCorners, tolerance);
}

double M_TransformPoly2D::GetMinimumEdgeDistance(const M_Vector2T<double>* point) const {
  return M_GetMinimumEdgeDistance(point, *this);
}

// ---------------------------------------------------------------------------------------------
// 3D
// ---------------------------------------------------------------------------------------------

M_TransformPoly3D::M_TransformPoly3D() : clipped{}, polyPointsValid(false) {}

M_TransformPoly3D::~M_TransformPoly3D() = default;

void M_TransformPoly3D::TransformPointsToEye(const M_Matrix4& toEye) {
  if (IsDegenerate(toEye)) {
    ClearFlags(this);
    return;
  }
  ThrowOnError(M_Transform3DFloatPoints(&toEye, kCorners, points));
}

void M_TransformPoly3D::TransformPointsToScreen(const M_Matrix4& toScreen) {
  if (IsDegenerate(toScreen)) {
    ClearFlags(this);
    return;
  }
  bool isCut = false;
  for (const Vector3& p : points) isCut |= !(p.z >= kNearPlane);
  if (isCut) {
    for (int edge = 0; edge < kCorners; ++edge) ClipEdgeToScreen(edge);
  } else {
    ClearFlags(this);
    std::fill(clipPoints, clipPoints + kCorners, Vector3{0, 0, 0});
  }
  ThrowOnError(M_Transform3DFloatPoints(&toScreen, kCorners, points));
  ThrowOnError(M_Transform3DFloatPoints(&toScreen, kCorners, clipPoints));
  InvalidatePolyPoints();
}

void M_TransformPoly3D::ClipEdgeToScreen(int edge) {
  const int next = Next(edge);
  clipPoints[edge] = {0, 0, 0};
  unsigned char isClipped, isNextClipped;
  ThrowOnError(
      M_Clip3DLine(&points[edge], &points[next], &isClipped, &isNextClipped, &clipPoints[edge]));
  clipped[edge] = isClipped;
  clipped[next] = isNextClipped;
}

void M_TransformPoly3D::InvalidatePolyPoints() {
  polyPoints.clear();
  polyPointsValid = false;
}

void M_TransformPoly3D::InitPolyPoints() const {
  if (polyPointsValid) return;
  polyPoints.reserve(kMostPolyPoints);
  for (int edge = 0; edge < kCorners; ++edge) {
    Vector2 start, end;
    if (!VisibleEdge(*this, edge, &start, &end)) continue;
    polyPoints.push_back(start);
    if (clipped[Next(edge)] != 0) polyPoints.push_back(end);
  }
  polyPointsValid = true;
}

bool M_TransformPoly3D::IsVisible() const {
  return !(clipped[0] && clipped[1] && clipped[2] && clipped[3]);
}

bool M_TransformPoly3D::GetPoint(int corner, M_Vector2T<double>* out) const {
  if (clipped[corner] != 0) return false;
  *out = OnScreen(points[corner]);
  return true;
}

bool M_TransformPoly3D::GetEdge(int edge,
                                std::pair<M_Vector2T<double>, M_Vector2T<double>>* out) const {
  return VisibleEdge(*this, edge, &out->first, &out->second);
}

int M_TransformPoly3D::NumPolyPoints() const { return static_cast<int>(polyPoints.size()); }

void M_TransformPoly3D::GetPolyPoint(int index, M_Vector2T<double>* out) const {
  *out = polyPoints[static_cast<size_t>(index)];
}

bool M_TransformPoly3D::IsPointInside(const M_Vector2T<double>* point, double tolerance) const {
  // The outline is taken as it stands: it is not made here.
  if (!IsVisible() || polyPoints.empty()) return false;
  return IsInsideOutline(point, polyPoints.data(), NumPolyPoints(), tolerance);
}

double M_TransformPoly3D::GetMinimumEdgeDistance(const M_Vector2T<double>* point) const {
  return M_GetMinimumEdgeDistance(point, *this);
}

// ---------------------------------------------------------------------------------------------
// Points
// ---------------------------------------------------------------------------------------------

extern "C" bool M_TransformPoint2DtoScreen(const M_Matrix3& first, const M_Matrix3& second,
                                           M_Vector2T<double>* point) {
  M_Matrix3 combined = first;
  ThrowOnError(M_ConcatMatrix(&second, &combined));
  ThrowOnError(M_TransformFloatPoints(&combined, 1, point));
  return true;
}

bool M_TransformPoint3DtoScreen(const M_Matrix4& toEye, const M_Matrix4& projection,
                                const M_Matrix3& toScreen, M_Vector3T<double>* point) {
  Vector4 p = {point->x, point->y, point->z, 1};
  toEye.TransformPointAndDivide(&p);
  if (p.z < kNearPlane) return false;
  M_Matrix4 combined;
  ThrowOnError(M_Matrix3ToMatrix4(&toScreen, &combined));
  ThrowOnError(M_ConcatMatrix4(&projection, &combined, &combined));
  p.w = 1;
  combined.TransformPointAndDivide(&p);
  *point = {p.x, p.y, p.z};
  return true;
}

bool M_TransformPoint3DtoScreen(const M_Matrix4& toEye, const M_Matrix4& projection,
                                const M_Matrix3& toScreen, M_Vector2T<double>* point) {
  Vector3 p = {point->x, point->y, 0};
  const bool isSeen = M_TransformPoint3DtoScreen(toEye, projection, toScreen, &p);
  *point = OnScreen(p);
  return isSeen;
}
