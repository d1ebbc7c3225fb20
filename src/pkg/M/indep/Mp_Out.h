/// \file
/// Output arguments that a caller may leave out.
#ifndef MP_OUT_H
#define MP_OUT_H

#include <type_traits>

namespace Mp {

template <class T>
constexpr void Store(T* out, std::type_identity_t<T> value) {
  if (out) *out = value;
}

}  // namespace Mp

#endif  // MP_OUT_H
