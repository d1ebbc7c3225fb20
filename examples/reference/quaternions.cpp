#include <cstdio>

#include "M_Matrix.h"

int main() {
  // Half-way between no rotation and a half turn about z.
  const double from[4] = {0, 0, 0, 1}, to[4] = {0, 0, 1, 0};
  double between[4];
  M_Slerp(from, to, between, 0.5);
  std::printf("%.4f %.4f\n", between[2], between[3]);  // -> 0.7071 0.7071
}
