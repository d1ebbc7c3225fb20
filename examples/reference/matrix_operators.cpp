#include <array>
#include <iostream>

#include "M_Ops.h"

int main() {
  M_Matrix3 scale, move;
  M_SetIdentityMatrix(&scale);
  M_SetIdentityMatrix(&move);
  M_ScaleMatrix(&scale, 2, 2, 0, 0);
  M_TranslateMatrix(&move, 10, 0);
  // First twice as large, then to the right.
  const M_Matrix3 both = scale * move;
  std::array<M_Vector2T<double>, 2> points = {{{1, 1}, {3, 4}}};
  M_Transform(points, both);
  std::cout << points[1].x << ", " << points[1].y << '\n';  // -> 16, 8
  const M_Vector2T<double> back = points[1] * M_Inverse(both).value();
  std::cout << back.x << ", " << back.y << '\n';  // -> 3, 4
  const M_LRect bounds = M_LRect{0, 0, 100, 50} * both;
  std::cout << bounds.left << " to " << bounds.right << '\n';  // -> 10 to 210
  M_ScaleMatrix(&scale, 0, 1, 0, 0);
  std::cout << M_Inverse(scale).has_value() << '\n';  // -> 0
}
