#include "Cases.h"

#include <cstdlib>
#include <cstring>
#include <fstream>
#include <map>

namespace {

std::map<std::string, std::string (*)(Arguments&)>& Operations() {
  static std::map<std::string, std::string (*)(Arguments&)> operations;
  return operations;
}

// An expected result with its numbers written as results are. Words stay as they are, and so do
// identifiers and codes, which have no 0x.
std::string Normal(const std::string& expected) {
  std::istringstream words(expected);
  std::string normal, word;
  while (words >> word) {
    const std::string number = word.substr(word[0] == '-');
    const bool isRatio = number.find_first_not_of("-0123456789ABCDEFmaxin/") == std::string::npos &&
                         number.find('/') != std::string::npos &&
                         std::strchr("0123456789m", number[0]);
    const bool isInteger = number == "min" || number == "max" || number.rfind("0x", 0) == 0;
    normal += ' ' + (isRatio ? ToText(ToRatio(word)) : isInteger ? ToText(ToInteger(word)) : word);
  }
  return normal;
}

class CasesTest : public HostTest, public ::testing::WithParamInterface<const char*> {};
INSTANTIATE_TEST_SUITE_P(, CasesTest,
                         ::testing::Values("approximation", "bits", "clip", "fixed", "life",
                                           "lines", "matrix3", "matrix4", "members", "points",
                                           "polygons", "quads", "ratio", "rectangles", "report",
                                           "rotations", "rounding", "tables", "transforms"),
                         [](const auto& file) { return std::string(file.param); });

TEST_P(CasesTest, GiveTheirResults) {
  std::ifstream file(std::string(TESTS_FOLDER "/cases/").append(GetParam()).append(".txt"));
  std::string line;
  int cases = 0;
  for (int number = 1; std::getline(file, line); ++number) {
    SCOPED_TRACE(std::string(GetParam())
                     .append(".txt:")
                     .append(std::to_string(number))
                     .append(": ")
                     .append(line));
    line = line.substr(0, line.find('#'));
    const size_t equals = line.find('=');
    if (equals == std::string::npos) continue;
    Arguments arguments(line.substr(0, equals));
    const auto operation = Operations().find(arguments.Word());
    ASSERT_NE(operation, Operations().end());
    EXPECT_EQ(operation->second(arguments), Normal(line.substr(equals + 1)));
    ++cases;
  }
  EXPECT_GT(cases, 10) << "the table could not be read";
}

}  // namespace

int64_t ToInteger(const std::string& text) {
  if (text[0] == '-') return -ToInteger(text.substr(1));
  if (text == "min") return INT32_MIN;
  if (text == "max") return INT32_MAX;
  return static_cast<int64_t>(std::stoull(text, nullptr, 0));
}

M_Ratio ToRatio(const std::string& text) {
  const size_t slash = text.find('/');
  return {static_cast<int32_t>(ToInteger(text.substr(0, slash))),
          static_cast<uint32_t>(ToInteger(text.substr(slash + 1)))};
}

std::string ToText(const M_Ratio& r) { return ToText(r.num).append("/").append(ToText(r.den)); }

std::string Outcome(int32_t code) {
  std::ostringstream text;
  if (code != 0) text << ' ' << std::hex << code;
  const char* separator = " ";
  for (const std::string& call : host.Take()) {
    text << separator << call;
    separator = " | ";
  }
  return text.str();
}

double ToDouble(const std::string& text) {
  const bool isLimit = text == "min" || text == "max";
  return isLimit ? static_cast<double>(ToInteger(text)) : std::strtod(text.c_str(), nullptr);
}

Arguments::Arguments(const std::string& line) {
  std::istringstream words(line);
  for (std::string word; words >> word;) words_.push_back(word);
}

std::string Arguments::Word() {
  EXPECT_FALSE(IsEmpty()) << "an argument is missing";
  return IsEmpty() ? "0" : words_[next_++];
}

std::string Arguments::Number() {
  const std::string word = Word();
  const size_t comma = word.find(',');
  if (comma == std::string::npos) return word;
  words_[--next_] = word.substr(comma + 1);
  return word.substr(0, comma);
}

std::vector<double> Arguments::Doubles() {
  std::istringstream list(Word());
  std::vector<double> all;
  for (std::string element; std::getline(list, element, ',');) all.push_back(ToDouble(element));
  return all;
}

std::string Aliased(const std::vector<M_Ratio>& operands,
                    const std::function<std::string(const M_Ratio*, M_Ratio*)>& call) {
  std::string first;
  for (size_t alias = 0; alias <= operands.size(); ++alias) {
    std::vector<M_Ratio> copies = operands;
    copies.push_back({77, 77});
    const std::string result = call(copies.data(), &copies[operands.size() - alias]);
    if (alias == 0) first = result;
    EXPECT_EQ(result, first) << "with the output in operand " << operands.size() - alias;
  }
  return first;
}

Operation::Operation(const char* name, std::string (*run)(Arguments&)) { Operations()[name] = run; }
