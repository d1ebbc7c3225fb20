// Fixed point, integer utilities, rounding and ratios, as one call a line.

#include <cctype>

#include "Call.h"
#include "Mp_Bits.h"
#include "Mp_Ratio.h"
#include "Mp_Utils.h"

namespace {

template <auto kOperation>
std::string Arithmetic(Arguments& in) {
  const M_Ratio a = in.Ratio(), b = in.Ratio();
  const std::string status = in.Word();
  return Aliased({a, b}, [&](const M_Ratio* operands, M_Ratio* out) {
    auto byte = static_cast<unsigned char>(std::isdigit(status[0]) ? ToInteger(status) : 0);
    unsigned char* pointer = status == "null" ? nullptr : &byte;
    if (status == "ones") pointer = reinterpret_cast<unsigned char*>(UINTPTR_MAX);
    const int32_t code = kOperation(operands, operands + 1, out, pointer);
    return Text(*out, pointer == &byte ? ToText(byte) : status).append(Outcome(code));
  });
}

std::string ClipRatio(Arguments& in) {
  const M_Ratio value = in.Ratio(), lo = in.Ratio(), hi = in.Ratio();
  return Aliased({value, lo, hi}, [](const M_Ratio* operands, M_Ratio* out) {
    const std::string before = ToText(*out);
    const int32_t code = M_ClipRatio(operands, operands + 1, operands + 2, out);
    return Text(code != 0 && ToText(*out) == before ? "kept" : ToText(*out)).append(Outcome(code));
  });
}

std::string Convert(Arguments& in) {
  const M_Ratio ratio = in.Ratio();
  const uint32_t newDen = in.Unsigned();
  return Aliased({ratio}, [newDen](const M_Ratio* operands, M_Ratio* out) {
    M_Ratio reported = *operands;
    unsigned char exact = 9, exactOfReported = 9, overflow = 9;
    const int32_t flagged = M_ConvRatio(operands, newDen, out, &exact, &overflow);
    EXPECT_EQ(flagged, Outcome(flagged) == "" ? 0 : M_ERR_ZERO_DENOMINATOR);
    const int32_t code = M_ConvRatio(&reported, newDen, &reported, &exactOfReported, nullptr);
    EXPECT_EQ(Text(reported, exactOfReported), Text(*out, exact));
    return Text(*out, exact, overflow).append(Outcome(code));
  });
}

std::string ShortConvert(Arguments& in) {
  const M_Ratio ratio = in.Ratio();
  const uint32_t newDen = in.Unsigned();
  int32_t num = 77, unflagged = 78;
  unsigned char overflow = 9;
  const int32_t flagged = M_ShortConvRatio(ratio.num, ratio.den, newDen, &num, &overflow);
  EXPECT_EQ(flagged, Outcome(flagged) == "" ? 0 : M_ERR_ZERO_DENOMINATOR);
  const int32_t code = M_ShortConvRatio(ratio.num, ratio.den, newDen, &unflagged, nullptr);
  EXPECT_EQ(num, unflagged);
  return Text(num, overflow).append(Outcome(code));
}

std::string FromDouble(Arguments& in) {
  const double x = in.Double();
  M_Ratio best = {77, 77}, out = {77, 77};
  unsigned char isOutOfRange = 9;
  const int32_t code = Mp_Double2RatioSmart(&best, x) | M_FpLong2Ratio(&out, &isOutOfRange, x);
  EXPECT_EQ(ToText(out), isOutOfRange ? "0/0" : ToText(best));
  EXPECT_EQ(M_FpLong2Ratio(&out, nullptr, x), 0);
  return Text(best).append(isOutOfRange ? " out of range" : "").append(Outcome(code));
}

std::string LongMultiply(Arguments& in) {
  const int32_t a = in.Int();
  int32_t out[2] = {};
  host.touches = 0;
  const int32_t code = Mp_LongMul(a, in.Int(), out);
  EXPECT_EQ(host.touches, 1) << "the host multiplies";
  return Text(out[0], out[1]).append(Outcome(code));
}

constexpr CallOptions kFlagged = {.nullable = 4};

const Operation kOperations[] = {
    {"AddRatio", Arithmetic<M_AddRatio>},
    {"AddWouldOverflow", Call<M_AddWouldOverflow>},
    {"BitsUsed", Call<M_BitsUsed>},
    {"IsTopTwoBitsSame", Call<M_IsTopTwoBitsSame>},
    {"LeadingZeros", Call<M_LeadingZeros>},
    {"MulWouldOverflow", Call<M_MulWouldOverflow>},
    {"RoundDouble", Call<M_RoundDouble>},
    {"RoundDouble64", Call<M_RoundDouble64>},
    {"RoundDoubleSafe", Call<M_RoundDoubleSafe>},
    {"RoundDownToPowerOf2", Call<M_RoundDownToPowerOf2>},
    {"RoundUpToPowerOf2", Call<M_RoundUpToPowerOf2>},
    {"SignedGCD", Call<M_SignedGCD>},
    {"SignedLCM", Call<M_SignedLCM>},
    {"TrailingZeros", Call<M_TrailingZeros>},
    {"UMulWouldOverflow", Call<M_UMulWouldOverflow>},
    {"UnsignedGCD", Call<M_UnsignedGCD>},
    {"UnsignedLCM", Call<M_UnsignedLCM>},
    {"ClipRatio", ClipRatio},
    {"ClipRatioToSpan", Call<M_ClipRatioToSpan>},
    {"ClipSpanToSpan", Call<M_ClipSpanToSpan>},
    {"CompareRatio", Call<M_CompareRatio>},
    {"ConvRatio", Convert},
    {"DivRatio", Arithmetic<M_DivRatio>},
    {"Fix24Mul", Call<M_Fix24Mul>},
    {"Fix24Ratio", Call<M_Fix24Ratio>},
    {"FixDiv", Call<M_FixDiv>},
    {"FixMul", Call<M_FixMul>},
    {"FpLong2Ratio", FromDouble},
    {"LongMul", LongMultiply},
    {"Nibble",
     [](Arguments& in) {
       const int nibble = in.Int();
       return Text(Mp_G_lead_zeros[nibble], Mp_G_trail_zeros[nibble]);
     }},
    {"MaxRatio", Call<M_MaxRatio>},
    {"MinRatio", Call<M_MinRatio>},
    {"MulRatio", Arithmetic<M_MulRatio>},
    {"RecipRatio", Call<M_RecipRatio, kFlagged>},
    {"ReduceRatio", Call<M_ReduceRatio, kFlagged>},
    {"RoundToNearestMult", Call<M_RoundToNearestMult>},
    {"ShortConvRatio", ShortConvert},
    {"SubRatio", Arithmetic<M_SubRatio>},
    {"fmod", Call<M_fmod>},
};

}  // namespace
