#include "Errors.h"

#include <pybind11/pybind11.h>

#include <string>
#include <utility>

#include "M_Rect.h"
#include "M_Utils.h"
#include "U.h"

namespace py = pybind11;

namespace m_math {
namespace {

struct Kept {
  uint32_t id = 0;
  std::string text;
};
thread_local Kept kept;

const char* NameOf(int code) {
  switch (code) {
    case M_ERR_OVERFLOW:
    case M_RECT_OUT_OF_RANGE:
      return "RangeError";
    case M_ERR_ZERO_DENOMINATOR:
    case M_ERR_DIVIDE_BY_ZERO:
      return "DivisionError";
    case M_ERR_MEMORY:
      return "NoMemoryError";
    default:
      return "OperandError";
  }
}

}  // namespace

void SetError(int code) {
  const Kept report = std::exchange(kept, {});
  const py::object type = py::module_::import("m_math._errors").attr(NameOf(code));
  const std::string text = report.text.empty() ? "out of range" : report.text;
  PyErr_SetObject(type.ptr(), type(text, code, report.id & 0xFFFF).ptr());
}

void TranslateErrors() {
  U_SetReportCallback(
      [](void*, const U_Report* report) {
        kept = {report->id, report->text};
      },
      nullptr);
  py::register_exception_translator([](std::exception_ptr thrown) {
    try {
      if (thrown) std::rethrow_exception(thrown);
    } catch (int code) {
      SetError(code);
    }
  });
}

}  // namespace m_math
