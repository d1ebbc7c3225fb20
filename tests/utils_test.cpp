// Bit counts, overflow predictions, gcd and lcm, rounding.

#include <bit>
#include <cmath>
#include <numeric>

#include "Generate.h"
#include "M_Utils.h"
#include "Mp_Bits.h"
#include "TestHost.h"

namespace {

constexpr int32_t kMin = INT32_MIN;
constexpr int32_t kMax = INT32_MAX;

// 0, every power of two with its neighbours, and generated words.
std::vector<uint32_t> Words() {
  std::vector<uint32_t> words = {0};
  for (int bit = 0; bit < 32; ++bit) {
    for (const uint32_t step : {0u - 1, 0u, 1u}) words.push_back((1u << bit) + step);
  }
  Generator generator(3);
  for (int i = 0; i < 1000; ++i) words.push_back(generator.Spread());
  return words;
}

TEST(Bits, NibbleTables) {
  for (unsigned nibble = 0; nibble < 16; ++nibble) {
    EXPECT_EQ(Mp_G_lead_zeros[nibble], std::countl_zero(static_cast<uint8_t>(nibble)) - 4);
    EXPECT_EQ(Mp_G_trail_zeros[nibble], nibble == 0 ? 4 : std::countr_zero(nibble));
  }
}

TEST(Bits, CountsAndPowers) {
  for (const uint32_t x : Words()) {
    SCOPED_TRACE(x);
    EXPECT_EQ(M_LeadingZeros(x), std::countl_zero(x));
    EXPECT_EQ(M_TrailingZeros(x), std::countr_zero(x));
    EXPECT_EQ(M_RoundDownToPowerOf2(x), std::bit_floor(x));
    EXPECT_EQ(M_RoundUpToPowerOf2(x), x == 0 || x > 0x80000000 ? 0 : std::bit_ceil(x));
    const auto value = static_cast<int32_t>(x);
    EXPECT_EQ(M_BitsUsed(value), value <= 0 ? 0 : std::bit_width(x));
    EXPECT_EQ(M_IsTopTwoBitsSame(x), value >= -0x40000000 && value < 0x40000000);
  }
}

TEST(Overflow, Predictions) {
  const auto bits = [](int64_t v) { return std::bit_width(static_cast<uint64_t>(std::abs(v))); };
  const std::vector<uint32_t> words = Words();
  for (const uint32_t x : words) {
    for (const uint32_t y : words) {
      const auto a = static_cast<int32_t>(x);
      const auto b = static_cast<int32_t>(y);
      const int64_t sum = int64_t{a} + b;
      ASSERT_EQ(M_AddWouldOverflow(a, b), sum < kMin || sum > kMax) << a << ' ' << b;
      ASSERT_EQ(M_MulWouldOverflow(a, b), bits(a) + bits(b) > 31) << a << ' ' << b;
      ASSERT_EQ(M_UMulWouldOverflow(x, y), bits(x) + bits(y) > 32) << x << ' ' << y;
    }
  }
}

TEST(Gcd, DividesAndIsGreatest) {
  const std::vector<uint32_t> words = Words();
  for (const uint32_t x : words) {
    for (size_t i = 0; i < words.size(); i += 3) {
      const uint32_t y = words[i];
      const auto a = static_cast<int32_t>(x);
      const auto b = static_cast<int32_t>(y);
      const uint32_t gcd = y == 0 ? 1 : std::gcd(x, y);
      const auto signedGcd =
          static_cast<uint32_t>(b == 0 ? 1 : std::gcd(std::abs(int64_t{a}), std::abs(int64_t{b})));
      uint32_t out = 99;
      int32_t signedOut = 99;
      ASSERT_EQ(M_UnsignedGCD(x, y, &out), 0);
      ASSERT_EQ(out, gcd) << x << ' ' << y;
      ASSERT_EQ(M_UnsignedLCM(x, y, &out), 0);
      ASSERT_EQ(out, x * y / gcd) << x << ' ' << y;
      ASSERT_EQ(M_SignedGCD(a, b, &signedOut), 0);
      ASSERT_EQ(static_cast<uint32_t>(signedOut), signedGcd) << a << ' ' << b;
      ASSERT_EQ(M_SignedLCM(a, b, &signedOut), 0);
      ASSERT_EQ(signedOut, static_cast<int32_t>(x * y) / int64_t{signedGcd}) << a << ' ' << b;
    }
  }
}

TEST(Rounding, Remainder) {
  EXPECT_EQ(M_fmod(5.5, -2), 1.5);
  EXPECT_EQ(M_fmod(-5.5, 2), -1.5);
  EXPECT_TRUE(std::isnan(M_fmod(1, 0)));
}

}  // namespace
