// Clipping: whichever way round the clipper runs, and wherever the result goes, it is the same; a
// clipper around the subject changes nothing.

#include <algorithm>

#include "Input.h"

namespace {

using Polygon = std::vector<Vector4>;

bool IsSame(const Polygon& a, const Polygon& b) {
  return a.size() == b.size() &&
         (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(Vector4)) == 0);
}

Polygon Clip(const Polygon& clipper, const Polygon& subject) {
  Polygon result = {{1, 2, 3, 4}};
  M_PolyPolyClip2D(&clipper, &subject, &result);
  return result;
}

}  // namespace

void Run(Input& input) {
  std::vector<Vector2> corners = input.Points(input.Below(9)), hull;
  // A convex clipper for points of any kind; at times whatever was given.
  const bool isConvex = input.Below(4) != 0;
  if (isConvex) {
    M_ComputeConvexHull(corners.cbegin(), corners.cend(), hull);
    corners = hull;
  }
  Polygon clipper, subject;
  for (const Vector2& p : corners) clipper.push_back({p.x, p.y, 0, 1});
  while (!input.IsEmpty()) subject.push_back(input.Usual<Vector4>());
  const Polygon result = Clip(clipper, subject);
  Polygon inPlace = subject;
  M_PolyPolyClip2D(&clipper, &inPlace, &inPlace);
  Require(IsSame(inPlace, result));
  // A subject's points that are all inside stay, in their order.
  const Polygon around = {
      {-5e3, -5e3, 0, 0}, {5e3, -5e3, 0, 0}, {5e3, 5e3, 0, 0}, {-5e3, 5e3, 0, 0}};
  if (subject.size() >= 3) Require(IsSame(Clip(around, subject), subject));
  const double area = M_SignedPolygonArea2D(corners.data(), static_cast<int32_t>(corners.size()));
  if (!isConvex || corners.size() < 3 || !(std::abs(area) > 1)) return;
  std::vector<Vector2> rest;
  for (const Vector4& p : result) rest.push_back({p.x, p.y});
  const double left = M_SignedPolygonArea2D(rest.data(), static_cast<int32_t>(rest.size()));
  Require(std::abs(left) <= std::abs(area) * 1.01 + 1 || subject.size() > 4);
  std::reverse(clipper.begin(), clipper.end());
  Require(IsSame(Clip(clipper, subject), result));
}
