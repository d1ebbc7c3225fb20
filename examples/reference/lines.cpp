#include <cstdio>

#include "M_Matrix.h"

int main() {
  const M_Vector2T<double> p = {3, 4}, a = {0, 0}, b = {10, 0};
  unsigned char isBeside;
  double distance;
  M_PerpDistTo2DLine(&p, &a, &b, &isBeside, &distance);
  std::printf("%g %d\n", distance, isBeside);  // -> 4 1
}
