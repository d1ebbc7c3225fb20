#include "Picture.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iterator>
#include <utility>

#include "Layout.h"
#include "Reports.h"
#include "Scene.h"
#include "Sheet.h"
#include "Wording.h"

namespace comp {
namespace {

using Point = M_Vector2T<double>;

// A layer on the screen.
struct Shape {
  std::string name;
  size_t number;  ///< In the list of layers, for its colour.
  bool isInSpace;
  double depth;  ///< How far from the eye its middle is.
  bool isEdgeOn;
  std::vector<Point> outline;  ///< Of what lies behind the near plane.
  M_TransformPoly2D flat;
  M_TransformPoly3D solid;

  bool IsHit(const Point& p, double tolerance) const {
    return isInSpace ? solid.IsPointInside(&p, tolerance) : flat.IsPointInside(&p, tolerance);
  }
  double EdgeDistance(const Point& p) const {
    return isInSpace ? solid.GetMinimumEdgeDistance(&p) : flat.GetMinimumEdgeDistance(&p);
  }
};

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

Shape MakeSolid(const Layer& layer, const Scene& scene, const Size& frame,
                const PictureOptions& options) {
  Shape shape = {};
  shape.isInSpace = true;
  const M_Matrix4 world = WorldMatrix(*layer.space, options.frame);
  M_Matrix4 toEye;
  M_ConcatMatrix4(&world, &scene.view, &toEye);
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
  shape.solid.TransformPointsToScreen(MakeProjection(scene.camera, frame));
  shape.solid.InitPolyPoints();
  shape.outline.assign(shape.solid.polyPoints.begin(), shape.solid.polyPoints.end());
  return shape;
}

// From back to front: as the list has them, but neighbours in space by their depth.
std::vector<Shape> MakeShapes(const Composition& composition, const Sheet& sheet,
                              const PictureOptions& options) {
  // What is reported here is in the sheet's reports.
  ReportCollector collector;
  const Scene scene = MakeScene(composition, collector);
  std::vector<Shape> shapes;
  for (size_t i = composition.layers.size(); i-- > 0;) {
    const Layer& layer = composition.layers[i];
    const Row& row = sheet.rows[i];
    const auto frameOf = [](const Time& time) { return static_cast<double>(time.frames.count); };
    const bool isOn =
        !options.frame || (frameOf(row.in) <= *options.frame && *options.frame < frameOf(row.out));
    if (!isOn || (!layer.placement && !layer.space)) continue;
    Shape shape =
        layer.space ? MakeSolid(layer, scene, *composition.size, options) : MakeFlat(layer);
    shape.name = layer.name;
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

const char* Color(size_t number) {
  static constexpr const char* kColors[] = {"#4e79a7", "#f28e2b", "#e15759", "#76b7b2",
                                            "#59a14f", "#edc948", "#b07aa1", "#9c755f"};
  return kColors[number % std::size(kColors)];
}

template <class Points>
std::string PointList(const Points& points) {
  std::string text;
  for (const auto& p : points) {
    text.append(text.empty() ? "" : " ").append(ToText(p.x)).append(",").append(ToText(p.y));
  }
  return text;
}

template <class Points>
std::string Polygon(const Points& points, const std::string& style, const std::string& title) {
  if (points.empty()) return "";
  return "<polygon points=\"" + PointList(points) + "\" " + style + ">" + title + "</polygon>\n";
}

std::string Dot(const Point& p, double radius, const std::string& style) {
  return std::string("<circle cx=\"").append(ToText(p.x)).append("\" cy=\"").append(ToText(p.y)) +
         "\" r=\"" + ToText(radius) + "\" " + style + "/>\n";
}

using Homogeneous = std::vector<M_Vector4T<double>>;

// The part of an outline in a box; nothing where it is not finite.
Homogeneous Clipped(const std::vector<Point>& outline, const M_FloatRect& box) {
  Homogeneous part;
  for (const Point& p : outline) {
    if (!std::isfinite(p.x) || !std::isfinite(p.y)) return {};
    part.push_back({p.x, p.y, 0, 1});
  }
  const Homogeneous clipper = {{box.left, box.top, 0, 1},
                               {box.right, box.top, 0, 1},
                               {box.right, box.bottom, 0, 1},
                               {box.left, box.bottom, 0, 1}};
  M_PolyPolyClip2D(&clipper, &part, &part);
  return part;
}

std::string Title(const std::string& name) { return "<title>" + Escaped(name) + "</title>"; }

// What is outside the picture is cut off: renderers have limits of their own.
std::string DrawShape(const Shape& shape, const M_FloatRect& box) {
  const std::string color = Color(shape.number);
  if (!shape.isEdgeOn) {
    return Polygon(
        Clipped(shape.outline, box),
        "fill=\"" + color + "\" fill-opacity=\"0.6\" stroke=\"" + color + "\" stroke-width=\"2\"",
        Title(shape.name));
  }
  std::vector<Point> line;
  for (const Point& p : shape.outline) {
    line.push_back({std::clamp(p.x, box.left, box.right), std::clamp(p.y, box.top, box.bottom)});
  }
  return "<polyline points=\"" + PointList(line) + "\" fill=\"none\" stroke=\"" + color +
         "\" stroke-width=\"3\">" + Title(shape.name) + "</polyline>\n";
}

// Places names so that none lies on another: in the middle, or as near above or below as there is
// room; else not at all.
class Labels {
 public:
  explicit Labels(double size) : size_(size) {}

  std::string Place(const std::string& name, const Point& middle) {
    const auto letters = std::count_if(name.begin(), name.end(), [](char c) {
      return (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    });
    const double half = 0.3 * size_ * static_cast<double>(letters);
    for (const int step : {0, 1, -1, 2, -2, 3, -3}) {
      const double y = middle.y + step * size_ * 1.2;
      const M_FloatRect box = {middle.x - half, y - size_, middle.x + half, y + 0.3 * size_};
      const auto overlaps = [&](const M_FloatRect& other) {
        return M_SectFloatRect(&box, &other, nullptr) != 0;
      };
      if (std::any_of(placed_.begin(), placed_.end(), overlaps)) continue;
      placed_.push_back(box);
      return "<text x=\"" + ToText(middle.x) + "\" y=\"" + ToText(y) + "\">" + Escaped(name) +
             "</text>\n";
    }
    return "";
  }

 private:
  double size_;
  std::vector<M_FloatRect> placed_;
};

// The part of an outline inside the frame with a dashed edge, and the name in its middle.
std::string DrawInFrame(const Shape& shape, const Size& frame, Labels* labels) {
  const Homogeneous part = Clipped(
      shape.outline, {0, 0, static_cast<double>(frame.width), static_cast<double>(frame.height)});
  if (part.empty()) return "";
  Point sum = {0, 0};
  for (const auto& p : part) sum = {sum.x + p.x, sum.y + p.y};
  const auto count = static_cast<double>(part.size());
  return Polygon(part, "fill=\"none\" stroke=\"#222\" stroke-width=\"1\" stroke-dasharray=\"6 4\"",
                 Title(shape.name)) +
         labels->Place(shape.name, {sum.x / count, sum.y / count});
}

// Veils what is outside the frame.
std::string DrawVeil(const M_FloatRect& box, const Size& frame) {
  char text[200];
  std::snprintf(
      text, sizeof text,
      "<path d=\"M%.0f %.0fH%.0fV%.0fH%.0fzM0 0V%dH%dV0z\" fill=\"#fff\" fill-opacity=\"0.5\"/>\n",
      box.left, box.top, box.right, box.bottom, box.left, frame.height, frame.width);
  return text;
}

}  // namespace

Picture Draw(const Composition& composition, const PictureOptions& options) {
  const Size& frame = *composition.size;
  const Sheet sheet = MakeSheet(composition);
  const std::vector<Shape> shapes = MakeShapes(composition, sheet, options);
  const int margin = std::max(frame.width, frame.height) / 4;
  char head[300];
  std::snprintf(head, sizeof head,
                "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"%d %d %d %d\" "
                "font-family=\"sans-serif\" font-size=\"%d\" text-anchor=\"middle\">\n"
                "<rect x=\"0\" y=\"0\" width=\"%d\" height=\"%d\" fill=\"#f4f4f4\" stroke=\"#222\" "
                "stroke-width=\"3\"/>\n",
                -margin, -margin, frame.width + 2 * margin, frame.height + 2 * margin,
                frame.height / 36 + 1, frame.width, frame.height);
  Picture picture = {head + Title(composition.name) + "\n", {}, sheet.reports};
  const M_FloatRect box = {-1.0 * margin, -1.0 * margin, frame.width + 1.0 * margin,
                           frame.height + 1.0 * margin};
  std::vector<Point> all;
  for (const Shape& shape : shapes) {
    picture.svg += DrawShape(shape, box);
    all.insert(all.end(), shape.outline.begin(), shape.outline.end());
  }
  picture.svg += DrawVeil(box, frame);
  const int letters = frame.height / 36 + 1;
  Labels labels(letters);
  // The names in front first.
  for (auto shape = shapes.rbegin(); shape != shapes.rend(); ++shape) {
    picture.svg += DrawInFrame(*shape, frame, &labels);
  }
  M_ComputeConvexHull(all.cbegin(), all.cend(), all);
  picture.svg += Polygon(Clipped(all, box), "fill=\"none\" stroke=\"#999\" stroke-width=\"2\"",
                         Title("the hull of all"));

  const auto front = [&](const Point& p) {
    return std::find_if(shapes.rbegin(), shapes.rend(),
                        [&](const Shape& shape) { return shape.IsHit(p, options.tolerance); });
  };
  for (int i = 0; i < options.grid * options.grid; ++i) {
    const int column = i % options.grid;
    const int row = i / options.grid;
    const Point p = {(column + 0.5) * frame.width / options.grid,
                     (row + 0.5) * frame.height / options.grid};
    const auto hit = front(p);
    if (hit != shapes.rend()) {
      picture.svg += Dot(p, 3, std::string("fill=\"").append(Color(hit->number)).append("\""));
    }
  }
  if (options.point) {
    picture.svg += Dot(*options.point, 6, "fill=\"none\" stroke=\"#d00\" stroke-width=\"3\"");
    for (auto shape = shapes.rbegin(); shape != shapes.rend(); ++shape) {
      if (!shape->IsHit(*options.point, options.tolerance)) continue;
      picture.hits.push_back({shape->name, shape->EdgeDistance(*options.point)});
    }
  }
  picture.svg += "</svg>\n";
  return picture;
}

}  // namespace comp
