/// \file
/// Operands out of a fuzzer's bytes, and what stops it.
#ifndef FUZZ_INPUT_H
#define FUZZ_INPUT_H

#include <fuzzer/FuzzedDataProvider.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "M_Utils.h"
#include "U.h"

using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;
using Vector4 = M_Vector4T<double>;

/// Reports are part of the game: nobody wants to read them.
inline const bool isQuiet = [] {
  U_SetReportCallback([](void*, const U_Report*) {}, nullptr);
  return true;
}();

/// Stops the fuzzer where a law is broken.
inline void Require(bool holds, const char* file = __builtin_FILE(), int line = __builtin_LINE()) {
  if (holds) return;
  std::fprintf(stderr, "%s:%d: a law is broken\n", file, line);
  std::abort();
}

class Input {
 public:
  Input(const uint8_t* data, size_t size) : bytes_(data, size) {}

  bool IsEmpty() { return bytes_.remaining_bytes() == 0; }
  uint32_t Below(uint32_t limit) { return bytes_.ConsumeIntegralInRange<uint32_t>(0, limit - 1); }

  /// Any bits, and zeros where there are no more.
  template <class Record>
  Record Any() {
    Record record = {};
    bytes_.ConsumeData(&record, sizeof record);
    return record;
  }

  /// A coordinate such as clients have, of a kind that meets others often.
  double Coordinate() { return Any<int16_t>() / 16.0; }
  Vector2 Point() { return {Coordinate(), Coordinate()}; }

  template <class Record>
  Record Usual() {
    Record record;
    for (size_t i = 0; i < sizeof record; i += sizeof(double)) {
      const double coordinate = Coordinate();
      std::memcpy(reinterpret_cast<char*>(&record) + i, &coordinate, sizeof coordinate);
    }
    return record;
  }

  std::string Text() { return bytes_.ConsumeRemainingBytesAsString(); }

  std::vector<Vector2> Points(size_t most) {
    std::vector<Vector2> points;
    while (!IsEmpty() && points.size() < most) points.push_back(Point());
    return points;
  }

 private:
  FuzzedDataProvider bytes_;
};

/// The target: what one input goes through.
void Run(Input& input);

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  Input input(data, size);
  Run(input);
  return 0;
}

/// Twice the area of a triangle.
inline double Turn(const Vector2& a, const Vector2& b, const Vector2& c) {
  return (b.x - a.x) * (c.y - a.y) - (b.y - a.y) * (c.x - a.x);
}

#endif  // FUZZ_INPUT_H
