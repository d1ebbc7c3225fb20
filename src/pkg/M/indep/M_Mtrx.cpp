// The functions on 3x3 and 4x4 matrices.

#include <algorithm>
#include <cmath>

#include "M_Matrix.h"
#include "Mp_Err.h"
#include "Mp_Matrix.h"
#include "Mp_Out.h"
#include "Mp_Tolerance.h"

namespace {

constexpr double kDegree = 0.017453292519943295;

template <class Matrix>
bool IsEqual(const Matrix& a, const Matrix& b) {
  bool isEqual = true;
  for (int i = 0; i < Mp::kSize<Matrix>; ++i) {
    for (int j = 0; j < Mp::kSize<Matrix>; ++j) isEqual &= a.m[i][j] == b.m[i][j];
  }
  return isEqual;
}

// What the Quiet form wants reported, reported.
int32_t ReportFailure(int16_t place, int32_t code, bool isReportable) {
  return isReportable ? Mp_ReportErr(place, code, 0) : code;
}

// Gauss-Jordan elimination: what makes the left matrix the identity makes the right one, which was
// the identity, the inverse. Rows are known when it is compiled, so that both matrices stay in
// registers.
class Elimination {
 public:
  [[gnu::always_inline]] explicit Elimination(const M_Matrix3& left)
      : left_(left), right_(Mp::kIdentity3) {}

  // The first pivot is the largest element of column 0, of equals the last.
  [[gnu::always_inline]] int32_t Invert(M_Matrix3* dst, bool* reportable) {
    const double a = std::abs(left_.m[0][0]);
    const double b = std::abs(left_.m[1][0]);
    const double c = std::abs(left_.m[2][0]);
    if (a > b && a > c) return InvertFrom<0, 1, 2>(dst, reportable);
    if (b > c) return InvertFrom<1, 0, 2>(dst, reportable);
    return InvertFrom<2, 0, 1>(dst, reportable);
  }

 private:
  // The second pivot is the larger element of column 1 in the other rows, of equals the later.
  template <int kFirst, int kRow, int kLaterRow>
  [[gnu::always_inline]] int32_t InvertFrom(M_Matrix3* dst, bool* reportable) {
    if (!Reduce<0, kFirst, kRow, kLaterRow>()) return Fail(dst, reportable);
    return std::abs(left_.m[kRow][1]) > std::abs(left_.m[kLaterRow][1])
               ? InvertFromSecond<kFirst, kRow, kLaterRow>(dst, reportable)
               : InvertFromSecond<kFirst, kLaterRow, kRow>(dst, reportable);
  }

  template <int kFirst, int kSecond, int kThird>
  [[gnu::always_inline]] int32_t InvertFromSecond(M_Matrix3* dst, bool* reportable) {
    if (!Reduce<1, kSecond, kFirst, kThird>()) return Fail(dst, reportable);
    if (Reduce<2, kThird, kFirst, kSecond>()) {
      const auto& a = right_.m;
      *dst = {{{a[kFirst][0], a[kFirst][1], a[kFirst][2]},
               {a[kSecond][0], a[kSecond][1], a[kSecond][2]},
               {a[kThird][0], a[kThird][1], a[kThird][2]}}};
    } else {
      // Kept on purpose: a zero last pivot is no failure. The result is 0 and dst stays half-way,
      // its rows not yet in order.
      *dst = right_;
    }
    return 0;
  }

  // Makes column c 1 in the pivot's row and 0 in the others. False, with nothing done, for a pivot
  // that is too small. Left of c nothing is looked at any more.
  template <int kColumn, int kPivot, int kOther1, int kOther2>
  [[gnu::always_inline]] bool Reduce() {
    const double pivot = left_.m[kPivot][kColumn];
    if (-1e-20 < pivot && pivot < 1e-20) return false;
    const double r = 1.0 / pivot;
    for (int j = kColumn + 1; j < 3; ++j) left_.m[kPivot][j] *= r;
    for (int j = 0; j < 3; ++j) right_.m[kPivot][j] *= r;
    Subtract<kColumn, kPivot, kOther1>();
    Subtract<kColumn, kPivot, kOther2>();
    return true;
  }

  // Whole rows on the right, zeros included.
  template <int kColumn, int kPivot, int kRow>
  [[gnu::always_inline]] void Subtract() {
    const double factor = left_.m[kRow][kColumn];
    for (int j = kColumn + 1; j < 3; ++j) left_.m[kRow][j] -= factor * left_.m[kPivot][j];
    for (int j = 0; j < 3; ++j) right_.m[kRow][j] -= factor * right_.m[kPivot][j];
  }

  [[gnu::always_inline]] int32_t Fail(M_Matrix3* dst, bool* reportable) const {
    *dst = right_;
    Mp::Store(reportable, true);
    return M_ERR_NOT_INVERTIBLE;
  }

