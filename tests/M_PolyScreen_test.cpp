#include <cstring>

#include "Law.h"

namespace {

using Poly3 = M_TransformPoly3D;

// What there is of a quad, to be compared as a whole.
std::string StateOf(const Poly3& poly) {
  std::string state;
  for (const V3& p : poly.points) state += BitsOf(p);
  for (const V3& p : poly.clipPoints) state += BitsOf(p);
  state.append(reinterpret_cast<const char*>(poly.clipped), 4);
  for (const V2& p : poly.polyPoints) state += BitsOf(p);
  return state + (poly.polyPointsValid ? 'v' : '-');
}

Poly3 DrawQuad() {
  Poly3 poly;
  for (V3& p : poly.points) {
    p = {*operands::Reals(), *operands::Reals(),
         *rc::gen::oneOf(operands::Reals(), operands::Near(rc::gen::element(0.1, -0.5, 0.5)))};
  }
  for (V3& p : poly.clipPoints) p = {7, 7, 7};
  return poly;
}

const M_Matrix4 kFlat = {{{2, 0, 0, 0}, {0, 3, 0, 0}, {0, 0, 1, 1}, {1, 2, 0, 1}}};

// The corners and crossings of a polygon cut at z = 0.1, carried to the screen by a matrix.
struct Outline {
  std::vector<V2> points;
  std::vector<std::pair<V2, V2>> edges;
  bool isClipped[4];
};
Outline Cut(const V3* corners, const M_Matrix4& toScreen) {
  Outline outline;
  const auto onScreen = [&](V3 p) {
    M_Transform3DFloatPoints(&toScreen, 1, &p);
    return V2{p.x, p.y};
  };
  for (int i = 0; i < 4; ++i) {
    const V3 &a = corners[i], &b = corners[(i + 1) % 4];
    outline.isClipped[i] = a.z < 0.1;
    if (a.z < 0.1 && b.z < 0.1) continue;
    unsigned char flags[2];
    V3 crossing;
    M_Clip3DLine(&a, &b, &flags[0], &flags[1], &crossing);
    const V2 start = onScreen(flags[0] ? crossing : a), end = onScreen(flags[1] ? crossing : b);
    outline.edges.emplace_back(start, end);
    outline.points.push_back(start);
    if (flags[1]) outline.points.push_back(end);
  }
  return outline;
}

double Distance(const V2& p, const std::vector<std::pair<V2, V2>>& edges) {
  double least = -1;
  for (const auto& [a, b] : edges) {
    double distance;
    unsigned char on;
    M_PerpDistTo2DLine(&p, &a, &b, &on, &distance);
    if (!on) {
      distance = std::min(std::sqrt((p.x - a.x) * (p.x - a.x) + (p.y - a.y) * (p.y - a.y)),
                          std::sqrt((p.x - b.x) * (p.x - b.x) + (p.y - b.y) * (p.y - b.y)));
    }
    if (least < 0 || distance < least) least = distance;
  }
  return least;
}

TEST(PolyScreen, QuadsAreCutAtTheNearPlane) {
  Holds([](Real x, Real y, bool isTransformed) {
    Poly3 poly = DrawQuad();
    const M_Matrix4 toEye =
        isTransformed ? kFlat : M_Matrix4{{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 0}, {0, 0, 0, 1}}};
    Check(poly.IsVisible() && poly.NumPolyPoints() == 0 && !poly.polyPointsValid);
    V3 corners[4];
    std::copy(poly.points, poly.points + 4, corners);
    M_Transform3DFloatPoints(&toEye, 4, corners);
    poly.polyPoints.push_back({1, 1});
    poly.polyPointsValid = true;
    poly.TransformPointsToEye(toEye);
    Equal(std::memcmp(poly.points, corners, sizeof corners), 0);
    // Neither the flags nor the outline follow.
    Check(poly.polyPointsValid && poly.NumPolyPoints() == 1 && poly.IsVisible() &&
          poly.clipPoints[2].x == 7);
    poly.TransformPointsToScreen(kFlat);
    Check(!poly.polyPointsValid && poly.polyPoints.empty());
    const Outline outline = Cut(corners, kFlat);
    const V2 p = {x, y};
    Check(!poly.IsPointInside(&p, 100));
    V3 origin = {0, 0, 0};
    M_Transform3DFloatPoints(&kFlat, 1, &origin);
    M_Transform3DFloatPoints(&kFlat, 4, corners);
    Equal(std::memcmp(poly.points, corners, sizeof corners), 0);
    size_t edge = 0;
    for (int i = 0; i < 4; ++i) {
      const bool isThis = outline.isClipped[i], isNext = outline.isClipped[(i + 1) % 4];
      Equal(poly.clipped[i], isThis);
      if (isThis == isNext) Equal(BitsOf(poly.clipPoints[i]), BitsOf(origin));
      V2 corner = {7, 7};
      Equal(poly.GetPoint(i, &corner), !isThis);
      Equal(BitsOf(corner), BitsOf(isThis ? V2{7, 7} : V2{corners[i].x, corners[i].y}));
      std::pair<V2, V2> part = {{7, 7}, {7, 7}};
      Equal(poly.GetEdge(i, &part), !(isThis && isNext));
      const auto expected =
          isThis && isNext ? std::pair<V2, V2>{{7, 7}, {7, 7}} : outline.edges[edge++];
      Check(BitsOf(part.first) == BitsOf(expected.first) &&
            BitsOf(part.second) == BitsOf(expected.second));
    }
    Equal(poly.IsVisible(), !outline.edges.empty());
    Equal(poly.GetMinimumEdgeDistance(&p), Distance(p, outline.edges));
    for (int i = 0; i < 2; ++i) {
      poly.InitPolyPoints();
      Check(poly.polyPointsValid &&
            poly.NumPolyPoints() == static_cast<int>(outline.points.size()));
      for (int k = 0; k < poly.NumPolyPoints(); ++k) {
        V2 q;
        poly.GetPolyPoint(k, &q);
        Equal(BitsOf(q), BitsOf(outline.points[static_cast<size_t>(k)]));
      }
    }
    for (const double tolerance : {0.0, 1.5}) {
      unsigned char inside = 0;
      M_IsFloatPointInConcavePoly(&p, outline.points.data(), poly.NumPolyPoints(), tolerance,
                                  &inside);
      Equal(poly.IsPointInside(&p, tolerance), (inside != 0));
      std::fill(poly.clipped, poly.clipped + 4, 1);
      Check(!poly.IsPointInside(&p, 1e9) && poly.GetMinimumEdgeDistance(&p) == -1);
      for (int k = 0; k < 4; ++k) poly.clipped[k] = outline.isClipped[k];
    }
    poly.InvalidatePolyPoints();
    Check(!poly.polyPointsValid && poly.polyPoints.empty() && poly.polyPoints.capacity() == 8);
  });
}

