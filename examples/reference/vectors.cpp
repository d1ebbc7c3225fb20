#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Vector4T<double> v = {3, 0, 4, 7};
  v.Normalize();
  std::printf("%g %g %g\n", v.x, v.y, v.z);  // -> 0.6 0 0.8
}
