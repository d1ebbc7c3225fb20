/// \file
/// A timeline of tracks: what is where in it, exactly.
#ifndef COMP_TIMELINE_H
#define COMP_TIMELINE_H

#include <optional>
#include <set>
#include <string>
#include <vector>

#include "M_Matrix.h"
#include "M_Ops.h"
#include "M_Utils.h"
#include "Seconds.h"

namespace comp {

struct Marker {
  std::string name;
  std::string color;
  Seconds in, out;  ///< From the timeline's start.
};

struct Item {
  enum class Kind { kClip, kGap, kTransition, kStack };
  Kind kind;
  std::string name;
  Seconds recordIn, recordOut;             ///< From the timeline's start.
  Seconds sourceIn, sourceOut;             ///< As the media counts.
  Seconds speed = M_Ratio{1, 1};           ///< Of the source a second; below 0 backwards.
  std::optional<M_Vector2T<double>> size;  ///< Of the medium's picture, where the file tells it.
};

struct Track {
  std::string name;
  std::string kind;  ///< "Video", "Audio" or what the file says.
  std::vector<Item> items;
  std::vector<Marker> markers;  ///< Its own, and those of its items.
  Seconds duration;
};

struct Timeline {
  std::string name;
  M_Ratio rate;   ///< Frames a second.
  Seconds start;  ///< What the first frame is called, as a time.
  Seconds duration;
  std::vector<Track> tracks;
  std::vector<Marker> markers;       ///< Of all tracks together.
  std::set<M_Ratio> rates;           ///< All that are met.
  std::vector<std::string> remarks;  ///< What was passed over, or is not as it should be.
};

}  // namespace comp

#endif  // COMP_TIMELINE_H
