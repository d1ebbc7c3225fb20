#include "Timeline.h"

#include <cmath>

#include "M_Ops.h"

namespace comp {
namespace {

double ToDouble(const M_Ratio& r) { return r.num / static_cast<double>(r.den); }

// By the library: exactly, or approximated, or not at all.
Seconds Calculate(Operation operation, const Seconds& a, const Seconds& b) {
  if (!a.IsKnown() || !b.IsKnown()) return {{0, 0}, false};
  unsigned char mayApproximate = 2;
  Seconds result;
  result.isExact = a.isExact && b.isExact;
  operation(&a.ratio, &b.ratio, &result.ratio, &mayApproximate);
  result.isExact &= mayApproximate == 0;
  if (result.IsKnown() && !result.isExact) {
    result.maxError = MaxError(operation, a.ratio, a.maxError, b.ratio, b.maxError, result.ratio);
  }
  // In lowest terms there is more room for what follows.
  if (result.IsKnown()) M_ReduceRatio(&result.ratio, &result.ratio, nullptr);
  return result;
}

}  // namespace

double MaxError(Operation operation, const M_Ratio& a, double aError, const M_Ratio& b,
                double bError, const M_Ratio& result) {
  const double x = ToDouble(a), y = ToDouble(b);
  double exact = x + y, given = aError + bError;
  if (operation == M_SubRatio) {
    exact = x - y;
  } else if (operation == M_MulRatio) {
    exact = x * y;
    given = aError * (std::abs(y) + bError) + bError * std::abs(x);
  } else if (operation == M_DivRatio) {
    exact = x / y;
    const double least = std::abs(y) - bError;
    given = least > 0 ? (aError + std::abs(exact) * bError) / least : INFINITY;
  }
  // What doubles round away, which is little beside the rest.
  const double rounding = 1e-15 * (std::abs(x) + std::abs(y) + std::abs(exact));
  return given + std::abs(ToDouble(result) - exact) + rounding;
}

Seconds operator+(const Seconds& a, const Seconds& b) { return Calculate(M_AddRatio, a, b); }
Seconds operator-(const Seconds& a, const Seconds& b) { return Calculate(M_SubRatio, a, b); }
Seconds operator*(const Seconds& a, const Seconds& factor) {
  return Calculate(M_MulRatio, a, factor);
}
bool operator<(const Seconds& a, const Seconds& b) { return a.ratio < b.ratio; }

}  // namespace comp
