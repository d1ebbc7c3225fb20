#include <cstdio>

#include "M_Matrix.h"

int main() {
  const M_Vector3T<double> square[] = {{0, 0, 5}, {1, 0, 5}, {1, 1, 5}, {0, 1, 5}};
  M_PlaneEq plane;
  M_GetPlaneEquation(square, 4, &plane, nullptr);
  const M_Ray ray = {{0.5, 0.5, 0, 1}, {0, 0, 1, 0}};
  M_Vector3T<double> hit;
  unsigned char isBehind, isHit;
  M_RayIntersectPlane(&plane, 0, &ray, &hit, &isBehind, &isHit);
  std::printf("%d %d: %g %g %g\n", isHit, isBehind, hit.x, hit.y, hit.z);  // -> 1 0: 0.5 0.5 5
}
