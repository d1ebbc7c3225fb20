// Ratios from doubles.

#include <cmath>
#include <limits>
#include <ostream>

#include "Generate.h"
#include "M_Utils.h"
#include "Mp_Ratio.h"
#include "TestHost.h"

namespace {

constexpr int32_t k2To30 = 0x40000000;

__extension__ typedef __int128 Wide;

// The continued fraction of n / d (above 1) up to a numerator of 2^30, in wide integers. Where the
// next convergent is too large, the closer of the last one and the largest fraction between is
// taken, the convergent when they are equally close: judged by the distances themselves.
void Model(Wide n, Wide d, Wide* num, Wide* den) {
  const Wide limit = k2To30;
  Wide h = n / d, k = 1, hp = 1, kp = 0;
  Wide a = d, b = n % d;
  while (b != 0) {
    const Wide q = a / b;
    const Wide rest = a % b;
    const Wide t = (limit - hp) / h;
    if (t <= q) {
      const Wide hs = t * h + hp, ks = t * k + kp;
      const auto distance = [n, d](Wide p, Wide r) {
        return n * r > p * d ? n * r - p * d : p * d - n * r;
      };
      // |n/d - hs/ks| < |n/d - h/k|, times d k ks.
      if (ks > 0 && distance(hs, ks) * k < distance(h, k) * ks) h = hs, k = ks;
      break;
    }
    const Wide hn = q * h + hp, kn = q * k + kp;
    hp = h, kp = k, h = hn, k = kn;
    a = b, b = rest;
  }
  *num = h, *den = k;
}

TEST(Approximation, IsTheClosestOfTheContinuedFraction) {
  Generator generator(7);
  for (int i = 0; i < 400000; ++i) {
    const float mantissa =
        std::ldexp(static_cast<float>(generator.Below(1u << 24) | (1u << 23)), -24);
    // Quotients of small numbers stop early and make the halves; the rest is any single.
    const float a = i % 2 ? std::ldexp(mantissa, static_cast<int>(generator.Below(61)) - 30)
                          : static_cast<float>(generator.Below(5000) + 1) /
                                static_cast<float>(generator.Spread() | 1);
    if (a <= 0x1p-30f || a >= 0x1p30f) continue;
    int exponent;
    const auto integer = static_cast<int64_t>(std::frexp(a, &exponent) * 0x1p24f);
    exponent -= 24;
    Wide n = integer, d = 1;
    (exponent >= 0 ? n : d) <<= std::abs(exponent);
    Wide num, den;
    if (a >= 1) {
      Model(n, d, &num, &den);
    } else {
      Model(d, n, &den, &num);
    }
    const bool isNegative = generator.Below(2);
    M_Ratio out = {};
    unsigned char isOutOfRange = 9;
    ASSERT_EQ(M_FpLong2Ratio(&out, &isOutOfRange, isNegative ? -a : a), 0);
    ASSERT_EQ(isOutOfRange, 0);
    ASSERT_EQ(out.num, static_cast<int32_t>(isNegative ? -num : num)) << a;
    ASSERT_EQ(out.den, static_cast<uint32_t>(den)) << a;
  }
}

}  // namespace
