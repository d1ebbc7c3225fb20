#include "TimelinePicture.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <iterator>

#include "Language.h"
#include "M_Ops.h"
#include "Text.h"
#include "Timecode.h"
#include "Wording.h"

namespace comp {
namespace {

constexpr double kWidth = 960, kLeft = 110, kRight = 20, kTop = 80, kLane = 34, kBar = 26;
constexpr double kSize = 11;  // Of letters.

double ToDouble(const Seconds& time) {
  return time.IsKnown() ? time.ratio.num / static_cast<double>(time.ratio.den) : 0;
}

// Follows the reader's choice of light or dark.
constexpr char kStyle[] =
    "<style>:root{color-scheme:light dark}text{fill:#222}.quiet{fill:#666}.lane{fill:#8882}"
    ".rule{stroke:#8888}.clip{fill:#7fa8d6}.stack{fill:#e3b466}.gap{fill:none;stroke:#8888;"
    "stroke-dasharray:3 3}.transition{fill:#b04f;fill-opacity:.35;stroke:#b04f}.marker{fill:#d33}"
    ".name{fill:#111}@media(prefers-color-scheme:dark){text{fill:#eee}.quiet{fill:#aaa}"
    ".name{fill:#111}}</style>\n";

constexpr const char* kClasses[] = {"clip", "gap", "transition", "stack"};
// What the legend calls them.
constexpr const char* kKinds[] = {Later("clip"), Later("gap"), Later("transition"),
                                  Later("nested")};

std::string Shape(const char* element, const std::string& attributes, const std::string& content) {
  return std::string("<")
             .append(element)
             .append(" ")
             .append(attributes)
             .append(">")
             .append(content) +
         "</" + element + ">\n";
}

std::string Text(double x, double y, const std::string& attributes, const std::string& text) {
  return Shape("text", "x=\"" + ToText(x) + "\" y=\"" + ToText(y) + "\" " + attributes,
               Escaped(text));
}

class Drawing {
 public:
  Drawing(const Timeline& timeline, bool mayDrop)
      : timeline_(timeline),
        clock_(timeline.rate, mayDrop),
        length_(std::max(ToDouble(timeline.duration), 1e-3)) {}

  std::string Make() {
    const double height = kTop + kLane * static_cast<double>(timeline_.tracks.size()) + 12;
    char head[200];
    std::snprintf(head, sizeof head,
                  "<svg xmlns=\"http://www.w3.org/2000/svg\" viewBox=\"0 0 %.0f %.0f\" "
                  "font-family=\"sans-serif\" font-size=\"11\">\n",
                  kWidth, height);
    std::string svg = head + Shape("title", "", Escaped(timeline_.name)) + kStyle;
    svg += Text(kLeft, 18, "font-size=\"14\"", Fitted(timeline_.name, 600 / 14.0));
    char length[64];
    std::snprintf(length, sizeof length, "%.3f s", ToDouble(timeline_.duration));
    svg += Text(kWidth - kRight, 18, "class=\"quiet\" text-anchor=\"end\"",
                Timecode(timeline_.duration) + " = " + length);
    svg += Legend();
    svg += Ruler(height);
    for (size_t i = 0; i < timeline_.tracks.size(); ++i) {
      svg += Lane(timeline_.tracks[i], i, kTop + kLane * static_cast<double>(i));
    }
    return svg + "</svg>\n";
  }

 private:
  double X(const Seconds& time) const {
    const double x = kLeft + ToDouble(time) / length_ * (kWidth - kLeft - kRight);
    return std::clamp(x, kLeft, kWidth - kRight);
  }
  std::string Timecode(const Seconds& time) const {
    return time.IsKnown() ? clock_.Timecode(time) : "?";
  }

  // The kinds that there are.
  std::string Legend() const {
    bool isThere[std::size(kKinds)] = {}, hasMarkers = false;
    for (const Track& track : timeline_.tracks) {
      for (const Item& item : track.items) isThere[static_cast<int>(item.kind)] = true;
      hasMarkers |= !track.markers.empty();
    }
    std::string svg;
    double x = kLeft;
    const auto add = [&](const char* style, const char* name) {
      svg += Shape("rect",
                   "class=\"" + std::string(style) + "\" x=\"" + ToText(x) +
                       "\" y=\"30\" width=\"12\" height=\"12\" rx=\"2\"",
                   "");
      svg += Text(x + 17, 40, "class=\"quiet\"", name);
      x += 36 + kSize * Width(name);
    };
    for (size_t i = 0; i < std::size(kKinds); ++i) {
      if (isThere[i]) add(kClasses[i], Tr(kKinds[i]));
    }
    if (hasMarkers) add("marker", Tr("marker"));
    return svg;
  }

