#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix3 m, inverse;
  uint32_t type;
  M_SetIdentityMatrix(&m);
  M_RotateMatrix(&m, 30, 960, 540);
  M_GetMatrixType(&m, &type);
  std::printf("%d\n", type == M_MATRIX_AFFINE);  // -> 1
  if (M_InverseMatrix(&m, &inverse) != 0) return 1;
  M_ConcatMatrix(&m, &inverse);                                // inverse := inverse x m
  std::printf("%d\n", inverse.IsIdentityWithinEpsilon(1e-9));  // -> 1
}
