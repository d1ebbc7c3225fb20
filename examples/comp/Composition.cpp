#include "Composition.h"

#include <charconv>
#include <cmath>
#include <initializer_list>
#include <istream>
#include <nlohmann/json.hpp>
#include <optional>

namespace comp {
namespace {

using Json = nlohmann::json;

// An object of the file that knows where it stands, so that every complaint can say so.
class Fields {
 public:
  Fields(const Json& json, std::string place, std::initializer_list<const char*> known)
      : json_(json), place_(std::move(place)) {
    if (!json.is_object()) Complain("is not an object");
    for (const auto& [key, value] : json.items()) {
      bool isKnown = false;
      for (const char* name : known) isKnown |= key == name;
      if (!isKnown) ComplainAbout(key, "is not a field this program knows");
    }
  }

  [[noreturn]] void Complain(const std::string& what) const {
    throw InputError(place_ + " " + what + ".");
  }

  [[noreturn]] void ComplainAbout(const std::string& field, const std::string& what) const {
    throw InputError(place_ + ", field \"" + field + "\": " + what + ".");
  }

  bool Has(const char* field) const { return json_.contains(field); }

  const Json& Get(const char* field) const {
    if (!Has(field)) ComplainAbout(field, "is missing");
    return json_.at(field);
  }

  std::string Name() const {
    const Json& value = Get("name");
    if (!value.is_string() || value.get<std::string>().empty())
      ComplainAbout("name", "is not a text");
    return value;
  }

  int32_t Whole(const char* field) const {
    const Json& value = Get(field);
    if (!value.is_number_integer()) ComplainAbout(field, value.dump() + " is not a whole number");
    const bool fits = value.is_number_unsigned() ? value.get<uint64_t>() <= INT32_MAX
                                                 : value.get<int64_t>() >= INT32_MIN;
    if (!fits) ComplainAbout(field, value.dump() + " has more than 32 bits");
    return value;
  }

  // A positive ratio: "30000/1001", 25, "25", 23.976 or "23.976".
  GivenRatio Ratio(const char* field, bool isFrameRate) const {
    const Json& value = Get(field);
    if (value.is_number()) return FromNumber(field, value.dump(), isFrameRate);
    if (!value.is_string()) ComplainAbout(field, "is neither a number nor a ratio");
    const std::string text = value;
    const size_t slash = text.find('/');
    if (slash == std::string::npos) return FromNumber(field, text, isFrameRate);
    const auto num = Parse<int32_t>(text.substr(0, slash));
    const auto den = Parse<int32_t>(text.substr(slash + 1));
    if (!num || !den) ComplainAbout(field, "\"" + text + "\" is not a ratio of 32-bit numbers");
    if (*den == 0) ComplainAbout(field, "\"" + text + "\" has a zero denominator");
    if (*num <= 0 || *den < 0) ComplainAbout(field, "\"" + text + "\" is not greater than zero");
    return {{*num, static_cast<uint32_t>(*den)}, {}};
  }

  double Number(const char* field) const { return ToNumber(field, Get(field)); }

  M_Vector2T<double> Pair(const char* field) const {
    const Json& list = List(field);
    return {ToNumber(field, list[0]), ToNumber(field, list[1])};
  }

  Size Pixels(const char* field) const {
    const auto length = [&](const Json& value) {
      constexpr int32_t kMost = 30000;
      const bool isLength = value.is_number_integer() && value > 0 && value <= kMost;
      if (!isLength) ComplainAbout(field, value.dump() + " is not a whole number from 1 to 30000");
      return value.get<int32_t>();
    };
    const Json& list = List(field);
    return {length(list[0]), length(list[1])};
  }

 private:
  const Json& List(const char* field) const {
    const Json& list = Get(field);
    if (!list.is_array() || list.size() != 2) ComplainAbout(field, "is not a list of two numbers");
    return list;
  }

  double ToNumber(const char* field, const Json& value) const {
    if (!value.is_number()) ComplainAbout(field, value.dump() + " is not a number");
    return value;
  }

  template <class T>
  static std::optional<T> Parse(const std::string& text) {
    T value;
    const char* const end = text.data() + text.size();
    const auto [rest, error] = std::from_chars(text.data(), end, value);
    if (error != std::errc() || rest != end) return {};
    return value;
  }

  GivenRatio FromNumber(const char* field, const std::string& text, bool isFrameRate) const {
    const auto value = Parse<double>(text);
    if (!value || !std::isfinite(*value)) ComplainAbout(field, "\"" + text + "\" is not a number");
    if (*value <= 0) ComplainAbout(field, text + " is not greater than zero");
    M_Ratio ratio;
    M_FpLong2Ratio(&ratio, nullptr, *value);
    // 0/0 for what is too large, 0/1 for what is too small.
    if (ratio.num == 0) ComplainAbout(field, text + " is out of range");
    if (isFrameRate) {
      // 23.976, 29.97 and their like stand for thousands over 1001, which differ by a millionth.
      const int32_t nominal = M_RoundDouble(*value * 1.001);
      const double broadcast = nominal * 1000.0 / 1001.0;
      if (nominal < 1000 && std::abs(*value - broadcast) < 1.5e-6 * *value) {
        ratio = {nominal * 1000, 1001};
      }
    }
    return {ratio, ratio.num / static_cast<double>(ratio.den) == *value ? "" : text};
  }

