#include "Sheet.h"

#include <algorithm>
#include <numeric>

#include "M_Ops.h"
#include "Timeline.h"

namespace comp {
namespace {

constexpr Value kOverflown = {{0, 0}, Accuracy::kOverflow};

Accuracy Worse(Accuracy a, Accuracy b) { return a < b ? b : a; }

// Exactly, or with a report; then approximately. What goes in approximated comes out so.
Value Calculate(Operation operation, const Value& a, const Value& b) {
  const Accuracy given = Worse(a.accuracy, b.accuracy);
  if (given == Accuracy::kOverflow) return kOverflown;
  Value result = {{}, given};
  if (operation(&a.ratio, &b.ratio, &result.ratio, nullptr) != 0) {
    unsigned char status = 2;
    if (operation(&a.ratio, &b.ratio, &result.ratio, &status) != 0 || status != 2) {
      return kOverflown;
    }
    result.accuracy = Accuracy::kApproximated;
  }
  if (result.accuracy == Accuracy::kApproximated) {
    result.maxError = MaxError(operation, a.ratio, a.maxError, b.ratio, b.maxError, result.ratio);
  }
  return result;
}

// A sum that tells whether its operands had to be reduced: then it is not over their least common
// denominator.
Value Add(const Value& a, const Value& b) {
  Value sum = Calculate(M_AddRatio, a, b);
  const uint64_t common = std::lcm(uint64_t{a.ratio.den}, uint64_t{b.ratio.den});
  const bool isPlain = a.ratio.num == 0 || b.ratio.num == 0 || sum.ratio.den == common;
  if (sum.accuracy == Accuracy::kExact && !isPlain) sum.accuracy = Accuracy::kReduced;
  return sum;
}

class SheetMaker {
 public:
  explicit SheetMaker(const Composition& composition) : composition_(composition) {
    M_RecipRatio(&composition.frameRate.ratio, &frame_.ratio, nullptr);
    start_ = Calculate(M_MulRatio, Units(composition.start), frame_);
    duration_ = Calculate(M_MulRatio, Units(composition.duration), frame_);
  }

  Sheet Make(bool withOverlaps, ReportCollector& collector) const {
    Sheet sheet;
    sheet.name = composition_.name;
    sheet.frameRate = composition_.frameRate;
    sheet.start = InFrames(start_);
    sheet.duration = InFrames(duration_);
    Value sum = {{0, 1}, Accuracy::kExact};
    for (const Layer& layer : composition_.layers) {
      collector.SetLayer(layer.name);
      Row row = MakeRow(layer);
      sum = Add(sum, row.duration.seconds);
      row.runningSum = sum;
      sheet.rows.push_back(std::move(row));
    }
    sheet.layout = MakeLayout(composition_, withOverlaps, collector);
    const auto isInSpace = [](const Layer& layer) { return layer.space.has_value(); };
    if (std::any_of(composition_.layers.begin(), composition_.layers.end(), isInSpace)) {
      sheet.scene = MakeScene(composition_, collector);
    }
    sheet.reports = collector.Reports();
    return sheet;
  }

 private:
  static Value Units(int32_t count) { return {{count, 1}, Accuracy::kExact}; }

  Time InFrames(const Value& seconds) const {
    if (seconds.accuracy == Accuracy::kOverflow) return {seconds, {0, false, true}};
    const auto frame = [&](M_Rounding rounding) {
      return M_FrameAt(seconds.ratio, composition_.frameRate.ratio, rounding);
    };
    const bool isWhole = frame(M_Rounding::Floor) == frame(M_Rounding::Ceiling);
    const bool isExact = isWhole && seconds.accuracy != Accuracy::kApproximated;
    return {seconds, {frame(M_Rounding::Nearest), isExact, false}};
  }

  // Both ends are held to the composition by themselves: M_ClipSpanToSpan would end every layer
  // where the composition ends.
  Value Clip(const Value& seconds) const {
    const Accuracy accuracy = Worse(seconds.accuracy, Worse(start_.accuracy, duration_.accuracy));
    // What is held may not be where it seems.
    Value clipped = {{}, accuracy, seconds.maxError + start_.maxError + duration_.maxError};
    const bool fails =
        accuracy == Accuracy::kOverflow ||
        M_ClipRatioToSpan(&seconds.ratio, &start_.ratio, &duration_.ratio, &clipped.ratio);
    return fails ? kOverflown : clipped;
  }

  Row MakeRow(const Layer& layer) const {
    Row row;
    row.name = layer.name;
    row.timeBase = layer.timeBase;
    row.hasSourceRate = layer.hasSourceRate;
    // Seconds a unit of the layer's time base.
    Value unit = {layer.timeBase.ratio, Accuracy::kExact};
    if (layer.hasSourceRate) M_RecipRatio(&unit.ratio, &unit.ratio, nullptr);
    row.stretch = layer.stretch;
    row.inUnits = layer.in;
    row.outUnits = layer.out;
    row.in = InFrames(Calculate(M_MulRatio, Units(layer.in), unit));
    row.out = InFrames(Calculate(M_MulRatio, Units(layer.out), unit));
    row.duration = InFrames(Calculate(M_MulRatio, Units(layer.out - layer.in), unit));
    row.clippedIn = InFrames(Clip(row.in.seconds));
    row.clippedOut = InFrames(Clip(row.out.seconds));
    row.clippedDuration =
        InFrames(Calculate(M_SubRatio, row.clippedOut.seconds, row.clippedIn.seconds));
    const M_Ratio& stretch = layer.stretch.ratio;
    row.sourceDuration = row.clippedDuration.seconds;
    if (stretch.num != 1 || stretch.den != 1) {
      row.sourceDuration = Calculate(M_DivRatio, row.sourceDuration, {stretch, Accuracy::kExact});
    }
    return row;
  }

  const Composition& composition_;
  Value frame_ = {{}, Accuracy::kExact};
  Value start_;
  Value duration_;
};

}  // namespace

Sheet MakeSheet(const Composition& composition, bool withOverlaps) {
  ReportCollector collector;
  return SheetMaker(composition).Make(withOverlaps, collector);
}

}  // namespace comp
