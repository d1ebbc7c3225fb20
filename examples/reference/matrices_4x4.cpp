#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix4 m;
  M_IdentityMatrix4(&m);
  M_ScaleMatrix4(&m, 2, 2, 2);
  M_TranslateMatrix4(&m, 0, 0, 500);
  double determinant;
  M_GetMatrix4Determinant(&m, &determinant);
  std::printf("%g %g\n", m.m[3][2], determinant);  // -> 500 8
}