  M_Matrix3 left_;
  M_Matrix3 right_;
};

void MinorsOfRow(const double* row0, const double* row1, const double* row2, double* minors) {
  minors[0] = Mp::Determinant(row0, row1, row2, 1, 2, 3);
  minors[1] = Mp::Determinant(row0, row1, row2, 0, 2, 3);
  minors[2] = Mp::Determinant(row0, row1, row2, 0, 1, 3);
  minors[3] = Mp::Determinant(row0, row1, row2, 0, 1, 2);
}

}  // namespace

bool M_EqualMatrixWithinEpsilon(const M_Matrix3& a, const M_Matrix3& b, double eps) {
  return Mp::IsEqualWithin(a, b, eps);
}

bool M_EqualMatrixWithinEpsilon(const M_Matrix4& a, const M_Matrix4& b, double eps) {
  return Mp::IsEqualWithin(a, b, eps);
}

extern "C" {

// ---------------------------------------------------------------------------------------------
// 3x3
// ---------------------------------------------------------------------------------------------

int32_t M_EqualMatrix(const M_Matrix3* a, const M_Matrix3* b, bool* equal) {
  *equal = IsEqual(*a, *b);
  return 0;
}

int32_t M_SetIdentityMatrix(M_Matrix3* m) {
  *m = Mp::kIdentity3;
  return 0;
}

int32_t M_TranslateMatrix(M_Matrix3* m, double tx, double ty) {
  const M_Matrix3 translation = {{{1, 0, 0}, {0, 1, 0}, {tx, ty, 1}}};
  return M_ConcatMatrix(&translation, m);
}

int32_t M_RotateMatrix(M_Matrix3* m, double degrees, double cx, double cy) {
  if (degrees == 0.0) return 0;
  const double angle = degrees * kDegree;
  const double s = std::sin(angle);
  const double c = std::cos(angle);
  const M_Matrix3 rotation = {
      {{c, s, 0}, {-s, c, 0}, {(1 - c) * cx + s * cy, (1 - c) * cy - s * cx, 1}}};
  return M_ConcatMatrix(&rotation, m);
}

int32_t M_ScaleMatrix(M_Matrix3* m, double sx, double sy, double cx, double cy) {
  if (sx == 1.0 && sy == 1.0) return 0;
  const M_Matrix3 scale = {{{sx, 0, 0}, {0, sy, 0}, {cx * (1 - sx), cy * (1 - sy), 1}}};
  return M_ConcatMatrix(&scale, m);
}

int32_t M_ConcatMatrix(const M_Matrix3* a, M_Matrix3* b) {
  *b = Mp::Product(*b, *a);
  return 0;
}

int32_t M_GetMatrixType(const M_Matrix3* m, uint32_t* type) {
  const auto& a = m->m;
  const bool hasScale = a[0][0] != 1 || a[1][1] != 1;
  const bool hasTranslation = a[2][0] != 0 || a[2][1] != 0;
  if (a[0][2] != 0 || a[1][2] != 0 || a[2][2] != 1) {
    *type = M_MATRIX_PERSPECTIVE;
  } else if (a[0][1] != 0 || a[1][0] != 0) {
    *type = M_MATRIX_AFFINE;
  } else if (hasScale) {
    *type = hasTranslation ? M_MATRIX_SCALE_TRANSLATE : M_MATRIX_SCALE;
  } else {
    *type = hasTranslation ? M_MATRIX_TRANSLATE : M_MATRIX_IDENTITY;
  }
  return 0;
}

int32_t M_InverseMatrixQuiet(const M_Matrix3* src, M_Matrix3* dst, bool* reportable) {
  Mp::Store(reportable, false);
  return Elimination(*src).Invert(dst, reportable);
}

int32_t M_InverseMatrix(const M_Matrix3* src, M_Matrix3* dst) {
  bool isReportable;
  const int32_t code = M_InverseMatrixQuiet(src, dst, &isReportable);
  return ReportFailure(Mp_PLACE_INVERSE_MATRIX, code, isReportable);
}

// ---------------------------------------------------------------------------------------------
// 4x4
// ---------------------------------------------------------------------------------------------

int32_t M_EqualMatrix4(const M_Matrix4* a, const M_Matrix4* b, bool* equal) {
  *equal = IsEqual(*a, *b);
  return 0;
}

int32_t M_ZeroMatrix4(M_Matrix4* m) {
  *m = {};
  return 0;
}

int32_t M_IdentityMatrix4(M_Matrix4* m) {
  *m = Mp::kIdentity4;
  return 0;
}

int32_t M_SetMatrix4CoB(const M_Vector3T<double>* u, const M_Vector3T<double>* v,
                        const M_Vector3T<double>* w, M_Matrix4* m) {
  *m = {{{u->x, v->x, w->x, 0}, {u->y, v->y, w->y, 0}, {u->z, v->z, w->z, 0}, {0, 0, 0, 1}}};
  return 0;
}

int32_t M_ConcatMatrix4(const M_Matrix4* a, const M_Matrix4* b, M_Matrix4* out) {
  *out = Mp::Product(*a, *b);
  return 0;
}

int32_t M_TransposeMatrix4(const M_Matrix4* src, M_Matrix4* dst) {
  const auto& a = src->m;
  *dst = {{{a[0][0], a[1][0], a[2][0], a[3][0]},
           {a[0][1], a[1][1], a[2][1], a[3][1]},
           {a[0][2], a[1][2], a[2][2], a[3][2]},
           {a[0][3], a[1][3], a[2][3], a[3][3]}}};
  return 0;
}

int32_t M_GetMatrix3DeterminantPlus(const M_Matrix4* m, double* det, M_Matrix4* minors) {
  const auto& a = m->m;
  double first[4];
  MinorsOfRow(a[1], a[2], a[3], first);
  *det = a[0][0] * first[0] - a[0][1] * first[1] + a[0][2] * first[2] - a[0][3] * first[3];
  if (minors) {
    std::copy(first, first + 4, minors->m[0]);
    MinorsOfRow(a[0], a[2], a[3], minors->m[1]);
    MinorsOfRow(a[0], a[1], a[3], minors->m[2]);
    MinorsOfRow(a[0], a[1], a[2], minors->m[3]);
  }
  return 0;
}

int32_t M_GetMatrix4Determinant(const M_Matrix4* m, double* det) {
  return M_GetMatrix3DeterminantPlus(m, det, nullptr);
}

int32_t M_InverseMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable) {
  double det;
  M_Matrix4 minors;
  M_GetMatrix3DeterminantPlus(src, &det, &minors);
  const bool isSingular = std::abs(det) < 1e-16;
  // Divided by 1 the adjugate stays as it is.
  const double divisor = isSingular ? 1.0 : det;
  for (int i = 0; i < 4; ++i) {
    for (int j = 0; j < 4; ++j) {
      const double minor = minors.m[j][i];
      dst->m[i][j] = ((i + j) % 2 == 0 ? minor : -minor) / divisor;
    }
  }
  Mp::Store(reportable, isSingular);
  return isSingular ? M_ERR_NOT_INVERTIBLE : 0;
}

