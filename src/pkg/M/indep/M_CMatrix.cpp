// Members of the vectors and matrices.

#include <cmath>

#include "M_Matrix.h"
#include "Mp_Err.h"
#include "Mp_Matrix.h"
#include "Mp_Strs.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector3.h"
#include "U.h"

namespace {

void Report(uint32_t id, int32_t message) {
  Up_ReportErrString(id, Mp_SEVERITY_ERROR, Mp::Text(message));
}

[[noreturn]] void ThrowWIsZero(uint32_t id) {
  Report(id, Mp_STR_W_IS_ZERO);
  throw int{M_ERR_W_IS_ZERO};
}

double W(const M_Matrix3& a, const M_Vector3T<double>& p) {
  return p.x * a.m[0][2] + p.y * a.m[1][2] + p.z * a.m[2][2];
}

double W(const M_Matrix4& a, const M_Vector4T<double>& p) {
  return p.x * a.m[0][3] + p.y * a.m[1][3] + p.z * a.m[2][3] + p.w * a.m[3][3];
}

// Divides, where the 4x4 form multiplies by the reciprocal: the last bits may differ.
M_Vector3T<double> TransformAndDivide(const M_Matrix3& a, const M_Vector3T<double>& p, double w) {
  const auto column = [&](int j) { return p.x * a.m[0][j] + p.y * a.m[1][j] + p.z * a.m[2][j]; };
  return {column(0) / w, column(1) / w, 1.0};
}

M_Vector4T<double> TransformAndDivide(const M_Matrix4& a, const M_Vector4T<double>& p, double w) {
  const auto column = [&](int j) {
    return p.x * a.m[0][j] + p.y * a.m[1][j] + p.z * a.m[2][j] + p.w * a.m[3][j];
  };
  const double r = 1.0 / w;
  return {r * column(0), r * column(1), r * column(2), 1.0};
}

template <class Matrix, class Point>
void TransformAndDivideChecked(const Matrix& a, int count, Point* pts, uint32_t id) {
  for (int i = 0; i < count; ++i) {
    const double w = W(a, pts[i]);
    if (Mp::IsNearZero(w)) ThrowWIsZero(id);
    pts[i] = TransformAndDivide(a, pts[i], w);
  }
}

template <class Matrix, class Point>
void TransformAndDivideFast(const Matrix& a, int count, Point* pts) {
  for (int i = 0; i < count; ++i) pts[i] = TransformAndDivide(a, pts[i], W(a, pts[i]));
}

template <class Matrix>
Matrix& Add(Matrix& a, const Matrix& b) {
  for (int i = 0; i < Mp::kSize<Matrix>; ++i) {
    for (int j = 0; j < Mp::kSize<Matrix>; ++j) a.m[i][j] += b.m[i][j];
  }
  return a;
}

template <class Matrix>
Matrix& Subtract(Matrix& a, const Matrix& b) {
  for (int i = 0; i < Mp::kSize<Matrix>; ++i) {
    for (int j = 0; j < Mp::kSize<Matrix>; ++j) a.m[i][j] -= b.m[i][j];
  }
  return a;
}

// The inline members, so that the library has them for those who look them up by name.
[[gnu::used]] constexpr void (M_Matrix3::*kTranspose3)() = &M_Matrix3::Transpose;
[[gnu::used]] constexpr void (M_Matrix4::*kTranspose4)() = &M_Matrix4::Transpose;
[[gnu::used]] constexpr void (M_Matrix3::*kDropZ)(const M_Matrix4&) =
    &M_Matrix3::AssignFromByDroppingZ;

}  // namespace

template <>
void M_Vector4T<double>::Normalize() {
  // A warning only.
  if (!Mp::IsNearZero(w)) Report(Mp_ID_NORMALIZE, Mp_STR_NORMALIZE_HOMOGENEOUS);
  const double square = z * z + (y * y + x * x);
  if (Mp::IsNearZero(square)) {
    Report(Mp_ID_NORMALIZE, Mp_STR_ZERO_VECTOR);
    throw int{M_ERR_ZERO_VECTOR};
  }
  const double r = 1.0 / std::sqrt(square);
  x *= r;
  y *= r;
  z *= r;
}

void M_Matrix3::TransformPointAndDivide(M_Vector3T<double>* p) const {
  TransformAndDivideChecked(*this, 1, p, Mp_ID_TRANSFORM_POINT3);
}

