#include "Matrices.h"

namespace {

constexpr auto kBoth = {M_DecomposeMatrix4, M_DecomposeMatrix4ZYX};

// There is one way to write a matrix as a lower triangular one and a rotation, but for signs.
TEST(MtrxDecomp, ComposesBack) {
  Holds([] {
    // A rotation, by quarter turns at times, scaled and sheared.
    const auto angle =
        rc::gen::oneOf(rc::gen::element(0.0, kPi / 2, -kPi / 2, kPi), operands::Reals());
    const auto scale = rc::gen::element(1.0, 2.0, -1.0, -3.0, 0.25);
    auto given = Identity<M_Matrix4>();
    M_ScaleMatrix4(&given, *scale, *scale, *scale);
    M_RotateMatrix4XYZ(&given, *angle, *angle, *angle);
    given = given + *rc::gen::element(0.0, 0.125) * Draw<M_Matrix4>();
    for (auto& row : given.m) row[3] = &row == given.m + 3;
    double determinant;
    M_GetMatrix4Determinant(&given, &determinant);
    RC_PRE(std::abs(determinant) > 1e-3 && Length(Row(given, 0)) > 1e-3);
    const double w = *rc::gen::element(1.0, 2.0, -0.5);
    const M_Matrix4 m = w * given;
    for (const auto decompose : kBoth) {
      M_Matrix4Decomp d;
      unsigned char failed = 7;
      Check(decompose(&m, &d, &failed) == 0 && failed == 7);
      Equal(Numbers(d.translate), Numbers(1 / w * Row(m, 3)));
      const double sign = determinant < 0 ? -1 : 1;
      Check(std::min({sign * d.scale.x, sign * d.scale.y, sign * d.scale.z}) > 0);
      const M_Matrix4 lower = {{{d.scale.x, 0, 0, 0},
                                {sign * d.shear.xy, d.scale.y, 0, 0},
                                {sign * d.shear.xz, sign * d.shear.yz, d.scale.z, 0}}};
      const M_Matrix4 x = Rotation({1, 0, 0}, d.rotate.x), y = Rotation({0, 1, 0}, d.rotate.y),
                      z = Rotation({0, 0, 1}, d.rotate.z);
      const bool isZyx = decompose == M_DecomposeMatrix4ZYX;
      const M_Matrix4 composed = lower * (isZyx ? x * y * z : z * y * x);
      // Close to a quarter turn little is left of the other two angles.
      const double cosine = std::abs(std::cos(d.rotate.y));
      RC_PRE(cosine > 1e-3 || cosine < 1e-9);
      for (int i = 0; i < 3; ++i) Check(IsNear(Row(composed, i), Row(given, i), 1e-6L));
      V3 angles = d.rotate;
      if (!isZyx) Equal(M_GetOrderedXYZRotationFromMatrix(&m, &angles.x, &angles.y, &angles.z), 0);
      Equal(BitsOf(angles), BitsOf(d.rotate));
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
    const Calls told(fails, "11002d 8 unable to decompose matrix.");
    for (const auto decompose : kBoth) {
      M_Matrix4Decomp d;
      std::fill_n(&d.translate.x, 12, 7);
      unsigned char failed = 7;
      Check(decompose(&m, &d, &failed) == code && failed == (fails ? 1 : 7) && host.Take().empty());
      if (fails) Equal(BitsOf(d), BitsOf(M_Matrix4Decomp{}));
      Check(decompose(&m, &d, nullptr) == code && host.Take() == told);
    }
    V3 angles = {1, 2, 3};
    Equal(M_GetOrderedXYZRotationFromMatrix(&m, &angles.x, &angles.y, &angles.z), code);
    Equal(host.Take(), told);
    if (fails) Equal(BitsOf(angles), BitsOf(V3{}));
  });
}

// Where the middle angle is a quarter turn, or as good as one, one of the others is 0.
TEST(MtrxDecomp, GimbalLock) {
  M_Matrix4Decomp d;
  Holds([&](Real any, bool isUp, Digit tilt, Digit slant) {
    const double a = slant > 5 ? any : slant * 2.5e-6;
    const double y = (isUp ? 1 : -1) * kPi / 2 + tilt * 2.5e-6;
    const bool isLocked = std::abs(tilt) < 4;  // Closer than 1e-5.
    RC_PRE(std::abs(tilt) != 4);
    auto m = Identity<M_Matrix4>();
    M_RotateMatrix4XYZ(&m, a, y, 0.5);
    M_DecomposeMatrix4(&m, &d, nullptr);
    Equal((d.rotate.x == 0), isLocked);
    Check(IsNear(std::cos(d.rotate.y), std::abs(std::cos(y))));
    m = Rotation({1, 0, 0}, a) * Rotation({0, 1, 0}, y);
    M_DecomposeMatrix4ZYX(&m, &d, nullptr);
    const bool isFlat = std::abs(m.m[2][1]) < 1e-5;
    if (isLocked) Check(isFlat == (d.rotate.x == 0) && (isFlat || d.rotate.z == 0));
    if (isLocked && isFlat) Check(d.rotate.z == 0 || d.rotate.z == kPi);
  });
  // As good as -1 is what is nearer than about 1e-12.
  for (const auto& [y, z] : {std::pair(-1 + 1.1e-12, 0.0), {-1 + 0.9e-12, kPi}}) {
    const M_Matrix4 m = {
        {{0, 0, -1, 0}, {std::sqrt(1 - y * y), y, 0, 0}, {-1, 0, 0, 0}, {0, 0, 0, 1}}};
    M_DecomposeMatrix4ZYX(&m, &d, nullptr);
    EXPECT_EQ(d.rotate.x, 0);
    EXPECT_EQ(d.rotate.z, z) << y;
  }
  // A zero row is no mirror.
  const M_Matrix4 flat = {{{0, 0, 0, 0}, {0, 2, 0, 0}, {0, 0, 2, 0}, {0, 0, 0, 1}}};
  EXPECT_EQ(M_DecomposeMatrix4(&flat, &d, nullptr), 0);
  EXPECT_EQ(BitsOf(d.scale), BitsOf(V3{0, 2, 2}));
  // A length that is so small that rounding makes a sine of more than 1 of it.
  for (const double t : {2.7e-162, -2.7e-162}) {
    const M_Matrix4 tiny = {{{0, 0, t, 0}, {0, 1, 0, 0}, {t, 0, 0, 0}, {0, 0, 0, 1}}};
    for (const auto decompose : kBoth) {
      decompose(&tiny, &d, nullptr);
      EXPECT_EQ(std::abs(d.rotate.y), kPi / 2);
    }
  }
}

TEST(MtrxDecomp, HalfTurnsBecomeFlips) {
  Holds([](M_Matrix4Decomp d) {
    const auto turn =
        rc::gen::element(kPi, -kPi, std::nextafter(kPi, 0.0), kPi + 1e-13, kPi - 1e-13, 0.0, 1.0);
    d.rotate = {*turn, *turn, *operands::Reals()};
    M_Matrix4Decomp expected = d;
    const auto isHalf = [](double radians) {
      return std::abs(std::abs(radians * 57.29577951308232) - 180) < 1e-12;
    };
    V3 &r = expected.rotate, &s = expected.scale;
    s = {isHalf(d.rotate.y) ? -s.x : s.x, isHalf(d.rotate.x) ? -s.y : s.y, 1};
    if (isHalf(d.rotate.x)) r = {0, -r.y, -r.z};
    if (isHalf(d.rotate.y)) r = {-r.x, 0, -r.z};
    Equal(M_Correct3DDecompFor2D(&d), 0);
    Equal(BitsOf(d), BitsOf(expected));
  });
}

}  // namespace
