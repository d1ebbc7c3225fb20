#include "M_Utils.h"
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

// A 16.16 result of the wrong sign has overflowed; 0 goes with either sign.
M_Fixed CheckSign(int32_t a, int32_t b, int32_t result) {
  const bool isWrong = (a ^ b) >= 0 ? result < 0 : result > 0;
  return isWrong ? kError : result;
}

}  // namespace

extern "C" {

M_Fixed M_FixMul(M_Fixed a, M_Fixed b) {
  // The product is to lose 16 bits. Where the operands have 17 trailing zeros between them, both
  // are shifted by zeros only and nothing is lost; otherwise each gives up its low 8 bits.
  int shiftA = 8;
  int shiftB = 8;
  // With a bit set in both low bytes there are 14 zeros at the most; no need to count them.
  if ((a & 0xFF) == 0 || (b & 0xFF) == 0) {
    const int zerosA = Mp::TrailingZeros(Mp::Magnitude(a));
    if (zerosA >= 17) {
      shiftA = 16;
      shiftB = 0;
    } else if (zerosA + Mp::TrailingZeros(Mp::Magnitude(b)) >= 17) {
      shiftA = zerosA;
      shiftB = 16 - zerosA;
    }
  }
  return CheckSign(a, b, Mp::WrapMul(a >> shiftA, b >> shiftB));
}

M_Fixed M_FixDiv(M_Fixed a, M_Fixed b) {
  uint32_t numerator = Mp::Magnitude(a);
  uint32_t divisor = Mp::Magnitude(b);
  const int zeros = Mp::LeadingZeros(numerator);
  if (zeros >= 16) {
    numerator <<= 16;
  } else {
    // No room for 16 bits: the divisor gives up the rest. The shift is arithmetic, which shows for
    // a divisor of -32768.0 only.
    numerator <<= zeros;
    divisor = static_cast<uint32_t>(static_cast<int32_t>(divisor) >> (16 - zeros));
  }
  if (divisor == 0) return kError;
  const auto quotient = static_cast<int32_t>(numerator / divisor);
  return CheckSign(a, b, (a ^ b) < 0 ? Mp::WrapNegate(quotient) : quotient);
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
