#include "TimelineText.h"

#include <cstdio>
#include <nlohmann/json.hpp>

#include "Language.h"
#include "M_Ops.h"
#include "Text.h"
#include "Timecode.h"
#include "Wording.h"

namespace comp {
namespace {

using Json = nlohmann::ordered_json;

constexpr const char* kKinds[] = {Later("clip"), Later("gap"), Later("transition"), Later("stack")};

const char* KindOf(const Item& item) { return kKinds[static_cast<int>(item.kind)]; }

bool IsWhole(const Clock& clock, const Seconds& time) { return clock.IsWhole(time); }

std::string Decimal(const Seconds& time) {
  if (!time.IsKnown()) return Tr("overflow");
  char text[40];
  std::snprintf(text, sizeof text, "%.3f", time.ratio.num / static_cast<double>(time.ratio.den));
  return std::string(time.isExact ? "" : "~").append(text);
}

// A timecode; marked where the time is not exact, or lies within a frame.
std::string Cell(const Clock& clock, const Seconds& time) {
  if (!time.IsKnown()) return Tr("overflow");
  return std::string(IsWhole(clock, time) ? "" : "~").append(clock.Timecode(time));
}

std::string Cells(const std::string& kind, const std::string& name, const std::string& in,
                  const std::string& out, const std::string& sourceIn, const std::string& sourceOut,
                  const std::string& seconds) {
  constexpr size_t kKind = 10, kName = 17, kTimecode = 14, kSeconds = 12;
  return "  " + PadRight(Shortened(kind, kKind), kKind) + ' ' +
         PadRight(Shortened(name, kName), kName) + PadLeft(in, kTimecode) +
         PadLeft(out, kTimecode) + PadLeft(sourceIn, kTimecode) + PadLeft(sourceOut, kTimecode) +
         PadLeft(seconds, kSeconds) + '\n';
}

std::string SpeedText(const Seconds& speed) {
  if (!speed.IsKnown()) return Tr("overflow");
  return std::string(speed.isExact ? "" : "~").append(RateText(speed.ratio));
}

std::string ItemText(const Clock& clock, const Item& item) {
  std::string text = Cells(Tr(KindOf(item)), Printable(item.name), Cell(clock, item.recordIn),
                           Cell(clock, item.recordOut), Cell(clock, item.sourceIn),
                           Cell(clock, item.sourceOut), Decimal(item.recordOut - item.recordIn));
  std::string more;
  if (item.size) more = Tr("{0} x {1} pixels", {ToText(item.size->x), ToText(item.size->y)});
  if (item.speed.ratio != M_Ratio{1, 1}) {
    more.append(more.empty() ? "" : ", ").append(Tr("at a speed of {0}", {SpeedText(item.speed)}));
  }
  if (!more.empty()) text.append(13, ' ').append(more).append("\n");
  return text;
}

std::string MarkersText(const Clock& clock, const std::vector<Marker>& markers) {
  std::string text;
  for (const Marker& marker : markers) {
    text +=
        Cells(Tr("marker"), Printable(marker.name), Cell(clock, marker.in), Cell(clock, marker.out),
              "", Printable(marker.color), Decimal(marker.out - marker.in));
  }
  return text;
}

std::string TrackText(const Clock& clock, const Track& track, size_t number) {
  std::string text(1, '\n');
  text += Tr("Track {0}, {1}", {std::to_string(number), Printable(track.kind)});
  if (!track.name.empty())
    text.append(", \"").append(Shortened(Printable(track.name), 50)).append("\"");
  text.append(", ").append(Decimal(track.duration)).append(" s\n");
  if (!track.items.empty()) {
    text += Cells("", "", Tr("record in"), Tr("record out"), Tr("source in"), Tr("source out"),
                  Tr("seconds"));
  }
  for (const Item& item : track.items) text += ItemText(clock, item);
  text += MarkersText(clock, track.markers);
  return text;
}

// Length, rates, and what is not exact.
std::string Summary(const Clock& clock, const Timeline& timeline) {
  std::string text = Tr("Timeline \"{0}\"", {Shortened(Printable(timeline.name), 80)}) + "\n  ";
  text +=
      Tr("{0} frames a second, {1} long, starts at {2}",
         {RateText(timeline.rate), Cell(clock, timeline.duration), Cell(clock, timeline.start)});
  text += '\n';
  std::vector<std::string> rates;
  for (const M_Ratio& rate : timeline.rates) rates.push_back(RateText(rate));
  text += Line(Tr("duration"), {Decimal(timeline.duration), "s"});
  text += Line(Tr("counted in"), Listed(std::move(rates)));
  Doubts doubts;
  for (const Track& track : timeline.tracks) {
    for (const Item& item : track.items) {
      for (const Seconds* time :
           {&item.recordIn, &item.recordOut, &item.sourceIn, &item.sourceOut}) {
        doubts.Add(time->IsKnown(), time->isExact, time->maxError);
      }
    }
  }
  return text.append("  ").append(doubts.Text()).append("\n");
}

Json ToJson(const Clock& clock, const Seconds& time) {
  if (!time.IsKnown()) {
    return {{"seconds", nullptr},
            {"exact", false},
            {"frame", nullptr},
            {"wholeFrame", false},
            {"timecode", nullptr}};
  }
  Json json = {{"seconds", RatioText(time.ratio)},
               {"exact", time.isExact},
               {"frame", clock.Frame(time)},
               {"wholeFrame", IsWhole(clock, time)},
               {"timecode", clock.Timecode(time)}};
  if (!time.isExact) json["maxError"] = time.maxError;
  return json;
}

Json ToJson(const Clock& clock, const std::vector<Marker>& markers) {
  Json list = Json::array();
  for (const Marker& marker : markers) {
    list.push_back({{"name", marker.name},
                    {"color", marker.color},
                    {"in", ToJson(clock, marker.in)},
                    {"out", ToJson(clock, marker.out)}});
  }
  return list;
}

}  // namespace

std::string ToTable(const std::vector<Timeline>& timelines, bool mayDrop) {
  std::string text;
  for (const Timeline& timeline : timelines) {
    const Clock clock(timeline.rate, mayDrop);
    text.append(text.empty() ? "" : "\n").append(Summary(clock, timeline));
    for (size_t i = 0; i < timeline.tracks.size(); ++i) {
      text += TrackText(clock, timeline.tracks[i], i + 1);
    }
    if (!timeline.markers.empty()) text.append("\n").append(MarkersText(clock, timeline.markers));
    for (const std::string& remark : timeline.remarks) {
      text += '\n';
      text += Tr("Remark: {0}.", {Printable(remark)});
    }
    if (!timeline.remarks.empty()) text += '\n';
  }
  return text + "\n" + Tr("~ marks a time that is not exact, or lies within a frame.") + "\n";
}

std::string ToCsv(const std::vector<Timeline>& timelines, bool mayDrop) {
  const auto quoted = [](const std::string& text) {
    std::string field = "\"";
    for (const char c : Printable(text)) field.append(c == '"' ? 2 : 1, c);
    return field + '"';
  };
  std::string text =
      "timeline,track,kind,name,record in,record out,source in,source out,speed,exact,timecode "
      "in,timecode out\n";
  for (const Timeline& timeline : timelines) {
    const Clock clock(timeline.rate, mayDrop);
    for (size_t i = 0; i < timeline.tracks.size(); ++i) {
      for (const Item& item : timeline.tracks[i].items) {
        text += quoted(timeline.name) + ',' + std::to_string(i + 1) + ',' + KindOf(item) + ',' +
                quoted(item.name);
        bool isExact = true;
        for (const Seconds& time : {item.recordIn, item.recordOut, item.sourceIn, item.sourceOut}) {
          text.append(",").append(time.IsKnown() ? RatioText(time.ratio) : "");
          isExact &= time.isExact;
        }
        text.append(",")
            .append(item.speed.IsKnown() ? RatioText(item.speed.ratio) : "")
            .append(isExact ? ",1" : ",0");
        for (const Seconds& time : {item.recordIn, item.recordOut}) {
          text.append(",").append(time.IsKnown() ? clock.Timecode(time) : "");
        }
        text += '\n';
      }
    }
  }
  return text;
}

std::string ToJson(const std::vector<Timeline>& timelines, bool mayDrop) {
  Json all = Json::array();
  for (const Timeline& timeline : timelines) {
    const Clock clock(timeline.rate, mayDrop);
    Json tracks = Json::array();
    for (const Track& track : timeline.tracks) {
      Json items = Json::array();
      for (const Item& item : track.items) {
        Json json = {{"kind", KindOf(item)},
                     {"name", item.name},
                     {"recordIn", ToJson(clock, item.recordIn)},
                     {"recordOut", ToJson(clock, item.recordOut)},
                     {"sourceIn", ToJson(clock, item.sourceIn)},
                     {"sourceOut", ToJson(clock, item.sourceOut)},
                     {"speed", item.speed.IsKnown() ? Json(RatioText(item.speed.ratio)) : Json()}};
        if (!item.speed.isExact) json["speedIsExact"] = false;
        if (item.size) json["size"] = {item.size->x, item.size->y};
        items.push_back(std::move(json));
      }
      tracks.push_back({{"name", track.name},
                        {"kind", track.kind},
                        {"duration", ToJson(clock, track.duration)},
                        {"items", std::move(items)},
                        {"markers", ToJson(clock, track.markers)}});
    }
    all.push_back({{"name", timeline.name},
                   {"rate", RatioText(timeline.rate)},
                   {"start", ToJson(clock, timeline.start)},
                   {"duration", ToJson(clock, timeline.duration)},
                   {"tracks", std::move(tracks)},
                   {"markers", ToJson(clock, timeline.markers)},
                   {"remarks", timeline.remarks}});
  }
  const Json json = {{"timelines", std::move(all)}};
  return PrintableJson(json.dump(2, ' ', false, Json::error_handler_t::replace)) + '\n';
}

}  // namespace comp
