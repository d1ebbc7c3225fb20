#include "SheetText.h"

#include <cstdio>
#include <nlohmann/json.hpp>
#include <set>

#include "Language.h"
#include "LayoutText.h"
#include "M_Ops.h"
#include "SceneText.h"
#include "Text.h"
#include "Timecode.h"
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
  if (value.accuracy == Accuracy::kOverflow) return Tr("overflow");
  return Marked(value.accuracy != Accuracy::kApproximated, ToText(value.ratio));
}

std::string ToText(const Frames& frames) {
  return frames.hasOverflowed ? Tr("overflow")
                              : Marked(frames.isExact, std::to_string(frames.count));
}

// A ratio and, where it stands for a decimal, that decimal.
std::string ToText(const GivenRatio& ratio) {
  std::string text = ToText(ratio.ratio);
  if (!ratio.given.empty()) text += Tr(" (approximates {0})", {ratio.given});
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

// Cells of a line: the first to the left, the others to the right of their columns.
std::string Cells(const std::string& label, const std::string& units, const std::string& exact,
                  const std::string& seconds, const std::string& frames,
                  const std::string& timecode) {
  std::string line = "  " + PadRight(label, 11) + PadLeft(units, 13) + PadLeft(exact, 23) +
                     PadLeft(seconds, 20) + PadLeft(frames, 13) + PadLeft(timecode, 15);
  line.erase(line.find_last_not_of(' ') + 1);
  return line += '\n';
}

std::string Decimal(const Value& value) {
  if (value.accuracy == Accuracy::kOverflow) return "";
  return SecondsText(value.ratio, value.maxError);
}

std::string Timecode(const Clock& clock, const Time& time) {
  if (time.frames.hasOverflowed) return Tr("overflow");
  return Marked(time.frames.isExact, clock.Timecode(time.frames.count));
}

std::string Cells(const Clock& clock, const std::string& label, const std::string& units,
                  const Time& time) {
  return Cells(label, units, ToText(time.seconds), Decimal(time.seconds), ToText(time.frames),
               Timecode(clock, time));
}

std::string Heads(const std::string& units) {
  return Cells("", units, Tr("exact, s"), Tr("seconds"), Tr("frames"), Tr("timecode"));
}

bool IsSame(const Value& a, const Value& b) {
  return a.accuracy == b.accuracy && (a.accuracy == Accuracy::kOverflow || a.ratio == b.ratio);
}

// What of a row is not at its place as given.
bool IsClipped(const Row& row) {
  return !IsSame(row.in.seconds, row.clippedIn.seconds) ||
         !IsSame(row.out.seconds, row.clippedOut.seconds);
}

std::string Summary(const Sheet& sheet, const Clock& clock) {
  std::string text = Tr("Composition \"{0}\"", {Shortened(Printable(sheet.name), 80)}) + "\n  ";
  text +=
      Tr("{0} frames a second, {1} long, starts at {2}",
         {ToRate(sheet.frameRate), Timecode(clock, sheet.duration), Timecode(clock, sheet.start)});
  text += '\n';
  std::set<std::string> rates;
  Doubts doubts;
  const auto add = [&](const Value& value) {
    doubts.Add(value.accuracy != Accuracy::kOverflow, value.accuracy != Accuracy::kApproximated,
               value.maxError);
  };
  add(sheet.start.seconds);
  add(sheet.duration.seconds);
  for (const Row& row : sheet.rows) {
    rates.insert(row.hasSourceRate ? ToRate(row.timeBase) : ToText(row.timeBase) + " s");
    for (const Time* time : {&row.in, &row.out, &row.duration, &row.clippedIn, &row.clippedOut,
                             &row.clippedDuration}) {
      add(time->seconds);
    }
    add(row.sourceDuration);
  }
  text += Line(Tr("layers"), {std::to_string(sheet.rows.size())});
  text += Line(Tr("counted in"), Listed({rates.begin(), rates.end()}));
  return text.append("  ").append(doubts.Text()).append("\n\n");
}

Json ToJson(const Value& value) {
  Json json = {{"ratio", RatioText(value.ratio)}, {"accuracy", Name(value.accuracy)}};
  if (value.accuracy == Accuracy::kApproximated) json["maxError"] = value.maxError;
  return json;
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

Json ToJson(const Row& row) {
  return {{"name", row.name},
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
          {"runningSum", ToJson(row.runningSum)}};
}

std::string Text(const Json& json) {
  return PrintableJson(json.dump(2, ' ', false, Json::error_handler_t::replace));
}

}  // namespace

std::string ToTable(const Sheet& sheet, bool mayDrop) {
  const Clock clock(sheet.frameRate.ratio, mayDrop);
  std::string text = Summary(sheet, clock) + Heads("");
  text += Cells(clock, Tr("start"), "", sheet.start);
  text += Cells(clock, Tr("duration"), "", sheet.duration);
  for (const Row& row : sheet.rows) {
    const std::string name = Printable(row.name);
    text += '\n';
    text += row.hasSourceRate ? Tr("Layer \"{0}\", in frames of {1} a second, stretch {2}",
                                   {name, ToRate(row.timeBase), ToText(row.stretch)})
                              : Tr("Layer \"{0}\", in units of {1} s, stretch {2}",
                                   {name, ToText(row.timeBase), ToText(row.stretch)});
    text += '\n' + Heads(Tr("units"));
    text += Cells(clock, Tr("in"), std::to_string(row.inUnits), row.in);
    text += Cells(clock, Tr("out"), std::to_string(row.outUnits), row.out);
    text += Cells(clock, Tr("duration"), std::to_string(row.outUnits - row.inUnits), row.duration);
    if (IsClipped(row)) {
      text += Cells(clock, Tr("seen from"), "", row.clippedIn);
      text += Cells(clock, Tr("seen to"), "", row.clippedOut);
      text += Cells(clock, Tr("seen for"), "", row.clippedDuration);
    }
    if (!IsSame(row.sourceDuration, row.clippedDuration.seconds)) {
      text += Cells(Tr("of source"), "", ToText(row.sourceDuration), Decimal(row.sourceDuration),
                    "", "");
    }
  }
  text.append("\n")
      .append(Tr("~ marks what is not exact: frames are rounded, ratios near what does not fit."))
      .append("\n");
  if (sheet.layout) text.append("\n").append(ToTable(*sheet.layout));
  if (sheet.scene) text.append("\n").append(ToTable(*sheet.scene));
  if (!sheet.reports.empty()) text.append("\n").append(Tr("Reported by the library:")).append("\n");
  for (const Report& report : sheet.reports) {
    text.append("  [").append(IdText(report.id)).append("] ").append(report.text);
    if (!report.layer.empty()) text += Tr(" (layer \"{0}\")", {Printable(report.layer)});
    text += '\n';
  }
  return text;
}

std::string ToJson(const Sheet& sheet) {
  Json json = {{"name", sheet.name},           {"frameRate", ToJson(sheet.frameRate)},
               {"start", ToJson(sheet.start)}, {"duration", ToJson(sheet.duration)},
               {"layers", Json::array()},      {"reports", Json::array()}};
  if (sheet.layout) json["layout"] = ToJson(*sheet.layout);
  if (sheet.scene) json["space"] = ToJson(*sheet.scene);
  for (const Report& report : sheet.reports) {
    json["reports"].push_back({{"layer", report.layer},
                               {"id", IdText(report.id)},
                               {"severity", report.severity},
                               {"text", report.text}});
  }
  // Layer by layer: one tree of them all would take several times the room.
  const std::string empty = "\n  \"layers\": []";
  std::string text = Text(json);
  const size_t place = text.find(empty) + empty.size() - 1;
  const std::string rest = text.substr(place);
  text.resize(place);
  for (const Row& row : sheet.rows) {
    text += text.back() == '[' ? "\n    " : ",\n    ";
    for (const char c : Text(ToJson(row))) {
      text += c;
      if (c == '\n') text += "    ";
    }
  }
  text.append(sheet.rows.empty() ? "" : "\n  ").append(rest);
  return text += '\n';
}

}  // namespace comp
