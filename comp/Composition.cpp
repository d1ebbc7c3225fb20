#include "Composition.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <initializer_list>
#include <nlohmann/json.hpp>
#include <optional>
#include <set>
#include <utility>

#include "JsonPlace.h"
#include "Language.h"
#include "Rates.h"
#include "Text.h"
#include "Timecode.h"

namespace comp {
namespace {

using Json = nlohmann::json;

// A value in a sentence.
std::string Shown(const Json& value) { return Shortened(value.dump(), 40); }

// What is wrong, and where in the tree of the file.
struct Complaint {
  std::string sentence;
  std::vector<std::string> path;
};

// An object of the file that knows where it stands, so that every complaint can say so.
class Fields {
 public:
  Fields(const Json& json, std::string place, std::vector<std::string> path,
         std::initializer_list<const char*> known)
      : json_(json), place_(std::move(place)), path_(std::move(path)) {
    if (!json.is_object()) Complain(Tr("is not an object"));
    for (const auto& [key, value] : json.items()) {
      bool isKnown = false;
      for (const char* name : known) isKnown |= key == name;
      if (!isKnown) ComplainAbout(key, Tr("is not a field this program knows"));
    }
  }

  [[noreturn]] void Complain(const std::string& what) const {
    throw Complaint{Tr("{0} {1}.", {place_, what}), path_};
  }

  [[noreturn]] void ComplainAbout(const std::string& field, const std::string& what) const {
    throw Complaint{Tr("{0}, field \"{1}\": {2}.", {place_, field, what}), Below(field)};
  }

  bool Has(const char* field) const { return json_.contains(field); }

  const Json& Get(const char* field) const {
    if (!Has(field)) ComplainAbout(field, Tr("is missing"));
    return json_.at(field);
  }

  std::string Name() const {
    const Json& value = Get("name");
    if (!value.is_string() || value.get<std::string>().empty())
      ComplainAbout("name", Tr("is not a text"));
    return value;
  }

  int32_t Whole(const char* field) const {
    const Json& value = Get(field);
    if (!value.is_number_integer())
      ComplainAbout(field, Tr("{0} is not a whole number", {Shown(value)}));
    const bool fits = value.is_number_unsigned() ? value.get<uint64_t>() <= INT32_MAX
                                                 : value.get<int64_t>() >= INT32_MIN;
    if (!fits) ComplainAbout(field, Tr("{0} has more than 32 bits", {Shown(value)}));
    return value;
  }

  // A number of frames, or their timecode.
  int32_t Start(const char* field, const M_Ratio& rate) const {
    const Json& value = Get(field);
    if (!value.is_string()) return Whole(field);
    const auto frame = ParseTimecode(value.get<std::string>(), rate);
    if (!frame || !std::in_range<int32_t>(*frame)) {
      ComplainAbout(field, Tr("{0} is no timecode of this rate", {Shown(value)}));
    }
    return static_cast<int32_t>(*frame);
  }

  // A positive ratio: "30000/1001", 25, "25", 23.976 or "23.976".
  GivenRatio Ratio(const char* field, bool isFrameRate) const {
    const Json& value = Get(field);
    if (value.is_number()) return FromNumber(field, value.dump(), isFrameRate);
    if (!value.is_string()) ComplainAbout(field, Tr("is neither a number nor a ratio"));
    const std::string text = value;
    const size_t slash = text.find('/');
    if (slash == std::string::npos) return FromNumber(field, text, isFrameRate);
    const auto num = ToInteger(text.substr(0, slash));
    const auto den = ToInteger(text.substr(slash + 1));
    if (!num || !den) ComplainAbout(field, Tr("\"{0}\" is not a ratio of 32-bit numbers", {text}));
    if (*den == 0) ComplainAbout(field, Tr("\"{0}\" has a zero denominator", {text}));
    if (*num <= 0 || *den < 0) ComplainAbout(field, Tr("\"{0}\" is not greater than zero", {text}));
    return {{*num, static_cast<uint32_t>(*den)}, {}};
  }

  double Number(const char* field) const { return ToNumber(field, Get(field)); }

  M_Vector2T<double> Pair(const char* field) const {
    const auto numbers = Numbers<2>(field);
    return {numbers[0], numbers[1]};
  }

  M_Vector3T<double> Triple(const char* field) const {
    const auto numbers = Numbers<3>(field);
    return {numbers[0], numbers[1], numbers[2]};
  }

