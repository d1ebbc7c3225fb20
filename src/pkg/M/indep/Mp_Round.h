/// \file
/// Rounding of doubles to integers, halves towards plus infinity.
#ifndef MP_ROUND_H
#define MP_ROUND_H

#include <cstdint>

#include "Mp_Arith.h"

namespace Mp {

/// d > 0: d + 0.5 truncated. d <= 0: d truncated where d + 0.5 is whole, else d - 0.5 truncated.
template <class Int>
Int RoundHalfUp(double d) {
  const double up = d + 0.5;
  // Beyond 64 bits the test fails for whole values, too, but there d - 0.5 is no other value than
  // d.
  const bool isWhole = static_cast<double>(TruncTo<int64_t>(up)) == up;
  return TruncTo<Int>(d > 0 ? up : isWhole ? d : d - 0.5);
}

}  // namespace Mp

#endif  // MP_ROUND_H
