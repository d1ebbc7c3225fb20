// What comp reads, and how it counts.

#include <gtest/gtest.h>

#include <cstdio>

#include "Composition.h"
#include "M_Ops.h"
#include "Otio.h"
#include "Rates.h"
#include "Text.h"
#include "Timecode.h"

namespace {

TEST(Timecode, DropsTwoOrFourNumbersOfEachMinuteButTheTenth) {
  for (const M_Ratio rate : {M_Ratio{30000, 1001}, {60000, 1001}}) {
    const int base = rate.num / 1000;
    int64_t frame = 0;
    for (int number = 0; number < 86400 * base; ++number) {  // A day, number by number.
      const int second = number / base, minute = second / 60, f = number % base;
      const bool isLeftOut = minute % 10 != 0 && second % 60 == 0 && f < base / 15;
      char text[40];
      std::snprintf(text, sizeof text, "%02d:%02d:%02d;%02d", minute / 60, minute % 60, second % 60,
                    f);
      const auto parsed = comp::ParseTimecode(text, rate);
      ASSERT_EQ(parsed.has_value(), !isLeftOut) << text;
      if (isLeftOut) continue;
      ASSERT_EQ(*parsed, frame) << text;
      ASSERT_EQ(comp::ToTimecode(frame++, rate, true), text);
    }
  }
  const M_Ratio film = {24000, 1001};
  EXPECT_EQ(comp::ToTimecode(-25, film, false), "-00:00:01:01");
  EXPECT_EQ(comp::ParseTimecode("-100:00:00:23", film), -(100 * 3600 * 24 + 23));
  for (const char* bad :
       {"", "1:2:3", "00:00:00:24", "00:60:00:00", "00:00:00;01", "00:00:00:", "a"}) {
    EXPECT_FALSE(comp::ParseTimecode(bad, film)) << bad;
  }
  EXPECT_TRUE(comp::MayDrop({60000, 1001}) && !comp::MayDrop(film));
}

TEST(Rates, AreWhatDecimalsStandFor) {
  const std::tuple<const char*, M_Ratio, bool> rows[] = {
      {"23.976", {24000, 1001}, true},
      {"23.98", {24000, 1001}, true},
      {"23.976023976024", {24000, 1001}, true},
      {"59.94", {60000, 1001}, true},
      {"119.88", {120000, 1001}, true},
      {"12.5", {25, 2}, true},
      {"24.0", {24, 1}, true},
      {"23.97", {2397, 100}, true},
      {"1.25e-3", {1, 800}, true},
      {"-0.8545454545454545", {-47, 55}, true},
      {"3.14159265358979", {1434877259, 456735617}, false}};
  for (const auto& [text, ratio, isExact] : rows) {
    const auto read = comp::ToRatio(text, true);
    EXPECT_TRUE(read && read->ratio == ratio && read->isExact == isExact) << text;
  }
  EXPECT_EQ(comp::ToRatio("23.976", false)->ratio, (M_Ratio{2997, 125}));
  for (const char* bad : {"", "x", "1e40", "2147483648", "nan", "1 "})
    EXPECT_FALSE(comp::ToRatio(bad, true)) << bad;
}

std::string RationalTime(const std::string& value, const std::string& rate) {
  return R"({"OTIO_SCHEMA": "RationalTime.1", "value": )" + value + R"(, "rate": )" + rate + "}";
}
std::string Range(const std::string& start, const std::string& duration, const std::string& rate) {
  return R"({"OTIO_SCHEMA": "TimeRange.1", "start_time": )" + RationalTime(start, rate) +
         R"(, "duration": )" + RationalTime(duration, rate) + "}";
}

TEST(Otio, TracksAreSummedExactly) {
  const std::string text =
      R"({"OTIO_SCHEMA": "Timeline.1", "name": "T", "metadata": {"a": -Infinity, "b": [NaN, Inf],
          "c": 123456789012345678901234567890, "d": 1e999, "e": "Inf \" NaN"},
          "global_start_time": )" +
      RationalTime("86400", "23.976") + R"(, "tracks": {"OTIO_SCHEMA":
          "Stack.1", "children": [{"OTIO_SCHEMA": "Sequence.1", "kind": "Video", "children": [
            {"OTIO_SCHEMA": "Clip.2", "name": "a", "source_range": )" +
      Range("10", "48", "23.98") + R"(,
             "effects": [{"OTIO_SCHEMA": "LinearTimeWarp.1", "time_scalar": 0.3333333333333333}]},
            {"OTIO_SCHEMA": "Transition.1", "in_offset": )" +
      RationalTime("12", "24") + R"(,
             "out_offset": )" +
      RationalTime("6", "24") + R"(},
            {"OTIO_SCHEMA": "Clip.2", "name": "b", "active_media_reference_key": "hi", "media_references":
             {"hi": {"OTIO_SCHEMA": "ExternalReference.1", "available_range": )" +
      Range("0", "88200.5", "44100") + R"(}}},
            {"OTIO_SCHEMA": "Marker.2"},
            {"OTIO_SCHEMA": "Stack.1", "children": [{"OTIO_SCHEMA": "Gap.1", "source_range": )" +
      Range("0", "3", "25") + R"(},
             {"OTIO_SCHEMA": "Gap.1", "source_range": )" +
      Range("0", "5", "25") + R"(}]}]}]}})";
  ASSERT_TRUE(comp::IsOtio(text));
  const comp::Timeline timeline = comp::ReadOtio(text, "file").at(0);
  EXPECT_EQ(timeline.rate, (M_Ratio{24000, 1001}));
  EXPECT_EQ(timeline.start.ratio, (M_Ratio{18018, 5}));
  ASSERT_EQ(timeline.tracks.size(), 1u);
  const auto& items = timeline.tracks[0].items;
  ASSERT_EQ(items.size(), 4u);
  const M_Ratio first = {2002, 1000}, second = {176401, 88200};
  EXPECT_EQ(items[0].recordOut.ratio, first);
  EXPECT_EQ(items[0].sourceOut.ratio, (M_Ratio{10 * 1001, 24000} + first / M_Ratio{3, 1}));
  EXPECT_EQ(items[1].recordIn.ratio, (first - M_Ratio{1, 2}));
  EXPECT_EQ(items[1].recordOut.ratio, (first + M_Ratio{1, 4}));
  EXPECT_EQ(items[2].recordOut.ratio, (first + second));
  EXPECT_EQ(timeline.duration.ratio, (first + second + M_Ratio{1, 5}));
  EXPECT_TRUE(timeline.duration.isExact && items[3].kind == comp::Item::Kind::kStack);
  EXPECT_EQ(timeline.remarks.size(), 1u);
  // What is cut off is no file, what has no timeline none of these.
  for (size_t size = 40; size < text.size(); size += 97) {
    EXPECT_THROW(comp::ReadOtio(text.substr(0, size), "file"), comp::InputError);
  }
  EXPECT_THROW(comp::ReadOtio(R"({"OTIO_SCHEMA": "Marker.2"})", "file"), comp::InputError);
  EXPECT_THROW(comp::ReadOtio(text + std::string(2000, '['), "file"), comp::InputError);
}

TEST(Otio, TrimmedTracksHoldWhatIsInTheTrim) {
  const std::string clip =
      R"({"OTIO_SCHEMA": "Clip.1", "source_range": )" + Range("5", "10", "24") +
      R"(, "effects": [{"OTIO_SCHEMA": "LinearTimeWarp.1", "time_scalar": 2}],
          "markers": [{"name": "m", "marked_range": )" +
      Range("8", "0", "24") + R"(}], "media_reference": {"available_image_bounds":
          {"min": {"x": -8, "y": -4.5}, "max": {"x": 8, "y": 4.5}}}})";
  const std::string text = R"({"OTIO_SCHEMA": "Track.1", "source_range": )" +
                           Range("12", "20", "24") + R"(, "children": [)" + clip + ',' + clip +
                           ',' + clip + ',' + clip + ',' + clip + "]}";
  const comp::Track track = comp::ReadOtio(text, "file").at(0).tracks.at(0);
  const auto& items = track.items;
  ASSERT_EQ(items.size(), 3u);
  EXPECT_TRUE(items[0].recordIn.ratio == (M_Ratio{0, 1}) &&
              items[0].sourceIn.ratio == (M_Ratio{9, 24}));
  EXPECT_EQ(items[1].recordIn.ratio, (M_Ratio{8, 24}));
  EXPECT_TRUE(items[2].recordOut.ratio == (M_Ratio{20, 24}) &&
              items[2].sourceOut.ratio == (M_Ratio{9, 24}));
  EXPECT_TRUE(items[0].size && items[0].size->x == 16 && items[0].size->y == 9);
  ASSERT_EQ(track.markers.size(), 2u);
  EXPECT_EQ(track.markers[0].in.ratio, (M_Ratio{1, 24}));
}

TEST(Text, FitsAndHoldsNothingOdd) {
  const std::string text = "a\u0308\u3042\u3044b";
  EXPECT_EQ(comp::Columns(text), 6u);
  EXPECT_EQ(comp::Shortened(text, 6), text);
  EXPECT_EQ(comp::Shortened(text, 5), "a\u0308\u3042…");
  EXPECT_EQ(comp::Shortened(text, 1), "…");
  EXPECT_EQ(comp::PadLeft("\u3042", 4), "  \u3042");
  // Cut, overlong, a surrogate, beyond Unicode; and what is as it should be.
  EXPECT_EQ(comp::Printable("\xE3\x81 \xC0\xAF \xED\xA0\x80 \xF4\x90\x80\x80")
                .find_first_of("\xC0\xED\xF4"),
            std::string::npos);
  EXPECT_EQ(comp::Printable("\U0010FFFD\uD7FF\u07FF\x7F\uFFFF"), "\U0010FFFD\uD7FF\u07FF??");
}

}  // namespace
