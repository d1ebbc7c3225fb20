#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix4 m;
  M_IdentityMatrix4(&m);
  M_ScaleMatrix4(&m, 3, 3, 3);
  M_RotateMatrix4(&m, 0, 0, 1, 0.5);
  M_TranslateMatrix4(&m, 10, 20, 30);
  M_Matrix4Decomp parts;
  if (M_DecomposeMatrix4(&m, &parts, nullptr) != 0) return 1;
  std::printf("%g %g %g\n", parts.translate.x, parts.scale.x, parts.rotate.z);  // -> 10 3 0.5
}