  template <size_t kCount>
  std::array<double, kCount> Numbers(const char* field) const {
    const Json& list = List(field, kCount);
    std::array<double, kCount> numbers;
    for (size_t i = 0; i < kCount; ++i) numbers[i] = ToNumber(field, list[i]);
    return numbers;
  }

  bool HasTriple(const char* field) const {
    return Has(field) && Get(field).is_array() && Get(field).size() == 3;
  }

  // The object in a field.
  Fields Sub(const char* field, std::initializer_list<const char*> known) const {
    return {Get(field), Tr("{0}, field \"{1}\"", {place_, field}), Below(field), known};
  }

  // An object in the list of one.
  Fields Sub(const char* field, size_t index, const std::string& what,
             std::initializer_list<const char*> known) const {
    std::vector<std::string> path = Below(field);
    path.push_back(std::to_string(index));
    return {Get(field)[index], Tr("{0}, field \"{1}\"", {place_, field}) + what, path, known};
  }

  Size Pixels(const char* field) const {
    const auto length = [&](const Json& value) {
      constexpr int32_t kMost = 30000;
      const bool isLength = value.is_number_integer() && value > 0 && value <= kMost;
      if (!isLength)
        ComplainAbout(field, Tr("{0} is not a whole number from 1 to 30000", {Shown(value)}));
      return value.get<int32_t>();
    };
    const Json& list = List(field, 2);
    return {length(list[0]), length(list[1])};
  }

 private:
  const Json& List(const char* field, size_t count) const {
    const Json& list = Get(field);
    if (!list.is_array() || list.size() != count) {
      ComplainAbout(field, Tr("is not a list of {0} numbers", {std::to_string(count)}));
    }
    return list;
  }

  double ToNumber(const char* field, const Json& value) const {
    if (!value.is_number()) ComplainAbout(field, Tr("{0} is not a number", {Shown(value)}));
    return value;
  }

  static std::optional<int32_t> ToInteger(const std::string& text) {
    int32_t value;
    const char* const end = text.data() + text.size();
    const auto [rest, error] = std::from_chars(text.data(), end, value);
    if (error != std::errc() || rest != end) return {};
    return value;
  }

  GivenRatio FromNumber(const char* field, const std::string& text, bool isFrameRate) const {
    const auto value = ToDouble(text);
    if (!value || !std::isfinite(*value))
      ComplainAbout(field, Tr("\"{0}\" is not a number", {text}));
    if (*value <= 0) ComplainAbout(field, Tr("{0} is not greater than zero", {text}));
    const auto decimal = ToRatio(text, isFrameRate);
    // 0 for what is too small.
    if (!decimal || decimal->ratio.num == 0)
      ComplainAbout(field, Tr("{0} is out of range", {text}));
    return {decimal->ratio, decimal->isExact ? "" : text};
  }

  std::vector<std::string> Below(const std::string& field) const {
    std::vector<std::string> path = path_;
    path.push_back(field);
    return path;
  }

