/// \file
/// What the areas that deal in matrices share.
#ifndef MP_MATRIX_H
#define MP_MATRIX_H

#include <cmath>
#include <iterator>

#include "M_Matrix.h"

/// The determinant of m and, unless `minors` is null, all minors: element (i, j) is the determinant
/// of m without row i and column j, with no sign. Always 0. Not exported.
extern "C" int32_t M_GetMatrix3DeterminantPlus(const M_Matrix4* m, double* det, M_Matrix4* minors);

namespace Mp {

inline constexpr M_Matrix3 kIdentity3 = {{{1, 0, 0}, {0, 1, 0}, {0, 0, 1}}};
inline constexpr M_Matrix4 kIdentity4 = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};

/// Rows, and columns, of a type of matrix.
template <class Matrix>
inline constexpr int kSize = std::size(Matrix{}.m);

/// a x b.
template <class Matrix>
Matrix Product(const Matrix& a, const Matrix& b) {
  Matrix product;
  for (int i = 0; i < kSize<Matrix>; ++i) {
    for (int j = 0; j < kSize<Matrix>; ++j) {
      double sum = a.m[i][0] * b.m[0][j];
      for (int k = 1; k < kSize<Matrix>; ++k) sum += a.m[i][k] * b.m[k][j];
      product.m[i][j] = sum;
    }
  }
  return product;
}

/// Whether no element of a differs from b's by more than eps; a NaN does not.
template <class Matrix>
bool IsEqualWithin(const Matrix& a, const Matrix& b, double eps) {
  for (int i = 0; i < kSize<Matrix>; ++i) {
    for (int j = 0; j < kSize<Matrix>; ++j) {
      if (std::abs(a.m[i][j] - b.m[i][j]) > eps) return false;
    }
  }
  return true;
}

}  // namespace Mp

#endif  // MP_MATRIX_H
