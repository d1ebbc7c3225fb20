#include "Fraction.h"

#include <algorithm>
#include <charconv>
#include <cstdlib>
#include <numeric>
#include <utility>

namespace comp {
namespace {

constexpr int kBits = 126;

Wide Magnitude(Wide a) { return a < 0 ? -a : a; }

int BitsOf(Wide a) {
  int bits = 0;
  for (a = Magnitude(a); a != 0; a >>= 1) ++bits;
  return bits;
}

bool IsSmall(Wide a) { return a >= INT64_MIN && a <= INT64_MAX; }

Wide Gcd(Wide a, Wide b) {
  a = Magnitude(a), b = Magnitude(b);
  while (!IsSmall(a) || !IsSmall(b)) {
    if (b == 0) return a;
    a = std::exchange(b, a % b);
  }
  return std::gcd(static_cast<int64_t>(a), static_cast<int64_t>(b));
}

bool FitsProduct(Wide a, Wide b) {
  constexpr Wide kHalf = Wide{1} << 62;
  if (Magnitude(a) < kHalf && Magnitude(b) < kHalf) return true;
  return BitsOf(a) + BitsOf(b) <= kBits;
}

// Whether a/b is nearer to a magnitude than c/d is.
bool IsNearer(const Fraction& fraction, Wide a, Wide b, Wide c, Wide d) {
  if (d == 0) return true;
  const Fraction magnitude(Magnitude(fraction.num), fraction.den);
  const auto first = Sum(magnitude, Fraction(-a, b)), second = Sum(magnitude, Fraction(-c, d));
  return first && second && std::abs(first->ToDouble()) < std::abs(second->ToDouble());
}

}  // namespace

Fraction::Fraction(const M_Ratio& ratio) : Fraction(ratio.num, ratio.den) {}

Fraction::Fraction(Wide n, Wide d) : num(n), den(d) {
  const Wide gcd = Gcd(n, d) * (d < 0 ? -1 : 1);
  num /= gcd;
  den /= gcd;
}

std::optional<Fraction> Sum(const Fraction& a, const Fraction& b) {
  const Wide gcd = Gcd(a.den, b.den), left = b.den / gcd, right = a.den / gcd;
  if (!FitsProduct(a.num, left) || !FitsProduct(b.num, right) || !FitsProduct(a.den, left)) {
    return {};
  }
  return Fraction(a.num * left + b.num * right, a.den * left);
}

std::optional<Fraction> Product(const Fraction& a, const Fraction& b) {
  // Crosswise first, so that little is multiplied.
  const Fraction c(a.num, b.den), d(b.num, a.den);
  if (!FitsProduct(c.num, d.num) || !FitsProduct(c.den, d.den)) return {};
  return Fraction(c.num * d.num, c.den * d.den);
}

std::optional<Fraction> Quotient(const Fraction& a, const Fraction& b) {
  if (b.num == 0) return {};
  return Product(a, Fraction(b.den, b.num));
}

Fraction Negative(const Fraction& a) { return {-a.num, a.den}; }

std::optional<M_Ratio> Nearest(const Fraction& fraction, uint32_t most) {
  constexpr Wide kMost = INT32_MAX;
  const Wide magnitude = Magnitude(fraction.num);
  if (magnitude <= kMost && fraction.den <= most) {
    return M_Ratio{static_cast<int32_t>(fraction.num), static_cast<uint32_t>(fraction.den)};
  }
  if (magnitude / fraction.den > kMost) return {};
  // Along the convergents; the last step goes as far as there is room.
  Wide n = magnitude, d = fraction.den;
  Wide num[] = {1, 0}, den[] = {0, 1};
  while (d != 0) {
    const Wide term = n / d;
    Wide step = term;
    if (num[0] > 0) step = std::min(step, (kMost - num[1]) / num[0]);
    if (den[0] > 0) step = std::min(step, (Wide{most} - den[1]) / den[0]);
    const Wide nextNum = step * num[0] + num[1], nextDen = step * den[0] + den[1];
    // Half a step is nearer or not.
    const bool isNearer = 2 * step > term || (2 * step == term &&
                                              IsNearer(fraction, nextNum, nextDen, num[0], den[0]));
    if (step == term || isNearer) {
      num[1] = std::exchange(num[0], nextNum);
      den[1] = std::exchange(den[0], nextDen);
    }
    if (step < term) break;
    n = std::exchange(d, n % d);
  }
  return M_Ratio{static_cast<int32_t>(fraction.num < 0 ? -num[0] : num[0]),
                 static_cast<uint32_t>(den[0])};
}

std::optional<Fraction> ParseDecimal(std::string_view decimal) {
  constexpr int kMostDigits = 36;
  const bool isNegative = decimal.starts_with('-');
  if (isNegative) decimal.remove_prefix(1);
  int exponent = 0;
  const size_t e = decimal.find_first_of("eE");
  if (e != std::string_view::npos) {
    std::string_view text = decimal.substr(e + 1);
    if (text.starts_with('+')) text.remove_prefix(1);
    const auto [rest, error] = std::from_chars(text.data(), text.data() + text.size(), exponent);
    if (error != std::errc() || rest != text.data() + text.size()) return {};
    decimal = decimal.substr(0, e);
  }
  Wide num = 0, den = 1;
  int digits = 0;
  bool isBehindPoint = false;
  for (const char c : decimal) {
    if (c == '.') {
      isBehindPoint = true;
      continue;
    }
    if (c < '0' || c > '9') return {};
    digits += digits > 0 || c != '0' ? 1 : 0;
    if (digits > kMostDigits) return {};
    num = num * 10 + (c - '0');
    exponent -= isBehindPoint ? 1 : 0;
  }
  if (num == 0) return Fraction();
  if (std::abs(exponent) > kMostDigits) return {};
  for (int i = 0; i < std::abs(exponent); ++i) {
    Wide& side = exponent > 0 ? num : den;
    if (!FitsProduct(side, 10)) return {};
    side *= 10;
  }
  return Fraction(isNegative ? -num : num, den);
}

}  // namespace comp
