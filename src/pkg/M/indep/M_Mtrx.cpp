// The functions on 3x3 and 4x4 matrices.

#include <algorithm>
#include <cmath>

#include "M_Matrix.h"
#include "Mp_Err.h"
#include "Mp_Lanes.h"
#include "Mp_Matrix.h"
#include "Mp_Out.h"
#include "Mp_Tolerance.h"
#include "Mp_Vector3.h"

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
// the identity, the inverse. Rows are in the order of their pivots, found without branches, which
// matrices of all kinds would mislead.
class Elimination {
 public:
  explicit Elimination(const M_Matrix3& m) {
    const double a = std::abs(m.m[0][0]);
    const double b = std::abs(m.m[1][0]);
    const double c = std::abs(m.m[2][0]);
    // The first pivot is the largest element of column 0, of equals the last.
    const int first = (2 - (b > c)) & -!((a > b) & (a > c));
    rowOf_[0] = first;
    rowOf_[1] = first == 0;
    rowOf_[2] = 2 - (first == 2);
    for (int i = 0; i < 3; ++i) {
      const auto &left = m.m[rowOf_[i]], &right = Mp::kIdentity3.m[rowOf_[i]];
      rows_[i] = {{Pair{left[0], left[1]}, Pair{left[2], right[0]}, Pair{right[1], right[2]}}};
    }
  }

  // A failure leaves dst half-way, its rows not yet in order.
  int32_t Invert(M_Matrix3* dst) {
    if (!Reduce(0)) return Fail(dst);
    ChooseSecond();
    if (!Reduce(1)) return Fail(dst);
    if (Reduce(2)) {
      for (int i = 0; i < 3; ++i) StoreRight(i, dst->m[i]);
    } else {
      // Kept on purpose: a zero last pivot is no failure, but for what it leaves.
      Fail(dst);
    }
    return 0;
  }

 private:
  using Pair = Mp::Lanes<2>::Doubles;
  using PairBits = Mp::Lanes<2>::Bits;
  // Of the left matrix and then of the right one.
  struct Row {
    Pair pairs[3];
  };

  static double Element(const Row& row, int column) { return row.pairs[column / 2][column % 2]; }

  // Makes a column 1 in the row of its number and 0 in the others; left of it nothing is looked at
  // any more. False, with nothing done, for a pivot that is too small.
  bool Reduce(int column) {
    Row& pivotRow = rows_[column];
    const double pivot = Element(pivotRow, column);
    if (-1e-20 < pivot && pivot < 1e-20) return false;
    const double r = 1.0 / pivot;
    for (Pair& pair : pivotRow.pairs) pair *= r;
    for (int i = 0; i < 3; ++i) {
      if (i == column) continue;
      const double factor = Element(rows_[i], column);
      for (int k = 0; k < 3; ++k) rows_[i].pairs[k] -= factor * pivotRow.pairs[k];
    }
    return true;
  }

  // The second pivot is the larger element of column 1 in the other rows, of equals the later.
  void ChooseSecond() {
    const bool isLater = !(std::abs(Element(rows_[1], 1)) > std::abs(Element(rows_[2], 1)));
    const PairBits mask = PairBits{} - isLater;
    for (int k = 0; k < 3; ++k) {
      Pair &p = rows_[1].pairs[k], &q = rows_[2].pairs[k];
      const auto pBits = reinterpret_cast<PairBits>(p), qBits = reinterpret_cast<PairBits>(q);
      const PairBits change = (pBits ^ qBits) & mask;
      p = reinterpret_cast<Pair>(pBits ^ change);
      q = reinterpret_cast<Pair>(qBits ^ change);
    }
    const int change = (rowOf_[1] ^ rowOf_[2]) & -isLater;
    rowOf_[1] ^= change;
    rowOf_[2] ^= change;
  }

  void StoreRight(int i, double* to) const {
    to[0] = rows_[i].pairs[1][1];
    Mp::Store(to + 1, rows_[i].pairs[2]);
  }

  int32_t Fail(M_Matrix3* dst) const {
    for (int i = 0; i < 3; ++i) StoreRight(i, dst->m[rowOf_[i]]);
    return M_ERR_NOT_INVERTIBLE;
  }

  Row rows_[3];
  int rowOf_[3];  // Of the given matrix.
};

// Four columns at once: the same source is compiled for the baseline and for AVX2.
using Row = Mp::Lanes<4>::Doubles;

// What is left of a row without column 0, 1, 2 and 3, each in its lane.
[[gnu::always_inline]] inline M_Vector3T<Row> WithoutEach(const double* row) {
  const auto r = Mp::Load<Row>(row);
  return {__builtin_shufflevector(r, r, 1, 0, 0, 0), __builtin_shufflevector(r, r, 2, 2, 1, 1),
          __builtin_shufflevector(r, r, 3, 3, 3, 2)};
}

