/// \file
/// Operands that know the edges, for RapidCheck: it draws them, and shrinks those of a failure to
/// the simplest ones that fail. Equal and neighbouring ones are frequent.
#ifndef TESTS_OPERANDS_H
#define TESTS_OPERANDS_H

#include <rapidcheck.h>

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <limits>
#include <ostream>

#include "M_Matrix.h"
#include "M_Rect.h"
#include "M_Utils.h"

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;
using F2 = M_Vector2T<float>;

inline constexpr double kInf = std::numeric_limits<double>::infinity();
inline constexpr double kNan = std::numeric_limits<double>::quiet_NaN();

/// Integers of every bit length, near powers of two, with zeros at their end.
struct Word {
  uint32_t value;
  operator uint32_t() const { return value; }
};
struct Int {
  int32_t value;
  operator int32_t() const { return value; }
};
struct Short {
  int16_t value;
  operator int16_t() const { return value; }
};
/// A small integer, so that several are often equal or neighbours.
struct Digit {
  int16_t value;
  operator int16_t() const { return value; }
};
/// Any double: halves and ties, tolerances and what is beside them, infinities, NaNs.
struct Any {
  double value;
  operator double() const { return value; }
};
/// A double in the middle: from -10 to 10, often whole.
struct Real {
  double value;
  operator double() const { return value; }
};

// As one would type them.
inline void showValue(double d, std::ostream& os) {
  if (std::isnan(d)) {
    os << "NAN";
  } else if (std::isinf(d)) {
    os << (d < 0 ? "-INFINITY" : "INFINITY");
  } else {
    char text[32];
    os.write(text, std::to_chars(text, text + sizeof text, d).ptr - text);
  }
}
template <class... Parts>
void ShowList(std::ostream& os, const Parts&... parts) {
  const char* separator = "{";
  const auto show = [&](const auto& part) {
    os << std::exchange(separator, ", ");
    if constexpr (std::is_floating_point_v<std::decay_t<decltype(part)>>) {
      showValue(static_cast<double>(part), os);
    } else {
      rc::show(part, os);
    }
  };
  (show(parts), ...);
  os << '}';
}
inline void showValue(const Word& w, std::ostream& os) {
  os << "0x" << std::hex << w.value << std::dec;
}
inline void showValue(const Int& i, std::ostream& os) { os << i.value; }
inline void showValue(const Short& i, std::ostream& os) { os << i.value; }
inline void showValue(const Digit& i, std::ostream& os) { os << i.value; }
inline void showValue(const Any& d, std::ostream& os) { showValue(d.value, os); }
inline void showValue(const Real& d, std::ostream& os) { showValue(d.value, os); }
inline void showValue(const M_Ratio& r, std::ostream& os) { ShowList(os, r.num, r.den); }

/// A record of numbers of one type, whatever their names.
template <class T>
concept Record = std::is_aggregate_v<T> && std::is_trivially_copyable_v<T> && !requires(T t) {
  t.begin();
}
&&!requires(T t) { t.value; };
template <Record T>
using NumberOf = std::conditional_t<
    alignof(T) == alignof(int16_t), int16_t,
    std::conditional_t<std::is_same_v<T, F2>, float,
                       std::conditional_t<alignof(T) == alignof(int32_t), int32_t, double>>>;
template <Record T>
using NumbersOf = std::array<NumberOf<T>, sizeof(T) / sizeof(NumberOf<T>)>;

template <Record T>
void showValue(const T& record, std::ostream& os) {
  std::apply([&](const auto&... numbers) { ShowList(os, numbers...); },
             std::bit_cast<NumbersOf<T>>(record));
}

