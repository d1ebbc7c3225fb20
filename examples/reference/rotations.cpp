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

  // A camera 5 in front of the origin, upright on a screen whose y runs downwards.
  const M_Vector3T<double> eye = {0, 0, -5};
  M_Matrix4 orientation = M_LookAtMatrix(eye, {0, 0, 0}, {0, 1, 0});
  orientation.Transpose();
  M_Matrix4 toEye;
  M_IdentityMatrix4(&toEye);
  M_TranslateMatrix4(&toEye, -eye.x, -eye.y, -eye.z);
  M_ConcatMatrix4(&toEye, &orientation, &toEye);
  p = {1, 2, 0};
  M_Transform3DFloatPoints(&toEye, 1, &p);
  std::printf("%g %g %g\n", p.x, p.y, p.z);  // -> 1 2 5
}
