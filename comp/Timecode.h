/// \file
/// Frames as HH:MM:SS:FF, and back.
#ifndef COMP_TIMECODE_H
#define COMP_TIMECODE_H

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "M_Utils.h"
#include "Seconds.h"

namespace comp {

/// Whether timecode of a rate may drop frames: 29.97 and 59.94.
bool MayDrop(const M_Ratio& rate);

/// The timecode of a frame, counted by the whole number next to the rate. Where frames are dropped
/// two or four numbers of each minute but every tenth are left out, and the last separator is ';'.
/// Before 0 with a minus; beyond 24 hours the hours go on.
std::string ToTimecode(int64_t frame, const M_Ratio& rate, bool isDropped);

/// The frame of "HH:MM:SS:FF", or "HH:MM:SS;FF" for dropped ones, with a sign or without. Nothing
/// for another text, a number that is too large in its place, and one that is dropped.
std::optional<int64_t> ParseTimecode(std::string_view text, const M_Ratio& rate);

/// A rate, and how its frames are written. Of times that are known.
class Clock {
 public:
  /// With dropped frames where the rate may have them.
  Clock(const M_Ratio& rate, bool mayDrop) : rate_(rate), isDropped_(mayDrop && MayDrop(rate)) {}

  /// The nearest.
  int64_t Frame(const Seconds& time) const;
  /// Whether it is certain that a frame begins just then.
  bool IsWhole(const Seconds& time) const;
  std::string Timecode(const Seconds& time) const { return Timecode(Frame(time)); }
  std::string Timecode(int64_t frame) const { return ToTimecode(frame, rate_, isDropped_); }

 private:
  M_Ratio rate_;
  bool isDropped_;
};

}  // namespace comp

#endif  // COMP_TIMECODE_H
