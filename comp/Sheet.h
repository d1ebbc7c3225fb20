/// \file
/// The sheet of a composition: where each layer lies in time, exactly and in frames, and in space.
#ifndef COMP_SHEET_H
#define COMP_SHEET_H

#include <optional>
#include <string>
#include <vector>

#include "Composition.h"
#include "Layout.h"
#include "M_Utils.h"
#include "Reports.h"
#include "Scene.h"

namespace comp {

/// How a value came about.
enum class Accuracy {
  kExact,
  kReduced,       ///< Exact, with operands reduced so that it fits.
  kApproximated,  ///< The exact value does not fit; the nearest ratio stands for it.
  kOverflow,      ///< Not even that fits; the value is 0/0.
};

struct Value {
  M_Ratio ratio;
  Accuracy accuracy;
  double maxError = 0;  ///< How far from the exact value it may be.
};

/// The frame of the composition that is nearest to a time, and whether it begins just then.
struct Frames {
  int64_t count;
  bool isExact;
  bool hasOverflowed;
};

struct Time {
  Value seconds;
  Frames frames;
};

struct Row {
  std::string name;
  GivenRatio timeBase;
  bool hasSourceRate;
  GivenRatio stretch;
  int32_t inUnits, outUnits;
  Time in, out, duration;
  Time clippedIn, clippedOut, clippedDuration;  ///< Held to the composition.
  Value sourceDuration;                         ///< Seconds of the source that are seen.
  Value runningSum;                             ///< Seconds of this layer and those above it.
};

struct Sheet {
  std::string name;
  GivenRatio frameRate;
  Time start, duration;
  std::vector<Row> rows;
  std::optional<Layout> layout;
  std::optional<Scene> scene;   ///< Where there are layers in space.
  std::vector<Report> reports;  ///< What the library reported on the way.
};

/// With what layers have in common where that is asked for.
Sheet MakeSheet(const Composition& composition, bool withOverlaps = false);

}  // namespace comp

#endif  // COMP_SHEET_H
