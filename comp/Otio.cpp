#include "Otio.h"

#include <algorithm>
#include <cctype>
#include <cmath>
#include <cstdlib>
#include <nlohmann/json.hpp>
#include <optional>
#include <set>
#include <utility>

#include "Composition.h"
#include "Fraction.h"
#include "JsonPlace.h"
#include "Language.h"
#include "M_Ops.h"
#include "Rates.h"
#include "Seconds.h"

namespace comp {
namespace {

using Json = nlohmann::json;

// Writers put Infinity, NaN and numbers beyond a double into their metadata, which JSON has not:
// they become empty texts. The rest stays where it is. A file that is nested deeper than any edit
// throws.
std::string WithoutOddNumbers(const std::string& text, const std::string& fileName) {
  int depth = 0;
  std::string plain;
  plain.reserve(text.size());
  for (size_t i = 0; i < text.size();) {
    const char c = text[i];
    size_t end = i + 1;
    if (c == '"') {
      while (end < text.size() && text[end] != '"') end += text[end] == '\\' ? 2 : 1;
      end = std::min(end + 1, text.size());
      plain.append(text, i, end - i);
    } else if (c == '-' || std::isalnum(static_cast<unsigned char>(c))) {
      const auto isPart = [](char part) {
        return std::isalnum(static_cast<unsigned char>(part)) || part == '.' || part == '+' ||
               part == '-';
      };
      while (end < text.size() && isPart(text[end])) ++end;
      const std::string token = text.substr(i, end - i);
      // Also what strtod() takes for one of them.
      char* rest;
      const bool isOdd = !std::isfinite(std::strtod(token.c_str(), &rest)) && *rest == '\0';
      plain += isOdd ? std::string("\"\"").append(token.size() - 2, ' ') : token;
    } else {
      depth += c == '{' || c == '[' ? 1 : c == '}' || c == ']' ? -1 : 0;
      if (depth > 1000) throw InputError(Tr("{0}: is nested too deeply.", {fileName}));
      plain += c;
    }
    i = end;
  }
  return plain;
}

// A span of a medium, or of a track.
struct Range {
  Seconds start, duration;
};

class Reader {
 public:
  explicit Reader(const std::string& fileName) : fileName_(fileName) {}

  std::vector<Timeline> Read(const Json& root) {
    std::vector<std::string> passedOver;
    Collect(root, &passedOver);
    if (timelines_.empty()) throw InputError(Tr("{0}: there is no timeline in it.", {fileName_}));
    auto& remarks = timelines_[0].remarks;
    remarks.insert(remarks.end(), passedOver.begin(), passedOver.end());
    return std::move(timelines_);
  }

 private:
  void Collect(const Json& json, std::vector<std::string>* passedOver) {
    if (IsA(json, "SerializableCollection")) {
      for (const Json& child : List(json, "children")) Collect(child, passedOver);
    } else if (IsA(json, "Timeline")) {
      timelines_.push_back(ReadTracks(json, Get(json, "tracks")));
    } else if (IsA(json, "Stack") || IsItem(json) || IsTrack(json)) {
      timelines_.push_back(ReadTracks(json, json));
    } else {
      passedOver->push_back(Tr("an object {0} is passed over", {Get(json, "OTIO_SCHEMA").dump()}));
    }
  }

  // Whether an object's schema has this name, in any version.
  static bool IsA(const Json& json, const std::string& name) {
    if (!json.is_object() || !json.contains("OTIO_SCHEMA")) return false;
    const Json& schema = json["OTIO_SCHEMA"];
    if (!schema.is_string()) return false;
    const std::string text = schema;
    return text.substr(0, text.find('.')) == name;
  }

  static bool IsItem(const Json& json) {
    return IsA(json, "Clip") || IsA(json, "Gap") || IsA(json, "Filler");
  }
  static bool IsTrack(const Json& json) { return IsA(json, "Track") || IsA(json, "Sequence"); }

