// Approximation of doubles by ratios: continued fractions on the value in single precision.

#include <bit>
#include <cmath>
#include <utility>

#include "M_Utils.h"
#include "Mp_Out.h"
#include "Mp_Ratio.h"

namespace {

constexpr int32_t kLimit = 0x40000000;

// A value above 1 as whole + rest / unit.
struct Mixed {
  int32_t whole;
  uint32_t rest;
  uint32_t unit;
};

// a >= 1 with a whole part below the limit.
Mixed Split(float a) {
  const auto whole = static_cast<int32_t>(a);
  // From 1 on a float is a multiple of 2^-23, so the rest is exact.
  const float rest = (a - static_cast<float>(whole)) * 0x1p23f;
  return {whole, static_cast<uint32_t>(rest), uint32_t{1} << 23};
}

// 1 / a for 2^-31 < a < 1, as 2^shift / (a 2^shift) with a 24-bit integer below the line.
Mixed SplitReciprocal(float a) {
  int exponent;
  const float mantissa = std::frexp(a, &exponent);
  const auto unit = static_cast<uint32_t>(mantissa * 0x1p24f);
  const uint64_t dividend = uint64_t{1} << (24 - exponent);
  return {static_cast<int32_t>(dividend / unit), static_cast<uint32_t>(dividend % unit), unit};
}

struct Fraction {
  int32_t num;
  int32_t den;
};

// The best fraction of y with a numerator up to the limit. y > 1, so its denominator is smaller.
Fraction Approximate(Mixed y) {
  int32_t numBefore = 1;
  int32_t denBefore = 0;
  int32_t num = y.whole;
  int32_t den = 1;
  while (y.rest != 0) {
    const uint32_t quotient = y.unit / y.rest;
    y.unit = std::exchange(y.rest, y.unit % y.rest);
    // The next numerator would reach the limit. Written without the division that finds how many
    // times num still fits, which only the last step needs.
    const auto room = static_cast<uint32_t>(kLimit - numBefore);
    if ((uint64_t{quotient} + 1) * static_cast<uint32_t>(num) > room) {
      const uint32_t fit = room / static_cast<uint32_t>(num);
      // Half the quotient or more brings the fraction between the last two closer than the last;
      // at exactly half the remainders decide.
      const bool isCloser =
          2 * uint64_t{fit} > quotient ||
          (2 * uint64_t{fit} == quotient && uint64_t{static_cast<uint32_t>(denBefore)} * y.unit >
                                                uint64_t{static_cast<uint32_t>(den)} * y.rest);
      if (isCloser) {
        num = static_cast<int32_t>(fit) * num + numBefore;
        den = static_cast<int32_t>(fit) * den + denBefore;
      }
      break;
    }
    numBefore = std::exchange(num, static_cast<int32_t>(quotient) * num + numBefore);
    denBefore = std::exchange(den, static_cast<int32_t>(quotient) * den + denBefore);
  }
  return {num, den};
}

}  // namespace

extern "C" {

int32_t Mp_Double2RatioSmart(M_Ratio* out, double x) {
  // Too large for a ratio, and perhaps for a float; a NaN goes the same way. The other bound that
  // the whole part must keep is below.
  if (!(std::abs(x) < 0x1p31)) {
    *out = {x < 0 ? -kLimit : kLimit, 1};
    return 0;
  }
  // Kept on purpose: single precision from here on, for about 24 significant bits.
  const auto f = static_cast<float>(x);
  const float a = std::abs(f);
  const int32_t sign = f < 0 ? -1 : 1;
  if (a >= 0x1p30f) {
    *out = {sign * kLimit, 1};
  } else if (a >= 1) {
    const Fraction y = Approximate(Split(a));
    *out = {sign * y.num, static_cast<uint32_t>(y.den)};
  } else if (a <= 0x1p-31f) {
    // Half of 1 / a would be the denominator here, and it has reached the limit.
    *out = {0, 1};
  } else {
    const Mixed y = SplitReciprocal(a);
    if (y.whole >= kLimit) {
      *out = {sign, static_cast<uint32_t>(kLimit)};
    } else {
      const Fraction reciprocal = Approximate(y);
      *out = {sign * reciprocal.den, static_cast<uint32_t>(reciprocal.num)};
    }
  }
  return 0;
}

int32_t M_FpLong2Ratio(M_Ratio* out, unsigned char* outOfRange, double x) {
  const bool isInRange = std::abs(x) < 0x1p31;
  Mp::Store(outOfRange, !isInRange);
  if (!isInRange) {
    *out = {0, 0};
    return 0;
  }
  // The fractions of a continued fraction are in lowest terms: there is nothing to reduce.
  return Mp_Double2RatioSmart(out, x);
}

}  // extern "C"
