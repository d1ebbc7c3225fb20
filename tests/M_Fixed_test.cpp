#include <bit>

#include "Law.h"

namespace {

// A product or quotient of the wrong sign is an error.
int32_t Checked(int32_t a, int32_t b, int64_t wide) {
  const auto result = static_cast<int32_t>(wide);
  return ((a ^ b) < 0 ? result > 0 : result < 0) ? INT32_MIN : result;
}

TEST(Fixed, ProductsLoseZerosOrLowBits) {
  Holds([](Int a, Int b) {
    const int64_t product = int64_t{a} * b, cut = int64_t{a.value >> 8} * (b.value >> 8);
    Equal(M_FixMul(a, b), Checked(a, b, product % 0x20000 == 0 ? product >> 16 : cut));
  });
}

TEST(Fixed, QuotientsGiveUpTheDivisorsLowBits) {
  Holds([](Int a, Int b) {
    const int64_t dividend = std::abs(int64_t{a});
    const int lost = std::max(0, 16 - std::countl_zero(static_cast<uint32_t>(dividend)));
    // Arithmetically, which shows for -32768.0.
    const int32_t kept = static_cast<int32_t>(std::abs(int64_t{b})) >> lost;
    const int64_t quotient =
        kept == 0 ? 0 : (dividend << (16 - lost)) / static_cast<uint32_t>(kept);
    const int32_t result = Checked(a, b, (a ^ b) < 0 ? -quotient : quotient);
    Equal(M_FixDiv(a, b), (kept == 0 ? INT32_MIN : result));
  });
}

// Between -129 and -128, and where 128 comes from rounding, nothing is reported.
TEST(Fixed, Fix24IsRoundedHalfAwayFromZeroAndBounded) {
  const auto is = [](int32_t result, double value, const char* report) {
    const bool isOver = !(value < 128 && value > -129);
    Equal(host.Take(), (isOver ? Calls{report} : Calls()));
    const int64_t nearest = isOver ? INT64_MAX : std::llround(value * 0x1p24);
    Equal(result, (nearest > INT32_MAX ? INT32_MIN : std::max<int64_t>(nearest, INT32_MIN)));
  };
  Holds([&](Int a, Int b, Digit i) {
    is(M_Fix24Mul(a, b), static_cast<double>(int64_t{a} * b) * 0x1p-48,
       "110008 8 overflow in fix24 multiply.");
    const std::pair<int32_t, int32_t> edges[] = {
        {a, b}, {i * 128, i}, {i * -129, i}, {i * 1289, -10}, {INT32_MAX - i * i, 1 << 24}};
    for (const auto& [num, den] : edges) {
      is(M_Fix24Ratio(num, den), den == 0 ? kNan : num / (den * 1.0),
         den == 0 ? "110009 8 divide by zero in fix24 divide."
                  : "110009 8 overflow in fix24 multiply.");
    }
  });
}

}  // namespace
