// Where a polygon begins does not matter, nor whether its points repeat.

#include <algorithm>

#include "Input.h"

void Run(Input& input) {
  const Vector2 p = input.Below(8) ? input.Point() : input.Any<Vector2>();
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
  std::rotate(poly.begin(), poly.begin() + static_cast<std::ptrdiff_t>(poly.size() / 3),
              poly.end());
  Require(isInside(poly) == inside);
  if (poly.size() == 4 && tolerance == 0) {
    unsigned char inQuad;
    M_IsFloatPointInQuad(&p, poly.data(), &inQuad);
    Require(inQuad == inside);
  }
  std::vector<Vector2> twice;
  for (const Vector2& q : poly) twice.insert(twice.end(), 2, q);
  Require(isInside(twice) == inside);
}
