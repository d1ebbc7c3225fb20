#include "TimelineText.h"

#include <cstdio>
#include <nlohmann/json.hpp>
#include <sstream>

#include "M_Ops.h"
#include "Timecode.h"
#include "Wording.h"

namespace comp {
namespace {

using Json = nlohmann::ordered_json;

constexpr const char* kKinds[] = {"clip", "gap", "transition", "stack"};

// A timeline's rate, and how its frames are written.
class Clock {
 public:
  Clock(const M_Ratio& rate, bool mayDrop) : rate_(rate), isDropped_(mayDrop && MayDrop(rate)) {}

  int64_t Frame(const Seconds& time) const {
    return M_FrameAt(time.ratio, rate_, M_Rounding::Nearest);
  }
  bool IsWhole(const Seconds& time) const {
    return time.isExact &&
           M_FrameAt(time.ratio, rate_) == M_FrameAt(time.ratio, rate_, M_Rounding::Ceiling);
  }
  std::string Timecode(const Seconds& time) const {
    return ToTimecode(Frame(time), rate_, isDropped_);
  }

 private:
  M_Ratio rate_;
  bool isDropped_;
};

std::string Decimal(const Seconds& time) {
  if (!time.IsKnown()) return "overflow";
  char text[40];
  std::snprintf(text, sizeof text, "%.3f", time.ratio.num / static_cast<double>(time.ratio.den));
  return std::string(time.isExact ? "" : "~").append(text);
}

// A timecode; marked where the time is not exact, or lies within a frame.
std::string Cell(const Clock& clock, const Seconds& time) {
  if (!time.IsKnown()) return "overflow";
  return std::string(clock.IsWhole(time) ? "" : "~").append(clock.Timecode(time));
}

// As much of a text as there is room for, by characters of UTF-8.
std::string Fitted(const std::string& given, size_t room) {
  std::string text;
  size_t length = 0;
  for (const char c : given) {
    const bool isFirst = (static_cast<unsigned char>(c) & 0xC0) != 0x80;
    if (isFirst && ++length > room) return text;
    text += c;
  }
  return text.append(room - length, ' ');
}

std::string Line(const std::string& label, const std::string& name, const std::string& in,
                 const std::string& out, const std::string& sourceIn, const std::string& seconds) {
  char cells[160];
  std::snprintf(cells, sizeof cells, " %13s %13s %13s %12s", in.c_str(), out.c_str(),
                sourceIn.c_str(), seconds.c_str());
  return "  " + Fitted(label, 10) + ' ' + Fitted(name, 28) + cells + '\n';
}

Json ToJson(const Clock& clock, const Seconds& time) {
  if (!time.IsKnown()) {
    return {{"seconds", nullptr},
            {"exact", false},
            {"frame", nullptr},
            {"wholeFrame", false},
            {"timecode", nullptr}};
  }
  return {{"seconds", RatioText(time.ratio)},
          {"exact", time.isExact},
          {"frame", clock.Frame(time)},
          {"wholeFrame", clock.IsWhole(time)},
          {"timecode", clock.Timecode(time)}};
}

}  // namespace

std::string ToTable(const std::vector<Timeline>& timelines, bool mayDrop) {
  std::string text;
  for (const Timeline& timeline : timelines) {
    const Clock clock(timeline.rate, mayDrop);
    if (!text.empty()) text += '\n';
    text += "Timeline \"" + Printable(timeline.name) + "\"\n  " + RateText(timeline.rate) +
            " frames a second, " + Cell(clock, timeline.duration) + " long (" +
            Decimal(timeline.duration) + " s), starts at " + Cell(clock, timeline.start) + '\n';
    for (size_t i = 0; i < timeline.tracks.size(); ++i) {
      const Track& track = timeline.tracks[i];
      text += "\nTrack " + std::to_string(i + 1) + ", " + track.kind;
      if (!track.name.empty()) text += ", \"" + Printable(track.name) + '"';
      text += ", " + Decimal(track.duration) + " s\n";
      text += Line("", "", "record in", "record out", "source in", "duration/s");
      for (const Item& item : track.items) {
        std::string label = kKinds[static_cast<int>(item.kind)];
        text += Line(label, Printable(item.name), Cell(clock, item.recordIn),
                     Cell(clock, item.recordOut), Cell(clock, item.sourceIn),
                     Decimal(item.recordOut - item.recordIn));
        if (item.speed != M_Ratio{1, 1})
          text += "             at a speed of " + RateText(item.speed) + '\n';
      }
    }
    for (const std::string& remark : timeline.remarks) text += "\nRemark: " + remark + '.';
    if (!timeline.remarks.empty()) text += '\n';
  }
  return text + "\n~ marks a time that is not exact, or lies within a frame.\n";
}

std::string ToCsv(const std::vector<Timeline>& timelines, bool mayDrop) {
  const auto quoted = [](const std::string& text) {
    std::string field = "\"";
    for (const char c : text) field.append(c == '"' ? 2 : 1, c);
    return field + '"';
  };
  std::string text =
      "timeline,track,kind,name,record in,record out,source in,source out,speed,exact,timecode "
      "in,timecode out\n";
  for (const Timeline& timeline : timelines) {
    const Clock clock(timeline.rate, mayDrop);
    for (size_t i = 0; i < timeline.tracks.size(); ++i) {
      for (const Item& item : timeline.tracks[i].items) {
        text += quoted(timeline.name) + ',' + std::to_string(i + 1) + ',' +
                kKinds[static_cast<int>(item.kind)] + ',' + quoted(item.name);
        bool isExact = true;
        for (const Seconds& time : {item.recordIn, item.recordOut, item.sourceIn, item.sourceOut}) {
          text.append(",").append(time.IsKnown() ? RatioText(time.ratio) : "");
          isExact &= time.isExact;
        }
        text.append(",").append(RatioText(item.speed)).append(isExact ? ",1" : ",0");
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
        items.push_back({{"kind", kKinds[static_cast<int>(item.kind)]},
                         {"name", item.name},
                         {"recordIn", ToJson(clock, item.recordIn)},
                         {"recordOut", ToJson(clock, item.recordOut)},
                         {"sourceIn", ToJson(clock, item.sourceIn)},
                         {"sourceOut", ToJson(clock, item.sourceOut)},
                         {"speed", RatioText(item.speed)}});
      }
      tracks.push_back({{"name", track.name},
                        {"kind", track.kind},
                        {"duration", ToJson(clock, track.duration)},
                        {"items", std::move(items)}});
    }
    all.push_back({{"name", timeline.name},
                   {"rate", RatioText(timeline.rate)},
                   {"start", ToJson(clock, timeline.start)},
                   {"duration", ToJson(clock, timeline.duration)},
                   {"tracks", std::move(tracks)},
                   {"remarks", timeline.remarks}});
  }
  return Json{{"timelines", std::move(all)}}.dump(2, ' ', false, Json::error_handler_t::replace) +
         '\n';
}

}  // namespace comp
