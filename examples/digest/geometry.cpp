// Lines, planes, polygons, hulls, and quads on their way to the screen.

#include "Area.h"
#include "qelcore/geom/PointT.h"

namespace digest {
namespace {

using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;
using Vector4 = M_Vector4T<double>;

// A point of the unit circle without a sine, t from -1 to 1 and mirrored.
Vector2 OnCircle(Operands& operands) {
  const double t = operands.Word() / 2147483648.0 - 1;
  const double x = (1 - t * t) / (1 + t * t);
  return {operands.Below(2) ? x : -x, 2 * t / (1 + t * t)};
}

// A point in one of some shapes, each with hulls of its own kind.
Vector2 InShape(Operands& operands, uint32_t shape) {
  const Vector2 p = OnCircle(operands);
  const double coordinate = operands.Word() / 4294967296.0;
  switch (shape) {
    case 0:
      return p;
    case 1:
      return {p.x * coordinate, p.y * coordinate};
    case 2:
      return {static_cast<double>(operands.Below(7)), static_cast<double>(operands.Below(5))};
    case 3:
      return {coordinate * 3, coordinate * -2};
    case 4:
      return {1e9 + coordinate, 1e-9 * p.y};
    default:
      operands.BeginCall();
      return operands.Make<Vector2>();
  }
}
constexpr uint32_t kShapes = 6;

template <class Point>
void Hulls(Area& area, const char* name) {
  area.Begin(name);
  Operands& operands = area.operands();
  for (uint32_t i = 0; i < 600; ++i) {
    const uint32_t shape = i % kShapes;
    const uint32_t count = i < 594 ? operands.Below(i < 300 ? 24 : 300) : 3000;
    std::vector<Point> points(count), hull;
    for (Point& p : points) {
      const Vector2 at = InShape(operands, shape);
      using Coord = decltype(Point::x);
      p.x = static_cast<Coord>(at.x);
      p.y = static_cast<Coord>(at.y);
    }
    if (i % 2 == 0) {
      M_ComputeConvexHull(points.cbegin(), points.cend(), hull);
    } else {
      const Point* const first = points.data();
      M_ComputeConvexHull(first, first + count, hull);
    }
    area.Add(static_cast<uint32_t>(hull.size()));
    for (Point& p : hull) ForEachNumber(p, [&](auto& number) { area.Add(number); });
  }
}

template <class Point>
void Convexity(Area& area, const char* name) {
  area.Begin(name);
  Operands& operands = area.operands();
  for (int i = 0; i < Area::kTimes; ++i) {
    std::vector<Point> points(operands.Below(7));
    for (Point& p : points) {
      const Vector2 at = InShape(operands, static_cast<uint32_t>(i) % kShapes);
      p.x = at.x;
      p.y = at.y;
    }
    const Point* const first = points.data();
    area.Add(M_IsConvex(points.cbegin(), points.cend()));
    area.Add(M_IsConvex(first, first + points.size()));
  }
}

template <class Point>
void HitTests(Area& area, const char* name) {
  area.Begin(name);
  Operands& operands = area.operands();
  for (uint32_t i = 0; i < Area::kTimes; ++i) {
    const uint32_t count = i % 50 == 0 ? 65 + operands.Below(200) : operands.Below(12);
    std::vector<Point> poly(count + 1);
    for (Point& p : poly) {
      const Vector2 at = InShape(operands, i % kShapes);
      p = {static_cast<decltype(p.x)>(at.x), static_cast<decltype(p.y)>(at.y)};
    }
    const double tolerance = operands.Below(2) ? 0 : operands.Word() / 1e10;
    unsigned char isInside = 7;
    area.Add(M_IsFloatPointInConcavePoly(&poly[count], poly.data(), static_cast<int32_t>(count),
                                         tolerance, &isInside));
    area.Add(isInside);
  }
}

void Clipping(Area& area) {
  area.Begin("M_PolyPolyClip2D");
  Operands& operands = area.operands();
  for (int i = 0; i < Area::kTimes; ++i) {
    std::vector<Vector4> clipper, subject, result;
    // Half of them convex clippers that cut what is in the unit circle, the others anything.
    const bool isUsual = i % 2 == 0;
    const uint32_t shape = isUsual ? operands.Below(2) : operands.Below(kShapes);
    std::vector<Vector2> corners(operands.Below(9));
    for (Vector2& p : corners) p = InShape(operands, shape);
    if (isUsual) {
      const std::vector<Vector2> all = corners;
      M_ComputeConvexHull(all.cbegin(), all.cend(), corners);
    }
    for (const Vector2& p : corners) clipper.push_back({p.x, p.y, 0, 1});
    for (uint32_t k = operands.Below(9); k > 0; --k) {
      const Vector2 at = InShape(operands, shape);
      const double z = operands.Make<double>();
      subject.push_back({at.x, at.y, z, operands.Make<double>()});
    }
    M_PolyPolyClip2D(&clipper, &subject, &result);
    area.Add(static_cast<uint32_t>(result.size()));
    for (const Vector4& p : result) area.Add(p);
  }
}

void AddPoly(Area& area, const M_TransformPoly3D& poly) {
  area.Add(poly.points);
  area.Add(poly.clipPoints);
  area.Add(poly.clipped);
  area.Add(poly.polyPointsValid);
  area.Add(poly.IsVisible());
  area.Add(poly.NumPolyPoints());
  for (int i = 0; i < poly.NumPolyPoints(); ++i) {
    Vector2 p;
    poly.GetPolyPoint(i, &p);
    area.Add(p);
  }
  for (int i = 0; i < 4; ++i) {
    Vector2 p = {5, 5};
    std::pair<Vector2, Vector2> edge = {p, p};
    area.Add(poly.GetPoint(i, &p));
    area.Add(poly.GetEdge(i, &edge));
    area.Add(p);
    area.Add(edge.first);
    area.Add(edge.second);
  }
}

void Quads(Area& area) {
  area.Begin("M_TransformPoly2D, M_TransformPoly3D");
  Operands& operands = area.operands();
  for (int i = 0; i < Area::kTimes; ++i) {
    operands.BeginCall();
    M_TransformPoly2D flat;
    area.Add(flat.visible);
    M_TransformPoly3D poly;
    area.Add(poly.clipped);
    for (int corner = 0; corner < 4; ++corner) {
      flat.points[corner] = operands.Make<Vector2>();
      poly.points[corner] = operands.Make<Vector3>();
      poly.clipPoints[corner] = {};
    }
    flat.visible = operands.Below(8) != 0;
    const auto point = operands.Make<Vector2>();
    const auto toEye = operands.Make<M_Matrix4>();
    const auto toScreen = operands.Make<M_Matrix4>();
    const double tolerance = operands.Below(2) ? 0 : operands.Make<double>();
    area.Try([&] { area.Add(flat.IsPointInside(&point, tolerance)); });
    area.Try([&] { area.Add(flat.GetMinimumEdgeDistance(&point)); });
    area.Try([&] { area.Add(M_GetMinimumEdgeDistance(&point, flat)); });
    area.Try([&] {
      poly.TransformPointsToEye(toEye);
      AddPoly(area, poly);
      poly.ClipEdgeToScreen(static_cast<int>(operands.Below(4)));
      AddPoly(area, poly);
      poly.TransformPointsToScreen(toScreen);
      poly.InitPolyPoints();
      AddPoly(area, poly);
      area.Add(poly.IsPointInside(&point, tolerance));
      area.Add(poly.GetMinimumEdgeDistance(&point));
      area.Add(M_GetMinimumEdgeDistance(&point, poly));
      poly.InvalidatePolyPoints();
    });
    AddPoly(area, poly);
  }
}

}  // namespace

void RunLines(Area& area) {
  area.Call(
      "M_GetPlaneEquation",
      +[](const Vector3* points, uint32_t count, M_PlaneEq* plane, Vector3* centroid) {
        return M_GetPlaneEquation(points, static_cast<int32_t>(count % 9 == 0 ? 0 : count % 4 + 1),
                                  plane, centroid);
      },
      0b1000);
  area.Call<M_GetPlaneEquation2>();
  area.Call<M_RayIntersectPlane>(0b110000);
  area.Call<M_PerpDistTo2DLine>(0b1000);
  area.Call<M_Clip3DLine>();
  area.Call<M_ClipLine2Rect>();
}

void RunPolygons(Area& area) {
  HitTests<Vector2>(area, "M_IsFloatPointInConcavePoly(Vector2)");
  HitTests<M_Vector2T<float>>(area, "M_IsFloatPointInConcavePoly(floats)");
  area.Call<M_IsFloatPointInQuad>();
  area.Call(
      "M_SignedPolygonArea2D", +[](const Vector2* poly, uint32_t count) {
        return M_SignedPolygonArea2D(poly, static_cast<int32_t>(count % 5));
      });
  area.Call<M_IsQuadEdgeOn>();
  Clipping(area);
}

void RunHulls(Area& area) {
  Hulls<Vector2>(area, "M_ComputeConvexHull(Vector2)");
  Hulls<Vector3>(area, "M_ComputeConvexHull(Vector3)");
  Hulls<Vector4>(area, "M_ComputeConvexHull(Vector4)");
  Hulls<qelcore::geom::PointT<float>>(area, "M_ComputeConvexHull(PointT<float>)");
  Convexity<Vector2>(area, "M_IsConvex(Vector2)");
  Convexity<Vector3>(area, "M_IsConvex(Vector3)");
  Convexity<Vector4>(area, "M_IsConvex(Vector4)");
}

void RunScreen(Area& area) {
  Quads(area);
  area.Call<M_TransformPoint2DtoScreen>();
  area.Call(
      "M_TransformPoint3DtoScreen", +[](const M_Matrix4& toEye, const M_Matrix4& projection,
                                        const M_Matrix3& toScreen, Vector3* point) {
        return M_TransformPoint3DtoScreen(toEye, projection, toScreen, point);
      });
  area.Call(
      "M_TransformPoint3DtoScreen of the plane",
      +[](const M_Matrix4& toEye, const M_Matrix4& projection, const M_Matrix3& toScreen,
          Vector2* point) {
        return M_TransformPoint3DtoScreen(toEye, projection, toScreen, point);
      });
}

}  // namespace digest
