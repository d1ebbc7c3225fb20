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

namespace comp {

/// A time, or a span of it, in seconds: exact, or a ratio near it that fits, or nothing that does
/// (0/0).
struct Seconds {
  M_Ratio ratio = {0, 1};
  bool isExact = true;
  double maxError = 0;  ///< How far from the exact one it may be.

  bool IsKnown() const { return ratio.den != 0; }
};

using Operation = decltype(M_AddRatio)*;

/// How far the library's sum, difference, product or quotient of two ratios may be from the exact
/// one, where the operands may be off by so much.
double MaxError(Operation operation, const M_Ratio& a, double aError, const M_Ratio& b,
                double bError, const M_Ratio& result);

/// As exact as its operands, where the result fits.
Seconds operator+(const Seconds& a, const Seconds& b);
Seconds operator-(const Seconds& a, const Seconds& b);
Seconds operator*(const Seconds& a, const Seconds& factor);
bool operator<(const Seconds& a, const Seconds& b);

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
  M_Ratio speed = {1, 1};                  ///< Seconds of the source a second; below 0 backwards.
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
  std::set<M_Ratio> rates;           ///< All that are met.
  std::vector<std::string> remarks;  ///< What was passed over, or is not as it should be.
};

}  // namespace comp

#endif  // COMP_TIMELINE_H