  const Json& json_;
  std::string place_;
  std::vector<std::string> path_;
};

M_Vector2T<double> Center(const Size& size) { return {size.width / 2.0, size.height / 2.0}; }

Orientation ReadOrientation(const Fields& fields) {
  using Kind = Orientation::Kind;
  if (fields.Has("angles")) {
    const auto angles = fields.Numbers<3>("angles");
    return {Kind::kAngles, {angles[0], angles[1], angles[2], 0}};
  }
  if (fields.Has("axis")) {
    const auto axis = fields.Numbers<3>("axis");
    return {Kind::kAxis, {axis[0], axis[1], axis[2], fields.Number("angle")}};
  }
  if (fields.Has("quaternion")) return {Kind::kQuaternion, fields.Numbers<4>("quaternion")};
  fields.Complain(Tr("has neither \"angles\" nor an \"axis\" nor a \"quaternion\""));
}

constexpr auto kOrientationFields = {"angles", "axis", "angle", "quaternion"};
constexpr auto kKeyFields = {"frame", "angles", "axis", "angle", "quaternion"};

SpacePlacement ReadSpacePlacement(const Fields& fields) {
  if (fields.Has("rotation")) {
    fields.ComplainAbout("rotation",
                         Tr("is for layers in the frame; in space it is \"orientation\""));
  }
  SpacePlacement placement = {};
  placement.size = fields.Pixels("size");
  const M_Vector2T<double> center = Center(placement.size);
  placement.anchor =
      fields.Has("anchor") ? fields.Triple("anchor") : M_Vector3T<double>{center.x, center.y, 0};
  placement.position = fields.Triple("position");
  placement.scale = fields.Has("scale") ? fields.Triple("scale") : M_Vector3T<double>{1, 1, 1};
  if (fields.Has("orientation")) {
    placement.orientation = ReadOrientation(fields.Sub("orientation", kOrientationFields));
  }
  if (!fields.Has("keys")) return placement;
  const Json& keys = fields.Get("keys");
  if (!keys.is_array() || keys.empty()) fields.ComplainAbout("keys", Tr("is not a list of keys"));
  for (size_t i = 0; i < keys.size(); ++i) {
    const Fields key = fields.Sub("keys", i, Tr(", key {0}", {std::to_string(i + 1)}), kKeyFields);
    const int32_t frame = key.Whole("frame");
    if (!placement.keys.empty() && frame <= placement.keys.back().frame) {
      key.ComplainAbout("frame", Tr("does not lie behind that of the key before"));
    }
    placement.keys.push_back({frame, ReadOrientation(key)});
  }
  return placement;
}

Placement ReadPlacement(const Fields& fields, const Size& frame) {
  for (const char* field : {"orientation", "keys"}) {
    if (fields.Has(field)) fields.ComplainAbout(field, Tr("needs a \"position\" of three numbers"));
  }
  Placement placement;
  placement.size = fields.Pixels("size");
  placement.anchor = fields.Has("anchor") ? fields.Pair("anchor") : Center(placement.size);
  placement.position = fields.Has("position") ? fields.Pair("position") : Center(frame);
  placement.scale = fields.Has("scale") ? fields.Pair("scale") : M_Vector2T<double>{1, 1};
  placement.rotation = fields.Has("rotation") ? fields.Number("rotation") : 0;
  return placement;
}

void ReadPlace(const Fields& fields, const std::optional<Size>& frame, Layer* layer) {
  if (!fields.Has("size")) {
    for (const char* field : {"anchor", "position", "scale", "rotation", "orientation", "keys"}) {
      if (fields.Has(field)) fields.ComplainAbout(field, Tr("places a layer that has no \"size\""));
    }
    return;
  }
  if (!frame) fields.ComplainAbout("size", Tr("needs a composition that has a \"size\""));
  if (fields.HasTriple("position")) {
    layer->space = ReadSpacePlacement(fields);
  } else {
    layer->placement = ReadPlacement(fields, *frame);
  }
}

// Without a camera, one from which the frame is seen as it is.
Camera ReadCamera(const Fields& fields, const Size& frame) {
  const M_Vector2T<double> center = Center(frame);
  const double distance = frame.width;
  Camera camera = {{center.x, center.y, -distance}, {center.x, center.y, 0}, {0, -1, 0}, distance};
  if (!fields.Has("camera")) return camera;
  const Fields given = fields.Sub("camera", {"eye", "target", "up", "zoom"});
  camera.eye = given.Triple("eye");
  camera.target = given.Triple("target");
  if (given.Has("up")) camera.up = given.Triple("up");
  if (given.Has("zoom")) camera.zoom = given.Number("zoom");
  if (camera.zoom <= 0) given.ComplainAbout("zoom", Tr("is not greater than zero"));
  return camera;
}

Layer ReadLayer(const Json& json, const std::string& fileName, size_t number,
                const std::optional<Size>& frame) {
  std::string place = Tr("{0}: layer {1}", {fileName, std::to_string(number)});
  if (json.contains("name") && json["name"].is_string()) {
    place += Tr(" (\"{0}\")", {json["name"].get<std::string>()});
  }
  const Fields fields(json, place, {"layers", std::to_string(number - 1)},
                      {"name", "sourceRate", "timeBase", "in", "out", "stretch", "size", "anchor",
                       "position", "scale", "rotation", "orientation", "keys"});
  Layer layer;
  layer.name = fields.Name();
  layer.hasSourceRate = fields.Has("sourceRate");
  if (layer.hasSourceRate && fields.Has("timeBase")) {
    fields.ComplainAbout("timeBase", Tr("stands beside a \"sourceRate\""));
  }
  layer.timeBase =
      layer.hasSourceRate ? fields.Ratio("sourceRate", true) : fields.Ratio("timeBase", false);
  layer.in = fields.Whole("in");
  layer.out = fields.Whole("out");
  if (layer.out < layer.in) fields.ComplainAbout("out", Tr("lies before \"in\""));
  if (int64_t{layer.out} - layer.in > INT32_MAX) {
    fields.ComplainAbout("out", Tr("lies more than 32 bits behind \"in\""));
  }
  layer.stretch = fields.Has("stretch") ? fields.Ratio("stretch", false) : GivenRatio{{1, 1}, {}};
  ReadPlace(fields, frame, &layer);
  return layer;
}

// Follows the parser, so that it can be said where the file stopped making sense, and refuses
// keys that come twice.
class Parser : public nlohmann::detail::json_sax_dom_parser<Json> {
 public:
  using Base = nlohmann::detail::json_sax_dom_parser<Json>;

