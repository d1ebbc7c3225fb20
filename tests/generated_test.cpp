// Generated operands against wide integer arithmetic and the standard library.

#include <bit>
#include <numeric>

#include "Cases.h"
#include "Generator.h"

namespace {

__extension__ typedef __int128 Wide;

int Bits(Wide v) { return static_cast<int>(std::bit_width(static_cast<uint64_t>(v < 0 ? -v : v))); }
int Sign(Wide v) { return (v > 0) - (v < 0); }
bool IsInt32(Wide v) { return v == static_cast<int32_t>(v); }

// The sum over the least common denominator, unless a bit length forbids it.
bool PlainSum(const M_Ratio& a, const M_Ratio& b, M_Ratio* sum) {
  const uint32_t gcd = std::gcd(a.den, b.den);
  const Wide scaleA = b.den / gcd, scaleB = a.den / gcd, num = scaleA * a.num + scaleB * b.num;
  const bool isTooLong =
      a.den != b.den && (Bits(scaleA) + Bits(a.den) > 32 || Bits(scaleA) + Bits(a.num) > 31 ||
                         Bits(scaleB) + Bits(b.num) > 31);
  *sum = {static_cast<int32_t>(num), static_cast<uint32_t>(scaleA * a.den)};
  if (a.num == 0 || b.num == 0) *sum = a.num == 0 ? b : a;
  return a.num == 0 || b.num == 0 || (!isTooLong && IsInt32(num));
}

M_Ratio Lowest(const M_Ratio& r) {
  const int64_t gcd = std::gcd(int64_t{r.num}, int64_t{r.den});
  return gcd > INT32_MAX
             ? r
             : M_Ratio{static_cast<int32_t>(r.num / gcd), static_cast<uint32_t>(r.den / gcd)};
}

TEST(Generated, Ratios) {
  Generator generator(3);
  for (int i = 0; i < 300000; ++i) {
    M_Ratio a = generator.Ratio(), b = generator.Ratio(), out = {}, expected = {};
    if (i % 3 == 0) b = {i % 2 ? b.num : a.num ^ 1, a.den};
    if (i % 3 == 1) {
      const uint32_t common = generator.Below(0x10000) + 1;
      a.den = (a.den % 0x1000 + 1) * common, b.den = (b.den % 0x1000 + 1) * common;
    }
    SCOPED_TRACE(Text(a, b));
    bool fits = PlainSum(a, b, &expected) || PlainSum(Lowest(a), Lowest(b), &expected);
    if (!fits) expected = {0, 0};
    unsigned char status = 0;
    ASSERT_EQ(M_AddRatio(&a, &b, &out, &status), 0);
    ASSERT_EQ(ToText(out), ToText(expected));
    ASSERT_EQ(status, !fits);
    const M_Ratio negated = {b.num == INT32_MIN ? b.num : -b.num, b.den};
    if (b.num != INT32_MIN) {
      ASSERT_EQ(M_SubRatio(&a, &negated, &out, &status), 0);
      ASSERT_EQ(ToText(out), ToText(expected));
    }

    const Wide num = Wide{a.num} * b.num, den = Wide{a.den} * b.den;
    fits = Bits(a.num) + Bits(b.num) <= 31 && Bits(a.den) + Bits(b.den) <= 32;
    ASSERT_EQ(M_MulRatio(&a, &b, &out, &(status = 0)), 0);
    ASSERT_TRUE(!fits || (out.num == num && out.den == den));
    ASSERT_TRUE(status != 0 || out.den * num == out.num * den);
    ASSERT_TRUE(status != 0 || fits || num == 0 ||
                std::gcd(int64_t{out.num}, int64_t{out.den}) == 1);

    if (b.num == INT32_MIN || (a.den | b.den) > INT32_MAX) continue;
    const Wide difference = Wide{a.num} * b.den - Wide{b.num} * a.den;
    int32_t order = 99;
    M_Ratio least = {}, most = {};
    ASSERT_EQ(
        M_CompareRatio(&a, &b, &order) | M_MinRatio(&a, &b, &least) | M_MaxRatio(&a, &b, &most), 0);
    ASSERT_EQ(Sign(order), Sign(difference));
    ASSERT_EQ(ToText(least), ToText(difference <= 0 ? a : b));
    ASSERT_EQ(ToText(most), ToText(difference >= 0 ? a : b));
  }
}

}  // namespace
