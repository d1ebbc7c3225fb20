#include <future>

#include "Law.h"

namespace {

// p x m, with 1 for a coordinate that p does not have; divided by w or not.
template <class Matrix, class Point>
Point Plain(const Matrix& m, const Point& p, bool isDivided) {
  constexpr size_t kRows = std::size(Matrix{}.m), kW = kRows - 1;
  // Sums start with -0, which changes none.
  double in[] = {1, 1, 1, 1}, out[] = {-0.0, -0.0, -0.0, -0.0};
  std::memcpy(in, &p, sizeof p);
  for (size_t i = 0; i < kRows; ++i) {
    for (size_t j = 0; j < kRows; ++j) out[j] += in[i] * m.m[i][j];
  }
  const bool isScaled = isDivided && !(std::abs(out[kW]) < 1e-12);
  const double factor = isScaled ? 1 / std::exchange(out[kW], 1) : 1;
  for (size_t j = 0; j < kW; ++j) out[j] *= factor;
  Point transformed;
  std::memcpy(&transformed, out, sizeof p);
  return transformed;
}

// Points at every alignment a double may have, in numbers around whole blocks and the detour for
// aligned ones, with a number behind the last.
template <class Matrix, class Point>
void TestBatch(int32_t (*transform)(const Matrix*, int32_t, Point*), bool isDivided) {
  constexpr size_t kSize = sizeof(Point) / sizeof(double), kW = std::size(Matrix{}.m) - 1;
  for (const int32_t none : {0, -1, INT32_MIN}) EXPECT_EQ(transform(nullptr, none, nullptr), 0);
  Holds([=](Matrix m, bool isEdge) {
    const size_t count = *rc::gen::weightedOneOf<size_t>(
        {{6, rc::gen::inRange<size_t>(0, 20)}, {1, rc::gen::inRange<size_t>(250, 275)}});
    const size_t offset = *rc::gen::inRange<size_t>(0, 4);
    const auto few = *rc::gen::container<std::array<double, 8>>(operands::Doubles());
    std::vector<double> batch(offset + count * kSize + 1);
    for (size_t i = 0; i < batch.size(); ++i) batch[i] = few[i * 5 % 7 ^ i % 2];
    if (isEdge) {  // w is, for a first coordinate of 1, at or beside the tolerance, or 0.
      for (auto& row : m.m) row[kW] = 0;
      m.m[0][kW] = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 5e-13));
      for (size_t i = 0; i < count; i += 2) batch[offset + i * kSize] = 1;
    }
    std::vector<double> single = batch;
    Point* const points = reinterpret_cast<Point*>(&batch[offset]);
    Point* const apart = reinterpret_cast<Point*>(&single[offset]);
    Equal(transform(&m, static_cast<int32_t>(count), points), 0);
    for (size_t i = 0; i < count; ++i) {
      const Point expected = Plain(m, apart[i], isDivided);
      Equal(transform(&m, 1, &apart[i]), 0);
      Equal(BitsOf(points[i]), BitsOf(expected));
    }
    // Even the signs of NaNs.
    Equal(std::memcmp(batch.data(), single.data(), batch.size() * sizeof batch[0]), 0);
  });
}

TEST(Xform, BatchesGiveTheBitsOfSinglePoints) {
  TestBatch<M_Matrix3, V3>(M_TransformVector3, false);
  TestBatch<M_Matrix4, V4>(M_TransformVector4NoDivide, false);
  TestBatch<M_Matrix4, V4>(M_TransformVector4, true);
  TestBatch<M_Matrix4, V3>(M_Transform3DFloatPoints, true);
  TestBatch<M_Matrix3, V2>(M_TransformFloatPoints, false);
}

// Results that are halves, bounds and their neighbours, with failures at any place.
template <class Point>
void TestIntegers(int32_t (*transform)(const M_Matrix3*, int32_t, Point*), double unit,
                  const char* report) {
  using Coord = decltype(Point::h);
  constexpr int64_t kLowest = std::numeric_limits<Coord>::min(), kHighest = -kLowest - 1;
  for (const int32_t none : {0, -1}) EXPECT_EQ(transform(nullptr, none, nullptr), 0);
  Holds([=] {
    const double below = 0x1.fffffffffffffp-2;
    const auto scale = rc::gen::element(0.0, 0.0, 1.0, 0.5, -0.5, 0.25, -1.0, 1.5, below, kNan);
    const auto shift = rc::gen::element(0.0, 0.5, -0.5, below, -below, 0.25, -0.0, -3.75);
    const M_Matrix3 m = {
        {{*scale, *scale, 7}, {*scale, *scale, 7}, {*shift / unit, *shift / unit, 7}}};
    // In the middle, and where they turn round.
    const auto coord = rc::gen::cast<Coord>(rc::gen::weightedOneOf<int64_t>(
        {{30, rc::gen::inRange<int64_t>(-999, 1000)},
         {1, rc::gen::inRange<int64_t>(kHighest - 2, kHighest + 4)}}));
    std::vector<Point> points(*rc::gen::inRange<size_t>(0, 30));
    for (Point& p : points) p = {*coord, *coord};
    std::vector<Point> model = points;
    bool fails = false;
    for (Point& p : model) {
      const double x = p.h, y = p.v;
      for (const int j : {0, 1}) {
        const double value = m.m[0][j] * x + m.m[1][j] * y + m.m[2][j] * unit;
        fails = fails || value >= kHighest || value <= kLowest;
        if (!fails) (j == 0 ? p.h : p.v) = static_cast<Coord>(M_RoundDouble(value));
      }
    }
    Equal(transform(&m, static_cast<int32_t>(points.size()), points.data()),
          (fails ? M_ERR_OVERFLOW : 0));
    Equal(host.Take(), (fails ? Calls{report} : Calls()));
    for (size_t i = 0; i < points.size(); ++i) Equal(BitsOf(points[i]), BitsOf(model[i]));
  });
}

