/// \file
/// Short vectors of numbers, which the compiler maps to what the processor has. A lane gives the
/// bits that plain arithmetic gives. Everything is inlined: how a vector crosses a call would
/// depend on what the caller is compiled for.
#ifndef MP_LANES_H
#define MP_LANES_H

#include <cstdint>
#include <cstring>

// How wide vectors cross a call without AVX, which none does.
#pragma GCC diagnostic ignored "-Wpsabi"

namespace Mp {

// A function compiled for AVX2, and whether it may be called; elsewhere, and where AVX2 is left
// out, it never is.
#if defined(__x86_64__) && !defined(M_BASELINE_VECTORS)
#define MP_TARGET_AVX2 [[gnu::target("avx2")]]
inline bool HasAvx2() { return __builtin_cpu_supports("avx2"); }
#else
#define MP_TARGET_AVX2
constexpr bool HasAvx2() { return false; }
#endif

/// A vector of doubles, and one of their bits. A comparison gives all bits or none.
template <int kLanes>
struct Lanes {
  typedef double Doubles __attribute__((vector_size(kLanes * sizeof(double))));
  typedef uint64_t Bits __attribute__((vector_size(kLanes * sizeof(uint64_t))));
};

template <class Vector>
[[gnu::always_inline]] inline Vector Load(const void* from) {
  Vector v;
  std::memcpy(&v, from, sizeof v);
  return v;
}

template <class Vector>
[[gnu::always_inline]] inline void Store(void* to, const Vector& v) {
  std::memcpy(to, &v, sizeof v);
}

/// Whether a comparison holds in every lane.
template <int kLanes>
[[gnu::always_inline]] inline bool HoldsInAll(const typename Lanes<kLanes>::Bits& comparison) {
  uint64_t all = comparison[0];
  for (int i = 1; i < kLanes; ++i) all &= comparison[i];
  return all != 0;
}

/// Coordinates of `kLanes` points with x, y and z each.
template <int kLanes>
struct Triples {
  using Doubles = typename Lanes<kLanes>::Doubles;
  using Doubles2 = Lanes<2>::Doubles;
  Doubles x, y, z;

  /// From points one behind the other, two numbers at a time: what has just been written in halves
  /// would have to be waited for if it were read as a whole.
  [[gnu::always_inline]] static Triples Load(const double* from) {
    const auto a = Mp::Load<Doubles2>(from);
    const auto b = Mp::Load<Doubles2>(from + 2);
    const auto c = Mp::Load<Doubles2>(from + 4);
    if constexpr (kLanes == 2) {  // x y | z x | y z
      return {__builtin_shufflevector(a, b, 0, 3), __builtin_shufflevector(a, c, 1, 2),
              __builtin_shufflevector(b, c, 0, 3)};
    } else {
      const Doubles xy = __builtin_shufflevector(a, Mp::Load<Doubles2>(from + 6), 0, 1, 2, 3);
      const Doubles zx = __builtin_shufflevector(b, Mp::Load<Doubles2>(from + 8), 0, 1, 2, 3);
      const Doubles yz = __builtin_shufflevector(c, Mp::Load<Doubles2>(from + 10), 0, 1, 2, 3);
      return {__builtin_shufflevector(xy, zx, 0, 5, 2, 7),
              __builtin_shufflevector(xy, yz, 1, 4, 3, 6),
              __builtin_shufflevector(zx, yz, 0, 5, 2, 7)};
    }
  }

