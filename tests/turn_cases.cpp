// Decomposition, rotations, quaternions, planes and lines.

#include "Mp_Decomp.h"
#include "SpaceText.h"

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

std::string Rotate4(Arguments& in) {
  auto m = ReadMatrix<M_Matrix4>(in);
  const auto axis = Read<V3>(in);
  const int32_t code = M_RotateMatrix4(&m, axis.x, axis.y, axis.z, in.Double());
  return Text(NearElements(m)).append(Outcome(code));
}

// From the identity and about the matrix's own axes.
std::string RotateXYZ(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix4>(in);
  const auto angles = Read<V3>(in);
  M_Matrix4 fixed = m, own = m, plus = m;
  const int32_t code = M_RotateMatrix4XYZ(&fixed, angles.x, angles.y, angles.z);
  EXPECT_EQ(M_RotateMatrix4XYZPlus(true, &plus, angles.x, angles.y, angles.z), code);
  EXPECT_EQ(ToText(plus), ToText(fixed));
  const int32_t codeOfOwn = M_RotateMatrix4XYZPlus(false, &own, angles.x, angles.y, angles.z);
  return Text(NearElements(fixed), NearElements(own)).append(Outcome(code | codeOfOwn));
}

std::string AxisAngle(Arguments& in) {
  const auto axis = Read<V3>(in);
  V3 angles = {9, 9, 9};
  const int32_t code = M_ConvertAxisAngleToOrderedXYZRotation(axis.x, axis.y, axis.z, in.Double(),
                                                              &angles.x, &angles.y, &angles.z);
  return Text(NearElements(angles)).append(Outcome(code));
}

std::string LookAt(Arguments& in) {
  const auto eye = Read<V3>(in), target = Read<V3>(in);
  return Text(NearElements(M_LookAtMatrix(eye, target, Read<V3>(in))));
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

std::string PlaneOfNormal(Arguments& in) {
  const auto point = Read<V3>(in), normal = Read<V3>(in);
  M_PlaneEq plane;
  const int32_t code = M_GetPlaneEquation2(&point, &normal, &plane);
  return Text(Elements(plane)).append(Outcome(code));
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

std::string Distance(Arguments& in) {
  const auto point = Read<V2>(in), a = Read<V2>(in), b = Read<V2>(in);
  unsigned char onSegment = 9;
  double distance = 99, other = 99;
  const int32_t code = M_PerpDistTo2DLine(&point, &a, &b, &onSegment, &distance) |
                       M_PerpDistTo2DLine(&point, &a, &b, nullptr, &other);
  EXPECT_EQ(distance, other);
  return Text(NumberText(distance), onSegment).append(Outcome(code));
}

std::string ClipToNearPlane(Arguments& in) {
  const auto p0 = Read<V3>(in), p1 = Read<V3>(in);
  std::string flags;
  const std::string crossing = InAnyPlace<V3>(p0, p1, [&](const V3* a, const V3* b, V3* out) {
    unsigned char clipped0 = 9, clipped1 = 9;
    const int32_t code = M_Clip3DLine(a, b, &clipped0, &clipped1, out);
    flags = Text(clipped0, clipped1);
    return code;
  });
  return flags + crossing;
}

std::string ClipToRect(Arguments& in) {
  const auto rect = Read<M_FloatRect>(in);
  auto p0 = Read<V2>(in), p1 = Read<V2>(in);
  unsigned char visible = 9;
  const int32_t code = M_ClipLine2Rect(&rect, &p0, &p1, &visible);
  return Text(visible, p0, p1).append(Outcome(code));
}

std::string Directions(Arguments& in) {
  const M_DirectionalComponents d = M_ComputeDirectionalComponents(ReadMatrix<M_Matrix3>(in));
  return Text(d.x, d.y);
}

// The bearing of a vector, and of a point about a rectangle whose centre is (0, 0).
std::string Bearing(Arguments& in) {
  const auto v = Read<V2>(in);
  const M_FloatRect rect = {-3, -7, 3, 7};
  double angle = 999;
  const int32_t code = M_Pt2Angle(&rect, &v, &angle);
  EXPECT_EQ(NearElements(angle), NearElements(M_VecToAngle(v)));
  const M_FloatRect moved = {rect.left + 4, rect.top - 8, rect.right + 12, rect.bottom - 24};
  const V2 point = {v.x + 8, v.y - 16};
  double movedAngle = 999;
  M_Pt2Angle(&moved, &point, &movedAngle);
  EXPECT_EQ(NumberText(movedAngle), NumberText(angle));
  return Text(NearElements(M_VecToAngle(v))).append(Outcome(code));
}

std::string TransformPoint(Arguments& in) {
  const auto c = Read<V2>(in);
  const double angle = in.Double();
  const auto p = Read<V2>(in);
  const M_Vector2T<float> centre = {static_cast<float>(c.x), static_cast<float>(c.y)};
  M_Vector2T<float> point = {static_cast<float>(p.x), static_cast<float>(p.y)}, own = centre;
  const int32_t code = M_TransformPtF(&centre, angle, &point) | M_TransformPtF(&own, angle, &own);
  EXPECT_TRUE(own.x == centre.x && own.y == centre.y);
  const auto near = [](float f) { return std::round(f * 1e4) / 1e4 + 0.0; };
  return Text(List(std::array{near(point.x), near(point.y)})).append(Outcome(code));
}

const Operation kOperations[] = {
    {"Decompose", Decompose},
    {"Correct3DDecompFor2D", Correct2D},
    {"RotateMatrix4", Rotate4},
    {"RotateMatrix4XYZ", RotateXYZ},
    {"ConvertAxisAngle", AxisAngle},
    {"LookAtMatrix", LookAt},
    {"QuatToMatrix4", FromQuaternion},
    {"Matrix4ToQuat", ToQuaternion},
    {"Slerp", Slerp},
    {"GetPlaneEquation", Plane},
    {"GetPlaneEquation2", PlaneOfNormal},
    {"RayIntersectPlane", RayAndPlane},
    {"PerpDistTo2DLine", Distance},
    {"Clip3DLine", ClipToNearPlane},
    {"ClipLine2Rect", ClipToRect},
    {"ComputeDirectionalComponents", Directions},
    {"Angle", Bearing},
    {"TransformPtF", TransformPoint},
};

}  // namespace
