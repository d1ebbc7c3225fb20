#include "Wording.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <sstream>

#include "M_Ops.h"
#include "Rates.h"

namespace comp {

std::string ToText(double number) {
  char text[32];
  std::snprintf(text, sizeof text, "%.10g", std::round(number * 1000) / 1000 + 0.0);
  return text;
}

std::string ToText(std::initializer_list<double> numbers) {
  std::string text;
  for (const double number : numbers) {
    text.append(text.empty() ? "(" : ", ").append(ToText(number));
  }
  return text.append(")");
}

std::string ToText(const M_Vector3T<double>& v) { return ToText({v.x, v.y, v.z}); }

std::string ToText(const Size& size) {
  return std::to_string(size.width).append(" x ").append(std::to_string(size.height));
}

std::string RatioText(const M_Ratio& ratio) {
  return std::to_string(ratio.num).append("/").append(std::to_string(ratio.den));
}

std::string RateText(const M_Ratio& rate) {
  std::ostringstream text;
  if (rate.den == 1) {
    text << rate;
  } else {
    // As few digits as tell it.
    char decimal[32];
    for (int digits = 5; digits < 17; ++digits) {
      std::snprintf(decimal, sizeof decimal, "%.*g", digits,
                    rate.num / static_cast<double>(rate.den));
      const auto read = ToRatio(decimal, true);
      if (read && read->ratio == rate) break;
    }
    text << decimal << " (" << rate << ')';
  }
  return text.str();
}

std::string Printable(std::string name) {
  for (char& c : name) {
    if (static_cast<unsigned char>(c) < 0x20 || c == 0x7F) c = '?';
  }
  return name;
}

std::string Escaped(const std::string& name) {
  std::string escaped;
  for (const char c : Printable(name)) {
    switch (c) {
      case '&':
        escaped += "&amp;";
        break;
      case '<':
        escaped += "&lt;";
        break;
      case '>':
        escaped += "&gt;";
        break;
      default:
        escaped += c;
    }
  }
  return escaped;
}

std::string Line(const std::string& label, const std::string& text) {
  std::string line = std::string("  ").append(label);
  line.resize(std::max<size_t>(line.size() + 1, 14), ' ');
  return line.append(text).append("\n");
}

}  // namespace comp
