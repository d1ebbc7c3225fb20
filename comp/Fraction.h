/// \file
/// Fractions of 128 bits, for what lies between a file's numbers and ratios of 32 bits.
#ifndef COMP_FRACTION_H
#define COMP_FRACTION_H

#include <cstdint>
#include <optional>
#include <string_view>

#include "M_Utils.h"

namespace comp {

__extension__ using Wide = __int128;

/// In lowest terms; the den is above 0.
struct Fraction {
  Wide num = 0;
  Wide den = 1;

  Fraction() = default;
  explicit Fraction(const M_Ratio& ratio);
  /// Reduces. The den is not 0.
  Fraction(Wide n, Wide d);

  double ToDouble() const { return static_cast<double>(num) / static_cast<double>(den); }
  /// The greatest whole number that is not above it.
  Wide Floor() const { return num / den - (num % den < 0 ? 1 : 0); }
};

// Nothing where 128 bits may be too few.
std::optional<Fraction> Sum(const Fraction& a, const Fraction& b);
std::optional<Fraction> Product(const Fraction& a, const Fraction& b);
/// Nothing for a divisor of 0, too.
std::optional<Fraction> Quotient(const Fraction& a, const Fraction& b);
Fraction Negative(const Fraction& a);

/// The ratio with a den of at most `most` that is nearest; the fraction itself where that fits.
/// Nothing beyond 32 bits.
std::optional<M_Ratio> Nearest(const Fraction& fraction, uint32_t most = UINT32_MAX);

/// A decimal as it is written, with an exponent or without. Nothing for what 128 bits do not hold.
std::optional<Fraction> ParseDecimal(std::string_view decimal);

}  // namespace comp

#endif  // COMP_FRACTION_H
