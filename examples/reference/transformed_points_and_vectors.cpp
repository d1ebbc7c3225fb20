#include <cstdio>

#include "M_Matrix.h"

int main() {
  M_Matrix3 m;
  M_SetIdentityMatrix(&m);
  M_ScaleMatrix(&m, 2, 2, 0, 0);
  M_TranslateMatrix(&m, 100, 0);  // appended: it acts after the scale
  M_Vector2T<double> points[] = {{1, 1}, {2, 3}};
  M_TransformFloatPoints(&m, 2, points);
  std::printf("%g %g, %g %g\n", points[0].x, points[0].y, points[1].x,
              points[1].y);  // -> 102 2, 104 6
}
