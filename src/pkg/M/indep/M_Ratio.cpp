#include "M_Utils.h"

#include <bit>
#include <cstring>

#include "Mp_Arith.h"
#include "Mp_Bits.h"
#include "Mp_Err.h"
#include "Mp_Out.h"
#include "Mp_Ratio.h"
#include "Mp_Round.h"
#include "Mp_Utils.h"
#include "U.h"

namespace {

constexpr M_Ratio kInvalid = {0, 0};
constexpr uint32_t kTwoTo31 = 0x80000000;

// Bits of the status byte.
constexpr unsigned char kMayHalve = 1;        // in
constexpr unsigned char kMayApproximate = 2;  // in
constexpr unsigned char kExact = 0;           // out
constexpr unsigned char kOverflow = 1;        // out
constexpr unsigned char kApproximated = 2;    // out

// The status pointer with all bits set: approximate and halve unasked.
bool IsAllOnes(const unsigned char* status) {
  return reinterpret_cast<uintptr_t>(status) == UINTPTR_MAX;
}

bool IsStatusByte(const unsigned char* status) { return status && !IsAllOnes(status); }

// Reads the caller's permission to approximate and clears the status byte.
bool TakePermission(unsigned char* status) {
  if (!status) return false;
  if (IsAllOnes(status)) return true;
  const bool mayApproximate = (*status & kMayApproximate) != 0;
  *status = kExact;
  return mayApproximate;
}

// Hands the outcome to the caller: through its status byte or, if it has none, as a report.
int32_t Finish(unsigned char outcome, int16_t place, int16_t detail, M_Ratio* out,
               unsigned char* status) {
  if (outcome == kOverflow) *out = kInvalid;
  if (status && !IsAllOnes(status)) {
    *status = outcome;
    return 0;
  }
  return outcome == kOverflow ? Mp_ReportErr(place, M_ERR_OVERFLOW, detail) : 0;
}

int32_t FailZeroDenominator(int16_t place, int16_t detail, M_Ratio* out) {
  *out = kInvalid;
  return Mp_ReportErr(place, M_ERR_ZERO_DENOMINATOR, detail);
}

int32_t Fail(int32_t code, M_Ratio* out) {
  *out = kInvalid;
  return code;
}

template <class T>
int32_t Compare(T x, T y) {
  return (x > y) - (x < y);
}

double ToDouble(const M_Ratio& r) { return r.num / static_cast<double>(r.den); }

unsigned char Approximate(double value, M_Ratio* out) {
  unsigned char isOutOfRange;
  M_FpLong2Ratio(out, &isOutOfRange, value);
  return isOutOfRange ? kOverflow : kApproximated;
}

// Divides both by their gcd, unless it is 1 or 2^31 and more. Returns whether anything changed.
bool Cancel(int32_t* num, uint32_t* den) {
  const uint32_t gcd = Mp::Gcd(Mp::Magnitude(*num), *den);
  if (gcd <= 1 || gcd >= kTwoTo31) return false;
  *num /= static_cast<int32_t>(gcd);
  *den /= gcd;
  return true;
}

bool Cancel(M_Ratio* r) { return Cancel(&r->num, &r->den); }

// Writes a ratio in one piece: who copies it at once would have to wait for two.
[[gnu::always_inline]] inline void Put(int32_t num, uint32_t den, M_Ratio* out) {
  const auto both = Mp::BitCast<uint64_t>(M_Ratio{num, den});
  std::memcpy(out, &both, sizeof both);
}

// What has 15 bits can be multiplied and its products added in 32 without asking further.
bool AreSmall(const M_Ratio& a, const M_Ratio& b) {
  constexpr uint32_t kSmall = 0x8000;
  return (Mp::Magnitude(a.num) | a.den | Mp::Magnitude(b.num) | b.den) < kSmall;
}

// a + b, or a - b, over the least common denominator, if no intermediate might leave 32 bits.
// Inlined, so that the fast way of an operation calls nothing.
[[gnu::always_inline]] inline bool TrySum(M_Ratio a, M_Ratio b, bool subtract, M_Ratio* sum) {
  const int32_t bNum = subtract ? Mp::WrapNegate(b.num) : b.num;
  if (a.num == 0) {
    Put(bNum, b.den, sum);
    return true;
  }
  if (b.num == 0) {
    *sum = a;
    return true;
  }
  if (a.den == b.den) {
    if (Mp::AddWouldOverflow(a.num, bNum)) return false;
    Put(Mp::WrapAdd(a.num, bNum), a.den, sum);
    return true;
  }
  uint32_t gcd;
  const bool areSmall = AreSmall(a, b);
  if (areSmall) {
    gcd = Mp::Gcd(a.den, b.den);
  } else {
    // The common denominator b.den / gcd x a.den is predicted to fit where the first factor has no
    // more bits than the second leaves, which asks for a gcd above this.
    const uint32_t tooSmall = b.den >> std::countl_zero(a.den);
    gcd = Mp::Gcd<true>(a.den, b.den, tooSmall);
    if (gcd <= tooSmall) return false;
  }
  const uint32_t aFactor = b.den / gcd;
  const auto aScale = static_cast<int32_t>(aFactor);
  const auto bScale = static_cast<int32_t>(a.den / gcd);
  const int32_t aTerm = Mp::WrapMul(aScale, a.num);
  const int32_t bTerm = Mp::WrapMul(bScale, bNum);
  if (!areSmall && (Mp::MulWouldOverflow(aScale, a.num) || Mp::MulWouldOverflow(bScale, bNum) ||
                    Mp::AddWouldOverflow(aTerm, bTerm))) {
    return false;
  }
  Put(Mp::WrapAdd(aTerm, bTerm), aFactor * a.den, sum);
  return true;
}

[[gnu::always_inline]] inline bool TryProduct(M_Ratio a, M_Ratio b, M_Ratio* product) {
  if (Mp::UMulWouldOverflow(a.den, b.den) || Mp::MulWouldOverflow(a.num, b.num)) return false;
  Put(Mp::WrapMul(a.num, b.num), a.den * b.den, product);
  return true;
}

// The slow ways of adding and multiplying: failures, reduction, approximation. out is written once
// the result is known, so until then the given operands stand even where out is one of them.
[[gnu::noinline]] int32_t CalcSlowly(const M_Ratio* givenA, const M_Ratio* givenB, bool subtract,
                                     int16_t detail, M_Ratio* out, unsigned char* status) {
  const bool mayApproximate = TakePermission(status);
  M_Ratio a = *givenA;
  M_Ratio b = *givenB;
  if (a.den == 0 || b.den == 0) return FailZeroDenominator(Mp_PLACE_CALC_RATIO, detail, out);
  bool hasCancelled = Cancel(&a);
  hasCancelled |= Cancel(&b);
  unsigned char outcome = kExact;
  if (!hasCancelled || !TrySum(a, b, subtract, out)) {
    outcome = kOverflow;
    if (mayApproximate) {
      const double x = ToDouble(*givenA);
      const double y = ToDouble(*givenB);
      outcome = Approximate(subtract ? x - y : x + y, out);
    }
  }
  return Finish(outcome, Mp_PLACE_CALC_RATIO, detail, out, status);
}

[[gnu::noinline]] int32_t MulSlowly(const M_Ratio* givenA, const M_Ratio* givenB, M_Ratio* out,
                                    unsigned char* status) {
  const bool mayApproximate = TakePermission(status);
  M_Ratio a = *givenA;
  M_Ratio b = *givenB;
  if (a.den == 0 || b.den == 0) {
    return FailZeroDenominator(Mp_PLACE_MUL_RATIO, Mp_STR_IN_RATIO_MULTIPLY, out);
  }
  unsigned char outcome = kExact;
  bool hasCancelled = Cancel(&a);
  hasCancelled |= Cancel(&b);
  hasCancelled |= Cancel(&b.num, &a.den);
  hasCancelled |= Cancel(&a.num, &b.den);
  if (!hasCancelled || !TryProduct(a, b, out)) {
    outcome = mayApproximate ? Approximate(ToDouble(*givenA) * ToDouble(*givenB), out) : kOverflow;
  }
  return Finish(outcome, Mp_PLACE_MUL_RATIO, Mp_STR_IN_RATIO_MULTIPLY, out, status);
}

// Not inlined, to keep the fast way of Order short.
[[gnu::noinline]] int32_t OrderSlowly(const M_Ratio& a, const M_Ratio& b, int32_t* order) {
  return M_CompareRatio(&a, &b, order);
}

// The order of a and b as M_CompareRatio has it, sign only. Where the cross products are known to
// tell the same, no common denominator is looked for.
int32_t Order(const M_Ratio& a, const M_Ratio& b, int32_t* order) {
  const auto isPlainDen = [](uint32_t den) { return den - 1 < kTwoTo31 - 1; };
  if (!isPlainDen(a.den) || !isPlainDen(b.den) || b.num == INT32_MIN) {
    return OrderSlowly(a, b, order);
  }
  *order = Compare(int64_t{a.num} * b.den, int64_t{b.num} * a.den);
  return 0;
}

int32_t AddToSpan(const M_Ratio& start, const M_Ratio& duration, int16_t detail, M_Ratio* end) {
  return Mp_CalcRatio(&start, &duration, false, detail, end, nullptr);
}

// The two results of clipping a span to a span, see M_ClipSpanToSpan.
int32_t ClipSpan(const M_Ratio& startA, const M_Ratio& durationA, const M_Ratio& startB,
                 const M_Ratio& durationB, M_Ratio* start, M_Ratio* duration) {
  int32_t order;
  M_Ratio endB = kInvalid;
  *start = startB;
  if (const int32_t code = Order(startA, startB, &order)) return code;
  if (order > 0) {
    if (const int32_t code = AddToSpan(startB, durationB, Mp_STR_IN_RATIO_SPAN, &endB)) return code;
    if (const int32_t code = Order(startA, endB, &order)) return code;
    *start = order < 0 ? startA : endB;
  }
  M_Ratio end;
  if (const int32_t code = AddToSpan(startA, durationA, Mp_STR_IN_RATIO_ADDITION, &end))
    return code;
  if (const int32_t code = Order(end, startB, &order)) return code;
  if (order <= 0) {
    end = startB;
  } else {
    // Kept on purpose: a span that reaches into b ends where b ends, even if it ended before. b's
    // end may have been formed above.
    if (endB.den == 0) {
      const int32_t code = AddToSpan(startB, durationB, Mp_STR_IN_RATIO_SPAN, &endB);
      if (code) return code;
    }
    end = endB;
  }
  return Mp_CalcRatio(&end, start, true, Mp_STR_IN_RATIO_SUBTRACTION, duration, nullptr);
}

// value over newDen, if it fits: (newDen / den) x num in that order.
bool TryConvert(int32_t num, uint32_t den, uint32_t newDen, int32_t* out) {
  const double value = static_cast<double>(newDen) / den * num;
  if (value > 2147483647.0 || value < -2147483648.0) return false;
  *out = Mp::RoundHalfUp<int32_t>(value);
  return true;
}

}  // namespace