  static const Json& Get(const Json& json, const char* field) {
    static const Json none;
    return json.is_object() && json.contains(field) ? json[field] : none;
  }
  static const Json& List(const Json& json, const char* field) {
    static const Json none = Json::array();
    const Json& list = Get(json, field);
    return list.is_array() ? list : none;
  }
  static std::string Name(const Json& json) {
    const Json& name = Get(json, "name");
    return name.is_string() ? name.get<std::string>() : std::string();
  }

  void Remark(const std::string& text) {
    if (remarks_.insert(text).second) timeline_.remarks.push_back(text);
  }

  // What it is, and what stands for it.
  struct RateOfTime {
    Fraction exact;
    M_Ratio ratio;
  };

  std::optional<RateOfTime> Rate(const Json& time) {
    const Json& rate = Get(time, "rate");
    const auto exact = ToFraction(rate.is_number() ? rate.dump() : "", true);
    // Neither may be more than a num holds: a frame is its reciprocal.
    const auto ratio = exact ? Nearest(*exact, INT32_MAX) : std::nullopt;
    if (!ratio || ratio->num <= 0) return {};
    if (!Seconds(*exact).isExact)
      Remark(Tr("the rate {0} is no ratio of 32 bits: the nearest is taken", {rate.dump()}));
    timeline_.rates.insert(*ratio);
    return RateOfTime{*exact, *ratio};
  }

  // value / rate; nothing where there is none, and unknown for one that cannot be read.
  std::optional<Seconds> Time(const Json& time) {
    if (time.is_null()) return {};
    const Json& value = Get(time, "value");
    const auto rate = Rate(time);
    const auto count = ToFraction(value.is_number() ? value.dump() : "", false);
    if (rate && count) return Seconds(*count) / Seconds(rate->exact);
    Remark(Tr("the time {0} over {1} cannot be read", {value.dump(), Get(time, "rate").dump()}));
    return kUnknown;
  }

  std::optional<Range> ReadRange(const Json& range) {
    const auto duration = Time(Get(range, "duration"));
    if (!duration) return {};
    return Range{Time(Get(range, "start_time")).value_or(Seconds()), *duration};
  }

  // The medium that a clip shows: the one that is chosen, of several.
  static const Json& Medium(const Json& clip) {
    const Json& several = Get(clip, "media_references");
    const Json& key = Get(clip, "active_media_reference_key");
    if (several.is_object())
      return Get(several, key.is_string() ? key.get<std::string>().c_str() : "DEFAULT_MEDIA");
    return Get(clip, "media_reference");
  }

  // What of an item is seen: its source range or, without one, all there is.
  Range Trimmed(const Json& item) {
    if (const auto given = ReadRange(Get(item, "source_range"))) return *given;
    if (IsA(item, "Clip")) {
      if (const auto available = ReadRange(Get(Medium(item), "available_range"))) return *available;
      Remark(Tr("\"{0}\" does not say how long it is", {Name(item)}));
      return {};
    }
    if (IsA(item, "Timeline")) return Trimmed(Get(item, "tracks"));
    Range all;
    for (const Json& child : List(item, "children")) {
      if (IsA(child, "Transition")) continue;
      const Seconds duration = Trimmed(child).duration;
      if (IsA(item, "Stack")) {
        if (all.duration < duration) all.duration = duration;
      } else {
        all.duration = all.duration + duration;
      }
    }
    return all;
  }

  // Of the medium's picture.
  static std::optional<M_Vector2T<double>> PictureSize(const Json& clip) {
    const Json& bounds = Get(Medium(clip), "available_image_bounds");
    const auto number = [&](const char* corner, const char* axis) {
      const Json& value = Get(Get(bounds, corner), axis);
      return value.is_number() ? value.get<double>() : NAN;
    };
    const M_Vector2T<double> size = {number("max", "x") - number("min", "x"),
                                     number("max", "y") - number("min", "y")};
    if (!std::isfinite(size.x) || !std::isfinite(size.y)) return {};
    return size;
  }

