#include <bit>
#include <numeric>

#include "Law.h"
#include "Mp_Ratio.h"
#include "Mp_Strs.h"

// Found through the type it is about, so not in a namespace.
static bool operator==(const M_Ratio& a, const M_Ratio& b) {
  return a.num == b.num && a.den == b.den;
}

namespace {

__extension__ typedef __int128 Wide;

constexpr M_Ratio kNone = {0, 0};
constexpr uint32_t kTwoTo31 = 0x80000000;
unsigned char* const kAllOnes = reinterpret_cast<unsigned char*>(UINTPTR_MAX);

int Bits(Wide v) { return static_cast<int>(std::bit_width(static_cast<uint64_t>(v < 0 ? -v : v))); }
int Sign(Wide v) { return (v > 0) - (v < 0); }
bool IsInt32(Wide v) { return v == static_cast<int32_t>(v); }
int32_t Negated(int32_t i) { return static_cast<int32_t>(0 - static_cast<uint32_t>(i)); }
Wide Order(const M_Ratio& a, const M_Ratio& b) { return Wide{a.num} * b.den - Wide{b.num} * a.den; }

M_Ratio Lowest(const M_Ratio& r) {
  const int64_t gcd = std::gcd(int64_t{r.num}, int64_t{r.den});
  return gcd > INT32_MAX
             ? r
             : M_Ratio{static_cast<int32_t>(r.num / gcd), static_cast<uint32_t>(r.den / gcd)};
}

// The sum over the least common denominator, unless a bit length forbids it.
bool Sum(const M_Ratio& a, const M_Ratio& b, M_Ratio* sum) {
  const uint32_t gcd = std::gcd(a.den, b.den);
  const Wide scaleA = b.den / gcd, scaleB = a.den / gcd, num = scaleA * a.num + scaleB * b.num;
  const bool isTooLong =
      a.den != b.den && (Bits(scaleA) + Bits(a.den) > 32 || Bits(scaleA) + Bits(a.num) > 31 ||
                         Bits(scaleB) + Bits(b.num) > 31);
  *sum = {static_cast<int32_t>(num), static_cast<uint32_t>(scaleA * a.den)};
  if (a.num == 0 || b.num == 0) *sum = a.num == 0 ? b : a;
  return a.num == 0 || b.num == 0 || (!isTooLong && IsInt32(num));
}

bool Product(const M_Ratio& a, const M_Ratio& b, M_Ratio* product) {
  *product = {static_cast<int32_t>(Wide{a.num} * b.num), a.den * b.den};
  return Bits(a.num) + Bits(b.num) <= 31 && Bits(a.den) + Bits(b.den) <= 32;
}

void Cancel(int32_t* num, uint32_t* den) {
  const M_Ratio r = Lowest({*num, *den});
  *num = r.num, *den = r.den;
}

bool ReducedProduct(M_Ratio a, M_Ratio b, M_Ratio* product) {
  if (Product(a, b, product)) return true;
  Cancel(&a.num, &a.den), Cancel(&b.num, &b.den), Cancel(&b.num, &a.den), Cancel(&a.num, &b.den);
  return Product(a, b, product);
}

// What an operation does with each kind of status, given what it should come to if it is exact, the
// value that is approximated otherwise, and what it reports.
template <class Operation>
void IsAsPermitted(const Operation& operation, bool fits, const M_Ratio& exact, double value,
                   const std::string& overflow) {
  M_Ratio nearest;
  unsigned char isOutOfRange;
  M_FpLong2Ratio(&nearest, &isOutOfRange, value);
  for (const int given : {-2, -1, 0, 1, 2, 3, 0xFD, 0xFE}) {
    unsigned char byte = static_cast<unsigned char>(given);
    unsigned char* const status = given == -2 ? nullptr : given == -1 ? kAllOnes : &byte;
    const bool mayApproximate = given == -1 || (given > 0 && given & 2);
    const bool isApproximated = !fits && mayApproximate && !isOutOfRange;
    const bool isReported = !fits && !isApproximated && given < 0;
    M_Ratio out = {77, 77};
    Equal(operation(&out, status), (isReported ? M_ERR_OVERFLOW : 0));
    Equal(out, (fits ? exact : isApproximated ? nearest : kNone));
    Check(given < 0 || byte == (fits ? 0 : isApproximated ? 2 : 1));
    Equal(host.Take(), (isReported ? Calls{overflow} : Calls()));
  }
}

// Operands whose denominators have much in common, or nothing, at times the same.
template <class Check>
void HoldsForPairs(const Check& check) {
  Holds([&](M_Ratio a, M_Ratio b, Word common, Digit kind) {
    if (kind < 0) {
      const uint32_t factor = common % 0x10000 + 1;
      a.den = (a.den % 0x1000 + 1) * factor, b.den = (b.den % 0x1000 + 1) * factor;
    }
    if (kind > 6) b.den = a.den;
    if (kind == 6) b.num = a.num, b.den = a.den ^ 1;
    if (kind == 5) b = {INT32_MIN, a.den};
    if (b.den == 0) b.den = 1;
    check(a, b);
  });
}

TEST(Ratio, SumsAreExactWhereTheyFit) {
  HoldsForPairs([](const M_Ratio& a, const M_Ratio& b) {
    for (const bool isDifference : {false, true}) {
      // -2^31 is its own negative, unless it has been reduced before.
      const auto term = [&](const M_Ratio& r) {
        return M_Ratio{isDifference ? Negated(r.num) : r.num, r.den};
      };
      M_Ratio exact;
      const bool fits = Sum(a, term(b), &exact) || Sum(Lowest(a), term(Lowest(b)), &exact);
      const double x = a.num / double{a.den * 1.0}, y = b.num / double{b.den * 1.0};
      const auto calculate = isDifference ? M_SubRatio : M_AddRatio;
      IsAsPermitted(
          [&](M_Ratio* out, unsigned char* status) { return calculate(&a, &b, out, status); }, fits,
          exact, isDifference ? x - y : x + y,
          isDifference ? "110010 8 overflow in ratio subtraction."
                       : "110010 8 overflow in ratio addition.");
    }
  });
}

TEST(Ratio, ProductsAndQuotients) {
  HoldsForPairs([](const M_Ratio& a, const M_Ratio& b) {
    const auto multiplies = [&](const M_Ratio& factor, const auto& operation) {
      M_Ratio exact;
      const bool fits = ReducedProduct(a, factor, &exact);
      const double value = (a.num / double{a.den * 1.0}) * (factor.num / double{factor.den * 1.0});
      IsAsPermitted(operation, fits, exact, value, "110011 8 overflow in ratio multiply.");
    };
    multiplies(
        b, [&](M_Ratio* out, unsigned char* status) { return M_MulRatio(&a, &b, out, status); });
    if (b.num == 0 || b.den >= kTwoTo31) return;
    const auto den = static_cast<int32_t>(b.den);
    multiplies(
        {b.num < 0 ? -den : den, static_cast<uint32_t>(b.num)},
        [&](M_Ratio* out, unsigned char* status) { return M_DivRatio(&a, &b, out, status); });
  });
  // A divisor that is too large, halved or not.
  Holds([](const M_Ratio& a, Int num, Word word) {
    const M_Ratio b = {num, word | kTwoTo31}, half = {num / 2, b.den >> 1};
    for (const int given : {-2, -1, 0, 1, 2, 3}) {
      const auto byte = [&](unsigned char* own) {
        return given == -2   ? nullptr
               : given == -1 ? kAllOnes
                             : (*own = static_cast<unsigned char>(given), own);
      };
      const bool mayHalve = given == -1 || given == 1 || given == 3;
      unsigned char status = 0, expectedStatus = 0;
      M_Ratio out = {77, 77}, expected = {0, 0};
      const int32_t code = mayHalve      ? M_DivRatio(&a, &half, &expected, byte(&expectedStatus))
                           : given == -2 ? M_ERR_OVERFLOW
                                         : 0;
      Calls calls = host.Take();
      if (given == -2) calls = {"110011 8 overflow in ratio divide."};
      Equal(M_DivRatio(&a, &b, &out, byte(&status)), code);
      Check(out == expected && host.Take() == calls);
      Check(given < 0 || status == (mayHalve ? expectedStatus | 2 : given | 1));
    }
  });
}

TEST(Ratio, ZeroDenominatorsAreReportedWhateverTheStatus) {
  Holds([](M_Ratio a, M_Ratio b, bool isFirst) {
    (isFirst ? a : b).den = 0;
    const auto fails = [&](const auto& operation, const char* report) {
      for (const int given : {-2, -1, 0, 3}) {
        unsigned char byte = static_cast<unsigned char>(given);
        M_Ratio out = {77, 77};
        Equal(operation(&a, &b, &out,
                        given == -2   ? nullptr
                        : given == -1 ? kAllOnes
                                      : &byte),
              M_ERR_ZERO_DENOMINATOR);
        Check(out == kNone && (given < 0 || byte == 0));
        Equal(host.Take(), Calls{report});
      }
    };
    fails(M_AddRatio, "110010 8 zero denominator in ratio addition.");
    fails(M_SubRatio, "110010 8 zero denominator in ratio subtraction.");
    fails(M_MulRatio, "110011 8 zero denominator in ratio multiply.");
    int32_t order = 77;
    Check(M_CompareRatio(&a, &b, &order) == M_ERR_ZERO_DENOMINATOR && order == 0);
    for (const auto extreme : {M_MinRatio, M_MaxRatio}) {
      M_Ratio out = {77, 77};
      Check(extreme(&a, &b, &out) == M_ERR_ZERO_DENOMINATOR && out == kNone);
    }
    Equal(host.Take(), Calls(3, "110010 8 zero denominator comparing ratios."));
    if (isFirst || b.num <= 0 || a.den > INT32_MAX || a.num == INT32_MIN) return;
    // The reciprocal of a zero has none; of none it is zero.
    const M_Ratio zero = {0, 7};
    M_Ratio out;
    Check(M_DivRatio(&a, &zero, &out, nullptr) == M_ERR_ZERO_DENOMINATOR && out == kNone);
    Equal(host.Take(), Calls{"110011 8 zero denominator in ratio multiply."});
    Check(M_DivRatio(&a, &b, &out, nullptr) == 0 && out.num == 0);
  });
}

TEST(Ratio, ReducedAndReciprocal) {
  Holds([](M_Ratio r, Digit kind) {
    if (kind == 9) r.den = 0;
    if (kind == 8) r = {INT32_MIN, kTwoTo31};
    if (kind == 7) r = {0, r.den | kTwoTo31};
    const uint32_t n = static_cast<uint32_t>(std::abs(int64_t{r.num})), d = r.den;
    const uint32_t gcd = d == 0 ? 1 : std::gcd(n, d);
    M_Ratio out;
    unsigned char flag = 9;
    Check(M_ReduceRatio(&r, &out, &flag) == 0 && flag == (gcd != 1));
    Equal(out, (d == 0 ? r : Lowest(r)));
    Equal(M_RecipRatio(&r, &out, &flag), 0);
    const auto is = [&](uint32_t num, uint32_t den) {
      return out == M_Ratio{static_cast<int32_t>(r.num < 0 ? 0 - num : num), den};
    };
    const bool isHalved = d >= kTwoTo31 && gcd == 1 && n != 0;
    Equal(flag, !isHalved);
    if (isHalved) {
      Check(is(d >> 1, static_cast<uint32_t>(static_cast<int32_t>(n) >> 1)));
    } else if (n == 0) {
      Equal(out, kNone);
    } else if (d >= kTwoTo31 && gcd < kTwoTo31) {
      Check(is(d / gcd, n / gcd));
    } else {
      Check(is(d, n));
    }
  });
}

// The order by which functions decide: exact, but for large denominators and for -2^31, which is
// its own negative.
bool IsOrdered(const M_Ratio& a, const M_Ratio& b) {
  return b.num != INT32_MIN && (a.den | b.den) < kTwoTo31;
}

TEST(Ratio, Comparison) {
  HoldsForPairs([](const M_Ratio& a, const M_Ratio& b) {
    int32_t order = 99;
    M_Ratio least, most, difference;
    unsigned char status = 0;
    Equal((M_CompareRatio(&a, &b, &order) | M_MinRatio(&a, &b, &least) | M_MaxRatio(&a, &b, &most)),
          0);
    if (IsOrdered(a, b)) {
      Equal(Sign(order), Sign(Order(a, b)));
      M_SubRatio(&a, &b, &difference, &status);
      Equal(order, (status == 0 ? difference.num : Sign(Order(a, b))));
    } else {
      M_SubRatio(&a, &b, &difference, &status);
      const double x = b.den * 1.0 * a.num, y = a.den * 1.0 * b.num;
      if (status != 0 && (a.den | b.den) >= kTwoTo31) Equal(order, (x > y) - (x < y));
      if (status == 0) Equal(order, difference.num);
    }
    Equal(least, (order <= 0 ? a : b));
    Equal(most, (order < 0 ? b : a));
    host.Take();
  });
}

TEST(Ratio, ClippedToARange) {
  Holds([](const M_Ratio& value, M_Ratio lo, M_Ratio hi, bool isSame) {
    if (isSame) hi = lo;
    RC_PRE(IsOrdered(lo, hi) && IsOrdered(value, lo) && IsOrdered(value, hi));
    M_Ratio out = {77, 77};
    for (const int answer : {-1, 0, 1234}) {
      host.answers = answer;
      const int32_t code = M_ClipRatio(&value, &lo, &hi, &out);
      host.answers = -1;
      const bool isEmpty = Order(lo, hi) > 0;
      Equal(code, (!isEmpty ? 0 : answer < 0 ? 3 : answer));
      Equal(host.Take(), (isEmpty ? Calls{"110018 8 host 3 invalid rational range"} : Calls()));
      Equal(out, (isEmpty                 ? M_Ratio{77, 77}
                  : Order(value, lo) <= 0 ? lo
                  : Order(value, hi) < 0  ? value
                                          : hi));
      out = {77, 77};
    }
    // Whatever is without a denominator.
    const char* const report = "110010 8 zero denominator comparing ratios.";
    const M_Ratio none = {1, 0};
    Equal(M_ClipRatio(&value, &none, &hi, &out), M_ERR_ZERO_DENOMINATOR);
    Equal(M_ClipRatio(&value, &lo, &none, &out), M_ERR_ZERO_DENOMINATOR);
    Check(out == (M_Ratio{77, 77}) && host.Take() == (Calls{report, report}));
    Check(M_ClipRatio(&none, &lo, &lo, &out) == M_ERR_ZERO_DENOMINATOR && out == kNone);
    Equal(host.Take(), Calls{report});
  });
}

TEST(Ratio, ClippedToASpan) {
  Holds([](std::array<M_Ratio, 4> r, Digit kind, std::array<bool, 4> isLarge) {
    for (size_t i = 0; i < 4; ++i) {
      if (!isLarge[i]) r[i] = {r[i].num % 20, r[i].den % 6 + 1};
      RC_PRE(r[i].num != INT32_MIN && r[i].den < kTwoTo31);
    }
    if (kind > 6) r[static_cast<size_t>(kind - 6)].den = 0;
    // From the plain calls, in the order in which reports come.
    const auto add = [](const M_Ratio& a, const M_Ratio& b, int16_t detail, M_Ratio* end) {
      return Mp_CalcRatio(&a, &b, false, detail, end, nullptr);
    };
    const auto order = [](const M_Ratio& a, const M_Ratio& b, int32_t* result) {
      return M_CompareRatio(&a, &b, result);
    };
    const auto clip = [&](M_Ratio* out) -> int32_t {
      int32_t sign;
      M_Ratio end;
      if (const int32_t code = order(r[0], r[1], &sign)) return code;
      *out = r[1];
      if (sign <= 0) return 0;
      if (const int32_t code = add(r[1], r[2], Mp_STR_IN_RATIO_SPAN, &end)) return code;
      if (const int32_t code = order(r[0], end, &sign)) return code;
      *out = sign < 0 ? r[0] : end;
      return 0;
    };
    M_Ratio out = {77, 77}, expected = {0, 0};
    int32_t code = clip(&expected);
    const auto withoutProducts = [] {
      Calls calls = host.Take();
      std::erase_if(calls, [](const std::string& call) { return call.starts_with("multiply"); });
      return calls;
    };
    Calls calls = withoutProducts();
    Equal(M_ClipRatioToSpan(&r[0], &r[1], &r[2], &out), code);
    Check(out == (code ? kNone : expected) && withoutProducts() == calls);

    // r[0] and r[3] are span a, r[1] and r[2] span b.
    M_Ratio start = {0, 0}, duration = {0, 0}, outStart = {77, 77}, outDuration = {77, 77};
    const auto clipSpan = [&]() -> int32_t {
      if (const int32_t error = clip(&start)) return error;
      int32_t sign;
      M_Ratio end;
      if (const int32_t error = add(r[0], r[3], Mp_STR_IN_RATIO_ADDITION, &end)) return error;
      if (const int32_t error = order(end, r[1], &sign)) return error;
      if (sign <= 0) end = r[1];
      if (sign > 0) {
        if (const int32_t error = add(r[1], r[2], Mp_STR_IN_RATIO_SPAN, &end)) return error;
      }
      return Mp_CalcRatio(&end, &start, true, Mp_STR_IN_RATIO_SUBTRACTION, &duration, nullptr);
    };
    code = clipSpan();
    calls = withoutProducts();
    Equal(M_ClipSpanToSpan(&r[0], &r[3], &r[1], &r[2], &outStart, &outDuration), code);
    Check(outStart == (code ? kNone : start) && outDuration == (code ? kNone : duration));
    Equal(withoutProducts(), calls);
  });
}

TEST(Ratio, ConvertedToAnotherDenominator) {
  Holds([](M_Ratio in, Word word, Digit kind) {
    const uint32_t newDen = kind == 9   ? in.den
                            : kind == 8 ? in.den * (word % 9)
                            : kind == 7 ? 0
                                        : word;
    if (kind == 6) in.den = 0;
    const bool isZero = newDen == 0 || in.den == 0, isSame = newDen == in.den;
    const double value = isZero ? 0 : static_cast<double>(newDen) / in.den * in.num;
    const bool isOver = !isZero && !isSame && (value > 2147483647.0 || value < -2147483648.0);
    const int32_t num = isZero || isOver ? 0 : isSame ? in.num : M_RoundDouble(value);
    const char* const error = isZero ? "zero denominator" : "overflow";
    const int32_t code = isZero ? M_ERR_ZERO_DENOMINATOR : isOver ? M_ERR_OVERFLOW : 0;
    for (const bool hasFlag : {true, false}) {
      const bool isReported = isZero || (isOver && !hasFlag);
      const auto told = [&](const char* place) {
        return isReported ? Calls{std::string(place) + error + " converting ratio denominators."}
                          : Calls();
      };
      M_Ratio out = {77, 77};
      unsigned char exact = 9, overflow = 9;
      Equal(M_ConvRatio(&in, newDen, &out, &exact, hasFlag ? &overflow : nullptr),
            (isReported ? code : 0));
      Check(out == (code ? kNone : M_Ratio{num, newDen}) && host.Take() == told("110012 8 "));
      Equal(overflow, (hasFlag ? isOver : 9));
      // As doubles see it.
      const bool isExact = isSame || newDen * 1.0 * in.num == in.den * 1.0 * out.num;
      Equal(exact, (isZero ? 9 : isExact));
      int32_t result = 77;
      overflow = 9;
      Equal(M_ShortConvRatio(in.num, in.den, newDen, &result, hasFlag ? &overflow : nullptr),
            (isReported ? code : 0));
      Check(result == num && host.Take() == told("110013 8 ") &&
            overflow == (hasFlag ? isOver : 9));
    }
    if (code == 0 && std::abs(value) < 1e6) {
      const Wide error2 = 2 * (Wide{num} * in.den - Wide{in.num} * newDen);
      Check(-Wide{in.den} <= error2 + 9 && error2 <= Wide{in.den} + 9);
    }
  });
}

// ---------------------------------------------------------------------------------------------
// Approximation: the best fraction up to 2^30 of the value in single precision
// ---------------------------------------------------------------------------------------------

TEST(RatAprx, IsTheBestThereIs) {
  Holds([](Any any, M_Ratio ratio, Digit kind) {
    const double x = kind > 3   ? ratio.num / (ratio.den * 1.0)
                     : kind > 0 ? 1 / any.value
                                : any.value;
    const auto f = static_cast<float>(x);
    const long double value = std::abs(static_cast<long double>(f));
    constexpr int64_t kMost = 1 << 30;
    M_Ratio best, out = {77, 77};
    unsigned char isOutOfRange = 9;
    Equal(Mp_Double2RatioSmart(&best, x), 0);
    Equal(M_FpLong2Ratio(&out, &isOutOfRange, x), 0);
    Equal(isOutOfRange, !(std::abs(x) < 0x1p31));
    Equal(out, (isOutOfRange ? kNone : best));
    const int64_t num = std::abs(int64_t{best.num}), den = best.den;
    Check(num <= kMost && den <= kMost && den > 0 && std::gcd(num, den) == 1);
    Check(num == 0 || (best.num < 0) == (f < 0) || std::isnan(f));
    if (!(value < 0x1p30)) {
      Check(num == kMost && den == 1);
    } else if (value <= 0x1p-31) {
      Check(num == 0 && den == 1);
    } else if (value > 0x1p-30) {
      // No other fraction whose larger part is as small is nearer: its neighbours are not.
      const bool isFlipped = value < 1;
      const long double y = isFlipped ? 1 / value : value;
      const int64_t p = isFlipped ? den : num, q = isFlipped ? num : den;
      const long double error = std::abs(p - y * q);
      // Farey neighbours by the extended Euclid: p r - q s = 1.
      int64_t a = p, b = q, s0 = 1, s1 = 0, r0 = 0, r1 = 1;
      while (b != 0) {
        const int64_t t = a / b;
        std::tie(a, b) = std::pair(b, a - t * b);
        std::tie(s0, s1) = std::pair(s1, s0 - t * s1);
        std::tie(r0, r1) = std::pair(r1, r0 - t * r1);
      }
      // p s0 + q r0 = 1: (|r0|, |s0|) and (p - |r0|, q - |s0|) are neighbours; add p and q as often
      // as fits.
      for (int64_t n : {std::abs(r0), p - std::abs(r0)}) {
        int64_t m = n == std::abs(r0) ? std::abs(s0) : q - std::abs(s0);
        const int64_t more = (kMost - n) / p;
        n += more * p, m += more * q;
        if (m == 0) continue;
        const long double neighbour = std::abs(n - y * m);
        Check(error / static_cast<long double>(q) <=
              neighbour / static_cast<long double>(m) * (1 + 1e-12L) + 1e-15L);
      }
    }
  });
  // Half way between two convergents the remainders decide; the ends of the range.
  const std::tuple<double, int32_t, uint32_t> rows[] = {{0.5, 1, 2},
                                                        {-2.5, -5, 2},
                                                        {1e10, 1 << 30, 1},
                                                        {-1e10, -(1 << 30), 1},
                                                        {kNan, 1 << 30, 1},
                                                        {1e-12, 0, 1},
                                                        {-0.0, 0, 1},
                                                        {0x1p-30, 1, 1 << 30},
                                                        {0x1.8p-30, 1, 715827883},
                                                        {0x1.8p-31, 1, 1 << 30},
                                                        {0x1.0002p-30, 1, 1073709057},
                                                        {1073741823.0, 1 << 30, 1},
                                                        {1073741760, 1073741760, 1},
                                                        {1.0 / 3, 11184811, 33554432}};
  for (const auto& [x, num, den] : rows) {
    M_Ratio out;
    Mp_Double2RatioSmart(&out, x);
    EXPECT_TRUE(out == (M_Ratio{num, den})) << x << ": " << out.num << '/' << out.den;
  }
}

}  // namespace
