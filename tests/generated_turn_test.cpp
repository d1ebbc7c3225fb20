// Laws of decompositions, rotations, quaternions, planes and lines over generated operands.

#include <cmath>
#include <numbers>

#include "Generator.h"
#include "M_Matrix.h"
#include "TestHost.h"

namespace {

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;

class Turns : public HostTest {
 protected:
  double Uniform(double limit) { return generator_.Small(1 << 30) * limit / (1 << 30); }
  V3 Vector(double limit) { return {Uniform(limit), Uniform(limit), Uniform(limit)}; }

  V4 UnitQuaternion() {
    for (;;) {
      const V4 q = {Uniform(1), Uniform(1), Uniform(1), Uniform(1)};
      const double length = std::sqrt(q.x * q.x + q.y * q.y + q.z * q.z + q.w * q.w);
      if (length > 0.1) return {q.x / length, q.y / length, q.z / length, q.w / length};
    }
  }

  Generator generator_{11};
};

constexpr double kNear = 1e-9;

double Dot(const V3& a, const V3& b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
double Dot(const V4& a, const V4& b) {
  return Dot(V3{a.x, a.y, a.z}, V3{b.x, b.y, b.z}) + a.w * b.w;
}

bool IsOrthonormal(const M_Matrix4& m) {
  M_Matrix4 product = m;
  product.Transpose();
  M_ConcatMatrix4(&m, &product, &product);
  return product.IsIdentityWithinEpsilon(kNear);
}

TEST_F(Turns, DecompositionsComposeBack) {
  for (int round = 0; round < 5000; ++round) {
    M_Matrix4 m;
    const double w = generator_.OneOf({1.0, 2.0, -0.5});
    for (auto& row : m.m) {
      for (double& element : row) element = Uniform(3) * w;
      row[3] = 0;
    }
    m.m[3][3] = w;
    for (const bool isZyx : {false, true}) {
      M_Matrix4Decomp d;
      ASSERT_EQ((isZyx ? M_DecomposeMatrix4ZYX : M_DecomposeMatrix4)(&m, &d, nullptr), 0);
      const double sign = d.scale.x < 0 ? -1 : 1;
      M_Matrix4 composed = {{{d.scale.x, 0, 0, 0},
                             {sign * d.shear.xy, d.scale.y, 0, 0},
                             {sign * d.shear.xz, sign * d.shear.yz, d.scale.z, 0},
                             {0, 0, 0, 1}}};
      if (isZyx) {
        M_RotateMatrix4(&composed, 1, 0, 0, d.rotate.x);
        M_RotateMatrix4(&composed, 0, 1, 0, d.rotate.y);
        M_RotateMatrix4(&composed, 0, 0, 1, d.rotate.z);
      } else {
        M_RotateMatrix4XYZ(&composed, d.rotate.x, d.rotate.y, d.rotate.z);
      }
      M_TranslateMatrix4(&composed, d.translate.x, d.translate.y, d.translate.z);
      M_Matrix4 given = m;
      for (auto& row : given.m) {
        for (double& element : row) element /= w;
      }
      ASSERT_TRUE(M_EqualMatrixWithinEpsilon(composed, given, kNear));
    }
  }
}

TEST_F(Turns, QuaternionsMatricesAndAxesAgree) {
  for (int round = 0; round < 5000; ++round) {
    const V4 q = UnitQuaternion();
    M_Matrix4 m, rotation;
    M_QuatToMatrix4(&q.x, &m);
    ASSERT_TRUE(IsOrthonormal(m));
    M_IdentityMatrix4(&rotation);
    const double half = std::acos(q.w);
    if (std::sin(half) > 1e-3) {
      M_RotateMatrix4(&rotation, q.x, q.y, q.z, 2 * half);
      ASSERT_TRUE(M_EqualMatrixWithinEpsilon(m, rotation, kNear));
    }
    V4 back;
    M_Matrix4ToQuat(&m, &back.x);
    ASSERT_NEAR(std::abs(Dot(q, back)), 1, kNear);
    V3 angles;
    ASSERT_EQ(M_GetOrderedXYZRotationFromMatrix(&m, &angles.x, &angles.y, &angles.z), 0);
    M_IdentityMatrix4(&rotation);
    M_RotateMatrix4XYZ(&rotation, angles.x, angles.y, angles.z);
    ASSERT_TRUE(M_EqualMatrixWithinEpsilon(m, rotation, kNear));
  }
}

TEST_F(Turns, SlerpKeepsTheSpeed) {
  for (int round = 0; round < 5000; ++round) {
    const V4 p = UnitQuaternion(), q = UnitQuaternion();
    const double t = generator_.Below(1001) / 1000.0, whole = std::acos(std::abs(Dot(p, q)));
    V4 at, start, end;
    M_Slerp(&p.x, &q.x, &at.x, t);
    M_Slerp(&p.x, &q.x, &start.x, 0);
    M_Slerp(&p.x, &q.x, &end.x, 1);
    if (whole < 0.01) continue;
    ASSERT_NEAR(Dot(at, at), 1, kNear);
    ASSERT_NEAR(std::acos(std::min(1.0, Dot(p, at))), t * whole, 1e-7);
    ASSERT_NEAR(Dot(start, p), 1, kNear);
    ASSERT_NEAR(std::abs(Dot(end, q)), 1, kNear);
  }
}

TEST_F(Turns, LookAtLooksAt) {
  for (int round = 0; round < 5000; ++round) {
    const V3 eye = Vector(10), target = Vector(10), up = Vector(1);
    const V3 line = {target.x - eye.x, target.y - eye.y, target.z - eye.z};
    const M_Matrix4 m = M_LookAtMatrix(eye, target, up);
    ASSERT_TRUE(IsOrthonormal(m));
    const V3 upwards = {m.m[1][0], m.m[1][1], m.m[1][2]},
             forward = {m.m[2][0], m.m[2][1], m.m[2][2]};
    ASSERT_NEAR(Dot(forward, line), std::sqrt(Dot(line, line)), kNear);
    ASSERT_GE(Dot(upwards, up), -kNear);
  }
}

TEST_F(Turns, PlanesHoldTheirPointsAndHits) {
  for (int round = 0; round < 5000; ++round) {
    // A polygon of five in a plane through two vectors.
    const V3 a = Vector(3), u = Vector(2), v = Vector(2);
    V3 points[5];
    for (int i = 0; i < 5; ++i) {
      const double angle = i * 2 * std::numbers::pi / 5, c = std::cos(angle), s = std::sin(angle);
      points[i] = {a.x + c * u.x + s * v.x, a.y + c * u.y + s * v.y, a.z + c * u.z + s * v.z};
    }
    M_PlaneEq plane;
    V3 centroid;
    M_GetPlaneEquation(points, 5, &plane, &centroid);
    const V3 normal = {plane.a, plane.b, plane.c};
    ASSERT_NEAR(Dot(normal, normal), 1, kNear);
    for (const V3& p : points) ASSERT_NEAR(Dot(normal, p) + plane.d, 0, kNear);
    ASSERT_NEAR(Dot(centroid, centroid), Dot(a, a), kNear);

    const V3 o = Vector(5), d = Vector(1);
    const M_Ray ray = {{o.x, o.y, o.z, 0}, {d.x, d.y, d.z, 0}};
    if (std::abs(Dot(normal, d)) < 0.01) continue;
    V3 hit;
    unsigned char isBehind, isHit, isHitForward;
    M_RayIntersectPlane(&plane, 0, &ray, &hit, &isBehind, &isHit);
    M_RayIntersectPlane(&plane, 1, &ray, &hit, &isBehind, &isHitForward);
    ASSERT_NEAR(Dot(normal, hit) + plane.d, 0, kNear);
    ASSERT_TRUE(isHit && isHitForward != isBehind);
    ASSERT_EQ(Dot({hit.x - o.x, hit.y - o.y, hit.z - o.z}, d) < 0, isBehind);
  }
}

TEST_F(Turns, ClippedLinesStayOnTheLineAndInside) {
  const M_FloatRect rect = {-3, -2, 3, 2};
  int visibles = 0;
  for (int round = 0; round < 5000; ++round) {
    const V2 a = {Uniform(6), Uniform(6)}, b = {Uniform(6), Uniform(6)};
    V2 p = a, q = b;
    unsigned char isVisible, isOn;
    M_ClipLine2Rect(&rect, &p, &q, &isVisible);
    bool hasPointInside = false;
    for (int i = 0; i <= 500; ++i) {
      const double x = a.x + (b.x - a.x) * i / 500, y = a.y + (b.y - a.y) * i / 500;
      hasPointInside |= std::abs(x) < 3 && std::abs(y) < 2;
    }
    ASSERT_TRUE(isVisible || !hasPointInside);
    visibles += isVisible;
    for (const V2& end : {p, q}) {
      double distance;
      M_PerpDistTo2DLine(&end, &a, &b, &isOn, &distance);
      ASSERT_NEAR(distance, 0, 1e-6);
      ASSERT_TRUE(!isVisible || (std::abs(end.x) < 3 + kNear && std::abs(end.y) < 2 + kNear));
    }
    // Twice the triangle's area over its base.
    const V2 c = {Uniform(6), Uniform(6)};
    double distance;
    M_PerpDistTo2DLine(&c, &a, &b, nullptr, &distance);
    const double area = (b.x - a.x) * (c.y - a.y) - (b.y - a.y) * (c.x - a.x);
    ASSERT_NEAR(distance * std::hypot(b.x - a.x, b.y - a.y), std::abs(area), 1e-6);

    const V3 near = Vector(3), far = Vector(3);
    V3 crossing;
    unsigned char isClipped[2];
    M_Clip3DLine(&near, &far, &isClipped[0], &isClipped[1], &crossing);
    ASSERT_EQ(isClipped[0], near.z < 0.1);
    ASSERT_EQ(isClipped[1], far.z < 0.1);
    if (isClipped[0] == isClipped[1]) continue;
    const double t = (0.1 - near.z) / (far.z - near.z);
    ASSERT_NEAR(crossing.x, near.x + t * (far.x - near.x), kNear);
    ASSERT_NEAR(crossing.y, near.y + t * (far.y - near.y), kNear);
    ASSERT_NEAR(crossing.z, 0.1, kNear);
  }
  EXPECT_GT(visibles, 1000);
}

}  // namespace
