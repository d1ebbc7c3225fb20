/// \file
/// Arithmetic for laws about vectors and matrices, plainly written out.
#ifndef TESTS_MATRICES_H
#define TESTS_MATRICES_H

#include <bit>
#include <numbers>
#include <numeric>

#include "Law.h"

inline constexpr double kPi = std::numbers::pi;

/// A record of nothing but doubles.
template <class T>
concept OfDoubles =
    std::is_class_v<T> && std::is_trivially_copyable_v<T> && !std::is_convertible_v<T, double>;

/// The numbers in a record, in order.
template <OfDoubles T>
auto Numbers(const T& record) {
  return std::bit_cast<std::array<double, sizeof record / sizeof(double)>>(record);
}
/// A record of such numbers.
template <OfDoubles T>
T Draw(const rc::Gen<double>& number = operands::Reals()) {
  return std::bit_cast<T>(*rc::gen::container<decltype(Numbers(T{}))>(number));
}

/// Number by number, of two records.
template <OfDoubles T, class Function>
T Zip(const T& a, const T& b, const Function& f) {
  auto out = Numbers(a), second = Numbers(b);
  std::transform(out.begin(), out.end(), second.begin(), out.begin(), f);
  return std::bit_cast<T>(out);
}
template <OfDoubles T>
bool IsNear(const T& a, const T& b, long double precision = 1e-9L) {
  const auto isFar = [=](double x, double y) { return IsNear(x, y, precision) ? 0.0 : 1.0; };
  return Numbers(Zip(a, b, isFar)) == Numbers(T{});
}
template <OfDoubles T>
T operator+(const T& a, const T& b) {
  return Zip(a, b, std::plus());
}
template <OfDoubles T>
T operator-(const T& a, const T& b) {
  return Zip(a, b, std::minus());
}
template <class T, class = std::enable_if_t<OfDoubles<T>>>
T operator*(double factor, const T& v) {
  return Zip(v, v, [=](double x, double) { return factor * x; });
}
template <OfDoubles T>
double Dot(const T& a, const T& b) {
  const auto products = Numbers(Zip(a, b, std::multiplies()));
  return std::accumulate(products.begin(), products.end(), 0.0);
}
template <class Vector>
double Length(const Vector& v) {
  return std::sqrt(Dot(v, v));
}
inline V3 Cross(const V3& a, const V3& b) {
  return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}

template <class Matrix>
Matrix Identity() {
  Matrix m = {};
  for (size_t i = 0; i < std::size(m.m); ++i) m.m[i][i] = 1;
  return m;
}
template <class Matrix>
V3 Row(const Matrix& m, int i) {
  return {m.m[i][0], m.m[i][1], m.m[i][2]};
}
template <class Matrix>
double& AnyElement(Matrix& m) {
  const auto index = rc::gen::inRange<size_t>(0, std::size(m.m));
  return m.m[*index][*index];
}
/// Rows times a matrix: one, or those of a matrix. From left to right, so that each bit counts.
template <class Rows, class Matrix>
requires requires(Matrix m) { m.m; }
Rows operator*(const Rows& rows, const Matrix& m) {
  constexpr size_t kSize = std::size(Matrix{}.m);
  const auto in = Numbers(rows);
  auto out = in;
  for (size_t i = 0; i < in.size(); ++i) {
    out[i] = -0.0;  // To which one may add anything and have it.
    for (size_t k = 0; k < kSize; ++k) out[i] += in[i / kSize * kSize + k] * m.m[k][i % kSize];
  }
  return std::bit_cast<Rows>(out);
}
/// What the library rotates by.
inline M_Matrix4 Rotation(const V3& axis, double angle) {
  auto m = Identity<M_Matrix4>();
  Equal(M_RotateMatrix4(&m, axis.x, axis.y, axis.z, angle), 0);
  return m;
}

#endif  // TESTS_MATRICES_H
