#include <cstring>
#include <numeric>

#include "Law.h"

namespace {

// Whole numbers, for which sums of products are exact.
template <class Matrix>
rc::Gen<Matrix> Whole(int limit = 9) {
  constexpr size_t kSize = std::size(Matrix{}.m);
  using Elements = std::array<int, kSize * kSize>;
  return rc::gen::map(rc::gen::container<Elements>(rc::gen::inRange(-limit, limit + 1)),
                      [](const Elements& all) {
                        Matrix m;
                        for (size_t i = 0; i < all.size(); ++i) m.m[i / kSize][i % kSize] = all[i];
                        return m;
                      });
}

// By all permutations.
template <class Matrix>
double Determinant(const Matrix& m) {
  constexpr size_t kSize = std::size(Matrix{}.m);
  std::array<size_t, kSize> order;
  std::iota(order.begin(), order.end(), 0);
  double sum = 0;
  do {
    double product = 1;
    for (size_t i = 0; i < kSize; ++i) {
      product *= m.m[i][order[i]];
      for (size_t j = 0; j < i; ++j) product = order[j] > order[i] ? -product : product;
    }
    sum += product;
  } while (std::next_permutation(order.begin(), order.end()));
  return sum;
}

template <class Matrix>
bool IsSame(const Matrix& a, const Matrix& b) {
  return M_EqualMatrixWithinEpsilon(a, b, 0);
}

TEST(Mtrx, ProductsAreOneTransformAfterTheOther) {
  Holds([] {
    const M_Matrix3 a = *Whole<M_Matrix3>(), b = *Whole<M_Matrix3>();
    M_Matrix3 product = b;
    Equal(M_ConcatMatrix(&a, &product), 0);
    V3 twice = {*operands::Of<Digit>() * 1.0, 2, *operands::Of<Digit>() * 1.0}, once = twice;
    M_TransformVector3(&b, 1, &twice);
    M_TransformVector3(&a, 1, &twice);
    M_TransformVector3(&product, 1, &once);
    Check(once.x == twice.x && once.y == twice.y && once.z == twice.z);
    Equal(product.Determinant(), a.Determinant() * b.Determinant());

    const M_Matrix4 a4 = *Whole<M_Matrix4>(), b4 = *Whole<M_Matrix4>();
    M_Matrix4 product4, transposed;
    Equal(M_ConcatMatrix4(&a4, &b4, &product4), 0);
    V4 twice4 = {twice.x, 3, twice.z, -1}, once4 = twice4;
    M_TransformVector4NoDivide(&a4, 1, &twice4);
    M_TransformVector4NoDivide(&b4, 1, &twice4);
    M_TransformVector4NoDivide(&product4, 1, &once4);
    Check(once4.x == twice4.x && once4.y == twice4.y && once4.z == twice4.z && once4.w == twice4.w);
    Equal(M_TransposeMatrix4(&a4, &transposed), 0);
    for (int i = 0; i < 16; ++i) Equal(transposed.m[i / 4][i % 4], a4.m[i % 4][i / 4]);
  });
}

// Where a step takes a point, after where the matrix takes it.
TEST(Mtrx, StepsAreAppended) {
  Holds([](const std::array<Real, 5>& n) {
    const M_Matrix3 m = *Whole<M_Matrix3>();
    const M_Matrix4 m4 = *Whole<M_Matrix4>();
    const V3 p = {n[0], n[1], 1};
    const auto then = [&](const auto& append, const auto& step) {
      M_Matrix3 both = m;
      Equal(append(&both), 0);
      V3 q = p, r = p;
      M_TransformVector3(&m, 1, &q);
      M_TransformVector3(&both, 1, &r);
      const V2 moved = step(V2{q.x, q.y}, q.z);
      Check(IsNear(r, V3{moved.x, moved.y, q.z}));
    };
    // A coordinate of a step applies as often as z says.
    then([&](M_Matrix3* b) { return M_TranslateMatrix(b, n[2], n[3]); },
         [&](V2 q, double z) {
           return V2{q.x + n[2] * z, q.y + n[3] * z};
         });
    then([&](M_Matrix3* b) { return M_ScaleMatrix(b, n[2], n[3], n[4], n[0]); },
         [&](V2 q, double z) {
           return V2{(q.x - n[4] * z) * n[2] + n[4] * z, (q.y - n[0] * z) * n[3] + n[0] * z};
         });
    const double degrees = n[2] * 45, c = std::cos(degrees / 180 * std::acos(-1.0)),
                 s = std::sin(degrees / 180 * std::acos(-1.0));
    then([&](M_Matrix3* b) { return M_RotateMatrix(b, degrees, n[3], n[4]); },
         [&](V2 q, double z) {
           const double x = q.x - n[3] * z, y = q.y - n[4] * z;
           return V2{x * c - y * s + n[3] * z, x * s + y * c + n[4] * z};
         });
    const auto then4 = [&](const auto& append, const auto& step) {
      M_Matrix4 both = m4;
      Equal(append(&both), 0);
      V4 q = {n[0], n[1], n[2], 1}, r = q;
      M_TransformVector4NoDivide(&m4, 1, &q);
      M_TransformVector4NoDivide(&both, 1, &r);
      const V4 moved = step(q);
      Check(IsNear(V3{r.x, r.y, r.z}, V3{moved.x, moved.y, moved.z}) && r.w == q.w);
    };
    then4([&](M_Matrix4* b) { return M_TranslateMatrix4(b, n[2], n[3], n[4]); },
          [&](V4 q) {
            return V4{q.x + n[2] * q.w, q.y + n[3] * q.w, q.z + n[4] * q.w, 0};
          });
    then4([&](M_Matrix4* b) { return M_ScaleMatrix4(b, n[2], n[3], n[4]); },
          [&](V4 q) {
            return V4{q.x * n[2], q.y * n[3], q.z * n[4], 0};
          });
  });
  // Neutral arguments: rotation and scale leave a NaN beside an infinity alone, translation does
  // not.
  const M_Matrix3 odd = {{{kInf, 1, 2}, {3, 4, 5}, {6, 7, kInf}}};
  M_Matrix3 m = odd;
  EXPECT_EQ(
      M_RotateMatrix(&m, 0, 1, 2) | M_RotateMatrix(&m, -0.0, 1, 2) | M_ScaleMatrix(&m, 1, 1, 5, 6),
      0);
  EXPECT_EQ(BitsOf(m), BitsOf(odd));
  EXPECT_EQ(M_TranslateMatrix(&m, 0, 0), 0);
  EXPECT_TRUE(std::isnan(m.m[2][0]));
  M_ScaleMatrix(&(m = odd), 1, 2, 0, 0);
  EXPECT_EQ(m.m[1][1], 8);
  M_ScaleMatrix(&(m = odd), 2, 1, 0, 0);
  EXPECT_EQ(m.m[1][0], 6);
}

TEST(Mtrx, KindsAreTheFirstThatFits) {
  Holds([](const M_Matrix3& m) {
    const auto& a = m.m;
    const bool isMoved = a[2][0] != 0 || a[2][1] != 0, isScaled = a[0][0] != 1 || a[1][1] != 1;
    const bool isTurned = a[0][1] != 0 || a[1][0] != 0;
    const bool isPerspective = a[0][2] != 0 || a[1][2] != 0 || a[2][2] != 1;
    uint32_t type = 77;
    Equal(M_GetMatrixType(&m, &type), 0);
    Equal(type, (isPerspective ? 5 : isTurned ? 4 : isScaled ? 2 + isMoved : isMoved));
    const M_Matrix3 other = *operands::Of<M_Matrix3>();
    for (const M_Matrix3& b : {m, other}) {
      bool isEqual = true, equal = !isEqual;
      for (int i = 0; i < 9; ++i) isEqual &= m.m[i / 3][i % 3] == b.m[i / 3][i % 3];
      Check(M_EqualMatrix(&m, &b, &equal) == 0 && equal == isEqual);
    }
  });
  Holds([](const M_Matrix4& m) {
    M_Matrix4 b = m;
    double& element = b.m[*rc::gen::inRange(0, 4)][*rc::gen::inRange(0, 4)];
    if (*operands::Of<Digit>() > 0) element = *operands::Near(rc::gen::just(element));
    bool isEqual = true, equal = !isEqual;
    for (int i = 0; i < 16; ++i) isEqual &= m.m[i / 4][i % 4] == b.m[i / 4][i % 4];
    Check(M_EqualMatrix4(&m, &b, &equal) == 0 && equal == isEqual);
  });
}

TEST(Mtrx, BuiltMatrices) {
  M_Matrix3 i3 = {{{7}}};
  M_Matrix4 i4 = {{{7}}}, zero = i4;
  EXPECT_EQ(M_SetIdentityMatrix(&i3) | M_IdentityMatrix4(&i4) | M_ZeroMatrix4(&zero), 0);
  EXPECT_TRUE(i3.IsIdentityWithinEpsilon(0) && i4.IsIdentityWithinEpsilon(0) &&
              zero.IsZeroWithinEpsilon(0));
  Holds([](const V3& u, const V3& v, const V3& w, const M_Matrix3& m, Digit kind) {
    M_Matrix4 basis, wide, uniform;
    Equal(M_SetMatrix4CoB(&u, &v, &w, &basis), 0);
    const M_Matrix4 expected = {
        {{u.x, v.x, w.x, 0}, {u.y, v.y, w.y, 0}, {u.z, v.z, w.z, 0}, {0, 0, 0, 1}}};
    Equal(BitsOf(basis), BitsOf(expected));
    M_Matrix3 flat = m;
    const double s = m.m[0][0], c = m.m[0][1];
    // The same scale in both columns, up to about 1e-12 of its square.
    if (kind > 0) flat.m[1][0] = -c, flat.m[1][1] = s * (1 + kind * 1e-13);
    const auto& a = flat.m;
    Equal((M_Matrix3ToMatrix4(&flat, &wide) | M_Matrix3ToMatrix4Uniform(&flat, &uniform)), 0);
    const M_Matrix4 widened = {{{a[0][0], a[0][1], 0, 0},
                                {a[1][0], a[1][1], 0, 0},
                                {0, 0, 1, 0},
                                {a[2][0], a[2][1], 0, 1}}};
    Equal(BitsOf(wide), BitsOf(widened));
    const double x = a[0][0] * a[0][0] + a[1][0] * a[1][0],
                 y = a[0][1] * a[0][1] + a[1][1] * a[1][1];
    const bool isUniform = std::abs(x - y) < std::max(1e-12 * std::max(x, y), 0x1.198p-40);
    const double z = uniform.m[2][2];
    Equal(BitsOf(z), BitsOf(isUniform ? std::sqrt(x) : 1.0));
    uniform.m[2][2] = 1;
    Equal(BitsOf(uniform), BitsOf(widened));
  });
}

TEST(Mtrx, DeterminantsAndAdjugates) {
  Holds([] {
    const M_Matrix3 m = *Whole<M_Matrix3>();
    Equal(m.Determinant(), Determinant(m));
    M_Matrix3 product = m;
    product.Adjoint();
    M_ConcatMatrix(&m, &product);
    for (int i = 0; i < 3; ++i) product.m[i][i] -= Determinant(m);
    Check(product.IsZeroWithinEpsilon(0));
    const M_Matrix4 m4 = *Whole<M_Matrix4>();
    double determinant;
    Check(M_GetMatrix4Determinant(&m4, &determinant) == 0 && determinant == Determinant(m4));
  });
}

// Of whole numbers a determinant is 0 or far from it, and the inverse no larger than the adjugate.
TEST(Mtrx, InversesUndo) {
  Holds([](bool isSingular) {
    M_Matrix3 m = *Whole<M_Matrix3>(2), inverse, product;
    if (isSingular) std::copy_n(m.m[0], 3, m.m[*rc::gen::inRange(1, 3)]);
    bool isReportable = true;
    if (Determinant(m) != 0) {
      Check(M_InverseMatrixQuiet(&m, &inverse, &isReportable) == 0 && !isReportable);
      M_ConcatMatrix(&m, &(product = inverse));
      Check(product.IsIdentityWithinEpsilon(1e-9));
      Check(M_InverseMatrix(&m, &product) == 0 && BitsOf(product) == BitsOf(inverse));
    }
    M_Matrix4 m4 = *Whole<M_Matrix4>(2), inverse4, product4, normal, adjugate;
    if (isSingular) std::copy_n(m4.m[2], 4, m4.m[1]);
    const double determinant = Determinant(m4);
    isReportable = determinant != 0;
    const int32_t code = determinant == 0 ? M_ERR_NOT_INVERTIBLE : 0;
    const Calls told = code ? Calls{"11002d 8 unable to invert matrix."} : Calls();
    Equal(M_InverseMatrix4Quiet(&m4, &inverse4, &isReportable), code);
    Check(isReportable == (code != 0) && host.Take().empty());
    M_ConcatMatrix4(&m4, &inverse4, &product4);
    // After a failure, the adjugate.
    if (code)
      for (int i = 0; i < 4; ++i) product4.m[i][i] += 1;
    Check(product4.IsIdentityWithinEpsilon(1e-9));
    for (int i = 0; i < 4; ++i) {
      for (int j = 0; j < 4; ++j) {
        M_Matrix3 minor;
        minor.AssignFromByDroppingIndices(m4, j, i);
        adjugate.m[i][j] = ((i + j) % 2 ? -1 : 1) * Determinant(minor);
        Equal(inverse4.m[i][j], adjugate.m[i][j] / (code ? 1 : determinant));
      }
    }
    Check(M_InverseMatrix4(&m4, &product4) == code && host.Take() == told);
    Check(IsSame(product4, inverse4));
    M_TransposeMatrix4(&inverse4, &product4);
    isReportable = code == 0;
    Check(M_CalcNormalMatrix4Quiet(&m4, &normal, &isReportable) == code &&
          isReportable == (code != 0));
    Check(IsSame(normal, product4) && host.Take().empty());
    Check(M_CalcNormalMatrix4(&m4, &normal) == code && host.Take() == told);
    Check(IsSame(normal, code ? inverse4 : product4));
  });
}

// The pivots decide by strict bounds, absolute ones; a third one that is too small is no failure.
TEST(Mtrx, SmallPivotsAndDeterminants) {
  Holds([](bool isNegative) {
    const double p =
        *operands::Near(rc::gen::element(1e-20, 3.0, 0.0, 1e-21)) * (isNegative ? -1 : 1);
    const bool isZero = -1e-20 < p && p < 1e-20;
    for (int at = 0; at < 3; ++at) {
      M_Matrix3 m = {{{1, 0, 0}, {0, 1, 0}, {0, 0, 1}}}, inverse;
      m.m[at][at] = p;
      bool isReportable = false;
      const int32_t code = isZero && at < 2 ? M_ERR_NOT_INVERTIBLE : 0;
      Check(M_InverseMatrixQuiet(&m, &inverse, &isReportable) == code &&
            isReportable == (code != 0));
      Check(host.Take().empty());
      if (!isZero) Check(IsNear(inverse.m[at][at] * p, 1));
      if (isZero) Check(inverse.IsIdentityWithinEpsilon(0));
      Equal(M_InverseMatrix(&m, &inverse), code);
      Equal(host.Take(), (code ? Calls{"110023 8 unable to invert matrix."} : Calls()));
    }
    const double determinant = *operands::Near(rc::gen::element(1e-16, -1e-16, 1e-15, 0.0));
    const M_Matrix4 m4 = {{{determinant, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};
    M_Matrix4 inverse4;
    Equal(M_InverseMatrix4Quiet(&m4, &inverse4, nullptr),
          (std::abs(determinant) < 1e-16 ? M_ERR_NOT_INVERTIBLE : 0));
  });
  // A NaN is not small.
  M_Matrix3 nan3 = {{{kNan, 0, 0}, {kNan, kNan, 0}, {kNan, kNan, kNan}}};
  M_Matrix4 nan4 = {{{kNan}}};
  EXPECT_EQ(
      M_InverseMatrixQuiet(&nan3, &nan3, nullptr) | M_InverseMatrix4Quiet(&nan4, &nan4, nullptr),
      0);
  // Of equal pivots the later row, which what is left half-way shows; there rows are not in order.
  const std::tuple<M_Matrix3, int32_t, M_Matrix3> rows[] = {
      {{{{1, 1, 0}, {1, 1, 0}, {1, 1, 5}}},
       M_ERR_NOT_INVERTIBLE,
       {{{1, 0, -1}, {0, 1, -1}, {0, 0, 1}}}},
      {{{{1, 1, 0}, {1, 1, 5}, {0, 0, 1}}},
       M_ERR_NOT_INVERTIBLE,
       {{{1, -1, 0}, {0, 1, 0}, {0, 0, 1}}}},
      {{{{2, 2, 1}, {1, 1, 0}, {1, 1, 5}}},
       M_ERR_NOT_INVERTIBLE,
       {{{0.5, 0, 0}, {-0.5, 1, 0}, {-0.5, 0, 1}}}},
      {{{{1, 0, 0}, {0, 1, 0}, {0, 1, 0}}}, 0, {{{1, 0, 0}, {0, 1, -1}, {0, 0, 1}}}},
      {{{{1, 2, 0}, {0, 1, 0}, {4, 0, 0}}},
       0,
       {{{0.5, 0, -0.125}, {-0.5, 1, 0.125}, {0, 0, 0.25}}}}};
  for (const auto& [m, code, halfWay] : rows) {
    M_Matrix3 inverse;
    EXPECT_EQ(M_InverseMatrixQuiet(&m, &inverse, nullptr), code);
    EXPECT_TRUE(IsSame(inverse, halfWay)) << rc::toString(inverse);
  }
}

}  // namespace
