#include "Matrices.h"

namespace {

// Whole numbers, of which sums of products are exact.
rc::Gen<double> Whole(int limit = 9) {
  return rc::gen::cast<double>(rc::gen::inRange(-limit, limit + 1));
}

double Determinant(const M_Matrix3& m) { return Dot(Row(m, 0), Cross(Row(m, 1), Row(m, 2))); }

M_Matrix4 Adjugate(const M_Matrix4& m, double divisor = 1) {
  M_Matrix4 adjugate;
  for (int i = 0; i < 4; ++i) {
    for (int j = 0; j < 4; ++j) {
      M_Matrix3 minor;
      minor.AssignFromByDroppingIndices(m, j, i);
      adjugate.m[i][j] = ((i + j) % 2 ? -1 : 1) * Determinant(minor) / divisor;
    }
  }
  return adjugate;
}

TEST(Mtrx, ProductsAndDeterminants) {
  Holds([] {
    const auto a = Draw<M_Matrix3>(Whole()), b = Draw<M_Matrix3>(Whole());
    const double d = Determinant(a);
    M_Matrix3 product = b, adjugate = a;
    Equal(M_ConcatMatrix(&a, &product), 0);
    Equal(Numbers(product), Numbers(b * a));
    Equal(a.Determinant(), d);
    adjugate.Adjoint();
    Equal(Numbers(a * adjugate), Numbers(M_Matrix3{{{d, 0, 0}, {0, d, 0}, {0, 0, d}}}));

    const auto a4 = Draw<M_Matrix4>(Whole()), b4 = Draw<M_Matrix4>(Whole());
    M_Matrix4 product4, transposed;
    double determinant;
    Equal(M_ConcatMatrix4(&a4, &b4, &product4) | M_TransposeMatrix4(&a4, &transposed) |
              M_GetMatrix4Determinant(&a4, &determinant),
          0);
    Equal(Numbers(product4), Numbers(a4 * b4));
    Equal(determinant, (a4 * Adjugate(a4)).m[0][0]);
    for (int i = 0; i < 16; ++i) Equal(transposed.m[i / 4][i % 4], a4.m[i % 4][i / 4]);
  });
}

TEST(Mtrx, StepsAreAppended) {
  Holds([](Real x, Real y, Real z) {
    const auto m = Draw<M_Matrix3>(Whole());
    const auto m4 = Draw<M_Matrix4>(Whole());
    const auto c = Draw<V2>();
    const auto moved = [](double h, double v) {
      return M_Matrix3{{{1, 0, 0}, {0, 1, 0}, {h, v, 1}}};
    };
    const M_Matrix3 back = m * moved(-c.x, -c.y), forth = moved(c.x, c.y);
    const double angle = x / 4 * kPi, cosine = std::cos(angle), sine = std::sin(angle);
    const M_Matrix3 scale = {{{x, 0, 0}, {0, y, 0}, {0, 0, 1}}},
                    rotation = {{{cosine, sine, 0}, {-sine, cosine, 0}, {0, 0, 1}}};
    const M_Matrix4 move4 = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {x, y, z, 1}}},
                    scale4 = {{{x, 0, 0, 0}, {0, y, 0, 0}, {0, 0, z, 0}, {0, 0, 0, 1}}};
    M_Matrix3 translated = m, scaled = m, rotated = m;
    M_Matrix4 translated4 = m4, scaled4 = m4;
    Equal(M_TranslateMatrix(&translated, x, y) | M_ScaleMatrix(&scaled, x, y, c.x, c.y) |
              M_RotateMatrix(&rotated, x * 45, c.x, c.y) |
              M_TranslateMatrix4(&translated4, x, y, z) | M_ScaleMatrix4(&scaled4, x, y, z),
          0);
    Check(IsNear(translated, m * moved(x, y)) && IsNear(scaled, back * scale * forth));
    Check(IsNear(rotated, back * rotation * forth));
    Check(IsNear(translated4, m4 * move4) && IsNear(scaled4, m4 * scale4));
  });
  // Neutral arguments: rotation and scale leave a NaN beside an infinity alone, translation not.
  const M_Matrix3 odd = {{{kInf, 1, 2}, {3, 4, 5}, {6, 7, kInf}}};
  M_Matrix3 m = odd;
  EXPECT_EQ(M_RotateMatrix(&m, 0, 1, 2) | M_RotateMatrix(&m, -0.0, 1, 2), 0);
  EXPECT_EQ(M_ScaleMatrix(&m, 1, 1, 5, 6), 0);
  EXPECT_EQ(BitsOf(m), BitsOf(odd));
  EXPECT_EQ(M_TranslateMatrix(&m, 0, 0), 0);
  EXPECT_TRUE(std::isnan(m.m[2][0]));
  // None is what is as good as neutral.
  EXPECT_EQ(M_ScaleMatrix(&(m = odd), 1, 1 + 0x1p-52, 0, 0), 0);
  EXPECT_NE(m.m[1][1], 4);
  EXPECT_EQ(M_RotateMatrix(&(m = odd), 1e-13, 0, 0), 0);
  EXPECT_NE(m.m[1][1], 4);
}