extern "C" {

int32_t M_ReduceRatio(const M_Ratio* in, M_Ratio* out, unsigned char* reduced) {
  M_Ratio r = *in;
  const uint32_t gcd = Mp::Gcd(Mp::Magnitude(r.num), r.den);
  if (gcd != 1 && gcd < kTwoTo31) r = {r.num / static_cast<int32_t>(gcd), r.den / gcd};
  *out = r;
  Mp::Store(reduced, gcd != 1);
  return 0;
}

int32_t Mp_CalcRatio(const M_Ratio* a, const M_Ratio* b, bool subtract, int16_t detail,
                     M_Ratio* out, unsigned char* status) {
  if (a->den == 0 || b->den == 0 || !TrySum(*a, *b, subtract, out)) {
    return CalcSlowly(a, b, subtract, detail, out, status);
  }
  if (IsStatusByte(status)) *status = kExact;
  return 0;
}

int32_t M_AddRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status) {
  return Mp_CalcRatio(a, b, false, Mp_STR_IN_RATIO_ADDITION, out, status);
}

int32_t M_SubRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status) {
  return Mp_CalcRatio(a, b, true, Mp_STR_IN_RATIO_SUBTRACTION, out, status);
}

int32_t M_MulRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status) {
  if (a->den == 0 || b->den == 0 || !TryProduct(*a, *b, out)) return MulSlowly(a, b, out, status);
  if (IsStatusByte(status)) *status = kExact;
  return 0;
}

