// The bridge between the page and the library: a file that is open, the camera that looks at it,
// and what the page asks about them. Texts are JSON; pictures are numbers in memory.

#include <emscripten/bind.h>
#include <emscripten/val.h>

#include <algorithm>
#include <clocale>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <nlohmann/json.hpp>
#include <numbers>
#include <optional>
#include <string>
#include <vector>

#include "Area.h"
#include "Composition.h"
#include "Layout.h"
#include "M_Matrix.h"
#include "M_Ops.h"
#include "Otio.h"
#include "Picture.h"
#include "Reports.h"
#include "Scene.h"
#include "Sheet.h"
#include "SheetText.h"
#include "Stage.h"
#include "Timecode.h"
#include "TimelinePicture.h"
#include "TimelineText.h"
#include "U.h"
#include "Wording.h"

namespace {

using Json = nlohmann::ordered_json;
using Point = M_Vector2T<double>;
using Vector = M_Vector3T<double>;

constexpr double kDegree = std::numbers::pi / 180;

std::string Text(const Json& json) {
  return json.dump(-1, ' ', false, Json::error_handler_t::replace);
}

Json ToJson(const Vector& v) { return {v.x, v.y, v.z}; }
Json ToJson(const Vector& v, double factor) { return {v.x * factor, v.y * factor, v.z * factor}; }

template <class Matrix>
Json ToJson(const Matrix& matrix) {
  Json rows = Json::array();
  for (const auto& row : matrix.m) rows.push_back(row);
  return rows;
}

Json ToJson(const std::vector<comp::Report>& reports) {
  Json list = Json::array();
  for (const comp::Report& report : reports) {
    char id[16];
    std::snprintf(id, sizeof id, "0x%06X", static_cast<unsigned>(report.id));
    list.push_back({{"layer", report.layer}, {"id", id}, {"text", report.text}});
  }
  return list;
}

// A time as a row of the inspector.
Json ToJson(const comp::Time& time, const comp::Clock& clock) {
  if (time.frames.hasOverflowed) return {{"overflow", true}};
  return {{"seconds", comp::RatioText(time.seconds.ratio)},
          {"isExact", time.seconds.accuracy != comp::Accuracy::kApproximated},
          {"frame", time.frames.count},
          {"isWholeFrame", time.frames.isExact},
          {"timecode", clock.Timecode(time.frames.count)}};
}

Json ToJson(const std::optional<comp::Camera>& camera) {
  if (!camera) return {};
  return {ToJson(camera->eye), ToJson(camera->target), ToJson(camera->up), camera->zoom};
}

class Viewer {
 public:
  Viewer() {
    U_SetLogCallback([](void*, int32_t, const char*, const char*, const char*) {}, nullptr);
    U_SetMessageFolder("/share/locale");
    M_Birth(M_SERVICE_TRIG | M_SERVICE_FCMD, nullptr);
  }

  /// The language of reports and sentences: "en", "de", "fr" or "ja".
  void SetLanguage(const std::string& language) {
    std::setlocale(LC_MESSAGES, language == "en" ? "C" : language.c_str());
  }

  /// Opens a file. What was open stays where this one cannot be used. The camera stays where it is
  /// the same file, edited, unless its own has moved.
  std::string Open(const std::string& text, const std::string& name, bool isEdited) {
    try {
      if (comp::IsOtio(text)) {
        auto timelines = comp::ReadOtio(text, name);
        Forget();
        timelines_ = std::move(timelines);
        return Choose(0);
      }
      comp::Composition composition = comp::ReadComposition(text, name);
      comp::Sheet sheet = comp::MakeSheet(composition);
      std::string opened = Opened(composition, sheet);
      const auto camera = composition.camera;
      if (isEdited && composition_ && Text(ToJson(camera)) == Text(ToJson(camera_))) {
        composition.camera = composition_->camera;
      }
      Forget();
      composition_ = std::move(composition);
      sheet_ = std::move(sheet);
      camera_ = camera;
      return opened;
    } catch (const comp::InputError& error) {
      return Text({{"error", error.what()}, {"line", error.line}, {"column", error.column}});
    }
  }

