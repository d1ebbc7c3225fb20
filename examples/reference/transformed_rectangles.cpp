#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix3 m;
  M_SetIdentityMatrix(&m);
  M_RotateMatrix(&m, 90, 0, 0);
  M_FloatRect r = {0, 0, 4, 2};
  M_Vector2T<double> corners[4];
  unsigned char isBoundingBox;
  M_TransformFloatRect(&m, &r, corners, &isBoundingBox);
  std::printf("%.3g %.3g %.3g %.3g, %d\n", r.left, r.top, r.right, r.bottom,
              isBoundingBox);  // -> -2 0 2.45e-16 4, 1
}
