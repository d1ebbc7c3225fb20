#include "Picture.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iterator>
#include <utility>

#include "Language.h"
#include "Sheet.h"
#include "Stage.h"
#include "Text.h"
#include "Wording.h"

namespace comp {
namespace {

using Point = M_Vector2T<double>;

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

std::string Title(const std::string& name) { return "<title>" + Escaped(name) + "</title>"; }

// Follows the reader's choice of light or dark.
constexpr char kStyle[] =
    "<style>:root{color-scheme:light dark}text{fill:#111}.name{paint-order:stroke;stroke:#f4f4f4;"
    "stroke-width:.25em;stroke-opacity:.7}.frame{fill:#f4f4f4;stroke:#222;stroke-width:3}"
    ".veil{fill:#fff;fill-opacity:.5}.part{fill:none;stroke:#222;stroke-width:3;stroke-dasharray:"
    "12 8}"
    ".hull{fill:none;stroke:#999;stroke-width:4}@media(prefers-color-scheme:dark){text{fill:#eee}"
    ".name{stroke:#222}.frame{fill:#2a2c30;stroke:#bbb}.veil{fill:#111}.part{stroke:#ddd}}</style>"
    "\n";

// What is outside the picture is cut off: renderers have limits of their own.
std::string DrawShape(const Shape& shape, const M_FloatRect& box) {
  const std::string color = Color(shape.number);
  if (!shape.isEdgeOn) {
    return Polygon(
        Clipped(shape.outline, box),
        "fill=\"" + color + "\" fill-opacity=\"0.6\" stroke=\"" + color + "\" stroke-width=\"2\"",
        Title(*shape.name));
  }
  const std::vector<Point> line = ClippedLine(shape.outline, box);
  if (line.empty()) return "";
  return "<polyline points=\"" + PointList(line) + "\" fill=\"none\" stroke=\"" + color +
         "\" stroke-width=\"3\">" + Title(*shape.name) + "</polyline>\n";
}

// Places names so that none lies on another: in the middle, or as near above or below as there is
// room; else shortened; else not at all.
class Labels {
 public:
  Labels(double size, const Size& frame) : size_(size), most_(frame.width / size) {}

  std::string Place(const std::string& name, const Point& middle) {
    constexpr double kFew = 7;
    for (const std::string& text : {Fitted(name, most_), Fitted(name, kFew)}) {
      for (const int step : {0, 1, -1, 2, -2, 3, -3}) {
        const Point at = {middle.x, middle.y + step * size_ * 1.2};
        if (!Take(text, at)) continue;
        return "<text class=\"name\" x=\"" + ToText(at.x) + "\" y=\"" + ToText(at.y) + "\">" +
               Escaped(text) + "</text>\n";
      }
    }
    return "";
  }

 private:
  bool Take(const std::string& text, const Point& middle) {
    const double half = size_ * Width(text) / 2;
    const M_FloatRect box = {middle.x - half, middle.y - size_, middle.x + half,
                             middle.y + 0.3 * size_};
    const auto overlaps = [&](const M_FloatRect& other) {
      return M_SectFloatRect(&box, &other, nullptr) != 0;
    };
    if (std::any_of(placed_.begin(), placed_.end(), overlaps)) return false;
    placed_.push_back(box);
    return true;
  }

