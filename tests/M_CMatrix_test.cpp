#include <cstring>

#include "Law.h"

namespace {

// Single points, and those of a batch up to the first that fails, which stay as they are.
template <class Matrix, class Point>
void TestDivision(const char* single, const char* batch) {
  Holds([=](Matrix m, std::array<Point, 3> points, Digit kind) {
    constexpr size_t kSize = std::size(Matrix{}.m);
    // w' is what x is multiplied by, at times at the tolerance or beside it.
    if (kind > 0) {
      for (auto& row : m.m) row[kSize - 1] = 0;
      m.m[0][kSize - 1] = 1;
      for (Point& p : points)
        p.x = *operands::Near(rc::gen::element(1e-12, -1e-12, 3.0, 0.0, 5e-13));
    }
    const auto w = [&](const Point& p) {
      double in[kSize], sum = 0;
      std::memcpy(in, &p, sizeof in);
      for (size_t i = 0; i < kSize; ++i) sum += in[i] * m.m[i][kSize - 1];
      return sum;
    };
    // -0.0 + 0.0 is 0.0, which the check of w does not tell apart.
    const auto fails = [&](const Point& p) { return -1e-12 < w(p) && w(p) < 1e-12; };
    std::array<Point, 3> fast = points, all = points, one = points;
    for (Point& p : fast) m.TransformPointAndDivideFast(&p);
    m.TransformPointsAndDivideFast(3, all.data());
    Equal(BitsOf(all), BitsOf(fast));
    // The quotient by w', as exact as a division or two can be.
    for (size_t i = 0; i < 3; ++i) {
      if (!std::isfinite(w(points[i])) || std::abs(w(points[i])) < 1e-9) continue;
      double in[kSize];
      std::memcpy(in, &points[i], sizeof in);
      long double x = 0, size = 0;
      for (size_t k = 0; k < kSize; ++k) {
        x += static_cast<long double>(in[k]) * m.m[k][1], size += std::abs(in[k] * m.m[k][1]);
      }
      const long double y = x / w(points[i]);
      if (!(size < 1e100)) continue;
      Check(std::abs(fast[i].y - y) <= 1e-13L * (size / std::abs(w(points[i])) + 1));
      double out[kSize];
      std::memcpy(out, &fast[i], sizeof out);
      Equal(out[kSize - 1], 1);
    }
    const size_t failing =
        static_cast<size_t>(std::find_if(points.begin(), points.end(), fails) - points.begin());
    const auto told = [&](const char* id, bool hasFailed) {
      return !hasFailed ? "0"
                        : std::string("4364 | ").append(id).append(" 8 homogeneous point has W=0");
    };
    all = points;
    Equal(Thrown([&] { m.TransformPointsAndDivide(3, all.data()); }), told(batch, failing < 3));
    std::copy(points.begin() + static_cast<int>(failing), points.end(),
              fast.begin() + static_cast<int>(failing));
    Equal(BitsOf(all), BitsOf(fast));
    for (size_t i = 0; i < 3; ++i) {
      Equal(Thrown([&] { m.TransformPointAndDivide(&one[i]); }), told(single, fails(points[i])));
      if (i <= failing) Equal(BitsOf(one[i]), BitsOf(fails(points[i]) ? points[i] : fast[i]));
    }
    m.TransformPointsAndDivide(0, nullptr);
    m.TransformPointsAndDivide(-1, nullptr);
  });
}

TEST(CMatrix, PointsAreDividedUnlessWIsZero) {
  TestDivision<M_Matrix3, V3>("110039", "11003a");
  TestDivision<M_Matrix4, V4>("11003b", "11003c");
  // One divides, the other multiplies by the reciprocal.
  const M_Matrix3 third = {{{1, 0, 0}, {0, 1, 0}, {0, 0, 49}}};
  const M_Matrix4 third4 = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 49}}};
  V3 p = {49, 0, 1};
  V4 q = {49, 0, 0, 1};
  third.TransformPointAndDivide(&p);
  third4.TransformPointAndDivide(&q);
  EXPECT_EQ(p.x, 1);
  EXPECT_EQ(q.x, 0x1.fffffffffffffp-1);
}

TEST(CMatrix, VectorsAreNormalized) {
  Holds([](V4 v, Digit kind) {
    if (kind > 0) v = {0, 0, *operands::Near(rc::gen::element(1e-6, -1e-6, 0.0, 2e-6)), v.w};
    if (kind > 5) v.w = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0));
    const V4 given = v;
    const double square = v.z * v.z + (v.y * v.y + v.x * v.x);
    const bool isZero = -1e-12 < square && square < 1e-12;
    std::string told = isZero ? "4363" : "0";
    if (!(-1e-12 < v.w && v.w < 1e-12))
      told += " | 110037 8 attempt to normalize a homegeneous point";
    if (isZero) told += " | 110037 8 cannot normalize zero vector";
    Equal(Thrown([&] { v.Normalize(); }), told);
    Equal(BitsOf(v.w), BitsOf(given.w));
    if (isZero) {
      Equal(BitsOf(v), BitsOf(given));
    } else if (std::isfinite(square)) {
      Check(IsNear(v.x * v.x + v.y * v.y + v.z * v.z, 1, 1e-14L));
      const long double length = std::sqrt(static_cast<long double>(square));
      Check(IsNear(v.x * length, given.x, 1e-14L) && IsNear(v.z * length, given.z, 1e-14L));
      Check(IsNear(v.y * length, given.y, 1e-14L));
    }
  });
}

