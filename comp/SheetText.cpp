#include "SheetText.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "LayoutText.h"
#include "SceneText.h"
#include "Wording.h"

namespace comp {
namespace {

using Json = nlohmann::ordered_json;

std::string ToText(const M_Ratio& r) { return r.den == 1 ? std::to_string(r.num) : RatioText(r); }

// A number with its mark where it is not exact.
std::string Marked(bool isExact, const std::string& number) {
  return std::string(isExact ? "" : "~").append(number);
}

std::string ToText(const Value& value) {
  if (value.accuracy == Accuracy::kOverflow) return "overflow";
  return Marked(value.accuracy != Accuracy::kApproximated, ToText(value.ratio));
}

std::string ToText(const Frames& frames) {
  return frames.hasOverflowed ? "overflow" : Marked(frames.isExact, std::to_string(frames.count));
}

// A ratio and, where it stands for a decimal, that decimal.
std::string ToText(const GivenRatio& ratio) {
  std::string text = ToText(ratio.ratio);
  if (!ratio.given.empty()) text.append(" (approximates ").append(ratio.given).append(")");
  return text;
}

// The same of a rate, which people know by its decimal.
std::string ToRate(const GivenRatio& rate) {
  return rate.given.empty() ? RateText(rate.ratio) : ToText(rate);
}

std::string IdText(uint32_t id) {
  char text[16];
  std::snprintf(text, sizeof text, "0x%06X", static_cast<unsigned>(id));
  return text;
}

const char* Name(Accuracy accuracy) {
  switch (accuracy) {
    case Accuracy::kExact:
      return "exact";
    case Accuracy::kReduced:
      return "reduced";
    case Accuracy::kApproximated:
      return "approximated";
    case Accuracy::kOverflow:
      return "overflow";
  }
  return "";
}

// Cells of a line, the first to the left, the others to the right of their columns.
std::string Line(const std::string& label, const std::string& units, const std::string& seconds,
                 const std::string& frames, const std::string& clipped) {
  char cells[256];
  std::snprintf(cells, sizeof cells, "  %-10s %12s %24s %12s %12s", label.c_str(), units.c_str(),
                seconds.c_str(), frames.c_str(), clipped.c_str());
  std::string line = cells;
  line.erase(line.find_last_not_of(' ') + 1);
  return line += '\n';
}

Json ToJson(const Value& value) {
  return {{"ratio", RatioText(value.ratio)}, {"accuracy", Name(value.accuracy)}};
}

Json ToJson(const Time& time) {
  Json json = {{"seconds", ToJson(time.seconds)}};
  json["frames"] = time.frames.hasOverflowed ? Json() : Json(time.frames.count);
  json["isWholeFrame"] = time.frames.isExact;
  return json;
}

Json ToJson(const GivenRatio& ratio) {
  Json json = {{"ratio", RatioText(ratio.ratio)}};
  if (!ratio.given.empty()) json["approximates"] = ratio.given;
  return json;
}

}  // namespace

std::string ToTable(const Sheet& sheet) {
  std::string text = "Composition \"" + Printable(sheet.name) + "\", " + ToRate(sheet.frameRate) +
                     " frames a second\n";
  text += Line("", "units", "seconds", "frames", "");
  text += Line("start", "", ToText(sheet.start.seconds), ToText(sheet.start.frames), "");
  text += Line("duration", "", ToText(sheet.duration.seconds), ToText(sheet.duration.frames), "");
  for (const Row& row : sheet.rows) {
    text += "\nLayer \"" + Printable(row.name) + "\", in ";
    text += row.hasSourceRate ? "frames of " + ToRate(row.timeBase) + " a second"
                              : "units of " + ToText(row.timeBase) + " s";
    text += ", stretch " + ToText(row.stretch) + '\n';
    text += Line("", "units", "seconds", "frames", "clipped");
    text += Line("in", std::to_string(row.inUnits), ToText(row.in.seconds), ToText(row.in.frames),
                 ToText(row.clippedIn.frames));
    text += Line("out", std::to_string(row.outUnits), ToText(row.out.seconds),
                 ToText(row.out.frames), ToText(row.clippedOut.frames));
    text +=
        Line("duration", std::to_string(row.outUnits - row.inUnits), ToText(row.duration.seconds),
             ToText(row.duration.frames), ToText(row.clippedDuration.frames));
    text += Line("of source", "", ToText(row.sourceDuration), "", "");
    text += Line("sum so far", "", ToText(row.runningSum), Name(row.runningSum.accuracy), "");
  }
  const Value sum =
      sheet.rows.empty() ? Value{{0, 1}, Accuracy::kExact} : sheet.rows.back().runningSum;
  text.append("\nSum of the durations: ").append(ToText(sum));
  if (sum.accuracy != Accuracy::kOverflow) text.append(" s, ").append(Name(sum.accuracy));
  text += '\n';
  text += "~ marks what is not exact: frames are rounded, ratios the nearest that fit.\n";
  if (sheet.layout) text.append("\n").append(ToTable(*sheet.layout));
  if (sheet.scene) text.append("\n").append(ToTable(*sheet.scene));
  if (!sheet.reports.empty()) text += "\nReported by the library:\n";
  for (const Report& report : sheet.reports) {
    text.append("  [").append(IdText(report.id)).append("] ").append(report.text);
    if (!report.layer.empty())
      text.append(" (layer \"").append(Printable(report.layer)).append("\")");
    text += '\n';
  }
  return text;
}

std::string ToJson(const Sheet& sheet) {
  Json json = {{"name", sheet.name},           {"frameRate", ToJson(sheet.frameRate)},
               {"start", ToJson(sheet.start)}, {"duration", ToJson(sheet.duration)},
               {"layers", Json::array()},      {"reports", Json::array()}};
  for (const Row& row : sheet.rows) {
    json["layers"].push_back({{"name", row.name},
                              {row.hasSourceRate ? "sourceRate" : "timeBase", ToJson(row.timeBase)},
                              {"stretch", ToJson(row.stretch)},
                              {"inUnits", row.inUnits},
                              {"outUnits", row.outUnits},
                              {"in", ToJson(row.in)},
                              {"out", ToJson(row.out)},
                              {"duration", ToJson(row.duration)},
                              {"clippedIn", ToJson(row.clippedIn)},
                              {"clippedOut", ToJson(row.clippedOut)},
                              {"clippedDuration", ToJson(row.clippedDuration)},
                              {"sourceDuration", ToJson(row.sourceDuration)},
                              {"runningSum", ToJson(row.runningSum)}});
  }
  if (sheet.layout) json["layout"] = ToJson(*sheet.layout);
  if (sheet.scene) json["space"] = ToJson(*sheet.scene);
  for (const Report& report : sheet.reports) {
    json["reports"].push_back({{"layer", report.layer},
                               {"id", IdText(report.id)},
                               {"severity", report.severity},
                               {"text", report.text}});
  }
  return json.dump(2, ' ', false, Json::error_handler_t::replace) + '\n';
}

}  // namespace comp