  const Json& json_;
  std::string place_;
};

M_Vector2T<double> Center(const Size& size) { return {size.width / 2.0, size.height / 2.0}; }

std::optional<Placement> ReadPlacement(const Fields& fields, const std::optional<Size>& frame) {
  if (!fields.Has("size")) {
    for (const char* field : {"anchor", "position", "scale", "rotation"}) {
      if (fields.Has(field)) fields.ComplainAbout(field, "places a layer that has no \"size\"");
    }
    return {};
  }
  if (!frame) fields.ComplainAbout("size", "needs a composition that has a \"size\"");
  Placement placement;
  placement.size = fields.Pixels("size");
  placement.anchor = fields.Has("anchor") ? fields.Pair("anchor") : Center(placement.size);
  placement.position = fields.Has("position") ? fields.Pair("position") : Center(*frame);
  placement.scale = fields.Has("scale") ? fields.Pair("scale") : M_Vector2T<double>{1, 1};
  placement.rotation = fields.Has("rotation") ? fields.Number("rotation") : 0;
  return placement;
}

Layer ReadLayer(const Json& json, const std::string& fileName, size_t number,
                const std::optional<Size>& frame) {
  std::string place = fileName + ": layer " + std::to_string(number);
  if (json.contains("name") && json["name"].is_string()) {
    place += " (\"" + json["name"].get<std::string>() + "\")";
  }
  const Fields fields(json, place,
                      {"name", "sourceRate", "timeBase", "in", "out", "stretch", "size", "anchor",
                       "position", "scale", "rotation"});
  Layer layer;
  layer.name = fields.Name();
  layer.hasSourceRate = fields.Has("sourceRate");
  if (layer.hasSourceRate && fields.Has("timeBase")) {
    fields.ComplainAbout("timeBase", "stands beside a \"sourceRate\"");
  }
  layer.timeBase =
      layer.hasSourceRate ? fields.Ratio("sourceRate", true) : fields.Ratio("timeBase", false);
  layer.in = fields.Whole("in");
  layer.out = fields.Whole("out");
  if (layer.out < layer.in) fields.ComplainAbout("out", "lies before \"in\"");
  if (int64_t{layer.out} - layer.in > INT32_MAX) {
    fields.ComplainAbout("out", "lies more than 32 bits behind \"in\"");
  }
  layer.stretch = fields.Has("stretch") ? fields.Ratio("stretch", false) : GivenRatio{{1, 1}, {}};
  layer.placement = ReadPlacement(fields, frame);
  return layer;
}

}  // namespace

Composition ReadComposition(std::istream& in, const std::string& fileName) {
  // Follows the parser, so that it can be said where the file stopped making sense.
  size_t layerNumber = 0;
  std::string field;
  const auto follow = [&](int depth, Json::parse_event_t event, Json& parsed) {
    if (event == Json::parse_event_t::object_start && depth == 2) {
      ++layerNumber;
      field.clear();
    }
    if (event == Json::parse_event_t::key) field = parsed;
    return true;
  };
  const auto complain = [&](const std::string& what) {
    std::string place =
        layerNumber == 0 ? ": composition" : ": layer " + std::to_string(layerNumber);
    if (!field.empty()) place += ", at or behind field \"" + field + "\"";
    throw InputError(fileName + place + ": " + what + ".");
  };
  Json json;
  try {
    json = Json::parse(in, follow);
  } catch (const Json::parse_error& error) {
    complain("is not JSON, or ends too soon (at byte " + std::to_string(error.byte) + ")");
  } catch (const Json::out_of_range&) {
    complain("a number is too large");
  }
  const Fields fields(json, fileName + ": composition",
                      {"name", "frameRate", "start", "duration", "size", "layers"});
  Composition composition;
  composition.name = fields.Name();
  composition.frameRate = fields.Ratio("frameRate", true);
  composition.start = fields.Whole("start");
  composition.duration = fields.Whole("duration");
  if (composition.duration <= 0) fields.ComplainAbout("duration", "is not greater than zero");
  if (fields.Has("size")) composition.size = fields.Pixels("size");
  const Json& layers = fields.Get("layers");
  if (!layers.is_array()) fields.ComplainAbout("layers", "is not a list");
  for (const Json& layer : layers) {
    composition.layers.push_back(
        ReadLayer(layer, fileName, composition.layers.size() + 1, composition.size));
  }
  return composition;
}

}  // namespace comp