  /// Of several timelines, another one.
  std::string Choose(size_t timeline) {
    chosen_ = std::min(timeline, timelines_.size() - 1);
    return Opened(*Timeline(), timelines_);
  }

  /// The sheet of what is open, as the program prints it.
  std::string Sheet() const {
    if (composition_) return comp::ToJson(*sheet_);
    return timelines_.empty() ? "" : comp::ToJson(timelines_, mayDrop_);
  }

  void SetDropFrame(bool mayDrop) { mayDrop_ = mayDrop; }

  /// The time of a frame: timecode, exact seconds.
  std::string TimeOf(double frame) const {
    const comp::ReportCollector reported;
    const M_Ratio rate = Rate();
    const auto count = static_cast<int64_t>(frame);
    Json json = {{"timecode", comp::ToTimecode(count, rate, mayDrop_ && comp::MayDrop(rate))},
                 {"seconds", nullptr}};
    try {
      json["seconds"] = comp::RatioText(M_TimeOfFrame(count, rate));
    } catch (const int&) {
    }
    return Text(json);
  }

  /// How many frames begin in so many milliseconds.
  double FramesIn(int32_t milliseconds) const {
    return static_cast<double>(M_FrameAt({milliseconds, 1000}, Rate()));
  }

  /// The layers on the screen at a frame, from back to front. For each: its number, flags (1: seen
  /// from the side, 2: cut at the near plane), the count of its points, these, and where it is cut
  /// two more.
  emscripten::val Shapes(double frame) {
    numbers_.clear();
    shapes_.clear();
    if (!composition_ || !composition_->size) return View();
    comp::ReportCollector collector;
    shapes_ = comp::MakeShapes(*composition_, *sheet_, frame, collector);
    reports_ = collector.Reports();
    const M_FloatRect box = Box();
    for (const comp::Shape& shape : shapes_) {
      std::vector<Point> cut;
      for (int i = 0; shape.isInSpace && i < 4; ++i) {
        if (!shape.solid.clipped[i] != !shape.solid.clipped[(i + 1) % 4]) {
          cut.push_back({shape.solid.clipPoints[i].x, shape.solid.clipPoints[i].y});
        }
      }
      const std::vector<Point> line = comp::ClippedLine(cut, box);
      const bool isCut = line.size() == 2;
      numbers_.push_back(static_cast<double>(shape.number));
      numbers_.push_back((shape.isEdgeOn ? 1 : 0) + (isCut ? 2 : 0));
      const size_t count = numbers_.size();
      numbers_.push_back(0);
      if (shape.isEdgeOn) {
        for (const Point& p : comp::ClippedLine(shape.outline, box)) Put(p);
      } else {
        for (const auto& p : comp::Clipped(shape.outline, box)) Put({p.x, p.y});
      }
      numbers_[count] = static_cast<double>((numbers_.size() - count - 1) / 2);
      if (isCut) {
        for (const Point& p : line) Put(p);
      }
    }
    return View();
  }

  /// The outline of what was on the screen last, of all layers or of one.
  emscripten::val Hull() {
    std::vector<Point> all;
    for (const comp::Shape& shape : shapes_) {
      all.insert(all.end(), shape.outline.begin(), shape.outline.end());
    }
    std::erase_if(all, [](const Point& p) { return !std::isfinite(p.x) || !std::isfinite(p.y); });
    M_ComputeConvexHull(all.cbegin(), all.cend(), all);
    numbers_.clear();
    for (const auto& p : comp::Clipped(all, Box())) Put({p.x, p.y});
    return View();
  }

  /// The layers under a point of what was on the screen last, from front to back: how many, and
  /// the first of them with the distance of their nearest edge.
  std::string Hits(double x, double y, double tolerance) const {
    constexpr size_t kMost = 20;
    const Point point = {x, y};
    size_t count = 0;
    Json list = Json::array();
    for (auto shape = shapes_.rbegin(); shape != shapes_.rend(); ++shape) {
      if (!shape->IsHit(point, tolerance) || ++count > kMost) continue;
      list.push_back({{"number", shape->number},
                      {"name", *shape->name},
                      {"distance", shape->EdgeDistance(point)}});
    }
    return Text({{"count", count}, {"layers", std::move(list)}});
  }

