/// \file
/// The ratio routines behind the public ones.
#ifndef MP_RATIO_H
#define MP_RATIO_H

#include <cstdint>

#include "M_Utils.h"

#pragma GCC visibility push(default)
extern "C" {

/// *out = a + b, or a - b; see M_AddRatio. `detail` is the message index that names the operation
/// in a report.
int32_t Mp_CalcRatio(const M_Ratio* a, const M_Ratio* b, bool subtract, int16_t detail,
                     M_Ratio* out, unsigned char* status);

/// *out = the best ratio near x with num and den up to 2^30, always coprime; see M_FpLong2Ratio.
/// |x| <= 2^-31 gives 0/1; what is too large gives 2^30/1 with x's sign, a NaN 2^30/1. Always 0.
int32_t Mp_Double2RatioSmart(M_Ratio* out, double x);
}
#pragma GCC visibility pop

#endif  // MP_RATIO_H
