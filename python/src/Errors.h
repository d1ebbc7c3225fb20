/// \file
/// From the library's reports and codes to Python's exceptions.
#ifndef PYTHON_ERRORS_H
#define PYTHON_ERRORS_H

#include <cstdint>

namespace m_math {

/// From now on reports are kept for the exception that follows, and what the library throws, or
/// Check() does, becomes one of `m_math._errors`.
void TranslateErrors();

/// Sets the exception of a code, and of the report that was kept.
void SetError(int code);

/// Throws a code that is none of success.
inline void Check(int32_t code) {
  if (code != 0) throw int{code};
}

}  // namespace m_math

#endif  // PYTHON_ERRORS_H
