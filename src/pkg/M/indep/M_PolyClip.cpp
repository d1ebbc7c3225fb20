// One polygon clipped by another, edge by edge (Sutherland and Hodgman).

#include <algorithm>
#include <utility>
#include <vector>

#include "M_Matrix.h"
#include "Mp_Tolerance.h"

namespace {

using Point = M_Vector4T<double>;
using Polygon = std::vector<Point>;

// In the measure of a clip line's sides; what is closer to the line is outside.
constexpr double kInside = -1e-6;

// An edge of the clipper, extended, with the side of it that stays.
class ClipLine {
 public:
  ClipLine(const Point& from, const Point& to)
      : dx_(to.x - from.x), dy_(to.y - from.y), e_(dy_ * from.x - dx_ * from.y) {}

  double Side(const Point& q) const { return dx_ * q.y - dy_ * q.x + e_; }

  // Where the line through s and e meets this one; s if they are parallel. z and w lie between
  // theirs, also where both are on one side: then one of them is close to the line and outside.
  Point Intersect(const Point& s, double sideOfS, const Point& e, double sideOfE) const {
    const double sx = e.x - s.x;
    const double sy = e.y - s.y;
    const double f = sy * s.x - sx * s.y;
    const double det = sx * dy_ - sy * dx_;
    if (Mp::IsNearZero(det)) return s;
    const double t = std::clamp(sideOfS / (sideOfS - sideOfE), 0.0, 1.0);
    return {-(f * dx_ - e_ * sx) / det, (e_ * sy - f * dy_) / det, s.z + t * (e.z - s.z),
            s.w + t * (e.w - s.w)};
  }

 private:
  double dx_, dy_, e_;
};

void Clip(const ClipLine& line, const Polygon& polygon, Polygon* clipped) {
  clipped->clear();
  if (polygon.size() < 3) return;
  // Where every second point is outside, two crossings stand for it.
  clipped->reserve(polygon.size() + polygon.size() / 2 + 1);
  const Point* s = &polygon.back();
  double sideOfS = line.Side(*s);
  for (const Point& e : polygon) {
    const double sideOfE = line.Side(e);
    const bool isInside = sideOfE < kInside;
    if (isInside != (sideOfS < kInside)) {
      clipped->push_back(line.Intersect(*s, sideOfS, e, sideOfE));
    }
    if (isInside) clipped->push_back(e);
    s = &e;
    sideOfS = sideOfE;
  }
}

// Whether the polygon's inside is on the side that does not stay, judged by its first edge.
bool IsToBeReversed(const Polygon& clipper) {
  double x = 0;
  double y = 0;
  for (const Point& p : clipper) {
    x += p.x;
    y += p.y;
  }
  const auto count = static_cast<double>(clipper.size());
  const Point& k0 = clipper[0];
  const Point& k1 = clipper[1];
  const double s = (k1.x - k0.x) * (y / count - k0.y) - (k1.y - k0.y) * (x / count - k0.x);
  return !(s < kInside);
}

}  // namespace

extern "C" void M_PolyPolyClip2D(const std::vector<M_Vector4T<double>>* clipper,
                                 const std::vector<M_Vector4T<double>>* subject,
                                 std::vector<M_Vector4T<double>>* result) {
  const size_t count = clipper->size();
  if (count == 0) {
    // A copy first: if that fails, the result is what it was.
    Polygon copy = *subject;
    result->swap(copy);
    return;
  }
  const bool isReversed = count > 1 && IsToBeReversed(*clipper);
  const auto vertex = [&](size_t k) -> const Point& {
    return (*clipper)[isReversed ? count - 1 - k : k];
  };
  Polygon clipped;
  Polygon next;
  const Polygon* polygon = subject;
  for (size_t k = 0; k < count; ++k) {
    Clip(ClipLine(vertex(k == 0 ? count - 1 : k - 1), vertex(k)), *polygon, &next);
    clipped.swap(next);
    polygon = &clipped;
  }
  result->swap(clipped);
}
