#include <cstring>
#include <functional>

#include "Law.h"

namespace {

// p x m, with 1 for a coordinate that p does not have; divided by w or not.
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

// Points at every alignment a double may have, in numbers around whole blocks and the detour for
// aligned ones, with a number behind the last.
template <class Point>
struct Batch {
  static constexpr size_t kCoords = sizeof(Point) / 8;
  int32_t count = *rc::gen::weightedOneOf<int32_t>(
      {{6, rc::gen::inRange(1, 20)}, {1, rc::gen::inRange(250, 275)}});
  size_t offset = *rc::gen::inRange<size_t>(0, 4);
  std::vector<double> numbers =
      std::vector<double>(offset + static_cast<size_t>(count) * kCoords + 1);
  Point* At(int32_t i) {
    return reinterpret_cast<Point*>(&numbers[offset + static_cast<size_t>(i) * kCoords]);
  }
};

template <class Matrix, class Point>
void TestBatch(int32_t (*transform)(const Matrix*, int32_t, Point*), bool isDivided) {
  Holds([=](Matrix m, bool isEdge) {
    Batch<Point> given;
    const std::vector<double> few =
        *rc::gen::container<std::vector<double>>(8, operands::Doubles());
    for (size_t i = 0; i < given.numbers.size(); ++i) given.numbers[i] = few[i * 5 % 7 ^ i % 2];
    if (isEdge) {  // w is, for a first coordinate of 1, at or beside the tolerance, or 0.
      for (auto& row : m.m) row[std::size(m.m) - 1] = 0;
      m.m[0][std::size(m.m) - 1] = *operands::Near(rc::gen::element(1e-12, -1e-12, 0.0, 5e-13));
      for (int32_t i = 0; i < given.count; i += 2) given.At(i)->x = 1;
    }
    Batch<Point> batch = given, single = given;
    Equal(transform(&m, given.count, batch.At(0)), 0);
    for (int32_t i = 0; i < given.count; ++i) {
      Equal(transform(&m, 1, single.At(i)), 0);
      Equal(BitsOf(*batch.At(i)), BitsOf(Plain(m, *given.At(i), isDivided)));
    }
    Equal(std::memcmp(batch.numbers.data(), single.numbers.data(), batch.numbers.size() * 8), 0);
  });
}

TEST(Xform, BatchesGiveTheBitsOfSinglePoints) {
  TestBatch<M_Matrix3, V3>(M_TransformVector3, false);
  TestBatch<M_Matrix4, V4>(M_TransformVector4NoDivide, false);
  TestBatch<M_Matrix4, V4>(M_TransformVector4, true);
  TestBatch<M_Matrix4, V3>(M_Transform3DFloatPoints, true);
  TestBatch<M_Matrix3, V2>([](const M_Matrix3* m, int32_t count,
                              V2* points) { return M_TransformFloatPoints(m, count, points); },
                           false);
}

TEST(Xform, BatchesOfNothingReadNothing) {
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

// Results that are halves, bounds and their neighbours, with failures at any place.
template <class Point>
void TestIntegers(int32_t (*transform)(const M_Matrix3*, int32_t, Point*), double unit,
                  double lowest, double highest, const char* report) {
  using Coord = decltype(Point::h);
  Holds([=] {
    const auto scale =
        rc::gen::element(0.0, 0.0, 1.0, 0.5, -0.5, 0.25, -1.0, 1.5, 0x1.fffffffffffffp-2, kNan);
    const auto shift = rc::gen::element(0.0, 0.5, -0.5, 0x1.fffffffffffffp-2, -0x1.fffffffffffffp-2,
                                        0.25, -0.0, -3.75);
    const M_Matrix3 m = {
        {{*scale, *scale, 7}, {*scale, *scale, 7}, {*shift / unit, *shift / unit, 7}}};
    const auto coord = rc::gen::weightedOneOf<double>(
        {{30, rc::gen::cast<double>(rc::gen::inRange(-999, 1000))},
         {1, rc::gen::element(lowest, highest, lowest + 1, lowest + 2, highest - 1)}});
    std::vector<Point> points;
    for (int i = *rc::gen::inRange(0, 30); i > 0; --i) {
      points.push_back({static_cast<Coord>(*coord), static_cast<Coord>(*coord)});
    }
    std::vector<Point> model = points;
    bool fails = false;
    for (Point& p : model) {
      const double x = p.h, y = p.v;
      for (int j = 0; j < 2 && !fails; ++j) {
        const double value = m.m[0][j] * x + m.m[1][j] * y + m.m[2][j] * unit;
        fails = value >= highest || value <= lowest;
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
  TestIntegers<M_Point>(M_TransformPoints, 1, -32768, 32767,
                        "110026 8 overflow in point transformation.");
  TestIntegers<M_FixedPoint>(M_TransformFixPoints, 65536, -2147483648.0, 2147483647,
                             "110027 8 overflow in fixed point transformation.");
}

TEST(Xform, PointsInSpaceAreTruncatedAndHeld) {
  Holds([](const M_Matrix4& m) {
    auto points = *rc::gen::resize(
        rc::kNominalSize, rc::gen::container<std::vector<M_Point>>(operands::Of<M_Point>()));
    if (points.size() > 3) points.resize(130, points[1]);
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

// Four corners in the order of the plain calls, and their bounds.
TEST(Xform, RectanglesAreTheBoundsOfTheirCorners) {
  Holds([](M_Matrix3 m, M_Rect s, const M_FloatRect& f, const M_FixedRect& x, const M_LRect& l) {
    if (*rc::gen::inRange(0, 20) != 0) {
      for (auto& row : m.m) {
        for (double& element : row) element = std::isfinite(element) ? element : 1;
      }
    }
    const auto hasNan = [](const std::array<V2, 4>& all) {
      return std::any_of(all.begin(), all.end(),
                         [](const V2& p) { return std::isnan(p.x) || std::isnan(p.y); });
    };
    const auto corners = [&](double left, double top, double right, double bottom) {
      std::array<V2, 4> all = {{{left, top}, {right, top}, {right, bottom}, {left, bottom}}};
      M_TransformFloatPoints(&m, 4, all.data());
      return all;
    };
    const auto bounds = [](const std::array<V2, 4>& all) {
      const auto [x0, x1] = std::minmax({all[0].x, all[1].x, all[2].x, all[3].x});
      const auto [y0, y1] = std::minmax({all[0].y, all[1].y, all[2].y, all[3].y});
      return M_FloatRect{x0, y0, x1, y1};
    };
    uint32_t type;
    M_GetMatrixType(&m, &type);
    std::array<V2, 4> expected = corners(s.left, s.top, s.right, s.bottom), out = expected;
    unsigned char isBox = 9;
    const M_FloatRect box = bounds(expected);
    const auto held = [](double d) { return M_RoundDouble(std::clamp(d, -32767.0, 32766.0)); };
    Equal(M_TransformRect(&m, &s, (out = {}).data(), &isBox), 0);
    Check(isBox == (type >= 4) && BitsOf(out) == BitsOf(expected));
    if (!hasNan(expected)) {
      Check(s.left == held(box.left) && s.right == held(box.right));
      Check(s.top == held(box.top) && s.bottom == held(box.bottom));
    }
    expected = corners(f.left, f.top, f.right, f.bottom);
    M_FloatRect g = f;
    Equal(M_TransformFloatRect(&m, &g, (out = {}).data(), &(isBox = 9)), 0);
    Check(isBox == (type >= 4) && BitsOf(out) == BitsOf(expected));
    const M_FloatRect b = bounds(expected);
    if (!hasNan(expected))
      Check(g.left == b.left && g.top == b.top && g.right == b.right && g.bottom == b.bottom);

    M_FixedPoint plain[4] = {
        {x.left, x.top}, {x.right, x.top}, {x.right, x.bottom}, {x.left, x.bottom}};
    M_FixedPoint fixed[4];
    M_FixedRect y = x;
    const int32_t code = M_TransformFixPoints(&m, 4, plain);
    Equal(M_TransformFixRect(&m, &y, fixed, &(isBox = 9)), code);
    Equal(std::memcmp(plain, fixed, sizeof plain), 0);
    Check(isBox == (code ? 9 : type >= 4) && host.Take().size() == (code ? 2u : 0u));
    const auto [h0, h1] = std::minmax({plain[0].h, plain[1].h, plain[2].h, plain[3].h});
    const auto [v0, v1] = std::minmax({plain[0].v, plain[1].v, plain[2].v, plain[3].v});
    Equal(BitsOf(y), BitsOf(code ? x : M_FixedRect{h0, v0, h1, v1}));

    const M_LRect around = M_TransformBounds(m, l);
    const bool isEmpty = l.right <= l.left || l.bottom <= l.top;
    expected = corners(l.left, l.top, l.right, l.bottom);
    const M_FloatRect edges = bounds(expected);
    const auto inRange = [](double d) {
      return static_cast<int32_t>(d >= -0x1p31 && d < 0x1p31 ? d : -0x1p31);
    };
    const M_LRect wanted = {inRange(std::floor(std::max(edges.left, -0x1p31))),
                            inRange(std::floor(std::max(edges.top, -0x1p31))),
                            inRange(std::ceil(std::min(edges.right, 0x1p31 - 1))),
                            inRange(std::ceil(std::min(edges.bottom, 0x1p31 - 1)))};
    if (isEmpty || !hasNan(expected)) Equal(BitsOf(around), BitsOf(isEmpty ? M_LRect{} : wanted));
  });
}

}  // namespace
