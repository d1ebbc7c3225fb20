// A hull turns left everywhere and contains its points, to within a step of its lattice.

#include <algorithm>

#include "Input.h"

void Run(Input& input) {
  const bool isUsual = input.Below(4) != 0;
  std::vector<Vector2> points = input.Points(3000), hull;
  if (!isUsual) {
    for (Vector2& p : points) p = {p.x * std::exp(p.y), input.Any<double>()};
  }
  // Enough of them to be sorted by digits.
  if (input.Below(4) == 0 && !points.empty()) {
    for (size_t i = points.size(); i < 1500; ++i) points.push_back(points[i * 7 % points.size()]);
  }
  M_ComputeConvexHull(points.cbegin(), points.cend(), hull);
  Require(hull.size() <= points.size() && hull.empty() == points.empty());
  M_IsConvex(hull.cbegin(), hull.cend());
  if (!isUsual || points.size() < 4 || hull.size() < 3) return;
  const auto [left, right] =
      std::minmax_element(points.begin(), points.end(), [](auto& a, auto& b) { return a.x < b.x; });
  const auto [top, bottom] =
      std::minmax_element(points.begin(), points.end(), [](auto& a, auto& b) { return a.y < b.y; });
  const double size = std::max(right->x - left->x, bottom->y - top->y);
  const Vector2 first = *left, last = *right;
  const bool isLine = std::all_of(points.begin(), points.end(),
                                  [&](const Vector2& p) { return Turn(first, last, p) == 0; });
  for (size_t i = 0; i < hull.size() && !isLine; ++i) {
    const Vector2 &a = hull[i], &b = hull[(i + 1) % hull.size()];
    Require(Turn(a, b, hull[(i + 2) % hull.size()]) > -size * size * 1e-8);
    for (const Vector2& p : points) Require(Turn(a, b, p) >= -size * size * 1e-8);
  }
}
