#include "Matrices.h"

namespace {

template <class Vector>
Vector DrawUnit() {
  const auto v = Draw<Vector>();
  RC_PRE(Length(v) > 0.01);
  return 1 / Length(v) * v;
}
V4 AsPoint(const V3& v) { return {v.x, v.y, v.z, 1}; }

TEST(MtrxRotate, AboutAnAxis) {
  Holds([](Real angle) {
    const V3 unit = DrawUnit<V3>(), p = Draw<V3>();
    const auto [x, y, z] = *rc::gen::element(0.25, 1.0, 8.0) * unit;
    const double c = std::cos(angle), s = std::sin(angle);
    const M_Matrix4 m = Rotation({x, y, z}, angle);
    Check(IsNear(AsPoint(p) * m,
                 AsPoint(c * p + s * Cross(unit, p) + (1 - c) * Dot(unit, p) * unit)));
    auto appended = Draw<M_Matrix4>(), expected = appended * m, ordered = Identity<M_Matrix4>();
    M_RotateMatrix4(&appended, x, y, z, angle);
    Equal(Numbers(appended), Numbers(expected));
    V3 r;
    Equal(M_ConvertAxisAngleToOrderedXYZRotation(x, y, z, angle, &r.x, &r.y, &r.z), 0);
    M_RotateMatrix4XYZ(&ordered, r.x, r.y, r.z);
    Check(IsNear(ordered, m, 1e-5L));
  });
  Holds([](const M_Matrix4& given) {
    const double length = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 1e-13, 2e-12));
    const bool isZero = std::abs(length) < 1e-12;
    M_Matrix4 m = given;
    Equal(M_RotateMatrix4(&m, 0, length, 0, 1), (isZero ? 3 : 0));
    if (isZero) Equal(BitsOf(m), BitsOf(given));
    V3 r = {1, 2, 3};
    Equal(M_ConvertAxisAngleToOrderedXYZRotation(0, 0, length, 0.3, &r.x, &r.y, &r.z),
          (isZero ? 3 : 0));
    Check(IsNear(r, V3{0, 0, isZero ? 0 : std::copysign(0.3, length)}));
    Equal(host.Take(), Calls(isZero ? 2 : 0, "11002e 8 unable to build rotation matrix."));
  });
}

// Each about the direction that the earlier ones, or the matrix itself, have made of its axis.
TEST(MtrxRotate, AboutTurnedAxes) {
  Holds([](M_Matrix4 given, bool fromIdentity, bool isEdge, Real x, Real y, Real z) {
    if (isEdge) {  // An axis of nothing, or at the tolerance.
      const double least = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 2e-12));
      for (double& element : given.m[1]) element = *rc::gen::element(0.0, least);
      for (auto& row : given.m) row[3] = 0;
    }
    M_Matrix4 m = given, turned = fromIdentity ? Identity<M_Matrix4>() : given;
    const double angles[] = {x, y, z};
    for (int i = 0; i < 3; ++i) {
      V4 axis = {i == 0 ? 1.0 : 0, i == 1 ? 1.0 : 0, i == 2 ? 1.0 : 0, 0};
      M_TransformVector4(&turned, 1, &axis);
      const auto isNone = [](double c) { return std::abs(c) < 1e-12; };
      if (!isNone(axis.x) || !isNone(axis.y) || !isNone(axis.z))
        M_RotateMatrix4(&turned, axis.x, axis.y, axis.z, angles[i]);
    }
    if (fromIdentity) turned = given * turned;
    Check(M_RotateMatrix4XYZPlus(fromIdentity, &m, x, y, z) == 0 && host.Take().empty());
    Equal(BitsOf(m), BitsOf(turned));
    Equal(M_RotateMatrix4XYZ(&given, x, y, z), 0);
    if (fromIdentity) Equal(BitsOf(given), BitsOf(m));
  });
}

