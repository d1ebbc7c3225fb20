#include <numbers>

#include "Law.h"

namespace {

constexpr double kPi = std::numbers::pi;

double Dot(const V3& a, const V3& b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
double Dot(const V4& a, const V4& b) {
  return Dot(V3{a.x, a.y, a.z}, V3{b.x, b.y, b.z}) + a.w * b.w;
}
V3 Cross(const V3& a, const V3& b) {
  return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}
V3 Row(const M_Matrix4& m, int i) { return {m.m[i][0], m.m[i][1], m.m[i][2]}; }
V3 Image(const M_Matrix4& m, V3 p) {
  M_Transform3DFloatPoints(&m, 1, &p);
  return p;
}
M_Matrix4 Identity() {
  M_Matrix4 m;
  M_IdentityMatrix4(&m);
  return m;
}
V3 DrawVector() { return {*operands::Reals(), *operands::Reals(), *operands::Reals()}; }
V4 DrawUnit() {
  V4 q = {*operands::Reals(), *operands::Reals(), *operands::Reals(), *operands::Reals()};
  const double length = std::sqrt(Dot(q, q));
  RC_PRE(length > 0.1);
  return {q.x / length, q.y / length, q.z / length, q.w / length};
}

// Along the axis a point stays, across it it turns from one side to the next.
TEST(MtrxRotate, AboutAnAxis) {
  Holds([](Real angle) {
    const V3 axis = DrawVector(), other = DrawVector(), across = Cross(axis, other);
    RC_PRE(Dot(across, across) > 1e-3);
    M_Matrix4 m = Identity();
    Equal(M_RotateMatrix4(&m, axis.x, axis.y, axis.z, angle), 0);
    Check(IsNear(Image(m, axis), axis));
    const double length = std::sqrt(Dot(axis, axis)), c = std::cos(angle),
                 s = std::sin(angle) / length;
    const V3 next = Cross(axis, across);
    Check(IsNear(Image(m, across), V3{c * across.x + s * next.x, c * across.y + s * next.y,
                                      c * across.z + s * next.z}));
    // Appended.
    const M_Matrix4 given = *operands::Of<M_Matrix4>();
    M_Matrix4 both = given, product;
    M_RotateMatrix4(&both, axis.x, axis.y, axis.z, angle);
    M_ConcatMatrix4(&given, &m, &product);
    Check(M_EqualMatrixWithinEpsilon(both, product, 0));
    double x, y, z;
    Equal(M_ConvertAxisAngleToOrderedXYZRotation(axis.x, axis.y, axis.z, angle, &x, &y, &z), 0);
    M_Matrix4 ordered = Identity();
    M_RotateMatrix4XYZ(&ordered, x, y, z);
    Check(M_EqualMatrixWithinEpsilon(ordered, m, 1e-5));
  });
  Holds([](const M_Matrix4& given) {
    const double length = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 1e-13, 2e-12));
    const bool isZero = std::abs(length) < 1e-12;
    M_Matrix4 m = given;
    Equal(M_RotateMatrix4(&m, 0, length, 0, 1), (isZero ? 3 : 0));
    Equal(host.Take(), (isZero ? Calls{"11002e 8 unable to build rotation matrix."} : Calls()));
    if (isZero) Equal(BitsOf(m), BitsOf(given));
    double x = 1, y = 2, z = 3;
    Equal(M_ConvertAxisAngleToOrderedXYZRotation(0, 0, length, 0.3, &x, &y, &z), (isZero ? 3 : 0));
    Check(x == 0 && y == 0 && IsNear(z, isZero ? 0 : length < 0 ? -0.3 : 0.3));
    host.Take();
  });
}

