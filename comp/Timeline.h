/// \file
/// A timeline of tracks: what is where in it, exactly.
#ifndef COMP_TIMELINE_H
#define COMP_TIMELINE_H

#include <optional>
#include <string>
#include <vector>

#include "M_Utils.h"

namespace comp {

/// A time, or a span of it, in seconds: exact, or the nearest ratio that fits, or nothing that
/// does (0/0).
struct Seconds {
  M_Ratio ratio = {0, 1};
  bool isExact = true;

  bool IsKnown() const { return ratio.den != 0; }
};

/// As exact as its operands, where the result fits.
Seconds operator+(const Seconds& a, const Seconds& b);
Seconds operator-(const Seconds& a, const Seconds& b);
Seconds operator*(const Seconds& a, const M_Ratio& factor);
bool operator<(const Seconds& a, const Seconds& b);

struct Item {
  enum class Kind { kClip, kGap, kTransition, kStack };
  Kind kind;
  std::string name;
  Seconds recordIn, recordOut;  ///< From the timeline's start.
  Seconds sourceIn, sourceOut;  ///< As the media counts.
  M_Ratio speed = {1, 1};       ///< Seconds of the source a second; below 0 backwards.
};

struct Track {
  std::string name;
  std::string kind;  ///< "Video", "Audio" or what the file says.
  std::vector<Item> items;
  Seconds duration;
};

struct Timeline {
  std::string name;
  M_Ratio rate;   ///< Frames a second.
  Seconds start;  ///< What the first frame is called, as a time.
  Seconds duration;
  std::vector<Track> tracks;
  std::vector<std::string> remarks;  ///< What was passed over, or is not as it should be.
};

}  // namespace comp

#endif  // COMP_TIMELINE_H
