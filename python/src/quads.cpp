// Quads on their way to the screen.

#include <string>
#include <utility>

#include "Arrays.h"
#include "Errors.h"
#include "M_Matrix.h"
#include "bind.h"

namespace m_math {
namespace {

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;

V2 ToPoint(const std::pair<double, double>& p) { return {p.first, p.second}; }
std::pair<double, double> ToPair(const V2& p) { return {p.x, p.y}; }

template <class Quad, class Corner>
void SetCorners(Quad* quad, const py::array& corners) {
  const auto rows = Rows<Corner, double>(corners, "corners");
  if (rows.size() != 4) RefuseShape("corners", "four rows");
  std::copy(rows.begin(), rows.end(), quad->points);
}

int InRange(int index) {
  if (index < 0 || index > 3) throw py::index_error("a quad has corners and edges 0 to 3");
  return index;
}

// What both kinds have.
template <class Quad>
py::class_<Quad> BindQuad(py::module_& m, const char* name, const char* doc) {
  return py::class_<Quad>(m, name, doc)
      .def(
          "is_point_inside",
          [](const Quad& quad, const std::pair<double, double>& point, double tolerance) {
            const V2 p = ToPoint(point);
            return quad.IsPointInside(&p, tolerance);
          },
          py::arg("point"), py::arg("tolerance") = 0.0,
          "Whether a point is inside, or at most the tolerance away.")
      .def(
          "minimum_edge_distance",
          [](const Quad& quad, const std::pair<double, double>& point) {
            const V2 p = ToPoint(point);
            return quad.GetMinimumEdgeDistance(&p);
          },
          py::arg("point"), "From the nearest visible edge; -1 if there is none.");
}

}  // namespace

void BindQuads(py::module_& m) {
  using Quad2 = M_TransformPoly2D;
  using Quad3 = M_TransformPoly3D;
  BindQuad<Quad2>(m, "TransformPoly2D", "A quad in the plane of the screen.")
      .def(py::init([](const py::array& corners) {
             Quad2 quad;
             SetCorners<Quad2, V2>(&quad, corners);
             return quad;
           }),
           py::arg("corners"), "From a (4, 2) array of float64.")
      .def_readwrite("visible", &Quad2::visible, "Whether points may be inside.");
  BindQuad<Quad3>(m, "TransformPoly3D",
                  "A quad in space: to_eye(), to_screen(), and then what of it is seen.")
      .def(py::init([](const py::array& corners) {
             auto quad = std::make_unique<Quad3>();
             SetCorners<Quad3, V3>(quad.get(), corners);
             return quad;
           }),
           py::arg("corners"), "From a (4, 3) array of float64.")
      .def("to_eye", &Quad3::TransformPointsToEye, py::arg("matrix"),
           "Takes the corners to where the eye sees them.")
      .def(
          "to_screen",
          [](Quad3& quad, const M_Matrix4& matrix) {
            quad.TransformPointsToScreen(matrix);
            quad.InitPolyPoints();
          },
          py::arg("matrix"),
          "Clips the edges to z >= 0.1, takes them to the screen, and makes the "
          "outline.")
      .def_property_readonly(
          "corners",
          [](const Quad3& quad) { return ToArray<double>(std::span<const V3>(quad.points)); },
          "As they are now, (4, 3).")
      .def_property_readonly("is_visible", &Quad3::IsVisible, "Not all corners are clipped.")
      .def_property_readonly(
          "outline", [](const Quad3& quad) { return ToArray<double>(quad.polyPoints); },
          "What is visible, (n, 2), of at most 8 points.")
      .def(
          "corner",
          [](const Quad3& quad, int corner) -> py::object {
            V2 p;
            if (!quad.GetPoint(InRange(corner), &p)) return py::none();
            return py::cast(ToPair(p));
          },
          py::arg("corner"), "(x, y) of a corner, or None if it is clipped.")
      .def(
          "edge",
          [](const Quad3& quad, int edge) -> py::object {
            std::pair<V2, V2> ends;
            if (!quad.GetEdge(InRange(edge), &ends)) return py::none();
            return py::make_tuple(ToPair(ends.first), ToPair(ends.second));
          },
          py::arg("edge"), "Both ends of what is seen of an edge, or None.");
}

}  // namespace m_math
