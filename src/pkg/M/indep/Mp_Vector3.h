/// \file
/// Arithmetic of vectors in space.
#ifndef MP_VECTOR3_H
#define MP_VECTOR3_H

#include <cmath>

#include "M_Matrix.h"

namespace Mp {

inline M_Vector3T<double> Sum(const M_Vector3T<double>& a, const M_Vector3T<double>& b) {
  return {a.x + b.x, a.y + b.y, a.z + b.z};
}

inline M_Vector3T<double> Difference(const M_Vector3T<double>& a, const M_Vector3T<double>& b) {
  return {a.x - b.x, a.y - b.y, a.z - b.z};
}

inline M_Vector3T<double> Negated(const M_Vector3T<double>& a) { return {-a.x, -a.y, -a.z}; }

inline M_Vector3T<double> Scaled(const M_Vector3T<double>& a, double factor) {
  return {a.x * factor, a.y * factor, a.z * factor};
}

inline M_Vector3T<double> Divided(const M_Vector3T<double>& a, double divisor) {
  return {a.x / divisor, a.y / divisor, a.z / divisor};
}

/// Of numbers, or of vectors of them.
template <class T>
[[gnu::always_inline]] inline T Dot(const M_Vector3T<T>& a, const M_Vector3T<T>& b) {
  return a.x * b.x + a.y * b.y + a.z * b.z;
}

template <class T>
[[gnu::always_inline]] inline M_Vector3T<T> Cross(const M_Vector3T<T>& a, const M_Vector3T<T>& b) {
  return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}

/// The plain square root of the sum of squares, which may overflow where the length does not.
inline double Length(const M_Vector3T<double>& a) { return std::sqrt(Dot(a, a)); }

}  // namespace Mp

#endif  // MP_VECTOR3_H
