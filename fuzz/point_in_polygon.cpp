// Where a polygon begins does not matter, nor whether its points repeat.

#include <algorithm>

#include "Input.h"

namespace {

// Exactly, in sixteenths: on an edge that is not upright, its left end left out, or an odd number
// of edges below.
bool IsInside(const Vector2& p, const std::vector<Vector2>& poly) {
  bool isInside = false;
  for (size_t i = 0; i < poly.size(); ++i) {
    const Vector2 &a = poly[i], &b = poly[(i + 1) % poly.size()];
    if ((a.x < p.x) == (b.x < p.x)) continue;
    const double turn = a.x < b.x ? Turn(a, b, p) : Turn(b, a, p);
    if (turn == 0) return true;
    isInside ^= turn < 0;
  }
  return isInside;
}

}  // namespace

void Run(Input& input) {
  const bool isUsual = input.Below(8) != 0;
  const Vector2 p = isUsual ? input.Point() : input.Any<Vector2>();
  const double tolerance = input.Below(2) ? 0 : std::abs(input.Coordinate());
  std::vector<Vector2> poly = input.Points(200);
  const auto isInside = [&](const std::vector<Vector2>& polygon) {
    unsigned char inside = 7;
    Require(M_IsFloatPointInConcavePoly(&p, polygon.data(), static_cast<int32_t>(polygon.size()),
                                        tolerance, &inside) == 0);
    return inside;
  };
  const unsigned char inside = isInside(poly);
  if (poly.empty()) return;
  const bool isPlace = std::all_of(poly.begin(), poly.end(), [&](const Vector2& q) {
    return q.x == poly[0].x && q.y == poly[0].y;
  });
  if (isUsual && tolerance == 0 && !isPlace) Require(inside == IsInside(p, poly));
  std::rotate(poly.begin(), poly.begin() + static_cast<std::ptrdiff_t>(poly.size() / 3),
              poly.end());
  Require(isInside(poly) == inside);
  std::vector<Vector2> twice;
  for (const Vector2& q : poly) twice.insert(twice.end(), 2, q);
  Require(isInside(twice) == inside);
}
