#include "Rates.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstdlib>
#include <string>
#include <utility>

#include "M_Ops.h"

namespace comp {
namespace {

// 23.976 and its like: as many digits as are written agree with n x 1000/1001.
std::optional<M_Ratio> ToBroadcastRate(std::string_view decimal, double value) {
  const int32_t nominal = M_RoundDouble(value * 1.001);
  if (nominal % 6 != 0 || nominal <= 0 || nominal > 960) return {};
  const M_Ratio rate = {nominal * 1000, 1001};
  const size_t point = decimal.find('.');
  const size_t digits = point == std::string_view::npos ? 0 : decimal.size() - point - 1;
  // Half a unit of the last digit, and some more: 23.98 is off by 0.004, 23.976 by 0.00002.
  const double most =
      digits < 2 ? 0 : std::max(0.6 * std::pow(10, -static_cast<double>(digits)), 1e-9);
  if (std::abs(rate.num / 1001.0 - value) > most) return {};
  return rate;
}

// Without its exponent, for one that is small.
std::string Plain(std::string_view decimal) {
  const size_t e = decimal.find_first_of("eE");
  if (e == std::string_view::npos) return std::string(decimal);
  int exponent = 0;
  const char* const from =
      decimal.data() + e + 1 + (decimal.substr(e + 1).starts_with('+') ? 1 : 0);
  std::from_chars(from, decimal.data() + decimal.size(), exponent);
  std::string digits(decimal.substr(0, e));
  if (std::abs(exponent) > 18) return {};
  size_t point = digits.find('.');
  if (point == std::string::npos)
    point = digits.size();
  else
    digits.erase(point, 1);
  const size_t sign = digits.starts_with('-') ? 1 : 0;
  auto place = static_cast<std::ptrdiff_t>(point) + exponent;
  while (place <= static_cast<std::ptrdiff_t>(sign)) digits.insert(sign, 1, '0'), ++place;
  while (place > static_cast<std::ptrdiff_t>(digits.size())) digits.push_back('0');
  if (place < static_cast<std::ptrdiff_t>(digits.size()))
    digits.insert(static_cast<size_t>(place), 1, '.');
  return digits;
}

// The small ratio whose double this is, such as 47/55: ratios so small lie so far apart that no
// other double is one by chance.
std::optional<M_Ratio> ToSmallRatio(double value) {
  double x = std::abs(value);
  int64_t num[] = {1, 0}, den[] = {0, 1};
  while (true) {
    const double whole = std::floor(x);
    constexpr int64_t kMost = 1 << 20;
    if (!(whole < static_cast<double>(kMost))) return {};
    const auto term = static_cast<int64_t>(whole);
    num[1] = std::exchange(num[0], term * num[0] + num[1]);
    den[1] = std::exchange(den[0], term * den[0] + den[1]);
    if (num[0] > kMost || den[0] > kMost) return {};
    const double ratio = static_cast<double>(num[0]) / static_cast<double>(den[0]);
    if (ratio == std::abs(value)) {
      return M_Ratio{static_cast<int32_t>(value < 0 ? -num[0] : num[0]),
                     static_cast<uint32_t>(den[0])};
    }
    x = 1 / (x - whole);
  }
}

}  // namespace

std::optional<double> ToDouble(std::string_view decimal) {
#ifdef __cpp_lib_to_chars
  double value;
  const char* const end = decimal.data() + decimal.size();
  const auto [rest, error] = std::from_chars(decimal.data(), end, value);
  if (error != std::errc() || rest != end) return {};
  return value;
#else
  // A standard library that has no such function for doubles yet.
  if (decimal.starts_with('+') || decimal.find_first_not_of("0123456789+-.eE") != decimal.npos)
    return {};
  const std::string text(decimal);
  char* rest;
  errno = 0;
  const double value = std::strtod(text.c_str(), &rest);
  const bool isOutOfRange = errno == ERANGE && (value == 0 || std::isinf(value));
  if (rest == text.c_str() || *rest != 0 || isOutOfRange) return {};
  return value;
#endif
}

std::optional<Decimal> ToRatio(std::string_view decimal, bool isRate) {
  const auto read = ToDouble(decimal);
  if (!read || !std::isfinite(*read)) return {};
  const double value = *read;
  if (isRate) {
    if (const auto rate = ToBroadcastRate(decimal, value)) return Decimal{*rate, true};
  }
  if (const auto exact = M_ParseRatio(Plain(decimal))) return Decimal{*exact, true};
  if (const auto small = ToSmallRatio(value)) return Decimal{*small, true};
  M_Ratio nearest;
  unsigned char isOutOfRange;
  M_FpLong2Ratio(&nearest, &isOutOfRange, value);
  if (isOutOfRange) return {};
  return Decimal{nearest, false, std::abs(value - nearest.num / static_cast<double>(nearest.den))};
}

}  // namespace comp
