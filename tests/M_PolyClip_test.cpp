#include "Law.h"

namespace {

using Polygon = std::vector<V4>;

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

// A quadrilateral about the middle, or a triangle, which carries where its points are.
Polygon Draw(int count, double size) {
  Polygon polygon;
  for (int i = 0; i < count; ++i) {
    const double angle = (i + *rc::gen::inRange(0, 8) / 10.0) * 6.283185307179586 / count,
                 r = size * (1 + *rc::gen::inRange(0, 9) / 8.0);
    const double x = r * std::cos(angle), y = r * std::sin(angle);
    polygon.push_back({x, y, x, y});
  }
  return polygon;
}

TEST(PolyClip, PartsAddUp) {
  Holds([](Real a, Real b, bool isReversed) {
    const Polygon subject = Draw(*rc::gen::inRange(3, 9), 2);
    // Two halves of a large square, cut anywhere.
    double sum = 0;
    for (const double side : {-50.0, 50.0}) {
      Polygon half = {{a, -50, 0, 0}, {b, 50, 0, 0}, {side, 50, 0, 0}, {side, -50, 0, 0}};
      if (isReversed) std::reverse(half.begin(), half.end());
      const Polygon result = Clip(half, subject);
      sum += Area(result);
      for (const V4& p : result) {
        // What was carried along lies where the point does.
        Check(IsNear(p.z, p.x) && IsNear(p.w, p.y));
        const double edge = a + (b - a) * (p.y + 50) / 100;
        Check(side < 0 ? p.x <= edge + 1e-6 : p.x >= edge - 1e-6);
      }
    }
    Check(IsNear(sum, Area(subject), 1e-6L));
  });
}

// By a convex clipper, whichever way it runs: a point is in the result where it is in both.
TEST(PolyClip, IsWhatIsInBoth) {
  Holds([](Real x, Real y, Digit dx, Digit dy) {
    Polygon clipper = {{1, 0, 0, 0}, {0, 1, 0, 0}, {-1, 0, 0, 0}, {0, -1, 0, 0}},
            subject = Draw(5, 0.7);
    for (V4& p : clipper) p = {p.x * 1.5 + dx / 9.0, p.y * 1.25 + dy / 9.0, kNan, kNan};
    std::rotate(clipper.begin(), clipper.begin() + *rc::gen::inRange(0, 4), clipper.end());
    const Polygon result = Clip(clipper, subject), given = clipper;
    std::reverse(clipper.begin(), clipper.end());
    Check(IsNear(Area(Clip(clipper, subject)), Area(result)));
    const auto isIn = [&](const Polygon& polygon) {
      std::vector<V2> flat;
      for (const V4& p : polygon) flat.push_back({p.x, p.y});
      const V2 p = {x / 5, y / 5};
      unsigned char inside = 0, near = 0;
      M_IsFloatPointInConcavePoly(&p, flat.data(), static_cast<int32_t>(flat.size()), 0, &inside);
      M_IsFloatPointInConcavePoly(&p, flat.data(), static_cast<int32_t>(flat.size()), 1e-5, &near);
      RC_PRE(near == inside);
      return inside;
    };
    const unsigned char inClipper = isIn(given), inSubject = isIn(subject);
    Equal(isIn(result), (inClipper && inSubject));
    // In each of the others' place.
    Polygon place = given;
    M_PolyPolyClip2D(&place, &subject, &place);
    Check(place.size() == result.size() && Area(place) == Area(result));
    M_PolyPolyClip2D(&given, &subject, &subject);
    Check(subject.size() == result.size() && Area(subject) == Area(result));
  });
}

// Also where both neighbours are on one side of the line, one of them too close to it to be inside.
TEST(PolyClip, NewPointsCarryWhatLiesBetween) {
  Holds([](int16_t kind) {
    const auto unit = rc::gen::map(operands::Bits(), [](uint32_t w) { return w * 0x1p-31 - 1; });
    Polygon subject;
    for (int i = 0; i < 5; ++i) {
      const double inwards = 1e-6 * (1 + *unit * 1e-3);
      subject.push_back({0.5 + *unit, 0.5 + *unit, *unit, 0.5});
      (kind & 1 ? subject.back().x : subject.back().y) = kind & 2 ? inwards : 1 - inwards;
    }
    for (const V4& p : Clip({{0, 0, 0, 0}, {1, 0, 0, 0}, {1, 1, 0, 0}, {0, 1, 0, 0}}, subject)) {
      Check(std::abs(p.z) <= 1 && p.w == 0.5);
    }
  });
}

TEST(PolyClip, Limits) {
  const Polygon square = {{0, 0, 0, 0}, {4, 0, 0, 0}, {4, 4, 0, 0}, {0, 4, 0, 0}};
  const Polygon inside = {{1, 1, 7, 8}, {2, 1, 7, 8}, {1, 2, 9, 9}};
  const auto text = [](const Polygon& p) { return rc::toString(p); };
  EXPECT_EQ(text(Clip(square, inside)), text(inside));
  EXPECT_EQ(text(Clip({}, {{1, 2, 3, 4}})), text({{1, 2, 3, 4}}));
  EXPECT_EQ(text(Clip(square, {{1, 1, 0, 0}, {2, 2, 0, 0}})), "[]");
  // Clippers without an inside.
  EXPECT_EQ(text(Clip({{1, 1, 0, 0}}, square)), "[]");
  EXPECT_EQ(text(Clip({{1, 1, 0, 0}, {3, 3, 0, 0}}, square)), "[]");
  EXPECT_EQ(text(Clip({{-9, -9, 0, 0}, {9, -9, 0, 0}, {9, -9, 0, 0}, {9, 9, 0, 0}}, square)), "[]");
  // What lies on a side is outside, and replaced by crossings there; 1e-6 of its measure inside,
  // too.
  const Polygon onSide = {{0, 1, 5, 1}, {2, 1, 5, 1}, {2, 2, 5, 1}};
  EXPECT_EQ(Clip(square, onSide).size(), 4u);
  for (const auto& [x, isIn] : {std::pair(0.25e-6, false), {0.26e-6, true}}) {
    Polygon near = onSide;
    near[0].x = x;
    EXPECT_EQ(text(Clip(square, near)) == text(near), isIn) << x;
  }
  // Parallel within 1e-12: the point before stands for the crossing.
  const Polygon along = {{1, 0.25e-6, 1, 0}, {2, 0.25000005e-6, 2, 0}, {2, 3, 3, 0}};
  EXPECT_EQ(Clip(square, along).size(), 4u);
  // So small that it is turned round, or not.
  for (const auto& [size, count] : {std::pair(1.2e-3, 0u), {2e-3, 4u}}) {
    const Polygon small = {{0, 0, 0, 0}, {0, size, 0, 0}, {size, size, 0, 0}, {size, 0, 0, 0}};
    EXPECT_EQ(Clip(small, square).size(), count) << size;
  }
}

// Whichever allocation fails, what there was is still there, and nothing is lost.
TEST(PolyClip, FailedAllocationsChangeNothing) {
  const Polygon square = {{0, 0, 0, 0}, {4, 0, 0, 0}, {4, 4, 0, 0}, {0, 4, 0, 0}}, none;
  for (const Polygon* clipper : {&square, &none}) {
    bool fails = true;
    for (int allocation = 1; fails; ++allocation) {
      Polygon result = {{9, 9, 9, 9}};
      const int blocks = memory.blocks;
      memory.newToFail = allocation;
      try {
        M_PolyPolyClip2D(clipper, &square, &result);
        fails = false;
        EXPECT_GT(allocation, 1);
      } catch (const std::bad_alloc&) {
        EXPECT_TRUE(memory.blocks == blocks && result.size() == 1 && result[0].x == 9);
      }
      memory.newToFail = 0;
    }
  }
}

}  // namespace
