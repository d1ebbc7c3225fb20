// Points and rectangles of the four widths.

#include <sstream>
#include <string>

#include "Errors.h"
#include "M_Ops.h"
#include "bind.h"

namespace m_math {
namespace {

namespace py = pybind11;

template <class Number>
std::string Repr(const char* name, std::initializer_list<Number> numbers) {
  std::string text = std::string(name) + '(';
  const char* separator = "";
  for (const Number number : numbers) {
    text += separator + std::string(py::repr(py::cast(number)));
    separator = ", ";
  }
  return text + ')';
}

template <class Point>
py::class_<Point> BindPoint(py::module_& m, const char* name, const char* doc) {
  using Coord = decltype(Point::h);
  const auto make = [](Coord h, Coord v) {
    Point p;
    p.h = h;
    p.v = v;
    return p;
  };
  return py::class_<Point>(m, name, doc)
      .def(py::init(make), py::arg("h") = Coord{}, py::arg("v") = Coord{})
      .def_readwrite("h", &Point::h, "To the right.")
      .def_readwrite("v", &Point::v, "Downwards.")
      .def(
          "__eq__", [](const Point& a, const Point& b) { return a == b; }, py::is_operator())
      .def("__repr__",
           [name](const Point& p) {
             return Repr(name, {p.h, p.v});
           })
      .def("__iter__", [](const Point& p) { return py::iter(py::make_tuple(p.h, p.v)); });
}

template <class Rect>
py::class_<Rect> BindRect(py::module_& m, const char* name, const char* doc) {
  using Edge = decltype(Rect::left);
  const auto make = [](Edge left, Edge top, Edge right, Edge bottom) {
    Rect r;
    r.left = left;
    r.top = top;
    r.right = right;
    r.bottom = bottom;
    return r;
  };
  return py::class_<Rect>(m, name, doc)
      .def(py::init(make), py::arg("left") = Edge{}, py::arg("top") = Edge{},
           py::arg("right") = Edge{}, py::arg("bottom") = Edge{})
      .def_readwrite("left", &Rect::left)
      .def_readwrite("top", &Rect::top)
      .def_readwrite("right", &Rect::right, "Behind the last column.")
      .def_readwrite("bottom", &Rect::bottom, "Behind the last row.")
      .def(
          "__and__", [](const Rect& a, const Rect& b) { return a & b; }, py::is_operator(),
          "What both share; all 0 if nothing.")
      .def("__repr__",
           [name](const Rect& r) {
             return Repr(name, {r.left, r.top, r.right, r.bottom});
           })
      .def("__iter__", [](const Rect& r) {
        return py::iter(py::make_tuple(r.left, r.top, r.right, r.bottom));
      });
}

template <class Rect, class Point>
py::class_<Rect> BindWholeRect(py::module_& m, const char* name, const char* doc) {
  return BindRect<Rect>(m, name, doc)
      .def(
          "__eq__", [](const Rect& a, const Rect& b) { return a == b; }, py::is_operator(),
          "Empty rectangles are equal wherever they are.")
      .def(
          "__or__", [](const Rect& a, const Rect& b) { return a | b; }, py::is_operator(),
          "The smallest rectangle around both; an empty one adds nothing.")
      .def(
          "__contains__", [](const Rect& r, const Point& p) { return M_Contains(r, p); },
          "Left and top edges belong to a rectangle, right and bottom ones do not.")
      .def_property_readonly("is_empty", [](const Rect& r) { return M_IsEmpty(r); });
}

M_RectRounding ToRounding(const std::string& name) {
  if (name == "nearest") return M_RectRounding::Nearest;
  if (name == "in") return M_RectRounding::In;
  if (name == "out") return M_RectRounding::Out;
  throw py::value_error("rounding must be 'nearest', 'in' or 'out', not '" + name + "'");
}

}  // namespace

void BindRectangles(py::module_& m) {
  BindPoint<M_Point>(m, "Point", "A point of 16 bits a coordinate.");
  BindPoint<M_LPoint>(m, "LPoint", "A point of 32 bits a coordinate.");
  BindPoint<M_FixedPoint>(m, "FixedPoint", "A point in 16.16: 65536 is 1.");
  using FloatPoint = M_Vector2T<double>;
  py::class_<FloatPoint>(m, "FloatPoint", "A point of floats.")
      .def(py::init([](double x, double y) {
             return FloatPoint{x, y};
           }),
           py::arg("x") = 0.0, py::arg("y") = 0.0)
      .def_readwrite("x", &FloatPoint::x, "To the right.")
      .def_readwrite("y", &FloatPoint::y, "Downwards.")
      .def(
          "__eq__",
          [](const FloatPoint& a, const FloatPoint& b) { return a.x == b.x && a.y == b.y; },
          py::is_operator())
      .def("__repr__",
           [](const FloatPoint& p) {
             return Repr("FloatPoint", {p.x, p.y});
           })
      .def("__iter__", [](const FloatPoint& p) { return py::iter(py::make_tuple(p.x, p.y)); });

  const char* const kRounding =
      "'nearest', 'in' (inside this one) or 'out' (around it), in whole pixels.";
  auto rect =
      BindWholeRect<M_Rect, M_Point>(m, "Rect", "A rectangle of 16 bits an edge, half-open.");
  auto lrect = BindWholeRect<M_LRect, M_LPoint>(m, "LRect",
                                                "A rectangle of 32 bits an edge, half-open.\n\n"
                                                ">>> LRect(0, 0, 4, 4) & LRect(2, 2, 9, 9)\n"
                                                "LRect(2, 2, 4, 4)\n"
                                                ">>> LPoint(4, 0) in LRect(0, 0, 4, 4)\nFalse");
  auto fixed =
      BindWholeRect<M_FixedRect, M_FixedPoint>(m, "FixedRect", "A rectangle in 16.16: 65536 is 1.");
  BindRect<M_FloatRect>(m, "FloatRect", "A rectangle of floats, half-open.")
      .def(
          "__eq__",
          [](const M_FloatRect& a, const M_FloatRect& b) {
            return a.left == b.left && a.top == b.top && a.right == b.right && a.bottom == b.bottom;
          },
          py::is_operator());
  rect.def(
          "to_lrect", [](const M_Rect& r) { return M_ToLRect(r); }, "The same edges.")
      .def(
          "to_fixed", [](const M_Rect& r) { return M_ToFixedRect(r); }, "The same in 16.16.");
  lrect
      .def(
          "to_rect", [](const M_LRect& r) { return M_ToRect(r); },
          "The same edges in 16 bits. An OverflowError for a left or top edge that is too low, "
          "or a right or bottom one that is too high.")
      .def(
          "to_fixed", [](const M_LRect& r) { return M_ToFixedRect(r); },
          "The same in 16.16, of the low 16 bits.");
  fixed
      .def(
          "to_rect",
          [](const M_FixedRect& r, const std::string& rounding) {
            return M_ToRect(r, ToRounding(rounding));
          },
          py::arg("rounding") = "nearest", kRounding)
      .def(
          "to_lrect",
          [](const M_FixedRect& r, const std::string& rounding) {
            return M_ToLRect(r, ToRounding(rounding));
          },
          py::arg("rounding") = "nearest", kRounding);
}

}  // namespace m_math
