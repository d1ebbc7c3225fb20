// Tables, integers, fixed point and ratios.

#include "Area.h"

namespace digest {

void RunTables(Area& area) {
  area.Begin("M_PrepareFCMD");
  for (const bool reports : {false, true}) {
    for (const bool staysAway : {true, false}) {
      unsigned char isReady = 2;
      const unsigned char* mul = nullptr;
      const unsigned char* div = nullptr;
      area.Add(M_PrepareFCMD(reports, staysAway, &isReady, &mul, &div));
      area.Add(isReady);
      for (size_t i = 0; mul && i < 65536; ++i) area.Add(mul[i]), area.Add(div[i]);
      area.Add(M_UnprepareFCMD());
    }
  }
}

void RunSineTable(Area& area) {
  area.Begin("M_PrepareFTrig");
  unsigned char isReady = 2;
  const float* sines = nullptr;
  area.Add(M_PrepareFTrig(true, false, &isReady, &sines));
  area.Add(isReady);
  for (size_t i = 0; sines && i < 256; ++i) area.Add(sines[i]);
  area.Add(M_UnprepareFTrig());
}

void RunIntegers(Area& area) {
  area.Call<M_LeadingZeros>();
  area.Call<M_TrailingZeros>();
  area.Call<M_RoundUpToPowerOf2>();
  area.Call<M_RoundDownToPowerOf2>();
  area.Call<M_BitsUsed>();
  area.Call<M_IsTopTwoBitsSame>();
  area.Call<M_AddWouldOverflow>();
  area.Call<M_MulWouldOverflow>();
  area.Call<M_UMulWouldOverflow>();
  area.Call<M_SignedGCD>();
  area.Call<M_UnsignedGCD>();
  area.Call<M_SignedLCM>();
  area.Call<M_UnsignedLCM>();
  area.Call(
      "M_RoundToNearestMult", +[](int32_t x, uint32_t m) {
        return M_RoundToNearestMult(x, static_cast<int32_t>(m % 0x7FFFFFFF) + 1);
      });
  area.Call<M_RoundDouble>();
  area.Call<M_RoundDoubleSafe>();
  area.Call<M_RoundDouble64>();
  area.Call<M_fmod>();
}

void RunFixed(Area& area) {
  area.Call<M_FixMul>();
  area.Call<M_FixDiv>();
  area.Call<M_Fix24Mul>();
  area.Call<M_Fix24Ratio>();
}

void RunRatios(Area& area) {
  area.Call<M_ReduceRatio>(0b100);
  area.Call<M_AddRatio>(0b1000);
  area.Call<M_SubRatio>(0b1000);
  area.Call<M_MulRatio>(0b1000);
  area.Call<M_DivRatio>(0b1000);
  area.Call<M_RecipRatio>(0b100);
  area.Call<M_CompareRatio>();
  area.Call<M_MinRatio>();
  area.Call<M_MaxRatio>();
  area.Call<M_FpLong2Ratio>(0b10);
  area.Call<M_ConvRatio>(0b11000);
  area.Call<M_ShortConvRatio>(0b10000);
  area.Call<M_ClipRatio>();
  area.Call<M_ClipRatioToSpan>();
  area.Call<M_ClipSpanToSpan>();
}

}  // namespace digest
