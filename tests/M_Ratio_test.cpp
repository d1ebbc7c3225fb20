#include <bit>
#include <numeric>
#include <optional>

#include "Law.h"
#include "Mp_Ratio.h"
#include "Mp_Strs.h"

// Found through the type it is about, so not in a namespace.
static bool operator==(const M_Ratio& a, const M_Ratio& b) { return BitsOf(a) == BitsOf(b); }

namespace {

__extension__ typedef __int128 Wide;

constexpr M_Ratio kNone = {0, 0};
constexpr M_Ratio kUntouched = {77, 77};
constexpr uint32_t kTwoTo31 = 0x80000000;

int Bits(int64_t i) { return 64 - std::countl_zero(static_cast<uint64_t>(std::abs(i))); }
int32_t Cut(int64_t i) { return static_cast<int32_t>(i); }
double ToDouble(const M_Ratio& r) { return r.num / (r.den * 1.0); }

M_Ratio Lowest(const M_Ratio& r) {
  const int64_t gcd = r.den == 0 ? 1 : std::gcd(int64_t{r.num}, int64_t{r.den});
  return gcd > INT32_MAX ? r : M_Ratio{Cut(r.num / gcd), static_cast<uint32_t>(r.den / gcd)};
}

// The sum over the least common denominator, unless a bit length forbids it.
std::optional<M_Ratio> Sum(const M_Ratio& a, const M_Ratio& b) {
  if (a.num == 0) return b;
  if (b.num == 0) return a;
  const uint32_t gcd = std::gcd(a.den, b.den), scaleA = b.den / gcd, scaleB = a.den / gcd;
  if (a.den != b.den && (Bits(scaleA) + Bits(a.den) > 32 || Bits(scaleA) + Bits(a.num) > 31 ||
                         Bits(scaleB) + Bits(b.num) > 31)) {
    return {};
  }
  const int64_t num = int64_t{scaleA} * a.num + int64_t{scaleB} * b.num;
  if (num != Cut(num)) return {};
  return M_Ratio{Cut(num), scaleA * a.den};
}

std::optional<M_Ratio> Product(const M_Ratio& a, const M_Ratio& b) {
  if (Bits(a.num) + Bits(b.num) > 31 || Bits(a.den) + Bits(b.den) > 32) return {};
  return M_Ratio{Cut(int64_t{a.num} * b.num), a.den * b.den};
}

std::optional<M_Ratio> ReducedProduct(const M_Ratio& a, const M_Ratio& b) {
  if (const auto product = Product(a, b)) return product;
  const M_Ratio x = Lowest(a), y = Lowest(b);
  const M_Ratio z = Lowest({y.num, x.den}), w = Lowest({x.num, y.den});
  return Product({w.num, z.den}, {z.num, w.den});
}

// Bits of permissions: none where there is no byte, all in its stead, or those of a byte.
constexpr int kNoStatus = 0x100, kAllOnes = -1;
constexpr int kStatuses[] = {kNoStatus, kAllOnes, 0, 1, 2, 3, 0xFD, 0xFE};
bool IsByte(int status) { return status == (status & 0xFF); }

// The code, the result, the status byte afterwards, and the reports.
using Outcome = std::tuple<int32_t, M_Ratio, int, Calls>;
using Operation = decltype(M_AddRatio);
Outcome OutcomeOf(Operation& operation, const M_Ratio& a, const M_Ratio& b, int status) {
  M_Ratio out = kUntouched;
  auto byte = static_cast<unsigned char>(status);
  unsigned char* const allOnes = reinterpret_cast<unsigned char*>(UINTPTR_MAX);
  unsigned char* const other = status == kAllOnes ? allOnes : nullptr;
  const int32_t code = operation(&a, &b, &out, IsByte(status) ? &byte : other);
  return {code, out, IsByte(status) ? byte : -1, host.Take()};
}

// What an operation does with each kind of status, given what it should come to if that fits, and
// the value that is approximated otherwise; which is finite unless a denominator is zero.
void IsAsPermitted(Operation& operation, const M_Ratio& a, const M_Ratio& b,
                   const std::optional<M_Ratio>& exact, double value, const std::string& place,
                   const std::string& name) {
  M_Ratio nearest;
  unsigned char isOutOfRange;
  M_FpLong2Ratio(&nearest, &isOutOfRange, value);
  const bool isZero = !std::isfinite(value);
  const Calls report = {place + (isZero ? "zero denominator" : "overflow") + name};
  for (const int status : kStatuses) {
    const int outcome = isZero || exact ? 0 : status & 2 && !isOutOfRange ? 2 : 1;
    const bool isReported = isZero || (outcome == 1 && !IsByte(status));
    const M_Ratio out = isZero || outcome == 1 ? kNone : outcome == 2 ? nearest : *exact;
    Outcome expected = {0, out, IsByte(status) ? outcome : -1, {}};
    if (isReported) std::get<0>(expected) = isZero ? M_ERR_ZERO_DENOMINATOR : M_ERR_OVERFLOW;
    if (isReported) std::get<3>(expected) = report;
    Equal(OutcomeOf(operation, a, b, status), expected);
  }
}

// Operands whose denominators have much in common, or nothing, at times the same, or zero.
template <class Law>
void HoldsForPairs(const Law& law) {
  Holds([&](M_Ratio a, M_Ratio b, Word common, Digit kind) {
    if (kind < 0) {
      const uint32_t factor = common % 0x10000 + 1;
      a.den = (a.den % 0x1000 + 1) * factor;
      b.den = (b.den % 0x1000 + 1) * factor;
    }
    if (kind > 6) b.den = a.den;
    if (kind == 6) b = {a.num, a.den ^ 1};
    if (kind == 5) b = {INT32_MIN, a.den};
    if (kind == 3 || kind == 4) (kind == 3 ? a : b).den = 0;
    if (kind == 2 || kind == 1) b.den |= kTwoTo31;
    law(a, b);
  });
}

TEST(Ratio, SumsAreExactWhereTheyFit) {
  HoldsForPairs([](const M_Ratio& a, const M_Ratio& b) {
    const auto adds = [&](Operation& operation, int64_t sign, const char* name) {
      // -2^31 is its own negative, unless it has been reduced before.
      const M_Ratio low = Lowest(b);
      auto exact = Sum(a, {Cut(sign * b.num), b.den});
      if (!exact) exact = Sum(Lowest(a), {Cut(sign * low.num), low.den});
      const double value = ToDouble(a) + static_cast<int>(sign) * ToDouble(b);
      IsAsPermitted(operation, a, b, exact, value, "110010 8 ", name);
    };
    adds(M_AddRatio, 1, " in ratio addition.");
    adds(M_SubRatio, -1, " in ratio subtraction.");
  });
}

TEST(Ratio, ProductsAndQuotients) {
  HoldsForPairs([](const M_Ratio& a, const M_Ratio& b) {
    const auto multiplies = [&](Operation& operation, const M_Ratio& factor) {
      IsAsPermitted(operation, a, b, ReducedProduct(a, factor), ToDouble(a) * ToDouble(factor),
                    "110011 8 ", " in ratio multiply.");
    };
    multiplies(M_MulRatio, b);
    const int64_t den = b.den;
    const M_Ratio reciprocal = {Cut(b.num < 0 ? -den : den), static_cast<uint32_t>(b.num)};
    if (den < kTwoTo31) return multiplies(M_DivRatio, reciprocal);
    // A divisor that is too large is halved, where that is permitted.
    for (const int status : kStatuses) {
      Outcome expected = {M_ERR_OVERFLOW, kNone, -1, {"110011 8 overflow in ratio divide."}};
      if (IsByte(status)) expected = {0, kNone, status | 1, {}};
      if (status & 1) {
        expected = OutcomeOf(M_DivRatio, a, {b.num / 2, b.den / 2}, status);
        std::get<2>(expected) |= 2;
      }
      Equal(OutcomeOf(M_DivRatio, a, b, status), expected);
    }
  });
}

TEST(Ratio, ReducedAndReciprocal) {
  Holds([](M_Ratio r, Digit kind) {
    if (kind == 9) r.den = 0;
    if (kind == 8) r = {INT32_MIN, kTwoTo31};
    if (kind == 7) r = {0, r.den | kTwoTo31};
    const int64_t gcd = r.den == 0 ? 1 : std::gcd(int64_t{r.num}, int64_t{r.den});
    M_Ratio out;
    unsigned char flag = 9;
    Check(M_ReduceRatio(&r, &out, &flag) == 0 && flag == (gcd != 1) && out == Lowest(r));
    const bool isLarge = r.den >= kTwoTo31, isHalved = isLarge && gcd == 1;
    const M_Ratio x = isLarge ? Lowest(r) : r;
    const int64_t num = x.den >> isHalved, den = Cut(std::abs(int64_t{x.num})) >> isHalved;
    Check(M_RecipRatio(&r, &out, &flag) == 0 && flag == !isHalved);
    Equal(out,
          (r.num == 0 ? kNone : M_Ratio{Cut(r.num < 0 ? -num : num), static_cast<uint32_t>(den)}));
  });
}

// Products, which are made by a call of the host, are not counted.
Calls Reports() {
  Calls calls = host.Take();
  std::erase_if(calls, [](const std::string& call) { return call.starts_with("multiply"); });
  return calls;
}

// The numerator of the difference, or else by products, in double precision where a denominator is
// large.
TEST(Ratio, Comparison) {
  HoldsForPairs([](const M_Ratio& a, const M_Ratio& b) {
    M_Ratio least, most, difference;
    unsigned char status = 0;
    int32_t order = 99;
    M_SubRatio(&a, &b, &difference, &status);
    host.Take();
    const auto compare = [](auto x, auto y) { return (x > y) - (x < y); };
    int sign = compare(int64_t{b.den} * a.num, int64_t{a.den} * b.num);
    if ((a.den | b.den) >= kTwoTo31) sign = compare(b.den * 1.0 * a.num, a.den * 1.0 * b.num);
    if (status == 0) sign = difference.num;
    const bool isZero = a.den == 0 || b.den == 0;
    const int32_t code = isZero ? M_ERR_ZERO_DENOMINATOR : 0;
    Check(M_CompareRatio(&a, &b, &order) == code && order == sign);
    Check(M_MinRatio(&a, &b, &least) == code && M_MaxRatio(&a, &b, &most) == code);
    Equal(Reports(), Calls(isZero ? 3 : 0, "110010 8 zero denominator comparing ratios."));
    Equal(least, (isZero ? kNone : sign <= 0 ? a : b));
    Equal(most, (isZero ? kNone : sign < 0 ? b : a));
  });
}

// Plain calls that throw their code.
int32_t Order(const M_Ratio& a, const M_Ratio& b) {
  int32_t order;
  if (const int32_t code = M_CompareRatio(&a, &b, &order)) throw code;
  return order;
}
M_Ratio Sum(const M_Ratio& a, const M_Ratio& b, int16_t detail) {
  M_Ratio sum;
  const bool isDifference = detail == Mp_STR_IN_RATIO_SUBTRACTION;
  if (const int32_t code = Mp_CalcRatio(&a, &b, isDifference, detail, &sum, nullptr)) throw code;
  return sum;
}

// A function gives the code, the results and the reports of a model; zeros where that throws.
template <size_t count>
void IsLike(const auto& model, auto function, const auto*... operands) {
  std::array<M_Ratio, count> out, expected;
  out.fill(kUntouched);
  expected.fill(kUntouched);
  int32_t code;
  try {
    code = model(expected);
  } catch (int32_t thrown) {
    code = thrown;
    expected.fill(kNone);
  }
  const Calls reports = Reports();
  Equal(std::apply([&](auto&... each) { return function(operands..., &each...); }, out), code);
  Check(out == expected && Reports() == reports);
}

TEST(Ratio, Clipping) {
  Holds([](std::array<M_Ratio, 4> r, Digit kind, std::array<bool, 4> isLarge) {
    for (size_t i = 0; i < 4; ++i) {
      if (kind < 0 || !isLarge[i]) r[i] = {r[i].num % 20, r[i].den % 6 + 1};
    }
    if (kind > 5) r[static_cast<size_t>(kind - 6)].den = 0;
    host.answers = kind % 3 == 0 ? -1 : kind % 3 == 1 ? 0 : 1234;
    // The first to the range from the second to the third; a bad one leaves all as it is.
    const auto toRange = [&](auto& out) -> int32_t {
      int32_t order;
      if (const int32_t code = M_CompareRatio(&r[1], &r[2], &order)) return code;
      if (order > 0) return Up_ReportVarkErrString(0x110018, 8, 3, "invalid rational range");
      out[0] = Order(r[0], r[1]) <= 0 ? r[1] : Order(r[0], r[2]) < 0 ? r[0] : r[2];
      return 0;
    };
    // To the span of these two; and the span of the first and the last.
    const auto toSpan = [&](auto& out) {
      out[0] = r[1];
      if (Order(r[0], r[1]) <= 0) return 0;
      const M_Ratio end = Sum(r[1], r[2], Mp_STR_IN_RATIO_SPAN);
      out[0] = Order(r[0], end) < 0 ? r[0] : end;
      return 0;
    };
    const auto spanToSpan = [&](auto& out) {
      toSpan(out);
      M_Ratio end = Sum(r[0], r[3], Mp_STR_IN_RATIO_ADDITION);
      end = Order(end, r[1]) <= 0 ? r[1] : Sum(r[1], r[2], Mp_STR_IN_RATIO_SPAN);
      out[1] = Sum(end, out[0], Mp_STR_IN_RATIO_SUBTRACTION);
      return 0;
    };
    IsLike<1>(toRange, M_ClipRatio, &r[0], &r[1], &r[2]);
    IsLike<1>(toSpan, M_ClipRatioToSpan, &r[0], &r[1], &r[2]);
    IsLike<2>(spanToSpan, M_ClipSpanToSpan, &r[0], &r[3], &r[1], &r[2]);
  });
}

TEST(Ratio, ConvertedToAnotherDenominator) {
  Holds([](M_Ratio in, Word word, Digit kind, bool hasFlag) {
    uint32_t newDen = word;
    if (kind == 9) newDen = in.den;
    if (kind == 8) newDen = in.den * (word % 9);
    if (kind == 7) in.den = 0;
    if (kind == 6) in = {in.num < 0 ? -1 : 1, in.den % 2 + 1};  // At the ends of what fits.
    if (kind == 5 || kind == 4) {  // A half, but for what is rounded on the way.
      newDen = 1;
      const uint32_t n = word % 997 + 1;
      in = {(in.num % 1000 | 1) * Cut(n), 2 * n};
    }
    const bool isZero = newDen == 0 || in.den == 0;
    const double value = newDen == in.den ? in.num : newDen * 1.0 / in.den * in.num;
    const bool isOver = !isZero && (value > 2147483647.0 || value < -2147483648.0);
    const M_Ratio expected = isZero || isOver ? kNone : M_Ratio{M_RoundDouble(value), newDen};
    int32_t code = 0, num = 77;
    if (isOver && !hasFlag) code = M_ERR_OVERFLOW;
    if (isZero) code = M_ERR_ZERO_DENOMINATOR;
    M_Ratio out = kUntouched;
    unsigned char exact = 9, isOver1 = 9, isOver2 = 9;
    Equal(M_ConvRatio(&in, newDen, &out, &exact, hasFlag ? &isOver1 : nullptr), code);
    Equal(M_ShortConvRatio(in.num, in.den, newDen, &num, hasFlag ? &isOver2 : nullptr), code);
    const std::string what = isZero ? " 8 zero denominator" : " 8 overflow";
    const std::string report = what + " converting ratio denominators.";
    Equal(host.Take(), (code ? Calls{"110012" + report, "110013" + report} : Calls()));
    Check(out == expected && num == expected.num);
    Check(isOver1 == (hasFlag ? isOver : 9) && isOver2 == isOver1);
    // As doubles see it.
    Equal(exact, (isZero ? 9 : newDen * 1.0 * in.num == in.den * 1.0 * out.num));
  });
}

// The best fraction of p / q, which is 1 or more, up to 2^30: one of two that enclose it. Each is
// brought nearer by adding the other as often as p / q is not passed, in turns.
M_Ratio BestOf(int64_t p, int64_t q) {
  int64_t num[] = {0, 1}, den[] = {1, 0}, distance[] = {p, q};
  size_t side = 0;
  for (int idle = 0; idle < 2 && distance[0] != 0 && distance[1] != 0; side = 1 - side) {
    const size_t other = 1 - side;
    const int64_t n =
        std::min(distance[side] / distance[other], ((1 << 30) - num[side]) / num[other]);
    num[side] += n * num[other];
    den[side] += n * den[other];
    distance[side] -= n * distance[other];
    idle = n == 0 ? idle + 1 : 0;
  }
  const size_t best = Wide{distance[0]} * den[1] > Wide{distance[1]} * den[0];
  return {Cut(num[best]), static_cast<uint32_t>(den[best])};
}

TEST(RatAprx, IsTheBestThereIsOfTheSinglePrecisionValue) {
  Holds([](Any any, M_Ratio ratio, Digit kind) {
    const double x = kind > 3 ? ToDouble(ratio) : kind > 0 ? 1 / any.value : any.value;
    const double size = std::min(0x1p31, std::abs(static_cast<double>(static_cast<float>(x))));
    M_Ratio expected = {0, 1}, out;
    if (size >= 1) {
      expected = BestOf(std::llround(size * 0x1p23), 1 << 23);
    } else if (size > 0x1p-31) {
      const M_Ratio y = BestOf(1LL << 54, std::llround(size * 0x1p54));
      expected = {Cut(y.den), static_cast<uint32_t>(y.num)};
    }
    if (x < 0) expected.num = -expected.num;
    Equal(Mp_Double2RatioSmart(&out, x), 0);
    Equal(out, expected);
    unsigned char isOutOfRange = 9;
    Equal(M_FpLong2Ratio(&out, &isOutOfRange, x), 0);
    Equal(isOutOfRange, !(std::abs(x) < 0x1p31));
    Equal(out, (isOutOfRange ? kNone : expected));
  });
}

}  // namespace
