#include "Law.h"

namespace {

// A product or quotient of the wrong sign is an error.
int32_t Checked(int32_t a, int32_t b, int64_t wide) {
  const auto result = static_cast<int32_t>(wide);
  return ((a ^ b) < 0 ? result > 0 : result < 0) ? INT32_MIN : result;
}

TEST(Fixed, ProductsLoseZerosOrLowBits) {
  Holds([](Int a, Int b) {
    const int64_t product = int64_t{a} * b;
    const bool isExact = (product & 0x1FFFF) == 0;
    const int64_t cut = int64_t{a.value >> 8} * (b.value >> 8);
    Equal(M_FixMul(a, b), Checked(a, b, isExact ? product >> 16 : cut));
  });
}

TEST(Fixed, QuotientsGiveUpTheDivisorsLowBits) {
  Holds([](Int a, Int b) {
    const int64_t dividend = std::abs(int64_t{a});
    int64_t divisor = std::abs(int64_t{b});
    int given = 16;
    while (dividend << given > UINT32_MAX) --given;
    // Arithmetically, which shows for -32768.0.
    if (given < 16) divisor = static_cast<uint32_t>(static_cast<int32_t>(divisor) >> (16 - given));
    const int64_t quotient = divisor == 0 ? 0 : (dividend << given) / divisor;
    const int32_t expected =
        divisor == 0 ? INT32_MIN : Checked(a, b, (a ^ b) < 0 ? -quotient : quotient);
    Equal(M_FixDiv(a, b), expected);
  });
}

const Calls kNothing;

TEST(Fixed, Fix24IsRoundedHalfAwayFromZeroAndBounded) {
  const auto rounded = [](long double units) {
    return std::abs(units) >= 0x1p31L - 0.5L && units != -0x1p31L
               ? INT32_MIN
               : static_cast<int32_t>(std::trunc(units + (units < 0 ? -0.5L : 0.5L)));
  };
  const auto is = [&](int32_t result, long double value, const char* overflow) {
    const bool isOver = value >= 128 || value <= -129;
    Equal(host.Take(), (isOver ? Calls{overflow} : kNothing));
    const int64_t expected = isOver ? INT32_MIN : rounded(value * 0x1p24L);
    // Large values have more digits than a double.
    Check(result == expected || (std::abs(value) > 1 && std::abs(result - expected) <= 1));
  };
  Holds([&](Int a, Int b) {
    const int32_t product = M_Fix24Mul(a, b);
    is(product, int64_t{a} * b * 0x1p-48L, "110008 8 overflow in fix24 multiply.");
    if (b == 0) {
      Equal(M_Fix24Ratio(a, b), INT32_MIN);
      Equal(host.Take(), Calls{"110009 8 divide by zero in fix24 divide."});
    } else {
      const int32_t quotient = M_Fix24Ratio(a, b);
      is(quotient, static_cast<long double>(a) / b, "110009 8 overflow in fix24 multiply.");
    }
  });
  // Between -129 and -128 nothing is reported.
  for (const auto& [a, b, isOver] : {std::tuple(-129, 1, true),
                                     {-1289, 10, false},
                                     {128, 1, true},
                                     {-128, 1, false},
                                     {INT32_MAX, 16777216, false}}) {
    const int32_t result = M_Fix24Ratio(a, b);
    EXPECT_EQ(result == INT32_MIN, a != INT32_MAX);
    EXPECT_EQ(host.Take().size(), isOver) << a;
  }
  EXPECT_EQ(M_Fix24Ratio(1, 3), 5592405);
  EXPECT_EQ(M_Fix24Mul(0x1800, -0x800), -1);
}

}  // namespace