// A first or second row that is zero, by the square of its length, clears the flags and no more.
TEST(PolyScreen, DegenerateMatrices) {
  Holds([](bool isOutlined) {
    Poly3 poly = DrawQuad();
    poly.TransformPointsToScreen(kFlat);
    if (isOutlined) poly.InitPolyPoints();
    const int row = *rc::gen::inRange(0, 4), column = *rc::gen::inRange(0, 4);
    M_Matrix4 m = kFlat;
    std::fill(m.m[row], m.m[row] + 4, 0.0);
    m.m[row][column] = *operands::Near(rc::gen::element(1e-6, -1e-6, 0.0, 2e-6));
    const double square = m.m[row][column] * m.m[row][column];
    const bool isDegenerate = row < 2 && square < 1e-12;
    for (const auto transform : {&Poly3::TransformPointsToEye, &Poly3::TransformPointsToScreen}) {
      Poly3 moved = poly, cleared = poly;
      std::fill(cleared.clipped, cleared.clipped + 4, 0);
      (moved.*transform)(m);
      Equal((StateOf(moved) == StateOf(cleared)), isDegenerate);
    }
  });
}

TEST(PolyScreen, SingleEdges) {
  Holds([](int16_t number) {
    Poly3 poly = DrawQuad();
    poly.InitPolyPoints();
    for (unsigned char& flag : poly.clipped) flag = number & 4;
    Poly3 expected = poly;
    const int edge = number & 3, next = (edge + 1) % 4;
    V3 crossing;
    M_Clip3DLine(&poly.points[edge], &poly.points[next], &expected.clipped[edge],
                 &expected.clipped[next], &crossing);
    expected.clipPoints[edge] = crossing;
    poly.ClipEdgeToScreen(edge);
    Equal(StateOf(poly), StateOf(expected));
  });
}

