// Exact ratio arithmetic, comparison, conversion and clipping.

#include <bit>
#include <numeric>
#include <ostream>

#include "Generate.h"
#include "M_Utils.h"
#include "Mp_Ratio.h"
#include "TestHost.h"

bool operator==(const M_Ratio& a, const M_Ratio& b) { return a.num == b.num && a.den == b.den; }
std::ostream& operator<<(std::ostream& out, const M_Ratio& r) {
  return out << r.num << '/' << r.den;
}

namespace {

constexpr int32_t kMin = INT32_MIN;
constexpr int32_t kMax = INT32_MAX;
constexpr uint32_t k2To31 = 0x80000000;
using RatioTest = HostTest;

__extension__ typedef __int128 Wide;

int Bits(Wide v) { return static_cast<int>(std::bit_width(static_cast<uint64_t>(v < 0 ? -v : v))); }

// What adding does, step by step in wide integers: the sum over the least common denominator unless
// a bit length forbids it, then the same with reduced operands. False: overflow.
bool ModelSum(M_Ratio a, M_Ratio b, M_Ratio* sum) {
  for (bool isReduced = false;; isReduced = true) {
    if (a.num == 0 || b.num == 0) {
      *sum = a.num == 0 ? b : a;
      return true;
    }
    const uint32_t gcd = std::gcd(a.den, b.den);
    const Wide scaleA = b.den / gcd, scaleB = a.den / gcd;
    const Wide num = scaleA * a.num + scaleB * b.num;
    const bool isTooLong =
        a.den != b.den && (Bits(scaleA) + Bits(a.den) > 32 || Bits(scaleA) + Bits(a.num) > 31 ||
                           Bits(scaleB) + Bits(b.num) > 31);
    if (!isTooLong && num >= kMin && num <= kMax) {
      *sum = {static_cast<int32_t>(num), static_cast<uint32_t>(scaleA * a.den)};
      return true;
    }
    if (isReduced) return false;
    for (M_Ratio* r : {&a, &b}) {
      const Wide divisor = std::gcd(int64_t{r->num}, int64_t{r->den});
      if (divisor < k2To31)
        *r = {static_cast<int32_t>(r->num / divisor), static_cast<uint32_t>(r->den / divisor)};
    }
  }
}

M_Ratio Operand(Generator& generator) {
  const uint32_t den = generator.Spread();
  return {generator.SignedSpread(), den == 0 ? 1 : den};
}

TEST_F(RatioTest, SumsAreExactOrOverflow) {
  Generator generator(4);
  int overflows = 0;
  for (int i = 0; i < 200000; ++i) {
    M_Ratio a = Operand(generator);
    M_Ratio b = Operand(generator);
    if (i % 3 == 0) b.den = a.den;
    if (i % 3 == 1) {
      const uint32_t common = generator.Below(0x10000) + 1;
      a.den = (a.den % 0x1000 + 1) * common;
      b.den = (b.den % 0x1000 + 1) * common;
    }
    M_Ratio expected = {0, 0};
    const bool fits = ModelSum(a, b, &expected);
    overflows += !fits;
    M_Ratio sum = {};
    unsigned char status = 0;
    ASSERT_EQ(M_AddRatio(&a, &b, &sum, &status), 0);
    ASSERT_EQ(status, !fits) << a << " + " << b;
    ASSERT_EQ(sum, expected) << a << " + " << b;
    if (b.num == kMin) continue;
    const M_Ratio negated = {-b.num, b.den};
    ASSERT_EQ(M_SubRatio(&a, &negated, &sum, &status), 0);
    ASSERT_EQ(status, !fits) << a << " - " << negated;
    ASSERT_EQ(sum, expected) << a << " - " << negated;
  }
  EXPECT_GT(overflows, 20000);
  EXPECT_LT(overflows, 180000);
}

TEST_F(RatioTest, ProductsAreExactOrOverflow) {
  Generator generator(5);
  for (int i = 0; i < 200000; ++i) {
    const M_Ratio a = Operand(generator);
    const M_Ratio b = Operand(generator);
    if (a.num == 0 || b.num == 0) continue;
    const auto fits = [](Wide num, Wide num2, Wide den, Wide den2) {
      return Bits(num) + Bits(num2) <= 31 && Bits(den) + Bits(den2) <= 32;
    };
    const Wide num = Wide{a.num} * b.num;
    const Wide den = Wide{a.den} * b.den;
    M_Ratio out = {};
    unsigned char status = 0;
    ASSERT_EQ(M_MulRatio(&a, &b, &out, &status), 0);
    if (fits(a.num, b.num, a.den, b.den)) {
      ASSERT_EQ(out, (M_Ratio{static_cast<int32_t>(num), static_cast<uint32_t>(den)}));
    } else if (status == 0) {
      ASSERT_TRUE(out.den * num == out.num * den) << a << " x " << b;
      ASSERT_EQ(std::gcd(int64_t{out.num}, int64_t{out.den}), 1) << "cross-reduced";
    } else {
      // In lowest terms the product leaves the bit lengths of its factors in any split.
      const Wide divisor =
          std::gcd(static_cast<uint64_t>(num < 0 ? -num : num), static_cast<uint64_t>(den));
      ASSERT_TRUE(Bits(num / divisor) >= 31 || Bits(den / divisor) >= 32) << a << " x " << b;
    }
    ASSERT_TRUE(status == 0 || out == (M_Ratio{0, 0}));
  }
}

TEST_F(RatioTest, OrderIsThatOfTheValues) {
  Generator generator(6);
  for (int i = 0; i < 200000; ++i) {
    const M_Ratio a = Operand(generator);
    const M_Ratio b =
        i % 2 ? Operand(generator) : M_Ratio{a.num + static_cast<int>(generator.Below(2)), a.den};
    if (b.num == kMin || a.den >= k2To31 || b.den >= k2To31) continue;
    int32_t order = 99;
    ASSERT_EQ(M_CompareRatio(&a, &b, &order), 0);
    const Wide difference = Wide{a.num} * b.den - Wide{b.num} * a.den;
    ASSERT_EQ((order > 0) - (order < 0), (difference > 0) - (difference < 0)) << a << ' ' << b;
    M_Ratio least = {}, most = {};
    ASSERT_EQ(M_MinRatio(&a, &b, &least) | M_MaxRatio(&a, &b, &most), 0);
    ASSERT_EQ(least, difference <= 0 ? a : b);
    ASSERT_EQ(most, difference >= 0 ? a : b);
  }
}

}  // namespace
