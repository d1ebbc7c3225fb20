/// \file
/// Numbers and lines as the tables of places show them.
#ifndef COMP_WORDING_H
#define COMP_WORDING_H

#include <initializer_list>
#include <string>
#include <vector>

#include "Composition.h"

namespace comp {

/// To a thousandth, and without a sign for what is 0 then.
std::string ToText(double number);

/// "(1, 2, 3)"
std::string ToText(std::initializer_list<double> numbers);
std::string ToText(const M_Vector3T<double>& v);

/// "1920 x 1080"
std::string ToText(const Size& size);

/// "25/1"
std::string RatioText(const M_Ratio& ratio);

/// A rate, "25" or "29.97 (30000/1001)".
std::string RateText(const M_Ratio& rate);

/// One digit of a number, which is not below it.
std::string BoundText(double bound);

/// A time in seconds with six decimals; where it is not exact, by how much it may be off.
std::string SecondsText(const M_Ratio& seconds, double maxError);

/// How many times are approximated, by how much at most, and how many do not fit.
class Doubts {
 public:
  void Add(bool isKnown, bool isExact, double maxError);
  /// A sentence about it.
  std::string Text() const;

 private:
  size_t all_ = 0, approximated_ = 0, unknown_ = 0;
  double maxError_ = 0;
};

/// The words with commas behind all but the last.
std::vector<std::string> Listed(std::vector<std::string> words);

/// Indented lines of at most 100 columns with a label.
std::string Line(const std::string& label, const std::vector<std::string>& words);

}  // namespace comp

#endif  // COMP_WORDING_H
