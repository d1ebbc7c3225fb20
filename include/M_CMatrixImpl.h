/// \file
/// M_CMatrixImpl.h: the inline parts of the matrix classes, those that only move numbers.
///
/// What calculates is in the library: compiled by a client it could be contracted, or reordered by
/// the client's flags, and give other bits.
#ifndef M_CMATRIX_IMPL_H
#define M_CMATRIX_IMPL_H

#include <utility>

#include "M_Matrix.h"

inline void M_Matrix3::Transpose() {
  std::swap(m[0][1], m[1][0]);
  std::swap(m[0][2], m[2][0]);
  std::swap(m[1][2], m[2][1]);
}

inline void M_Matrix3::AssignFromByDroppingZ(const M_Matrix4& m4) {
  *this = {{{m4.m[0][0], m4.m[0][1], m4.m[0][3]},
            {m4.m[1][0], m4.m[1][1], m4.m[1][3]},
            {m4.m[3][0], m4.m[3][1], m4.m[3][3]}}};
}

inline void M_Matrix4::Transpose() {
  for (int i = 0; i < 4; ++i) {
    for (int j = 0; j < i; ++j) std::swap(m[i][j], m[j][i]);
  }
}

#endif  // M_CMATRIX_IMPL_H