// Each about the direction that the earlier ones, or the matrix itself, have made of its axis.
TEST(MtrxRotate, AboutTurnedAxes) {
  Holds([](M_Matrix4 given, bool fromIdentity) {
    const double angles[] = {*operands::Reals(), *operands::Reals(), *operands::Reals()};
    for (auto& row : given.m) {
      for (double& element : row)
        element = std::isfinite(element) && std::abs(element) < 1e3 ? element : 0;
    }
    if (*operands::Of<Digit>() > 5) {  // An axis of nothing, or at the tolerance.
      const double least = *operands::Near(rc::gen::element(1e-12, 0.0, 2e-12));
      for (int j = 0; j < 3; ++j) given.m[1][j] = least;
      for (auto& row : given.m) row[3] = 0;
    }
    M_Matrix4 m = given, turned = fromIdentity ? Identity() : given;
    int32_t code = 0;
    for (int axis = 0; axis < 3 && code == 0; ++axis) {
      V4 d = {axis == 0 ? 1.0 : 0, axis == 1 ? 1.0 : 0, axis == 2 ? 1.0 : 0, 0};
      M_TransformVector4(&turned, 1, &d);
      const auto isNone = [](double c) { return -1e-12 < c && c < 1e-12; };
      if (isNone(d.x) && isNone(d.y) && isNone(d.z)) continue;
      code = M_RotateMatrix4(&turned, d.x, d.y, d.z, angles[axis]);
    }
    const Calls told = host.Take();
    if (fromIdentity) M_ConcatMatrix4(&given, &turned, &turned);
    Equal(M_RotateMatrix4XYZPlus(fromIdentity, &m, angles[0], angles[1], angles[2]), code);
    Check(host.Take() == told && BitsOf(m) == BitsOf(turned));
    if (fromIdentity)
      Check(M_RotateMatrix4XYZ(&(m = given), angles[0], angles[1], angles[2]) == 0 &&
            BitsOf(m) == BitsOf(turned));
  });
}

TEST(MtrxRotate, LookAtLooksAt) {
  Holds([] {
    const V3 eye = DrawVector(), target = DrawVector(), up = DrawVector();
    const V3 line = {target.x - eye.x, target.y - eye.y, target.z - eye.z}, side = Cross(up, line);
    const M_Matrix4 m = M_LookAtMatrix(eye, target, up);
    Check(m.m[3][0] == 0 && m.m[3][1] == 0 && m.m[3][2] == 0 && m.m[3][3] == 1);
    RC_PRE(Dot(side, side) > 1e-3);
    for (int i = 0; i < 9; ++i) Check(IsNear(Dot(Row(m, i / 3), Row(m, i % 3)), i / 3 == i % 3));
    Check(IsNear(Dot(Row(m, 2), line), std::sqrt(Dot(line, line))));
    Check(IsNear(Dot(Row(m, 0), side), std::sqrt(Dot(side, side))));
    Check(Dot(Row(m, 1), up) > 0 && IsNear(Cross(Row(m, 2), Row(m, 0)), Row(m, 1)));
  });
  // Along the line of sight, or nowhere. The quarter turn looks down where f.y is 0, too.
  const V3 o = {0, 0, 0};
  const auto quarter = [](double angle) {
    M_Matrix4 m = Identity();
    M_RotateMatrix4(&m, 1, 0, 0, angle);
    return m;
  };
  for (const V3& up : {V3{0, 1, 0}, V3{0, -2, 0}, o}) {
    EXPECT_EQ(BitsOf(M_LookAtMatrix(o, {0, 3, 0}, up)), BitsOf(quarter(-kPi / 2)));
    EXPECT_EQ(BitsOf(M_LookAtMatrix({0, 3, 0}, o, up)), BitsOf(quarter(kPi / 2)));
    EXPECT_EQ(BitsOf(M_LookAtMatrix(up, up, up)), BitsOf(Identity()));
  }
  EXPECT_EQ(BitsOf(M_LookAtMatrix(o, {2, 0, 0}, o)), BitsOf(quarter(-kPi / 2)));
  EXPECT_EQ(M_LookAtMatrix(o, {0, 0, 2}, {0, 1e-300, 0}).m[0][0], 1);
}

