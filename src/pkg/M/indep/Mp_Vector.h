/// \file
/// Short vectors of numbers, which the compiler maps to what the processor has. A lane gives the
/// bits that plain arithmetic gives. Everything is inlined: how a vector crosses a call would
/// depend on what the caller is compiled for.
#ifndef MP_VECTOR_H
#define MP_VECTOR_H

#include <cstdint>
#include <cstring>

namespace Mp {

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
  Doubles x, y, z;

  /// From points one behind the other.
  [[gnu::always_inline]] static Triples Load(const double* from) {
    const auto a = Mp::Load<Doubles>(from);
    const auto b = Mp::Load<Doubles>(from + kLanes);
    const auto c = Mp::Load<Doubles>(from + 2 * kLanes);
    if constexpr (kLanes == 2) {  // x y | z x | y z
      return {__builtin_shufflevector(a, b, 0, 3), __builtin_shufflevector(a, c, 1, 2),
              __builtin_shufflevector(b, c, 0, 3)};
    } else {  // x y z x | y z x y | z x y z
      const Doubles xy = __builtin_shufflevector(a, b, 0, 1, 6, 7);
      const Doubles zx = __builtin_shufflevector(a, c, 2, 3, 4, 5);
      const Doubles yz = __builtin_shufflevector(b, c, 0, 1, 6, 7);
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

}  // namespace Mp

#endif  // MP_VECTOR_H
