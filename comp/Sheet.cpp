#include "Sheet.h"

#include <algorithm>
#include <numeric>

#include "M_Ops.h"
#include "Seconds.h"
#include "Timecode.h"

namespace comp {
namespace {

// A value as the sheet shows it, and what it is calculated with.
struct Term {
  Value shown;
  Seconds exact;
};

struct Operation {
  decltype(M_AddRatio)* library;
  Seconds (*exactly)(const Seconds&, const Seconds&);
};

constexpr Operation kAdd = {
    M_AddRatio, operator+ },
    kSub = {M_SubRatio, operator- },
            kMul = {M_MulRatio, operator* }, kDiv = {M_DivRatio, operator/ };

Term ToTerm(const M_Ratio& ratio) { return {{ratio, Accuracy::kExact}, ratio}; }

// As the library gives it; where that sees an overflow, in lowest terms, if that is enough; else
// the nearest, and the library reports it.
Term Calculate(const Operation& operation, const Term& a, const Term& b) {
  const Seconds exact = operation.exactly(a.exact, b.exact);
  M_Ratio ratio;
  unsigned char status = 0;
  const bool isGiven = operation.library(&a.shown.ratio, &b.shown.ratio, &ratio, &status) == 0 &&
                       status == 0 && exact.isExact && ratio == exact.ratio;
  if (isGiven) return {{ratio, Accuracy::kExact}, exact};
  if (exact.isExact) return {{exact.ratio, Accuracy::kExact}, exact};
  if (a.shown.accuracy == Accuracy::kExact && b.shown.accuracy == Accuracy::kExact) {
    operation.library(&a.shown.ratio, &b.shown.ratio, &ratio, nullptr);
  }
  const Accuracy accuracy = exact.IsKnown() ? Accuracy::kApproximated : Accuracy::kOverflow;
  return {{exact.ratio, accuracy, exact.maxError}, exact};
}

// A sum that tells whether its operands had to be reduced: then it is not over their least common
// denominator.
Term Add(const Term& a, const Term& b) {
  Term sum = Calculate(kAdd, a, b);
  if (sum.shown.accuracy != Accuracy::kExact) return sum;
  const M_Ratio &x = a.shown.ratio, &y = b.shown.ratio;
  const uint64_t common = std::lcm(uint64_t{x.den}, uint64_t{y.den});
  const bool isPlain = x.num == 0 || y.num == 0 || sum.shown.ratio.den == common;
  if (!isPlain) sum.shown.accuracy = Accuracy::kReduced;
  return sum;
}

class SheetMaker {
 public:
  explicit SheetMaker(const Composition& composition)
      : composition_(composition),
        clock_(composition.frameRate.ratio, false),
        frame_(Inverse(composition.frameRate.ratio)),
        start_(Calculate(kMul, Units(composition.start), frame_)),
        duration_(Calculate(kMul, Units(composition.duration), frame_)),
        end_(Calculate(kAdd, start_, duration_)) {}

  Sheet Make(bool withOverlaps, ReportCollector& collector) const {
    Sheet sheet;
    sheet.name = composition_.name;
    sheet.frameRate = composition_.frameRate;
    sheet.start = InFrames(start_);
    sheet.duration = InFrames(duration_);
    Term sum = ToTerm({0, 1});
    for (const Layer& layer : composition_.layers) {
      collector.SetLayer(layer.name);
      sheet.rows.push_back(MakeRow(layer, &sum));
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
  static Term Units(int32_t count) { return ToTerm({count, 1}); }

  static Term Inverse(M_Ratio rate) {
    M_RecipRatio(&rate, &rate, nullptr);
    return ToTerm(rate);
  }

  Time InFrames(const Term& term) const {
    if (term.shown.accuracy == Accuracy::kOverflow) return {term.shown, {0, false, true}};
    return {term.shown, {clock_.Frame(term.exact), clock_.IsWhole(term.exact), false}};
  }

  // Both ends are held to the composition by themselves.
  Term Clip(const Term& term) const {
    if (!start_.exact.IsKnown() || !end_.exact.IsKnown())
      return {{{0, 0}, Accuracy::kOverflow}, kUnknown};
    if (term.exact < start_.exact) return start_;
    return end_.exact < term.exact ? end_ : term;
  }

  // Seconds a unit of a layer's time base.
  static Term Unit(const Layer& layer) {
    return layer.hasSourceRate ? Inverse(layer.timeBase.ratio) : ToTerm(layer.timeBase.ratio);
  }

  Row MakeRow(const Layer& layer, Term* sum) const {
    Row row;
    row.name = layer.name;
    row.timeBase = layer.timeBase;
    row.hasSourceRate = layer.hasSourceRate;
    row.stretch = layer.stretch;
    row.inUnits = layer.in;
    row.outUnits = layer.out;
    const Term unit = Unit(layer);
    const Term in = Calculate(kMul, Units(layer.in), unit);
    const Term out = Calculate(kMul, Units(layer.out), unit);
    const Term duration = Calculate(kMul, Units(layer.out - layer.in), unit);
    const Term clippedIn = Clip(in), clippedOut = Clip(out);
    const Term clipped = Calculate(kSub, clippedOut, clippedIn);
    row.in = InFrames(in);
    row.out = InFrames(out);
    row.duration = InFrames(duration);
    row.clippedIn = InFrames(clippedIn);
    row.clippedOut = InFrames(clippedOut);
    row.clippedDuration = InFrames(clipped);
    const M_Ratio& stretch = layer.stretch.ratio;
    const bool isStretched = stretch.num != 1 || stretch.den != 1;
    row.sourceDuration =
        isStretched ? Calculate(kDiv, clipped, ToTerm(stretch)).shown : clipped.shown;
    *sum = Add(*sum, duration);
    row.runningSum = sum->shown;
    return row;
  }

  const Composition& composition_;
  Clock clock_;
  Term frame_;
  Term start_;
  Term duration_;
  Term end_;
};

}  // namespace

Sheet MakeSheet(const Composition& composition, bool withOverlaps) {
  ReportCollector collector;
  return SheetMaker(composition).Make(withOverlaps, collector);
}

}  // namespace comp
