/// \file
/// The layers of a composition on the screen, and what lies under a point of it.
#ifndef COMP_STAGE_H
#define COMP_STAGE_H

#include <cstddef>
#include <optional>
#include <string>
#include <vector>

#include "Composition.h"
#include "M_Matrix.h"
#include "M_Rect.h"
#include "Reports.h"
#include "Sheet.h"

namespace comp {

/// A layer on the screen.
struct Shape {
  const std::string* name;  ///< The layer's, in its composition.
  size_t number;            ///< In the list of layers, from 0.
  bool isInSpace;
  double depth;  ///< How far from the eye its middle is.
  bool isEdgeOn;
  std::vector<M_Vector2T<double>> outline;  ///< Of what lies behind the near plane.
  M_TransformPoly2D flat;
  M_TransformPoly3D solid;

  bool IsHit(const M_Vector2T<double>& p, double tolerance) const {
    return isInSpace ? solid.IsPointInside(&p, tolerance) : flat.IsPointInside(&p, tolerance);
  }
  double EdgeDistance(const M_Vector2T<double>& p) const {
    return isInSpace ? solid.GetMinimumEdgeDistance(&p) : flat.GetMinimumEdgeDistance(&p);
  }
};

/// The layers of a composition that has a size, from back to front: as the list has them, but
/// neighbours in space by their depth. As they are at a frame; without one all, at their first key.
/// The sheet is the composition's, which has to outlive them.
std::vector<Shape> MakeShapes(const Composition& composition, const Sheet& sheet,
                              std::optional<double> frame, ReportCollector& collector);

/// A layer under a point.
struct Hit {
  std::string name;
  size_t number;    ///< In the list of layers, from 0.
  double distance;  ///< From the nearest visible edge, in pixels.
};

/// The layers at most `tolerance` pixels beside a point, from front to back.
std::vector<Hit> HitsAt(const std::vector<Shape>& shapes, const M_Vector2T<double>& point,
                        double tolerance);

using Homogeneous = std::vector<M_Vector4T<double>>;

/// The ends of what is in a box of a layer that is seen from the side; nothing where that is
/// nothing, or not finite.
std::vector<M_Vector2T<double>> ClippedLine(const std::vector<M_Vector2T<double>>& outline,
                                            const M_FloatRect& box);

/// The part of an outline in a box; nothing where it is not finite.
Homogeneous Clipped(const std::vector<M_Vector2T<double>>& outline, const M_FloatRect& box);

}  // namespace comp

#endif  // COMP_STAGE_H