// One element differs by eps, its neighbours, or is a NaN; or nothing does.
template <class Matrix>
void TestTolerance() {
  Holds([](bool isIdentity, const Any& any, const Matrix& other) {
    constexpr int kSize = std::size(Matrix{}.m);
    const double eps = std::abs(any.value);
    Matrix m = {}, base = {};
    for (int i = 0; isIdentity && i < kSize; ++i) m.m[i][i] = base.m[i][i] = 1;
    double& element = m.m[*rc::gen::inRange(0, kSize)][*rc::gen::inRange(0, kSize)];
    const double factor = *rc::gen::element(1.0, -1.0, 0.0, 2.0, kNan), exact = element;
    element += *operands::Near(rc::gen::just(eps)) * factor;
    const bool isFar = std::abs(element - exact) > eps;
    Equal((isIdentity ? m.IsIdentityWithinEpsilon(eps) : m.IsZeroWithinEpsilon(eps)), !isFar);
    Equal(M_EqualMatrixWithinEpsilon(m, base, eps), !isFar);
    Check(M_EqualMatrixWithinEpsilon(other, other, 0));
  });
}

TEST(CMatrix, TolerancesIncludeTheirEndAndNans) {
  TestTolerance<M_Matrix3>();
  TestTolerance<M_Matrix4>();
}

TEST(CMatrix, ElementsStandWhereTheyBelong) {
  Holds([](const M_Matrix4& a, const M_Matrix4& b, const M_Matrix3& c, const M_Matrix3& d) {
    M_Matrix4 sum = a, difference = a, transposed = a;
    M_Matrix3 sum3 = c, difference3 = c, transposed3 = c;
    Check(&(sum += b) == &sum && &(difference -= b) == &difference);
    Check(&(sum3 += d) == &sum3 && &(difference3 -= d) == &difference3);
    transposed.Transpose();
    transposed3.Transpose();
    bool isFinite = true;
    for (int i = 0; i < 4; ++i) {
      for (int j = 0; j < 4; ++j) {
        isFinite &= std::isfinite(a.m[i][j]);
        Equal(BitsOf(sum.m[i][j]), BitsOf(a.m[i][j] + b.m[i][j]));
        Equal(BitsOf(difference.m[i][j]), BitsOf(a.m[i][j] - b.m[i][j]));
        Equal(BitsOf(transposed.m[j][i]), BitsOf(a.m[i][j]));
        if (i == 3 || j == 3) continue;
        Equal(BitsOf(sum3.m[i][j]), BitsOf(c.m[i][j] + d.m[i][j]));
        Equal(BitsOf(difference3.m[i][j]), BitsOf(c.m[i][j] - d.m[i][j]));
        Equal(BitsOf(transposed3.m[j][i]), BitsOf(c.m[i][j]));
      }
    }
    Equal(a.IsFinite(), isFinite);
    const int row = *rc::gen::inRange(0, 4), col = *rc::gen::inRange(0, 4);
    M_Matrix3 minor, withoutZ;
    minor.AssignFromByDroppingIndices(a, row, col);
    withoutZ.AssignFromByDroppingZ(a);
    for (int i = 0; i < 3; ++i) {
      for (int j = 0; j < 3; ++j) {
        Equal(BitsOf(minor.m[i][j]), BitsOf(a.m[i + (i >= row)][j + (j >= col)]));
        Equal(BitsOf(withoutZ.m[i][j]), BitsOf(a.m[i + (i >= 2)][j + (j >= 2)]));
      }
    }
  });
}

TEST(CMatrix, ProjectionDividesByTheDistance) {
  Holds([](const M_Matrix4& m, Real d, Real x, Real y) {
    RC_PRE(std::abs(d) > 0.01);
    M_Matrix4 both = m, alone;
    M_IdentityMatrix4(&alone);
    alone.Project(d);
    // (x, y, z, w) becomes (x, y, z - w, z / d).
    V4 p = {x, y, 3, 1};
    M_TransformVector4NoDivide(&alone, 1, &p);
    Check(p.x == x && p.y == y && p.z == 2 && IsNear(p.w, 3 / d.value));
    both.Project(d);
    M_ConcatMatrix4(&m, &alone, &alone);
    Equal(BitsOf(both), BitsOf(alone));
    both.Project(0);
    Check(!both.IsFinite());
  });
}

}  // namespace