int32_t M_InverseMatrix4(const M_Matrix4* src, M_Matrix4* dst) {
  bool isReportable;
  const int32_t code = M_InverseMatrix4Quiet(src, dst, &isReportable);
  return ReportFailure(Mp_PLACE_MATRIX4, code, isReportable);
}

int32_t M_CalcNormalMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable) {
  const int32_t code = M_InverseMatrix4Quiet(src, dst, reportable);
  dst->Transpose();
  return code;
}

int32_t M_CalcNormalMatrix4(const M_Matrix4* src, M_Matrix4* dst) {
  // Kept on purpose: after a failure dst is not transposed, as it is by the Quiet form.
  const int32_t code = M_InverseMatrix4(src, dst);
  if (code == 0) dst->Transpose();
  return code;
}

int32_t M_TranslateMatrix4(M_Matrix4* m, double tx, double ty, double tz) {
  const M_Matrix4 translation = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {tx, ty, tz, 1}}};
  *m = Mp::Product(*m, translation);
  return 0;
}

int32_t M_ScaleMatrix4(M_Matrix4* m, double sx, double sy, double sz) {
  const M_Matrix4 scale = {{{sx, 0, 0, 0}, {0, sy, 0, 0}, {0, 0, sz, 0}, {0, 0, 0, 1}}};
  *m = Mp::Product(*m, scale);
  return 0;
}

int32_t M_Matrix3ToMatrix4(const M_Matrix3* m3, M_Matrix4* m4) {
  const auto& a = m3->m;
  *m4 = {
      {{a[0][0], a[0][1], 0, 0}, {a[1][0], a[1][1], 0, 0}, {0, 0, 1, 0}, {a[2][0], a[2][1], 0, 1}}};
  return 0;
}

int32_t M_Matrix3ToMatrix4Uniform(const M_Matrix3* m3, M_Matrix4* m4) {
  M_Matrix3ToMatrix4(m3, m4);
  const auto& a = m3->m;
  // The squared lengths of the columns.
  const double x = a[0][0] * a[0][0] + a[1][0] * a[1][0];
  const double y = a[0][1] * a[0][1] + a[1][1] * a[1][1];
  if (Mp::IsNearlyEqual(x, y)) m4->m[2][2] = std::sqrt(x);
  return 0;
}

}  // extern "C"
