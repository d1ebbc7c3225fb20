#include "Stage.h"

#include <algorithm>
#include <cmath>
#include <iterator>
#include <utility>

#include "Layout.h"
#include "Scene.h"

namespace comp {
namespace {

// From the eye to pixels: a point at the camera's zoom keeps its distance from the middle.
M_Matrix4 MakeProjection(const Camera& camera, const Size& frame) {
  M_Matrix4 m = {};
  m.m[0][0] = m.m[1][1] = camera.zoom;
  m.m[2][0] = frame.width / 2.0;
  m.m[2][1] = frame.height / 2.0;
  m.m[2][3] = 1;
  m.m[3][2] = 1;
  return m;
}

Shape MakeFlat(const Layer& layer) {
  Shape shape = {};
  const auto corners = CornersOf(*layer.placement);
  std::copy(corners.begin(), corners.end(), shape.flat.points);
  shape.outline.assign(corners.begin(), corners.end());
  shape.isEdgeOn = M_SignedPolygonArea2D(corners.data(), 4) == 0;
  return shape;
}

Shape MakeSolid(const Layer& layer, const M_Matrix4& view, const M_Matrix4& projection,
                std::optional<double> frame) {
  Shape shape = {};
  shape.isInSpace = true;
  const M_Matrix4 world = WorldMatrix(*layer.space, frame);
  M_Matrix4 toEye;
  M_ConcatMatrix4(&world, &view, &toEye);
  const double width = layer.space->size.width;
  const double height = layer.space->size.height;
  const M_Vector3T<double> corners[4] = {
      {0, 0, 0}, {width, 0, 0}, {width, height, 0}, {0, height, 0}};
  std::copy(corners, corners + 4, shape.solid.points);
  unsigned char isEdgeOn;
  M_IsQuadEdgeOn(&toEye, corners, 0, &isEdgeOn, 0.001);
  shape.isEdgeOn = isEdgeOn != 0;
  shape.solid.TransformPointsToEye(toEye);
  for (const auto& corner : shape.solid.points) shape.depth += corner.z / 4;
  shape.solid.TransformPointsToScreen(projection);
  shape.solid.InitPolyPoints();
  shape.outline.assign(shape.solid.polyPoints.begin(), shape.solid.polyPoints.end());
  return shape;
}

}  // namespace

std::vector<Shape> MakeShapes(const Composition& composition, const Sheet& sheet,
                              std::optional<double> frame, ReportCollector& collector) {
  const M_Matrix4 view = MakeView(*composition.camera);
  const M_Matrix4 projection = MakeProjection(*composition.camera, *composition.size);
  std::vector<Shape> shapes;
  for (size_t i = composition.layers.size(); i-- > 0;) {
    const Layer& layer = composition.layers[i];
    const Row& row = sheet.rows[i];
    const auto frameOf = [](const Time& time) { return static_cast<double>(time.frames.count); };
    const bool isOn = !frame || (frameOf(row.in) <= *frame && *frame < frameOf(row.out));
    if (!isOn || (!layer.placement && !layer.space)) continue;
    collector.SetLayer(layer.name);
    Shape shape = layer.space ? MakeSolid(layer, view, projection, frame) : MakeFlat(layer);
    shape.name = &layer.name;
    shape.number = i;
    if (!shape.outline.empty()) shapes.push_back(std::move(shape));
  }
  for (auto begin = shapes.begin(); begin != shapes.end();) {
    const auto isSame = [&](const Shape& s) { return s.isInSpace == begin->isInSpace; };
    const auto end = std::find_if_not(begin, shapes.end(), isSame);
    if (begin->isInSpace) {
      std::stable_sort(begin, end,
                       [](const Shape& a, const Shape& b) { return a.depth > b.depth; });
    }
    begin = end;
  }
  return shapes;
}

std::vector<Hit> HitsAt(const std::vector<Shape>& shapes, const M_Vector2T<double>& point,
                        double tolerance) {
  std::vector<Hit> hits;
  for (auto shape = shapes.rbegin(); shape != shapes.rend(); ++shape) {
    if (!shape->IsHit(point, tolerance)) continue;
    hits.push_back({*shape->name, shape->number, shape->EdgeDistance(point)});
  }
  return hits;
}

std::vector<M_Vector2T<double>> ClippedLine(const std::vector<M_Vector2T<double>>& outline,
                                            const M_FloatRect& box) {
  using Point = M_Vector2T<double>;
  if (outline.empty()) return {};
  const auto farthest = [&](const Point& from) {
    const auto distance = [&](const Point& p) { return std::hypot(p.x - from.x, p.y - from.y); };
    return *std::max_element(outline.begin(), outline.end(), [&](const Point& a, const Point& b) {
      return distance(a) < distance(b);
    });
  };
  const Point start = farthest(outline[0]), end = farthest(start);
  // From side to side, the part of the way that is in.
  double first = 0, last = 1;
  const auto hold = [&](double from, double to, double low, double high) {
    const double way = to - from;
    if (way == 0 && (from < low || from > high)) last = -1;
    if (way == 0) return;
    const double a = (low - from) / way, b = (high - from) / way;
    first = std::max(first, std::min(a, b));
    last = std::min(last, std::max(a, b));
  };
  hold(start.x, end.x, box.left, box.right);
  hold(start.y, end.y, box.top, box.bottom);
  const double length = std::hypot(end.x - start.x, end.y - start.y);
  if (!std::isfinite(length) || !(first <= last)) return {};
  const auto at = [&](double t) {
    return Point{start.x + (end.x - start.x) * t, start.y + (end.y - start.y) * t};
  };
  return {at(first), at(last)};
}

Homogeneous Clipped(const std::vector<M_Vector2T<double>>& outline, const M_FloatRect& box) {
  Homogeneous part;
  for (const auto& p : outline) {
    if (!std::isfinite(p.x) || !std::isfinite(p.y)) return {};
    part.push_back({p.x, p.y, 0, 1});
  }
  const Homogeneous clipper = {{box.left, box.top, 0, 1},
                               {box.right, box.top, 0, 1},
                               {box.right, box.bottom, 0, 1},
                               {box.left, box.bottom, 0, 1}};
  M_PolyPolyClip2D(&clipper, &part, &part);
  // What is too far away to be cut.
  for (const auto& p : part) {
    if (!std::isfinite(p.x) || !std::isfinite(p.y)) return {};
  }
  return part;
}

}  // namespace comp
