#include "M_Utils.h"

#include <cmath>

#include "Mp_Arith.h"
#include "Mp_Bits.h"
#include "Mp_Round.h"
#include "Mp_Utils.h"
#include "U.h"

extern "C" {

const unsigned char Mp_G_lead_zeros[16] = {4, 3, 2, 2, 1, 1, 1, 1, 0, 0, 0, 0, 0, 0, 0, 0};
const unsigned char Mp_G_trail_zeros[16] = {4, 0, 1, 0, 2, 0, 1, 0, 3, 0, 1, 0, 2, 0, 1, 0};

int16_t M_LeadingZeros(uint32_t x) { return static_cast<int16_t>(Mp::LeadingZeros(x)); }
int16_t M_TrailingZeros(uint32_t x) { return static_cast<int16_t>(Mp::TrailingZeros(x)); }

uint32_t M_RoundDownToPowerOf2(uint32_t x) {
  return x == 0 ? 0 : 0x80000000 >> Mp::LeadingZeros(x);
}

uint32_t M_RoundUpToPowerOf2(uint32_t x) {
  const uint32_t down = M_RoundDownToPowerOf2(x);
  // Above 0x80000000 the doubling wraps to 0, as it should.
  return down == x ? down : down << 1;
}

int16_t M_BitsUsed(int32_t x) {
  return static_cast<int16_t>(x <= 0 ? 0 : 32 - Mp::LeadingZeros(static_cast<uint32_t>(x)));
}

bool M_IsTopTwoBitsSame(uint32_t x) { return ((x ^ (x << 1)) & 0x80000000) == 0; }

bool M_AddWouldOverflow(int32_t a, int32_t b) { return Mp::AddWouldOverflow(a, b); }
bool M_MulWouldOverflow(int32_t a, int32_t b) { return Mp::MulWouldOverflow(a, b); }
bool M_UMulWouldOverflow(uint32_t a, uint32_t b) { return Mp::UMulWouldOverflow(a, b); }

int32_t M_SignedGCD(int32_t a, int32_t b, int32_t* out) {
  *out = static_cast<int32_t>(Mp::Gcd(Mp::Magnitude(a), Mp::Magnitude(b)));
  return 0;
}

int32_t M_UnsignedGCD(uint32_t a, uint32_t b, uint32_t* out) {
  *out = Mp::Gcd(a, b);
  return 0;
}

int32_t M_SignedLCM(int32_t a, int32_t b, int32_t* out) {
  // A gcd of 2^31 reads as -2^31 here, but then the wrapped product is 0; the gcd is never -1.
  const auto gcd = static_cast<int32_t>(Mp::Gcd(Mp::Magnitude(a), Mp::Magnitude(b)));
  *out = Mp::WrapMul(a, b) / gcd;
  return 0;
}

int32_t M_UnsignedLCM(uint32_t a, uint32_t b, uint32_t* out) {
  *out = a * b / Mp::Gcd(a, b);
  return 0;
}

int32_t M_RoundToNearestMult(int32_t x, int32_t m) {
  const int32_t half = m / 2;
  if (x >= 0) {
    const int32_t sum = Mp::WrapAdd(x, half);
    return Mp::WrapSub(sum, sum % m);
  }
  const int32_t sum = Mp::WrapSub(half, x);
  return Mp::WrapSub(sum % m, sum);
}

int32_t M_RoundDouble(double d) { return Mp::RoundHalfUp<int32_t>(d); }

int32_t M_RoundDoubleSafe(double d) {
  if (d > 2147483646.5) return INT32_MAX;
  // Below the other end 0x80000000 comes by itself: it stands for all that does not fit.
  return Mp::RoundHalfUp<int32_t>(d);
}

int64_t M_RoundDouble64(double d) { return Mp::RoundHalfUp<int64_t>(d); }

double M_fmod(double x, double y) { return std::fmod(x, y); }

int32_t Mp_LongMul(int32_t a, int32_t b, int32_t out[2]) {
  const int64_t product = WideMultiply(a, b);
  out[0] = static_cast<int32_t>(product >> 32);
  out[1] = static_cast<int32_t>(product);
  return 0;
}

}  // extern "C"
