#include "M_Utils.h"

#include <bit>

#include "Mp_Arith.h"
#include "Mp_Bits.h"
#include "Mp_Err.h"

namespace {

constexpr int32_t kError = INT32_MIN;
constexpr double kFix24One = 16777216.0;

// Kept on purpose: -129 rather than -128 is the lower bound. Between them the value converts to
// 0x80000000 and nothing is reported.
bool IsFix24Overflow(double value) { return value >= 128.0 || value <= -129.0; }

// Halves away from zero.
M_Fix24 ToFix24(double value) {
  return Mp::TruncTo<int32_t>(value * kFix24One + (value >= 0 ? 0.5 : -0.5));
}

// All ones where one of the two is negative and the other is not, else 0.
int32_t SignMask(int32_t a, int32_t b) { return (a ^ b) >> 31; }

// The value or, by an all-ones mask, its negative.
int32_t NegateIf(int32_t mask, int32_t value) { return Mp::WrapSub(value ^ mask, mask); }

}  // namespace

extern "C" {

M_Fixed M_FixMul(M_Fixed a, M_Fixed b) {
  // The product is to lose 16 bits. Where the operands have 17 trailing zeros between them, which
  // are those of their product, both are shifted by zeros only and nothing is lost; otherwise each
  // gives up its low 8 bits.
  const bool isExact = (Mp::WrapMul(a, b) & 0x1FFFF) == 0;
  const int zeros = std::countr_zero(static_cast<uint32_t>(a) | 0x10000);
  const int shift = isExact ? zeros : 8;
  const int32_t result = Mp::WrapMul(a >> shift, b >> (16 - shift));
  // One of the wrong sign has overflowed; 0 goes with either sign.
  return NegateIf(SignMask(a, b), result) < 0 ? kError : result;
}

M_Fixed M_FixDiv(M_Fixed a, M_Fixed b) {
  // The dividend is to gain 16 bits. Where there is no room for all, the divisor gives up the rest;
  // the shift is arithmetic, which shows for a divisor of -32768.0 only.
  const uint32_t dividend = Mp::Magnitude(a);
  const int zeros = std::countl_zero(dividend | 0x8000);
  const auto divisor =
      static_cast<uint32_t>(static_cast<int32_t>(Mp::Magnitude(b)) >> (16 - zeros));
  if (divisor == 0) return kError;
  const auto quotient = static_cast<int32_t>((dividend << zeros) / divisor);
  return quotient < 0 ? kError : NegateIf(SignMask(a, b), quotient);
}

M_Fix24 M_Fix24Mul(M_Fix24 a, M_Fix24 b) {
  const double product = (b * 0x1p-24) * (a * 0x1p-24);
  if (IsFix24Overflow(product)) {
    Mp_ReportErr(Mp_PLACE_FIX24_MUL, M_ERR_OVERFLOW, Mp_STR_IN_FIX24_MULTIPLY);
    return kError;
  }
  return ToFix24(product);
}

M_Fix24 M_Fix24Ratio(int32_t num, int32_t den) {
  if (den == 0) {
    Mp_ReportErr(Mp_PLACE_FIX24_RATIO, M_ERR_DIVIDE_BY_ZERO, Mp_STR_IN_FIX24_DIVIDE);
    return kError;
  }
  const double quotient = static_cast<double>(num) / den;
  if (IsFix24Overflow(quotient)) {
    // Kept on purpose: the overflow of a division is reported as one "in fix24 multiply".
    Mp_ReportErr(Mp_PLACE_FIX24_RATIO, M_ERR_OVERFLOW, Mp_STR_IN_FIX24_MULTIPLY);
    return kError;
  }
  return ToFix24(quotient);
}

}  // extern "C"
