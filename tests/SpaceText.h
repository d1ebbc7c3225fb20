/// \file
/// Points, rectangles, vectors and matrices as the tables of cases write them: a point is h,v and a
/// rectangle left,top,right,bottom, whatever its layout; vectors and matrices are lists of their
/// elements.
#ifndef TESTS_SPACE_TEXT_H
#define TESTS_SPACE_TEXT_H

#include <array>
#include <charconv>
#include <cmath>
#include <cstring>

#include "Cases.h"
#include "M_Matrix.h"
#include "M_Rect.h"

inline std::string NumberText(double d) {
  if (std::isnan(d)) return "nan";
  char text[32];
  return {text, std::to_chars(text, text + sizeof text, d).ptr};
}

template <class Numbers>
std::string List(const Numbers& numbers) {
  std::string text;
  for (const auto number : numbers) {
    text.append(text.empty() ? "" : ",").append(NumberText(static_cast<double>(number)));
  }
  return text;
}

template <class Point>
concept IsPoint = requires(Point p) {
  p.h;
};
template <class Rect>
concept IsRect = requires(Rect r) {
  r.bottom;
};

/// Integers are written with all their digits.
template <IsPoint Point>
std::string ToText(const Point& p) {
  return std::to_string(p.h).append(",").append(std::to_string(p.v));
}
template <IsRect Rect>
std::string ToText(const Rect& r) {
  return ToText(M_LPoint{r.left, r.top}).append(",").append(ToText(M_LPoint{r.right, r.bottom}));
}
inline std::string ToText(const M_WHRect& r) { return List(r.values); }
inline std::string ToText(const M_FloatRect& r) {
  return List(std::array{r.left, r.top, r.right, r.bottom});
}

/// Vectors and matrices, element by element.
template <class Record>
std::string Elements(const Record& record) {
  std::array<double, sizeof(Record) / 8> elements;
  std::memcpy(elements.data(), &record, sizeof record);
  return List(elements);
}
/// What comes from sines and roots, to nine places.
template <class Record>
std::string NearElements(const Record& record, double unit = 1e9) {
  std::array<double, sizeof(Record) / 8> elements;
  std::memcpy(elements.data(), &record, sizeof record);
  for (double& element : elements) element = std::round(element * unit) / unit + 0.0;
  return List(elements);
}
template <class Record>
requires requires(Record r) { r.m; } || requires(Record r) {
  r.x;
}
std::string ToText(const Record& record) { return Elements(record); }

template <class Record>
Record Read(Arguments& in) {
  const std::vector<double> numbers = in.Doubles();
  Record record;
  if constexpr (IsPoint<Record>) {
    record.h = static_cast<decltype(record.h)>(numbers.at(0));
    record.v = static_cast<decltype(record.v)>(numbers.at(1));
  } else if constexpr (std::is_same_v<Record, M_WHRect>) {
    for (size_t i = 0; i < 4; ++i) record.values[i] = static_cast<int16_t>(numbers.at(i));
  } else if constexpr (IsRect<Record>) {
    record.left = static_cast<decltype(record.left)>(numbers.at(0));
    record.top = static_cast<decltype(record.top)>(numbers.at(1));
    record.right = static_cast<decltype(record.right)>(numbers.at(2));
    record.bottom = static_cast<decltype(record.bottom)>(numbers.at(3));
  } else {
    EXPECT_EQ(numbers.size() * 8, sizeof record);
    std::memcpy(&record, numbers.data(), sizeof record);
  }
  return record;
}

/// All elements, or those that differ from the identity: "I" nothing, "d,..." the diagonal, "t,..."
/// the last row, "w,..." the last column.
template <class Matrix>
Matrix ReadMatrix(Arguments& in) {
  constexpr size_t kSize = std::size(Matrix{}.m);
  Arguments whole = in;
  const std::string word = in.Word();
  if (!std::strchr("Idtw", word[0])) return Read<Matrix>(whole);
  Arguments list(word.size() > 2 ? word.substr(2) : "0");
  const std::vector<double> numbers = list.Doubles();
  Matrix m = {};
  for (size_t i = 0; i < kSize; ++i) m.m[i][i] = 1;
  for (size_t i = 0; word[0] != 'I' && i < numbers.size(); ++i) {
    (word[0] == 'd'   ? m.m[i][i]
     : word[0] == 't' ? m.m[kSize - 1][i]
                      : m.m[i][kSize - 1]) = numbers[i];
  }
  return m;
}

/// A binary operation with an output of its own, and with the output in a and in b.
template <class Record>
std::array<std::string, 3> InEachPlace(
    const Record& a, const Record& b,
    const std::function<int32_t(const Record*, const Record*, Record*)>& call) {
  std::array<std::string, 3> results;
  for (size_t place = 0; place < 3; ++place) {
    std::array<Record, 3> records = {Record{}, a, b};
    std::memset(&records[0], 0x77, sizeof(Record));
    const int32_t code = call(&records[1], &records[2], &records[place]);
    results[place] = Text(records[place]).append(Outcome(code));
  }
  return results;
}

template <class Record>
std::string InAnyPlace(const Record& a, const Record& b,
                       const std::function<int32_t(const Record*, const Record*, Record*)>& call) {
  const auto results = InEachPlace<Record>(a, b, call);
  EXPECT_EQ(results[1], results[0]) << "with the output in a";
  EXPECT_EQ(results[2], results[0]) << "with the output in b";
  return results[0];
}

/// The outcome of a call that may throw a code.
inline std::string Thrown(const std::function<void()>& call) {
  try {
    call();
  } catch (int code) {
    return Outcome(code);
  }
  return Outcome(0);
}

/// Records up to the end of the line.
template <class Record>
std::vector<Record> ReadAll(Arguments& in) {
  std::vector<Record> all;
  while (!in.IsEmpty()) all.push_back(Read<Record>(in));
  return all;
}

template <class Records>
std::string TextOfAll(const Records& records) {
  std::string text;
  for (const auto& record : records) text += Text(record);
  return text;
}

#endif  // TESTS_SPACE_TEXT_H
