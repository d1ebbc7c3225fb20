#include <numbers>

#include "Law.h"

namespace {

constexpr double kPi = std::numbers::pi;

// A rotation, by quarter turns at times, scaled and sheared.
M_Matrix4 DrawAffine() {
  M_Matrix4 m;
  M_IdentityMatrix4(&m);
  const auto angle = rc::gen::oneOf(
      rc::gen::map(rc::gen::inRange(-4, 5), [](int i) { return i * kPi / 4; }), operands::Reals());
  const auto scale = rc::gen::element(1.0, 2.0, -1.0, -3.0, 0.25);
  M_ScaleMatrix4(&m, *scale, *scale, *scale);
  M_RotateMatrix4XYZ(&m, *angle, *angle, *angle);
  if (*rc::gen::arbitrary<bool>()) {
    for (auto& row : m.m) {
      for (int j = 0; j < 3; ++j) row[j] += *operands::Reals() / 8;
    }
  }
  M_TranslateMatrix4(&m, *operands::Reals(), *operands::Reals(), *operands::Reals());
  return m;
}

double Dot(const double* a, const double* b) { return a[0] * b[0] + a[1] * b[1] + a[2] * b[2]; }

TEST(MtrxDecomp, ComposesBack) {
  Holds([] {
    const M_Matrix4 given = DrawAffine();
    RC_PRE(std::abs(given.m[0][0]) + std::abs(given.m[0][1]) + std::abs(given.m[0][2]) > 1e-3);
    double determinant;
    M_GetMatrix4Determinant(&given, &determinant);
    RC_PRE(std::abs(determinant) > 1e-3);
    M_Matrix4 m = given;
    const double w = *rc::gen::element(1.0, 2.0, -0.5);
    for (auto& row : m.m) {
      for (double& element : row) element *= w;
    }
    for (const bool isZyx : {false, true}) {
      M_Matrix4Decomp d;
      unsigned char failed = 7;
      Check((isZyx ? M_DecomposeMatrix4ZYX : M_DecomposeMatrix4)(&m, &d, &failed) == 0 &&
            failed == 7);
      Check(d.translate.x == m.m[3][0] / w && d.translate.y == m.m[3][1] / w &&
            d.translate.z == m.m[3][2] / w);
      Check((d.scale.x < 0) == (determinant < 0) && (d.scale.y < 0) == (d.scale.x < 0) &&
            (d.scale.z < 0) == (d.scale.x < 0));
      // Of the first row the length, of the others what is not along those before.
      const double *r0 = given.m[0], *r1 = given.m[1], *r2 = given.m[2],
                   length = std::sqrt(Dot(r0, r0));
      Check(IsNear(std::abs(d.scale.x), length));
      Check(IsNear(d.shear.xy, Dot(r0, r1) / length) && IsNear(d.shear.xz, Dot(r0, r2) / length));
      Check(IsNear(d.shear.xy * d.shear.xy + d.scale.y * d.scale.y, Dot(r1, r1)));
      Check(IsNear(d.shear.xz * d.shear.xz + d.shear.yz * d.shear.yz + d.scale.z * d.scale.z,
                   Dot(r2, r2)));
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
      // Close to a quarter turn little is left of the other two angles.
      const double cosine = std::abs(std::cos(d.rotate.y));
      RC_PRE(cosine > 1e-3 || cosine < 1e-9);
      Check(M_EqualMatrixWithinEpsilon(composed, given, 1e-6));
      double x, y, z;
      if (isZyx) continue;
      Equal(M_GetOrderedXYZRotationFromMatrix(&m, &x, &y, &z), 0);
      Check(x == d.rotate.x && y == d.rotate.y && z == d.rotate.z);
    }
  });
}

TEST(MtrxDecomp, AnyPerspectiveFails) {
  Holds([](M_Matrix4 m) {
    double& w = m.m[3][3];
    if (*operands::Of<Digit>() > 0) w = *rc::gen::element(0.0, -0.0, kNan, 1.0, 1e-300, 2.0);
    for (int i = 0; i < 3; ++i) m.m[i][3] = *rc::gen::element(0.0, -0.0, 0.0, 0.0, 5e-324, 1e-300);
    bool fails = w == 0;
    for (int i = 0; i < 3; ++i) fails |= m.m[i][3] / w != 0;
    const int32_t code = fails ? M_ERR_NOT_DECOMPOSABLE : 0;
    const Calls told = fails ? Calls{"11002d 8 unable to decompose matrix."} : Calls();
    for (const auto decompose : {M_DecomposeMatrix4, M_DecomposeMatrix4ZYX}) {
      M_Matrix4Decomp d = {{1, 2, 3}, {4, 5, 6}, {7, 8, 9}, {1, 2, 3}};
      unsigned char failed = 7;
      Check(decompose(&m, &d, &failed) == code && failed == (fails ? 1 : 7) && host.Take().empty());
      if (fails) Equal(BitsOf(d), BitsOf(M_Matrix4Decomp{}));
      Check(decompose(&m, &d, nullptr) == code && host.Take() == told);
    }
    double x = 1, y = 2, z = 3;
    Check(M_GetOrderedXYZRotationFromMatrix(&m, &x, &y, &z) == code && host.Take() == told);
    if (fails) Check(x == 0 && y == 0 && z == 0);
  });
}

// Where the middle angle is a quarter turn, or as good as one, one of the others is 0.
TEST(MtrxDecomp, GimbalLock) {
  Holds([](Real a, bool isUp, Digit tilt) {
    const double quarter = (isUp ? 1 : -1) * kPi / 2, y = quarter + tilt * 2.5e-6;
    const bool isLocked = std::abs(tilt) * 2.5e-6 < 1e-5 - 1e-12;
    RC_PRE(std::abs(tilt) != 4);
    M_Matrix4 m;
    M_Matrix4Decomp d;
    M_IdentityMatrix4(&m);
    M_RotateMatrix4XYZ(&m, a, y, 0.5);
    M_DecomposeMatrix4(&m, &d, nullptr);
    Equal((d.rotate.x == 0), isLocked);
    Check(IsNear(std::cos(d.rotate.y), std::abs(std::cos(y)), 1e-9L));
    M_IdentityMatrix4(&m);
    M_RotateMatrix4(&m, 1, 0, 0, a);
    M_RotateMatrix4(&m, 0, 1, 0, y);
    M_DecomposeMatrix4ZYX(&m, &d, nullptr);
    const bool isFlat = std::abs(m.m[2][1]) < 1e-5;
    if (isLocked) Equal((isFlat ? d.rotate.x : d.rotate.z), 0);
    if (isLocked && isFlat) Check(d.rotate.z == 0 || d.rotate.z == kPi);
  });
  M_Matrix4Decomp d;
  M_Matrix4 m = {{{0, 0, -1, 0}, {0, -1, 0, 0}, {-1, 0, 0, 0}, {0, 0, 0, 1}}};
  M_DecomposeMatrix4ZYX(&m, &d, nullptr);
  EXPECT_EQ(d.rotate.z, kPi);
  // As good as -1 is what is nearer than about 1e-12.
  for (const auto& [y, z] : {std::pair(-1 + 1.1e-12, 0.0), {-1 + 0.9e-12, kPi}}) {
    m.m[1][0] = std::sqrt(1 - y * y), m.m[1][1] = y;
    m.m[0][1] = 0;
    M_DecomposeMatrix4ZYX(&m, &d, nullptr);
    EXPECT_EQ(d.rotate.x, 0);
    EXPECT_EQ(d.rotate.z, z) << y;
  }
  m = {{{0, 0, 0, 0}, {0, 2, 0, 0}, {0, 0, 2, 0}, {0, 0, 0, 1}}};
  EXPECT_EQ(M_DecomposeMatrix4(&m, &d, nullptr), 0);
  EXPECT_TRUE(d.scale.x == 0 && d.scale.y == 2 && d.scale.z == 2);
  // Lengths that are so small that rounding makes a sine of more than 1 of them.
  for (double tiny = 1e-162; tiny < 1e-160; tiny *= 1.1) {
    m = {{{0, 0, tiny, 0}, {0, 1, 0, 0}, {tiny, 0, 0, 0}, {0, 0, 0, 1}}};
    for (const auto decompose : {M_DecomposeMatrix4, M_DecomposeMatrix4ZYX}) {
      decompose(&m, &d, nullptr);
      ASSERT_FALSE(std::isnan(d.rotate.y)) << tiny;
    }
  }
  // A flip: all scales, and half a turn.
  m = {{{-1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};
  M_DecomposeMatrix4(&m, &d, nullptr);
  EXPECT_TRUE(d.scale.x == -1 && d.scale.y == -1 && d.scale.z == -1);
  EXPECT_TRUE(std::abs(d.rotate.x) == kPi && d.rotate.y == 0 && d.rotate.z == 0);
}

TEST(MtrxDecomp, HalfTurnsBecomeFlips) {
  Holds([](M_Matrix4Decomp d) {
    const auto turn =
        rc::gen::element(kPi, -kPi, std::nextafter(kPi, 0.0), kPi + 1e-13, kPi - 1e-13, 0.0, 1.0);
    d.rotate = {*turn, *turn, *operands::Reals()};
    const M_Matrix4Decomp given = d;
    const auto isHalf = [](double radians) {
      return std::abs(std::abs(radians * 57.29577951308232) - 180) < 1e-12;
    };
    const bool x = isHalf(given.rotate.x), y = isHalf(given.rotate.y);
    Equal(M_Correct3DDecompFor2D(&d), 0);
    M_Matrix4Decomp expected = given;
    if (x) expected.scale.y *= -1;
    if (y) expected.scale.x *= -1;
    expected.scale.z = 1;
    const auto& r = given.rotate;
    expected.rotate = {y   ? x ? -0.0 : -r.x
                       : x ? 0
                           : r.x,
                       y   ? 0
                       : x ? -r.y
                           : r.y,
                       x != y ? -r.z : r.z};
    Equal(BitsOf(d), BitsOf(expected));
  });
}

}  // namespace
