#include "Timeline.h"

#include "M_Ops.h"

namespace comp {
namespace {

// By the library: exactly, or approximated, or not at all.
Seconds Calculate(decltype(M_AddRatio)* operation, const Seconds& a, const Seconds& b) {
  if (!a.IsKnown() || !b.IsKnown()) return {{0, 0}, false};
  unsigned char mayApproximate = 2;
  Seconds result;
  result.isExact = a.isExact && b.isExact;
  operation(&a.ratio, &b.ratio, &result.ratio, &mayApproximate);
  result.isExact &= mayApproximate == 0;
  // In lowest terms there is more room for what follows.
  if (result.IsKnown()) M_ReduceRatio(&result.ratio, &result.ratio, nullptr);
  return result;
}

}  // namespace

Seconds operator+(const Seconds& a, const Seconds& b) { return Calculate(M_AddRatio, a, b); }
Seconds operator-(const Seconds& a, const Seconds& b) { return Calculate(M_SubRatio, a, b); }
Seconds operator*(const Seconds& a, const M_Ratio& factor) {
  return Calculate(M_MulRatio, a, {factor, true});
}
bool operator<(const Seconds& a, const Seconds& b) { return a.ratio < b.ratio; }

}  // namespace comp
