#include <cstdio>

#include "M_Matrix.h"

int main() {
  const std::vector<M_Vector2T<double>> points = {{0, 0}, {4, 0}, {2, 1}, {4, 4}, {0, 4}};
  std::vector<M_Vector2T<double>> hull;
  M_ComputeConvexHull(points.begin(), points.end(), hull);
  std::printf("%zu %d\n", hull.size(), M_IsConvex(hull.cbegin(), hull.cend()));  // -> 4 1
}