namespace operands {

using rc::Gen;
namespace gen = rc::gen;

inline Gen<uint32_t> Bits() { return gen::resize(rc::kNominalSize, gen::arbitrary<uint32_t>()); }

inline Gen<uint32_t> Words() {
  return gen::map(gen::tuple(gen::inRange(0, 33), Bits(), gen::inRange(0, 7)), [](const auto& t) {
    const auto& [bits, random, kind] = t;
    if (bits == 0) return uint32_t{0};
    const uint32_t top = 1u << (bits - 1), word = top | (random & (top - 1));
    return kind == 1   ? top
           : kind == 2 ? top - 1
           : kind == 3 ? top + 1
           : kind == 5 ? (random % 4 << 30) - (random >> 8) % 2  // The ends, and half of them.
           : kind == 4 ? word & ~((1u << random % static_cast<uint32_t>(bits)) - 1)
                       : word;
  });
}

inline Gen<int32_t> Ints() {
  return gen::map(gen::pair(Words(), gen::arbitrary<bool>()), [](const auto& p) {
    return static_cast<int32_t>(p.second ? 0 - p.first : p.first);
  });
}

inline Gen<double> Reals() {
  return gen::weightedOneOf<double>(
      {{3, gen::map(gen::inRange(-10, 11), [](int i) { return i * 1.0; })},
       {2, gen::map(gen::inRange(-160, 161), [](int i) { return i / 16.0; })},
       {4, gen::map(Bits(), [](uint32_t w) { return w * (20 * 0x1p-32) - 10; })}});
}

/// d, or one of its neighbours.
inline Gen<double> Near(Gen<double> d) {
  return gen::map(gen::pair(std::move(d), gen::inRange(0, 5)), [](const auto& p) {
    return p.second == 1   ? std::nextafter(p.first, kInf)
           : p.second == 2 ? std::nextafter(p.first, -kInf)
                           : p.first;
  });
}

inline Gen<double> Doubles() {
  const auto edges =
      gen::element(0.0, -0.0, 0.5, -0.5, 1e-12, -1e-12, 1e-20, 1e-16, 0.1, 0.25, 1e-6, 32766.5,
                   -32767.5, 32767.0, -32768.0, 2147483647.5, 2147483646.5, -2147483647.5,
                   -2147483648.0, 0x1p63, 128.0, -129.0, 1e12, 1e154);
  const auto halves = gen::map(Ints(), [](int32_t i) { return i * 0.5; });
  const auto scaled = gen::map(gen::pair(Ints(), gen::inRange(-70, 40)),
                               [](const auto& p) { return std::ldexp(p.first, p.second); });
  return gen::weightedOneOf<double>(
      {{4, Reals()},
       {3, Near(edges)},
       {2, Near(halves)},
       {2, scaled},
       {1, gen::element(kInf, -kInf, kNan, 5e-324, -5e-324, 1e308, -1e308)}});
}

template <class Record, class... Parts>
Gen<Record> Make(Gen<Parts>... parts) {
  return gen::map(gen::tuple(std::move(parts)...), [](const auto& t) {
    return std::apply([](const auto&... part) { return Record{part...}; }, t);
  });
}

/// Identities of which some parts have been set: translation, scale, rotation or skew, the last
/// column; at times to what arithmetic is quick to get wrong, or singular.
template <class Matrix>
Gen<Matrix> Matrices() {
  constexpr size_t kSize = std::size(Matrix{}.m);
  using Elements = std::array<double, kSize * kSize>;
  const auto elements = gen::weightedOneOf<Elements>(
      {{5, gen::container<Elements>(Reals())}, {1, gen::container<Elements>(Doubles())}});
  return gen::map(gen::tuple(elements, gen::inRange(0, 32), gen::inRange(0, 8)), [](const auto& t) {
    const auto& [all, parts, kind] = t;
    Matrix m = {};
    for (size_t i = 0; i < kSize; ++i) {
      for (size_t j = 0; j < kSize; ++j) {
        const int part = j == kSize - 1 ? 8 : i == kSize - 1 ? 1 : i == j ? 2 : 4;
        m.m[i][j] = parts >= 16 || parts & part ? all[i * kSize + j] : i == j;
      }
    }
    if (kind == 7) std::copy_n(m.m[1], kSize, m.m[0]);
    return m;
  });
}

/// For everything that functions take.
template <class T>
Gen<T> Of();

}  // namespace operands

namespace rc {

/// What the library works on is drawn as above.
template <class T>
requires requires(T t) {
  showValue(t, std::declval<std::ostream&>());
} &&(!std::is_arithmetic_v<T>)struct Arbitrary<T> {
  static Gen<T> arbitrary() { return operands::Of<T>(); }
};

}  // namespace rc

#endif  // TESTS_OPERANDS_H
