// Fixed point and integers against wide arithmetic.

#include <algorithm>
#include <bit>
#include <numeric>

#include "Input.h"

void Run(Input& input) {
  const auto a = input.Any<int32_t>(), b = input.Any<int32_t>();
  const auto u = static_cast<uint32_t>(a), v = static_cast<uint32_t>(b);
  const int64_t product = int64_t{a} * b;
  M_FixMul(a, b);
  if (b != 0 && std::abs(int64_t{a}) < 1 << 14) {
    Require(M_FixDiv(a, b) == (int64_t{a} << 16) / b);
  }
  if (product >> 16 == static_cast<int32_t>(product >> 16) && (a & 0x1FFFF) == 0) {
    Require(M_FixMul(a, b) == product >> 16);
  }
  const M_Fix24 fraction = M_Fix24Mul(a, b);
  if (std::abs(product) < int64_t{0x7FFFFFFF} << 24) {
    // Half a unit, and what double precision loses of the product.
    Require(std::abs(int64_t{fraction} * (1 << 24) - product) <= (1 << 23) + 4);
  }
  if (b != 0 && std::abs(a / static_cast<double>(b)) < 127) {
    Require(std::abs(M_Fix24Ratio(a, b) / 16777216.0 - a / static_cast<double>(b)) <= 0x1.1p-25);
  }
  const int64_t sum = int64_t{a} + b;
  Require(M_AddWouldOverflow(a, b) == (sum != static_cast<int32_t>(sum)));
  Require(M_MulWouldOverflow(a, b) || product == static_cast<int32_t>(product));
  Require(M_UMulWouldOverflow(u, v) || uint64_t{u} * v <= UINT32_MAX);
  Require(M_LeadingZeros(u) == std::countl_zero(u) && M_TrailingZeros(u) == std::countr_zero(u));
  uint32_t gcd, lcm;
  Require(M_UnsignedGCD(u, v, &gcd) == 0);
  if (v != 0) Require(u % gcd == 0 && v % gcd == 0 && std::gcd(u / gcd, v / gcd) == 1);
  if (v != 0) Require(M_UnsignedLCM(u, v, &lcm) == 0 && lcm == u * v / gcd);
  int32_t divisor, multiple;
  M_SignedGCD(a, b, &divisor);
  M_SignedLCM(a, b, &multiple);
  if (b != 0 && a != INT32_MIN && b != INT32_MIN) {
    Require(divisor == std::gcd(a, b) && multiple == static_cast<int32_t>(u * v) / divisor);
  }
  const double d = input.Any<double>();
  if (std::abs(d) < 1e9) Require(std::abs(M_RoundDouble(d) - d) <= 0.5 + 1e-7);
  if (!std::isnan(d)) {
    const double held = std::max(-2147483648.0, std::min(d, 2147483647.0));
    Require(std::abs(M_RoundDoubleSafe(d) - held) <= 0.5 + 1e-6);
  }
  if (std::abs(d) < 1e15) Require(std::abs(static_cast<double>(M_RoundDouble64(d)) - d) <= 0.75);
  if (b > 0) Require(std::abs(int64_t{a}) > 1 << 30 || M_RoundToNearestMult(a, b) % b == 0);
}
