// Hulls, hit tests, clipping, and quads on their way to the screen, beside CGAL, Boost.Geometry and
// Clipper, and the last beside what one would write by hand with glm. Peers that are not installed
// are left out.

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <functional>
#include <numbers>
#include <string>
#include <utility>
#include <vector>

#ifdef BENCH_HAS_CGAL
#include <CGAL/Exact_predicates_inexact_constructions_kernel.h>
#include <CGAL/Polygon_2_algorithms.h>
#include <CGAL/Simple_cartesian.h>
#include <CGAL/convex_hull_2.h>
#endif
#ifdef BENCH_HAS_BOOST
#include <boost/geometry.hpp>
#include <boost/geometry/geometries/geometries.hpp>
#include <boost/geometry/geometries/point_xy.hpp>
#endif
#ifdef BENCH_HAS_CLIPPER
#include <clipper.hpp>
#endif
#ifdef BENCH_HAS_GLM
#include <glm/glm.hpp>
#endif

#include "Comparison.h"
#include "M_Matrix.h"
#include "Random.h"

namespace {

using bench::Batch;
using bench::Require;
using bench::Uniform;
using Vector2 = M_Vector2T<double>;
using Vector3 = M_Vector3T<double>;
using Vector4 = M_Vector4T<double>;
using Points = std::vector<Vector2>;

constexpr double kTurn = 2 * std::numbers::pi;

// What a benchmark works on, for as long as the program runs.
template <class T>
T& Keep(T value) {
  return *new T(std::move(value));
}

#ifdef BENCH_HAS_BOOST
using BoostPoint = boost::geometry::model::d2::point_xy<double>;
using BoostPolygon = boost::geometry::model::polygon<BoostPoint>;

BoostPolygon ToBoost(const Points& points) {
  BoostPolygon polygon;
  for (const Vector2& p : points) polygon.outer().emplace_back(p.x, p.y);
  boost::geometry::correct(polygon);
  return polygon;
}
#endif

#ifdef BENCH_HAS_CGAL
template <class Kernel>
std::vector<typename Kernel::Point_2> ToCgal(const Points& points) {
  std::vector<typename Kernel::Point_2> all;
  for (const Vector2& p : points) all.emplace_back(p.x, p.y);
  return all;
}

using Exact = CGAL::Exact_predicates_inexact_constructions_kernel;
using Plain = CGAL::Simple_cartesian<double>;
#endif

#ifdef BENCH_HAS_CLIPPER
constexpr double kClipperScale = 1 << 20;

ClipperLib::IntPoint ToClipper(const Vector2& p) {
  return {static_cast<ClipperLib::cInt>(p.x * kClipperScale),
          static_cast<ClipperLib::cInt>(p.y * kClipperScale)};
}

ClipperLib::Path ToClipper(const Points& points) {
  ClipperLib::Path path;
  for (const Vector2& p : points) path.push_back(ToClipper(p));
  return path;
}
#endif

// ---------------------------------------------------------------------------------------------
// Hulls
// ---------------------------------------------------------------------------------------------

#ifdef BENCH_HAS_CGAL
template <class Kernel>
void CgalHull(const std::string& line, const char* subject, const Points& points, size_t corners) {
  const auto& theirs = Keep(ToCgal<Kernel>(points));
  const int count = static_cast<int>(points.size());
  Batch(line, subject, count, [&theirs, corners] {
    std::vector<typename Kernel::Point_2> hull;
    CGAL::convex_hull_2(theirs.begin(), theirs.end(), std::back_inserter(hull));
    // Theirs may have corners that are flatter than the steps of our lattice.
    Require(hull.size() >= corners, "CGAL hull");
  });
}
#endif

void Hulls(const std::string& shape, const std::function<Vector2()>& make) {
  // Peers up to a million; beyond it is seen whether a point still takes as long.
  for (const int count : {100, 1000, 10000, 100000, 1000000, 10000000}) {
    const std::string line = "hull of " + std::to_string(count) + ", " + shape;
    Points& points = Keep(Points(static_cast<size_t>(count)));
    for (Vector2& p : points) p = make();
    Points hull;
    M_ComputeConvexHull(points.cbegin(), points.cend(), hull);
    [[maybe_unused]] const size_t corners = hull.size();
    Batch(line, "M", count, [&points, corners] {
      Points result;
      M_ComputeConvexHull(points.cbegin(), points.cend(), result);
      Require(result.size() == corners, "M hull");
    });
    if (count != 100 && count != 10000 && count != 1000000) continue;
#ifdef BENCH_HAS_CGAL
    CgalHull<Exact>(line, "CGAL (exact)", points, corners);
    CgalHull<Plain>(line, "CGAL (plain)", points, 3);
#endif
#ifdef BENCH_HAS_BOOST
    auto& theirs = Keep(boost::geometry::model::multi_point<BoostPoint>());
    for (const Vector2& p : points) theirs.emplace_back(p.x, p.y);
    Batch(line, "Boost", count, [&theirs] {
      BoostPolygon result;
      boost::geometry::convex_hull(theirs, result);
      Require(result.outer().size() > 3, "Boost hull");
    });
#endif
    uint64_t& sum = Keep(uint64_t{0});
    Batch(line, "(one look)", count, [&points, &sum] {
      for (const Vector2& p : points) sum += p.x < p.y;
    });
  }
}

// ---------------------------------------------------------------------------------------------
// Points in polygons
// ---------------------------------------------------------------------------------------------

// More than what a processor learns by heart.
constexpr size_t kQueries = 4096;

// A star about the origin; every second corner is further in.
Points Star(int count) {
  Points star;
  for (int i = 0; i < count; ++i) {
    const double angle = (i + 0.3) * kTurn / count;
    const double radius = i % 2 == 0 ? 100 : Uniform(50, 90);
    star.push_back({radius * std::cos(angle), radius * std::sin(angle)});
  }
  return star;
}

void HitTests() {
  const Points& queries = Keep([] {
    Points all;
    for (size_t i = 0; i < kQueries; ++i) all.push_back({Uniform(-110, 110), Uniform(-110, 110)});
    return all;
  }());
  for (const int count : {4, 16, 256, 4096, 1000000}) {
    const std::string line = "point in polygon of " + std::to_string(count);
    const Points& star = Keep(Star(count));
    const size_t number = count > 4096 ? 16 : kQueries;
    int& expected = Keep(0);
    for (size_t i = 0; i < number; ++i) {
      unsigned char inside;
      M_IsFloatPointInConcavePoly(&queries[i], star.data(), count, 0.0, &inside);
      expected += inside;
    }
    // All queries: `isInside` takes the number of one.
    const auto measure = [&](const char* subject, auto isInside) {
      Batch(line, subject, static_cast<int>(number), [=, &expected] {
        int hits = 0;
        for (size_t i = 0; i < number; ++i) hits += isInside(i);
        Require(hits == expected, subject);
      });
    };
    measure("M", [&star, &queries, count](size_t i) {
      unsigned char inside;
      M_IsFloatPointInConcavePoly(&queries[i], star.data(), count, 0.0, &inside);
      return inside != 0;
    });
    if (count > 4096) continue;
#ifdef BENCH_HAS_CGAL
    const auto& cgalStar = Keep(ToCgal<Plain>(star));
    const auto& cgalQueries = Keep(ToCgal<Plain>(queries));
    measure("CGAL (plain)", [&](size_t i) {
      return CGAL::bounded_side_2(cgalStar.begin(), cgalStar.end(), cgalQueries[i]) !=
             CGAL::ON_UNBOUNDED_SIDE;
    });
    const auto& exactStar = Keep(ToCgal<Exact>(star));
    const auto& exactQueries = Keep(ToCgal<Exact>(queries));
    measure("CGAL (exact)", [&](size_t i) {
      return CGAL::bounded_side_2(exactStar.begin(), exactStar.end(), exactQueries[i]) !=
             CGAL::ON_UNBOUNDED_SIDE;
    });
#endif
#ifdef BENCH_HAS_BOOST
    const auto& boostStar = Keep(ToBoost(star));
    measure("Boost", [&](size_t i) {
      return boost::geometry::covered_by(BoostPoint(queries[i].x, queries[i].y), boostStar);
    });
#endif
#ifdef BENCH_HAS_CLIPPER
    const auto& clipperStar = Keep(ToClipper(star));
    const auto& clipperQueries = Keep(ToClipper(queries));
    measure("Clipper", [&](size_t i) {
      return ClipperLib::PointInPolygon(clipperQueries[i], clipperStar) != 0;
    });
#endif
  }
}

// A vertex, where the whole outline is to be looked at.
void HitTestsWithin() {
  for (const int count : {1000, 100000}) {
    const Points& star = Keep(Star(count));
    Batch("outline within 1, " + std::to_string(count), "M", count, [&star, count] {
      const Vector2 middle = {3, 4};
      unsigned char inside;
      M_IsFloatPointInConcavePoly(&middle, star.data(), count, 1.0, &inside);
      Require(inside != 0, "M outline");
    });
  }
}

// ---------------------------------------------------------------------------------------------
// Clipping
// ---------------------------------------------------------------------------------------------

Points Regular(int count, double radius, const Vector2& centre) {
  Points points;
  for (int i = 0; i < count; ++i) {
    const double angle = (i + 0.5) * kTurn / count;
    points.push_back({centre.x + radius * std::cos(angle), centre.y + radius * std::sin(angle)});
  }
  return points;
}

std::vector<Vector4> WithAttributes(const Points& points) {
  std::vector<Vector4> all;
  for (const Vector2& p : points) all.push_back({p.x, p.y, 0, 1});
  return all;
}

void Clipping() {
  for (const auto& [corners, sides] : {std::pair(100, 4), {100, 32}, {10000, 4}, {1000000, 4}}) {
    const Points subject = Regular(corners, 100, {0, 0});
    const std::string line = std::to_string(corners) + "-gon clipped by " + std::to_string(sides);
    const Points clipper = Regular(sides, 90, {40, 25});
    const auto& ourSubject = Keep(WithAttributes(subject));
    const auto& ourClipper = Keep(WithAttributes(clipper));
    std::vector<Vector4> clipped;
    M_PolyPolyClip2D(&ourClipper, &ourSubject, &clipped);
    Points flat;
    for (const Vector4& p : clipped) flat.push_back({p.x, p.y});
    [[maybe_unused]] const double area =
        std::abs(M_SignedPolygonArea2D(flat.data(), static_cast<int32_t>(flat.size())));
    Batch(line, "M", 1, [&ourSubject, &ourClipper, count = clipped.size()] {
      std::vector<Vector4> result;
      M_PolyPolyClip2D(&ourClipper, &ourSubject, &result);
      Require(result.size() == count, "M clipping");
    });
    if (corners > 10000) continue;
#ifdef BENCH_HAS_BOOST
    const auto& boostSubject = Keep(ToBoost(subject));
    const auto& boostClipper = Keep(ToBoost(clipper));
    const auto intersect = [&boostSubject, &boostClipper] {
      std::vector<BoostPolygon> result;
      boost::geometry::intersection(boostSubject, boostClipper, result);
      return result;
    };
    Require(std::abs(boost::geometry::area(intersect().at(0)) / area - 1) < 1e-6, "Boost area");
    Batch(line, "Boost", 1, [=] { Require(intersect().size() == 1, "Boost clipping"); });
#endif
#ifdef BENCH_HAS_CLIPPER
    const auto& clipperSubject = Keep(ToClipper(subject));
    const auto& clipperClipper = Keep(ToClipper(clipper));
    const auto execute = [&clipperSubject, &clipperClipper] {
      ClipperLib::Clipper machine;
      machine.AddPath(clipperSubject, ClipperLib::ptSubject, true);
      machine.AddPath(clipperClipper, ClipperLib::ptClip, true);
      ClipperLib::Paths result;
      machine.Execute(ClipperLib::ctIntersection, result);
      return result;
    };
    const double scaled = ClipperLib::Area(execute().at(0)) / kClipperScale / kClipperScale;
    Require(std::abs(scaled / area - 1) < 1e-6, "Clipper area");
    Batch(line, "Clipper", 1, [=] { Require(execute().size() == 1, "Clipper clipping"); });
#endif
  }
}

// ---------------------------------------------------------------------------------------------
// Layers: corners to the eye, clipped, to the screen, outline, hit test
// ---------------------------------------------------------------------------------------------

constexpr size_t kLayers = 64;
[[maybe_unused]] constexpr double kNear = 0.1;

struct Layer {
  Vector3 corners[4];
  M_Matrix4 toEye;
};

// Some are cut by the near plane; the last of eight lies behind it.
std::vector<Layer> RandomLayers() {
  std::vector<Layer> layers(kLayers);
  for (size_t i = 0; i < kLayers; ++i) {
    Layer& layer = layers[i];
    const double width = Uniform(100, 900), height = Uniform(100, 900);
    layer.corners[0] = {0, 0, 0};
    layer.corners[1] = {width, 0, 0};
    layer.corners[2] = {width, height, 0};
    layer.corners[3] = {0, height, 0};
    M_IdentityMatrix4(&layer.toEye);
    M_RotateMatrix4(&layer.toEye, Uniform(-1, 1), Uniform(-1, 1), 1, Uniform(-1.4, 1.4));
    M_TranslateMatrix4(&layer.toEye, Uniform(-300, 0), Uniform(-300, 0),
                       i % 8 == 7 ? -2000 : Uniform(100, 900));
  }
  return layers;
}

// A perspective on a screen of 1920 x 1080.
const M_Matrix4 kToScreen = {{{900, 0, 0, 0}, {0, 900, 0, 0}, {960, 540, 1, 1}, {0, 0, -0.1, 0}}};
constexpr Vector2 kMouse = {1000, 600};

#ifdef BENCH_HAS_GLM
glm::dmat4 ToGlm(const M_Matrix4& m) {
  glm::dmat4 theirs;
  for (int row = 0; row < 4; ++row) {
    for (int column = 0; column < 4; ++column) theirs[row][column] = m.m[row][column];
  }
  return theirs;
}

// The outline, to the screen as it is made.
int OutlineByHand(const glm::dmat4& toScreen, const glm::dvec3 eye[4], glm::dvec2 outline[8]) {
  int count = 0;
  const auto add = [&](const glm::dvec3& p) {
    const glm::dvec4 screen = toScreen * glm::dvec4(p, 1);
    outline[count++] = glm::dvec2(screen) / screen.w;
  };
  for (int i = 0; i < 4; ++i) {
    const glm::dvec3& p = eye[i];
    const glm::dvec3& q = eye[(i + 1) % 4];
    if (p.z >= kNear) add(p);
    if ((p.z < kNear) != (q.z < kNear)) add(p + (q - p) * ((kNear - p.z) / (q.z - p.z)));
  }
  return count;
}

bool IsHitByHand(const glm::dvec2& mouse, const glm::dvec2* outline, int count) {
  bool isInside = false;
  for (int i = 0, j = count - 1; i < count; j = i++) {
    const glm::dvec2& p = outline[i];
    const glm::dvec2& q = outline[j];
    if ((p.x > mouse.x) != (q.x > mouse.x) &&
        mouse.y < (q.y - p.y) * (mouse.x - p.x) / (q.x - p.x) + p.y) {
      isInside = !isInside;
    }
  }
  return isInside;
}
#endif

void LayerPath() {
  const auto& layers = Keep(RandomLayers());
  const auto isHit = [](const Layer& layer, M_TransformPoly3D* poly) {
    std::copy(layer.corners, layer.corners + 4, poly->points);
    poly->TransformPointsToEye(layer.toEye);
    poly->TransformPointsToScreen(kToScreen);
    poly->InitPolyPoints();
    return poly->IsPointInside(&kMouse, 0.0);
  };
  int& expected = Keep(0);
  for (const Layer& layer : layers) {
    M_TransformPoly3D poly;
    expected += isHit(layer, &poly);
  }
  const auto measure = [&](const std::string& line, const char* subject, auto isHitNow) {
    Batch(line, subject, kLayers, [=, &layers, &expected] {
      int hits = 0;
      for (const Layer& layer : layers) hits += isHitNow(layer);
      Require(hits == expected, subject);
    });
  };
  auto& poly = Keep(M_TransformPoly3D());
  measure("layer, its quad kept", "M",
          [=, &poly](const Layer& layer) { return isHit(layer, &poly); });
  measure("layer, a quad of its own", "M", [=](const Layer& layer) {
    M_TransformPoly3D own;
    return isHit(layer, &own);
  });
#ifdef BENCH_HAS_GLM
  const auto byHand = [toScreen = ToGlm(kToScreen)](const Layer& layer) {
    const glm::dmat4 toEye = ToGlm(layer.toEye);
    glm::dvec3 eye[4];
    for (int i = 0; i < 4; ++i) {
      const Vector3& p = layer.corners[i];
      const glm::dvec4 q = toEye * glm::dvec4(p.x, p.y, p.z, 1);
      eye[i] = glm::dvec3(q) / q.w;
    }
    glm::dvec2 outline[8];
    const int count = OutlineByHand(toScreen, eye, outline);
    return IsHitByHand({kMouse.x, kMouse.y}, outline, count);
  };
  measure("layer, its quad kept", "by hand (glm)", byHand);
  measure("layer, a quad of its own", "by hand (glm)", byHand);
#endif
}

}  // namespace

int main(int argc, char** argv) {
  const auto inSquare = [] { return Vector2{Uniform(-1, 1), Uniform(-1, 1)}; };
  const auto atAngle = [](double radius) {
    const double angle = Uniform(0, kTurn);
    return Vector2{radius * std::cos(angle), radius * std::sin(angle)};
  };
  Hulls("square", inSquare);
  Hulls("disc", [=] { return atAngle(std::sqrt(Uniform(0, 1))); });
  Hulls("circle", [=] { return atAngle(1); });
  Hulls("gaussian", [=] { return atAngle(std::sqrt(-2 * std::log(Uniform(1e-10, 1)))); });
  HitTests();
  HitTestsWithin();
  Clipping();
  LayerPath();
  return bench::RunAndCompare(argc, argv);
}
