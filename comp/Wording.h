/// \file
/// Numbers and lines as the tables of places show them.
#ifndef COMP_WORDING_H
#define COMP_WORDING_H

#include <initializer_list>
#include <string>

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

/// A name from a file with nothing in it that moves a cursor, or that XML does not allow.
std::string Printable(std::string name);

/// The same with what has a meaning in XML written out.
std::string Escaped(const std::string& name);

/// An indented line with a label.
std::string Line(const std::string& label, const std::string& text);

}  // namespace comp

#endif  // COMP_WORDING_H
