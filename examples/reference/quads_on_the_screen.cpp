#include <cstdio>

#include "M_Matrix.h"

int main() {
  // A floor that reaches behind the camera, and a screen 1000 pixels from the eye.
  M_TransformPoly3D floor;
  const M_Vector3T<double> corners[4] = {
      {-50, 50, -100}, {50, 50, -100}, {50, 50, 1000}, {-50, 50, 1000}};
  for (int i = 0; i < 4; ++i) floor.points[i] = corners[i];
  M_Matrix4 toEye, toScreen = {{{1000, 0, 0, 0}, {0, 1000, 0, 0}, {0, 0, 1, 1}, {0, 0, 0, 0}}};
  M_IdentityMatrix4(&toEye);
  floor.TransformPointsToEye(toEye);
  floor.TransformPointsToScreen(toScreen);
  floor.InitPolyPoints();
  const M_Vector2T<double> mouse = {0, 80};
  std::printf("%d points, hit %d\n", floor.NumPolyPoints(),
              floor.IsPointInside(&mouse, 0.0));  // -> 4 points, hit 1
}
