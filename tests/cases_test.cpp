// Runs the tables in cases/: one call a line, with its result as text.

#include <cstdlib>
#include <fstream>
#include <functional>
#include <map>
#include <sstream>

#include "M_Utils.h"
#include "Mp_Err.h"
#include "Mp_Ratio.h"
#include "Mp_Utils.h"
#include "TestHost.h"

namespace {

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

std::string ToText(const std::string& text) { return text; }
std::string ToText(int64_t value) { return std::to_string(value); }
std::string ToText(const M_Ratio& r) { return ToText(r.num) + '/' + ToText(r.den); }

template <class... Parts>
std::string Text(const Parts&... parts) {
  std::string text;
  ((text += ' ' + ToText(parts)), ...);
  return text;
}

// The arguments of a line, taken one by one.
class Arguments {
 public:
  explicit Arguments(const std::string& line) : words_(line) {}
  std::string Word() {
    std::string word;
    words_ >> word;
    EXPECT_NE(word, "") << "an argument is missing";
    return word.empty() ? "0" : word;
  }
  int32_t Int() { return static_cast<int32_t>(ToInteger(Word())); }
  double Double() { return std::strtod(Word().c_str(), nullptr); }
  M_Ratio Ratio() { return ToRatio(Word()); }

 private:
  std::istringstream words_;
};

// A code that is not 0, in hexadecimal as the codes are written, and what was reported.
std::string Outcome(int32_t code) {
  char text[16] = "";
  if (code != 0) std::snprintf(text, sizeof text, " %x", static_cast<unsigned>(code));
  std::string outcome = text;
  for (const std::string& call : host.Take()) outcome += ' ' + call;
  return outcome;
}

// Runs a call with an output of its own and with the output in each operand: all must give the
// same.
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

template <auto kOperation>
std::string Integers(Arguments& in) {
  const int32_t a = in.Int();
  const int32_t result = kOperation(a, in.Int());
  return Text(result) + Outcome(0);
}

template <auto kOperation>
std::string Arithmetic(Arguments& in) {
  const M_Ratio a = in.Ratio(), b = in.Ratio();
  const std::string status = in.Word();
  return Aliased({a, b}, [&](const M_Ratio* operands, M_Ratio* out) {
    unsigned char byte = 0;
    unsigned char* pointer = nullptr;
    if (status == "ones") pointer = reinterpret_cast<unsigned char*>(UINTPTR_MAX);
    if (std::isdigit(status[0]))
      byte = static_cast<unsigned char>(ToInteger(status)), pointer = &byte;
    const int32_t code = kOperation(operands, operands + 1, out, pointer);
    return Text(*out, pointer == &byte ? ToText(byte) : status) + Outcome(code);
  });
}

template <auto kOperation>
std::string Unary(Arguments& in) {
  return Aliased({in.Ratio()}, [](const M_Ratio* operands, M_Ratio* out) {
    const M_Ratio given = *operands;
    unsigned char flag = 9;
    int32_t code = kOperation(operands, out, &flag);
    M_Ratio again = given;
    code |= kOperation(&again, &again, nullptr);
    EXPECT_EQ(ToText(again), ToText(*out)) << "without a flag";
    return Text(*out, flag) + Outcome(code);
  });
}

template <auto kOperation>
std::string Clip(Arguments& in) {
  const M_Ratio value = in.Ratio(), lo = in.Ratio(), hi = in.Ratio();
  return Aliased({value, lo, hi}, [](const M_Ratio* operands, M_Ratio* out) {
    const std::string before = ToText(*out);
    const int32_t code = kOperation(operands, operands + 1, operands + 2, out);
    return Text(code != 0 && ToText(*out) == before ? "kept" : ToText(*out)) + Outcome(code);
  });
}

std::string ClipSpan(Arguments& in) {
  const M_Ratio startA = in.Ratio(), durationA = in.Ratio(), startB = in.Ratio();
  return Aliased(
      {startA, durationA, startB, in.Ratio()}, [](const M_Ratio* operands, M_Ratio* out) {
        M_Ratio other;
        std::vector<M_Ratio> copies(operands, operands + 4);
        int32_t code =
            M_ClipSpanToSpan(copies.data(), &copies[1], &copies[2], &copies[3], &other, &copies[0]);
        const std::string outcome = Outcome(code);
        code |= M_ClipSpanToSpan(operands, operands + 1, operands + 2, operands + 3, out, &other);
        EXPECT_EQ(Outcome(code), outcome);
        EXPECT_EQ(ToText(other), ToText(copies[0]));
        return Text(*out, other) + outcome;
      });
}

std::string Compare(Arguments& in) {
  const M_Ratio a = in.Ratio(), b = in.Ratio();
  return Aliased({a, b}, [](const M_Ratio* operands, M_Ratio* out) {
    const M_Ratio x = operands[0], y = operands[1];
    int32_t order = 99;
    const int32_t code = M_CompareRatio(&x, &y, &order);
    const std::string outcome = Outcome(code);
    EXPECT_EQ(M_MinRatio(operands, operands + 1, out), code);
    EXPECT_EQ(Outcome(code), outcome);
    const M_Ratio least = *out;
    M_Ratio copies[] = {x, y};
    M_Ratio* const greatest = out == operands ? &copies[0] : &copies[1];
    EXPECT_EQ(M_MaxRatio(&copies[0], &copies[1], greatest), code);
    EXPECT_EQ(Outcome(code), outcome);
    return Text(order, least, *greatest) + outcome;
  });
}

std::string Convert(Arguments& in) {
  const M_Ratio ratio = in.Ratio();
  const auto newDen = static_cast<uint32_t>(in.Int());
  return Aliased({ratio}, [newDen](const M_Ratio* operands, M_Ratio* out) {
    M_Ratio again = *operands;
    unsigned char exact = 9, overflow = 9;
    M_ConvRatio(operands, newDen, out, &exact, &overflow);
    host.calls.clear();
    const int32_t code = M_ConvRatio(&again, newDen, &again, nullptr, nullptr);
    EXPECT_EQ(ToText(again), ToText(*out));
    return Text(*out, exact, overflow) + Outcome(code);
  });
}

// The plain conversion of a numerator; a flag for overflow takes the report's place.
std::string ShortConvert(Arguments& in) {
  const M_Ratio ratio = in.Ratio();
  const auto newDen = static_cast<uint32_t>(in.Int());
  int32_t num = 77, again = 78;
  unsigned char overflow = 9;
  const int32_t flagged = M_ShortConvRatio(ratio.num, ratio.den, newDen, &num, &overflow);
  EXPECT_EQ(flagged, Outcome(flagged) == "" ? 0 : M_ERR_ZERO_DENOMINATOR);
  const int32_t code = M_ShortConvRatio(ratio.num, ratio.den, newDen, &again, nullptr);
  EXPECT_EQ(num, again);
  return Text(num, overflow) + Outcome(code);
}

std::string FromDouble(Arguments& in) {
  const double x = in.Double();
  M_Ratio best = {77, 77}, out = {77, 77};
  unsigned char isOutOfRange = 9;
  const int32_t code = Mp_Double2RatioSmart(&best, x) | M_FpLong2Ratio(&out, &isOutOfRange, x);
  EXPECT_EQ(ToText(out), isOutOfRange ? "0/0" : ToText(best));
  EXPECT_EQ(M_FpLong2Ratio(&out, nullptr, x), 0);
  return Text(best) + (isOutOfRange ? " out of range" : "") + Outcome(code);
}

std::string Round(Arguments& in) {
  const double d = in.Double();
  return Text(M_RoundDouble(d), M_RoundDoubleSafe(d), M_RoundDouble64(d));
}

std::string LongMultiply(Arguments& in) {
  const int32_t a = in.Int();
  int32_t out[2] = {};
  host.touches = 0;
  const int32_t code = Mp_LongMul(a, in.Int(), out);
  EXPECT_EQ(host.touches, 1) << "the host multiplies";
  return Text(out[0], out[1]) + Outcome(code);
}

std::string Report(Arguments& in) {
  const auto place = static_cast<int16_t>(in.Int());
  const int32_t code = in.Int();
  EXPECT_EQ(Mp_ReportErr(place, code, static_cast<int16_t>(in.Int())), code);
  return Outcome(0);
}

const std::map<std::string, std::string (*)(Arguments&)> kOperations = {
    {"AddRatio", Arithmetic<M_AddRatio>},
    {"ClipRatio", Clip<M_ClipRatio>},
    {"ClipRatioToSpan", Clip<M_ClipRatioToSpan>},
    {"ClipSpanToSpan", ClipSpan},
    {"CompareRatio", Compare},
    {"ConvRatio", Convert},
    {"DivRatio", Arithmetic<M_DivRatio>},
    {"Fix24Mul", Integers<M_Fix24Mul>},
    {"Fix24Ratio", Integers<M_Fix24Ratio>},
    {"FixDiv", Integers<M_FixDiv>},
    {"FixMul", Integers<M_FixMul>},
    {"FpLong2Ratio", FromDouble},
    {"LongMul", LongMultiply},
    {"MulRatio", Arithmetic<M_MulRatio>},
    {"RecipRatio", Unary<M_RecipRatio>},
    {"ReduceRatio", Unary<M_ReduceRatio>},
    {"ReportErr", Report},
    {"RoundDouble", Round},
    {"RoundToNearestMult", Integers<M_RoundToNearestMult>},
    {"ShortConvRatio", ShortConvert},
    {"SubRatio", Arithmetic<M_SubRatio>},
};

// An expectation with its numbers written as results are.
std::string Normal(const std::string& expected) {
  std::istringstream words(expected);
  std::string normal, word;
  while (words >> word) {
    const auto integer = [](const std::string& text) {
      const std::string digits = text.substr(text[0] == '-');
      const bool isNumber = digits == "min" || digits == "max" || digits.rfind("0x", 0) == 0;
      return isNumber ? ToText(ToInteger(text)) : text;
    };
    const size_t slash = word.find('/');
    normal += ' ' + (slash == std::string::npos ? integer(word) : ToText(ToRatio(word)));
  }
  return normal;
}

class CasesTest : public HostTest, public ::testing::WithParamInterface<const char*> {};
INSTANTIATE_TEST_SUITE_P(, CasesTest,
                         ::testing::Values("approximation", "clip", "fixed", "ratio", "report",
                                           "rounding"),
                         [](const auto& file) { return std::string(file.param); });

TEST_P(CasesTest, GiveTheirResults) {
  std::ifstream file(std::string(TESTS_FOLDER "/cases/") + GetParam() + ".txt");
  std::string line;
  int cases = 0;
  for (int number = 1; std::getline(file, line); ++number) {
    SCOPED_TRACE(std::string(GetParam()) + ".txt:" + std::to_string(number) + ": " + line);
    line = line.substr(0, line.find('#'));
    const size_t equals = line.find('=');
    if (equals == std::string::npos) continue;
    Arguments arguments(line.substr(0, equals));
    const auto operation = kOperations.find(arguments.Word());
    ASSERT_NE(operation, kOperations.end());
    EXPECT_EQ(operation->second(arguments), Normal(line.substr(equals + 1)));
    ++cases;
  }
  EXPECT_GT(cases, 10) << "the table could not be read";
}

}  // namespace
