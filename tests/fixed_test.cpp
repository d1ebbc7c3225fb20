// 16.16 and 8.24 arithmetic.

#include <cstdlib>

#include "Generate.h"
#include "M_Utils.h"
#include "TestHost.h"

namespace {

constexpr int32_t kMin = INT32_MIN;
constexpr int32_t kMax = INT32_MAX;

using FixedTest = HostTest;

// The exact product of what the shifts leave, with the sign rule.
TEST_F(FixedTest, MultiplyAgreesWithWideArithmetic) {
  Generator generator(1);
  for (int i = 0; i < 300000; ++i) {
    const M_Fixed a = generator.SignedSpread();
    const M_Fixed b = generator.SignedSpread();
    const auto zeros = [](int64_t v) {
      return v == 0 ? 32 : __builtin_ctzll(static_cast<uint64_t>(v));
    };
    const bool isExact = zeros(a) >= 17 || zeros(a) + zeros(b) >= 17;
    const int64_t wide = isExact ? (int64_t{a} * b) >> 16 : int64_t{a >> 8} * (b >> 8);
    const auto wrapped = static_cast<int32_t>(wide);
    const bool isWrong = (a ^ b) >= 0 ? wrapped < 0 : wrapped > 0;
    ASSERT_EQ(M_FixMul(a, b), isWrong ? kMin : wrapped) << a << ' ' << b;
  }
}

TEST_F(FixedTest, DivideAgreesWithWideArithmetic) {
  Generator generator(2);
  for (int i = 0; i < 300000; ++i) {
    const M_Fixed a = generator.SignedSpread();
    const M_Fixed b = generator.SignedSpread();
    const int64_t ua = std::abs(int64_t{a});
    const int64_t ub = std::abs(int64_t{b});
    int drop = 0;
    while (ua >> (16 + drop) != 0) ++drop;
    // |-32768.0| is negative as 32 bits, so its shift is filled with ones.
    const int64_t divisor =
        b == kMin && drop > 0 ? (int64_t{kMin} >> drop) & 0xFFFFFFFF : ub >> drop;
    int32_t expected = kMin;
    if (divisor != 0) {
      const int64_t magnitude = (ua << (16 - drop)) / divisor;
      const auto quotient = static_cast<int32_t>((a ^ b) < 0 ? -magnitude : magnitude);
      const bool isWrong = (a ^ b) >= 0 ? quotient < 0 : quotient > 0;
      if (!isWrong) expected = quotient;
    }
    ASSERT_EQ(M_FixDiv(a, b), expected) << a << ' ' << b;
  }
}

}  // namespace
