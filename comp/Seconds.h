/// \file
/// Times in seconds that are exact, or say how far off they are.
#ifndef COMP_SECONDS_H
#define COMP_SECONDS_H

#include "Fraction.h"
#include "M_Utils.h"

namespace comp {

/// A time, or a span of it, in seconds, or a factor of one: exact, or a ratio near it that fits, or
/// nothing that does (0/0). What follows from it is calculated with more than it shows.
class Seconds {
 public:
  /// Exact; unknown for a den of 0.
  Seconds(const M_Ratio& given = {0, 1});  // NOLINT(google-explicit-constructor)
  explicit Seconds(const Fraction& value, double error = 0);

  bool IsKnown() const { return ratio.den != 0; }
  /// Whether it is the number that is meant, be it one that does not fit.
  bool IsCertain() const { return hasValue_ && error_ == 0; }
  /// Nearer than the ratio. Of one that is known.
  const Fraction& Value() const { return value_; }

  M_Ratio ratio;
  bool isExact;     ///< The ratio is.
  double maxError;  ///< How far from the exact one the ratio may be.

  friend Seconds operator+(const Seconds& a, const Seconds& b);
  friend Seconds operator-(const Seconds& a, const Seconds& b);
  friend Seconds operator*(const Seconds& a, const Seconds& b);
  friend Seconds operator/(const Seconds& a, const Seconds& b);
  friend bool operator<(const Seconds& a, const Seconds& b);

 private:
  Fraction value_;
  bool hasValue_;
  double error_;  // Of the value.
};

// As exact as the operands; a quotient by 0 is unknown.
Seconds operator+(const Seconds& a, const Seconds& b);
Seconds operator-(const Seconds& a, const Seconds& b);
Seconds operator*(const Seconds& a, const Seconds& b);
Seconds operator/(const Seconds& a, const Seconds& b);
/// False where one is unknown.
bool operator<(const Seconds& a, const Seconds& b);

/// One that is unknown.
inline const Seconds kUnknown(M_Ratio{0, 0});

}  // namespace comp

#endif  // COMP_SECONDS_H
