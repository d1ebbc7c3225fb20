#include "Matrices.h"

namespace {

// Single points, and those of a batch up to the first that fails; it and those after it stay.
template <class Matrix, class Point>
void TestDivision(const char* single, const char* batch) {
  Holds([=](Matrix m, std::array<Point, 3> points, bool isEdge) {
    constexpr size_t kSize = std::size(Matrix{}.m);
    if (isEdge) {  // w' is what x is, which is at the tolerance or beside it.
      for (auto& row : m.m) row[kSize - 1] = &row == m.m;
      for (Point& p : points)
        p.x = *operands::Near(rc::gen::element(1e-12, -1e-12, 3.0, 0.0, 5e-13, kNan));
    }
    const auto images = points * m;
    std::array<Point, 3> expected, all = points, one = points, fast = points;
    for (size_t i = 0; i < 3; ++i) {
      auto numbers = Numbers(images[i]);
      const double w = numbers.back();
      // One divides, the other multiplies by the reciprocal.
      for (double& n : numbers) n = kSize == 3 ? n / w : n * (1 / w);
      numbers.back() = 1;
      expected[i] = std::bit_cast<Point>(numbers);
      m.TransformPointAndDivideFast(&fast[i]);
    }
    m.TransformPointsAndDivideFast(3, all.data());
    Equal(BitsOf(std::array{fast, all}), BitsOf(std::array{expected, expected}));
    const auto told = [](const char* id, bool hasFailed) {
      return hasFailed ? std::string("4364 | ") + id + " 8 homogeneous point has W=0" : "0";
    };
    bool hasFailed = false;
    for (size_t i = 0; i < 3; ++i) {
      const bool fails = std::abs(Numbers(images[i]).back()) < 1e-12;
      hasFailed |= fails;
      Equal(Thrown([&] { m.TransformPointAndDivide(&one[i]); }), told(single, fails));
      Equal(BitsOf(one[i]), BitsOf(fails ? points[i] : expected[i]));
      if (hasFailed) expected[i] = points[i];
    }
    all = points;
    Equal(Thrown([&] { m.TransformPointsAndDivide(3, all.data()); }), told(batch, hasFailed));
    Equal(BitsOf(all), BitsOf(expected));
    m.TransformPointsAndDivide(0, nullptr);
    m.TransformPointsAndDivide(-1, nullptr);
  });
}

TEST(CMatrix, PointsAreDividedUnlessWIsZero) {
  TestDivision<M_Matrix3, V3>("110039", "11003a");
  TestDivision<M_Matrix4, V4>("11003b", "11003c");
}

TEST(CMatrix, VectorsAreNormalized) {
  Holds([](V4 v, Digit kind) {
    if (kind > 0) v = {0, 0, *operands::Near(rc::gen::element(1e-6, -1e-6, 0.0, 2e-6)), v.w};
    if (kind > 5) v.w = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0));
    const V4 given = v;
    const double square = v.z * v.z + (v.y * v.y + v.x * v.x), length = std::sqrt(square);
    const bool isZero = square < 1e-12;
    std::string told = isZero ? "4363" : "0";
    if (!(std::abs(v.w) < 1e-12)) told += " | 110037 8 attempt to normalize a homegeneous point";
    if (isZero) told += " | 110037 8 cannot normalize zero vector";
    Equal(Thrown([&] { v.Normalize(); }), told);
    Equal(BitsOf(v.w), BitsOf(given.w));
    if (isZero) Equal(BitsOf(v), BitsOf(given));
    if (!isZero && std::isfinite(length))
      Check(IsNear(length * V3{v.x, v.y, v.z}, V3{given.x, given.y, given.z}, 1e-14L));
  });
}

template <class Matrix>
void TestElements() {
  Holds([](const Matrix& a, const Matrix& b, bool isIdentity, const Any& any) {
    Matrix sum = a, difference = a, transposed = a;
    Check(&(sum += b) == &sum && &(difference -= b) == &difference);
    Equal(BitsOf(sum), BitsOf(Zip(a, b, std::plus())));
    Equal(BitsOf(difference), BitsOf(Zip(a, b, std::minus())));
    transposed.Transpose();
    for (size_t i = 0; i < std::size(a.m); ++i) {
      for (size_t j = 0; j < std::size(a.m); ++j)
        Equal(BitsOf(transposed.m[j][i]), BitsOf(a.m[i][j]));
    }
    // One element differs by the tolerance, its neighbours, or is a NaN; or nothing does.
    const double eps = std::abs(any.value);
    const Matrix base = isIdentity ? Identity<Matrix>() : Matrix{};
    Matrix m = base;
    double& element = AnyElement(m);
    const double exact = element;
    element += *operands::Near(rc::gen::just(eps)) * *rc::gen::element(1.0, -1.0, 0.0, 2.0, kNan);
    const bool isFar = std::abs(element - exact) > eps;
    Equal((isIdentity ? m.IsIdentityWithinEpsilon(eps) : m.IsZeroWithinEpsilon(eps)), !isFar);
    Equal(M_EqualMatrixWithinEpsilon(m, base, eps), !isFar);
    Check(M_EqualMatrixWithinEpsilon(a, a, 0));
  });
}

TEST(CMatrix, ElementsStandWhereTheyBelong) {
  TestElements<M_Matrix3>();
  TestElements<M_Matrix4>();
  Holds([](M_Matrix4 m, Any d) {
    const int row = *rc::gen::inRange(0, 4), column = *rc::gen::inRange(0, 4);
    M_Matrix3 minor, withoutZ;
    minor.AssignFromByDroppingIndices(m, row, column);
    for (int i = 0; i < 3; ++i) {
      for (int j = 0; j < 3; ++j)
        Equal(BitsOf(minor.m[i][j]), BitsOf(m.m[i + (i >= row)][j + (j >= column)]));
    }
    withoutZ.AssignFromByDroppingZ(m);
    minor.AssignFromByDroppingIndices(m, 2, 2);
    Equal(BitsOf(withoutZ), BitsOf(minor));

    // The distance becomes w.
    const M_Matrix4 projection = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 1 / d}, {0, 0, -1, 0}}};
    M_Matrix4 projected = m;
    projected.Project(d);
    Equal(BitsOf(projected), BitsOf(m * projection));

    AnyElement(m) = *rc::gen::element(0.0, 1.7e308, kInf, -kInf, kNan);
    const auto numbers = Numbers(m);
    Equal(m.IsFinite(), std::all_of(numbers.begin(), numbers.end(),
                                    [](double number) { return std::isfinite(number); }));
  });
}

}  // namespace
