// Matrices, their parts, rotations and quaternions.

#include <pybind11/numpy.h>

#include <array>
#include <string>

#include "Errors.h"
#include "M_Ops.h"
#include "bind.h"

namespace m_math {
namespace {

namespace py = pybind11;

using Vector3 = M_Vector3T<double>;
using Triple = std::array<double, 3>;
using Quad = std::array<double, 4>;

template <class Matrix>
constexpr size_t kSize = std::size(Matrix{}.m);

Vector3 ToVector(const py::sequence& s) {
  if (s.size() != 3)
    throw py::value_error("three numbers are needed, not " + std::to_string(s.size()));
  return {s[0].cast<double>(), s[1].cast<double>(), s[2].cast<double>()};
}
Quad ToQuad(const py::sequence& s) {
  if (s.size() != 4)
    throw py::value_error("four numbers are needed, not " + std::to_string(s.size()));
  return {s[0].cast<double>(), s[1].cast<double>(), s[2].cast<double>(), s[3].cast<double>()};
}
py::tuple ToTuple(const Vector3& v) { return py::make_tuple(v.x, v.y, v.z); }

template <class Matrix>
Matrix Identity() {
  Matrix m = {};
  for (size_t i = 0; i < kSize<Matrix>; ++i) m.m[i][i] = 1;
  return m;
}

template <class Matrix>
Matrix FromRows(const py::sequence& rows) {
  const std::string size = std::to_string(kSize<Matrix>);
  Matrix m;
  if (rows.size() != kSize<Matrix>) throw py::value_error(size + " rows are needed");
  for (size_t i = 0; i < kSize<Matrix>; ++i) {
    const py::object row = rows[i];
    if (py::len(row) != kSize<Matrix>)
      throw py::value_error("rows of " + size + " numbers are needed");
    for (size_t j = 0; j < kSize<Matrix>; ++j) m.m[i][j] = row[py::int_(j)].template cast<double>();
  }
  return m;
}

template <class Matrix>
py::list ToRows(const Matrix& m) {
  py::list rows;
  for (const auto& row : m.m) {
    py::list numbers;
    for (const double number : row) numbers.append(number);
    rows.append(numbers);
  }
  return rows;
}

template <class Matrix>
py::class_<Matrix> BindMatrix(py::module_& m, const char* name, const char* doc) {
  return py::class_<Matrix>(m, name, py::buffer_protocol(), doc)
      .def(py::init(&Identity<Matrix>), "The identity.")
      .def(py::init(&FromRows<Matrix>), py::arg("rows"), "From rows of numbers, or an array.")
      .def_buffer([](Matrix& matrix) {
        constexpr auto kRows = static_cast<py::ssize_t>(kSize<Matrix>);
        const py::ssize_t step = sizeof(double);
        return py::buffer_info(&matrix.m[0][0], step, py::format_descriptor<double>::format(), 2,
                               {kRows, kRows}, {kRows * step, step}, true);
      })
      .def("__array__",
           [](const py::object& self) {
             const auto& matrix = self.cast<const Matrix&>();
             py::array_t<double> array({kSize<Matrix>, kSize<Matrix>}, &matrix.m[0][0], self);
             array.attr("setflags")(py::arg("write") = false);
             return array;
           })
      .def(
          "__matmul__", [](const Matrix& a, const Matrix& b) { return a * b; }, py::is_operator(),
          "What does as self does, and then as the other does: points are rows.")
      .def(
          "__eq__", [](const Matrix& a, const Matrix& b) { return a == b; }, py::is_operator())
      .def("__getitem__",
           [](const Matrix& matrix, const std::pair<size_t, size_t>& at) {
             if (at.first >= kSize<Matrix> || at.second >= kSize<Matrix>) {
               throw py::index_error("row and column of a matrix");
             }
             return matrix.m[at.first][at.second];
           })
      .def("__repr__",
           [name](const Matrix& matrix) {
             return std::string(name) + '(' + std::string(py::repr(ToRows(matrix))) + ')';
           })
      .def(
          "inverse",
          [](const Matrix& matrix) {
            const auto inverse = M_Inverse(matrix);
            if (inverse) return *inverse;
            // Said in the library's words.
            Matrix zero = {};
            if constexpr (kSize<Matrix> == 3) {
              Check(M_InverseMatrix(&zero, &zero));
            } else {
              Check(M_InverseMatrix4(&zero, &zero));
            }
            return zero;
          },
          "What undoes it. A ValueError where nothing does.");
}

// A copy that a function of the library has changed.
template <class Matrix, class... Arguments>
auto Changed(int32_t (*change)(Matrix*, Arguments...)) {
  return [change](Matrix matrix, Arguments... arguments) {
    Check(change(&matrix, arguments...));
    return matrix;
  };
}

constexpr const char* kKinds[] = {"identity",        "translate", "scale",
                                  "scale-translate", "affine",    "perspective"};

}  // namespace

void BindMatrices(py::module_& m) {
  BindMatrix<M_Matrix3>(m, "Matrix3",
                        "A transform of the plane: rows, translation in the last one. Immutable; "
                        "numpy.asarray() shows it without a copy.\n\n"
                        ">>> Matrix3().scale(2, 2) @ Matrix3().translate(10, 0)\n"
                        "Matrix3([[2.0, 0.0, 0.0], [0.0, 2.0, 0.0], [10.0, 0.0, 1.0]])")
      .def("translate", Changed(M_TranslateMatrix), py::arg("x"), py::arg("y"), "Then moved.")
      .def("scale", Changed(M_ScaleMatrix), py::arg("x"), py::arg("y"), py::arg("cx") = 0.0,
           py::arg("cy") = 0.0, "Then scaled about (cx, cy).")
      .def("rotate", Changed(M_RotateMatrix), py::arg("degrees"), py::arg("cx") = 0.0,
           py::arg("cy") = 0.0, "Then turned about (cx, cy), in degrees, from x towards y.")
      .def("determinant", [](const M_Matrix3& a) { return a.Determinant(); })
      .def_property_readonly(
          "kind",
          [](const M_Matrix3& a) {
            uint32_t type;
            Check(M_GetMatrixType(&a, &type));
            return kKinds[type];
          },
          "'identity', 'translate', 'scale', 'scale-translate', 'affine' or 'perspective'.")
      .def(
          "to_matrix4",
          [](const M_Matrix3& a) {
            M_Matrix4 out;
            Check(M_Matrix3ToMatrix4(&a, &out));
            return out;
          },
          "The same in the plane z = 0 of space.");
  using R = const M_Matrix4&;
  BindMatrix<M_Matrix4>(m, "Matrix4",
                        "A transform of space: rows, translation in the last one. Immutable; "
                        "numpy.asarray() shows it without a copy.")
      .def("translate", Changed(M_TranslateMatrix4), py::arg("x"), py::arg("y"), py::arg("z"),
           "Then moved.")
      .def("scale", Changed(M_ScaleMatrix4), py::arg("x"), py::arg("y"), py::arg("z"),
           "Then scaled.")
      .def(
          "rotate",
          [](M_Matrix4 a, const py::sequence& axis, double radians) {
            const Vector3 v = ToVector(axis);
            Check(M_RotateMatrix4(&a, v.x, v.y, v.z, radians));
            return a;
          },
          py::arg("axis"), py::arg("radians"), "Then turned about an axis, in radians.")
      .def("rotate_xyz", Changed(M_RotateMatrix4XYZ), py::arg("x"), py::arg("y"), py::arg("z"),
           "Turned about x, then y, then z as these have turned, in radians.")
      .def("determinant",
           [](R a) {
             double determinant;
             Check(M_GetMatrix4Determinant(&a, &determinant));
             return determinant;
           })
      .def("transposed",
           [](R a) {
             M_Matrix4 out;
             Check(M_TransposeMatrix4(&a, &out));
             return out;
           })
      .def(
          "normal_matrix",
          [](R a) {
            M_Matrix4 out;
            Check(M_CalcNormalMatrix4(&a, &out));
            return out;
          },
          "The transposed inverse, for normals. A ValueError where there is none.")
      .def(
          "decompose",
          [](R a, const std::string& order) {
            if (order != "xyz" && order != "zyx") {
              throw py::value_error("order must be 'xyz' or 'zyx', not '" + order + "'");
            }
            M_Matrix4Decomp d;
            Check((order == "xyz" ? M_DecomposeMatrix4 : M_DecomposeMatrix4ZYX)(&a, &d, nullptr));
            return py::module_::import("m_math._types")
                .attr("Decomposition")(ToTuple(d.translate), ToTuple(d.scale),
                                       py::make_tuple(d.shear.xy, d.shear.xz, d.shear.yz),
                                       ToTuple(d.rotate));
          },
          py::arg("order") = "xyz",
          "A Decomposition: translate, scale, shear (xy, xz, yz) and rotate (x, y, z, in radians) "
          "in that order of rotations. A ValueError where there is perspective.")
      .def(
          "quaternion",
          [](R a) {
            Quad q;
            Check(M_Matrix4ToQuat(&a, q.data()));
            return py::make_tuple(q[0], q[1], q[2], q[3]);
          },
          "Of a rotation: (x, y, z, w).")
      .def_static(
          "from_quaternion",
          [](const py::sequence& quaternion) {
            const Quad q = ToQuad(quaternion);
            M_Matrix4 out;
            Check(M_QuatToMatrix4(q.data(), &out));
            return out;
          },
          py::arg("quaternion"), "The rotation that (x, y, z, w) stands for.")
      .def_static(
          "look_at",
          [](const py::sequence& eye, const py::sequence& target, const py::sequence& up) {
            return M_LookAtMatrix(ToVector(eye), ToVector(target), ToVector(up));
          },
          py::arg("eye"), py::arg("target"), py::arg("up"),
          "The orientation of an eye that looks at a target: it takes directions as the eye has "
          "them "
          "to those of the world. A camera is Matrix4().translate(-x, -y, -z) @ "
          "look_at(...).transposed() for an eye at (x, y, z).");
  m.def(
      "slerp",
      [](const py::sequence& a, const py::sequence& b, double t) {
        const Quad p = ToQuad(a), q = ToQuad(b);
        Quad out;
        Check(M_Slerp(p.data(), q.data(), out.data(), t));
        return py::make_tuple(out[0], out[1], out[2], out[3]);
      },
      py::arg("a"), py::arg("b"), py::arg("t"),
      "Between two unit quaternions, at a constant speed, the shorter way round: a where t is 0.");
}

}  // namespace m_math