  /// What the library reported while the shapes were made.
  std::string Reports() const { return Text(ToJson(reports_)); }

  /// All about a layer at a frame.
  std::string Layer(size_t number, double frame) const {
    if (!composition_ || number >= composition_->layers.size()) return "null";
    const comp::ReportCollector reported;
    const comp::Layer& layer = composition_->layers[number];
    const comp::Row& row = sheet_->rows[number];
    const comp::Clock clock(Rate(), mayDrop_);
    Json json = {{"name", layer.name},
                 {"in", ToJson(row.in, clock)},
                 {"out", ToJson(row.out, clock)},
                 {"duration", ToJson(row.duration, clock)}};
    if (layer.placement) AddPlacement(*layer.placement, &json);
    if (layer.space) AddSpace(layer, frame, &json);
    for (const comp::Shape& shape : shapes_) {
      if (shape.number != number) continue;
      Json screen = Json::array();
      for (int i = 0; i < 4; ++i) {
        const Point p = shape.isInSpace ? Point{shape.solid.points[i].x, shape.solid.points[i].y}
                                        : shape.flat.points[i];
        screen.push_back(shape.isInSpace && shape.solid.clipped[i] ? Json("before the near plane")
                                                                   : Json{p.x, p.y});
      }
      json["screen"] = screen;
    }
    return Text(json);
  }

  /// The picture of what is open, as the program draws it.
  std::string Svg(double frame) const {
    if (Timeline()) return comp::Draw(*Timeline(), mayDrop_);
    if (!composition_ || !composition_->size) return "";
    comp::PictureOptions options;
    options.frame = frame;
    return comp::Draw(*composition_, options).svg;
  }

  // The camera, degrees and pixels.

  /// Round the target: about the direction that is up, and above or below the level of the target.
  void Orbit(double yaw, double pitch) {
    comp::Camera* const camera = Camera();
    if (!camera) return;
    Vector arm = Difference(camera->eye, camera->target);
    const M_Matrix4 view = comp::MakeView(*camera);
    const Vector& up = camera->up;
    const double product = Length(arm) * Length(up);
    if (!(product > 0)) return;
    const double sine = (arm.x * up.x + arm.y * up.y + arm.z * up.z) / product;
    // Never quite over the target, where nothing is level.
    const double now = std::asin(std::clamp(sine, -1.0, 1.0)) / kDegree;
    const double most = 89.5, turn = std::clamp(now + pitch, -most, most) - now;
    M_Matrix4 m;
    M_IdentityMatrix4(&m);
    M_RotateMatrix4(&m, view.m[0][0], view.m[1][0], view.m[2][0], -turn * kDegree);
    M_RotateMatrix4(&m, up.x, up.y, up.z, -yaw * kDegree);
    M_Transform3DFloatPoints(&m, 1, &arm);
    camera->eye = {camera->target.x + arm.x, camera->target.y + arm.y, camera->target.z + arm.z};
  }

  void Pan(double right, double down) {
    comp::Camera* const camera = Camera();
    if (!camera) return;
    const M_Matrix4 view = comp::MakeView(*camera);
    const Vector arm = Difference(camera->eye, camera->target);
    const double scale = Length(arm) / camera->zoom;
    for (Vector* const point : {&camera->eye, &camera->target}) {
      point->x += scale * (right * view.m[0][0] + down * view.m[0][1]);
      point->y += scale * (right * view.m[1][0] + down * view.m[1][1]);
      point->z += scale * (right * view.m[2][0] + down * view.m[2][1]);
    }
  }

  /// Nearer by a factor below 1.
  void Dolly(double factor) {
    comp::Camera* const camera = Camera();
    if (!camera) return;
    const Vector arm = Difference(camera->eye, camera->target);
    const double length = Length(arm), nearest = 1, farthest = 1e7;
    if (!(length > 0)) return;
    const double by = std::clamp(length * factor, nearest, farthest) / length;
    camera->eye = {camera->target.x + arm.x * by, camera->target.y + arm.y * by,
                   camera->target.z + arm.z * by};
  }

  void ResetCamera() {
    if (composition_) composition_->camera = camera_;
  }

