// Ratios against 128-bit arithmetic.

#include "Input.h"

namespace {

using Wide = __int128;

// Whether num / den is the ratio's value.
bool IsValue(const M_Ratio& r, Wide num, Wide den) { return Wide{r.num} * den == num * r.den; }

// A result that is said to be exact is; one that overflows is 0/0.
void RequireExact(int32_t code, unsigned char status, const M_Ratio& r, Wide num, Wide den) {
  if (code != 0 || status == 1) {
    Require(r.num == 0 && r.den == 0);
  } else if (status == 0) {
    Require(r.den != 0 && IsValue(r, num, den));
  }
}

}  // namespace

void Run(Input& input) {
  const auto a = input.Any<M_Ratio>(), b = input.Any<M_Ratio>();
  const auto given = input.Any<unsigned char>();
  const Wide an = a.num, ad = a.den, bn = b.num, bd = b.den;
  M_Ratio r;
  const auto check = [&](auto* function, Wide num, Wide den) {
    unsigned char status = given & 3;
    const int32_t code = function(&a, &b, &r, &status);
    RequireExact(code, status, r, num, den);
    M_Ratio inPlace = a;
    unsigned char again = given & 3;
    Require(function(&inPlace, &b, &inPlace, &again) == code && again == status);
    Require(inPlace.num == r.num && inPlace.den == r.den);
    function(&a, &b, &r, nullptr);
    function(&a, &b, &r, reinterpret_cast<unsigned char*>(-1));
  };
  check(M_AddRatio, an * bd + bn * ad, ad * bd);
  // The most negative numerator is its own negative, and a den of 2^31 no numerator.
  if (b.num != INT32_MIN) {
    check(M_SubRatio, an * bd - bn * ad, ad * bd);
    int32_t order = 7;
    Require((M_CompareRatio(&a, &b, &order) == 0) == (a.den != 0 && b.den != 0));
    const Wide difference = an * bd - bn * ad;
    // With larger denominators close ratios may be equal.
    const bool isUsual = a.den - 1 < 0x7FFFFFFF && b.den - 1 < 0x7FFFFFFF;
    if (isUsual) Require((order > 0) - (order < 0) == (difference > 0) - (difference < 0));
  }
  check(M_MulRatio, an * bn, ad * bd);
  if (b.num > 0 && b.den < 0x80000000) check(M_DivRatio, an * bd, ad * bn);

  // Where everything fits, everything is exact.
  const M_Ratio c = {a.num % 32768, a.den % 32767 + 1}, d = {b.num % 32768, b.den % 32767 + 1};
  const Wide cn = c.num, cd = c.den, dn = d.num, dd = d.den;
  const auto isExactly = [&](auto* function, Wide num, Wide den) {
    unsigned char status = 0;
    return function(&c, &d, &r, &status) == 0 && status == 0 && IsValue(r, num, den);
  };
  Require(isExactly(M_AddRatio, cn * dd + dn * cd, cd * dd));
  Require(isExactly(M_SubRatio, cn * dd - dn * cd, cd * dd));
  Require(isExactly(M_MulRatio, cn * dn, cd * dd));
  if (d.num > 0) Require(isExactly(M_DivRatio, cn * dd, cd * dn));
  unsigned char isConverted = 2, isTooLarge = 2;
  Require(M_ConvRatio(&c, d.den, &r, &isConverted, &isTooLarge) == 0 && !isTooLarge);
  Require(isConverted == (cn * dd % cd == 0));

  unsigned char isReduced;
  if (a.den != 0) {
    Require(M_ReduceRatio(&a, &r, &isReduced) == 0 && IsValue(r, an, ad));
  }
  const auto newDen = input.Any<uint32_t>();
  unsigned char isExact = 2, overflows = 2;
  if (M_ConvRatio(&a, newDen, &r, &isExact, &overflows) == 0 && !overflows) {
    Require(r.den == newDen);
    // Half a unit, and what is lost in double precision.
    const Wide twice = 2 * (Wide{r.num} * ad - an * newDen);
    const Wide most = (isExact ? 0 : ad) + 8192;
    Require(-most <= twice && twice <= most);
  }
  const double x = input.Any<double>();
  unsigned char isOutOfRange = 2;
  M_FpLong2Ratio(&r, &isOutOfRange, x);
  Require(isOutOfRange == !(std::abs(x) < 2147483648.0));
  if (!isOutOfRange) Require(r.den != 0);
}
