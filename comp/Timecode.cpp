#include "Timecode.h"

#include <algorithm>
#include <array>
#include <cstdio>

#include "M_Ops.h"

namespace comp {
namespace {

// The whole number that a rate is counted by.
int64_t Nominal(const M_Ratio& rate) {
  return std::max<int64_t>(M_FrameAt({1, 1}, rate, M_Rounding::Nearest), 1);
}

}  // namespace

bool MayDrop(const M_Ratio& rate) {
  return rate == M_Ratio{30000, 1001} || rate == M_Ratio{60000, 1001};
}

std::string ToTimecode(int64_t frame, const M_Ratio& rate, bool isDropped) {
  const int64_t nominal = Nominal(rate);
  uint64_t number = frame < 0 ? 0 - static_cast<uint64_t>(frame) : static_cast<uint64_t>(frame);
  if (isDropped) {
    const auto dropped = static_cast<uint64_t>(nominal / 15),
               perMinute = static_cast<uint64_t>(nominal) * 60;
    const uint64_t perTen = perMinute * 10 - dropped * 9;
    const uint64_t tens = number / perTen, rest = number % perTen;
    // The first minute of ten is whole; each of the others begins with numbers that are left out.
    const uint64_t minutes = rest < perMinute ? 0 : 1 + (rest - perMinute) / (perMinute - dropped);
    number += dropped * (tens * 9 + minutes);
  }
  const auto base = static_cast<uint64_t>(nominal);
  const uint64_t seconds = number / base;
  char text[64];
  std::snprintf(text, sizeof text, "%s%02llu:%02u:%02u%c%02u", frame < 0 ? "-" : "",
                static_cast<unsigned long long>(seconds / 3600),
                static_cast<unsigned>(seconds / 60 % 60), static_cast<unsigned>(seconds % 60),
                isDropped ? ';' : ':', static_cast<unsigned>(number % base));
  return text;
}

std::optional<int64_t> ParseTimecode(std::string_view text, const M_Ratio& rate) {
  const bool isNegative = text.starts_with('-');
  if (isNegative) text.remove_prefix(1);
  std::array<int64_t, 4> parts = {};
  size_t part = 0, digits = 0;
  bool isDropped = false;
  for (const char c : text) {
    const bool isSeparator = c == ':' || (c == ';' && part == 2);
    if (isSeparator && digits > 0 && part < 3) {
      isDropped = c == ';';
      ++part;
      digits = 0;
    } else if (c >= '0' && c <= '9' && ++digits <= 6) {
      parts[part] = parts[part] * 10 + (c - '0');
    } else {
      return {};
    }
  }
  const int64_t nominal = Nominal(rate);
  const auto [hours, minutes, seconds, frames] = parts;
  if (part != 3 || digits == 0 || minutes > 59 || seconds > 59 || frames >= nominal) return {};
  int64_t frame = ((hours * 60 + minutes) * 60 + seconds) * nominal + frames;
  if (isDropped) {
    const int64_t dropped = nominal / 15;
    if (!MayDrop(rate) || (minutes % 10 != 0 && seconds == 0 && frames < dropped)) return {};
    const int64_t all = hours * 60 + minutes;
    frame -= dropped * (all - all / 10);
  }
  return isNegative ? -frame : frame;
}

int64_t Clock::Frame(const Seconds& time) const {
  if (time.isExact) return M_FrameAt(time.ratio, rate_, M_Rounding::Nearest);
  const auto frames = Product(time.Value(), Fraction(rate_));
  const auto raised = frames ? Sum(*frames, Fraction(1, 2)) : std::nullopt;
  if (!raised) return M_FrameAt(time.ratio, rate_, M_Rounding::Nearest);
  return static_cast<int64_t>(raised->Floor());
}

bool Clock::IsWhole(const Seconds& time) const {
  const auto frames = Product(time.Value(), Fraction(rate_));
  return time.IsCertain() && frames && frames->den == 1;
}

}  // namespace comp
