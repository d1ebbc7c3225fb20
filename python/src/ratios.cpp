// Ratios beside Python's own numbers, and frames.

#include <cmath>
#include <numeric>
#include <optional>
#include <sstream>
#include <string>

#include "Errors.h"
#include "M_Ops.h"
#include "Ratio.h"
#include "bind.h"

namespace m_math {
namespace {

namespace py = pybind11;

struct RatioObject {
  PyObject_HEAD M_Ratio value;
};

// Kept as long as the process.
PyTypeObject* ratioType;
PyObject* fractionType;

const M_Ratio& ValueOf(PyObject* ratio) { return reinterpret_cast<RatioObject*>(ratio)->value; }
bool IsRatio(PyObject* object) { return Py_TYPE(object) == ratioType; }
bool IsFraction(PyObject* object) { return PyObject_IsInstance(object, fractionType) == 1; }
bool IsWhole(PyObject* object) { return PyIndex_Check(object) != 0; }

py::object ToFraction(const M_Ratio& r) {
  return py::reinterpret_borrow<py::object>(fractionType)(r.num, r.den);
}

M_Ratio Lowest(const M_Ratio& r) {
  const int64_t gcd = std::gcd(int64_t{r.num}, int64_t{r.den});
  return {static_cast<int32_t>(r.num / gcd), static_cast<uint32_t>(r.den / gcd)};
}

// A whole number, or one that is certainly too large.
int64_t ToInt(const py::handle& value) {
  const auto number = py::reinterpret_steal<py::object>(PyNumber_Index(value.ptr()));
  if (!number) throw py::error_already_set();
  int overflow = 0;
  const int64_t i = PyLong_AsLongLongAndOverflow(number.ptr(), &overflow);
  if (overflow != 0 || i < -(int64_t{1} << 33) || i > int64_t{1} << 33) return int64_t{1} << 33;
  return i;
}

M_Ratio FromParts(const py::handle& num, const py::handle& den) {
  int64_t n = ToInt(num), d = ToInt(den);
  if (d == 0) return M_Ratio{1, 1} / M_Ratio{0, 1};  // Throws.
  if (d < 0) n = -n, d = -d;
  // Throws, too, for what does not fit.
  const M_Ratio whole = M_RatioOf(std::in_range<uint32_t>(d) ? n : INT64_MAX);
  return {whole.num, static_cast<uint32_t>(d)};
}

// A number of one of the kinds that are exact, or nothing.
std::optional<M_Ratio> Convert(PyObject* value) {
  if (IsRatio(value)) return ValueOf(value);
  if (IsWhole(value)) return FromParts(value, py::int_(1));
  if (!IsFraction(value)) return {};
  const py::handle fraction(value);
  return FromParts(fraction.attr("numerator"), fraction.attr("denominator"));
}

// What Python calls: exceptions do not pass through it.
template <class Result, class Body>
Result Guarded(Result failure, const Body& body) {
  try {
    return body();
  } catch (int code) {
    SetError(code);
  } catch (py::error_already_set& error) {
    error.restore();
  } catch (const py::builtin_exception& error) {
    error.set_error();
  }
  return failure;
}
template <class Body>
PyObject* Guarded(const Body& body) {
  return Guarded<PyObject*>(nullptr, body);
}

PyObject* NotImplemented() { return Py_NewRef(Py_NotImplemented); }

template <M_Ratio (*kCalculate)(const M_Ratio&, const M_Ratio&)>
PyObject* Binary(PyObject* a, PyObject* b) {
  return Guarded([&] {
    if (IsRatio(a) && IsRatio(b)) return ToPython(kCalculate(ValueOf(a), ValueOf(b)));
    const auto x = Convert(a), y = Convert(b);
    return x && y ? ToPython(kCalculate(*x, *y)) : NotImplemented();
  });
}

template <M_Ratio (*kCalculate)(const M_Ratio&)>
PyObject* Unary(PyObject* a) {
  return Guarded([&] { return ToPython(kCalculate(ValueOf(a))); });
}

M_Ratio Sum(const M_Ratio& a, const M_Ratio& b) { return a + b; }
M_Ratio Difference(const M_Ratio& a, const M_Ratio& b) { return a - b; }
M_Ratio Product(const M_Ratio& a, const M_Ratio& b) { return a * b; }
M_Ratio Quotient(const M_Ratio& a, const M_Ratio& b) { return a / b; }
M_Ratio Negative(const M_Ratio& a) { return -a; }
M_Ratio Same(const M_Ratio& a) { return a; }
M_Ratio Absolute(const M_Ratio& a) { return a.num < 0 ? -a : a; }

PyObject* Compare(PyObject* a, PyObject* b, int operation) {
  return Guarded([&]() -> PyObject* {
    if (IsRatio(b)) Py_RETURN_RICHCOMPARE(ValueOf(a), ValueOf(b), operation);
    // Also with numbers that are larger than any ratio.
    if (!IsWhole(b) && !PyFloat_Check(b) && !IsFraction(b)) return NotImplemented();
    return PyObject_RichCompare(ToFraction(ValueOf(a)).ptr(), b, operation);
  });
}

// That of Python's own numbers of the same value: num / den modulo 2^61 - 1.
Py_hash_t Hash(PyObject* self) {
  constexpr int64_t kPrime = (int64_t{1} << 61) - 1;
  const M_Ratio r = Lowest(ValueOf(self));
  __extension__ using Wide = __int128;
  Wide inverse = 1;
  if (r.den != 1) {
    // k x kPrime + 1 is a multiple of den for the k that Euclid finds.
    int64_t last = r.den, rest = kPrime % r.den, lastFactor = 0, factor = 1;
    while (rest != 0) {
      const int64_t quotient = last / rest;
      last = std::exchange(rest, last - quotient * rest);
      lastFactor = std::exchange(factor, lastFactor - quotient * factor);
    }
    const int64_t k = lastFactor > 0 ? r.den - lastFactor : -lastFactor;
    inverse = (Wide{k} * kPrime + 1) / r.den;
  }
  const auto hash = static_cast<int64_t>(std::abs(int64_t{r.num}) * inverse % kPrime);
  return r.num >= 0 ? hash : hash == 1 ? -2 : -hash;
}

std::string Text(const M_Ratio& r) {
  std::ostringstream text;
  text << r;
  return text.str();
}

PyObject* Make(PyTypeObject*, PyObject* arguments, PyObject* keywords) {
  return Guarded([&]() -> PyObject* {
    static const char* names[] = {"num", "den", nullptr};
    PyObject *num, *den = nullptr;
    if (!PyArg_ParseTupleAndKeywords(arguments, keywords, "O|O:Ratio", const_cast<char**>(names),
                                     &num, &den)) {
      return nullptr;
    }
    if (!den) return IsRatio(num) ? Py_NewRef(num) : ToPython(ToRatio(num));
    if (!IsWhole(num) || !IsWhole(den)) throw py::type_error("num and den must be whole numbers");
    return ToPython(FromParts(num, den));
  });
}

void Free(PyObject* self) {
  PyTypeObject* const type = Py_TYPE(self);
  PyObject_Free(self);
  Py_DECREF(type);
}

PyObject* Approximate(PyObject*, PyObject* number) {
  return Guarded([&] {
    const double value = PyFloat_AsDouble(number);
    if (PyErr_Occurred()) throw py::error_already_set();
    M_Ratio ratio;
    unsigned char isOutOfRange;
    M_FpLong2Ratio(&ratio, &isOutOfRange, value);
    if (isOutOfRange) ratio = M_RatioOf(INT64_MAX);  // Throws.
    const bool isExact = std::fma(value, ratio.den, -1.0 * ratio.num) == 0;
    return py::make_tuple(ratio, isExact).release().ptr();
  });
}

PyMethodDef methods[] = {
    {"approximate", Approximate, METH_O | METH_STATIC,
     "approximate(value: float)\n\nThe best ratio near a float, as single precision sees it, up to "
     "2**30, and whether it is exactly the float.\n\n"
     ">>> Ratio.approximate(12.5)\n(Ratio(25, 2), True)\n"
     ">>> Ratio.approximate(0.3)\n(Ratio(5033165, 16777216), False)"},
    {"reduced", [](PyObject* self, PyObject*) { return ToPython(Lowest(ValueOf(self))); },
     METH_NOARGS, "The same in lowest terms."},
    {"as_fraction",
     [](PyObject* self, PyObject*) {
       return Guarded([&] { return ToFraction(ValueOf(self)).release().ptr(); });
     },
     METH_NOARGS, "The same as a fractions.Fraction."},
    {"__reduce__",
     [](PyObject* self, PyObject*) {
       const M_Ratio& r = ValueOf(self);
       return Py_BuildValue("O(iI)", ratioType, r.num, r.den);
     },
     METH_NOARGS, nullptr},
    {"__floor__",
     [](PyObject* self, PyObject*) {
       return PyLong_FromLongLong(M_FrameAt(ValueOf(self), {1, 1}));
     },
     METH_NOARGS, nullptr},
    {"__ceil__",
     [](PyObject* self, PyObject*) {
       return PyLong_FromLongLong(M_FrameAt(ValueOf(self), {1, 1}, M_Rounding::Ceiling));
     },
     METH_NOARGS, nullptr},
    {}};

template <class Get>
PyGetSetDef Property(const char* name, const char* doc, Get get) {
  return {name, get, nullptr, doc, nullptr};
}

PyGetSetDef properties[] = {
    Property("num", "As it stands; carries the sign.",
             [](PyObject* self, void*) { return PyLong_FromLong(ValueOf(self).num); }),
    Property("den", "As it stands; above 0.",
             [](PyObject* self, void*) { return PyLong_FromUnsignedLong(ValueOf(self).den); }),
    Property("numerator", "In lowest terms.",
             [](PyObject* self, void*) { return PyLong_FromLong(Lowest(ValueOf(self)).num); }),
    Property(
        "denominator", "In lowest terms.",
        [](PyObject* self, void*) { return PyLong_FromUnsignedLong(Lowest(ValueOf(self)).den); }),
    {}};

constexpr char kDoc[] =
    "Ratio(num, den=1)\n--\n\n"
    "An exact ratio of 32 bits, num / den, as the library keeps it: immutable, and not in lowest "
    "terms. Of one value: an int, a Fraction, a Ratio, or a str such as '30000/1001', '25' or "
    "'23.976'.\n\n"
    ">>> Ratio('30000/1001') * 1001\nRatio(30030000, 1001)\n"
    ">>> Ratio(1, 4) + Ratio(1, 4) == Ratio(1, 2)\nTrue\n\n"
    "It equals, orders and hashes as a Fraction of its value does. What does not fit raises an "
    "OverflowError.";

template <class Function>
void* Slot(Function* function) {
  return reinterpret_cast<void*>(function);
}

M_Rounding ToRounding(const std::string& name) {
  if (name == "floor") return M_Rounding::Floor;
  if (name == "nearest") return M_Rounding::Nearest;
  if (name == "ceiling") return M_Rounding::Ceiling;
  throw py::value_error("rounding must be 'floor', 'nearest' or 'ceiling', not '" + name + "'");
}

PyObject* MakeType() {
  PyType_Slot slots[] = {
      {Py_tp_doc, const_cast<char*>(kDoc)},
      {Py_tp_new, Slot(Make)},
      {Py_tp_dealloc, Slot(Free)},
      {Py_tp_methods, methods},
      {Py_tp_getset, properties},
      {Py_tp_hash, Slot(Hash)},
      {Py_tp_richcompare, Slot(Compare)},
      {Py_tp_repr, Slot(+[](PyObject* self) {
         return PyUnicode_FromFormat("Ratio(%i, %u)", ValueOf(self).num, ValueOf(self).den);
       })},
      {Py_tp_str,
       Slot(+[](PyObject* self) { return PyUnicode_FromString(Text(ValueOf(self)).c_str()); })},
      {Py_nb_add, Slot(Binary<Sum>)},
      {Py_nb_subtract, Slot(Binary<Difference>)},
      {Py_nb_multiply, Slot(Binary<Product>)},
      {Py_nb_true_divide, Slot(Binary<Quotient>)},
      {Py_nb_negative, Slot(Unary<Negative>)},
      {Py_nb_positive, Slot(Unary<Same>)},
      {Py_nb_absolute, Slot(Unary<Absolute>)},
      {Py_nb_bool, Slot(+[](PyObject* self) { return static_cast<int>(ValueOf(self).num != 0); })},
      {Py_nb_int, Slot(+[](PyObject* self) {
         return PyLong_FromLongLong(ValueOf(self).num / int64_t{ValueOf(self).den});
       })},
      {Py_nb_float, Slot(+[](PyObject* self) {
         return PyFloat_FromDouble(ValueOf(self).num / static_cast<double>(ValueOf(self).den));
       })},
      {}};
  PyType_Spec description = {"m_math.Ratio", sizeof(RatioObject), 0,
                             Py_TPFLAGS_DEFAULT | Py_TPFLAGS_IMMUTABLETYPE, slots};
  return PyType_FromSpec(&description);
}

}  // namespace

PyObject* ToPython(const M_Ratio& ratio) {
  auto* const object = PyObject_New(RatioObject, ratioType);
  if (!object) throw py::error_already_set();
  object->value = ratio;
  return reinterpret_cast<PyObject*>(object);
}

M_Ratio ToRatio(const py::handle& value) {
  if (const auto ratio = Convert(value.ptr())) return *ratio;
  if (!py::isinstance<py::str>(value)) {
    throw py::type_error(
        "a Ratio, int, Fraction or str is needed; Ratio.approximate() takes a float");
  }
  const auto text = value.cast<std::string>();
  const std::optional<M_Ratio> ratio = M_ParseRatio(text);
  if (!ratio) throw py::value_error("no ratio of 32 bits: '" + text + "'");
  return *ratio;
}

void BindRatios(py::module_& m) {
  fractionType = py::object(py::module_::import("fractions").attr("Fraction")).release().ptr();
  ratioType = reinterpret_cast<PyTypeObject*>(MakeType());
  if (!ratioType) throw py::error_already_set();
  m.attr("Ratio") = py::handle(reinterpret_cast<PyObject*>(ratioType));

  m.def(
      "frame_at",
      [](const M_Ratio& time, const M_Ratio& rate, const std::string& rounding) {
        return M_FrameAt(time, rate, ToRounding(rounding));
      },
      py::arg("time"), py::arg("rate"), py::arg("rounding") = "floor",
      "The frame at a time in seconds, exactly; the rate is in frames a second.\n\n"
      ">>> frame_at(7200, '30000/1001')\n215784\n"
      ">>> frame_at('0.5', 25, 'nearest')\n13");
  m.def("time_of_frame", &M_TimeOfFrame, py::arg("frame"), py::arg("rate"),
        "When a frame begins, in seconds, exactly.\n\n"
        ">>> time_of_frame(100, '30000/1001')\nRatio(1001, 300)");
  m.def(
      "snap_to_frame",
      [](const M_Ratio& time, const M_Ratio& rate, const std::string& rounding) {
        return M_SnapToFrame(time, rate, ToRounding(rounding));
      },
      py::arg("time"), py::arg("rate"), py::arg("rounding") = "floor",
      "The beginning of the frame at a time.\n\n"
      ">>> snap_to_frame(Ratio(1, 3), 24)\nRatio(1, 3)");
}

}  // namespace m_math
