// Quads on their way to the screen: an outline of at most eight points, which are all hit.

#include "Input.h"

void Run(Input& input) {
  const bool isUsual = input.Below(4) != 0;
  M_TransformPoly3D poly;
  for (Vector3& p : poly.points) p = isUsual ? input.Usual<Vector3>() : input.Any<Vector3>();
  const auto toEye = isUsual ? input.Usual<M_Matrix4>() : input.Any<M_Matrix4>();
  const auto toScreen = isUsual ? input.Usual<M_Matrix4>() : input.Any<M_Matrix4>();
  try {
    poly.TransformPointsToEye(toEye);
    poly.TransformPointsToScreen(toScreen);
    poly.InitPolyPoints();
    Require(poly.NumPolyPoints() <= 8 && poly.IsVisible() == (poly.NumPolyPoints() > 0));
    for (int i = 0; i < poly.NumPolyPoints(); ++i) {
      Vector2 p;
      poly.GetPolyPoint(i, &p);
      if (!std::isfinite(p.x) || !std::isfinite(p.y)) continue;
      Require(poly.IsPointInside(&p, 1.0));
    }
    const Vector2 p = input.Point();
    poly.GetMinimumEdgeDistance(&p);
  } catch (int) {
    // A point at the height of the eye.
  }
}