// All minors: lane j of row i is the determinant without row i and column j. Two of the rows of
// minors share the cross product of their last two rows.
struct Minors {
  Row rows[4];

  [[gnu::always_inline]] explicit Minors(const M_Matrix4& m) {
    const auto row0 = WithoutEach(m.m[0]), row1 = WithoutEach(m.m[1]), row2 = WithoutEach(m.m[2]),
               row3 = WithoutEach(m.m[3]);
    const M_Vector3T<Row> lastTwo = Mp::Cross(row2, row3);
    rows[0] = Mp::Dot(row1, lastTwo);
    rows[1] = Mp::Dot(row0, lastTwo);
    rows[2] = Mp::Dot(row0, Mp::Cross(row1, row3));
    rows[3] = Mp::Dot(row0, Mp::Cross(row1, row2));
  }
};

// The determinant, by the minors of the first row.
[[gnu::always_inline]] inline double Expand(const double* row, const Row& minors) {
  const Row terms = Mp::Load<Row>(row) * minors;
  return terms[0] - terms[1] + terms[2] - terms[3];
}

[[gnu::always_inline]] inline double DeterminantInLanes(const M_Matrix4& m) {
  const M_Vector3T<Row> lastTwo = Mp::Cross(WithoutEach(m.m[2]), WithoutEach(m.m[3]));
  return Expand(m.m[0], Mp::Dot(WithoutEach(m.m[1]), lastTwo));
}

// The inverse or, where there is none, the adjugate. False then.
[[gnu::always_inline]] inline bool InvertInLanes(const M_Matrix4& src, M_Matrix4* dst) {
  const Minors minors(src);
  const double det = Expand(src.m[0], minors.rows[0]);
  const bool isSingular = std::abs(det) < 1e-16;
  // Divided by 1 the adjugate stays as it is.
  const double divisor = isSingular ? 1.0 : det;
  const auto& r = minors.rows;
  const Row even01 = __builtin_shufflevector(r[0], r[1], 0, 4, 2, 6);
  const Row odd01 = __builtin_shufflevector(r[0], r[1], 1, 5, 3, 7);
  const Row even23 = __builtin_shufflevector(r[2], r[3], 0, 4, 2, 6);
  const Row odd23 = __builtin_shufflevector(r[2], r[3], 1, 5, 3, 7);
  using Bits = Mp::Lanes<4>::Bits;
  constexpr uint64_t kMinus = uint64_t{1} << 63;
  const Bits evenSigns = {0, kMinus, 0, kMinus}, oddSigns = {kMinus, 0, kMinus, 0};
  const auto store = [&](int i, const Row& transposed, const Bits& signs)
      __attribute__((always_inline)) {
    Mp::Store(dst->m[i],
              reinterpret_cast<Row>(reinterpret_cast<Bits>(transposed) ^ signs) / divisor);
  };
  store(0, __builtin_shufflevector(even01, even23, 0, 1, 4, 5), evenSigns);
  store(1, __builtin_shufflevector(odd01, odd23, 0, 1, 4, 5), oddSigns);
  store(2, __builtin_shufflevector(even01, even23, 2, 3, 6, 7), evenSigns);
  store(3, __builtin_shufflevector(odd01, odd23, 2, 3, 6, 7), oddSigns);
  return !isSingular;
}

MP_TARGET_AVX2 double DeterminantWithAvx2(const M_Matrix4& m) { return DeterminantInLanes(m); }
MP_TARGET_AVX2 bool InvertWithAvx2(const M_Matrix4& src, M_Matrix4* dst) {
  return InvertInLanes(src, dst);
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
  const int32_t code = Elimination(*src).Invert(dst);
  Mp::Store(reportable, code != 0);
  return code;
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
  *det = Mp::HasAvx2() ? DeterminantWithAvx2(*m) : DeterminantInLanes(*m);
  if (minors) {
    const Minors all(*m);
    for (int i = 0; i < 4; ++i) Mp::Store(minors->m[i], all.rows[i]);
  }
  return 0;
}

int32_t M_GetMatrix4Determinant(const M_Matrix4* m, double* det) {
  return M_GetMatrix3DeterminantPlus(m, det, nullptr);
}

int32_t M_InverseMatrix4Quiet(const M_Matrix4* src, M_Matrix4* dst, bool* reportable) {
  const bool isInverted = Mp::HasAvx2() ? InvertWithAvx2(*src, dst) : InvertInLanes(*src, dst);
  Mp::Store(reportable, !isInverted);
  return isInverted ? 0 : M_ERR_NOT_INVERTIBLE;
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
