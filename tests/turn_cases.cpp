// Decomposition, rotations, quaternions, planes and lines.

#include <numbers>

#include "Call.h"
#include "Mp_Decomp.h"

namespace {

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;

// What a failure leaves, reported and flagged.
std::string Decompose(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix4>(in);
  M_Matrix4Decomp xyz, zyx, flagged;
  std::memset(&xyz, 0x77, sizeof xyz);
  std::memset(&zyx, 0x77, sizeof zyx);
  unsigned char failed = 9;
  const int32_t code = M_DecomposeMatrix4(&m, &xyz, nullptr);
  const std::string outcome = Outcome(code);
  EXPECT_EQ(M_DecomposeMatrix4(&m, &flagged, &failed), code);
  EXPECT_EQ(failed, code == 0 ? 9 : 1);
  EXPECT_EQ(Elements(flagged), Elements(xyz));
  EXPECT_EQ(M_DecomposeMatrix4ZYX(&m, &zyx, &failed), code);
  EXPECT_EQ(Mp_DecomposeMatrix4(&m, &flagged, &failed, true), code);
  EXPECT_EQ(Elements(flagged), Elements(zyx));
  EXPECT_EQ(Outcome(0), "") << "a flagged failure is not reported";
  V3 angles = {9, 9, 9};
  EXPECT_EQ(M_GetOrderedXYZRotationFromMatrix(&m, &angles.x, &angles.y, &angles.z), code);
  EXPECT_EQ(Outcome(code), outcome);
  EXPECT_EQ(Elements(angles), Elements(xyz.rotate));
  const V3 zyxAngles = std::exchange(zyx.rotate, xyz.rotate);
  EXPECT_EQ(Elements(zyx), Elements(xyz));
  if (zyxAngles.z > 3.1415926) {
    EXPECT_EQ(zyxAngles.z, std::numbers::pi);
  }
  return Text(NearElements(xyz.translate), NearElements(xyz.scale), NearElements(xyz.shear),
              NearElements(xyz.rotate), NearElements(zyxAngles))
      .append(outcome);
}

std::string Correct2D(Arguments& in) {
  M_Matrix4Decomp d = {{1, 2, 3}, {4, 5, 6}, {7, 8, 9}, Read<V3>(in)};
  const int32_t code = M_Correct3DDecompFor2D(&d);
  EXPECT_EQ(Elements(d.translate) + Elements(d.shear), "1,2,37,8,9");
  return Text(Elements(d.rotate), Elements(d.scale)).append(Outcome(code));
}

std::string FromQuaternion(Arguments& in) {
  const auto q = Read<V4>(in);
  M_Matrix4 m;
  const int32_t code = M_QuatToMatrix4(&q.x, &m);
  return Text(m).append(Outcome(code));
}

std::string ToQuaternion(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix4>(in);
  V4 q;
  const int32_t code = M_Matrix4ToQuat(&m, &q.x);
  return Text(q).append(Outcome(code));
}

std::string Slerp(Arguments& in) {
  const auto a = Read<V4>(in), b = Read<V4>(in);
  const double t = in.Double();
  std::string exact;
  const auto call = [&](const V4* p, const V4* q, V4* out) {
    const int32_t code = M_Slerp(&p->x, &q->x, &out->x, t);
    if (std::memcmp(out, &a, sizeof a) == 0) exact = " q0";
    *out = {std::round(out->x * 1e9) / 1e9, std::round(out->y * 1e9) / 1e9,
            std::round(out->z * 1e9) / 1e9, std::round(out->w * 1e9) / 1e9};
    return code;
  };
  return InAnyPlace<V4>(a, b, call).append(exact);
}

std::string Plane(Arguments& in) {
  const std::vector<V3> points = ReadAll<V3>(in);
  M_PlaneEq plane, other;
  V3 centroid;
  const int32_t code =
      M_GetPlaneEquation(points.data(), static_cast<int32_t>(points.size()), &plane, &centroid) |
      M_GetPlaneEquation(points.data(), static_cast<int32_t>(points.size()), &other, nullptr);
  EXPECT_EQ(Elements(plane), Elements(other));
  return Text(Elements(plane), centroid).append(Outcome(code));
}

std::string RayAndPlane(Arguments& in) {
  const auto plane = Read<M_PlaneEq>(in);
  const int32_t forwardOnly = in.Int();
  const auto origin = Read<V3>(in), direction = Read<V3>(in);
  const M_Ray ray = {{origin.x, origin.y, origin.z, 7}, {direction.x, direction.y, direction.z, 7}};
  V3 hit, other;
  unsigned char behind = 9, ok = 9;
  EXPECT_EQ(M_RayIntersectPlane(&plane, forwardOnly, &ray, &other, &behind, &ok), 0);
  EXPECT_EQ(Outcome(0), "");
  const int32_t code = M_RayIntersectPlane(&plane, forwardOnly, &ray, &hit, nullptr, nullptr);
  EXPECT_EQ(ToText(hit), ToText(other));
  return Text(hit, behind, ok).append(Outcome(code));
}

constexpr CallOptions kNear = {.isNear = true};
constexpr CallOptions kFirstInOut = {.inOut = 1, .isNear = true};

const Operation kOperations[] = {
    {"Decompose", Decompose},
    {"Correct3DDecompFor2D", Correct2D},
    {"RotateMatrix4", Call<M_RotateMatrix4, kFirstInOut>},
    {"RotateMatrix4XYZ", Call<M_RotateMatrix4XYZ, kFirstInOut>},
    {"RotateMatrix4XYZPlus", Call<M_RotateMatrix4XYZPlus, CallOptions{.inOut = 2, .isNear = true}>},
    {"ConvertAxisAngle", Call<M_ConvertAxisAngleToOrderedXYZRotation, kNear>},
    {"LookAtMatrix", Call<M_LookAtMatrix, kNear>},
    {"QuatToMatrix4", FromQuaternion},
    {"Matrix4ToQuat", ToQuaternion},
    {"Slerp", Slerp},
    {"GetPlaneEquation", Plane},
    {"GetPlaneEquation2", Call<M_GetPlaneEquation2>},
    {"RayIntersectPlane", RayAndPlane},
    {"PerpDistTo2DLine", Call<M_PerpDistTo2DLine, CallOptions{.nullable = 8}>},
    {"Clip3DLine", Call<M_Clip3DLine>},
    {"ClipLine2Rect", Call<M_ClipLine2Rect, CallOptions{.inOut = 6}>},
    {"ComputeDirectionalComponents", Call<M_ComputeDirectionalComponents>},
    {"VecToAngle", Call<M_VecToAngle, kNear>},
    {"Pt2Angle", Call<M_Pt2Angle, kNear>},
    {"TransformPtF", Call<M_TransformPtF, CallOptions{.inOut = 4}>},
};

}  // namespace
