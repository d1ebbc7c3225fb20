#include <bit>
#include <numeric>

#include "Law.h"
#include "Mp_Bits.h"
#include "Mp_Utils.h"

namespace {

TEST(Utils, BitsAreCountedAsByTheStandardLibrary) {
  Holds([](Word x) {
    Equal(M_LeadingZeros(x), std::countl_zero(x.value));
    Equal(M_TrailingZeros(x), std::countr_zero(x.value));
    Equal(M_RoundDownToPowerOf2(x), std::bit_floor(x.value));
    Equal(M_RoundUpToPowerOf2(x), (x > 0x80000000 || x == 0 ? 0 : std::bit_ceil(x.value)));
    const auto i = static_cast<int32_t>(x.value);
    Equal(M_BitsUsed(i), (i <= 0 ? 0 : std::bit_width(x.value)));
    Equal(M_IsTopTwoBitsSame(x), (int64_t{i} * 2 == static_cast<int32_t>(x.value * 2)));
    Equal(Mp_G_lead_zeros[x & 15], std::countl_zero(x.value << 28 | 0x8000000));
    Equal(Mp_G_trail_zeros[x & 15], std::countr_zero(x.value % 16 | 16));
  });
}

TEST(Utils, OverflowsArePredicted) {
  const auto bits = [](int64_t v) { return std::bit_width(static_cast<uint64_t>(std::abs(v))); };
  Holds([&](Int a, Int b) {
    const int64_t sum = int64_t{a} + b;
    Equal(M_AddWouldOverflow(a, b), (sum != static_cast<int32_t>(sum)));
    Equal(M_MulWouldOverflow(a, b), (bits(a) + bits(b) > 31));
    int32_t out[2];
    Equal(Mp_LongMul(a, b, out), 0);
    Equal(host.Take(), (Calls{"multiply " + std::to_string(a) + " " + std::to_string(b)}));
    Equal((int64_t{out[0]} << 32 | static_cast<uint32_t>(out[1])), int64_t{a} * b);
  });
  Holds([&](Word a, Word b) { Equal(M_UMulWouldOverflow(a, b), (bits(a) + bits(b) > 32)); });
}

TEST(Utils, DivisorsAndMultiples) {
  Holds([](Word a, Word b, bool isCommon) {
    const uint32_t x = isCommon ? a.value % 0x10000 * (b % 0x1000) : a.value;
    const uint32_t y = isCommon ? a.value % 0x10000 * (b.value >> 20) : b.value;
    uint32_t gcd, lcm;
    Check(M_UnsignedGCD(x, y, &gcd) == 0 && M_UnsignedLCM(x, y, &lcm) == 0);
    Equal(gcd, (y == 0 ? 1 : std::gcd(x, y)));
    Equal(lcm, x * y / gcd);
    int32_t i, j;
    const auto signedX = static_cast<int32_t>(x), signedY = static_cast<int32_t>(y);
    Check(M_SignedGCD(signedX, signedY, &i) == 0 && M_SignedLCM(signedX, signedY, &j) == 0);
    const int64_t wide = y == 0 ? 1 : std::gcd(int64_t{signedX}, int64_t{signedY});
    Equal(i, static_cast<int32_t>(wide));
    Equal(j, static_cast<int32_t>(x * y) / wide);
  });
}

TEST(Utils, Rounding) {
  Holds([](Any any) {
    const double d = any;
    const double whole = std::floor(d), rest = d - whole;
    // Far out a sum with 0.5 is rounded itself; just below a half, it is whole.
    if (std::abs(d) < 0x1p51 && std::abs(std::abs(d) - 0.5) > 1e-15) {
      const auto nearest = static_cast<int64_t>(rest < 0.5 ? whole : whole + 1);
      Equal(M_RoundDouble64(d), nearest);
      const bool fits = nearest == static_cast<int32_t>(nearest);
      Equal(M_RoundDouble(d), (fits ? nearest : INT32_MIN));
      Equal(M_RoundDoubleSafe(d), std::clamp<int64_t>(nearest, INT32_MIN, INT32_MAX));
    } else if (!(std::abs(d) < 1)) {
      Equal(M_RoundDouble(d), INT32_MIN);
      Equal(M_RoundDoubleSafe(d), (d > 0 ? INT32_MAX : INT32_MIN));
      if (!(std::abs(d) < 0x1p63)) Equal(M_RoundDouble64(d), INT64_MIN);
    }
  });
  Holds([](Int x, Word word) {
    const auto m = static_cast<int32_t>(std::max(word.value >> 1, 1u));
    const int64_t magnitude = std::abs(int64_t{x}), nearest = (magnitude + m / 2) / m * m;
    RC_PRE(magnitude + m / 2 <= INT32_MAX);
    Equal(M_RoundToNearestMult(x, m), (x < 0 ? -nearest : nearest));
  });
  Holds([](Any x, Any y) { Equal(BitsOf(M_fmod(x, y)), BitsOf(std::fmod(x.value, y.value))); });
  // A sum with 0.5 is rounded, too.
  EXPECT_EQ(M_RoundDouble(0x1.fffffffffffffp-2), 1);
  EXPECT_EQ(M_RoundDouble(-0x1.fffffffffffffp-2), -1);
  EXPECT_EQ(M_RoundDouble64(-0.50000000000000011), -1);
  EXPECT_EQ(M_RoundDouble64(0x1p52 + 1), 0x10000000000002);
  EXPECT_EQ(M_RoundDouble64(-0x1p53 - 2), -0x20000000000002);
  EXPECT_EQ(M_RoundDouble64(-0x1p52 - 1), -0x10000000000001);
  EXPECT_EQ(M_RoundDouble64(0x1.fffffffffffffp62), 0x7FFFFFFFFFFFFC00);
  EXPECT_EQ(M_RoundDoubleSafe(2147483646.5), INT32_MAX);
}

}  // namespace
