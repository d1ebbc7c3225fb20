#include "Seconds.h"

#include <cmath>

namespace comp {
namespace {

// What doubles round away of a number, and more.
double Rounding(double number) { return std::abs(number) * 1e-15; }

// The difference between two numbers that are nearly the same, and not less.
double Distance(const Fraction& value, const M_Ratio& ratio) {
  if (const auto difference = Sum(value, Negative(Fraction(ratio)))) {
    return std::abs(difference->ToDouble()) * (1 + 1e-15);
  }
  const double number = value.ToDouble();
  return std::abs(number - ratio.num / static_cast<double>(ratio.den)) + Rounding(number);
}

// One whose value has 32 bits, so that what is made of two has 128.
Seconds Narrow(const Seconds& s) { return Seconds(Fraction(s.ratio), s.maxError); }

}  // namespace

Seconds::Seconds(const M_Ratio& given)
    : ratio(given), isExact(given.den != 0), maxError(0), hasValue_(isExact), error_(0) {
  if (isExact) value_ = Fraction(given);
}

Seconds::Seconds(const Fraction& value, double error)
    : ratio{0, 0}, isExact(false), maxError(0), value_(value), hasValue_(true), error_(error) {
  const auto nearest = Nearest(value);
  if (!nearest) return;
  ratio = *nearest;
  const double distance = Distance(value, ratio);
  maxError = distance + error;
  isExact = maxError == 0;
}

Seconds operator+(const Seconds& a, const Seconds& b) {
  if (!a.hasValue_ || !b.hasValue_) return kUnknown;
  if (const auto sum = Sum(a.value_, b.value_)) return Seconds(*sum, a.error_ + b.error_);
  return a.IsKnown() && b.IsKnown() ? Narrow(a) + Narrow(b) : kUnknown;
}

Seconds operator-(const Seconds& a, const Seconds& b) {
  if (!b.hasValue_) return kUnknown;
  return a + Seconds(Negative(b.value_), b.error_);
}

Seconds operator*(const Seconds& a, const Seconds& b) {
  if (!a.hasValue_ || !b.hasValue_) return kUnknown;
  if (const auto product = Product(a.value_, b.value_)) {
    const double x = std::abs(a.value_.ToDouble()), y = std::abs(b.value_.ToDouble());
    const double error = a.error_ * (y + b.error_) + b.error_ * x;
    return Seconds(*product, error + Rounding(error));
  }
  return a.IsKnown() && b.IsKnown() ? Narrow(a) * Narrow(b) : kUnknown;
}

Seconds operator/(const Seconds& a, const Seconds& b) {
  if (!b.hasValue_ || b.value_.num == 0) return kUnknown;
  const double y = std::abs(b.value_.ToDouble());
  if (!(b.error_ < y)) return kUnknown;
  const double error = b.error_ == 0 ? 0 : b.error_ / (y * (y - b.error_)) * (1 + 1e-15);
  return a * Seconds(Fraction(b.value_.den, b.value_.num), error);
}

bool operator<(const Seconds& a, const Seconds& b) {
  const Seconds difference = b - a;
  return difference.hasValue_ && difference.value_.num > 0;
}

}  // namespace comp
