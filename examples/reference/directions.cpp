#include <cstdio>

#include "M_Matrix.h"

int main() {
  // Bearings: up is 360, right 90.
  std::printf("%g %g\n", M_VecToAngle({0, -1}), M_VecToAngle({1, 0}));  // -> 360 90
}
