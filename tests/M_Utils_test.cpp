#include <bit>
#include <numeric>

#include "Law.h"
#include "Mp_Utils.h"

namespace {

TEST(Utils, BitsAreCountedAndOverflowsPredicted) {
  Holds([](Word x) {
    Equal(M_LeadingZeros(x), std::countl_zero(x.value));
    Equal(M_TrailingZeros(x), std::countr_zero(x.value));
    Equal(M_RoundDownToPowerOf2(x), std::bit_floor(x.value));
    Equal(M_RoundUpToPowerOf2(x), (x > 0x80000000 || x == 0 ? 0 : std::bit_ceil(x.value)));
    const auto i = static_cast<int32_t>(x.value);
    Equal(M_BitsUsed(i), (i <= 0 ? 0 : std::bit_width(x.value)));
    Equal(M_IsTopTwoBitsSame(x), (int64_t{i} * 2 == static_cast<int32_t>(x.value * 2)));
  });
  Holds([](Int a, Int b, Word x, Word y) {
    const int64_t sum = int64_t{a} + b, product = int64_t{a} * b;
    const auto bits = [](int64_t v) { return std::bit_width(static_cast<uint64_t>(std::abs(v))); };
    Equal(M_AddWouldOverflow(a, b), (sum != static_cast<int32_t>(sum)));
    Equal(M_MulWouldOverflow(a, b), (bits(a) + bits(b) > 31));
    Equal(M_UMulWouldOverflow(x, y), (bits(x) + bits(y) > 32));
    int32_t out[2];
    Check(Mp_LongMul(a, b, out) == 0 && out[0] == product >> 32);
    Equal(out[1], static_cast<int32_t>(product));
    Equal(host.Take(), (Calls{"multiply " + std::to_string(a) + " " + std::to_string(b)}));
  });
}

TEST(Utils, DivisorsAndMultiples) {
  Holds([](Word a, Word b, bool isCommon) {
    const uint32_t x = isCommon ? a.value % 0x10000 * (b % 0x1000) : a.value;
    const uint32_t y = isCommon ? a.value % 0x10000 * (b.value >> 20) : b.value;
    const auto i = static_cast<int32_t>(x), j = static_cast<int32_t>(y);
    const uint32_t gcd = y == 0 ? 1 : std::gcd(x, y);
    const int64_t wide = y == 0 ? 1 : std::gcd(int64_t{i}, int64_t{j});
    uint32_t out;
    int32_t signedOut;
    Check(M_UnsignedGCD(x, y, &out) == 0 && out == gcd);
    Check(M_UnsignedLCM(x, y, &out) == 0 && out == x * y / gcd);
    Check(M_SignedGCD(i, j, &signedOut) == 0 && signedOut == static_cast<int32_t>(wide));
    Check(M_SignedLCM(i, j, &signedOut) == 0 && signedOut == static_cast<int32_t>(x * y) / wide);
  });
}

TEST(Utils, Rounding) {
  // Any, and odd ones beyond 2^52.
  Holds([](Any any, Any y, Int x, Word word, bool isOdd) {
    const double d = isOdd ? x * 0x400001p0 : any.value;
    // What is added to a positive value is rounded; so is what is taken from one above -0.5.
    const long double sum = d == -0x1.fffffffffffffp-2 ? -1 : d > 0 ? d + 0.5 : d + 0.5L;
    const auto fitted = [&](auto lowest) {
      const bool fits = std::floor(sum) >= lowest && sum < -1.0L * lowest;
      return fits ? static_cast<decltype(lowest)>(std::floor(sum)) : lowest;
    };
    Equal(M_RoundDouble64(d), fitted(INT64_MIN));
    Equal(M_RoundDouble(d), fitted(INT32_MIN));
    Equal(M_RoundDoubleSafe(d), (sum > INT32_MAX ? INT32_MAX : fitted(INT32_MIN)));
    Equal(BitsOf(M_fmod(d, y)), BitsOf(std::fmod(d, y.value)));
    const auto m = static_cast<int32_t>(std::max(word.value >> 1, 1u));
    const int64_t magnitude = std::abs(int64_t{x}), nearest = (magnitude + m / 2) / m * m;
    RC_PRE(magnitude + m / 2 <= INT32_MAX);
    Equal(M_RoundToNearestMult(x, m), (x < 0 ? -nearest : nearest));
  });
}

}  // namespace