TEST(Xform, IntegerPointsAreRoundedAndBoundedOneByOne) {
  TestIntegers<M_Point>(M_TransformPoints, 1, "110026 8 overflow in point transformation.");
  TestIntegers<M_FixedPoint>(M_TransformFixPoints, 65536,
                             "110027 8 overflow in fixed point transformation.");
}

TEST(Xform, PointsInSpaceAreTruncatedAndHeld) {
  for (const int32_t none : {0, -1}) EXPECT_EQ(M_3DTransform2DPoints(nullptr, none, nullptr), 0);
  Holds([](const M_Matrix4& m, std::array<M_Point, 4> few) {
    std::vector<M_Point> points(*rc::gen::element<size_t>(1, 2, 7, 64, 65, 130));
    for (size_t i = 0; i < points.size(); ++i) points[i] = few[i * 5 % 7 % 4];
    std::vector<M_Point> result = points;
    Equal(M_3DTransform2DPoints(&m, static_cast<int32_t>(points.size()), result.data()), 0);
    for (size_t i = 0; i < points.size(); ++i) {
      const V3 p = Plain(m, V3{points[i].h * 1.0, points[i].v * 1.0, 0}, true);
      const auto held = [](double d) {
        return static_cast<int16_t>(std::isnan(d) ? 0 : std::clamp(d, -32767.0, 32766.0));
      };
      Check(result[i].h == held(p.x) && result[i].v == held(p.y));
    }
  });
}

// For so long that the threads are sure to meet.
TEST(Xform, LongBatchesMayBeTransformedInTwoThreads) {
  const auto failures = [](double scale) {
    const M_Matrix4 m = {{{scale, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};
    std::vector<M_Point> points(1 << 22, M_Point{1, 1});
    M_3DTransform2DPoints(&m, 1 << 22, points.data());
    return std::count_if(points.begin(), points.end(), [=](auto& p) { return p.h != scale; });
  };
  auto others = std::async(std::launch::async, failures, 2.0);
  EXPECT_EQ(failures(3) + others.get(), 0);
}

template <class Rect>
std::array<double, 4> Sides(const Rect& r) {
  return {r.left * 1.0, r.top * 1.0, r.right * 1.0, r.bottom * 1.0};
}

// Four corners in the order of the plain calls, and their bounds; the others as that of floats.
TEST(Xform, RectanglesAreTheBoundsOfTheirCorners) {
  Holds([](const M_Matrix3& m, M_Rect s, const M_FloatRect& f, M_FixedRect x, M_LRect l) {
    std::array<V2, 4> corners, out;
    std::array<double, 4> bounds;
    unsigned char isBox;
    uint32_t type;
    M_GetMatrixType(&m, &type);
    const auto transform = [&](auto* function, auto rect) {
      const auto [left, top, right, bottom] = Sides(rect);
      corners = {{{left, top}, {right, top}, {right, bottom}, {left, bottom}}};
      M_TransformFloatPoints(&m, 4, corners.data());
      for (const V2& p : corners) RC_PRE(!std::isnan(p.x + p.y));
      const auto& [a, b, c, d] = corners;
      bounds = {std::min({a.x, b.x, c.x, d.x}), std::min({a.y, b.y, c.y, d.y}),
                std::max({a.x, b.x, c.x, d.x}), std::max({a.y, b.y, c.y, d.y})};
      Equal(function(&m, &rect, (out = {}).data(), &(isBox = 9)), 0);
      Check(isBox == (type >= 4) && BitsOf(out) == BitsOf(corners));
      return Sides(rect);
    };
    Equal(transform(M_TransformFloatRect, f), bounds);
    const auto sides = transform(M_TransformRect, s);
    for (double& side : bounds) side = M_RoundDouble(std::clamp(side, -32767.0, 32766.0));
    Equal(sides, bounds);
    transform(M_TransformFloatRect,
              M_FloatRect{l.left * 1.0, l.top * 1.0, l.right * 1.0, l.bottom * 1.0});
    for (double& side : bounds) {
      side = &side < &bounds[2] ? std::floor(std::max(side, -0x1p31))
                                : std::ceil(std::min(side, 0x1p31 - 1));
      if (!(std::abs(side) < 0x1p31)) side = -0x1p31;
    }
    if (l.right <= l.left || l.bottom <= l.top) bounds = {};
    Equal(Sides(M_TransformBounds(m, l)), bounds);
    M_FixedPoint plain[] = {
        {x.left, x.top}, {x.right, x.top}, {x.right, x.bottom}, {x.left, x.bottom}};
    const int32_t code = M_TransformFixPoints(&m, 4, plain);
    const auto [h0, h1] = std::minmax({plain[0].h, plain[1].h, plain[2].h, plain[3].h});
    const auto [v0, v1] = std::minmax({plain[0].v, plain[1].v, plain[2].v, plain[3].v});
    const M_FixedRect box = code ? x : M_FixedRect{h0, v0, h1, v1};
    M_FixedPoint fixed[4];
    Equal(M_TransformFixRect(&m, &x, fixed, &(isBox = 9)), code);
    Check(BitsOf(x) == BitsOf(box) && BitsOf(plain) == BitsOf(fixed));
    Check(isBox == (code ? 9 : type >= 4) && host.Take().size() == (code ? 2u : 0u));
  });
}

}  // namespace