TEST(Mtrx, KindsAndEquality) {
  Holds([](const M_Matrix3& m, const M_Matrix4& m4) {
    const auto& a = m.m;
    const bool isMoved = a[2][0] != 0 || a[2][1] != 0, isScaled = a[0][0] != 1 || a[1][1] != 1;
    const bool isTurned = a[0][1] != 0 || a[1][0] != 0;
    const bool isPerspective = a[0][2] != 0 || a[1][2] != 0 || a[2][2] != 1;
    uint32_t type = 77;
    Equal(M_GetMatrixType(&m, &type), 0);
    Equal(type, (isPerspective ? 5 : isTurned ? 4 : isScaled ? 2 + isMoved : isMoved));
    const auto testEquality = [](const auto& areEqual, const auto& first) {
      auto second = first;
      // A zero becomes a negative one.
      AnyElement(second) *= *rc::gen::element(1.0, -1.0, 1 + 0x1p-52);
      const bool expected = Numbers(first) == Numbers(second);
      bool equal = !expected;
      Check(areEqual(&first, &second, &equal) == 0 && equal == expected);
    };
    testEquality(M_EqualMatrix, m);
    testEquality(M_EqualMatrix4, m4);
  });
}

TEST(Mtrx, BuiltMatrices) {
  M_Matrix3 i3;
  M_Matrix4 i4, zero;
  EXPECT_EQ(M_SetIdentityMatrix(&i3) | M_IdentityMatrix4(&i4) | M_ZeroMatrix4(&zero), 0);
  EXPECT_EQ(BitsOf(i3), BitsOf(Identity<M_Matrix3>()));
  EXPECT_EQ(BitsOf(i4) + BitsOf(zero), BitsOf(Identity<M_Matrix4>()) + BitsOf(M_Matrix4{}));
  Holds([](const V3& u, const V3& v, const V3& w, M_Matrix3 flat, Digit kind) {
    auto& a = flat.m;
    // The same scale in both columns, up to about 1e-12 of its square.
    if (kind > 0) a[1][0] = -a[0][1], a[1][1] = a[0][0] * (1 + kind * 1e-13);
    M_Matrix4 basis, wide, uniform;
    Equal(M_SetMatrix4CoB(&u, &v, &w, &basis) | M_Matrix3ToMatrix4(&flat, &wide) |
              M_Matrix3ToMatrix4Uniform(&flat, &uniform),
          0);
    const M_Matrix4 columns = {
        {{u.x, v.x, w.x, 0}, {u.y, v.y, w.y, 0}, {u.z, v.z, w.z, 0}, {0, 0, 0, 1}}};
    Equal(BitsOf(basis), BitsOf(columns));
    M_Matrix4 expected = {{{a[0][0], a[0][1], 0, 0},
                           {a[1][0], a[1][1], 0, 0},
                           {0, 0, 1, 0},
                           {a[2][0], a[2][1], 0, 1}}};
    Equal(BitsOf(wide), BitsOf(expected));
    const double x = a[0][0] * a[0][0] + a[1][0] * a[1][0],
                 y = a[0][1] * a[0][1] + a[1][1] * a[1][1];
    if (std::abs(x - y) < std::max(1e-12 * std::max(x, y), 0x1.198p-40))
      expected.m[2][2] = std::sqrt(x);
    Equal(BitsOf(uniform), BitsOf(expected));
  });
}