  [[gnu::always_inline]] void Store(double* to) const {
    if constexpr (kLanes == 2) {
      Mp::Store(to, __builtin_shufflevector(x, y, 0, 2));
      Mp::Store(to + 2, __builtin_shufflevector(z, x, 0, 3));
      Mp::Store(to + 4, __builtin_shufflevector(y, z, 1, 3));
    } else {
      const Doubles xy = __builtin_shufflevector(x, y, 0, 4, 2, 6);
      const Doubles zx = __builtin_shufflevector(z, x, 0, 5, 2, 7);
      const Doubles yz = __builtin_shufflevector(y, z, 1, 5, 3, 7);
      Mp::Store(to, __builtin_shufflevector(xy, zx, 0, 1, 4, 5));
      Mp::Store(to + 4, __builtin_shufflevector(yz, xy, 0, 1, 6, 7));
      Mp::Store(to + 8, __builtin_shufflevector(zx, yz, 2, 3, 6, 7));
    }
  }
};

/// Coordinates of `kLanes` points with x, y, z and w each.
template <int kLanes>
struct Quadruples {
  using Doubles = typename Lanes<kLanes>::Doubles;
  using Doubles2 = Lanes<2>::Doubles;
  Doubles x, y, z, w;

  template <class Point>
  [[gnu::always_inline]] static Quadruples Load(const Point* from) {
    const auto xy0 = Mp::Load<Doubles2>(&from[0].x), zw0 = Mp::Load<Doubles2>(&from[0].z);
    const auto xy1 = Mp::Load<Doubles2>(&from[1].x), zw1 = Mp::Load<Doubles2>(&from[1].z);
    if constexpr (kLanes == 2) {
      return {__builtin_shufflevector(xy0, xy1, 0, 2), __builtin_shufflevector(xy0, xy1, 1, 3),
              __builtin_shufflevector(zw0, zw1, 0, 2), __builtin_shufflevector(zw0, zw1, 1, 3)};
    } else {
      const auto xy2 = Mp::Load<Doubles2>(&from[2].x), zw2 = Mp::Load<Doubles2>(&from[2].z);
      const auto xy3 = Mp::Load<Doubles2>(&from[3].x), zw3 = Mp::Load<Doubles2>(&from[3].z);
      const Doubles xy02 = __builtin_shufflevector(xy0, xy2, 0, 1, 2, 3);
      const Doubles xy13 = __builtin_shufflevector(xy1, xy3, 0, 1, 2, 3);
      const Doubles zw02 = __builtin_shufflevector(zw0, zw2, 0, 1, 2, 3);
      const Doubles zw13 = __builtin_shufflevector(zw1, zw3, 0, 1, 2, 3);
      return {__builtin_shufflevector(xy02, xy13, 0, 4, 2, 6),
              __builtin_shufflevector(xy02, xy13, 1, 5, 3, 7),
              __builtin_shufflevector(zw02, zw13, 0, 4, 2, 6),
              __builtin_shufflevector(zw02, zw13, 1, 5, 3, 7)};
    }
  }

  [[gnu::always_inline]] static void StoreHalves(const Doubles& v, double* low, double* high) {
    // Written this way, the upper half needs no shuffle on its way to memory.
    Doubles2 halves[2];
    std::memcpy(halves, &v, sizeof v);
    Mp::Store(low, halves[0]);
    Mp::Store(high, halves[1]);
  }

  template <class Point>
  [[gnu::always_inline]] void Store(Point* to) const {
    if constexpr (kLanes == 2) {
      Mp::Store(&to[0].x, __builtin_shufflevector(x, y, 0, 2));
      Mp::Store(&to[0].z, __builtin_shufflevector(z, w, 0, 2));
      Mp::Store(&to[1].x, __builtin_shufflevector(x, y, 1, 3));
      Mp::Store(&to[1].z, __builtin_shufflevector(z, w, 1, 3));
    } else {
      const Doubles xy02 = __builtin_shufflevector(x, y, 0, 4, 2, 6);
      const Doubles xy13 = __builtin_shufflevector(x, y, 1, 5, 3, 7);
      const Doubles zw02 = __builtin_shufflevector(z, w, 0, 4, 2, 6);
      const Doubles zw13 = __builtin_shufflevector(z, w, 1, 5, 3, 7);
      StoreHalves(xy02, &to[0].x, &to[2].x);
      StoreHalves(zw02, &to[0].z, &to[2].z);
      StoreHalves(xy13, &to[1].x, &to[3].x);
      StoreHalves(zw13, &to[1].z, &to[3].z);
    }
  }
};

}  // namespace Mp

#endif  // MP_LANES_H