  explicit Parser(Json* json) : Base(*json, false) {}

  bool start_object(std::size_t size) {
    if (++depth_ > kMostDepth) return Complain(Tr("is nested too deeply"));
    keys_.emplace_back();
    if (keys_.size() == 2 && isInList_) {
      ++layer;
      field.clear();
    }
    return Base::start_object(size);
  }
  bool end_object() {
    --depth_;
    keys_.pop_back();
    return Base::end_object();
  }
  bool end_array() {
    --depth_;
    return Base::end_array();
  }
  bool start_array(std::size_t size) {
    if (++depth_ > kMostDepth) return Complain(Tr("is nested too deeply"));
    if (keys_.size() == 1) isInList_ = field == "layers";
    return Base::start_array(size);
  }
  bool key(std::string& name) {
    field = name;
    if (!keys_.back().insert(name).second) return Complain(Tr("comes twice"));
    return Base::key(name);
  }
  template <class Error>
  bool parse_error(std::size_t at, const std::string&, const Error& error) {
    byte = at - std::min<size_t>(at, 1);
    return Complain(error.id == 406 ? Tr("a number is too large")
                                    : Tr("is not JSON, or ends too soon"));
  }

  std::string complaint;  // Empty unless something is wrong.
  std::string field;      // The last key.
  size_t layer = 0;       // Its number, or 0 before the first.
  size_t byte = 0;        // Where the file stopped making sense, if it did.

 private:
  bool Complain(const std::string& what) {
    complaint = what;
    return false;
  }

  static constexpr int kMostDepth = 100;

  std::vector<std::set<std::string>> keys_;
  int depth_ = 0;
  bool isInList_ = false;
};

// What Parser found, as a sentence.
[[noreturn]] void Fail(const Parser& parser, size_t read, const std::string& text,
                       const std::string& fileName) {
  const size_t layer = parser.layer;
  std::string place = layer == 0 ? Tr("{0}: composition", {fileName})
                                 : Tr("{0}: layer {1}", {fileName, std::to_string(layer)});
  if (!parser.field.empty()) place += Tr(", at or behind field \"{0}\"", {parser.field});
  const auto [line, column] = PlaceOf(text, parser.byte > 0 ? parser.byte : read - 1);
  const std::string where =
      Tr(" (line {0}, column {1})", {std::to_string(line), std::to_string(column)});
  throw InputError(Tr("{0}: {1}{2}.", {place, parser.complaint, where}), line, column);
}

Composition Read(const Json& json, const std::string& fileName) {
  const Fields fields(json, Tr("{0}: composition", {fileName}), {},
                      {"name", "frameRate", "start", "duration", "size", "camera", "layers"});
  Composition composition;
  composition.name = fields.Name();
  composition.frameRate = fields.Ratio("frameRate", true);
  composition.start = fields.Start("start", composition.frameRate.ratio);
  composition.duration = fields.Whole("duration");
  if (composition.duration <= 0) fields.ComplainAbout("duration", Tr("is not greater than zero"));
  if (fields.Has("size")) {
    composition.size = fields.Pixels("size");
    composition.camera = ReadCamera(fields, *composition.size);
  } else if (fields.Has("camera")) {
    fields.ComplainAbout("camera", Tr("needs a composition that has a \"size\""));
  }
  const Json& layers = fields.Get("layers");
  if (!layers.is_array()) fields.ComplainAbout("layers", Tr("is not a list"));
  for (const Json& layer : layers) {
    composition.layers.push_back(
        ReadLayer(layer, fileName, composition.layers.size() + 1, composition.size));
  }
  return composition;
}

}  // namespace

Composition ReadComposition(const std::string& text, const std::string& fileName) {
  Json json;
  Parser parser(&json);
  const char *const begin = text.data(), *read = begin;
  Json::sax_parse(Reading(begin, &read), Reading(begin + text.size(), &read), &parser);
  if (!parser.complaint.empty()) Fail(parser, static_cast<size_t>(read - begin), text, fileName);
  try {
    return Read(json, fileName);
  } catch (const Complaint& complaint) {
    const auto [line, column] = PlaceOf(text, FindPath(text, complaint.path));
    throw InputError(complaint.sentence, line, column);
  }
}

}  // namespace comp
