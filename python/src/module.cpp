#include "Errors.h"
#include "bind.h"

PYBIND11_MODULE(_core, m) {
  m.doc() = "What m_math is made of; see there.";
  m_math::TranslateErrors();
  m_math::BindRatios(m);
  m_math::BindRectangles(m);
  m_math::BindMatrices(m);
  m_math::BindArrays(m);
  m_math::BindQuads(m);
}