  // Those that begin in what is seen of an object, which is at `at` in the timeline.
  void ReadMarkers(const Json& json, const Range& seen, const Seconds& at,
                   std::vector<Marker>* markers) {
    for (const Json& marker : List(json, "markers")) {
      const auto range = ReadRange(Get(marker, "marked_range"));
      if (!range) continue;
      const Seconds offset = range->start - seen.start, in = at + offset;
      if (offset < Seconds() || !(offset < seen.duration)) continue;
      const Json& color = Get(marker, "color");
      markers->push_back({Name(marker), color.is_string() ? color.get<std::string>() : "", in,
                          in + range->duration});
    }
  }

  // Seconds of the source a second.
  Seconds Speed(const Json& item) {
    Seconds speed = M_Ratio{1, 1};
    for (const Json& effect : List(item, "effects")) {
      if (IsA(effect, "FreezeFrame")) {
        speed = M_Ratio{0, 1};
      } else if (IsA(effect, "LinearTimeWarp")) {
        const Json& scalar = Get(effect, "time_scalar");
        if (scalar.is_null()) continue;
        const auto factor = ToFraction(scalar.is_number() ? scalar.dump() : "", false);
        speed = speed * (factor ? Seconds(*factor) : kUnknown);
        if (!speed.isExact) Remark(Tr("the speed of \"{0}\" is not exact", {Name(item)}));
      } else if (!IsA(effect, "Effect") && !Get(effect, "OTIO_SCHEMA").is_null()) {
        Remark(Tr("an effect {0} is passed over", {Get(effect, "OTIO_SCHEMA").dump()}));
      }
    }
    return speed;
  }

  // Leaves of items and markers what is in a range, and counts from its beginning.
  static void Trim(Track* track, const Range& range) {
    const auto items = std::exchange(track->items, {});
    for (Item item : items) {
      item.recordIn = item.recordIn - range.start;
      item.recordOut = item.recordOut - range.start;
      const Seconds before = Seconds() - item.recordIn, behind = item.recordOut - range.duration;
      if (!(Seconds() < item.recordOut) || !(item.recordIn < range.duration)) continue;
      if (Seconds() < before) {
        item.recordIn = Seconds();
        item.sourceIn = item.sourceIn + before * item.speed;
      }
      if (Seconds() < behind) {
        item.recordOut = range.duration;
        item.sourceOut = item.sourceOut - behind * item.speed;
      }
      track->items.push_back(std::move(item));
    }
    Trim(&track->markers, range);
    track->duration = range.duration;
  }
  static void Trim(std::vector<Marker>* markers, const Range& range) {
    for (Marker& marker : *markers) {
      marker.in = marker.in - range.start;
      marker.out = marker.out - range.start;
    }
    std::erase_if(*markers, [&](const Marker& marker) {
      return marker.in < Seconds() || !(marker.in < range.duration);
    });
  }

  Track ReadTrack(const Json& json) {
    Track track;
    track.name = Name(json);
    const Json& kind = Get(json, "kind");
    track.kind = kind.is_string() ? kind.get<std::string>() : "Video";
    Seconds at;
    for (const Json& child : List(json, "children")) {
      if (IsA(child, "Transition")) {
        const Seconds in = Time(Get(child, "in_offset")).value_or(Seconds());
        const Seconds out = Time(Get(child, "out_offset")).value_or(Seconds());
        track.items.push_back({Item::Kind::kTransition,
                               Name(child),
                               at - in,
                               at + out,
                               Seconds() - in,
                               out,
                               M_Ratio{1, 1},
                               {}});
        continue;
      }
      const bool isNested = IsA(child, "Stack") || IsTrack(child) || IsA(child, "Timeline");
      if (!IsItem(child) && !isNested) {
        Remark(Tr("an object {0} is passed over", {Get(child, "OTIO_SCHEMA").dump()}));
        continue;
      }
      const Range range = Trimmed(child);
      const Seconds speed = Speed(child);
      const Item::Kind itemKind = isNested             ? Item::Kind::kStack
                                  : IsA(child, "Clip") ? Item::Kind::kClip
                                                       : Item::Kind::kGap;
      const Seconds end = at + range.duration, sourceEnd = range.start + range.duration * speed;
      track.items.push_back(
          {itemKind, Name(child), at, end, range.start, sourceEnd, speed, PictureSize(child)});
      ReadMarkers(child, range, at, &track.markers);
      at = end;
    }
    track.duration = at;
    const auto trim = ReadRange(Get(json, "source_range"));
    if (trim) Trim(&track, *trim);
    ReadMarkers(json, {trim ? trim->start : Seconds(), track.duration}, Seconds(), &track.markers);
    return track;
  }

