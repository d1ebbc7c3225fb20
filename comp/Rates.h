/// \file
/// Decimals of files as the ratios that they stand for.
#ifndef COMP_RATES_H
#define COMP_RATES_H

#include <optional>
#include <string_view>

#include "Fraction.h"
#include "M_Utils.h"

namespace comp {

/// The number that a decimal stands for: as it is written, with an exponent or without; or a small
/// ratio whose double it is, such as 47/55; or where `isRate` thousands over 1001
/// for 23.976, 23.98, 29.97, 59.94 and their like, rounded, cut off or held as a float. Nothing for
/// what is no number, or more than 128 bits hold.
std::optional<Fraction> ToFraction(std::string_view decimal, bool isRate);

struct Decimal {
  M_Ratio ratio;
  bool isExact;  ///< It is the number that the decimal stands for.
};

/// What std::from_chars() makes of the whole of a decimal, if it is one.
std::optional<double> ToDouble(std::string_view decimal);

/// The ratio of that number: exact wherever it fits, else the best there is. Nothing for what is no
/// number, or beyond 32 bits.
std::optional<Decimal> ToRatio(std::string_view decimal, bool isRate);

}  // namespace comp

#endif  // COMP_RATES_H
