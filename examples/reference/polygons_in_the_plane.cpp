#include <cstdio>

#include "M_Matrix.h"

int main() {
  const M_Vector2T<double> arrow[] = {{0, 0}, {10, 5}, {0, 10}, {4, 5}};
  const M_Vector2T<double> tip = {8, 5}, notch = {1, 5};
  unsigned char isTip, isNotch;
  M_IsFloatPointInConcavePoly(&tip, arrow, 4, 0.0, &isTip);
  M_IsFloatPointInConcavePoly(&notch, arrow, 4, 0.0, &isNotch);
  std::printf("%d %d\n", isTip, isNotch);                // -> 1 0
  std::printf("%g\n", M_SignedPolygonArea2D(arrow, 4));  // -> 30
}
