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

// 23.976 and its like: n thousands over 1001, as far as it is written, rounded or cut off.
std::optional<Fraction> ToBroadcastRate(std::string_view decimal, double value) {
  const int32_t nominal = M_RoundDouble(value * 1.001);
  const size_t point = decimal.find('.');
  const size_t digits = point == std::string_view::npos ? 0 : decimal.size() - point - 1;
  // Two digits are enough only where everybody writes two.
  const bool isUsual = nominal % 6 == 0 && digits == 2;
  const bool isNominal = nominal > 0 && nominal <= 960 && (nominal % 6 == 0 || nominal == 15);
  if (!isNominal || !(digits > 2 || isUsual)) return {};
  const double rate = nominal * 1000 / 1001.0;
  const double unit = std::max(std::pow(10, -static_cast<double>(digits)), 1e-9);
  const double off = (value - rate) / unit;
  const bool isCutOff = digits > 2 && off > -1 && off <= 0;
  bool isFloat = false;
  for (const double number : {rate, std::round(rate * 1000) / 1000, std::round(rate * 100) / 100}) {
    isFloat |= static_cast<double>(static_cast<float>(number)) == value;
  }
  if (!isCutOff && !isFloat && !(std::abs(off) <= 0.51)) return {};
  return Fraction(Wide{nominal} * 1000, 1001);
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

std::optional<Fraction> ToFraction(std::string_view decimal, bool isRate) {
  const auto value = ToDouble(decimal);
  if (!value || !std::isfinite(*value)) return {};
  if (isRate) {
    if (const auto rate = ToBroadcastRate(decimal, *value)) return rate;
  }
  // What has been a double shows by its many digits.
  constexpr size_t kFew = 14;
  if (decimal.size() > kFew) {
    if (const auto small = ToSmallRatio(*value)) return Fraction(*small);
  }
  return ParseDecimal(decimal);
}

std::optional<Decimal> ToRatio(std::string_view decimal, bool isRate) {
  const auto number = ToFraction(decimal, isRate);
  const auto ratio = number ? Nearest(*number) : std::nullopt;
  if (!ratio) return {};
  const Fraction read(*ratio);
  return Decimal{*ratio, read.num == number->num && read.den == number->den};
}

}  // namespace comp
