#include "Law.h"

namespace {

using Poly3 = M_TransformPoly3D;
using Edge = std::pair<V2, V2>;

double DrawDepth() {
  return *rc::gen::oneOf(operands::Reals(), operands::Near(rc::gen::element(0.1, -0.5, 0.0)));
}

// With whatever flags and crossings, with an outline of these or without.
Poly3 DrawQuad(bool isOutlined) {
  Poly3 poly;
  Check(poly.IsVisible() && poly.NumPolyPoints() == 0 && !poly.polyPointsValid);
  for (V3& p : poly.points) p = {*operands::Reals(), *operands::Reals(), DrawDepth()};
  for (V3& p : poly.clipPoints) p = {*operands::Reals(), *operands::Reals(), 7};
  for (unsigned char& flag : poly.clipped) flag = *rc::gen::element<unsigned char>(0, 0, 0, 1, 2);
  if (isOutlined) poly.InitPolyPoints();
  return poly;
}

// What there is of a quad, to be compared as a whole.
std::string StateOf(const Poly3& poly) {
  std::string state = BitsOf(poly.points) + BitsOf(poly.clipPoints) + BitsOf(poly.clipped);
  for (const V2& p : poly.polyPoints) state += BitsOf(p);
  return state + (poly.polyPointsValid ? 'v' : '-');
}

// A first or second row that is zero, by the square of its length, clears the flags and no more.
TEST(PolyScreen, EdgesAreCutAndTransformed) {
  Holds([](bool isOutlined) {
    Poly3 eye = DrawQuad(isOutlined), screen = eye, single = eye, cut = eye, onScreen = eye;
    const int row = *rc::gen::inRange(0, 4), next = (row + 1) % 4;
    M_Clip3DLine(&eye.points[row], &eye.points[next], &cut.clipped[row], &cut.clipped[next],
                 &cut.clipPoints[row]);
    single.ClipEdgeToScreen(row);
    Equal(StateOf(single), StateOf(cut));
    M_Matrix4 m = {{{2, 0, 0, 0}, {0, 3, 0, 0}, {0, 0, 1, 1}, {1, 2, 0, 1}}};
    const bool isOne = *rc::gen::inRange(0, 4) == 0;
    const double element = isOne ? 1 : *operands::Near(rc::gen::element(1e-6, -1e-6, 0.0, 2e-6));
    std::fill(m.m[row], m.m[row] + 4, 0.0);
    m.m[row][*rc::gen::inRange(0, 4)] = element;
    if (isOne) m.m[row][*rc::gen::inRange(0, 4)] = element;
    Poly3 inEye = eye;
    if (row < 2 && element * element < 1e-12) {
      for (Poly3* each : {&inEye, &onScreen}) std::fill(each->clipped, each->clipped + 4, 0);
    } else {
      for (int edge = 0; edge < 4; ++edge) onScreen.ClipEdgeToScreen(edge);
      for (V3* four : {inEye.points, onScreen.points, onScreen.clipPoints})
        M_Transform3DFloatPoints(&m, 4, four);
      onScreen.InvalidatePolyPoints();
    }
    eye.TransformPointsToEye(m);
    Equal(StateOf(eye), StateOf(inEye));
    screen.TransformPointsToScreen(m);
    Equal(StateOf(screen), StateOf(onScreen));
  });
}

double Distance(const V2& p, const Edge& edge) {
  const auto& [a, b] = edge;
  double distance;
  unsigned char isBeside;
  M_PerpDistTo2DLine(&p, &a, &b, &isBeside, &distance);
  return isBeside ? distance
                  : std::min(std::hypot(p.x - a.x, p.y - a.y), std::hypot(p.x - b.x, p.y - b.y));
}

TEST(PolyScreen, WhatIsSeenFollowsFromTheFlags) {
  Holds([](Real x, Real y, Digit tolerance) {
    const V2 p = {x, y};
    Poly3 poly = DrawQuad(false);
    M_TransformPoly2D flat;
    V2 outline[8] = {}, made[8] = {};
    int count = 0;
    double least = kInf;
    const auto onScreen = [](const V3& point) { return V2{point.x, point.y}; };
    for (int i = 0; i < 4; ++i) {
      const int next = (i + 1) % 4;
      const bool isThis = poly.clipped[i], isNext = poly.clipped[next], isSeen = !isThis || !isNext;
      const V2 a = onScreen(poly.points[i]), b = onScreen(poly.points[next]),
               crossing = onScreen(poly.clipPoints[i]);
      const Edge none = {{7, 7}, {8, 8}}, edge = {isThis ? crossing : a, isNext ? crossing : b};
      Edge part = none;
      Equal(poly.GetEdge(i, &part), isSeen);
      Equal(BitsOf(part), BitsOf(isSeen ? edge : none));
      flat.points[i] = {9, 9};
      Equal(poly.GetPoint(i, &flat.points[i]), !isThis);
      Equal(BitsOf(flat.points[i]), BitsOf(isThis ? V2{9, 9} : a));
      flat.points[i] = a;
      if (!isSeen) continue;
      least = std::min(least, Distance(p, edge));
      outline[count++] = edge.first;
      if (isNext) outline[count++] = edge.second;
    }
    Equal(poly.IsVisible(), (count > 0));
    Check(IsNear(poly.GetMinimumEdgeDistance(&p), count > 0 ? least : -1));
    Check(!poly.IsPointInside(&p, 100) && memory.trackedBlocks == 0);
    poly.InitPolyPoints();
    poly.InitPolyPoints();
    // One block of the host's for eight points.
    Check(poly.polyPointsValid && memory.trackedBlocks == 1 && memory.trackedBytes == 128);
    Equal(poly.NumPolyPoints(), count);
    for (int i = 0; i < poly.NumPolyPoints(); ++i) poly.GetPolyPoint(i, &made[i]);
    Equal(BitsOf(made), BitsOf(outline));
    unsigned char inside = 9;
    M_IsFloatPointInConcavePoly(&p, made, poly.NumPolyPoints(), tolerance * 1.0, &inside);
    Equal(poly.IsPointInside(&p, tolerance), (inside == 1));
    std::fill(poly.clipped, poly.clipped + 4, 1);
    Check(!poly.IsPointInside(&p, 1e9) && poly.GetMinimumEdgeDistance(&p) == -1);
    poly.InvalidatePolyPoints();
    Check(!poly.polyPointsValid && poly.polyPoints.empty() && memory.trackedBlocks == 1);
    // A quad in the plane is one of which nothing is clipped.
    std::fill(poly.clipped, poly.clipped + 4, 0);
    poly.InitPolyPoints();
    Equal(flat.IsPointInside(&p, tolerance), poly.IsPointInside(&p, tolerance));
    flat.visible = false;
    Check(!flat.IsPointInside(&p, 1e9) &&
          flat.GetMinimumEdgeDistance(&p) == poly.GetMinimumEdgeDistance(&p));
    // No memory for an outline that long.
    poly.polyPoints.resize(65);
    memory.newToFail = 1;
    Equal(Thrown([&] { poly.IsPointInside(&p, 0); }), "79 | exception std::bad_alloc");
  });
}

TEST(PolyScreen, SinglePoints) {
  Holds([](Digit kind, const M_Matrix3& first, const M_Matrix3& toScreen, Real x, Real y) {
    V2 flat = {x, y}, moved = flat;
    M_Matrix3 both = first;
    M_ConcatMatrix(&toScreen, &both);
    M_TransformFloatPoints(&both, 1, &moved);
    Check(M_TransformPoint2DtoScreen(first, toScreen, &flat) && BitsOf(flat) == BitsOf(moved));
    // In space: divided in the eye, dropped before 0.1, and divided on the screen.
    M_Matrix4 toEye = *operands::Of<M_Matrix4>(), projection = *operands::Of<M_Matrix4>(), all;
    if (kind > 0) {
      toEye = {{{2, 0, 0, 0}, {0, 3, 0, 0}, {0, 0, 1, 0}, {1, 2, 0, 1}}};
      projection = {{{1, 0, 0, 0}, {0, 1, 0, 0}, {0, 0, 1, kind == 1 ? 0.0 : 1.0}, {0, 0, 0, 0}}};
    }
    const double z = DrawDepth();
    V3 expected = {x, y, z};
    bool isSeen = false;
    const std::string thrown = Thrown([&] {
      V4 p = {x, y, z, 1};
      toEye.TransformPointAndDivide(&p);
      if (p.z < 0.1) return;
      M_Matrix3ToMatrix4(&toScreen, &all);
      M_ConcatMatrix4(&projection, &all, &all);
      all.TransformPointAndDivide(&p);
      expected = {p.x, p.y, p.z};
      isSeen = true;
    });
    const auto test = [&](auto p, const auto& transformed) {
      bool result = false;
      const auto call = [&] {
        result = M_TransformPoint3DtoScreen(toEye, projection, toScreen, &p);
      };
      Equal(Thrown(call), thrown);
      Check(result == isSeen && BitsOf(p) == BitsOf(transformed));
    };
    test(V3{x, y, z}, expected);
    if (z == 0) test(V2{x, y}, V2{expected.x, expected.y});
  });
}

}  // namespace