int32_t M_DivRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out, unsigned char* status) {
  M_Ratio divisor = *b;
  const bool isLarge = divisor.den >= kTwoTo31;
  if (isLarge) {
    const bool mayHalve = IsStatusByte(status) ? (*status & kMayHalve) != 0 : IsAllOnes(status);
    if (!mayHalve) {
      *out = kInvalid;
      if (!status) return Mp_ReportErr(Mp_PLACE_MUL_RATIO, M_ERR_OVERFLOW, Mp_STR_IN_RATIO_DIVIDE);
      // Kept on purpose: the bit joins what the caller passed in.
      *status |= kOverflow;
      return 0;
    }
    divisor = {divisor.num / 2, divisor.den >> 1};
  }
  // Kept on purpose: a negative divisor gives the reciprocal a denominator of 2^31 or more, which
  // the multiplication then reduces or approximates like any other.
  const auto num = static_cast<int32_t>(divisor.den);
  const M_Ratio reciprocal = {divisor.num < 0 ? Mp::WrapNegate(num) : num,
                              static_cast<uint32_t>(divisor.num)};
  const int32_t code = M_MulRatio(a, &reciprocal, out, status);
  if (isLarge && IsStatusByte(status)) *status |= kApproximated;
  return code;
}

int32_t M_RecipRatio(const M_Ratio* in, M_Ratio* out, unsigned char* exact) {
  const bool isNegative = in->num < 0;
  uint32_t num = in->den;
  uint32_t den = Mp::Magnitude(in->num);
  bool isExact = true;
  if (den == 0) {
    num = 0;
  } else if (num >= kTwoTo31) {
    const uint32_t gcd = Mp::Gcd(den, num);
    if (gcd == 1) {
      num >>= 1;
      // Arithmetic, which shows for a numerator of -2^31 only.
      den = static_cast<uint32_t>(static_cast<int32_t>(den) >> 1);
      isExact = false;
    } else if (gcd < kTwoTo31) {
      num /= gcd;
      den /= gcd;
    }
  }
  *out = {static_cast<int32_t>(isNegative ? 0 - num : num), den};
  Mp::Store(exact, isExact);
  return 0;
}