TEST(MtrxRotate, QuaternionsAndMatrices) {
  Holds([](Real size) {
    V4 q = DrawUnit();
    const int kind = *rc::gen::inRange(0, 4);
    if (kind == 1) q = {q.x < 0 ? -1.0 : 1, 0, 0, 0};
    if (kind == 2) q = {0, q.y < 0 ? -1.0 : 1, 0, 0};
    if (kind == 3) q = {0, 0, q.z < 0 ? -1.0 : 1, 0};
    M_Matrix4 m, rotation = Identity();
    Equal(M_QuatToMatrix4(&q.x, &m), 0);
    const double half = std::acos(std::clamp(q.w, -1.0, 1.0));
    if (std::sin(half) > 1e-3) {
      M_RotateMatrix4(&rotation, q.x, q.y, q.z, 2 * half);
      Check(M_EqualMatrixWithinEpsilon(m, rotation, 1e-9));
    }
    V4 back, scaled = {q.x * size, q.y * size, q.z * size, q.w * size};
    Equal(M_Matrix4ToQuat(&m, &back.x), 0);
    Check(IsNear(std::abs(Dot(q, back)), 1) && IsNear(Dot(back, back), 1));
    M_Matrix4 large, expected = m;
    M_QuatToMatrix4(&scaled.x, &large);
    M_ScaleMatrix4(&expected, size * size, size * size, size * size);
    Check(M_EqualMatrixWithinEpsilon(large, expected, 1e-9));
  });
  // The largest of the diagonal decides; x before y before z where they are equal.
  Holds([] {
    const auto d = rc::gen::element(0.0, 0.0, -0.25, -1.0, 0.25);
    const M_Matrix4 m = {{{*d, 1, 2, 9}, {3, *d, 4, 9}, {5, 6, *d, 9}, {9, 9, 9, 9}}};
    const auto& a = m.m;
    double q[4];
    M_Matrix4ToQuat(&m, q);
    const int i = a[2][2] > std::max(a[0][0], a[1][1]) ? 2 : a[1][1] > a[0][0], j = (i + 1) % 3,
              k = (j + 1) % 3;
    const double trace = a[0][0] + a[1][1] + a[2][2];
    const double r = trace > 0 ? trace + 1 : a[i][i] - a[j][j] - a[k][k] + 1;
    const double large = trace > 0 ? q[3] : q[i], f = 1 / (4 * large);
    Check(r < 0 ? std::isnan(large) : IsNear(4 * large * large, r));
    RC_PRE(r > 0);
    const V3 differences = {a[1][2] - a[2][1], a[2][0] - a[0][2], a[0][1] - a[1][0]};
    if (trace > 0)
      Check(IsNear(V3{q[0], q[1], q[2]},
                   V3{differences.x * f, differences.y * f, differences.z * f}));
    if (trace <= 0) {
      Check(IsNear(q[j], (a[i][j] + a[j][i]) * f) && IsNear(q[k], (a[i][k] + a[k][i]) * f));
      Check(IsNear(q[3], (a[j][k] - a[k][j]) * f));
    }
  });
}

TEST(MtrxRotate, SlerpKeepsTheSpeed) {
  Holds([](Digit tenth) {
    const V4 p = DrawUnit(), q = DrawUnit();
    const double t = (tenth + 9) / 18.0, whole = std::acos(std::min(1.0, std::abs(Dot(p, q))));
    V4 at;
    Equal(M_Slerp(&p.x, &q.x, &at.x, t), 0);
    RC_PRE(whole > 0.01);
    Check(IsNear(Dot(at, at), 1));
    Check(IsNear(std::acos(std::min(1.0, Dot(p, at))), t * whole, 1e-7L));
    Check(IsNear(std::acos(std::min(1.0, std::abs(Dot(q, at)))), (1 - t) * whole, 1e-7L));
  });
  // Nearly parallel, along the chord: from a distance in 1 - |p . q| of 1e-5, not included. Beyond
  // 0 ... 1 it goes on.
  Holds([](bool isOpposite, Digit step) {
    const double angle = (4.4721e-3 + step * 1e-6), t = *rc::gen::element(0.0, 0.25, 1.0, 2.0);
    const V4 p = {0, 0, 0, 1},
             q = {0, std::sin(angle), 0, isOpposite ? -std::cos(angle) : std::cos(angle)};
    V4 at;
    M_Slerp(&p.x, &q.x, &at.x, t);
    const bool isChord = !(1 - std::cos(angle) > 1e-5);
    const double length = isChord ? 1 - 2 * t * (1 - t) * (1 - std::cos(angle)) : 1;
    Check(IsNear(Dot(at, at), length, 1e-12L));
    Equal((at.y < 0), (isOpposite && t != 0));
  });
  // All four as good as equal: the first, whatever t is.
  Holds([](bool isNear) {
    const V4 p = DrawUnit();
    V4 q = p, at;
    double& part = (&q.x)[*rc::gen::inRange(0, 4)];
    const double limit = std::max(1e-12 * std::abs(part), 0x1.198p-40);
    part += (isNear ? 0.9 : 1.5) * limit;
    M_Slerp(&p.x, &q.x, &at.x, 1e6);
    Equal((BitsOf(at) == BitsOf(p)), isNear);
  });
}

}  // namespace
