#include <cstdio>

#include "M_Matrix.h"

int main() {
  // A quarter turn about z takes x to y.
  M_Matrix4 m;
  M_IdentityMatrix4(&m);
  M_RotateMatrix4(&m, 0, 0, 1, 1.5707963267948966);
  M_Vector3T<double> p = {1, 0, 0};
  M_Transform3DFloatPoints(&m, 1, &p);
  std::printf("%.3f %.3f %.3f\n", p.x, p.y, p.z);  // -> 0.000 1.000 0.000
}