int32_t M_CompareRatio(const M_Ratio* a, const M_Ratio* b, int32_t* order) {
  M_Ratio difference;
  unsigned char status = 0;
  const int32_t code = Mp_CalcRatio(a, b, true, Mp_STR_IN_RATIO_COMPARISON, &difference, &status);
  if (status != kOverflow) {
    *order = difference.num;
    return code;
  }
  if (a->den >= kTwoTo31 || b->den >= kTwoTo31) {
    const double x = static_cast<double>(b->den) * a->num;
    const double y = static_cast<double>(a->den) * b->num;
    *order = Compare(x, y);
    return code;
  }
  int32_t x[2];
  int32_t y[2];
  Mp_LongMul(a->num, static_cast<int32_t>(b->den), x);
  Mp_LongMul(static_cast<int32_t>(a->den), b->num, y);
  *order = x[0] != y[0] ? Compare(x[0], y[0])
                        : Compare(static_cast<uint32_t>(x[1]), static_cast<uint32_t>(y[1]));
  return code;
}

int32_t M_MinRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out) {
  int32_t order;
  if (const int32_t code = Order(*a, *b, &order)) return Fail(code, out);
  *out = *(order <= 0 ? a : b);
  return 0;
}

int32_t M_MaxRatio(const M_Ratio* a, const M_Ratio* b, M_Ratio* out) {
  int32_t order;
  if (const int32_t code = Order(*a, *b, &order)) return Fail(code, out);
  *out = *(order < 0 ? b : a);
  return 0;
}