  /// [eye, target, up, zoom], and back.
  std::string CameraText() const {
    return Text(composition_ ? ToJson(composition_->camera) : Json());
  }
  void SetCamera(const std::string& text) {
    comp::Camera* const camera = Camera();
    const Json json = Json::parse(text, nullptr, false);
    if (!camera || !json.is_array() || json.size() != 4) return;
    Vector* const vectors[] = {&camera->eye, &camera->target, &camera->up};
    for (size_t i = 0; i < 3; ++i) {
      if (!json[i].is_array() || json[i].size() != 3) return;
      for (const Json& number : json[i]) {
        if (!number.is_number()) return;
      }
    }
    if (!json[3].is_number() || !(json[3] > 0)) return;
    for (size_t i = 0; i < 3; ++i) *vectors[i] = {json[i][0], json[i][1], json[i][2]};
    camera->zoom = json[3];
  }

  /// The digests of an area of functions, a line each: the digest, the name and, where it passes
  /// through the C library's sines, "libm". Nothing behind the last area.
  std::string Digests(size_t area) const {
    std::string text;
    if (area >= digest::kAreaCount) return text;
    for (const auto& [name, value] : digest::DigestsOf(digest::kAreas[area])) {
      char line[200];
      std::snprintf(line, sizeof line, "%016llx %s%s\n", static_cast<unsigned long long>(value),
                    name.c_str(), digest::kAreas[area].usesLibm ? " libm" : "");
      text += line;
    }
    return text;
  }

 private:
  static Vector Difference(const Vector& a, const Vector& b) {
    return {a.x - b.x, a.y - b.y, a.z - b.z};
  }
  static double Length(const Vector& v) { return std::hypot(v.x, v.y, v.z); }

  void Forget() {
    composition_.reset();
    sheet_.reset();
    timelines_.clear();
    shapes_.clear();
    reports_.clear();
  }

  const comp::Timeline* Timeline() const {
    return timelines_.empty() ? nullptr : &timelines_[chosen_];
  }

  M_Ratio Rate() const {
    if (composition_) return composition_->frameRate.ratio;
    return Timeline() ? Timeline()->rate : M_Ratio{24, 1};
  }

  comp::Camera* Camera() {
    return composition_ && composition_->camera ? &*composition_->camera : nullptr;
  }

  // More than the page shows round the frame.
  M_FloatRect Box() const {
    if (!composition_ || !composition_->size) return {0, 0, 0, 0};
    const double width = composition_->size->width, height = composition_->size->height;
    const double margin = 2 * std::max(width, height);
    return {-margin, -margin, width + margin, height + margin};
  }

  void Put(const Point& p) {
    numbers_.push_back(p.x);
    numbers_.push_back(p.y);
  }
  emscripten::val View() const {
    return emscripten::val(emscripten::typed_memory_view(numbers_.size(), numbers_.data()));
  }

  static std::string Opened(const comp::Composition& c, const comp::Sheet& sheet) {
    Json names = Json::array(), ins = Json::array(), outs = Json::array(), seen = Json::array();
    for (size_t i = 0; i < c.layers.size(); ++i) {
      const comp::Row& row = sheet.rows[i];
      names.push_back(c.layers[i].name);
      const auto frame = [](const comp::Time& time) {
        return time.frames.hasOverflowed ? Json() : Json(time.frames.count);
      };
      ins.push_back(frame(row.in));
      outs.push_back(frame(row.out));
      seen.push_back(c.layers[i].placement || c.layers[i].space);
    }
    Json json = {{"kind", "composition"},
                 {"name", c.name},
                 {"rate", comp::RateText(c.frameRate.ratio)},
                 {"start", c.start},
                 {"duration", c.duration},
                 {"size", nullptr},
                 {"names", std::move(names)},
                 {"ins", std::move(ins)},
                 {"outs", std::move(outs)},
                 {"seen", std::move(seen)},
                 {"reports", ToJson(sheet.reports)}};
    if (c.size) json["size"] = {c.size->width, c.size->height};
    return Text(json);
  }

