#include "Wording.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>

#include "Language.h"
#include "M_Ops.h"
#include "Rates.h"
#include "Text.h"

namespace comp {

std::string ToText(double number) {
  char text[32];
  // Beyond that there are no thousandths.
  const bool isLarge = !(std::abs(number) < 1e12);
  std::snprintf(text, sizeof text, "%.10g",
                isLarge ? number : std::round(number * 1000) / 1000 + 0.0);
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
  if (rate.den == 1) return std::to_string(rate.num);
  // As few digits as tell it.
  char decimal[32];
  for (int digits = 5; digits < 17; ++digits) {
    std::snprintf(decimal, sizeof decimal, "%.*g", digits,
                  rate.num / static_cast<double>(rate.den));
    const auto read = ToRatio(decimal, true);
    if (read && read->ratio == rate) break;
  }
  return std::string(decimal).append(" (").append(RatioText(rate)).append(")");
}

std::string BoundText(double bound) {
  char text[32];
  std::snprintf(text, sizeof text, "%.1g", bound);
  // Rounded down it would be none.
  if (std::strtod(text, nullptr) < bound) {
    const double unit = std::pow(10, std::floor(std::log10(bound)));
    std::snprintf(text, sizeof text, "%.1g", (std::floor(bound / unit) + 1) * unit);
  }
  return text;
}

std::string SecondsText(const M_Ratio& seconds, double maxError) {
  char text[80];
  const double value = seconds.num / static_cast<double>(seconds.den);
  if (maxError == 0) {
    std::snprintf(text, sizeof text, "%.6f", value);
    return text;
  }
  std::snprintf(text, sizeof text, "~%.*f ±", maxError < 1e-3 ? 6 : 3, value);
  return text + BoundText(maxError);
}

void Doubts::Add(bool isKnown, bool isExact, double maxError) {
  ++all_;
  unknown_ += isKnown ? 0 : 1;
  approximated_ += isKnown && !isExact ? 1 : 0;
  maxError_ = std::max(maxError_, maxError);
}

std::string Doubts::Text() const {
  if (approximated_ + unknown_ == 0) return Tr("All times are exact.");
  const std::string most = BoundText(maxError_);
  const std::string all = std::to_string(all_);
  std::string text;
  if (approximated_ > 0) {
    text = Tr("Not exact: {0} of {1} times, which are off by {2} s at most.",
              {std::to_string(approximated_), all, most});
  }
  if (unknown_ == 0) return text;
  return text.append(text.empty() ? "" : " ")
      .append(Tr("Beyond 32 bits: {0} of {1} times.", {std::to_string(unknown_), all}));
}

std::vector<std::string> Listed(std::vector<std::string> words) {
  for (std::string& word : words) {
    if (&word != &words.back()) word += ',';
  }
  return words;
}

std::string Line(const std::string& label, const std::vector<std::string>& words) {
  constexpr size_t kMargin = 16, kWidth = 100;
  std::string text, line = PadRight("  " + label, kMargin - 1);
  for (const std::string& word : words) {
    if (Columns(line) + 1 + Columns(word) > kWidth) {
      text.append(line).append("\n");
      line.assign(kMargin - 1, ' ');
    }
    line.append(" ").append(word);
  }
  return text.append(line).append("\n");
}

}  // namespace comp