// What the Quiet form gives and what the plain one does, which reports what the other wants to be.
template <class Matrix, class Quiet, class Plain>
std::pair<Matrix, Matrix> Both(Quiet quiet, Plain plain, const Matrix& m, bool fails) {
  const int32_t code = fails ? M_ERR_NOT_INVERTIBLE : 0;
  const std::string place = std::size(m.m) == 3 ? "110023" : "11002d";
  Matrix first, second;
  bool isReportable = !fails;
  Check(quiet(&m, &first, &isReportable) == code && isReportable == fails && host.Take().empty());
  Equal(plain(&m, &second), code);
  Equal(host.Take(), Calls(fails, place + " 8 unable to invert matrix."));
  return {first, second};
}
M_Matrix3 Inverse(const M_Matrix3& m, bool fails) {
  const auto [quiet, plain] = Both(M_InverseMatrixQuiet, M_InverseMatrix, m, fails);
  Equal(BitsOf(quiet), BitsOf(plain));
  return quiet;
}
M_Matrix4 Inverse(const M_Matrix4& m, bool fails) {
  const auto [inverse, plain] = Both(M_InverseMatrix4Quiet, M_InverseMatrix4, m, fails);
  const auto [normal, plainNormal] = Both(M_CalcNormalMatrix4Quiet, M_CalcNormalMatrix4, m, fails);
  M_Matrix4 transposed = inverse;
  transposed.Transpose();
  Equal(BitsOf(std::array{plain, normal, plainNormal}),
        BitsOf(std::array{inverse, transposed, fails ? inverse : transposed}));
  return inverse;
}

TEST(Mtrx, Inverses) {
  Holds([](bool isSingular) {
    // Of whole numbers a determinant is 0 or far from it.
    const auto m = Draw<M_Matrix3>(Whole(2));
    if (Determinant(m) != 0) Check(IsNear(m * Inverse(m, false), Identity<M_Matrix3>()));
    auto m4 = Draw<M_Matrix4>(Whole(2));
    if (isSingular) std::copy_n(m4.m[2], 4, m4.m[1]);
    const double determinant = (m4 * Adjugate(m4)).m[0][0];
    const M_Matrix4 expected = Adjugate(m4, determinant == 0 ? 1 : determinant);
    Equal(Numbers(Inverse(m4, determinant == 0)), Numbers(expected));

    // The pivots decide by strict bounds, absolute ones; a third that is too small is no failure.
    const double p = *operands::Near(rc::gen::element(1e-20, -1e-20, 3.0, 0.0, 1e-21));
    const bool isZero = std::abs(p) < 1e-20;
    for (int at = 0; at < 3; ++at) {
      M_Matrix3 scale = Identity<M_Matrix3>(), inverse = scale;
      scale.m[at][at] = p;
      if (!isZero) inverse.m[at][at] = 1 / p;
      Check(IsNear(Inverse(scale, isZero && at < 2), inverse));
    }
    m4 = Identity<M_Matrix4>();
    m4.m[0][0] = *operands::Near(rc::gen::element(1e-16, -1e-16, 1e-15, 0.0, kNan));
    Inverse(m4, std::abs(m4.m[0][0]) < 1e-16);
    Inverse(M_Matrix3{{{kNan, 0, 0}, {kNan, kNan, 0}, {kNan, kNan, kNan}}}, false);
    // Of equal pivots the later row, which what is left half-way shows; its rows are not in order.
    const std::pair<M_Matrix3, M_Matrix3> rows[] = {
        {{{{1, 1, 0}, {1, 1, 0}, {1, 1, 5}}}, {{{1, 0, -1}, {0, 1, -1}, {0, 0, 1}}}},
        {{{{1, 0, 0}, {0, 1, 0}, {1, 1, 0}}}, {{{1, 1, -1}, {0, 1, 0}, {0, -1, 1}}}},
        {{{{1, 0, 0}, {1, 1, 0}, {0, 1, 0}}}, {{{1, -1, 1}, {0, 1, -1}, {0, 0, 1}}}},
        {{{{2, 0, 0}, {1, 1, 0}, {1, 1, 0}}}, {{{0.5, 0, 0}, {0, 1, -1}, {-0.5, 0, 1}}}}};
    for (const auto& [singular, halfWay] : rows)
      Equal(Numbers(Inverse(singular, singular.m[2][2] == 5)), Numbers(halfWay));
  });
}

}  // namespace
