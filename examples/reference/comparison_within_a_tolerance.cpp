#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix3 a, b;
  M_SetIdentityMatrix(&a);
  M_SetIdentityMatrix(&b);
  M_RotateMatrix(&b, 360, 0, 0);
  std::printf("%d %d\n", M_EqualMatrixWithinEpsilon(a, b, 0),
              M_EqualMatrixWithinEpsilon(a, b, 1e-12));  // -> 0 1
}