  double size_;
  double most_;  // By the height of letters.
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
  return Polygon(part, "class=\"part\"", Title(*shape.name)) +
         labels->Place(*shape.name, {sum.x / count, sum.y / count});
}

std::string Head(const Size& frame, double margin, double letters) {
  char head[200];
  std::snprintf(head, sizeof head,
                "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"%g %g %g %g\" "
                "font-family=\"sans-serif\" font-size=\"%.3g\" text-anchor=\"middle\">\n",
                -margin, -margin, frame.width + 2 * margin, frame.height + 2 * margin, letters);
  return head;
}

// The name above the frame, and below what the lines are.
std::string Legend(const Composition& composition, double margin, double letters) {
  const Size& frame = *composition.size;
  const double room = (frame.width + 1.9 * margin) / letters;
  std::string svg = "<g text-anchor=\"start\">\n<text x=\"" + ToText(-0.95 * margin) + "\" y=\"" +
                    ToText(-margin + 1.5 * letters) + "\">" +
                    Escaped(Fitted(composition.name, room)) + "</text>\n";
  double x = -0.95 * margin;
  const double y = frame.height + margin - 0.7 * letters;
  for (const auto& [style, name] :
       {std::pair{"part", Tr("what is in the frame")}, {"hull", Tr("the hull of all")}}) {
    char line[160];
    std::snprintf(line, sizeof line, "<path class=\"%s\" d=\"M%.2f %.2fh%.2f\"/>\n", style, x,
                  y - 0.3 * letters, 2 * letters);
    svg += line;
    svg += "<text x=\"" + ToText(x + 2.5 * letters) + "\" y=\"" + ToText(y) + "\">" + name +
           "</text>\n";
    x += (4 + Width(name)) * letters;
  }
  return svg + "</g>\n";
}

// Veils what is outside the frame.
std::string DrawVeil(const M_FloatRect& box, const Size& frame) {
  char text[200];
  std::snprintf(text, sizeof text, "<path class=\"veil\" d=\"M%g %gH%gV%gH%gzM0 0V%dH%dV0z\"/>\n",
                box.left, box.top, box.right, box.bottom, box.left, frame.height, frame.width);
  return text;
}

}  // namespace

Picture Draw(const Composition& composition, const PictureOptions& options) {
  const Size& frame = *composition.size;
  const Sheet sheet = MakeSheet(composition);
  // What is reported here is in the sheet's reports.
  ReportCollector collector;
  const std::vector<Shape> shapes = MakeShapes(composition, sheet, options.frame, collector);
  const double margin = std::max(frame.width, frame.height) / 4.0;
  const double letters = (frame.width + 2 * margin) / 72;
  const M_FloatRect box = {-margin, -margin, frame.width + margin, frame.height + margin};
  Picture picture = {
      Head(frame, margin, letters) + Title(composition.name) + kStyle, {}, sheet.reports};
  char text[200];
  std::snprintf(text, sizeof text,
                "<rect class=\"frame\" x=\"0\" y=\"0\" width=\"%d\" height=\"%d\"/>\n", frame.width,
                frame.height);
  picture.svg += text;
  std::vector<Point> all;
  for (const Shape& shape : shapes) {
    picture.svg += DrawShape(shape, box);
    all.insert(all.end(), shape.outline.begin(), shape.outline.end());
  }
  picture.svg += DrawVeil(box, frame);
  Labels labels(letters, frame);
  // The names in front first.
  for (auto shape = shapes.rbegin(); shape != shapes.rend(); ++shape) {
    picture.svg += DrawInFrame(*shape, frame, &labels);
  }
  std::erase_if(all, [](const Point& p) { return !std::isfinite(p.x) || !std::isfinite(p.y); });
  M_ComputeConvexHull(all.cbegin(), all.cend(), all);
  picture.svg += Polygon(Clipped(all, box), "class=\"hull\"", Title(Tr("the hull of all")));
  picture.svg += Legend(composition, margin, letters);

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
      picture.svg += Dot(p, 5, std::string("fill=\"").append(Color(hit->number)).append("\""));
    }
  }
  if (options.point) {
    const Point shown = {std::clamp(options.point->x, box.left, box.right),
                         std::clamp(options.point->y, box.top, box.bottom)};
    picture.svg += Dot(shown, 6, "fill=\"none\" stroke=\"#d00\" stroke-width=\"3\"");
    picture.hits = HitsAt(shapes, *options.point, options.tolerance);
  }
  picture.svg += "</svg>\n";
  return picture;
}

}  // namespace comp