TEST(PolyScreen, QuadsOnTheScreen) {
  EXPECT_TRUE(M_TransformPoly2D().visible);
  Holds([](Real x, Real y) {
    M_TransformPoly2D poly;
    std::vector<std::pair<V2, V2>> edges;
    for (V2& p : poly.points) p = {*operands::Reals(), *operands::Reals()};
    for (int i = 0; i < 4; ++i) edges.emplace_back(poly.points[i], poly.points[(i + 1) % 4]);
    const V2 p = {x, y};
    Equal(poly.GetMinimumEdgeDistance(&p), Distance(p, edges));
    for (const double tolerance : {0.0, 2.0}) {
      unsigned char inside;
      M_IsFloatPointInConcavePoly(&p, poly.points, 4, tolerance, &inside);
      Equal(poly.IsPointInside(&p, tolerance), (inside != 0));
    }
    poly.visible = false;
    Check(!poly.IsPointInside(&p, 1e9) && poly.GetMinimumEdgeDistance(&p) >= 0);
  });
}

TEST(PolyScreen, SinglePoints) {
  Holds([](const M_Matrix3& a, const M_Matrix3& b, Real x, Real y) {
    V2 p = {x, y}, q = p;
    M_Matrix3 both = a;
    M_ConcatMatrix(&b, &both);
    M_TransformFloatPoints(&both, 1, &q);
    Check(M_TransformPoint2DtoScreen(a, b, &p));
    Equal(BitsOf(p), BitsOf(q));
    // In space: divided in the eye, dropped before 0.1, and divided on the screen.
    M_Matrix4 toEye = *operands::Of<M_Matrix4>(), projection = *operands::Of<M_Matrix4>(), combined;
    if (*operands::Of<Digit>() > 0) {
      toEye = kFlat;
      toEye.m[2][3] = 0;
      projection = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, 1}, {0, 0, 0, 0}}};
    }
    const V3 given = {
        x, y, *rc::gen::oneOf(operands::Reals(), operands::Near(rc::gen::element(0.1, 0.0)))};
    for (const bool isFlat : {false, true}) {
      V4 e = {x, y, isFlat ? 0 : given.z, 1};
      bool isSeen = true;
      const std::string thrown = Thrown([&] {
        toEye.TransformPointAndDivide(&e);
        isSeen = !(e.z < 0.1);
        if (!isSeen) return;
        M_Matrix3ToMatrix4(&b, &combined);
        M_ConcatMatrix4(&projection, &combined, &combined);
        combined.TransformPointAndDivide(&e);
      });
      V3 moved = given;
      V2 flat = {x, y};
      bool result = !isSeen;
      Equal(Thrown([&] {
              result = isFlat ? M_TransformPoint3DtoScreen(toEye, projection, b, &flat)
                              : M_TransformPoint3DtoScreen(toEye, projection, b, &moved);
            }),
            thrown);
      if (thrown != "0") continue;
      Equal(result, isSeen);
      if (isFlat) Equal(BitsOf(flat), BitsOf(isSeen ? V2{e.x, e.y} : V2{x, y}));
      if (!isFlat) Equal(BitsOf(moved), BitsOf(isSeen ? V3{e.x, e.y, e.z} : given));
    }
  });
}

// The outline is the host's memory: one block for eight points.
TEST(PolyScreen, OutlinesAreTrackedMemory) {
  {
    Poly3 poly, other;
    for (V3& p : poly.points) p = {0, 0, 1};
    for (V3& p : other.points) p = {0, 0, 1};
    EXPECT_EQ(memory.trackedBlocks, 0);
    for (int i = 0; i < 3; ++i) {
      poly.InitPolyPoints();
      EXPECT_EQ(memory.trackedBlocks, 1);
      EXPECT_EQ(memory.trackedBytes, 128u);
      poly.InvalidatePolyPoints();
    }
    other.polyPoints.push_back({1, 1});
    other.InitPolyPoints();
    EXPECT_EQ(memory.trackedBytes, 128u);
    EXPECT_EQ(memory.trackedBlocks, 2);
  }
  EXPECT_EQ(memory.trackedBlocks, 0);
}

}  // namespace
