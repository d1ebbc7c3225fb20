// Ratios beside Python's own numbers, and frames.

#include <cmath>
#include <optional>
#include <sstream>
#include <string>

#include "Errors.h"
#include "M_Ops.h"
#include "bind.h"

namespace m_math {
namespace {

namespace py = pybind11;

// Kept as long as the process.
const py::object& Fraction() {
  static const auto* const type = new py::object(py::module_::import("fractions").attr("Fraction"));
  return *type;
}

py::object ToFraction(const M_Ratio& r) { return Fraction()(r.num, r.den); }

M_Ratio Lowest(const M_Ratio& r) { return M_OpsDetail::Product(r, {1, 1}).ToRatio().value_or(r); }

std::string Text(const M_Ratio& r) {
  std::ostringstream text;
  text << r;
  return text.str();
}

M_Ratio FromParts(const py::handle& num, const py::handle& den) {
  const auto n = num.cast<py::int_>(), d = den.cast<py::int_>();
  int overflows = 0;
  const long long p = PyLong_AsLongLongAndOverflow(n.ptr(), &overflows);
  int dOverflows = 0;
  const long long q = PyLong_AsLongLongAndOverflow(d.ptr(), &dOverflows);
  if (q == 0 && dOverflows == 0) M_OpsDetail::FailZeroDenominator(M_MulRatio);
  const long long limit = 1LL << 32;
  if (overflows != 0 || dOverflows != 0 || p < -limit || p > limit || q < -limit || q > limit) {
    M_OpsDetail::FailAs(M_MulRatio);
  }
  const int64_t sign = q < 0 ? -1 : 1;
  if (std::in_range<int32_t>(sign * p) && std::in_range<uint32_t>(sign * q)) {
    return {static_cast<int32_t>(sign * p), static_cast<uint32_t>(sign * q)};
  }
  M_OpsDetail::FailAs(M_MulRatio);
}

bool IsWhole(const py::handle& value) { return PyIndex_Check(value.ptr()) != 0; }

// A whole number or a Fraction as it is, or nothing for what is neither.
std::optional<M_Ratio> Convert(const py::handle& value) {
  if (py::isinstance<M_Ratio>(value)) return value.cast<M_Ratio>();
  if (IsWhole(value))
    return FromParts(py::int_(py::reinterpret_borrow<py::object>(value)), py::int_(1));
  if (!py::isinstance(value, Fraction())) return {};
  return FromParts(value.attr("numerator"), value.attr("denominator"));
}

M_Ratio Parse(const std::string& text) {
  const std::optional<M_Ratio> ratio = M_ParseRatio(text);
  if (!ratio) throw py::value_error("no ratio of 32 bits: '" + text + "'");
  return *ratio;
}

// Whatever a function may be given for a ratio.
M_Ratio Given(const py::handle& value) {
  if (py::isinstance<py::str>(value)) return Parse(value.cast<std::string>());
  if (const auto ratio = Convert(value)) return *ratio;
  throw py::type_error(
      "a Ratio, int, Fraction or str is needed; Ratio.approximate() takes a float");
}

// As Python's own numbers of the same value.
py::ssize_t Hash(const M_Ratio& r) {
  constexpr uint64_t kPrime = (uint64_t{1} << 61) - 1;
  const auto times = [](uint64_t a, uint64_t b) {
    __extension__ using Wide = unsigned __int128;
    return static_cast<uint64_t>(Wide{a} * b % kPrime);
  };
  const M_Ratio low = Lowest(r);
  uint64_t hash = M_OpsDetail::Magnitude(low.num) % kPrime;
  if (low.den != 1) {  // The inverse, by Fermat.
    uint64_t inverse = 1, power = low.den;
    for (uint64_t exponent = kPrime - 2; exponent != 0; exponent >>= 1) {
      if (exponent & 1) inverse = times(inverse, power);
      power = times(power, power);
    }
    hash = times(hash, inverse);
  }
  const auto result = static_cast<py::ssize_t>(hash);
  return low.num < 0 ? (result == 1 ? -2 : -result) : result;
}

py::object NotImplemented() { return py::reinterpret_borrow<py::object>(Py_NotImplemented); }

// An operator between two ratios, and between one and what can be converted, on either side.
template <class Class, class Operator>
void DefineOperator(Class& c, const std::string& name, const char* doc, Operator calculate) {
  c.def(("__" + name + "__").c_str(), calculate, py::arg("other"), doc);
  c.def(("__" + name + "__").c_str(),
        [calculate](const M_Ratio& a, const py::object& b) {
          const auto other = Convert(b);
          return other ? py::cast(calculate(a, *other)) : NotImplemented();
        },
        py::arg("other"));
  c.def(("__r" + name + "__").c_str(),
        [calculate](const M_Ratio& a, const py::object& b) {
          const auto other = Convert(b);
          return other ? py::cast(calculate(*other, a)) : NotImplemented();
        },
        py::arg("other"));
}

template <class Class, class Operator>
void DefineComparison(Class& c, const char* name, int operation, Operator compare) {
  c.def(name, compare, py::arg("other"));
  c.def(
      name,
      [operation](const M_Ratio& a, const py::object& b) {
        // Also numbers that are larger than any ratio.
        if (!IsWhole(b) && !py::isinstance<py::float_>(b) && !py::isinstance(b, Fraction())) {
          return NotImplemented();
        }
        PyObject* const result = PyObject_RichCompare(ToFraction(a).ptr(), b.ptr(), operation);
        if (!result) throw py::error_already_set();
        return py::reinterpret_steal<py::object>(result);
      },
      py::arg("other"));
}

M_Rounding ToRounding(const std::string& name) {
  if (name == "floor") return M_Rounding::Floor;
  if (name == "nearest") return M_Rounding::Nearest;
  if (name == "ceiling") return M_Rounding::Ceiling;
  throw py::value_error("rounding must be 'floor', 'nearest' or 'ceiling', not '" + name + "'");
}

}  // namespace

void BindRatios(py::module_& m) {
  py::class_<M_Ratio> c(m, "Ratio", py::is_final(),
                        "An exact ratio of 32 bits, num / den, as the library keeps it: immutable, "
                        "and not in lowest terms.\n\n"
                        ">>> Ratio('30000/1001') * 1001\nRatio(30030000, 1001)\n"
                        ">>> Ratio(1, 4) + Ratio(1, 4) == Ratio(1, 2)\nTrue\n\n"
                        "It equals, orders and hashes as a Fraction of its value does. What does "
                        "not fit raises an OverflowError.");
  c.def(py::init(&Given), py::arg("value"),
        "From an int, a Fraction, a Ratio, or a str such as '30000/1001', '25' or '23.976'.")
      .def(py::init([](const py::int_& num, const py::int_& den) { return FromParts(num, den); }),
           py::arg("num"), py::arg("den"), "num / den as it stands; den must not be 0.")
      .def_static(
          "approximate",
          [](double value) {
            M_Ratio ratio;
            unsigned char isOutOfRange;
            M_FpLong2Ratio(&ratio, &isOutOfRange, value);
            if (isOutOfRange) M_OpsDetail::FailAs(M_MulRatio);
            const bool isExact =
                std::fma(value, static_cast<double>(ratio.den), -1.0 * ratio.num) == 0;
            return py::make_tuple(ratio, isExact);
          },
          py::arg("value"),
          "The best ratio near a float, as single precision sees it, up to 2**30, and "
          "whether it is exactly the float.\n\n"
          ">>> Ratio.approximate(12.5)\n(Ratio(25, 2), True)\n"
          ">>> Ratio.approximate(0.1)\n(Ratio(1, 10), False)")
      .def_readonly("num", &M_Ratio::num, "As it stands; carries the sign.")
      .def_readonly("den", &M_Ratio::den, "As it stands; above 0.")
      .def_property_readonly(
          "numerator", [](const M_Ratio& r) { return Lowest(r).num; }, "In lowest terms.")
      .def_property_readonly(
          "denominator", [](const M_Ratio& r) { return Lowest(r).den; }, "In lowest terms.")
      .def("reduced", &Lowest, "The same in lowest terms.")
      .def("as_fraction", &ToFraction, "The same as a fractions.Fraction.")
      .def("__repr__",
           [](const M_Ratio& r) {
             return "Ratio(" + std::to_string(r.num) + ", " + std::to_string(r.den) + ")";
           })
      .def("__str__", &Text)
      .def("__hash__", &Hash)
      .def("__bool__", [](const M_Ratio& r) { return r.num != 0; })
      .def("__float__", [](const M_Ratio& r) { return r.num / static_cast<double>(r.den); })
      .def("__int__", [](const M_Ratio& r) { return r.num / static_cast<int64_t>(r.den); })
      .def("__neg__", [](const M_Ratio& r) { return -r; })
      .def("__pos__", [](const M_Ratio& r) { return r; })
      .def("__abs__", [](const M_Ratio& r) { return r.num < 0 ? -r : r; })
      .def("__reduce__", [](const py::object& self) {
        const auto& r = self.cast<const M_Ratio&>();
        return py::make_tuple(py::type::of(self), py::make_tuple(r.num, r.den));
      });
  using R = const M_Ratio&;
  DefineOperator(c, "add", "The exact sum.", [](R a, R b) { return a + b; });
  DefineOperator(c, "sub", "The exact difference.", [](R a, R b) { return a - b; });
  DefineOperator(c, "mul", "The exact product.", [](R a, R b) { return a * b; });
  DefineOperator(c, "truediv", "The exact quotient.", [](R a, R b) { return a / b; });
  DefineComparison(c, "__eq__", Py_EQ, [](R a, R b) { return a == b; });
  DefineComparison(c, "__ne__", Py_NE, [](R a, R b) { return a != b; });
  DefineComparison(c, "__lt__", Py_LT, [](R a, R b) { return a < b; });
  DefineComparison(c, "__le__", Py_LE, [](R a, R b) { return a <= b; });
  DefineComparison(c, "__gt__", Py_GT, [](R a, R b) { return a > b; });
  DefineComparison(c, "__ge__", Py_GE, [](R a, R b) { return a >= b; });

  m.def(
      "frame_at",
      [](const py::object& time, const py::object& rate, const std::string& rounding) {
        return M_FrameAt(Given(time), Given(rate), ToRounding(rounding));
      },
      py::arg("time"), py::arg("rate"), py::arg("rounding") = "floor",
      "The frame at a time in seconds, exactly; the rate is in frames a second.\n\n"
      ">>> frame_at(7200, '30000/1001')\n215784\n"
      ">>> frame_at('0.5', 25, 'nearest')\n13");
  m.def(
      "time_of_frame",
      [](int64_t frame, const py::object& rate) { return M_TimeOfFrame(frame, Given(rate)); },
      py::arg("frame"), py::arg("rate"),
      "When a frame begins, in seconds, exactly.\n\n"
      ">>> time_of_frame(100, '30000/1001')\nRatio(1001, 300)");
  m.def(
      "snap_to_frame",
      [](const py::object& time, const py::object& rate, const std::string& rounding) {
        return M_SnapToFrame(Given(time), Given(rate), ToRounding(rounding));
      },
      py::arg("time"), py::arg("rate"), py::arg("rounding") = "floor",
      "The beginning of the frame at a time.\n\n"
      ">>> snap_to_frame(Ratio(1, 3), 24)\nRatio(1, 3)");
}

}  // namespace m_math
