// Batches against one point at a time and against the plain formula, rectangles against the cells
// they cover, and laws of matrices that hold exactly for whole numbers.

#include <bit>
#include <cmath>
#include <cstring>
#include <limits>

#include "Generator.h"
#include "M_Matrix.h"
#include "TestHost.h"

namespace {

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;

constexpr double kInf = std::numeric_limits<double>::infinity();
constexpr double kNan = std::numeric_limits<double>::quiet_NaN();

class Space : public HostTest {
 public:
  double Uniform() { return generator_.Small(1 << 30) / 1e8; }

  // At times what arithmetic is quick to get wrong.
  double Nasty() {
    const double kNasty[] = {0, -0.0, kInf, -kInf, kNan, -kNan, 1e-12, 1e-13, -1e-12, 1e300, 1, -1};
    return generator_.Below(6) == 0 ? generator_.OneOf(kNasty) : Uniform();
  }

  template <class Matrix>
  Matrix Random(double (Space::*element)()) {
    Matrix m;
    for (auto& row : m.m) {
      for (double& e : row) e = (this->*element)();
    }
    return m;
  }
  double Digit() { return generator_.Small(9); }

  Generator generator_{7};
};

bool IsSame(double a, double b) {
  return std::bit_cast<uint64_t>(a) == std::bit_cast<uint64_t>(b) ||
         (std::isnan(a) && std::isnan(b));
}

// p x m, with 1 for a coordinate that p does not have; divided by w or not. Returns how many
// coordinates are compared.
template <class Matrix, class Point>
Point Plain(const Matrix& m, const Point& p, bool isDivided) {
  constexpr size_t kRows = std::size(Matrix{}.m), kCoords = sizeof(Point) / 8;
  double in[kRows], out[kRows];
  std::fill(in, in + kRows, 1.0);
  std::memcpy(in, &p, sizeof p);
  for (size_t j = 0; j < kRows; ++j) {
    out[j] = in[0] * m.m[0][j];
    for (size_t i = 1; i < kRows; ++i) out[j] += in[i] * m.m[i][j];
  }
  const double w = out[kRows - 1];
  if (isDivided && !(-1e-12 < w && w < 1e-12)) {
    const double r = 1 / w;
    for (double& coordinate : out) coordinate *= r;
    out[kRows - 1] = 1;
  }
  Point transformed;
  std::memcpy(&transformed, out, kCoords * 8);
  return transformed;
}

template <class Matrix, class Point>
void TestBatch(int32_t (*transform)(const Matrix*, int32_t, Point*), bool isDivided,
               const std::function<double()>& number, const std::function<Matrix()>& matrix) {
  constexpr size_t kCoords = sizeof(Point) / 8;
  for (int round = 0; round < 400; ++round) {
    const Matrix m = matrix();
    const int32_t count = round < 300 ? round % 41 : 256 + round % 16;
    // At every alignment a double may have, with a number behind the last point.
    const size_t offset = static_cast<size_t>(round / 3 % 4),
                 size = static_cast<size_t>(count) * kCoords;
    std::vector<double> given(offset + size + 1);
    for (double& coordinate : given) coordinate = number();
    std::vector<double> batch = given, single = given;
    ASSERT_EQ(transform(&m, count, reinterpret_cast<Point*>(batch.data() + offset)), 0);
    for (int32_t i = 0; i < count; ++i) {
      const size_t at = offset + static_cast<size_t>(i) * kCoords;
      ASSERT_EQ(transform(&m, 1, reinterpret_cast<Point*>(single.data() + at)), 0);
      Point plain;
      std::memcpy(&plain, given.data() + at, sizeof plain);
      plain = Plain(m, plain, isDivided);
      for (size_t c = 0; c < kCoords; ++c) {
        double coordinate;
        std::memcpy(&coordinate, reinterpret_cast<char*>(&plain) + c * 8, 8);
        ASSERT_TRUE(IsSame(batch[at + c], coordinate)) << batch[at + c] << " for " << coordinate;
      }
    }
    ASSERT_EQ(std::memcmp(batch.data(), single.data(), batch.size() * 8), 0) << count << " points";
  }
}

TEST_F(Space, BatchesGiveTheBitsOfSinglePoints) {
  for (const auto number : {&Space::Nasty, &Space::Uniform}) {
    const auto one = [&] { return (this->*number)(); };
    const std::function<M_Matrix3()> m3 = [&] { return Random<M_Matrix3>(number); };
    const std::function<M_Matrix4()> m4 = [&] { return Random<M_Matrix4>(number); };
    TestBatch<M_Matrix3, V2>(M_TransformFloatPoints, false, one, m3);
    TestBatch<M_Matrix3, V3>(M_TransformVector3, false, one, m3);
    TestBatch<M_Matrix4, V4>(M_TransformVector4NoDivide, false, one, m4);
    TestBatch<M_Matrix4, V4>(M_TransformVector4, true, one, m4);
    TestBatch<M_Matrix4, V3>(M_Transform3DFloatPoints, true, one, m4);
  }
}

// Results that are halves, bounds and their neighbours, with failures at any place.
template <class Point>
void TestIntegers(int32_t (*transform)(const M_Matrix3*, int32_t, Point*), double unit,
                  double lowest, double highest, Generator& generator) {
  using Coord = decltype(Point::h);
  const double kScales[] = {1, 0.5, -0.5, 0.25, -1, 1.5, 0x1.fffffffffffffp-2, kNan};
  const double kShifts[] = {0,    0.5,  -0.5, 0x1.fffffffffffffp-2, -0x1.fffffffffffffp-2,
                            0.25, -0.0, -3.75};
  for (int round = 0; round < 20000; ++round) {
    const auto scale = [&] { return generator.Below(3) == 0 ? 0 : generator.OneOf(kScales); };
    const auto shift = [&] { return generator.OneOf(kShifts) / unit; };
    const M_Matrix3 m = {{{scale(), scale(), 7}, {scale(), scale(), 7}, {shift(), shift(), 7}}};
    std::vector<Point> points(generator.Below(30)), model;
    for (Point& p : points) {
      const bool isLarge = generator.Below(20) == 0;
      const auto coord = [&] {
        return static_cast<Coord>(isLarge
                                      ? generator.OneOf({lowest, highest, lowest + 2, highest - 1})
                                      : generator.Small(999));
      };
      p = {coord(), coord()};
    }
    model = points;
    int32_t expected = 0;
    for (Point& p : model) {
      const double x = p.h, y = p.v;
      for (int j = 0; j < 2 && expected == 0; ++j) {
        const double value = m.m[0][j] * x + m.m[1][j] * y + m.m[2][j] * unit;
        if (value >= highest || value <= lowest) {
          expected = M_ERR_OVERFLOW;
        } else {
          (j == 0 ? p.h : p.v) = static_cast<Coord>(M_RoundDouble(value));
        }
      }
    }
    ASSERT_EQ(transform(&m, static_cast<int32_t>(points.size()), points.data()), expected);
    ASSERT_EQ(host.Take().size(), expected == 0 ? 0u : 1u);
    for (size_t i = 0; i < points.size(); ++i) {
      ASSERT_EQ(points[i].h, model[i].h) << i;
      ASSERT_EQ(points[i].v, model[i].v) << i;
    }
  }
}

TEST_F(Space, BatchesOfNothingReadNothing) {
  for (const int32_t count : {0, -1, INT32_MIN}) {
    EXPECT_EQ(M_TransformFloatPoints(nullptr, count, nullptr) |
                  M_TransformPoints(nullptr, count, nullptr) |
                  M_TransformFixPoints(nullptr, count, nullptr) |
                  M_TransformVector3(nullptr, count, nullptr) |
                  M_TransformVector4NoDivide(nullptr, count, nullptr) |
                  M_TransformVector4(nullptr, count, nullptr) |
                  M_Transform3DFloatPoints(nullptr, count, nullptr) |
                  M_3DTransform2DPoints(nullptr, count, nullptr),
              0);
  }
}

TEST_F(Space, IntegerPointsAreRoundedAndBoundedOneByOne) {
  TestIntegers<M_Point>(M_TransformPoints, 1, -32768, 32767, generator_);
  TestIntegers<M_FixedPoint>(M_TransformFixPoints, 65536, -2147483648.0, 2147483647, generator_);
}

TEST_F(Space, RectanglesAreTheCellsTheyCover) {
  for (int round = 0; round < 3000; ++round) {
    const auto edge = [&] { return static_cast<int16_t>(generator_.Below(6)); };
    M_Rect a, b, sect, both;
    M_SetRect(&a, edge(), edge(), edge(), edge());
    M_SetRect(&b, edge(), edge(), edge(), edge());
    const int32_t isOverlap = M_SectRect(&a, &b, &sect);
    M_UnionRect(&a, &b, &both);
    M_Rect bounds = {9, 9, -9, -9};
    int common = 0;
    for (int16_t v = 0; v < 6; ++v) {
      for (int16_t h = 0; h < 6; ++h) {
        const M_Point cell = {v, h},
                      end = {static_cast<int16_t>(v + 1), static_cast<int16_t>(h + 1)};
        const bool isInA = M_PtInRect(&cell, &a), isInB = M_PtInRect(&cell, &b);
        common += isInA && isInB;
        ASSERT_EQ(M_PtInRect(&cell, &sect), isInA && isInB);
        if (!isInA && !isInB) continue;
        bounds = {std::min(bounds.top, v), std::min(bounds.left, h), std::max(bounds.bottom, end.v),
                  std::max(bounds.right, end.h)};
      }
    }
    ASSERT_EQ(isOverlap, common > 0);
    ASSERT_EQ(M_RectCompare(7, &a, &b), isOverlap);
    ASSERT_TRUE(M_EmptyRect(&a) && M_EmptyRect(&b) ? M_RectCompare(0, &both, &a)
                                                   : M_RectCompare(0, &both, &bounds));
    // The halves of a rectangle span it, in place.
    const M_Rect given = a;
    M_Pt2Rect(&M_TopLeft(a), &M_BottomRight(a), &a);
    ASSERT_EQ(a.left, std::min(given.left, given.right));
    ASSERT_EQ(a.bottom, std::max(given.top, given.bottom));
    M_TopLeft(a) = {8, 7};
    M_BottomRight(a).h = 6;
    ASSERT_TRUE(a.top == 8 && a.left == 7 && a.right == 6 && a.bottom >= given.bottom);
  }
}

// What holds exactly for whole numbers.
TEST_F(Space, ConcatenationIsOneTransformAfterTheOther) {
  for (int round = 0; round < 300; ++round) {
    auto a = Random<M_Matrix3>(&Space::Digit), b = Random<M_Matrix3>(&Space::Digit);
    V3 twice = {Digit(), Digit(), Digit()}, once = twice;
    M_TransformVector3(&b, 1, &twice);
    M_TransformVector3(&a, 1, &twice);
    M_ConcatMatrix(&a, &b);
    M_TransformVector3(&b, 1, &once);
    ASSERT_TRUE(once.x == twice.x && once.y == twice.y && once.z == twice.z);

    const auto a4 = Random<M_Matrix4>(&Space::Digit), b4 = Random<M_Matrix4>(&Space::Digit);
    V4 twice4 = {Digit(), Digit(), Digit(), Digit()}, once4 = twice4;
    M_Matrix4 product;
    M_TransformVector4NoDivide(&a4, 1, &twice4);
    M_TransformVector4NoDivide(&b4, 1, &twice4);
    M_ConcatMatrix4(&a4, &b4, &product);
    M_TransformVector4NoDivide(&product, 1, &once4);
    ASSERT_EQ(std::memcmp(&once4, &twice4, sizeof once4), 0);
    double determinants[3];
    M_GetMatrix4Determinant(&a4, &determinants[0]);
    M_GetMatrix4Determinant(&b4, &determinants[1]);
    M_GetMatrix4Determinant(&product, &determinants[2]);
    ASSERT_EQ(determinants[0] * determinants[1], determinants[2]);

    M_Matrix3 adjugate = a;
    adjugate.Adjoint();
    M_ConcatMatrix(&a, &adjugate);
    for (double& diagonal :
         {std::ref(adjugate.m[0][0]), std::ref(adjugate.m[1][1]), std::ref(adjugate.m[2][2])}) {
      diagonal -= a.Determinant();
    }
    ASSERT_TRUE(adjugate.IsZeroWithinEpsilon(0));
  }
}

TEST_F(Space, InversesUndo) {
  for (int round = 0; round < 3000; ++round) {
    const auto m3 = Random<M_Matrix3>(&Space::Digit);
    M_Matrix3 inverse, product;
    // Whole numbers: a determinant is 0 or far from it, and the inverse is no larger than the
    // adjugate.
    if (m3.Determinant() != 0) {
      ASSERT_EQ(M_InverseMatrix(&m3, &inverse), 0);
      product = inverse;
      M_ConcatMatrix(&m3, &product);
      ASSERT_TRUE(product.IsIdentityWithinEpsilon(1e-9));
      ASSERT_EQ(M_InverseMatrix(&inverse, &inverse), 0);
      ASSERT_TRUE(M_EqualMatrixWithinEpsilon(inverse, m3, 1e-9));
    }
    const auto m4 = Random<M_Matrix4>(&Space::Digit);
    M_Matrix4 inverse4, product4;
    double determinant;
    M_GetMatrix4Determinant(&m4, &determinant);
    ASSERT_EQ(M_InverseMatrix4Quiet(&m4, &inverse4, nullptr),
              determinant == 0 ? M_ERR_NOT_INVERTIBLE : 0);
    if (determinant == 0) continue;
    M_ConcatMatrix4(&m4, &inverse4, &product4);
    ASSERT_TRUE(product4.IsIdentityWithinEpsilon(1e-9));
    M_CalcNormalMatrix4(&m4, &product4);
    M_TransposeMatrix4(&product4, &product4);
    ASSERT_EQ(std::memcmp(&product4, &inverse4, sizeof inverse4), 0);
  }
}

}  // namespace
