/// \file
/// The parts of the module.
#ifndef PYTHON_BIND_H
#define PYTHON_BIND_H

#include <pybind11/pybind11.h>

namespace m_math {

void BindRatios(pybind11::module_& m);
void BindRectangles(pybind11::module_& m);
void BindMatrices(pybind11::module_& m);
void BindArrays(pybind11::module_& m);
void BindQuads(pybind11::module_& m);

}  // namespace m_math

#endif  // PYTHON_BIND_H
