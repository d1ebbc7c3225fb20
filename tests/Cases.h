/// \file
/// Tables of calls in cases/*.txt: "OPERATION ARGUMENTS = RESULT", one a line. An operation takes
/// its arguments from the line and gives its result, all outputs, flags and reports included, as
/// text.
#ifndef TESTS_CASES_H
#define TESTS_CASES_H

#include <cstdint>
#include <functional>
#include <sstream>
#include <string>
#include <vector>

#include "M_Utils.h"
#include "TestHost.h"

/// A number in decimal, 0x or "min" and "max" for the ends of 32 bits.
int64_t ToInteger(const std::string& text);
M_Ratio ToRatio(const std::string& text);
/// As strtod, or "min" and "max".
double ToDouble(const std::string& text);

inline std::string ToText(const std::string& text) { return text; }
inline std::string ToText(int64_t value) { return std::to_string(value); }
std::string ToText(const M_Ratio& r);

/// The parts, each behind a blank.
template <class... Parts>
std::string Text(const Parts&... parts) {
  std::string text;
  ((text.append(" ").append(ToText(parts))), ...);
  return text;
}

/// A code that is not 0, in hexadecimal as the codes are written, then all that the host was asked.
std::string Outcome(int32_t code);

/// The arguments of a line, taken one by one. Numbers may stand in a list with commas.
class Arguments {
 public:
  explicit Arguments(const std::string& line);
  bool IsEmpty() const { return next_ == words_.size(); }
  std::string Word();
  std::string Number();
  int32_t Int() { return static_cast<int32_t>(ToInteger(Number())); }
  uint32_t Unsigned() { return static_cast<uint32_t>(Int()); }
  double Double() { return ToDouble(Number()); }
  M_Ratio Ratio() { return ToRatio(Word()); }
  /// A list with commas.
  std::vector<double> Doubles();

 private:
  std::vector<std::string> words_;
  size_t next_ = 0;
};

/// Runs a call with an output of its own and with the output in each operand; all must give the
/// same.
std::string Aliased(const std::vector<M_Ratio>& operands,
                    const std::function<std::string(const M_Ratio*, M_Ratio*)>& call);

/// Makes an operation known to the tables.
struct Operation {
  Operation(const char* name, std::string (*run)(Arguments&));
};

#endif  // TESTS_CASES_H
