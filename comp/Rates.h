/// \file
/// Decimals of files as the ratios that they stand for.
#ifndef COMP_RATES_H
#define COMP_RATES_H

#include <optional>
#include <string_view>

#include "M_Utils.h"

namespace comp {

struct Decimal {
  M_Ratio ratio;
  bool isExact;      ///< It is the decimal, or the broadcast rate that it stands for.
  double error = 0;  ///< How far it is from the decimal, else.
};

/// What std::from_chars() makes of the whole of a decimal, if it is one.
std::optional<double> ToDouble(std::string_view decimal);

/// The ratio of a decimal as it is written, with an exponent or without. Where `isRate`, 23.976,
/// 23.98, 29.97, 59.94 and their like are thousands over 1001. Exact wherever it fits, else the
/// best there is; nothing for what is no number, or beyond 32 bits.
std::optional<Decimal> ToRatio(std::string_view decimal, bool isRate);

}  // namespace comp

#endif  // COMP_RATES_H