  std::string Opened(const comp::Timeline& timeline,
                     const std::vector<comp::Timeline>& timelines) const {
    const comp::Clock clock(timeline.rate, mayDrop_);
    const auto frame = [&](const comp::Seconds& time) {
      return time.IsKnown() ? clock.Frame(time) : 0;
    };
    Json names = Json::array();
    for (const comp::Timeline& each : timelines) names.push_back(each.name);
    Json all = Json::parse(comp::ToJson({timeline}, mayDrop_));
    return Text({{"kind", "timeline"},
                 {"name", timeline.name},
                 {"timelines", std::move(names)},
                 {"rate", comp::RateText(timeline.rate)},
                 {"start", frame(timeline.start)},
                 {"duration", frame(timeline.duration)},
                 {"tracks", std::move(all["timelines"][0]["tracks"])},
                 {"remarks", timeline.remarks}});
  }

  void AddPlacement(const comp::Placement& placement, Json* json) const {
    const M_Matrix3 m = comp::MatrixOf(placement);
    (*json)["size"] = {placement.size.width, placement.size.height};
    (*json)["matrix"] = ToJson(m);
  }

  void AddSpace(const comp::Layer& layer, double frame, Json* json) const {
    const comp::SpaceLayer placed =
        comp::PlaceInSpace(layer, comp::MakeView(*composition_->camera), frame);
    (*json)["size"] = {placed.size.width, placed.size.height};
    (*json)["matrix"] = ToJson(placed.matrix);
    Json eye = Json::array();
    for (const Vector& corner : placed.corners) eye.push_back(ToJson(corner));
    (*json)["eye"] = std::move(eye);
    Json crossings = Json::array();
    for (const Vector& crossing : placed.crossings) crossings.push_back(ToJson(crossing));
    (*json)["crossings"] = std::move(crossings);
    if (!placed.isDecomposable) return;
    const M_Matrix4Decomp& d = placed.decomp;
    M_Matrix4 rotation;
    M_IdentityMatrix4(&rotation);
    M_RotateMatrix4XYZ(&rotation, d.rotate.x, d.rotate.y, d.rotate.z);
    double quaternion[4];
    M_Matrix4ToQuat(&rotation, quaternion);
    (*json)["translate"] = ToJson(d.translate);
    (*json)["scale"] = ToJson(d.scale);
    (*json)["shear"] = {d.shear.xy, d.shear.xz, d.shear.yz};
    (*json)["anglesXYZ"] = ToJson(d.rotate, 1 / kDegree);
    (*json)["anglesZYX"] = ToJson(placed.anglesZYX, 1 / kDegree);
    (*json)["quaternion"] = quaternion;
  }

  std::optional<comp::Composition> composition_;
  std::optional<comp::Sheet> sheet_;
  std::optional<comp::Camera> camera_;  // As the file has it.
  std::vector<comp::Timeline> timelines_;
  size_t chosen_ = 0;  // Of these.
  std::vector<comp::Shape> shapes_;
  std::vector<double> numbers_;  // What the page looks at.
  std::vector<comp::Report> reports_;
  bool mayDrop_ = false;
};

}  // namespace

EMSCRIPTEN_BINDINGS(viewer) {
  emscripten::class_<Viewer>("Viewer")
      .constructor<>()
      .function("setLanguage", &Viewer::SetLanguage)
      .function("setDropFrame", &Viewer::SetDropFrame)
      .function("open", &Viewer::Open)
      .function("choose", &Viewer::Choose)
      .function("sheet", &Viewer::Sheet)
      .function("timeOf", &Viewer::TimeOf)
      .function("framesIn", &Viewer::FramesIn)
      .function("shapes", &Viewer::Shapes)
      .function("hull", &Viewer::Hull)
      .function("hits", &Viewer::Hits)
      .function("reports", &Viewer::Reports)
      .function("layer", &Viewer::Layer)
      .function("svg", &Viewer::Svg)
      .function("orbit", &Viewer::Orbit)
      .function("pan", &Viewer::Pan)
      .function("dolly", &Viewer::Dolly)
      .function("resetCamera", &Viewer::ResetCamera)
      .function("camera", &Viewer::CameraText)
      .function("setCamera", &Viewer::SetCamera)
      .function("digests", &Viewer::Digests);
}
