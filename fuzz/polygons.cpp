// Polygons of any points: hulls, hit tests, clipping, and quads on their way to the screen.

#include <fuzzer/FuzzedDataProvider.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "M_Matrix.h"

namespace {

using Vector2 = M_Vector2T<double>;
using Polygon = std::vector<M_Vector4T<double>>;

// Any bits or, more often, sixteenths, which meet others often.
template <class Record>
Record Draw(FuzzedDataProvider* bytes, bool isUsual) {
  double numbers[sizeof(Record) / sizeof(double)] = {};
  for (double& number : numbers) {
    number = bytes->ConsumeIntegral<int16_t>() / 16.0;
    if (!isUsual) bytes->ConsumeData(&number, sizeof number);
  }
  Record record;
  std::memcpy(&record, numbers, sizeof record);
  return record;
}

void Require(bool holds) {
  if (!holds) std::abort();
}

void TestQuad(FuzzedDataProvider* bytes, bool isUsual) {
  M_TransformPoly3D quad;
  for (auto& corner : quad.points) corner = Draw<M_Vector3T<double>>(bytes, isUsual);
  quad.TransformPointsToEye(Draw<M_Matrix4>(bytes, isUsual));
  quad.TransformPointsToScreen(Draw<M_Matrix4>(bytes, isUsual));
  quad.InitPolyPoints();
  Require(quad.NumPolyPoints() <= 8 && quad.IsVisible() == (quad.NumPolyPoints() > 0));
  const auto point = Draw<Vector2>(bytes, isUsual);
  quad.IsPointInside(&point, 1.0);
  quad.GetMinimumEdgeDistance(&point);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  FuzzedDataProvider bytes(data, size);
  const bool isUsual = bytes.ConsumeIntegralInRange(0, 3) != 0;
  const double tolerance = bytes.ConsumeBool() ? 0 : bytes.ConsumeIntegral<int16_t>() / 16.0;
  const auto point = Draw<Vector2>(&bytes, isUsual);
  TestQuad(&bytes, isUsual);

  std::vector<Vector2> points, hull;
  while (bytes.remaining_bytes() > 0) points.push_back(Draw<Vector2>(&bytes, isUsual));
  M_ComputeConvexHull(points.cbegin(), points.cend(), hull);
  Require(hull.size() <= points.size() && hull.empty() == points.empty());
  M_IsConvex(hull.cbegin(), hull.cend());

  // Where a polygon begins does not matter, nor whether its points repeat.
  const auto isInside = [&](const std::vector<Vector2>& polygon) {
    unsigned char inside = 7;
    const auto count = static_cast<int32_t>(polygon.size());
    Require(M_IsFloatPointInConcavePoly(&point, polygon.data(), count, tolerance, &inside) == 0);
    return inside;
  };
  std::vector<Vector2> other;
  for (const Vector2& p : points) other.insert(other.end(), 2, p);
  std::rotate(other.begin(), other.begin() + static_cast<std::ptrdiff_t>(points.size()),
              other.end());
  Require(isInside(other) == isInside(points));

  // The result may replace the subject.
  Polygon clipper, subject, result;
  for (const Vector2& p : hull) clipper.push_back({p.x, p.y, 0, 1});
  for (const Vector2& p : points) subject.push_back({p.y, p.x, p.x, p.y});
  M_PolyPolyClip2D(&clipper, &subject, &result);
  M_PolyPolyClip2D(&clipper, &subject, &subject);
  Require(subject.size() == result.size() &&
          (result.empty() ||
           std::memcmp(subject.data(), result.data(), result.size() * sizeof result[0]) == 0));
  return 0;
}