int32_t M_ConvRatio(const M_Ratio* in, uint32_t newDen, M_Ratio* out, unsigned char* exact,
                    unsigned char* overflow) {
  const M_Ratio given = *in;
  Mp::Store(overflow, 0);
  if (newDen == 0 || given.den == 0) {
    return FailZeroDenominator(Mp_PLACE_CONV_RATIO, Mp_STR_IN_RATIO_CONVERSION, out);
  }
  Mp::Store(exact, 1);
  if (given.den == newDen) {
    *out = given;
    return 0;
  }
  int32_t code = 0;
  *out = {0, newDen};
  if (!TryConvert(given.num, given.den, newDen, &out->num)) {
    *out = kInvalid;
    if (overflow) {
      *overflow = 1;
    } else {
      code = Mp_ReportErr(Mp_PLACE_CONV_RATIO, M_ERR_OVERFLOW, Mp_STR_IN_RATIO_CONVERSION);
    }
  }
  const double wanted = static_cast<double>(newDen) * given.num;
  const double reached = static_cast<double>(given.den) * out->num;
  if (wanted != reached) Mp::Store(exact, 0);
  return code;
}

int32_t M_ShortConvRatio(int32_t num, uint32_t fromDen, uint32_t toDen, int32_t* out,
                         unsigned char* overflow) {
  Mp::Store(overflow, 0);
  *out = 0;
  if (fromDen == 0 || toDen == 0) {
    return Mp_ReportErr(Mp_PLACE_SHORT_CONV_RATIO, M_ERR_ZERO_DENOMINATOR,
                        Mp_STR_IN_RATIO_CONVERSION);
  }
  if (fromDen == toDen) {
    *out = num;
    return 0;
  }
  if (TryConvert(num, fromDen, toDen, out)) return 0;
  if (!overflow) {
    return Mp_ReportErr(Mp_PLACE_SHORT_CONV_RATIO, M_ERR_OVERFLOW, Mp_STR_IN_RATIO_CONVERSION);
  }
  *overflow = 1;
  return 0;
}

int32_t M_ClipRatio(const M_Ratio* value, const M_Ratio* lo, const M_Ratio* hi, M_Ratio* out) {
  int32_t order;
  if (const int32_t code = Order(*lo, *hi, &order)) return code;
  if (order > 0) {
    return Up_ReportVarkErrString(Mp_ID_CLIP_RATIO, Mp_SEVERITY_ERROR, Mp_HOST_BAD_RANGE,
                                  Mp::Text(Mp_STR_INVALID_RANGE));
  }
  if (const int32_t code = Order(*value, *lo, &order)) return Fail(code, out);
  if (order <= 0) {
    *out = *lo;
    return 0;
  }
  if (const int32_t code = Order(*value, *hi, &order)) return Fail(code, out);
  *out = order < 0 ? *value : *hi;
  return 0;
}

int32_t M_ClipRatioToSpan(const M_Ratio* value, const M_Ratio* start, const M_Ratio* duration,
                          M_Ratio* out) {
  int32_t order;
  if (const int32_t code = Order(*value, *start, &order)) return Fail(code, out);
  if (order <= 0) {
    *out = *start;
    return 0;
  }
  M_Ratio end;
  if (const int32_t code = AddToSpan(*start, *duration, Mp_STR_IN_RATIO_SPAN, &end)) {
    return Fail(code, out);
  }
  if (const int32_t code = Order(*value, end, &order)) return Fail(code, out);
  *out = order < 0 ? *value : end;
  return 0;
}

int32_t M_ClipSpanToSpan(const M_Ratio* startA, const M_Ratio* durationA, const M_Ratio* startB,
                         const M_Ratio* durationB, M_Ratio* outStart, M_Ratio* outDuration) {
  M_Ratio start;
  M_Ratio duration;
  const int32_t code = ClipSpan(*startA, *durationA, *startB, *durationB, &start, &duration);
  *outStart = code ? kInvalid : start;
  *outDuration = code ? kInvalid : duration;
  return code;
}

}  // extern "C"
