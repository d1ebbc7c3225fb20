/// \file
/// A law: what holds for all operands, drawn by RapidCheck.
#ifndef TESTS_LAW_H
#define TESTS_LAW_H

#include <gtest/gtest.h>
#include <rapidcheck/gtest.h>

#include <cstdlib>
#include <cstring>
#include <sstream>
#include <string>

#include "Operands.h"
#include "TestHost.h"

/// Checks a law for many operands, or for a part of as many. A failure says the simplest ones that
/// were found, and the seed.
template <class Check>
void Holds(const Check& law, double part = 1) {
  rc::detail::TestParams params = rc::detail::configuration().testParams;
  params.maxSuccess = static_cast<int>(params.maxSuccess * part) + 1;
  const auto result = rc::detail::checkTestable(law, rc::detail::TestMetadata(), params);
  if (!result.template is<rc::detail::SuccessResult>()) {
    std::ostringstream text;
    rc::detail::printResultMessage(result, text);
    ADD_FAILURE() << text.str() << "\nRC_PARAMS=\"" << std::getenv("RC_PARAMS") << '"';
  }
  host = {};
}

/// What a law says of its operands. (RC_ASSERT says the same, but takes the compiler twice as
/// long.)
template <class Actual, class Expected>
void Equal(const Actual& actual, const Expected& expected, const char* file = __builtin_FILE(),
           int line = __builtin_LINE()) {
  const auto isSame = [&] {
    if constexpr (std::is_integral_v<Actual> && std::is_integral_v<Expected>) {
      return actual + 0LL == expected + 0LL;
    } else {
      return actual == expected;
    }
  };
  if (isSame()) return;
  RC_FAIL(std::string(file) + ':' + std::to_string(line) + ": " + rc::toString(actual) + ", not " +
          rc::toString(expected));
}
inline void Check(bool holds, const char* file = __builtin_FILE(), int line = __builtin_LINE()) {
  if (!holds) RC_FAIL(std::string(file) + ':' + std::to_string(line));
}

/// All bits of the numbers in a record; one NaN is as good as another.
template <class T>
std::string BitsOf(const T& value) {
  std::string bits(reinterpret_cast<const char*>(&value), sizeof value);
  if constexpr (std::is_same_v<T, F2> || std::is_same_v<T, float>) {
    for (size_t i = 0; i < bits.size(); i += sizeof(float)) {
      float f;
      std::memcpy(&f, &bits[i], sizeof f);
      if (std::isnan(f)) bits.replace(i, sizeof f, "nanf");
    }
  } else if constexpr (!std::has_unique_object_representations_v<T>) {
    for (size_t i = 0; i < bits.size(); i += sizeof(double)) {
      double d;
      std::memcpy(&d, &bits[i], sizeof d);
      if (std::isnan(d)) bits.replace(i, sizeof d, "any nan!");
    }
  }
  return bits;
}

/// Whether two numbers are the same to some relative precision, or to as much absolutely.
inline bool IsNear(long double a, long double b, long double precision = 1e-9L) {
  return std::abs(a - b) <= precision * std::max({1.0L, std::abs(a), std::abs(b)});
}
inline bool IsNear(const V3& a, const V3& b, long double precision = 1e-9L) {
  return IsNear(a.x, b.x, precision) && IsNear(a.y, b.y, precision) && IsNear(a.z, b.z, precision);
}

/// What a call throws, or 0, and then what the host is told.
template <class Call>
std::string Thrown(const Call& call) {
  std::string text = "0";
  try {
    call();
  } catch (int code) {
    text = std::to_string(code);
  }
  for (const std::string& each : host.Take()) text += " | " + each;
  return text;
}

#endif  // TESTS_LAW_H
