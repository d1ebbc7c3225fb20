// Polygons, hulls, and quads on their way to the screen.

#include "Call.h"
#include "Mp_Hull.h"
#include "U.h"
#include "qelcore/geom/PointT.h"

namespace {

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;
using F2 = M_Vector2T<float>;
using PointF = qelcore::geom::PointT<float>;

// TOLERANCE POINT POLYGON, for double and, with the same coordinates, for float; reversed and begun
// elsewhere, too.
std::string PointInPoly(Arguments& in) {
  const double tolerance = in.Double();
  const auto point = Read<V2>(in);
  std::vector<V2> poly = ReadAll<V2>(in);
  const auto count = static_cast<int32_t>(poly.size());
  unsigned char inside = 9, inFloat = 9;
  const int32_t code = M_IsFloatPointInConcavePoly(&point, poly.data(), count, tolerance, &inside);
  std::vector<F2> floats;
  for (const V2& p : poly) floats.push_back({static_cast<float>(p.x), static_cast<float>(p.y)});
  const F2 f = {static_cast<float>(point.x), static_cast<float>(point.y)};
  EXPECT_EQ(M_IsFloatPointInConcavePoly(&f, floats.data(), count, tolerance, &inFloat), code);
  for (size_t turn = 0; turn < 2 * poly.size(); ++turn) {
    std::rotate(poly.begin(), poly.begin() + 1, poly.end());
    if (turn == poly.size()) std::reverse(poly.begin(), poly.end());
    unsigned char other = 9;
    M_IsFloatPointInConcavePoly(&point, poly.data(), count, tolerance, &other);
    EXPECT_EQ(other, inside) << turn;
  }
  if (count == 4 && tolerance == 0) {
    unsigned char inQuad = 9;
    EXPECT_EQ(M_IsFloatPointInQuad(&point, poly.data(), &inQuad), code);
    EXPECT_EQ(inQuad, inside);
  }
  return Text(inside, inFloat).append(Outcome(code));
}

std::string Area(Arguments& in) {
  const std::vector<V2> poly = ReadAll<V2>(in);
  return Text(NumberText(M_SignedPolygonArea2D(poly.data(), static_cast<int32_t>(poly.size()))));
}

// MATRIX Z_AXIS TOLERANCE CORNERS
std::string EdgeOn(Arguments& in) {
  const auto m = ReadMatrix<M_Matrix4>(in);
  const auto useZAxis = static_cast<unsigned char>(in.Int());
  const double tolerance = in.Double();
  const std::vector<V3> corners = ReadAll<V3>(in);
  unsigned char isEdgeOn = 9;
  const int32_t code = M_IsQuadEdgeOn(&m, corners.data(), useZAxis, &isEdgeOn, tolerance);
  return Text(isEdgeOn).append(Outcome(code));
}

// Two polygons with a "|" between them; the result in its own vector, and in each argument.
std::string Clip(Arguments& in) {
  std::array<std::vector<V4>, 3> polygons;
  for (size_t i = 0; !in.IsEmpty();) {
    Arguments rest = in;
    if (rest.Word() == "|") {
      in = rest;
      ++i;
    } else {
      polygons[i].push_back(Read<V4>(in));
    }
  }
  polygons[2] = {{9, 9, 9, 9}};
  std::string text;
  for (const size_t place : {size_t{2}, size_t{1}, size_t{0}}) {
    auto all = polygons;
    M_PolyPolyClip2D(&all[0], &all[1], &all[place]);
    const std::string result = TextOfAll(all[place]);
    if (place == 2) text = result.empty() ? " nothing" : result;
    EXPECT_EQ(result, place == 2 ? result : text == " nothing" ? "" : text);
  }
  return text;
}

template <class T>
std::string HullOf(const std::vector<T>& points) {
  std::vector<T> hull(1), other = points;
  M_ComputeConvexHull(points.begin(), points.end(), hull);
  const T* const data = other.data();
  M_ComputeConvexHull(data, data + other.size(), other);
  std::string text, same;
  for (const T& p : hull) text += Text(List(std::array{p.x, p.y}));
  for (const T& p : other) same += Text(List(std::array{p.x, p.y}));
  EXPECT_EQ(same, text);
  return text;
}

// In all types of points; components beyond x and y are 0.
std::string Hull(Arguments& in) {
  const std::vector<V2> points = ReadAll<V2>(in);
  std::vector<V3> threes;
  std::vector<V4> fours, hull;
  std::vector<PointF> floats;
  for (const V2& p : points) {
    threes.push_back({p.x, p.y, 7});
    fours.push_back({p.x, p.y, 7, 8});
    floats.push_back({static_cast<float>(p.x), static_cast<float>(p.y)});
  }
  const std::string text = HullOf(points);
  EXPECT_EQ(HullOf(threes), text);
  EXPECT_EQ(HullOf(fours), text);
  EXPECT_EQ(HullOf(floats), text);
  M_ComputeConvexHull(fours.cbegin(), fours.cend(), hull);
  for (const V4& p : hull) EXPECT_EQ(p.z + p.w, points.size() > 3 ? 0 : 15);
  return text.empty() ? " nothing" : text;
}

std::string Convex(Arguments& in) {
  const std::vector<V2> points = ReadAll<V2>(in);
  std::vector<V3> threes;
  std::vector<V4> fours;
  for (const V2& p : points) {
    threes.push_back({p.x, p.y, static_cast<double>(threes.size())});
    fours.push_back({p.x, p.y, 0, static_cast<double>(fours.size() % 2)});
  }
  const bool isConvex = M_IsConvex(points.begin(), points.end());
  EXPECT_EQ(M_IsConvex(threes.cbegin(), threes.cend()), isConvex);
  EXPECT_EQ(M_IsConvex(fours.cbegin(), fours.cend()), isConvex);
  const V2* const data = points.data();
  EXPECT_EQ(M_IsConvex(data, data + points.size()), isConvex);
  return Text(isConvex);
}

std::string AngleOrder(Arguments& in) {
  const auto point = [&] { return M_LongPoint{in.Int(), in.Int()}; };
  const Mp_CompareAngleAndDist isBefore(point());
  const M_LongPoint a = point(), b = point();
  return Text(isBefore(a, b), isBefore(b, a));
}

// A quad that the lines of a story work on.
M_TransformPoly3D* quad = nullptr;

std::string QuadState() {
  std::string text;
  for (const V3& p : quad->points) text += Text(p);
  return text += Text(quad->clipped[0], quad->clipped[1], quad->clipped[2], quad->clipped[3]);
}

const Operation kNewQuad("NewQuad", [](Arguments& in) {
  delete quad;
  quad = new M_TransformPoly3D;
  EXPECT_EQ(quad->polyPoints.capacity(), 0u);
  EXPECT_FALSE(quad->polyPointsValid);
  for (unsigned char flag : quad->clipped) EXPECT_EQ(flag, 0);
  for (size_t seen = 0; seen < 4; ++seen) {
    for (size_t i = 0; i < 4; ++i) quad->clipped[i] = i != seen;
    EXPECT_TRUE(quad->IsVisible());
  }
  std::fill_n(quad->clipped, 4, 0);
  if (in.IsEmpty()) delete std::exchange(quad, nullptr);
  for (size_t i = 0; quad && i < 4; ++i) quad->points[i] = Read<V3>(in);
  return Outcome(0);
});

const Operation kToEye("ToEye", [](Arguments& in) {
  quad->TransformPointsToEye(ReadMatrix<M_Matrix4>(in));
  return QuadState();
});

const Operation kToScreen("ToScreen", [](Arguments& in) {
  quad->TransformPointsToScreen(ReadMatrix<M_Matrix4>(in));
  return QuadState();
});

const Operation kClipEdge("ClipEdge", [](Arguments& in) {
  const int edge = in.Int();
  quad->ClipEdgeToScreen(edge);
  return Text(quad->clipPoints[edge]).append(QuadState());
});

const Operation kCrossings("Crossings", [](Arguments&) { return TextOfAll(quad->clipPoints); });

const Operation kInvalidate("Invalidate", [](Arguments&) {
  quad->InvalidatePolyPoints();
  return Text(quad->NumPolyPoints(), static_cast<int>(quad->polyPoints.capacity()),
              quad->polyPointsValid);
});

const Operation kInit("InitPolyPoints", [](Arguments&) {
  quad->InitPolyPoints();
  EXPECT_TRUE(quad->polyPointsValid);
  EXPECT_EQ(quad->polyPoints.capacity(), 8u);
  return Text(quad->NumPolyPoints());
});

const Operation kOutline("Outline", [](Arguments&) {
  std::string text = Text(quad->IsVisible(), quad->NumPolyPoints());
  for (int i = 0; i < quad->NumPolyPoints(); ++i) {
    V2 p;
    quad->GetPolyPoint(i, &p);
    text += Text(p);
  }
  return text;
});

const Operation kEdges("Edges", [](Arguments&) {
  std::string text;
  for (int i = 0; i < 4; ++i) {
    std::pair<V2, V2> edge = {{77, 77}, {77, 77}};
    const bool isSeen = quad->GetEdge(i, &edge);
    EXPECT_EQ(edge.first.x == 77 && edge.second.y == 77, !isSeen);
    text += isSeen ? Text(edge.first, "-", edge.second) : " none";
  }
  return text;
});

const Operation kCorners("Corners", [](Arguments&) {
  std::string text;
  for (int i = 0; i < 4; ++i) {
    V2 p = {77, 77};
    const bool isSeen = quad->GetPoint(i, &p);
    text += isSeen ? Text(p) : " none";
    EXPECT_EQ(p.x == 77, !isSeen);
  }
  return text;
});

const Operation kHit("Hit", [](Arguments& in) {
  const double tolerance = in.Double();
  const auto point = Read<V2>(in);
  const double distance = quad->GetMinimumEdgeDistance(&point);
  EXPECT_EQ(M_GetMinimumEdgeDistance(&point, *quad), distance);
  return Text(quad->IsPointInside(&point, tolerance), NumberText(distance));
});

// TOLERANCE POINT CORNERS = inside, the distance of the nearest edge
const Operation kHit2D("Hit2D", [](Arguments& in) {
  const double tolerance = in.Double();
  const auto point = Read<V2>(in);
  M_TransformPoly2D poly;
  for (V2& corner : poly.points) corner = Read<V2>(in);
  const bool isInside = poly.IsPointInside(&point, tolerance);
  poly.visible = false;
  EXPECT_FALSE(poly.IsPointInside(&point, tolerance));
  EXPECT_EQ(M_GetMinimumEdgeDistance(&point, poly), poly.GetMinimumEdgeDistance(&point));
  return Text(isInside, NumberText(poly.GetMinimumEdgeDistance(&point)));
});

const Operation kPoint2DtoScreen("Point2DtoScreen", [](Arguments& in) {
  const auto first = ReadMatrix<M_Matrix3>(in), second = ReadMatrix<M_Matrix3>(in);
  auto p = Read<V2>(in);
  const bool isSeen = M_TransformPoint2DtoScreen(first, second, &p);
  return Text(isSeen, p).append(Outcome(0));
});

// A point with z = 0 also as one of the plane.
const Operation kPoint3DtoScreen("Point3DtoScreen", [](Arguments& in) {
  const auto toEye = ReadMatrix<M_Matrix4>(in), projection = ReadMatrix<M_Matrix4>(in);
  const auto toScreen = ReadMatrix<M_Matrix3>(in);
  auto p = Read<V3>(in);
  V2 flat = {p.x, p.y};
  const bool isFlat = p.z == 0;
  bool isSeen = false, isFlatSeen = false;
  const std::string outcome =
      Thrown([&] { isSeen = M_TransformPoint3DtoScreen(toEye, projection, toScreen, &p); });
  if (isFlat) {
    isFlatSeen = M_TransformPoint3DtoScreen(toEye, projection, toScreen, &flat);
    EXPECT_TRUE(isFlatSeen == isSeen && flat.x == p.x && flat.y == p.y);
  }
  return Text(p).append(isSeen ? " 1" : "").append(outcome);
});

const Operation kOperations[] = {
    {"PointInPoly", PointInPoly}, {"Area", Area}, {"QuadEdgeOn", EdgeOn},
    {"PolyPolyClip", Clip},       {"Hull", Hull}, {"IsConvex", Convex},
    {"AngleOrder", AngleOrder},
};

}  // namespace
