#include "Law.h"

namespace {

using Polygon = std::vector<V4>;

const Polygon kSquare = {{0, 0, 0, 0}, {4, 0, 0, 0}, {4, 4, 0, 0}, {0, 4, 0, 0}};

double Area(const Polygon& polygon) {
  std::vector<V2> flat;
  for (const V4& p : polygon) flat.push_back({p.x, p.y});
  return M_SignedPolygonArea2D(flat.data(), static_cast<int32_t>(flat.size()));
}

Polygon Clip(const Polygon& clipper, const Polygon& subject) {
  Polygon result = {{9, 9, 9, 9}};
  M_PolyPolyClip2D(&clipper, &subject, &result);
  return result;
}

std::string Text(const Polygon& polygon) { return rc::toString(polygon); }

// A large square is cut anywhere into four parts, whichever way these run. What is in them is all.
TEST(PolyClip, PartsAddUp) {
  Holds([](const std::array<Real, 6>& cut, bool isReversed) {
    Polygon subject;
    const int count = *rc::gen::inRange(3, 9);
    for (int i = 0; i < count; ++i) {
      const double angle = (i + *rc::gen::inRange(0, 8) / 10.0) * 6.283185307179586 / count,
                   r = 2 + *rc::gen::inRange(0, 17) / 8.0, x = r * std::cos(angle),
                   y = r * std::sin(angle);
      subject.push_back({x, y, x, y});
    }
    double sum = 0;
    for (const auto& [x, y] : {std::pair(-50.0, -50.0), {50, -50}, {50, 50}, {-50, 50}}) {
      Polygon part = {{cut[0] / 5, cut[1] / 5, kNan, kNan},
                      {x, cut[x > 0 ? 2 : 3], kNan, kNan},
                      {x, y, kNan, kNan},
                      {cut[y > 0 ? 4 : 5], y, kNan, kNan}};
      if (isReversed) std::reverse(part.begin(), part.end());
      std::rotate(part.begin(), part.begin() + *rc::gen::inRange(0, 4), part.end());
      const Polygon result = Clip(part, subject);
      sum += Area(result);
      for (const V4& p : result) {
        // What was carried along lies where the point does.
        Check(IsNear(p.z, p.x) && IsNear(p.w, p.y));
        for (size_t k = 0; k < 4; ++k)
          Check(Area({part[k], part[(k + 1) % 4], p}) * Area(part) > -0.01);
      }
      // In each of the others' place.
      Polygon place = subject;
      M_PolyPolyClip2D(&part, &place, &place);
      M_PolyPolyClip2D(&part, &subject, &part);
      Check(place.size() == result.size() && Area(place) == Area(result));
      Check(part.size() == result.size() && Area(part) == Area(result));
    }
    Check(IsNear(sum, Area(subject), 1e-5L));
  });
}

TEST(PolyClip, Limits) {
  const Polygon inside = {{1, 1, 7, 8}, {2, 1, 7, 8}, {1, 2, 9, 9}};
  EXPECT_EQ(Text(Clip(kSquare, inside)), Text(inside));
  EXPECT_EQ(Text(Clip({}, {{1, 2, 3, 4}})), Text({{1, 2, 3, 4}}));
  EXPECT_TRUE(Clip(kSquare, {{1, 1, 0, 0}, {2, 2, 0, 0}}).empty());
  // Clippers without an inside.
  for (const Polygon& clipper :
       {Polygon{{1, 1, 0, 0}}, Polygon{{1, 1, 0, 0}, {3, 3, 0, 0}},
        Polygon{{-9, -9, 0, 0}, {9, -9, 0, 0}, {9, -9, 0, 0}, {9, 9, 0, 0}}}) {
    EXPECT_TRUE(Clip(clipper, kSquare).empty());
  }
  // What lies on a side is outside, and replaced by crossings there; 1e-6 of its measure inside,
  // too.
  for (const auto& [x, count] : {std::pair(0.0, 4u), {0.25e-6, 4}, {0.26e-6, 3}})
    EXPECT_EQ(Clip(kSquare, {{x, 1, 5, 1}, {2, 1, 5, 1}, {2, 2, 5, 1}}).size(), count) << x;
  // There both ends may be on one side of the line, and what is carried along lies between them.
  Polygon beside = {{1, 0.3e-6, 1, 5}, {1.5, 0.2e-6, -1, 5}, {2, 3, 0, 5}};
  for (int i = 0; i < 2; ++i) {
    for (const V4& p : Clip(kSquare, beside)) EXPECT_TRUE(std::abs(p.z) <= 1 && p.w == 5);
    std::reverse(beside.begin(), beside.end());
  }
  // Parallel within 1e-12: the point before stands for the crossing.
  const Polygon along = {{1, 0.25e-6, 1, 0}, {2, 0.25000005e-6, 2, 0}, {2, 3, 3, 0}};
  EXPECT_EQ(Text({Clip(kSquare, along).at(1)}), Text({along[0]}));
  // So small that it is turned round, or not.
  for (const auto& [width, count] : {std::pair(2e-6, 0u), {std::nextafter(2e-6, 1), 4}}) {
    const Polygon small = {{0, 0, 0, 0}, {0, 1, 0, 0}, {width, 1, 0, 0}, {width, 0, 0, 0}};
    EXPECT_EQ(Clip(small, kSquare).size(), count) << width;
    const Polygon low = {{1, 0, 0, 0}, {0, 0, 0, 0}, {0, width, 0, 0}, {1, width, 0, 0}};
    EXPECT_EQ(Clip(low, kSquare).size(), count) << width;
  }
}

// Whichever allocation fails, what there was is still there, and nothing is lost.
TEST(PolyClip, FailedAllocationsChangeNothing) {
  for (const Polygon& clipper : {kSquare, Polygon()}) {
    const int news = memory.news;
    Polygon result;
    M_PolyPolyClip2D(&clipper, &kSquare, &result);
    result.assign(1, {9, 9, 9, 9});
    const int blocks = memory.blocks;
    for (int allocations = memory.news - news; allocations > 0; --allocations) {
      memory.newToFail = allocations;
      EXPECT_THROW(M_PolyPolyClip2D(&clipper, &kSquare, &result), std::bad_alloc);
      EXPECT_TRUE(memory.blocks == blocks && result.size() == 1 && result[0].x == 9);
    }
  }
}

}  // namespace