  // The first rate that is met.
  std::optional<M_Ratio> FindRate(const Json& json) {
    if (!json.is_object()) return {};
    if (IsA(json, "RationalTime")) {
      const auto rate = Rate(json);
      return rate ? std::optional(rate->ratio) : std::nullopt;
    }
    for (const char* field : {"source_range", "start_time", "duration", "tracks"}) {
      if (const auto rate = FindRate(Get(json, field))) return rate;
    }
    for (const Json& child : List(json, "children")) {
      if (const auto rate = FindRate(child)) return rate;
    }
    return IsA(json, "Clip") ? FindRate(Get(Medium(json), "available_range")) : std::nullopt;
  }

  Timeline ReadTracks(const Json& json, const Json& tracks) {
    timeline_ = {};
    remarks_.clear();
    timeline_.name = Name(json);
    const Json& start = Get(json, "global_start_time");
    timeline_.start = Time(start).value_or(Seconds());
    const auto rate = Rate(start);
    const auto met = rate ? std::optional(rate->ratio) : FindRate(tracks);
    timeline_.rate = met.value_or(M_Ratio{24, 1});
    if (!met) Remark(Tr("no rate is given: 24 frames a second are taken"));
    const auto add = [&](const Json& child) {
      timeline_.tracks.push_back(ReadTrack(child));
      const Seconds& duration = timeline_.tracks.back().duration;
      if (timeline_.duration < duration) timeline_.duration = duration;
    };
    if (IsTrack(tracks)) {
      add(tracks);
    } else if (IsItem(tracks)) {
      add({{"children", Json::array({tracks})}});
    } else {
      for (const Json& child : List(tracks, "children")) {
        // What stands in the stack by itself is a track of its own.
        if (IsTrack(child)) {
          add(child);
        } else {
          add({{"name", Name(child)}, {"children", Json::array({child})}});
        }
      }
    }
    const auto trim = IsA(tracks, "Stack") ? ReadRange(Get(tracks, "source_range")) : std::nullopt;
    if (trim) {
      for (Track& track : timeline_.tracks) Trim(&track, *trim);
      timeline_.duration = trim->duration;
    }
    if (IsA(tracks, "Stack")) {
      ReadMarkers(tracks, {trim ? trim->start : Seconds(), timeline_.duration}, Seconds(),
                  &timeline_.markers);
    }
    return std::move(timeline_);
  }

  const std::string& fileName_;
  std::vector<Timeline> timelines_;
  Timeline timeline_;              // The one that is read.
  std::set<std::string> remarks_;  // Those of the timeline, each once.
};

}  // namespace

bool IsOtio(const std::string& text) { return text.find("\"OTIO_SCHEMA\"") != std::string::npos; }

std::vector<Timeline> ReadOtio(const std::string& text, const std::string& fileName) {
  const std::string plain = WithoutOddNumbers(text, fileName);
  try {
    return Reader(fileName).Read(Json::parse(plain));
  } catch (const Json::parse_error& error) {
    const auto [line, column] = PlaceOf(text, error.byte - std::min<size_t>(error.byte, 1));
    const std::string where =
        Tr(" (line {0}, column {1})", {std::to_string(line), std::to_string(column)});
    throw InputError(Tr("{0}: is not JSON, or ends too soon{1}.", {fileName, where}), line, column);
  }
}

}  // namespace comp
