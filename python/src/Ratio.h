/// \file
/// Python's Ratio: a type of its own rather than one of pybind11's, so that a sum takes no longer
/// than one of floats.
#ifndef PYTHON_RATIO_H
#define PYTHON_RATIO_H

#include <pybind11/pybind11.h>

#include "M_Utils.h"

namespace m_math {

/// A new Ratio.
PyObject* ToPython(const M_Ratio& ratio);

/// Whatever may be given for a ratio: a Ratio, int, Fraction or str. Throws a TypeError, a
/// ValueError, or the code of an overflow.
M_Ratio ToRatio(const pybind11::handle& value);

}  // namespace m_math

/// Functions take and give ratios by it.
template <>
struct pybind11::detail::type_caster<M_Ratio> {
  PYBIND11_TYPE_CASTER(M_Ratio, const_name("Ratio"));
  bool load(handle source, bool) {
    value = m_math::ToRatio(source);
    return true;
  }
  static handle cast(const M_Ratio& ratio, return_value_policy, handle) {
    return m_math::ToPython(ratio);
  }
};

#endif  // PYTHON_RATIO_H
