#include "Scene.h"

#include <algorithm>
#include <iterator>
#include <numbers>

#include "M_Rect.h"

namespace comp {
namespace {

constexpr double kDegree = std::numbers::pi / 180;

// What cannot be built, which the library reports, is no rotation.
M_Matrix4 ToMatrix(const Orientation& orientation) {
  const auto& v = orientation.values;
  M_Matrix4 m;
  M_IdentityMatrix4(&m);
  switch (orientation.kind) {
    case Orientation::Kind::kAngles:
      M_RotateMatrix4XYZ(&m, v[0] * kDegree, v[1] * kDegree, v[2] * kDegree);
      break;
    case Orientation::Kind::kAxis:
      M_RotateMatrix4(&m, v[0], v[1], v[2], v[3] * kDegree);
      break;
    case Orientation::Kind::kQuaternion:
      M_QuatToMatrix4(v.data(), &m);
      break;
  }
  return m;
}

std::array<double, 4> ToQuaternion(const Orientation& orientation) {
  if (orientation.kind == Orientation::Kind::kQuaternion) return orientation.values;
  const M_Matrix4 m = ToMatrix(orientation);
  std::array<double, 4> q;
  M_Matrix4ToQuat(&m, q.data());
  return q;
}

OrientationSample SampleAt(const std::vector<OrientationKey>& keys, double frame) {
  const auto isBefore = [](double f, const OrientationKey& key) { return f < key.frame; };
  auto after = std::upper_bound(keys.begin(), keys.end(), frame, isBefore);
  if (after == keys.end()) --after;
  const auto before = after == keys.begin() ? after : std::prev(after);
  OrientationSample sample = {frame, ToQuaternion(before->orientation), {}};
  if (before != after) {
    const auto next = ToQuaternion(after->orientation);
    const double t = (frame - before->frame) / (after->frame - before->frame);
    M_Slerp(sample.quaternion.data(), next.data(), sample.quaternion.data(), t);
  }
  M_Matrix4 m;
  M_QuatToMatrix4(sample.quaternion.data(), &m);
  M_Vector3T<double>& angles = sample.angles;
  M_GetOrderedXYZRotationFromMatrix(&m, &angles.x, &angles.y, &angles.z);
  angles = {angles.x / kDegree, angles.y / kDegree, angles.z / kDegree};
  return sample;
}

// The keys' whole time in four steps.
std::vector<OrientationSample> SampleAll(const std::vector<OrientationKey>& keys) {
  constexpr int kSteps = 4;
  std::vector<OrientationSample> samples;
  if (keys.empty()) return samples;
  const double start = keys.front().frame;
  const double duration = keys.back().frame - start;
  for (int i = 0; i <= kSteps; ++i) {
    samples.push_back(SampleAt(keys, start + duration * i / kSteps));
    if (duration == 0) break;
  }
  return samples;
}

}  // namespace

M_Matrix4 WorldMatrix(const SpacePlacement& placement, std::optional<double> frame) {
  M_Matrix4 m, rotation;
  if (placement.keys.empty()) {
    rotation = ToMatrix(placement.orientation);
  } else if (frame) {
    M_QuatToMatrix4(SampleAt(placement.keys, *frame).quaternion.data(), &rotation);
  } else {
    rotation = ToMatrix(placement.keys.front().orientation);
  }
  M_IdentityMatrix4(&m);
  M_TranslateMatrix4(&m, -placement.anchor.x, -placement.anchor.y, -placement.anchor.z);
  M_ScaleMatrix4(&m, placement.scale.x, placement.scale.y, placement.scale.z);
  M_ConcatMatrix4(&m, &rotation, &m);
  M_TranslateMatrix4(&m, placement.position.x, placement.position.y, placement.position.z);
  return m;
}

M_Matrix4 MakeView(const Camera& camera) {
  // Downwards is y here, so up is down to the library.
  M_Matrix4 orientation =
      M_LookAtMatrix(camera.eye, camera.target, {-camera.up.x, -camera.up.y, -camera.up.z});
  orientation.Transpose();
  M_Matrix4 view;
  M_IdentityMatrix4(&view);
  M_TranslateMatrix4(&view, -camera.eye.x, -camera.eye.y, -camera.eye.z);
  M_ConcatMatrix4(&view, &orientation, &view);
  return view;
}

SpaceLayer PlaceInSpace(const Layer& layer, const M_Matrix4& view, std::optional<double> frame) {
  const SpacePlacement& placement = *layer.space;
  SpaceLayer placed = {};
  placed.name = layer.name;
  placed.size = placement.size;
  placed.samples = SampleAll(placement.keys);
  placed.matrix = WorldMatrix(placement, frame);
  const M_Matrix4& m = placed.matrix;

  placed.isDecomposable = M_DecomposeMatrix4(&m, &placed.decomp, nullptr) == 0;
  M_Matrix4Decomp zyx;
  unsigned char hasFailed = 0;
  M_DecomposeMatrix4ZYX(&m, &zyx, &hasFailed);
  placed.anglesZYX = zyx.rotate;

  const double width = placed.size.width;
  const double height = placed.size.height;
  placed.corners = {{{0, 0, 0}, {width, 0, 0}, {width, height, 0}, {0, height, 0}}};
  M_Matrix4 toEye;
  M_ConcatMatrix4(&m, &view, &toEye);
  M_Transform3DFloatPoints(&toEye, 4, placed.corners.data());
  for (size_t i = 0; i < 4; ++i) {
    unsigned char isClipped, isNextClipped;
    M_Vector3T<double> crossing;
    M_Clip3DLine(&placed.corners[i], &placed.corners[(i + 1) % 4], &isClipped, &isNextClipped,
                 &crossing);
    if (isClipped != isNextClipped) placed.crossings.push_back(crossing);
  }
  return placed;
}

Scene MakeScene(const Composition& composition, ReportCollector& collector) {
  Scene scene = {*composition.camera, MakeView(*composition.camera), {}};
  for (const Layer& layer : composition.layers) {
    if (!layer.space) continue;
    collector.SetLayer(layer.name);
    scene.layers.push_back(PlaceInSpace(layer, scene.view, {}));
  }
  return scene;
}

}  // namespace comp