TEST(MtrxRotate, LookAtLooksAt) {
  Holds([] {
    const V3 eye = Draw<V3>(), target = Draw<V3>(), up = Draw<V3>();
    const V3 line = target - eye, side = Cross(up, line);
    const M_Matrix4 m = M_LookAtMatrix(eye, target, up);
    RC_PRE(Length(side) > 0.03);
    M_Matrix4 transposed = m;
    transposed.Transpose();
    Check(IsNear(m * transposed, Identity<M_Matrix4>()) && m.m[3][3] == 1);
    Check(IsNear(Length(line) * Row(m, 2), line) && IsNear(Length(side) * Row(m, 0), side));
    Check(Dot(Row(m, 1), up) > 0);
  });
  // Along the line of sight, or nowhere. The quarter turn looks down where f.y is 0, too.
  const V3 o = {0, 0, 0};
  const auto down = BitsOf(Rotation({1, 0, 0}, -kPi / 2));
  for (const V3& up : {V3{0, 1, 0}, V3{0, -2, 0}, o}) {
    EXPECT_EQ(BitsOf(M_LookAtMatrix(o, {0, 3, 0}, up)), down);
    EXPECT_EQ(BitsOf(M_LookAtMatrix({0, 3, 0}, o, up)), BitsOf(Rotation({1, 0, 0}, kPi / 2)));
    EXPECT_EQ(BitsOf(M_LookAtMatrix(up, up, up)), BitsOf(Identity<M_Matrix4>()));
  }
  EXPECT_EQ(BitsOf(M_LookAtMatrix(o, {2, 0, 0}, o)), down);
  EXPECT_EQ(M_LookAtMatrix(o, {0, 0, 2}, {0, 0x1p-400, 0}).m[1][1], 1);
}

TEST(MtrxRotate, QuaternionsAndMatrices) {
  Holds([](bool isSimple) {
    const V4 q = Draw<V4>();
    const V3 u = {q.x, q.y, q.z}, p = Draw<V3>();
    M_Matrix4 m;
    Equal(M_QuatToMatrix4(&q.x, &m), 0);
    // q p / q times its square, which is one of a unit.
    Check(IsNear(AsPoint(p) * m,
                 AsPoint((q.w * q.w - Dot(u, u)) * p + 2 * Dot(u, p) * u + 2 * q.w * Cross(u, p))));
    // And back: the largest of the diagonal decides the sign, x before y before z where they are
    // equal. The last row and column do not matter.
    const V4 unit = isSimple ? Draw<V4>(rc::gen::element(0.5, -0.5)) : DrawUnit<V4>();
    M_QuatToMatrix4(&unit.x, &m);
    const auto& a = m.m;
    const int largest = a[2][2] > std::max(a[0][0], a[1][1]) ? 2 : a[1][1] > a[0][0];
    const int deciding = a[0][0] + a[1][1] + a[2][2] > 0 ? 3 : largest;
    for (int i = 0; i < 4; ++i) m.m[i][3] = m.m[3][i] = 9;
    V4 back;
    Equal(M_Matrix4ToQuat(&m, &back.x), 0);
    Check(IsNear(back, ((&unit.x)[deciding] < 0 ? -1 : 1) * unit));
  });
}

TEST(MtrxRotate, SlerpKeepsTheSpeed) {
  Holds([](Real t, Digit step, bool isOpposite) {
    auto p = DrawUnit<V4>(), q = DrawUnit<V4>();
    if (step > 0) {  // Where the arc gives way to the chord.
      const double near = 4.4721e-3 + (step - 5) * 1e-6;
      p = {0, 0, 0, isOpposite ? -1.0 : 1};
      q = {0, std::sin(near), 0, std::cos(near)};
    }
    const double dot = Dot(p, q), angle = std::acos(std::abs(dot));
    const bool isArc = 1 - std::abs(dot) > 1e-5;
    RC_PRE(angle > 1e-6);
    const auto part = [&](double s) { return isArc ? std::sin(s * angle) / std::sin(angle) : s; };
    V4 at;
    Equal(M_Slerp(&p.x, &q.x, &at.x, t), 0);
    // The shorter way round, and beyond 0 ... 1 further.
    Check(IsNear(at, part(1 - t) * p + (dot < 0 ? -part(t) : part(t)) * q));
  });
  // At a right angle as given.
  const V4 first = {1, 0, 0, 0}, second = {0, 1, 0, 0};
  V4 middle;
  M_Slerp(&first.x, &second.x, &middle.x, 0.5);
  EXPECT_TRUE(middle.x > 0 && middle.y > 0);
  // All four as good as equal: the first, whatever t is.
  Holds([](bool isNear) {
    const auto p = DrawUnit<V4>();
    V4 q = p, at;
    double& part = (&q.x)[*rc::gen::inRange(0, 4)];
    part += (isNear ? 0.9 : 1.5) * std::max(1e-12 * std::abs(part), 0x1.198p-40);
    M_Slerp(&p.x, &q.x, &at.x, 1e6);
    Equal((BitsOf(at) == BitsOf(p)), isNear);
  });
}

}  // namespace