  // A mark at whole seconds, minutes or hours, as many as there is room for.
  std::string Ruler(double height) const {
    constexpr int32_t kSteps[] = {1,   2,   5,    10,   15,   30,    60,    120,  300,
                                  600, 900, 1800, 3600, 7200, 14400, 43200, 86400};
    const auto* known = std::find_if(std::begin(kSteps), std::end(kSteps) - 1,
                                     [&](int32_t s) { return length_ / s <= 8; });
    int32_t step = *known;
    while (length_ / step > 8 && step < INT32_MAX / 16) step *= 2;
    std::string svg;
    const auto last = static_cast<int32_t>(length_ / step);
    for (int32_t i = 0; i <= last; ++i) {
      const Seconds time = M_Ratio{i * step, 1};
      const std::string x = ToText(X(time));
      svg += Shape("line",
                   std::string("class=\"rule\" x1=\"").append(x).append("\" x2=\"").append(x) +
                       "\" y1=\"" + ToText(kTop - 16) + "\" y2=\"" + ToText(height - 6) + "\"",
                   "");
      if (X(time) > kWidth - kRight - 60) continue;  // No room for its name.
      svg += Text(X(time) + 3, kTop - 8, "class=\"quiet\" font-size=\"9\"",
                  Timecode(timeline_.start + time));
    }
    return svg;
  }

  std::string Lane(const Track& track, size_t number, double y) const {
    char rectangle[120];
    std::snprintf(rectangle, sizeof rectangle,
                  "class=\"lane\" x=\"%.0f\" y=\"%.0f\" width=\"%.0f\" height=\"%.0f\"", kLeft, y,
                  kWidth - kLeft - kRight, kBar);
    const std::string label = track.kind + ' ' + std::to_string(number + 1);
    std::string svg = Shape("rect", rectangle, Shape("title", "", Escaped(track.name)));
    svg +=
        Text(8, y + 17, "", Fitted(track.name.empty() ? label : track.name, (kLeft - 16) / kSize));
    // Transitions lie on what they join.
    for (const bool areTransitions : {false, true}) {
      for (const Item& item : track.items) {
        if ((item.kind == Item::Kind::kTransition) == areTransitions) svg += Bar(item, y);
      }
    }
    for (const Marker& marker : track.markers) {
      const double x = X(marker.in);
      svg += Shape("polygon",
                   "class=\"marker\" points=\"" + ToText(x - 4) + "," + ToText(y - 4) + " " +
                       ToText(x + 4) + "," + ToText(y - 4) + " " + ToText(x) + "," + ToText(y + 4) +
                       "\"",
                   Shape("title", "", Escaped(marker.name) + ", " + Timecode(marker.in)));
    }
    return svg;
  }

  std::string Bar(const Item& item, double y) const {
    const double left = X(item.recordIn), right = X(item.recordOut), width = right - left;
    const std::string speed =
        item.speed.ratio == M_Ratio{1, 1} ? "" : " x " + SpeedText(item.speed.ratio);
    const std::string title = Shape("title", "",
                                    Escaped(item.name + speed) + ", " + Timecode(item.recordIn) +
                                        " - " + Timecode(item.recordOut));
    const std::string style =
        std::string("class=\"").append(kClasses[static_cast<int>(item.kind)]) + "\" ";
    if (item.kind == Item::Kind::kTransition) {
      return Shape("polygon",
                   style + "points=\"" + ToText(left) + "," + ToText(y + kBar) + " " +
                       ToText(right) + "," + ToText(y) + " " + ToText(right) + "," +
                       ToText(y + kBar) + "\"",
                   title);
    }
    std::string svg = Shape("rect",
                            style + "x=\"" + ToText(left) + "\" y=\"" + ToText(y + 1) +
                                "\" width=\"" + ToText(std::max(width - 1, 0.5)) + "\" height=\"" +
                                ToText(kBar - 2) + "\" rx=\"2\"",
                            title);
    if (item.kind == Item::Kind::kGap) return svg;
    const std::string name = Fitted(item.name + speed, (width - 8) / kSize);
    return name.empty() ? svg : svg + Text(left + 4, y + 17, "class=\"name\"", name);
  }

  static std::string SpeedText(const M_Ratio& speed) {
    return speed.den == 0 ? "?" : ToText(speed.num / static_cast<double>(speed.den));
  }

  const Timeline& timeline_;
  Clock clock_;
  double length_;
};

}  // namespace

std::string Draw(const Timeline& timeline, bool mayDrop) {
  return Drawing(timeline, mayDrop).Make();
}

}  // namespace comp
