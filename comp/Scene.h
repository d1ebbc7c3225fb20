/// \file
/// The layers of a composition that are placed in space, and the camera that looks at them.
#ifndef COMP_SCENE_H
#define COMP_SCENE_H

#include <array>
#include <cstdint>
#include <optional>
#include <string>
#include <vector>

#include "Composition.h"
#include "M_Matrix.h"
#include "Reports.h"

namespace comp {

/// An orientation between two keys, or at one.
struct OrientationSample {
  double frame;
  std::array<double, 4> quaternion;
  M_Vector3T<double> angles;  ///< Degrees, about x and then the turned y and z.
};

struct SpaceLayer {
  std::string name;
  Size size;
  M_Matrix4 matrix;     ///< From the layer to the world.
  bool isDecomposable;  ///< What follows is zero if it is not.
  M_Matrix4Decomp decomp;
  M_Vector3T<double> anglesZYX;               ///< Radians, in the other order.
  std::array<M_Vector3T<double>, 4> corners;  ///< As the eye sees them: right, down, away.
  std::vector<M_Vector3T<double>> crossings;  ///< Where edges pass through the near plane.
  std::vector<OrientationSample> samples;     ///< From the first key to the last.
};

struct Scene {
  Camera camera;
  M_Matrix4 view;  ///< From the world to the eye.
  std::vector<SpaceLayer> layers;
};

/// From a layer to the world, at a frame or, without one, at the first key.
M_Matrix4 WorldMatrix(const SpacePlacement& placement, std::optional<double> frame);

/// From the world to the eye, which is at the origin and looks along z.
M_Matrix4 MakeView(const Camera& camera);

/// A layer that is placed in space, at a frame or at its first key.
SpaceLayer PlaceInSpace(const Layer& layer, const M_Matrix4& view, std::optional<double> frame);

/// The scene of a composition with a size, at the first keys.
Scene MakeScene(const Composition& composition, ReportCollector& collector);

}  // namespace comp

#endif  // COMP_SCENE_H