void M_Matrix3::TransformPointsAndDivide(int count, M_Vector3T<double>* pts) const {
  TransformAndDivideChecked(*this, count, pts, Mp_ID_TRANSFORM_POINTS3);
}

void M_Matrix3::TransformPointAndDivideFast(M_Vector3T<double>* p) const {
  TransformAndDivideFast(*this, 1, p);
}

void M_Matrix3::TransformPointsAndDivideFast(int count, M_Vector3T<double>* pts) const {
  TransformAndDivideFast(*this, count, pts);
}

bool M_Matrix3::IsZeroWithinEpsilon(double eps) const {
  return Mp::IsEqualWithin(*this, M_Matrix3{}, eps);
}

bool M_Matrix3::IsIdentityWithinEpsilon(double eps) const {
  return Mp::IsEqualWithin(*this, Mp::kIdentity3, eps);
}

double M_Matrix3::Determinant() const {
  const auto row = [this](int i) { return M_Vector3T<double>{m[i][0], m[i][1], m[i][2]}; };
  return Mp::Dot(row(0), Mp::Cross(row(1), row(2)));
}

void M_Matrix3::Adjoint() {
  const auto& a = m;
  *this = {{{a[1][1] * a[2][2] - a[2][1] * a[1][2], a[0][2] * a[2][1] - a[2][2] * a[0][1],
             a[0][1] * a[1][2] - a[1][1] * a[0][2]},
            {a[1][2] * a[2][0] - a[2][2] * a[1][0], a[0][0] * a[2][2] - a[2][0] * a[0][2],
             a[0][2] * a[1][0] - a[1][2] * a[0][0]},
            {a[1][0] * a[2][1] - a[2][0] * a[1][1], a[0][1] * a[2][0] - a[2][1] * a[0][0],
             a[0][0] * a[1][1] - a[1][0] * a[0][1]}}};
}

M_Matrix3& M_Matrix3::operator+=(const M_Matrix3& other) { return Add(*this, other); }
M_Matrix3& M_Matrix3::operator-=(const M_Matrix3& other) { return Subtract(*this, other); }

void M_Matrix3::AssignFromByDroppingIndices(const M_Matrix4& m4, int row, int col) {
  for (int i = 0, from = 0; i < 3; ++i, ++from) {
    if (from == row) ++from;
    for (int j = 0, fromCol = 0; j < 3; ++j, ++fromCol) {
      if (fromCol == col) ++fromCol;
      m[i][j] = m4.m[from][fromCol];
    }
  }
}

void M_Matrix4::TransformPointAndDivide(M_Vector4T<double>* p) const {
  TransformAndDivideChecked(*this, 1, p, Mp_ID_TRANSFORM_POINT4);
}

void M_Matrix4::TransformPointsAndDivide(int count, M_Vector4T<double>* pts) const {
  TransformAndDivideChecked(*this, count, pts, Mp_ID_TRANSFORM_POINTS4);
}

void M_Matrix4::TransformPointAndDivideFast(M_Vector4T<double>* p) const {
  TransformAndDivideFast(*this, 1, p);
}

void M_Matrix4::TransformPointsAndDivideFast(int count, M_Vector4T<double>* pts) const {
  TransformAndDivideFast(*this, count, pts);
}

bool M_Matrix4::IsZeroWithinEpsilon(double eps) const {
  return Mp::IsEqualWithin(*this, M_Matrix4{}, eps);
}

bool M_Matrix4::IsIdentityWithinEpsilon(double eps) const {
  return Mp::IsEqualWithin(*this, Mp::kIdentity4, eps);
}

bool M_Matrix4::IsFinite() const {
  for (const auto& row : m) {
    for (const double element : row) {
      if (!std::isfinite(element)) return false;
    }
  }
  return true;
}

void M_Matrix4::Project(double d) {
  M_Matrix4 p = Mp::kIdentity4;
  p.m[2][3] = 1.0 / d;
  p.m[3][2] = -1.0;
  p.m[3][3] = 0.0;
  *this = Mp::Product(*this, p);
}

M_Matrix4& M_Matrix4::operator+=(const M_Matrix4& other) { return Add(*this, other); }
M_Matrix4& M_Matrix4::operator-=(const M_Matrix4& other) { return Subtract(*this, other); }
