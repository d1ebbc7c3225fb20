// Many points at once, in NumPy's arrays. The interpreter goes on meanwhile.

#include "Arrays.h"

#include <vector>

#include "Errors.h"
#include "M_Ops.h"
#include "bind.h"
#include "qelcore/geom/PointT.h"

namespace m_math {
namespace {

using V2 = M_Vector2T<double>;
using V3 = M_Vector3T<double>;
using V4 = M_Vector4T<double>;
using F2 = M_Vector2T<float>;

py::ssize_t Columns(const py::array& array) { return array.ndim() == 2 ? array.shape(1) : 0; }

template <class Record, class Number, class Matrix>
void TransformRows(py::array& points, const Matrix& matrix) {
  const std::span<Record> rows = RowsToChange<Record, Number>(points, "points");
  const py::gil_scoped_release released;
  M_Transform(rows, matrix);
}

// With x and y exchanged, for records that have them the other way round.
M_Matrix3 Exchanged(const M_Matrix3& m) {
  const auto& a = m.m;
  return {{{a[1][1], a[1][0], 0}, {a[0][1], a[0][0], 0}, {a[2][1], a[2][0], 1}}};
}

void Transform3(py::array points, const M_Matrix3& m) {
  if (py::isinstance<py::array_t<int16_t>>(points)) {
    return TransformRows<M_Point, int16_t>(points, Exchanged(m));
  }
  if (py::isinstance<py::array_t<int32_t>>(points)) {
    return TransformRows<M_FixedPoint, int32_t>(points, m);
  }
  if (Columns(points) == 3) return TransformRows<V3, double>(points, m);
  TransformRows<V2, double>(points, m);
}

void Transform4(py::array points, const M_Matrix4& m) {
  if (Columns(points) == 4) return TransformRows<V4, double>(points, m);
  TransformRows<V3, double>(points, m);
}

template <class Point, class Number>
py::array_t<bool> PointsInPolygon(const py::array& points, const py::array& polygon,
                                  double tolerance) {
  const auto rows = Rows<Point, Number>(points, "points");
  const auto corners = Rows<Point, Number>(polygon, "polygon");
  if (corners.size() > INT32_MAX) RefuseShape("polygon", "shorter");
  py::array_t<bool> inside(static_cast<py::ssize_t>(rows.size()));
  bool* const out = inside.mutable_data();
  const py::gil_scoped_release released;
  for (size_t i = 0; i < rows.size(); ++i) {
    unsigned char isInside = 0;
    Check(M_IsFloatPointInConcavePoly(&rows[i], corners.data(),
                                      static_cast<int32_t>(corners.size()), tolerance, &isInside));
    out[i] = isInside != 0;
  }
  return inside;
}

py::array InPolygon(const py::array& points, const py::array& polygon, double tolerance) {
  if (py::isinstance<py::array_t<float>>(points)) {
    return PointsInPolygon<F2, float>(points, polygon, tolerance);
  }
  return PointsInPolygon<V2, double>(points, polygon, tolerance);
}

// Rows of two numbers, or of four: the last two are carried along.
std::vector<V4> ToPolygon(const py::array& array, const char* name) {
  std::vector<V4> polygon;
  if (Columns(array) == 2) {
    for (const V2& p : Rows<V2, double>(array, name)) polygon.push_back({p.x, p.y, 0, 1});
  } else {
    const auto rows = Rows<V4, double>(array, name);
    polygon.assign(rows.begin(), rows.end());
  }
  return polygon;
}

py::array ClipPolygon(const py::array& clipper, const py::array& subject) {
  const std::vector<V4> around = ToPolygon(clipper, "clipper");
  std::vector<V4> result = ToPolygon(subject, "subject");
  {
    const py::gil_scoped_release released;
    M_PolyPolyClip2D(&around, &result, &result);
  }
  if (Columns(subject) == 4) return ToArray<double>(result);
  std::vector<V2> flat;
  for (const V4& p : result) flat.push_back({p.x, p.y});
  return ToArray<double>(flat);
}

template <class Point, class Number>
py::array Hull(const py::array& points) {
  const auto rows = Rows<Point, Number>(points, "points");
  std::vector<Point> hull;
  {
    const py::gil_scoped_release released;
    M_ComputeConvexHull(rows.data(), rows.data() + rows.size(), hull);
  }
  return ToArray<Number>(hull);
}

py::array ConvexHull(const py::array& points) {
  if (py::isinstance<py::array_t<float>>(points)) {
    return Hull<qelcore::geom::PointT<float>, float>(points);
  }
  if (Columns(points) == 3) return Hull<V3, double>(points);
  if (Columns(points) == 4) return Hull<V4, double>(points);
  return Hull<V2, double>(points);
}

double Area(const py::array& polygon) {
  const auto corners = Rows<V2, double>(polygon, "polygon");
  return M_SignedPolygonArea2D(corners.data(), static_cast<int32_t>(corners.size()));
}

}  // namespace

void BindArrays(py::module_& m) {
  m.def("transform", &Transform3, py::arg("points"), py::arg("matrix"),
        "Takes the rows of an array through a matrix, in place.\n\n"
        "With a Matrix3: (n, 2) points of float64; (n, 3) homogeneous vectors of float64, not "
        "divided; (n, 2) points of int16, or of int32 in 16.16, rounded to nearest: on an "
        "OverflowError those before it are done. With a Matrix4: (n, 3) points of float64, "
        "divided by their w, or (n, 4) homogeneous ones, which are not. Columns are x, y, z, w.");
  m.def("transform", &Transform4, py::arg("points"), py::arg("matrix"));
  m.def("points_in_polygon", &InPolygon, py::arg("points"), py::arg("polygon"),
        py::arg("tolerance") = 0.0,
        "An array of bool: which of the (n, 2) points are inside a polygon, or at most the "
        "tolerance from its outline. float64, or float32 both.");
  m.def("clip_polygon", &ClipPolygon, py::arg("clipper"), py::arg("subject"),
        "The part of a polygon that is inside a convex one. (n, 2), or (n, 4) of float64, whose "
        "last two columns are carried along; new points have what lies between.");
  m.def("convex_hull", &ConvexHull, py::arg("points"),
        "The corners of the hull, counter-clockwise where y grows upwards, from the lowest one; on "
        "a lattice of 2**29 steps along each axis. (n, 2), (n, 3) or (n, 4) of float64, of which x "
        "and y count, or (n, 2) of float32.");
  m.def("polygon_area", &Area, py::arg("polygon"),
        "The signed area of an (n, 2) polygon: positive where x turns towards y.");
}

}  // namespace m_math
